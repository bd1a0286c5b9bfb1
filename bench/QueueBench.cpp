// Handing work to another thread: posts, wakes, synchronous calls, frames, pools, beside peers and
// the bare system call. Run it on a quiet machine, and read each row as a ratio to those of its
// group; processor time says more than real time on a busy one.
//
// Times are of one processor for the caller and one for the worker where the system has two.

#include "Executors.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <string>

#include <linux/futex.h>
#include <sched.h>
#include <sys/resource.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace
{

using Clock = std::chrono::steady_clock;

double Nanoseconds(Clock::duration time)
{
    return std::chrono::duration<double, std::nano>(time).count();
}

/// Binds the calling thread to one processor, where there is one of that number.
void PinTo(int processor)
{
    cpu_set_t set;
    CPU_ZERO(&set);
    CPU_SET(processor, &set);
    sched_setaffinity(0, sizeof set, &set);
}

void Unpin()
{
    cpu_set_t set;
    std::memset(&set, 0xff, sizeof set);
    sched_setaffinity(0, sizeof set, &set);
}

/// Times of single calls; their middle and their worst hundredth become counters.
class Samples
{
public:
    explicit Samples(benchmark::State& state) : m_state(state) { m_times.reserve(1 << 20); }
    ~Samples()
    {
        if (m_times.empty())
            return;
        std::sort(m_times.begin(), m_times.end());
        m_state.counters["p50_ns"] = m_times[m_times.size() / 2];
        m_state.counters["p99_ns"] = m_times[m_times.size() * 99 / 100];
    }
    void Add(Clock::duration time) { m_times.push_back(Nanoseconds(time)); }

private:
    benchmark::State& m_state;
    std::vector<double> m_times;
};

/// A word that one thread sets and another one sleeps on: nothing but the system call.
class BareFutex
{
public:
    void Set(int value)
    {
        m_word.store(value, std::memory_order_release);
        syscall(SYS_futex, &m_word, FUTEX_WAKE_PRIVATE, 1, nullptr, nullptr, 0);
    }
    void WaitFor(int value)
    {
        for (int seen = m_word.load(std::memory_order_acquire); seen != value;
             seen = m_word.load(std::memory_order_acquire))
            syscall(SYS_futex, &m_word, FUTEX_WAIT_PRIVATE, seen, nullptr, nullptr, 0);
    }

private:
    std::atomic<int> m_word{0};
};

/// What drawing posts: a call with an object and a few arguments. More than what fits into the
/// buffer of std::function, as in most programs.
struct Stroke
{
    void* canvas = nullptr;
    double x = 0;
    double y = 0;
    double pressure = 0;

    void operator()() const { benchmark::DoNotOptimize(this); }
};

/// Switches of this process between its threads, told as so many for each call.
class Switches
{
public:
    explicit Switches(benchmark::State& state) : m_state(state), m_before(SoFar()) {}
    ~Switches()
    {
        m_state.counters["switches"] =
            static_cast<double>(SoFar() - m_before) / static_cast<double>(m_state.iterations());
    }
    Switches(const Switches&) = delete;
    Switches& operator=(const Switches&) = delete;

private:
    static long SoFar()
    {
        rusage usage{};
        getrusage(RUSAGE_SELF, &usage);
        return usage.ru_nvcsw + usage.ru_nivcsw;
    }

    benchmark::State& m_state;
    long m_before;
};

// ---- a post to a busy worker --------------------------------------------------------------------

template <typename Executor>
void BM_Post(benchmark::State& state)
{
    static std::unique_ptr<Executor> executor;
    if (state.thread_index() == 0)
        executor = std::make_unique<Executor>(1);
    for (auto _ : state)
        executor->Post(Stroke());
    state.SetItemsProcessed(state.iterations());
    if (state.thread_index() == 0)
        executor.reset();
}

#define NIB_POSTS(executor) BENCHMARK_TEMPLATE(BM_Post, executor)->Iterations(1 << 17)
NIB_POSTS(NibExecutor);
NIB_POSTS(LockedDequeExecutor);
NIB_POSTS(MoodycamelExecutor);
NIB_POSTS(AsioExecutor);
NIB_POSTS(TbbExecutor);
NIB_POSTS(UvExecutor);

// ---- posts of several threads to one worker -----------------------------------------------------

/// Lets go of some threads at once.
class StartLine
{
public:
    /// Called by each thread.
    void Wait() const
    {
        while (!m_open.load(std::memory_order_acquire))
            sched_yield();
    }
    void Open() { m_open.store(true, std::memory_order_release); }

private:
    std::atomic<bool> m_open{false};
};

/// Argument: the number of producers. The time goes from the start of the first producer to the end
/// of the last; the counter "run" says how many tasks a second were also run, from the start until
/// the last one had run.
template <typename Executor>
void BM_Producers(benchmark::State& state)
{
    constexpr int kTasks = 1 << 17; // of each producer
    const int producers = static_cast<int>(state.range(0));
    std::int64_t tasks = 0;
    double timeToRun = 0;
    for (auto _ : state)
    {
        auto executor = std::make_unique<Executor>(1);
        StartLine line;
        std::vector<std::thread> threads;
        for (int number = 0; number < producers; ++number)
            threads.emplace_back(
                [&]
                {
                    line.Wait();
                    for (int task = 0; task < kTasks; ++task)
                        executor->Post(Stroke());
                });
        const Clock::time_point begin = Clock::now();
        line.Open();
        for (std::thread& thread : threads)
            thread.join();
        state.SetIterationTime(Nanoseconds(Clock::now() - begin) / 1e9);
        executor.reset(); // all have run
        timeToRun += Nanoseconds(Clock::now() - begin) / 1e9;
        tasks += std::int64_t{producers} * kTasks;
    }
    state.SetItemsProcessed(tasks);
    state.counters["run"] = static_cast<double>(tasks) / timeToRun;
}

#define NIB_PRODUCERS(executor)                                                                    \
    BENCHMARK_TEMPLATE(BM_Producers, executor)                                                     \
        ->Arg(1)                                                                                   \
        ->Arg(2)                                                                                   \
        ->Arg(4)                                                                                   \
        ->Arg(8)                                                                                   \
        ->Iterations(3)                                                                            \
        ->UseManualTime()
NIB_PRODUCERS(NibExecutor);
NIB_PRODUCERS(LockedDequeExecutor);
NIB_PRODUCERS(MoodycamelExecutor);
NIB_PRODUCERS(AsioExecutor);
NIB_PRODUCERS(TbbExecutor);
NIB_PRODUCERS(UvExecutor);

// ---- the wake of a sleeping thread --------------------------------------------------------------

/// Long enough for whoever spins before it sleeps to have fallen asleep.
void LetItSleep()
{
    std::this_thread::sleep_for(std::chrono::microseconds(200));
}

template <typename Executor>
void BM_Wake(benchmark::State& state)
{
    PinTo(0);
    Executor executor(1);
    executor.Post([] { PinTo(1); });
    Samples samples(state);
    for (auto _ : state)
    {
        LetItSleep();
        std::atomic<bool> done{false};
        Clock::time_point woken;
        const Clock::time_point begin = Clock::now();
        executor.Post(
            [&]
            {
                woken = Clock::now();
                done.store(true, std::memory_order_release);
            });
        while (!done.load(std::memory_order_acquire))
            sched_yield();
        samples.Add(woken - begin);
        state.SetIterationTime(Nanoseconds(woken - begin) / 1e9);
    }
    Unpin();
}

void BM_WakeBareFutex(benchmark::State& state)
{
    PinTo(0);
    BareFutex to;
    std::atomic<int> back{0};
    Clock::time_point woken;
    std::thread sleeper(
        [&]
        {
            PinTo(1);
            for (int turn = 1;; ++turn)
            {
                to.WaitFor(turn);
                woken = Clock::now();
                back.store(turn, std::memory_order_release);
                if (turn == 2001)
                    return;
            }
        });
    Samples samples(state);
    int turn = 0;
    for (auto _ : state)
    {
        LetItSleep();
        const Clock::time_point begin = Clock::now();
        to.Set(++turn);
        while (back.load(std::memory_order_acquire) != turn)
            sched_yield();
        samples.Add(woken - begin);
        state.SetIterationTime(Nanoseconds(woken - begin) / 1e9);
    }
    to.Set(2001);
    sleeper.join();
    Unpin();
}

BENCHMARK(BM_WakeBareFutex)->UseManualTime()->Iterations(2000);
BENCHMARK_TEMPLATE(BM_Wake, NibExecutor)->UseManualTime()->Iterations(2000);
BENCHMARK_TEMPLATE(BM_Wake, LockedDequeExecutor)->UseManualTime()->Iterations(2000);
BENCHMARK_TEMPLATE(BM_Wake, AsioExecutor)->UseManualTime()->Iterations(2000);
BENCHMARK_TEMPLATE(BM_Wake, UvExecutor)->UseManualTime()->Iterations(2000);

// ---- synchronous calls, back to back ------------------------------------------------------------

/// What a caller of a peer waits on.
class Answer
{
public:
    void Give()
    {
        const std::lock_guard lock(m_mutex);
        m_given = true;
        m_condition.notify_one();
    }
    void Wait()
    {
        std::unique_lock lock(m_mutex);
        m_condition.wait(lock, [this] { return m_given; });
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_condition;
    bool m_given = false;
};

template <typename Executor>
void CallAndWait(Executor& executor)
{
    Answer answer;
    executor.Post([&answer] { answer.Give(); });
    answer.Wait();
}

void CallAndWait(NibExecutor& executor)
{
    const auto nothing = [] {};
    CallTask<decltype(nothing)> task(nothing);
    executor.Worker().RunSyncTask(&task, false, false);
}

/// Argument: the worker's processor; the caller is on 0.
template <typename Executor>
void BM_SyncCall(benchmark::State& state)
{
    PinTo(0);
    const int processor = static_cast<int>(state.range(0));
    Executor executor(1);
    executor.Post([processor] { PinTo(processor); });
    CallAndWait(executor); // now both are where they belong
    Samples samples(state);
    const Switches switches(state);
    for (auto _ : state)
    {
        const Clock::time_point begin = Clock::now();
        CallAndWait(executor);
        samples.Add(Clock::now() - begin);
    }
    Unpin();
}

void BM_SyncCallBareFutex(benchmark::State& state)
{
    PinTo(0);
    const int processor = static_cast<int>(state.range(0));
    BareFutex to;
    BareFutex back;
    std::thread worker(
        [&]
        {
            PinTo(processor);
            for (int turn = 1; turn <= 20000; ++turn)
            {
                to.WaitFor(turn);
                back.Set(turn);
            }
        });
    Samples samples(state);
    const Switches switches(state);
    int turn = 0;
    for (auto _ : state)
    {
        const Clock::time_point begin = Clock::now();
        to.Set(++turn);
        back.WaitFor(turn);
        samples.Add(Clock::now() - begin);
    }
    worker.join();
    Unpin();
}

/// Two words that two processors hand to each other: below this no call can come. It differs from
/// run to run where the system under this one moves its processors.
void BM_SyncCallBareSpin(benchmark::State& state)
{
    PinTo(0);
    alignas(128) std::atomic<int> to{0};
    alignas(128) std::atomic<int> back{0};
    std::thread worker(
        [&]
        {
            PinTo(1);
            back.store(-1, std::memory_order_release);
            for (int turn = 1; turn <= 20000; ++turn)
            {
                while (to.load(std::memory_order_acquire) != turn)
                    continue;
                back.store(turn, std::memory_order_release);
            }
        });
    while (back.load(std::memory_order_acquire) != -1)
        sched_yield();
    Samples samples(state);
    int turn = 0;
    for (auto _ : state)
    {
        const Clock::time_point begin = Clock::now();
        to.store(++turn, std::memory_order_release);
        while (back.load(std::memory_order_acquire) != turn)
            continue;
        samples.Add(Clock::now() - begin);
    }
    worker.join();
    Unpin();
}

BENCHMARK(BM_SyncCallBareSpin)->Iterations(20000)->UseRealTime();
BENCHMARK(BM_SyncCallBareFutex)->Arg(1)->Arg(0)->Iterations(20000)->UseRealTime();
BENCHMARK_TEMPLATE(BM_SyncCall, NibExecutor)->Arg(1)->Arg(0)->Iterations(20000)->UseRealTime();
BENCHMARK_TEMPLATE(BM_SyncCall, LockedDequeExecutor)
    ->Arg(1)
    ->Arg(0)
    ->Iterations(20000)
    ->UseRealTime();
BENCHMARK_TEMPLATE(BM_SyncCall, MoodycamelExecutor)
    ->Arg(1)
    ->Arg(0)
    ->Iterations(20000)
    ->UseRealTime();
BENCHMARK_TEMPLATE(BM_SyncCall, AsioExecutor)->Arg(1)->Arg(0)->Iterations(20000)->UseRealTime();
BENCHMARK_TEMPLATE(BM_SyncCall, UvExecutor)->Arg(1)->Arg(0)->Iterations(20000)->UseRealTime();

// ---- a frame: 100 tasks and one synchronous call ------------------------------------------------

template <typename Executor>
void BM_Frame(benchmark::State& state)
{
    PinTo(0);
    Executor executor(1);
    executor.Post([] { PinTo(1); });
    Samples samples(state);
    for (auto _ : state)
    {
        const Clock::time_point begin = Clock::now();
        for (int task = 0; task < 100; ++task)
            executor.Post(Stroke());
        CallAndWait(executor);
        samples.Add(Clock::now() - begin);
    }
    Unpin();
}

BENCHMARK_TEMPLATE(BM_Frame, NibExecutor)->Iterations(5000)->UseRealTime();
BENCHMARK_TEMPLATE(BM_Frame, LockedDequeExecutor)->Iterations(5000)->UseRealTime();
BENCHMARK_TEMPLATE(BM_Frame, MoodycamelExecutor)->Iterations(5000)->UseRealTime();
BENCHMARK_TEMPLATE(BM_Frame, AsioExecutor)->Iterations(5000)->UseRealTime();
BENCHMARK_TEMPLATE(BM_Frame, UvExecutor)->Iterations(5000)->UseRealTime();

// ---- a pool: 1,000,000 tiny tasks ---------------------------------------------------------------

/// Argument: the number of workers. All tasks have run when the executor has ended.
template <typename Executor>
void BM_Pool(benchmark::State& state)
{
    constexpr int kTasks = 1'000'000;
    for (auto _ : state)
    {
        Executor executor(static_cast<int>(state.range(0)));
        for (int task = 0; task < kTasks; ++task)
            executor.Post(Stroke());
    }
    state.SetItemsProcessed(state.iterations() * kTasks);
}

#define NIB_POOLS(executor)                                                                        \
    BENCHMARK_TEMPLATE(BM_Pool, executor)                                                          \
        ->Arg(2)                                                                                   \
        ->Arg(4)                                                                                   \
        ->Iterations(3)                                                                            \
        ->UseRealTime()                                                                            \
        ->MeasureProcessCPUTime()                                                                  \
        ->Unit(benchmark::kMillisecond)
NIB_POOLS(NibExecutor);
NIB_POOLS(LockedDequeExecutor);
NIB_POOLS(MoodycamelExecutor);
NIB_POOLS(AsioExecutor);
NIB_POOLS(TbbExecutor);

// ---- a worker with nothing to do ----------------------------------------------------------------

/// A number behind @p name in the status of one of this process's threads.
long StatusOf(long thread, const std::string& name)
{
    std::ifstream status("/proc/self/task/" + std::to_string(thread) + "/status");
    for (std::string line; std::getline(status, line);)
    {
        if (line.compare(0, name.size(), name) == 0)
            return std::stol(line.substr(name.size() + 1));
    }
    return -1;
}

/// Nanoseconds of processor time of one of this process's threads.
double ProcessorTimeOf(long thread)
{
    std::ifstream statistics("/proc/self/task/" + std::to_string(thread) + "/schedstat");
    double time = -1;
    statistics >> time;
    return time;
}

void BM_IdleWorker(benchmark::State& state)
{
    NibExecutor executor(1);
    long thread = 0;
    const auto tell = [&thread] { thread = syscall(SYS_gettid); };
    CallTask<decltype(tell)> task(tell);
    executor.Worker().RunSyncTask(&task, false, false);
    LetItSleep();
    const long switches = StatusOf(thread, "voluntary_ctxt_switches:");
    const double time = ProcessorTimeOf(thread);
    for (auto _ : state)
        std::this_thread::sleep_for(std::chrono::seconds(5));
    state.counters["wakes"] =
        static_cast<double>(StatusOf(thread, "voluntary_ctxt_switches:") - switches);
    state.counters["processor_ns"] = ProcessorTimeOf(thread) - time;
}
BENCHMARK(BM_IdleWorker)->Iterations(1)->UseRealTime();

} // namespace

int main(int argc, char** argv)
{
    setenv("NIB_LOG", "silent", 0);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
