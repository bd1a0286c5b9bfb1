#ifndef NIB_TESTS_PICTURES_GOLDEN_H
#define NIB_TESTS_PICTURES_GOLDEN_H

#include "tool/Picture.h"

#include <gtest/gtest.h>

#include <string>

/// How far two pictures of one size lie apart.
struct PictureDifference
{
    int largest = 0;    ///< of a channel of a pixel, 0 to 255
    double share = 0.0; ///< of the pixels that differ by more than drivers' edges commonly do
};
PictureDifference DifferenceOf(const Picture& a, const Picture& b);

/// Compares @p picture with the one that was accepted as golden/@p name.png, pixel by pixel, as far
/// as drivers may differ. When it is not the same, the picture and one of the difference are
/// written, and the failure tells where and how to accept the new one.
testing::AssertionResult IsAsAccepted(const std::string& name, const Picture& picture);

/// Writes an opaque picture as a PNG. Throws std::runtime_error.
void SavePng(const std::string& path, const Picture& picture);

#endif
