#include "InkMlWriter.h"
#include "RunNib.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <pty.h>
#include <sstream>
#include <sys/wait.h>
#include <unistd.h>

namespace
{

using Json = nlohmann::json;
using Words = std::vector<std::string>;

class RunFigures : public testing::Test
{
protected:
    NibResult Draw(Words more)
    {
        more.insert(more.begin(), {"draw", NIB_SAMPLE, "-o", m_folder.Path("page.png")});
        return RunNib(more, {{"DISPLAY", ""}, {"NIB_CACHE_DIR", m_folder.Path("sdk")}});
    }

    static std::string ContentOf(const std::string& path)
    {
        std::ifstream file(path);
        std::ostringstream text;
        text << file.rdbuf();
        return text.str();
    }

    TemporaryFolder m_folder;
};

TEST_F(RunFigures, LineCountsWhatWasDrawn)
{
    const NibResult result = Draw({});
    ASSERT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out.rfind("9 strokes, 433 samples, 0 frames, ", 0), 0u) << result.out;
    EXPECT_EQ(result.out.find('\n'), result.out.size() - 1);
    EXPECT_NE(result.out.find("programs 1 compiled 0 loaded"), std::string::npos) << result.out;
    EXPECT_EQ(result.err, "");
}

TEST_F(RunFigures, AnEmptyPageIsDrawn)
{
    const std::string empty = m_folder.Path("empty.inkml");
    std::ofstream(empty) << Ink::ToInkMl(Ink::Recording()); // as `nib draw --live` saves one
    for (const Words& frames : {Words{}, Words{"--speed", "max"}, Words{"--scale", "1:1"}})
    {
        Words words{"draw", empty, "-o", m_folder.Path("page.png"), "--json"};
        words.insert(words.end(), frames.begin(), frames.end());
        const NibResult result = RunNib(words, {{"DISPLAY", ""}});
        ASSERT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(Json::parse(result.out).at("strokes"), 0);
        EXPECT_GT(ContentOf(m_folder.Path("page.png")).size(), 0u);
    }
}

TEST_F(RunFigures, AnEmptyPageBetweenOthersChangesNothing)
{
    const std::string empty = m_folder.Path("empty.inkml");
    std::ofstream(empty) << Ink::ToInkMl(Ink::Recording());
    const NibResult result = Draw({empty, NIB_SAMPLE, "--json"});
    ASSERT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(Json::parse(result.out).at("strokes"), 18);
}

TEST_F(RunFigures, FramesAreShownWithoutAWindowWhenASpeedIsGiven)
{
    const NibResult result = Draw({"--speed", "max", "--json"});
    ASSERT_EQ(result.status, 0) << result.err;
    const Json figures = Json::parse(result.out);
    EXPECT_EQ(figures.at("strokes"), 9);
    EXPECT_EQ(figures.at("samples"), 433);
    EXPECT_EQ(figures.at("frames"), 433);
    // At least a dirty rectangle, the drawing of the view and the presenting of it for each frame.
    EXPECT_GE(figures.at("tasks"), 3 * 433);
    EXPECT_GT(figures.at("redrawnShare"), 0.0);
    EXPECT_LT(figures.at("redrawnShare"), 0.05);
    EXPECT_GT(figures.at("seconds"), 0.0);
    const Json times = figures.at("frameMilliseconds");
    EXPECT_GT(times.at("p50"), 0.0);
    EXPECT_LE(times.at("p50"), times.at("p95"));
    EXPECT_LE(times.at("p95"), times.at("p99"));
    EXPECT_EQ(figures.at("programs"), (Json{{"compiled", 2}, {"loaded", 0}})); // pen and view
}

TEST_F(RunFigures, ProgramsOfALaterRunAndAfterLossesAreLoaded)
{
    ASSERT_EQ(Draw({}).status, 0);
    const Json again = Json::parse(Draw({"--json"}).out);
    EXPECT_EQ(again.at("programs"), (Json{{"compiled", 0}, {"loaded", 1}}));
    // 433 samples: four losses.
    const Json lost = Json::parse(Draw({"--json", "--lose-context", "every:100"}).out);
    EXPECT_EQ(lost.at("programs"), (Json{{"compiled", 0}, {"loaded", 5}}));
}

TEST_F(RunFigures, JsonGoesIntoAFileBesideTheLine)
{
    const std::string file = m_folder.Path("figures.json");
    const NibResult result = Draw({"--json=" + file});
    ASSERT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out.rfind("9 strokes, ", 0), 0u);
    EXPECT_EQ(Json::parse(ContentOf(file)).at("samples"), 433);
    EXPECT_EQ(ContentOf(file).back(), '\n');
}

TEST_F(RunFigures, FileBehindJsonIsARecording)
{
    const NibResult result =
        RunNib({"draw", "-o", m_folder.Path("page.png"), "--json", NIB_SAMPLE}, {{"DISPLAY", ""}});
    ASSERT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(Json::parse(result.out).at("strokes"), 9);
}

TEST_F(RunFigures, UnwritableJsonIsNamed)
{
    const NibResult result = Draw({"--json=/nowhere/figures.json"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: /nowhere/figures.json:1: cannot be written: No such file or "
                          "directory\n");
}

/// Both ends of a new terminal.
struct Terminal
{
    Terminal() { isThere = openpty(&end, &other, nullptr, nullptr, nullptr) == 0; }

    bool isThere = false;
    int end = -1;
    int other = -1;
};

/// What the tool writes to a terminal that is its standard error.
std::string WrittenTo(const Terminal& terminal, const Words& arguments)
{
    const pid_t process = fork();
    if (process == 0)
    {
        std::string program = NIB_TOOL;
        std::vector<char*> words = {program.data()};
        for (const std::string& argument : arguments)
            words.push_back(const_cast<char*>(argument.c_str()));
        words.push_back(nullptr);
        unsetenv("DISPLAY");
        dup2(terminal.other, STDERR_FILENO);
        close(terminal.end);
        execv(NIB_TOOL, words.data());
        _exit(127);
    }
    close(terminal.other);
    std::string written;
    char buffer[4096];
    for (ssize_t count; (count = read(terminal.end, buffer, sizeof buffer)) > 0;)
        written.append(buffer, static_cast<std::size_t>(count));
    close(terminal.end);
    waitpid(process, nullptr, 0);
    return written;
}

TEST_F(RunFigures, BarGrowsOnATerminalFromASecondOnAndGoes)
{
    const Terminal terminal;
    if (!terminal.isThere)
        GTEST_SKIP() << "this system gives no pseudo terminal: " << std::strerror(errno);
    // Only the second of two samples comes behind the first second.
    const std::string file = m_folder.Write("in", "0 10 10 0.5\n1.2 20 20 0.5\n");
    const std::string written =
        WrittenTo(terminal, {"draw", file, "-o", m_folder.Path("page.png"), "--speed", "1"});
    EXPECT_EQ(written.rfind("\r[####################", 0), 0u) << written;
    EXPECT_NE(written.find("100 %"), std::string::npos) << written;
    const std::string erased = "\r\033[K";
    ASSERT_GE(written.size(), erased.size());
    EXPECT_EQ(written.substr(written.size() - erased.size()), erased);
}

TEST_F(RunFigures, ShortWorkShowsNoBar)
{
    const Terminal terminal;
    if (!terminal.isThere)
        GTEST_SKIP() << "this system gives no pseudo terminal: " << std::strerror(errno);
    const std::string file = m_folder.Write("in", "0 10 10 0.5\n");
    EXPECT_EQ(WrittenTo(terminal, {"draw", file, "-o", m_folder.Path("page.png")}), "");
}

} // namespace
