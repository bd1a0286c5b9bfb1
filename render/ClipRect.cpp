#include <nib/partial_update.h>

#include <algorithm>

namespace Nib
{

ClipRect::ClipRect(int count)
    : m_rectangles(std::make_unique<RectF[]>(static_cast<std::size_t>(std::max(count, 0)))),
      m_width(0), m_height(0), m_count(std::max(count, 0))
{
}

ClipRect::~ClipRect() = default;

void ClipRect::Init(int width, int height)
{
    m_width = width;
    m_height = height;
    Reset();
}

void ClipRect::Reset()
{
    const RectF all(0, 0, static_cast<float>(m_width), static_cast<float>(m_height));
    std::fill_n(m_rectangles.get(), m_count, all);
}

RectF ClipRect::AddUpdateRect(const RectF* rect)
{
    const RectF added =
        rect != nullptr ? *rect
                        : RectF(0, 0, static_cast<float>(m_width), static_cast<float>(m_height));
    if (m_count == 0)
        return added;
    RectF area = m_rectangles[0];
    for (int i = 1; i < m_count; ++i)
    {
        area.Union(m_rectangles[i]);
        m_rectangles[i - 1] = m_rectangles[i];
    }
    area.Union(added);
    m_rectangles[m_count - 1] = added;
    return area;
}

} // namespace Nib
