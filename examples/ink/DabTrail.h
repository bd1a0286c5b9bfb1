#ifndef INK_DAB_TRAIL_H
#define INK_DAB_TRAIL_H

#include "StrokeCurve.h"

#include <vector>

namespace Ink
{

/// One impression of a stamp.
struct Dab
{
    float x = 0.0f;      ///< its middle; page pixels, to the right
    float y = 0.0f;      ///< page pixels, downward
    float alongX = 0.0f; ///< from the middle to the end of its longer side, page pixels
    float alongY = 0.0f;
    float breadth = 1.0f; ///< from the middle to its longer edge, page pixels
    float opacity = 1.0f;
    float roll = 0.0f; ///< radians by which its print is turned, so that no two look alike
};
static_assert(sizeof(Dab) == 7 * sizeof(float), "uploaded as it stands");

/// Turns the points of one stroke, as they arrive, into dabs: one at the first point, then one
/// after each quarter of the stroke's width along the curve through the points. Each call appends
/// the dabs that have become certain (StrokeCurve).
class DabTrail
{
public:
    /// Starts a stroke; what an earlier one left unfinished is dropped.
    void Begin();

    void Add(const PenPoint& point, std::vector<Dab>& dabs);
    void End(std::vector<Dab>& dabs);

private:
    void Press(std::vector<Dab>& dabs);
    void Walk(std::vector<Dab>& dabs);
    void WalkTo(const PenPoint& to, std::vector<Dab>& dabs);

    StrokeCurve m_curve;
    std::vector<CurvePlace> m_places; ///< of the call that is running; kept for its memory
    PenPoint m_last;                  ///< how far the walk has come
    float m_walked = 0.0f;            ///< pixels since the last dab
    float m_roll = 0.0f;              ///< of the next dab
};

} // namespace Ink

#endif
