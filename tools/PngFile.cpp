#include "PngFile.h"

#include "UserError.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <png.h>
#include <sys/stat.h>
#include <unistd.h>

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

/// A new file beside the one that it will replace; removed unless it took that one's place.
class ReplacementFile
{
public:
    explicit ReplacementFile(const std::string& path) : m_path(path), m_name(path + ".XXXXXX")
    {
        const int descriptor = mkstemp(m_name.data());
        if (descriptor < 0)
            Fail();
        const mode_t mask = umask(0);
        umask(mask);
        fchmod(descriptor, 0666 & ~mask); // mkstemp makes files that only the owner reads
        m_file = fdopen(descriptor, "wb");
        if (!m_file)
            Fail();
    }
    ReplacementFile(const ReplacementFile&) = delete;
    ReplacementFile& operator=(const ReplacementFile&) = delete;
    ~ReplacementFile()
    {
        if (m_file)
            std::fclose(m_file);
        if (!m_isInPlace)
            unlink(m_name.c_str());
    }

    std::FILE* Stream() const { return m_file; }

    void TakePlace()
    {
        std::FILE* const file = m_file;
        m_file = nullptr;
        if (std::fclose(file) != 0 || std::rename(m_name.c_str(), m_path.c_str()) != 0)
            Fail();
        m_isInPlace = true;
    }

    [[noreturn]] void Fail() const
    {
        throw UserError(m_path + ":1: cannot be written: " + std::strerror(errno));
    }

private:
    std::string m_path;
    std::string m_name;
    std::FILE* m_file = nullptr;
    bool m_isInPlace = false;
};

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
