#ifndef NIB_THREAD_CALLS_IN_PROGRESS_H
#define NIB_THREAD_CALLS_IN_PROGRESS_H

#include "thread/WatchedCall.h"

#include <optional>
#include <string>
#include <vector>

namespace Nib
{

/// The watched calls that have begun and not ended, and what there is to say about them. Its owner
/// guards it with one lock.
class CallsInProgress
{
public:
    using Clock = std::chrono::steady_clock;

    CallsInProgress() = default;
    CallsInProgress(const CallsInProgress&) = delete;
    CallsInProgress& operator=(const CallsInProgress&) = delete;

    void Add(WatchedCall& call);
    void Remove(WatchedCall& call);

    /// Whether its thread waits for that target already: a step of a call that is being watched.
    bool HasOuterWait(const WatchedCall& call) const;

    /// Marks the waits for @p target to run @p task as over.
    void MarkAnswered(const WatchTarget& target, const ITask* task);

    /// A sentence when @p wait is one of a thread for itself, or closes a circle of waiting
    /// threads.
    std::optional<std::string> Deadlock(const WatchedCall& wait) const;

    /// A sentence for each call that has lasted longer than @p limit and was not reported yet.
    std::vector<std::string> TakeOverdue(Clock::time_point now, Clock::duration limit);

    /// When the next call will be overdue.
    std::optional<Clock::time_point> NextOverdue(Clock::duration limit) const;

    /// A sentence about a reported call that ends @p now.
    static std::string End(const WatchedCall& call, Clock::time_point now);
    static bool IsReported(const WatchedCall& call) { return call.m_reported; }

private:
    const WatchedCall* Newest(WatchedCall::Kind kind, std::uint64_t thread) const;
    const WatchedCall* WaitOf(std::uint64_t thread) const;
    std::string Circle(const WatchedCall& wait) const;
    std::string NameOf(std::uint64_t thread) const;
    std::string Overdue(const WatchedCall& call, Clock::time_point now) const;
    std::string StateOf(const WatchTarget& target, Clock::time_point now) const;

    WatchedCall* m_newest = nullptr;
};

} // namespace Nib

#endif
