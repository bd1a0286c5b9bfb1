#ifndef NIB_TESTS_ORACLE_RANDOM_SCENARIO_H
#define NIB_TESTS_ORACLE_RANDOM_SCENARIO_H

#include "oracle/Scenario.h"
#include "oracle/SwapChain.h"

#include <cstdint>
#include <random>

namespace Oracle
{

/// What a random scenario may hold.
struct Space
{
    int buffers = 0; ///< 0: 1 to 4
    int maxFrames = 12;
    int maxAge = 1000; ///< of a buffer that is given out
    bool buffersGetLost = true;
    bool lostIsZero = false; ///< always; else now and then
    bool preserved = false;  ///< one buffer, which never gets lost
};

/// The same scenario for the same seed, everywhere.
class RandomScenario
{
public:
    explicit RandomScenario(std::uint32_t seed) : m_random(seed) {}

    Scenario Make(const Space& space);

    /// Back buffers for frames whose rectangles are given.
    void GiveBuffers(const Space& space, Scenario& scenario);

private:
    int AgeIn(const SwapChain& chain, const Space& space, bool takesTurns);
    int Below(int limit);
    bool OneIn(int count) { return Below(count) == 0; }
    float Coordinate(int size);
    Nib::RectF Rectangle(int width, int height);

    std::mt19937 m_random;
};

} // namespace Oracle

#endif
