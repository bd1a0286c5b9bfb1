#include "CacheFolder.h"

#include "../UserError.h"

#include <nib/base.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>

#include <unistd.h>

namespace fs = std::filesystem;
using Kind = Nib::ShaderProgramCache::FileKind;

namespace
{

CacheEntry Describe(const fs::path& path, Kind kind)
{
    CacheEntry entry;
    entry.name = path.filename().string();
    entry.kind = kind;
    if (kind == Kind::Program)
        entry.key = std::strtoull(entry.name.c_str() + std::strlen("sh"), nullptr, 10);
    std::error_code gone;
    const std::uintmax_t bytes = fs::file_size(path, gone);
    entry.bytes = gone ? 0 : bytes;
    return entry;
}

} // namespace

std::string DefaultCacheFolder()
{
    const char* const sdk = Nib::System::GetSDKCacheDirectoryPath();
    if (sdk == nullptr || *sdk == '\0')
        throw UserError("there is no cache directory here: name the folder, or set NIB_CACHE_DIR");
    return (fs::path(sdk).parent_path() / "RendererCache").string();
}

std::vector<CacheEntry> ListCache(const std::string& folder, bool mayBeMissing)
{
    std::error_code failure;
    fs::directory_iterator files(folder, failure);
    if (failure == std::errc::no_such_file_or_directory && mayBeMissing)
        return {};
    if (failure)
        throw UserError("'" + folder + "' cannot be read: " + failure.message());
    std::vector<CacheEntry> entries;
    for (; files != fs::directory_iterator(); files.increment(failure))
    {
        const fs::path& path = files->path();
        const Kind kind = Nib::ShaderProgramCache::GetFileKind(path.filename().string().c_str());
        if (kind != Kind::Foreign)
            entries.push_back(Describe(path, kind));
    }
    std::sort(entries.begin(), entries.end(),
              [](const CacheEntry& a, const CacheEntry& b) { return a.name < b.name; });
    return entries;
}

std::vector<CacheCheck> CheckCache(const std::string& folder,
                                   const std::vector<CacheEntry>& entries)
{
    std::vector<CacheCheck> checks;
    for (const CacheEntry& entry : entries)
    {
        if (entry.kind != Kind::Program)
            continue;
        CacheCheck check;
        check.entry = entry;
        check.problem =
            Nib::ShaderProgramCache::CheckFile((folder + "/" + entry.name).c_str(), &check.record);
        checks.push_back(std::move(check));
    }
    return checks;
}

CacheClearing ClearCache(const std::string& folder, const std::vector<CacheEntry>& entries)
{
    CacheClearing clearing;
    for (const CacheEntry& entry : entries)
    {
        if (entry.kind == Kind::BeingWritten)
            clearing.kept.push_back(entry.name + ": it is being written");
        else if (unlink((folder + "/" + entry.name).c_str()) != 0)
            clearing.kept.push_back(entry.name + ": " + std::strerror(errno));
        else
            clearing.removed.push_back(entry);
    }
    return clearing;
}
