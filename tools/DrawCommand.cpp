#include "DrawCommand.h"

#include "UserError.h"

#include <memory>
#include <utility>

namespace
{

void Check(const DrawOptions& options)
{
    if (options.live)
        return;
    if (options.files.empty())
        throw UserError("draw: FILE is required, unless --live opens an empty page");
    if (options.output.empty() && !options.window)
        throw UserError("draw: say where to: -o PAGE.png, --window, or both; or --live");
    if (options.exportedPages != 0 && options.output.empty())
        throw UserError("--export: say where to: -o PAGE.png");
    if (options.frontBuffer && !options.window)
        throw UserError("--front-buffer: only a window has one; add --window or --live");
}

} // namespace

void AddDrawCommand(CLI::App& app, std::function<void(const DrawOptions&)> run)
{
    CLI::App* const draw = app.add_subcommand("draw", "Draw recorded pen strokes");
    const auto options = std::make_shared<DrawOptions>();
    draw->add_option("FILE", options->files,
                     "Recordings: InkML, tablet samples, pointer events; known by their content");
    draw->add_option("-o,--output", options->output, "Write the page as PNG; needs no display");
    draw->add_flag("--window", options->window,
                   "Replay in a window of the X server named by DISPLAY");
    CLI::Option* const live = draw->add_flag(
        "--live", options->live,
        "Draw with mouse and pen in a window, on top of FILE if there is one. Ctrl-Z takes the "
        "last step back, Ctrl-N or Delete clears the page, Ctrl-S saves it as PAGE.png and "
        "PAGE.inkml; with -o, closing the window saves it, too");
    draw->add_option("--size", options->size, "Page size in pixels, WIDTHxHEIGHT")
        ->capture_default_str();
    draw->add_option("--scale", options->scale,
                     "fit: the ink fills the page; 1:1: recorded units are pixels")
        ->check(CLI::IsMember({"fit", "1:1"}))
        ->capture_default_str();
    draw->add_option("--brush", options->brush, "pen, marker (translucent) or stamp (textured)")
        ->capture_default_str();
    draw->add_option("--color", options->colour,
                     "Of the ink: #rgb, #rrggbb, #rrggbbaa or a name such as 'red'; each brush has "
                     "one of its own");
    draw->add_option("--width", options->width,
                     "Of a stroke at full pressure, in pixels; each brush has one of its own");
    draw->add_option("--paper", options->paper, "Colour of the page, given like --color")
        ->capture_default_str();
    draw->add_option("--speed", options->speed,
                     "Show frames, one a sample, at this many times the recorded speed, or as fast "
                     "as they go for 'max'; without a window on an offscreen screen. A window's is "
                     "1 unless given");
    draw->add_flag("--json{-}", options->json,
                   "Print the figures of the run as JSON; --json=FILE writes them there");
    draw->add_flag("--keep", options->keep, "Leave the window open after the replay");
    draw->add_flag("--front-buffer", options->frontBuffer,
                   "Draw into the window's visible buffer where the device can");
    draw->add_option("--export", options->exportedPages,
                     "Meanwhile draw the strokes, split over this many pages, in the background "
                     "into PAGE-1.png, PAGE-2.png, ...")
        ->check(CLI::Range(1, 10000));
    draw->add_option("--lose-context", options->loseContext,
                     "Draw on a background thread that loses its GL context; every:N samples");
    draw->add_option("--trace", options->trace,
                     "Write what each thread does, and when, into this file, which Perfetto opens");
    for (const char* replay :
         {"--window", "--speed", "--keep", "--json", "--export", "--lose-context"})
        live->excludes(replay);
    draw->callback(
        [options, run = std::move(run)]
        {
            Check(*options);
            run(*options);
        });
}
