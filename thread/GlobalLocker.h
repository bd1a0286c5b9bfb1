#ifndef NIB_THREAD_GLOBAL_LOCKER_H
#define NIB_THREAD_GLOBAL_LOCKER_H

#include <nib/base.h>

namespace Nib
{

/// The process-wide guard under which the workers of global-lock mode run their tasks, so that no
/// two of them run at the same time. A worker enters it twice for a queued synchronous task.
class GlobalLocker
{
public:
    static CriticalSection m_guard;
};

} // namespace Nib

#endif
