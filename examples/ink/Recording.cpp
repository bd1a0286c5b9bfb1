#include "Recording.h"

#include "InkJson.h"
#include "InkMl.h"
#include "PenLog.h"
#include "StrokeList.h"
#include "SvcFile.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string_view>

namespace Ink
{
namespace
{

constexpr std::uintmax_t kLargestFile = 128u << 20;

std::string ReadWholeFile(const std::string& path)
{
    std::error_code error;
    if (std::filesystem::is_directory(path, error))
        throw ReadError(path, 1, "is a folder, not a recording");
    std::ifstream file(path, std::ios::binary);
    if (!file)
        throw ReadError(path, 1, std::string("cannot be read: ") + std::strerror(errno));
    std::string text;
    char block[65536];
    while (file.read(block, sizeof block) || file.gcount() > 0)
    {
        text.append(block, static_cast<std::size_t>(file.gcount()));
        if (text.size() > kLargestFile)
            throw ReadError(path, 1, "larger than 128 MiB");
    }
    if (file.bad())
        throw ReadError(path, 1, std::string("cannot be read: ") + std::strerror(errno));
    return text;
}

/// Whether the first line that is not blank is one whole number.
bool StartsWithCount(std::string_view text)
{
    const std::size_t end = text.find('\n');
    const std::string_view line = text.substr(0, end);
    const std::size_t last = line.find_last_not_of(" \t\r");
    return end != std::string_view::npos && last != std::string_view::npos &&
           line.substr(0, last + 1).find_first_not_of("0123456789") == std::string_view::npos;
}

} // namespace

Recording ReadRecording(const std::string& path)
{
    const std::string text = ReadWholeFile(path);
    const std::size_t first = text.find_first_not_of(" \t\r\n\xEF\xBB\xBF");
    if (first == std::string::npos)
        throw ReadError(path, 1, "the file is empty");
    const std::string_view content = std::string_view(text).substr(first);
    if (content.front() == '<')
        return ReadInkMl(path, text);
    if (content.front() == '{')
        return ReadInkJson(path, text);
    if (content.substr(0, 5) == "START")
        return ReadStrokeList(path, text);
    return StartsWithCount(content) ? ReadSvcFile(path, text) : ReadPenLog(path, text);
}

} // namespace Ink
