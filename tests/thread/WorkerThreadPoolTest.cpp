#include "sim/SimDriver.h"
#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <map>

#include <sys/resource.h>

using namespace Nib;

namespace
{

constexpr const char* kStarting = "virtual bool Nib::WorkerThreadImpl::Start(bool) Starting";
constexpr const char* kCleanup = "virtual Nib::WorkerThreadImpl::~WorkerThreadImpl() Cleanup";
constexpr const char* kPausedLine = "virtual bool Nib::WorkerThreadImpl::WaitForExecution(int *). "
                                    "Worker is on pause (Queued task: 0). No task executed.";

class WorkerThreadPool : public testing::Test
{
protected:
    static std::unique_ptr<IWorkerThread> NewPool(int count)
    {
        return std::unique_ptr<IWorkerThread>(IWorkerThread::CreatePoolInstance("pool", 0, count));
    }

    /// Of the next threads, number @p which (from 1) does not start.
    void RefuseThread(int which)
    {
        if (which > 1)
            driver.FailNext("pthread_create", 0, which - 1); // these go through
        driver.FailNext("pthread_create", EAGAIN);
    }

    /// The thread that runs the next task handed over asynchronously; the pool runs it at once.
    Thread::Handle NextMember()
    {
        Event done;
        Thread::Handle thread = 0;
        EXPECT_TRUE(pool->EnqueueAsyncTask(new CallTask(
            [&]
            {
                thread = Thread::self();
                done.Set();
            })));
        done.Wait();
        return thread;
    }

    Thread::Handle NextMemberSynchronously(bool ahead)
    {
        Thread::Handle thread = 0;
        pool->RunSyncTask(new CallTask([&] { thread = Thread::self(); }), ahead, kDeleteAfterRun);
        return thread;
    }

    SimDriver driver;
    std::unique_ptr<IWorkerThread> pool = NewPool(3);
};

} // namespace

TEST_F(WorkerThreadPool, GoesRound)
{
    pool->Start(!kPaused);
    const Thread::Handle first = NextMember();
    const Thread::Handle second = NextMember();
    const Thread::Handle third = NextMember();
    EXPECT_NE(first, second);
    EXPECT_NE(second, third);
    EXPECT_NE(third, first);
    EXPECT_EQ(NextMember(), first);
    EXPECT_EQ(NextMember(), second);
    EXPECT_EQ(NextMember(), third);
}

TEST_F(WorkerThreadPool, GivesFiveTasksToThreeMembersInTurn)
{
    pool->Start(!kPaused);
    std::vector<Thread::Handle> threads(5);
    for (std::size_t i = 0; i < threads.size(); ++i)
        pool->EnqueueAsyncTask(new CallTask([&, i] { threads[i] = Thread::self(); }));
    pool->WaitForExecution(nullptr);
    EXPECT_EQ(threads[3], threads[0]);
    EXPECT_EQ(threads[4], threads[1]);
    EXPECT_NE(threads[2], threads[0]);
    EXPECT_NE(threads[2], threads[1]);
    EXPECT_NE(threads[0], threads[1]);
}

TEST_F(WorkerThreadPool, BothHandOversShareTheTurn)
{
    pool->Start(!kPaused);
    const Thread::Handle first = NextMember();
    const Thread::Handle second = NextMemberSynchronously(kAheadOfQueue);
    const Thread::Handle third = NextMemberSynchronously(!kAheadOfQueue);
    EXPECT_NE(first, second);
    EXPECT_NE(second, third);
    EXPECT_NE(third, first);
    EXPECT_EQ(NextMember(), first);
    EXPECT_EQ(NextMember(), second);
    EXPECT_EQ(NextMemberSynchronously(kAheadOfQueue), third);
}

TEST_F(WorkerThreadPool, SynchronousTasksPassTheirFlagsOn)
{
    pool->Start(kPaused);
    std::atomic<int> deleted{0};
    auto kept = std::make_unique<CallTask>([] {}, &deleted);
    pool->RunSyncTask(kept.get(), kAheadOfQueue, !kDeleteAfterRun); // returns although paused
    EXPECT_EQ(deleted.load(), 0);
    pool->RunSyncTask(new CallTask([] {}, &deleted), kAheadOfQueue, kDeleteAfterRun);
    EXPECT_EQ(deleted.load(), 1);
    pool->Resume();
}

TEST_F(WorkerThreadPool, ASynchronousTaskWaitsForItsMemberAlone)
{
    pool->Start(!kPaused);
    Gate gate(*pool); // holds the first member
    NextMemberSynchronously(!kAheadOfQueue);
    NextMemberSynchronously(!kAheadOfQueue);
    SUCCEED();
}

TEST_F(WorkerThreadPool, MembersRunAtTheSameTime)
{
    pool->Start(!kPaused);
    Gate first(*pool);
    Gate second(*pool);
    Gate third(*pool); // all three are inside a task now
    first.Open();
    second.Open();
    third.Open();
    EXPECT_TRUE(pool->WaitForExecution(nullptr));
}

TEST_F(WorkerThreadPool, MembersHaveTheNameAndThePriority)
{
    pool.reset(IWorkerThread::CreatePoolInstance("brush", 6, 2));
    pool->Start(!kPaused);
    for (int i = 0; i < 2; ++i)
    {
        char name[16] = {};
        int nice = 0;
        pool->RunSyncTask(new CallTask(
                              [&]
                              {
                                  pthread_getname_np(pthread_self(), name, sizeof name);
                                  nice = getpriority(PRIO_PROCESS, 0);
                              }),
                          kAheadOfQueue, kDeleteAfterRun);
        EXPECT_STREQ(name, "brush");
        EXPECT_EQ(nice, 6);
    }
}

// ---- what concerns all members ----

TEST_F(WorkerThreadPool, StartsAllMembers)
{
    EXPECT_FALSE(pool->IsStarted());
    EXPECT_FALSE(pool->IsRunning());
    driver.ForgetLog();
    EXPECT_TRUE(pool->Start(!kPaused));
    EXPECT_TRUE(pool->IsStarted());
    EXPECT_TRUE(pool->IsRunning());
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kStarting), 3u);
}

TEST_F(WorkerThreadPool, StartEndsAtTheMemberThatDoesNotStart)
{
    RefuseThread(2);
    driver.ForgetLog();

    EXPECT_FALSE(pool->Start(!kPaused));

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kStarting), 2u); // the third was not asked
    EXPECT_EQ(driver.CountLogContaining(": Failed to start thrtead"), 1u);
    EXPECT_FALSE(pool->IsStarted());
    NextMember(); // the first one works
}

TEST_F(WorkerThreadPool, StartsTheRestAfterAFailure)
{
    RefuseThread(2);
    EXPECT_FALSE(pool->Start(!kPaused));
    EXPECT_TRUE(pool->Start(!kPaused));
    EXPECT_TRUE(pool->IsRunning());
    NextMember();
    NextMember();
    NextMember();
}

TEST_F(WorkerThreadPool, PausesAndResumesAllMembers)
{
    pool->Start(!kPaused);
    EXPECT_TRUE(pool->Pause());
    EXPECT_FALSE(pool->IsRunning());
    EXPECT_TRUE(pool->IsStarted());
    EXPECT_TRUE(pool->Resume());
    EXPECT_TRUE(pool->IsRunning());
}

TEST_F(WorkerThreadPool, ResumeEndsAtAMemberThatWasNotPaused)
{
    RefuseThread(2);
    pool->Start(!kPaused);
    pool->Start(kPaused); // the first runs as before, the others are paused
    Record record;
    for (int i = 0; i < 3; ++i)
        pool->EnqueueAsyncTask(record.NewTask(i));

    EXPECT_FALSE(pool->Resume());

    EXPECT_FALSE(pool->IsRunning());
    // Ahead of the queue each member answers, and what it had queued has not run on two of them.
    for (int i = 0; i < 3; ++i)
        NextMemberSynchronously(kAheadOfQueue);
    for (const int entry : record.Entries())
        EXPECT_EQ(entry, 0);
    EXPECT_TRUE(pool->Pause());
    EXPECT_TRUE(pool->Resume());
    EXPECT_TRUE(pool->WaitForExecution(nullptr));
    EXPECT_EQ(record.Entries().size(), 3u);
}

TEST_F(WorkerThreadPool, WaitsForAllMembersAndLeavesTheCountAlone)
{
    pool->Start(!kPaused);
    std::atomic<int> ran{0};
    for (int i = 0; i < 30; ++i)
        pool->EnqueueAsyncTask(new CallTask([&] { ran.fetch_add(1); }));
    int queuedAfter = -5;
    EXPECT_TRUE(pool->WaitForExecution(&queuedAfter));
    EXPECT_EQ(ran.load(), 30);
    EXPECT_EQ(queuedAfter, -5);
}

TEST_F(WorkerThreadPool, WaitingEndsAtTheFirstMemberThatDoesNotRun)
{
    pool->Start(kPaused);
    driver.ForgetLog();
    int queuedAfter = -5;
    EXPECT_FALSE(pool->WaitForExecution(&queuedAfter));
    EXPECT_EQ(queuedAfter, -5);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR), std::vector<std::string>{kPausedLine});
    pool->Resume();
}

TEST_F(WorkerThreadPool, TerminateEndsTheMembersThatHaveStarted)
{
    RefuseThread(2);
    pool->Start(!kPaused); // only the first
    pool->Terminate();
    RefuseThread(1);
    EXPECT_FALSE(pool->Start(!kPaused)); // so the first had ended
    EXPECT_TRUE(pool->Start(!kPaused));
    pool->Terminate();
    EXPECT_FALSE(pool->IsStarted());
}

TEST_F(WorkerThreadPool, TerminateRunsWhatIsQueuedOnEveryMember)
{
    pool->Start(!kPaused);
    std::atomic<int> ran{0};
    {
        Gate gate(*pool);
        for (int i = 0; i < 9; ++i)
            pool->EnqueueAsyncTask(new CallTask([&] { ran.fetch_add(1); }));
    }
    pool->Terminate();
    EXPECT_EQ(ran.load(), 9);
    EXPECT_FALSE(pool->IsStarted());
}

TEST_F(WorkerThreadPool, DestructionEndsTheMembersFromTheFirstOn)
{
    pool->Start(!kPaused);
    Gate first(*pool);
    driver.ForgetLog();
    std::thread destroyer([this] { pool.reset(); });
    while (driver.CountLog(ANDROID_LOG_INFO, kCleanup) == 0)
        std::this_thread::yield();
    for (int i = 0; i < 1000; ++i)
        std::this_thread::yield();
    // The first member is busy, and none is ended before it.
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kCleanup), 1u);
    first.Open();
    destroyer.join();
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kCleanup), 3u);
}

// ---- without members ----

TEST_F(WorkerThreadPool, WithoutMembersEverythingIsRefused)
{
    for (const int count : {0, -1, -1000})
    {
        pool = NewPool(count);
        EXPECT_FALSE(pool->Start(!kPaused)) << count;
        EXPECT_FALSE(pool->Pause()) << count;
        EXPECT_FALSE(pool->Resume()) << count;
        EXPECT_FALSE(pool->IsRunning()) << count;
        EXPECT_FALSE(pool->IsStarted()) << count;
        int queuedAfter = -5;
        EXPECT_FALSE(pool->WaitForExecution(&queuedAfter)) << count;
        EXPECT_EQ(queuedAfter, -5) << count;
        pool->Terminate();
    }
}

TEST_F(WorkerThreadPool, WithoutMembersATaskStaysTheCallers)
{
    for (const int count : {0, -1})
    {
        pool = NewPool(count);
        std::atomic<int> deleted{0};
        bool ran = false;
        auto task = std::make_unique<CallTask>([&] { ran = true; }, &deleted);
        EXPECT_FALSE(pool->EnqueueAsyncTask(task.get()));
        pool->RunSyncTask(task.get(), kAheadOfQueue, kDeleteAfterRun);
        pool->RunSyncTask(task.get(), !kAheadOfQueue, kDeleteAfterRun);
        EXPECT_FALSE(ran);
        EXPECT_EQ(deleted.load(), 0);
    }
}

// ---- many tasks ----

TEST_F(WorkerThreadPool, EightMembersShareManyTasksEvenly)
{
    constexpr int kMembers = 8;
    pool = NewPool(kMembers);
    pool->Start(!kPaused);
    std::mutex mutex;
    std::map<Thread::Handle, int> total;
    static thread_local int t_ran;
    for (int i = 0; i < kManyTasks; ++i)
        pool->EnqueueAsyncTask(new CallTask([] { ++t_ran; }));
    EXPECT_TRUE(pool->WaitForExecution(nullptr));
    for (int i = 0; i < kMembers; ++i)
    {
        pool->RunSyncTask(new CallTask(
                              [&]
                              {
                                  const std::lock_guard lock(mutex);
                                  total[Thread::self()] = t_ran;
                              }),
                          kAheadOfQueue, kDeleteAfterRun);
    }
    ASSERT_EQ(total.size(), 8u);
    for (const auto& [thread, ran] : total)
        EXPECT_EQ(ran, kManyTasks / 8);
}

TEST_F(WorkerThreadPool, SeveralProducersLoseNothing)
{
    constexpr int kEach = kUnderThreadSanitizer ? 5000 : 50000;
    pool->Start(!kPaused);
    std::atomic<int> ran{0};
    std::vector<std::thread> producers;
    for (int i = 0; i < 4; ++i)
    {
        producers.emplace_back(
            [&]
            {
                for (int n = 0; n < kEach; ++n)
                    EXPECT_TRUE(pool->EnqueueAsyncTask(new CallTask([&] { ran.fetch_add(1); })));
            });
    }
    for (std::thread& producer : producers)
        producer.join();
    EXPECT_TRUE(pool->WaitForExecution(nullptr));
    EXPECT_EQ(ran.load(), 4 * kEach);
}
