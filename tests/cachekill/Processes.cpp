#include "Processes.h"

#include "KillPoint.h"
#include "Records.h"

#include <csignal>
#include <random>
#include <string_view>
#include <thread>

#include <android/log.h>
#include <sys/wait.h>

namespace CacheKill
{

namespace
{

using Nib::ShaderProgramCache;

constexpr int kMostSteps = 60;   ///< of a process that kills itself
constexpr int kLongestLife = 60; ///< milliseconds, of one that is killed

bool s_wasAbsent = false; ///< what the last line of the log was about

/// Writes records until it is killed.
[[noreturn]] void WriteForEver(Counters& counters, std::uint64_t seed)
{
    std::mt19937_64 random(seed);
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    if (random() % 2 == 0)
        DieAfter(static_cast<int>(random() % kMostSteps));
    for (;;)
    {
        const Record record =
            MakeRecord(random() % kKeys, static_cast<std::uint32_t>(random() & 0xFFFFFFFF));
        const bool isWritten = cache->SetBinaryShader(record);
        (isWritten ? counters.written : counters.wrong).fetch_add(1, std::memory_order_relaxed);
    }
}

/// Where to count that @p record, or none, came for @p key.
std::atomic<long>& Outcome(Counters& counters, const Record* record, std::uint64_t key)
{
    if (record)
        return IsWhole(*record, key) ? counters.whole : counters.wrong;
    return s_wasAbsent ? counters.absent : counters.refused;
}

} // namespace

} // namespace CacheKill

// In front of the base library's: the line that a missing file leaves is another than those of
// files that are not whole.
extern "C" __attribute__((visibility("default"))) int __android_log_print(int, const char*,
                                                                          const char* format, ...)
{
    CacheKill::s_wasAbsent = std::string_view(format).find("Failed to create shader binary file") !=
                             std::string_view::npos;
    return 0;
}

namespace CacheKill
{

int Wait(pid_t child)
{
    int status = 0;
    while (waitpid(child, &status, 0) != child)
    {
    }
    return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

void KeepKilling(Counters& counters, std::uint64_t seed, Clock::time_point end)
{
    std::mt19937_64 random(seed);
    while (Clock::now() < end)
    {
        const pid_t writer = Fork([&counters, own = random()] { WriteForEver(counters, own); });
        // The moment of death is the point here; nothing is waited for.
        std::this_thread::sleep_for(std::chrono::microseconds(random() % (kLongestLife * 1000)));
        kill(writer, SIGKILL);
        if (Wait(writer) == 128 + SIGKILL)
            counters.killed.fetch_add(1, std::memory_order_relaxed);
        else
            counters.wrong.fetch_add(1, std::memory_order_relaxed); // it may end in no other way
    }
}

void KeepReading(Counters& counters, Clock::time_point end)
{
    while (Clock::now() < end)
    {
        if (Wait(Fork([&counters] { ReadAll(counters); })) != 0)
            counters.wrong.fetch_add(1, std::memory_order_relaxed);
    }
}

void ReadAll(Counters& counters)
{
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    for (std::uint64_t key = 0; key < kKeys; ++key)
    {
        const auto record = cache->HoldBinaryShader(key);
        Outcome(counters, record.get(), key).fetch_add(1, std::memory_order_relaxed);
    }
}

} // namespace CacheKill
