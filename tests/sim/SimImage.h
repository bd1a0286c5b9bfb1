#ifndef NIB_SIM_IMAGE_H
#define NIB_SIM_IMAGE_H

#include "SimObjects.h"

#include <GLES3/gl3.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace Sim
{

/// A colour as numbers: red, green, blue and alpha, 0 to 1 for normalised formats.
using Color = std::array<double, 4>;

/// How pixels lie in memory, on either side of an upload or a read-back.
struct PixelFormat
{
    GLenum format = GL_RGBA;
    GLenum type = GL_UNSIGNED_BYTE;

    friend bool operator==(const PixelFormat&, const PixelFormat&) = default;
};

/// Bytes of one pixel; 0 for a combination that is not known.
std::size_t BytesPerPixel(const PixelFormat& layout);
Color DecodePixel(const PixelFormat& layout, const unsigned char* pixel);
void EncodePixel(const PixelFormat& layout, const Color& color, unsigned char* pixel);

/// A rectangle in pixels, y counted from the bottom.
struct Box
{
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
};

SimPixel ToPixel(const Color& color);

Box Intersection(const Box& a, const Box& b);

/// Pixels of one level of a texture, of a renderbuffer or of a window buffer. Nothing is allocated
/// as long as all pixels are alike.
class Image
{
public:
    int width = 0;
    int height = 0;
    int depth = 1;
    GLenum internalFormat = 0;
    PixelFormat layout;
    std::uint64_t drawn = 0; ///< stands for the draws that went into it; 0 for none

    bool Exists() const { return internalFormat != 0; }
    Box Area() const { return {0, 0, width, height}; }
    std::size_t PixelSize() const { return BytesPerPixel(layout); }

    /// Every pixel gets @p color.
    void Fill(const Color& color);
    /// The pixels of @p area get the channels of @p color whose mask is set.
    void Fill(const Box& area, const Color& color, const std::array<bool, 4>& mask);
    Color Read(int x, int y, int z = 0) const;
    void Write(int x, int y, const Color& color, int z = 0);
    /// Copies @p area of @p source, which has the same size and layout, to the same place here.
    void CopyFrom(const Image& source, const Box& area);

    /// All bytes, tightly packed; the storage is allocated by the first call.
    std::vector<unsigned char>& Bytes();
    std::vector<unsigned char> CopyOfBytes() const;

private:
    void FillAll(const Box& inside, const Color& color);
    std::size_t PixelCount() const;

    std::vector<unsigned char> m_bytes; // empty: all pixels are m_fill
    std::array<unsigned char, 16> m_fill{};
};

/// GL_UNPACK_... or GL_PACK_...
struct PixelStore
{
    int rowLength = 0;
    int skipRows = 0;
    int skipPixels = 0;
    int alignment = 4;
    int imageHeight = 0;
    int skipImages = 0;

    /// Where row @p row of layer @p layer begins in client memory.
    std::size_t OffsetOf(int row, int layer, int width, int height, std::size_t pixelSize) const;
};

} // namespace Sim

#endif
