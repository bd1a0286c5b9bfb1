#include "DriverContext.h"

#include <nib/device.h>

#include <array>
#include <cstdint>
#include <vector>

// Store and restore of the state, entry by entry, on whatever driver the process has loaded.

using Nib::OpenGLRenderer;

namespace
{

class OpenGlStateOnDriver : public DriverContext
{
protected:
    void SetUp() override
    {
        DriverContext::SetUp();
        m_samplers = OpenGLRenderer::getSupportSampler();
    }

    static GLint Attribute(GLuint index, GLenum name)
    {
        GLint value = -1;
        glGetVertexAttribiv(index, name, &value);
        return value;
    }

    static void* AttributePointer(GLuint index)
    {
        void* pointer = nullptr;
        glGetVertexAttribPointerv(index, GL_VERTEX_ATTRIB_ARRAY_POINTER, &pointer);
        return pointer;
    }

    static GLuint NewTexture()
    {
        GLuint name = 0;
        glGenTextures(1, &name);
        glBindTexture(GL_TEXTURE_2D, name);
        return name;
    }

    static GLuint NewBuffer(GLenum target)
    {
        GLuint name = 0;
        glGenBuffers(1, &name);
        glBindBuffer(target, name);
        glBufferData(target, 1024, nullptr, GL_STATIC_DRAW);
        return name;
    }

    static GLuint NewProgram()
    {
        const char* texts[] = {"attribute vec4 a; void main() { gl_Position = a; }",
                               "precision mediump float; void main() { gl_FragColor = vec4(1.0); "
                               "}"};
        const GLenum kinds[] = {GL_VERTEX_SHADER, GL_FRAGMENT_SHADER};
        const GLuint program = glCreateProgram();
        for (int i = 0; i < 2; ++i)
        {
            const GLuint shader = glCreateShader(kinds[i]);
            glShaderSource(shader, 1, &texts[i], nullptr);
            glCompileShader(shader);
            glAttachShader(program, shader);
            glDeleteShader(shader);
        }
        glLinkProgram(program);
        GLint linked = 0;
        glGetProgramiv(program, GL_LINK_STATUS, &linked);
        EXPECT_EQ(linked, GL_TRUE);
        return program;
    }

    OpenGLRenderer::OpenGlState m_state;
    bool m_samplers = false;
};

} // namespace

TEST_F(OpenGlStateOnDriver, Program)
{
    const GLuint program = NewProgram();
    glUseProgram(program);
    m_state.store();
    glUseProgram(NewProgram());

    m_state.restore();

    EXPECT_EQ(Integer(GL_CURRENT_PROGRAM), static_cast<GLint>(program));
}

TEST_F(OpenGlStateOnDriver, ArrayBuffer)
{
    const GLuint buffer = NewBuffer(GL_ARRAY_BUFFER);
    m_state.store();
    NewBuffer(GL_ARRAY_BUFFER);

    m_state.restore();

    EXPECT_EQ(Integer(GL_ARRAY_BUFFER_BINDING), static_cast<GLint>(buffer));
}

TEST_F(OpenGlStateOnDriver, ElementArrayBuffer)
{
    const GLuint buffer = NewBuffer(GL_ELEMENT_ARRAY_BUFFER);
    m_state.store();
    NewBuffer(GL_ELEMENT_ARRAY_BUFFER);

    m_state.restore();

    EXPECT_EQ(Integer(GL_ELEMENT_ARRAY_BUFFER_BINDING), static_cast<GLint>(buffer));
}

TEST_F(OpenGlStateOnDriver, ActiveTextureUnit)
{
    glActiveTexture(GL_TEXTURE6);
    m_state.store();
    EXPECT_EQ(Integer(GL_ACTIVE_TEXTURE), GL_TEXTURE3);
    glActiveTexture(GL_TEXTURE2);

    m_state.restore();

    EXPECT_EQ(Integer(GL_ACTIVE_TEXTURE), GL_TEXTURE6);
}

TEST_F(OpenGlStateOnDriver, SwitchesEachOnAlone)
{
    const GLenum switches[] = {GL_BLEND, GL_DEPTH_TEST, GL_CULL_FACE, GL_SCISSOR_TEST,
                               GL_STENCIL_TEST};
    for (const GLenum on : switches)
    {
        SCOPED_TRACE(on);
        for (const GLenum capability : switches)
            glDisable(capability);
        glEnable(on);
        m_state.store();
        for (const GLenum capability : switches)
            glEnable(capability);
        glDisable(on);

        m_state.restore();

        for (const GLenum capability : switches)
            EXPECT_EQ(glIsEnabled(capability) == GL_TRUE, capability == on) << capability;
    }
}

TEST_F(OpenGlStateOnDriver, DepthWriteMask)
{
    for (const GLboolean mask : {GL_FALSE, GL_TRUE})
    {
        glDepthMask(mask);
        m_state.store();
        glDepthMask(mask == GL_TRUE ? GL_FALSE : GL_TRUE);

        m_state.restore();

        EXPECT_EQ(Integer(GL_DEPTH_WRITEMASK), GLint{mask});
    }
}

TEST_F(OpenGlStateOnDriver, AlphaBlendFactorsForColorAndAlpha)
{
    glBlendFuncSeparate(GL_ONE, GL_ZERO, GL_DST_ALPHA, GL_ONE_MINUS_CONSTANT_ALPHA);
    m_state.store();
    glBlendFunc(GL_ZERO, GL_ONE);

    m_state.restore();

    EXPECT_EQ(Integer(GL_BLEND_SRC_RGB), GL_DST_ALPHA);
    EXPECT_EQ(Integer(GL_BLEND_DST_RGB), GL_ONE_MINUS_CONSTANT_ALPHA);
    EXPECT_EQ(Integer(GL_BLEND_SRC_ALPHA), GL_DST_ALPHA);
    EXPECT_EQ(Integer(GL_BLEND_DST_ALPHA), GL_ONE_MINUS_CONSTANT_ALPHA);
}

TEST_F(OpenGlStateOnDriver, TexturesOfFourUnits)
{
    std::array<GLuint, 4> textures{};
    for (GLuint unit = 0; unit < 4; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        textures[unit] = NewTexture();
    }
    m_state.store();
    for (GLuint unit = 0; unit < 4; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        NewTexture();
    }

    m_state.restore();

    for (GLuint unit = 0; unit < 4; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        EXPECT_EQ(Integer(GL_TEXTURE_BINDING_2D), static_cast<GLint>(textures[unit])) << unit;
    }
}

TEST_F(OpenGlStateOnDriver, SamplersOfFourUnits)
{
    std::array<GLuint, 4> samplers{};
    glGenSamplers(4, samplers.data());
    for (GLuint unit = 0; unit < 4; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        NewTexture();
        glBindSampler(unit, samplers[unit]);
    }
    m_state.store();
    for (GLuint unit = 0; unit < 4; ++unit)
        glBindSampler(unit, 0);

    m_state.restore();

    // Where the library uses no samplers it does not put them back either.
    for (GLuint unit = 0; unit < 4; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        EXPECT_EQ(Integer(GL_SAMPLER_BINDING), m_samplers ? static_cast<GLint>(samplers[unit]) : 0)
            << unit;
    }
}

TEST_F(OpenGlStateOnDriver, DeletedTextureIsReplacedByNone)
{
    glActiveTexture(GL_TEXTURE2);
    const GLuint texture = NewTexture();
    m_state.store();
    glDeleteTextures(1, &texture);

    m_state.restore();

    glActiveTexture(GL_TEXTURE2);
    EXPECT_EQ(Integer(GL_TEXTURE_BINDING_2D), 0);
    EXPECT_EQ(glIsTexture(texture), GL_FALSE); // binding the old name would have made it again
}

TEST_F(OpenGlStateOnDriver, RenderbufferAndFramebuffer)
{
    GLuint framebuffers[2] = {};
    GLuint renderbuffers[2] = {};
    glGenFramebuffers(2, framebuffers);
    glGenRenderbuffers(2, renderbuffers);
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffers[0]);
    glBindRenderbuffer(GL_RENDERBUFFER, renderbuffers[0]);
    m_state.store();
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffers[1]);
    glBindRenderbuffer(GL_RENDERBUFFER, renderbuffers[1]);

    m_state.restore();

    EXPECT_EQ(Integer(GL_FRAMEBUFFER_BINDING), static_cast<GLint>(framebuffers[0]));
    EXPECT_EQ(Integer(GL_RENDERBUFFER_BINDING), static_cast<GLint>(renderbuffers[0]));
}

TEST_F(OpenGlStateOnDriver, DefaultFramebuffer)
{
    m_state.store();
    GLuint framebuffer = 0;
    glGenFramebuffers(1, &framebuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffer);

    m_state.restore();

    EXPECT_EQ(Integer(GL_FRAMEBUFFER_BINDING), 0);
}

TEST_F(OpenGlStateOnDriver, ViewportAndScissorBox)
{
    glViewport(1, 2, 30, 14);
    glScissor(3, 4, 20, 12);
    m_state.store();
    glViewport(0, 0, 64, 32);
    glScissor(0, 0, 64, 32);

    m_state.restore();

    EXPECT_EQ(FourIntegers(GL_VIEWPORT), (std::array<GLint, 4>{1, 2, 30, 14}));
    EXPECT_EQ(FourIntegers(GL_SCISSOR_BOX), (std::array<GLint, 4>{3, 4, 20, 12}));
}

TEST_F(OpenGlStateOnDriver, VertexAttributesOfBuffers)
{
    struct Row
    {
        GLint size;
        GLenum type;
        GLboolean normalized;
        GLsizei stride;
        std::uintptr_t offset;
        bool enabled;
    };
    const Row rows[5] = {
        {2, GL_FLOAT, GL_FALSE, 24, 0, true},          {4, GL_UNSIGNED_BYTE, GL_TRUE, 24, 8, false},
        {1, GL_SHORT, GL_FALSE, 0, 12, true},          {3, GL_BYTE, GL_TRUE, 16, 4, false},
        {4, GL_UNSIGNED_SHORT, GL_FALSE, 8, 16, true},
    };
    GLuint buffers[5] = {};
    for (GLuint i = 0; i < 5; ++i)
    {
        buffers[i] = NewBuffer(GL_ARRAY_BUFFER);
        glVertexAttribPointer(i, rows[i].size, rows[i].type, rows[i].normalized, rows[i].stride,
                              reinterpret_cast<void*>(rows[i].offset));
        if (rows[i].enabled)
            glEnableVertexAttribArray(i);
    }
    m_state.store();
    NewBuffer(GL_ARRAY_BUFFER);
    for (GLuint i = 0; i < 5; ++i)
    {
        glVertexAttribPointer(i, 4, GL_FLOAT, GL_FALSE, 64, nullptr);
        if (rows[i].enabled)
            glDisableVertexAttribArray(i);
        else
            glEnableVertexAttribArray(i);
    }

    m_state.restore();

    for (GLuint i = 0; i < 5; ++i)
    {
        SCOPED_TRACE(i);
        EXPECT_EQ(Attribute(i, GL_VERTEX_ATTRIB_ARRAY_ENABLED), rows[i].enabled ? 1 : 0);
        EXPECT_EQ(Attribute(i, GL_VERTEX_ATTRIB_ARRAY_BUFFER_BINDING),
                  static_cast<GLint>(buffers[i]));
        EXPECT_EQ(Attribute(i, GL_VERTEX_ATTRIB_ARRAY_SIZE), rows[i].size);
        EXPECT_EQ(Attribute(i, GL_VERTEX_ATTRIB_ARRAY_TYPE), static_cast<GLint>(rows[i].type));
        EXPECT_EQ(Attribute(i, GL_VERTEX_ATTRIB_ARRAY_NORMALIZED), GLint{rows[i].normalized});
        EXPECT_EQ(Attribute(i, GL_VERTEX_ATTRIB_ARRAY_STRIDE), rows[i].stride);
        EXPECT_EQ(AttributePointer(i), reinterpret_cast<void*>(rows[i].offset));
    }
}

TEST_F(OpenGlStateOnDriver, VertexAttributeOfClientMemory)
{
    static const float memory[16] = {};
    glVertexAttribPointer(3, 2, GL_FLOAT, GL_FALSE, 8, memory);
    m_state.store();
    NewBuffer(GL_ARRAY_BUFFER);
    glVertexAttribPointer(3, 4, GL_BYTE, GL_FALSE, 4, nullptr);

    m_state.restore();

    EXPECT_EQ(Attribute(3, GL_VERTEX_ATTRIB_ARRAY_BUFFER_BINDING), 0);
    EXPECT_EQ(AttributePointer(3), static_cast<const void*>(memory));
    EXPECT_EQ(Integer(GL_ARRAY_BUFFER_BINDING), 0);
}

TEST_F(OpenGlStateOnDriver, PendingErrorsAreTaken)
{
    glEnable(0xFFFF);
    m_state.store();
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
    glEnable(0xFFFF);
    m_state.restore();
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST_F(OpenGlStateOnDriver, AnotherDrawingLeavesNoTraceInThePicture)
{
    // Given somebody who draws a white triangle over the left half
    const float triangle[] = {-1, -1, 0, -1, -1, 3};
    const GLuint program = NewProgram();
    const GLint location = glGetAttribLocation(program, "a");
    const GLuint buffer = NewBuffer(GL_ARRAY_BUFFER);
    glBufferData(GL_ARRAY_BUFFER, sizeof(triangle), triangle, GL_STATIC_DRAW);
    glUseProgram(program);
    glEnableVertexAttribArray(static_cast<GLuint>(location));
    glVertexAttribPointer(static_cast<GLuint>(location), 2, GL_FLOAT, GL_FALSE, 0, nullptr);
    glViewport(0, 0, 64, 32);
    glClearColor(0, 0, 0, 1);
    ASSERT_NE(buffer, 0u);
    const auto draw = []
    {
        glClear(GL_COLOR_BUFFER_BIT);
        glDrawArrays(GL_TRIANGLES, 0, 3);
        std::vector<unsigned char> pixels(64 * 32 * 4);
        glReadPixels(0, 0, 64, 32, GL_RGBA, GL_UNSIGNED_BYTE, pixels.data());
        return pixels;
    };
    const std::vector<unsigned char> before = draw();
    EXPECT_EQ(before[(8 * 64 + 4) * 4], 255);
    EXPECT_EQ(before[(8 * 64 + 60) * 4], 0);

    // When the library draws in between, with everything set otherwise
    m_state.store();
    glUseProgram(0);
    glEnable(GL_SCISSOR_TEST);
    glScissor(0, 0, 1, 1);
    glEnable(GL_CULL_FACE);
    glEnable(GL_BLEND);
    glBlendFunc(GL_ZERO, GL_ZERO);
    glViewport(5, 5, 3, 3);
    NewBuffer(GL_ARRAY_BUFFER);
    glVertexAttribPointer(static_cast<GLuint>(location), 4, GL_BYTE, GL_FALSE, 0, nullptr);
    glDisableVertexAttribArray(static_cast<GLuint>(location));
    m_state.restore();

    // Then the picture is the same
    EXPECT_EQ(draw(), before);
}
