#include "base/TraceSinkHolder.h"

#include <utility>

namespace Nib
{

namespace
{

thread_local bool t_insideSink = false;

// What the calling thread has begun and not ended, as the sink of that generation has seen it.
thread_local unsigned t_generation = 0;
thread_local int t_depth = 0;

/// Closes a file before the library's code goes away.
struct EndOfLibrary
{
    ~EndOfLibrary() { Trace::Stop(); }
};

} // namespace

TraceSinkHolder& TraceSinkHolder::Instance()
{
    // Never destroyed: threads may go on until the process has ended.
    static TraceSinkHolder& holder = *new TraceSinkHolder;
    return holder;
}

bool TraceSinkHolder::Set(std::unique_ptr<OwnedTraceSink> sink)
{
    static const EndOfLibrary end;
    ITraceSink* const taken = sink.get();
    return Replace(taken, std::move(sink));
}

bool TraceSinkHolder::Replace(ITraceSink* sink, std::unique_ptr<OwnedTraceSink> owned)
{
    m_touched.store(true, std::memory_order_relaxed);
    const std::lock_guard change(m_changeLock);
    // With no new events, the threads that are handing over one let the change come in between.
    Trace::SetListening(Trace::kSink, false);
    {
        const std::lock_guard lock(m_lock);
        m_sink = sink;
        m_owned.swap(owned);
        ++m_generation;
    }
    Trace::SetListening(Trace::kSink, sink != nullptr);
    return !owned || owned->Close();
}

void TraceSinkHolder::Take(const TraceEvent& event)
{
    if (t_insideSink)
        return;
    const std::shared_lock lock(m_lock);
    if (!m_sink || !Balance(event.kind))
        return;
    t_insideSink = true;
    m_sink->OnTraceEvent(event);
    t_insideSink = false;
}

/// Whether the sink is to see the event.
bool TraceSinkHolder::Balance(TraceEvent::Kind kind) const
{
    if (t_generation != m_generation)
    {
        t_generation = m_generation;
        t_depth = 0;
    }
    if (kind == TraceEvent::Kind::Begin)
        ++t_depth;
    if (kind != TraceEvent::Kind::End)
        return true;
    if (t_depth == 0)
        return false;
    --t_depth;
    return true;
}

} // namespace Nib
