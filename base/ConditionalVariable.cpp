#include "base/ThreadAnnotations.h"

#include <nib/base.h>

#include <cerrno>
#include <climits>
#include <ctime>

#include <linux/futex.h>
#include <sys/syscall.h>
#include <unistd.h>

// Every waiter stands in the list with a word of its own, on its own stack, and sleeps until that
// word says that it was signalled. So a signal reaches exactly the thread that it was given to, and
// what else may end a sleep (a system signal, a word that lived here before) only leads back into
// it.

namespace Nib
{

namespace
{

constexpr int kWaiting = 0;
constexpr int kSignalled = 1;

timespec DeadlineAfter(int milliseconds)
{
    constexpr long kNanosecondsPerSecond = 1000000000;
    timespec deadline{};
    clock_gettime(CLOCK_MONOTONIC, &deadline);
    deadline.tv_sec += milliseconds / 1000;
    deadline.tv_nsec += milliseconds % 1000 * 1000000L;
    if (deadline.tv_nsec >= kNanosecondsPerSecond)
    {
        deadline.tv_nsec -= kNanosecondsPerSecond;
        ++deadline.tv_sec;
    }
    return deadline;
}

// The deadline is a point of the monotonic clock; null for none. False only when it has passed.
bool SleepWhileWaiting(std::atomic<int>* word, const timespec* deadline)
{
    const long result = syscall(SYS_futex, word, FUTEX_WAIT_BITSET | FUTEX_PRIVATE_FLAG, kWaiting,
                                deadline, nullptr, FUTEX_BITSET_MATCH_ANY);
    return result == 0 || errno != ETIMEDOUT;
}

void Wake(std::atomic<int>* word)
{
    // The address only: the waiter may have seen its word and gone on, and then this wakes nobody.
    syscall(SYS_futex, word, FUTEX_WAKE | FUTEX_PRIVATE_FLAG, 1, nullptr, nullptr, 0);
}

static_assert(sizeof(std::atomic<int>) == sizeof(int) && std::atomic<int>::is_always_lock_free,
              "the system sleeps on the bare integer");

} // namespace

struct ConditionalVariable::Waiter
{
    std::atomic<int> state{kWaiting};
    Waiter* next = nullptr;
    Waiter* previous = nullptr;
};

bool ConditionalVariable::Wait(CriticalSection* section,
                               int milliseconds) noexcept NIB_NO_THREAD_SAFETY_ANALYSIS
{
    Waiter waiter;
    timespec deadline{};
    const bool hasDeadline = milliseconds >= 0;
    if (hasDeadline)
        deadline = DeadlineAfter(milliseconds);

    Append(&waiter);
    section->Leave();
    bool signalled = true;
    // Acquire, paired with the release in Signal and SignalAll.
    while (waiter.state.load(std::memory_order_acquire) == kWaiting)
    {
        if (SleepWhileWaiting(&waiter.state, hasDeadline ? &deadline : nullptr))
            continue;
        signalled = !GiveUp(&waiter);
        break;
    }
    section->Enter();
    return signalled;
}

void ConditionalVariable::Signal() noexcept
{
    pthread_mutex_lock(&m_guard);
    Waiter* waiter = m_first;
    if (waiter)
    {
        Unlink(waiter);
        waiter->state.store(kSignalled, std::memory_order_release);
    }
    pthread_mutex_unlock(&m_guard);
    if (waiter)
        Wake(&waiter->state);
}

void ConditionalVariable::SignalAll() noexcept
{
    pthread_mutex_lock(&m_guard);
    while (m_first)
    {
        Waiter* waiter = m_first;
        Unlink(waiter);
        waiter->state.store(kSignalled, std::memory_order_release);
        Wake(&waiter->state);
    }
    pthread_mutex_unlock(&m_guard);
}

void ConditionalVariable::Append(Waiter* waiter) noexcept
{
    pthread_mutex_lock(&m_guard);
    waiter->previous = m_last;
    (m_last ? m_last->next : m_first) = waiter;
    m_last = waiter;
    pthread_mutex_unlock(&m_guard);
}

// False when a signal came between the time-out and the lock: then it must not be lost.
bool ConditionalVariable::GiveUp(Waiter* waiter) noexcept
{
    pthread_mutex_lock(&m_guard);
    const bool waiting = waiter->state.load(std::memory_order_relaxed) == kWaiting;
    if (waiting)
        Unlink(waiter);
    pthread_mutex_unlock(&m_guard);
    return waiting;
}

// The caller holds the guard.
void ConditionalVariable::Unlink(Waiter* waiter) noexcept
{
    (waiter->previous ? waiter->previous->next : m_first) = waiter->next;
    (waiter->next ? waiter->next->previous : m_last) = waiter->previous;
}

} // namespace Nib
