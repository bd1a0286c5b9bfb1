// A render thread that loses its context again and again, with everything that comes back.

#include "drivers/RenderThreadSupport.h"
#include "drivers/ResidentMemory.h"

#include <nib/nib.h>

#include <GLES3/gl3.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>
#include <string>

using namespace Nib;

namespace
{

/// The whole number once, without a window system; a window system changes nothing about it.
int Rounds()
{
    const char* const platform = std::getenv("EGL_PLATFORM");
    const bool isWhole = platform && std::string(platform) == "surfaceless";
    return kMemoryCanBeMeasured && isWhole ? 10000 : 300;
}

constexpr long kFlatKiB = 2048;

const char* const kVertexShader = "attribute vec2 a_position;\n"
                                  "void main() { gl_Position = vec4(a_position, 0.0, 1.0); }\n";
const char* const kFragmentShader = "precision mediump float;\n"
                                    "uniform vec4 u_colour;\n"
                                    "void main() { gl_FragColor = u_colour; }\n";

/// One object of each kind that comes back with the context.
struct Objects
{
    ITextureObject* texture;
    IGraphicsObject* mesh;
    IDepthStencilBuffer* depth;
    IShaderProgram* program;

    Objects()
    {
        TextureDescriptor descriptor;
        descriptor.width = descriptor.height = 32;
        texture = RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr);
        VertexDescriptor vertex;
        vertex.addAttribute(VertexDescriptor::AttributeType::Float, 2);
        mesh = RendererFactory::CreateGraphicsObject(1, PrimitiveType::Triangles, &vertex, 3, 3);
        depth = RendererFactory::CreateDepthStencilBuffer(32, 32);
        program = RendererFactory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr);
    }
    ~Objects()
    {
        program->Release();
        depth->Release();
        mesh->Release();
        texture->Release();
    }
};

/// Names of any kind that live in the calling thread's share group; a driver may give a new number
/// each time.
int CountNames(int rounds)
{
    int count = 0;
    for (GLuint name = 1; name <= static_cast<GLuint>(4 * rounds); ++name)
        count += glIsTexture(name) + glIsBuffer(name) + glIsRenderbuffer(name) + glIsSampler(name) +
                 glIsProgram(name) + glIsShader(name);
    return count;
}

void PauseAndResume(RenderThreadGL& thread)
{
    thread.OnPause();
    thread.OnResume();
    thread.GetMsgQueue()->waitForCompleting(); // OnResume does not wait for the context
}

} // namespace

TEST(PauseResume, ManyRoundsLeaveMemoryAndNamesWhereTheyWere)
{
    ASSERT_EQ(Egl::GetEglStatus(), 0) << "the driver does not start";
    const int rounds = Rounds();
    const int warmUpRounds = rounds / 10;
    const std::unique_ptr<RenderThreadGL> parent(
        RendererFactory::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    parent->Start();
    const std::unique_ptr<RenderThreadGL> child(
        RendererFactory::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
    child->Start();
    IGLMsgQueue* const queue = child->GetMsgQueue();
    std::unique_ptr<Objects> objects;
    int namesBefore = 0, namesAfter = 0;
    RunOn(queue, [&] { objects = std::make_unique<Objects>(); });

    for (int i = 0; i < warmUpRounds; ++i)
        PauseAndResume(*child);
    const long residentBefore = ResidentKiB();
    RunOn(queue, [&] { namesBefore = CountNames(rounds); });

    for (int i = warmUpRounds; i < rounds; ++i)
        PauseAndResume(*child);

    EXPECT_LE(ResidentKiB() - residentBefore, kFlatKiB);
    RunOn(queue, [&] { namesAfter = CountNames(rounds); });
    EXPECT_EQ(namesAfter, namesBefore);
    EXPECT_GE(namesBefore, 5); // texture, two buffers, renderbuffer, program
    RunOn(queue, [&] { objects.reset(); });
}
