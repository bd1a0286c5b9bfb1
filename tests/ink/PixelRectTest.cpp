#include "PixelRect.h"

#include <gtest/gtest.h>
#include <random>

namespace
{

using Ink::PixelRect;

TEST(PixelRect, HoldsEveryPixelThatABoxTouches)
{
    EXPECT_EQ(Ink::PixelsIn(Nib::RectF(1.5f, 2.0f, 3.1f, 4.0f), 100, 100), (PixelRect{1, 2, 4, 4}));
}

TEST(PixelRect, EndsWithThePage)
{
    EXPECT_EQ(Ink::PixelsIn(Nib::RectF(-1e30f, -5.0f, 1e30f, 9.5f), 20, 8),
              (PixelRect{0, 0, 20, 8}));
    EXPECT_TRUE(Ink::PixelsIn(Nib::RectF(30.0f, 2.0f, 40.0f, 4.0f), 20, 8).IsEmpty());
    EXPECT_TRUE(Ink::PixelsIn(Nib::RectF(-9.0f, 2.0f, -1.0f, 4.0f), 20, 8).IsEmpty());
}

TEST(PixelRect, UnionIsTheBoxAroundBoth)
{
    EXPECT_EQ(Ink::Union({1, 2, 3, 4}, {5, 0, 6, 3}), (PixelRect{1, 0, 6, 4}));
    EXPECT_EQ(Ink::Union({}, {5, 0, 6, 3}), (PixelRect{5, 0, 6, 3}));
    EXPECT_EQ(Ink::Union({5, 0, 6, 3}, {9, 9, 9, 20}), (PixelRect{5, 0, 6, 3}));
}

TEST(PixelRect, NothingLiesAroundTheSame)
{
    EXPECT_TRUE(Ink::Around({1, 2, 3, 4}, {1, 2, 3, 4}).empty());
    EXPECT_TRUE(Ink::Around({}, {}).empty());
}

TEST(PixelRect, AllOfItLiesAroundNothing)
{
    EXPECT_EQ(Ink::Around({}, {1, 2, 3, 4}), (std::vector<PixelRect>{{1, 2, 3, 4}}));
}

TEST(PixelRect, EveryPixelAroundIsInOneStrip)
{
    std::mt19937 random(4);
    const auto within = [&random](int low, int high)
    { return std::uniform_int_distribution<int>(low, high)(random); };
    for (int round = 0; round < 200; ++round)
    {
        const PixelRect outer{within(0, 4), within(0, 4), within(6, 9), within(6, 9)};
        const PixelRect inner{within(outer.left, 5), within(outer.top, 5), within(6, outer.right),
                              within(6, outer.bottom)};
        int times[10][10] = {};
        for (const PixelRect& strip : Ink::Around(inner, outer))
        {
            EXPECT_FALSE(strip.IsEmpty());
            for (int y = strip.top; y < strip.bottom; ++y)
                for (int x = strip.left; x < strip.right; ++x)
                    ++times[y][x];
        }
        const auto holds = [](const PixelRect& rect, int x, int y)
        { return x >= rect.left && x < rect.right && y >= rect.top && y < rect.bottom; };
        for (int y = 0; y < 10; ++y)
            for (int x = 0; x < 10; ++x)
                ASSERT_EQ(times[y][x], holds(outer, x, y) && !holds(inner, x, y) ? 1 : 0);
    }
}

} // namespace
