#ifndef INK_STROKE_MESH_H
#define INK_STROKE_MESH_H

#include "StrokeCurve.h"

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

/// Turns the points of one stroke, as they arrive, into triangles: a band of varying width along
/// the curve through the points, with round caps, and round joins where the curve turns sharply.
/// Each call appends the triangles that have become certain (StrokeCurve).
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
        Vertex left, right; ///< the corners of the band
    };

    void AddPlaces(std::vector<Vertex>& triangles);
    void AddSection(const CurvePlace& place, std::vector<Vertex>& triangles);

    StrokeCurve m_curve;
    std::vector<CurvePlace> m_places; ///< of the call that is running; kept for its memory
    Section m_last;                   ///< where the band ends so far
    bool m_hasSection = false;
};

} // namespace Ink

#endif
