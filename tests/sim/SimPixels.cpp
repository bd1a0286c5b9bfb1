#include "SimImage.h"

#include <GLES2/gl2.h>
// After gl2.h, which it needs.
#include <GLES2/gl2ext.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <type_traits>

// Pixels in client memory: their sizes, and their channels as numbers.

namespace Sim
{

namespace
{

/// For each channel of a pixel, in memory order, its index in a Color. Luminance counts as red.
struct Channels
{
    int count = 0;
    std::array<std::size_t, 4> index{};
    bool normalised = true;
};

Channels ChannelsOf(GLenum format)
{
    switch (format)
    {
    case GL_RED:
    case GL_LUMINANCE:
    case GL_DEPTH_COMPONENT: return {1, {0}, true};
    case GL_RED_INTEGER: return {1, {0}, false};
    case GL_ALPHA: return {1, {3}, true};
    case GL_LUMINANCE_ALPHA: return {2, {0, 3}, true};
    case GL_RG: return {2, {0, 1}, true};
    case GL_RG_INTEGER: return {2, {0, 1}, false};
    case GL_RGB: return {3, {0, 1, 2}, true};
    case GL_RGB_INTEGER: return {3, {0, 1, 2}, false};
    case GL_RGBA: return {4, {0, 1, 2, 3}, true};
    case GL_RGBA_INTEGER: return {4, {0, 1, 2, 3}, false};
    case GL_BGRA_EXT: return {4, {2, 1, 0, 3}, true};
    default: return {};
    }
}

std::size_t ChannelSize(GLenum type)
{
    switch (type)
    {
    case GL_BYTE:
    case GL_UNSIGNED_BYTE: return 1;
    case GL_SHORT:
    case GL_UNSIGNED_SHORT:
    case GL_HALF_FLOAT:
    case GL_HALF_FLOAT_OES: return 2;
    case GL_INT:
    case GL_UNSIGNED_INT:
    case GL_FLOAT: return 4;
    default: return 0;
    }
}

std::size_t PackedSize(GLenum type)
{
    switch (type)
    {
    case GL_UNSIGNED_SHORT_5_6_5:
    case GL_UNSIGNED_SHORT_4_4_4_4:
    case GL_UNSIGNED_SHORT_5_5_5_1: return 2;
    case GL_UNSIGNED_INT_2_10_10_10_REV:
    case GL_UNSIGNED_INT_10F_11F_11F_REV:
    case GL_UNSIGNED_INT_5_9_9_9_REV:
    case GL_UNSIGNED_INT_24_8: return 4;
    case GL_FLOAT_32_UNSIGNED_INT_24_8_REV: return 8;
    default: return 0;
    }
}

double FromHalf(std::uint16_t bits)
{
    const int exponent = (bits >> 10) & 0x1F;
    const int mantissa = bits & 0x3FF;
    const double sign = (bits & 0x8000) != 0 ? -1 : 1;
    if (exponent == 0)
        return sign * std::ldexp(mantissa, -24);
    return sign * std::ldexp(1024 + mantissa, exponent - 25);
}

std::uint16_t ToHalf(double value)
{
    const std::uint16_t sign = std::signbit(value) ? 0x8000 : 0;
    const double size = std::min(std::fabs(value), 65504.0);
    if (size < std::ldexp(1, -24))
        return sign;
    const int exponent = std::max(std::ilogb(size), -14);
    const int mantissa = static_cast<int>(std::lround(std::ldexp(size, 10 - exponent)));
    const int bits =
        exponent == -14 && mantissa < 1024 ? mantissa : ((exponent + 15) << 10) + (mantissa - 1024);
    return static_cast<std::uint16_t>(sign | bits);
}

template <typename T>
double Load(const unsigned char* from, bool normalised)
{
    T value;
    std::memcpy(&value, from, sizeof value);
    if constexpr (std::is_floating_point_v<T>)
        return static_cast<double>(value);
    else
        return normalised ? static_cast<double>(value) / std::numeric_limits<T>::max()
                          : static_cast<double>(value);
}

template <typename T>
void Store(double number, bool normalised, unsigned char* to)
{
    T value;
    if constexpr (std::is_floating_point_v<T>)
    {
        value = static_cast<T>(number);
    }
    else
    {
        const double top = std::numeric_limits<T>::max();
        const double bottom = std::numeric_limits<T>::min();
        const double scaled = normalised ? number * top : number;
        value = static_cast<T>(std::llround(std::clamp(scaled, bottom, top)));
    }
    std::memcpy(to, &value, sizeof value);
}

double LoadChannel(GLenum type, const unsigned char* from, bool normalised)
{
    switch (type)
    {
    case GL_BYTE: return Load<std::int8_t>(from, normalised);
    case GL_UNSIGNED_BYTE: return Load<std::uint8_t>(from, normalised);
    case GL_SHORT: return Load<std::int16_t>(from, normalised);
    case GL_UNSIGNED_SHORT: return Load<std::uint16_t>(from, normalised);
    case GL_INT: return Load<std::int32_t>(from, normalised);
    case GL_UNSIGNED_INT: return Load<std::uint32_t>(from, normalised);
    case GL_FLOAT: return Load<float>(from, normalised);
    default:
    {
        std::uint16_t bits;
        std::memcpy(&bits, from, sizeof bits);
        return FromHalf(bits);
    }
    }
}

void StoreChannel(GLenum type, double number, bool normalised, unsigned char* to)
{
    switch (type)
    {
    case GL_BYTE: return Store<std::int8_t>(number, normalised, to);
    case GL_UNSIGNED_BYTE: return Store<std::uint8_t>(number, normalised, to);
    case GL_SHORT: return Store<std::int16_t>(number, normalised, to);
    case GL_UNSIGNED_SHORT: return Store<std::uint16_t>(number, normalised, to);
    case GL_INT: return Store<std::int32_t>(number, normalised, to);
    case GL_UNSIGNED_INT: return Store<std::uint32_t>(number, normalised, to);
    case GL_FLOAT: return Store<float>(number, normalised, to);
    default:
    {
        const std::uint16_t bits = ToHalf(number);
        std::memcpy(to, &bits, sizeof bits);
    }
    }
}

} // namespace

std::size_t BytesPerPixel(const PixelFormat& layout)
{
    if (const std::size_t packed = PackedSize(layout.type))
        return packed;
    return static_cast<std::size_t>(ChannelsOf(layout.format).count) * ChannelSize(layout.type);
}

Color DecodePixel(const PixelFormat& layout, const unsigned char* pixel)
{
    Color color{0, 0, 0, 1};
    if (PackedSize(layout.type) != 0)
        return color;
    const Channels channels = ChannelsOf(layout.format);
    for (int i = 0; i < channels.count; ++i)
    {
        const std::size_t at = static_cast<std::size_t>(i);
        color[channels.index[at]] =
            LoadChannel(layout.type, pixel + at * ChannelSize(layout.type), channels.normalised);
    }
    if (layout.format == GL_LUMINANCE || layout.format == GL_LUMINANCE_ALPHA)
        color[1] = color[2] = color[0];
    return color;
}

void EncodePixel(const PixelFormat& layout, const Color& color, unsigned char* pixel)
{
    if (PackedSize(layout.type) != 0)
        return;
    const Channels channels = ChannelsOf(layout.format);
    for (int i = 0; i < channels.count; ++i)
    {
        const std::size_t at = static_cast<std::size_t>(i);
        StoreChannel(layout.type, color[channels.index[at]], channels.normalised,
                     pixel + at * ChannelSize(layout.type));
    }
}

SimPixel ToPixel(const Color& color)
{
    const auto byte = [](double value)
    { return static_cast<int>(std::lround(std::clamp(value, 0.0, 1.0) * 255)); };
    return {byte(color[0]), byte(color[1]), byte(color[2]), byte(color[3])};
}

} // namespace Sim
