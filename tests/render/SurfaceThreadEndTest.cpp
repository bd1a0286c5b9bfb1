// The surface render thread: deletion, and what is queued then.

#include "render/SurfaceThreadSupport.h"

using namespace Nib;

namespace
{

constexpr const char* kRetry = "tasks in queue ater WaitForExecution";

using ThreadPtr = std::unique_ptr<RenderThreadGL>;

ThreadPtr NewThread()
{
    return ThreadPtr(GLES::CreateSurfaceRenderer("surface", RenderThreadGL::Medium));
}

ThreadPtr StartedThread()
{
    ThreadPtr thread = NewThread();
    EXPECT_TRUE(thread->Start());
    return thread;
}

TEST(RenderThreadGLEnd, OfAnUnstartedThreadTouchesNoEgl)
{
    SimDriver driver;
    ThreadPtr thread = NewThread();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(LinesWith(driver, "RenderThreadGLImpl"),
              Lines({"I virtual Nib::GLES::RenderThreadGLImpl::~RenderThreadGLImpl()"}));
}

TEST(RenderThreadGLEnd, EndsTheSurfaceThenTheContext)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    const unsigned renderThread =
        AskOn(thread->GetMsgQueue(), [] { return SimDriver::ThisThread(); });
    driver.ForgetCalls();

    thread.reset();

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglMakeCurrent", "eglDestroySurface", "eglDestroyContext"}));
    EXPECT_EQ(driver.LastCall("eglMakeCurrent").args.at(3).Pointer(), nullptr);
    EXPECT_EQ(driver.LastCall("eglDestroyContext").thread, renderThread);
    EXPECT_EQ(driver.CallingThreads(), 1u);
    EXPECT_EQ(driver.Live().contexts, 1); // the shared one
    EXPECT_EQ(driver.Live().surfaces, 0);
}

TEST(RenderThreadGLEnd, WritesItsLinesInOrder)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    const std::string self = Hex(thread.get());
    const std::string context =
        Hex(AskOn(thread->GetMsgQueue(), [] { return eglGetCurrentContext(); }));
    driver.ForgetLog();

    thread.reset();

    const std::vector<std::string> lines = LinesWith(driver, "");
    EXPECT_EQ(lines.front(), "I virtual Nib::GLES::RenderThreadGLImpl::~RenderThreadGLImpl()");
    EXPECT_EQ(LinesWith(driver, "DoTerminate"),
              Lines({"I void Nib::GLES::RenderThreadGLImpl::DoTerminate() RenderThread: " + self +
                     ", Context: " + context}));
    EXPECT_EQ(LinesWith(driver, "ShaderManager"),
              Lines({"I void Nib::ShaderManager::CheckEmpty() All shaders was cleaned"}));
    EXPECT_EQ(driver.CountLogContaining(kRetry), 0u);
}

TEST(RenderThreadGLEnd, ChecksTheShadersAfterTheContextIsGone)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    driver.ForgetLog();

    thread.reset();

    // The destructor of the empty context writes the first line once more.
    EXPECT_EQ(EndsInOrder(driver), Lines({"context", "shaders", "worker", "context"}));
}

TEST(RenderThreadGLEnd, WithAWindowEndsBothSurfaces)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    ANativeWindow* window = driver.Window(8, 8);
    const EGLSurface pbuffer =
        AskOn(thread->GetMsgQueue(), [] { return eglGetCurrentSurface(EGL_DRAW); });
    thread->OnSurfaceChanged(window, 8, 8, 0);
    const EGLSurface shown =
        AskOn(thread->GetMsgQueue(), [] { return eglGetCurrentSurface(EGL_DRAW); });
    driver.ForgetCalls();

    thread.reset();

    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglMakeCurrent", "eglDestroySurface",
                                                   "eglDestroySurface", "eglDestroyContext"}));
    const std::vector<SimCall> ended = driver.Calls("eglDestroySurface");
    EXPECT_EQ(ended.at(0).args.at(1).Pointer(), pbuffer);
    EXPECT_EQ(ended.at(1).args.at(1).Pointer(), shown);
    EXPECT_FALSE(driver.WindowState(window).connected);
}

TEST(RenderThreadGLEnd, RunsTheQueuedTasksFirstWithTheContextCurrent)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    Gate gate(thread->GetMsgQueue());
    std::atomic<int> withContext{0};
    for (int i = 0; i < 50; ++i)
    {
        Post(thread->GetMsgQueue(),
             [&] { withContext += eglGetCurrentContext() != EGL_NO_CONTEXT ? 1 : 0; });
    }

    gate.Open();
    thread.reset();

    EXPECT_EQ(withContext, 50);
}

/// Posts itself again until the deletion has complained.
struct Reposter
{
    SimDriver& driver;
    IGLMsgQueue* queue;
    std::atomic<int>& runs;

    void operator()() const
    {
        ++runs;
        if (driver.CountLogContaining(kRetry) == 0)
            Post(queue, *this);
    }
};

TEST(RenderThreadGLEnd, WarnsAndWaitsAgainWhileTasksPostTasks)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    std::atomic<int> runs{0};
    Post(thread->GetMsgQueue(), Reposter{driver, thread->GetMsgQueue(), runs});

    thread.reset();

    const std::vector<std::string> warnings = LinesWith(driver, kRetry);
    ASSERT_FALSE(warnings.empty());
    for (const std::string& warning : warnings)
    {
        EXPECT_EQ(warning, "W void Nib::GLES::RenderThreadGLImpl::Terminate() : 1 tasks in queue "
                           "ater WaitForExecution. Note! - Some task add new task while execution. "
                           "Retry waiting.");
    }
    EXPECT_GT(runs, 0);
    EXPECT_EQ(driver.Live().contexts, 1); // ended all the same
}

TEST(RenderThreadGLEnd, ThroughTheQueueFaceEndsTheSameThings)
{
    SimDriver driver;
    ThreadPtr thread = StartedThread();
    IGLMsgQueue* queue = thread.release()->GetMsgQueue();
    driver.ForgetCalls();

    delete queue;

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglMakeCurrent", "eglDestroySurface", "eglDestroyContext"}));
}

TEST(RenderThreadGLEnd, AfterAFailedStartEndsWhatThereIs)
{
    SimDriver driver;
    ThreadPtr thread = NewThread();
    SharedContext::GetInstance();
    driver.FailNext("eglCreatePbufferSurface", EGL_BAD_ALLOC);
    thread->Start();
    driver.ForgetCalls();

    thread.reset();

    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglMakeCurrent", "eglDestroyContext"}));
    EXPECT_EQ(driver.Live().contexts, 1); // the shared one
}

} // namespace
