#include "PngFile.h"

#include "ReplacementFile.h"

#include <cerrno>
#include <cstring>
#include <png.h>

namespace
{

/// Most pages are: eight bytes at a time and without a branch, since a page has millions.
bool IsOpaque(const std::vector<std::uint8_t>& pixels)
{
    constexpr std::uint8_t kOpaque[] = {0, 0, 0, 255, 0, 0, 0, 255};
    std::uint64_t opaque, pair, common = ~std::uint64_t{0};
    std::memcpy(&opaque, kOpaque, sizeof opaque);
    std::size_t i = 0;
    for (; i + sizeof pair <= pixels.size(); i += sizeof pair)
    {
        std::memcpy(&pair, pixels.data() + i, sizeof pair);
        common &= pair;
    }
    return (common & opaque) == opaque && (i == pixels.size() || pixels.back() == 255);
}

std::vector<std::uint8_t> WithStraightAlpha(std::vector<std::uint8_t> pixels)
{
    for (std::size_t i = 0; i < pixels.size(); i += 4)
    {
        const unsigned int alpha = pixels[i + 3];
        if (alpha == 0 || alpha == 255)
            continue;
        for (std::size_t channel = i; channel < i + 3; ++channel)
        {
            const unsigned int straight = (pixels[channel] * 255u + alpha / 2) / alpha;
            pixels[channel] = static_cast<std::uint8_t>(straight > 255u ? 255u : straight);
        }
    }
    return pixels;
}

} // namespace

void WritePng(const std::string& path, const std::vector<std::uint8_t>& pixels, int width,
              int height)
{
    std::vector<std::uint8_t> straight;
    const bool isOpaque = IsOpaque(pixels);
    if (!isOpaque)
        straight = WithStraightAlpha(pixels);
    ReplacementFile file(path);

    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = static_cast<png_uint_32>(width);
    image.height = static_cast<png_uint_32>(height);
    image.format = PNG_FORMAT_RGBA;
    errno = 0;
    if (!png_image_write_to_stdio(&image, file.Stream(), 0, (isOpaque ? pixels : straight).data(),
                                  0, nullptr))
        file.Fail();
    file.TakePlace();
}
