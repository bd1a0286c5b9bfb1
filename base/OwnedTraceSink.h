#ifndef NIB_BASE_OWNED_TRACE_SINK_H
#define NIB_BASE_OWNED_TRACE_SINK_H

#include <nib/trace.h>

namespace Nib
{

/// A sink of the library's own.
class OwnedTraceSink : public ITraceSink
{
public:
    /// No event comes any more.
    /// @return false when some of the events were lost
    virtual bool Close() { return true; }
};

} // namespace Nib

#endif
