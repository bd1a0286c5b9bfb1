#include "thread/CallsInProgress.h"

#include "thread/TypeName.h"

#include <cstdio>

namespace Nib
{

namespace
{

using Clock = CallsInProgress::Clock;

std::string Seconds(Clock::duration time)
{
    char text[32];
    std::snprintf(text, sizeof text, "%.1f s", std::chrono::duration<double>(time).count());
    return text;
}

std::string Thread(std::uint64_t thread)
{
    return "thread " + std::to_string(thread);
}

std::uint64_t ThreadOf(const WatchTarget& target)
{
    return target.thread ? target.thread->load(std::memory_order_relaxed) : 0;
}

std::string Name(const WatchTarget& target)
{
    return std::string("'") + (target.name ? target.name : "") + "'";
}

std::string NameAndThread(const WatchTarget& target)
{
    const std::uint64_t thread = ThreadOf(target);
    return thread == 0 ? Name(target) : Name(target) + " (" + Thread(thread) + ")";
}

std::string Work(const std::type_info* type, const char* what)
{
    return what ? what : "run " + TypeName(type);
}

} // namespace

void CallsInProgress::Add(WatchedCall& call)
{
    call.m_newer = nullptr;
    call.m_older = m_newest;
    if (m_newest)
        m_newest->m_newer = &call;
    m_newest = &call;
}

void CallsInProgress::Remove(WatchedCall& call)
{
    (call.m_newer ? call.m_newer->m_older : m_newest) = call.m_older;
    if (call.m_older)
        call.m_older->m_newer = call.m_newer;
}

bool CallsInProgress::HasOuterWait(const WatchedCall& call) const
{
    const WatchedCall* outer = Newest(WatchedCall::Kind::Wait, call.m_caller);
    return outer && call.m_kind == WatchedCall::Kind::Wait && outer->m_target == call.m_target;
}

void CallsInProgress::MarkAnswered(const WatchTarget& target, const ITask* task)
{
    for (WatchedCall* call = m_newest; call; call = call->m_older)
    {
        if (call->m_kind == WatchedCall::Kind::Wait && call->m_target == &target &&
            call->m_task == task)
            call->m_answered = true;
    }
}

/// What @p thread is doing now: of nested calls the innermost is the newest.
const WatchedCall* CallsInProgress::Newest(WatchedCall::Kind kind, std::uint64_t thread) const
{
    for (const WatchedCall* call = m_newest; call; call = call->m_older)
    {
        if (call->m_kind == kind && call->m_caller == thread)
            return call;
    }
    return nullptr;
}

/// What @p thread waits for; null when it has its answer already.
const WatchedCall* CallsInProgress::WaitOf(std::uint64_t thread) const
{
    const WatchedCall* wait = Newest(WatchedCall::Kind::Wait, thread);
    return wait && !wait->m_answered ? wait : nullptr;
}

// ---- threads that wait for each other -----------------------------------------------------------

std::optional<std::string> CallsInProgress::Deadlock(const WatchedCall& wait) const
{
    if (ThreadOf(*wait.m_target) == wait.m_caller)
    {
        return NameAndThread(*wait.m_target) + " waits for itself to " +
               Work(wait.m_type, wait.m_what) + ": this call cannot return";
    }
    const std::string circle = Circle(wait);
    if (circle.empty())
        return std::nullopt;
    return "threads wait for each other in a circle: " + circle + ": these calls cannot return";
}

/// The waits from @p wait back to its own thread; empty when they end elsewhere.
std::string CallsInProgress::Circle(const WatchedCall& wait) const
{
    std::string text;
    const WatchedCall* step = &wait;
    // No longer than there are calls: another circle, which this wait leads into, is not its own.
    for (const WatchedCall* each = m_newest; each && step; each = each->m_older)
    {
        if (!text.empty())
            text += ", ";
        text += NameOf(step->m_caller) + " for " + Name(*step->m_target) + " to " +
                Work(step->m_type, step->m_what);
        const std::uint64_t next = ThreadOf(*step->m_target);
        if (next == wait.m_caller)
            return text;
        step = next == 0 ? nullptr : WaitOf(next);
    }
    return {};
}

std::string CallsInProgress::NameOf(std::uint64_t thread) const
{
    const WatchedCall* run = Newest(WatchedCall::Kind::Run, thread);
    return run ? NameAndThread(*run->m_target) : Thread(thread);
}

// ---- calls that last too long -------------------------------------------------------------------

std::vector<std::string> CallsInProgress::TakeOverdue(Clock::time_point now, Clock::duration limit)
{
    std::vector<std::string> sentences;
    for (WatchedCall* call = m_newest; call; call = call->m_older)
    {
        if (call->m_reported || call->m_answered || now - call->m_begin < limit)
            continue;
        call->m_reported = true;
        sentences.push_back(Overdue(*call, now));
        if (call->m_kind != WatchedCall::Kind::Wait)
            continue;
        // Also now: when the wait began, its target may have had no thread yet.
        if (std::optional<std::string> deadlock = Deadlock(*call))
            sentences.push_back(std::move(*deadlock));
    }
    return sentences;
}

std::optional<Clock::time_point> CallsInProgress::NextOverdue(Clock::duration limit) const
{
    std::optional<Clock::time_point> next;
    for (const WatchedCall* call = m_newest; call; call = call->m_older)
    {
        if (!call->m_reported && !call->m_answered)
            next = call->m_begin + limit; // the oldest comes last
    }
    return next;
}

std::string CallsInProgress::Overdue(const WatchedCall& call, Clock::time_point now) const
{
    const std::string time = Seconds(now - call.m_begin);
    if (call.m_kind == WatchedCall::Kind::Run)
    {
        return NameAndThread(*call.m_target) + " has been running " + TypeName(call.m_type) +
               " for " + time;
    }
    return NameOf(call.m_caller) + " has waited " + time + " for " + NameAndThread(*call.m_target) +
           " to " + Work(call.m_type, call.m_what) + StateOf(*call.m_target, now);
}

/// Why @p target keeps others waiting.
std::string CallsInProgress::StateOf(const WatchTarget& target, Clock::time_point now) const
{
    const std::uint64_t thread = ThreadOf(target);
    if (thread == 0)
        return target.thread ? "; it is not started" : "";
    if (const WatchedCall* run = Newest(WatchedCall::Kind::Run, thread))
    {
        return "; it has been running " + TypeName(run->m_type) + " for " +
               Seconds(now - run->m_begin);
    }
    return target.paused && target.paused->load(std::memory_order_relaxed) ? "; it is paused" : "";
}

std::string CallsInProgress::End(const WatchedCall& call, Clock::time_point now)
{
    const std::string time = Seconds(now - call.m_begin);
    if (call.m_kind == WatchedCall::Kind::Run)
    {
        return NameAndThread(*call.m_target) + " ran " + TypeName(call.m_type) + " for " + time +
               " in all";
    }
    return Thread(call.m_caller) + " waited " + time + " in all for " +
           NameAndThread(*call.m_target) + " to " + Work(call.m_type, call.m_what);
}

} // namespace Nib
