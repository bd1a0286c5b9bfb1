#include "Run.h"

#include "Window.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <random>
#include <string>

namespace
{

constexpr int kUsageStatus = 2;
constexpr int kSkippedStatus = 77;

const char* const kUsage =
    "usage: nib_soak [--seed N] [--minutes N | --seconds N] [--rounds N] [--threads N]\n";

/// False when @p arguments are none of the program's. --plant-leak is for the tests of this program:
/// what it leaves behind has to be found.
bool Parse(int count, char** arguments, Soak::Options& options)
{
    for (int i = 1; i + 1 < count; i += 2)
    {
        const std::string name = arguments[i];
        if (name == "--plant-leak")
        {
            if (!options.leak.Choose(arguments[i + 1]))
                return false;
            continue;
        }
        char* end = nullptr;
        const unsigned long long number = std::strtoull(arguments[i + 1], &end, 10);
        if (*end != '\0' || end == arguments[i + 1])
            return false;
        if (name == "--seed")
            options.seed = number;
        else if (name == "--minutes")
            options.time = std::chrono::minutes(number);
        else if (name == "--seconds")
            options.time = std::chrono::seconds(number);
        else if (name == "--rounds")
            options.rounds = static_cast<int>(number);
        else if (name == "--threads" && number >= 1 && number <= Soak::Progress::kMostFamilies)
            options.families = static_cast<int>(number);
        else
            return false;
    }
    return count % 2 == 1 && (options.time.count() != 0 || options.rounds != 0);
}

} // namespace

int main(int count, char** arguments)
{
    Soak::Options options;
    options.seed = std::random_device()();
    if (!Parse(count, arguments, options))
    {
        std::fputs(kUsage, stderr);
        return kUsageStatus;
    }
    const char* const display = std::getenv("DISPLAY");
    if (Soak::HasWindows() && (display == nullptr || *display == '\0'))
    {
        std::puts("skipped: no X server, DISPLAY is unset");
        return kSkippedStatus;
    }
    try
    {
        return Soak::Run(options).ToTheEnd() ? EXIT_SUCCESS : EXIT_FAILURE;
    }
    catch (const std::exception& failure)
    {
        std::fprintf(stderr, "soak: %s\n", failure.what());
        return EXIT_FAILURE;
    }
}
