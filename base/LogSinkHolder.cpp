#include "base/LogSinkHolder.h"

#include <mutex>

namespace Nib
{

namespace
{

thread_local bool t_insideSink = false;

} // namespace

LogSinkHolder& LogSinkHolder::Instance()
{
    // Never destroyed: threads may log until the process has ended.
    static LogSinkHolder& holder = *new LogSinkHolder;
    return holder;
}

void LogSinkHolder::Set(LogSink sink, void* context, int lowestPriority)
{
    const std::lock_guard<std::shared_mutex> guard(m_lock);
    m_sink = sink;
    m_context = context;
    m_lowestPriority.store(sink ? lowestPriority : kNothing, std::memory_order_relaxed);
}

void LogSinkHolder::Take(int priority, const char* message)
{
    if (t_insideSink)
        return;
    const std::shared_lock<std::shared_mutex> guard(m_lock);
    if (!m_sink || !Wants(priority))
        return;
    t_insideSink = true;
    m_sink(m_context, priority, message);
    t_insideSink = false;
}

} // namespace Nib
