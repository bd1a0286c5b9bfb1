#include <nib/renderer_factory.h>

#include "gles/BoundQueue.h"
#include "gles/DepthStencilBuffer.h"
#include "gles/GlContext.h"
#include "gles/GraphicsObject.h"
#include "gles/OffscreenRenderTarget.h"
#include "gles/OpenGLShaderProgram.h"
#include "gles/RendererFactoryImpl.h"
#include "gles/RenderTargetBase.h"
#include "gles/TextureObject.h"

#include <nib/exceptions.h>

#include <gtest/gtest.h>

#include <memory>
#include <stdexcept>
#include <thread>

using namespace Nib;

namespace
{

constexpr const char* kVertex = "attribute vec4 a_position;\n"
                                "void main() { gl_Position = a_position; }\n";
constexpr const char* kFragment = "precision mediump float;\n"
                                  "uniform vec4 u_color;\n"
                                  "void main() { gl_FragColor = u_color; }\n";

struct Factory : ::testing::Test
{
    Factory() { gl.Forget(); }

    /// What the factory made is gone, once it was released.
    void ExpectNothingLeft() const
    {
        SimCounts expected;
        expected.contexts = 1;
        expected.surfaces = 1;
        EXPECT_EQ(gl.driver.Live(), expected);
    }

    GlContext gl;
    BoundQueue queue;
};

TextureDescriptor Rgba8(int width, int height)
{
    TextureDescriptor descriptor;
    descriptor.width = width;
    descriptor.height = height;
    return descriptor;
}

VertexDescriptor Positions()
{
    VertexDescriptor descriptor;
    descriptor.addAttribute(VertexDescriptor::AttributeType::Float, 2, VertexDescriptor::kPacked,
                            0);
    return descriptor;
}

} // namespace

using RendererFactoryTest = Factory;

TEST_F(RendererFactoryTest, CreatesATextureWithItsPixelsParametersAndBufferInfo)
{
    const unsigned char pixels[2 * 3 * 4] = {9, 9, 9, 9, 9, 9, 9, 9, 9, 9, 9, 9,
                                             9, 9, 9, 9, 1, 2, 3, 4, 9, 9, 9, 9};
    const unsigned int params[] = {kTextureParamMagFilter, kTextureFilterNearest};
    const TextureBufferInfo info{1, 1, 3};

    ITextureObject* texture =
        RendererFactory::CreateTextureObject(Rgba8(1, 1), pixels, params, 1, &info);

    auto* object = dynamic_cast<GLES::TextureObject*>(texture);
    ASSERT_NE(object, nullptr);
    EXPECT_EQ(texture->GetWidth(), 1);
    EXPECT_EQ(gl.driver.Texture(object->internals().glID).At(0, 0), (SimPixel{1, 2, 3, 4}));
    EXPECT_EQ(object->internals().params.at(kTextureParamMagFilter), kTextureFilterNearest);
    EXPECT_TRUE(object->IsSubscribed());
    texture->Release();
    ExpectNothingLeft();
}

TEST_F(RendererFactoryTest, AnOversizedTextureThrowsAndLeaksNothing)
{
    EXPECT_THROW(
        RendererFactory::CreateTextureObject(Rgba8(1 << 20, 1), nullptr, nullptr, 0, nullptr),
        std::logic_error);

    ExpectNothingLeft();
}

TEST_F(RendererFactoryTest, CreatesAMeshWithItsBuffers)
{
    const VertexDescriptor descriptors[] = {Positions(), Positions()};

    IGraphicsObject* mesh =
        RendererFactory::CreateGraphicsObject(2, PrimitiveType::TriangleStrip, descriptors, 4, 6);

    auto* object = dynamic_cast<GLES::GraphicsObject*>(mesh);
    ASSERT_NE(object, nullptr);
    EXPECT_TRUE(object->IsSubscribed());
    EXPECT_EQ(gl.driver.Live().buffers, 3);
    mesh->Release();
    ExpectNothingLeft();
}

TEST_F(RendererFactoryTest, AMeshDrawsInItsModeItsVertices)
{
    const VertexDescriptor descriptor = Positions();
    const float vertices[8] = {};
    IShaderProgram* program = RendererFactory::CreateShaderProgram(kVertex, kFragment, nullptr);
    IGraphicsObject* mesh =
        RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleFan, &descriptor, 4, 0);
    mesh->UpdateBuffer(0, vertices, 4);
    program->Activate();
    gl.Forget();

    mesh->Draw(0, -1, false);

    EXPECT_EQ(gl.driver.Calls("glDrawArrays"),
              Sequence({Call("glDrawArrays", GL_TRIANGLE_FAN, 0, 4)}));
    mesh->Release();
    program->Release();
}

TEST_F(RendererFactoryTest, ABadNumberOfBuffersThrowsAndLeaksNothing)
{
    const VertexDescriptor descriptors[17] = {};

    EXPECT_THROW(
        RendererFactory::CreateGraphicsObject(17, PrimitiveType::Triangles, descriptors, 4, 0),
        InvalidArgumentException);

    ExpectNothingLeft();
    queue.observer.DispatchRelease(); // nobody is called who was not made
}

TEST_F(RendererFactoryTest, CreatesADepthStencilBufferOfTheSize)
{
    IDepthStencilBuffer* buffer = RendererFactory::CreateDepthStencilBuffer(64, 32);

    EXPECT_EQ(buffer->GetWidth(), 64u);
    EXPECT_EQ(buffer->GetHeight(), 32u);
    EXPECT_TRUE(dynamic_cast<GLES::DepthStencilBuffer*>(buffer)->IsSubscribed());
    EXPECT_EQ(gl.driver.Live().renderbuffers, 1);
    buffer->Release();
    ExpectNothingLeft();
}

TEST_F(RendererFactoryTest, ReturnsADepthStencilBufferThatFailed)
{
    gl.driver.FailNext("glGenRenderbuffers", GL_OUT_OF_MEMORY);

    IDepthStencilBuffer* buffer = RendererFactory::CreateDepthStencilBuffer(64, 32);

    ASSERT_NE(buffer, nullptr);
    EXPECT_EQ(buffer->GetWidth(), 0u);
    buffer->Release();
}

TEST_F(RendererFactoryTest, CreatesABlendStateWithACopyOfTheDescriptor)
{
    BlendStateDescriptor descriptor(true);
    IBlendStateObject* state = RendererFactory::CreateBlendStateObject(descriptor);
    descriptor.SetEnabled(false, false);

    state->Activate();

    EXPECT_EQ(gl.driver.CallNames(),
              Names({"glBlendEquationSeparate", "glBlendFuncSeparate", "glEnable", "glColorMask"}));
    state->Release();
}

TEST_F(RendererFactoryTest, CreatesADepthStencilStateWithACopyOfTheDescriptor)
{
    DepthStencilStateDescriptor descriptor(true, false);
    IDepthStencilState* state = RendererFactory::CreateDepthStencilState(descriptor);
    descriptor = DepthStencilStateDescriptor(false, false);

    state->Activate();

    EXPECT_EQ(gl.driver.CallNames(),
              Names({"glEnable", "glDepthMask", "glDepthFunc", "glDisable"}));
    state->Release();
}

TEST_F(RendererFactoryTest, CreatesAnOffscreenTargetOnTheTexture)
{
    ITextureObject* texture =
        RendererFactory::CreateTextureObject(Rgba8(16, 8), nullptr, nullptr, 0, nullptr);
    gl.Forget();

    IOffscreenRenderTarget* target = RendererFactory::CreateOffscreenRenderTarget(texture);

    EXPECT_EQ(gl.driver.Live().framebuffers, 1);
    gl.Forget();
    target->Activate();
    EXPECT_EQ(gl.driver.LastCall("glViewport"), Call("glViewport", 0, 0, 16, 8));
    target->Release();
    texture->Release();
    ExpectNothingLeft();
}

TEST_F(RendererFactoryTest, ATextureThatCannotBeDrawnIntoThrowsAndLeaksNothing)
{
    TextureDescriptor descriptor = Rgba8(16, 8);
    descriptor.layout = TextureTargetLayout::Luminance;
    descriptor.memoryLayout = TextureMemoryLayout::Luminance;
    ITextureObject* texture =
        RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr);

    EXPECT_THROW(RendererFactory::CreateOffscreenRenderTarget(texture), std::logic_error);

    EXPECT_EQ(gl.driver.Live().framebuffers, 0);
    texture->Release();
    ExpectNothingLeft();
}

TEST_F(RendererFactoryTest, TheTargetFromDefaultIsFramebufferZero)
{
    IRenderTarget* target = RendererFactory::CreateRenderTargetFromDefault(320, 240);
    EXPECT_EQ(gl.driver.CallCount(), 0u);

    target->Activate();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, 0),
                                     Call("glViewport", 0, 0, 320, 240)}));
    target->Release();
}

TEST_F(RendererFactoryTest, TheTargetFromCurrentIsTheFramebufferBoundNow)
{
    GLuint own = 0;
    glGenFramebuffers(1, &own);
    glBindFramebuffer(GL_FRAMEBUFFER, own);
    IRenderTarget* target = RendererFactory::CreateRenderTargetFromCurrent(32, 24);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    gl.Forget();

    target->Activate();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, own),
                                     Call("glViewport", 0, 0, 32, 24)}));
    target->Release();
    EXPECT_TRUE(gl.driver.Framebuffer(own).exists);
    glDeleteFramebuffers(1, &own);
}

TEST_F(RendererFactoryTest, CreatesAProgramFromItsTwoSources)
{
    IShaderProgram* program = RendererFactory::CreateShaderProgram(kVertex, kFragment, nullptr);

    auto* object = dynamic_cast<GLES::OpenGLShaderProgram*>(program);
    ASSERT_NE(object, nullptr);
    EXPECT_TRUE(object->IsSubscribed());
    EXPECT_TRUE(gl.driver.Program(object->GetShaderId()).linked);
    program->Release();
    ExpectNothingLeft();
}

TEST_F(RendererFactoryTest, TheThirdArgumentOfAProgramChangesNothing)
{
    IShaderProgram* plain = RendererFactory::CreateShaderProgram(kVertex, kFragment, nullptr);
    plain->Release();
    gl.Forget();

    IShaderProgram* first = RendererFactory::CreateShaderProgram(kVertex, kFragment, nullptr);
    const std::vector<std::string> without = gl.driver.CallNames();
    first->Release();
    gl.Forget();
    IShaderProgram* second =
        RendererFactory::CreateShaderProgram(kVertex, kFragment, "#error anything at all");

    EXPECT_FALSE(without.empty());
    EXPECT_EQ(gl.driver.CallNames(), without);
    second->Release();
}

TEST_F(RendererFactoryTest, AProgramThatDoesNotCompileThrowsAndIsNotSubscribed)
{
    gl.driver.AllowMisuse("glDeleteProgram"); // its name is not one of GL's yet
    EXPECT_THROW(RendererFactory::CreateShaderProgram("#error no", kFragment, nullptr),
                 std::exception);

    gl.Forget();
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST_F(RendererFactoryTest, AFenceHasNoSyncObjectYet)
{
    IFence* fence = RendererFactory::CreateFence();

    EXPECT_EQ(gl.driver.CallCount(), 0u);
    fence->Insert();
    EXPECT_EQ(fence->Wait(), IFence::Signaled);
    fence->Release();
    ExpectNothingLeft();
}

TEST_F(RendererFactoryTest, AUniformBufferHasItsGLBufferAtOnce)
{
    gl.driver.AllowMisuse("glBufferData");

    IUniformBuffer* buffer = RendererFactory::CreateUniformBuffer();

    EXPECT_EQ(gl.driver.Live().buffers, 1);
    buffer->Release();
    ExpectNothingLeft();
    glGetError();
}

TEST_F(RendererFactoryTest, TheProcessWideObjectsAreTheSameForEveryThread)
{
    IRasterizerState* const state = RendererFactory::GetRasterizerState();
    IRendererDeviceCaps* const caps = RendererFactory::GetRendererDeviceCaps();
    IContextHolder* const holder = RendererFactory::GetContextHolder();
    ASSERT_NE(state, nullptr);
    ASSERT_NE(caps, nullptr);
    ASSERT_NE(holder, nullptr);

    std::thread other(
        [&]
        {
            EXPECT_EQ(RendererFactory::GetRasterizerState(), state);
            EXPECT_EQ(RendererFactory::GetRendererDeviceCaps(), caps);
            EXPECT_EQ(RendererFactory::GetContextHolder(), holder);
        });
    other.join();

    EXPECT_EQ(GLES::RendererFactoryImpl::GetRasterizerState(), state);
    EXPECT_EQ(GLES::RendererFactoryImpl::GetRendererDeviceCaps(), caps);
    EXPECT_EQ(GLES::RendererFactoryImpl::GetContextHolder(), holder);
    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST_F(RendererFactoryTest, TheProcessWideObjectsWork)
{
    RendererFactory::GetRasterizerState()->SetScissorEnabled(true);
    EXPECT_TRUE(RendererFactory::GetRasterizerState()->IsScissorEnabled());
    EXPECT_EQ(RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize(),
              OpenGLRenderer::getMaxTextureSize());
    EXPECT_EQ(RendererFactory::GetContextHolder()->GetCurrentContextId(), gl.context.Handle());
}

// ---- render threads: made by the functions of each kind, with the arguments as they are ----

TEST(RendererFactoryThreads, CreatesASurfaceRenderer)
{
    SimDriver driver;

    std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateSurfaceRenderer("surface", RenderThreadGL::Low));

    ASSERT_NE(thread, nullptr);
    EXPECT_EQ(thread->GetType(), 1);
    EXPECT_STREQ(thread->GetMsgQueue()->getTag(), "surface");
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO).front(),
              "Nib::RenderThreadGL *Nib::GLES::CreateSurfaceRenderer(const char *, "
              "RenderThreadGL::RenderPriority)");
}

TEST(RendererFactoryThreads, TheSurfaceRendererGetsItsPriority)
{
    SimDriver driver(SimGpu::Default().WithEglExtension("EGL_IMG_context_priority"));
    std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateSurfaceRenderer("surface", RenderThreadGL::Low));

    thread->Start();

    bool low = false;
    for (const EGLContext context : driver.Contexts())
        low = low || driver.Context(context).priority == 0x3103; // EGL_CONTEXT_PRIORITY_LOW_IMG
    EXPECT_TRUE(low);
}

TEST(RendererFactoryThreads, CreatesAnHWUIRenderer)
{
    SimDriver driver;
    HwuiCallback callback{};

    std::unique_ptr<RenderThreadHWUI> thread(
        RendererFactory::CreateHWUIRenderer(&callback, "hwui"));

    ASSERT_NE(thread, nullptr);
    EXPECT_EQ(thread->GetType(), 0);
    EXPECT_STREQ(thread->GetMsgQueue()->getTag(), "hwui");
}

TEST(RendererFactoryThreads, CreatesAFrontBufferRenderer)
{
    SimDriver driver;

    std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateFBRSurfaceRenderer(nullptr, "front"));

    ASSERT_NE(thread, nullptr);
    EXPECT_EQ(thread->GetType(), 2);
    EXPECT_STREQ(thread->GetMsgQueue()->getTag(), "front");
}

TEST(RendererFactoryThreads, CreatesAnOffscreenRendererThatManagesObjectsIfAsked)
{
    SimDriver driver;
    for (const bool managed : {true, false})
    {
        std::unique_ptr<RenderThreadGL> thread(
            RendererFactory::CreateOffscreenRenderer(nullptr, "off", managed));

        ASSERT_NE(thread, nullptr);
        EXPECT_EQ(thread->GetType(), 3);
        EXPECT_STREQ(thread->GetMsgQueue()->getTag(), "off");
        auto* queue = dynamic_cast<IGLManagedMsgQueue*>(thread->GetMsgQueue());
        ASSERT_NE(queue, nullptr);
        EXPECT_EQ(queue->GetObjectObserver() != nullptr, managed);
    }
}

TEST(RendererFactoryThreads, TheManagedFlagIsTrueForEveryNumberButZero)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateOffscreenRenderer(nullptr, "off", 0x10));

    EXPECT_NE(dynamic_cast<IGLManagedMsgQueue*>(thread->GetMsgQueue())->GetObjectObserver(),
              nullptr);
}

TEST(RendererFactoryThreads, ThereIsNoSwapChainRenderer)
{
    SimDriver driver;

    EXPECT_EQ(RendererFactory::CreateSwapChainRenderer("x"), nullptr);

    EXPECT_TRUE(driver.Log().empty());
    EXPECT_EQ(driver.CallCount(), 0u);
}
