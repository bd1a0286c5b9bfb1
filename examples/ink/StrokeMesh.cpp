#include "StrokeMesh.h"

#include <algorithm>
#include <cmath>

namespace Ink
{
namespace
{

constexpr float kFade = 1.0f;       // pixels that the triangles reach beyond the outline
constexpr float kStep = 2.0f;       // pixels along the curve between two sections
constexpr int kMostSteps = 48;      // between two points, however far apart
constexpr float kFarthest = 1.0e6f; // beyond any page; keeps the arithmetic finite
constexpr float kSharpTurn = 0.94f; // cosine of the angle from which a join is round
constexpr float kFlatness = 0.1f;   // pixels between a disc and the polygon that stands for it
constexpr float kPi = 3.14159265f;

float Distance(const PenPoint& a, const PenPoint& b)
{
    return std::hypot(b.x - a.x, b.y - a.y);
}

void AddTriangle(std::vector<Vertex>& triangles, const Vertex& a, const Vertex& b, const Vertex& c)
{
    triangles.push_back(a);
    triangles.push_back(b);
    triangles.push_back(c);
}

void AddDisc(const PenPoint& centre, std::vector<Vertex>& triangles)
{
    const float rim = centre.radius + kFade;
    const float halfAngle = std::acos(std::max(0.0f, 1.0f - kFlatness / rim));
    const int corners = std::clamp(static_cast<int>(std::ceil(kPi / halfAngle)), 8, 96);
    const Vertex middle{centre.x, centre.y, centre.radius};
    Vertex last{centre.x + rim, centre.y, -kFade};
    for (int i = 1; i <= corners; ++i)
    {
        const float angle = 2.0f * kPi * static_cast<float>(i) / static_cast<float>(corners);
        const Vertex next{centre.x + rim * std::cos(angle), centre.y + rim * std::sin(angle),
                          -kFade};
        AddTriangle(triangles, middle, last, next);
        last = next;
    }
}

/// A point of the page that lies within reach of the arithmetic; a pen may report anything.
PenPoint Bounded(const PenPoint& point)
{
    return {std::clamp(point.x, -kFarthest, kFarthest), std::clamp(point.y, -kFarthest, kFarthest),
            point.radius};
}

/// The point that continues the line from @p b through @p a, for the two ends of a stroke.
PenPoint Beyond(const PenPoint& a, const PenPoint& b)
{
    return {2.0f * a.x - b.x, 2.0f * a.y - b.y, a.radius};
}

struct Tangents
{
    float fromX, fromY, toX, toY;
};

/// The derivatives of the centripetal Catmull-Rom curve at both ends of its middle piece, scaled to
/// that piece (Barry and Goldman's form, knots at the square root of the distance). Centripetal,
/// because unevenly spaced points give the uniform curve loops.
Tangents CentripetalTangents(const PenPoint& p0, const PenPoint& p1, const PenPoint& p2,
                             const PenPoint& p3)
{
    const float t01 = std::max(std::sqrt(Distance(p0, p1)), 1.0e-3f);
    const float t12 = std::max(std::sqrt(Distance(p1, p2)), 1.0e-3f);
    const float t23 = std::max(std::sqrt(Distance(p2, p3)), 1.0e-3f);
    const auto tangent = [t12](float a, float b, float c, float ab, float bc)
    { return t12 * ((b - a) / ab - (c - a) / (ab + bc) + (c - b) / bc); };
    return {tangent(p0.x, p1.x, p2.x, t01, t12), tangent(p0.y, p1.y, p2.y, t01, t12),
            tangent(p1.x, p2.x, p3.x, t12, t23), tangent(p1.y, p2.y, p3.y, t12, t23)};
}

} // namespace

void StrokeMesh::Begin()
{
    m_recent.clear();
    m_hasSection = false;
}

void StrokeMesh::Add(const PenPoint& point, std::vector<Vertex>& triangles)
{
    const PenPoint bounded = Bounded(point);
    if (!m_recent.empty() && Distance(m_recent.back(), bounded) == 0.0f)
        return;
    m_recent.push_back(bounded);
    if (m_recent.size() == 1)
        AddDisc(bounded, triangles); // the round cap, and the whole of a stroke of one point
    else if (m_recent.size() == 3)
        AddCurve(Beyond(m_recent[0], m_recent[1]), m_recent[0], m_recent[1], m_recent[2],
                 triangles);
    else if (m_recent.size() == 4)
    {
        AddCurve(m_recent[0], m_recent[1], m_recent[2], m_recent[3], triangles);
        m_recent.erase(m_recent.begin());
    }
}

void StrokeMesh::End(std::vector<Vertex>& triangles)
{
    const std::size_t count = m_recent.size();
    if (count >= 2)
    {
        const PenPoint& from = m_recent[count - 2];
        const PenPoint& to = m_recent[count - 1];
        const PenPoint before = count > 2 ? m_recent[count - 3] : Beyond(from, to);
        AddCurve(before, from, to, Beyond(to, from), triangles);
        AddDisc(to, triangles);
    }
    Begin();
}

void StrokeMesh::AddCurve(const PenPoint& before, const PenPoint& from, const PenPoint& to,
                          const PenPoint& after, std::vector<Vertex>& triangles)
{
    const Tangents tangents = CentripetalTangents(before, from, to, after);
    const float length = Distance(from, to);
    const int steps = std::clamp(static_cast<int>(std::ceil(length / kStep)), 1, kMostSteps);
    if (!m_hasSection)
        AddSection(from, tangents.fromX, tangents.fromY, triangles);
    for (int i = 1; i <= steps; ++i)
    {
        const float t = static_cast<float>(i) / static_cast<float>(steps);
        const float t2 = t * t;
        const float t3 = t2 * t;
        // Cubic Hermite basis and its derivative.
        const float h00 = 2 * t3 - 3 * t2 + 1, h10 = t3 - 2 * t2 + t;
        const float h01 = -2 * t3 + 3 * t2, h11 = t3 - t2;
        const float d00 = 6 * t2 - 6 * t, d10 = 3 * t2 - 4 * t + 1;
        const float d01 = -6 * t2 + 6 * t, d11 = 3 * t2 - 2 * t;
        const PenPoint centre{h00 * from.x + h10 * tangents.fromX + h01 * to.x + h11 * tangents.toX,
                              h00 * from.y + h10 * tangents.fromY + h01 * to.y + h11 * tangents.toY,
                              from.radius + t * (to.radius - from.radius)};
        AddSection(centre, d00 * from.x + d10 * tangents.fromX + d01 * to.x + d11 * tangents.toX,
                   d00 * from.y + d10 * tangents.fromY + d01 * to.y + d11 * tangents.toY,
                   triangles);
    }
}

void StrokeMesh::AddSection(const PenPoint& centre, float directionX, float directionY,
                            std::vector<Vertex>& triangles)
{
    Section section{centre, m_last.normalX, m_last.normalY};
    const float length = std::hypot(directionX, directionY);
    if (length > 0.0f)
    {
        section.normalX = -directionY / length;
        section.normalY = directionX / length;
    }
    const auto corner = [](const Section& at, float side)
    {
        const float reach = side * (at.centre.radius + kFade);
        return Vertex{at.centre.x + at.normalX * reach, at.centre.y + at.normalY * reach, -kFade};
    };
    if (m_hasSection)
    {
        const Vertex lastMiddle{m_last.centre.x, m_last.centre.y, m_last.centre.radius};
        const Vertex middle{centre.x, centre.y, centre.radius};
        for (const float side : {1.0f, -1.0f})
        {
            AddTriangle(triangles, corner(m_last, side), lastMiddle, middle);
            AddTriangle(triangles, corner(m_last, side), middle, corner(section, side));
        }
        const float turn = m_last.normalX * section.normalX + m_last.normalY * section.normalY;
        if (turn < kSharpTurn)
            AddDisc(m_last.centre, triangles);
    }
    m_last = section;
    m_hasSection = true;
}

} // namespace Ink
