// A host that draws its own picture with its own GL state, and a guest that draws inside it.

#include "drivers/DriverContext.h"
#include "drivers/RenderThreadSupport.h"

#include <nib/nib.h>

#include <GLES3/gl3.h>
#include <gtest/gtest.h>

#include <atomic>
#include <memory>
#include <thread>
#include <vector>

using namespace Nib;

namespace
{

GLuint Compiled(GLenum type, const char* source)
{
    const GLuint shader = glCreateShader(type);
    glShaderSource(shader, 1, &source, nullptr);
    glCompileShader(shader);
    return shader;
}

/// A UI renderer as far as GL goes: a program, a texture, a mesh and the state to draw with them,
/// all set before the guest comes and trusted afterwards.
class HwuiHost : public DriverContext
{
protected:
    void SetUp() override
    {
        DriverContext::SetUp();
        if (IsSkipped() || HasFatalFailure())
            return;
        m_program = glCreateProgram();
        glAttachShader(m_program, Compiled(GL_VERTEX_SHADER,
                                           "attribute vec2 a; varying vec2 v;\n"
                                           "void main() { v = a; gl_Position = vec4(a, 0, 1); }"));
        glAttachShader(m_program,
                       Compiled(GL_FRAGMENT_SHADER,
                                "precision mediump float; uniform sampler2D t; varying vec2 v;\n"
                                "void main() { gl_FragColor = texture2D(t, v); }"));
        glBindAttribLocation(m_program, 2, "a");
        glLinkProgram(m_program);
        glUseProgram(m_program);
        glUniform1i(glGetUniformLocation(m_program, "t"), 1);

        const float rightHalf[] = {0, -1, 1, -1, 0, 1, 1, 1};
        glGenBuffers(1, &m_vertices);
        glBindBuffer(GL_ARRAY_BUFFER, m_vertices);
        glBufferData(GL_ARRAY_BUFFER, sizeof rightHalf, rightHalf, GL_STATIC_DRAW);
        glEnableVertexAttribArray(2);
        glVertexAttribPointer(2, 2, GL_FLOAT, GL_FALSE, 8, nullptr);

        const unsigned char blue[] = {0, 0, 255, 255};
        glActiveTexture(GL_TEXTURE1);
        glGenTextures(1, &m_texture);
        glBindTexture(GL_TEXTURE_2D, m_texture);
        glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA, 1, 1, 0, GL_RGBA, GL_UNSIGNED_BYTE, blue);
        glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MIN_FILTER, GL_NEAREST);
        glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAG_FILTER, GL_NEAREST);

        glViewport(0, 0, kWidth, kHeight);
        glScissor(0, 0, kWidth, kHeight / 2); // the host's picture is its lower half
        glEnable(GL_SCISSOR_TEST);
        glDisable(GL_BLEND);
        glClearColor(0, 1, 0, 1);
    }

    /// The host's draw callback: the guest's part, then its own, with the state set long ago.
    void DrawFrame(RenderThreadHWUI& guest)
    {
        glClear(GL_COLOR_BUFFER_BIT);
        OpenGLRenderer::OpenGlState state;
        state.store();
        guest.Render();
        state.restore();
        glDrawArrays(GL_TRIANGLE_STRIP, 0, 4);
    }

    Rgba Pixel(int x, int y) const
    {
        Rgba pixel{};
        glReadPixels(x, y, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, pixel.data());
        return pixel;
    }

    std::vector<GLint> State() const
    {
        std::vector<GLint> state;
        for (const GLenum name :
             {GL_CURRENT_PROGRAM, GL_ARRAY_BUFFER_BINDING, GL_ELEMENT_ARRAY_BUFFER_BINDING,
              GL_ACTIVE_TEXTURE, GL_TEXTURE_BINDING_2D, GL_RENDERBUFFER_BINDING,
              GL_FRAMEBUFFER_BINDING, GL_BLEND, GL_DEPTH_TEST, GL_CULL_FACE, GL_SCISSOR_TEST,
              GL_STENCIL_TEST, GL_DEPTH_WRITEMASK, GL_BLEND_SRC_ALPHA, GL_BLEND_DST_ALPHA})
            state.push_back(Integer(name));
        for (const GLenum name : {GL_VIEWPORT, GL_SCISSOR_BOX})
            for (const GLint value : FourIntegers(name))
                state.push_back(value);
        for (GLuint attribute = 0; attribute < 5; ++attribute)
            for (const GLenum name :
                 {GL_VERTEX_ATTRIB_ARRAY_ENABLED, GL_VERTEX_ATTRIB_ARRAY_BUFFER_BINDING,
                  GL_VERTEX_ATTRIB_ARRAY_SIZE, GL_VERTEX_ATTRIB_ARRAY_TYPE,
                  GL_VERTEX_ATTRIB_ARRAY_STRIDE})
            {
                GLint value = -1;
                glGetVertexAttribiv(attribute, name, &value);
                state.push_back(value);
            }
        return state;
    }

    HwuiCallback m_callback{nullptr, nullptr, nullptr};

private:
    GLuint m_program = 0;
    GLuint m_vertices = 0;
    GLuint m_texture = 0;
};

/// The guest's drawing: red over the lower left quarter, and everything that disturbs a host.
void DrawRed()
{
    using Factory = RendererFactory;
    IRenderTarget* const target = Factory::CreateRenderTargetFromCurrent(64, 32);
    IShaderProgram* const program = Factory::CreateShaderProgram(
        "attribute vec2 a_p; void main() { gl_Position = vec4(a_p, 0.0, 1.0); }",
        "precision mediump float; void main() { gl_FragColor = vec4(1.0, 0.0, 0.0, 1.0); }",
        nullptr);
    VertexDescriptor vertex;
    vertex.addAttribute(VertexDescriptor::AttributeType::Float, 2);
    IGraphicsObject* const quad =
        Factory::CreateGraphicsObject(1, PrimitiveType::TriangleStrip, &vertex, 4, 0);
    const float lowerLeft[] = {-1, -1, 0, -1, -1, 0, 0, 0};
    quad->UpdateBuffer(0, lowerLeft, 4);
    TextureDescriptor descriptor;
    descriptor.width = descriptor.height = 4;
    ITextureObject* const texture =
        Factory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr);
    IBlendStateObject* const blending = Factory::CreateBlendStateObject(BlendStateDescriptor(true));

    target->Activate();
    texture->Activate(1);
    blending->Activate();
    program->Activate();
    quad->Draw(0, -1, false);
    glDisable(GL_SCISSOR_TEST);

    blending->Release();
    texture->Release();
    quad->Release();
    program->Release();
    target->Release();
}

constexpr Rgba kRed = {255, 0, 0, 255};
constexpr Rgba kGreen = {0, 255, 0, 255};
constexpr Rgba kBlue = {0, 0, 255, 255};

} // namespace

TEST_F(HwuiHost, PictureIsRightWithTheGuestInIt)
{
    const std::unique_ptr<RenderThreadHWUI> guest(
        RendererFactory::CreateHWUIRenderer(&m_callback, "guest"));
    for (int frame = 0; frame < 3; ++frame)
    {
        guest->GetMsgQueue()->enQueueMsg(new CallTask(&DrawRed));
        DrawFrame(*guest);
        EXPECT_EQ(Pixel(8, 4), kRed);
        EXPECT_EQ(Pixel(8, 15), kRed);
        EXPECT_EQ(Pixel(40, 4), kBlue);
        EXPECT_NE(Pixel(40, 24), kBlue); // outside the host's scissor
    }
}

TEST_F(HwuiHost, StateIsTheSameBeforeAndAfterTheGuest)
{
    const std::unique_ptr<RenderThreadHWUI> guest(
        RendererFactory::CreateHWUIRenderer(&m_callback, "guest"));
    guest->GetMsgQueue()->enQueueMsg(new CallTask(&DrawRed));
    const std::vector<GLint> before = State();
    DrawFrame(*guest);
    EXPECT_EQ(State(), before);
}

TEST_F(HwuiHost, FrameWithoutTasksIsTheHostsAlone)
{
    const std::unique_ptr<RenderThreadHWUI> guest(
        RendererFactory::CreateHWUIRenderer(&m_callback, "guest"));
    DrawFrame(*guest);
    EXPECT_EQ(Pixel(8, 4), kGreen);
    EXPECT_EQ(Pixel(40, 4), kBlue);
}

TEST_F(HwuiHost, WaiterOnAnotherThreadReturnsWithTheNextFrame)
{
    const std::unique_ptr<RenderThreadHWUI> guest(
        RendererFactory::CreateHWUIRenderer(&m_callback, "guest"));
    DrawFrame(*guest);
    bool ran = false; // written in a frame, read behind it
    std::atomic<bool> isBack{false};
    std::thread waiter(
        [&]
        {
            guest->GetMsgQueue()->enQueueMsg(new CallTask([&ran] { ran = true; }));
            EXPECT_TRUE(guest->GetMsgQueue()->waitForCompleting());
            isBack = true;
        });
    while (!isBack) // without a way to ask for a frame, the waiter takes the next one that comes
        DrawFrame(*guest);
    waiter.join();
    EXPECT_TRUE(ran);
}

TEST_F(HwuiHost, PauseReleasesAndResumeRestoresInsideFrames)
{
    const std::unique_ptr<RenderThreadHWUI> guest(
        RendererFactory::CreateHWUIRenderer(&m_callback, "guest"));
    ITextureObject* texture = nullptr;
    guest->GetMsgQueue()->enQueueMsg(new CallTask(
        [&]
        {
            TextureDescriptor descriptor;
            descriptor.width = descriptor.height = 4;
            texture =
                RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr);
        }));
    DrawFrame(*guest);
    guest->OnPause(); // on the host's thread: runs the release at once, inside a stored state
    guest->OnResume();
    DrawFrame(*guest);
    EXPECT_NO_THROW(texture->Activate(0));
    EXPECT_TRUE(glIsTexture(static_cast<GLuint>(Integer(GL_TEXTURE_BINDING_2D))));
    guest->GetMsgQueue()->enQueueMsg(new CallTask([&] { texture->Release(); }));
    glActiveTexture(GL_TEXTURE1);
    DrawFrame(*guest);
}
