#ifndef NIB_DEBUG_CHECKERLOCK_H
#define NIB_DEBUG_CHECKERLOCK_H

#include <nib/base.h>

namespace Nib
{

/// Guards the databases of the resource checker and its map of contexts. Re-entrant, so that each
/// operation may be built of others.
extern CriticalSection cs;

} // namespace Nib

#endif
