#include "sim/SimDriver.h"
#include "thread/Tasks.h"
#include "thread/WorkerThreadImpl.h"

#include <nib/base.h>
#include <nib/msg_queue.h>

#include <gtest/gtest.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

using Nib::IWorkerThread;
using Texts = std::vector<std::string>;

namespace
{

/// Appends to a list that only the worker touches until the test has waited for it.
struct Notes
{
    Texts texts;
    Nib::ITask* Task(std::string text)
    {
        return new LambdaTask([this, text] { texts.push_back(text); },
                              [this, text] { texts.push_back("end of " + text); });
    }
};

/// Tells when tasks have been queued; carriers of synchronous tasks come through here, too.
class WatchedWorker : public Nib::WorkerThreadImpl
{
public:
    WatchedWorker() : WorkerThreadImpl("watched", 0, false) {}

    bool EnqueueAsyncTask(Nib::ITask* task) override
    {
        const bool taken = WorkerThreadImpl::EnqueueAsyncTask(task);
        const std::lock_guard lock(m_mutex);
        ++m_queued;
        m_changed.notify_all();
        return taken;
    }
    void WaitUntilQueued(int count)
    {
        std::unique_lock lock(m_mutex);
        m_changed.wait(lock, [&] { return m_queued >= count; });
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_changed;
    int m_queued = 0;
};

class WorkerThread : public testing::Test
{
protected:
    SimDriver driver; // for its log
    Worker worker = MakeWorker();
};

} // namespace

// ---- making, starting, ending -------------------------------------------------------------------

TEST_F(WorkerThread, IsMadePausedAndWithoutThread)
{
    EXPECT_FALSE(worker->IsStarted());
    EXPECT_FALSE(worker->IsRunning());
    EXPECT_EQ(driver.CallCount("pthread_create"), 0u);
    EXPECT_TRUE(driver.HasLog(ANDROID_LOG_INFO,
                              "Nib::WorkerThreadImpl::WorkerThreadImpl(const char *, "
                              "Thread::ThreadPriority, bool) Initialize"));
}

TEST_F(WorkerThread, StartRunsAndLogs)
{
    EXPECT_TRUE(worker->Start(!kPaused));
    EXPECT_TRUE(worker->IsStarted());
    EXPECT_TRUE(worker->IsRunning());
    EXPECT_TRUE(driver.HasLog(ANDROID_LOG_INFO,
                              "virtual bool Nib::WorkerThreadImpl::Start(bool) Starting"));
}

TEST_F(WorkerThread, StartOfAStartedOneChangesNothing)
{
    worker->Start(!kPaused);
    EXPECT_TRUE(worker->Start(kPaused));
    EXPECT_TRUE(worker->IsRunning());
    EXPECT_EQ(driver.CountLogContaining("Starting"), 2u);
}

TEST_F(WorkerThread, StartedPausedIsStartedButNotRunning)
{
    worker->Start(kPaused);
    EXPECT_TRUE(worker->IsStarted());
    EXPECT_FALSE(worker->IsRunning());
    worker->Resume();
}

TEST_F(WorkerThread, EndIsLoggedAndTerminates)
{
    worker->Start(!kPaused);
    Notes notes;
    worker->EnqueueAsyncTask(notes.Task("a"));
    worker.reset();
    EXPECT_EQ(notes.texts, (Texts{"a", "end of a"}));
    EXPECT_TRUE(driver.HasLog(ANDROID_LOG_INFO,
                              "virtual Nib::WorkerThreadImpl::~WorkerThreadImpl() Cleanup"));
}

TEST_F(WorkerThread, TerminateRunsEverythingQueuedBefore)
{
    worker->Start(!kPaused);
    Gate gate;
    worker->EnqueueAsyncTask(gate.Task());
    Notes notes;
    for (const char* name : {"a", "b", "c"})
        worker->EnqueueAsyncTask(notes.Task(name));
    gate.Open();
    worker->Terminate();
    EXPECT_EQ(notes.texts, (Texts{"a", "end of a", "b", "end of b", "c", "end of c"}));
    EXPECT_FALSE(worker->IsStarted());
}

TEST_F(WorkerThread, SecondTerminateDoesNothing)
{
    worker->Terminate();
    worker->Start(!kPaused);
    worker->Terminate();
    worker->Terminate();
    EXPECT_FALSE(worker->IsStarted());
}

TEST_F(WorkerThread, CanBeStartedAgain)
{
    for (int round = 0; round < 3; ++round)
    {
        worker->Start(!kPaused);
        bool ran = false;
        LambdaTask task([&ran] { ran = true; });
        worker->RunSyncTask(&task, !kAheadOfQueue, !kDeleteAfterRun);
        EXPECT_TRUE(ran);
        worker->Terminate();
    }
}

TEST_F(WorkerThread, PausedKeepsItsValueThroughTermination)
{
    worker->Start(!kPaused);
    worker->Terminate();
    EXPECT_FALSE(worker->Resume()); // not paused
    EXPECT_FALSE(worker->IsRunning());
}

TEST(WatchedWorkerThread, TasksBehindTheLastOneRunAfterTheNextStart)
{
    SimDriver driver;
    WatchedWorker worker;
    worker.Start(!kPaused);
    Notes notes;
    Gate gate;
    worker.EnqueueAsyncTask(gate.Task());
    std::thread terminator([&] { worker.Terminate(); });
    worker.WaitUntilQueued(2); // the gate's task and the one that ends the worker
    worker.EnqueueAsyncTask(notes.Task("late"));
    gate.Open();
    terminator.join();
    EXPECT_TRUE(notes.texts.empty());

    worker.Start(!kPaused);
    EXPECT_TRUE(worker.WaitForExecution(nullptr));
    EXPECT_EQ(notes.texts, (Texts{"late", "end of late"}));
    worker.Terminate();
}

TEST_F(WorkerThread, TasksQueuedBeforeTheStartRun)
{
    Notes notes;
    worker->EnqueueAsyncTask(notes.Task("a"));
    worker->EnqueueAsyncTask(notes.Task("b"));
    EXPECT_TRUE(notes.texts.empty());
    worker->Start(!kPaused);
    EXPECT_TRUE(worker->WaitForExecution(nullptr));
    EXPECT_EQ(notes.texts, (Texts{"a", "end of a", "b", "end of b"}));
}

TEST_F(WorkerThread, TasksLeftInADestroyedQueueAreNeitherRunNorDeleted)
{
    Notes notes;
    const std::unique_ptr<Nib::ITask> task(notes.Task("a"));
    worker->EnqueueAsyncTask(task.get());
    worker.reset();
    EXPECT_TRUE(notes.texts.empty());
}

TEST_F(WorkerThread, FailedStartIsLoggedAndLeavesItAsMade)
{
    driver.FailNext("pthread_create", EAGAIN);
    EXPECT_FALSE(worker->Start(!kPaused));
    EXPECT_FALSE(worker->IsStarted());
    EXPECT_FALSE(worker->IsRunning());
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              (Texts{"virtual bool Nib::WorkerThreadImpl::Start(bool): Failed to start thrtead"}));
    EXPECT_FALSE(worker->Resume()); // the argument was stored already
    EXPECT_TRUE(worker->Start(!kPaused));
}

// ---- asynchronous tasks -------------------------------------------------------------------------

TEST_F(WorkerThread, AsyncTasksRunInOrderOnItsThreadAndAreDeleted)
{
    worker->Start(!kPaused);
    Notes notes;
    EXPECT_TRUE(worker->EnqueueAsyncTask(notes.Task("a")));
    EXPECT_TRUE(worker->EnqueueAsyncTask(notes.Task("b")));
    std::thread::id thread;
    worker->EnqueueAsyncTask(new LambdaTask([&] { thread = std::this_thread::get_id(); }));
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(notes.texts, (Texts{"a", "end of a", "b", "end of b"}));
    EXPECT_NE(thread, std::this_thread::get_id());
    EXPECT_NE(thread, std::thread::id());
}

TEST_F(WorkerThread, TasksMayPostTasks)
{
    worker->Start(!kPaused);
    Notes notes;
    worker->EnqueueAsyncTask(
        new LambdaTask([&] { worker->EnqueueAsyncTask(notes.Task("inner")); }));
    worker->WaitForExecution(nullptr);
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(notes.texts, (Texts{"inner", "end of inner"}));
}

// ---- synchronous tasks --------------------------------------------------------------------------

TEST_F(WorkerThread, QueuedSyncTaskRunsBehindTheQueue)
{
    worker->Start(!kPaused);
    Notes notes;
    Gate gate;
    worker->EnqueueAsyncTask(gate.Task());
    worker->EnqueueAsyncTask(notes.Task("queued"));
    gate.Open();
    LambdaTask task([&] { notes.texts.push_back("sync"); });
    worker->RunSyncTask(&task, !kAheadOfQueue, !kDeleteAfterRun);
    EXPECT_EQ(notes.texts, (Texts{"queued", "end of queued", "sync"}));
}

TEST_F(WorkerThread, DirectSyncTaskOvertakesTheQueue)
{
    worker->Start(!kPaused);
    Notes notes;
    Gate gate;
    worker->EnqueueAsyncTask(gate.Task());
    gate.WaitUntilReached();
    worker->EnqueueAsyncTask(notes.Task("queued"));
    std::thread caller(
        [&] { worker->RunSyncTask(notes.Task("direct"), kAheadOfQueue, kDeleteAfterRun); });
    // A paused worker says how many tasks it holds: the queued one and the direct one.
    worker->Pause();
    while (driver.CountLogContaining("(Queued task: 2)") == 0)
        worker->WaitForExecution(nullptr);
    worker->Resume();
    gate.Open();
    caller.join();
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(notes.texts, (Texts{"direct", "end of direct", "queued", "end of queued"}));
}

TEST_F(WorkerThread, DirectSyncTaskRunsWhilePausedAndTheQueueWaits)
{
    worker->Start(kPaused);
    Notes notes;
    worker->EnqueueAsyncTask(notes.Task("queued"));
    worker->RunSyncTask(notes.Task("direct"), kAheadOfQueue, kDeleteAfterRun);
    EXPECT_EQ(notes.texts, (Texts{"direct", "end of direct"}));
    EXPECT_TRUE(worker->Resume());
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(notes.texts, (Texts{"direct", "end of direct", "queued", "end of queued"}));
}

TEST(WatchedWorkerThread, QueuedSyncTaskBlocksWhilePausedUntilTheResume)
{
    SimDriver driver;
    WatchedWorker worker;
    worker.Start(kPaused);
    std::atomic<bool> ran{false};
    std::thread caller(
        [&]
        {
            LambdaTask task([&] { ran = true; });
            worker.RunSyncTask(&task, !kAheadOfQueue, !kDeleteAfterRun);
        });
    worker.WaitUntilQueued(1);
    EXPECT_FALSE(ran);
    EXPECT_TRUE(worker.Resume());
    caller.join();
    EXPECT_TRUE(ran);
}

TEST_F(WorkerThread, DeleteFlagDecidesWhoEndsTheTask)
{
    worker->Start(!kPaused);
    for (const bool ahead : {true, false})
    {
        bool deleted = false;
        worker->RunSyncTask(new LambdaTask([] {}, [&] { deleted = true; }), ahead, kDeleteAfterRun);
        EXPECT_TRUE(deleted);
        int result = 0;
        LambdaTask own([&] { result = 42; });
        worker->RunSyncTask(&own, ahead, !kDeleteAfterRun);
        EXPECT_EQ(result, 42);
    }
}

TEST_F(WorkerThread, ManySyncCallersAreServedOneAfterTheOther)
{
    worker->Start(!kPaused);
    int count = 0; // touched on the worker alone
    std::vector<std::thread> callers;
    for (int caller = 0; caller < 4; ++caller)
        callers.emplace_back(
            [&, ahead = caller % 2 == 0]
            {
                for (int i = 0; i < 500; ++i)
                    worker->RunSyncTask(new LambdaTask([&count] { ++count; }), ahead,
                                        kDeleteAfterRun);
            });
    for (std::thread& caller : callers)
        caller.join();
    worker->Terminate();
    EXPECT_EQ(count, 2000);
}

// ---- waiting ------------------------------------------------------------------------------------

TEST_F(WorkerThread, WaitTellsHowManyTasksCameBehind)
{
    worker->Start(!kPaused);
    Notes notes;
    for (const char* name : {"a", "b", "c"})
        worker->EnqueueAsyncTask(notes.Task(name));
    int queuedAfter = -1;
    EXPECT_TRUE(worker->WaitForExecution(&queuedAfter));
    EXPECT_EQ(queuedAfter, 0);
    EXPECT_EQ(notes.texts.size(), 6u);
}

TEST(WatchedWorkerThread, WaitCountsTheTasksBehindIt)
{
    SimDriver driver;
    WatchedWorker worker;
    worker.Start(!kPaused);
    Gate gate;
    worker.EnqueueAsyncTask(gate.Task());
    int queuedAfter = -1;
    std::thread waiter([&] { EXPECT_TRUE(worker.WaitForExecution(&queuedAfter)); });
    worker.WaitUntilQueued(2);
    for (int i = 0; i < 3; ++i)
        worker.EnqueueAsyncTask(new LambdaTask([] {}));
    gate.Open();
    waiter.join();
    EXPECT_EQ(queuedAfter, 3);
}

TEST_F(WorkerThread, WaitOnAPausedOrUnstartedWorkerFailsAtOnce)
{
    const std::string function = "virtual bool Nib::WorkerThreadImpl::WaitForExecution(int *)";
    int untouched = 77;
    EXPECT_FALSE(worker->WaitForExecution(&untouched));
    worker->EnqueueAsyncTask(new LambdaTask([] {}));
    worker->EnqueueAsyncTask(new LambdaTask([] {}));
    worker->Start(kPaused);
    EXPECT_FALSE(worker->WaitForExecution(&untouched));
    EXPECT_EQ(untouched, 77);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              (Texts{function + ". Worker is on pause (Queued task: 0). No task executed.",
                     function + ". Worker is on pause (Queued task: 2). No task executed."}));
    worker->Resume();
}

// ---- pause and resume ---------------------------------------------------------------------------

TEST_F(WorkerThread, ResumeAnswersWhetherItWasPaused)
{
    worker->Start(!kPaused);
    EXPECT_FALSE(worker->Resume());
    EXPECT_TRUE(worker->Pause());
    EXPECT_TRUE(worker->Pause());
    EXPECT_FALSE(worker->IsRunning());
    EXPECT_TRUE(worker->Resume());
    EXPECT_TRUE(worker->IsRunning());
}

TEST_F(WorkerThread, PauseFromATaskHoldsTheRestOfTheQueue)
{
    worker->Start(!kPaused);
    Notes notes;
    Gate gate;
    worker->EnqueueAsyncTask(gate.Task());
    worker->EnqueueAsyncTask(new LambdaTask([this] { worker->Pause(); }));
    worker->EnqueueAsyncTask(notes.Task("held"));
    gate.Open();
    // Runs on the worker once it is paused or before; the held task cannot have run when it is.
    while (worker->IsRunning())
        std::this_thread::yield();
    worker->RunSyncTask(new LambdaTask([] {}), kAheadOfQueue, kDeleteAfterRun);
    EXPECT_TRUE(notes.texts.empty());
    worker->Resume();
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(notes.texts, (Texts{"held", "end of held"}));
}

TEST_F(WorkerThread, PauseAndResumeWhileTasksArriveLosesNone)
{
    worker->Start(!kPaused);
    std::atomic<int> ran{0};
    std::thread producer(
        [&]
        {
            for (int i = 0; i < 20000; ++i)
                worker->EnqueueAsyncTask(new LambdaTask([&ran] { ++ran; }));
        });
    for (int i = 0; i < 2000; ++i)
    {
        worker->Pause();
        worker->Resume();
    }
    producer.join();
    worker->Terminate();
    EXPECT_EQ(ran, 20000);
}

// ---- global-lock mode ---------------------------------------------------------------------------

TEST(GlobalLockWorker, TwoOfThemNeverRunAtTheSameTime)
{
    const Worker first(IWorkerThread::CreateInstance_GlobalLock("first", 0));
    const Worker second(IWorkerThread::CreateInstance_GlobalLock("second", 0));
    first->Start(!kPaused);
    second->Start(!kPaused);
    int guarded = 0; // no atomic: the guard orders the accesses
    for (int i = 0; i < 2000; ++i)
    {
        first->EnqueueAsyncTask(new LambdaTask([&] { ++guarded; }));
        second->EnqueueAsyncTask(new LambdaTask([&] { ++guarded; }));
    }
    first->Terminate();
    second->Terminate();
    EXPECT_EQ(guarded, 4000);
}

TEST(GlobalLockWorker, QueuedSyncTaskEntersTheGuardTwice)
{
    const Worker worker(IWorkerThread::CreateInstance_GlobalLock("worker", 0));
    worker->Start(!kPaused);
    bool ran = false;
    worker->RunSyncTask(new LambdaTask([&] { ran = true; }), !kAheadOfQueue, kDeleteAfterRun);
    EXPECT_TRUE(ran);
}

// ---- the thread's queue -------------------------------------------------------------------------

namespace
{

class NamedQueue : public Nib::IGLMsgQueue
{
public:
    bool enQueueMsg(Nib::ITask*) override { return false; }
    bool waitForCompleting() override { return false; }
    bool isRunning() override { return false; }
    const char* getTag() override { return "named"; }
};

} // namespace

TEST(CurrentMsgQueue, IsNullUntilAttachedAndOfOneThreadAlone)
{
    EXPECT_EQ(Nib::GetCurrentMsgQueue(), nullptr);
    NamedQueue queue;
    Nib::AttachToThread(&queue);
    EXPECT_EQ(Nib::GetCurrentMsgQueue(), &queue);
    std::thread([] { EXPECT_EQ(Nib::GetCurrentMsgQueue(), nullptr); }).join();
    Nib::AttachToThread(nullptr);
    EXPECT_EQ(Nib::GetCurrentMsgQueue(), nullptr);
}

TEST(MsgQueue, TearingIsNotAllowed)
{
    NamedQueue queue;
    EXPECT_FALSE(queue.setTearingAllowed(true));
    EXPECT_FALSE(queue.setTearingAllowed(false));
}
