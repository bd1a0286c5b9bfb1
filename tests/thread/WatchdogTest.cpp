// What the watchdog tells of threads that do not come back. Nobody waits for a time here: the limit
// is a millisecond, the worker is held, and the test goes on once the line is there.

#include <nib/watchdog.h>

#include "sim/SimDriver.h"
#include "thread/InstructionCount.h"
#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <regex>

#include <unistd.h>

using namespace Nib;

namespace
{

constexpr int kShortest = 1;             // ms
constexpr int kNever = 24 * 3600 * 1000; // ms

using WorkerPtr = std::unique_ptr<IWorkerThread>;

class WaitedForTask : public ITask
{
public:
    void run() override {}
};

/// Hands @p worker a task and waits for it.
void CallAndWait(IWorkerThread& worker)
{
    WaitedForTask task;
    worker.RunSyncTask(&task, !kAheadOfQueue, !kDeleteAfterRun);
}

WorkerPtr Started(const char* name)
{
    WorkerPtr worker(IWorkerThread::CreateInstance_NoLock(name, 0));
    worker->Start(!kPaused);
    return worker;
}

/// The watchdog's lines of @p priority whose text contains @p part, without their times and
/// numbers of threads.
std::vector<std::string> WatchdogLines(const SimDriver& driver, int priority,
                                       const std::string& part)
{
    static const std::regex kThread("thread [0-9]+");
    static const std::regex kTime("[0-9]+\\.[0-9] s");
    std::vector<std::string> lines;
    for (const std::string& text : driver.LogTexts(priority))
    {
        const std::string plain =
            std::regex_replace(std::regex_replace(text, kThread, "thread N"), kTime, "T");
        if (plain.find("Watchdog: ") == 0 && plain.find(part) != std::string::npos)
            lines.push_back(plain);
    }
    return lines;
}

std::vector<std::string> Warnings(const SimDriver& driver, const std::string& part)
{
    return WatchdogLines(driver, ANDROID_LOG_WARN, part);
}

void AwaitWarning(const SimDriver& driver, const std::string& part)
{
    while (Warnings(driver, part).empty())
        std::this_thread::yield();
}

using Texts = std::vector<std::string>;

// ---- the switch ---------------------------------------------------------------------------------

TEST(Watchdog, IsOffUnlessAskedFor)
{
    SimDriver driver;
    unsetenv("NIB_WATCHDOG");
    const WorkerPtr worker = Started("worker");
    CallAndWait(*worker);
    EXPECT_EQ(Watchdog::GetLimit(), 0);
    EXPECT_EQ(driver.CountLogContaining("Watchdog"), 0u);
}

TEST(Watchdog, TakesSecondsFromTheEnvironment)
{
    SimDriver driver;
    setenv("NIB_WATCHDOG", "2.5", 1);
    const WorkerPtr worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    EXPECT_EQ(Watchdog::GetLimit(), 2500);
}

TEST(Watchdog, StaysOffWhenTheEnvironmentIsNotANumber)
{
    SimDriver driver;
    setenv("NIB_WATCHDOG", "5s", 1);
    const WorkerPtr worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    EXPECT_EQ(Watchdog::GetLimit(), 0);
    EXPECT_EQ(Warnings(driver, ""),
              Texts({"Watchdog: NIB_WATCHDOG is '5s', not a number of seconds; it stays off."}));
}

TEST(Watchdog, TheApplicationGoesBeforeTheEnvironment)
{
    setenv("NIB_WATCHDOG", "2", 1);
    Watchdog::SetLimit(300);
    const WorkerPtr worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    EXPECT_EQ(Watchdog::GetLimit(), 300);
    Watchdog::SetLimit(-1);
    EXPECT_EQ(Watchdog::GetLimit(), 0);
}

TEST(Watchdog, LeavesTheCostOfAPostAsItIs)
{
    if (IsInstrumented())
        GTEST_SKIP() << "a sanitizer's instructions are counted with ours";
    SimDriver driver;
    const WorkerPtr worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    std::vector<WaitedForTask> tasks(101);
    const auto post = [&]
    {
        for (WaitedForTask& task : tasks)
            worker->EnqueueAsyncTask(&task);
    };
    const long off = InstructionsOf(post);
    if (off < 0)
        GTEST_SKIP() << "this system does not let a process be stepped through";
    Watchdog::SetLimit(kNever);
    EXPECT_EQ(InstructionsOf(post), off);
    EXPECT_LT(off / 101, 40); // a few of them are those of the loop and of the counting itself
}

// ---- calls that last too long -------------------------------------------------------------------

TEST(Watchdog, NamesTheWorkerTheTaskAndWhatKeepsItWaiting)
{
    SimDriver driver;
    const WorkerPtr worker = Started("canvas");
    Watchdog::SetLimit(kShortest);
    {
        Gate gate(*worker);
        std::thread caller([&] { CallAndWait(*worker); });
        AwaitWarning(driver, "has waited");
        AwaitWarning(driver, "has been running");
        gate.Open();
        caller.join();
    }
    Watchdog::SetLimit(kNever); // on a busy machine the end takes longer than a millisecond, too
    worker->Terminate();

    EXPECT_EQ(Warnings(driver, "thread N has waited"),
              Texts({"Watchdog: thread N has waited T for 'canvas' (thread N) to run "
                     "(anonymous namespace)::WaitedForTask; it has been running CallTask for T."}));
    EXPECT_EQ(Warnings(driver, "canvas' (thread N) has been"),
              Texts({"Watchdog: 'canvas' (thread N) has been running CallTask for T."}));
    EXPECT_EQ(WatchdogLines(driver, ANDROID_LOG_INFO, "WaitedForTask"),
              Texts({"Watchdog: thread N waited T in all for 'canvas' (thread N) to run "
                     "(anonymous namespace)::WaitedForTask."}));
    EXPECT_EQ(WatchdogLines(driver, ANDROID_LOG_INFO, "CallTask"),
              Texts({"Watchdog: 'canvas' (thread N) ran CallTask for T in all."}));
}

TEST(Watchdog, SaysThatAWorkerIsPaused)
{
    SimDriver driver;
    const WorkerPtr worker = Started("canvas");
    CallAndWait(*worker); // its thread is there, or the line would say that it is not started
    worker->Pause();
    Watchdog::SetLimit(kShortest);
    std::thread caller([&] { CallAndWait(*worker); });
    AwaitWarning(driver, "WaitedForTask; it is paused.");
    worker->Resume();
    caller.join();
}

TEST(Watchdog, SaysThatAWorkerIsNotStarted)
{
    SimDriver driver;
    const WorkerPtr worker(IWorkerThread::CreateInstance_NoLock("canvas", 0));
    Watchdog::SetLimit(kShortest);
    std::thread caller([&] { CallAndWait(*worker); });
    AwaitWarning(driver, "for 'canvas' to run (anonymous namespace)::WaitedForTask; it is not "
                         "started.");
    // Not through Start(), which waits for the caller.
    static_cast<void>(caller);
    _exit(testing::Test::HasFailure() ? 1 : 0);
}

TEST(Watchdog, ReportsEachOfSeveralCallers)
{
    SimDriver driver;
    const WorkerPtr worker = Started("canvas");
    Watchdog::SetLimit(kShortest);
    Gate gate(*worker);
    std::vector<std::thread> callers;
    for (int number = 0; number < 4; ++number)
        callers.emplace_back([&] { CallAndWait(*worker); });
    while (Warnings(driver, "has waited").size() < 4)
        std::this_thread::yield();
    gate.Open();
    for (std::thread& caller : callers)
        caller.join();
    EXPECT_EQ(Warnings(driver, "has waited").size(), 4u);
}

TEST(Watchdog, IsSilentAboutCallsWithinTheLimit)
{
    SimDriver driver;
    Watchdog::SetLimit(kNever);
    const WorkerPtr worker = Started("canvas");
    for (int number = 0; number < 1000; ++number)
        CallAndWait(*worker);
    worker->WaitForExecution(nullptr);
    worker->Terminate();
    EXPECT_EQ(driver.CountLogContaining("Watchdog"), 0u);
}

TEST(Watchdog, SeesCallsAgainAfterItWasOff)
{
    SimDriver driver;
    Watchdog::SetLimit(kNever);
    const WorkerPtr worker = Started("canvas");
    CallAndWait(*worker);
    Watchdog::SetLimit(0);
    CallAndWait(*worker);
    Watchdog::SetLimit(kShortest);
    Gate gate(*worker);
    AwaitWarning(driver, "has been running CallTask");
}

// ---- calls that cannot return -------------------------------------------------------------------

class WatchdogDeathTest : public testing::Test
{
protected:
    WatchdogDeathTest()
    {
        testing::FLAGS_gtest_death_test_style = "threadsafe";
        Watchdog::SetLimit(kNever);
    }
};

void CallItself()
{
    SimDriver driver;
    IWorkerThread* worker = Started("canvas").release();
    worker->EnqueueAsyncTask(new CallTask([=] { CallAndWait(*worker); }));
    AwaitWarning(driver, "itself");
    _exit(Warnings(driver, "") ==
                  Texts({"Watchdog: 'canvas' (thread N) waits for itself to run "
                         "(anonymous namespace)::WaitedForTask: this call cannot return."})
              ? 0
              : 1);
}

TEST_F(WatchdogDeathTest, TellsAtOnceThatAWorkerWaitsForItself)
{
    EXPECT_EXIT(CallItself(), testing::ExitedWithCode(0), "");
}

/// Each worker waits for the next one, the last for the first; for ever.
void CloseCircle(std::initializer_list<const char*> names)
{
    std::vector<IWorkerThread*> workers;
    for (const char* name : names)
        workers.push_back(Started(name).release());
    // All are held until each has its task, which so comes before what the others wait for.
    std::vector<std::unique_ptr<Gate>> gates;
    for (IWorkerThread* worker : workers)
        gates.push_back(std::make_unique<Gate>(*worker));
    for (std::size_t index = 0; index < workers.size(); ++index)
    {
        IWorkerThread* const next = workers[(index + 1) % workers.size()];
        workers[index]->EnqueueAsyncTask(new CallTask([next] { CallAndWait(*next); }));
    }
}

/// Ends the process, well when the only line about a circle is one of @p expected.
[[noreturn]] void ExitWhenCircleReported(const SimDriver& driver, const Texts& expected)
{
    AwaitWarning(driver, "circle");
    const Texts lines = Warnings(driver, "circle");
    for (const std::string& circle : expected)
    {
        if (lines == Texts({"Watchdog: threads wait for each other in a circle: " + circle +
                            ": these calls cannot return."}))
            _exit(0);
    }
    for (const std::string& line : lines)
        std::fprintf(stderr, "%s\n", line.c_str());
    _exit(1);
}

std::string WaitOf(const char* waiting, const char* target)
{
    return std::string("'") + waiting + "' (thread N) for '" + target +
           "' to run (anonymous namespace)::WaitedForTask";
}

void WaitForEachOther()
{
    SimDriver driver;
    CloseCircle({"a", "b"});
    // Whichever waits last closes the circle, and begins the line.
    const std::string a = WaitOf("a", "b");
    const std::string b = WaitOf("b", "a");
    ExitWhenCircleReported(driver, {a + ", " + b, b + ", " + a});
}

TEST_F(WatchdogDeathTest, TellsAtOnceThatTwoWorkersWaitForEachOther)
{
    EXPECT_EXIT(WaitForEachOther(), testing::ExitedWithCode(0), "");
}

void WaitInACircleOfThree()
{
    SimDriver driver;
    CloseCircle({"a", "b", "c"});
    const std::string a = WaitOf("a", "b");
    const std::string b = WaitOf("b", "c");
    const std::string c = WaitOf("c", "a");
    ExitWhenCircleReported(
        driver, {a + ", " + b + ", " + c, b + ", " + c + ", " + a, c + ", " + a + ", " + b});
}

TEST_F(WatchdogDeathTest, FollowsACircleOfThree)
{
    EXPECT_EXIT(WaitInACircleOfThree(), testing::ExitedWithCode(0), "");
}

TEST(Watchdog, TakesAnAnswerForTheEndOfAWait)
{
    // b has answered a and waits for a in its next task, while a's thread may not yet have noticed:
    // that is no circle.
    SimDriver driver;
    Watchdog::SetLimit(kNever);
    const WorkerPtr a = Started("a");
    const WorkerPtr b = Started("b");
    for (int turn = 0; turn < 2000; ++turn)
    {
        Event done;
        a->EnqueueAsyncTask(new CallTask(
            [&]
            {
                CallTask answer(
                    [&]
                    {
                        b->EnqueueAsyncTask(new CallTask(
                            [&]
                            {
                                CallAndWait(*a);
                                done.Set();
                            }));
                    });
                b->RunSyncTask(&answer, !kAheadOfQueue, !kDeleteAfterRun);
            }));
        done.Wait();
    }
    a->Terminate();
    b->Terminate();
    EXPECT_EQ(Warnings(driver, ""), Texts({}));
}

} // namespace
