#include "Recording.h"
#include "InkJson.h"
#include "InkMl.h"
#include "PenLog.h"
#include "StrokeList.h"
#include "SvcFile.h"

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
              "pen.dat:1: four numbers were expected: this is no recording of a pen");
    EXPECT_EQ(PenLogError("0 1 2 0.5\n\nhello\n"),
              "pen.dat:3: four numbers were expected: this is no recording of a pen");
    EXPECT_EQ(PenLogError("0 1 2 0.5x\n"),
              "pen.dat:1: four numbers were expected: this is no recording of a pen");
    EXPECT_EQ(PenLogError("0 nan 2 0.5\n"),
              "pen.dat:1: four numbers were expected: this is no recording of a pen");
    EXPECT_EQ(PenLogError("0 1e30 2 0.5\n0 1e300 2 0.5\n"),
              "pen.dat:2: a value of the sample is out of range");
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

TEST(InkMl, PenUpTracesAreHovers)
{
    const Recording recording =
        ReadInkMl("page.inkml", "<ink><trace type=\"penUp\">9 9</trace><trace>1 2</trace></ink>");
    ASSERT_EQ(recording.strokes.size(), 1u);
    EXPECT_FLOAT_EQ(recording.strokes[0][0].x, 1.0f);
    ASSERT_EQ(recording.hovers.size(), 1u);
    EXPECT_FLOAT_EQ(recording.hovers[0][0].x, 9.0f);
}

TEST(InkMl, OrientationOfThePenIsKept)
{
    const Recording recording =
        ReadInkMl("page.inkml", WithFormat("<channel name=\"X\"/><channel name=\"Y\"/>"
                                           "<channel name=\"OA\"/><channel name=\"OE\"/>",
                                           "<trace>0 0 120 50</trace>"));
    EXPECT_FLOAT_EQ(recording.strokes.at(0).at(0).azimuth, 120.0f);
    EXPECT_FLOAT_EQ(recording.strokes.at(0).at(0).altitude, 50.0f);
    const Recording tilted =
        ReadInkMl("page.inkml", WithFormat("<channel name=\"X\"/><channel name=\"Y\"/>"
                                           "<channel name=\"OTx\"/><channel name=\"OTy\"/>",
                                           "<trace>0 0 0 30</trace>"));
    EXPECT_NEAR(tilted.strokes.at(0).at(0).azimuth, 90.0f, 1e-3f);
    EXPECT_NEAR(tilted.strokes.at(0).at(0).altitude, 60.0f, 1e-3f);
}

TEST(InkMl, AnEmptyPageSaysWhatItsTracesWouldBeLike)
{
    const Recording page = ReadInkMl(
        "page.inkml", WithFormat("<channel name=\"X\"/><channel name=\"Y\"/>", "<!-- none -->"));
    EXPECT_TRUE(page.strokes.empty());
    EXPECT_TRUE(page.hovers.empty());
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

TEST(SvcFile, HoldsHoverAndOrientation)
{
    const Recording recording = Ink::ReadSvcFile("a.svc", "3\n"
                                                          "1 2 0.5 0 1200 900 0\n"
                                                          "3 4 0.6 1 1200 450 0.5\n"
                                                          "5 6 0.7 1 1200 450 0.25");
    ASSERT_EQ(recording.hovers.size(), 1u);
    ASSERT_EQ(recording.strokes.size(), 1u);
    const Ink::Sample& sample = recording.strokes[0].at(0);
    EXPECT_FLOAT_EQ(sample.x, 3.0f);
    EXPECT_FLOAT_EQ(sample.y, -4.0f);
    EXPECT_DOUBLE_EQ(sample.time, 0.6);
    EXPECT_FLOAT_EQ(sample.azimuth, 120.0f);
    EXPECT_FLOAT_EQ(sample.altitude, 45.0f);
    EXPECT_FLOAT_EQ(sample.pressure, 0.5f);
}

TEST(SvcFile, WholeTimesAreMillisecondsAndRawPressuresAreScaled)
{
    const Recording recording = Ink::ReadSvcFile("a.svc", "1\n"
                                                          "1 2 8000 1 0 900 500\n"
                                                          "3 4 8008 1 0 900 2000\n");
    EXPECT_DOUBLE_EQ(recording.strokes.at(0).at(1).time, 8.008);
    EXPECT_FLOAT_EQ(recording.strokes[0].at(0).pressure, 0.25f);
    EXPECT_FLOAT_EQ(recording.strokes[0].at(1).pressure, 1.0f);
}

TEST(SvcFile, ErrorsNameTheLine)
{
    const auto error = [](const std::string& text)
    { return ErrorOf([&] { Ink::ReadSvcFile("a.svc", text); }); };
    EXPECT_EQ(error("2\n1 2 3 1 5 6 0.5\n"),
              "a.svc:2: cut short: fewer samples than the first line says");
    EXPECT_EQ(error("1\n1 2 3 1 5 6\n"),
              "a.svc:2: seven numbers were expected: x, y, time, pen down, azimuth, altitude, "
              "pressure");
    EXPECT_EQ(error("1\n1 2 3 2 5 6 0.5\n"), "a.svc:2: pen down is neither 0 nor 1");
    EXPECT_EQ(error("1\n1 2 3 1 5 6 -1\n"), "a.svc:2: the pressure is negative");
    EXPECT_EQ(error("2\n1 2 3 1 5 6 0.5\n1 2 2 1 5 6 0.5\n"), "a.svc:3: the time runs backwards");
    EXPECT_EQ(error("1\n1 2 3 0 5 6 0.5\n"), "a.svc:2: the pen never touches the page");
}

TEST(StrokeList, BreakEndsAStroke)
{
    const Recording recording =
        Ink::ReadStrokeList("a.txt", "START\n1,-2,0\n3,-4,500\nBREAK\n5,-6,1000\nBREAK\n");
    ASSERT_EQ(recording.strokes.size(), 2u);
    EXPECT_FLOAT_EQ(recording.strokes[0].at(1).x, 3.0f);
    EXPECT_FLOAT_EQ(recording.strokes[0].at(1).y, 4.0f);
    EXPECT_DOUBLE_EQ(recording.strokes[0].at(1).time, 0.5);
    EXPECT_EQ(ErrorOf([] { Ink::ReadStrokeList("a.txt", "START\n1,2,3\n"); }),
              "a.txt:2: cut short: the last stroke has no BREAK");
    EXPECT_EQ(ErrorOf([] { Ink::ReadStrokeList("a.txt", "START\n1,2\nBREAK\n"); }),
              "a.txt:2: three numbers were expected: x, y and time");
}

TEST(InkJson, PointerEventsInColumns)
{
    const Recording recording = Ink::ReadInkJson(
        "a.json", R"({"x":[1,2,3],"y":[4,5,6],"time":[10,20,35],"pressure":[0,0.25,0.5],
                      "buttons":[0,1,1],"tiltX":[0,0,45],"tiltY":[0,0,0],"pointerType":"pen"})");
    ASSERT_EQ(recording.hovers.size(), 1u);
    ASSERT_EQ(recording.strokes.size(), 1u);
    ASSERT_EQ(recording.strokes[0].size(), 2u);
    const Ink::Sample& sample = recording.strokes[0][1];
    EXPECT_FLOAT_EQ(sample.x, 3.0f);
    EXPECT_FLOAT_EQ(sample.y, 6.0f);
    EXPECT_DOUBLE_EQ(sample.time, 0.035);
    EXPECT_FLOAT_EQ(sample.pressure, 0.5f);
    EXPECT_NEAR(sample.altitude, 45.0f, 1e-3f);
    EXPECT_NEAR(sample.azimuth, 0.0f, 1e-3f);
}

TEST(InkJson, NamedStrokes)
{
    const Recording recording = Ink::ReadInkJson(
        "a.json", R"({"a":[[1,2],[3,4]],"b":[{"y":6,"x":5}],"c":[[7,8,0.75,16],[9,8,0.5,32]]})");
    ASSERT_EQ(recording.strokes.size(), 3u);
    EXPECT_FLOAT_EQ(recording.strokes[0].at(1).y, 4.0f);
    EXPECT_FLOAT_EQ(recording.strokes[1].at(0).x, 5.0f);
    EXPECT_FLOAT_EQ(recording.strokes[1].at(0).y, 6.0f);
    EXPECT_FLOAT_EQ(recording.strokes[2].at(0).pressure, 0.75f);
    EXPECT_LT(recording.strokes[2].at(0).time, recording.strokes[2].at(1).time);
}

TEST(InkJson, ErrorsNameTheLine)
{
    const auto error = [](const std::string& text)
    { return ErrorOf([&] { Ink::ReadInkJson("a.json", text); }); };
    EXPECT_EQ(error("{\n\"a\": [[1,2],\n"),
              "a.json:3: not well-formed JSON: parse error at line 3, column 1: syntax error while "
              "parsing value - unexpected end of input; expected '[', '{', or a literal");
    EXPECT_EQ(error("{}"), "a.json:1: neither pointer events nor lists of points");
    EXPECT_EQ(error("{\"a\":[[[1]]]}"), "a.json:1: neither pointer events nor lists of points");
    EXPECT_EQ(error("{\"a\":[[1]]}"), "a.json:1: a point of \"a\" has no x or no y");
    EXPECT_EQ(error("{\"x\":[1],\"y\":[1,2]}"),
              "a.json:1: the columns \"x\" and \"y\" differ in length");
}

/// Every recording that users have sent, with what stands in it.
TEST(Recording, FurtherRecordingsAreWhole)
{
    const char* const folder = std::getenv("NIB_STROKES");
    if (!folder)
        GTEST_SKIP() << "NIB_STROKES does not name the folder of further recordings";
    const auto read = [folder](const char* name)
    { return Ink::ReadRecording(std::string(folder) + "/" + name); };
    EXPECT_EQ(read("handwriting-sample/signal.svc").strokes.size(), 5u);
    EXPECT_EQ(read("handwriting-sample/signal2.svc").strokes.size(), 3u);
    EXPECT_EQ(read("perfect-freehand/inputs.json").strokes.size(), 12u);
    EXPECT_FALSE(read("handwriting-sample/pointer-events.json").strokes.empty());
    int lists = 0;
    for (const auto& entry :
         std::filesystem::recursive_directory_iterator(std::string(folder) + "/omniglot"))
        if (entry.path().extension() == ".txt")
            lists += Ink::ReadRecording(entry.path()).strokes.empty() ? 0 : 1;
    EXPECT_EQ(lists, 64);
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
