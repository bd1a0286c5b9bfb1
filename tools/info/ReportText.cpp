#include "ReportText.h"

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <sstream>

namespace
{

constexpr std::size_t kColumns = 100;
constexpr int kIndent = 2;
constexpr int kLabelWidth = 26;

constexpr const char* kBold = "\033[1m";
constexpr const char* kGreen = "\033[32m";
constexpr const char* kRed = "\033[31m";
constexpr const char* kPlain = "\033[0m";

// "maxTextureSize" -> "max texture size"
std::string Spoken(const std::string& key)
{
    std::string words;
    for (const char letter : key)
    {
        if (std::isupper(static_cast<unsigned char>(letter)) != 0 && !words.empty())
            words += ' ';
        words += static_cast<char>(std::tolower(static_cast<unsigned char>(letter)));
    }
    return words;
}

class Printer
{
public:
    explicit Printer(bool colours) : m_colours(colours) {}

    std::string Text() const { return m_text.str(); }

    void Section(const std::string& name, const Report& section);

private:
    std::string Coloured(const char* colour, const std::string& text) const;
    std::string Value(const Report& value) const;
    void Line(int depth, const std::string& label, const std::string& value);
    void Members(int depth, const Report& object);
    void Member(int depth, const std::string& name, const Report& value);
    void Words(int depth, const std::string& label, const Report& words);
    void Configurations(const Report& all);
    void Steps(int depth, const Report& steps);
    void GpuLists(const Report& lists);

    bool m_colours;
    std::ostringstream m_text;
};

std::string Printer::Coloured(const char* colour, const std::string& text) const
{
    return m_colours ? colour + text + kPlain : text;
}

std::string Printer::Value(const Report& value) const
{
    if (value.is_null())
        return "-";
    if (value.is_boolean())
        return value.get<bool>() ? Coloured(kGreen, "yes") : Coloured(kRed, "no");
    return value.is_string() ? value.get<std::string>() : value.dump();
}

void Printer::Line(int depth, const std::string& label, const std::string& value)
{
    std::string start(static_cast<std::size_t>(depth * kIndent), ' ');
    start += label;
    start.resize(std::max<std::size_t>(start.size() + 1, kLabelWidth), ' ');
    m_text << start << value << '\n';
}

// As many words on a line as fit, under the count of them.
void Printer::Words(int depth, const std::string& label, const Report& words)
{
    Line(depth, label, std::to_string(words.size()));
    const std::string indent(static_cast<std::size_t>((depth + 1) * kIndent), ' ');
    std::string line = indent;
    for (const Report& word : words)
    {
        const std::string text = word.get<std::string>();
        if (line.size() > indent.size() && line.size() + text.size() + 1 > kColumns)
        {
            m_text << line << '\n';
            line = indent;
        }
        line += (line.size() > indent.size() ? " " : "") + text;
    }
    if (line.size() > indent.size())
        m_text << line << '\n';
}

void Printer::Member(int depth, const std::string& name, const Report& value)
{
    if (name == "steps")
        return Steps(depth, value);
    if (name == "all")
        return Configurations(value);
    if (name == "reasons")
    {
        Line(depth, name, "");
        for (const Report& reason : value)
            m_text << "    " << reason.get<std::string>() << '\n';
        return;
    }
    if (value.is_array())
        return Words(depth, Spoken(name), value);
    if (value.is_object())
    {
        Line(depth, Spoken(name), "");
        return Members(depth + 1, value);
    }
    Line(depth, Spoken(name), Value(value));
}

void Printer::Members(int depth, const Report& object)
{
    for (const auto& [name, value] : object.items())
        Member(depth, name, value);
}

void Printer::Configurations(const Report& all)
{
    Line(1, "all", std::to_string(all.size()));
    m_text << "      id  r  g  b  a depth stencil samples  ordinary; front buffer\n";
    for (const Report& config : all)
    {
        char sizes[80];
        const auto number = [&config](const char* name) { return config[name].get<int>(); };
        std::snprintf(sizes, sizeof sizes, "    %4d %2d %2d %2d %2d %5d %7d %7d  ", number("id"),
                      number("red"), number("green"), number("blue"), number("alpha"),
                      number("depth"), number("stencil"), number("samples"));
        const std::string ordinary = config["ordinary"].get<std::string>();
        m_text << sizes << (ordinary == "chosen" ? Coloured(kGreen, ordinary) : ordinary);
        if (config.contains("frontBuffer"))
            m_text << "; " << config["frontBuffer"].get<std::string>();
        m_text << '\n';
    }
}

void Printer::Steps(int depth, const Report& steps)
{
    for (const Report& step : steps)
        Line(depth + 1, Value(step["passed"]), step["step"].get<std::string>());
}

void Printer::GpuLists(const Report& lists)
{
    for (const Report& list : lists)
    {
        Line(1, list["meaning"].get<std::string>(), Value(list["matches"]));
        std::string names;
        for (const Report& name : list["names"])
            names += (names.empty() ? "" : ", ") + name.get<std::string>();
        m_text << "    " << names << '\n';
    }
}

void Printer::Section(const std::string& name, const Report& section)
{
    if (!section.is_structured())
        return Line(0, Spoken(name), Value(section));
    m_text << '\n' << Coloured(kBold, Spoken(name)) << '\n';
    if (section.is_array())
        GpuLists(section);
    else
        Members(1, section);
}

} // namespace

std::string ToText(const Report& report, bool colours)
{
    Printer printer(colours);
    for (const auto& [name, section] : report.items())
        printer.Section(name, section);
    return printer.Text();
}
