#include "Placement.h"

#include <algorithm>
#include <limits>

namespace Ink
{
namespace
{

constexpr float kMargin = 0.05f; // of the page, on each side

} // namespace

Placement FitToPage(const Recording& recording, int width, int height)
{
    float left = std::numeric_limits<float>::max(), top = left;
    float right = std::numeric_limits<float>::lowest(), bottom = right;
    for (const Stroke& stroke : recording.strokes)
        for (const Sample& sample : stroke)
        {
            left = std::min(left, sample.x);
            right = std::max(right, sample.x);
            top = std::min(top, sample.y);
            bottom = std::max(bottom, sample.y);
        }
    if (left > right)
        return {}; // an empty page
    const float pageWidth = static_cast<float>(width);
    const float pageHeight = static_cast<float>(height);
    const float room = 1.0f - 2.0f * kMargin;
    // Halved first: the ends may lie as far apart as the numbers reach.
    const float halfWidth = right / 2.0f - left / 2.0f;
    const float halfHeight = bottom / 2.0f - top / 2.0f;
    float scale = std::numeric_limits<float>::max();
    if (halfWidth > 0.0f)
        scale = std::min(scale, pageWidth * room / 2.0f / halfWidth);
    if (halfHeight > 0.0f)
        scale = std::min(scale, pageHeight * room / 2.0f / halfHeight);
    if (scale == std::numeric_limits<float>::max())
        scale = 1.0f; // a single point
    const float middleX = left / 2.0f + right / 2.0f;
    const float middleY = top / 2.0f + bottom / 2.0f;
    return {scale, pageWidth / 2.0f - middleX * scale, pageHeight / 2.0f - middleY * scale};
}

} // namespace Ink
