#include "InkJson.h"

#include "RecordingBuilder.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cmath>
#include <iterator>
#include <map>

namespace Ink
{
namespace
{

using Json = nlohmann::json;

constexpr std::size_t kMostValues = 16000000;
constexpr const char* kColumns[] = {"x", "y", "time", "pressure", "buttons", "tiltX", "tiltY"};
constexpr std::size_t kLongestString = 1u << 20; // the parser holds several copies of one
constexpr double kSteadyRate = 0.008; // seconds between samples, where a recording has no times

/// What the file holds, as far as either shape can have it: under each name, a list of numbers or a
/// list of points. A stream of events instead of a tree, whose size would be many times the file's;
/// numbers of no known name are not kept, points become samples at once.
class Content : public nlohmann::json_sax<Json>
{
public:
    /// Points that cannot be samples are reported in @p line.
    Content(const std::string& path, std::size_t line) : strokes(path), m_line(line) {}

    std::map<std::string, std::vector<double>> columns;
    RecordingBuilder strokes;
    bool hasStrokes = false;
    std::string problem;
    std::size_t offset = 0;

    /// Whether the list of that name holds a number.
    bool HasColumn(const std::string& name) const
    {
        const auto column = columns.find(name);
        return column != columns.end() && !column->second.empty();
    }

    bool null() override { return true; }
    bool boolean(bool) override { return true; }
    bool binary(binary_t&) override { return true; }
    bool string(string_t&) override { return true; }
    bool number_integer(number_integer_t value) override { return Number(double(value)); }
    bool number_unsigned(number_unsigned_t value) override { return Number(double(value)); }
    bool number_float(number_float_t value, const string_t&) override { return Number(value); }

    bool start_object(std::size_t) override
    {
        if (++m_depth == kPoint)
            return StartPoint();
        return m_depth == 1 || Unexpected();
    }
    bool end_object() override { return --m_depth != kList || EndPoint(); }
    bool start_array(std::size_t) override
    {
        ++m_depth;
        if (m_depth == kList)
            return true;
        return m_depth == kPoint ? StartPoint() : Unexpected();
    }
    bool end_array() override { return --m_depth != kList || EndPoint(); }
    bool key(string_t& name) override
    {
        if (m_depth == 1)
            BeginList(name);
        else
            m_coordinate = name == "x" ? 0 : name == "y" ? 1 : name == "pressure" ? 2 : 3;
        return true;
    }
    bool parse_error(std::size_t position, const std::string&,
                     const nlohmann::detail::exception& error) override
    {
        offset = position;
        const std::string text = error.what();
        problem =
            "not well-formed JSON: " + text.substr(std::min(text.size(), text.find("] ") + 2));
        return false;
    }

private:
    static constexpr int kList = 2;
    static constexpr int kPoint = 3;

    bool Unexpected()
    {
        problem = "neither pointer events nor lists of points";
        return false;
    }
    void BeginList(const std::string& name)
    {
        m_name = name;
        const bool isKnown =
            std::find(std::begin(kColumns), std::end(kColumns), name) != std::end(kColumns);
        m_column = isKnown ? &columns[name] : nullptr;
        strokes.Break();
        m_start = m_time;
    }
    bool Number(double value)
    {
        if (++m_count > kMostValues)
        {
            problem = "more than 16000000 numbers";
            return false;
        }
        if (m_depth == kList && m_column)
            m_column->push_back(value);
        else if (m_depth == kPoint && m_coordinate < 4)
        {
            if (m_point.size() <= m_coordinate)
                m_point.resize(m_coordinate + 1, std::nan(""));
            m_point[m_coordinate++] = value;
        }
        return true;
    }
    bool StartPoint()
    {
        m_point.clear();
        m_coordinate = 0;
        return true;
    }
    bool EndPoint()
    {
        if (m_point.size() < 2 || std::isnan(m_point[0]) || std::isnan(m_point[1]))
        {
            problem = "a point of \"" + m_name + "\" has no x or no y";
            return false;
        }
        hasStrokes = true;
        AddSample();
        return true;
    }
    void AddSample()
    {
        Sample sample;
        sample.x = static_cast<float>(m_point[0]);
        sample.y = static_cast<float>(m_point[1]);
        if (m_point.size() > 2 && std::isfinite(m_point[2]))
            sample.pressure = static_cast<float>(std::clamp(m_point[2], 0.0, 1.0));
        m_time = m_point.size() > 3 ? std::max(m_time, m_start + m_point[3] / 1000.0)
                                    : m_time + kSteadyRate;
        sample.time = m_time;
        strokes.Add(sample, true, m_line);
    }

    std::size_t m_line;
    std::string m_name;
    std::vector<double>* m_column = nullptr; ///< of the current list, where its name is known
    std::vector<double> m_point;
    std::size_t m_coordinate = 0;
    double m_start = 0.0; ///< the time at which the current list began
    double m_time = 0.0;
    std::size_t m_count = 0;
    int m_depth = 0;
};

class EventColumns
{
public:
    EventColumns(const Content& content, const RecordingBuilder& builder, std::size_t line)
        : m_content(content)
    {
        m_count = content.columns.at("x").size();
        for (const char* name : {"y", "time", "pressure", "buttons", "tiltX", "tiltY"})
            if (Has(name) && content.columns.at(name).size() != m_count)
                builder.Fail(line, std::string("the columns \"x\" and \"") + name +
                                       "\" differ in length");
    }

    std::size_t Count() const { return m_count; }
    bool Has(const std::string& name) const { return m_content.HasColumn(name); }
    double At(const std::string& name, std::size_t row, double otherwise) const
    {
        return Has(name) ? m_content.columns.at(name)[row] : otherwise;
    }

private:
    const Content& m_content;
    std::size_t m_count;
};

void AddEvents(const Content& content, RecordingBuilder& builder, std::size_t line)
{
    const EventColumns columns(content, builder, line);
    double time = 0.0;
    for (std::size_t row = 0; row < columns.Count(); ++row)
    {
        Sample sample;
        sample.x = static_cast<float>(columns.At("x", row, 0.0));
        sample.y = static_cast<float>(columns.At("y", row, 0.0));
        const double pressure = columns.At("pressure", row, 0.5);
        sample.pressure = static_cast<float>(std::clamp(pressure, 0.0, 1.0));
        const double steady = time + kSteadyRate * 1000.0;
        sample.time = (time = std::max(time, columns.At("time", row, steady))) / 1000.0;
        SetTilt(sample, static_cast<float>(columns.At("tiltX", row, 0.0)),
                static_cast<float>(columns.At("tiltY", row, 0.0)));
        const bool isDown = columns.Has("buttons")
                                ? std::fmod(columns.At("buttons", row, 0.0), 2.0) == 1.0
                                : pressure > 0.0;
        builder.Add(sample, isDown, line);
    }
}

/// Where the first string begins that is too long; the size of the text where none is.
std::size_t FindLongString(const std::string& text)
{
    std::size_t start = text.find('"');
    while (start != std::string::npos)
    {
        std::size_t end = start + 1;
        while (end < text.size() && text[end] != '"')
            end += text[end] == '\\' ? 2 : 1;
        if (end - start > kLongestString)
            return start;
        start = end < text.size() ? text.find('"', end + 1) : std::string::npos;
    }
    return text.size();
}

} // namespace

Recording ReadInkJson(const std::string& path, const std::string& text)
{
    RecordingBuilder builder(path);
    const auto lineAt = [&text](std::size_t offset)
    {
        const auto end = text.begin() + static_cast<std::ptrdiff_t>(std::min(offset, text.size()));
        return static_cast<std::size_t>(1 + std::count(text.begin(), end, '\n'));
    };
    const std::size_t lastLine = lineAt(text.size());
    if (const std::size_t offset = FindLongString(text); offset != text.size())
        builder.Fail(lineAt(offset), "a string is longer than 1 MiB");
    Content content(path, lastLine);
    if (!Json::sax_parse(text, &content))
        builder.Fail(lineAt(content.offset), content.problem);
    if (content.HasColumn("x") && content.HasColumn("y"))
        AddEvents(content, builder, lastLine);
    else if (content.hasStrokes)
        return content.strokes.Finish(lastLine);
    else
        builder.Fail(1, "neither pointer events nor lists of points");
    return builder.Finish(lastLine);
}

} // namespace Ink
