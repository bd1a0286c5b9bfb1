#ifndef NIB_TESTS_PICTURE_H
#define NIB_TESTS_PICTURE_H

#include <cstdint>
#include <string>
#include <vector>

/// A picture in memory: 8-bit RGBA, top row first.
struct Picture
{
    int width = 0;
    int height = 0;
    std::vector<std::uint8_t> pixels;

    const std::uint8_t* At(int x, int y) const
    {
        return pixels.data() + 4 * (static_cast<std::size_t>(y) * static_cast<std::size_t>(width) +
                                    static_cast<std::size_t>(x));
    }
    bool IsInk(int x, int y) const { return At(x, y)[0] < 128; }
};

/// Throws std::runtime_error when @p path is no PNG.
Picture LoadPng(const std::string& path);

/// The largest difference of a colour channel between two pictures of one size; alpha is left out.
int LargestDifference(const Picture& a, const Picture& b);

#endif
