#include "CheckerFixture.h"

#include <memory>
#include <type_traits>

// ---- records ------------------------------------------------------------------------------------

TEST(ResourceCheckerRecords, DescriptorsNameTheirDatabases)
{
    EXPECT_EQ(ResourceChecker::textureDbDescriptor.db, &ResourceChecker::textureDb);
    EXPECT_EQ(ResourceChecker::samplerDbDescriptor.db, &ResourceChecker::samplerDb);
    EXPECT_EQ(ResourceChecker::frameBufferDbDescriptor.db, &ResourceChecker::frameBufferDb);
    EXPECT_EQ(ResourceChecker::renderBufferDbDescriptor.db, &ResourceChecker::renderBufferDb);
    EXPECT_EQ(ResourceChecker::vertexBufferDbDescriptor.db, &ResourceChecker::vertexBufferDb);
    for (int i = 0; i < 5; ++i)
    {
        EXPECT_EQ(static_cast<int>(kKinds[i].db.type), i);
        EXPECT_STREQ(kKinds[i].db.toString(), kKinds[i].name);
    }
    const Descriptor other = {nullptr, static_cast<ResourceChecker::DescriptorType>(5)};
    EXPECT_STREQ(other.toString(), "");
    EXPECT_EQ(sizeof(ResourceChecker::DescriptorType), 4u);
}

TEST(ResourceCheckerRecords, ConstantsHaveTheirValues)
{
    EXPECT_EQ(ResourceChecker::ALL_INFO, 0);
    EXPECT_EQ(sizeof(ResourceChecker::ALL_INFO), 1u);
    EXPECT_EQ(ResourceChecker::BIT_TO_KB, 8192u);
    EXPECT_EQ(ResourceChecker::KB_TO_MB, 1024u);
}

TEST(ResourceCheckerRecords, AnItemTakesItsNameFromTheQueue)
{
    TestQueue queue("ink");
    int context = 0;

    const Item item(7u, &queue, &context);

    EXPECT_EQ(item.queue, &queue);
    EXPECT_STREQ(item.queueName, "ink");
    EXPECT_EQ(item.context, &context);
    EXPECT_EQ(item.id, 7u);
    EXPECT_EQ(item.tag, "");
    EXPECT_EQ(item.info, nullptr);
}

TEST(ResourceCheckerRecords, AnItemWithoutAQueueOrTagHasAnEmptyName)
{
    TestQueue queue(nullptr);
    EXPECT_STREQ(Item(1u, nullptr, nullptr).queueName, "");
    EXPECT_STREQ(Item(1u, &queue, nullptr).queueName, "");
}

TEST(ResourceCheckerRecords, ACopyTakesTheDetailsAway)
{
    TestQueue queue("ink");
    int context = 0;
    Item item(7u, &queue, &context);
    item.tag = "label";
    item.info = std::make_unique<ResourceChecker::TextureInfo>(1, 2, 0x1908u);
    const ResourceChecker::BaseInfo* info = item.info.get();

    const Item copy(item);

    EXPECT_EQ(copy.queue, &queue);
    EXPECT_EQ(copy.queueName, item.queueName);
    EXPECT_EQ(copy.context, &context);
    EXPECT_EQ(copy.id, 7u);
    EXPECT_EQ(copy.tag, "label");
    EXPECT_EQ(copy.info.get(), info);
    EXPECT_EQ(item.info, nullptr);
    EXPECT_EQ(item.tag, "label");
}

TEST(ResourceCheckerRecords, ItemsAreOrderedByContextThenId)
{
    TestQueue queue("q");
    void* low = reinterpret_cast<void*>(0x10);
    void* high = reinterpret_cast<void*>(0xFFFFFFFFFFFFFFF0); // negative, were it signed

    EXPECT_LT(Item(9u, nullptr, low), Item(1u, nullptr, high));
    EXPECT_FALSE(Item(1u, nullptr, high) < Item(9u, nullptr, low));
    EXPECT_LT(Item(1u, nullptr, low), Item(2u, nullptr, low));
    EXPECT_LT(Item(1u, nullptr, low), Item(0x80000000u, nullptr, low));
    EXPECT_FALSE(Item(1u, nullptr, low) < Item(1u, &queue, low)); // the queue does not count
    EXPECT_FALSE(Item(1u, &queue, low) < Item(1u, nullptr, low));
}

TEST(ResourceCheckerRecords, TextureInfoHoldsItsFields)
{
    const ResourceChecker::TextureInfo info(-1, 20, 0x1908u);
    EXPECT_EQ(info.width, -1);
    EXPECT_EQ(info.height, 20);
    EXPECT_EQ(info.internalFormat, 0x1908u);
    static_assert(std::has_virtual_destructor_v<ResourceChecker::BaseInfo>);
}
