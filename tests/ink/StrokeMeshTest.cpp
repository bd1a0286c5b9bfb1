#include "StrokeMesh.h"
#include "BrushStyle.h"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <random>
#include <vector>

namespace
{

using Ink::PenPoint;
using Ink::StrokeMesh;
using Ink::Vertex;

std::vector<Vertex> MeshOf(const std::vector<PenPoint>& points)
{
    std::vector<Vertex> triangles;
    StrokeMesh mesh;
    mesh.Begin();
    for (const PenPoint& point : points)
        mesh.Add(point, triangles);
    mesh.End(triangles);
    return triangles;
}

/// The greatest `inside` of the triangles over (x, y); far outside when there is none.
float InsideAt(const std::vector<Vertex>& triangles, float x, float y)
{
    float greatest = -1000.0f;
    for (std::size_t i = 0; i + 2 < triangles.size(); i += 3)
    {
        const Vertex &a = triangles[i], &b = triangles[i + 1], &c = triangles[i + 2];
        const float area = (b.x - a.x) * (c.y - a.y) - (c.x - a.x) * (b.y - a.y);
        if (std::abs(area) < 1e-9f)
            continue;
        const float u = ((b.x - x) * (c.y - y) - (c.x - x) * (b.y - y)) / area;
        const float v = ((c.x - x) * (a.y - y) - (a.x - x) * (c.y - y)) / area;
        const float w = 1.0f - u - v;
        if (u >= -1e-4f && v >= -1e-4f && w >= -1e-4f)
            greatest = std::max(greatest, u * a.inside + v * b.inside + w * c.inside);
    }
    return greatest;
}

TEST(StrokeMesh, NoPointIsNoInk)
{
    EXPECT_TRUE(MeshOf({}).empty());
}

TEST(StrokeMesh, OnePointIsADisc)
{
    const std::vector<Vertex> triangles = MeshOf({{50, 60, 5}});
    EXPECT_NEAR(InsideAt(triangles, 50, 60), 5.0f, 0.01f);
    EXPECT_NEAR(InsideAt(triangles, 53, 60), 2.0f, 0.15f);
    EXPECT_NEAR(InsideAt(triangles, 50, 64), 1.0f, 0.15f);
    EXPECT_NEAR(InsideAt(triangles, 50, 65), 0.0f, 0.15f);
    EXPECT_LT(InsideAt(triangles, 57, 60), -1.0f);
}

TEST(StrokeMesh, EqualPointsAddNothing)
{
    EXPECT_EQ(MeshOf({{50, 60, 5}, {50, 60, 5}, {50, 60, 5}}).size(), MeshOf({{50, 60, 5}}).size());
}

TEST(StrokeMesh, StraightStrokeHasItsWidthAndRoundEnds)
{
    const std::vector<Vertex> triangles = MeshOf({{20, 50, 4}, {60, 50, 4}, {100, 50, 4}});
    for (const float x : {25.0f, 60.0f, 95.0f})
    {
        EXPECT_NEAR(InsideAt(triangles, x, 50), 4.0f, 0.01f);
        EXPECT_NEAR(InsideAt(triangles, x, 53), 1.0f, 0.01f);
        EXPECT_NEAR(InsideAt(triangles, x, 47), 1.0f, 0.01f);
        EXPECT_NEAR(InsideAt(triangles, x, 54.5f), -0.5f, 0.01f);
        EXPECT_LT(InsideAt(triangles, x, 56), -1.0f);
    }
    EXPECT_NEAR(InsideAt(triangles, 17, 50), 1.0f, 0.15f);
    EXPECT_NEAR(InsideAt(triangles, 103, 50), 1.0f, 0.15f);
    EXPECT_LT(InsideAt(triangles, 14, 50), -1.0f);
}

TEST(StrokeMesh, WidthFollowsTheRadius)
{
    const std::vector<Vertex> triangles = MeshOf({{0, 50, 2}, {50, 50, 6}, {100, 50, 10}});
    EXPECT_NEAR(InsideAt(triangles, 25, 50), 4.0f, 0.05f);
    EXPECT_NEAR(InsideAt(triangles, 75, 50), 8.0f, 0.05f);
}

TEST(StrokeMesh, CurvePassesThroughEveryPoint)
{
    std::mt19937 random(7);
    std::uniform_real_distribution<float> place(0.0f, 500.0f);
    std::vector<PenPoint> points;
    for (int i = 0; i < 40; ++i)
        points.push_back({place(random), place(random), 3.0f});
    const std::vector<Vertex> triangles = MeshOf(points);
    for (const PenPoint& point : points)
        EXPECT_GT(InsideAt(triangles, point.x, point.y), 2.5f);
}

TEST(StrokeMesh, SharpTurnsAreRound)
{
    const std::vector<Vertex> triangles = MeshOf({{0, 0, 5}, {50, 0, 5}, {0, 0.5f, 5}});
    EXPECT_NEAR(InsideAt(triangles, 53, 0), 2.0f, 0.6f);
}

TEST(StrokeMesh, PiecesMakeTheSameStrokeAsTheWhole)
{
    const std::vector<PenPoint> points = {
        {0, 0, 2}, {10, 5, 3}, {20, 0, 4}, {30, 9, 3}, {31, 40, 2}};
    const std::vector<Vertex> whole = MeshOf(points);
    std::vector<Vertex> pieces;
    StrokeMesh mesh;
    mesh.Begin();
    for (const PenPoint& point : points)
    {
        std::vector<Vertex> piece;
        mesh.Add(point, piece);
        pieces.insert(pieces.end(), piece.begin(), piece.end());
    }
    mesh.End(pieces);
    ASSERT_EQ(pieces.size(), whole.size());
    for (std::size_t i = 0; i < whole.size(); ++i)
        EXPECT_TRUE(whole[i].x == pieces[i].x && whole[i].y == pieces[i].y);
}

TEST(StrokeMesh, AnyPositionGivesFiniteTriangles)
{
    const std::vector<Vertex> triangles =
        MeshOf({{-1e30f, 5, 3}, {1e30f, 1e30f, 3}, {7, -1e30f, 3}, {7, 7, 3}});
    EXPECT_LT(triangles.size(), 4000u);
    for (const Vertex& vertex : triangles)
        EXPECT_TRUE(std::isfinite(vertex.x) && std::isfinite(vertex.y));
}

TEST(Placement, FitLeavesAMarginOnTheTighterSide)
{
    Ink::Recording recording;
    recording.strokes = {{{0, 100, 200, 0.5f}, {1, 300, 250, 0.5f}}};
    const Ink::Placement placement = Ink::FitToPage(recording, 1000, 1000);
    EXPECT_FLOAT_EQ(placement.scale, 4.5f);
    EXPECT_FLOAT_EQ(100 * placement.scale + placement.offsetX, 50.0f);
    EXPECT_FLOAT_EQ(300 * placement.scale + placement.offsetX, 950.0f);
    EXPECT_FLOAT_EQ(225 * placement.scale + placement.offsetY, 500.0f);
}

} // namespace
