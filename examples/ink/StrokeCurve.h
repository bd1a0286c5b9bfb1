#ifndef INK_STROKE_CURVE_H
#define INK_STROKE_CURVE_H

#include "PenPoint.h"

#include <cstddef>
#include <vector>

namespace Ink
{

/// A place on the curve of a stroke.
struct CurvePlace
{
    PenPoint at;
    float directionX = 0.0f; ///< of the curve, of any length; both are 0 where it stands still
    float directionY = 0.0f;
};

/// Turns the points of one stroke, as they arrive, into places close together along the centripetal
/// Catmull-Rom curve through them. Each call appends the places that have become certain; the curve
/// up to the newest point follows with the next point or with End, since its direction depends on
/// it.
class StrokeCurve
{
public:
    /// Starts a stroke; what an earlier one left unfinished is dropped.
    void Begin();

    /// False, and nothing else happens, for a point where the one before is.
    bool Add(const PenPoint& point, std::vector<CurvePlace>& places);

    /// Appends the rest of the curve, up to Newest(). A stroke of one point has no places.
    void End(std::vector<CurvePlace>& places);

    /// How many points the stroke has so far, at most 3: no more are remembered.
    std::size_t PointCount() const { return m_recent.size(); }

    const PenPoint& Newest() const { return m_recent.back(); }

private:
    void AddPiece(const PenPoint& before, const PenPoint& from, const PenPoint& to,
                  const PenPoint& after, std::vector<CurvePlace>& places);

    std::vector<PenPoint> m_recent; ///< the last points, at most three
    bool m_hasPlaces = false;
};

float Distance(const PenPoint& a, const PenPoint& b);

/// The length of a vector; squared in double, so that it overflows nowhere.
float Length(float x, float y);

/// What @p a becomes on its way to @p b, in a straight line, after the share @p t of it.
PenPoint Between(const PenPoint& a, const PenPoint& b, float t);

} // namespace Ink

#endif
