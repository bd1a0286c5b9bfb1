#ifndef NIB_TESTS_SOAK_RANDOM_H
#define NIB_TESTS_SOAK_RANDOM_H

#include <cstdint>
#include <random>

namespace Soak
{

/// The choices of one thread. The same seed gives the same choices, on every machine: the
/// distributions of the standard library do not promise that.
class Random
{
public:
    explicit Random(std::uint64_t seed) : m_engine(seed) {}

    /// A number below @p limit.
    int Below(int limit)
    {
        return static_cast<int>(m_engine() % static_cast<std::uint64_t>(limit));
    }

    /// A number from @p least to @p most.
    int Between(int least, int most) { return least + Below(most - least + 1); }

    bool OneIn(int count) { return Below(count) == 0; }

private:
    std::mt19937_64 m_engine;
};

} // namespace Soak

#endif
