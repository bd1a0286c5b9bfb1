#include <nib/base.h>

#include <algorithm>
#include <cmath>
#include <limits>

namespace Nib
{

namespace
{

// A conversion of what int cannot hold is undefined in the language; this is what arm64 does.
int Truncate(float value)
{
    constexpr float kEnd = 2147483648.0f; // one above the largest int, exact in float
    if (std::isnan(value))
        return 0;
    if (value >= kEnd)
        return std::numeric_limits<int>::max();
    if (value < -kEnd)
        return std::numeric_limits<int>::min();
    return static_cast<int>(value);
}

} // namespace

void RectF::Set(float l, float t, float r, float b) noexcept
{
    *this = RectF(l, t, r, b);
}

bool RectF::Intersect(const RectF& other) noexcept
{
    const RectF common(std::max(left, other.left), std::max(top, other.top),
                       std::min(right, other.right), std::min(bottom, other.bottom));
    if (common.IsEmpty())
        return false;
    *this = common;
    return true;
}

void RectF::Union(const RectF& other) noexcept
{
    if (other.IsEmpty())
        return;
    if (IsEmpty())
    {
        *this = other;
        return;
    }
    Set(std::min(left, other.left), std::min(top, other.top), std::max(right, other.right),
        std::max(bottom, other.bottom));
}

void RectF::MakeRect(float x, float y) noexcept
{
    *this = RectF(std::min(left, x), std::min(top, y), std::max(right, x), std::max(bottom, y));
}

void RectF::ExtendRect() noexcept
{
    Set(std::floor(left), std::floor(top), std::ceil(right), std::ceil(bottom));
}

void Rect::Set(int l, int t, int r, int b) noexcept
{
    *this = Rect(l, t, r, b);
}

Rect& Rect::operator=(const RectF& other) noexcept
{
    return *this = Rect(Truncate(other.left), Truncate(other.top), Truncate(other.right),
                        Truncate(other.bottom));
}

} // namespace Nib
