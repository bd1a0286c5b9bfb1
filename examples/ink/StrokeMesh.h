#ifndef INK_STROKE_MESH_H
#define INK_STROKE_MESH_H

#include <cstddef>
#include <vector>

namespace Ink
{

/// A corner of a triangle of ink.
struct Vertex
{
    float x = 0.0f;      ///< page pixels, to the right
    float y = 0.0f;      ///< page pixels, downward
    float inside = 0.0f; ///< distance to the stroke's outline in pixels, positive within the ink
};
static_assert(sizeof(Vertex) == 3 * sizeof(float), "uploaded as it stands");

/// A point of a stroke on the page.
struct PenPoint
{
    float x = 0.0f;      ///< page pixels, to the right
    float y = 0.0f;      ///< page pixels, downward
    float radius = 1.0f; ///< half the width of the stroke here, in pixels
};

/// Turns the points of one stroke, as they arrive, into triangles: a band of varying width along
/// the centripetal Catmull-Rom curve through the points, with round caps, and round joins where the
/// curve turns sharply. Each call appends the triangles that have become certain; the curve up to
/// the newest point follows with the next point or with End, since its direction depends on it.
///
/// The outline lies half a pixel inside the outermost corners, so that the shader can fade the edge
/// over one pixel from `inside`.
class StrokeMesh
{
public:
    /// Starts a stroke; what an earlier one left unfinished is dropped.
    void Begin();

    /// Appends the triangles that @p point makes certain to @p triangles, three corners each. A
    /// point equal to the one before adds nothing.
    void Add(const PenPoint& point, std::vector<Vertex>& triangles);

    /// Appends the rest of the stroke. A stroke of one point becomes a disc.
    void End(std::vector<Vertex>& triangles);

private:
    struct Section
    {
        PenPoint centre;
        float normalX = 0.0f;
        float normalY = 0.0f;
    };

    void AddCurve(const PenPoint& before, const PenPoint& from, const PenPoint& to,
                  const PenPoint& after, std::vector<Vertex>& triangles);
    void AddSection(const PenPoint& centre, float directionX, float directionY,
                    std::vector<Vertex>& triangles);

    std::vector<PenPoint> m_recent; ///< the last points, at most three
    Section m_last;                 ///< where the band ends so far
    bool m_hasSection = false;
};

} // namespace Ink

#endif
