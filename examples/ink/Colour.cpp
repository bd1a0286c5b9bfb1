#include "Colour.h"

#include <algorithm>
#include <charconv>
#include <iterator>

namespace Ink
{
namespace
{

struct NamedColour
{
    std::string_view name;
    std::string_view digits; // as behind a '#'
};

constexpr std::string_view kNames =
    "black, grey, white, red, orange, yellow, green, blue, violet, brown, transparent";

constexpr NamedColour kColours[] = {
    {"black", "000000"},  {"grey", "808080"},          {"white", "ffffff"}, {"red", "d62828"},
    {"orange", "f77f00"}, {"yellow", "ffd60a"},        {"green", "2d8a3e"}, {"blue", "1d4ed8"},
    {"violet", "7b2cbf"}, {"transparent", "00000000"}, {"brown", "7f4f24"},
};

/// A channel of one digit, which stands for itself twice, or of two; below 0 for anything else.
float Channel(std::string_view digits)
{
    int value = 0;
    const char* const end = digits.data() + digits.size();
    if (std::from_chars(digits.data(), end, value, 16).ptr != end || digits.front() == '-')
        return -1.0f;
    return static_cast<float>(digits.size() == 1 ? value * 17 : value) / 255.0f;
}

std::optional<Colour> ParseDigits(std::string_view digits)
{
    const std::size_t width = digits.size() == 3 ? 1 : 2; // digits a channel
    if (digits.size() != 3 && digits.size() != 6 && digits.size() != 8)
        return std::nullopt;
    float channels[4] = {0.0f, 0.0f, 0.0f, 1.0f};
    for (std::size_t i = 0; i < digits.size() / width; ++i)
        channels[i] = Channel(digits.substr(i * width, width));
    if (std::any_of(std::begin(channels), std::end(channels), [](float c) { return c < 0.0f; }))
        return std::nullopt;
    return Colour{channels[0], channels[1], channels[2], channels[3]};
}

} // namespace

std::array<float, 4> Premultiplied(const Colour& colour)
{
    return {colour.red * colour.alpha, colour.green * colour.alpha, colour.blue * colour.alpha,
            colour.alpha};
}

std::optional<Colour> ParseColour(std::string_view text)
{
    if (!text.empty() && text.front() == '#')
        return ParseDigits(text.substr(1));
    for (const NamedColour& colour : kColours)
        if (colour.name == text)
            return ParseDigits(colour.digits);
    return std::nullopt;
}

std::string_view ColourNames()
{
    return kNames;
}

} // namespace Ink
