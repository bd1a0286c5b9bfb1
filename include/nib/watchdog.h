#ifndef NIB_WATCHDOG_H
#define NIB_WATCHDOG_H

/// @file
/// A debugging aid for threads that do not come back.

#include <nib/export.h>

namespace Nib
{

/// Tells the log about blocking calls that last too long. Off by default; the environment variable
/// NIB_WATCHDOG=seconds turns it on when the first worker or render thread is made.
///
/// While it is on, these are WARN lines, which name the threads, the type of the task and the time:
/// a call that has waited for a worker or render thread longer than the limit, once, with what that
/// thread is doing; a task that has been running longer than the limit, once; at the moment at
/// which it happens, a synchronous call of a thread on itself, and one that closes a circle of
/// threads that wait for each other. What lasted too long and ends after all is one INFO line.
///
/// It only watches: what hangs without it hangs with it, and what is posted costs the same. A
/// synchronous call and the run of a task cost one lock each while it is on, one look at a number
/// while it is off.
///
/// Threads  any, at any time. Calls that wait already when it is turned on are not seen.
class NIB_EXPORT Watchdog
{
public:
    /// Turns it on with this limit, or off with 0 or less. Goes before the environment.
    static void SetLimit(int milliseconds);

    /// The limit in milliseconds; 0 while it is off.
    static int GetLimit();
};

} // namespace Nib

#endif
