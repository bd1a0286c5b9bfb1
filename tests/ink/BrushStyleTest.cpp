#include "BrushStyle.h"

#include <gtest/gtest.h>

namespace
{

using Ink::BrushKind;

Ink::Sample Pressed(float pressure)
{
    Ink::Sample sample;
    sample.pressure = pressure;
    return sample;
}

Ink::Sample Leaning(float altitude, float azimuth)
{
    Ink::Sample sample;
    sample.altitude = altitude;
    sample.azimuth = azimuth;
    return sample;
}

float RadiusOf(BrushKind kind, float pressure)
{
    return Ink::ToPage(Pressed(pressure), {}, {kind, {}, 10.0f}).radius;
}

float FlowOf(BrushKind kind, float pressure)
{
    return Ink::ToPage(Pressed(pressure), {}, {kind, {}, 10.0f}).flow;
}

TEST(BrushStyle, NamesMeanKinds)
{
    EXPECT_EQ(Ink::BrushNamed("pen"), BrushKind::Pen);
    EXPECT_EQ(Ink::BrushNamed("marker"), BrushKind::Marker);
    EXPECT_EQ(Ink::BrushNamed("stamp"), BrushKind::Stamp);
    EXPECT_EQ(Ink::BrushNamed("Pen"), std::nullopt);
    EXPECT_EQ(Ink::BrushNamed(""), std::nullopt);
}

TEST(BrushStyle, EachKindHasItsOwnStyle)
{
    for (const BrushKind kind : {BrushKind::Pen, BrushKind::Marker, BrushKind::Stamp})
        EXPECT_EQ(Ink::DefaultStyle(kind).kind, kind);
    EXPECT_FLOAT_EQ(Ink::DefaultStyle(BrushKind::Pen).width, 6.0f);
    EXPECT_FLOAT_EQ(Ink::DefaultStyle(BrushKind::Marker).width, 22.0f);
    EXPECT_FLOAT_EQ(Ink::DefaultStyle(BrushKind::Stamp).width, 26.0f);
}

TEST(BrushStyle, PressureSetsTheWidthOfAPen)
{
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Pen, 1.0f), 5.0f);
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Pen, 0.5f), 3.0f);
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Pen, 0.0f), 1.0f);
}

TEST(BrushStyle, PressureBeyondItsEndsCountsAsTheEnd)
{
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Pen, 7.0f), 5.0f);
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Pen, -7.0f), 1.0f);
}

TEST(BrushStyle, MarkerIsAsWideHoweverItIsPressed)
{
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Marker, 1.0f), 5.0f);
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Marker, 0.0f), 5.0f);
}

TEST(BrushStyle, PressureSetsSizeAndFlowOfAStamp)
{
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Stamp, 1.0f), 5.0f);
    EXPECT_FLOAT_EQ(RadiusOf(BrushKind::Stamp, 0.0f), 2.0f);
    EXPECT_FLOAT_EQ(FlowOf(BrushKind::Stamp, 1.0f), 1.0f);
    EXPECT_FLOAT_EQ(FlowOf(BrushKind::Stamp, 0.0f), 0.1f);
}

TEST(BrushStyle, StampLeansAsThePenDoes)
{
    const Ink::BrushStyle stamp{BrushKind::Stamp, {}, 10.0f};
    const Ink::PenPoint upright = Ink::ToPage(Leaning(90, 0), {}, stamp);
    EXPECT_FLOAT_EQ(upright.stretch, 1.0f);
    const Ink::PenPoint leaning = Ink::ToPage(Leaning(30, 90), {}, stamp);
    EXPECT_FLOAT_EQ(leaning.stretch, 2.0f); // 1 / sin(30 degrees)
    EXPECT_FLOAT_EQ(leaning.angle, 1.5707964f);
    EXPECT_FLOAT_EQ(Ink::ToPage(Leaning(0, 0), {}, stamp).stretch, 2.5f);
}

TEST(BrushStyle, PenAndMarkerStandUpright)
{
    for (const BrushKind kind : {BrushKind::Pen, BrushKind::Marker})
    {
        const Ink::PenPoint point = Ink::ToPage(Leaning(30, 90), {}, {kind, {}, 10.0f});
        EXPECT_FLOAT_EQ(point.stretch, 1.0f);
        EXPECT_FLOAT_EQ(point.flow, 1.0f);
    }
}

TEST(BrushStyle, CoatOfAMarkerLetsHalfThrough)
{
    const Ink::Colour colour{0.1f, 0.2f, 0.3f, 0.8f};
    EXPECT_FLOAT_EQ(Ink::CoatOf({BrushKind::Pen, colour, 1.0f}).alpha, 0.8f);
    EXPECT_FLOAT_EQ(Ink::CoatOf({BrushKind::Marker, colour, 1.0f}).alpha, 0.4f);
    EXPECT_FLOAT_EQ(Ink::CoatOf({BrushKind::Stamp, colour, 1.0f}).alpha, 0.8f);
    EXPECT_FLOAT_EQ(Ink::CoatOf({BrushKind::Marker, colour, 1.0f}).blue, 0.3f);
}

} // namespace
