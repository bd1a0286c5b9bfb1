#include "PngFile.h"

#include "ReplacementFile.h"

#include <cerrno>
#include <png.h>

namespace
{

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
    const std::vector<std::uint8_t> straight = WithStraightAlpha(pixels);
    ReplacementFile file(path);

    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = static_cast<png_uint_32>(width);
    image.height = static_cast<png_uint_32>(height);
    image.format = PNG_FORMAT_RGBA;
    errno = 0;
    if (!png_image_write_to_stdio(&image, file.Stream(), 0, straight.data(), 0, nullptr))
        file.Fail();
    file.TakePlace();
}
