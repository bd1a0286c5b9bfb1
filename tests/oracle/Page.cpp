#include "oracle/Page.h"

#include <algorithm>
#include <cmath>

namespace Oracle
{

namespace
{

Box Common(const Box& a, const Box& b)
{
    const int left = std::max(a.x, b.x);
    const int bottom = std::max(a.y, b.y);
    const int width = std::min(a.x + a.width, b.x + b.width) - left;
    const int height = std::min(a.y + a.height, b.y + b.height) - bottom;
    return width > 0 && height > 0 ? Box{left, bottom, width, height} : Box{};
}

bool Covers(const Box& outer, const Box& inner)
{
    return outer.x <= inner.x && outer.y <= inner.y &&
           outer.x + outer.width >= inner.x + inner.width &&
           outer.y + outer.height >= inner.y + inner.height;
}

// Opaque, and never the same twice within a scenario.
SimPixel Colour(int number)
{
    return {number & 0xFF, (number >> 8) & 0xFF, 255 - (number & 0xFF), 255};
}

} // namespace

Box TouchedPixels(const Nib::RectF& rect, int width, int height)
{
    const auto within = [](float edge, int limit)
    { return static_cast<int>(std::clamp(edge, 0.0F, static_cast<float>(limit))); };
    const int left = within(std::floor(rect.left), width);
    const int top = within(std::floor(rect.top), height);
    const int right = within(std::ceil(rect.right), width);
    const int bottom = within(std::ceil(rect.bottom), height);
    if (left >= right || top >= bottom || rect.IsEmpty())
        return {};
    return {left, height - bottom, right - left, bottom - top};
}

Page::Page(int width, int height)
    : m_width(width), m_height(height),
      m_pixels(static_cast<std::size_t>(width) * static_cast<std::size_t>(height))
{
    Add(All());
}

void Page::Paint(const Nib::RectF& rect)
{
    const Box box = TouchedPixels(rect, m_width, m_height);
    if (box.width > 0)
        Add(box);
}

void Page::Add(const Box& box)
{
    const SimPixel colour = Colour(m_colours++);
    m_patches.erase(std::remove_if(m_patches.begin(), m_patches.end(),
                                   [&box](const Patch& patch) { return Covers(box, patch.box); }),
                    m_patches.end());
    m_patches.push_back({box, colour});
    for (int y = box.y; y < box.y + box.height; ++y)
        std::fill_n(m_pixels.begin() + y * m_width + box.x, box.width, colour);
}

void Page::Draw(const Box& box) const
{
    glEnable(GL_SCISSOR_TEST);
    for (const Patch& patch : m_patches)
    {
        const Box part = Common(patch.box, box);
        if (part.width == 0)
            continue;
        glScissor(part.x, part.y, part.width, part.height);
        glClearColor(static_cast<float>(patch.colour.r) / 255,
                     static_cast<float>(patch.colour.g) / 255,
                     static_cast<float>(patch.colour.b) / 255, 1);
        glClear(GL_COLOR_BUFFER_BIT);
    }
    glDisable(GL_SCISSOR_TEST);
}

} // namespace Oracle
