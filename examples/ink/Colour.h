#ifndef INK_COLOUR_H
#define INK_COLOUR_H

#include <array>
#include <optional>
#include <string_view>

namespace Ink
{

/// A colour with straight (not premultiplied) alpha, each channel from 0 to 1.
struct Colour
{
    float red = 0.0f;
    float green = 0.0f;
    float blue = 0.0f;
    float alpha = 1.0f;
};

/// Red, green and blue multiplied with alpha, then alpha: as blending wants it.
std::array<float, 4> Premultiplied(const Colour& colour);

/// "#rgb", "#rrggbb" or "#rrggbbaa" in hexadecimal digits, or one of ColourNames(). Nothing for any
/// other text.
std::optional<Colour> ParseColour(std::string_view text);

/// The names that ParseColour knows, with ", " between them.
std::string_view ColourNames();

} // namespace Ink

#endif
