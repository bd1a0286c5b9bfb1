#include <nib/partial_update.h>

#include <gtest/gtest.h>

#include <tuple>

using Nib::ClipRect;
using Nib::RectF;

namespace
{

using Edges = std::tuple<float, float, float, float>;

Edges Add(ClipRect& history, const RectF& rect)
{
    const RectF area = history.AddUpdateRect(&rect);
    return {area.left, area.top, area.right, area.bottom};
}

Edges AddFullSurface(ClipRect& history)
{
    const RectF area = history.AddUpdateRect(nullptr);
    return {area.left, area.top, area.right, area.bottom};
}

const RectF kNothing;
const RectF kA(0, 0, 10, 10);
const RectF kB(20, 20, 30, 30);
const RectF kC(40, 40, 50, 50);
const RectF kD(60, 60, 70, 70);

/// A history of three rectangles, A, B and C.
struct Abc
{
    Abc()
    {
        for (const RectF& rect : {kA, kB, kC})
            history.AddUpdateRect(&rect);
    }

    ClipRect history{3};
};

} // namespace

TEST(ClipRect, StartsWithEmptyRectangles)
{
    ClipRect history(3);

    EXPECT_EQ(Add(history, kB), Edges(20, 20, 30, 30));
}

TEST(ClipRect, AreaIsTheUnionOfTheHistoryAndTheNewOne)
{
    Abc abc;

    EXPECT_EQ(Add(abc.history, kD), Edges(0, 0, 70, 70));
}

TEST(ClipRect, OldestDropsOut)
{
    Abc abc;
    Add(abc.history, kD);

    EXPECT_EQ(Add(abc.history, kNothing), Edges(20, 20, 70, 70)); // B, C, D
    EXPECT_EQ(Add(abc.history, kNothing), Edges(40, 40, 70, 70)); // C, D
    EXPECT_EQ(Add(abc.history, kNothing), Edges(60, 60, 70, 70)); // D
    EXPECT_EQ(Add(abc.history, kNothing), Edges(0, 0, 0, 0));
}

TEST(ClipRect, HistoryOfOneKeepsTheLast)
{
    ClipRect history(1);
    Add(history, kA);

    EXPECT_EQ(Add(history, kB), Edges(0, 0, 30, 30));
    EXPECT_EQ(Add(history, kC), Edges(20, 20, 50, 50));
}

TEST(ClipRect, WithoutHistoryTheAreaIsTheNewOne)
{
    ClipRect history(0);
    history.Init(100, 200);
    Add(history, kA);

    EXPECT_EQ(Add(history, kB), Edges(20, 20, 30, 30));
    EXPECT_EQ(AddFullSurface(history), Edges(0, 0, 100, 200));
}

TEST(ClipRect, NegativeCountIsNoHistory)
{
    ClipRect history(-1);
    history.Init(100, 200);

    EXPECT_EQ(Add(history, kB), Edges(20, 20, 30, 30));
}

TEST(ClipRect, InitMakesEveryRectangleTheSurface)
{
    ClipRect history(3);

    history.Init(100, 200);

    EXPECT_EQ(Add(history, kA), Edges(0, 0, 100, 200));
    EXPECT_EQ(Add(history, kA), Edges(0, 0, 100, 200));
    EXPECT_EQ(Add(history, kA), Edges(0, 0, 100, 200));
    EXPECT_EQ(Add(history, kB), Edges(0, 0, 30, 30)); // three times A, and B
}

TEST(ClipRect, InitTakesANewSize)
{
    ClipRect history(3);
    history.Init(100, 200);

    history.Init(50, 60);

    EXPECT_EQ(Add(history, kNothing), Edges(0, 0, 50, 60));
}

TEST(ClipRect, ResetMakesEveryRectangleTheSurfaceAgain)
{
    ClipRect history(2);
    history.Init(100, 200);
    Add(history, kB);
    Add(history, kB);

    history.Reset();

    EXPECT_EQ(Add(history, kB), Edges(0, 0, 100, 200));
    EXPECT_EQ(Add(history, kB), Edges(0, 0, 100, 200));
    EXPECT_EQ(Add(history, kB), Edges(20, 20, 30, 30));
}

TEST(ClipRect, ResetWithoutASizeEmptiesEveryRectangle)
{
    Abc abc;

    abc.history.Reset();

    EXPECT_EQ(Add(abc.history, kD), Edges(60, 60, 70, 70));
}

TEST(ClipRect, NullStandsForTheSurface)
{
    ClipRect history(2);
    history.Init(100, 200);
    Add(history, kB);
    Add(history, kB);

    EXPECT_EQ(AddFullSurface(history), Edges(0, 0, 100, 200));

    EXPECT_EQ(Add(history, kB), Edges(0, 0, 100, 200)); // and is kept as such
    EXPECT_EQ(Add(history, kB), Edges(0, 0, 100, 200));
    EXPECT_EQ(Add(history, kB), Edges(20, 20, 30, 30));
}

TEST(ClipRect, RectangleOutsideTheSurfaceIsNotClipped)
{
    ClipRect history(1);
    history.Init(100, 200);

    EXPECT_EQ(Add(history, RectF(-10, -20, 300, 400)), Edges(-10, -20, 300, 400));
}
