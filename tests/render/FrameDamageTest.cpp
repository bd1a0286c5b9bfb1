#include "render/FrameDamage.h"

#include <gtest/gtest.h>

using namespace Nib;
using Nib::GLES::FrameDamage;

namespace
{

void ExpectDamage(const UpdateRectangle::DamageRect& damage, int x, int y, int width, int height)
{
    EXPECT_EQ(damage.x, x);
    EXPECT_EQ(damage.y, y);
    EXPECT_EQ(damage.width, width);
    EXPECT_EQ(damage.height, height);
}

TEST(FrameDamage, IsCountedFromTheBottomLeft)
{
    FrameDamage frame;

    frame.Add(RectF(10, 20, 110, 70));

    ExpectDamage(frame.Take({1920, 1080}), 10, 1010, 100, 50);
}

TEST(FrameDamage, IsTheBoundingBoxOfAllRectangles)
{
    FrameDamage frame;

    frame.Add(RectF(10, 20, 30, 40));
    frame.Add(RectF(100, 200, 120, 210));

    ExpectDamage(frame.Take({1000, 500}), 10, 290, 110, 190);
}

TEST(FrameDamage, IsRoundedOutward)
{
    FrameDamage frame;

    frame.Add(RectF(10.9f, 20.1f, 30.1f, 39.9f));

    ExpectDamage(frame.Take({100, 100}), 10, 60, 21, 20);
}

TEST(FrameDamage, IsClippedToTheScreen)
{
    FrameDamage frame;

    frame.Add(RectF(-50, -50, 20, 2000));

    ExpectDamage(frame.Take({100, 200}), 0, 0, 20, 200);
}

TEST(FrameDamage, WithoutARectangleIsTheScreen)
{
    FrameDamage frame;

    ExpectDamage(frame.Take({640, 480}), 0, 0, 640, 480);
}

TEST(FrameDamage, OutsideTheScreenIsTheScreen)
{
    FrameDamage frame;

    frame.Add(RectF(700, 10, 800, 20));

    ExpectDamage(frame.Take({640, 480}), 0, 0, 640, 480);
}

TEST(FrameDamage, OfEmptyRectanglesIsTheScreen)
{
    FrameDamage frame;

    frame.Add(RectF(5, 5, 5, 9));
    frame.Add(RectF(9, 9, 5, 5));

    ExpectDamage(frame.Take({640, 480}), 0, 0, 640, 480);
}

TEST(FrameDamage, AnEmptyRectangleAddsNothing)
{
    FrameDamage frame;

    frame.Add(RectF(10, 10, 20, 20));
    frame.Add(RectF(300, 300, 300, 400));

    ExpectDamage(frame.Take({640, 480}), 10, 460, 10, 10);
}

TEST(FrameDamage, BelongsToOneFrame)
{
    FrameDamage frame;
    frame.Add(RectF(10, 10, 20, 20));
    frame.Take({640, 480});

    ExpectDamage(frame.Take({640, 480}), 0, 0, 640, 480);

    frame.Add(RectF(30, 30, 40, 40));
    ExpectDamage(frame.Take({640, 480}), 30, 440, 10, 10);
}

} // namespace
