#include "PenInput.h"

#include <gtest/gtest.h>

namespace
{

constexpr int kMouse = 4;
constexpr int kPen = 9;
constexpr int kPointer = 2;

using Kind = PenReport::Kind;

/// A pen as common drivers describe it, with its axes in an order of their own.
std::vector<PenAxis> PenWithTilt()
{
    return {{0, "Abs X", 0.0, 21600.0, 0.0},       {1, "Abs Y", 0.0, 13500.0, 0.0},
            {2, "Abs Pressure", 0.0, 2048.0, 0.0}, {3, "Abs Tilt X", -64.0, 63.0, 0.0},
            {4, "Abs Tilt Y", -64.0, 63.0, 0.0},   {5, "Abs Wheel", -900.0, 899.0, 0.0}};
}

PenReport Report(Kind kind, float x, float y, std::uint32_t milliseconds = 0)
{
    PenReport report;
    report.kind = kind;
    report.pointer = kPointer;
    report.device = kPen;
    report.x = x;
    report.y = y;
    report.milliseconds = milliseconds;
    return report;
}

/// A report with the valuators that the bits of @p mask name.
struct WithValues
{
    unsigned char mask;
    std::vector<double> values;

    PenReport Make(Kind kind) const
    {
        PenReport report = Report(kind, 1.0f, 2.0f);
        report.mask = &mask;
        report.maskBytes = 1;
        report.values = values.data();
        return report;
    }
};

TEST(PenInput, AMouseWritesUprightWithMediumPressure)
{
    PenInput input(0.0);
    PenReport report = Report(Kind::Down, 30.5f, 40.25f);
    report.device = kMouse;
    const std::optional<Ink::Sample> sample = input.Accept(report);
    ASSERT_TRUE(sample);
    EXPECT_EQ(sample->x, 30.5f);
    EXPECT_EQ(sample->y, 40.25f);
    EXPECT_EQ(sample->pressure, 0.5f);
    EXPECT_EQ(sample->altitude, 90.0f);
    EXPECT_EQ(sample->azimuth, 0.0f);
}

TEST(PenInput, PressureIsItsShareOfTheRange)
{
    PenInput input(0.0);
    input.Describe(kPen, PenWithTilt());
    const WithValues half{0b00000111, {100.0, 200.0, 1024.0}};
    EXPECT_EQ(input.Accept(half.Make(Kind::Down))->pressure, 0.5f);
    const WithValues full{0b00000100, {2048.0}};
    EXPECT_EQ(input.Accept(full.Make(Kind::Move))->pressure, 1.0f);
    const WithValues beyond{0b00000100, {9999.0}};
    EXPECT_EQ(input.Accept(beyond.Make(Kind::Move))->pressure, 1.0f);
    const WithValues below{0b00000100, {-5.0}};
    EXPECT_EQ(input.Accept(below.Make(Kind::Move))->pressure, 0.0f);
}

TEST(PenInput, PressureCountsFromTheLowestValue)
{
    PenInput input(0.0);
    input.Describe(kPen, {{2, "Abs Pressure", -100.0, 300.0, 0.0}});
    const WithValues lowest{0b00000100, {0.0}};
    EXPECT_EQ(input.Accept(lowest.Make(Kind::Down))->pressure, 0.25f);
}

TEST(PenInput, AxesThatDoNotChangeKeepTheirValue)
{
    PenInput input(0.0);
    input.Describe(kPen, PenWithTilt());
    const WithValues pressed{0b00011100, {512.0, 0.0, 30.0}};
    input.Accept(pressed.Make(Kind::Down));
    const WithValues moved{0b00000011, {300.0, 400.0}};
    const std::optional<Ink::Sample> sample = input.Accept(moved.Make(Kind::Move));
    EXPECT_EQ(sample->pressure, 0.25f);
    EXPECT_FLOAT_EQ(sample->azimuth, 90.0f);
    EXPECT_FLOAT_EQ(sample->altitude, 60.0f);
}

TEST(PenInput, WhatADeviceHoldsAtItsDescriptionCounts)
{
    PenInput input(0.0);
    input.Describe(kPen, {{2, "Abs Pressure", 0.0, 1000.0, 750.0}});
    EXPECT_EQ(input.Accept(Report(Kind::Down, 1, 2))->pressure, 0.75f);
}

TEST(PenInput, TiltIsInDegrees)
{
    struct Row
    {
        double tiltX, tiltY;
        float azimuth, altitude;
    };
    const Row rows[] = {
        {0.0, 0.0, 0.0f, 90.0f},     {30.0, 0.0, 0.0f, 60.0f},    {-30.0, 0.0, 180.0f, 60.0f},
        {0.0, 45.0, 90.0f, 45.0f},   {0.0, -45.0, 270.0f, 45.0f}, {45.0, 45.0, 45.0f, 35.26439f},
        {-60.0, 0.0, 180.0f, 30.0f},
    };
    for (const Row& row : rows)
    {
        PenInput input(0.0);
        input.Describe(kPen, PenWithTilt());
        const WithValues leaning{0b00011000, {row.tiltX, row.tiltY}};
        const std::optional<Ink::Sample> sample = input.Accept(leaning.Make(Kind::Down));
        EXPECT_NEAR(sample->azimuth, row.azimuth, 1.0e-4) << row.tiltX << ", " << row.tiltY;
        EXPECT_NEAR(sample->altitude, row.altitude, 1.0e-4) << row.tiltX << ", " << row.tiltY;
    }
}

TEST(PenInput, AFinerTiltSpansTheHalfCircle)
{
    PenInput input(0.0);
    input.Describe(kPen, {{3, "Abs Tilt X", -9000.0, 9000.0, 4500.0},
                          {4, "Abs Tilt Y", -9000.0, 9000.0, 0.0}});
    EXPECT_FLOAT_EQ(input.Accept(Report(Kind::Down, 1, 2))->altitude, 45.0f);
}

TEST(PenInput, AnAxisWithoutARangeIsNone)
{
    PenInput input(0.0);
    input.Describe(kPen, {{2, "Abs Pressure", 0.0, 0.0, 0.0}});
    EXPECT_EQ(input.Accept(Report(Kind::Down, 1, 2))->pressure, 0.5f);
}

TEST(PenInput, HoversAreNoSamplesButTheirAxesCount)
{
    PenInput input(0.0);
    input.Describe(kPen, PenWithTilt());
    const WithValues hover{0b00011000, {30.0, 0.0}};
    EXPECT_FALSE(input.Accept(hover.Make(Kind::Move)));
    EXPECT_FLOAT_EQ(input.Accept(Report(Kind::Down, 1, 2))->altitude, 60.0f);
}

TEST(PenInput, DownMoveAndUpAreSamplesOfTheStroke)
{
    PenInput input(0.0);
    EXPECT_TRUE(input.Accept(Report(Kind::Down, 1, 1)));
    EXPECT_TRUE(input.Accept(Report(Kind::Move, 2, 2)));
    EXPECT_TRUE(input.Accept(Report(Kind::Up, 3, 3)));
    EXPECT_FALSE(input.Accept(Report(Kind::Move, 4, 4)));
    EXPECT_FALSE(input.Accept(Report(Kind::Up, 4, 4)));
}

TEST(PenInput, AnotherPointerDoesNotMixIn)
{
    PenInput input(0.0);
    PenReport other = Report(Kind::Down, 7, 7);
    other.pointer = 5;
    input.Accept(Report(Kind::Down, 1, 1));
    EXPECT_FALSE(input.Accept(other));
    other.kind = Kind::Move;
    EXPECT_FALSE(input.Accept(other));
    other.kind = Kind::Up;
    EXPECT_FALSE(input.Accept(other));
    EXPECT_TRUE(input.Accept(Report(Kind::Move, 2, 2)));
}

TEST(PenInput, TimesCountFromTheStart)
{
    PenInput input(12.5);
    EXPECT_EQ(input.Accept(Report(Kind::Down, 1, 1, 5000))->time, 12.5);
    EXPECT_EQ(input.Accept(Report(Kind::Move, 2, 2, 5008))->time, 12.508);
    EXPECT_EQ(input.Accept(Report(Kind::Up, 3, 3, 6500))->time, 14.0);
}

TEST(PenInput, TimesGoOnWhereTheServersClockStartsAgain)
{
    PenInput input(0.0);
    EXPECT_EQ(input.Accept(Report(Kind::Down, 1, 1, 0xFFFFFF00u))->time, 0.0);
    EXPECT_EQ(input.Accept(Report(Kind::Move, 2, 2, 0x00000100u))->time, 0.512);
}

TEST(PenInput, TimesNeverStepBack)
{
    PenInput input(0.0);
    input.Accept(Report(Kind::Down, 1, 1, 1000));
    EXPECT_EQ(input.Accept(Report(Kind::Move, 2, 2, 1100))->time, 0.1);
    EXPECT_EQ(input.Accept(Report(Kind::Move, 3, 3, 1050))->time, 0.1);
    EXPECT_EQ(input.Accept(Report(Kind::Move, 4, 4, 1200))->time, 0.2);
}

TEST(PenInput, ADeviceThatChangedIsDescribedAgain)
{
    PenInput input(0.0);
    EXPECT_FALSE(input.Knows(kPen));
    input.Describe(kPen, PenWithTilt());
    EXPECT_TRUE(input.Knows(kPen));
    input.Forget(kPen);
    EXPECT_FALSE(input.Knows(kPen));
}

} // namespace
