#include "gles/RasterizerState.h"

#include "gles/GlContext.h"

#include <gtest/gtest.h>

using namespace Nib;
using GLES::RasterizerState;

TEST(RasterizerState, EnablesTheScissor)
{
    GlContext gl;
    RasterizerState state;

    state.SetScissorEnabled(true);

    EXPECT_EQ(gl.Issued(), Sequence({Call("glEnable", GL_SCISSOR_TEST)}));
}

TEST(RasterizerState, DisablesTheScissor)
{
    GlContext gl;
    RasterizerState state;

    state.SetScissorEnabled(false);

    EXPECT_EQ(gl.Issued(), Sequence({Call("glDisable", GL_SCISSOR_TEST)}));
}

TEST(RasterizerState, SetsTheScissorBox)
{
    GlContext gl;
    RasterizerState state;

    state.SetScissorRect({1, 2, 30, 40});

    EXPECT_EQ(gl.Issued(), Sequence({Call("glScissor", 1, 2, 30, 40)}));
}

TEST(RasterizerState, ReadsWhetherTheScissorIsOnFromGL)
{
    GlContext gl;
    RasterizerState state;

    EXPECT_FALSE(state.IsScissorEnabled());
    glEnable(GL_SCISSOR_TEST);
    gl.Forget();
    EXPECT_TRUE(state.IsScissorEnabled());

    EXPECT_EQ(gl.Issued(), Sequence({Call("glGetBooleanv", GL_SCISSOR_TEST, kAddress)}));
}

TEST(RasterizerState, ReadsTheScissorBoxFromGL)
{
    GlContext gl;
    const RasterizerState state;
    glScissor(5, 6, 70, 80);
    gl.Forget();

    const IRasterizerState::ScissorRect rect = state.GetScissorRect();

    EXPECT_EQ(rect.x, 5);
    EXPECT_EQ(rect.y, 6);
    EXPECT_EQ(rect.width, 70);
    EXPECT_EQ(rect.height, 80);
    EXPECT_EQ(gl.Issued(), Sequence({Call("glGetIntegerv", GL_SCISSOR_BOX, kAddress)}));
}
