#include "DabTrail.h"

#include <cmath>
#include <gtest/gtest.h>
#include <vector>

namespace
{

using Ink::Dab;
using Ink::DabTrail;
using Ink::PenPoint;

std::vector<Dab> TrailOf(const std::vector<PenPoint>& points)
{
    std::vector<Dab> dabs;
    DabTrail trail;
    trail.Begin();
    for (const PenPoint& point : points)
        trail.Add(point, dabs);
    trail.End(dabs);
    return dabs;
}

TEST(DabTrail, NoPointIsNoDab)
{
    EXPECT_TRUE(TrailOf({}).empty());
}

TEST(DabTrail, OnePointIsOneDabAtOnce)
{
    std::vector<Dab> dabs;
    DabTrail trail;
    trail.Begin();
    trail.Add({30, 20, 8, 0.25f, 0, 1}, dabs);
    ASSERT_EQ(dabs.size(), 1u);
    EXPECT_EQ(dabs[0].x, 30.0f);
    EXPECT_EQ(dabs[0].y, 20.0f);
    EXPECT_EQ(dabs[0].alongX, 8.0f);
    EXPECT_EQ(dabs[0].alongY, 0.0f);
    EXPECT_EQ(dabs[0].breadth, 8.0f);
    EXPECT_EQ(dabs[0].opacity, 0.25f);
    trail.End(dabs);
    EXPECT_EQ(dabs.size(), 1u);
}

TEST(DabTrail, EqualPointsAreOneDab)
{
    EXPECT_EQ(TrailOf({{30, 20, 8}, {30, 20, 8}, {30, 20, 8}}).size(), 1u);
}

TEST(DabTrail, DabsAreAQuarterOfTheWidthApart)
{
    const std::vector<Dab> dabs = TrailOf({{10, 50, 8}, {50, 50, 8}, {90, 50, 8}});
    ASSERT_EQ(dabs.size(), 21u); // one each 4 pixels on 80
    for (std::size_t i = 0; i < dabs.size(); ++i)
    {
        EXPECT_NEAR(dabs[i].x, 10.0f + 4.0f * static_cast<float>(i), 0.01f);
        EXPECT_NEAR(dabs[i].y, 50.0f, 0.01f);
    }
}

TEST(DabTrail, SpacingFollowsTheCurveAndNotTheSamples)
{
    // A circle of 100 pixels around, sampled at uneven angles: 628 pixels, a dab each 5.
    std::vector<PenPoint> circle;
    for (float angle = 0.0f; angle < 6.2831853f; angle += circle.size() % 3 == 0 ? 0.21f : 0.05f)
        circle.push_back({200 + 100 * std::cos(angle), 200 + 100 * std::sin(angle), 10});
    circle.push_back({300, 200, 10});
    const std::vector<Dab> dabs = TrailOf(circle);
    EXPECT_NEAR(static_cast<double>(dabs.size()), 126.0, 2.0);
    for (std::size_t i = 1; i < dabs.size(); ++i)
        EXPECT_NEAR(std::hypot(dabs[i].x - dabs[i - 1].x, dabs[i].y - dabs[i - 1].y), 5.0f, 0.2f);
}

TEST(DabTrail, SizeFlowAndLeanGrowAlongTheWay)
{
    const float quarter = 1.5707964f;
    const std::vector<Dab> dabs = TrailOf({{0, 0, 4, 0.2f, 0, 1}, {100, 0, 8, 0.8f, quarter, 2}});
    for (const Dab& dab : dabs)
    {
        const float share = dab.x / 100.0f;
        EXPECT_NEAR(dab.breadth, 4.0f + 4.0f * share, 0.01f);
        EXPECT_NEAR(dab.opacity, 0.2f + 0.6f * share, 0.001f);
        EXPECT_NEAR(std::hypot(dab.alongX, dab.alongY), dab.breadth * (1.0f + share), 0.02f);
        EXPECT_NEAR(std::atan2(dab.alongY, dab.alongX), quarter * share, 0.01f);
    }
    EXPECT_GT(dabs.back().x, 90.0f);
}

TEST(DabTrail, LeanTurnsTheShortWayRound)
{
    const float nearlyRound = 6.1f; // 0.18 short of a full turn
    const std::vector<Dab> dabs = TrailOf({{0, 0, 4, 1, nearlyRound, 1}, {60, 0, 4, 1, 0.1f, 1}});
    for (const Dab& dab : dabs)
        EXPECT_GT(dab.alongX, 3.9f); // never turned to the other side
}

TEST(DabTrail, PrintsAreTurnedAgainstTheirNeighbours)
{
    const std::vector<Dab> dabs = TrailOf({{0, 0, 8}, {200, 0, 8}});
    for (std::size_t i = 1; i < dabs.size(); ++i)
        EXPECT_GT(std::abs(std::remainder(dabs[i].roll - dabs[i - 1].roll, 6.2831853f)), 2.0f);
}

TEST(DabTrail, SecondStrokeStartsAnew)
{
    std::vector<Dab> first, second;
    DabTrail trail;
    for (std::vector<Dab>* dabs : {&first, &second})
    {
        trail.Begin();
        trail.Add({0, 0, 8}, *dabs);
        trail.Add({43, 0, 8}, *dabs);
        trail.End(*dabs);
    }
    ASSERT_EQ(first.size(), second.size());
    for (std::size_t i = 0; i < first.size(); ++i)
    {
        EXPECT_EQ(first[i].x, second[i].x);
        EXPECT_EQ(first[i].roll, second[i].roll);
    }
}

TEST(DabTrail, FarApartPointsGiveAsManyDabsAsAPageCouldShow)
{
    const std::vector<Dab> dabs = TrailOf({{-1e30f, 0, 0.35f}, {1e30f, 0, 0.35f}});
    EXPECT_LE(dabs.size(), 48u * 257u);
    for (const Dab& dab : dabs)
        ASSERT_TRUE(std::isfinite(dab.x) && std::isfinite(dab.y));
}

} // namespace
