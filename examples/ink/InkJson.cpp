#include "InkJson.h"

#include "RecordingBuilder.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cmath>
#include <map>
#include <utility>

namespace Ink
{
namespace
{

using Json = nlohmann::json;

constexpr std::size_t kMostValues = 16000000;
constexpr double kSteadyRate = 0.008; // seconds between samples, where a recording has no times

/// What the file holds, as far as either shape can have it: under each name, a list of numbers or a
/// list of points. A stream of events instead of a tree, whose size would be many times the file's.
class Content : public nlohmann::json_sax<Json>
{
public:
    using Point = std::vector<double>;

    std::map<std::string, std::vector<double>> columns;
    std::vector<std::pair<std::string, std::vector<Point>>> strokes;
    std::string problem;
    std::size_t offset = 0;

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
        m_column = nullptr;
        m_hasStroke = false;
    }
    /// The current list as a list of numbers. Looked up once a list: names may be long.
    std::vector<double>& Column()
    {
        if (!m_column)
            m_column = &columns[m_name];
        return *m_column;
    }
    bool Number(double value)
    {
        if (++m_count > kMostValues)
        {
            problem = "more than 16000000 numbers";
            return false;
        }
        if (m_depth == kList)
            Column().push_back(value);
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
        if (!std::exchange(m_hasStroke, true))
            strokes.emplace_back(m_name, std::vector<Point>());
        if (m_point.size() < 2 || std::isnan(m_point[0]) || std::isnan(m_point[1]))
        {
            problem = "a point of \"" + m_name + "\" has no x or no y";
            return false;
        }
        strokes.back().second.push_back(m_point);
        return true;
    }

    std::string m_name;
    std::vector<double>* m_column = nullptr; ///< of the current list, once it has a number
    bool m_hasStroke = false;                ///< the current list has a point
    Point m_point;
    std::size_t m_coordinate = 0;
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
    bool Has(const std::string& name) const { return m_content.columns.count(name) != 0; }
    double At(const std::string& name, std::size_t row, double otherwise) const
    {
        const auto column = m_content.columns.find(name);
        return column == m_content.columns.end() ? otherwise : column->second[row];
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

void AddStrokes(const Content& content, RecordingBuilder& builder, std::size_t line)
{
    double time = 0.0;
    for (const auto& [name, points] : content.strokes)
    {
        builder.Break();
        const double start = time;
        for (const Content::Point& point : points)
        {
            Sample sample;
            sample.x = static_cast<float>(point[0]);
            sample.y = static_cast<float>(point[1]);
            if (point.size() > 2 && std::isfinite(point[2]))
                sample.pressure = static_cast<float>(std::clamp(point[2], 0.0, 1.0));
            time =
                point.size() > 3 ? std::max(time, start + point[3] / 1000.0) : time + kSteadyRate;
            sample.time = time;
            builder.Add(sample, true, line);
        }
    }
}

} // namespace

Recording ReadInkJson(const std::string& path, const std::string& text)
{
    RecordingBuilder builder(path);
    Content content;
    const auto lastLine = static_cast<std::size_t>(1 + std::count(text.begin(), text.end(), '\n'));
    if (!Json::sax_parse(text, &content))
    {
        const auto end =
            text.begin() + static_cast<std::ptrdiff_t>(std::min(content.offset, text.size()));
        const auto line = 1 + std::count(text.begin(), end, '\n');
        builder.Fail(static_cast<std::size_t>(line), content.problem);
    }
    if (content.columns.count("x") && content.columns.count("y"))
        AddEvents(content, builder, lastLine);
    else if (!content.strokes.empty())
        AddStrokes(content, builder, lastLine);
    else
        builder.Fail(1, "neither pointer events nor lists of points");
    return builder.Finish(lastLine);
}

} // namespace Ink
