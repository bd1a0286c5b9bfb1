#include <nib/base.h>

#include <gtest/gtest.h>

#include <limits>
#include <ostream>

using namespace Nib;

namespace Nib
{

static std::ostream& operator<<(std::ostream& out, const RectF& r)
{
    return out << "(" << r.left << ", " << r.top << ", " << r.right << ", " << r.bottom << ")";
}

static std::ostream& operator<<(std::ostream& out, const Rect& r)
{
    return out << "(" << r.left << ", " << r.top << ", " << r.right << ", " << r.bottom << ")";
}

} // namespace Nib

TEST(RectF, HoldsItsSidesInOrder)
{
    const RectF rect(1, 2, 5, 10);
    EXPECT_EQ(rect.left, 1);
    EXPECT_EQ(rect.top, 2);
    EXPECT_EQ(rect.right, 5);
    EXPECT_EQ(rect.bottom, 10);
    EXPECT_EQ(rect.Width(), 4);
    EXPECT_EQ(rect.Height(), 8);
    EXPECT_EQ(RectF(), RectF(0, 0, 0, 0));
    EXPECT_EQ(sizeof(RectF), 16u);
}

TEST(RectF, IsEmptyWithoutWidthOrHeight)
{
    EXPECT_FALSE(RectF(0, 0, 1, 1).IsEmpty());
    EXPECT_TRUE(RectF(0, 0, 0, 1).IsEmpty());
    EXPECT_TRUE(RectF(0, 0, 1, 0).IsEmpty());
    EXPECT_TRUE(RectF(2, 0, 1, 1).IsEmpty());
    EXPECT_TRUE(RectF(0, 2, 1, 1).IsEmpty());
    EXPECT_TRUE(RectF().IsEmpty());
}

TEST(RectF, SetTakesFourSides)
{
    RectF rect;
    rect.Set(1, 2, 3, 4);
    EXPECT_EQ(rect, RectF(1, 2, 3, 4));
}

TEST(RectF, IntersectClips)
{
    RectF rect(0, 0, 10, 10);
    EXPECT_TRUE(rect.Intersect(RectF(5, -3, 20, 4)));
    EXPECT_EQ(rect, RectF(5, 0, 10, 4));
}

TEST(RectF, IntersectLeavesItUnchangedWithoutACommonArea)
{
    for (const RectF& other : {RectF(10, 0, 20, 10), RectF(0, 10, 10, 20), RectF(-5, 0, 0, 10),
                               RectF(30, 30, 40, 40), RectF(2, 2, 2, 5), RectF()})
    {
        RectF rect(0, 0, 10, 10);
        EXPECT_FALSE(rect.Intersect(other)) << other;
        EXPECT_EQ(rect, RectF(0, 0, 10, 10)) << other;
    }
    RectF inverted(10, 0, 0, 10);
    EXPECT_FALSE(inverted.Intersect(RectF(0, 0, 20, 20)));
    EXPECT_EQ(inverted, RectF(10, 0, 0, 10));
}

TEST(RectF, UnionIsTheBoundingBox)
{
    RectF rect(0, 0, 2, 2);
    rect.Union(RectF(5, -1, 6, 1));
    EXPECT_EQ(rect, RectF(0, -1, 6, 2));
}

TEST(RectF, UnionIgnoresAnEmptyArgument)
{
    RectF rect(0, 0, 2, 2);
    rect.Union(RectF(50, 50, 50, 60));
    EXPECT_EQ(rect, RectF(0, 0, 2, 2));
    RectF empty(7, 7, 7, 7);
    empty.Union(RectF(1, 1, 1, 1));
    EXPECT_EQ(empty, RectF(7, 7, 7, 7));
}

TEST(RectF, UnionOfAnEmptyReceiverIsTheArgument)
{
    RectF rect(100, 100, 100, 100);
    rect.Union(RectF(1, 2, 3, 4));
    EXPECT_EQ(rect, RectF(1, 2, 3, 4));
}

TEST(RectF, MakeRectIncludesAPoint)
{
    RectF rect(5, 5, 5, 5); // a rectangle without area is a point like any other
    rect.MakeRect(7, 3);
    EXPECT_EQ(rect, RectF(5, 3, 7, 5));
    rect.MakeRect(6, 4);
    EXPECT_EQ(rect, RectF(5, 3, 7, 5));
    rect.MakeRect(-1, 9);
    EXPECT_EQ(rect, RectF(-1, 3, 7, 9));
}

TEST(RectF, ExtendRectRoundsOutward)
{
    RectF rect(1.9f, -0.1f, 2.1f, 3.0f);
    rect.ExtendRect();
    EXPECT_EQ(rect, RectF(1, -1, 3, 3));
    RectF negative(-2.5f, -2.5f, -1.5f, -1.5f);
    negative.ExtendRect();
    EXPECT_EQ(negative, RectF(-3, -3, -1, -1));
}

TEST(Rect, HoldsItsSidesInOrder)
{
    Rect rect(1, 2, 5, 10);
    EXPECT_EQ(rect.Width(), 4);
    EXPECT_EQ(rect.Height(), 8);
    EXPECT_FALSE(rect.IsEmpty());
    EXPECT_TRUE(Rect().IsEmpty());
    EXPECT_TRUE(Rect(3, 0, 3, 1).IsEmpty());
    EXPECT_TRUE(Rect(0, 3, 1, 3).IsEmpty());
    rect.Set(4, 3, 2, 1);
    EXPECT_EQ(rect.left, 4);
    EXPECT_EQ(rect.top, 3);
    EXPECT_EQ(rect.right, 2);
    EXPECT_EQ(rect.bottom, 1);
}

TEST(Rect, AssignmentTruncatesTowardsZero)
{
    Rect rect;
    Rect& result = rect = RectF(1.9f, -1.9f, 2.0f, -0.5f);
    EXPECT_EQ(rect, Rect(1, -1, 2, 0));
    EXPECT_EQ(&result, &rect);
}

TEST(Rect, AssignmentKeepsWhatNoIntCanHoldAtTheEnds)
{
    constexpr float kInfinity = std::numeric_limits<float>::infinity();
    Rect rect;
    rect = RectF(-kInfinity, std::numeric_limits<float>::quiet_NaN(), 3e9f, 2147483648.0f);
    EXPECT_EQ(rect, Rect(-2147483647 - 1, 0, 2147483647, 2147483647));
    rect = RectF(-2147483648.0f, 2147483520.0f, kInfinity, -3e9f);
    EXPECT_EQ(rect, Rect(-2147483647 - 1, 2147483520, 2147483647, -2147483647 - 1));
}
