#include "sim/SimDriver.h"

#include <gtest/gtest.h>

// What tells two runs apart by what they drew, and what a lost context does.

namespace
{

class Picture : public testing::Test
{
protected:
    Picture() : context(driver) { driver.NotePictures(true); }

    /// Clears to grey, draws @p vertices points, and gives the picture that is then read.
    SimPicture Drawn(int vertices)
    {
        unsigned char pixel[4] = {};
        glClearColor(0.5f, 0.5f, 0.5f, 1);
        glClear(GL_COLOR_BUFFER_BIT);
        if (vertices > 0)
            glDrawArrays(GL_POINTS, 0, vertices);
        glReadPixels(0, 0, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, pixel);
        return driver.Pictures().back();
    }

    SimDriver driver;
    SimContext context;
};

} // namespace

TEST_F(Picture, IsTheSameForTheSameDraws)
{
    EXPECT_EQ(Drawn(3), Drawn(3));
}

TEST_F(Picture, DiffersByADrawAndByItsArguments)
{
    EXPECT_FALSE(Drawn(0) == Drawn(3));
    EXPECT_FALSE(Drawn(2) == Drawn(3));
}

TEST_F(Picture, DiffersByTheStateOfADraw)
{
    const SimPicture plain = Drawn(3);
    glEnable(GL_BLEND);

    EXPECT_FALSE(Drawn(3) == plain);
}

TEST_F(Picture, LostContextsDoNothingAndCannotBecomeCurrent)
{
    driver.ForgetCalls();
    driver.LoseContextsAt(1);
    eglGetCurrentContext();

    GLuint name = 7;
    glGenTextures(1, &name);
    EXPECT_EQ(name, 0u);
    EXPECT_EQ(eglMakeCurrent(eglGetDisplay(EGL_DEFAULT_DISPLAY), driver.Surfaces().front(),
                             driver.Surfaces().front(), context.Handle()),
              EGLBoolean{EGL_FALSE});
    EXPECT_EQ(eglGetError(), EGL_CONTEXT_LOST);
}
