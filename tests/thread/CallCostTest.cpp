// What a synchronous call costs in things that can be counted whatever else the machine does.

#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

#include <sched.h>
#include <sys/resource.h>

using namespace Nib;

namespace
{

long SwitchesSoFar()
{
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return usage.ru_nvcsw + usage.ru_nivcsw;
}

void Call(IWorkerThread& worker, int times)
{
    for (int number = 0; number < times; ++number)
    {
        CallTask task([] {});
        worker.RunSyncTask(&task, !kAheadOfQueue, !kDeleteAfterRun);
    }
}

} // namespace

TEST(CallCost, OnOneProcessorItIsTwoSwitches)
{
    if (kUnderThreadSanitizer)
        GTEST_SKIP() << "a thread sanitizer has threads of its own";
    cpu_set_t one;
    CPU_ZERO(&one);
    CPU_SET(sched_getcpu(), &one);
    ASSERT_EQ(sched_setaffinity(0, sizeof one, &one), 0);
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    worker->Start(!kPaused);
    Call(*worker, 100);

    constexpr int kCalls = 2000;
    const long before = SwitchesSoFar();
    Call(*worker, kCalls);
    // There and back; what is above comes from other processes. A lock that either side runs into
    // would make it more than four.
    EXPECT_LE(SwitchesSoFar() - before, kCalls * 5 / 2);
}

TEST(CallCost, ItsCarriersAreUsedAgain)
{
#if defined(__SANITIZE_ADDRESS__)
    GTEST_SKIP() << "under an address sanitizer every task is allocated";
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
    GTEST_SKIP() << "under an address sanitizer every task is allocated";
#endif
#endif
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    worker->Start(!kPaused);
    const long before = AllocationsOfAllThreads();
    Call(*worker, 5000);
    // The slab that carriers are cut from, and those that are on their way back.
    EXPECT_LE(AllocationsOfAllThreads() - before, 8);
}
