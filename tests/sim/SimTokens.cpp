#include "SimTokens.h"

#include <cctype>
#include <sstream>

namespace Sim
{

namespace
{

bool IsWordCharacter(char c)
{
    return std::isalnum(static_cast<unsigned char>(c)) || c == '_' || c == '.';
}

/// The text with every comment replaced by blanks; line ends stay.
std::string WithoutComments(const std::string& source)
{
    std::string text = source;
    for (std::size_t i = 0; i + 1 < text.size(); ++i)
    {
        if (text[i] != '/' || (text[i + 1] != '/' && text[i + 1] != '*'))
            continue;
        const bool line = text[i + 1] == '/';
        std::size_t end = line ? text.find('\n', i) : text.find("*/", i + 2);
        end = end == std::string::npos ? text.size() : line ? end : end + 2;
        for (; i < end; ++i)
            text[i] = text[i] == '\n' ? '\n' : ' ';
        --i;
    }
    return text;
}

void SplitWords(const std::string& line, std::vector<std::string>& words)
{
    for (std::size_t i = 0; i < line.size();)
    {
        if (std::isspace(static_cast<unsigned char>(line[i])))
        {
            ++i;
            continue;
        }
        std::size_t end = i;
        while (end < line.size() && IsWordCharacter(line[end]))
            ++end;
        end = end == i ? i + 1 : end;
        words.push_back(line.substr(i, end - i));
        i = end;
    }
}

/// The lines that stay, and what directives say, one line at a time.
class Preprocessor
{
public:
    explicit Preprocessor(TokenList& out) : m_out(out) {}

    void Line(const std::string& line, int number)
    {
        const std::size_t first = line.find_first_not_of(" \t\r");
        if (first != std::string::npos && line[first] == '#')
            Directive(line.substr(first + 1), number);
        else if (Active())
            SplitWords(line, m_out.words);
    }

private:
    bool Active() const
    {
        for (const bool taken : m_taken)
        {
            if (!taken)
                return false;
        }
        return true;
    }

    bool Condition(std::istringstream& rest) const
    {
        std::string text;
        std::getline(rest, text);
        std::vector<std::string> words;
        SplitWords(text, words);
        bool negated = false;
        std::size_t at = 0;
        if (at < words.size() && words[at] == "!")
        {
            negated = true;
            ++at;
        }
        bool value = at >= words.size() || words[at] != "0";
        if (at < words.size() && words[at] == "defined")
        {
            at += at + 1 < words.size() && words[at + 1] == "(" ? 2 : 1;
            value = at < words.size() && m_out.defines.count(words[at]) != 0;
        }
        return value != negated;
    }

    void Directive(const std::string& text, int number)
    {
        std::istringstream rest(text);
        std::string word;
        std::string name;
        rest >> word;
        if (word == "ifdef" || word == "ifndef")
        {
            rest >> name;
            m_taken.push_back((m_out.defines.count(name) != 0) == (word == "ifdef"));
        }
        else if (word == "if")
        {
            m_taken.push_back(Condition(rest));
        }
        else if (word == "else" && !m_taken.empty())
        {
            m_taken.back() = !m_taken.back();
        }
        else if (word == "endif" && !m_taken.empty())
        {
            m_taken.pop_back();
        }
        else if (Active())
        {
            Statement(word, rest, number);
        }
    }

    void Statement(const std::string& word, std::istringstream& rest, int number)
    {
        std::string name;
        std::string value;
        if (word == "define")
        {
            rest >> name >> value;
            m_out.defines[name] = value;
        }
        else if (word == "undef")
        {
            rest >> name;
            m_out.defines.erase(name);
        }
        else if (word == "error" && m_out.error.empty())
        {
            std::getline(rest >> std::ws, value);
            m_out.error = "ERROR: 0:" + std::to_string(number) + ": '" + value + "' : error\n";
        }
    }

    TokenList& m_out;
    std::vector<bool> m_taken;
};

} // namespace

TokenList Tokenize(const std::string& source)
{
    TokenList out;
    Preprocessor preprocessor(out);
    std::istringstream lines(WithoutComments(source));
    std::string line;
    for (int number = 1; std::getline(lines, line); ++number)
        preprocessor.Line(line, number);
    return out;
}

} // namespace Sim
