#ifndef NIB_BASE_LOG_SINK_HOLDER_H
#define NIB_BASE_LOG_SINK_HOLDER_H

#include <nib/log.h>

#include <atomic>
#include <climits>
#include <shared_mutex>

namespace Nib
{

/// The application's sink, as the platforms' log functions feed it. Any thread.
class LogSinkHolder
{
public:
    static LogSinkHolder& Instance();

    /// Returns when the sink that was there before is called no more.
    void Set(LogSink sink, void* context, int lowestPriority);

    /// Whether a line of @p priority is wanted: one relaxed load.
    bool Wants(int priority) const { return priority >= LowestWanted(); }

    /// The lowest priority that is wanted; INT_MAX without a sink.
    int LowestWanted() const { return m_lowestPriority.load(std::memory_order_relaxed); }

    /// Hands over one line, unless the calling thread is inside the sink.
    void Take(int priority, const char* message);

private:
    static constexpr int kNothing = INT_MAX;

    // Only a hint: what is handed over is decided under the lock.
    std::atomic<int> m_lowestPriority{kNothing};
    std::shared_mutex m_lock; // shared: the sink is being called
    LogSink m_sink = nullptr;
    void* m_context = nullptr;
};

} // namespace Nib

#endif
