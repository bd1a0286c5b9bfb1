#include "Recording.h"

#include "InkMl.h"
#include "PenLog.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace Ink
{
namespace
{

std::string ReadWholeFile(const std::string& path)
{
    std::error_code error;
    if (std::filesystem::is_directory(path, error))
        throw ReadError(path, 1, "is a folder, not a recording");
    std::ifstream file(path, std::ios::binary);
    if (!file)
        throw ReadError(path, 1, std::string("cannot be read: ") + std::strerror(errno));
    std::string text{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    if (file.bad())
        throw ReadError(path, 1, std::string("cannot be read: ") + std::strerror(errno));
    return text;
}

} // namespace

Recording ReadRecording(const std::string& path)
{
    const std::string text = ReadWholeFile(path);
    const std::size_t first = text.find_first_not_of(" \t\r\n\xEF\xBB\xBF");
    if (first == std::string::npos)
        throw ReadError(path, 1, "the file is empty");
    return text[first] == '<' ? ReadInkMl(path, text) : ReadPenLog(path, text);
}

} // namespace Ink
