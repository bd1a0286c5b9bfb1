// The front-buffer render thread: start, pause, surfaces, end. Its frames:
// FrontBufferFrameTest.cpp.

#include "render/SurfaceThreadSupport.h"

#include <nib/base.h>
#include <nib/device.h>

using namespace Nib;

namespace
{

using ThreadPtr = std::unique_ptr<RenderThreadGL>;

SimGpu Gpu()
{
    return SimGpu::Default().WithFrontBuffer().WithEglExtension("EGL_IMG_context_priority");
}

ThreadPtr StartedParent()
{
    ThreadPtr parent(GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    EXPECT_TRUE(parent->Start());
    return parent;
}

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

EGLContext ContextOf(RenderThreadGL& thread)
{
    return AskOn(thread.GetMsgQueue(), [] { return eglGetCurrentContext(); });
}

// ---- start --------------------------------------------------------------------------------------

TEST(RenderThreadFBR, AsksForItsNiceValue)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread();

    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return RequestedNiceValue(); }), -10);
}

TEST(RenderThreadFBR, WithoutAParentSharesWithNothing)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = NewThread(nullptr);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglCreateContext", "eglCreatePbufferSurface", "eglMakeCurrent"}));
    EXPECT_EQ(driver.LastCall("eglCreateContext").args.at(2).Pointer(), nullptr);
    EXPECT_EQ(LinesWith(driver, "RenderThreadFBRImpl::"),
              Lines({"I virtual bool Nib::GLES::RenderThreadFBRImpl::Start() - Parent renderer is "
                     "null. Initialize with independent context",
                     "I bool Nib::GLES::RenderThreadFBRImpl::Init()",
                     "I bool Nib::GLES::RenderThreadFBRImpl::Init() RenderThread: " +
                         Hex(thread.get()) + ", Context: " + Hex(ContextOf(*thread))}));
}

TEST(RenderThreadFBR, SharesWithTheContextOfItsParent)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    driver.ForgetLog();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());

    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, ContextOf(*parent));
    EXPECT_EQ(LinesWith(driver, "::Start() - Parent"),
              Lines({"I virtual bool Nib::GLES::RenderThreadFBRImpl::Start() - Parent renderer is "
                     "\"parent\". Start paused and wait for parent context"}));
    EXPECT_EQ(LinesWith(driver, "GetContextAndResume"),
              Lines({"I static void Nib::GLES::RenderThreadFBRImpl::GetContextAndResume("
                     "std::shared_ptr<IWorkerThread>, std::shared_ptr<EGLContext>), OK! Parent "
                     "context: " +
                     Hex(ContextOf(*parent))}));
}

TEST(RenderThreadFBR, HasAFrontBufferConfigurationAndHighPriority)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread();

    const SimContextState context = driver.Context(ContextOf(*thread));
    const int surfaceType =
        driver.Gpu().configs.at(static_cast<std::size_t>(context.config)).surfaceType;
    EXPECT_EQ(context.priority, 0x3101);
    EXPECT_EQ(surfaceType & 0x1000, 0x1000);
}

TEST(RenderThreadFBR, BindsTheThreadToItsQueueAndReadsTheGLParameters)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread();

    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }),
              thread->GetMsgQueue());
    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
}

TEST(RenderThreadFBR, StartWaitsForTheParentsAnswerOnly)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(parent.Count(), 1u);
    EXPECT_EQ(parent.Waits(), 1);
    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
    EXPECT_EQ(driver.CountLogContaining("Init()"), 0u);
}

TEST(RenderThreadFBR, GetsAContextOfItsOwnWhenTheParentHasNone)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    parent.RunWhileWaitedFor();

    ThreadPtr thread = StartedThread(&parent);

    EXPECT_EQ(LinesWith(driver, "GetContextAndResume"),
              Lines({"E static void Nib::GLES::RenderThreadFBRImpl::GetContextAndResume("
                     "std::shared_ptr<IWorkerThread>, std::shared_ptr<EGLContext>), Failed to "
                     "get main context!"}));
    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, EGL_NO_CONTEXT);
}

TEST(RenderThreadFBR, StaysPausedWhenTheParentRefuses)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    parent.Refuse();
    ThreadPtr thread = NewThread(&parent);

    EXPECT_TRUE(thread->Start());

    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
}

TEST(RenderThreadFBR, StartFailsWithoutAThreadAndDoesNotBlock)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = NewThread(parent->GetMsgQueue());
    const NoMoreThreads noMore;
    const LeaksAllowed itsStartTask;

    EXPECT_FALSE(thread->Start());
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
    SimDriver driver(Gpu());
    ThreadPtr thread = NewThread(nullptr);
    driver.FailNext("eglCreatePbufferSurface", EGL_BAD_ALLOC);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadFBRImpl::Init()",
                     "E bool Nib::GLES::RenderThreadFBRImpl::Init() Failed to create context"}));
    EXPECT_EQ(driver.CallCount("eglMakeCurrent"), 0u);
}

TEST(RenderThreadFBR, GoesOnUnboundWhenTheContextCannotBeMadeCurrent)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = NewThread(nullptr);
    driver.FailNext("eglMakeCurrent", EGL_BAD_ACCESS);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadFBRImpl::Init()",
                     "E bool Nib::GLES::RenderThreadFBRImpl::Init() Failed to MakeCurrent"}));
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }), nullptr);
}

// ---- surfaces -----------------------------------------------------------------------------------

TEST(RenderThreadFBR, OnSurfaceChangedFinishesThenAttaches)
{
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread();
    driver.ForgetLog();

    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);

    EXPECT_EQ(driver.CountLogContaining("UpdateRectangle"), 0u);
}

TEST(RenderThreadFBR, OnSurfaceChangedDetachesTheWindowBeforeAndFinishesTwice)
{
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
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

TEST(RenderThreadFBRPause, ReleasesObjectsThenTellsTheShaderManagerThenEndsTheContext)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    auto* managed = dynamic_cast<IGLManagedMsgQueue*>(thread->GetMsgQueue());
    std::vector<std::string> notes;
    NotedObject first("first", &notes);
    NotedObject second("second", &notes);
    Observer<IManagedObject>::Position positions[2];
    RunOn(thread->GetMsgQueue(),
          [&]
          {
              positions[0] = managed->GetObjectObserver()->Subscribe(&first);
              positions[1] = managed->GetDataObserver()->Subscribe(&second);
          });
    driver.ForgetLog();
    driver.ForgetCalls();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::DoPause()", "D second release",
                     "D first release", "I void Nib::ShaderManager::OnDestroyContext()",
                     "I void Nib::EglContext::Destroy()"}));
    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglMakeCurrent", "eglDestroyContext"}));
    EXPECT_EQ(notes, Lines({"second release with context", "first release with context"}));
    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());

    thread->OnResume();
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());
    EXPECT_EQ(notes, Lines({"second release with context", "first release with context",
                            "first restore with context", "second restore with context"}));
    RunOn(thread->GetMsgQueue(),
          [&]
          {
              managed->GetObjectObserver()->Unsubscribe(positions[0]);
              managed->GetObjectObserver()->Unsubscribe(positions[1]);
          });
}

TEST(RenderThreadFBRPause, ASecondPauseIsSkippedWithAWarning)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread();
    thread->OnPause();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"W virtual void Nib::GLES::RenderThreadFBRImpl::OnPause() : Skip DoPause to "
                     "prevent ANR. Worker is on pause"}));
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST(RenderThreadFBRPause, ResumeMakesANewContextOnTheActiveSurface)
{
    SimDriver driver(Gpu());
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

TEST(RenderThreadFBRPause, ResumeWithoutAParentLeavesItPaused)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread();
    thread->OnPause();
    driver.ForgetLog();

    thread->OnResume();

    EXPECT_EQ(
        LinesWith(driver, ""),
        Lines({"I virtual void Nib::GLES::RenderThreadFBRImpl::OnResume()",
               "E virtual void Nib::GLES::RenderThreadFBRImpl::OnResume() m_parent is NULL"}));
    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
}

TEST(RenderThreadFBRPause, ResumeWithoutAContextLeavesTheObjectsReleased)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    thread->OnPause();
    driver.ForgetLog();
    driver.FailNext("eglCreateContext", EGL_BAD_ALLOC);

    thread->OnResume();
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, "DoResume"),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::DoResume()",
                     "E void Nib::GLES::RenderThreadFBRImpl::DoResume() Failed to create "
                     "context"}));
    EXPECT_EQ(driver.CountLogContaining("OnRestoreContext"), 0u);
}

TEST(RenderThreadFBRPause, RenderAndWaitReturnFalseAtOnce)
{
    SimDriver driver(Gpu());
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

TEST(RenderThreadFBREnd, OfAnUnstartedThreadTouchesNothing)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(parent.Waits(), 0);
    EXPECT_EQ(LinesWith(driver, "RenderThreadFBRImpl"),
              Lines({"I virtual Nib::GLES::RenderThreadFBRImpl::~RenderThreadFBRImpl()"}));
}

TEST(RenderThreadFBREnd, EndsBothSurfacesThenTheContextThenChecksTheShaders)
{
    SimDriver driver(Gpu());
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
    EXPECT_EQ(EndsInOrder(driver), Lines({"context", "shaders", "context"}));
    EXPECT_EQ(driver.Live().contexts, 0);
    EXPECT_EQ(driver.Live().surfaces, 0);
}

TEST(RenderThreadFBREnd, OfAWaitingThreadGivesTheParentTheChanceToAnswer)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    thread->Start();
    SimContext context(driver);
    parent.RunWhileWaitedFor();

    thread.reset();

    EXPECT_EQ(parent.Waits(), 2);
    EXPECT_EQ(driver.CountLogContaining("OK! Parent context: " + Hex(context.Handle())), 1u);
    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
}

TEST(RenderThreadFBREnd, LeavesTheWorkerToAnAnswerThatIsStillQueued)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    thread->Start();
    thread.reset();
    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl() Cleanup"), 0u);

    parent.RunAll();

    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl() Cleanup"), 1u);
}

TEST(RenderThreadFBREnd, RunsAResumeThatThePausedParentHasNotAnswered)
{
    SimDriver driver(Gpu());
    ThreadPtr first = StartedParent();
    ThreadPtr parent = StartedThread(first->GetMsgQueue());
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());
    thread->OnPause();
    parent->OnPause();
    thread->OnResume(); // asks the paused parent, whose last context is gone
    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());

    thread.reset();

    EXPECT_EQ(driver.CountLogContaining("FBRImpl::DoResume()"), 1u);
    EXPECT_EQ(driver.Live().contexts, 2); // the shared one, the first parent's
    parent->OnResume();                   // now it answers a child that is gone
    EXPECT_TRUE(parent->GetMsgQueue()->waitForCompleting());
}

TEST(RenderThreadFBREnd, OfAPausedThreadRunsWhatWaits)
{
    SimDriver driver(Gpu());
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

/// Posts itself again until the deletion has complained.
struct Reposter
{
    SimDriver& driver;
    IGLMsgQueue* queue;

    void operator()() const
    {
        if (driver.CountLogContaining("tasks in queue ater WaitForExecution") == 0)
            Post(queue, *this);
    }
};

TEST(RenderThreadFBREnd, WarnsAndWaitsAgainWhileTasksPostTasks)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread();
    Post(thread->GetMsgQueue(), Reposter{driver, thread->GetMsgQueue()});

    thread.reset();

    const std::vector<std::string> warnings =
        LinesWith(driver, "tasks in queue ater WaitForExecution");
    ASSERT_FALSE(warnings.empty());
    EXPECT_EQ(warnings.front(),
              "W void Nib::GLES::RenderThreadFBRImpl::Terminate() : 1 tasks in queue ater "
              "WaitForExecution. Note! - Some task add new task while execution. Retry waiting.");
    EXPECT_EQ(driver.Live().contexts, 0);
}

} // namespace
