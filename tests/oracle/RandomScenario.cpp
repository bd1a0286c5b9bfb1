#include "oracle/RandomScenario.h"

namespace Oracle
{

// The library's own distributions differ between standard libraries.
int RandomScenario::Below(int limit)
{
    return static_cast<int>(m_random() % static_cast<std::uint32_t>(limit));
}

// Mostly on the screen, now and then beyond it; whole, or with a fraction.
float RandomScenario::Coordinate(int size)
{
    const int whole = OneIn(8) ? Below(3 * size) - size : Below(size + 1);
    const float fraction = OneIn(3) ? static_cast<float>(Below(100)) / 100 : 0.0F;
    return static_cast<float>(whole) + fraction;
}

Nib::RectF RandomScenario::Rectangle(int width, int height)
{
    if (OneIn(20))
        return {0, 0, static_cast<float>(width), static_cast<float>(height)};
    const float left = Coordinate(width);
    const float top = Coordinate(height);
    if (OneIn(2)) // as a piece of a stroke is
        return {left, top, left + 1 + static_cast<float>(Below(8)),
                top + 1 + static_cast<float>(Below(8))};
    return {left, top, Coordinate(width), Coordinate(height)}; // often empty, too
}

Scenario RandomScenario::Make(const Space& space)
{
    Scenario scenario;
    scenario.width = 1 + Below(OneIn(4) ? 8 : 100);
    scenario.height = 1 + Below(OneIn(4) ? 8 : 100);
    scenario.panelRotation = 90 * Below(4);
    scenario.rotation = Below(4);
    scenario.damageIsAHint = OneIn(2);
    scenario.frames.resize(static_cast<std::size_t>(1 + Below(space.maxFrames)));
    for (Frame& frame : scenario.frames)
    {
        for (int i = Below(4); i > 0; --i)
            frame.dirty.push_back(Rectangle(scenario.width, scenario.height));
    }
    GiveBuffers(space, scenario);
    return scenario;
}

void RandomScenario::GiveBuffers(const Space& space, Scenario& scenario)
{
    scenario.lostIsZero = space.lostIsZero || OneIn(2);
    scenario.buffers = space.preserved ? 1 : space.buffers != 0 ? space.buffers : 1 + Below(4);
    const bool takesTurns = OneIn(2);
    SwapChain chain(scenario.buffers);
    for (Frame& frame : scenario.frames)
    {
        frame.age = AgeIn(chain, space, takesTurns);
        chain.Present(frame.age);
    }
}

int RandomScenario::AgeIn(const SwapChain& chain, const Space& space, bool takesTurns)
{
    if (chain.HasFresh() && (takesTurns || OneIn(2)))
        return 0;
    if (space.buffersGetLost && OneIn(10))
        return 0;
    std::vector<int> ages = chain.Ages(); // 0 comes first
    while (ages.back() > space.maxAge)
        ages.pop_back();
    if (takesTurns || ages.size() == 1)
        return ages.back();
    return ages[static_cast<std::size_t>(1 + Below(static_cast<int>(ages.size()) - 1))];
}

} // namespace Oracle
