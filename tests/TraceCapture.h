#ifndef NIB_TESTS_TRACE_CAPTURE_H
#define NIB_TESTS_TRACE_CAPTURE_H

#include <nib/trace.h>

#include <mutex>
#include <string>
#include <utility>
#include <vector>

/// An event, with texts of its own.
struct CapturedEvent
{
    Nib::TraceEvent::Kind kind;
    std::uint64_t thread;
    std::string lane; ///< "-" without a name
    std::int64_t time;
    std::string category;
    std::string name;
    std::int64_t value;
    std::vector<std::pair<std::string, std::string>> arguments;

    /// The value of an argument; "-" without it.
    std::string Argument(const std::string& key) const
    {
        for (const auto& [argument, text] : arguments)
        {
            if (argument == key)
                return text;
        }
        return "-";
    }
};

/// Keeps every event, as the sink while it lives.
class TraceCapture : public Nib::ITraceSink
{
public:
    TraceCapture() { Nib::Trace::SetSink(this); }
    ~TraceCapture() override { Nib::Trace::Stop(); }

    void OnTraceEvent(const Nib::TraceEvent& event) override
    {
        CapturedEvent copy{event.kind,
                           event.thread,
                           event.lane ? event.lane : "-",
                           event.time,
                           event.category ? event.category : "",
                           event.name ? event.name : "",
                           event.value,
                           {}};
        for (std::size_t index = 0; index < event.argumentCount; ++index)
        {
            const Nib::TraceArgument& argument = event.arguments[index];
            copy.arguments.emplace_back(
                argument.key, argument.text ? argument.text : std::to_string(argument.number));
        }
        const std::lock_guard lock(m_lock);
        m_events.push_back(std::move(copy));
    }

    std::vector<CapturedEvent> Events() const
    {
        const std::lock_guard lock(m_lock);
        return m_events;
    }

    /// The events of a lane, as "+name" for a beginning, "-" for an end, "!name" for an instant and
    /// "name=value" for a counter; of those categories alone, where there are any.
    std::vector<std::string> Lane(const std::string& lane,
                                  const std::vector<std::string>& categories = {}) const
    {
        std::vector<std::string> texts;
        std::vector<bool> isShown; // of what is open
        for (const CapturedEvent& event : Events())
        {
            if (event.lane != lane)
                continue;
            bool shown = categories.empty();
            for (const std::string& category : categories)
                shown = shown || category == event.category;
            if (event.kind == Nib::TraceEvent::Kind::Begin)
                isShown.push_back(shown);
            if (event.kind == Nib::TraceEvent::Kind::End)
            {
                shown = isShown.back();
                isShown.pop_back();
            }
            if (shown)
                texts.push_back(Text(event));
        }
        return texts;
    }

    /// The first event of that name; an empty one of no lane when there is none.
    CapturedEvent Find(const std::string& category, const std::string& name) const
    {
        for (const CapturedEvent& event : Events())
        {
            if (event.category == category && event.name == name)
                return event;
        }
        return {};
    }

private:
    static std::string Text(const CapturedEvent& event)
    {
        switch (event.kind)
        {
        case Nib::TraceEvent::Kind::Begin: return "+" + event.name;
        case Nib::TraceEvent::Kind::End: return "-";
        case Nib::TraceEvent::Kind::Counter: return event.name + "=" + std::to_string(event.value);
        case Nib::TraceEvent::Kind::Instant: break;
        }
        return "!" + event.name;
    }

    mutable std::mutex m_lock;
    std::vector<CapturedEvent> m_events;
};

#endif
