#include "sim/SimDriver.h"
#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>
#include <string>

#include <sys/resource.h>

using namespace Nib;

namespace
{

class WorkerThread : public testing::Test
{
protected:
    static std::unique_ptr<IWorkerThread> NewWorker()
    {
        return std::unique_ptr<IWorkerThread>(IWorkerThread::CreateInstance_NoLock("worker", 0));
    }

    /// Runs @p function on the worker, ahead of its queue.
    static void RunAhead(IWorkerThread& worker, std::function<void()> function)
    {
        worker.RunSyncTask(new CallTask(std::move(function)), kAheadOfQueue, kDeleteAfterRun);
    }

    void Enqueue(std::initializer_list<int> entries)
    {
        for (const int entry : entries)
            EXPECT_TRUE(worker->EnqueueAsyncTask(record.NewTask(entry)));
    }

    /// Starts and terminates @p followed, with @p tasks queued behind the last one that still runs.
    static void TerminateLeaving(FollowedWorker& followed, const std::vector<ITask*>& tasks)
    {
        followed.Start(!kPaused);
        Event allQueued; // until then the worker does not reach the terminate task
        followed.EnqueueQuietly(new CallTask([&] { allQueued.Wait(); }));
        followed.onEnqueue = [&] // the terminate task is in the queue
        {
            for (ITask* task : tasks)
                followed.EnqueueQuietly(task);
            allQueued.Set();
        };
        followed.Terminate();
    }

    /// The number of queued tasks in the line of a wait that a worker refuses, since it is paused.
    std::string QueuedWhilePaused(IWorkerThread& paused)
    {
        driver.ForgetLog();
        EXPECT_FALSE(paused.WaitForExecution(nullptr));
        const std::string line = driver.LogTexts(ANDROID_LOG_ERROR).at(0);
        const std::string head = "virtual bool Nib::WorkerThreadImpl::WaitForExecution(int *). "
                                 "Worker is on pause (Queued task: ";
        const std::string tail = "). No task executed.";
        EXPECT_EQ(line.substr(0, head.size()), head);
        EXPECT_EQ(line.substr(line.size() - tail.size()), tail);
        return line.substr(head.size(), line.size() - head.size() - tail.size());
    }

    SimDriver driver;
    Record record;
    std::unique_ptr<IWorkerThread> worker = NewWorker();
};

template <typename F>
std::ptrdiff_t Slot(F function)
{
    std::ptrdiff_t parts[2] = {};
    static_assert(sizeof function == sizeof parts);
    std::memcpy(parts, &function, sizeof parts);
    return (parts[0] & ~std::ptrdiff_t(1)) / static_cast<std::ptrdiff_t>(sizeof(void*));
}

} // namespace

TEST_F(WorkerThread, OperationsStandInTheExportedOrder)
{
    // Slots 0 and 1 are the destructor's.
    EXPECT_EQ(Slot(&IWorkerThread::Start), 2);
    EXPECT_EQ(Slot(&IWorkerThread::Terminate), 3);
    EXPECT_EQ(Slot(&IWorkerThread::Pause), 4);
    EXPECT_EQ(Slot(&IWorkerThread::Resume), 5);
    EXPECT_EQ(Slot(&IWorkerThread::EnqueueAsyncTask), 6);
    EXPECT_EQ(Slot(&IWorkerThread::IsRunning), 7);
    EXPECT_EQ(Slot(&IWorkerThread::IsStarted), 8);
    EXPECT_EQ(Slot(&IWorkerThread::WaitForExecution), 9);
    EXPECT_EQ(Slot(&IWorkerThread::RunSyncTask), 10);
}

// ---- start and end ----

TEST_F(WorkerThread, IsMadeNeitherStartedNorRunning)
{
    EXPECT_FALSE(worker->IsStarted());
    EXPECT_FALSE(worker->IsRunning());
}

TEST_F(WorkerThread, StartsRunning)
{
    EXPECT_TRUE(worker->Start(!kPaused));
    EXPECT_TRUE(worker->IsStarted());
    EXPECT_TRUE(worker->IsRunning());
}

TEST_F(WorkerThread, StartsPaused)
{
    EXPECT_TRUE(worker->Start(kPaused));
    EXPECT_TRUE(worker->IsStarted());
    EXPECT_FALSE(worker->IsRunning());
    worker->Resume();
}

TEST_F(WorkerThread, StartingAgainChangesNothing)
{
    ASSERT_TRUE(worker->Start(!kPaused));
    EXPECT_TRUE(worker->Start(kPaused));
    EXPECT_TRUE(worker->IsRunning());

    worker->Pause();
    EXPECT_TRUE(worker->Start(!kPaused));
    EXPECT_FALSE(worker->IsRunning());
    worker->Resume();
}

TEST_F(WorkerThread, LogsItsLife)
{
    driver.ForgetLog();
    auto logged = NewWorker();
    logged->Start(!kPaused);
    logged->Terminate();
    logged.reset();

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO),
              (std::vector<std::string>{
                  "Nib::WorkerThreadImpl::WorkerThreadImpl(const char *, Thread::ThreadPriority, "
                  "bool) Initialize",
                  "virtual bool Nib::WorkerThreadImpl::Start(bool) Starting",
                  "virtual Nib::WorkerThreadImpl::~WorkerThreadImpl() Cleanup"}));
    EXPECT_EQ(driver.Log().size(), 3u);
    EXPECT_EQ(driver.Log().front().tag, "nib_log");
}

TEST_F(WorkerThread, EveryStartIsLogged)
{
    worker->Start(!kPaused);
    driver.ForgetLog();
    worker->Start(!kPaused);
    EXPECT_EQ(
        driver.LogTexts(ANDROID_LOG_INFO),
        (std::vector<std::string>{"virtual bool Nib::WorkerThreadImpl::Start(bool) Starting"}));
}

TEST_F(WorkerThread, AThreadThatDoesNotStartIsReported)
{
    driver.ForgetLog();
    driver.FailNext("pthread_create", EAGAIN);

    EXPECT_FALSE(worker->Start(!kPaused));

    EXPECT_FALSE(worker->IsStarted());
    EXPECT_FALSE(worker->IsRunning());
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              (std::vector<std::string>{
                  "virtual bool Nib::WorkerThreadImpl::Start(bool): Failed to start thrtead"}));
}

TEST_F(WorkerThread, StartsAfterAFailure)
{
    Enqueue({1});
    driver.FailNext("pthread_create", EAGAIN);
    EXPECT_FALSE(worker->Start(!kPaused));
    EXPECT_TRUE(worker->Start(!kPaused));
    EXPECT_TRUE(worker->WaitForExecution(nullptr));
    EXPECT_EQ(record.Entries(), Numbers({1}));
}

TEST_F(WorkerThread, AFailedStartKeepsItsPausedFlag)
{
    driver.FailNext("pthread_create", EAGAIN);
    EXPECT_FALSE(worker->Start(!kPaused));
    EXPECT_FALSE(worker->Resume()); // not paused any more
}

TEST_F(WorkerThread, CarriesItsNameAndPriority)
{
    char name[] = "?nk";
    const std::unique_ptr<IWorkerThread> named(IWorkerThread::CreateInstance_NoLock(name, 7));
    name[0] = 'i'; // the caller's text, not a copy
    named->Start(!kPaused);

    char shown[16] = {};
    int nice = 0;
    RunAhead(*named,
             [&]
             {
                 pthread_getname_np(pthread_self(), shown, sizeof shown);
                 nice = getpriority(PRIO_PROCESS, 0);
             });

    EXPECT_STREQ(shown, "ink");
    EXPECT_EQ(nice, 7);
}

TEST_F(WorkerThread, TerminateRunsWhatIsQueued)
{
    worker->Start(!kPaused);
    {
        Gate gate(*worker);
        Enqueue({1, 2, 3});
    }
    worker->Terminate();
    EXPECT_EQ(record.Entries(), Numbers({1, 2, 3}));
    EXPECT_FALSE(worker->IsStarted());
    EXPECT_FALSE(worker->IsRunning());
}

TEST_F(WorkerThread, TerminatingTwiceOrUnstartedDoesNothing)
{
    worker->Terminate();
    EXPECT_FALSE(worker->IsStarted());
    worker->Start(!kPaused);
    worker->Terminate();
    worker->Terminate();
    EXPECT_FALSE(worker->IsStarted());
}

TEST_F(WorkerThread, StartsAgainAfterTerminate)
{
    for (int round = 0; round < 3; ++round)
    {
        EXPECT_TRUE(worker->Start(!kPaused));
        Enqueue({round});
        worker->Terminate();
    }
    EXPECT_EQ(record.Entries(), Numbers({0, 1, 2}));
}

TEST_F(WorkerThread, TerminateKeepsThePausedFlag)
{
    worker->Start(!kPaused);
    worker->Terminate();
    EXPECT_FALSE(worker->Resume()); // it is not paused
}

TEST_F(WorkerThread, DestructionTerminates)
{
    worker->Start(!kPaused);
    {
        Gate gate(*worker);
        Enqueue({1, 2});
    }
    worker.reset();
    EXPECT_EQ(record.Entries(), Numbers({1, 2}));
}

TEST_F(WorkerThread, TasksBehindTheLastOneStayForTheNextStart)
{
    FollowedWorker followed;
    std::atomic<int> deleted{0};

    TerminateLeaving(followed, {new CallTask([&] { record.Add(1); }, &deleted),
                                new CallTask([&] { record.Add(2); }, &deleted)});

    EXPECT_EQ(record.Entries(), Numbers({}));
    EXPECT_EQ(deleted.load(), 0);

    followed.Start(!kPaused);
    followed.Terminate(); // works, although nobody posts anything
    EXPECT_EQ(record.Entries(), Numbers({1, 2}));
    EXPECT_EQ(deleted.load(), 2);
}

TEST_F(WorkerThread, TasksLeftBehindAreCountedAgain)
{
    FollowedWorker followed;
    TerminateLeaving(followed, {record.NewTask(1)});

    EXPECT_EQ(QueuedWhilePaused(followed), "0");
    followed.Start(kPaused);
    EXPECT_EQ(QueuedWhilePaused(followed), "1");

    followed.Resume();
    followed.Terminate();
    EXPECT_EQ(record.Entries(), Numbers({1}));
}

TEST_F(WorkerThread, TasksLeftBehindAreCountedOnce)
{
    FollowedWorker followed;
    TerminateLeaving(followed, {record.NewTask(1)});
    followed.Start(!kPaused);
    followed.Terminate(); // runs it

    followed.Start(kPaused);

    EXPECT_EQ(QueuedWhilePaused(followed), "0");
    followed.Resume();
}

TEST_F(WorkerThread, TasksOfADestroyedWorkerAreNeitherRunNorDeleted)
{
    std::atomic<int> deleted{0};
    ITask* const task = new CallTask([&] { record.Add(1); }, &deleted);
    worker->EnqueueAsyncTask(task);
    worker.reset();
    EXPECT_EQ(record.Entries(), Numbers({}));
    EXPECT_EQ(deleted.load(), 0);
    delete task; // nobody else does
}

// ---- asynchronous tasks ----

TEST_F(WorkerThread, RunsTasksInOrderOnItsOwnThread)
{
    worker->Start(!kPaused);
    std::vector<Thread::Handle> threads;
    std::atomic<int> deleted{0};
    for (int i = 0; i < 5; ++i)
    {
        EXPECT_TRUE(worker->EnqueueAsyncTask(new CallTask(
            [&, i]
            {
                record.Add(i);
                threads.push_back(Thread::self());
            },
            &deleted)));
    }
    EXPECT_TRUE(worker->WaitForExecution(nullptr));

    EXPECT_EQ(record.Entries(), Numbers({0, 1, 2, 3, 4}));
    ASSERT_EQ(threads.size(), 5u);
    for (const Thread::Handle thread : threads)
    {
        EXPECT_EQ(thread, threads.front());
        EXPECT_NE(thread, Thread::self());
    }
    EXPECT_EQ(deleted.load(), 5);
}

TEST_F(WorkerThread, TakesTasksBeforeItIsStarted)
{
    Enqueue({1, 2});
    EXPECT_EQ(record.Entries(), Numbers({}));
    worker->Start(!kPaused);
    EXPECT_TRUE(worker->WaitForExecution(nullptr));
    EXPECT_EQ(record.Entries(), Numbers({1, 2}));
}

TEST_F(WorkerThread, TasksMayPostTasks)
{
    worker->Start(!kPaused);
    worker->EnqueueAsyncTask(new CallTask(
        [this]
        {
            record.Add(1);
            worker->EnqueueAsyncTask(record.NewTask(2));
        }));
    worker->WaitForExecution(nullptr);
    worker->WaitForExecution(nullptr); // behind what the first task posted
    EXPECT_EQ(record.Entries(), Numbers({1, 2}));
}

TEST_F(WorkerThread, IsWokenOnlyWhenItWasIdle)
{
    worker->Start(!kPaused);
    Gate gate(*worker);
    const int before = SignalsSoFar();
    for (int i = 0; i < 1000; ++i)
        worker->EnqueueAsyncTask(new CallTask([] {}));
    EXPECT_EQ(SignalsSoFar() - before, 1); // for the first of them
}

TEST_F(WorkerThread, APausedWorkerIsNotWokenForTasks)
{
    worker->Start(kPaused);
    const int before = SignalsSoFar();
    Enqueue({1, 2, 3});
    EXPECT_EQ(SignalsSoFar() - before, 0);
    worker->Resume();
    EXPECT_EQ(SignalsSoFar() - before, 1);
}

TEST_F(WorkerThread, WakeupSignalsOnce)
{
    FollowedWorker followed;
    const int before = SignalsSoFar();
    followed.Wakeup();
    EXPECT_EQ(SignalsSoFar() - before, 1);
}

TEST_F(WorkerThread, PostingAllocatesNothing)
{
    std::vector<ITask*> tasks;
    for (int i = 0; i < 100; ++i)
        tasks.push_back(new CallTask([] {}));
    worker->Start(!kPaused);

    const long before = AllocationsSoFar();
    for (ITask* task : tasks)
        worker->EnqueueAsyncTask(task);
    EXPECT_EQ(AllocationsSoFar() - before, 0);
}

TEST_F(WorkerThread, AnExceptionOfATaskEndsTheProcess)
{
    EXPECT_DEATH(
        {
            worker->Start(!kPaused);
            worker->EnqueueAsyncTask(
                new CallTask([] { throw std::runtime_error("nobody catches this"); }));
            worker->Terminate();
        },
        "");
}

// ---- pause ----

TEST_F(WorkerThread, TasksWaitWhileItIsPaused)
{
    worker->Start(kPaused);
    Enqueue({1, 2});
    RunAhead(*worker, [this] { record.Add(0); });
    EXPECT_EQ(record.Entries(), Numbers({0}));

    EXPECT_TRUE(worker->Resume());
    EXPECT_TRUE(worker->WaitForExecution(nullptr));
    EXPECT_EQ(record.Entries(), Numbers({0, 1, 2}));
}

TEST_F(WorkerThread, AWakeUpDoesNotMakeAPausedWorkerTouchItsQueue)
{
    FollowedWorker paused;
    const int before = WaitsSoFar();
    paused.Start(kPaused);
    paused.EnqueueAsyncTask(record.NewTask(1));
    WaitForWaits(before, 1);

    paused.Wakeup();
    WaitForWaits(before, 2); // it went back to sleep

    EXPECT_EQ(record.Entries(), Numbers({}));
    paused.Resume();
}

TEST_F(WorkerThread, PauseIsAlwaysTrue)
{
    EXPECT_TRUE(worker->Pause());
    worker->Start(!kPaused);
    EXPECT_TRUE(worker->Pause());
    EXPECT_TRUE(worker->Pause());
    EXPECT_FALSE(worker->IsRunning());
    EXPECT_TRUE(worker->IsStarted());
    worker->Resume();
}

TEST_F(WorkerThread, ResumeIsTrueOnlyWhenItWasPaused)
{
    EXPECT_TRUE(worker->Resume()); // a new worker is paused
    EXPECT_FALSE(worker->Resume());
    worker->Start(kPaused);
    EXPECT_TRUE(worker->Resume());
    EXPECT_TRUE(worker->IsRunning());
}

TEST_F(WorkerThread, ResumingARunningWorkerSignalsNothing)
{
    worker->Start(!kPaused);
    worker->WaitForExecution(nullptr);
    const int before = SignalsSoFar();
    EXPECT_FALSE(worker->Resume());
    EXPECT_EQ(SignalsSoFar() - before, 0);
}

TEST_F(WorkerThread, PauseLetsTheRunningTaskEnd)
{
    worker->Start(!kPaused);
    {
        Gate gate(*worker);
        Enqueue({1});
        worker->Pause();
        gate.Open();
    }
    RunAhead(*worker, [this] { record.Add(0); }); // behind the gate, which has ended
    EXPECT_EQ(record.Entries(), Numbers({0}));
    worker->Resume();
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(record.Entries(), Numbers({0, 1}));
}

TEST_F(WorkerThread, ATaskMayPauseItsWorker)
{
    worker->Start(!kPaused);
    {
        Gate gate(*worker);
        worker->EnqueueAsyncTask(new CallTask([this] { worker->Pause(); }));
        Enqueue({1});
    }
    while (worker->IsRunning())
        std::this_thread::yield();
    RunAhead(*worker, [this] { record.Add(0); });
    EXPECT_EQ(record.Entries(), Numbers({0}));
    worker->Resume();
    worker->WaitForExecution(nullptr);
    EXPECT_EQ(record.Entries(), Numbers({0, 1}));
}

TEST_F(WorkerThread, NoTaskIsLostBetweenPauseAndResume)
{
    constexpr int kTasks = kUnderThreadSanitizer ? 5000 : 50000;
    worker->Start(!kPaused);
    std::atomic<int> ran{0};
    std::atomic<bool> posted{false};
    std::thread producer(
        [&]
        {
            for (int i = 0; i < kTasks; ++i)
                worker->EnqueueAsyncTask(new CallTask([&] { ran.fetch_add(1); }));
            posted.store(true);
        });
    while (!posted.load())
    {
        worker->Pause();
        worker->Resume();
    }
    producer.join();
    // Not woken here: the last task or the last Resume has done that.
    while (ran.load() < kTasks)
        std::this_thread::yield();
    EXPECT_EQ(ran.load(), kTasks);
}

// ---- waiting ----

TEST_F(WorkerThread, WaitForExecutionRunsWhatWasQueued)
{
    worker->Start(!kPaused);
    Enqueue({1, 2, 3});
    int queuedAfter = -5;
    EXPECT_TRUE(worker->WaitForExecution(&queuedAfter));
    EXPECT_EQ(record.Entries(), Numbers({1, 2, 3}));
    EXPECT_EQ(queuedAfter, 0);
}

TEST_F(WorkerThread, WaitForExecutionTellsWhatIsQueuedBehind)
{
    FollowedWorker followed;
    followed.Start(!kPaused);
    Event allQueued;
    followed.EnqueueQuietly(new CallTask([&] { allQueued.Wait(); }));
    followed.onEnqueue = [&] // the wait task is in the queue
    {
        followed.EnqueueQuietly(record.NewTask(1));
        followed.EnqueueQuietly(record.NewTask(2));
        allQueued.Set();
    };
    int queuedAfter = -5;
    EXPECT_TRUE(followed.WaitForExecution(&queuedAfter));
    EXPECT_EQ(queuedAfter, 2);
}

TEST_F(WorkerThread, WaitForExecutionTakesNull)
{
    worker->Start(!kPaused);
    Enqueue({1});
    EXPECT_TRUE(worker->WaitForExecution(nullptr));
    EXPECT_EQ(record.Entries(), Numbers({1}));
}

TEST_F(WorkerThread, WaitForExecutionFailsUnlessItRuns)
{
    Enqueue({1, 2});
    driver.ForgetLog();
    int queuedAfter = -5;

    EXPECT_FALSE(worker->WaitForExecution(&queuedAfter)); // not started
    worker->Start(kPaused);
    EXPECT_FALSE(worker->WaitForExecution(&queuedAfter)); // paused

    EXPECT_EQ(queuedAfter, -5);
    EXPECT_EQ(record.Entries(), Numbers({}));
    const std::string line = "virtual bool Nib::WorkerThreadImpl::WaitForExecution(int *). Worker "
                             "is on pause (Queued task: 2). No task executed.";
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR), (std::vector<std::string>{line, line}));
    worker->Resume();
}
