#include "DrawCommand.h"

#include "InkSession.h"
#include "PngFile.h"
#include "Recording.h"
#include "Replay.h"
#include "UserError.h"
#include "XWindow.h"

#include <nib/nib.h>

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace
{

constexpr int kLargestPage = 16384;

struct DrawOptions
{
    std::vector<std::string> files;
    std::string output;
    std::string size = "1280x800";
    std::string scale = "fit";
    std::string speed = "1";
    bool window = false;
    bool keep = false;
};

struct Size
{
    int width;
    int height;
};

std::optional<int> ParseCount(std::string_view text)
{
    int number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size())
        return std::nullopt;
    return number;
}

Size ParseSize(const std::string& text)
{
    const std::size_t cross = text.find('x');
    const std::string_view all = text;
    if (cross != std::string::npos)
    {
        const std::optional<int> width = ParseCount(all.substr(0, cross));
        const std::optional<int> height = ParseCount(all.substr(cross + 1));
        const auto isPossible = [](const std::optional<int>& side)
        { return side && *side >= 1 && *side <= kLargestPage; };
        if (isPossible(width) && isPossible(height))
            return {*width, *height};
    }
    throw UserError("--size: '" + text + "' is not WIDTHxHEIGHT with sides from 1 to " +
                    std::to_string(kLargestPage));
}

/// Times the recorded speed; 0 for as fast as it goes.
double ParseSpeed(const std::string& text)
{
    if (text == "max")
        return 0.0;
    double speed = 0.0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), speed);
    if (error != std::errc() || end != text.data() + text.size() || !(speed >= 0.001) ||
        speed > 1.0e6)
        throw UserError("--speed: '" + text + "' is neither 'max' nor a factor such as 2 or 0.5");
    return speed;
}

/// All files as one recording, each behind the one before.
Ink::Recording ReadRecordings(const std::vector<std::string>& files)
{
    Ink::Recording all;
    double end = 0.0;
    for (const std::string& file : files)
    {
        Ink::Recording one = Ink::ReadRecording(file);
        const double shift = end - one.strokes.front().front().time;
        for (Ink::Stroke& stroke : one.strokes)
        {
            for (Ink::Sample& sample : stroke)
                sample.time += shift;
            end = stroke.back().time;
            all.strokes.push_back(std::move(stroke));
        }
    }
    return all;
}

/// A started render thread for the page. Without a window, EGL needs no display server.
std::unique_ptr<Nib::RenderThreadGL> StartThread(bool hasWindow)
{
    if (!hasWindow)
        setenv("EGL_PLATFORM", "surfaceless", 0);
    if (Nib::Egl::GetEglStatus() != 0 || !Nib::Egl::GetInstance()->GetConfig(false))
        throw UserError("EGL does not start here: no driver, or none with an RGBA8888 "
                        "configuration (NIB_LOG=info tells more)");
    std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::RendererFactory::CreateSurfaceRenderer("nib draw", Nib::RenderThreadGL::High));
    if (!thread->Start())
        throw UserError("the render thread does not start");
    return thread;
}

void CheckFor(const std::string& failure)
{
    if (!failure.empty())
        throw UserError("drawing failed: " + failure);
}

class Drawing
{
public:
    explicit Drawing(const DrawOptions& options)
        : m_options(options), m_size(ParseSize(options.size)), m_speed(ParseSpeed(options.speed)),
          m_recording(ReadRecordings(options.files))
    {
        if (options.scale == "fit")
            m_placement = Ink::FitToPage(m_recording, m_size.width, m_size.height);
    }

    void Run()
    {
        std::unique_ptr<XWindow> window;
        if (m_options.window)
            window = std::make_unique<XWindow>("nib draw", m_size.width, m_size.height);
        const std::unique_ptr<Nib::RenderThreadGL> thread = StartThread(m_options.window);
        {
            Ink::InkSession session(*thread, m_size.width, m_size.height, Ink::Colour{1, 1, 1, 1});
            if (window)
                session.AttachWindow(window->NativeWindow());
            CheckFor(session.Error());
            const Figures figures = Draw(session, window.get());
            CheckFor(session.Error());
            if (!m_options.output.empty())
                WritePng(m_options.output, session.ReadPixels(), m_size.width, m_size.height);
            Print(figures);
            if (window && m_options.keep)
                WaitUntilClosed(*window);
        }
        if (window)
            thread->OnSurfaceDestroyed();
    }

private:
    Figures Draw(Ink::InkSession& session, XWindow* window)
    {
        Pace pace;
        if (window)
        {
            session.Present(); // the empty page
            pace.speed = m_speed;
            pace.framePerSample = true;
            pace.isWanted = [window] { return window->IsOpen(); };
        }
        return Replay(session, m_recording, m_placement, m_style, pace);
    }

    static void Print(const Figures& figures)
    {
        std::printf("%d strokes, %d samples, %d frames\n", figures.strokes, figures.samples,
                    figures.frames);
        std::fflush(stdout);
    }

    static void WaitUntilClosed(XWindow& window)
    {
        while (window.IsOpen())
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }

    const DrawOptions& m_options;
    Size m_size;
    double m_speed;
    Ink::Recording m_recording;
    Ink::Placement m_placement;
    Ink::PenStyle m_style;
};

void RunDraw(const DrawOptions& options)
{
    if (options.output.empty() && !options.window)
        throw UserError("draw: say where to: -o PAGE.png, --window, or both");
    Drawing(options).Run();
}

} // namespace

void AddDrawCommand(CLI::App& app)
{
    CLI::App* const draw = app.add_subcommand("draw", "Draw recorded pen strokes");
    const auto options = std::make_shared<DrawOptions>();
    draw->add_option("FILE", options->files,
                     "Recordings: W3C InkML, or a pen log (time x y pressure on each line)")
        ->required();
    draw->add_option("-o,--output", options->output, "Write the page as PNG; needs no display");
    draw->add_flag("--window", options->window,
                   "Replay in a window of the X server named by DISPLAY");
    draw->add_option("--size", options->size, "Page size in pixels, WIDTHxHEIGHT")
        ->capture_default_str();
    draw->add_option("--scale", options->scale,
                     "fit: the ink fills the page; 1:1: recorded units are pixels")
        ->check(CLI::IsMember({"fit", "1:1"}))
        ->capture_default_str();
    draw->add_option("--speed", options->speed, "Times the recorded speed, or 'max'; for --window")
        ->capture_default_str();
    draw->add_flag("--keep", options->keep, "Leave the window open after the replay");
    draw->callback([options] { RunDraw(*options); });
}
