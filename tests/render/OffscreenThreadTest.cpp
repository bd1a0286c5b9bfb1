// The offscreen render thread: what it does not have in common with the front-buffer one.

#include "render/ChildThreadSupport.h"

using namespace Nib;

namespace
{

ThreadPtr NewThread(IGLMsgQueue* parent, bool managed = true)
{
    return ThreadPtr(GLES::CreateOffscreenRenderer(parent, "off", managed));
}

ThreadPtr StartedThread(IGLMsgQueue* parent, bool managed = true)
{
    ThreadPtr thread = NewThread(parent, managed);
    EXPECT_TRUE(thread->Start());
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());
    return thread;
}

// ---- construction -------------------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, HasTheUsualNiceValueBelowLevel29)
{
    SimDriver driver(ChildGpu());
    System::SetSDKVersion(28);
    ThreadPtr thread = StartedThread(nullptr);

    EXPECT_EQ(LinesWith(driver, "WorkerThread priority"),
              Lines({"I Nib::GLES::RenderThreadOffscreenGLImpl::RenderThreadOffscreenGLImpl("
                     "Nib::IGLMsgQueue *, const char *, bool) - WorkerThread priority for SDK:28 "
                     "set to 0"}));
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return RequestedNiceValue(); }), 0);
}

TEST(RenderThreadOffscreenGL, YieldsFromLevel29On)
{
    SimDriver driver(ChildGpu());
    System::SetSDKVersion(29);
    ThreadPtr thread = StartedThread(nullptr);

    EXPECT_EQ(LinesWith(driver, "WorkerThread priority"),
              Lines({"I Nib::GLES::RenderThreadOffscreenGLImpl::RenderThreadOffscreenGLImpl("
                     "Nib::IGLMsgQueue *, const char *, bool) - WorkerThread priority for SDK:29 "
                     "set to 10"}));
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return RequestedNiceValue(); }), 10);
}

// ---- start with a parent ------------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, StartUsesTheOrdinaryConfiguration)
{
    SimDriver driver(ChildGpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());

    EXPECT_EQ(driver.Context(ContextOf(*thread)).config, driver.Context(ContextOf(*parent)).config);
}

// ---- what EGL refuses ---------------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, GoesOnWithoutASurface)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = NewThread(nullptr);
    driver.FailNext("eglCreatePbufferSurface", EGL_BAD_ALLOC);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadOffscreenGLImpl::Init()",
                     "E bool Nib::GLES::RenderThreadOffscreenGLImpl::Init() - Failed to create "
                     "PBuffer surface"}));
    EXPECT_EQ(driver.CallCount("eglMakeCurrent"), 0u);
}

// ---- the priority of its context ----------------------------------------------------------------

TEST(RenderThreadOffscreenGL, PrefersMediumContextPriorityBelowLevel29)
{
    SimDriver driver(ChildGpu());
    System::SetSDKVersion(28);
    ThreadPtr thread = StartedThread(nullptr);

    EXPECT_EQ(driver.Context(ContextOf(*thread)).priority, 0x3102);
    EXPECT_EQ(LinesWith(driver, "Context priority"),
              Lines({"I static EglContext::Priority "
                     "Nib::GLES::RenderThreadOffscreenGLImpl::GetPrefferedContextPriority() - "
                     "Context priority for SDK:28 is 0x3102"}));
}

TEST(RenderThreadOffscreenGL, PrefersLowContextPriorityFromLevel29On)
{
    SimDriver driver(ChildGpu());
    System::SetSDKVersion(29);
    ThreadPtr thread = StartedThread(nullptr);

    EXPECT_EQ(driver.Context(ContextOf(*thread)).priority, 0x3103);
    EXPECT_EQ(LinesWith(driver, "Context priority"),
              Lines({"I static EglContext::Priority "
                     "Nib::GLES::RenderThreadOffscreenGLImpl::GetPrefferedContextPriority() - "
                     "Context priority for SDK:29 is 0x3103"}));
}

// ---- work ---------------------------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, RenderIsABarrierAndNoMore)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread(nullptr);
    std::atomic<int> ran{0};
    for (int i = 0; i < 20; ++i)
        Post(thread->GetMsgQueue(), [&] { ++ran; });
    driver.ForgetCalls();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(ran, 20);
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST(RenderThreadOffscreenGL, WaitForCompletingWritesItsLine)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread(nullptr);
    driver.ForgetLog();

    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(
        LinesWith(driver, ""),
        Lines({"I virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting()"}));
}

TEST(RenderThreadOffscreenGL, IgnoresSurfacesAndDirtyRectangles)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread(nullptr);
    driver.ForgetCalls();
    driver.ForgetLog();
    Gate gate(thread->GetMsgQueue()); // nothing of it waits for the thread

    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    thread->OnSurfaceDestroyed();
    thread->ApplyUpdateRect(RectF(0, 0, 8, 8), 1);
    thread->OnInput(7);

    EXPECT_FALSE(thread->IsAttachedToWindow());
    gate.Open();
    RunOn(thread->GetMsgQueue(), [] {});
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_TRUE(driver.Log().empty());
}

// ---- pause and resume ---------------------------------------------------------------------------

TEST(RenderThreadOffscreenGLPause, WaitForCompletingWritesBothLines)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread(nullptr);
    thread->OnPause();
    driver.ForgetLog();

    EXPECT_FALSE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting()",
                     "E virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting() - "
                     "worker is on pause!!!"}));
}

TEST(RenderThreadOffscreenGLPause, ResumeUsesTheFrontBufferConfigurationAndTheSamePriority)
{
    SimDriver driver(ChildGpu());
    System::SetSDKVersion(34);
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    const SimContextState before = driver.Context(ContextOf(*thread));
    thread->OnPause();

    thread->OnResume();
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    const SimContextState after = driver.Context(ContextOf(*thread));
    EXPECT_EQ(before.priority, 0x3103);
    EXPECT_EQ(after.priority, 0x3103);
    EXPECT_EQ(SurfaceTypeOf(driver, before), 0x0005);
    EXPECT_EQ(SurfaceTypeOf(driver, after), 0x1005);
    EXPECT_EQ(driver.CountLogContaining("Context priority for SDK:34 is 0x3103"), 2u);
}

TEST(RenderThreadOffscreenGLPause, UnmanagedObserversAreEmptyAndTheRestHappens)
{
    SimDriver driver(ChildGpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue(), false);
    driver.ForgetLog();

    thread->OnPause();
    thread->OnResume();
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(driver.CountLogContaining("ShaderManager::OnDestroyContext"), 1u);
    EXPECT_EQ(driver.CountLogContaining("ShaderManager::OnRestoreContext"), 1u);
    EXPECT_NE(ContextOf(*thread), EGL_NO_CONTEXT);
}

TEST(RenderThreadOffscreenGLPause, ResumeFailsOnADeviceWithoutFrontBufferAndTheThreadGoesOn)
{
    System::SetDesktopFallbacks(false);
    SimDriver driver(SimGpu::Default().WithoutFrontBuffer());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    EXPECT_NE(ContextOf(*thread), EGL_NO_CONTEXT);
    thread->OnPause();

    thread->OnResume();
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, "DoResume() "),
              Lines({"E void Nib::GLES::RenderThreadOffscreenGLImpl::DoResume() Failed to create "
                     "context"}));
    EXPECT_EQ(driver.CountLogContaining("required config is NULL (enableFrontBuffer = true)"), 1u);
    EXPECT_EQ(ContextOf(*thread), EGL_NO_CONTEXT);
}

// ---- end ----------------------------------------------------------------------------------------

TEST(RenderThreadOffscreenGLEnd, EndsThePbufferThenTheContextThenChecksTheShaders)
{
    SimDriver driver(ChildGpu());
    ThreadPtr thread = StartedThread(nullptr);
    const std::string self = Hex(thread.get());
    const std::string context = Hex(ContextOf(*thread));
    driver.ForgetCalls();
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglMakeCurrent", "eglDestroySurface", "eglDestroyContext"}));
    EXPECT_EQ(driver.CallingThreads(), 1u);
    EXPECT_EQ(LinesWith(driver, "DoTerminate"),
              Lines({"I void Nib::GLES::RenderThreadOffscreenGLImpl::DoTerminate() RenderThread: " +
                     self + ", Context: " + context}));
    EXPECT_EQ(driver.CountLogContaining("ShaderManager::CheckEmpty() All shaders was cleaned"), 1u);
    // The destructor of the empty context writes its line once more.
    EXPECT_EQ(EndsInOrder(driver), Lines({"context", "shaders", "context", "worker"}));
    EXPECT_EQ(driver.Live().contexts, 0);
    EXPECT_EQ(driver.Live().surfaces, 0);
}

} // namespace
