// The offscreen render thread: start, work, end.

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

ThreadPtr NewParent()
{
    return ThreadPtr(GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
}

ThreadPtr StartedParent()
{
    ThreadPtr parent = NewParent();
    EXPECT_TRUE(parent->Start());
    return parent;
}

ThreadPtr NewThread(IGLMsgQueue* parent, bool managed = true)
{
    return ThreadPtr(GLES::CreateOffscreenRenderer(parent, "off", managed));
}

ThreadPtr StartedThread(IGLMsgQueue* parent)
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

// ---- construction -------------------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, HasTheUsualNiceValueBelowLevel29)
{
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
    System::SetSDKVersion(29);
    ThreadPtr thread = StartedThread(nullptr);

    EXPECT_EQ(LinesWith(driver, "WorkerThread priority"),
              Lines({"I Nib::GLES::RenderThreadOffscreenGLImpl::RenderThreadOffscreenGLImpl("
                     "Nib::IGLMsgQueue *, const char *, bool) - WorkerThread priority for SDK:29 "
                     "set to 10"}));
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return RequestedNiceValue(); }), 10);
}

// ---- start without a parent ---------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, WithoutAParentSharesWithNothing)
{
    SimDriver driver(Gpu());
    System::SetSDKVersion(34);
    ThreadPtr thread = NewThread(nullptr);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglCreateContext", "eglCreatePbufferSurface", "eglMakeCurrent"}));
    EXPECT_EQ(driver.LastCall("eglCreateContext").args.at(2).Pointer(), nullptr);
    EXPECT_EQ(LinesWith(driver, "RenderThreadOffscreenGLImpl::").at(1),
              "I virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::Start() - Parent renderer is "
              "null. Initialize with independent context");
}

TEST(RenderThreadOffscreenGL, WithoutAParentHasItsContextWhenStartReturns)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = NewThread(nullptr);

    thread->Start();

    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
    EXPECT_TRUE(thread->GetMsgQueue()->isRunning());
}

// ---- start with a parent ------------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, SharesWithTheContextOfItsParent)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());

    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, ContextOf(*parent));
}

TEST(RenderThreadOffscreenGL, StartWritesItsLinesInOrder)
{
    SimDriver driver(Gpu());
    System::SetSDKVersion(34);
    ThreadPtr parent = StartedParent();
    const std::string parentContext = Hex(ContextOf(*parent));
    ThreadPtr thread = NewThread(parent->GetMsgQueue());
    driver.ForgetLog();

    Gate child(parent->GetMsgQueue()); // so that the parent's line comes after the child's first
    std::thread starter([&] { thread->Start(); });
    while (driver.CountLogContaining("wait for parent context") == 0)
        std::this_thread::yield();
    child.Open();
    starter.join();
    RunOn(thread->GetMsgQueue(), [] {});
    const std::string context = Hex(ContextOf(*thread));

    EXPECT_EQ(LinesWith(driver, "::Start() - Parent"),
              Lines({"I virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::Start() - Parent "
                     "renderer is \"parent\". Start paused and wait for parent context"}));
    EXPECT_EQ(LinesWith(driver, "GetContextAndResume"),
              Lines({"I static void Nib::GLES::RenderThreadOffscreenGLImpl::GetContextAndResume("
                     "std::shared_ptr<IWorkerThread>, std::shared_ptr<EGLContext>), OK! Parent "
                     "context: " +
                     parentContext}));
    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadOffscreenGLImpl::Init()",
                     "I bool Nib::GLES::RenderThreadOffscreenGLImpl::Init() RenderThread: " +
                         Hex(thread.get()) + ", Context: " + context}));
}

TEST(RenderThreadOffscreenGL, StartMakesAContextAndAPbufferOfOnePixel)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    driver.ForgetCalls();

    ThreadPtr thread = StartedThread(parent->GetMsgQueue());

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglCreateContext", "eglCreatePbufferSurface", "eglMakeCurrent"}));
    const SimSurfaceState surface =
        driver.Surface(AskOn(thread->GetMsgQueue(), [] { return eglGetCurrentSurface(EGL_DRAW); }));
    EXPECT_FALSE(surface.window);
    EXPECT_EQ(surface.width, 1);
    EXPECT_EQ(surface.height, 1);
}

TEST(RenderThreadOffscreenGL, StartUsesTheOrdinaryConfiguration)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = StartedThread(parent->GetMsgQueue());

    EXPECT_EQ(driver.Context(ContextOf(*thread)).config, driver.Context(ContextOf(*parent)).config);
}

TEST(RenderThreadOffscreenGL, StartWaitsForTheParentsAnswerOnly)
{
    SimDriver driver(Gpu());
    KeepingQueue parent; // answers nothing, and does not let wait
    ThreadPtr thread = NewThread(&parent);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(parent.Count(), 1u);
    EXPECT_EQ(parent.Waits(), 1);
    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
    EXPECT_EQ(driver.CountLogContaining("Init()"), 0u);
}

TEST(RenderThreadOffscreenGL, RunsNothingBeforeTheParentHasAnswered)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    thread->Start();
    std::atomic<bool> ran{false};
    Event done;
    Post(thread->GetMsgQueue(),
         [&]
         {
             ran = true;
             done.Set();
         });

    EXPECT_FALSE(thread->Render());
    EXPECT_FALSE(ran);

    SimContext context(driver);
    parent.RunAll();
    done.Wait(); // behind Init
    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
}

TEST(RenderThreadOffscreenGL, GetsAContextOfItsOwnWhenTheParentHasNone)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    parent.RunWhileWaitedFor(); // on this thread, which has no context
    ThreadPtr thread = NewThread(&parent);

    EXPECT_TRUE(thread->Start());
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, "GetContextAndResume"),
              Lines({"E static void Nib::GLES::RenderThreadOffscreenGLImpl::GetContextAndResume("
                     "std::shared_ptr<IWorkerThread>, std::shared_ptr<EGLContext>), Failed to "
                     "get main context!"}));
    EXPECT_NE(ContextOf(*thread), EGL_NO_CONTEXT);
    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, EGL_NO_CONTEXT);
}

TEST(RenderThreadOffscreenGL, StaysPausedWhenTheParentRefuses)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    parent.Refuse();
    ThreadPtr thread = NewThread(&parent);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(parent.Waits(), 1);
    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
}

TEST(RenderThreadOffscreenGL, StartFailsWithoutAThreadAndDoesNotBlock)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = NewThread(parent->GetMsgQueue());
    const NoMoreThreads noMore;
    const LeaksAllowed itsStartTask;

    EXPECT_FALSE(thread->Start());

    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
}

TEST(RenderThreadOffscreenGL, ParentsMayHaveParents)
{
    SimDriver driver(Gpu());
    ThreadPtr first = StartedParent();
    ThreadPtr second = StartedThread(first->GetMsgQueue());
    ThreadPtr third = StartedThread(second->GetMsgQueue());

    EXPECT_EQ(driver.Context(ContextOf(*third)).share, ContextOf(*second));
}

// ---- what EGL refuses ---------------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, GoesOnWithoutAContext)
{
    SimDriver driver(Gpu());
    System::SetSDKVersion(34);
    ThreadPtr thread = NewThread(nullptr);
    driver.FailNext("eglCreateContext", EGL_BAD_ALLOC);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadOffscreenGLImpl::Init()",
                     "E bool Nib::GLES::RenderThreadOffscreenGLImpl::Init() Failed to create "
                     "context"}));
    EXPECT_EQ(driver.CallCount("eglCreatePbufferSurface"), 0u);
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }), nullptr);
}

TEST(RenderThreadOffscreenGL, GoesOnWithoutASurface)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = NewThread(nullptr);
    driver.FailNext("eglCreatePbufferSurface", EGL_BAD_ALLOC);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadOffscreenGLImpl::Init()",
                     "E bool Nib::GLES::RenderThreadOffscreenGLImpl::Init() - Failed to create "
                     "PBuffer surface"}));
    EXPECT_EQ(driver.CallCount("eglMakeCurrent"), 0u);
}

TEST(RenderThreadOffscreenGL, GoesOnUnboundWhenTheContextCannotBeMadeCurrent)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = NewThread(nullptr);
    driver.FailNext("eglMakeCurrent", EGL_BAD_ACCESS);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Lines({"I bool Nib::GLES::RenderThreadOffscreenGLImpl::Init()",
                     "E bool Nib::GLES::RenderThreadOffscreenGLImpl::Init() Failed to "
                     "MakeCurrent"}));
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }), nullptr);
    EXPECT_FALSE(OpenGLRenderer::IsGLParameterInited());
}

// ---- the priority of its context ----------------------------------------------------------------

TEST(RenderThreadOffscreenGL, PrefersMediumContextPriorityBelowLevel29)
{
    SimDriver driver(Gpu());
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
    SimDriver driver(Gpu());
    System::SetSDKVersion(29);
    ThreadPtr thread = StartedThread(nullptr);

    EXPECT_EQ(driver.Context(ContextOf(*thread)).priority, 0x3103);
    EXPECT_EQ(LinesWith(driver, "Context priority"),
              Lines({"I static EglContext::Priority "
                     "Nib::GLES::RenderThreadOffscreenGLImpl::GetPrefferedContextPriority() - "
                     "Context priority for SDK:29 is 0x3103"}));
}

// ---- work ---------------------------------------------------------------------------------------

TEST(RenderThreadOffscreenGL, BindsTheThreadToItsQueue)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread(nullptr);

    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }),
              thread->GetMsgQueue());
    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
}

TEST(RenderThreadOffscreenGL, RenderIsABarrierAndNoMore)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread(nullptr);
    std::atomic<int> ran{0};
    for (int i = 0; i < 20; ++i)
        Post(thread->GetMsgQueue(), [&] { ++ran; });
    driver.ForgetCalls();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(ran, 20);
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST(RenderThreadOffscreenGL, RenderOfAnUnstartedThreadReturnsFalse)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = NewThread(nullptr);

    EXPECT_FALSE(thread->Render());
}

TEST(RenderThreadOffscreenGL, WaitForCompletingWritesItsLine)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread(nullptr);
    driver.ForgetLog();

    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(
        LinesWith(driver, ""),
        Lines({"I virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting()"}));
}

TEST(RenderThreadOffscreenGL, IgnoresSurfacesAndDirtyRectangles)
{
    SimDriver driver(Gpu());
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

// ---- end ----------------------------------------------------------------------------------------

TEST(RenderThreadOffscreenGLEnd, OfAnUnstartedThreadTouchesNothing)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(parent.Waits(), 0);
    EXPECT_EQ(LinesWith(driver, "RenderThreadOffscreenGLImpl"),
              Lines({"I virtual "
                     "Nib::GLES::RenderThreadOffscreenGLImpl::~RenderThreadOffscreenGLImpl()"}));
}

TEST(RenderThreadOffscreenGLEnd, EndsThePbufferThenTheContextThenChecksTheShaders)
{
    SimDriver driver(Gpu());
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
    EXPECT_EQ(EndsInOrder(driver), Lines({"context", "shaders", "context"}));
    EXPECT_EQ(driver.Live().contexts, 0);
    EXPECT_EQ(driver.Live().surfaces, 0);
}

TEST(RenderThreadOffscreenGLEnd, OfAWaitingThreadGivesTheParentTheChanceToAnswer)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    thread->Start();
    SimContext context(driver);
    parent.RunWhileWaitedFor();

    thread.reset();

    EXPECT_EQ(parent.Waits(), 2); // at the start, at the end
    EXPECT_EQ(driver.CountLogContaining("OK! Parent context: " + Hex(context.Handle())), 1u);
    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
}

TEST(RenderThreadOffscreenGLEnd, OfAWaitingThreadWhoseParentIsSilentRunsItsStartFirst)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    thread->Start();

    thread.reset();

    EXPECT_EQ(parent.Waits(), 2);
    EXPECT_EQ(parent.Count(), 1u); // the answer that was asked for is still to come
    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
    EXPECT_EQ(driver.Live().contexts, 0);
}

TEST(RenderThreadOffscreenGLEnd, LeavesTheWorkerToAnAnswerThatIsStillQueued)
{
    SimDriver driver(Gpu());
    KeepingQueue parent;
    ThreadPtr thread = NewThread(&parent);
    thread->Start();
    thread.reset();
    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl() Cleanup"), 0u);

    parent.RunAll(); // touches the worker of a thread that is gone

    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl() Cleanup"), 1u);
}

TEST(RenderThreadOffscreenGLEnd, WithAnAnswerQueuedOnABusyParentWaitsForIt)
{
    SimDriver driver(Gpu());
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = NewThread(parent->GetMsgQueue());
    {
        Gate busy(parent->GetMsgQueue());
        std::thread starter([&] { thread->Start(); });
        while (driver.CountLogContaining("wait for parent context") == 0)
            std::this_thread::yield();
        busy.Open();
        starter.join();
    }

    thread.reset();

    EXPECT_EQ(driver.CountLogContaining("OK! Parent context"), 1u);
    EXPECT_EQ(driver.Live().contexts, 2); // the parent's and the shared one
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

TEST(RenderThreadOffscreenGLEnd, WarnsAndWaitsAgainWhileTasksPostTasks)
{
    SimDriver driver(Gpu());
    ThreadPtr thread = StartedThread(nullptr);
    Post(thread->GetMsgQueue(), Reposter{driver, thread->GetMsgQueue()});

    thread.reset();

    const std::vector<std::string> warnings =
        LinesWith(driver, "tasks in queue ater WaitForExecution");
    ASSERT_FALSE(warnings.empty());
    EXPECT_EQ(warnings.front(),
              "W void Nib::GLES::RenderThreadOffscreenGLImpl::Terminate() : 1 tasks in queue ater "
              "WaitForExecution. Note! - Some task add new task while execution. Retry waiting.");
    EXPECT_EQ(driver.Live().contexts, 0);
}

} // namespace
