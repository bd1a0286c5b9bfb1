#ifndef NIB_TOOLS_CACHE_FOLDER_H
#define NIB_TOOLS_CACHE_FOLDER_H

#include <nib/shader_cache.h>

#include <cstdint>
#include <string>
#include <vector>

/// One of the cache's files, as it lies in its folder.
struct CacheEntry
{
    std::string name;
    Nib::ShaderProgramCache::FileKind kind{};
    std::uint64_t key = 0; ///< of a program
    std::uintmax_t bytes = 0;
};

/// One program's file, read as the library reads it.
struct CacheCheck
{
    CacheEntry entry;
    std::string problem;                          ///< empty: the file is whole
    Nib::ShaderProgramCache::BinaryShader record; ///< of a whole file
};

/// What became of the cache's files when they were to go.
struct CacheClearing
{
    std::vector<CacheEntry> removed;
    std::vector<std::string> kept; ///< names, each with the reason
};

/// The folder in which programs of this user's environment are kept; throws UserError where the
/// library has none.
std::string DefaultCacheFolder();

/// The cache's files in @p folder, by name; files of others are left out. Throws UserError when
/// @p folder cannot be read; where @p mayBeMissing, a folder that is not there holds nothing.
std::vector<CacheEntry> ListCache(const std::string& folder, bool mayBeMissing);

/// Reads every program's file of @p entries.
std::vector<CacheCheck> CheckCache(const std::string& folder,
                                   const std::vector<CacheEntry>& entries);

/// Removes @p entries, but for what a living process is writing.
CacheClearing ClearCache(const std::string& folder, const std::vector<CacheEntry>& entries);

#endif
