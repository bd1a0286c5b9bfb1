#include "Recording.h"
#include "InkMl.h"
#include "PenLog.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <functional>
#include <gtest/gtest.h>
#include <string>
#include <unistd.h>

namespace
{

using Ink::ReadError;
using Ink::ReadInkMl;
using Ink::ReadPenLog;
using Ink::Recording;

std::string ErrorOf(const std::function<void()>& read)
{
    try
    {
        read();
    }
    catch (const ReadError& error)
    {
        return error.what();
    }
    return "no error";
}

std::string InkMlError(const std::string& text)
{
    return ErrorOf([&] { ReadInkMl("page.inkml", text); });
}

std::string PenLogError(const std::string& text)
{
    return ErrorOf([&] { ReadPenLog("pen.dat", text); });
}

std::string WithFormat(const std::string& channels, const std::string& traces)
{
    return "<ink xmlns=\"http://www.w3.org/2003/InkML\"><traceFormat>" + channels +
           "</traceFormat>" + traces + "</ink>";
}

const std::string kXYF = "<channel name=\"X\"/><channel name=\"Y\"/>"
                         "<channel name=\"F\" min=\"100\" max=\"300\"/>";

TEST(PenLog, PenIsDownWhilePressureIsAboveZero)
{
    const Recording recording = ReadPenLog("pen.dat", "0.0 1 2 0\n"
                                                      "0.1 3 4 0.5\n"
                                                      "0.2 5 6 0.25\n"
                                                      "0.3 7 8 0\n"
                                                      "0.4 9 10 1\n");
    ASSERT_EQ(recording.strokes.size(), 2u);
    ASSERT_EQ(recording.strokes[0].size(), 2u);
    EXPECT_DOUBLE_EQ(recording.strokes[0][0].time, 0.1);
    EXPECT_FLOAT_EQ(recording.strokes[0][1].x, 5.0f);
    EXPECT_FLOAT_EQ(recording.strokes[0][1].y, 6.0f);
    EXPECT_FLOAT_EQ(recording.strokes[0][1].pressure, 0.25f);
    ASSERT_EQ(recording.strokes[1].size(), 1u);
    EXPECT_FLOAT_EQ(recording.strokes[1][0].x, 9.0f);
}

TEST(PenLog, BlankLinesAndCarriageReturnsAreReadOver)
{
    const Recording recording = ReadPenLog("pen.dat", "\r\n0 1 2 0.5\r\n\n");
    ASSERT_EQ(recording.strokes.size(), 1u);
}

TEST(PenLog, ErrorsNameTheLine)
{
    EXPECT_EQ(PenLogError("0 1 2 0.5\n0 1 2\n"),
              "pen.dat:2: the sample is cut short: time, x, y and pressure are needed");
    EXPECT_EQ(PenLogError("0 1 2 0.5 9\n"),
              "pen.dat:1: too many numbers: time, x, y and pressure are needed");
    EXPECT_EQ(PenLogError("0 1 2 0.5\n\nhello\n"),
              "pen.dat:3: a number was expected: this is no recording of a pen");
    EXPECT_EQ(PenLogError("0 1 2 0.5x\n"),
              "pen.dat:1: a number was expected: this is no recording of a pen");
    EXPECT_EQ(PenLogError("0 nan 2 0.5\n"),
              "pen.dat:1: a number was expected: this is no recording of a pen");
    EXPECT_EQ(PenLogError("0 1e30 2 0.5\n0 1e300 2 0.5\n"),
              "pen.dat:2: the position is out of range");
    EXPECT_EQ(PenLogError("0 1 2 1.5\n"), "pen.dat:1: the pressure is not between 0 and 1");
    EXPECT_EQ(PenLogError("1 1 2 0.5\n0.5 1 2 0.5\n"), "pen.dat:2: the time runs backwards");
    EXPECT_EQ(PenLogError("0 1 2 0.5\n0.1 1 2 0.5"),
              "pen.dat:2: the last line is cut short: its end of line is missing");
    EXPECT_EQ(PenLogError("0 1 2 0\n"), "pen.dat:1: the pen never touches the page");
}

TEST(InkMl, PlainTracesAreXAndY)
{
    const Recording recording =
        ReadInkMl("page.inkml", "<ink><trace>1 2, 3 4</trace><trace>5 6</trace></ink>");
    ASSERT_EQ(recording.strokes.size(), 2u);
    ASSERT_EQ(recording.strokes[0].size(), 2u);
    EXPECT_FLOAT_EQ(recording.strokes[0][1].x, 3.0f);
    EXPECT_FLOAT_EQ(recording.strokes[0][1].y, 4.0f);
    EXPECT_FLOAT_EQ(recording.strokes[0][1].pressure, 0.5f);
    EXPECT_LT(recording.strokes[0][0].time, recording.strokes[0][1].time);
    EXPECT_LT(recording.strokes[0][1].time, recording.strokes[1][0].time);
}

TEST(InkMl, ChannelsComeInTheOrderOfTheFormat)
{
    const Recording recording =
        ReadInkMl("page.inkml", WithFormat("<channel name=\"T\" units=\"ms\"/><channel name=\"Y\"/>"
                                           "<channel name=\"OTx\"/><channel name=\"X\"/>"
                                           "<channel name=\"F\" min=\"100\" max=\"300\"/>",
                                           "<trace>1000 2 77 1 150, 1500 4 77 3 300</trace>"));
    const Ink::Sample& second = recording.strokes.at(0).at(1);
    EXPECT_DOUBLE_EQ(recording.strokes[0][0].time, 1.0);
    EXPECT_DOUBLE_EQ(second.time, 1.5);
    EXPECT_FLOAT_EQ(second.x, 3.0f);
    EXPECT_FLOAT_EQ(second.y, 4.0f);
    EXPECT_FLOAT_EQ(recording.strokes[0][0].pressure, 0.25f);
    EXPECT_FLOAT_EQ(second.pressure, 1.0f);
}

TEST(InkMl, DifferencesAddUp)
{
    const Recording recording = ReadInkMl(
        "page.inkml", WithFormat(kXYF, "<trace>1125 18432 200,'23'43'0, \"7\"-8\"0, 3 -5 0, !9 !8 "
                                       "!300</trace>"));
    const Ink::Stroke& stroke = recording.strokes.at(0);
    ASSERT_EQ(stroke.size(), 5u);
    EXPECT_FLOAT_EQ(stroke[1].x, 1148.0f);
    EXPECT_FLOAT_EQ(stroke[1].y, 18475.0f);
    EXPECT_FLOAT_EQ(stroke[2].x, 1178.0f);
    EXPECT_FLOAT_EQ(stroke[2].y, 18510.0f);
    EXPECT_FLOAT_EQ(stroke[3].x, 1211.0f);
    EXPECT_FLOAT_EQ(stroke[3].y, 18540.0f);
    EXPECT_FLOAT_EQ(stroke[4].x, 9.0f);
    EXPECT_FLOAT_EQ(stroke[4].pressure, 1.0f);
}

TEST(InkMl, TracesFollowTheFormatOfTheirContext)
{
    const Recording recording = ReadInkMl(
        "page.inkml",
        "<inkml:ink xmlns:inkml=\"http://www.w3.org/2003/InkML\"><inkml:definitions>"
        "<inkml:traceFormat xml:id=\"yx\"><inkml:channel name=\"Y\"/><inkml:channel name=\"X\"/>"
        "</inkml:traceFormat>"
        "<inkml:context xml:id=\"a\"><inkml:inkSource><inkml:traceFormat><inkml:channel "
        "name=\"X\"/>"
        "<inkml:channel name=\"Y\" orientation=\"-ve\"/></inkml:traceFormat></inkml:inkSource>"
        "</inkml:context><inkml:context xml:id=\"b\" traceFormatRef=\"#yx\"/></inkml:definitions>"
        "<inkml:trace contextRef=\"#a\">1 2</inkml:trace><inkml:traceGroup contextRef=\"#b\">"
        "<inkml:trace>1 2</inkml:trace></inkml:traceGroup></inkml:ink>");
    ASSERT_EQ(recording.strokes.size(), 2u);
    EXPECT_FLOAT_EQ(recording.strokes[0][0].x, 1.0f);
    EXPECT_FLOAT_EQ(recording.strokes[0][0].y, -2.0f);
    EXPECT_FLOAT_EQ(recording.strokes[1][0].x, 2.0f);
    EXPECT_FLOAT_EQ(recording.strokes[1][0].y, 1.0f);
}

TEST(InkMl, PressureWithoutRangeIsScaledByItsGreatest)
{
    const Recording recording =
        ReadInkMl("page.inkml", WithFormat("<channel name=\"X\"/><channel name=\"Y\"/>"
                                           "<channel name=\"F\"/>",
                                           "<trace>0 0 200, 1 1 800</trace>"));
    EXPECT_FLOAT_EQ(recording.strokes.at(0).at(0).pressure, 0.25f);
    EXPECT_FLOAT_EQ(recording.strokes.at(0).at(1).pressure, 1.0f);
}

TEST(InkMl, TimesThatStartAgainWithEachTraceGoOn)
{
    const Recording recording =
        ReadInkMl("page.inkml", WithFormat("<channel name=\"X\"/><channel name=\"Y\"/>"
                                           "<channel name=\"T\" units=\"ms\"/>",
                                           "<trace>0 0 0, 1 1 500</trace>"
                                           "<trace>0 0 0, 1 1 250</trace>"));
    EXPECT_DOUBLE_EQ(recording.strokes.at(1).at(0).time, 0.5);
    EXPECT_DOUBLE_EQ(recording.strokes.at(1).at(1).time, 0.75);
}

TEST(InkMl, PenUpTracesAreLeftOut)
{
    const Recording recording =
        ReadInkMl("page.inkml", "<ink><trace type=\"penUp\">9 9</trace><trace>1 2</trace></ink>");
    ASSERT_EQ(recording.strokes.size(), 1u);
    EXPECT_FLOAT_EQ(recording.strokes[0][0].x, 1.0f);
}

TEST(InkMl, ErrorsNameTheLine)
{
    EXPECT_EQ(InkMlError("<ink>\n<trace>1 2</trace>\n"),
              "page.inkml:2: not well-formed XML: Start-end tags mismatch");
    EXPECT_EQ(InkMlError("<svg/>"), "page.inkml:1: not InkML: the outermost element is not <ink>");
    EXPECT_EQ(InkMlError("<ink>\n</ink>"), "page.inkml:1: there is no trace in it");
    EXPECT_EQ(InkMlError("<ink>\n<trace>1</trace></ink>"),
              "page.inkml:2: a point has fewer values than the trace format has channels");
    EXPECT_EQ(InkMlError("<ink>\n<trace>1 2 3</trace></ink>"),
              "page.inkml:2: a point has more values than the trace format has channels");
    EXPECT_EQ(InkMlError("<ink>\n\n<trace>1 two</trace></ink>"),
              "page.inkml:3: a value of a point is not a number");
    EXPECT_EQ(InkMlError("<ink>\n<trace> </trace></ink>"), "page.inkml:2: the trace has no point");
    EXPECT_EQ(InkMlError("<ink>\n<trace>1e300 2</trace></ink>"),
              "page.inkml:2: a value of a point is out of range");
    EXPECT_EQ(InkMlError("<ink><traceFormat>\n<channel name=\"X\"/></traceFormat></ink>"),
              "page.inkml:1: the trace format has no X or no Y channel");
}

TEST(Recording, FormatIsRecognisedByContent)
{
    const std::filesystem::path folder = std::filesystem::temp_directory_path();
    const std::string path = folder / ("recording-" + std::to_string(::getpid()) + ".any");
    std::ofstream(path) << "\n <ink><trace>1 2</trace></ink>";
    EXPECT_EQ(Ink::ReadRecording(path).strokes.size(), 1u);
    std::ofstream(path) << "0 1 2 0.5\n";
    EXPECT_EQ(Ink::ReadRecording(path).strokes.size(), 1u);
    std::ofstream(path) << "";
    EXPECT_EQ(ErrorOf([&] { Ink::ReadRecording(path); }), path + ":1: the file is empty");
    std::filesystem::remove(path);
    EXPECT_EQ(ErrorOf([&] { Ink::ReadRecording(path); }),
              path + ":1: cannot be read: No such file or directory");
    EXPECT_EQ(ErrorOf([&] { Ink::ReadRecording(folder); }),
              folder.string() + ":1: is a folder, not a recording");
}

TEST(Recording, SampleOfTheDemoIsWhole)
{
    const Recording recording = Ink::ReadRecording(NIB_SAMPLE);
    EXPECT_EQ(recording.strokes.size(), 9u);
    for (const Ink::Stroke& stroke : recording.strokes)
        for (const Ink::Sample& sample : stroke)
            EXPECT_TRUE(sample.pressure > 0.0f && sample.pressure <= 1.0f);
}

TEST(Recording, ThirtySecondsOfPaintingHaveThirtyStrokes)
{
    const char* const folder = std::getenv("NIB_STROKES");
    if (!folder)
        GTEST_SKIP() << "NIB_STROKES does not name the folder of further recordings";
    const Recording recording =
        Ink::ReadRecording(std::string(folder) + "/libmypaint/painting30sec.dat");
    EXPECT_EQ(recording.strokes.size(), 30u);
}

} // namespace
