// What workers tell a trace.

#include "sim/SimDriver.h"
#include "thread/InstructionCount.h"
#include "thread/TaskScope.h"
#include "thread/ThreadTestSupport.h"
#include "TraceCapture.h"

#include <gtest/gtest.h>

#include <cstdlib>

using namespace Nib;

namespace
{

using Texts = std::vector<std::string>;
using Kind = TraceEvent::Kind;

class DrawTask : public ITask
{
public:
    void run() override {}
};

class WorkerTrace : public testing::Test
{
protected:
    std::unique_ptr<IWorkerThread> Started()
    {
        std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("canvas", 0));
        worker->Start(!kPaused);
        return worker;
    }

    /// A process of its own would do as well: no lines of the log on standard error.
    SimDriver m_driver;
};

TEST_F(WorkerTrace, HasALaneWithEachTaskByTheNameOfItsType)
{
    const TraceCapture capture;
    const auto worker = Started();
    worker->EnqueueAsyncTask(new DrawTask);
    worker->EnqueueAsyncTask(new CallTask([] { Trace::Instant("work", "called"); }));
    worker->Terminate();

    EXPECT_EQ(capture.Lane("canvas", {"task", "work"}),
              Texts({"+(anonymous namespace)::DrawTask", "-", "+CallTask", "!called", "-",
                     "+Nib::WorkerThreadImpl::TerminateTask", "-"}));
}

TEST_F(WorkerTrace, TellsOfASynchronousTaskOnBothLanes)
{
    const TraceCapture capture;
    const auto worker = Started();
    const TraceLane lane("caller");
    DrawTask queued;
    worker->RunSyncTask(&queued, !kAheadOfQueue, !kDeleteAfterRun);
    DrawTask ahead;
    worker->RunSyncTask(&ahead, kAheadOfQueue, !kDeleteAfterRun);

    EXPECT_EQ(capture.Lane("caller", {"wait"}), Texts({"+wait", "-", "+wait", "-"}));
    const CapturedEvent wait = [&]
    {
        for (const CapturedEvent& event : capture.Events())
        {
            if (event.lane == "caller")
                return event;
        }
        return CapturedEvent{};
    }();
    EXPECT_EQ(wait.Argument("for"), "canvas");
    EXPECT_EQ(wait.Argument("task"), "(anonymous namespace)::DrawTask");
    const std::string task = "+(anonymous namespace)::DrawTask";
    EXPECT_EQ(capture.Lane("canvas", {"task"}), Texts({task, "-", task, "-"}));
}

TEST_F(WorkerTrace, TellsThatItIsIdle)
{
    const TraceCapture capture;
    const int before = WaitsSoFar();
    const auto worker = Started();
    WaitForWaits(before, 1);
    worker->Terminate();
    const Texts waits = capture.Lane("canvas", {"wait"});
    ASSERT_GE(waits.size(), 2u);
    EXPECT_EQ(waits[0], "+idle");
    EXPECT_EQ(waits[1], "-");
}

TEST_F(WorkerTrace, CountsTheTasksThatWait)
{
    const TraceCapture capture;
    const auto worker = Started();
    {
        Gate gate(*worker);
        worker->EnqueueAsyncTask(new DrawTask);
        worker->EnqueueAsyncTask(new DrawTask);
        const Texts depths = capture.Lane("canvas", {"queue"});
        ASSERT_GE(depths.size(), 3u);
        EXPECT_EQ(Texts(depths.end() - 2, depths.end()), Texts({"queue=1", "queue=2"}));
    }
    worker->Terminate();
    EXPECT_EQ(capture.Lane("canvas", {"queue"}).back(), "queue=0");
}

TEST_F(WorkerTrace, TheLaneOfAWorkerIsItsThread)
{
    const TraceCapture capture;
    const auto worker = Started();
    std::uint64_t thread = 0;
    CallTask ask([&] { thread = GetNibCurrentThreadId(); });
    worker->RunSyncTask(&ask, !kAheadOfQueue, !kDeleteAfterRun);
    worker->Terminate();
    for (const CapturedEvent& event : capture.Events())
        EXPECT_EQ(event.thread == thread, event.lane == "canvas");
}

TEST_F(WorkerTrace, ATaskThatRunsWhenTheTraceBeginsIsNotTold)
{
    const auto worker = Started();
    Gate gate(*worker);
    const TraceCapture capture;
    worker->EnqueueAsyncTask(new DrawTask);
    gate.Open();
    worker->Terminate();
    EXPECT_EQ(capture.Lane("canvas", {"task"}),
              Texts({"+(anonymous namespace)::DrawTask", "-",
                     "+Nib::WorkerThreadImpl::TerminateTask", "-"}));
}

TEST_F(WorkerTrace, BeginsWithTheFirstWorkerWhenTheEnvironmentSaysSo)
{
    setenv("NIB_TRACE", "/dev/null", 1);
    EXPECT_FALSE(Trace::IsOn());
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("canvas", 0));
    EXPECT_TRUE(Trace::IsOn());
    EXPECT_TRUE(Trace::Stop());
}

TEST_F(WorkerTrace, MayBeginAndEndWhileWorkersRun)
{
    const auto worker = Started();
    std::atomic<bool> stop{false};
    std::thread producer(
        [&]
        {
            while (!stop.load())
            {
                worker->EnqueueAsyncTask(new DrawTask);
                worker->WaitForExecution(nullptr);
            }
        });
    for (int round = 0; round < 50; ++round)
    {
        const TraceCapture capture;
        while (capture.Lane("canvas", {"task"}).size() < 4)
            std::this_thread::yield();
        int depth = 0;
        for (const CapturedEvent& event : capture.Events())
        {
            if (event.lane != "canvas")
                continue;
            depth += event.kind == Kind::Begin ? 1 : event.kind == Kind::End ? -1 : 0;
            ASSERT_GE(depth, 0);
        }
    }
    stop.store(true);
    producer.join();
}

// ---- its price ----------------------------------------------------------------------------------

TEST_F(WorkerTrace, ASwitchedOffScopeIsALookAtANumber)
{
    if (IsInstrumented())
        GTEST_SKIP() << "a sanitizer's instructions are counted with ours";
    constexpr long kTurns = 100;
    const auto turns = [](auto turn)
    {
        for (long number = 0; number < kTurns; ++number)
            turn();
    };
    const long bare = InstructionsOf([&] { turns([] { asm volatile(""); }); });
    if (bare < 0)
        GTEST_SKIP() << "this system does not let a process be stepped through";
    const auto extra = [&](auto turn)
    { return (InstructionsOf([&] { turns(turn); }) - bare) / kTurns; };
    EXPECT_LE(extra([] { const TraceScope scope("work", "turn"); }), 8);
    EXPECT_LE(extra([] { Trace::Instant("work", "turn"); }), 5);
    EXPECT_LE(extra([] { Trace::Counter("work", "turns", 1); }), 5);
    DrawTask task;
    EXPECT_LE(extra([&] { const TaskScope scope(task); }), 8);
}

TEST_F(WorkerTrace, ASwitchedOffTraceAllocatesNothing)
{
    DrawTask task;
    const long before = AllocationsSoFar();
    {
        const TraceScope scope("work", "turn", {{"points", 1}});
        const TaskScope run(task);
        const TaskScope wait("canvas", task);
        Trace::Instant("work", "turn", {{"brush", "pen"}});
        Trace::Counter("work", "turns", 1);
    }
    EXPECT_EQ(AllocationsSoFar(), before);
}

} // namespace
