#ifndef NIB_TESTS_THREAD_THREAD_TEST_SUPPORT_H
#define NIB_TESTS_THREAD_THREAD_TEST_SUPPORT_H

#include "thread/WorkerThreadImpl.h"

#include <nib/task.h>
#include <nib/worker_thread.h>

#include <atomic>
#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

inline constexpr bool kPaused = true;
inline constexpr bool kAheadOfQueue = true;
inline constexpr bool kDeleteAfterRun = true;

#if defined(__SANITIZE_THREAD__)
inline constexpr bool kUnderThreadSanitizer = true;
#elif defined(__has_feature)
#if __has_feature(thread_sanitizer)
inline constexpr bool kUnderThreadSanitizer = true;
#else
inline constexpr bool kUnderThreadSanitizer = false;
#endif
#else
inline constexpr bool kUnderThreadSanitizer = false;
#endif

/// How many tasks the large tests post: a thread sanitizer looks at each access of each.
inline constexpr int kManyTasks = kUnderThreadSanitizer ? 200000 : 1000000;

/// A task that calls a function, and counts its end.
class CallTask : public Nib::ITask
{
public:
    explicit CallTask(std::function<void()> function, std::atomic<int>* deleted = nullptr)
        : m_function(std::move(function)), m_deleted(deleted)
    {
    }

    ~CallTask() override
    {
        if (m_deleted)
            m_deleted->fetch_add(1);
    }

    void run() override { m_function(); }

private:
    std::function<void()> m_function;
    std::atomic<int>* m_deleted;
};

/// Something that happens once, on any thread.
class Event
{
public:
    void Set()
    {
        const std::lock_guard lock(m_mutex);
        m_set = true;
        m_condition.notify_all();
    }

    void Wait()
    {
        std::unique_lock lock(m_mutex);
        m_condition.wait(lock, [this] { return m_set; });
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_condition;
    bool m_set = false;
};

/// Holds a running worker inside a task, from construction until Open().
class Gate
{
public:
    explicit Gate(Nib::IWorkerThread& worker)
    {
        worker.EnqueueAsyncTask(new CallTask(
            [shared = m_shared]
            {
                shared->entered.Set();
                shared->open.Wait();
            }));
        m_shared->entered.Wait();
    }
    ~Gate() { Open(); }

    void Open() { m_shared->open.Set(); }

private:
    struct Shared
    {
        Event entered;
        Event open;
    };

    std::shared_ptr<Shared> m_shared = std::make_shared<Shared>();
};

/// What ran, in the order in which it ran.
class Record
{
public:
    void Add(int entry)
    {
        const std::lock_guard lock(m_mutex);
        m_entries.push_back(entry);
    }

    std::vector<int> Entries() const
    {
        const std::lock_guard lock(m_mutex);
        return m_entries;
    }

    Nib::ITask* NewTask(int entry)
    {
        return new CallTask([this, entry] { Add(entry); });
    }

private:
    mutable std::mutex m_mutex;
    std::vector<int> m_entries;
};

using Numbers = std::vector<int>;

/// A worker whose hand-overs a test can follow: @p onEnqueue runs behind each of them, on the
/// thread that makes it.
class FollowedWorker : public Nib::WorkerThreadImpl
{
public:
    FollowedWorker() : WorkerThreadImpl("followed", 0, false) {}

    bool EnqueueAsyncTask(Nib::ITask* task) override
    {
        const bool taken = WorkerThreadImpl::EnqueueAsyncTask(task);
        if (const auto action = std::exchange(onEnqueue, nullptr))
            action();
        return taken;
    }

    /// Adds a task without being followed.
    void EnqueueQuietly(Nib::ITask* task) { WorkerThreadImpl::EnqueueAsyncTask(task); }

    std::function<void()> onEnqueue; ///< once
};

/// How often any condition was signalled since the start of the process.
int SignalsSoFar();

/// Waits until that many more signals than @p before were sent.
void WaitForSignals(int before, int more);

/// How often a wait for any condition was begun since the start of the process. Who then enters the
/// section of that wait finds the waiter asleep.
int WaitsSoFar();

/// Returns once that many more waits than @p before were begun.
void WaitForWaits(int before, int more);

/// How many waits of synchronous callers have asked for a spin.
int SpinsSoFar();

/// Whether posix_memalign fails, on all threads.
void RefuseAlignedMemory(bool refuse);

/// How often the calling thread has allocated since the start of the process.
long AllocationsSoFar();

/// How often any thread has.
long AllocationsOfAllThreads();

/// Bytes that the main thread has allocated and nobody has freed. Not under a sanitizer, which has a
/// heap of its own.
std::size_t MemoryInUse();

#endif
