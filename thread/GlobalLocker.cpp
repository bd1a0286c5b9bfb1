#include "thread/GlobalLocker.h"

namespace Nib
{

// Entered twice by its owner, hence re-entrant.
CriticalSection GlobalLocker::m_guard{true};

} // namespace Nib
