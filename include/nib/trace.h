#ifndef NIB_TRACE_H
#define NIB_TRACE_H

/// @file
/// What the library's threads do, moment by moment, for a trace viewer or for the application.

#include <nib/export.h>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <initializer_list>

namespace Nib
{

/// What an event says besides its name: a number, or a text.
struct TraceArgument
{
    /// @p argumentKey is kept as a pointer, as all texts here.
    constexpr TraceArgument(const char* argumentKey, std::int64_t argumentNumber)
        : key(argumentKey), text(nullptr), number(argumentNumber)
    {
    }

    /// A null @p argumentText is an empty one.
    constexpr TraceArgument(const char* argumentKey, const char* argumentText)
        : key(argumentKey), text(argumentText ? argumentText : ""), number(0)
    {
    }

    const char* key;     ///< what it is
    const char* text;    ///< null: it is a number
    std::int64_t number; ///< without a text
};

/// Something that happened, or began or ended, on a lane. All pointers are valid during the call of
/// the sink.
struct TraceEvent
{
    /// What the event says of its lane.
    enum class Kind
    {
        Begin,   ///< from here on, the lane is at this; what it was at before goes on around it
        End,     ///< of what began last
        Counter, ///< from here on, this is the value
        Instant  ///< a moment without length
    };

    Kind kind;                      ///< what it is
    std::uint64_t thread;           ///< the lane: the system's number of its thread
    const char* lane;               ///< its name; null where nobody gave one
    std::int64_t time;              ///< nanoseconds of the system's monotonic clock
    const char* category;           ///< "task", "wait", "queue", ...; null for an end
    const char* name;               ///< null for an end
    std::int64_t value;             ///< of a counter
    const TraceArgument* arguments; ///< null without any
    std::size_t argumentCount;      ///< how many of them
};

/// Takes the events.
///
/// Owner    the application. It lives until Trace::SetSink has returned with another, or with none.
/// Threads  each event comes on the thread on which it happened, several at once; the events of a
///          lane's thread come in order, and every end that comes has had its beginning.
/// Failure  it must not throw. It must not change the sink; what it causes itself is not traced.
class NIB_EXPORT ITraceSink
{
public:
    virtual ~ITraceSink();

    /// One event. The thread that it comes from waits for the return.
    virtual void OnTraceEvent(const TraceEvent& event) = 0;
};

/// Switches the trace, and adds to it.
///
/// The library's own events, one lane a thread: "task", each with the name of its type; "wait", of
/// callers for a thread and of a thread for its next task; "queue", the number of tasks that
/// wait in a thread's queue; "context", its creation, loss, and what is released and restored;
/// "frame", with the swap, its update mode and damaged area; "program", compiled, loaded and saved.
///
/// There is one sink or none. Without one, each event costs one relaxed load; nothing is formatted,
/// allocated or called. The environment variable NIB_TRACE=file starts a trace file.
///
/// Threads  any, at any time.
class NIB_EXPORT Trace
{
public:
    /// Whether there is a sink. Relaxed: who asks may learn of a change a moment later.
    static bool IsOn() { return (s_listeners.load(std::memory_order_relaxed) & kSink) != 0; }

    /// Hands all events to @p sink from now on; null ends the trace. When the call returns, the
    /// sink that was there before is called no more, and a file that was being written is closed.
    static void SetSink(ITraceSink* sink);

    /// Writes the events to this file from now on, in Chrome's JSON format as an array, which
    /// Perfetto and chrome://tracing open, also when the process ends before the array does. A file
    /// of that name is replaced. What cannot be written is one WARN line in the log, and the end
    /// of the file; drawing goes on.
    /// @return false, with a WARN line and the sink unchanged, where the file cannot be opened
    static bool StartFile(const char* path);

    /// Hands the events to the system's own trace: on Android ATrace, where a name carries the
    /// arguments, an instant is a section without length, and counters are there from API level 29
    /// on.
    /// @return false, with a WARN line and the sink unchanged, where the system has none
    static bool StartSystem();

    /// Ends the trace, whatever its sink.
    /// @return false when it was a file that could not be written whole
    static bool Stop();

    /// Starts the file that NIB_TRACE names, in the first call of a process alone, and unless the
    /// application has started or ended a trace before. Each worker and render thread that is made
    /// calls it.
    static void StartFromEnvironment();

    /// The lane of the calling thread is at @p name until the matching End. The texts are valid
    /// during the call.
    static void Begin(const char* category, const char* name,
                      std::initializer_list<TraceArgument> arguments = {})
    {
        if (IsOn())
            Write(TraceEvent::Kind::Begin, category, name, arguments);
    }

    /// Ends what the calling thread began last. Without a beginning that the sink has seen, nothing.
    static void End()
    {
        if (IsOn())
            Write(TraceEvent::Kind::End, nullptr, nullptr, {});
    }

    /// A moment on the lane of the calling thread.
    static void Instant(const char* category, const char* name,
                        std::initializer_list<TraceArgument> arguments = {})
    {
        if (IsOn())
            Write(TraceEvent::Kind::Instant, category, name, arguments);
    }

    /// A value of the calling thread's lane.
    static void Counter(const char* category, const char* name, std::int64_t value)
    {
        if (IsOn())
            WriteCounter(category, name, value, 0, nullptr);
    }

    /// A value of the lane of the thread with the system's number @p thread, named @p lane.
    static void Counter(const char* category, const char* name, std::int64_t value,
                        std::uint64_t thread, const char* lane)
    {
        if (IsOn())
            WriteCounter(category, name, value, thread, lane);
    }

private:
    friend class TraceLane;
    friend class TraceScope;
    friend class TraceSinkHolder;
    friend class TaskScope;

    static constexpr unsigned kSink = 1;
    static constexpr unsigned kTaskGroups = 2; ///< somebody else wants to know of tasks

    static void Write(TraceEvent::Kind kind, const char* category, const char* name,
                      std::initializer_list<TraceArgument> arguments);
    static void WriteCounter(const char* category, const char* name, std::int64_t value,
                             std::uint64_t thread, const char* lane);
    static const char* ExchangeLane(const char* name);

    static void SetListening(unsigned listener, bool isListening);

    // Only a hint: who is there is decided under a lock.
    static std::atomic<unsigned> s_listeners;
};

/// The calling thread is at this as long as the object lives. It ends on the same thread.
class TraceScope
{
public:
    /// As Trace::Begin.
    explicit TraceScope(const char* category, const char* name,
                        std::initializer_list<TraceArgument> arguments = {})
        : m_begun(Trace::IsOn())
    {
        if (m_begun)
            Trace::Write(TraceEvent::Kind::Begin, category, name, arguments);
    }

    ~TraceScope()
    {
        if (m_begun)
            Trace::Write(TraceEvent::Kind::End, nullptr, nullptr, {});
    }

    TraceScope(const TraceScope&) = delete;
    TraceScope& operator=(const TraceScope&) = delete;

private:
    const bool m_begun;
};

/// Names the lane of the calling thread as long as the object lives, which ends on the same thread.
/// Worker and render threads name theirs themselves.
class TraceLane
{
public:
    /// @p name is kept as a pointer; null leaves the lane without a name.
    explicit TraceLane(const char* name) : m_before(Trace::ExchangeLane(name)) {}
    ~TraceLane() { Trace::ExchangeLane(m_before); }

    TraceLane(const TraceLane&) = delete;
    TraceLane& operator=(const TraceLane&) = delete;

private:
    const char* const m_before;
};

} // namespace Nib

#endif
