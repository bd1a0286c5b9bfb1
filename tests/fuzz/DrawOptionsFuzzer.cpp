#include "Expect.h"

#include "DrawCommand.h"
#include "UserError.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

// The command line of `nib draw`, an argument a line. Whatever is accepted is in its range, and is
// what a plain second reading of the text gives.

namespace
{

std::vector<std::string> Lines(const std::string& text)
{
    std::vector<std::string> lines(1);
    for (const char letter : text)
    {
        if (letter == '\n')
            lines.emplace_back();
        else
            lines.back() += letter;
    }
    return lines;
}

/// @p number as it may be written: with further zeros in front.
bool Writes(const std::string& text, int number)
{
    const std::size_t first = text.find_first_not_of('0');
    return first != std::string::npos && text.substr(first) == std::to_string(number);
}

void CheckSize(const std::string& text)
{
    const PageSize size = ParseSize(text);
    Nib::Expect(size.width >= 1 && size.width <= 16384, "the width is 1 to 16384");
    Nib::Expect(size.height >= 1 && size.height <= 16384, "the height is 1 to 16384");
    const std::size_t cross = text.find('x');
    Nib::Expect(Writes(text.substr(0, cross), size.width), "the width is the one written");
    Nib::Expect(Writes(text.substr(cross + 1), size.height), "the height is the one written");
}

void CheckSpeed(const std::string& text)
{
    const double speed = ParseSpeed(text);
    if (text == "max")
        Nib::Expect(speed == 0.0, "the greatest speed is 0");
    else
        Nib::Expect(speed >= 0.001 && speed <= 1.0e6, "the speed is 0.001 to 1000000");
}

void CheckLoseContext(const std::string& text)
{
    const int every = ParseLoseContext(text);
    if (text.empty())
        Nib::Expect(every == 0, "no loss is 0");
    else
        Nib::Expect(every >= 1 && Writes(text.substr(6), every), "the samples are those written");
}

void CheckColour(const Ink::Colour& colour)
{
    for (const float part : {colour.red, colour.green, colour.blue, colour.alpha})
        Nib::Expect(part >= 0.0f && part <= 1.0f, "each part of a colour is 0 to 1");
}

void CheckStyle(const DrawOptions& options)
{
    const Ink::BrushStyle style = StyleOf(options);
    Nib::Expect(style.width > 0.0f && style.width <= 1000.0f, "the width is above 0");
    CheckColour(style.colour);
    CheckColour(ParseColourOption("--paper", options.paper));
}

void CheckOptions(const DrawOptions& options)
{
    Nib::Expect(options.live || !options.files.empty(), "there is a file");
    Nib::Expect(options.live || options.window || !options.output.empty(),
                "there is a place to draw");
    Nib::Expect(options.exportedPages >= 0 && options.exportedPages <= 10000, "the pages' number");
    Nib::Expect(options.scale == "fit" || options.scale == "1:1", "the scale is one of two");
    CheckSize(options.size);
    if (options.speed)
        CheckSpeed(*options.speed);
    CheckStyle(options);
    CheckLoseContext(options.loseContext);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    std::vector<std::string> arguments =
        Lines(std::string(reinterpret_cast<const char*>(data), size));
    CLI::App app("fuzzed", "nib");
    app.require_subcommand(1);
    AddDrawCommand(app, CheckOptions);
    try
    {
        // The parser takes them from the back.
        app.parse(std::vector<std::string>(arguments.rbegin(), arguments.rend()));
    }
    catch (const CLI::ParseError&)
    {
    }
    catch (const UserError& error)
    {
        Nib::Expect(!std::string(error.what()).empty(), "the error says what is wrong");
    }
    return 0;
}
