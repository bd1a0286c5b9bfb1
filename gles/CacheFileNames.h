#ifndef NIB_GLES_CACHE_FILE_NAMES_H
#define NIB_GLES_CACHE_FILE_NAMES_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace Nib
{

/// "sh<KEY>.dat"
std::string ShaderFileName(std::uint64_t key);

/// The key in a name that ShaderFileName made; nothing for any other name.
std::optional<std::uint64_t> KeyInFileName(std::string_view name);

/// A name beside @p path under which no other thread or process writes: PATH.PROCESS.NUMBER.tmp
std::string TemporaryName(const std::string& path);

/// Whether @p name is the last part of one that TemporaryName made for a binary shader file.
bool IsTemporaryName(std::string_view name);

/// Whether that file's writer has ended, this process included.
bool IsStaleTemporary(std::string_view name);

/// Removes from @p directory what TemporaryName named, of writers that have ended. Call it before
/// this process writes its first file there: one with this process's own number then is of an
/// earlier process that had the same.
void RemoveStaleTemporaries(const std::string& directory);

} // namespace Nib

#endif
