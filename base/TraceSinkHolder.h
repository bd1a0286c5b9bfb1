#ifndef NIB_BASE_TRACE_SINK_HOLDER_H
#define NIB_BASE_TRACE_SINK_HOLDER_H

#include "base/OwnedTraceSink.h"

#include <memory>
#include <mutex>
#include <shared_mutex>

namespace Nib
{

/// The sink, as the events reach it. Any thread.
class TraceSinkHolder
{
public:
    static TraceSinkHolder& Instance();

    /// A sink of the application, or none. Returns when the one before is called no more.
    /// @return false when that was one of the library's that has lost events
    bool Set(ITraceSink* sink) { return Replace(sink, nullptr); }

    /// As above, one of the library's own.
    bool Set(std::unique_ptr<OwnedTraceSink> sink);

    /// Whether nobody has set a sink, or asked this, before.
    bool IsUntouched() { return !m_touched.exchange(true, std::memory_order_relaxed); }

    /// Hands over one event, unless the calling thread is inside the sink, or the event ends what
    /// this sink has not seen begin.
    void Take(const TraceEvent& event);

private:
    bool Replace(ITraceSink* sink, std::unique_ptr<OwnedTraceSink> owned);
    bool Balance(TraceEvent::Kind kind) const;

    std::atomic<bool> m_touched{false};
    std::mutex m_changeLock;  // one change at a time; outside m_lock
    std::shared_mutex m_lock; // shared: the sink is being called
    ITraceSink* m_sink = nullptr;
    std::unique_ptr<OwnedTraceSink> m_owned; // m_sink, when it is the library's
    unsigned m_generation = 0;               // counts the sinks
};

} // namespace Nib

#endif
