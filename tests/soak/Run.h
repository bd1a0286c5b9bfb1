#ifndef NIB_TESTS_SOAK_RUN_H
#define NIB_TESTS_SOAK_RUN_H

#include "MemoryRecord.h"
#include "PlantedLeak.h"
#include "Progress.h"
#include "World.h"

#include <chrono>
#include <cstdint>
#include <string>

namespace Soak
{

struct Options
{
    std::uint64_t seed = 0;
    std::chrono::seconds time{0}; ///< no round is begun behind it
    int rounds = 0;               ///< at most; 0: as many as the time allows
    int families = 4;
    PlantedLeak leak; ///< what each round is made to leave behind
};

/// One run: rounds of life, and behind each a look at what the process holds.
class Run
{
public:
    explicit Run(const Options& options);
    ~Run();
    Run(const Run&) = delete;
    Run& operator=(const Run&) = delete;

    /// [blocks] Prints what was tried and what was lost; true when nothing was.
    bool ToTheEnd();

private:
    struct Held;

    bool IsOver() const;
    std::string DoRound();
    std::string CompareHoldings();
    void PrintRow(const std::string& lost) const;

    using Clock = std::chrono::steady_clock;

    const Options m_options;
    const Clock::time_point m_start = Clock::now();
    std::filesystem::path m_folder;
    World m_world;
    Progress m_progress;
    MemoryRecord m_memory;
    std::unique_ptr<Held> m_atStart;
    std::string m_driver; ///< as it names itself
    int m_rounds = 0;
    std::uint64_t m_digest = 0; ///< of the choices of all rounds
};

} // namespace Soak

#endif
