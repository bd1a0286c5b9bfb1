#ifndef NIB_THREAD_WATCHED_CALL_H
#define NIB_THREAD_WATCHED_CALL_H

#include <nib/task.h>

#include <atomic>
#include <chrono>
#include <cstdint>
#include <typeinfo>

namespace Nib
{

/// A worker or render thread, as the watchdog knows it.
struct WatchTarget
{
    const char* name;
    const std::atomic<std::uint64_t>* thread; ///< the system's number, 0 without one; null: unknown
    const std::atomic<bool>* paused;          ///< null where it cannot be
};

/// As long as it lives, the calling thread waits for a target, or is the target's thread and runs a
/// task. Costs one look at the limit while the watchdog is off.
class WatchedCall
{
public:
    enum class Kind
    {
        Wait,
        Run
    };

    WatchedCall(Kind kind, const WatchTarget& target, const ITask* task)
    {
        if (IsOn())
            Enter(kind, target, task, nullptr);
    }

    /// A wait until @p target does @p what: "draw a frame".
    WatchedCall(const WatchTarget& target, const char* what)
    {
        if (IsOn())
            Enter(Kind::Wait, target, nullptr, what);
    }

    ~WatchedCall()
    {
        if (m_target != nullptr)
            Leave();
    }

    WatchedCall(const WatchedCall&) = delete;
    WatchedCall& operator=(const WatchedCall&) = delete;

    /// The waits for @p target to run @p task (null: to do anything else) are over, although their
    /// threads may not have noticed yet. Called by the target, before it tells them.
    static void Answer(const WatchTarget& target, const ITask* task)
    {
        if (IsOn())
            MarkAnswered(target, task);
    }

    /// In milliseconds, 0 is off.
    static int Limit() { return s_limit.load(std::memory_order_relaxed); }
    static void SetLimit(int limit) { s_limit.store(limit, std::memory_order_relaxed); }

private:
    friend class CallsInProgress;

    static bool IsOn() { return Limit() > 0; }
    static void MarkAnswered(const WatchTarget& target, const ITask* task);

    void Enter(Kind kind, const WatchTarget& target, const ITask* task, const char* what);
    void Leave();

    // Relaxed: nothing is published by it. A call that misses a change is not watched.
    static std::atomic<int> s_limit;

    // Set by Enter, under the registry's lock; m_target stays null when the call is not watched.
    const WatchTarget* m_target = nullptr;
    Kind m_kind;
    std::uint64_t m_caller;
    const std::type_info* m_type; // null without one
    const ITask* m_task;          // only to be compared
    const char* m_what;
    std::chrono::steady_clock::time_point m_begin;
    bool m_reported;
    bool m_answered;
    WatchedCall* m_newer;
    WatchedCall* m_older;
};

/// Turns the watchdog on when NIB_WATCHDOG says so; the first call in a process alone.
void ReadWatchdogEnvironment();

} // namespace Nib

#endif
