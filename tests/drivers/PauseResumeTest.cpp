// A render thread that loses its context again and again, with everything that comes back.

#include "drivers/Driver.h"
#include "drivers/RenderThreadSupport.h"
#include "drivers/ResidentMemory.h"

#include <nib/nib.h>

#include <GLES3/gl3.h>
#include <gtest/gtest.h>

#include <memory>

using namespace Nib;

namespace
{

/// The whole number on one driver, since the others change nothing about it; few on the slow one.
int Rounds()
{
    if (DriverIs({"softpipe"}))
        return 100;
    return kMemoryCanBeMeasured && DriverIs({"surfaceless"}) ? 10000 : 300;
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

/// Names of any kind that live in the calling thread's share group. A driver may give a new number
/// each time, and a round makes at most four of a kind: two programs and, with the same numbers on
/// some drivers, two shaders.
int CountNames(int rounds)
{
    int count = 0;
    for (GLuint name = 1; name <= static_cast<GLuint>(5 * rounds); ++name)
        count += glIsTexture(name) + glIsBuffer(name) + glIsRenderbuffer(name) + glIsSampler(name) +
                 glIsProgram(name) + glIsShader(name);
    return count;
}

/// The names that a restored program leaves: one, that of the binary which was refused, for a driver
/// without program binaries.
int NamesLeftByARound()
{
    GLint formats = 0;
    glGetIntegerv(GL_NUM_PROGRAM_BINARY_FORMATS, &formats);
    return formats == 0 ? 1 : 0;
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
    if (!HasPbuffers())
        GTEST_SKIP() << kNoPbuffers;
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
    int namesBefore = 0, namesAfter = 0, namesLeft = 0;
    RunOn(queue, [&] { objects = std::make_unique<Objects>(); });
    RunOn(queue, [&] { namesLeft = (rounds - warmUpRounds) * NamesLeftByARound(); });

    for (int i = 0; i < warmUpRounds; ++i)
        PauseAndResume(*child);
    const long residentBefore = ResidentKiB();
    RunOn(queue, [&] { namesBefore = CountNames(rounds); });

    for (int i = warmUpRounds; i < rounds; ++i)
        PauseAndResume(*child);

    EXPECT_LE(ResidentKiB() - residentBefore, kFlatKiB);
    RunOn(queue, [&] { namesAfter = CountNames(rounds); });
    EXPECT_EQ(namesAfter, namesBefore + namesLeft);
    EXPECT_GE(namesBefore, 5); // texture, two buffers, renderbuffer, program
    RunOn(queue, [&] { objects.reset(); });
}
