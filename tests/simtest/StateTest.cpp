#include "sim/SimDriver.h"

#include <gtest/gtest.h>

namespace
{

GLint Integer(GLenum name)
{
    GLint value = -1;
    glGetIntegerv(name, &value);
    return value;
}

TEST(SimState, QueriesGiveBackWhatWasSet)
{
    SimDriver driver;
    const SimContext context(driver);
    glEnable(GL_BLEND);
    glBlendFuncSeparate(GL_ONE, GL_ZERO, GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA);
    glDepthMask(GL_FALSE);
    glViewport(1, 2, 3, 4);
    glActiveTexture(GL_TEXTURE3);
    glPixelStorei(GL_PACK_ROW_LENGTH, 9);
    glStencilFuncSeparate(GL_BACK, GL_LESS, 3, 0xF0);

    GLboolean flag = 9;
    glGetBooleanv(GL_BLEND, &flag);
    EXPECT_EQ(flag, GL_TRUE);
    glGetBooleanv(GL_DEPTH_WRITEMASK, &flag);
    EXPECT_EQ(flag, GL_FALSE);
    glGetBooleanv(GL_SCISSOR_TEST, &flag);
    EXPECT_EQ(flag, GL_FALSE);
    EXPECT_EQ(Integer(GL_BLEND_SRC_ALPHA), GL_SRC_ALPHA);
    EXPECT_EQ(Integer(GL_BLEND_DST_RGB), GL_ZERO);
    EXPECT_EQ(Integer(GL_ACTIVE_TEXTURE), GL_TEXTURE3);
    EXPECT_EQ(Integer(GL_PACK_ROW_LENGTH), 9);
    EXPECT_EQ(Integer(GL_STENCIL_BACK_REF), 3);
    EXPECT_EQ(Integer(GL_STENCIL_REF), 0);
    GLint viewport[4];
    glGetIntegerv(GL_VIEWPORT, viewport);
    EXPECT_EQ(viewport[3], 4);
}

TEST(SimState, LimitsAreTheDevices)
{
    SimDriver driver(SimGpu::Default().WithMaxTextureSize(4096).WithMaxViewport(5000, 6000));
    const SimContext context(driver);
    GLint dims[2];
    glGetIntegerv(GL_MAX_VIEWPORT_DIMS, dims);
    EXPECT_EQ(Integer(GL_MAX_TEXTURE_SIZE), 4096);
    EXPECT_EQ(dims[0], 5000);
    EXPECT_EQ(dims[1], 6000);
    EXPECT_EQ(Integer(GL_MAX_UNIFORM_BLOCK_SIZE), 65536);
    EXPECT_EQ(Integer(GL_MAX_VERTEX_UNIFORM_BLOCKS), 12);
}

TEST(SimState, AnErrorStaysUntilItIsRead)
{
    SimDriver driver;
    driver.ExpectMisuse("glEnable");
    driver.ExpectMisuse("glViewport");
    const SimContext context(driver);
    glEnable(0x1234);
    glViewport(0, 0, -1, 1);

    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST(SimState, AnEs2DeviceHasNoSamplers)
{
    SimDriver driver(SimGpu::Named("Mali-400 MP"));
    const SimContext context(driver);
    GLuint name = 5;
    glGenSamplers(1, &name);

    EXPECT_EQ(name, 0u);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION});
}

TEST(SimState, TilingPairs)
{
    SimDriver driver(SimGpu::Named("Adreno (TM) 530"));
    const SimContext context(driver);
    const auto start = reinterpret_cast<void (*)(GLuint, GLuint, GLuint, GLuint, GLbitfield)>(
        eglGetProcAddress("glStartTilingQCOM"));
    const auto end = reinterpret_cast<void (*)(GLbitfield)>(eglGetProcAddress("glEndTilingQCOM"));
    ASSERT_NE(start, nullptr);

    start(0, 0, 4, 4, 0);
    end(1);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
    end(1);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION});
    EXPECT_EQ(driver.Calls("glStartTilingQCOM"),
              Sequence({Call("glStartTilingQCOM", 0, 0, 4, 4, 0)}));
}

TEST(SimBuffer, ContentsAndUsage)
{
    SimDriver driver;
    const SimContext context(driver);
    GLuint name = 0;
    glGenBuffers(1, &name);
    EXPECT_FALSE(glIsBuffer(name));
    glBindBuffer(GL_ARRAY_BUFFER, name);
    EXPECT_TRUE(glIsBuffer(name));
    glBufferData(GL_ARRAY_BUFFER, 4, "abcd", GL_STREAM_DRAW);
    glBufferSubData(GL_ARRAY_BUFFER, 1, 2, "xy");

    EXPECT_EQ(driver.Buffer(name).bytes, (std::vector<unsigned char>{'a', 'x', 'y', 'd'}));
    EXPECT_EQ(driver.Buffer(name).usage, GLenum{GL_STREAM_DRAW});
    glDeleteBuffers(1, &name);
    EXPECT_EQ(Integer(GL_ARRAY_BUFFER_BINDING), 0);
    EXPECT_FALSE(driver.Buffer(name).exists);
}

TEST(SimBuffer, DataWithoutABufferIsMisuse)
{
    SimDriver driver;
    driver.ExpectMisuse("glBufferData");
    const SimContext context(driver);
    glBufferData(GL_ARRAY_BUFFER, 0, nullptr, GL_DYNAMIC_DRAW);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION});
}

TEST(SimBuffer, BasesBindTheTargetToo)
{
    SimDriver driver;
    const SimContext context(driver);
    GLuint name = 0;
    glGenBuffers(1, &name);
    glBindBufferBase(GL_UNIFORM_BUFFER, 2, name);
    GLint bound = 0;
    glGetIntegeri_v(GL_UNIFORM_BUFFER_BINDING, 2, &bound);
    EXPECT_EQ(bound, static_cast<GLint>(name));
    EXPECT_EQ(Integer(GL_UNIFORM_BUFFER_BINDING), static_cast<GLint>(name));
}

TEST(SimDraws, KeepTheirAttributes)
{
    SimDriver driver;
    const SimContext context(driver);
    GLuint names[2];
    glGenBuffers(2, names);
    glBindBuffer(GL_ARRAY_BUFFER, names[0]);
    glBufferData(GL_ARRAY_BUFFER, 96, nullptr, GL_STATIC_DRAW);
    glEnableVertexAttribArray(0);
    glVertexAttribPointer(0, 2, GL_FLOAT, GL_FALSE, 24, nullptr);
    glEnableVertexAttribArray(1);
    glVertexAttribPointer(1, 4, GL_FLOAT, GL_FALSE, 24, reinterpret_cast<void*>(8));
    glVertexAttribDivisor(1, 1);
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, names[1]);
    glBufferData(GL_ELEMENT_ARRAY_BUFFER, 24, nullptr, GL_DYNAMIC_DRAW);

    glDrawElements(GL_TRIANGLES, 3, GL_UNSIGNED_INT, reinterpret_cast<void*>(12));
    glDrawArraysInstanced(GL_POINTS, 1, 2, 5);

    const std::vector<SimDraw> draws = driver.Draws();
    ASSERT_EQ(draws.size(), 2u);
    EXPECT_EQ(draws[0].indexBuffer, names[1]);
    EXPECT_EQ(draws[0].count, 3);
    EXPECT_EQ(draws[0].indices, reinterpret_cast<void*>(12));
    EXPECT_EQ(draws[0].attribs[0].size, 2);
    EXPECT_EQ(draws[0].attribs[1].buffer, names[0]);
    EXPECT_EQ(draws[0].attribs[1].pointer, reinterpret_cast<void*>(8));
    EXPECT_EQ(draws[0].attribs[1].divisor, 1u);
    EXPECT_FALSE(draws[0].attribs[2].enabled);
    EXPECT_EQ(draws[1].instances, 5);
    EXPECT_EQ(draws[1].first, 1);
}

TEST(SimDraws, IndicesBehindTheBufferAreMisuse)
{
    SimDriver driver;
    driver.ExpectMisuse("glDrawElements");
    const SimContext context(driver);
    GLuint name = 0;
    glGenBuffers(1, &name);
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, name);
    glBufferData(GL_ELEMENT_ARRAY_BUFFER, 10, nullptr, GL_DYNAMIC_DRAW);
    glDrawElements(GL_TRIANGLES, 3, GL_UNSIGNED_INT, nullptr);
}

} // namespace
