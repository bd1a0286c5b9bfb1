// Who may spin while another thread works for it: nobody on one processor, on a paused worker, or
// with NIB_SPIN=0.

#include "thread/SpinPartners.h"
#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

#include <cstdlib>

#include <sched.h>

using namespace Nib;

namespace
{

/// The calling thread, and those that it starts, on one processor until this ends.
class OneProcessor
{
public:
    OneProcessor()
    {
        sched_getaffinity(0, sizeof m_before, &m_before);
        cpu_set_t one;
        CPU_ZERO(&one);
        CPU_SET(sched_getcpu(), &one);
        sched_setaffinity(0, sizeof one, &one);
    }
    ~OneProcessor() { sched_setaffinity(0, sizeof m_before, &m_before); }

    OneProcessor(const OneProcessor&) = delete;
    OneProcessor& operator=(const OneProcessor&) = delete;

private:
    cpu_set_t m_before;
};

bool HasOneProcessor()
{
    return !SpinPartners::CanRunTogether(0, 0);
}

#define NIB_NEEDS_TWO_PROCESSORS()                                                                 \
    if (HasOneProcessor())                                                                         \
    GTEST_SKIP() << "this process may use one processor only"

constexpr std::atomic<std::uint64_t> kThisThread{0}; // as the system's calls take it

/// Calls that @p worker answers, and how many of them asked for a spin.
int SpinsOfCalls(IWorkerThread& worker, int calls)
{
    const int before = SpinsSoFar();
    for (int number = 0; number < calls; ++number)
    {
        CallTask task([] {});
        worker.RunSyncTask(&task, kAheadOfQueue, !kDeleteAfterRun);
    }
    return SpinsSoFar() - before;
}

} // namespace

TEST(SpinPartners, TheWorkerDoesNotSpinBeforeTheFirstCall)
{
    EXPECT_FALSE(SpinPartners().WorkerMaySpin());
}

TEST(SpinPartners, BothMaySpinWhereThereIsAProcessorForEach)
{
    NIB_NEEDS_TWO_PROCESSORS();
    SpinPartners partners;
    EXPECT_TRUE(partners.CallerMaySpin(kThisThread));
    EXPECT_TRUE(partners.WorkerMaySpin());
}

TEST(SpinPartners, NeitherMaySpinOnOneProcessor)
{
    const OneProcessor one;
    SpinPartners partners;
    EXPECT_FALSE(partners.CallerMaySpin(kThisThread));
    EXPECT_FALSE(partners.WorkerMaySpin());
}

TEST(SpinPartners, OneProcessorEachIsEnough)
{
    NIB_NEEDS_TWO_PROCESSORS();
    const OneProcessor one;
    std::atomic<std::uint64_t> elsewhere{0};
    Event isKnown;
    Event done;
    std::thread other(
        [&]
        {
            cpu_set_t rest;
            CPU_ZERO(&rest);
            for (int processor = 0; processor < CPU_SETSIZE; ++processor)
                CPU_SET(processor, &rest);
            sched_setaffinity(0, sizeof rest, &rest);
            const OneProcessor any;
            elsewhere.store(GetNibCurrentThreadId());
            isKnown.Set();
            done.Wait();
        });
    isKnown.Wait();
    // The two may have met on the same processor: then the answer is no, and right as well.
    cpu_set_t mine;
    cpu_set_t theirs;
    sched_getaffinity(0, sizeof mine, &mine);
    sched_getaffinity(static_cast<pid_t>(elsewhere.load()), sizeof theirs, &theirs);
    SpinPartners partners;
    EXPECT_EQ(partners.CallerMaySpin(elsewhere), CPU_EQUAL(&mine, &theirs) == 0);
    done.Set();
    other.join();
}

TEST(SpinPartners, AVainSpinAsksTheSystemAgain)
{
    NIB_NEEDS_TWO_PROCESSORS();
    SpinPartners partners;
    EXPECT_TRUE(partners.CallerMaySpin(kThisThread));
    const OneProcessor one;
    partners.CallerSpunInVain();
    EXPECT_FALSE(partners.CallerMaySpin(kThisThread));
}

TEST(SpinPartners, AVainSpinOfTheWorkerDoesSoToo)
{
    NIB_NEEDS_TWO_PROCESSORS();
    SpinPartners partners;
    EXPECT_TRUE(partners.CallerMaySpin(kThisThread));
    const OneProcessor one;
    partners.WorkerSpunInVain();
    EXPECT_FALSE(partners.WorkerMaySpin());
}

// ---- the worker's calls -------------------------------------------------------------------------

TEST(WorkerSpin, ACallSpins)
{
    NIB_NEEDS_TWO_PROCESSORS();
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    worker->Start(!kPaused);
    EXPECT_EQ(SpinsOfCalls(*worker, 3), 3);
}

TEST(WorkerSpin, ACallOfAPausedWorkerDoesNot)
{
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    worker->Start(kPaused);
    EXPECT_EQ(SpinsOfCalls(*worker, 3), 0);
    worker->Resume();
}

TEST(WorkerSpin, ACallOnOneProcessorDoesNot)
{
    const OneProcessor one;
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    worker->Start(!kPaused);
    EXPECT_EQ(SpinsOfCalls(*worker, 40), 0);
}

TEST(WorkerSpin, TheEnvironmentSwitchesItOff)
{
    setenv("NIB_SPIN", "0", 1);
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    worker->Start(!kPaused);
    EXPECT_EQ(SpinsOfCalls(*worker, 3), 0);
}
