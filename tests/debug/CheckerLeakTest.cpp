#include "CheckerFixture.h"

#include <memory>
#include <thread>

// ---- leaks --------------------------------------------------------------------------------------

TEST_F(ResourceCheckerTest, LeaksAreErrorsOrWarnings)
{
    ResourceChecker::addLookup(5, Texture, nullptr);
    ResourceChecker::updateTagLookup(5, "brush", Texture);
    char who[128];
    std::snprintf(who, sizeof(who), "Context: %p,  Queue: %p[queue], Id: 5, Tag: brush",
                  static_cast<void*>(context.Handle()),
                  static_cast<void*>(static_cast<Nib::IGLMsgQueue*>(&queue)));

    ResourceChecker::leakCheckLookup(true);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              Texts{std::string("Error, GL resource leak detected in textureDb: ") + who});
    EXPECT_EQ(driver.Log().size(), 1u);

    driver.ForgetLog();
    ResourceChecker::leakCheckLookup(false);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN),
              Texts{std::string("Possible resource leak detected in textureDb: ") + who});
    EXPECT_EQ(driver.Log().size(), 1u);

    EXPECT_EQ(ResourceChecker::textureDb.size(), 1u); // reported, not removed
}

TEST_F(ResourceCheckerTest, LeaksAreListedByKindThenId)
{
    for (const Kind& kind : kKinds)
    {
        ResourceChecker::addLookup(2, kind.db, nullptr);
        ResourceChecker::addLookup(1, kind.db, nullptr);
    }

    ResourceChecker::leakCheckLookup(true);

    const Texts lines = driver.LogTexts(ANDROID_LOG_ERROR);
    ASSERT_EQ(lines.size(), 10u);
    const char* names[] = {"textureDb", "samplerDb", "frameBufferDb", "renderBufferDb",
                           "vertexBufferDb"};
    for (std::size_t i = 0; i < 10; ++i)
    {
        EXPECT_EQ(lines[i].find(std::string("Error, GL resource leak detected in ") + names[i / 2] +
                                ": Context: "),
                  0u)
            << lines[i];
        EXPECT_NE(lines[i].find(i % 2 == 0 ? ", Id: 1, Tag: " : ", Id: 2, Tag: "),
                  std::string::npos)
            << lines[i];
    }
}

TEST_F(ResourceCheckerTest, LeaksOfOtherQueuesAndContextsAreNotReported)
{
    ResourceChecker::addLookup(1, Texture, nullptr);
    TestQueue other("other");
    Nib::AttachToThread(&other);
    ResourceChecker::addLookup(2, Texture, nullptr);
    Nib::AttachToThread(&queue);
    {
        SimContext second(driver);
        ResourceChecker::addLookup(3, Texture, nullptr);
    }
    context.MakeCurrent();

    ResourceChecker::leakCheckLookup(true);

    const Texts lines = driver.LogTexts(ANDROID_LOG_ERROR);
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_NE(lines[0].find("Id: 1,"), std::string::npos);
}

TEST_F(ResourceCheckerTest, LeaksOfASharedContextAreThoseOfTheOwner)
{
    SimContext shared(driver, context);
    ResourceChecker::addSharedContext(shared.Handle(), context.Handle());
    ResourceChecker::addLookup(1, Texture, nullptr);
    ResourceChecker::addLookup(2, FrameBuffer, nullptr);
    context.MakeCurrent();

    ResourceChecker::leakCheckLookup(true);

    const Texts lines = driver.LogTexts(ANDROID_LOG_ERROR);
    ASSERT_EQ(lines.size(), 1u); // not the framebuffer
    EXPECT_NE(lines[0].find("textureDb"), std::string::npos);
    shared.MakeCurrent();
}

TEST_F(ResourceCheckerTest, TheTextureSummaryComesBeforeTheLeaks)
{
    ResourceChecker::addLookup(1, Texture,
                               std::make_unique<ResourceChecker::TextureInfo>(1024, 1024, 0x1908u));

    ResourceChecker::leakCheckLookup(true);

    const std::vector<SimLogLine> log = driver.Log();
    ASSERT_EQ(log.size(), 2u);
    EXPECT_EQ(log[0].text.find("Dump queue : IGLMsgQueue("), 0u);
    EXPECT_EQ(log[1].text.find("Error, GL resource leak"), 0u);
}

TEST_F(ResourceCheckerTest, PrintResourceWritesALineAnItem)
{
    ResourceChecker::Database items;
    Nib::IGLMsgQueue* face = &queue;
    items.insert(Item(7u, face, context.Handle()));
    items.insert(Item(4000000000u, face, context.Handle()));
    char expected[256];
    std::snprintf(expected, sizeof(expected),
                  "context=%p, queue=%p, id=7\ncontext=%p, queue=%p, id=4000000000\n",
                  static_cast<void*>(context.Handle()), static_cast<void*>(face),
                  static_cast<void*>(context.Handle()), static_cast<void*>(face));

    testing::internal::CaptureStdout();
    ResourceChecker::printResource(items);

    EXPECT_EQ(testing::internal::GetCapturedStdout(), expected);
}

TEST_F(ResourceCheckerTest, PrintResourceWritesANullPointerAsZero)
{
    ResourceChecker::Database items;
    items.insert(Item(7u, nullptr, nullptr));

    testing::internal::CaptureStdout();
    ResourceChecker::printResource(items);

    EXPECT_EQ(testing::internal::GetCapturedStdout(), "context=0, queue=0, id=7\n");
}

// ---- several threads ----------------------------------------------------------------------------

TEST_F(ResourceCheckerTest, TwoThreadsUseItAtOnce)
{
    constexpr unsigned kNames = 200;
    const auto work = [this](unsigned first, const char* tag)
    {
        SimContext own(driver);
        TestQueue ownQueue(tag);
        Nib::AttachToThread(&ownQueue);
        for (unsigned id = first; id < first + kNames; ++id)
        {
            ResourceChecker::addLookup(
                id, Texture, std::make_unique<ResourceChecker::TextureInfo>(4, 4, 0x1908u));
            ResourceChecker::addSharedContext(reinterpret_cast<void*>(std::uintptr_t{id}), &own);
            ResourceChecker::updateTagLookup(id, tag, Texture);
            ResourceChecker::checkLookup(id, Texture);
        }
        ResourceChecker::leakCheckLookup(false);
        for (unsigned id = first; id < first + kNames; ++id)
        {
            ResourceChecker::removeSharedContext(reinterpret_cast<void*>(std::uintptr_t{id}));
            ResourceChecker::removeLookup(id, Texture);
        }
        Nib::AttachToThread(nullptr);
    };
    std::thread first([&] { work(1, "first"); });
    std::thread second([&] { work(1, "second"); }); // the same names in another context
    first.join();
    second.join();

    EXPECT_TRUE(ResourceChecker::textureDb.empty());
    EXPECT_TRUE(ResourceChecker::contextDb.empty());
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR), Texts{});
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN).size(), 2u * kNames);
}

TEST_F(ResourceCheckerTest, TheLockIsFreeAfterAnException)
{
    EXPECT_THROW(ResourceChecker::removeLookup(9, Texture), std::logic_error);
    EXPECT_THROW(ResourceChecker::checkLookup(9, Texture), std::logic_error);
    ResourceChecker::addLookup(9, Texture, nullptr);
    EXPECT_THROW(ResourceChecker::addLookup(9, Texture, nullptr), std::logic_error);

    std::thread other([this] { ResourceChecker::removeSharedContext(this); });
    other.join(); // would never end
}
