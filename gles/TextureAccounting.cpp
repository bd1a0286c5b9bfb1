#include "gles/TextureAccounting.h"

#include "base/Log.h"

#include <atomic>
#include <cstdint>

namespace Nib::GLES::TextureAccounting
{

namespace
{

constexpr double kPixelsPerKilobyte = 256; // at 4 bytes a pixel, whatever the format
constexpr double kKilobytesPerMegabyte = 1024;

// Any render thread, no order needed between them. Wraps around without harm.
std::atomic<std::int32_t> s_totalPixels{0};
std::atomic<std::int32_t> s_textures{0};

std::int32_t Pixels(int width, int height)
{
    return static_cast<std::int32_t>(static_cast<std::int64_t>(width) * height);
}

double Kilobytes(std::int32_t pixels)
{
    return pixels / kPixelsPerKilobyte;
}

double Megabytes(std::int32_t pixels)
{
    return Kilobytes(pixels) / kKilobytesPerMegabyte;
}

} // namespace

void Add(int width, int height, unsigned glID)
{
    const std::int32_t pixels = Pixels(width, height);
    s_totalPixels.fetch_add(pixels, std::memory_order_relaxed);
    s_textures.fetch_add(1, std::memory_order_relaxed);
    NIB_LOG_INFO("CREATE. Texture Size = %.2fKB Texture Counter = %d Total Size = %.2fMB, "
                 "glID = %d",
                 Kilobytes(pixels), s_textures.load(std::memory_order_relaxed),
                 Megabytes(s_totalPixels.load(std::memory_order_relaxed)), static_cast<int>(glID));
}

void Remove(int width, int height, unsigned glID, const char* tag)
{
    const std::int32_t pixels = Pixels(width, height);
    s_totalPixels.fetch_sub(pixels, std::memory_order_relaxed);
    s_textures.fetch_sub(1, std::memory_order_relaxed);
    NIB_LOG_INFO("FREE. Size = %.2fKB, Counter = %d, Total Size = %.2fMB, glID = %d, tag = %s",
                 Kilobytes(pixels), s_textures.load(std::memory_order_relaxed),
                 Megabytes(s_totalPixels.load(std::memory_order_relaxed)), static_cast<int>(glID),
                 tag);
}

} // namespace Nib::GLES::TextureAccounting
