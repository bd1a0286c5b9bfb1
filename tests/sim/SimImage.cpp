#include "SimImage.h"

#include "SimPicture.h"

#include <algorithm>
#include <cstring>

namespace Sim
{

Box Intersection(const Box& a, const Box& b)
{
    const int left = std::max(a.x, b.x);
    const int bottom = std::max(a.y, b.y);
    const int right = std::min(a.x + a.width, b.x + b.width);
    const int top = std::min(a.y + a.height, b.y + b.height);
    if (left >= right || bottom >= top)
        return {};
    return {left, bottom, right - left, top - bottom};
}

std::size_t Image::PixelCount() const
{
    return static_cast<std::size_t>(width) * static_cast<std::size_t>(height) *
           static_cast<std::size_t>(depth);
}

void Image::Fill(const Color& color)
{
    m_bytes.clear();
    m_bytes.shrink_to_fit();
    drawn = 0;
    EncodePixel(layout, color, m_fill.data());
}

/// As Fill, without looking at what was there.
void Image::FillAll(const Box& inside, const Color& color)
{
    if (inside.width <= 0)
        return;
    const std::size_t size = PixelSize();
    std::array<unsigned char, 16> pixel{};
    EncodePixel(layout, color, pixel.data());
    std::vector<unsigned char>& bytes = Bytes();
    for (int y = inside.y; y < inside.y + inside.height; ++y)
    {
        unsigned char* to =
            bytes.data() + (static_cast<std::size_t>(y) * static_cast<std::size_t>(width) +
                            static_cast<std::size_t>(inside.x)) *
                               size;
        for (int x = 0; x < inside.width; ++x, to += size)
            std::copy_n(pixel.data(), size, to);
    }
}

void Image::Fill(const Box& area, const Color& color, const std::array<bool, 4>& mask)
{
    const Box inside = Intersection(area, Area());
    const bool whole = inside.width == width && inside.height == height && depth == 1;
    if (whole && mask == std::array<bool, 4>{true, true, true, true})
        return Fill(color);
    if (mask == std::array<bool, 4>{true, true, true, true})
        return FillAll(inside, color);
    for (int y = inside.y; y < inside.y + inside.height; ++y)
    {
        for (int x = inside.x; x < inside.x + inside.width; ++x)
        {
            Color mixed = Read(x, y);
            for (std::size_t channel = 0; channel < 4; ++channel)
            {
                if (mask[channel])
                    mixed[channel] = color[channel];
            }
            Write(x, y, mixed);
        }
    }
}

Color Image::Read(int x, int y, int z) const
{
    if (x < 0 || y < 0 || z < 0 || x >= width || y >= height || z >= depth)
        return {};
    if (m_bytes.empty())
        return DecodePixel(layout, m_fill.data());
    const std::size_t index = (static_cast<std::size_t>(z) * height + y) * width + x;
    return DecodePixel(layout, m_bytes.data() + index * PixelSize());
}

void Image::Write(int x, int y, const Color& color, int z)
{
    if (x < 0 || y < 0 || z < 0 || x >= width || y >= height || z >= depth)
        return;
    const std::size_t index = (static_cast<std::size_t>(z) * height + y) * width + x;
    EncodePixel(layout, color, Bytes().data() + index * PixelSize());
}

void Image::CopyFrom(const Image& source, const Box& area)
{
    const Box inside = Intersection(Intersection(area, Area()), source.Area());
    if (inside.width == width && inside.height == height && source.width == width &&
        source.height == height && source.layout == layout)
    {
        m_bytes = source.m_bytes;
        m_fill = source.m_fill;
        drawn = source.drawn;
        return;
    }
    drawn = Sim::CopiedInto(*this, source, inside);
    for (int y = inside.y; y < inside.y + inside.height; ++y)
    {
        for (int x = inside.x; x < inside.x + inside.width; ++x)
            Write(x, y, source.Read(x, y));
    }
}

std::vector<unsigned char>& Image::Bytes()
{
    if (m_bytes.empty())
        m_bytes = CopyOfBytes();
    return m_bytes;
}

std::vector<unsigned char> Image::CopyOfBytes() const
{
    if (!m_bytes.empty())
        return m_bytes;
    const std::size_t size = PixelSize();
    std::vector<unsigned char> bytes(PixelCount() * size);
    for (std::size_t i = 0; i < bytes.size(); i += size)
        std::memcpy(bytes.data() + i, m_fill.data(), size);
    return bytes;
}

std::size_t PixelStore::OffsetOf(int row, int layer, int width, int height,
                                 std::size_t pixelSize) const
{
    const std::size_t pixels = static_cast<std::size_t>(rowLength > 0 ? rowLength : width);
    const std::size_t unit = static_cast<std::size_t>(alignment);
    const std::size_t stride = (pixels * pixelSize + unit - 1) / unit * unit;
    const std::size_t rows = static_cast<std::size_t>(imageHeight > 0 ? imageHeight : height);
    const std::size_t line = static_cast<std::size_t>(layer + skipImages) * rows +
                             static_cast<std::size_t>(row + skipRows);
    return line * stride + static_cast<std::size_t>(skipPixels) * pixelSize;
}

} // namespace Sim
