#include "CheckerFixture.h"

#include <memory>

namespace
{

constexpr unsigned kRgba = 0x1908;

class TextureSummaryTest : public ResourceCheckerTest
{
protected:
    /// Texture memory is attributed by the address of the queue: these two lie in order.
    Nib::IGLMsgQueue* A() { return &queues[0]; }
    Nib::IGLMsgQueue* B() { return &queues[1]; }

    void Add(unsigned id, Nib::IGLMsgQueue* owner, int width, int height, unsigned format)
    {
        AddInfo(id, owner, std::make_unique<ResourceChecker::TextureInfo>(width, height, format));
    }

    void AddInfo(unsigned id, Nib::IGLMsgQueue* owner,
                 std::unique_ptr<ResourceChecker::BaseInfo> info)
    {
        Nib::AttachToThread(owner);
        ResourceChecker::addLookup(id, ResourceChecker::textureDbDescriptor, std::move(info));
    }

    static std::string Line(Nib::IGLMsgQueue* owner, const char* rest)
    {
        char text[256];
        std::snprintf(text, sizeof(text), "Dump queue : IGLMsgQueue(Queue: %p%s",
                      static_cast<void*>(owner), rest);
        return text;
    }

    Texts Summary()
    {
        driver.ForgetLog();
        ResourceChecker::printInfoTexture();
        Texts texts;
        for (const SimLogLine& line : driver.Log())
        {
            EXPECT_EQ(line.priority, ANDROID_LOG_INFO);
            texts.push_back(line.text);
        }
        return texts;
    }

    TestQueue queues[2] = {TestQueue("A"), TestQueue("B")};
};

} // namespace

TEST_F(TextureSummaryTest, QueuesAreComparedByAddress)
{
    const ResourceChecker::CheckerItem low(1u, A(), nullptr);
    const ResourceChecker::CheckerItem high(1u, B(), nullptr);
    const ResourceChecker::CheckerItem none(1u, nullptr, nullptr);
    EXPECT_TRUE(ResourceChecker::compareFunction(&low, &high));
    EXPECT_FALSE(ResourceChecker::compareFunction(&high, &low));
    EXPECT_FALSE(ResourceChecker::compareFunction(&low, &low));
    EXPECT_TRUE(ResourceChecker::compareFunction(&none, &low));
}

TEST_F(TextureSummaryTest, WithoutTexturesThereIsNoLine)
{
    EXPECT_EQ(Summary(), Texts{});
}

TEST_F(TextureSummaryTest, OneTexture)
{
    Add(1, A(), 1024, 1024, kRgba);
    EXPECT_EQ(Summary(), Texts{Line(A(), "[A] textureCounter=1 textureSize=4MB)")});
}

TEST_F(TextureSummaryTest, TheFirstTextureOfAQueueCountsForTheQueueBefore)
{
    Add(1, A(), 1024, 1024, kRgba);
    Add(2, A(), 1024, 1024, kRgba);
    Add(3, B(), 1024, 1024, kRgba);

    EXPECT_EQ(Summary(), Texts{Line(A(), "[A] textureCounter=3 textureSize=12MB)")});
}

TEST_F(TextureSummaryTest, ASecondTextureOfTheLastQueueGivesItALine)
{
    Add(1, A(), 1024, 1024, kRgba);
    Add(2, A(), 1024, 1024, kRgba);
    Add(3, B(), 1024, 1024, kRgba);
    Add(4, B(), 2048, 1024, kRgba);

    EXPECT_EQ(Summary(), (Texts{Line(A(), "[A] textureCounter=3 textureSize=12MB)"),
                                Line(B(), "[B] textureCounter=1 textureSize=8MB)")}));
}

TEST_F(TextureSummaryTest, QueuesAreGroupedWhateverTheOrderOfIds)
{
    Add(1, B(), 1024, 1024, kRgba);
    Add(2, A(), 1024, 1024, kRgba);
    Add(3, B(), 1024, 1024, kRgba);
    Add(4, A(), 1024, 1024, kRgba);

    EXPECT_EQ(Summary(), (Texts{Line(A(), "[A] textureCounter=3 textureSize=12MB)"),
                                Line(B(), "[B] textureCounter=1 textureSize=4MB)")}));
}

TEST_F(TextureSummaryTest, TexturesWithoutDetailsAreSkipped)
{
    struct OtherInfo : ResourceChecker::BaseInfo
    {
    };
    AddInfo(1, A(), nullptr);
    AddInfo(2, A(), std::make_unique<OtherInfo>());
    Add(3, A(), 1024, 1024, kRgba);

    EXPECT_EQ(Summary(), Texts{Line(A(), "[A] textureCounter=1 textureSize=4MB)")});
}

TEST_F(TextureSummaryTest, ALastTextureWithoutDetailsEndsNoLine)
{
    Add(1, A(), 1024, 1024, kRgba);
    AddInfo(2, A(), nullptr);

    EXPECT_EQ(Summary(), Texts{});
}

TEST_F(TextureSummaryTest, TheGroupBeginsWithTheFirstTextureThatHasDetails)
{
    AddInfo(1, A(), nullptr);
    Add(2, B(), 1024, 1024, kRgba);
    Add(3, B(), 1024, 1024, kRgba);

    EXPECT_EQ(Summary(), Texts{Line(B(), "[B] textureCounter=2 textureSize=8MB)")});
}

TEST_F(TextureSummaryTest, ATextureWithoutAQueueIsAnError)
{
    Add(9, nullptr, 1024, 512, kRgba);
    ResourceChecker::updateTagLookup(9, "brush", ResourceChecker::textureDbDescriptor);
    char expected[256];
    std::snprintf(expected, sizeof(expected),
                  "Dump queue : Error, Queue: NULL. Texture(context=%p id=9 tag=\"brush\" w=1024 "
                  "h=512 size=2048KB)",
                  static_cast<void*>(context.Handle()));

    driver.ForgetLog();
    ResourceChecker::printInfoTexture();

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR), Texts{expected});
    EXPECT_EQ(driver.Log().size(), 1u);
}

TEST_F(TextureSummaryTest, ATextureWithoutAQueueBeginsAGroupThatTheNextQueueEnds)
{
    Add(1, nullptr, 1024, 1024, kRgba);
    Add(2, A(), 1024, 1024, kRgba);
    Add(3, A(), 1024, 1024, kRgba);

    driver.ForgetLog();
    ResourceChecker::printInfoTexture();

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO),
              (Texts{"Dump queue : IGLMsgQueue(Queue: (nil)[] textureCounter=1 textureSize=4MB)",
                     Line(A(), "[A] textureCounter=1 textureSize=4MB)")}));
}

// ---- sizes --------------------------------------------------------------------------------------

TEST_F(TextureSummaryTest, EachFormatHasItsBits)
{
    struct Row
    {
        unsigned format;
        const char* kilobytes; // of 64 x 128 texels: one KB a bit
    };
    const Row rows[] = {
        {0x1907, "24"},                      // GL_RGB
        {0x1908, "32"},                      // GL_RGBA
        {0x8229, "8"},                       // GL_R8
        {0x822D, "16"},                      // GL_R16F
        {0x822E, "32"},                      // GL_R32F
        {0x8814, "128"},                     // GL_RGBA32F
        {0x8815, "96"},                      // GL_RGB32F
        {0x881A, "64"},                      // GL_RGBA16F
        {0x881B, "48"},                      // GL_RGB16F
        {0x8058, "0"},                       // GL_RGBA8 and any other
        {0, "0"},        {0xFFFFFFFFu, "0"}, // unknown
    };
    unsigned id = 1;
    for (const Row& row : rows)
    {
        Add(id, nullptr, 64, 128, row.format);
        driver.ForgetLog();
        ResourceChecker::printInfoTexture();
        EXPECT_EQ(driver.CountLogContaining("id=" + std::to_string(id) +
                                            " tag=\"\" w=64 h=128 size=" + row.kilobytes + "KB)"),
                  1u)
            << row.format;
        ++id;
    }
}

TEST_F(TextureSummaryTest, UnknownSizesAreZero)
{
    Add(1, nullptr, -1, 1024, kRgba);
    Add(2, nullptr, 1024, -1, kRgba);
    Add(3, nullptr, 1024, 1024, 0xFFFFFFFFu);

    driver.ForgetLog();
    ResourceChecker::printInfoTexture();

    EXPECT_EQ(driver.CountLogContaining("id=1 tag=\"\" w=-1 h=1024 size=0KB)"), 1u);
    EXPECT_EQ(driver.CountLogContaining("id=2 tag=\"\" w=1024 h=-1 size=0KB)"), 1u);
    EXPECT_EQ(driver.CountLogContaining("id=3 tag=\"\" w=1024 h=1024 size=0KB)"), 1u);
}

TEST_F(TextureSummaryTest, KilobytesAndMegabytesAreTruncated)
{
    // 16 x 15 x 32 bits are 0.94 KB; 512 x 511 x 32 bits are 1022 KB.
    Add(1, nullptr, 16, 15, kRgba);
    driver.ForgetLog();
    ResourceChecker::printInfoTexture();
    EXPECT_EQ(driver.CountLogContaining("size=0KB)"), 1u);
    ResourceChecker::textureDb.clear();

    Add(2, A(), 512, 511, kRgba);
    EXPECT_EQ(Summary(), Texts{Line(A(), "[A] textureCounter=1 textureSize=0MB)")});
    Add(3, A(), 512, 511, kRgba);
    EXPECT_EQ(Summary(), Texts{Line(A(), "[A] textureCounter=2 textureSize=1MB)")});
}

TEST_F(TextureSummaryTest, MemoryIsSummedIn64Bits)
{
    Add(1, A(), 32768, 32768, 0x8814); // 16 GB
    Add(2, A(), 32768, 32768, 0x8814);
    EXPECT_EQ(Summary(), Texts{Line(A(), "[A] textureCounter=2 textureSize=32768MB)")});
}
