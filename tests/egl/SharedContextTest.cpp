#include "egl/EglTestSupport.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <cstdlib>
#include <thread>

using Nib::EglContext;
using Nib::SharedContext;

namespace
{

const char kCreating[] =
    "static Nib::EglContext *Nib::SharedContext::GetInstance() Creating shared context";

} // namespace

TEST(SharedContext, IsMadeByTheFirstCall)
{
    OpenDisplay display;

    EglContext* shared = SharedContext::GetInstance();

    ASSERT_NE(shared, nullptr);
    const SimContextState state = display.driver.Context(shared->Get());
    EXPECT_TRUE(state.exists);
    EXPECT_EQ(state.share, EGL_NO_CONTEXT);
    EXPECT_EQ(state.clientVersion, 3);
    EXPECT_EQ(state.priority, 0x3102); // medium
    EXPECT_EQ(state.config, IndexOf(display.egl->GetConfig(false)));
}

TEST(SharedContext, CreationIsLogged)
{
    OpenDisplay display(SimGpu::Default().WithoutEglExtension("EGL_IMG_context_priority"));

    SharedContext::GetInstance();

    EXPECT_EQ(AllLines(display.driver), Lines({"I " + std::string(kCreating)}));
}

TEST(SharedContext, CreationComesBeforeThePriority)
{
    OpenDisplay display;

    SharedContext::GetInstance();

    EXPECT_EQ(AllLines(display.driver), Lines({"I " + std::string(kCreating),
                                               "I bool Nib::EglContext::Create(const EGLContext, "
                                               "bool, Nib::EglContext::Priority), "
                                               "Create context with priority: 0x3102"}));
}

TEST(SharedContext, OpensTheDisplayWhenNobodyHas)
{
    SimDriver driver;

    EXPECT_NE(SharedContext::GetInstance()->Get(), EGL_NO_CONTEXT);

    EXPECT_EQ(driver.CallCount("eglInitialize"), 1u);
}

TEST(SharedContext, IsTheSameEveryTime)
{
    OpenDisplay display;
    EglContext* shared = SharedContext::GetInstance();
    const EGLContext handle = shared->Get();
    display.driver.ForgetCalls();
    display.driver.ForgetLog();

    EXPECT_EQ(SharedContext::GetInstance(), shared);

    EXPECT_EQ(SharedContext::GetInstance()->Get(), handle);
    EXPECT_EQ(display.driver.CallCount(), 0u);
    EXPECT_EQ(display.driver.Log().size(), 0u);
}

TEST(SharedContext, IsMadeOnceWhenThreadsComeAtTheSameTime)
{
    // Given a thread that is making it
    OpenDisplay display;
    display.driver.Hold("eglCreateContext");
    std::array<EglContext*, 4> seen{};
    std::thread first([&] { seen[0] = SharedContext::GetInstance(); });
    display.driver.WaitUntilHeld("eglCreateContext");

    // When others want it before it is there
    std::array<std::thread, 3> others;
    for (std::size_t i = 0; i < others.size(); ++i)
    {
        others[i] = std::thread(
            [&seen, i]
            {
                seen[i + 1] = SharedContext::GetInstance();
                EXPECT_NE(seen[i + 1]->Get(), EGL_NO_CONTEXT) << "given out before it is ready";
            });
    }
    display.driver.Release("eglCreateContext");
    first.join();
    for (std::thread& other : others)
        other.join();

    // Then all of them have the same one
    for (EglContext* shared : seen)
        EXPECT_EQ(shared, SharedContext::GetInstance());
    EXPECT_EQ(display.driver.CallCount("eglCreateContext"), 1u);
    EXPECT_EQ(display.driver.CountLog(ANDROID_LOG_INFO, kCreating), 1u);
}

TEST(SharedContext, FailureLeavesAnEmptyContext)
{
    OpenDisplay display;
    display.driver.FailNext("eglCreateContext", EGL_BAD_ALLOC);

    EglContext* shared = SharedContext::GetInstance();

    ASSERT_NE(shared, nullptr);
    EXPECT_EQ(shared->Get(), EGL_NO_CONTEXT);
}

TEST(SharedContext, FailureIsNotTriedAgain)
{
    OpenDisplay display;
    display.driver.FailNext("eglCreateContext", EGL_BAD_ALLOC); // once
    EglContext* shared = SharedContext::GetInstance();

    EXPECT_EQ(SharedContext::GetInstance(), shared);

    EXPECT_EQ(shared->Get(), EGL_NO_CONTEXT);
    EXPECT_EQ(display.driver.CallCount("eglCreateContext"), 1u);
}

TEST(SharedContext, IsNeverMadeCurrent)
{
    OpenDisplay display;

    SharedContext::GetInstance();

    EXPECT_EQ(display.driver.CallCount("eglMakeCurrent"), 0u);
    EXPECT_EQ(display.driver.Surfaces().size(), 0u);
}

TEST(SharedContext, OthersShareItsObjects)
{
    OpenDisplay display;
    EglContext context;

    ASSERT_TRUE(
        context.Create(SharedContext::GetInstance()->Get(), false, EglContext::Priority::Medium));

    EXPECT_EQ(display.driver.Context(context.Get()).share, SharedContext::GetInstance()->Get());
}

TEST(SharedContext, IsDestroyedWhenTheProcessEnds)
{
    EXPECT_EXIT(
        {
            SimDriver driver;
            driver.OnCall("eglDestroyContext", [] { std::fputs("it is gone", stderr); });
            SharedContext::GetInstance();
            std::exit(0);
        },
        testing::ExitedWithCode(0), "it is gone");
}

TEST(SharedContext, IsDestroyedBeforeWhatTheDriverSetUpForItsOwnEnd)
{
    EXPECT_EXIT(
        {
            SimDriver driver;
            driver.OnCall("eglInitialize", []
                          { std::atexit([] { std::fputs("the driver has ended\n", stderr); }); });
            driver.OnCall("eglDestroyContext", [] { std::fputs("it is gone\n", stderr); });
            SharedContext::GetInstance();
            std::exit(0);
        },
        testing::ExitedWithCode(0), "it is gone\nthe driver has ended");
}

TEST(SharedContext, NothingIsMadeWhenTheProcessEndsWithoutOne)
{
    EXPECT_EXIT(
        {
            SimDriver driver;
            driver.OnCall("eglGetDisplay", [] { std::_Exit(7); });
            std::exit(0);
        },
        testing::ExitedWithCode(0), "");
}
