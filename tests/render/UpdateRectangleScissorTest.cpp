#include "render/UpdateWindow.h"

#include <gtest/gtest.h>

using Nib::RectF;
using Nib::UpdateRectangle;

// Scissor boxes, and whether the content of the back buffer is known.

// ---- GetScissorRect -----------------------------------------------------------------------------

namespace
{

/// The scissor box of the dirty rectangle for a back buffer of this age.
Box ScissorAtAge(int age)
{
    UpdateWindow window(WithAge(TilingDevice(), age));
    const auto rectangle = window.Rectangle();
    window.Swap();
    return ScissorOf(*rectangle, kDirty);
}

} // namespace

TEST(UpdateRectangleScissor, ScissorOfABufferOfAgeZeroIsTheScreen)
{
    EXPECT_EQ(ScissorAtAge(0), kFullScreen);
}

TEST(UpdateRectangleScissor, ScissorOfABufferOfAgeOneIsTheDirtyBox)
{
    EXPECT_EQ(ScissorAtAge(1), kDirtyBox);
}

TEST(UpdateRectangleScissor, ScissorOfABufferOfAgeTwoIsTheDirtyBox)
{
    EXPECT_EQ(ScissorAtAge(2), kDirtyBox);
}

TEST(UpdateRectangleScissor, ScissorOfABufferOfAgeThreeIsTheDirtyBox)
{
    EXPECT_EQ(ScissorAtAge(3), kDirtyBox);
}

TEST(UpdateRectangleScissor, ScissorOfABufferOfAgeFourIsTheScreen)
{
    EXPECT_EQ(ScissorAtAge(4), kFullScreen);
}

TEST(UpdateRectangleScissor, ScissorOfAnEmptyRectangleIsAllZero)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();

    EXPECT_EQ(ScissorOf(*rectangle, RectF(50, 60, 50, 70)), Box(0, 0, 0, 0));
    EXPECT_EQ(ScissorOf(*rectangle, RectF(50, 60, 40, 70)), Box(0, 0, 0, 0));
    EXPECT_EQ(ScissorOf(*rectangle, RectF(50, 70, 60, 70)), Box(0, 0, 0, 0));
}

TEST(UpdateRectangleScissor, UnknownBufferComesBeforeAnEmptyRectangle)
{
    UpdateWindow window(WithAge(TilingDevice(), 0));
    const auto rectangle = window.Rectangle();

    EXPECT_EQ(ScissorOf(*rectangle, RectF()), kFullScreen);
}

TEST(UpdateRectangleScissor, ScissorDropsFractions)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();

    EXPECT_EQ(ScissorOf(*rectangle, RectF(100.9F, 200.25F, 300.75F, 260.5F)),
              Box(100, 1659, 199, 60));
}

TEST(UpdateRectangleScissor, ScissorIsNotAlignedWhereTilesAreNot)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();

    for (int rotationIndex : {-1, 0, 1, 2, 3})
        EXPECT_EQ(ScissorOf(*rectangle, kDirty, rotationIndex), kDirtyBox);
}

TEST(UpdateRectangleScissor, ScissorOfTiledMaliIsAligned)
{
    UpdateWindow window(WithAge(TiledMali(), 2));
    UpdateRectangle rectangle;
    rectangle.Init(window.surface.get(), 1080, 1910);
    window.Swap();

    EXPECT_EQ(ScissorOf(rectangle, kDirty, 0), Box(96, 1632, 224, 96));
    EXPECT_EQ(ScissorOf(rectangle, kDirty, 1), Box(88, 1632, 224, 96));
    EXPECT_EQ(ScissorOf(rectangle, kDirty, 2), Box(88, 1622, 224, 96));
    EXPECT_EQ(ScissorOf(rectangle, kDirty, 3), Box(96, 1622, 224, 96));
    EXPECT_EQ(ScissorOf(rectangle, kDirty, -1), Box(88, 1622, 224, 96));
    EXPECT_EQ(ScissorOf(rectangle, RectF(), 0), Box(0, 0, 0, 0)); // not a tile
}

// ---- is the back buffer known -------------------------------------------------------------------

namespace
{

bool DirtyAtAge(int age)
{
    UpdateWindow window(WithAge(PlainDevice().WithoutPreservedSwap(), age));
    const auto rectangle = window.Rectangle();
    window.Swap();
    return rectangle->IsFramebufferDirty();
}

} // namespace

TEST(UpdateRectangleScissor, BufferOfAgeZeroIsDirty)
{
    EXPECT_TRUE(DirtyAtAge(0));
}

TEST(UpdateRectangleScissor, BufferOfAgeOneIsNotDirty)
{
    EXPECT_FALSE(DirtyAtAge(1));
}

TEST(UpdateRectangleScissor, BufferOfAgeThreeIsNotDirty)
{
    EXPECT_FALSE(DirtyAtAge(3));
}

TEST(UpdateRectangleScissor, BufferOfAgeFourIsDirty)
{
    EXPECT_TRUE(DirtyAtAge(4));
}

TEST(UpdateRectangleScissor, KnownAgeReadsNoPixel)
{
    UpdateWindow window(WithAge(PlainDevice(), 1));
    const auto rectangle = window.Rectangle();

    rectangle->IsFramebufferDirty();

    EXPECT_EQ(window.driver.CallNames(), Names({"eglQuerySurface"}));
}

TEST(UpdateRectangleScissor, WithoutAnAgeTheCentreDecides)
{
    UpdateWindow window(PlainDevice().WithoutEglExtension("EGL_EXT_buffer_age"));
    const auto rectangle = window.Rectangle();

    FillBackBuffer(0, 0, 0, 0);
    window.Forget();
    EXPECT_TRUE(rectangle->IsFramebufferDirty());

    const SimCall read = window.driver.LastCall("glReadPixels");
    // GL_RGBA, GL_UNSIGNED_BYTE
    EXPECT_EQ(read, Call("glReadPixels", 540, 960, 1, 1, 0x1908, 0x1401, read.args.at(6)));
    FillBackBuffer(0, 0, 0, 1);
    EXPECT_FALSE(rectangle->IsFramebufferDirty());
    FillBackBuffer(1, 0, 0, 0);
    EXPECT_FALSE(rectangle->IsFramebufferDirty());
}

TEST(UpdateRectangleScissor, CentreOfAnOddSizeIsRoundedDown)
{
    UpdateWindow window(OldTilingDevice());
    UpdateRectangle rectangle;
    rectangle.Init(window.surface.get(), 1079, 1919);

    rectangle.IsFramebufferDirty();

    const SimCall read = window.driver.LastCall("glReadPixels");
    EXPECT_EQ(read.Arg(0), 539);
    EXPECT_EQ(read.Arg(1), 959);
}

TEST(UpdateRectangleScissor, QuestionForAnAgeThatIsNotThereIsLoggedEachTime)
{
    UpdateWindow window(PlainDevice().WithoutEglExtension("EGL_EXT_buffer_age"));
    const auto rectangle = window.Rectangle();

    rectangle->IsFramebufferDirty();
    ScissorOf(*rectangle, kDirty);

    // EGL_BUFFER_AGE_EXT is 12605, EGL_BAD_ATTRIBUTE 12292.
    EXPECT_EQ(window.driver.CountLog(ANDROID_LOG_ERROR,
                                     "bool Nib::EglSurface::QueryAttribute(int, int *) const : "
                                     "Failed. attr = 12605, err = 12292"),
              2u);
}

TEST(UpdateRectangleScissor, AgeIsNotAskedForWhereItIsNotToBeTrusted)
{
    UpdateWindow window(WithAge(OldTilingDevice(), 2));
    const auto rectangle = window.Rectangle();

    rectangle->IsFramebufferDirty();
    ScissorOf(*rectangle, kDirty);

    EXPECT_EQ(window.driver.CallNames(), Names({"glReadPixels", "glReadPixels"}));
    EXPECT_EQ(window.driver.Log().size(), 0u);
}

TEST(UpdateRectangleScissor, ScissorGoesByTheCentreWithoutAnAge)
{
    UpdateWindow window(OldTilingDevice());
    const auto rectangle = window.Rectangle();

    FillBackBuffer(0, 0, 0, 0);
    EXPECT_EQ(ScissorOf(*rectangle, kDirty), kFullScreen);
    FillBackBuffer(0, 0, 0, 1);
    EXPECT_EQ(ScissorOf(*rectangle, kDirty), kDirtyBox);
}

TEST(UpdateRectangleScissor, CentreThatCannotBeReadIsDirty)
{
    UpdateWindow window(OldTilingDevice());
    const auto rectangle = window.Rectangle();
    FillBackBuffer(1, 1, 1, 1);
    window.driver.FailNext("glReadPixels", GL_INVALID_OPERATION);

    EXPECT_TRUE(rectangle->IsFramebufferDirty());
}
