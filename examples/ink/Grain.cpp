#include "Grain.h"

#include <algorithm>
#include <cmath>

namespace Ink
{
namespace
{

constexpr int kCells = 9;         // of the grain, across the print
constexpr float kFadeFrom = 0.7f; // of the radius

/// A number from 0 to 1 that has nothing to do with those of the places around.
float Noise(int x, int y)
{
    std::uint32_t bits =
        static_cast<std::uint32_t>(x) * 0x9E3779B1u ^ static_cast<std::uint32_t>(y) * 0x85EBCA77u;
    bits = (bits ^ (bits >> 15)) * 0x2C1B3C6Du;
    bits = (bits ^ (bits >> 12)) * 0x297A2D39u;
    return static_cast<float>((bits ^ (bits >> 15)) & 0xFFFFu) / 65535.0f;
}

/// The noise of four neighbours, faded into each other.
float SmoothNoise(float x, float y)
{
    const auto fade = [](float t) { return t * t * (3.0f - 2.0f * t); };
    const int left = static_cast<int>(x), top = static_cast<int>(y);
    const float across = fade(x - static_cast<float>(left));
    const float down = fade(y - static_cast<float>(top));
    const float above = std::lerp(Noise(left, top), Noise(left + 1, top), across);
    const float below = std::lerp(Noise(left, top + 1), Noise(left + 1, top + 1), across);
    return std::lerp(above, below, down);
}

float Coverage(float x, float y)
{
    const float distance = std::hypot(x - 0.5f, y - 0.5f) * 2.0f;
    const float disc = std::clamp((1.0f - distance) / (1.0f - kFadeFrom), 0.0f, 1.0f);
    const float grain = SmoothNoise(x * kCells, y * kCells);
    return disc * std::clamp(grain * 2.2f - 0.6f, 0.0f, 1.0f);
}

} // namespace

std::vector<std::uint8_t> GrainPixels(int side)
{
    std::vector<std::uint8_t> pixels;
    for (int y = 0; y < side; ++y)
        for (int x = 0; x < side; ++x)
        {
            const auto place = [side](int pixel)
            { return (static_cast<float>(pixel) + 0.5f) / static_cast<float>(side); };
            const float coverage = Coverage(place(x), place(y));
            pixels.insert(pixels.end(), 4, static_cast<std::uint8_t>(coverage * 255.0f + 0.5f));
        }
    return pixels;
}

} // namespace Ink
