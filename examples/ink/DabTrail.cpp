#include "DabTrail.h"

#include <algorithm>
#include <cmath>

namespace Ink
{
namespace
{

constexpr float kSpacing = 0.25f;      // of the width
constexpr float kClosest = 1.0f;       // pixels between two dabs of the finest stroke
constexpr float kMostBetween = 256.0f; // dabs between two places of a curve, however far apart
constexpr float kRoll = 2.39996f;      // radians, the golden angle: it takes long to come round
constexpr float kTurn = 2.0f * 3.14159265f;

float SpacingAt(const PenPoint& point)
{
    return std::max(kSpacing * 2.0f * point.radius, kClosest);
}

} // namespace

void DabTrail::Begin()
{
    m_curve.Begin();
}

void DabTrail::Add(const PenPoint& point, std::vector<Dab>& dabs)
{
    m_places.clear();
    if (!m_curve.Add(point, m_places))
        return;
    if (m_curve.PointCount() == 1)
    {
        m_last = m_curve.Newest();
        m_roll = 0.0f;
        Press(dabs);
    }
    Walk(dabs);
}

void DabTrail::End(std::vector<Dab>& dabs)
{
    m_places.clear();
    m_curve.End(m_places);
    Walk(dabs);
    Begin();
}

/// Sets a dab where the walk has come to.
void DabTrail::Press(std::vector<Dab>& dabs)
{
    const float length = m_last.radius * m_last.stretch;
    dabs.push_back({m_last.x, m_last.y, length * std::cos(m_last.angle),
                    length * std::sin(m_last.angle), m_last.radius, m_last.flow, m_roll});
    m_roll = std::fmod(m_roll + kRoll, kTurn);
    m_walked = 0.0f;
}

void DabTrail::Walk(std::vector<Dab>& dabs)
{
    for (const CurvePlace& place : m_places)
        WalkTo(place.at, dabs);
}

/// Straight on to the next place of the curve, with a dab wherever one is due.
void DabTrail::WalkTo(const PenPoint& to, std::vector<Dab>& dabs)
{
    const PenPoint from = m_last;
    const float length = Distance(from, to);
    if (length == 0.0f)
        return;
    const float least = length / kMostBetween;
    float done = 0.0f;
    for (;;)
    {
        const float due = std::max(SpacingAt(m_last), least) - m_walked;
        if (!(done + due <= length))
            break;
        done += std::max(due, 0.0f);
        m_last = Between(from, to, done / length);
        Press(dabs);
    }
    m_walked += length - done;
    m_last = to;
}

} // namespace Ink
