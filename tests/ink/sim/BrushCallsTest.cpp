#include "gles/GlesFixture.h"
#include "InkPainter.h"
#include "InkStroke.h"
#include "Program.h"

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <gtest/gtest.h>

namespace
{

using Ink::BrushKind;
using Ink::BrushStyle;
using Ink::InkPiece;

constexpr int kWidth = 100;
constexpr int kHeight = 80;
constexpr long long kSquare = 4; // corners of a dab

/// A page and a painter on the simulated driver, with a folder of its own for program binaries.
class BrushCalls : public GlesTest
{
protected:
    BrushCalls() : m_folder(MakeFolder()), page(kWidth, kHeight, {1, 1, 1, 1}) { Forget(); }
    ~BrushCalls() override { std::filesystem::remove_all(m_folder); }

    void Forget() { driver.ForgetCalls(); }

    /// Paints and forgets what making the brush has called.
    void PaintFirst(const InkPiece& piece)
    {
        painter.Paint(piece, page);
        Forget();
    }

    std::vector<float> FloatsOf(GLuint buffer) const
    {
        const std::vector<unsigned char> bytes = driver.Buffer(buffer).bytes;
        std::vector<float> floats(bytes.size() / sizeof(float));
        std::memcpy(floats.data(), bytes.data(), floats.size() * sizeof(float));
        return floats;
    }

private:
    static std::string MakeFolder()
    {
        std::string folder = std::filesystem::temp_directory_path() / "nib-brush-XXXXXX";
        if (!mkdtemp(folder.data()))
            throw std::runtime_error("no temporary folder");
        static std::string kept; // the library keeps the pointer's text, the test the folder
        kept = folder + "/sdk";
        Nib::System::SetSDKCacheDirectoryPath(kept.c_str());
        return folder;
    }

    std::string m_folder; // before the first program

protected:
    Ink::Page page;
    Ink::InkPainter painter;
};

InkPiece Dabs(std::size_t count)
{
    InkPiece piece;
    piece.style = Ink::DefaultStyle(BrushKind::Stamp);
    piece.startsStroke = true;
    piece.dabs.assign(count, {50, 40, 6, 0, 6, 0.5f, 0});
    return piece;
}

/// A triangle in the box from (@p left, @p top) to (@p right, @p bottom).
InkPiece Band(const BrushStyle& style, float left, float top, float right, float bottom,
              bool startsStroke)
{
    InkPiece piece;
    piece.style = style;
    piece.startsStroke = startsStroke;
    piece.band = {{left, top, 1}, {right, top, 1}, {left, bottom, 1}};
    return piece;
}

const BrushStyle kPen = Ink::DefaultStyle(BrushKind::Pen);
const BrushStyle kMarker = Ink::DefaultStyle(BrushKind::Marker);

TEST_F(BrushCalls, AllDabsOfAPieceAreOneInstancedDraw)
{
    painter.Paint(Dabs(37), page);
    EXPECT_EQ(driver.Calls("glDrawArraysInstanced"),
              Sequence({Call("glDrawArraysInstanced", GL_TRIANGLE_STRIP, 0, kSquare, 37)}));
    EXPECT_EQ(driver.CallCount("glDrawArrays"), 0u);
    ASSERT_EQ(driver.Draws().size(), 1u);
    const SimDraw draw = driver.Draws().front();
    EXPECT_EQ(draw.instances, 37);
    ASSERT_GE(draw.attribs.size(), 4u);
    EXPECT_EQ(draw.attribs[0].divisor, 0u); // the corners of the square
    for (const int location : {1, 2, 3})
        EXPECT_EQ(draw.attribs[static_cast<std::size_t>(location)].divisor, 1u) << location;
}

TEST_F(BrushCalls, DabsOfAStrokeReachTheDriverInOrder)
{
    Ink::InkStroke stroke(Ink::DefaultStyle(BrushKind::Stamp));
    stroke.Add({10, 20, 8, 0.5f, 0, 1});
    stroke.Add({18, 20, 8, 0.5f, 0, 1});
    stroke.End();
    painter.Paint(stroke.Take(), page);
    ASSERT_EQ(driver.Draws().size(), 1u);
    const SimDraw draw = driver.Draws().front();
    EXPECT_EQ(draw.instances, 3);
    const std::vector<float> dabs = FloatsOf(draw.attribs[1].buffer);
    ASSERT_EQ(dabs.size(), 21u);
    const std::vector<float> first = {10, 20, 8, 0, 8, 0.5f, 0};
    EXPECT_EQ(std::vector<float>(dabs.begin(), dabs.begin() + 7), first);
    EXPECT_NEAR(dabs[7], 14.0f, 0.01f);
    EXPECT_NEAR(dabs[14], 18.0f, 0.01f);
}

TEST_F(BrushCalls, MoreDabsThanADrawTakesAreSeveralDraws)
{
    painter.Paint(Dabs(20000), page);
    EXPECT_EQ(driver.Calls("glDrawArraysInstanced"),
              Sequence({Call("glDrawArraysInstanced", GL_TRIANGLE_STRIP, 0, kSquare, 16384),
                        Call("glDrawArraysInstanced", GL_TRIANGLE_STRIP, 0, kSquare, 3616)}));
}

TEST_F(BrushCalls, SquareOfTheStampIsUploadedAgainAfterALoss)
{
    PaintFirst(Dabs(1));
    painter.Paint(Dabs(1), page);
    EXPECT_EQ(driver.CallCount("glBufferData"), 1u); // the dab alone
    Forget();
    painter.Suspend();
    painter.Resume();
    ASSERT_EQ(driver.CallCount("glBufferData"), 1u);
    EXPECT_EQ(driver.LastCall("glBufferData").Arg(1), 32); // four corners of two floats
    EXPECT_EQ(driver.CallCount("glTexSubImage2D") + driver.CallCount("glTexImage2D"), 1u);
}

TEST_F(BrushCalls, PenDrawsOnceWithItsAlphaOverThePage)
{
    painter.Paint(Band(kPen, 10, 10, 20, 20, true), page);
    EXPECT_EQ(driver.Calls("glDrawArrays"), Sequence({Call("glDrawArrays", GL_TRIANGLES, 0, 3)}));
    EXPECT_EQ(driver.LastCall("glBlendEquationSeparate"),
              Call("glBlendEquationSeparate", GL_FUNC_ADD, GL_FUNC_ADD));
    EXPECT_EQ(driver.LastCall("glBlendFuncSeparate"),
              Call("glBlendFuncSeparate", GL_ONE, GL_ONE_MINUS_SRC_ALPHA, GL_ONE,
                   GL_ONE_MINUS_SRC_ALPHA));
}

TEST_F(BrushCalls, MarkerKeepsTheGreatestCoverageApartFromThePage)
{
    painter.Paint(Band(kMarker, 10, 10, 20, 20, true), page);
    EXPECT_EQ(driver.LastCall("glBlendEquationSeparate"),
              Call("glBlendEquationSeparate", GL_MAX, GL_MAX));
    const std::vector<SimDraw> draws = driver.Draws();
    ASSERT_EQ(draws.size(), 3u); // what lies below is set aside; the band; the coat
    EXPECT_EQ(draws[0].count, 6);
    EXPECT_EQ(draws[1].count, 3);
    EXPECT_EQ(draws[2].count, 6);
    EXPECT_NE(draws[0].framebuffer, draws[1].framebuffer);
    EXPECT_NE(draws[1].framebuffer, draws[2].framebuffer);
    EXPECT_NE(draws[2].framebuffer, draws[0].framebuffer);
    EXPECT_EQ(FloatsOf(draws[2].attribs[0].buffer),
              (std::vector<float>{10, 10, 20, 10, 10, 20, 10, 20, 20, 10, 20, 20}));
}

TEST_F(BrushCalls, MarkerGoesOnWithinItsReachWithoutSettingAside)
{
    PaintFirst(Band(kMarker, 10, 10, 40, 40, true));
    painter.Paint(Band(kMarker, 20, 20, 30, 30, false), page);
    EXPECT_EQ(driver.Draws().size(), 2u); // the band and the coat
    EXPECT_EQ(driver.CallCount("glClear"), 0u);
}

TEST_F(BrushCalls, MarkerSetsAsideWhatItsReachGrowsBy)
{
    PaintFirst(Band(kMarker, 10, 10, 40, 40, true));
    painter.Paint(Band(kMarker, 30, 20, 60, 30, false), page);
    ASSERT_EQ(driver.Draws().size(), 3u);
    EXPECT_EQ(driver.Draws()[0].count, 6); // one strip, to the right of the reach
    EXPECT_EQ(driver.Calls("glScissor"), Sequence({Call("glScissor", 40, 10, 20, 30)}));
    EXPECT_EQ(driver.CallCount("glClear"), 1u);
}

TEST_F(BrushCalls, NextStrokeOfAMarkerLiesOverTheOneBefore)
{
    PaintFirst(Band(kMarker, 10, 10, 40, 40, true));
    painter.Paint(Band(kMarker, 20, 20, 30, 30, true), page);
    EXPECT_EQ(driver.Draws().size(), 3u); // the first stroke is set aside with the page
    EXPECT_EQ(driver.Calls("glScissor"), Sequence({Call("glScissor", 20, 20, 10, 10)}));
}

TEST_F(BrushCalls, MarkerBesideThePageDrawsNothing)
{
    PaintFirst(Band(kMarker, 10, 10, 40, 40, true));
    painter.Paint(Band(kMarker, 200, 10, 240, 40, false), page);
    EXPECT_TRUE(driver.Draws().empty());
    EXPECT_EQ(driver.CallCount("glClear"), 0u);
}

TEST_F(BrushCalls, TranslucentPenLaysOneCoat)
{
    BrushStyle translucent = kPen;
    translucent.colour.alpha = 0.5f;
    painter.Paint(Band(translucent, 10, 10, 20, 20, true), page);
    EXPECT_EQ(driver.Draws().size(), 3u);
    EXPECT_EQ(driver.LastCall("glBlendEquationSeparate"),
              Call("glBlendEquationSeparate", GL_MAX, GL_MAX));
}

TEST_F(BrushCalls, NoBrushLeavesTheScissorOn)
{
    for (const InkPiece& piece :
         {Dabs(1), Band(kPen, 10, 10, 20, 20, true), Band(kMarker, 10, 10, 20, 20, true)})
    {
        painter.Paint(piece, page);
        EXPECT_EQ(glIsEnabled(GL_SCISSOR_TEST), GL_FALSE);
    }
}

TEST_F(BrushCalls, BrushIsMadeWhenItIsFirstAskedFor)
{
    EXPECT_EQ(driver.Live().programs, 0);
    painter.Paint(Band(kPen, 10, 10, 20, 20, true), page);
    EXPECT_EQ(driver.Live().programs, 1);
    painter.Paint(Dabs(1), page);
    EXPECT_EQ(driver.Live().programs, 2);
    painter.Paint(Dabs(1), page);
    EXPECT_EQ(driver.Live().programs, 2);
}

TEST_F(BrushCalls, ProgramsAreCountedAsCompiledOrLoaded)
{
    painter.Paint(Band(kPen, 10, 10, 20, 20, true), page);
    EXPECT_EQ(Ink::Program::Counts().compiled, 1);
    EXPECT_EQ(Ink::Program::Counts().loaded, 0);

    Ink::InkPainter another; // finds what the first one left in the cache
    another.Paint(Band(kPen, 10, 10, 20, 20, true), page);
    EXPECT_EQ(Ink::Program::Counts().compiled, 1);
    EXPECT_EQ(Ink::Program::Counts().loaded, 1);
}

} // namespace
