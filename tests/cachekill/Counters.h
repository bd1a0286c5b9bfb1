#ifndef NIB_TESTS_CACHEKILL_COUNTERS_H
#define NIB_TESTS_CACHEKILL_COUNTERS_H

#include <atomic>

namespace CacheKill
{

/// What the processes have done and seen so far; in memory that they share.
struct Counters
{
    std::atomic<long> written{0}; ///< records, by processes that lived on
    std::atomic<long> killed{0};  ///< processes
    std::atomic<long> whole{0};   ///< records that readers got
    std::atomic<long> absent{0};  ///< keys that had no file
    std::atomic<long> refused{0}; ///< files that were there, but not whole
    std::atomic<long> wrong{0};   ///< records that nobody wrote, or that could not be written
};
static_assert(std::atomic<long>::is_always_lock_free, "works between processes");

/// @return counters that every process forked from now on shares. Never freed.
Counters& ShareCounters();

} // namespace CacheKill

#endif
