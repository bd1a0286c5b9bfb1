#include "Expect.h"

#include "gles/AttributeScanner.h"

#include <regex>
#include <string>
#include <string_view>
#include <vector>

namespace
{

using Names = std::vector<std::string>;

Names Scan(std::string_view source)
{
    Names names;
    Nib::GLES::AttributeScanner scanner(source);
    for (std::string_view name = scanner.Next(); !name.empty(); name = scanner.Next())
        names.emplace_back(name);
    return names;
}

// The same in the words of a pattern: from "attribute " on, one word that may be empty, and a name
// with something behind it.
Names ReadNames(const std::string& source)
{
    static const std::regex declaration("^attribute +([_a-zA-Z0-9]*) *([_a-zA-Z0-9]*)");
    Names names;
    size_t at = 0;
    while ((at = source.find("attribute ", at)) != std::string::npos)
    {
        const size_t statement = source.find_last_of(";\n", at);
        const size_t start = statement == std::string::npos ? 0 : statement + 1;
        const std::string before = source.substr(start, at - start);
        std::smatch match;
        const std::string rest = source.substr(at, 4096);
        std::regex_search(rest, match, declaration);
        at += std::string_view("attribute ").size();
        if (std::regex_search(before, std::regex("[a-zA-Z]")))
            continue;
        if (static_cast<size_t>(match.length(0)) == rest.size())
            break; // the text ends with the declaration
        if (match.length(2) == 0)
            continue;
        names.push_back(match[2]);
        at = at - std::string_view("attribute ").size() + static_cast<size_t>(match.length(0));
    }
    return names;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const std::string source(reinterpret_cast<const char*>(data), size);
    Nib::Expect(Scan(source) == ReadNames(source), "the names of the attributes");
    return 0;
}
