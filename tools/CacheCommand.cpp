#include "CacheCommand.h"

#include "cache/CacheFolder.h"
#include "UserError.h"

#include <nlohmann/json.hpp>

#include <cstdio>
#include <memory>
#include <numeric>

using Json = nlohmann::ordered_json;
using Kind = Nib::ShaderProgramCache::FileKind;

namespace
{

struct CacheOptions
{
    std::string folder; ///< empty: the library's own
    bool json = false;

    std::string Folder() const { return folder.empty() ? DefaultCacheFolder() : folder; }
    std::vector<CacheEntry> Entries() const { return ListCache(Folder(), folder.empty()); }
};

const char* NameOf(Kind kind)
{
    switch (kind)
    {
    case Kind::Program: return "program";
    case Kind::BeingWritten: return "being written";
    case Kind::Leftover: return "leftover";
    case Kind::Foreign: break;
    }
    return "foreign";
}

std::uintmax_t SumOfBytes(const std::vector<CacheEntry>& entries)
{
    return std::accumulate(entries.begin(), entries.end(), std::uintmax_t{0},
                           [](std::uintmax_t sum, const CacheEntry& entry)
                           { return sum + entry.bytes; });
}

Json Describe(const CacheEntry& entry)
{
    Json file = {{"name", entry.name}, {"kind", NameOf(entry.kind)}, {"bytes", entry.bytes}};
    file["key"] = entry.kind == Kind::Program ? Json(entry.key) : Json(nullptr);
    return file;
}

Json Describe(const CacheCheck& check)
{
    Json file = Describe(check.entry);
    file["whole"] = check.problem.empty();
    file["problem"] = check.problem.empty() ? Json(nullptr) : Json(check.problem);
    if (!check.problem.empty())
        return file;
    file["format"] = check.record.format;
    file["programBytes"] = check.record.length;
    file["attributes"] = check.record.attributes;
    return file;
}

void Print(const Json& json)
{
    // Names of attributes are whatever bytes a file holds.
    std::puts(json.dump(2, ' ', false, Json::error_handler_t::replace).c_str());
}

// ---- the three commands -------------------------------------------------------------------------

void List(const CacheOptions& options)
{
    const std::vector<CacheEntry> entries = options.Entries();
    if (options.json)
    {
        Json files = Json::array();
        for (const CacheEntry& entry : entries)
            files.push_back(Describe(entry));
        return Print({{"folder", options.Folder()}, {"files", std::move(files)}});
    }
    std::printf("%s\n", options.Folder().c_str());
    for (const CacheEntry& entry : entries)
        std::printf("%10ju  %-13s  %s\n", entry.bytes, NameOf(entry.kind), entry.name.c_str());
    std::printf("%10ju  bytes in %zu files\n", SumOfBytes(entries), entries.size());
}

void PrintCheck(const CacheCheck& check)
{
    if (!check.problem.empty())
        std::printf("refused  %-20s  %s\n", check.entry.name.c_str(), check.problem.c_str());
    else
        std::printf("whole    %-20s  format 0x%X, %d bytes, %zu attributes\n",
                    check.entry.name.c_str(), check.record.format, check.record.length,
                    check.record.attributes.size());
}

void Verify(const CacheOptions& options)
{
    const std::vector<CacheCheck> checks = CheckCache(options.Folder(), options.Entries());
    Json files = Json::array();
    std::size_t refused = 0;
    for (const CacheCheck& check : checks)
    {
        refused += check.problem.empty() ? 0 : 1;
        if (options.json)
            files.push_back(Describe(check));
        else
            PrintCheck(check);
    }
    if (options.json)
        Print({{"folder", options.Folder()}, {"refused", refused}, {"files", std::move(files)}});
    else
        std::printf("%zu files, %zu refused\n", checks.size(), refused);
    if (refused != 0)
        throw CLI::RuntimeError(1);
}

void Clear(const CacheOptions& options)
{
    const CacheClearing clearing = ClearCache(options.Folder(), options.Entries());
    if (options.json)
    {
        Json removed = Json::array();
        for (const CacheEntry& entry : clearing.removed)
            removed.push_back(entry.name);
        Print({{"folder", options.Folder()},
               {"removed", std::move(removed)},
               {"kept", clearing.kept}});
    }
    else
    {
        for (const std::string& name : clearing.kept)
            std::printf("kept %s\n", name.c_str());
        std::printf("removed %zu files, %ju bytes\n", clearing.removed.size(),
                    SumOfBytes(clearing.removed));
    }
    if (!clearing.kept.empty())
        throw CLI::RuntimeError(1);
}

void AddOne(CLI::App& cache, const char* name, const char* help,
            void (*run)(const CacheOptions& options))
{
    CLI::App* const command = cache.add_subcommand(name, help);
    const auto options = std::make_shared<CacheOptions>();
    command->add_option("FOLDER", options->folder,
                        "The folder of the files; by default the one that programs of this "
                        "environment use");
    command->add_flag("--json", options->json, "As JSON, in the form that docs/nib-cache.md has");
    command->callback([options, run] { run(*options); });
}

} // namespace

void AddCacheCommand(CLI::App& app)
{
    CLI::App* const cache =
        app.add_subcommand("cache", "Look at the kept program binaries, or remove them");
    cache->require_subcommand(1);
    AddOne(*cache, "list", "List the files", &List);
    AddOne(*cache, "verify",
           "Read every file as the library would; exit status 1 when it would refuse one", &Verify);
    AddOne(*cache, "clear",
           "Remove the cache's files and nothing else; exit status 1 when one stays", &Clear);
}
