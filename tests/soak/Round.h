#ifndef NIB_TESTS_SOAK_ROUND_H
#define NIB_TESTS_SOAK_ROUND_H

#include "Action.h"
#include "Progress.h"
#include "World.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace Soak
{

/// Some families that live side by side, from their birth to their end.
class Round
{
public:
    Round(World& world, Progress& progress, std::uint64_t seed);

    /// [blocks] The first failure, or an empty text.
    std::string Run(int families);

    /// Of all choices, behind Run: the same for each run of the same seed that lost nothing.
    std::uint64_t Digest() const { return m_digest.load(std::memory_order_relaxed); }

private:
    void Live(int family);
    void Keep(const std::string& failure);

    World& m_world;
    Progress& m_progress;
    const std::uint64_t m_seed;
    const std::vector<std::unique_ptr<Action>> m_actions = AllActions();
    std::atomic<std::uint64_t> m_digest{0}; ///< the sum of the families'
    std::mutex m_lock;
    std::string m_failure; // guarded by m_lock
};

} // namespace Soak

#endif
