#include "Picture.h"
#include "RunNib.h"

#include <chrono>
#include <gtest/gtest.h>
#include <optional>
#include <string>
#include <X11/Xlib.h>
#include <X11/Xutil.h>

namespace
{

/// The X server, asked on a connection of the test's own: what it shows, not what GL says.
class Screen
{
public:
    Screen() : m_display(XOpenDisplay(nullptr)) {}
    ~Screen()
    {
        if (m_display)
            XCloseDisplay(m_display);
    }
    Screen(const Screen&) = delete;
    Screen& operator=(const Screen&) = delete;

    bool IsThere() const { return m_display; }

    std::optional<Window> WindowNamed(const std::string& name) const
    {
        Window root = 0, parent = 0, *children = nullptr;
        unsigned int count = 0;
        std::optional<Window> found;
        XQueryTree(m_display, DefaultRootWindow(m_display), &root, &parent, &children, &count);
        for (unsigned int i = 0; i < count && !found; ++i)
        {
            char* title = nullptr;
            if (XFetchName(m_display, children[i], &title) && title && title == name)
                found = children[i];
            XFree(title);
        }
        XFree(children);
        return found;
    }

    Picture Content(Window window, int width, int height) const
    {
        XImage* const image = XGetImage(m_display, window, 0, 0, static_cast<unsigned>(width),
                                        static_cast<unsigned>(height), AllPlanes, ZPixmap);
        Picture picture{width, height, {}};
        for (int y = 0; image && y < height; ++y)
            for (int x = 0; x < width; ++x)
            {
                const unsigned long pixel = XGetPixel(image, x, y);
                for (const int shift : {16, 8, 0})
                    picture.pixels.push_back(static_cast<std::uint8_t>(pixel >> shift));
                picture.pixels.push_back(255);
            }
        if (image)
            XDestroyImage(image);
        return picture;
    }

private:
    Display* m_display;
};

/// What the server shows once it equals @p expected; after 20 seconds, whatever it shows then. The
/// frames travel on another connection than the test's questions, so the last may still be under
/// way when the tool says that it is done.
Picture ContentOnceEqual(const Screen& screen, Window window, const Picture& expected)
{
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    Picture shown;
    do
        shown = screen.Content(window, expected.width, expected.height);
    while (LargestDifference(shown, expected) > 1 && std::chrono::steady_clock::now() < deadline);
    return shown;
}

void ExpectWindowEqualsPage(const std::string& file)
{
    Screen screen;
    if (!screen.IsThere())
        GTEST_SKIP() << "no X server: DISPLAY is unset or does not answer";
    TemporaryFolder folder;
    const std::string page = folder.Path("page.png");
    const std::string alone = folder.Path("alone.png");

    RunningNib nib({"draw", file, "--window", "--speed", "max", "--keep", "-o", page});
    const std::string figures = nib.ReadLine(); // printed when all is drawn and written
    ASSERT_NE(figures.find("strokes"), std::string::npos) << nib.Finish().err;
    const std::optional<Window> window = screen.WindowNamed("nib draw");
    ASSERT_TRUE(window);
    const Picture expected = LoadPng(page);
    EXPECT_LE(LargestDifference(ContentOnceEqual(screen, *window, expected), expected), 1);

    ASSERT_EQ(RunNib({"draw", file, "-o", alone}, {{"DISPLAY", ""}}).status, 0);
    EXPECT_LE(LargestDifference(LoadPng(alone), expected), 1);
}

TEST(Window, ShowsThePageOfTheSample)
{
    ExpectWindowEqualsPage(NIB_SAMPLE);
}

TEST(Window, ShowsThirtySecondsOfPainting)
{
    const std::string file = FurtherRecording("libmypaint/painting30sec.dat");
    if (file.empty())
        GTEST_SKIP() << "NIB_STROKES does not name the folder of further recordings";
    ExpectWindowEqualsPage(file);
}

TEST(Window, ClosesWhenItsUserAsks)
{
    Screen screen;
    if (!screen.IsThere())
        GTEST_SKIP() << "no X server: DISPLAY is unset or does not answer";
    RunningNib nib({"draw", NIB_SAMPLE, "--window", "--speed", "max", "--keep"});
    ASSERT_NE(nib.ReadLine().find("strokes"), std::string::npos);
    const std::optional<Window> window = screen.WindowNamed("nib draw");
    ASSERT_TRUE(window);

    Display* const display = XOpenDisplay(nullptr);
    XEvent close{};
    close.xclient.type = ClientMessage;
    close.xclient.window = *window;
    close.xclient.message_type = XInternAtom(display, "WM_PROTOCOLS", False);
    close.xclient.format = 32;
    close.xclient.data.l[0] = static_cast<long>(XInternAtom(display, "WM_DELETE_WINDOW", False));
    XSendEvent(display, *window, False, NoEventMask, &close);
    XCloseDisplay(display);

    const NibResult result = nib.Finish();
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

TEST(FrontBuffer, SaysWhyNotAndDrawsFrames)
{
    Screen screen;
    if (!screen.IsThere())
        GTEST_SKIP() << "no X server: DISPLAY is unset or does not answer";
    TemporaryFolder folder;
    const NibResult result = RunNib({"draw", NIB_SAMPLE, "--window", "--speed", "max",
                                     "--front-buffer", "-o", folder.Path("page.png")});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "nib: --front-buffer: the display has no EGL_KHR_mutable_render_buffer; "
                          "drawing frames instead\n");
    EXPECT_NE(result.out.find("433 frames"), std::string::npos);
}

} // namespace
