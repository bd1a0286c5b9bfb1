#include "gles/CacheFileNames.h"

#include "gles/SymbolicLink.h"

#include <atomic>
#include <cerrno>
#include <charconv>
#include <csignal>
#include <iterator>
#include <limits>
#include <memory>
#include <optional>
#include <string_view>

#include <dirent.h>
#include <fcntl.h>
#include <unistd.h>

namespace Nib
{

namespace
{

constexpr std::string_view kShaderPrefix = "sh";
constexpr std::string_view kShaderSuffix = ".dat";
constexpr std::string_view kTemporarySuffix = ".tmp";

// Takes @p text off the front of @p name; false when it does not begin so.
bool Skip(std::string_view& name, std::string_view text)
{
    if (name.substr(0, text.size()) != text)
        return false;
    name.remove_prefix(text.size());
    return true;
}

// Takes a decimal number without a sign off the front of @p name.
template <typename Number>
std::optional<Number> SkipNumber(std::string_view& name)
{
    Number number{};
    if (name.empty() || name.front() < '0' || name.front() > '9')
        return std::nullopt;
    const auto [end, error] = std::from_chars(name.data(), name.data() + name.size(), number);
    if (error != std::errc())
        return std::nullopt;
    name.remove_prefix(static_cast<std::size_t>(end - name.data()));
    return number;
}

// Takes "sh<KEY>.dat" off the front of @p name.
std::optional<std::uint64_t> SkipShaderFileName(std::string_view& name)
{
    if (!Skip(name, kShaderPrefix))
        return std::nullopt;
    const std::optional<std::uint64_t> key = SkipNumber<std::uint64_t>(name);
    return key && Skip(name, kShaderSuffix) ? key : std::nullopt;
}

// The process that writes or wrote the file; nothing for a name that is none of TemporaryName's.
std::optional<pid_t> WriterOf(std::string_view name)
{
    if (!SkipShaderFileName(name) || !Skip(name, "."))
        return std::nullopt;
    const std::optional<pid_t> writer = SkipNumber<pid_t>(name);
    if (!writer || *writer == 0 || !Skip(name, ".") || !SkipNumber<unsigned>(name) ||
        name != kTemporarySuffix)
        return std::nullopt;
    return writer;
}

bool HasEnded(pid_t process)
{
    return process == getpid() || (kill(process, 0) != 0 && errno == ESRCH);
}

struct CloseFolder
{
    void operator()(DIR* folder) const { closedir(folder); }
};

} // namespace

std::string ShaderFileName(std::uint64_t key)
{
    char digits[std::numeric_limits<std::uint64_t>::digits10 + 1];
    const char* const end = std::to_chars(digits, std::end(digits), key).ptr;
    std::string name;
    name.reserve(kShaderPrefix.size() + sizeof digits + kShaderSuffix.size());
    return name.append(kShaderPrefix)
        .append(digits, static_cast<std::size_t>(end - digits))
        .append(kShaderSuffix);
}

std::optional<std::uint64_t> KeyInFileName(std::string_view name)
{
    std::string_view rest = name;
    const std::optional<std::uint64_t> key = SkipShaderFileName(rest);
    return key && name == ShaderFileName(*key) ? key : std::nullopt;
}

bool IsTemporaryName(std::string_view name)
{
    return WriterOf(name).has_value();
}

bool IsStaleTemporary(std::string_view name)
{
    const std::optional<pid_t> writer = WriterOf(name);
    return writer && HasEnded(*writer);
}

std::string TemporaryName(const std::string& path)
{
    static std::atomic<unsigned> counter{0};
    return path + "." + std::to_string(getpid()) + "." +
           std::to_string(counter.fetch_add(1, std::memory_order_relaxed)) +
           std::string(kTemporarySuffix);
}

void RemoveStaleTemporaries(const std::string& directory)
{
    const std::unique_ptr<DIR, CloseFolder> folder(opendir(directory.c_str()));
    if (!folder || IsSymbolicLink(directory.c_str()))
        return;
    while (const dirent* const entry = readdir(folder.get()))
    {
        if (IsStaleTemporary(entry->d_name))
            unlinkat(dirfd(folder.get()), entry->d_name, 0); // what stays harms nobody
    }
}

} // namespace Nib
