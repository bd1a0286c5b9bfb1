#ifndef NIB_TESTS_CACHEKILL_KILL_POINT_H
#define NIB_TESTS_CACHEKILL_KILL_POINT_H

namespace CacheKill
{

/// From now on the process writes, renames and removes @p steps times; in the next of these it is
/// killed: half way through when it is a write, else before or behind it.
void DieAfter(int steps);

} // namespace CacheKill

#endif
