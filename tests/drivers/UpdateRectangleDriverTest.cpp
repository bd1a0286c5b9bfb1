// Partial update where the window keeps its content, which is what real drivers here offer.

#include "drivers/EglOnDriver.h"

#include <nib/device.h>
#include <nib/partial_update.h>

using namespace Nib;

namespace
{

class UpdateRectangleOnDriver : public EglOnDriver
{
protected:
    void SetUp() override
    {
        EglOnDriver::SetUp();
        if (IsSkipped())
            return;
        ASSERT_NO_FATAL_FAILURE(MakeReady(m_context, m_surface));
        OpenGLRenderer::InitParameters();
    }

    void Attach(XWindow& window)
    {
        ASSERT_TRUE(m_surface.AttachToWindow(window.Native()));
        ASSERT_TRUE(Egl::GetInstance()->MakeCurrent(&m_context, m_surface.GetActiveSurface()));
    }

    static bool TellsAges()
    {
        return Egl::GetInstance()->IsEglExtensionSupported("EGL_EXT_buffer_age");
    }

    /// Restricts drawing to what @p update makes of @p dirty.
    static void ScissorTo(UpdateRectangle& update, const RectF& dirty)
    {
        int x = -1;
        int y = -1;
        int width = -1;
        int height = -1;
        update.UseRect(dirty, 0);
        update.GetScissorRect(dirty, &x, &y, &width, &height, 0);
        glEnable(GL_SCISSOR_TEST);
        glScissor(x, y, width, height);
    }

    static void Present(UpdateRectangle& update)
    {
        update.Reset();
        EXPECT_TRUE(update.DoSwapBuffers());
    }

    EglContext m_context;
    HybridSurface m_surface;
};

TEST_F(UpdateRectangleOnDriver, WindowKeepsItsContentWhereItCan)
{
    if (!HasXServer())
        GTEST_SKIP() << "this display has no windows";
    XWindow window(64, 48);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    UpdateRectangle update;

    update.Init(m_surface.GetActiveSurface());

    EXPECT_EQ(update.GetUpdateMode(), CanPreserve() ? 0x09u : 0x01u);
    EXPECT_EQ(update.GetTileSize(), 0);
    EXPECT_EQ(update.GetScreenWidth(), 64);
    EXPECT_EQ(update.GetScreenHeight(), 48);
}

TEST_F(UpdateRectangleOnDriver, SecondFrameChangesOnlyWhatItDraws)
{
    if (!HasXServer())
        GTEST_SKIP() << "this display has no windows";
    if (!CanPreserve())
        GTEST_SKIP() << "windows lose their content in a swap";
    XWindow window(64, 48);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    UpdateRectangle update;
    update.Init(m_surface.GetActiveSurface());

    // Given a green frame
    Clear(0.0f, 1.0f, 0.0f, 1.0f);
    Present(update);

    // When the next ones draw 8 x 8 red pixels at the top left of the window; two, because softpipe
    // shows one that is only a clear with the next
    for (int i = 0; i < 2; ++i)
    {
        ScissorTo(update, RectF(0, 0, 8, 8));
        Clear(1.0f, 0.0f, 0.0f, 1.0f);
        glDisable(GL_SCISSOR_TEST);
        Present(update);
    }

    // Then the rest is still green
    EXPECT_TRUE(Near(window.AtOnceNear(4, 4, {255, 0, 0}), {255, 0, 0}));
    EXPECT_TRUE(Near(window.At(8, 8), {0, 255, 0}));
    EXPECT_TRUE(Near(window.At(60, 40), {0, 255, 0}));
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST_F(UpdateRectangleOnDriver, ScissorBoxIsExactWhereTheContentIsKnown)
{
    if (!HasXServer())
        GTEST_SKIP() << "this display has no windows";
    if (TellsAges())
        GTEST_SKIP() << "the age of a new buffer is 0";
    XWindow window(64, 48);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    UpdateRectangle update;
    update.Init(m_surface.GetActiveSurface());
    Clear(0.0f, 1.0f, 0.0f, 1.0f);

    ScissorTo(update, RectF(0, 0, 8, 8));

    GLint box[4] = {};
    glGetIntegerv(GL_SCISSOR_BOX, box);
    EXPECT_EQ(box[0], 0);
    EXPECT_EQ(box[1], 40);
    EXPECT_EQ(box[2], 8);
    EXPECT_EQ(box[3], 8);
}

TEST_F(UpdateRectangleOnDriver, NewBufferIsDirtyUntilItsCentreIsDrawn)
{
    if (!HasXServer())
        GTEST_SKIP() << "this display has no windows";
    if (TellsAges())
        GTEST_SKIP() << "the age of a buffer decides, not its centre";
    XWindow window(64, 48);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    UpdateRectangle update;
    update.Init(m_surface.GetActiveSurface());

    Clear(0.0f, 0.0f, 0.0f, 0.0f);
    EXPECT_TRUE(update.IsFramebufferDirty());

    Clear(0.0f, 0.0f, 0.0f, 1.0f);
    EXPECT_FALSE(update.IsFramebufferDirty());
}

TEST_F(UpdateRectangleOnDriver, NewBufferIsDirtyByItsAge)
{
    if (!HasXServer())
        GTEST_SKIP() << "this display has no windows";
    if (!TellsAges())
        GTEST_SKIP() << "this driver does not tell the age of a buffer";
    XWindow window(64, 48);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    UpdateRectangle update;
    update.Init(m_surface.GetActiveSurface());

    Clear(0.0f, 0.0f, 0.0f, 1.0f);

    EXPECT_TRUE(update.IsFramebufferDirty());
    ScissorTo(update, RectF(0, 0, 8, 8));
    GLint box[4] = {};
    glGetIntegerv(GL_SCISSOR_BOX, box);
    EXPECT_EQ(box[2], 64);
    EXPECT_EQ(box[3], 48);
}

TEST_F(UpdateRectangleOnDriver, PbufferIsPresentedToo)
{
    if (HasXServer())
        GTEST_SKIP() << "this display has windows";
    UpdateRectangle update;

    update.Init(m_surface.GetActiveSurface());

    EXPECT_TRUE(update.GetUpdateMode() == 0x09u || update.GetUpdateMode() == 0x01u);
    EXPECT_EQ(update.GetScreenWidth(), 1);
    Clear(0.0f, 0.0f, 1.0f, 1.0f);
    update.UseRect(RectF(0, 0, 1, 1), 0);
    Present(update);
    EXPECT_EQ(PixelAt(0, 0), (Rgba{0, 0, 255, 255}));
}

TEST(AndroidPropertyOnDriver, IsNotThereOnLinux)
{
    char value[92] = "before";

    EXPECT_EQ(android_property_get("ro.sf.hwrotation", value), 0);

    EXPECT_STREQ(value, "");
}

} // namespace
