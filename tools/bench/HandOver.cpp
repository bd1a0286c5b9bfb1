#include "bench/HandOver.h"

#include "UserError.h"

#include <nib/task.h>
#include <nib/worker_thread.h>

#include <future>
#include <memory>
#include <thread>
#include <utility>

namespace
{

using Clock = Stopwatch::Clock;

constexpr int kPostsInARow = 10000;
constexpr int kCallsInARow = 100;
constexpr std::chrono::milliseconds kUntilAsleep{1}; // a worker spins for a shorter time
constexpr bool kAheadOfQueue = true;
constexpr bool kStaysTheCallers = false;

class EmptyTask : public Nib::ITask
{
public:
    void run() override {}
};

/// Keeps the worker busy until it is told.
class GateTask : public Nib::ITask
{
public:
    explicit GateTask(std::future<void> opened) : m_opened(std::move(opened)) {}
    void run() override { m_opened.wait(); }

private:
    std::future<void> m_opened;
};

/// Tells when it ran.
class ClockTask : public Nib::ITask
{
public:
    explicit ClockTask(std::promise<Clock::time_point> ran) : m_ran(std::move(ran)) {}
    void run() override { m_ran.set_value(Clock::now()); }

private:
    std::promise<Clock::time_point> m_ran;
};

/// The mean time of one post in nanoseconds, while the worker is held.
float TimeOfPosts(Nib::IWorkerThread& worker)
{
    std::promise<void> gate;
    worker.EnqueueAsyncTask(new GateTask(gate.get_future()));
    const Clock::time_point start = Clock::now();
    for (int i = 0; i < kPostsInARow; ++i)
        worker.EnqueueAsyncTask(new EmptyTask);
    const float time = Stopwatch::Since(start);
    gate.set_value();
    worker.WaitForExecution(nullptr);
    return 1000.0f * time / kPostsInARow;
}

float TimeOfCall(Nib::IWorkerThread& worker)
{
    EmptyTask task;
    const Clock::time_point start = Clock::now();
    worker.RunSyncTask(&task, kAheadOfQueue, kStaysTheCallers);
    return Stopwatch::Since(start);
}

float TimeOfWake(Nib::IWorkerThread& worker)
{
    std::this_thread::sleep_for(kUntilAsleep);
    std::promise<Clock::time_point> promise;
    std::future<Clock::time_point> ran = promise.get_future();
    const Clock::time_point start = Clock::now();
    worker.EnqueueAsyncTask(new ClockTask(std::move(promise)));
    return Stopwatch::Microseconds(ran.get() - start).count();
}

} // namespace

HandOver MeasureHandOver(Stopwatch& stopwatch)
{
    const std::unique_ptr<Nib::IWorkerThread> worker(
        Nib::IWorkerThread::CreateInstance_NoLock("nib bench", 0));
    if (!worker->Start(false))
        throw UserError("the worker thread does not start");

    HandOver times;
    TimeOfPosts(*worker); // fills the memory that later tasks take
    for (stopwatch.Begin(0.15); times.posts.empty() || stopwatch.GoesOn();)
        times.posts.push_back(TimeOfPosts(*worker));
    for (stopwatch.Begin(0.15); times.calls.empty() || stopwatch.GoesOn();)
    {
        for (int i = 0; i < kCallsInARow; ++i)
            times.calls.push_back(TimeOfCall(*worker));
    }
    for (stopwatch.Begin(0.1); times.wakes.empty() || stopwatch.GoesOn();)
        times.wakes.push_back(TimeOfWake(*worker));
    return times;
}
