// The front-buffer render thread: its surfaces, and what else it does not have in common with the
// offscreen one. Its frames: FrontBufferFrameTest.cpp.

#include "render/ChildThreadSupport.h"

using namespace Nib;

namespace
{

ThreadPtr NewThread(IGLMsgQueue* parent)
{
    return ThreadPtr(GLES::CreateFBRSurfaceRenderer(parent, "front"));
}

ThreadPtr StartedThread(IGLMsgQueue* parent = nullptr)
{
    ThreadPtr thread = NewThread(parent);
    EXPECT_TRUE(thread->Start());
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());
    return thread;
}

// ---- start --------------------------------------------------------------------------------------

TEST(RenderThreadFBR, AsksForItsNiceValue)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();

    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return RequestedNiceValue(); }), -10);
}

TEST(RenderThreadFBR, HasAFrontBufferConfigurationAndHighPriority)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();

    const SimContextState context = driver.Context(ContextOf(*thread));
    EXPECT_EQ(context.priority, 0x3101);
    EXPECT_EQ(SurfaceTypeOf(driver, context), 0x1005);
}

TEST(RenderThreadFBR, GoesOnWithoutAContextOnADeviceWithoutFrontBuffer)
{
    System::SetDesktopFallbacks(false);
    SimDriver driver(SimGpu::Default().WithoutFrontBuffer());
    ThreadPtr thread = NewThread(nullptr);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadFBRImpl::Init()",
                     "E bool Nib::GLES::RenderThreadFBRImpl::Init() Failed to create context"}));
    EXPECT_EQ(driver.CountLogContaining("required config is NULL (enableFrontBuffer = true)"), 1u);
    EXPECT_EQ(driver.CallCount("eglCreatePbufferSurface"), 0u);
    EXPECT_EQ(ContextOf(*thread), EGL_NO_CONTEXT);
}

TEST(RenderThreadFBR, GoesOnWithoutASurface)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = NewThread(nullptr);
    driver.FailNext("eglCreatePbufferSurface", EGL_BAD_ALLOC);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadFBRImpl::Init()",
                     "E bool Nib::GLES::RenderThreadFBRImpl::Init() Failed to create context"}));
    EXPECT_EQ(driver.CallCount("eglMakeCurrent"), 0u);
}

// ---- surfaces -----------------------------------------------------------------------------------

TEST(RenderThreadFBR, OnSurfaceChangedFinishesThenAttaches)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();
    ANativeWindow* window = driver.Window(1920, 1080);
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceChanged(window, 1920, 1080, 0);

    EXPECT_TRUE(thread->IsAttachedToWindow());
    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"glFinish", "eglCreateWindowSurface", "eglMakeCurrent"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"window"}));
    EXPECT_EQ(LinesWith(driver, "RenderThreadFBRImpl::"),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::ChangeSurface(NativeWindowType, int, "
                     "int). ScreenRect = 1920 * 1080"}));
}

TEST(RenderThreadFBR, OnSurfaceChangedInitialisesNoUpdateRectangle)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();
    driver.ForgetLog();

    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);

    EXPECT_EQ(driver.CountLogContaining("UpdateRectangle"), 0u);
}

TEST(RenderThreadFBR, OnSurfaceChangedDetachesTheWindowBeforeAndFinishesTwice)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();
    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    driver.ForgetCalls();
    driver.ForgetLog();

    driver.AllowMisuse("glFinish"); // the second one comes when nothing is current
    thread->OnSurfaceChanged(driver.Window(16, 16), 16, 16, 0);

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"glFinish", "eglMakeCurrent", "eglDestroySurface", "glFinish",
                     "eglCreateWindowSurface", "eglMakeCurrent"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"none", "window"}));
    EXPECT_EQ(LinesWith(driver, "RenderThreadFBRImpl::"),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::ChangeSurface(NativeWindowType, int, "
                     "int). ScreenRect = 16 * 16",
                     "I void Nib::GLES::RenderThreadFBRImpl::DetachFromWindow()"}));
}

TEST(RenderThreadFBR, OnSurfaceChangedIgnoresItsLastArgument)
{
    SimDriver driver(ChildGpu());
    std::vector<std::vector<std::string>> calls;
    for (int last : {0, 1, -1})
    {
        ThreadPtr thread = StartedThread();
        driver.ForgetCalls();
        thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, last);
        calls.push_back(driver.CallNames());
    }

    EXPECT_EQ(calls[1], calls[0]);
    EXPECT_EQ(calls[2], calls[0]);
}

TEST(RenderThreadFBR, OnSurfaceDestroyedKeepsTheContextCurrentOnThePbuffer)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();
    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceDestroyed();

    EXPECT_FALSE(thread->IsAttachedToWindow());
    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"glFinish", "eglMakeCurrent", "eglDestroySurface", "eglMakeCurrent"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"none", "pbuffer"}));
    EXPECT_EQ(LinesWith(driver, "RenderThreadFBRImpl::"),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::DestroySurface()",
                     "I void Nib::GLES::RenderThreadFBRImpl::DetachFromWindow()"}));
}

TEST(RenderThreadFBR, OnSurfaceDestroyedWithoutAWindowWritesItsLineOnly)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceDestroyed();

    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::DestroySurface()"}));
}

// ---- surfaces while paused ----------------------------------------------------------------------

TEST(RenderThreadFBRPause, OnSurfaceChangedReturnsAtOnceWithAWarning)
{
    SimDriver driver(ChildGpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    thread->OnPause();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"W virtual void Nib::GLES::RenderThreadFBRImpl::OnSurfaceChanged(void *, int, "
                     "int, int) : Worker on pause. Not safe to call ChangeSurface as async "
                     "task!"}));
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_FALSE(thread->IsAttachedToWindow());
    driver.AllowMisuse("glFinish"); // at the end it runs without a context
}

TEST(RenderThreadFBRPause, OnSurfaceDestroyedReturnsAtOnceWithAWarning)
{
    SimDriver driver(ChildGpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    thread->OnPause();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceDestroyed();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"W virtual void Nib::GLES::RenderThreadFBRImpl::OnSurfaceDestroyed() : Worker "
                     "on pause. Not safe to call DestroySurface as async task!"}));
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_TRUE(thread->IsAttachedToWindow());
    driver.AllowMisuse("glFinish");
}

TEST(RenderThreadFBRPause, OnSurfaceDestroyedRunsAfterTheResume)
{
    SimDriver driver(ChildGpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    ANativeWindow* window = driver.Window(8, 8);
    thread->OnSurfaceChanged(window, 8, 8, 0);
    thread->OnPause();
    driver.AllowMisuse("glFinish"); // it runs before the new context is there
    driver.AllowMisuse("eglMakeCurrent");
    thread->OnSurfaceDestroyed();

    thread->OnResume();
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_FALSE(thread->IsAttachedToWindow());
    EXPECT_FALSE(driver.WindowState(window).connected);
}

TEST(RenderThreadFBRPause, SurfaceChangesRunAfterTheResumeInTheirOrder)
{
    SimDriver driver(ChildGpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    ANativeWindow* first = driver.Window(8, 8);
    ANativeWindow* second = driver.Window(16, 16);
    thread->OnPause();
    std::vector<std::string> order;
    driver.AllowMisuse("glFinish"); // these run before the new context is there
    driver.AllowMisuse("eglMakeCurrent");
    thread->OnSurfaceChanged(first, 8, 8, 0);
    Post(thread->GetMsgQueue(),
         [&] { order.push_back(driver.WindowState(first).connected ? "first" : "none"); });
    thread->OnSurfaceDestroyed();
    thread->OnSurfaceChanged(second, 16, 16, 0);
    Post(thread->GetMsgQueue(),
         [&] { order.push_back(driver.WindowState(second).connected ? "second" : "none"); });

    thread->OnResume();
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(order, Lines({"first", "second"}));
    EXPECT_TRUE(thread->IsAttachedToWindow());
    EXPECT_FALSE(driver.WindowState(first).connected);
    const EGLSurface current =
        AskOn(thread->GetMsgQueue(), [] { return eglGetCurrentSurface(EGL_DRAW); });
    EXPECT_TRUE(driver.Surface(current).window); // the resume made the new context current on it
    EXPECT_EQ(driver.Surface(current).width, 16);
}

TEST(RenderThreadFBRPause, SurfaceEventsBeforeTheStartWaitForIt)
{
    SimDriver driver(ChildGpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    thread->Start(); // waits for the parent

    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    EXPECT_FALSE(thread->IsAttachedToWindow());
    SimContext context(driver);
    parent.RunAll();
    RunOn(thread->GetMsgQueue(), [] {});

    EXPECT_TRUE(thread->IsAttachedToWindow());
    EXPECT_EQ(driver.CountLogContaining("Not safe to call ChangeSurface as async task!"), 1u);
}

// ---- pause and resume ---------------------------------------------------------------------------

TEST(RenderThreadFBRPause, ResumeMakesANewContextOnTheActiveSurface)
{
    SimDriver driver(ChildGpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    thread->OnPause();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnResume();
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglCreateContext", "eglMakeCurrent"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"window"}));
    const SimContextState context = driver.Context(ContextOf(*thread));
    EXPECT_EQ(context.share, ContextOf(*parent));
    EXPECT_EQ(context.priority, 0x3101);
    EXPECT_EQ(LinesWith(driver, "RenderThreadFBRImpl::").front(),
              "I virtual void Nib::GLES::RenderThreadFBRImpl::OnResume()");
    EXPECT_EQ(LinesWith(driver, "DoResume"),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::DoResume()"}));
    EXPECT_EQ(LinesWith(driver, "ShaderManager"),
              Lines({"I void Nib::ShaderManager::OnRestoreContext()"}));
}

TEST(RenderThreadFBRPause, RenderAndWaitReturnFalseAtOnce)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();
    thread->OnPause();
    driver.ForgetLog();

    EXPECT_FALSE(thread->Render());
    EXPECT_FALSE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual bool Nib::GLES::RenderThreadFBRImpl::waitForCompleting() - worker "
                     "is on pause!!!"}));
}

// ---- end ----------------------------------------------------------------------------------------

TEST(RenderThreadFBREnd, EndsBothSurfacesThenTheContextThenChecksTheShaders)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread();
    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    const std::string self = Hex(thread.get());
    const std::string context = Hex(ContextOf(*thread));
    driver.ForgetCalls();
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglMakeCurrent", "eglDestroySurface",
                                                   "eglDestroySurface", "eglDestroyContext"}));
    EXPECT_EQ(driver.CallingThreads(), 1u);
    EXPECT_EQ(LinesWith(driver, "DoTerminate"),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::DoTerminate() RenderThread: " + self +
                     ", Context: " + context}));
    EXPECT_EQ(driver.CountLogContaining("ShaderManager::CheckEmpty() All shaders was cleaned"), 1u);
    // The destructor of the empty context writes its line once more.
    EXPECT_EQ(EndsInOrder(driver), Lines({"context", "shaders", "context", "worker"}));
    EXPECT_EQ(driver.Live().contexts, 0);
    EXPECT_EQ(driver.Live().surfaces, 0);
}

TEST(RenderThreadFBREnd, OfAPausedThreadRunsWhatWaits)
{
    SimDriver driver(ChildGpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    thread->OnPause();
    std::atomic<bool> ran{false};
    Post(thread->GetMsgQueue(), [&] { ran = true; });
    driver.AllowMisuse("glFinish");
    driver.AllowMisuse("eglMakeCurrent");
    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);

    thread.reset();

    EXPECT_TRUE(ran);
    EXPECT_EQ(driver.Live().contexts, 2); // the shared one, the parent's
    EXPECT_EQ(driver.Live().surfaces, 1);
}

} // namespace
