#ifndef NIB_TESTS_THREAD_TASKS_H
#define NIB_TESTS_THREAD_TASKS_H

#include <nib/task.h>
#include <nib/worker_thread.h>

#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <utility>

/// Runs a callable, and tells when it is deleted.
class LambdaTask : public Nib::ITask
{
public:
    explicit LambdaTask(std::function<void()> run, std::function<void()> deleted = {})
        : m_run(std::move(run)), m_deleted(std::move(deleted))
    {
    }
    ~LambdaTask() override
    {
        if (m_deleted)
            m_deleted();
    }
    void run() override { m_run(); }

private:
    std::function<void()> m_run;
    std::function<void()> m_deleted;
};

/// Holds a worker until it is opened: its task waits inside the gate.
class Gate
{
public:
    ~Gate() { Open(); }

    /// A task for a queue, which owns it. The gate must outlive its run.
    Nib::ITask* Task()
    {
        return new LambdaTask([this] { Pass(); });
    }
    void Open()
    {
        const std::lock_guard lock(m_mutex);
        m_isOpen = true;
        m_changed.notify_all();
    }
    /// Returns when somebody waits inside.
    void WaitUntilReached()
    {
        std::unique_lock lock(m_mutex);
        m_changed.wait(lock, [this] { return m_isReached; });
    }

private:
    void Pass()
    {
        std::unique_lock lock(m_mutex);
        m_isReached = true;
        m_changed.notify_all();
        m_changed.wait(lock, [this] { return m_isOpen; });
    }

    std::mutex m_mutex;
    std::condition_variable m_changed;
    bool m_isOpen = false;
    bool m_isReached = false;
};

using Worker = std::unique_ptr<Nib::IWorkerThread>;

inline Worker MakeWorker()
{
    return Worker(Nib::IWorkerThread::CreateInstance_NoLock("worker", 0));
}

inline constexpr bool kPaused = true;
inline constexpr bool kAheadOfQueue = true;
inline constexpr bool kDeleteAfterRun = true;

#endif
