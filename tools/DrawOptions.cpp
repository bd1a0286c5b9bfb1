#include "DrawOptions.h"

#include "UserError.h"

#include <charconv>
#include <optional>
#include <string_view>

namespace
{

constexpr int kLargestSide = 16384;
constexpr float kWidest = 1000.0f;
constexpr float kFinest = 0.1f;

template <typename Number>
std::optional<Number> ParseNumber(std::string_view text)
{
    Number number{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size())
        return std::nullopt;
    return number;
}

float ParseWidth(const std::string& text)
{
    const std::optional<float> width = ParseNumber<float>(text);
    if (!width || !(*width >= kFinest) || !(*width <= kWidest))
        throw UserError("--width: '" + text + "' is not a number of pixels from 0.1 to 1000");
    return *width;
}

} // namespace

PageSize ParseSize(const std::string& text)
{
    const std::string_view all = text;
    const std::size_t cross = all.find('x');
    if (cross != std::string_view::npos)
    {
        const std::optional<int> width = ParseNumber<int>(all.substr(0, cross));
        const std::optional<int> height = ParseNumber<int>(all.substr(cross + 1));
        const auto isPossible = [](const std::optional<int>& side)
        { return side && *side >= 1 && *side <= kLargestSide; };
        if (isPossible(width) && isPossible(height))
            return {*width, *height};
    }
    throw UserError("--size: '" + text + "' is not WIDTHxHEIGHT with sides from 1 to " +
                    std::to_string(kLargestSide));
}

double ParseSpeed(const std::string& text)
{
    if (text == "max")
        return 0.0;
    const std::optional<double> speed = ParseNumber<double>(text);
    if (!speed || !(*speed >= 0.001) || !(*speed <= 1.0e6))
        throw UserError("--speed: '" + text + "' is neither 'max' nor a factor such as 2 or 0.5");
    return *speed;
}

int ParseLoseContext(const std::string& text)
{
    if (text.empty())
        return 0;
    constexpr std::string_view kEvery = "every:";
    const std::string_view all = text;
    if (all.substr(0, kEvery.size()) == kEvery)
    {
        const std::optional<int> samples = ParseNumber<int>(all.substr(kEvery.size()));
        if (samples && *samples >= 1)
            return *samples;
    }
    throw UserError("--lose-context: '" + text + "' is not every:N with N from 1");
}

Ink::BrushStyle StyleOf(const DrawOptions& options)
{
    const std::optional<Ink::BrushKind> kind = Ink::BrushNamed(options.brush);
    if (!kind)
        throw UserError("--brush: '" + options.brush + "' is none of pen, marker, stamp");
    Ink::BrushStyle style = Ink::DefaultStyle(*kind);
    if (options.colour)
        style.colour = ParseColourOption("--color", *options.colour);
    if (options.width)
        style.width = ParseWidth(*options.width);
    return style;
}

Ink::Colour ParseColourOption(const std::string& option, const std::string& text)
{
    const std::optional<Ink::Colour> colour = Ink::ParseColour(text);
    if (!colour)
        throw UserError(option + ": '" + text +
                        "' is neither #rgb, #rrggbb, #rrggbbaa nor one of " +
                        std::string(Ink::ColourNames()));
    return *colour;
}
