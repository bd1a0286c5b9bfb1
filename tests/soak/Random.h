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
        const std::uint64_t chosen = m_engine() % static_cast<std::uint64_t>(limit);
        m_digest = (m_digest ^ chosen) * kDigestFactor;
        return static_cast<int>(chosen);
    }

    /// A number from @p least to @p most.
    int Between(int least, int most) { return least + Below(most - least + 1); }

    bool OneIn(int count) { return Below(count) == 0; }

    /// For choices whose number another thread has a say in: these go on as if one had been made.
    Random Fork() { return Random(m_engine()); }

    /// Of all choices so far.
    std::uint64_t Digest() const { return m_digest; }

private:
    static constexpr std::uint64_t kDigestFactor = 1099511628211; ///< FNV-1a's

    std::mt19937_64 m_engine;
    std::uint64_t m_digest = 14695981039346656037u;
};

} // namespace Soak

#endif
