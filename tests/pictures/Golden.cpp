#include "pictures/Golden.h"

#include "drivers/Driver.h"

#include <png.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <stdexcept>

namespace
{

// Some drivers snap coordinates to 1/16 of a pixel, others to 1/256, and the edge of the ink is a
// pixel wide: its pixels differ by up to 255/16. Where several edges meet, a few differ by more.
constexpr int kOfAnEdge = 16;
constexpr int kLargest = 64;
constexpr double kShare = 0.002;

std::uint8_t Stretched(int difference)
{
    return static_cast<std::uint8_t>(std::min(255, 4 * difference));
}

/// The accepted picture, pale, and over it in red what differs, four times as strong.
Picture PictureOfDifference(const Picture& accepted, const Picture& picture)
{
    Picture result = accepted;
    for (std::size_t i = 0; i < result.pixels.size(); i += 4)
    {
        int largest = 0;
        for (std::size_t channel = i; channel < i + 3; ++channel)
        {
            largest =
                std::max(largest, std::abs(accepted.pixels[channel] - picture.pixels[channel]));
            result.pixels[channel] = static_cast<std::uint8_t>(192 + accepted.pixels[channel] / 4);
        }
        if (largest <= 1)
            continue;
        result.pixels[i] = 255;
        result.pixels[i + 1] = result.pixels[i + 2] =
            static_cast<std::uint8_t>(255 - Stretched(largest));
    }
    return result;
}

/// Writes the pictures of a comparison that failed; returns what to tell about them.
std::string Kept(const std::string& name, const Picture* accepted, const Picture& picture)
{
    const std::filesystem::path folder = NIB_PICTURE_FOLDER;
    std::filesystem::create_directories(folder);
    const std::string driver(DriverName().empty() ? "driver" : DriverName());
    const std::string drawn = (folder / (name + "." + driver + ".png")).string();
    SavePng(drawn, picture);
    std::string text = "\ndrawn:      " + drawn;
    if (accepted)
    {
        const std::string file = (folder / (name + "." + driver + ".difference.png")).string();
        SavePng(file, PictureOfDifference(*accepted, picture));
        text += "\ndifference: " + file;
    }
    return text + "\nto accept:  scripts/accept-picture " + name + " " + driver;
}

} // namespace

PictureDifference DifferenceOf(const Picture& a, const Picture& b)
{
    PictureDifference result;
    int pixels = 0;
    for (std::size_t i = 0; i < a.pixels.size(); i += 4)
    {
        int largest = 0;
        for (std::size_t channel = i; channel < i + 4; ++channel)
            largest = std::max(largest, std::abs(a.pixels[channel] - b.pixels[channel]));
        result.largest = std::max(result.largest, largest);
        pixels += largest > kOfAnEdge ? 1 : 0;
    }
    result.share = static_cast<double>(pixels) / (a.width * a.height);
    return result;
}

testing::AssertionResult IsAsAccepted(const std::string& name, const Picture& picture)
{
    const std::string path = std::string(NIB_GOLDEN_FOLDER) + "/" + name + ".png";
    if (!std::filesystem::exists(path))
        return testing::AssertionFailure()
               << "no picture " << name << " was accepted" << Kept(name, nullptr, picture);
    const Picture accepted = LoadPng(path);
    if (accepted.width != picture.width || accepted.height != picture.height)
        return testing::AssertionFailure()
               << name << " was accepted in another size" << Kept(name, nullptr, picture);
    const PictureDifference difference = DifferenceOf(accepted, picture);
    const bool isSame = difference.largest <= kLargest && difference.share <= kShare;
    return (isSame ? testing::AssertionSuccess() : testing::AssertionFailure())
           << name << " differs by up to " << difference.largest << ", by more than " << kOfAnEdge
           << " in " << 100.0 * difference.share << " % of the pixels"
           << (isSame ? "" : Kept(name, &accepted, picture));
}

void SavePng(const std::string& path, const Picture& picture)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = static_cast<png_uint_32>(picture.width);
    image.height = static_cast<png_uint_32>(picture.height);
    image.format = PNG_FORMAT_RGBA;
    if (!png_image_write_to_file(&image, path.c_str(), 0, picture.pixels.data(), 0, nullptr))
        throw std::runtime_error(path + ": " + image.message);
}
