#include "sim/SimDriver.h"
#include "thread/GlobalLocker.h"
#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

using namespace Nib;

namespace
{

class WorkerThreadSync : public testing::Test
{
protected:
    WorkerThreadSync() { worker->Start(!kPaused); }

    SimDriver driver;
    Record record;
    std::unique_ptr<IWorkerThread> worker{IWorkerThread::CreateInstance_NoLock("worker", 0)};
};

/// A task on the stack that keeps what it found.
class FindThread : public ITask
{
public:
    void run() override { thread = Thread::self(); }
    Thread::Handle thread = 0;
};

/// A task that does not want the process-wide guard.
class UnguardedTask : public CallTask
{
public:
    using CallTask::CallTask;
    bool isGlobalLockAllowed() override { return false; }
};

} // namespace

TEST_F(WorkerThreadSync, HasRunWhenTheCallReturns)
{
    FindThread ahead;
    worker->RunSyncTask(&ahead, kAheadOfQueue, !kDeleteAfterRun);
    FindThread queued;
    worker->RunSyncTask(&queued, !kAheadOfQueue, !kDeleteAfterRun);

    EXPECT_NE(ahead.thread, 0);
    EXPECT_NE(ahead.thread, Thread::self());
    EXPECT_EQ(queued.thread, ahead.thread);
}

TEST_F(WorkerThreadSync, DeletesTheTaskOnlyWhenAsked)
{
    for (const bool ahead : {kAheadOfQueue, !kAheadOfQueue})
    {
        std::atomic<int> deleted{0};
        ITask* const kept = new CallTask([] {}, &deleted);
        worker->RunSyncTask(kept, ahead, !kDeleteAfterRun);
        EXPECT_EQ(deleted.load(), 0);
        delete kept;
        deleted = 0;
        worker->RunSyncTask(new CallTask([] {}, &deleted), ahead, kDeleteAfterRun);
        EXPECT_EQ(deleted.load(), 1);
    }
}

TEST_F(WorkerThreadSync, QueuedItRunsBehindTheQueue)
{
    {
        Gate gate(*worker);
        worker->EnqueueAsyncTask(record.NewTask(1));
        worker->EnqueueAsyncTask(record.NewTask(2));
    }
    worker->RunSyncTask(record.NewTask(3), !kAheadOfQueue, kDeleteAfterRun);
    EXPECT_EQ(record.Entries(), Numbers({1, 2, 3}));
}

TEST_F(WorkerThreadSync, AheadItRunsBeforeTheQueue)
{
    Gate gate(*worker);
    worker->EnqueueAsyncTask(record.NewTask(1));
    worker->EnqueueAsyncTask(record.NewTask(2));
    const int before = SignalsSoFar();
    std::thread caller([this]
                       { worker->RunSyncTask(record.NewTask(0), kAheadOfQueue, kDeleteAfterRun); });
    WaitForSignals(before, 1); // the task is in its slot
    gate.Open();
    caller.join();
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(record.Entries(), Numbers({0, 1, 2}));
}

TEST_F(WorkerThreadSync, AheadItRunsOnAPausedWorkerAtOnce)
{
    worker->Pause();
    worker->EnqueueAsyncTask(record.NewTask(1));
    worker->RunSyncTask(record.NewTask(0), kAheadOfQueue, kDeleteAfterRun);
    EXPECT_EQ(record.Entries(), Numbers({0}));
    worker->Resume();
}

TEST_F(WorkerThreadSync, AheadItIsCountedUntilItRuns)
{
    Gate gate(*worker);
    worker->EnqueueAsyncTask(record.NewTask(1));
    worker->Pause();
    std::thread caller([this]
                       { worker->RunSyncTask(record.NewTask(0), kAheadOfQueue, kDeleteAfterRun); });
    while (driver.CountLogContaining("(Queued task: 2)") == 0)
        worker->WaitForExecution(nullptr); // which says what is queued, and runs nothing
    gate.Open();
    caller.join();
    driver.ForgetLog();
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(driver.CountLogContaining("(Queued task: 1)"), 1u);
    worker->Resume();
}

TEST_F(WorkerThreadSync, QueuedItWaitsUntilAPausedWorkerIsResumed)
{
    worker->Pause();
    std::atomic<bool> ran{false};
    std::thread caller(
        [&] {
            worker->RunSyncTask(new CallTask([&] { ran.store(true); }), !kAheadOfQueue,
                                kDeleteAfterRun);
        });
    while (driver.CountLogContaining("(Queued task: 1)") == 0)
        worker->WaitForExecution(nullptr);
    EXPECT_FALSE(ran.load());
    worker->Resume();
    caller.join();
    EXPECT_TRUE(ran.load());
}

TEST_F(WorkerThreadSync, SignalsTheWorkerAlsoWhenPausedAndThenTheCaller)
{
    worker->Pause();
    const int before = SignalsSoFar();
    worker->RunSyncTask(record.NewTask(0), kAheadOfQueue, kDeleteAfterRun);
    EXPECT_EQ(SignalsSoFar() - before, 2);
    worker->Resume();
}

TEST_F(WorkerThreadSync, OneCallerAtATime)
{
    constexpr int kTurns = kUnderThreadSanitizer ? 500 : 3000;
    int sum = 0; // changed on the worker's thread alone
    std::vector<std::thread> callers;
    for (int i = 0; i < 4; ++i)
    {
        callers.emplace_back(
            [&, ahead = i % 2 == 0]
            {
                for (int n = 0; n < kTurns; ++n)
                {
                    bool ran = false;
                    CallTask task(
                        [&]
                        {
                            ++sum;
                            ran = true;
                        });
                    worker->RunSyncTask(&task, ahead, !kDeleteAfterRun);
                    EXPECT_TRUE(ran);
                }
            });
    }
    for (std::thread& caller : callers)
        caller.join();
    EXPECT_EQ(sum, 4 * kTurns);
}

TEST_F(WorkerThreadSync, MixesWithPostsFromOtherThreads)
{
    constexpr int kTurns = kUnderThreadSanitizer ? 2000 : 20000;
    std::atomic<int> ran{0};
    std::thread producer(
        [&]
        {
            for (int i = 0; i < kTurns; ++i)
                worker->EnqueueAsyncTask(new CallTask([&] { ran.fetch_add(1); }));
        });
    for (int i = 0; i < kTurns / 10; ++i)
    {
        CallTask task([&] { ran.fetch_add(1); });
        worker->RunSyncTask(&task, i % 2 == 0, !kDeleteAfterRun);
    }
    producer.join();
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(ran.load(), kTurns + kTurns / 10);
}

// ---- the process-wide guard ----

namespace
{

class GlobalLockWorkers : public testing::Test
{
protected:
    GlobalLockWorkers()
    {
        first->Start(!kPaused);
        second->Start(!kPaused);
    }

    SimDriver driver;
    std::unique_ptr<IWorkerThread> first{IWorkerThread::CreateInstance_GlobalLock("first", 0)};
    std::unique_ptr<IWorkerThread> second{IWorkerThread::CreateInstance_GlobalLock("second", 0)};
};

} // namespace

TEST_F(GlobalLockWorkers, RunOneTaskAtATime)
{
    int inside = 0; // without a lock of its own
    int ran = 0;
    const auto task = [&]
    {
        EXPECT_EQ(++inside, 1);
        std::this_thread::yield();
        ++ran;
        --inside;
    };
    for (int i = 0; i < 500; ++i)
    {
        first->EnqueueAsyncTask(new CallTask(task));
        second->EnqueueAsyncTask(new CallTask(task));
    }
    first->WaitForExecution(nullptr);
    second->WaitForExecution(nullptr);
    EXPECT_EQ(ran, 1000);
}

TEST_F(GlobalLockWorkers, WaitForTheGuard)
{
    std::atomic<bool> ran{false};
    {
        const AutoCriticalSection guard(GlobalLocker::m_guard);
        first->EnqueueAsyncTask(new CallTask([&] { ran.store(true); }));
        // The other worker works meanwhile, for a task that does without the guard.
        for (int i = 0; i < 100; ++i)
            second->RunSyncTask(new UnguardedTask([] {}), kAheadOfQueue, kDeleteAfterRun);
        EXPECT_FALSE(ran.load());
    }
    first->WaitForExecution(nullptr);
    EXPECT_TRUE(ran.load());
}

TEST_F(GlobalLockWorkers, EnterTheGuardTwiceForAQueuedSynchronousTask)
{
    bool ran = false;
    first->RunSyncTask(new CallTask([&] { ran = true; }), !kAheadOfQueue, kDeleteAfterRun);
    EXPECT_TRUE(ran);

    GlobalLocker::m_guard.Enter(); // it was left as often as it was entered
    GlobalLocker::m_guard.Leave();
}

TEST_F(GlobalLockWorkers, GuardSynchronousTasksAheadOfTheQueueToo)
{
    Event entered;
    Event open;
    std::thread caller(
        [&]
        {
            first->RunSyncTask(new CallTask(
                                   [&]
                                   {
                                       entered.Set();
                                       open.Wait();
                                   }),
                               kAheadOfQueue, kDeleteAfterRun);
        });
    entered.Wait();
    std::atomic<bool> ran{false};
    second->EnqueueAsyncTask(new CallTask([&] { ran.store(true); }));
    for (int i = 0; i < 1000; ++i)
        std::this_thread::yield();
    EXPECT_FALSE(ran.load());
    open.Set();
    caller.join();
    second->WaitForExecution(nullptr);
    EXPECT_TRUE(ran.load());
}

TEST_F(GlobalLockWorkers, WorkersWithoutItRunAtTheSameTime)
{
    const std::unique_ptr<IWorkerThread> a(IWorkerThread::CreateInstance_NoLock("a", 0));
    const std::unique_ptr<IWorkerThread> b(IWorkerThread::CreateInstance_NoLock("b", 0));
    a->Start(!kPaused);
    b->Start(!kPaused);
    Event fromA;
    Event fromB;
    const AutoCriticalSection guard(GlobalLocker::m_guard); // which none of the two enters
    a->EnqueueAsyncTask(new CallTask(
        [&]
        {
            fromA.Set();
            fromB.Wait();
        }));
    b->EnqueueAsyncTask(new CallTask(
        [&]
        {
            fromB.Set();
            fromA.Wait();
        }));
    EXPECT_TRUE(a->WaitForExecution(nullptr));
    EXPECT_TRUE(b->WaitForExecution(nullptr));
}
