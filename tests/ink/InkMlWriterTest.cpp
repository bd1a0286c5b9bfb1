#include "InkMlWriter.h"
#include "InkMl.h"

#include <gtest/gtest.h>
#include <limits>
#include <random>

namespace
{

void ExpectEqual(const std::vector<Ink::Stroke>& read, const std::vector<Ink::Stroke>& written)
{
    ASSERT_EQ(read.size(), written.size());
    for (std::size_t i = 0; i < read.size(); ++i)
    {
        ASSERT_EQ(read[i].size(), written[i].size()) << "stroke " << i;
        for (std::size_t j = 0; j < read[i].size(); ++j)
        {
            const Ink::Sample& a = read[i][j];
            const Ink::Sample& b = written[i][j];
            EXPECT_EQ(a.time, b.time) << "sample " << i << ", " << j;
            EXPECT_EQ(a.x, b.x) << "sample " << i << ", " << j;
            EXPECT_EQ(a.y, b.y) << "sample " << i << ", " << j;
            EXPECT_EQ(a.pressure, b.pressure) << "sample " << i << ", " << j;
            EXPECT_EQ(a.azimuth, b.azimuth) << "sample " << i << ", " << j;
            EXPECT_EQ(a.altitude, b.altitude) << "sample " << i << ", " << j;
        }
    }
}

void ExpectReadsBack(const Ink::Recording& recording)
{
    const Ink::Recording read = Ink::ReadInkMl("written", Ink::ToInkMl(recording));
    ExpectEqual(read.strokes, recording.strokes);
    ExpectEqual(read.hovers, recording.hovers);
}

TEST(InkMlWriter, AnEmptyPageReadsBack)
{
    ExpectReadsBack(Ink::Recording());
}

TEST(InkMlWriter, WritesATraceAStroke)
{
    Ink::Recording recording;
    recording.strokes = {
        {{0.25, 1.5f, 2.0f, 0.75f, 60.0f, 45.0f}, {0.5, 3.0f, 4.0f, 1.0f, 90.0f, 0.0f}},
        {{1.0, 5.0f, 6.0f, 0.5f, 90.0f, 0.0f}}};
    const std::string text = Ink::ToInkMl(recording);
    EXPECT_NE(
        text.find("  <trace contextRef=\"#pen\">1.5 2 0.75 0.25 45 60, 3 4 1 0.5 0 90</trace>\n"
                  "  <trace contextRef=\"#pen\">5 6 0.5 1 0 90</trace>\n</ink>\n"),
        std::string::npos)
        << text;
    ExpectReadsBack(recording);
}

TEST(InkMlWriter, WritesNoExponents)
{
    Ink::Recording recording;
    recording.strokes = {{{1.0e-12, 1.0e30f, -1.0e-30f, 1.0e-7f, 1.0e-5f, 359.99997f}}};
    EXPECT_EQ(Ink::ToInkMl(recording).find("e-"), std::string::npos);
    EXPECT_EQ(Ink::ToInkMl(recording).find("e+"), std::string::npos);
    ExpectReadsBack(recording);
}

TEST(InkMlWriter, KeepsTheExtremesOfItsNumbers)
{
    using Float = std::numeric_limits<float>;
    using Double = std::numeric_limits<double>;
    Ink::Recording recording;
    recording.strokes = {{{Double::denorm_min(), Float::max(), Float::lowest()},
                          {Double::max(), Float::denorm_min(), Float::min(), Float::denorm_min()}}};
    ExpectReadsBack(recording);
}

TEST(InkMlWriter, KeepsEverySampleToTheBit)
{
    std::mt19937 random(20261121);
    std::uniform_real_distribution<float> place(-50.0f, 5000.0f), unit(0.0f, 1.0f),
        turn(0.0f, 359.9f), lean(0.0f, 90.0f);
    std::uniform_real_distribution<double> pause(0.0, 0.02);
    Ink::Recording recording;
    double time = 0.0;
    for (int stroke = 0; stroke < 20; ++stroke)
    {
        recording.strokes.emplace_back();
        for (int i = 0; i < 200; ++i)
            recording.strokes.back().push_back({time += pause(random), place(random), place(random),
                                                unit(random), lean(random), turn(random)});
    }
    ExpectReadsBack(recording);
}

TEST(InkMlWriter, PutsHoversBetweenTheStrokesOfTheirTime)
{
    Ink::Recording recording;
    recording.strokes = {{{1.0, 1, 1}, {2.0, 2, 2}}, {{2.0, 3, 3}}, {{5.0, 5, 5}, {6.0, 6, 6}}};
    recording.hovers = {{{0.5, 7, 7}, {1.0, 8, 8}}, {{3.0, 9, 9}}, {{6.0, 10, 10}, {7.0, 11, 11}}};
    ExpectReadsBack(recording);
}

TEST(InkMlWriter, AnEmptyPageHasNoTrace)
{
    const std::string text = Ink::ToInkMl(Ink::Recording());
    EXPECT_EQ(text.find("<trace "), std::string::npos);
    EXPECT_NE(text.find("</ink>\n"), std::string::npos);
}

} // namespace
