#include "Colour.h"

#include <gtest/gtest.h>
#include <string>

namespace
{

void ExpectColour(const char* text, float red, float green, float blue, float alpha)
{
    const std::optional<Ink::Colour> colour = Ink::ParseColour(text);
    ASSERT_TRUE(colour) << text;
    EXPECT_FLOAT_EQ(colour->red, red / 255.0f) << text;
    EXPECT_FLOAT_EQ(colour->green, green / 255.0f) << text;
    EXPECT_FLOAT_EQ(colour->blue, blue / 255.0f) << text;
    EXPECT_FLOAT_EQ(colour->alpha, alpha / 255.0f) << text;
}

TEST(Colour, DigitsInThreeForms)
{
    ExpectColour("#0f8", 0, 255, 136, 255);
    ExpectColour("#1a2B3c", 26, 43, 60, 255);
    ExpectColour("#1a2b3c80", 26, 43, 60, 128);
    ExpectColour("#00000000", 0, 0, 0, 0);
}

TEST(Colour, Names)
{
    ExpectColour("black", 0, 0, 0, 255);
    ExpectColour("white", 255, 255, 255, 255);
    ExpectColour("red", 214, 40, 40, 255);
    ExpectColour("transparent", 0, 0, 0, 0);
}

TEST(Colour, EveryListedNameIsKnown)
{
    const std::string names(Ink::ColourNames());
    int count = 0;
    for (std::size_t first = 0; first < names.size(); ++count)
    {
        const std::size_t end = std::min(names.find(", ", first), names.size());
        EXPECT_TRUE(Ink::ParseColour(names.substr(first, end - first))) << names.substr(first);
        first = end + 2;
    }
    EXPECT_EQ(count, 11);
}

TEST(Colour, AnythingElseIsNone)
{
    for (const char* text : {"", "#", "#12", "#1234", "#12345", "#1234567", "#123456789", "123456",
                             "#12345g", "#-1-2-3", "#+1+2+3", "# 12", "#0x1", "Red", "red ", "ink"})
        EXPECT_FALSE(Ink::ParseColour(text)) << text;
}

TEST(Colour, PremultipliedChannelsCarryTheAlpha)
{
    const std::array<float, 4> expected = {0.25f, 0.125f, 0.0f, 0.5f};
    EXPECT_EQ(Ink::Premultiplied({0.5f, 0.25f, 0.0f, 0.5f}), expected);
}

} // namespace
