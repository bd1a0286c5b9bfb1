// The surface render thread: start, window, frames.

#include "render/SurfaceThreadSupport.h"

#include <nib/base.h>
#include <nib/device.h>

using namespace Nib;

namespace
{

using ThreadPtr = std::unique_ptr<RenderThreadGL>;

ThreadPtr NewThread(RenderThreadGL::RenderPriority priority = RenderThreadGL::Medium)
{
    return ThreadPtr(GLES::CreateSurfaceRenderer("surface", priority));
}

ThreadPtr StartedThread()
{
    ThreadPtr thread = NewThread();
    EXPECT_TRUE(thread->Start());
    return thread;
}

ThreadPtr StartedThread(ANativeWindow* window, int width, int height)
{
    ThreadPtr thread = StartedThread();
    thread->OnSurfaceChanged(window, width, height, 0);
    return thread;
}

EGLContext ContextOf(RenderThreadGL& thread)
{
    return AskOn(thread.GetMsgQueue(), [] { return eglGetCurrentContext(); });
}

EGLSurface SurfaceOf(RenderThreadGL& thread)
{
    return AskOn(thread.GetMsgQueue(), [] { return eglGetCurrentSurface(EGL_DRAW); });
}

// ---- start --------------------------------------------------------------------------------------

TEST(RenderThreadGL, StartMakesAContextAndAPbufferAndBindsThem)
{
    SimDriver driver;
    ThreadPtr thread = NewThread();
    const EGLContext shared = SharedContext::GetInstance()->Get();
    driver.ForgetCalls();

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglCreateContext", "eglCreatePbufferSurface", "eglMakeCurrent"}));
    EXPECT_EQ(driver.LastCall("eglCreateContext").args.at(2).Pointer(), shared);
    EXPECT_EQ(CurrentSurfaces(driver), Names({"pbuffer"}));
    EXPECT_EQ(driver.CallingThreads(), 1u);
    EXPECT_NE(driver.LastCall("eglMakeCurrent").thread, SimDriver::ThisThread());
}

TEST(RenderThreadGL, StartWritesItsLines)
{
    SimDriver driver;
    ThreadPtr thread = NewThread();

    thread->Start();

    EXPECT_EQ(LinesWith(driver, "RenderThreadGLImpl::"),
              Lines({"I bool Nib::GLES::RenderThreadGLImpl::Init()",
                     "I bool Nib::GLES::RenderThreadGLImpl::Init() RenderThread: " +
                         Hex(thread.get()) + ", Context: " + Hex(ContextOf(*thread))}));
}

TEST(RenderThreadGL, StartSharesWithTheProcessWideContext)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();

    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, SharedContext::GetInstance()->Get());
}

TEST(RenderThreadGL, StartBindsTheThreadToItsQueue)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();

    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }),
              thread->GetMsgQueue());
    EXPECT_EQ(GetCurrentMsgQueue(), nullptr); // the caller's thread is not
}

TEST(RenderThreadGL, StartReadsTheGLParameters)
{
    SimDriver driver;
    EXPECT_FALSE(OpenGLRenderer::IsGLParameterInited());

    ThreadPtr thread = StartedThread();

    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
}

TEST(RenderThreadGL, StartReturnsWhenTheContextIsCurrent)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();

    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
}

TEST(RenderThreadGL, AsksForItsNiceValue)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();

    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return RequestedNiceValue(); }), -9);
}

struct PriorityRow
{
    int priority;
    int context;
};

void PrintTo(const PriorityRow& row, std::ostream* out)
{
    *out << row.priority;
}

class SurfaceThreadPriority : public testing::TestWithParam<PriorityRow>
{
};

const PriorityRow kPriorityRows[] = {
    // render thread, context
    {0, 0x3101}, {1, 0x3102}, {2, 0x3103}, {3, 0x3102}, {100, 0x3102}, {-1, 0x3102},
};

INSTANTIATE_TEST_SUITE_P(Rows, SurfaceThreadPriority, testing::ValuesIn(kPriorityRows));

TEST_P(SurfaceThreadPriority, DecidesThatOfTheContext)
{
    SimDriver driver(SimGpu::Default().WithEglExtension("EGL_IMG_context_priority"));
    ThreadPtr thread = NewThread(static_cast<RenderThreadGL::RenderPriority>(GetParam().priority));

    thread->Start();

    EXPECT_EQ(driver.Context(ContextOf(*thread)).priority, GetParam().context);
}

TEST(RenderThreadGL, StartGoesOnWithoutAContextWhenEglRefusesOne)
{
    SimDriver driver;
    ThreadPtr thread = NewThread();
    SharedContext::GetInstance();
    driver.ForgetCalls();
    driver.FailNext("eglCreateContext", EGL_BAD_ALLOC);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "RenderThreadGLImpl::"),
              Lines({"I bool Nib::GLES::RenderThreadGLImpl::Init()",
                     "E bool Nib::GLES::RenderThreadGLImpl::Init() Failed to create context"}));
    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglCreateContext"}));
    EXPECT_EQ(ContextOf(*thread), EGL_NO_CONTEXT);
}

TEST(RenderThreadGL, StartGoesOnWithoutAContextWhenEglRefusesThePbuffer)
{
    SimDriver driver;
    ThreadPtr thread = NewThread();
    SharedContext::GetInstance();
    driver.ForgetCalls();
    driver.FailNext("eglCreatePbufferSurface", EGL_BAD_ALLOC);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "RenderThreadGLImpl::"),
              Lines({"I bool Nib::GLES::RenderThreadGLImpl::Init()",
                     "E bool Nib::GLES::RenderThreadGLImpl::Init() Failed to create context"}));
    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglCreateContext", "eglCreatePbufferSurface"}));
    EXPECT_EQ(ContextOf(*thread), EGL_NO_CONTEXT);
}

TEST(RenderThreadGL, StartGoesOnUnboundWhenTheContextCannotBeMadeCurrent)
{
    SimDriver driver;
    ThreadPtr thread = NewThread();
    driver.FailNext("eglMakeCurrent", EGL_BAD_ACCESS);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "RenderThreadGLImpl::"),
              Lines({"I bool Nib::GLES::RenderThreadGLImpl::Init()",
                     "E bool Nib::GLES::RenderThreadGLImpl::Init() Failed to MakeCurrent"}));
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }), nullptr);
    EXPECT_FALSE(OpenGLRenderer::IsGLParameterInited());
}

TEST(RenderThreadGLDeathTest, StartBlocksForEverWithoutAThread)
{
    // The child ends with 0 when Start has handed its task to a thread that there is not, and has
    // still not come back long after.
    const auto blocksInStart = []
    {
        SimDriver driver;
        ThreadPtr thread = NewThread();
        Event returned;
        std::thread caller;
        Event calling;
        // The caller exists before no further thread can be started.
        caller = std::thread(
            [&]
            {
                calling.Wait();
                thread->Start();
                returned.Set();
            });
        const NoMoreThreads noMore;
        calling.Set();
        while (driver.CountLogContaining("Failed to start thrtead") == 0)
            std::this_thread::yield();
        // "Never" is a time-out here: nothing wakes this wait but a return that must not come.
        const bool cameBack = returned.WaitFor(std::chrono::milliseconds(300));
        std::_Exit(cameBack ? 1 : 0);
    };

    EXPECT_EXIT(blocksInStart(), testing::ExitedWithCode(0), "");
}

// ---- the window ---------------------------------------------------------------------------------

TEST(RenderThreadGL, OnSurfaceChangedAttachesTheWindow)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    ANativeWindow* window = driver.Window(1080, 1920);
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceChanged(window, 1080, 1920, 0);

    EXPECT_TRUE(thread->IsAttachedToWindow());
    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglCreateWindowSurface", "eglMakeCurrent"}));
    EXPECT_EQ(driver.LastCall("eglCreateWindowSurface").args.at(2).Pointer(), window);
    EXPECT_EQ(CurrentSurfaces(driver), Names({"window"}));
    EXPECT_EQ(driver.CallingThreads(), 1u);
    EXPECT_EQ(LinesWith(driver, "RenderThreadGLImpl::"),
              Lines({"I void Nib::GLES::RenderThreadGLImpl::ChangeSurface(NativeWindowType, int, "
                     "int)"}));
}

TEST(RenderThreadGL, OnSurfaceChangedTellsTheUpdateRectangleTheSizeGiven)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    driver.ForgetLog();

    thread->OnSurfaceChanged(driver.Window(1080, 1920), 540, 960, 0); // not that of the window

    EXPECT_EQ(LinesWith(driver, "SetScreenRect"),
              Lines({"I void Nib::UpdateRectangle::SetScreenRect(int, int). ScreenRect = 540 * "
                     "960"}));
}

TEST(RenderThreadGL, OnSurfaceChangedRunsBehindTheQueuedTasks)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    std::atomic<bool> wasAttached{true};
    Post(thread->GetMsgQueue(), [&] { wasAttached = thread->IsAttachedToWindow(); });

    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);

    EXPECT_FALSE(wasAttached); // ran, and before
    EXPECT_TRUE(thread->IsAttachedToWindow());
}

TEST(RenderThreadGL, OnSurfaceChangedDetachesTheWindowBefore)
{
    SimDriver driver;
    ANativeWindow* before = driver.Window(8, 8);
    ANativeWindow* after = driver.Window(16, 16);
    ThreadPtr thread = StartedThread(before, 8, 8);
    const EGLSurface old = SurfaceOf(*thread);
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceChanged(after, 16, 16, 0);

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"glFinish", "eglMakeCurrent", "eglDestroySurface", "eglCreateWindowSurface",
                     "eglMakeCurrent"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"none", "window"}));
    EXPECT_EQ(driver.LastCall("eglDestroySurface").args.at(1).Pointer(), old);
    EXPECT_EQ(LinesWith(driver, "RenderThreadGLImpl::"),
              Lines({"I void Nib::GLES::RenderThreadGLImpl::ChangeSurface(NativeWindowType, int, "
                     "int)",
                     "I void Nib::GLES::RenderThreadGLImpl::DetachFromWindow()"}));
    EXPECT_FALSE(driver.WindowState(before).connected);
    EXPECT_TRUE(driver.WindowState(after).connected);
}

TEST(RenderThreadGL, OnSurfaceChangedMayNameTheSameWindowAgain)
{
    SimDriver driver;
    ANativeWindow* window = driver.Window(8, 8);
    ThreadPtr thread = StartedThread(window, 8, 8);
    driver.ResizeWindow(window, 16, 16);

    thread->OnSurfaceChanged(window, 16, 16, 0);

    EXPECT_TRUE(thread->IsAttachedToWindow());
    EXPECT_EQ(driver.Surface(SurfaceOf(*thread)).width, 16);
}

TEST(RenderThreadGL, OnSurfaceChangedIgnoresItsLastArgument)
{
    std::vector<std::vector<std::string>> calls;
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    for (int last : {0, 1, -1, 2147483647})
    {
        thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, last); // detaches the one before
        driver.ForgetCalls();
        thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, last);
        calls.push_back(driver.CallNames());
    }

    EXPECT_EQ(calls[1], calls[0]);
    EXPECT_EQ(calls[2], calls[0]);
    EXPECT_EQ(calls[3], calls[0]);
}

TEST(RenderThreadGL, OnSurfaceChangedFallsBackOnThePbufferWithoutAWindowSurface)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    ANativeWindow* window = driver.Window(8, 8);
    driver.AbandonWindow(window);
    driver.ForgetCalls();

    thread->OnSurfaceChanged(window, 8, 8, 0);

    EXPECT_FALSE(thread->IsAttachedToWindow());
    EXPECT_EQ(CurrentSurfaces(driver), Names({"pbuffer"}));
    EXPECT_NE(ContextOf(*thread), EGL_NO_CONTEXT);
}

TEST(RenderThreadGL, OnSurfaceChangedGoesOnWhenTheContextCannotBeMadeCurrent)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    driver.ForgetLog();
    driver.FailNext("eglMakeCurrent", EGL_BAD_ALLOC);

    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);

    EXPECT_TRUE(thread->IsAttachedToWindow());
    EXPECT_EQ(driver.CountLogContaining("SetScreenRect(int, int). ScreenRect = 8 * 8"), 1u);
}

TEST(RenderThreadGL, OnSurfaceDestroyedKeepsTheContextCurrentOnThePbuffer)
{
    SimDriver driver;
    ANativeWindow* window = driver.Window(8, 8);
    ThreadPtr thread = StartedThread(window, 8, 8);
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceDestroyed();

    EXPECT_FALSE(thread->IsAttachedToWindow());
    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"glFinish", "eglMakeCurrent", "eglDestroySurface", "eglMakeCurrent"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"none", "pbuffer"}));
    EXPECT_EQ(LinesWith(driver, "RenderThreadGLImpl::"),
              Lines({"I void Nib::GLES::RenderThreadGLImpl::DestroySurface()",
                     "I void Nib::GLES::RenderThreadGLImpl::DetachFromWindow()"}));
    EXPECT_FALSE(driver.WindowState(window).connected);
    EXPECT_NE(ContextOf(*thread), EGL_NO_CONTEXT);
}

TEST(RenderThreadGL, OnSurfaceDestroyedWithoutAWindowWritesItsLineOnly)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceDestroyed();

    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I void Nib::GLES::RenderThreadGLImpl::DestroySurface()"}));
}

TEST(RenderThreadGL, IsAttachedToWindowDoesNotWaitForTheThread)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread(driver.Window(8, 8), 8, 8);
    Gate gate(thread->GetMsgQueue());

    EXPECT_TRUE(thread->IsAttachedToWindow());
}

// ---- frames -------------------------------------------------------------------------------------

TEST(RenderThreadGL, RenderDropsDepthAndStencilThenSwaps)
{
    SimDriver driver;
    ANativeWindow* window = driver.Window(1080, 1920);
    ThreadPtr thread = StartedThread(window, 1080, 1920);
    driver.ForgetCalls();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(driver.CallNames(),
              Names({"glGetIntegerv", "glInvalidateFramebuffer", "eglSwapBuffers"}));
    EXPECT_EQ(driver.CallingThreads(), 1u);
    EXPECT_NE(driver.LastCall("eglSwapBuffers").thread, SimDriver::ThisThread());
    EXPECT_EQ(driver.WindowState(window).presented, 1);
}

TEST(RenderThreadGL, RenderShowsWhatTheTasksBeforeItDrew)
{
    SimDriver driver;
    ANativeWindow* window = driver.Window(8, 8);
    ThreadPtr thread = StartedThread(window, 8, 8);

    Post(thread->GetMsgQueue(),
         []
         {
             OpenGLRenderer::setClearColor(1, 0, 0, 1);
             OpenGLRenderer::clear(true, false, false);
         });
    thread->Render();

    EXPECT_EQ(driver.FrontPixel(window, 3, 3), (SimPixel{255, 0, 0, 255}));
}

TEST(RenderThreadGL, RenderWithoutAWindowOnlyWaitsForTheGpu)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    driver.ForgetCalls();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(driver.CallNames(), Names({"glFinish"}));
}

TEST(RenderThreadGL, RenderEndsTilingBeforeItDropsDepthAndStencil)
{
    SimDriver driver(SimGpu::Named("Adreno (TM) 540").WithGlExtension("GL_QCOM_tiled_rendering"));
    ThreadPtr thread = StartedThread(driver.Window(64, 64), 64, 64);
    thread->ApplyUpdateRect(RectF(0, 0, 64, 64), 0);
    thread->GetMsgQueue()->waitForCompleting();
    driver.ForgetCalls();

    thread->Render();

    EXPECT_EQ(driver.CallNames(), Names({"glEndTilingQCOM", "glGetIntegerv",
                                         "glInvalidateFramebuffer", "eglSwapBuffers"}));
}

TEST(RenderThreadGL, ApplyUpdateRectReachesTheUpdateRectangle)
{
    SimDriver driver(SimGpu::Named("Adreno (TM) 540")
                         .WithGlExtension("GL_QCOM_tiled_rendering")
                         .WithBufferAges({2}));
    ThreadPtr thread = StartedThread(driver.Window(1080, 1920), 1080, 1920);
    for (int frame = 0; frame < 3; ++frame) // a new window redraws everything for three frames
    {
        thread->ApplyUpdateRect(RectF(100, 200, 300, 260), 0);
        thread->Render();
    }
    driver.ForgetCalls();

    RectF rect(100, 200, 300, 260);
    thread->ApplyUpdateRect(rect, 0);
    thread->GetMsgQueue()->waitForCompleting();

    EXPECT_EQ(driver.LastCall("glStartTilingQCOM"),
              Call("glStartTilingQCOM", 100, 1660, 200, 60, 0));
    EXPECT_NE(driver.LastCall("glStartTilingQCOM").thread, SimDriver::ThisThread());
}

TEST(RenderThreadGL, ApplyUpdateRectCopiesAndDoesNotWait)
{
    SimDriver driver(
        SimGpu::Default().WithEglExtension("EGL_NV_post_sub_buffer").WithPostSubBuffer());
    ThreadPtr thread = StartedThread(driver.Window(100, 100), 100, 100);
    Gate gate(thread->GetMsgQueue());
    RectF rect(10, 20, 40, 60);

    thread->ApplyUpdateRect(rect, 0); // returns while the thread is held
    rect = RectF(0, 0, 1, 1);
    gate.Open();
    thread->Render();

    const SimCall post = driver.LastCall("eglPostSubBufferNV");
    EXPECT_EQ(post.Arg(2), 10);
    EXPECT_EQ(post.Arg(3), 20);
    EXPECT_EQ(post.Arg(4), 30);
    EXPECT_EQ(post.Arg(5), 40);
}

// ---- the damage of a frame ----------------------------------------------------------------------

/// A device that is told the damage of each frame.
SimGpu DamageGpu()
{
    return SimGpu::Named("Mali-G72")
        .WithEglExtension("EGL_KHR_partial_update")
        .WithEglExtension("EGL_KHR_swap_buffers_with_damage");
}

using Damage = std::vector<long long>;

TEST(RenderThreadGL, PresentsWithTheDamageOfTheFrame)
{
    SimDriver driver(DamageGpu());
    ANativeWindow* window = driver.Window(1920, 1080);
    ThreadPtr thread = StartedThread(window, 1920, 1080);

    thread->ApplyUpdateRect(RectF(10, 20, 60, 70), 0);
    thread->ApplyUpdateRect(RectF(50, 30, 110, 40), 0);
    thread->Render();

    EXPECT_EQ(driver.WindowState(window).lastDamage, (Damage{10, 1010, 100, 50}));
    EXPECT_EQ(driver.CallCount("eglSwapBuffers"), 0u);
}

TEST(RenderThreadGL, PresentsAllOfTheSurfaceWhenNoDamageIsKnown)
{
    SimDriver driver(DamageGpu());
    ANativeWindow* window = driver.Window(1920, 1080);
    ThreadPtr thread = StartedThread(window, 1920, 1080);
    thread->ApplyUpdateRect(RectF(10, 20, 60, 70), 0);
    thread->Render();

    thread->Render();

    EXPECT_EQ(driver.WindowState(window).lastDamage, (Damage{0, 0, 1920, 1080}));
}

TEST(RenderThreadGL, PresentsAllOfTheSurfaceWhenTheDamageIsOutside)
{
    SimDriver driver(DamageGpu());
    ANativeWindow* window = driver.Window(1920, 1080);
    ThreadPtr thread = StartedThread(window, 1920, 1080);

    thread->ApplyUpdateRect(RectF(10, 1200, 60, 1300), 0);
    thread->Render();

    EXPECT_EQ(driver.WindowState(window).lastDamage, (Damage{0, 0, 1920, 1080}));
}

TEST(RenderThreadGL, AFrameWithoutAWindowLeavesNoDamageBehind)
{
    SimDriver driver(DamageGpu());
    ThreadPtr thread = StartedThread();
    thread->ApplyUpdateRect(RectF(10, 20, 60, 70), 0);
    thread->Render();
    ANativeWindow* window = driver.Window(1920, 1080);
    thread->OnSurfaceChanged(window, 1920, 1080, 0);

    thread->Render();

    EXPECT_EQ(driver.WindowState(window).lastDamage, (Damage{0, 0, 1920, 1080}));
}

// ---- pause and resume ---------------------------------------------------------------------------

TEST(RenderThreadGL, CannotBePaused)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual void Nib::GLES::RenderThreadGLImpl::OnPause(). NOT SUPPRORTED by "
                     "this implementation"}));
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());
}

TEST(RenderThreadGL, CannotBeResumed)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnResume();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual void Nib::GLES::RenderThreadGLImpl::OnResume(). NOT SUPPRORTED by "
                     "this implementation"}));
    EXPECT_EQ(driver.CallCount(), 0u);
}

} // namespace
