#include "gles/UniformBuffer.h"

#include "gles/GlContext.h"

#include <gtest/gtest.h>

using namespace Nib;
using GLES::UniformBuffer;

namespace
{

constexpr GLuint kBuffer = 1; // the first name of a new context

struct Released
{
    void operator()(UniformBuffer* buffer) const { buffer->Release(); }
};
using Buffer = std::unique_ptr<UniformBuffer, Released>;

/// A context, and a buffer whose making is forgotten. Without an array buffer its empty storage is
/// an error of GL.
struct UniformBufferTest : ::testing::Test
{
    UniformBufferTest()
    {
        gl.driver.AllowMisuse("glBufferData");
        buffer.reset(new UniformBuffer);
        glGetError();
        gl.Forget();
    }

    GlContext gl;
    Buffer buffer;
};

} // namespace

TEST(UniformBuffer, ConstructionMakesABufferAndEmptiesTheArrayBuffer)
{
    GlContext gl;
    gl.driver.ExpectMisuse("glBufferData");

    Buffer buffer(new UniformBuffer);

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glGenBuffers", 1, kAddress),
                        Call("glBindBuffer", GL_UNIFORM_BUFFER, kBuffer),
                        Call("glBufferData", GL_ARRAY_BUFFER, 0, kAddress, GL_DYNAMIC_DRAW),
                        Call("glBindBuffer", GL_UNIFORM_BUFFER, 0)}));
    EXPECT_EQ(gl.driver.LastCall("glBufferData").args[2], SimValue(nullptr));
    EXPECT_EQ(gl.driver.Buffer(kBuffer).usage, 0u);
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_INVALID_OPERATION));
}

TEST(UniformBuffer, ConstructionEmptiesABoundArrayBuffer)
{
    GlContext gl;
    GLuint array = 0;
    glGenBuffers(1, &array);
    glBindBuffer(GL_ARRAY_BUFFER, array);
    glBufferData(GL_ARRAY_BUFFER, 4, "abc", GL_STATIC_DRAW);

    Buffer buffer(new UniformBuffer);

    EXPECT_TRUE(gl.driver.Buffer(array).bytes.empty());
    EXPECT_EQ(gl.driver.Buffer(array).usage, static_cast<GLenum>(GL_DYNAMIC_DRAW));
    glDeleteBuffers(1, &array);
}

TEST_F(UniformBufferTest, UpdateReplacesTheContents)
{
    const unsigned char data[] = {1, 2, 3};

    buffer->Update(data, 3, BufferUsage::Static);

    EXPECT_EQ(gl.driver.Calls(), Sequence({Call("glBindBuffer", GL_UNIFORM_BUFFER, kBuffer),
                                           Call("glBufferData", GL_UNIFORM_BUFFER, 3,
                                                static_cast<const void*>(data), GL_STATIC_DRAW),
                                           Call("glBindBuffer", GL_UNIFORM_BUFFER, 0)}));
    EXPECT_EQ(gl.driver.Buffer(kBuffer).bytes, (std::vector<unsigned char>{1, 2, 3}));
}

TEST_F(UniformBufferTest, EveryUsageHasItsGLValue)
{
    const float data[4] = {};

    buffer->Update(data, sizeof(data), static_cast<BufferUsage>(0));
    EXPECT_EQ(gl.driver.Buffer(kBuffer).usage, static_cast<GLenum>(GL_STREAM_DRAW));
    buffer->Update(data, sizeof(data), static_cast<BufferUsage>(1));
    EXPECT_EQ(gl.driver.Buffer(kBuffer).usage, static_cast<GLenum>(GL_STATIC_DRAW));
    buffer->Update(data, sizeof(data), static_cast<BufferUsage>(2));
    EXPECT_EQ(gl.driver.Buffer(kBuffer).usage, static_cast<GLenum>(GL_DYNAMIC_DRAW));
    EXPECT_EQ(gl.driver.Buffer(kBuffer).bytes.size(), 16u);
}

TEST_F(UniformBufferTest, UpdateAcceptsNoData)
{
    buffer->Update(nullptr, 64, BufferUsage::Stream);

    EXPECT_EQ(gl.driver.Buffer(kBuffer).bytes.size(), 64u);
}

TEST_F(UniformBufferTest, ActivateBindsToABindingPoint)
{
    buffer->Update(nullptr, 16, BufferUsage::Dynamic);
    for (int binding = 0; binding < 4; ++binding)
    {
        gl.Forget();

        buffer->Activate(binding);

        EXPECT_EQ(gl.Issued(),
                  Sequence({Call("glBindBufferBase", GL_UNIFORM_BUFFER, binding, kBuffer)}));
    }
}

TEST_F(UniformBufferTest, ReleaseDeletesTheBuffer)
{
    buffer.reset();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glDeleteBuffers", 1, kAddress)}));
    EXPECT_EQ(gl.driver.LastCall("glDeleteBuffers").list, (std::vector<long long>{kBuffer}));
    EXPECT_FALSE(gl.driver.Buffer(kBuffer).exists);
}

TEST_F(UniformBufferTest, DestructionAloneDeletesNoName)
{
    delete buffer.release();

    EXPECT_EQ(gl.driver.CallCount(), 0u);
    glDeleteBuffers(1, &kBuffer);
}

using UniformBufferDeathTest = UniformBufferTest;

TEST_F(UniformBufferDeathTest, TheFifthBindingPointEndsTheProcess)
{
    EXPECT_DEATH(buffer->Activate(4), "nib_log: cond: Error! Please, change value of variable "
                                      "MAX_UNIFORM_BUFFER_BINDINGS\n");
}

TEST_F(UniformBufferDeathTest, AnyBindingPointBeyondEndsTheProcess)
{
    EXPECT_DEATH(buffer->Activate(1000), "MAX_UNIFORM_BUFFER_BINDINGS");
}
