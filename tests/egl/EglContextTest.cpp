#include "egl/EglTestSupport.h"

#include <gtest/gtest.h>

using Nib::EglContext;

namespace
{

using Values = std::vector<long long>;
using Priority = EglContext::Priority;

const char kCreate[] =
    "bool Nib::EglContext::Create(const EGLContext, bool, Nib::EglContext::Priority)";
const char kDestroy[] = "void Nib::EglContext::Destroy()";

/// Without priorities, and with one configuration that is no front buffer's.
SimGpu PlainDevice()
{
    return SimGpu::Default()
        .WithEglExtensions({"EGL_KHR_fence_sync"})
        .WithConfigs({Bits(8, 8, 8, 8, 0, 0)});
}

SimGpu PriorityDevice()
{
    return PlainDevice().WithEglExtension("EGL_IMG_context_priority");
}

} // namespace

TEST(EglContext, IsEmptyAtFirst)
{
    EglContext context;

    EXPECT_EQ(context.Get(), EGL_NO_CONTEXT);
}

TEST(EglContext, PrioritiesAreTheTokensOfEgl)
{
    EXPECT_EQ(static_cast<int>(Priority::High), 0x3101);
    EXPECT_EQ(static_cast<int>(Priority::Medium), 0x3102);
    EXPECT_EQ(static_cast<int>(Priority::Low), 0x3103);
}

// ---- Create -------------------------------------------------------------------------------------

TEST(EglContext, CreateAsksForVersionThree)
{
    OpenDisplay display(PlainDevice());
    EglContext context;

    EXPECT_TRUE(context.Create(EGL_NO_CONTEXT, false, Priority::High));

    const SimCall create = display.driver.LastCall("eglCreateContext");
    EXPECT_EQ(create, Call("eglCreateContext", display.egl->GetDisplay(),
                           display.egl->GetConfig(false), nullptr, create.args.at(3)));
    EXPECT_EQ(create.list, (Values{0x3098, 3})); // EGL_CONTEXT_CLIENT_VERSION
    EXPECT_EQ(display.driver.Contexts(), std::vector<EGLContext>{context.Get()});
}

TEST(EglContext, CreateWithoutPrioritiesSaysNothing)
{
    OpenDisplay display(PlainDevice());
    EglContext context;

    EXPECT_TRUE(context.Create(EGL_NO_CONTEXT, false, Priority::High));

    EXPECT_EQ(display.driver.CallNames(), Names({"eglQueryString", "eglCreateContext"}));
    EXPECT_EQ(display.driver.Log().size(), 0u);
}

TEST(EglContext, EachPriorityIsPassedBehindTheVersion)
{
    OpenDisplay display(PriorityDevice());
    for (const int priority : {0x3101, 0x3102, 0x3103})
    {
        EglContext context;

        EXPECT_TRUE(context.Create(EGL_NO_CONTEXT, false, static_cast<Priority>(priority)));

        EXPECT_EQ(display.driver.LastCall("eglCreateContext").list,
                  (Values{0x3098, 3, 0x3100, priority})); // EGL_CONTEXT_PRIORITY_LEVEL_IMG
        EXPECT_EQ(display.driver.Context(context.Get()).priority, priority);
    }
}

TEST(EglContext, PriorityIsLogged)
{
    OpenDisplay display(PriorityDevice());
    EglContext context;

    context.Create(EGL_NO_CONTEXT, false, Priority::Low);

    EXPECT_EQ(AllLines(display.driver),
              Lines({"I " + std::string(kCreate) + ", Create context with priority: 0x3103"}));
}

TEST(EglContext, LongerExtensionNameMeansPriorities)
{
    OpenDisplay display(PlainDevice().WithEglExtensions({"EGL_IMG_context_priority_mock"}));
    display.driver.AllowMisuse("eglCreateContext"); // no such attribute then
    EglContext context;

    EXPECT_FALSE(context.Create(EGL_NO_CONTEXT, false, Priority::High));

    EXPECT_EQ(display.driver.LastCall("eglCreateContext").list,
              (Values{0x3098, 3, 0x3100, 0x3101}));
}

TEST(EglContext, ShareContextOfVersionTwoMakesVersionTwo)
{
    OpenDisplay display(PlainDevice());
    SimContext parent(display.driver, 2);
    EglContext context;

    EXPECT_TRUE(context.Create(parent.Handle(), false, Priority::Medium));

    const SimContextState state = display.driver.Context(context.Get());
    EXPECT_EQ(state.clientVersion, 2);
    EXPECT_EQ(state.share, parent.Handle());
    EXPECT_EQ(display.driver.LastCall("eglCreateContext").list, (Values{0x3098, 2}));
    EXPECT_EQ(AllLines(display.driver),
              Lines({"I " + std::string(kCreate) + ", Shared context client version 2"}));
}

TEST(EglContext, ShareContextOfVersionThreeMakesVersionThree)
{
    OpenDisplay display(PriorityDevice());
    SimContext parent(display.driver, 3);
    EglContext context;

    EXPECT_TRUE(context.Create(parent.Handle(), false, Priority::Medium));

    EXPECT_EQ(display.driver.CallNames(),
              Names({"eglQueryContext", "eglQueryString", "eglCreateContext"}));
    EXPECT_EQ(display.driver.LastCall("eglQueryContext").Arg(2), 0x3098);
    EXPECT_EQ(AllLines(display.driver),
              Lines({"I " + std::string(kCreate) + ", Shared context client version 3",
                     "I " + std::string(kCreate) + ", Create context with priority: 0x3102"}));
}

TEST(EglContext, VersionIsThreeWhenTheShareContextDoesNotTell)
{
    OpenDisplay display(PlainDevice());
    SimContext parent(display.driver, 3);
    display.driver.FailNext("eglQueryContext", EGL_BAD_CONTEXT);
    EglContext context;

    EXPECT_TRUE(context.Create(parent.Handle(), false, Priority::Medium));

    EXPECT_EQ(display.driver.LastCall("eglCreateContext").list, (Values{0x3098, 3}));
    EXPECT_EQ(AllLines(display.driver),
              Lines({"I " + std::string(kCreate) + ", Shared context client version 3"}));
}

TEST(EglContext, FrontBufferUsesItsOwnConfiguration)
{
    SimConfig flexible = Bits(8, 8, 8, 8, 16, 0);
    flexible.surfaceType = 0x1005;
    OpenDisplay display(SimGpu::Default()
                            .WithEglExtension("EGL_KHR_mutable_render_buffer")
                            .WithConfigs({Bits(8, 8, 8, 8, 0, 0), flexible}));
    EglContext ordinary;
    EglContext frontBuffer;

    EXPECT_TRUE(ordinary.Create(EGL_NO_CONTEXT, false, Priority::Medium));
    EXPECT_TRUE(frontBuffer.Create(EGL_NO_CONTEXT, true, Priority::Medium));

    EXPECT_EQ(display.driver.Context(ordinary.Get()).config, 0);
    EXPECT_EQ(display.driver.Context(frontBuffer.Get()).config, 1);
}

TEST(EglContext, FrontBufferWithoutAConfigurationFails)
{
    OpenDisplay display(PlainDevice());
    EglContext context;

    EXPECT_FALSE(context.Create(EGL_NO_CONTEXT, true, Priority::High));

    EXPECT_EQ(context.Get(), EGL_NO_CONTEXT);
    EXPECT_EQ(display.driver.CallCount("eglCreateContext"), 0u);
    EXPECT_EQ(AllLines(display.driver),
              Lines({"E " + std::string(kCreate) +
                     " - required config is NULL (enableFrontBuffer = true)"}));
}

TEST(EglContext, WithoutAnyConfigurationThePriorityIsStillAnnounced)
{
    OpenDisplay display(PriorityDevice().WithConfigs({Bits(5, 6, 5, 0, 0, 0)}));
    EglContext context;

    EXPECT_FALSE(context.Create(EGL_NO_CONTEXT, false, Priority::Medium));

    EXPECT_EQ(AllLines(display.driver),
              Lines({"I " + std::string(kCreate) + ", Create context with priority: 0x3102",
                     "E " + std::string(kCreate) +
                         " - required config is NULL (enableFrontBuffer = false)"}));
}

TEST(EglContext, RefusalIsLogged)
{
    OpenDisplay display(PlainDevice());
    display.driver.FailNext("eglCreateContext", EGL_BAD_ALLOC);
    EglContext context;

    EXPECT_FALSE(context.Create(EGL_NO_CONTEXT, false, Priority::Medium));

    // 12291 is EGL_BAD_ALLOC.
    EXPECT_EQ(context.Get(), EGL_NO_CONTEXT);
    EXPECT_EQ(AllLines(display.driver),
              Lines({"E " + std::string(kCreate) + ": eglCreateContext. Error:12291"}));
}

TEST(EglContext, CreateOverwritesWithoutDestroying)
{
    OpenDisplay display(PlainDevice());
    EglContext context;
    context.Create(EGL_NO_CONTEXT, false, Priority::Medium);
    const EGLContext first = context.Get();

    EXPECT_TRUE(context.Create(EGL_NO_CONTEXT, false, Priority::Medium));

    EXPECT_NE(context.Get(), first);
    EXPECT_EQ(display.driver.CallCount("eglDestroyContext"), 0u);
    EXPECT_TRUE(display.driver.Context(first).exists);
}

// ---- Destroy ------------------------------------------------------------------------------------

TEST(EglContext, DestroyEndsTheContext)
{
    OpenDisplay display(PlainDevice());
    EglContext context;
    context.Create(EGL_NO_CONTEXT, false, Priority::Medium);
    const EGLContext handle = context.Get();
    display.driver.ForgetCalls();

    context.Destroy();

    EXPECT_EQ(context.Get(), EGL_NO_CONTEXT);
    EXPECT_EQ(display.driver.Calls(),
              Sequence({Call("eglDestroyContext", display.egl->GetDisplay(), handle)}));
    EXPECT_EQ(AllLines(display.driver), Lines({"I " + std::string(kDestroy)}));
}

TEST(EglContext, DestroyingTwiceLogsTwiceAndDestroysOnce)
{
    OpenDisplay display(PlainDevice());
    EglContext context;
    context.Create(EGL_NO_CONTEXT, false, Priority::Medium);

    context.Destroy();
    context.Destroy();

    EXPECT_EQ(display.driver.CallCount("eglDestroyContext"), 1u);
    EXPECT_EQ(display.driver.CountLog(ANDROID_LOG_INFO, kDestroy), 2u);
}

TEST(EglContext, DestroyedOneCanBeCreatedAgain)
{
    OpenDisplay display(PlainDevice());
    EglContext context;
    context.Create(EGL_NO_CONTEXT, false, Priority::Medium);
    context.Destroy();

    EXPECT_TRUE(context.Create(EGL_NO_CONTEXT, false, Priority::Low));

    EXPECT_EQ(display.driver.Contexts(), std::vector<EGLContext>{context.Get()});
}

TEST(EglContext, DestructorDestroys)
{
    OpenDisplay display(PlainDevice());
    {
        EglContext context;
        context.Create(EGL_NO_CONTEXT, false, Priority::Medium);
        display.driver.ForgetLog();
    }

    EXPECT_EQ(display.driver.CallCount("eglDestroyContext"), 1u);
    EXPECT_EQ(AllLines(display.driver), Lines({"I " + std::string(kDestroy)}));
    EXPECT_EQ(display.driver.Contexts().size(), 0u);
}

TEST(EglContext, DestructorOfAnEmptyOneOnlyLogs)
{
    OpenDisplay display(PlainDevice());
    {
        EglContext context;
    }

    EXPECT_EQ(display.driver.CallCount(), 0u);
    EXPECT_EQ(AllLines(display.driver), Lines({"I " + std::string(kDestroy)}));
}

TEST(EglContext, DestructorOfADestroyedOneLogsAgain)
{
    OpenDisplay display(PlainDevice());
    {
        EglContext context;
        context.Create(EGL_NO_CONTEXT, false, Priority::Medium);
        context.Destroy();
    }

    EXPECT_EQ(display.driver.CallCount("eglDestroyContext"), 1u);
    EXPECT_EQ(display.driver.CountLog(ANDROID_LOG_INFO, kDestroy), 2u);
}
