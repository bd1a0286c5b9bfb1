#include "CheckerFixture.h"

#include <memory>

// ---- lookups ------------------------------------------------------------------------------------

TEST_F(ResourceCheckerTest, AddRecordsQueueContextAndDetails)
{
    auto info = std::make_unique<ResourceChecker::TextureInfo>(8, 4, 0x1908u);
    const ResourceChecker::BaseInfo* details = info.get();

    ResourceChecker::addLookup(5, Texture, std::move(info));

    ASSERT_EQ(ResourceChecker::textureDb.size(), 1u);
    const Item& item = *ResourceChecker::textureDb.begin();
    EXPECT_EQ(item.id, 5u);
    EXPECT_EQ(item.queue, &queue);
    EXPECT_STREQ(item.queueName, "queue");
    EXPECT_EQ(item.context, context.Handle());
    EXPECT_EQ(item.tag, "");
    EXPECT_EQ(item.info.get(), details);
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ResourceCheckerTest, EachKindHasItsOwnDatabase)
{
    for (const Kind& kind : kKinds)
        ResourceChecker::addLookup(5, kind.db, nullptr);

    for (const Kind& kind : kKinds)
    {
        EXPECT_EQ(kind.db.db->size(), 1u) << kind.name;
        ResourceChecker::checkLookup(5, kind.db);
        ResourceChecker::removeLookup(5, kind.db);
        EXPECT_EQ(kind.db.db->size(), 0u) << kind.name;
    }
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ResourceCheckerTest, AddOfANameThatIsThereThrows)
{
    for (const Kind& kind : kKinds)
    {
        driver.ForgetLog();
        ResourceChecker::addLookup(5, kind.db, nullptr);

        EXPECT_EQ(Thrown([&] { ResourceChecker::addLookup(5, kind.db, nullptr); }),
                  "Add resource lookup: Resource already exists in database");

        EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
                  Texts{std::string("Error add ") + kind.name +
                        " lookup: " + Who(context.Handle(), &queue, "queue", 5)});
        EXPECT_EQ(kind.db.db->size(), 1u);
    }
}

TEST_F(ResourceCheckerTest, AddKeepsTheDetailsOfTheFirst)
{
    auto info = std::make_unique<ResourceChecker::TextureInfo>(8, 4, 0x1908u);
    const ResourceChecker::BaseInfo* first = info.get();
    ResourceChecker::addLookup(5, Texture, std::move(info));

    EXPECT_THROW(ResourceChecker::addLookup(
                     5, Texture, std::make_unique<ResourceChecker::TextureInfo>(1, 1, 0x1908u)),
                 std::logic_error);

    EXPECT_EQ(ResourceChecker::textureDb.begin()->info.get(), first);
}

TEST_F(ResourceCheckerTest, AddOfTheSameNameFromAnotherQueueThrowsAllTheSame)
{
    ResourceChecker::addLookup(5, Texture, nullptr);
    TestQueue other("other");
    Nib::AttachToThread(&other);

    EXPECT_NE(Thrown([] { ResourceChecker::addLookup(5, Texture, nullptr); }), "");

    EXPECT_TRUE(driver.HasLog(ANDROID_LOG_ERROR, "Error add textureDb lookup: " +
                                                     Who(context.Handle(), &other, "other", 5)));
}

TEST_F(ResourceCheckerTest, TheSameNameOfAnotherContextIsAnotherObject)
{
    ResourceChecker::addLookup(5, Texture, nullptr);
    SimContext second(driver);

    ResourceChecker::addLookup(5, Texture, nullptr);

    EXPECT_EQ(ResourceChecker::textureDb.size(), 2u);
}

TEST_F(ResourceCheckerTest, RemoveOfAnUnknownNameThrows)
{
    for (const Kind& kind : kKinds)
    {
        driver.ForgetLog();

        EXPECT_EQ(Thrown([&] { ResourceChecker::removeLookup(6, kind.db); }),
                  "Remove resource lookup: Trying to delete resource, that is not listed in "
                  "database");

        EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
                  Texts{std::string("Error remove ") + kind.name +
                        " lookup: " + Who(context.Handle(), &queue, "queue", 6)});
    }
}

namespace
{

/// Details that tell when they are freed.
struct Watched : ResourceChecker::BaseInfo
{
    explicit Watched(bool& flag) : gone(flag) {}
    ~Watched() override { gone = true; }
    bool& gone;
};

} // namespace

TEST_F(ResourceCheckerTest, AddOfNameZeroFreesTheDetails)
{
    bool gone = false;
    ResourceChecker::addLookup(0, Texture, std::make_unique<Watched>(gone));
    EXPECT_TRUE(gone);
}

TEST_F(ResourceCheckerTest, RemoveFreesTheDetails)
{
    bool gone = false;
    ResourceChecker::addLookup(5, Texture, std::make_unique<Watched>(gone));
    EXPECT_FALSE(gone);

    ResourceChecker::removeLookup(5, Texture);

    EXPECT_TRUE(gone);
    EXPECT_NE(Thrown([] { ResourceChecker::removeLookup(5, Texture); }), "");
}

TEST_F(ResourceCheckerTest, CheckOfAnUnknownNameThrows)
{
    for (const Kind& kind : kKinds)
    {
        driver.ForgetLog();

        EXPECT_EQ(Thrown([&] { ResourceChecker::checkLookup(6, kind.db); }),
                  "Check resource lookup: Trying to access resource, that is not listed in "
                  "database");

        EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
                  Texts{std::string("Error check ") + kind.name +
                        " lookup: " + Who(context.Handle(), &queue, "queue", 6)});
    }
}

TEST_F(ResourceCheckerTest, CheckOfAKnownNameDoesNothing)
{
    ResourceChecker::addLookup(5, Texture, nullptr);

    ResourceChecker::checkLookup(5, Texture);

    EXPECT_EQ(ResourceChecker::textureDb.size(), 1u);
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ResourceCheckerTest, UpdateTagCopiesTheLabel)
{
    ResourceChecker::addLookup(5, Texture, nullptr);
    char tag[] = "first";

    ResourceChecker::updateTagLookup(5, tag, Texture);
    tag[0] = 'X';
    EXPECT_EQ(ResourceChecker::textureDb.begin()->tag, "first");

    ResourceChecker::updateTagLookup(5, "second", Texture);
    EXPECT_EQ(ResourceChecker::textureDb.begin()->tag, "second");

    ResourceChecker::updateTagLookup(5, nullptr, Texture);
    EXPECT_EQ(ResourceChecker::textureDb.begin()->tag, "");
}

TEST_F(ResourceCheckerTest, UpdateTagOfAnUnknownNameOnlyLogs)
{
    for (const Kind& kind : kKinds)
    {
        driver.ForgetLog();

        EXPECT_NO_THROW(ResourceChecker::updateTagLookup(6, "tag", kind.db));

        EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
                  Texts{std::string("Error update ") + kind.name +
                        " lookup: " + Who(context.Handle(), &queue, "queue", 6)});
        EXPECT_EQ(driver.Log().size(), 1u);
    }
}

TEST_F(ResourceCheckerTest, NameZeroIsAWarningAndNothingElse)
{
    for (const Kind& kind : kKinds)
    {
        driver.ForgetLog();

        ResourceChecker::addLookup(0, kind.db, nullptr);
        ResourceChecker::removeLookup(0, kind.db);
        ResourceChecker::checkLookup(0, kind.db);
        ResourceChecker::updateTagLookup(0, "tag", kind.db);

        const std::string end = std::string(" with ID = 0, ") + kind.name + " ";
        EXPECT_EQ(
            driver.LogTexts(ANDROID_LOG_INFO),
            (Texts{"Warning! Resource addLookup" + end, "Warning! Resource removeLookup" + end,
                   "Warning! Resource checkLookup" + end,
                   "Warning! Resource updateTagLookup" + end}));
        EXPECT_EQ(driver.Log().size(), 4u);
        EXPECT_EQ(kind.db.db->size(), 0u);
    }
}

TEST_F(ResourceCheckerTest, AThreadWithoutAQueueHasNullAndAnEmptyName)
{
    Nib::AttachToThread(nullptr);

    ResourceChecker::addLookup(5, Texture, nullptr);
    EXPECT_THROW(ResourceChecker::addLookup(5, Texture, nullptr), std::logic_error);

    EXPECT_EQ(ResourceChecker::textureDb.begin()->queue, nullptr);
    EXPECT_TRUE(driver.HasLog(ANDROID_LOG_ERROR, "Error add textureDb lookup: " +
                                                     Who(context.Handle(), nullptr, "", 5)));
}

TEST_F(ResourceCheckerTest, AThreadWithoutAContextRecordsUnderNull)
{
    context.Release();

    ResourceChecker::addLookup(5, Texture, nullptr);

    EXPECT_EQ(ResourceChecker::textureDb.begin()->context, nullptr);
    context.MakeCurrent();
}

// ---- engineering builds alone -------------------------------------------------------------------

TEST_F(ResourceCheckerTest, OtherBuildsDoNothing)
{
    ResourceChecker::addLookup(5, Texture,
                               std::make_unique<ResourceChecker::TextureInfo>(1024, 1024, 0x1908u));
    Nib::System::SetBuildTypeEngMode(false);
    driver.ForgetCalls();

    ResourceChecker::addLookup(6, Texture, nullptr);
    ResourceChecker::addLookup(5, Texture, nullptr);
    ResourceChecker::removeLookup(5, Texture);
    ResourceChecker::removeLookup(9, Texture);
    ResourceChecker::checkLookup(9, Texture);
    ResourceChecker::updateTagLookup(5, "tag", Texture);
    ResourceChecker::updateTagLookup(9, "tag", Texture);
    ResourceChecker::addLookup(0, Texture, nullptr);
    ResourceChecker::removeLookup(0, Texture);
    ResourceChecker::checkLookup(0, Texture);
    ResourceChecker::updateTagLookup(0, "tag", Texture);
    ResourceChecker::addSharedContext(this, &driver);
    ResourceChecker::leakCheckLookup(true);
    ResourceChecker::lookForContextResources(Texture, true);
    ResourceChecker::printInfoTexture();
    testing::internal::CaptureStdout();
    ResourceChecker::printResource(ResourceChecker::textureDb);

    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    EXPECT_EQ(driver.Log().size(), 0u);
    EXPECT_EQ(driver.CallCount(), 0u);
    ASSERT_EQ(ResourceChecker::textureDb.size(), 1u);
    EXPECT_EQ(ResourceChecker::textureDb.begin()->id, 5u);
    EXPECT_EQ(ResourceChecker::textureDb.begin()->tag, "");
    EXPECT_TRUE(ResourceChecker::contextDb.empty());
}

TEST_F(ResourceCheckerTest, OtherBuildsKeepTheMappingsOfContexts)
{
    ResourceChecker::addSharedContext(this, &driver);
    Nib::System::SetBuildTypeEngMode(false);

    ResourceChecker::removeSharedContext(this);

    EXPECT_EQ(ResourceChecker::contextDb.size(), 1u);
}

// ---- shared contexts ----------------------------------------------------------------------------

TEST_F(ResourceCheckerTest, TheFirstOwnerOfAContextStays)
{
    int shared = 0;
    int owner = 0;
    int other = 0;

    ResourceChecker::addSharedContext(&shared, nullptr);
    EXPECT_TRUE(ResourceChecker::contextDb.empty());
    ResourceChecker::addSharedContext(&shared, &owner);
    ResourceChecker::addSharedContext(&shared, &other);

    ASSERT_EQ(ResourceChecker::contextDb.size(), 1u);
    EXPECT_EQ(ResourceChecker::contextDb[&shared], &owner);
}

TEST_F(ResourceCheckerTest, RemovedMappingsMayBeMadeAnew)
{
    int shared = 0;
    int owner = 0;
    int other = 0;
    ResourceChecker::addSharedContext(&shared, &owner);

    ResourceChecker::removeSharedContext(&shared);
    ResourceChecker::removeSharedContext(&shared); // no longer there
    EXPECT_TRUE(ResourceChecker::contextDb.empty());
    ResourceChecker::addSharedContext(&shared, &other);

    EXPECT_EQ(ResourceChecker::contextDb[&shared], &other);
}

TEST_F(ResourceCheckerTest, NamesOfASharedContextBelongToTheOwner)
{
    ResourceChecker::addLookup(5, Texture, nullptr);
    SimContext shared(driver, context);
    ResourceChecker::addSharedContext(shared.Handle(), context.Handle());

    EXPECT_EQ(Thrown([] { ResourceChecker::addLookup(5, Texture, nullptr); }),
              "Add resource lookup: Resource already exists in database");
    ResourceChecker::checkLookup(5, Texture);
    ResourceChecker::addLookup(6, Texture, nullptr);

    for (const Item& item : ResourceChecker::textureDb)
        EXPECT_EQ(item.context, context.Handle());
    EXPECT_EQ(ResourceChecker::textureDb.size(), 2u);
}

TEST_F(ResourceCheckerTest, EveryKindButFramebuffersBelongsToTheOwner)
{
    SimContext shared(driver, context);
    ResourceChecker::addSharedContext(shared.Handle(), context.Handle());
    using Type = ResourceChecker::DescriptorType;

    EXPECT_EQ(ResourceChecker::getRealContext(Type::Texture), context.Handle());
    EXPECT_EQ(ResourceChecker::getRealContext(Type::Sampler), context.Handle());
    EXPECT_EQ(ResourceChecker::getRealContext(Type::FrameBuffer), shared.Handle());
    EXPECT_EQ(ResourceChecker::getRealContext(Type::RenderBuffer), context.Handle());
    EXPECT_EQ(ResourceChecker::getRealContext(Type::VertexBuffer), context.Handle());
}

TEST_F(ResourceCheckerTest, AFramebufferIsNotFoundFromTheOwner)
{
    SimContext shared(driver, context);
    ResourceChecker::addSharedContext(shared.Handle(), context.Handle());
    ResourceChecker::addLookup(3, FrameBuffer, nullptr);
    EXPECT_EQ(ResourceChecker::frameBufferDb.begin()->context, shared.Handle());

    context.MakeCurrent();

    EXPECT_NE(Thrown([] { ResourceChecker::checkLookup(3, FrameBuffer); }), "");
    shared.MakeCurrent();
    ResourceChecker::checkLookup(3, FrameBuffer);
}

TEST_F(ResourceCheckerTest, ChainsOfSharingAreFollowedToTheEnd)
{
    int middle = 0;
    int root = 0;
    ResourceChecker::addSharedContext(context.Handle(), &middle);
    ResourceChecker::addSharedContext(&middle, &root);

    EXPECT_EQ(ResourceChecker::getRealContext(ResourceChecker::DescriptorType::Texture), &root);
}

TEST_F(ResourceCheckerTest, RingsOfSharingEnd)
{
    int other = 0;
    ResourceChecker::addSharedContext(context.Handle(), &other);
    ResourceChecker::addSharedContext(&other, context.Handle());

    // Two mappings, two steps: back at the beginning.
    EXPECT_EQ(ResourceChecker::getRealContext(ResourceChecker::DescriptorType::Texture),
              context.Handle());
    ResourceChecker::addLookup(5, Texture, nullptr);
    ResourceChecker::removeLookup(5, Texture);
}
