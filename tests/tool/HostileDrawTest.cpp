#include "../ink/hostile/HostileFiles.h"
#include "RunNib.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <gtest/gtest.h>
#include <sys/resource.h>

namespace
{

const std::map<std::string, std::string> kNoDisplay = {
    {"DISPLAY", ""}, {"WAYLAND_DISPLAY", ""}, {"EGL_PLATFORM", ""}};

/// What the tool makes of files that are made to do harm: a picture, or one line and status 2.
class HostileDraw : public testing::Test
{
protected:
    NibResult Draw(const std::string& text)
    {
        std::filesystem::remove(m_folder.Path("page.png")); // a run that fails keeps the old one
        return RunNib({"draw", m_folder.Write("in", text), "-o", m_folder.Path("page.png"),
                       "--size", "64x64"},
                      kNoDisplay);
    }

    /// One line that names the file and a line of it, and what is wrong; no picture.
    void ExpectRefused(const std::string& text, const std::string& problem)
    {
        const NibResult result = Draw(text);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        const std::string start = "nib: " + m_folder.Path("in") + ":";
        EXPECT_EQ(result.err.substr(0, start.size()), start);
        EXPECT_NE(result.err.find(": " + problem, start.size()), std::string::npos) << result.err;
        EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1) << result.err;
        EXPECT_FALSE(HasPicture());
    }

    void ExpectDrawn(const std::string& text)
    {
        const NibResult result = Draw(text);
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_TRUE(HasPicture());
    }

    bool HasPicture() const
    {
        const std::vector<std::string> files = m_folder.Files();
        return std::find(files.begin(), files.end(), "page.png") != files.end();
    }

private:
    TemporaryFolder m_folder;
};

/// The greatest memory of a run of the tool so far, in MiB.
long Memory()
{
    rusage usage{};
    getrusage(RUSAGE_CHILDREN, &usage);
    return usage.ru_maxrss / 1024;
}

TEST_F(HostileDraw, FilesThatAreNoRecordingsAreRefusedInOneLine)
{
    for (const HostileFile& file : HostileFiles())
    {
        SCOPED_TRACE(file.name);
        if (file.problem)
            ExpectRefused(file.make(1000), file.problem);
    }
}

TEST_F(HostileDraw, CoordinatesBeyondAnyPageAreDrawn)
{
    ExpectDrawn("0 1e30 -1e30 1\n0 -1e30 1e30 1\n0 0 0 1\n1 1e-30 1e-38 1\n");
}

TEST_F(HostileDraw, NumbersThatAreNoneAreRefused)
{
    ExpectRefused("0 nan 1 1\n", "four numbers were expected");
    ExpectRefused("0 1 inf 1\n", "four numbers were expected");
    ExpectRefused("0 1 1e999 1\n", "four numbers were expected");
    ExpectRefused("0 1 1e39 1\n", "a value of the sample is out of range");
    ExpectRefused("1\n1 2 -inf 1 0 900 1\n", "seven numbers were expected");
    ExpectRefused("START\n1,NaN,2\nBREAK\n", "three numbers were expected");
    ExpectRefused("{\"a\":[[1,NaN]]}", "not well-formed JSON");
    ExpectRefused("{\"a\":[[1,1e999]]}", "");
    ExpectRefused("<ink><trace>1 inf</trace></ink>", "a value of a point is not a number");
}

TEST_F(HostileDraw, TimesBelowZeroAreDrawnUnlessTheyRunBackwards)
{
    ExpectDrawn("-5 1 1 1\n-4 2 2 1\n");
    ExpectRefused("-4 1 1 1\n-5 2 2 1\n", "the time runs backwards");
    ExpectDrawn("START\n1,1,-1000\n2,2,-5000\nBREAK\n"); // a mouse's clock may be set back
}

TEST_F(HostileDraw, WrongCountsAreRefused)
{
    const std::string sample = "1 1 1 1 0 900 1\n";
    ExpectRefused("2\n" + sample, "cut short: fewer samples than the first line says");
    ExpectRefused("18446744073709551617\n" + sample, "cut short");
    ExpectRefused("0\n", "the pen never touches the page");
    ExpectDrawn("0\n" + sample); // more than stated is what other programs write while recording
}

TEST_F(HostileDraw, EveryFileIsDrawnOrRefusedInLessMemoryThanItMayTake)
{
    if (!std::getenv("NIB_HOSTILE"))
        GTEST_SKIP() << "NIB_HOSTILE is not set: large files take a while to draw";
    for (const HostileFile& file : HostileFiles())
    {
        SCOPED_TRACE(file.name);
        const std::string text = file.make(30000);
        file.problem ? ExpectRefused(text, file.problem) : ExpectDrawn(text);
    }
    EXPECT_LT(Memory(), 512);
}

TEST_F(HostileDraw, AsManySamplesAsThereMayBeAreDrawn)
{
    if (!std::getenv("NIB_HOSTILE"))
        GTEST_SKIP() << "NIB_HOSTILE is not set: four million samples take a while to draw";
    ExpectDrawn(Repeated(3999999, "1 1 1 1\n") + "2 2 2 1\n");
    EXPECT_LT(Memory(), 512);
    ExpectRefused(Repeated(10000000, "1 1 1 1\n"), "more than 4000000 samples");
    EXPECT_LT(Memory(), 512);
}

} // namespace
