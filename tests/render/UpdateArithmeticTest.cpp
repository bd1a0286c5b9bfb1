#include "render/UpdateArithmetic.h"

#include <gtest/gtest.h>

#include <climits>
#include <limits>
#include <ostream>
#include <tuple>

using namespace Nib;

namespace
{

using Box = std::tuple<int, int, int, int>; // x, y, width, height
using Edges = std::tuple<float, float, float, float>;

Box ToBox(const ScissorBox& box)
{
    return {box.x, box.y, box.width, box.height};
}

Edges ToEdges(const RectF& rect)
{
    return {rect.left, rect.top, rect.right, rect.bottom};
}

// No side of it is a multiple of 32, except 1920.
constexpr ScreenSize kPhone{1080, 1920};
constexpr ScreenSize kOddPhone{1080, 1910};

Box Aligned(const ScissorBox& box, int rotationIndex)
{
    return ToBox(AlignedToTiles(box, kOddPhone, 32, rotationIndex));
}

} // namespace

// ---- clipping -----------------------------------------------------------------------------------

TEST(UpdateArithmetic, ClipKeepsWhatIsOnTheScreen)
{
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(10.5F, 20, 30, 40.25F), kPhone)),
              Edges(10.5F, 20, 30, 40.25F));
}

TEST(UpdateArithmetic, ClipCutsAtEachEdge)
{
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(-5, 20, 30, 40), kPhone)), Edges(0, 20, 30, 40));
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(10, -5, 30, 40), kPhone)), Edges(10, 0, 30, 40));
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(10, 20, 1085, 40), kPhone)), Edges(10, 20, 1080, 40));
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(10, 20, 30, 1925), kPhone)), Edges(10, 20, 30, 1920));
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(-1, -1, 9999, 9999), kPhone)), Edges(0, 0, 1080, 1920));
}

TEST(UpdateArithmetic, ClipOfWhatIsOutsideIsAllZero)
{
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(1100, 20, 1200, 40), kPhone)), Edges(0, 0, 0, 0));
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(-20, 20, -10, 40), kPhone)), Edges(0, 0, 0, 0));
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(10, 1920, 30, 1950), kPhone)), Edges(0, 0, 0, 0));
}

TEST(UpdateArithmetic, ClipOfAnEmptyRectangleIsAllZero)
{
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(50, 60, 50, 70), kPhone)), Edges(0, 0, 0, 0));
    EXPECT_EQ(ToEdges(ClipToScreen(RectF(50, 60, 40, 70), kPhone)), Edges(0, 0, 0, 0));
}

// ---- boxes --------------------------------------------------------------------------------------

TEST(UpdateArithmetic, FlippedBoxIsCountedFromTheBottom)
{
    EXPECT_EQ(ToBox(FlippedBox(RectF(100, 200, 300, 260), kPhone)), Box(100, 1660, 200, 60));
    EXPECT_EQ(ToBox(FlippedBox(RectF(0, 0, 1080, 1920), kPhone)), Box(0, 0, 1080, 1920));
    EXPECT_EQ(ToBox(FlippedBox(RectF(0, 0, 10, 10), kPhone)), Box(0, 1910, 10, 10));
}

TEST(UpdateArithmetic, FlippedBoxDropsFractions)
{
    // 100.9; 1920 - 260.5 = 1659.5; 300.75 - 100.9 = 199.85; 260.5 - 200.25 = 60.25
    EXPECT_EQ(ToBox(FlippedBox(RectF(100.9F, 200.25F, 300.75F, 260.5F), kPhone)),
              Box(100, 1659, 199, 60));
}

TEST(UpdateArithmetic, FractionsAreDroppedTowardZero)
{
    EXPECT_EQ(ToBox(FlippedBox(RectF(-10.75F, 10, 20, 1930.5F), kPhone)), Box(-10, -10, 30, 1920));
    EXPECT_EQ(ToBox(WindowBox(RectF(-10.75F, -0.5F, 20, 30))), Box(-10, 0, 30, 30));
}

TEST(UpdateArithmetic, WindowBoxIsNotTurned)
{
    EXPECT_EQ(ToBox(WindowBox(RectF(100, 200, 300, 260))), Box(100, 200, 200, 60));
    EXPECT_EQ(ToBox(WindowBox(RectF(100.9F, 200.9F, 300.2F, 260.1F))), Box(100, 200, 199, 59));
}

TEST(UpdateArithmetic, WhatNoIntHoldsIsTheNearestOne)
{
    const float infinity = std::numeric_limits<float>::infinity();
    const float none = std::numeric_limits<float>::quiet_NaN();

    EXPECT_EQ(ToBox(WindowBox(RectF(-1e30F, -infinity, 1e30F, infinity))),
              Box(INT_MIN, INT_MIN, INT_MAX, INT_MAX));
    EXPECT_EQ(ToBox(WindowBox(RectF(none, none, 7, 7))), Box(0, 0, 0, 0));
}

TEST(UpdateArithmetic, FullScreenIsTheWholeSurface)
{
    EXPECT_EQ(ToBox(FullScreen(kPhone)), Box(0, 0, 1080, 1920));
}

// ---- tiles --------------------------------------------------------------------------------------

TEST(UpdateArithmetic, TilesOfAnUnturnedPanelAreCountedFromLeftAndBottom)
{
    // x: 100 to 300 grows to 96 to 320; y: 1650 to 1710 grows to 1632 to 1728
    EXPECT_EQ(Aligned({100, 1650, 200, 60}, 0), Box(96, 1632, 224, 96));
}

TEST(UpdateArithmetic, TilesOfAQuarterTurnAreCountedFromRightAndBottom)
{
    // From the right: 980 to 780 grows to 992 to 768
    EXPECT_EQ(Aligned({100, 1650, 200, 60}, 1), Box(88, 1632, 224, 96));
}

TEST(UpdateArithmetic, TilesOfAHalfTurnAreCountedFromRightAndTop)
{
    // From the top: 260 to 200 grows to 288 to 192
    EXPECT_EQ(Aligned({100, 1650, 200, 60}, 2), Box(88, 1622, 224, 96));
}

TEST(UpdateArithmetic, TilesOfThreeQuarterTurnsAreCountedFromLeftAndTop)
{
    EXPECT_EQ(Aligned({100, 1650, 200, 60}, 3), Box(96, 1622, 224, 96));
}

TEST(UpdateArithmetic, TilesOfANegativeRotationAreCountedFromRightAndTop)
{
    for (int rotationIndex : {-1, -2, -3})
        EXPECT_EQ(Aligned({100, 1650, 200, 60}, rotationIndex), Box(88, 1622, 224, 96));
}

TEST(UpdateArithmetic, AlignedBoxStaysAsItIs)
{
    EXPECT_EQ(Aligned({64, 32, 96, 64}, 0), Box(64, 32, 96, 64));
    // 1080 - 64 = 1016 and 1910 - 54 = 1856 from the other edges; 1016 is 31.75 tiles
    EXPECT_EQ(Aligned({56, 54, 96, 64}, 2), Box(56, 54, 96, 64));
}

TEST(UpdateArithmetic, TilesEndAtTheScreen)
{
    EXPECT_EQ(Aligned({1060, 1900, 20, 10}, 0), Box(1056, 1888, 24, 22));
    EXPECT_EQ(Aligned({5, 3, 10, 4}, 2), Box(0, 0, 24, 22));
}

TEST(UpdateArithmetic, WholeScreenStaysTheWholeScreen)
{
    for (int rotationIndex : {-1, 0, 1, 2, 3})
        EXPECT_EQ(Aligned({0, 0, 1080, 1910}, rotationIndex), Box(0, 0, 1080, 1910));
}

TEST(UpdateArithmetic, BoxWithoutAreaTakesItsTile)
{
    EXPECT_EQ(Aligned({100, 100, 0, 0}, 0), Box(96, 96, 32, 32));
    // Counted from the ends: 980 and 1810 are inside of a tile
    EXPECT_EQ(Aligned({100, 100, 0, 0}, 2), Box(88, 86, 32, 32));
}

TEST(UpdateArithmetic, DivisionOfTilesIsTowardZero)
{
    // -40 to -30 on the left: the tile at -32, of which nothing is rounded away
    EXPECT_EQ(Aligned({-40, -5, 10, 10}, 0), Box(-32, 0, 32, 32));
}

TEST(UpdateArithmetic, OtherTileSizesWork)
{
    EXPECT_EQ(ToBox(AlignedToTiles({100, 100, 10, 10}, kPhone, 64, 0)), Box(64, 64, 64, 64));
    EXPECT_EQ(ToBox(AlignedToTiles({100, 100, 10, 10}, kPhone, 1, 0)), Box(100, 100, 10, 10));
}

TEST(UpdateArithmetic, TilesOfAHugeBoxDoNotOverflow)
{
    const ScissorBox huge{INT_MAX, INT_MIN, INT_MAX, INT_MAX};

    EXPECT_EQ(Aligned(huge, 0), Box(2147483616, INT_MIN, -2147482536, INT_MAX));
    EXPECT_EQ(std::get<0>(Aligned(huge, 2)), 2147483608);
}

// ---- the damage of a frame ----------------------------------------------------------------------

TEST(UpdateArithmetic, DamageIsClippedRoundedOutwardAndTurned)
{
    EXPECT_EQ(ToBox(DamageOfFrame(RectF(10.9F, 20.1F, 30.1F, 39.9F), kPhone)),
              Box(10, 1880, 21, 20));
    EXPECT_EQ(ToBox(DamageOfFrame(RectF(-50, -50, 20, 2000), kPhone)), Box(0, 0, 20, 1920));
}

TEST(UpdateArithmetic, DamageOutsideTheScreenIsTheScreen)
{
    EXPECT_EQ(ToBox(DamageOfFrame(RectF(2000, 0, 3000, 10), kPhone)), Box(0, 0, 1080, 1920));
    EXPECT_EQ(ToBox(DamageOfFrame(RectF(), kPhone)), Box(0, 0, 1080, 1920));
}
