#include "oracle/Shrink.h"
#include "oracle/Explore.h"
#include "oracle/SwapChain.h"

#include <gtest/gtest.h>

#include <numeric>

// What shrinks a failure is itself tried on faults that are planted.

using namespace Oracle;
using Nib::RectF;

namespace
{

using Numbers = std::vector<int>;

Numbers Counting(int count)
{
    Numbers numbers(static_cast<std::size_t>(count));
    std::iota(numbers.begin(), numbers.end(), 0);
    return numbers;
}

bool Has(const Numbers& numbers, int wanted)
{
    return std::find(numbers.begin(), numbers.end(), wanted) != numbers.end();
}

} // namespace

TEST(ShortestFailing, KeepsWhatTheFailureNeeds)
{
    const Numbers shortest = ShortestFailing(Counting(100), [](const Numbers& list)
                                             { return Has(list, 13) && Has(list, 77); });

    EXPECT_EQ(shortest, (Numbers{13, 77}));
}

TEST(ShortestFailing, KeepsTheOrder)
{
    const auto fails = [](const Numbers& list)
    { return Has(list, 70) && std::is_sorted(list.begin(), list.end()) && list.back() > 90; };

    EXPECT_EQ(ShortestFailing(Counting(100), fails), (Numbers{70, 99}));
}

TEST(ShortestFailing, IsEmptyWhereEverythingFails)
{
    EXPECT_EQ(ShortestFailing(Counting(10), [](const Numbers&) { return true; }), Numbers());
}

TEST(ShortestFailing, KeepsAllWhereAllIsNeeded)
{
    const auto fails = [](const Numbers& list) { return list.size() == 9; };

    EXPECT_EQ(ShortestFailing(Counting(9), fails), Counting(9));
}

TEST(ShortestFailing, DropsWhatOnlyGoesAfterAnother)
{
    // 1 can go when 2 is gone, 2 only when 3 is.
    const auto fails = [](const Numbers& list)
    { return Has(list, 0) && (!Has(list, 2) || Has(list, 1)) && (!Has(list, 3) || Has(list, 2)); };

    EXPECT_EQ(ShortestFailing(Numbers{0, 1, 2, 3}, fails), Numbers{0});
}

TEST(ShortestFailing, AsksFewTimes)
{
    int questions = 0;

    ShortestFailing(Counting(1024),
                    [&](const Numbers& list)
                    {
                        ++questions;
                        return Has(list, 500);
                    });

    EXPECT_LE(questions, 64); // about twice the halvings of 1024, not 1024 itself
}

TEST(Shrunk, FindsTheFrameTheRectangleAndTheNumbersThatMatter)
{
    // Given a fault that needs a rectangle which begins right of 5, in a frame of its own
    Scenario scenario = RandomScenario(7).Make(Space());
    scenario.width = 90;
    scenario.height = 70;
    scenario.frames.resize(6);
    scenario.frames[3].dirty = {RectF(1, 2, 3, 4), RectF(31.25F, 20, 60.5F, 30), RectF(5, 5, 6, 6)};
    scenario = Repaired(scenario);
    const auto fails = [](const Scenario& s)
    {
        for (const Frame& frame : s.frames)
        {
            for (const RectF& rect : frame.dirty)
            {
                if (rect.left > 5 && rect.right > rect.left)
                    return true;
            }
        }
        return false;
    };

    const Scenario shortest = Shrunk(scenario, fails);

    ASSERT_EQ(shortest.frames.size(), 1u);
    ASSERT_EQ(shortest.frames[0].dirty.size(), 1u);
    EXPECT_EQ(shortest.frames[0].dirty[0], RectF(6, 0, 7, 0));
    EXPECT_EQ(shortest.width, 1);
    EXPECT_EQ(shortest.height, 1);
    EXPECT_EQ(shortest.rotation, 0);
    EXPECT_EQ(shortest.panelRotation, 0);
    EXPECT_EQ(shortest.buffers, 1);
}

TEST(Shrunk, KeepsAgesThatTheBuffersCanHave)
{
    // Given a fault that needs a buffer of age 3 or more
    Scenario scenario;
    scenario.buffers = 4;
    scenario.frames.assign(12, {4, {RectF(0, 0, 1, 1)}});
    scenario = Repaired(scenario);
    const auto fails = [](const Scenario& s)
    {
        EXPECT_EQ(Repaired(s), s);
        return std::any_of(s.frames.begin(), s.frames.end(),
                           [](const Frame& frame) { return frame.age >= 3; });
    };

    const Scenario shortest = Shrunk(scenario, fails);

    ASSERT_EQ(shortest.frames.size(), 4u);
    EXPECT_EQ(shortest.frames[3].age, 3);
    EXPECT_EQ(shortest.buffers, 3); // two take turns, and none of them is ever older than 2
}

TEST(Shrunk, ForgottenFrameIsFoundAndPrintedAsATest)
{
    // Given a caller that remembers one frame, where three buffers need two
    Caller forgetful;
    forgetful.historyLength = 1;
    Player player(Device::DamageRegion, forgetful);
    Space space;
    space.buffers = 3;
    space.buffersGetLost = false;

    const std::string found = Explore(player, space);

    EXPECT_EQ(found, R"(
TEST(PartialUpdateFound, Seed1)
{
    Caller caller;
    caller.historyLength = 1;
    Player player(Device::DamageRegion, caller);
    Scenario scenario;
    scenario.width = 1;
    scenario.height = 1;
    scenario.buffers = 3;
    scenario.frames = {
        {0, {}},
        {0, {RectF(0, 0, 1, 1)}},
        {0, {}},
        {3, {}},
    };

    EXPECT_EQ(player.Play(scenario), "");
}
// frame 3, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)
)");
}

TEST(Shrunk, PrintedTestFailsAsItsOriginalDid)
{
    // What the test above prints, with its expectation turned round.
    Caller caller;
    caller.historyLength = 1;
    Player player(Device::DamageRegion, caller);
    Scenario scenario;
    scenario.width = 1;
    scenario.height = 1;
    scenario.buffers = 3;
    scenario.frames = {
        {0, {}},
        {0, {RectF(0, 0, 1, 1)}},
        {0, {}},
        {3, {}},
    };

    EXPECT_EQ(player.Play(scenario),
              "frame 3, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
    EXPECT_EQ(player.PlayAs(Caller(), scenario), "");
}

TEST(Scenario, StatementsGiveTheSameNumbersAgain)
{
    Scenario scenario;
    scenario.width = 3;
    scenario.rotation = 2;
    scenario.lostIsZero = true;
    scenario.frames = {{0, {}}, {2, {RectF(-1, 0.1F, 1e30F, 0.5F), RectF(1, 2, 3, 100)}}};

    EXPECT_EQ(ToStatements(scenario), R"(    Scenario scenario;
    scenario.width = 3;
    scenario.rotation = 2;
    scenario.lostIsZero = true;
    scenario.frames = {
        {0, {}},
        {2, {RectF(-1, 0.1F, 1e+30F, 0.5F), RectF(1, 2, 3, 100)}},
    };
)");
}
