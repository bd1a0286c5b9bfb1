#include "InkMl.h"

#include "InkMlTrace.h"
#include "RecordingBuilder.h"

#include <pugixml.hpp>

#include <algorithm>
#include <cmath>
#include <map>
#include <optional>
#include <string_view>

namespace Ink
{
namespace
{

// What no recording needs; beyond it, reading would take long.
constexpr int kDeepestElement = 256;
constexpr std::size_t kMostChannels = 64;

// A parsed element takes many times the memory of its text.
constexpr std::size_t kLargestText = 64u << 20;
constexpr std::size_t kMostTags = 500000;
constexpr std::size_t kMostAttributes = 500000;

/// The name without its namespace prefix.
std::string_view LocalName(const pugi::xml_node& node)
{
    const std::string_view name = node.name();
    const std::size_t colon = name.rfind(':');
    return colon == std::string_view::npos ? name : name.substr(colon + 1);
}

/// What a reference such as contextRef="#c1" points to.
std::string_view Target(const pugi::xml_attribute& reference)
{
    const std::string_view value = reference.value();
    return !value.empty() && value.front() == '#' ? value.substr(1) : value;
}

std::string_view Id(const pugi::xml_node& node)
{
    const pugi::xml_attribute id = node.attribute("xml:id");
    return id ? id.value() : node.attribute("id").value();
}

class Reader
{
public:
    Reader(const std::string& path, const std::string& text) : m_path(path), m_text(text) {}

    Recording Read()
    {
        CheckSize();
        pugi::xml_document document;
        const pugi::xml_parse_result result =
            document.load_buffer(m_text.data(), m_text.size(), pugi::parse_default);
        if (!result)
            Fail(result.offset, std::string("not well-formed XML: ") + result.description());
        const pugi::xml_node root = document.document_element();
        if (LocalName(root) != "ink")
            Fail(root.offset_debug(), "not InkML: the outermost element is not <ink>");
        CollectFormats(root);
        CollectTraces(root);
        // An empty page says what its traces would be like; anything else is no page.
        if (m_recording.strokes.empty() && m_formatsByNode.empty())
            Fail(root.offset_debug(), "there is no trace in it");
        ScalePressures(m_recording);
        return std::move(m_recording);
    }

private:
    [[noreturn]] void Fail(std::ptrdiff_t offset, const std::string& problem) const
    {
        const auto end =
            m_text.begin() +
            std::clamp<std::ptrdiff_t>(offset, 0, static_cast<std::ptrdiff_t>(m_text.size()));
        const auto line = 1 + std::count(m_text.begin(), end, '\n');
        throw ReadError(m_path, static_cast<std::size_t>(line), problem);
    }

    /// Refuses what would take too much memory, before any is taken. An equals sign outside of a tag
    /// counts, too: there are few in a recording.
    void CheckSize() const
    {
        if (m_text.size() > kLargestText)
            Fail(0, "larger than 64 MiB, for InkML");
        std::size_t tags = 0, attributes = 0;
        for (const char& c : m_text)
        {
            if (c == '<' && ++tags > kMostTags)
                Fail(&c - m_text.data(), "more than 500000 tags");
            if (c == '=' && ++attributes > kMostAttributes)
                Fail(&c - m_text.data(), "more than 500000 attributes");
        }
    }

    /// Every node below @p root in document order, without recursion: depth is the file's choice.
    template <typename Visit>
    void Walk(const pugi::xml_node& root, Visit visit) const
    {
        pugi::xml_node node = root;
        int depth = 1;
        while (node)
        {
            visit(node);
            if (node.first_child())
            {
                node = node.first_child();
                if (++depth > kDeepestElement && node.type() == pugi::node_element)
                    Fail(node.offset_debug(), "the elements are nested too deeply");
                continue;
            }
            while (node && node != root && !node.next_sibling())
            {
                node = node.parent();
                --depth;
            }
            node = node == root ? pugi::xml_node() : node.next_sibling();
        }
    }

    void CollectFormats(const pugi::xml_node& root)
    {
        Walk(root,
             [this](const pugi::xml_node& node)
             {
                 if (LocalName(node) == "traceFormat")
                     AddFormat(node);
                 else if (LocalName(node) == "context" && !Id(node).empty())
                     m_contexts.emplace(Id(node), node);
             });
        for (const auto& [id, node] : m_contexts)
            m_formatsByContext.emplace(id, FormatOfContext(node));
    }

    void AddFormat(const pugi::xml_node& node)
    {
        TraceFormat format;
        for (const pugi::xml_node& channel : node.children())
            if (LocalName(channel) == "channel")
                format.channels.push_back(ReadChannel(channel));
            else if (LocalName(channel) == "intermittentChannels")
                for (const pugi::xml_node& optional : channel.children())
                    if (LocalName(optional) == "channel")
                        format.intermittent.push_back(ReadChannel(optional));
        if (!format.Has("X") || !format.Has("Y"))
            Fail(node.offset_debug(), "the trace format has no X or no Y channel");
        if (format.channels.size() + format.intermittent.size() > kMostChannels)
            Fail(node.offset_debug(), "the trace format has more than 64 channels");
        m_formatsByNode.emplace(node.hash_value(), format);
        if (!Id(node).empty())
            m_formatsById.emplace(Id(node), format);
        if (!m_firstFormat)
            m_firstFormat = format;
    }

    static Channel ReadChannel(const pugi::xml_node& node)
    {
        Channel channel;
        channel.name = node.attribute("name").value();
        channel.isBoolean = std::string_view(node.attribute("type").value()) == "boolean";
        channel.max = node.attribute("max").as_double(0.0);
        channel.min = node.attribute("min").as_double(0.0);
        channel.isReversed = std::string_view(node.attribute("orientation").value()) == "-ve";
        channel.units = node.attribute("units").value();
        return channel;
    }

    /// The format of @p trace: its context's, else that of an enclosing group, else the file's
    /// first, else plain X and Y.
    TraceFormat FormatOf(const pugi::xml_node& trace) const
    {
        for (pugi::xml_node node = trace; node; node = node.parent())
        {
            const pugi::xml_attribute reference = node.attribute("contextRef");
            const auto format =
                reference ? m_formatsByContext.find(Target(reference)) : m_formatsByContext.end();
            if (format != m_formatsByContext.end() && format->second)
                return *format->second;
        }
        return m_firstFormat ? *m_firstFormat : TraceFormat::Plain();
    }

    /// The format that @p context refers to or holds; null when it has none.
    const TraceFormat* FormatOfContext(const pugi::xml_node& context) const
    {
        if (const pugi::xml_attribute reference = context.attribute("traceFormatRef"))
        {
            const auto format = m_formatsById.find(Target(reference));
            return format == m_formatsById.end() ? nullptr : &format->second;
        }
        const TraceFormat* found = nullptr;
        Walk(context,
             [&](const pugi::xml_node& node)
             {
                 const auto format = m_formatsByNode.find(node.hash_value());
                 if (!found && format != m_formatsByNode.end())
                     found = &format->second;
             });
        return found;
    }

    void CollectTraces(const pugi::xml_node& root)
    {
        Walk(root,
             [this](const pugi::xml_node& node)
             {
                 if (LocalName(node) == "trace")
                     AddTrace(node);
             });
    }

    void AddTrace(const pugi::xml_node& node)
    {
        const TraceFormat format = FormatOf(node);
        TraceDecoder decoder(format);
        Stroke stroke;
        std::string problem;
        if (!decoder.Decode(node.text().get(), kMostSamples - m_count, stroke, problem))
            Fail(node.text().data().offset_debug(), problem);
        if (stroke.empty())
            Fail(node.offset_debug(), "the trace has no point");
        m_count += stroke.size();
        GoOnFrom(stroke, format.Has("T"));
        if (!std::isfinite(m_time))
            Fail(node.offset_debug(), "the times are out of range");
        const bool isAbove = std::string_view(node.attribute("type").value()) == "penUp";
        (isAbove ? m_recording.hovers : m_recording.strokes).push_back(std::move(stroke));
    }

    /// Makes the times of @p stroke follow on those before: some files count the time of each trace
    /// from zero, and some have none, which get a steady rate.
    void GoOnFrom(Stroke& stroke, bool hasTime)
    {
        const double shift = std::max(0.0, m_time - stroke.front().time);
        for (Sample& sample : stroke)
            sample.time = m_time =
                hasTime ? std::max(m_time, sample.time + shift) : m_time + kSteadyRate;
    }

    static constexpr double kSteadyRate = 0.008;

    const std::string& m_path;
    const std::string& m_text;
    Recording m_recording;
    std::map<std::string, TraceFormat, std::less<>> m_formatsById;
    std::map<std::size_t, TraceFormat> m_formatsByNode;
    std::map<std::string, pugi::xml_node, std::less<>> m_contexts;
    std::map<std::string, const TraceFormat*, std::less<>> m_formatsByContext;
    std::optional<TraceFormat> m_firstFormat;
    double m_time = 0.0;
    std::size_t m_count = 0;
};

} // namespace

Recording ReadInkMl(const std::string& path, const std::string& text)
{
    return Reader(path, text).Read();
}

} // namespace Ink
