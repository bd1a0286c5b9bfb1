#include "Picture.h"

#include <algorithm>
#include <cstdlib>
#include <png.h>
#include <stdexcept>

Picture LoadPng(const std::string& path)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    if (!png_image_begin_read_from_file(&image, path.c_str()))
        throw std::runtime_error(path + ": " + image.message);
    image.format = PNG_FORMAT_RGBA;
    Picture picture;
    picture.width = static_cast<int>(image.width);
    picture.height = static_cast<int>(image.height);
    picture.pixels.resize(PNG_IMAGE_SIZE(image));
    if (!png_image_finish_read(&image, nullptr, picture.pixels.data(), 0, nullptr))
        throw std::runtime_error(path + ": " + image.message);
    return picture;
}

int LargestDifference(const Picture& a, const Picture& b)
{
    int largest = a.width == b.width && a.height == b.height ? 0 : 256;
    for (std::size_t i = 0; largest < 256 && i < a.pixels.size(); ++i)
        if (i % 4 != 3)
            largest = std::max(largest, std::abs(a.pixels[i] - b.pixels[i]));
    return largest;
}
