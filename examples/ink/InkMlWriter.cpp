#include "InkMlWriter.h"

#include <charconv>
#include <utility>

namespace Ink
{
namespace
{

const char* const kHead = R"(<?xml version="1.0" encoding="UTF-8"?>
<ink xmlns="http://www.w3.org/2003/InkML">
  <definitions>
    <traceFormat xml:id="samples">
      <channel name="X" type="decimal"/>
      <channel name="Y" type="decimal"/>
      <channel name="F" type="decimal" min="0" max="1"/>
      <channel name="T" type="decimal" units="s"/>
      <channel name="OA" type="decimal" units="deg"/>
      <channel name="OE" type="decimal" units="deg"/>
    </traceFormat>
    <context xml:id="pen" traceFormatRef="#samples"/>
  </definitions>
)";

/// The shortest digits that give @p value back, without an exponent, which InkML does not know.
void Append(std::string& text, double value)
{
    char digits[512]; // the longest double needs 326
    const auto [end, error] =
        std::to_chars(digits, digits + sizeof digits, value, std::chars_format::fixed);
    static_cast<void>(error); // there is room
    text.append(digits, end);
}

void AppendSample(std::string& text, const Sample& sample)
{
    // As doubles: a reader that parses a double first must not round twice.
    const double values[] = {sample.x,    sample.y,       sample.pressure,
                             sample.time, sample.azimuth, sample.altitude};
    for (const double& value : values)
    {
        if (&value != values)
            text += ' ';
        Append(text, value);
    }
}

void AppendTrace(std::string& text, const Stroke& stroke, bool isAbove)
{
    text +=
        isAbove ? "  <trace contextRef=\"#pen\" type=\"penUp\">" : "  <trace contextRef=\"#pen\">";
    for (const Sample& sample : stroke)
    {
        if (&sample != stroke.data())
            text += ", ";
        AppendSample(text, sample);
    }
    text += "</trace>\n";
}

using Span = std::pair<double, double>; // the first and the last time of a run

Span SpanOf(const Stroke& run)
{
    return {run.front().time, run.back().time};
}

} // namespace

std::string ToInkMl(const Recording& recording)
{
    std::string text = kHead;
    auto hover = recording.hovers.begin();
    const auto appendHoversBefore = [&](const Stroke* stroke)
    {
        for (; hover != recording.hovers.end() && (!stroke || SpanOf(*hover) < SpanOf(*stroke));
             ++hover)
            AppendTrace(text, *hover, true);
    };
    for (const Stroke& stroke : recording.strokes)
    {
        appendHoversBefore(&stroke);
        AppendTrace(text, stroke, false);
    }
    appendHoversBefore(nullptr);
    text += "</ink>\n";
    return text;
}

} // namespace Ink
