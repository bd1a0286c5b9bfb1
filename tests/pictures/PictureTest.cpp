// Pictures that the library paints, on the driver that the run is for.

#include "pictures/Golden.h"
#include "pictures/InkScene.h"

#include "drivers/Driver.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstdio>

namespace
{

/// How well a picture of black ink on white agrees with what it is to cover.
struct Agreement
{
    double overlap = 0.0;        ///< intersection over union of the pixels that are covered by half
    double edgeDifference = 0.0; ///< average over the pixels that are covered in part in either
    int edgePixels = 0;
};

Agreement AgreementOf(const Picture& picture, const Reference::Coverage& expected)
{
    Agreement result;
    int both = 0, either = 0;
    double sum = 0.0;
    for (int y = 0; y < picture.height; ++y)
        for (int x = 0; x < picture.width; ++x)
        {
            const double painted = 1.0 - picture.At(x, y)[0] / 255.0;
            const double ruled = std::min(expected.At(x, y), 1.0);
            both += painted >= 0.5 && ruled >= 0.5 ? 1 : 0;
            either += painted >= 0.5 || ruled >= 0.5 ? 1 : 0;
            if (std::min(painted, ruled) > 0.999 || std::max(painted, ruled) < 0.001)
                continue;
            sum += std::abs(painted - ruled);
            ++result.edgePixels;
        }
    result.overlap = either > 0 ? static_cast<double>(both) / either : 1.0;
    result.edgeDifference = sum / std::max(1, result.edgePixels);
    return result;
}

/// The least and the most that is covered of a pixel and those around it.
std::pair<double, double> CoverageAround(const Reference::Coverage& coverage, int x, int y)
{
    std::pair<double, double> result{1.0, 0.0};
    for (int row = std::max(0, y - 1); row <= std::min(coverage.Height() - 1, y + 1); ++row)
        for (int column = std::max(0, x - 1); column <= std::min(coverage.Width() - 1, x + 1);
             ++column)
        {
            result.first = std::min(result.first, coverage.At(column, row));
            result.second = std::max(result.second, coverage.At(column, row));
        }
    return result;
}

testing::AssertionResult IsNear(const std::uint8_t* pixel, const std::array<int, 4>& expected)
{
    for (std::size_t i = 0; i < 4; ++i)
        if (std::abs(pixel[i] - expected[i]) > 1)
            return testing::AssertionFailure() << int{pixel[0]} << ", " << int{pixel[1]} << ", "
                                               << int{pixel[2]} << ", " << int{pixel[3]};
    return testing::AssertionSuccess();
}

class FlatPicture : public testing::Test
{
protected:
    void SetUp() override
    {
        if (!HasPbuffers())
            GTEST_SKIP() << kNoPbuffers;
    }
};
class ReferencePicture : public FlatPicture, public testing::WithParamInterface<const char*>
{
};
class GoldenPicture : public FlatPicture, public testing::WithParamInterface<const char*>
{
};

std::string NameOf(const testing::TestParamInfo<const char*>& scene)
{
    std::string name = scene.param;
    std::replace_if(
        name.begin(), name.end(), [](char c) { return !std::isalnum(c); }, '_');
    return name;
}

} // namespace

TEST_P(ReferencePicture, CoversWhatTheRuleSays)
{
    const InkScene scene = SceneNamed(GetParam());
    if (scene.recording.strokes.empty())
        GTEST_SKIP() << "NIB_STROKES, the folder of further recordings, is unset";

    const Agreement agreement = AgreementOf(Painted(scene), ExpectedCoverage(scene));

    EXPECT_GE(agreement.overlap, 0.98);
    EXPECT_LE(agreement.edgeDifference, 0.15);
    EXPECT_GT(agreement.edgePixels, 100);
    std::printf("overlap %.4f, %d edge pixels differ by %.4f on average\n", agreement.overlap,
                agreement.edgePixels, agreement.edgeDifference);
}

INSTANTIATE_TEST_SUITE_P(Every, ReferencePicture,
                         testing::Values("dots", "rays", "spiral", "corners", "sample",
                                         "libmypaint/painting30sec.dat",
                                         "perfect-freehand/inputs.json",
                                         "omniglot/Latin/character10/0692_01.txt",
                                         "omniglot/Korean/character06/0648_02.txt"),
                         NameOf);

TEST_P(GoldenPicture, IsAsAccepted)
{
    const auto result = IsAsAccepted(GetParam(), Painted(SceneNamed(GetParam())));
    EXPECT_TRUE(result);
    std::puts(result.message());
}

INSTANTIATE_TEST_SUITE_P(Every, GoldenPicture,
                         testing::Values("dots", "rays", "spiral", "corners", "corners-marker",
                                         "rays-stamp", "spiral-stamp"),
                         NameOf);

TEST_F(FlatPicture, InkAndPaperHaveTheirColours)
{
    InkScene scene = SceneNamed("spiral");
    scene.style.colour = {0.3f, 0.55f, 0.8f, 1.0f};
    scene.paper = {0.95f, 0.9f, 0.75f, 1.0f};
    const Reference::Coverage expected = ExpectedCoverage(scene);

    const Picture picture = Painted(scene);

    int ink = 0, paper = 0;
    for (int y = 0; y < picture.height; ++y)
        for (int x = 0; x < picture.width; ++x)
        {
            const auto [least, most] = CoverageAround(expected, x, y);
            if (least > 0.999)
            {
                ++ink;
                EXPECT_TRUE(IsNear(picture.At(x, y), {77, 140, 204, 255})) << x << ", " << y;
            }
            else if (most == 0.0)
            {
                ++paper;
                EXPECT_TRUE(IsNear(picture.At(x, y), {242, 230, 191, 255})) << x << ", " << y;
            }
        }
    EXPECT_GT(ink, 1000);
    EXPECT_GT(paper, 5000);
}
