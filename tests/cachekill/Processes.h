#ifndef NIB_TESTS_CACHEKILL_PROCESSES_H
#define NIB_TESTS_CACHEKILL_PROCESSES_H

#include "Counters.h"

#include <chrono>
#include <cstdint>
#include <utility>

#include <sys/types.h>
#include <unistd.h>

namespace CacheKill
{

using Clock = std::chrono::steady_clock;

/// Runs @p work in a process of its own, which ends without tidying up. The number of the process.
template <typename Work>
pid_t Fork(Work work)
{
    const pid_t child = fork();
    if (child != 0)
        return child;
    work();
    _exit(0);
}

/// [blocks] The exit status of @p child, 128 + the signal that ended it.
int Wait(pid_t child);

/// [blocks] Until @p end: starts a process that writes records, and kills it, again and again.
void KeepKilling(Counters& counters, std::uint64_t seed, Clock::time_point end);

/// [blocks] Until @p end: reads all records, each time in a new process, which knows none of them.
void KeepReading(Counters& counters, Clock::time_point end);

/// [blocks] Reads each record once, as a process that has just started.
void ReadAll(Counters& counters);

} // namespace CacheKill

#endif
