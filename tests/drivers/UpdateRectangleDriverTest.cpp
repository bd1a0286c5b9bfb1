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

    EglContext m_context;
    HybridSurface m_surface;
};

TEST_F(UpdateRectangleOnDriver, WindowKeepsItsContent)
{
    if (IsSurfaceless())
        GTEST_SKIP() << "this display has no windows";
    XWindow window(64, 48);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    UpdateRectangle update;

    update.Init(m_surface.GetActiveSurface());

    EXPECT_EQ(update.GetUpdateMode(), 0x09u);
    EXPECT_EQ(update.GetTileSize(), 0);
    EXPECT_EQ(update.GetScreenWidth(), 64);
    EXPECT_EQ(update.GetScreenHeight(), 48);
}

TEST_F(UpdateRectangleOnDriver, SecondFrameChangesOnlyWhatItDraws)
{
    if (IsSurfaceless())
        GTEST_SKIP() << "this display has no windows";
    XWindow window(64, 48);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    UpdateRectangle update;
    update.Init(m_surface.GetActiveSurface());

    // Given a green frame
    Clear(0.0f, 1.0f, 0.0f, 1.0f);
    update.Reset();
    EXPECT_TRUE(update.DoSwapBuffers());

    // When the next one draws 8 x 8 red pixels at the top left of the window
    int x = -1;
    int y = -1;
    int width = -1;
    int height = -1;
    update.UseRect(RectF(0, 0, 8, 8), 0);
    update.GetScissorRect(RectF(0, 0, 8, 8), &x, &y, &width, &height, 0);
    EXPECT_EQ(x, 0);
    EXPECT_EQ(y, 40);
    EXPECT_EQ(width, 8);
    EXPECT_EQ(height, 8);
    glEnable(GL_SCISSOR_TEST);
    glScissor(x, y, width, height);
    Clear(1.0f, 0.0f, 0.0f, 1.0f);
    glDisable(GL_SCISSOR_TEST);
    update.Reset();
    EXPECT_TRUE(update.DoSwapBuffers());

    // Then the rest is still green
    EXPECT_TRUE(Near(window.AtOnceNear(4, 4, {255, 0, 0}), {255, 0, 0}));
    EXPECT_TRUE(Near(window.At(8, 8), {0, 255, 0}));
    EXPECT_TRUE(Near(window.At(60, 40), {0, 255, 0}));
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST_F(UpdateRectangleOnDriver, NewBufferIsDirtyUntilItsCentreIsDrawn)
{
    if (IsSurfaceless())
        GTEST_SKIP() << "this display has no windows";
    XWindow window(64, 48);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    UpdateRectangle update;
    update.Init(m_surface.GetActiveSurface());

    // This driver does not tell the age of a buffer, so that its centre decides.
    Clear(0.0f, 0.0f, 0.0f, 0.0f);
    EXPECT_TRUE(update.IsFramebufferDirty());

    Clear(0.0f, 0.0f, 0.0f, 1.0f);
    EXPECT_FALSE(update.IsFramebufferDirty());
}

TEST_F(UpdateRectangleOnDriver, PbufferIsUpdatedOnceAWay)
{
    if (!IsSurfaceless())
        GTEST_SKIP() << "this display has windows";
    UpdateRectangle update;

    update.Init(m_surface.GetActiveSurface());

    EXPECT_TRUE(update.GetUpdateMode() == 0x09u || update.GetUpdateMode() == 0x01u);
    EXPECT_EQ(update.GetScreenWidth(), 1);
    Clear(0.0f, 0.0f, 1.0f, 1.0f);
    update.UseRect(RectF(0, 0, 1, 1), 0);
    update.Reset();
    EXPECT_TRUE(update.DoSwapBuffers());
    EXPECT_EQ(PixelAt(0, 0), (Rgba{0, 0, 255, 255}));
}

TEST(AndroidPropertyOnDriver, IsNotThereOnLinux)
{
    char value[92] = "before";

    EXPECT_EQ(android_property_get("ro.sf.hwrotation", value), 0);

    EXPECT_STREQ(value, "");
}

} // namespace
