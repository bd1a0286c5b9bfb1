#include "Device.h"
#include "GlCalls.h"

#include <nib/device.h>

#include <gtest/gtest.h>

#include <string>
#include <vector>

using Nib::OpenGLRenderer;
using State = OpenGLRenderer::OpenGlState;

namespace
{

using Texts = std::vector<std::string>;

SimGpu WithSamplers()
{
    return SimGpu::Named("Mali-G72").WithVersion("OpenGL ES 3.2 v1.r19p0");
}

SimGpu WithoutSamplers()
{
    return SimGpu::Named("Mali-G72").WithVersion("OpenGL ES 3.0 v1.r1p0");
}

GLint Integer(GLenum name)
{
    GLint value = -1;
    glGetIntegerv(name, &value);
    return value;
}

GLint Attribute(GLuint index, GLenum name)
{
    GLint value = -1;
    glGetVertexAttribiv(index, name, &value);
    return value;
}

GLuint NewTexture()
{
    GLuint name = 0;
    glGenTextures(1, &name);
    glBindTexture(GL_TEXTURE_2D, name);
    return name;
}

GLuint NewBuffer()
{
    GLuint name = 0;
    glGenBuffers(1, &name);
    glBindBuffer(GL_ARRAY_BUFFER, name);
    return name;
}

GLuint NewSampler()
{
    GLuint name = 0;
    glGenSamplers(1, &name);
    return name;
}

GLuint NewProgram()
{
    const GLuint vertex = glCreateShader(GL_VERTEX_SHADER);
    const GLuint fragment = glCreateShader(GL_FRAGMENT_SHADER);
    const char* vertexText = "attribute vec4 a; void main() { gl_Position = a; }";
    const char* fragmentText = "void main() { gl_FragColor = vec4(1.0); }";
    glShaderSource(vertex, 1, &vertexText, nullptr);
    glShaderSource(fragment, 1, &fragmentText, nullptr);
    glCompileShader(vertex);
    glCompileShader(fragment);
    const GLuint program = glCreateProgram();
    glAttachShader(program, vertex);
    glAttachShader(program, fragment);
    glLinkProgram(program);
    glDeleteShader(vertex);
    glDeleteShader(fragment);
    return program;
}

} // namespace

// ---- store --------------------------------------------------------------------------------------

TEST(OpenGlState, StoreAsksForEverythingInOrder)
{
    Device device(WithSamplers());
    State state;

    state.store();

    const Texts attribute = {"glGetVertexAttribiv",      "glGetVertexAttribiv",
                             "glGetVertexAttribiv",      "glGetVertexAttribiv",
                             "glGetVertexAttribiv",      "glGetVertexAttribiv",
                             "glGetVertexAttribPointerv"};
    const Texts queries = Queries(device.driver);
    ASSERT_EQ(queries.size(), 17u + 4u * 3u + 1u + 5u * 7u);
    EXPECT_EQ(Texts(queries.begin(), queries.begin() + 31),
              (Texts{
                  "glGetError",
                  "glGetIntegerv 0x8B8D", // program
                  "glGetIntegerv 0x8894", // array buffer
                  "glGetIntegerv 0x84E0", // active texture unit
                  "glGetBooleanv 0x0BE2", // blend
                  "glGetBooleanv 0x0B71", // depth test
                  "glGetBooleanv 0x0B72", // depth write mask
                  "glGetBooleanv 0x0B44", // cull face
                  "glGetBooleanv 0x0C11", // scissor test
                  "glGetBooleanv 0x0B90", // stencil test
                  "glGetIntegerv 0x80CB", // blend source, alpha
                  "glGetIntegerv 0x80CA", // blend destination, alpha
                  "glGetIntegerv 0x8CA7", // renderbuffer
                  "glGetIntegerv 0x8CA6", // framebuffer
                  "glGetIntegerv 0x0BA2", // viewport
                  "glGetIntegerv 0x0C10", // scissor box
                  "glGetIntegerv 0x8895", // element array buffer
                  "glActiveTexture 0x84C0",
                  "glGetIntegerv 0x8069", // 2D texture
                  "glGetIntegerv 0x8919", // sampler
                  "glActiveTexture 0x84C1",
                  "glGetIntegerv 0x8069",
                  "glGetIntegerv 0x8919",
                  "glActiveTexture 0x84C2",
                  "glGetIntegerv 0x8069",
                  "glGetIntegerv 0x8919",
                  "glActiveTexture 0x84C3",
                  "glGetIntegerv 0x8069",
                  "glGetIntegerv 0x8919",
                  "glBindBuffer 0x8892",
                  "glGetVertexAttribiv 0x0000",
              }));
    const std::vector<SimCall> calls = device.driver.Calls();
    EXPECT_EQ(calls.at(29), Call("glBindBuffer", 0x8892, 0));
    const long long names[] = {0x8622, 0x889F, 0x8623, 0x8625, 0x886A, 0x8624, 0x8645};
    for (std::size_t i = 0; i < 5; ++i)
    {
        for (std::size_t j = 0; j < 7; ++j)
        {
            const SimCall& call = calls.at(30 + i * 7 + j);
            EXPECT_EQ(call.name, attribute[j]);
            EXPECT_EQ(call.Arg(0), static_cast<long long>(i));
            EXPECT_EQ(call.Arg(1), names[j]);
        }
    }
}

TEST(OpenGlState, StoreAsksForNoSamplersWhereThereAreNone)
{
    Device device(WithoutSamplers());
    OpenGLRenderer::getSupportSampler();
    device.driver.ForgetCalls();
    State state;

    state.store();

    for (const std::string& query : Queries(device.driver))
        EXPECT_NE(query, "glGetIntegerv 0x8919");
    EXPECT_EQ(device.driver.CallCount("glActiveTexture"), 4u);
}

TEST(OpenGlState, StoreLeavesUnitThreeActiveAndNoArrayBuffer)
{
    Device device(WithSamplers());
    const GLuint buffer = NewBuffer();
    glActiveTexture(GL_TEXTURE1);
    State state;

    state.store();

    EXPECT_EQ(Integer(GL_ACTIVE_TEXTURE), GL_TEXTURE3);
    EXPECT_EQ(Integer(GL_ARRAY_BUFFER_BINDING), 0);

    state.restore();

    EXPECT_EQ(Integer(GL_ACTIVE_TEXTURE), GL_TEXTURE1);
    EXPECT_EQ(Integer(GL_ARRAY_BUFFER_BINDING), static_cast<GLint>(buffer));
}

TEST(OpenGlState, StoreReportsAndClearsPendingErrors)
{
    Device device(WithSamplers());
    device.driver.QueueGlErrors({GL_INVALID_ENUM, GL_INVALID_OPERATION});
    State state;

    state.store();

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              (Texts{"static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : "
                     "OpenGlState::store() glError = 0x0500",
                     "static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : "
                     "OpenGlState::store() glError = 0x0502"}));
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

// ---- restore ------------------------------------------------------------------------------------

TEST(OpenGlState, RestoreDoesNothingBeforeAStore)
{
    Device device(WithSamplers());
    State state;

    state.restore();

    EXPECT_EQ(device.driver.CallCount(), 0u);
}

TEST(OpenGlState, RestoreOfTheInitialStateMakesItsCallsInOrder)
{
    Device device(WithSamplers());
    State state;
    state.store();
    device.driver.ForgetCalls();

    state.restore();

    Texts expected;
    for (int unit = 0; unit < 4; ++unit)
    {
        expected.push_back("glActiveTexture(" + std::to_string(33984 + unit) + ")");
        expected.push_back("glIsTexture(0)");
        expected.push_back("glBindTexture(3553, 0)");
        expected.push_back("glBindSampler(" + std::to_string(unit) + ", 0)");
    }
    for (int index = 0; index < 5; ++index)
    {
        expected.push_back("glDisableVertexAttribArray(" + std::to_string(index) + ")");
        expected.push_back("glBindBuffer(34962, 0)");
        expected.push_back("glVertexAttribPointer(" + std::to_string(index) +
                           ", 4, 5126, 0, 0, null)");
    }
    const Texts rest = {
        "glUseProgram(0)",
        "glActiveTexture(33984)",
        "glDisable(3042)",              // blend
        "glDisable(2929)",              // depth test
        "glDisable(2884)",              // cull face
        "glDisable(3089)",              // scissor test
        "glDisable(2960)",              // stencil test
        "glBlendFunc(1, 0)",            //
        "glBindRenderbuffer(36161, 0)", //
        "glBindFramebuffer(36160, 0)",  //
        "glBindBuffer(34962, 0)",       // array buffer
        "glBindBuffer(34963, 0)",       // element array buffer
        "glViewport(0, 0, 1, 1)",       //
        "glScissor(0, 0, 1, 1)",        //
        "glDepthMask(1)",               //
        "glGetError()",                 //
    };
    expected.insert(expected.end(), rest.begin(), rest.end());
    EXPECT_EQ(device.driver.CallTexts(), expected);
}

TEST(OpenGlState, RestoreReportsAndClearsErrors)
{
    Device device(WithSamplers());
    State state;
    state.store();
    device.driver.QueueGlErrors({GL_OUT_OF_MEMORY});

    state.restore();

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              (Texts{"static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : "
                     "OpenGlState::restore() glError = 0x0505"}));
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

TEST(OpenGlState, ProgramComesBack)
{
    Device device(WithSamplers());
    const GLuint program = NewProgram();
    glUseProgram(program);
    State state;
    state.store();
    glUseProgram(0);

    state.restore();

    EXPECT_EQ(Integer(GL_CURRENT_PROGRAM), static_cast<GLint>(program));
}

TEST(OpenGlState, SwitchesComeBackOn)
{
    const GLenum switches[] = {GL_BLEND, GL_DEPTH_TEST, GL_CULL_FACE, GL_SCISSOR_TEST,
                               GL_STENCIL_TEST};
    for (const GLenum on : switches)
    {
        SCOPED_TRACE(on);
        Device device(WithSamplers());
        glEnable(on);
        State state;
        state.store();
        for (const GLenum capability : switches)
        {
            if (capability == on)
                glDisable(capability);
            else
                glEnable(capability);
        }

        state.restore();

        for (const GLenum capability : switches)
            EXPECT_EQ(glIsEnabled(capability), capability == on ? GL_TRUE : GL_FALSE) << capability;
    }
}

TEST(OpenGlState, DepthWriteMaskComesBackBothWays)
{
    for (const GLboolean mask : {GL_FALSE, GL_TRUE})
    {
        Device device(WithSamplers());
        glDepthMask(mask);
        State state;
        state.store();
        glDepthMask(mask == GL_TRUE ? GL_FALSE : GL_TRUE);

        state.restore();

        EXPECT_EQ(Integer(GL_DEPTH_WRITEMASK), mask);
    }
}

TEST(OpenGlState, AlphaBlendFactorsComeBackForColorAndAlpha)
{
    Device device(WithSamplers());
    glBlendFuncSeparate(GL_ONE, GL_ZERO, GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA);
    State state;
    state.store();
    glBlendFunc(GL_ZERO, GL_ZERO);

    state.restore();

    EXPECT_EQ(Integer(GL_BLEND_SRC_RGB), GL_SRC_ALPHA);
    EXPECT_EQ(Integer(GL_BLEND_DST_RGB), GL_ONE_MINUS_SRC_ALPHA);
    EXPECT_EQ(Integer(GL_BLEND_SRC_ALPHA), GL_SRC_ALPHA);
    EXPECT_EQ(Integer(GL_BLEND_DST_ALPHA), GL_ONE_MINUS_SRC_ALPHA);
}

TEST(OpenGlState, TexturesAndSamplersOfFourUnitsComeBack)
{
    Device device(WithSamplers());
    GLuint textures[4] = {};
    GLuint samplers[4] = {};
    for (GLuint unit = 0; unit < 4; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        textures[unit] = NewTexture();
        samplers[unit] = NewSampler();
        glBindSampler(unit, samplers[unit]);
    }
    State state;
    state.store();
    for (GLuint unit = 0; unit < 4; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        glBindTexture(GL_TEXTURE_2D, 0);
        glBindSampler(unit, 0);
    }

    state.restore();

    for (GLuint unit = 0; unit < 4; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        EXPECT_EQ(Integer(GL_TEXTURE_BINDING_2D), static_cast<GLint>(textures[unit])) << unit;
        EXPECT_EQ(Integer(GL_SAMPLER_BINDING), static_cast<GLint>(samplers[unit])) << unit;
    }
}

TEST(OpenGlState, UnitFourIsLeftAlone)
{
    Device device(WithSamplers());
    glActiveTexture(GL_TEXTURE4);
    NewTexture();
    State state;
    state.store();
    glActiveTexture(GL_TEXTURE4);
    const GLuint other = NewTexture();

    state.restore();

    glActiveTexture(GL_TEXTURE4);
    EXPECT_EQ(Integer(GL_TEXTURE_BINDING_2D), static_cast<GLint>(other));
}

TEST(OpenGlState, ATextureThatWasDeletedIsReplacedByNone)
{
    Device device(WithSamplers());
    GLuint textures[2] = {};
    GLuint samplers[2] = {};
    for (GLuint unit = 0; unit < 2; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        textures[unit] = NewTexture();
        samplers[unit] = NewSampler();
        glBindSampler(unit, samplers[unit]);
    }
    State state;
    state.store();
    glDeleteTextures(1, &textures[1]);
    device.driver.ForgetCalls();

    state.restore();

    const std::vector<SimCall> binds = device.driver.Calls({"glBindTexture", "glBindSampler"});
    ASSERT_EQ(binds.size(), 8u);
    EXPECT_EQ(binds[0], Call("glBindTexture", 0x0DE1, textures[0]));
    EXPECT_EQ(binds[1], Call("glBindSampler", 0, samplers[0]));
    EXPECT_EQ(binds[2], Call("glBindTexture", 0x0DE1, 0));
    EXPECT_EQ(binds[3], Call("glBindSampler", 1, 0));
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

TEST(OpenGlState, SamplersAreLeftAloneWhereTheyAreNotSupported)
{
    Device device(WithoutSamplers());
    OpenGLRenderer::getSupportSampler();
    State state;
    state.store();
    device.driver.ForgetCalls();

    state.restore();

    EXPECT_EQ(device.driver.CallCount("glBindSampler"), 0u);
    EXPECT_EQ(device.driver.CallCount("glBindTexture"), 4u);
}

TEST(OpenGlState, FramebufferAndRenderbufferComeBack)
{
    Device device(WithSamplers());
    GLuint framebuffer = 0;
    GLuint renderbuffer = 0;
    glGenFramebuffers(1, &framebuffer);
    glGenRenderbuffers(1, &renderbuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffer);
    glBindRenderbuffer(GL_RENDERBUFFER, renderbuffer);
    State state;
    state.store();
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glBindRenderbuffer(GL_RENDERBUFFER, 0);

    state.restore();

    EXPECT_EQ(Integer(GL_FRAMEBUFFER_BINDING), static_cast<GLint>(framebuffer));
    EXPECT_EQ(Integer(GL_RENDERBUFFER_BINDING), static_cast<GLint>(renderbuffer));
}

TEST(OpenGlState, ArrayAndElementBufferComeBack)
{
    Device device(WithSamplers());
    const GLuint array = NewBuffer();
    GLuint elements = 0;
    glGenBuffers(1, &elements);
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, elements);
    State state;
    state.store();
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, 0);

    state.restore();

    EXPECT_EQ(Integer(GL_ARRAY_BUFFER_BINDING), static_cast<GLint>(array));
    EXPECT_EQ(Integer(GL_ELEMENT_ARRAY_BUFFER_BINDING), static_cast<GLint>(elements));
}

TEST(OpenGlState, ViewportAndScissorBoxComeBack)
{
    Device device(WithSamplers());
    glViewport(1, 2, 30, 40);
    glScissor(5, 6, 70, 80);
    State state;
    state.store();
    glViewport(0, 0, 9, 9);
    glScissor(0, 0, 9, 9);
    device.driver.ForgetCalls();

    state.restore();

    EXPECT_EQ(device.driver.Calls({"glViewport", "glScissor"}),
              Sequence({Call("glViewport", 1, 2, 30, 40), Call("glScissor", 5, 6, 70, 80)}));
}

TEST(OpenGlState, VertexAttributesComeBack)
{
    Device device(WithSamplers());
    const GLuint buffer = NewBuffer();
    glBufferData(GL_ARRAY_BUFFER, 256, nullptr, GL_STATIC_DRAW);
    // Attribute 1 from a buffer, 4 from memory and disabled, the others untouched.
    glEnableVertexAttribArray(1);
    glVertexAttribPointer(1, 2, GL_UNSIGNED_BYTE, GL_TRUE, 12, reinterpret_cast<void*>(8));
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    static const float memory[8] = {};
    glVertexAttribPointer(4, 3, GL_FLOAT, GL_FALSE, 16, memory);
    State state;
    state.store();
    glDisableVertexAttribArray(1);
    glEnableVertexAttribArray(4);
    glEnableVertexAttribArray(0);
    NewBuffer();
    for (const GLuint index : {1u, 4u})
        glVertexAttribPointer(index, 1, GL_SHORT, GL_FALSE, 0, nullptr);
    device.driver.ForgetCalls();

    state.restore();

    const std::vector<SimCall> calls = device.driver.Calls({"glVertexAttribPointer"});
    ASSERT_EQ(calls.size(), 5u);
    EXPECT_EQ(calls[1],
              Call("glVertexAttribPointer", 1, 2, 0x1401, 1, 12, reinterpret_cast<const void*>(8)));
    EXPECT_EQ(calls[4],
              Call("glVertexAttribPointer", 4, 3, 0x1406, 0, 16, static_cast<const void*>(memory)));
    EXPECT_EQ(Attribute(0, GL_VERTEX_ATTRIB_ARRAY_ENABLED), 0);
    EXPECT_EQ(Attribute(1, GL_VERTEX_ATTRIB_ARRAY_ENABLED), 1);
    EXPECT_EQ(Attribute(4, GL_VERTEX_ATTRIB_ARRAY_ENABLED), 0);
    EXPECT_EQ(Attribute(1, GL_VERTEX_ATTRIB_ARRAY_BUFFER_BINDING), static_cast<GLint>(buffer));
    EXPECT_EQ(Attribute(4, GL_VERTEX_ATTRIB_ARRAY_BUFFER_BINDING), 0);
    EXPECT_EQ(Attribute(1, GL_VERTEX_ATTRIB_ARRAY_SIZE), 2);
    EXPECT_EQ(Attribute(1, GL_VERTEX_ATTRIB_ARRAY_TYPE), GL_UNSIGNED_BYTE);
    EXPECT_EQ(Attribute(1, GL_VERTEX_ATTRIB_ARRAY_NORMALIZED), 1);
    EXPECT_EQ(Attribute(1, GL_VERTEX_ATTRIB_ARRAY_STRIDE), 12);
}

TEST(OpenGlState, AttributeFiveIsLeftAlone)
{
    Device device(WithSamplers());
    State state;
    state.store();
    glEnableVertexAttribArray(5);

    state.restore();

    EXPECT_EQ(Attribute(5, GL_VERTEX_ATTRIB_ARRAY_ENABLED), 1);
}

TEST(OpenGlState, RestoreMayBeRepeated)
{
    Device device(WithSamplers());
    glEnable(GL_BLEND);
    State state;
    state.store();
    device.driver.ForgetCalls();
    state.restore();
    const Texts first = device.driver.CallTexts();
    glDisable(GL_BLEND);
    device.driver.ForgetCalls();

    state.restore();

    EXPECT_EQ(device.driver.CallTexts(), first);
    EXPECT_EQ(glIsEnabled(GL_BLEND), GL_TRUE);
}

TEST(OpenGlState, ASecondStoreReplacesTheFirst)
{
    Device device(WithSamplers());
    glEnable(GL_BLEND);
    State state;
    state.store();
    glDisable(GL_BLEND);
    state.store();
    glEnable(GL_BLEND);

    state.restore();

    EXPECT_EQ(glIsEnabled(GL_BLEND), GL_FALSE);
}
