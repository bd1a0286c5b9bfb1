#include "StrokeCurve.h"

#include <algorithm>
#include <cmath>

namespace Ink
{
namespace
{

constexpr float kStep = 2.0f;       // pixels along the curve between two places
constexpr int kMostSteps = 48;      // between two points, however far apart
constexpr float kFarthest = 1.0e6f; // beyond any page; keeps the arithmetic finite
constexpr float kTurn = 2.0f * 3.14159265f;

/// A point of the page that lies within reach of the arithmetic; a pen may report anything.
PenPoint Bounded(PenPoint point)
{
    point.x = std::clamp(point.x, -kFarthest, kFarthest);
    point.y = std::clamp(point.y, -kFarthest, kFarthest);
    return point;
}

/// The point that continues the line from @p b through @p a, for the two ends of a stroke.
PenPoint Beyond(const PenPoint& a, const PenPoint& b)
{
    PenPoint point = a;
    point.x = 2.0f * a.x - b.x;
    point.y = 2.0f * a.y - b.y;
    return point;
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

/// The piece of the curve from @p from to @p to, after the share @p t of it (cubic Hermite form).
CurvePlace PlaceOn(const PenPoint& from, const PenPoint& to, const Tangents& tangents, float t)
{
    const float t2 = t * t;
    const float t3 = t2 * t;
    const float h00 = 2 * t3 - 3 * t2 + 1, h10 = t3 - 2 * t2 + t;
    const float h01 = -2 * t3 + 3 * t2, h11 = t3 - t2;
    const float d00 = 6 * t2 - 6 * t, d10 = 3 * t2 - 4 * t + 1;
    const float d01 = -6 * t2 + 6 * t, d11 = 3 * t2 - 2 * t;
    CurvePlace place{Between(from, to, t)};
    place.at.x = h00 * from.x + h10 * tangents.fromX + h01 * to.x + h11 * tangents.toX;
    place.at.y = h00 * from.y + h10 * tangents.fromY + h01 * to.y + h11 * tangents.toY;
    place.directionX = d00 * from.x + d10 * tangents.fromX + d01 * to.x + d11 * tangents.toX;
    place.directionY = d00 * from.y + d10 * tangents.fromY + d01 * to.y + d11 * tangents.toY;
    return place;
}

} // namespace

void StrokeCurve::Begin()
{
    m_recent.clear();
    m_hasPlaces = false;
}

bool StrokeCurve::Add(const PenPoint& point, std::vector<CurvePlace>& places)
{
    const PenPoint bounded = Bounded(point);
    if (!m_recent.empty() && Distance(m_recent.back(), bounded) == 0.0f)
        return false;
    m_recent.push_back(bounded);
    if (m_recent.size() == 3)
        AddPiece(Beyond(m_recent[0], m_recent[1]), m_recent[0], m_recent[1], m_recent[2], places);
    else if (m_recent.size() == 4)
    {
        AddPiece(m_recent[0], m_recent[1], m_recent[2], m_recent[3], places);
        m_recent.erase(m_recent.begin());
    }
    return true;
}

void StrokeCurve::End(std::vector<CurvePlace>& places)
{
    const std::size_t count = m_recent.size();
    if (count < 2)
        return;
    const PenPoint& from = m_recent[count - 2];
    const PenPoint& to = m_recent[count - 1];
    const PenPoint before = count > 2 ? m_recent[count - 3] : Beyond(from, to);
    AddPiece(before, from, to, Beyond(to, from), places);
}

void StrokeCurve::AddPiece(const PenPoint& before, const PenPoint& from, const PenPoint& to,
                           const PenPoint& after, std::vector<CurvePlace>& places)
{
    const Tangents tangents = CentripetalTangents(before, from, to, after);
    if (!m_hasPlaces)
        places.push_back({from, tangents.fromX, tangents.fromY});
    m_hasPlaces = true;
    const int steps =
        std::clamp(static_cast<int>(std::ceil(Distance(from, to) / kStep)), 1, kMostSteps);
    for (int i = 1; i <= steps; ++i)
        places.push_back(
            PlaceOn(from, to, tangents, static_cast<float>(i) / static_cast<float>(steps)));
}

float Distance(const PenPoint& a, const PenPoint& b)
{
    return Length(b.x - a.x, b.y - a.y);
}

float Length(float x, float y)
{
    return static_cast<float>(std::sqrt(double(x) * x + double(y) * y));
}

PenPoint Between(const PenPoint& a, const PenPoint& b, float t)
{
    const auto between = [t](float from, float to) { return from + t * (to - from); };
    PenPoint point;
    point.x = between(a.x, b.x);
    point.y = between(a.y, b.y);
    point.radius = between(a.radius, b.radius);
    point.flow = between(a.flow, b.flow);
    const float turn = b.angle - a.angle;
    if (turn == 0.0f)
        point.angle = a.angle;
    else
        point.angle = a.angle + t * std::remainder(turn, kTurn); // the short way round
    point.stretch = between(a.stretch, b.stretch);
    return point;
}

} // namespace Ink
