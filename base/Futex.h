#ifndef NIB_BASE_FUTEX_H
#define NIB_BASE_FUTEX_H

#include <atomic>
#include <cerrno>
#include <ctime>

#include <linux/futex.h>
#include <sys/syscall.h>
#include <unistd.h>

// The system's sleep on a word of this process. What it is called with is in no C library; the
// call itself is in all of them.

namespace Nib
{

static_assert(sizeof(std::atomic<int>) == sizeof(int) && std::atomic<int>::is_always_lock_free,
              "the system sleeps on the bare integer");

/// Sleeps while @p word holds @p value. May end for no reason, so callers look again. @p deadline is
/// a point of the monotonic clock, null for none. False only when it has passed.
inline bool FutexWait(std::atomic<int>& word, int value,
                      const timespec* deadline = nullptr) noexcept
{
    const long result = syscall(SYS_futex, &word, FUTEX_WAIT_BITSET | FUTEX_PRIVATE_FLAG, value,
                                deadline, nullptr, FUTEX_BITSET_MATCH_ANY);
    return result == 0 || errno != ETIMEDOUT;
}

/// Ends one sleep on @p word. Uses the address only: the sleeper may have seen its word and gone on,
/// and then this wakes nobody.
inline void FutexWake(std::atomic<int>& word) noexcept
{
    syscall(SYS_futex, &word, FUTEX_WAKE | FUTEX_PRIVATE_FLAG, 1, nullptr, nullptr, 0);
}

} // namespace Nib

#endif
