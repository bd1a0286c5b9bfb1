#include "InkMlTrace.h"

#include "RecordingBuilder.h"

#include <algorithm>
#include <charconv>
#include <cmath>

namespace Ink
{
namespace
{

constexpr std::string_view kBlanks = " \t\r\n";

std::string_view Trimmed(std::string_view text)
{
    const std::size_t first = text.find_first_not_of(kBlanks);
    if (first == std::string_view::npos)
        return {};
    return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

double SecondsPerUnit(const Channel& channel)
{
    return channel.units == "s" ? 1.0 : 0.001; // milliseconds are InkML's default
}

} // namespace

bool TraceFormat::Has(std::string_view name) const
{
    const auto named = [name](const Channel& channel) { return channel.name == name; };
    return std::any_of(channels.begin(), channels.end(), named) ||
           std::any_of(intermittent.begin(), intermittent.end(), named);
}

TraceFormat TraceFormat::Plain()
{
    TraceFormat format;
    for (const char* name : {"X", "Y"})
        format.channels.emplace_back().name.append(name);
    return format;
}

TraceDecoder::TraceDecoder(const TraceFormat& format)
    : m_channels(format.channels), m_required(format.channels.size())
{
    m_channels.insert(m_channels.end(), format.intermittent.begin(), format.intermittent.end());
    m_states.resize(m_channels.size());
}

bool TraceDecoder::Decode(std::string_view text, std::size_t most, Stroke& stroke,
                          std::string& problem)
{
    text = Trimmed(text);
    while (!text.empty())
    {
        const std::size_t comma = text.find(',');
        if (!DecodePoint(Trimmed(text.substr(0, comma)), problem))
            return false;
        const Sample sample = ToSample();
        if (!std::isfinite(sample.x) || !std::isfinite(sample.y) || !std::isfinite(sample.time) ||
            !std::isfinite(sample.pressure))
        {
            problem = "a value of a point is out of range";
            return false;
        }
        if (stroke.size() == most)
        {
            problem = "more than 4000000 samples";
            return false;
        }
        stroke.push_back(sample);
        text = comma == std::string_view::npos ? std::string_view() : text.substr(comma + 1);
    }
    return true;
}

bool TraceDecoder::DecodePoint(std::string_view text, std::string& problem)
{
    for (std::size_t channel = 0; channel < m_channels.size(); ++channel)
    {
        text = Trimmed(text);
        if (text.empty())
        {
            if (channel >= m_required)
                return true;
            problem = "a point has fewer values than the trace format has channels";
            return false;
        }
        if (!DecodeValue(text, channel, problem))
            return false;
    }
    if (!Trimmed(text).empty())
    {
        problem = "a point has more values than the trace format has channels";
        return false;
    }
    return true;
}

bool TraceDecoder::DecodeValue(std::string_view& text, std::size_t channel, std::string& problem)
{
    ChannelState& state = m_states[channel];
    const char first = text.front();
    if (first == '*' || first == '?') // "as before", and "not known"
    {
        if (first == '*')
            Accept(state, state.encoding == Encoding::Explicit ? state.value : 0.0);
        text.remove_prefix(1);
        return true;
    }
    if (m_channels[channel].isBoolean && (first == 'T' || first == 'F'))
    {
        state.value = first == 'T' ? 1.0 : 0.0;
        text.remove_prefix(1);
        return true;
    }
    if (first == '!' || first == '\'' || first == '"')
    {
        state.encoding = first == '!'    ? Encoding::Explicit
                         : first == '\'' ? Encoding::FirstDifference
                                         : Encoding::SecondDifference;
        text = Trimmed(text.substr(1));
    }
    if (!text.empty() && text.front() == '+')
        text.remove_prefix(1);
    double number = 0.0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || !std::isfinite(number))
    {
        problem = "a value of a point is not a number";
        return false;
    }
    text.remove_prefix(static_cast<std::size_t>(end - text.data()));
    Accept(state, number);
    return true;
}

void TraceDecoder::Accept(ChannelState& state, double number) const
{
    const double before = state.value;
    switch (state.encoding)
    {
    case Encoding::Explicit:
        state.value = number;
        state.velocity = state.value - before;
        break;
    case Encoding::FirstDifference:
        state.velocity = number;
        state.value += state.velocity;
        break;
    case Encoding::SecondDifference:
        state.velocity += number;
        state.value += state.velocity;
        break;
    }
}

Sample TraceDecoder::ToSample() const
{
    Sample sample;
    float tiltX = 0.0f, tiltY = 0.0f;
    double azimuth = sample.azimuth, altitude = sample.altitude;
    for (std::size_t i = 0; i < m_channels.size(); ++i)
    {
        const Channel& channel = m_channels[i];
        const double value = channel.isReversed ? -m_states[i].value : m_states[i].value;
        if (channel.name == "X")
            sample.x = static_cast<float>(value);
        else if (channel.name == "Y")
            sample.y = static_cast<float>(value);
        else if (channel.name == "T")
            sample.time = value * SecondsPerUnit(channel);
        else if (channel.name == "F" && channel.max > channel.min)
            sample.pressure = static_cast<float>(
                std::clamp((value - channel.min) / (channel.max - channel.min), 0.0, 1.0));
        else if (channel.name == "F")
            sample.pressure = static_cast<float>(std::max(value, 0.0));
        else if (channel.name == "OTx")
            tiltX = static_cast<float>(value);
        else if (channel.name == "OTy")
            tiltY = static_cast<float>(value);
        else if (channel.name == "OA")
            azimuth = value;
        else if (channel.name == "OE")
            altitude = value;
    }
    SetLean(sample, azimuth, altitude);
    SetTilt(sample, tiltX, tiltY);
    return sample;
}

} // namespace Ink
