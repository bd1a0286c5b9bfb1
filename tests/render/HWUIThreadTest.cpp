// The HWUI render thread: making, frames, waiting, pause.

#include "render/HWUITestSupport.h"

#include <nib/base.h>
#include <nib/device.h>
#include <nib/shader_manager.h>

#include <algorithm>
#include <stdexcept>

using namespace Nib;

namespace
{

// ---- making one ---------------------------------------------------------------------------------

TEST(CreateHWUIRenderer, WritesItsLineWithATrailingBlank)
{
    SimDriver driver;
    HwuiCallback callback{nullptr, nullptr, nullptr};

    std::unique_ptr<RenderThreadHWUI> thread(GLES::CreateHWUIRenderer(&callback, "hwui"));

    EXPECT_EQ(LinesWith(driver, "::CreateHWUIRenderer"),
              Lines({"I Nib::RenderThreadHWUI *Nib::GLES::CreateHWUIRenderer(Nib::HwuiCallback *, "
                     "const char *) "}));
}

TEST(CreateHWUIRenderer, HasTheSharedRenderThreadReadTheGLParametersFirst)
{
    SimDriver driver;
    HwuiCallback callback{nullptr, nullptr, nullptr};
    ASSERT_FALSE(OpenGLRenderer::IsGLParameterInited());

    std::unique_ptr<RenderThreadHWUI> thread(GLES::CreateHWUIRenderer(&callback, "hwui"));

    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST::getInstance() - Create"), 1u);
    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST::release() - Destroy"), 1u);
}

TEST(CreateHWUIRenderer, NeedsNoSharedRenderThreadOnceTheGLParametersAreRead)
{
    SimDriver driver;
    SimContext context(driver);
    OpenGLRenderer::InitParameters();
    HwuiCallback callback{nullptr, nullptr, nullptr};

    std::unique_ptr<RenderThreadHWUI> thread(GLES::CreateHWUIRenderer(&callback, "hwui"));

    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST"), 0u);
}

TEST_F(HwuiTest, TheConstructorWritesItsLineAndMakesTheObserver)
{
    const std::vector<std::string> lines = LinesWith(driver, "HWUI");

    EXPECT_EQ(lines,
              Lines({"I HWUIThreadGLImpl::HWUIThreadGLImpl Constructor : " + Hex(thread.get()),
                     "I static Nib::GLES::HWUIObjectObserver "
                     "*Nib::GLES::HWUIObjectObserver::GetInstance() - Create new instance"}));
}

TEST_F(HwuiTest, InitIsTheFirstTaskOfTheFirstFrame)
{
    std::vector<std::string> linesBefore;
    Post(Queue(), [&] { linesBefore = LinesWith(driver, "::Init() "); });
    EXPECT_EQ(driver.CountLogContaining("::Init()"), 0u);

    thread->Render();

    EXPECT_EQ(linesBefore, Lines({"I void Nib::GLES::HWUIThreadGLImpl::Init() RenderThread: " +
                                  Hex(thread.get()) + ", Context: " + Hex(context->Handle())}));
}

TEST(HwuiInit, ReadsTheGLParametersWhenNobodyHas)
{
    SimDriver driver;
    SimContext context(driver);
    HwuiCallback callback{};
    GLES::HWUIThreadGLImpl thread(&callback, "hwui");
    EXPECT_FALSE(OpenGLRenderer::IsGLParameterInited());

    thread.Render();

    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
}

// ---- what it does not do ------------------------------------------------------------------------

TEST_F(HwuiTest, StartDoesNothing)
{
    driver.ForgetCalls();
    driver.ForgetLog();

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_TRUE(driver.Log().empty());
}

TEST_F(HwuiTest, OnSurfaceChangedIsNotSupported)
{
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual void Nib::GLES::HWUIThreadGLImpl::OnSurfaceChanged(void *, int, "
                     "int, int). NOT SUPPRORTED by this implementation"}));
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(HwuiTest, OnSurfaceDestroyedIsNotSupported)
{
    driver.ForgetLog();

    thread->OnSurfaceDestroyed();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual void Nib::GLES::HWUIThreadGLImpl::OnSurfaceDestroyed(). NOT "
                     "SUPPRORTED by this implementation"}));
}

TEST_F(HwuiTest, ApplyUpdateRectWritesItsLineOnly)
{
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->ApplyUpdateRect(RectF(0, 0, 8, 8), 1);
    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I virtual void Nib::GLES::HWUIThreadGLImpl::ApplyUpdateRect(const Nib::RectF "
                     "&, int) "}));
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(HwuiTest, IsAlwaysAttachedAndRunning)
{
    EXPECT_TRUE(thread->IsAttachedToWindow());
    EXPECT_TRUE(Queue()->isRunning());
    EXPECT_EQ(thread->GetSafeLock(), static_cast<RenderThreadHWUI::ISafeLock*>(thread.get()));
}

TEST_F(HwuiTest, DoApplyUpdateRectTakesTheFieldsAsAScissorBox)
{
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->DoApplyUpdateRect(RectF(1.9f, -2.9f, 30.9f, 40.9f));

    EXPECT_EQ(driver.Calls(),
              Sequence({Call("glEnable", GL_SCISSOR_TEST), Call("glScissor", 1, -2, 30, 40)}));
    EXPECT_EQ(
        LinesWith(driver, ""),
        Lines({"I void Nib::GLES::HWUIThreadGLImpl::DoApplyUpdateRect(const Nib::RectF &) "}));
}

// ---- frames -------------------------------------------------------------------------------------

TEST_F(HwuiTest, RenderRunsTheTasksInOrderWithTheScissorOff)
{
    thread->Render();
    std::vector<int> order;
    glEnable(GL_SCISSOR_TEST);
    for (int i = 0; i < 5; ++i)
    {
        Post(Queue(),
             [&order, i]
             {
                 EXPECT_FALSE(glIsEnabled(GL_SCISSOR_TEST));
                 order.push_back(i);
             });
    }
    driver.ForgetCalls();
    driver.ForgetLog();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(order, (std::vector<int>{0, 1, 2, 3, 4}));
    EXPECT_EQ(LinesWith(driver, ""), Lines({"I virtual bool Nib::GLES::HWUIThreadGLImpl::Render()",
                                            "D HWUIThreadGLImpl::RunTasks count=5"}));
}

TEST_F(HwuiTest, RenderOfAnEmptyQueueCountsZero)
{
    thread->Render();
    driver.ForgetCalls();
    driver.ForgetLog();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(LinesWith(driver, ""), Lines({"I virtual bool Nib::GLES::HWUIThreadGLImpl::Render()",
                                            "D HWUIThreadGLImpl::RunTasks count=0"}));
    EXPECT_EQ(driver.Calls(),
              Sequence({Call("eglGetCurrentContext"), Call("glDisable", GL_SCISSOR_TEST)}));
}

TEST_F(HwuiTest, RenderBindsTheThreadToTheQueue)
{
    EXPECT_EQ(GetCurrentMsgQueue(), nullptr);
    IGLMsgQueue* seen = nullptr;
    Post(Queue(), [&] { seen = GetCurrentMsgQueue(); });

    thread->Render();

    EXPECT_EQ(seen, Queue());
    EXPECT_EQ(GetCurrentMsgQueue(), Queue());
}

TEST_F(HwuiTest, RenderDeletesEachTaskAfterItsRun)
{
    class Watched : public ITask
    {
    public:
        Watched(int& alive, std::vector<int>& seen) : m_alive(alive), m_seen(seen) { ++m_alive; }
        ~Watched() override { --m_alive; }
        void run() override { m_seen.push_back(m_alive); }

    private:
        int& m_alive;
        std::vector<int>& m_seen;
    };
    int alive = 0;
    std::vector<int> seen;
    for (int i = 0; i < 3; ++i)
        Queue()->enQueueMsg(new Watched(alive, seen));

    thread->Render();

    EXPECT_EQ(seen, (std::vector<int>{3, 2, 1})); // those before are gone already
    EXPECT_EQ(alive, 0);
}

TEST_F(HwuiTest, RenderLetsWhatATaskThrowsPassAndStaysUsable)
{
    thread->Render();
    auto token = std::make_shared<int>(0);
    Post(Queue(), [token] { throw std::runtime_error("from a task"); });
    int ran = 0;
    Post(Queue(), [&] { ++ran; });

    EXPECT_THROW(thread->Render(), std::runtime_error);
    EXPECT_EQ(token.use_count(), 1); // the task is gone

    thread->Render(); // the queue that was filled meanwhile
    thread->Render(); // the rest of the first one
    EXPECT_EQ(ran, 1);
}

TEST_F(HwuiTest, ATaskPostedBetweenTwoFramesRunsInTheSecond)
{
    thread->Render();
    int ran = 0;

    Post(Queue(), [&] { ++ran; });
    EXPECT_EQ(ran, 0);
    thread->Render();
    EXPECT_EQ(ran, 1);
    thread->Render();
    EXPECT_EQ(ran, 1);
}

TEST_F(HwuiTest, ATaskPostedDuringAFrameRunsInTheNext)
{
    std::vector<int> order;
    Post(Queue(),
         [&]
         {
             order.push_back(1);
             Post(Queue(), [&] { order.push_back(3); });
         });
    Post(Queue(), [&] { order.push_back(2); });

    thread->Render();
    EXPECT_EQ(order, (std::vector<int>{1, 2}));

    thread->Render();
    EXPECT_EQ(order, (std::vector<int>{1, 2, 3}));
}

TEST_F(HwuiTest, TasksKeepTheirOrderOverManyFrames)
{
    std::vector<int> order;
    for (int i = 0; i < 30; ++i)
    {
        Post(Queue(), [&order, i] { order.push_back(i); });
        if (i % 7 == 0)
            thread->Render();
    }
    thread->Render();

    ASSERT_EQ(order.size(), 30u);
    EXPECT_TRUE(std::is_sorted(order.begin(), order.end()));
}

TEST_F(HwuiTest, RenderWithoutAContextRunsNothingAndKeepsTheTasks)
{
    thread->Render();
    int ran = 0;
    Post(Queue(), [&] { ++ran; });
    context->Release();
    driver.ForgetCalls();
    driver.ForgetLog();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(ran, 0);
    EXPECT_EQ(driver.CallCount("glDisable"), 0u);
    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I virtual bool Nib::GLES::HWUIThreadGLImpl::Render()"}));
    context->MakeCurrent();
    thread->Render();
    EXPECT_EQ(ran, 1);
}

TEST_F(HwuiTest, ATaskMayDrawAFrameOfItsOwn)
{
    std::vector<int> order;
    Post(Queue(),
         [&]
         {
             order.push_back(1);
             Post(Queue(), [&] { order.push_back(2); });
             EXPECT_TRUE(Queue()->waitForCompleting());
             order.push_back(3);
         });
    Post(Queue(), [&] { order.push_back(4); });

    thread->Render();

    EXPECT_EQ(order, (std::vector<int>{1, 2, 3, 4}));
}

TEST_F(HwuiTest, IsRenderThreadComparesWithTheThreadOfTheLastFrame)
{
    const std::string self = std::to_string(static_cast<int>(GetNibCurrentThreadId()));
    driver.ForgetLog();
    EXPECT_FALSE(thread->IsRenderThread());
    thread->Render();
    EXPECT_TRUE(thread->IsRenderThread());
    bool elsewhere = true;
    std::thread([&] { elsewhere = thread->IsRenderThread(); }).join();
    EXPECT_FALSE(elsewhere);

    const std::vector<std::string> lines = LinesWith(driver, "IsRenderThread");
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_EQ(lines[0], "I bool Nib::GLES::HWUIThreadGLImpl::IsRenderThread() m_hwuiThreadId:0 "
                        "currentTheadId:" +
                            self);
    EXPECT_EQ(lines[1], "I bool Nib::GLES::HWUIThreadGLImpl::IsRenderThread() m_hwuiThreadId:" +
                            self + " currentTheadId:" + self);
}

// ---- waiting on the UI's thread -----------------------------------------------------------------

TEST_F(HwuiTest, WaitingInTheDrawCallbackRunsTheTasksAtOnce)
{
    thread->Render();
    int ran = 0;
    Post(Queue(), [&] { ++ran; });

    EXPECT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(ran, 1);
    EXPECT_EQ(requests, 0);
}

TEST_F(HwuiTest, WaitingInTheDrawCallbackLeavesTheGLStateAsItWas)
{
    thread->Render();
    glEnable(GL_SCISSOR_TEST);
    glScissor(1, 2, 3, 4);
    glDisable(GL_BLEND);
    Post(Queue(),
         []
         {
             glEnable(GL_BLEND);
             glScissor(5, 6, 7, 8);
         });

    Queue()->waitForCompleting();

    EXPECT_TRUE(glIsEnabled(GL_SCISSOR_TEST));
    EXPECT_FALSE(glIsEnabled(GL_BLEND));
    int box[4] = {};
    glGetIntegerv(GL_SCISSOR_BOX, box);
    EXPECT_EQ(box[0], 1);
    EXPECT_EQ(box[3], 4);
}

TEST_F(HwuiTest, WaitingInTheDrawCallbackWritesItsLines)
{
    thread->Render();
    driver.ForgetLog();

    Queue()->waitForCompleting();

    const std::vector<std::string> lines = LinesWith(driver, "HWUIThreadGLImpl");
    ASSERT_EQ(lines.size(), 4u);
    EXPECT_EQ(lines[0], "I virtual bool Nib::GLES::HWUIThreadGLImpl::waitForCompleting()");
    EXPECT_EQ(lines[1].rfind("I bool Nib::GLES::HWUIThreadGLImpl::IsRenderThread() ", 0), 0u);
    EXPECT_EQ(lines[2], "I virtual bool Nib::GLES::HWUIThreadGLImpl::Render()");
    EXPECT_EQ(lines[3], "D HWUIThreadGLImpl::RunTasks count=0");
}

// ---- waiting on other threads -------------------------------------------------------------------

/// Waits for the queue on a thread of its own.
class Waiter
{
public:
    explicit Waiter(IGLMsgQueue* queue)
        : m_thread(
              [this, queue]
              {
                  result = queue->waitForCompleting();
                  done.Set();
              })
    {
    }
    ~Waiter() { m_thread.join(); }

    std::atomic<bool> result{false};
    Event done;

private:
    std::thread m_thread;
};

TEST_F(HwuiTest, WaitingElsewhereAsksForAFrameAndReturnsAfterIt)
{
    std::atomic<int> ran{0};
    Post(Queue(), [&] { ++ran; });

    Waiter waiter(Queue());
    while (requests == 0)
        std::this_thread::yield();
    EXPECT_FALSE(waiter.done.IsSet());
    thread->Render(); // behind the lock that the waiter held when it asked
    waiter.done.Wait();

    EXPECT_TRUE(waiter.result);
    EXPECT_EQ(ran, 1);
    EXPECT_EQ(requests, 1);
    thread->Render(); // nobody waits any more
    EXPECT_EQ(LinesWith(driver, "Signal"),
              Lines({"D virtual bool Nib::GLES::HWUIThreadGLImpl::Render() - Signal "
                     "m_waitForCompletingCV"}));
}

TEST_F(HwuiTest, WaitingElsewhereIsRefusedWhenTheUiIsNotReady)
{
    ready = false;
    driver.ForgetLog();
    int ran = 0;
    Post(Queue(), [&] { ++ran; });

    bool result = true;
    std::thread([&] { result = Queue()->waitForCompleting(); }).join();

    EXPECT_FALSE(result);
    EXPECT_EQ(ran, 0);
    EXPECT_EQ(LinesWith(driver, "Invoke"),
              Lines({"W virtual bool Nib::GLES::HWUIThreadGLImpl::waitForCompleting() - Invoke was "
                     "not requested. Probably HWUI is not initialized yet."}));
    driver.ForgetLog();
    thread->Render();
    EXPECT_EQ(driver.CountLogContaining("Signal"), 0u); // nobody waits
}

TEST_F(HwuiTest, WaitingBeforeTheFirstFrameIsWaitingElsewhere)
{
    ready = false;

    EXPECT_FALSE(Queue()->waitForCompleting()); // on the thread that will draw

    EXPECT_EQ(requests, 1);
}

TEST_F(HwuiTest, WaitingElsewhereWithoutARequestLastsUntilAFrameComes)
{
    callback.invoke = nullptr;
    std::atomic<int> ran{0};
    Post(Queue(), [&] { ++ran; });
    driver.ForgetLog();

    Waiter waiter(Queue());
    while (!waiter.done.IsSet()) // the first frames may come before the wait
    {
        thread->Render();
        std::this_thread::yield();
    }

    EXPECT_TRUE(waiter.result);
    EXPECT_EQ(ran, 1);
    EXPECT_EQ(requests, 0);
    EXPECT_EQ(driver.CountLogContaining("Signal m_waitForCompletingCV"), 1u);
}

TEST_F(HwuiTest, AFrameWithoutAContextWakesTheWaiter)
{
    thread->Render();
    int ran = 0;
    Post(Queue(), [&] { ++ran; });
    context->Release();

    {
        Waiter waiter(Queue());
        while (requests == 0)
            std::this_thread::yield();
        thread->Render();
        waiter.done.Wait();
        EXPECT_TRUE(waiter.result);
    }

    EXPECT_EQ(ran, 0);
    context->MakeCurrent();
    thread->Render();
    EXPECT_EQ(ran, 1);
}

TEST_F(HwuiTest, OneFrameWakesAllWaiters)
{
    std::deque<Waiter> waiters;
    for (int i = 0; i < 4; ++i)
        waiters.emplace_back(Queue());
    while (requests < 4)
        std::this_thread::yield();

    thread->Render(); // the last to ask waits when the lock is free

    for (Waiter& waiter : waiters)
    {
        waiter.done.Wait();
        EXPECT_TRUE(waiter.result);
    }
    EXPECT_EQ(driver.CountLogContaining("Signal m_waitForCompletingCV"), 1u);
}

// ---- pause and resume ---------------------------------------------------------------------------

class HwuiPause : public HwuiTest
{
protected:
    void SetUp() override
    {
        thread->Render();
        positions.push_back(thread->GetObjectObserver()->Subscribe(&first));
        positions.push_back(thread->GetObjectObserver()->Subscribe(&second));
        driver.ForgetLog();
    }

    void TearDown() override
    {
        for (const auto& position : positions)
            thread->GetObjectObserver()->Unsubscribe(position);
    }

    std::vector<std::string> notes;
    NotedObject first{"first", &notes};
    NotedObject second{"second", &notes};
    std::vector<Observer<IManagedObject>::Position> positions;
};

TEST_F(HwuiPause, ReleasesTheObjectsThenTellsTheShaderManagerWithinAFrame)
{
    std::thread pauser([&] { thread->OnPause(); });
    while (requests == 0)
        std::this_thread::yield();
    EXPECT_TRUE(notes.empty());

    thread->Render();
    pauser.join();

    EXPECT_EQ(notes, Lines({"second release with context", "first release with context"}));
    const std::vector<std::string> lines = LinesWith(driver, "");
    const auto told =
        std::find(lines.begin(), lines.end(), "I void Nib::ShaderManager::OnDestroyContext()");
    ASSERT_NE(told, lines.end());
    EXPECT_EQ(*(told - 1), "D first release");
    EXPECT_EQ(LinesWith(driver, "count="), Lines({"D HWUIThreadGLImpl::RunTasks count=2"}));
}

TEST_F(HwuiPause, OnTheUisThreadReleasesAtOnce)
{
    thread->OnPause();

    EXPECT_EQ(notes.size(), 2u);
    EXPECT_EQ(requests, 0);
}

TEST_F(HwuiPause, ReturnsWhenTheUiIsNotReadyAndReleasesInTheNextFrame)
{
    ready = false;

    std::thread([&] { thread->OnPause(); }).join();
    EXPECT_TRUE(notes.empty());

    thread->Render();
    EXPECT_EQ(notes.size(), 2u);
}

TEST_F(HwuiPause, TasksStillRunAfterIt)
{
    thread->OnPause();
    int ran = 0;
    Post(Queue(), [&] { ++ran; });

    thread->Render();

    EXPECT_EQ(ran, 1);
    EXPECT_TRUE(Queue()->isRunning());
}

TEST_F(HwuiPause, ResumeRestoresInTheNextFrameWithoutWaiting)
{
    thread->OnPause();
    notes.clear();
    driver.ForgetLog();

    std::thread([&] { thread->OnResume(); }).join();
    EXPECT_TRUE(notes.empty());
    EXPECT_EQ(requests, 0);
    EXPECT_TRUE(driver.Log().empty());

    thread->Render();
    EXPECT_EQ(notes, Lines({"first restore with context", "second restore with context"}));
    EXPECT_EQ(LinesWith(driver, "estore"),
              Lines({"D first restore", "D second restore",
                     "I void Nib::ShaderManager::OnRestoreContext()"}));
}

TEST_F(HwuiPause, AnObjectThatIsNotRestoredIsToldAndTheOthersAre)
{
    class Failing : public NotedObject
    {
    public:
        using NotedObject::NotedObject;
        void OnRestore() override { throw std::runtime_error("no memory"); }
    } failing("failing", &notes);
    NotedObject last("last", &notes);
    positions.push_back(thread->GetObjectObserver()->Subscribe(&failing));
    positions.push_back(thread->GetObjectObserver()->Subscribe(&last));
    thread->OnPause();
    notes.clear();
    driver.ForgetLog();

    thread->OnResume();
    thread->Render();

    EXPECT_EQ(notes, Lines({"first restore with context", "second restore with context",
                            "last restore with context"}));
    EXPECT_EQ(LinesWith(driver, "not restored"),
              Lines({"E void Nib::GLES::HWUIThreadGLImpl::RestoreObjects() An object is not "
                     "restored: no memory"}));
}

TEST_F(HwuiPause, ReachesTheObjectsOfAllHwuiThreads)
{
    GLES::HWUIThreadGLImpl other(&callback, "other");
    NotedObject third("third", &notes);
    const auto position = other.GetObjectObserver()->Subscribe(&third);
    EXPECT_EQ(other.GetObjectObserver(), thread->GetObjectObserver());

    thread->OnPause();

    EXPECT_EQ(notes.size(), 3u);
    other.GetObjectObserver()->Unsubscribe(position);
}

} // namespace
