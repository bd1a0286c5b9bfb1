#ifndef NIB_BASE_LINUX_LOG_THRESHOLD_H
#define NIB_BASE_LINUX_LOG_THRESHOLD_H

#include <atomic>

namespace Nib
{

/// The lowest priority that the log or the sink wants; INT_MIN until the first line asks. Only a
/// hint, so relaxed: a line on the way while the sink changes is taken or not. Marked as this
/// library's own, so that it is read where it stands and not by way of the table of addresses.
extern std::atomic<int> g_lowestWanted __attribute__((visibility("hidden")));

/// Whether nobody wants lines of @p priority: one load.
inline bool IsDropped(int priority)
{
    return priority < g_lowestWanted.load(std::memory_order_relaxed);
}

/// The same for a line that may be the first, which finds that priority.
bool IsDroppedByNow(int priority);

/// Finds that priority again: the sink has changed.
void FindLowestWanted();

} // namespace Nib

#endif
