#include "Hand.h"
#include "Picture.h"
#include "Recording.h"
#include "RunNib.h"
#include "TestScreen.h"

#include <chrono>
#include <cstdio>
#include <gtest/gtest.h>
#include <map>
#include <optional>
#include <string>
#include <X11/keysym.h>

namespace
{

constexpr int kWidth = 400;
constexpr int kHeight = 300;

const std::vector<Spot> kHook = {{60, 50},   {80, 90},   {100, 130},
                                 {140, 150}, {180, 140}, {200, 100}};
const std::vector<Spot> kBar = {{250, 200}, {280, 205}, {310, 200}, {340, 210}};

/// A running `nib draw --live` with its window, and a hand to draw with.
class Live : public testing::Test
{
protected:
    void SetUp() override
    {
        if (!m_screen.IsThere())
            GTEST_SKIP() << "no X server: DISPLAY is unset or does not answer";
        m_hand.emplace(m_screen.Connection());
        if (!m_hand->IsThere())
            GTEST_SKIP() << "the X server has no XTEST extension";
    }

    void Start(std::vector<std::string> arguments = {})
    {
        arguments.insert(arguments.end(), m_style.begin(), m_style.end());
        arguments.insert(arguments.begin(), {"draw", "--live", "--size", "400x300"});
        m_nib.emplace(arguments, m_environment);
        ASSERT_NE(m_nib->ReadLine().find("Ctrl-S saves"), std::string::npos) << m_nib->Finish().err;
        m_window = m_screen.WindowNamed("nib draw");
        ASSERT_TRUE(m_window);
    }

    void StartSavingTo(const std::string& picture) { Start({"-o", picture}); }

    Hand& TheHand() { return *m_hand; }
    RunningNib& Nib() { return *m_nib; }

    NibResult Close()
    {
        m_screen.AskToClose(*m_window);
        return m_nib->Finish();
    }

    void ExpectShown(const Picture& expected)
    {
        const Picture shown = m_screen.ContentOnceEqual(*m_window, expected);
        EXPECT_LE(LargestDifference(shown, expected), 1);
    }

    /// The page of these strokes as the tool draws it from a file, without a display.
    Picture PageOf(const std::vector<std::vector<Spot>>& strokes, int width = kWidth,
                   int height = kHeight) const
    {
        if (strokes.empty())
            return Blank(width, height);
        std::string text = "<ink xmlns=\"http://www.w3.org/2003/InkML\">";
        for (const std::vector<Spot>& stroke : strokes)
        {
            text += "<trace>";
            for (const Spot& spot : stroke)
                text += (&spot == stroke.data() ? "" : ", ") + std::to_string(spot.x) + " " +
                        std::to_string(spot.y);
            text += "</trace>";
        }
        return PageOfFile(m_folder.Write("expected.inkml", text + "</ink>"), "1:1", width, height);
    }

    Picture PageOfFile(const std::string& file, const std::string& scale, int width,
                       int height) const
    {
        const std::string page = m_folder.Path("expected.png");
        const std::string size = std::to_string(width) + "x" + std::to_string(height);
        std::vector<std::string> arguments = {"draw",   file, "--scale", scale,
                                              "--size", size, "-o",      page};
        arguments.insert(arguments.end(), m_style.begin(), m_style.end());
        const NibResult result = RunNib(arguments, {{"DISPLAY", ""}});
        EXPECT_EQ(result.status, 0) << result.err;
        return LoadPng(page);
    }

    static Picture Blank(int width, int height)
    {
        const std::size_t count =
            static_cast<std::size_t>(width) * static_cast<std::size_t>(height);
        return {width, height, std::vector<std::uint8_t>(count * 4, 255)};
    }

    std::vector<std::string> m_style; ///< options of the live page and of those it is compared with
    std::map<std::string, std::string> m_environment;
    TestScreen m_screen;
    TemporaryFolder m_folder;
    std::optional<Hand> m_hand; // ended before the connection
    std::optional<RunningNib> m_nib;
    std::optional<Window> m_window;
};

std::vector<std::vector<Spot>> SpotsOf(const std::string& inkMl)
{
    std::vector<std::vector<Spot>> strokes;
    for (const Ink::Stroke& stroke : Ink::ReadRecording(inkMl).strokes)
    {
        strokes.emplace_back();
        for (const Ink::Sample& sample : stroke)
            strokes.back().push_back({static_cast<int>(sample.x), static_cast<int>(sample.y)});
    }
    return strokes;
}

/// What the tool makes of @p stroke: the release is a report of its own, where the pen was last.
std::vector<Spot> Reported(std::vector<Spot> stroke)
{
    stroke.push_back(stroke.back());
    return stroke;
}

TEST_F(Live, StartsWithAnEmptyPage)
{
    Start();
    ExpectShown(Blank(kWidth, kHeight));
    const NibResult result = Close();
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(result.out.rfind("0 strokes, 0 samples, ", 0), 0u) << result.out;
}

TEST_F(Live, ShowsWhatTheMouseWrites)
{
    Start();
    TheHand().Write(kHook);
    TheHand().Write(kBar);
    const Picture expected = PageOf({kHook, kBar});
    EXPECT_TRUE(expected.IsInk(100, 130));
    ExpectShown(expected);
}

TEST_F(Live, MotionWithoutAButtonWritesNothing)
{
    Start();
    for (const Spot& spot : kHook)
        TheHand().MoveTo(spot);
    TheHand().Write(kBar);
    ExpectShown(PageOf({kBar}));
    EXPECT_NE(Close().out.find("1 strokes, 5 samples"), std::string::npos);
}

TEST_F(Live, SavesPictureAndInk)
{
    const std::string picture = m_folder.Path("page.png"), ink = m_folder.Path("page.inkml");
    StartSavingTo(picture);
    TheHand().Write(kHook);
    TheHand().Write(kBar);
    TheHand().TypeWithControl(XK_s);
    EXPECT_EQ(Nib().ReadLine(), "saved " + picture + " and " + ink);
    EXPECT_EQ(m_folder.Files(), (std::vector<std::string>{"page.inkml", "page.png"}));

    ExpectShown(LoadPng(picture));
    EXPECT_LE(LargestDifference(LoadPng(picture), PageOf({kHook, kBar})), 1);
    EXPECT_LE(LargestDifference(LoadPng(picture), PageOfFile(ink, "1:1", kWidth, kHeight)), 1);
    EXPECT_EQ(SpotsOf(ink), (std::vector<std::vector<Spot>>{Reported(kHook), Reported(kBar)}));
    double last = 0.0;
    for (const Ink::Stroke& stroke : Ink::ReadRecording(ink).strokes)
        for (const Ink::Sample& sample : stroke)
        {
            EXPECT_GE(sample.time, last);
            EXPECT_LT(sample.time, 60.0); // seconds since the first report
            EXPECT_EQ(sample.pressure, 0.5f);
            EXPECT_EQ(sample.altitude, 90.0f);
            last = sample.time;
        }
}

TEST_F(Live, ThePageMayBeSavedEmptyAndOpenedAgain)
{
    const std::string picture = m_folder.Path("page.png"), ink = m_folder.Path("page.inkml");
    StartSavingTo(picture);
    TheHand().TypeWithControl(XK_s);
    EXPECT_EQ(Nib().ReadLine(), "saved " + picture + " and " + ink);
    ASSERT_EQ(Close().status, 0);

    Start({"-o", picture, ink});
    ExpectShown(Blank(kWidth, kHeight));
    TheHand().Write(kBar);
    ExpectShown(PageOf({kBar}));
    EXPECT_NE(Close().out.find("1 strokes, 5 samples"), std::string::npos);
}

TEST_F(Live, ClosingSavesWhatIsNotSavedYet)
{
    const std::string picture = m_folder.Path("page.png"), ink = m_folder.Path("page.inkml");
    StartSavingTo(picture);
    TheHand().Write(kHook);
    TheHand().TypeWithControl(XK_s);
    Nib().ReadLine();
    TheHand().Write(kBar);
    EXPECT_EQ(
        Close().out.rfind("saved " + picture + " and " + ink + "\n2 strokes, 12 samples, ", 0), 0u);
    EXPECT_LE(LargestDifference(LoadPng(picture), PageOf({kHook, kBar})), 1);
}

TEST_F(Live, AClosedPageThatIsSavedIsNotWrittenAgain)
{
    StartSavingTo(m_folder.Path("page.png"));
    TheHand().Write(kHook);
    TheHand().TypeWithControl(XK_s);
    Nib().ReadLine();
    EXPECT_EQ(Close().out.rfind("1 strokes, 7 samples, ", 0), 0u);
}

TEST_F(Live, ASaveThatFailsLeavesThePage)
{
    const std::string picture = m_folder.Path("nowhere/page.png");
    StartSavingTo(picture);
    TheHand().Write(kHook);
    TheHand().TypeWithControl(XK_s);
    TheHand().Write(kBar);
    ExpectShown(PageOf({kHook, kBar}));
    const NibResult result = Close();
    EXPECT_EQ(result.status, 2); // the save at the end fails, too
    const std::string line =
        "nib: " + picture + ":1: cannot be written: No such file or directory\n";
    EXPECT_EQ(result.err, line + line);
}

TEST_F(Live, CoalescesMotionIntoFramesWithoutLoss)
{
    const std::string picture = m_folder.Path("page.png"), ink = m_folder.Path("page.inkml");
    StartSavingTo(picture);
    std::vector<Spot> spiral;
    for (int i = 0; i < 400; ++i)
        spiral.push_back({20 + (i * 7) % 360, 20 + (i * 3) % 260});

    Nib().Stop(); // everything has come in when it goes on
    TheHand().Write(spiral);
    Nib().Continue();
    const NibResult result = Close();

    EXPECT_EQ(SpotsOf(ink), std::vector<std::vector<Spot>>{Reported(spiral)});
    EXPECT_LE(LargestDifference(LoadPng(picture), PageOf({spiral})), 1);
    int strokes = 0, samples = 0, frames = 0;
    const std::size_t figures = result.out.find('\n') + 1; // behind "saved"
    ASSERT_EQ(std::sscanf(result.out.c_str() + figures, "%d strokes, %d samples, %d frames",
                          &strokes, &samples, &frames),
              3);
    EXPECT_EQ(strokes, 1);
    EXPECT_EQ(samples, 401);
    EXPECT_LE(frames, 20); // far fewer than reports: the socket may hand them over in a few parts
}

TEST_F(Live, UndoTakesTheLastStroke)
{
    Start();
    TheHand().Write(kHook);
    TheHand().Write(kBar);
    ExpectShown(PageOf({kHook, kBar}));
    TheHand().TypeWithControl(XK_z);
    ExpectShown(PageOf({kHook}));
    TheHand().TypeWithControl(XK_z);
    ExpectShown(PageOf({}));
    TheHand().TypeWithControl(XK_z); // nothing left to take
    TheHand().Write(kBar);
    ExpectShown(PageOf({kBar}));
}

TEST_F(Live, UndoOfAStrokeInTheMakingDropsItsRest)
{
    Start();
    TheHand().Write(kBar);
    TheHand().MoveTo(kHook[0]);
    TheHand().Press();
    TheHand().MoveTo(kHook[1]);
    TheHand().MoveTo(kHook[2]);
    TheHand().TypeWithControl(XK_z);
    TheHand().MoveTo(kHook[3]);
    TheHand().Release();
    ExpectShown(PageOf({kBar}));
    EXPECT_NE(Close().out.find("1 strokes, 5 samples"), std::string::npos);
}

TEST_F(Live, ClearTakesEverythingAndUndoBringsItBack)
{
    Start();
    for (const KeySym key : {XK_n, XK_Delete})
    {
        TheHand().Write(kHook);
        TheHand().Write(kBar);
        ExpectShown(PageOf({kHook, kBar}));
        key == XK_Delete ? TheHand().Type(key) : TheHand().TypeWithControl(key);
        ExpectShown(PageOf({}));
        TheHand().TypeWithControl(XK_z);
        ExpectShown(PageOf({kHook, kBar}));
        TheHand().TypeWithControl(XK_n);
    }
}

TEST_F(Live, ResizingKeepsTheInk)
{
    const std::string picture = m_folder.Path("page.png");
    StartSavingTo(picture);
    TheHand().Write(kHook);
    TheHand().Write(kBar);
    ExpectShown(PageOf({kHook, kBar}));
    for (const Spot& size : {Spot{640, 420}, Spot{230, 160}, Spot{500, 333}})
    {
        XResizeWindow(m_screen.Connection(), *m_window, size.x, size.y);
        ExpectShown(PageOf({kHook, kBar}, size.x, size.y));
    }
    const std::vector<Spot> beyond = {{420, 310}, {450, 300}, {480, 310}}; // outside the first size
    TheHand().Write(beyond);
    ExpectShown(PageOf({kHook, kBar, beyond}, 500, 333));
    EXPECT_EQ(Close().status, 0);
    EXPECT_LE(LargestDifference(LoadPng(picture), PageOf({kHook, kBar, beyond}, 500, 333)), 1);
}

TEST_F(Live, ResizingInTheMiddleOfAStrokeGoesOnWithIt)
{
    Start();
    TheHand().MoveTo(kHook[0]);
    TheHand().Press();
    TheHand().MoveTo(kHook[1]);
    TheHand().MoveTo(kHook[2]);
    XResizeWindow(m_screen.Connection(), *m_window, 450, 350);
    for (std::size_t i = 3; i < kHook.size(); ++i)
        TheHand().MoveTo(kHook[i]);
    TheHand().Release();
    ExpectShown(PageOf({kHook}, 450, 350));
}

TEST_F(Live, WhatAnotherWindowCoveredIsShownAgain)
{
    Start();
    TheHand().Write(kHook);
    const Picture expected = PageOf({kHook});
    ExpectShown(expected);
    Display* const display = m_screen.Connection();
    const Window cover =
        XCreateSimpleWindow(display, DefaultRootWindow(display), 40, 40, 200, 150, 0, 0, 0x00FF00);
    XMapRaised(display, cover);
    XSync(display, False);
    XDestroyWindow(display, cover);
    ExpectShown(expected);
}

TEST_F(Live, EveryBrushDrawsTheSamePageAsFromAFile)
{
    const std::vector<Spot> across = {{60, 130}, {100, 125}, {140, 120}, {180, 125}};
    for (const char* brush : {"pen", "marker", "stamp"})
    {
        m_style = {"--brush", brush, "--color", "#a03060", "--width", "14", "--paper", "#ffffe0"};
        Start();
        TheHand().Write(kHook);
        TheHand().Write(across);
        const Picture both = PageOf({kHook, across});
        EXPECT_GT(LargestDifference(both, PageOf({kHook})), 30) << brush;
        ExpectShown(both);
        TheHand().TypeWithControl(XK_z);
        ExpectShown(PageOf({kHook}));
        EXPECT_EQ(Close().status, 0);
        m_nib.reset();
    }
}

TEST_F(Live, AMarkersStrokeGoesOnOverAnotherSize)
{
    m_style = {"--brush", "marker", "--width", "20"};
    Start();
    TheHand().Write(kBar);
    TheHand().MoveTo(kHook[0]);
    TheHand().Press();
    TheHand().MoveTo(kHook[1]);
    TheHand().MoveTo(kHook[2]);
    TheHand().MoveTo(kHook[3]);
    XResizeWindow(m_screen.Connection(), *m_window, 450, 350);
    for (std::size_t i = 4; i < kHook.size(); ++i)
        TheHand().MoveTo(kHook[i]);
    TheHand().Release();
    ExpectShown(PageOf({kBar, kHook}, 450, 350));
}

TEST_F(Live, WithoutAFrontBufferItSaysSoAndDrawsFrames)
{
    Start({"--front-buffer"});
    TheHand().Write(kHook);
    ExpectShown(PageOf({kHook}));
    EXPECT_EQ(Close().err, "nib: --front-buffer: the display has no EGL_KHR_mutable_render_buffer; "
                           "drawing frames instead\n");
}

// ---- the end, in the middle of a stroke ---------------------------------------------------------

class LiveEnd : public Live
{
protected:
    /// Writes all of kHook but lets the button down.
    void BeginStroke()
    {
        StartSavingTo(m_folder.Path("page.png"));
        TheHand().MoveTo(kHook[0]);
        TheHand().Press();
        for (std::size_t i = 1; i < kHook.size(); ++i)
            TheHand().MoveTo(kHook[i]);
    }

    /// With the last place the way to the one before has become certain, and is shown.
    void WaitUntilAllIsTaken() const
    {
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
        while (!IsInkAround(kHook[kHook.size() - 2]))
            ASSERT_LT(std::chrono::steady_clock::now(), deadline);
    }

    bool IsInkAround(const Spot& spot) const
    {
        const Picture shown = m_screen.Content(*m_window, kWidth, kHeight);
        for (int y = spot.y - 4; y <= spot.y + 4; ++y)
            for (int x = spot.x - 4; x <= spot.x + 4; ++x)
                if (shown.IsInk(x, y))
                    return true;
        return false;
    }

    /// A frame may be under way to a window that is gone; see the file.
    void AllowDriverLeaks()
    {
        m_environment["LSAN_OPTIONS"] =
            "print_suppressions=0:suppressions=" NIB_TOOL_TESTS "/lsan.supp";
    }

    /// The program ended as such, and all that had come in is in its files.
    void ExpectClean(const NibResult& result)
    {
        EXPECT_EQ(result.status, 0);
        EXPECT_EQ(result.err, "");
        EXPECT_NE(result.out.find("1 strokes, 6 samples"), std::string::npos) << result.out;
        EXPECT_EQ(SpotsOf(m_folder.Path("page.inkml")), std::vector<std::vector<Spot>>{kHook});
        EXPECT_LE(LargestDifference(LoadPng(m_folder.Path("page.png")), PageOf({kHook})), 1);
    }
};

TEST_F(LiveEnd, OfTheWindowByItsUser)
{
    BeginStroke();
    ExpectClean(Close());
}

TEST_F(LiveEnd, OfTheWindowByAnotherProgram)
{
    AllowDriverLeaks();
    BeginStroke();
    XDestroyWindow(m_screen.Connection(), *m_window);
    XSync(m_screen.Connection(), False);
    ExpectClean(Nib().Finish());
}

TEST_F(LiveEnd, OfTheConnection)
{
    AllowDriverLeaks();
    BeginStroke();
    WaitUntilAllIsTaken(); // a connection that breaks takes with it what was not read from it
    XKillClient(m_screen.Connection(), *m_window);
    XSync(m_screen.Connection(), False);
    ExpectClean(Nib().Finish());
}

// ---- what it starts from ------------------------------------------------------------------------

TEST_F(Live, OpensARecordingAsThePagesStart)
{
    const std::string picture = m_folder.Path("page.png"), ink = m_folder.Path("page.inkml");
    Start({NIB_SAMPLE, "-o", picture});
    const Picture opened = PageOfFile(NIB_SAMPLE, "fit", kWidth, kHeight);
    ExpectShown(opened);
    TheHand().Write(kBar);
    TheHand().TypeWithControl(XK_z);
    TheHand().TypeWithControl(XK_z); // leaves what was opened
    ExpectShown(opened);
    TheHand().Write(kBar);
    EXPECT_EQ(Close().status, 0);

    const Ink::Recording sample = Ink::ReadRecording(NIB_SAMPLE);
    const Ink::Recording saved = Ink::ReadRecording(ink);
    ASSERT_EQ(saved.strokes.size(), sample.strokes.size() + 1);
    for (std::size_t i = 0; i < sample.strokes.size(); ++i)
        EXPECT_EQ(saved.strokes[i].size(), sample.strokes[i].size());
    EXPECT_EQ(saved.strokes.back().size(), 5u);
    EXPECT_GE(saved.strokes.back().front().time, sample.strokes.back().back().time);
    EXPECT_LE(LargestDifference(LoadPng(picture), PageOfFile(ink, "1:1", kWidth, kHeight)), 1);
}

TEST(LiveOptions, AreCheckedBeforeAnyWindowOpens)
{
    struct Row
    {
        std::vector<std::string> arguments;
        const char* message;
    };
    const Row rows[] = {
        {{"draw", "--live", "--window"}, "--live"},
        {{"draw", "--live", "--keep"}, "--live"},
        {{"draw", "--live", "--json"}, "--live"},
        {{"draw", "--live", "--speed", "max"}, "--live"},
        {{"draw", "--live", "--export", "2"}, "--live"},
        {{"draw", "--live", "--lose-context", "every:9"}, "--live"},
        {{"draw", "--live", "-o", "page.inkml"}, "-o: 'page.inkml' is the name for the ink"},
        {{"draw", "--live", "--size", "0x9"}, "--size"},
        {{"draw", "--live", "missing.inkml"}, "missing.inkml:1: cannot be read"},
        {{"draw", "-o", "page.png"}, "FILE is required, unless --live opens an empty page"},
    };
    for (const Row& row : rows)
    {
        const NibResult result = RunNib(row.arguments, {{"DISPLAY", ""}});
        EXPECT_EQ(result.status, 2);
        EXPECT_NE(result.err.find(row.message), std::string::npos) << result.err;
        EXPECT_EQ(result.out, "");
    }
}

TEST(LiveOptions, NeedADisplay)
{
    const NibResult result = RunNib({"draw", "--live"}, {{"DISPLAY", ""}});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: --live: there is no display (DISPLAY is unset, or its server does "
                          "not answer)\n");
}

} // namespace
