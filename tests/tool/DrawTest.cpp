#include "BrushStyle.h"
#include "Picture.h"
#include "Recording.h"
#include "RunNib.h"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <sstream>
#include <string>
#include <sys/stat.h>
#include <unistd.h>

namespace
{

const std::map<std::string, std::string> kNoDisplay = {
    {"DISPLAY", ""}, {"WAYLAND_DISPLAY", ""}, {"EGL_PLATFORM", ""}};

/// The distance from a point to the nearest straight piece of a recording on its page.
class PenWay
{
public:
    PenWay(const Ink::Recording& recording, const Ink::Placement& placement)
    {
        const Ink::BrushStyle style;
        for (const Ink::Stroke& stroke : recording.strokes)
        {
            m_strokes.emplace_back();
            for (const Ink::Sample& sample : stroke)
                m_strokes.back().push_back(Ink::ToPage(sample, placement, style));
        }
    }

    const std::vector<std::vector<Ink::PenPoint>>& Strokes() const { return m_strokes; }

    /// Marks every pixel within @p reach of the way.
    std::vector<bool> Near(int width, int height, float reach) const
    {
        std::vector<bool> near(static_cast<std::size_t>(width) * static_cast<std::size_t>(height));
        for (const auto& stroke : m_strokes)
            for (std::size_t i = 0; i < stroke.size(); ++i)
                MarkPiece(near, width, height, stroke[i ? i - 1 : 0], stroke[i], reach);
        return near;
    }

private:
    static void MarkPiece(std::vector<bool>& near, int width, int height, const Ink::PenPoint& a,
                          const Ink::PenPoint& b, float reach)
    {
        const int left = std::max(0, static_cast<int>(std::min(a.x, b.x) - reach) - 1);
        const int right = std::min(width - 1, static_cast<int>(std::max(a.x, b.x) + reach) + 1);
        const int top = std::max(0, static_cast<int>(std::min(a.y, b.y) - reach) - 1);
        const int bottom = std::min(height - 1, static_cast<int>(std::max(a.y, b.y) + reach) + 1);
        const float dx = b.x - a.x, dy = b.y - a.y, length2 = dx * dx + dy * dy;
        for (int y = top; y <= bottom; ++y)
            for (int x = left; x <= right; ++x)
            {
                const float px = x + 0.5f - a.x, py = y + 0.5f - a.y;
                const float t =
                    length2 > 0 ? std::clamp((px * dx + py * dy) / length2, 0.0f, 1.0f) : 0.0f;
                if (std::hypot(px - t * dx, py - t * dy) <= reach)
                    near[static_cast<std::size_t>(y * width + x)] = true;
            }
    }

    std::vector<std::vector<Ink::PenPoint>> m_strokes;
};

/// Ink stands where the pen went and nowhere else.
void ExpectInkOnTheWay(const Picture& picture, const std::string& file)
{
    const Ink::Recording recording = Ink::ReadRecording(file);
    const PenWay way(recording, Ink::FitToPage(recording, picture.width, picture.height));
    for (const auto& stroke : way.Strokes())
        for (const Ink::PenPoint& point : stroke)
            if (point.radius >= 1.0f)
            {
                ASSERT_TRUE(picture.IsInk(static_cast<int>(point.x), static_cast<int>(point.y)))
                    << "no ink at " << point.x << ", " << point.y;
            }
    // The curve bends away from the straight pieces by a few pixels at most.
    const std::vector<bool> near = way.Near(picture.width, picture.height, 9.0f);
    for (int y = 0; y < picture.height; ++y)
        for (int x = 0; x < picture.width; ++x)
            if (!near[static_cast<std::size_t>(y * picture.width + x)])
            {
                ASSERT_EQ(picture.At(x, y)[0], 255) << "ink at " << x << ", " << y;
            }
}

class Draw : public testing::Test
{
protected:
    std::string Page() const { return m_folder.Path("page.png"); }

    NibResult DrawFile(const std::string& file, std::vector<std::string> more = {})
    {
        more.insert(more.begin(), {"draw", file, "-o", Page()});
        return RunNib(more, kNoDisplay);
    }

    std::string ErrorOf(const std::string& text)
    {
        const NibResult result = DrawFile(m_folder.Write("in", text));
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(m_folder.Files(), std::vector<std::string>{"in"});
        return result.err;
    }

    TemporaryFolder m_folder;
};

TEST_F(Draw, SampleWithoutDisplay)
{
    const NibResult result = DrawFile(NIB_SAMPLE);
    ASSERT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.err, "");
    const Picture picture = LoadPng(Page());
    EXPECT_EQ(picture.width, 1280);
    EXPECT_EQ(picture.height, 800);
    ExpectInkOnTheWay(picture, NIB_SAMPLE);
    EXPECT_EQ(m_folder.Files(), std::vector<std::string>{"page.png"});
}

TEST_F(Draw, ThirtySecondsOfPainting)
{
    const std::string file = FurtherRecording("libmypaint/painting30sec.dat");
    if (file.empty())
        GTEST_SKIP() << "NIB_STROKES does not name the folder of further recordings";
    const NibResult result = DrawFile(file, {"--size", "1000x700"});
    ASSERT_EQ(result.status, 0) << result.err;
    const Picture picture = LoadPng(Page());
    EXPECT_EQ(picture.width, 1000);
    EXPECT_EQ(picture.height, 700);
    ExpectInkOnTheWay(picture, file);
}

TEST_F(Draw, OnePointIsADotAtItsPlace)
{
    const std::string file = m_folder.Write("in", "<ink><trace>30 20</trace></ink>");
    ASSERT_EQ(DrawFile(file, {"--scale", "1:1", "--size", "60x40"}).status, 0);
    const Picture picture = LoadPng(Page());
    EXPECT_TRUE(picture.IsInk(30, 20));
    EXPECT_FALSE(picture.IsInk(30, 26));
    EXPECT_FALSE(picture.IsInk(20, 20));
}

TEST_F(Draw, RowsGrowDownward)
{
    const std::string file = m_folder.Write("in", "<ink><trace>10 5, 50 5</trace></ink>");
    ASSERT_EQ(DrawFile(file, {"--scale", "1:1", "--size", "60x40"}).status, 0);
    const Picture picture = LoadPng(Page());
    EXPECT_TRUE(picture.IsInk(30, 5));
    EXPECT_FALSE(picture.IsInk(30, 34));
}

TEST_F(Draw, EqualPointsAreOneDot)
{
    const std::string one = m_folder.Write("one", "<ink><trace>30 20</trace></ink>");
    const std::string equal = m_folder.Write("in", "<ink><trace>30 20,30 20,30 20</trace></ink>");
    ASSERT_EQ(DrawFile(one, {"--scale", "1:1", "--size", "60x40"}).status, 0);
    const Picture expected = LoadPng(Page());
    ASSERT_EQ(DrawFile(equal, {"--scale", "1:1", "--size", "60x40"}).status, 0);
    EXPECT_EQ(LargestDifference(LoadPng(Page()), expected), 0);
}

TEST_F(Draw, TenThousandPoints)
{
    std::ostringstream text;
    text << "<ink><trace>";
    for (int i = 0; i < 10000; ++i)
        text << (i ? "," : "") << 200 + 150 * std::cos(i * 0.003) << ' '
             << 200 + 150 * std::sin(i * 0.003);
    text << "</trace></ink>";
    const std::string file = m_folder.Write("in", text.str());
    ASSERT_EQ(DrawFile(file, {"--scale", "1:1", "--size", "400x400"}).status, 0);
    const Picture picture = LoadPng(Page());
    for (int degree = 0; degree < 360; ++degree)
    {
        const double angle = degree * 3.14159265 / 180;
        EXPECT_TRUE(picture.IsInk(static_cast<int>(200 + 150 * std::cos(angle)),
                                  static_cast<int>(200 + 150 * std::sin(angle))));
    }
    EXPECT_FALSE(picture.IsInk(200, 200));
}

TEST_F(Draw, PointsOutsideThePageLeaveTheRestRight)
{
    const std::string file = m_folder.Write("in", "<ink><trace>-500 20, 30 20, 900 20</trace>"
                                                  "<trace>1e30 1e30, -1e30 5</trace></ink>");
    ASSERT_EQ(DrawFile(file, {"--scale", "1:1", "--size", "60x40"}).status, 0);
    const Picture picture = LoadPng(Page());
    EXPECT_TRUE(picture.IsInk(30, 20));
    EXPECT_FALSE(picture.IsInk(30, 34));
}

TEST_F(Draw, SeveralFilesComeOntoOnePage)
{
    const std::string left = m_folder.Write("left", "<ink><trace>10 20</trace></ink>");
    const std::string right = m_folder.Write("right", "0 50 20 0.5\n");
    const NibResult result = RunNib(
        {"draw", left, right, "-o", Page(), "--scale", "1:1", "--size", "60x40"}, kNoDisplay);
    ASSERT_EQ(result.status, 0) << result.err;
    const Picture picture = LoadPng(Page());
    EXPECT_TRUE(picture.IsInk(10, 20));
    EXPECT_TRUE(picture.IsInk(50, 20));
}

TEST_F(Draw, BadFilesAreOneLineAndNoPicture)
{
    const std::string in = m_folder.Path("in");
    EXPECT_EQ(ErrorOf(""), "nib: " + in + ":1: the file is empty\n");
    EXPECT_EQ(ErrorOf("hello\n"),
              "nib: " + in + ":1: four numbers were expected: this is no recording of a pen\n");
    EXPECT_EQ(ErrorOf("0 1 2 0.5\n0 1"),
              "nib: " + in + ":2: the last line is cut short: its end of line is missing\n");
    EXPECT_EQ(ErrorOf("<svg/>"),
              "nib: " + in + ":1: not InkML: the outermost element is not <ink>\n");
    EXPECT_EQ(ErrorOf(std::string("\x89PNG\r\n\x1a\n", 8)),
              "nib: " + in + ":1: four numbers were expected: this is no recording of a pen\n");
}

TEST_F(Draw, MissingFileIsNamed)
{
    const std::string file = m_folder.Path("nothing");
    const NibResult result = DrawFile(file);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: " + file + ":1: cannot be read: No such file or directory\n");
}

TEST_F(Draw, BadOptionsAreNamed)
{
    const auto error = [](std::vector<std::string> options)
    {
        options.insert(options.begin(), {"draw", NIB_SAMPLE, "-o", "/nowhere/x.png"});
        const NibResult result = RunNib(options, kNoDisplay);
        EXPECT_EQ(result.status, 2);
        return result.err;
    };
    EXPECT_EQ(error({"--size", "12"}),
              "nib: --size: '12' is not WIDTHxHEIGHT with sides from 1 to 16384\n");
    EXPECT_EQ(error({"--size", "0x5"}),
              "nib: --size: '0x5' is not WIDTHxHEIGHT with sides from 1 to 16384\n");
    EXPECT_EQ(error({"--speed", "fast"}),
              "nib: --speed: 'fast' is neither 'max' nor a factor such as 2 or 0.5\n");
    EXPECT_EQ(error({"--scale", "2"}), "nib: --scale: 2 not in {fit,1:1}\n");
    EXPECT_EQ(error({"--colour"}), "nib: The following argument was not expected: --colour\n");
    EXPECT_EQ(RunNib({"draw", NIB_SAMPLE}).err,
              "nib: draw: say where to: -o PAGE.png, --window, or both; or --live\n");
}

TEST_F(Draw, UnwritableOutputIsNamed)
{
    const NibResult result = RunNib({"draw", NIB_SAMPLE, "-o", "/nowhere/page.png"}, kNoDisplay);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: /nowhere/page.png:1: cannot be written: No such file or "
                          "directory\n");
}

TEST_F(Draw, FolderWithoutWritePermissionIsNamed)
{
    if (geteuid() == 0)
        GTEST_SKIP() << "the superuser may write anywhere";
    chmod(m_folder.Path("").c_str(), 0555);
    const NibResult result = DrawFile(NIB_SAMPLE);
    chmod(m_folder.Path("").c_str(), 0755);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: " + Page() + ":1: cannot be written: Permission denied\n");
}

TEST_F(Draw, FailedRunLeavesTheOldPicture)
{
    m_folder.Write("page.png", "old");
    EXPECT_EQ(DrawFile(m_folder.Write("in", "x")).status, 2);
    EXPECT_EQ(m_folder.Files(), (std::vector<std::string>{"in", "page.png"}));
}

TEST_F(Draw, WindowWithoutDisplayIsAnError)
{
    const NibResult result = RunNib({"draw", NIB_SAMPLE, "--window"}, kNoDisplay);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: --window: there is no display (DISPLAY is unset, or its server "
                          "does not answer)\n");
}

TEST(Nib, HelpAndVersion)
{
    const NibResult help = RunNib({"--help"});
    EXPECT_EQ(help.status, 0);
    EXPECT_NE(help.out.find("draw"), std::string::npos);
    EXPECT_NE(RunNib({"draw", "--help"}).out.find("--size"), std::string::npos);
    EXPECT_EQ(RunNib({"--version"}).out, "nib 1.0.0\n");
    EXPECT_EQ(RunNib({}).status, 2);
    EXPECT_EQ(RunNib({"paint"}).status, 2);
}

} // namespace
