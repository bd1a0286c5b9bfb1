#include "StrokeMesh.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace Ink
{
namespace
{

constexpr float kFade = 1.0f;       // pixels that the triangles reach beyond the outline
constexpr float kSharpTurn = 0.94f; // cosine of the angle from which a join is round
constexpr float kFlatness = 0.02f;  // pixels between a disc and the polygon that stands for it
constexpr float kPi = 3.14159265f;

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

} // namespace

void StrokeMesh::Begin()
{
    m_curve.Begin();
    m_hasSection = false;
}

void StrokeMesh::Add(const PenPoint& point, std::vector<Vertex>& triangles)
{
    m_places.clear();
    if (!m_curve.Add(point, m_places))
        return;
    if (m_curve.PointCount() == 1)
        AddDisc(m_curve.Newest(),
                triangles); // the round cap, and the whole of a stroke of one point
    AddPlaces(triangles);
}

void StrokeMesh::End(std::vector<Vertex>& triangles)
{
    m_places.clear();
    m_curve.End(m_places);
    AddPlaces(triangles);
    if (m_curve.PointCount() > 1)
        AddDisc(m_curve.Newest(), triangles);
    Begin();
}

void StrokeMesh::AddPlaces(std::vector<Vertex>& triangles)
{
    for (const CurvePlace& place : m_places)
        AddSection(place, triangles);
}

void StrokeMesh::AddSection(const CurvePlace& place, std::vector<Vertex>& triangles)
{
    const PenPoint& centre = place.at;
    Section section{centre, m_last.normalX, m_last.normalY, {}, {}};
    const float length = Length(place.directionX, place.directionY);
    if (length > 0.0f)
    {
        section.normalX = -place.directionY / length;
        section.normalY = place.directionX / length;
    }
    const float reach = centre.radius + kFade;
    const float acrossX = section.normalX * reach, acrossY = section.normalY * reach;
    section.left = {centre.x + acrossX, centre.y + acrossY, -kFade};
    section.right = {centre.x - acrossX, centre.y - acrossY, -kFade};
    if (m_hasSection)
    {
        const Vertex lastMiddle{m_last.centre.x, m_last.centre.y, m_last.centre.radius};
        const Vertex middle{centre.x, centre.y, centre.radius};
        const Vertex band[] = {m_last.left,  lastMiddle, middle, //
                               m_last.left,  middle,     section.left,
                               m_last.right, lastMiddle, middle, //
                               m_last.right, middle,     section.right};
        triangles.insert(triangles.end(), std::begin(band), std::end(band));
        const float turn = m_last.normalX * section.normalX + m_last.normalY * section.normalY;
        if (turn < kSharpTurn)
            AddDisc(m_last.centre, triangles);
    }
    m_last = section;
    m_hasSection = true;
}

} // namespace Ink
