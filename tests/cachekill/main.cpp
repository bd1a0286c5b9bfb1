// Processes that write the same cache folder are killed at any moment, while others read.

#include "Processes.h"
#include "Records.h"

#include <nib/base.h>

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <string>
#include <vector>

namespace
{

namespace fs = std::filesystem;
using namespace CacheKill;

constexpr int kWriters = 4;
constexpr int kReaders = 2;
constexpr int kUsageStatus = 2;

struct Files
{
    int records = 0;
    int temporaries = 0; ///< and whatever else is there
};

Files FilesIn(const fs::path& folder)
{
    Files files;
    for (const fs::directory_entry& entry : fs::directory_iterator(folder))
        ++(entry.path().extension() == ".dat" ? files.records : files.temporaries);
    return files;
}

void LiveAndDie(Counters& counters, std::uint64_t seed, std::chrono::seconds time)
{
    const Clock::time_point end = Clock::now() + time;
    std::vector<pid_t> processes;
    for (std::uint64_t i = 0; i < kWriters; ++i)
        processes.push_back(
            Fork([&counters, own = seed * kWriters + i, end] { KeepKilling(counters, own, end); }));
    for (int i = 0; i < kReaders; ++i)
        processes.push_back(Fork([&counters, end] { KeepReading(counters, end); }));
    for (const pid_t process : processes)
    {
        if (Wait(process) != 0)
            counters.wrong.fetch_add(1, std::memory_order_relaxed);
    }
}

/// What is wrong, or an empty text. Prints the row of the table.
std::string Try(const fs::path& folder, std::uint64_t seed, std::chrono::seconds time)
{
    Counters& counters = ShareCounters();
    LiveAndDie(counters, seed, time);

    const fs::path cache = folder / "RendererCache";
    const Files left = FilesIn(cache);
    Counters& after = ShareCounters();
    const int lastStatus = Wait(Fork([&after] { ReadAll(after); }));
    const Files cleaned = FilesIn(cache);

    std::string lost;
    if (counters.wrong != 0)
        lost = std::to_string(counters.wrong) + " records were not whole, or not written";
    else if (counters.refused != 0)
        lost = std::to_string(counters.refused) + " files were seen half written";
    else if (lastStatus != 0 || after.wrong != 0 || after.whole != left.records)
        lost = "afterwards only " + std::to_string(after.whole) + " records load";
    else if (cleaned.temporaries != 0)
        lost = std::to_string(cleaned.temporaries) + " temporary files stay";
    else if (counters.killed == 0 || counters.whole == 0)
        lost = "nothing was tried";
    std::printf("RELIABILITY | kill -9 of 4 processes that write one cache folder, 2 reading it, "
                "seed %llu, %lld s | %ld killed, %ld records written, %ld read whole, %ld absent, "
                "%ld half written, %ld wrong; afterwards %ld of %d files load, %d temporary files, "
                "%d behind the "
                "next start | %s\n",
                static_cast<unsigned long long>(seed), static_cast<long long>(time.count()),
                counters.killed.load(), counters.written.load(), counters.whole.load(),
                counters.absent.load(), counters.refused.load(), counters.wrong.load(),
                after.whole.load(), left.records, left.temporaries, cleaned.temporaries,
                lost.empty() ? "nothing" : lost.c_str());
    return lost;
}

} // namespace

int main(int count, char** arguments)
{
    if (count != 3)
    {
        std::fputs("usage: nib_cache_kill SEED SECONDS\n", stderr);
        return kUsageStatus;
    }
    const std::uint64_t seed = std::strtoull(arguments[1], nullptr, 10);
    const std::chrono::seconds time(std::strtoll(arguments[2], nullptr, 10));
    try
    {
        std::string folder = (fs::temp_directory_path() / "nib-kill-XXXXXX").string();
        if (!mkdtemp(folder.data()))
            throw std::runtime_error("there is no temporary folder");
        Nib::System::SetSDKCacheDirectoryPath((folder + "/sdk").c_str());
        const std::string lost = Try(folder, seed, time);
        if (lost.empty())
            fs::remove_all(folder);
        else
            std::fprintf(stderr, "%s; see %s\n", lost.c_str(), folder.c_str());
        return lost.empty() ? EXIT_SUCCESS : EXIT_FAILURE;
    }
    catch (const std::exception& failure)
    {
        std::fprintf(stderr, "nib_cache_kill: %s\n", failure.what());
        return EXIT_FAILURE;
    }
}
