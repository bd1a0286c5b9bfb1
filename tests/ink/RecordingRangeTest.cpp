#include "InkJson.h"
#include "InkMl.h"
#include "PenLog.h"
#include "StrokeList.h"
#include "SvcFile.h"

#include <gtest/gtest.h>
#include <string>

// Values at the end of what numbers can hold, and files that would take long: what the fuzzers of
// the readers have found.

namespace
{

using Ink::ReadError;
using Ink::Recording;
using Ink::Sample;

template <typename Read>
std::string ErrorOf(Read read, const std::string& text)
{
    try
    {
        read("file", text);
    }
    catch (const ReadError& error)
    {
        return error.what();
    }
    return "no error";
}

std::string Repeated(int count, const std::string& text)
{
    std::string all;
    for (int i = 0; i < count; ++i)
        all += text;
    return all;
}

std::string InkMl(const std::string& channels, const std::string& rest)
{
    return "<ink><traceFormat><channel name=\"X\"/><channel name=\"Y\"/>" + channels +
           "</traceFormat>" + rest + "</ink>";
}

Sample FirstOf(const Recording& recording)
{
    return recording.strokes.at(0).at(0);
}

// ---- texts without a line -----------------------------------------------------------------------

TEST(EmptyText, IsAnErrorInLineOne)
{
    EXPECT_EQ(ErrorOf(Ink::ReadPenLog, "").substr(0, 8), "file:1: ");
    EXPECT_EQ(ErrorOf(Ink::ReadSvcFile, "").substr(0, 8), "file:1: ");
    EXPECT_EQ(ErrorOf(Ink::ReadStrokeList, "").substr(0, 8), "file:1: ");
    EXPECT_EQ(ErrorOf(Ink::ReadInkJson, "").substr(0, 8), "file:1: ");
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, "").substr(0, 8), "file:1: ");
}

// ---- where the pen leans ------------------------------------------------------------------------

TEST(SvcRange, LeansAreBroughtIntoTheirRanges)
{
    const auto read = [](const std::string& azimuth, const std::string& altitude) {
        return FirstOf(
            Ink::ReadSvcFile("file", "1\n1 2 3 1 " + azimuth + " " + altitude + " 0.5\n"));
    };
    EXPECT_FLOAT_EQ(read("4500", "450").azimuth, 90.0f);
    EXPECT_FLOAT_EQ(read("-900", "450").azimuth, 270.0f);
    EXPECT_FLOAT_EQ(read("3600", "450").azimuth, 0.0f);
    EXPECT_FLOAT_EQ(read("900", "1200").altitude, 90.0f);
    EXPECT_FLOAT_EQ(read("900", "-1").altitude, 0.0f);
    EXPECT_FLOAT_EQ(read("1e300", "1e300").altitude, 90.0f);
}

TEST(InkMlRange, LeansAreBroughtIntoTheirRanges)
{
    const Sample sample =
        FirstOf(Ink::ReadInkMl("file", InkMl("<channel name=\"OA\"/><channel name=\"OE\"/>",
                                             "<trace>1 2 -90 100</trace>")));
    EXPECT_FLOAT_EQ(sample.azimuth, 270.0f);
    EXPECT_FLOAT_EQ(sample.altitude, 90.0f);
}

TEST(InkMlRange, ALeanThatGrowsWithoutEndIsNotKnown)
{
    const Recording recording = Ink::ReadInkMl(
        "file", InkMl("<channel name=\"OA\"/>", "<trace>1 2 '1e308, 1 2 1e308, 1 2 1e308</trace>"));
    EXPECT_FLOAT_EQ(recording.strokes.at(0).at(2).azimuth, 0.0f);
    EXPECT_FLOAT_EQ(recording.strokes.at(0).at(2).altitude, 90.0f);
}

TEST(TiltRange, APenThatLiesFlatLiesWhereItIsTilted)
{
    const Sample right =
        FirstOf(Ink::ReadInkJson("file", "{\"x\":[1],\"y\":[2],\"tiltX\":[90],\"tiltY\":[0]}"));
    EXPECT_NEAR(right.azimuth, 0.0f, 0.01f);
    EXPECT_NEAR(right.altitude, 0.0f, 0.01f);
    const Sample up =
        FirstOf(Ink::ReadInkJson("file", "{\"x\":[1],\"y\":[2],\"tiltX\":[0],\"tiltY\":[-90]}"));
    EXPECT_NEAR(up.azimuth, 270.0f, 0.01f);
}

// ---- pressures and times ------------------------------------------------------------------------

TEST(InkMlRange, PressuresBeyondAFloatAreRefused)
{
    EXPECT_EQ(
        ErrorOf(Ink::ReadInkMl, InkMl("<channel name=\"F\"/>", "<trace>1 2 1e300, 3 4 5</trace>")),
        "file:1: a value of a point is out of range");
}

TEST(InkMlRange, PressuresOfAnEndlessRangeAreRefused)
{
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, InkMl("<channel name=\"F\" min=\"-1e999\" max=\"1e999\"/>",
                                            "<trace>1 2 3</trace>")),
              "file:1: a value of a point is out of range");
}

TEST(InkMlRange, TimesThatDoNotFollowOnEachOtherAreRefused)
{
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl,
                      InkMl("<channel name=\"T\" units=\"s\"/>",
                            "<trace>1 2 1.7e308</trace>\n<trace>1 2 -1.7e308, 3 4 1</trace>")),
              "file:2: the times are out of range");
}

TEST(SvcRange, PressuresBeyondAFloatAreRefused)
{
    EXPECT_EQ(ErrorOf(Ink::ReadSvcFile, "1\n1 2 3 1 900 450 1e300\n"),
              "file:2: a value of the sample is out of range");
}

// ---- files that would take long -----------------------------------------------------------------

TEST(InkMlSize, ElementsMayStandTwoHundredFiftySixDeep)
{
    const auto nested = [](int depth)
    { return "<ink>" + Repeated(depth, "<a>") + "<trace>1 2</trace>" + Repeated(depth, "</a>"); };
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, nested(254) + "</ink>"), "no error");
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, nested(255) + "</ink>"),
              "file:1: the elements are nested too deeply");
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, nested(200000) + "</ink>"),
              "file:1: the elements are nested too deeply");
}

TEST(InkMlSize, AFormatMayHaveSixtyFourChannels)
{
    const std::string traces = "<trace>1 2" + Repeated(62, " 3") + "</trace>";
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, InkMl(Repeated(62, "<channel name=\"Q\"/>"), traces)),
              "no error");
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, InkMl(Repeated(63, "<channel name=\"Q\"/>"), traces)),
              "file:1: the trace format has more than 64 channels");
}

TEST(InkMlSize, AFileMayHaveFiveHundredThousandTags)
{
    const auto withTags = [](int count)
    { return "<ink><trace>1 2</trace>" + Repeated(count - 4, "<a/>") + "</ink>"; };
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, withTags(500000)), "no error");
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, "\n" + withTags(500001)), "file:2: more than 500000 tags");
}

TEST(InkMlSize, AFileMayHaveFiveHundredThousandAttributes)
{
    const auto withAttributes = [](int count)
    { return "<ink" + Repeated(count, " a=''") + "><trace>1 2</trace></ink>"; };
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, withAttributes(500000)), "no error");
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, withAttributes(500001)),
              "file:1: more than 500000 attributes");
}

TEST(InkMlSize, AFileMayHaveSixtyFourMebibytes)
{
    const std::string text = "<ink><trace>1 2</trace></ink>";
    const std::string blanks((64u << 20) - text.size(), ' ');
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, text + blanks), "no error");
    EXPECT_EQ(ErrorOf(Ink::ReadInkMl, text + blanks + " "),
              "file:1: larger than 64 MiB, for InkML");
}

TEST(InkMlSize, AContextIsSearchedOnceForAllItsTraces)
{
    // Quadratic, this would take much longer than a test may.
    const Recording recording = Ink::ReadInkMl(
        "file", "<ink><context id=\"c\">" + Repeated(40000, "<a/>") +
                    "<traceFormat><channel name=\"Y\"/><channel name=\"X\"/></traceFormat>"
                    "</context>" +
                    Repeated(40000, "<trace contextRef=\"#c\">1 2</trace>") + "</ink>");
    EXPECT_EQ(recording.strokes.size(), 40000u);
    EXPECT_FLOAT_EQ(FirstOf(recording).x, 2.0f);
}

TEST(InkJsonSize, LongNamesAreLookedUpOnceAList)
{
    // Quadratic, this would take much longer than a test may.
    const std::string name(1000000, 'k');
    const Recording recording =
        Ink::ReadInkJson("file", "{\"" + name + "\":[" + Repeated(200000, "[1,2],") + "[1,2]]}");
    EXPECT_EQ(recording.strokes.size(), 1u);
    EXPECT_EQ(recording.strokes[0].size(), 200001u);
}

TEST(InkJsonSize, AStringMayHaveAMebibyte)
{
    const auto named = [](std::size_t length)
    { return "{\n\"" + std::string(length - 1, 'k') + "\":[[1,2]]}"; };
    EXPECT_EQ(ErrorOf(Ink::ReadInkJson, named(1u << 20)), "no error");
    EXPECT_EQ(ErrorOf(Ink::ReadInkJson, named((1u << 20) + 1)),
              "file:2: a string is longer than 1 MiB");
    EXPECT_EQ(ErrorOf(Ink::ReadInkJson, "{\"" + std::string(2u << 20, '\\')),
              "file:1: a string is longer than 1 MiB"); // escapes, and no end
}

TEST(InkJsonSize, NumbersOfNoKnownNameAreNotKept)
{
    EXPECT_EQ(ErrorOf(Ink::ReadInkJson, "{\"a\":[1,2,3],\"x\":[1],\"y\":[2],\"b\":[1]}"),
              "no error");
    EXPECT_EQ(ErrorOf(Ink::ReadInkJson, "{\"a\":[1,2,3],\"x\":[1]}"),
              "file:1: neither pointer events nor lists of points");
}

TEST(InkJsonSize, EachListOfPointsIsAStroke)
{
    const Recording recording =
        Ink::ReadInkJson("file", "{\"a\":[[1,2],[3,4]],\"none\":[],\"b\":[[5,6]]}");
    ASSERT_EQ(recording.strokes.size(), 2u);
    EXPECT_EQ(recording.strokes[0].size(), 2u);
    EXPECT_FLOAT_EQ(recording.strokes[1][0].x, 5.0f);
}

} // namespace
