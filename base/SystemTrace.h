#ifndef NIB_BASE_SYSTEM_TRACE_H
#define NIB_BASE_SYSTEM_TRACE_H

#include "base/OwnedTraceSink.h"

#include <memory>

namespace Nib
{

/// A sink that feeds the system's own trace; null where the system has none.
std::unique_ptr<OwnedTraceSink> NewSystemTrace();

} // namespace Nib

#endif
