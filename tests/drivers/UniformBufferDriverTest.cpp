// Uniform buffers, fences and what is known about the context, on the process's driver.

#include "drivers/ResourceContext.h"

#include <nib/device.h>

using namespace Nib;

namespace
{

constexpr const char* kVertex = "#version 300 es\n"
                                "layout(location = 0) in vec2 a_position;\n"
                                "void main() { gl_Position = vec4(a_position, 0.0, 1.0); }\n";
constexpr const char* kFragment = "#version 300 es\n"
                                  "precision highp float;\n"
                                  "layout(std140) uniform Colors { vec4 first; vec4 second; };\n"
                                  "out vec4 o_color;\n"
                                  "void main() { o_color = first + second; }\n";

/// A context of OpenGL ES 3, a program with a uniform block and a target to see its colours in.
class UniformBufferOnDriver : public ResourceContext
{
protected:
    void SetUp() override
    {
        ResourceContext::SetUp();
        if (IsSkipped() || HasFatalFailure())
            return;
        m_texture = NewTexture(2, 2);
        m_target = NewTarget(m_texture.get());
        m_program = NewProgram(kVertex, kFragment);
        VertexDescriptor layout;
        layout.addAttribute(VertexDescriptor::AttributeType::Float, 2);
        m_quad.reset(
            RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleStrip, &layout, 4, 0));
        const float vertices[] = {-1, -1, 1, -1, -1, 1, 1, 1};
        m_quad->UpdateBuffer(0, vertices, 4);
    }
    void TearDown() override
    {
        m_quad.reset();
        m_program.reset();
        m_target.reset();
        m_texture.reset();
        ResourceContext::TearDown();
    }

    /// The pixel that the program gives with its block at @p binding.
    Pixel Draw(int binding)
    {
        m_target->ClearColor(0, 0, 0, 0);
        m_program->Activate();
        const Owned<IParameterBinding> block(m_program->GetBindingIntf("Colors"));
        EXPECT_EQ(block->GetType(), BindingType::UniformBlock);
        block->SetValue(&binding);
        m_quad->Draw(0, 4, false);
        return PixelOf(*m_target, 1, 1);
    }

    /// Without an array buffer, the empty storage that a new uniform buffer gives it is an error.
    static Owned<IUniformBuffer> NewBuffer()
    {
        glBindBuffer(GL_ARRAY_BUFFER, 0);
        Owned<IUniformBuffer> buffer(RendererFactory::CreateUniformBuffer());
        EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION});
        return buffer;
    }

private:
    Owned<ITextureObject> m_texture;
    Owned<IOffscreenRenderTarget> m_target;
    Owned<IShaderProgram> m_program;
    Owned<IGraphicsObject> m_quad;
};

} // namespace

TEST_F(UniformBufferOnDriver, AProgramReadsItsBlockFromTheBuffer)
{
    const Owned<IUniformBuffer> buffer = NewBuffer();
    const float colors[8] = {0.2f, 0.0f, 0.4f, 0.5f, 0.2f, 0.6f, 0.0f, 0.5f};

    buffer->Update(colors, sizeof(colors), BufferUsage::Dynamic);
    buffer->Activate(2);

    EXPECT_EQ(Draw(2), (Pixel{102, 153, 102, 255}));
}

TEST_F(UniformBufferOnDriver, AnUpdateReplacesTheContents)
{
    const Owned<IUniformBuffer> buffer = NewBuffer();
    const float before[8] = {1, 1, 1, 1, 0, 0, 0, 0};
    const float after[8] = {0, 0.4f, 0, 1, 0, 0, 0, 0};
    buffer->Update(before, sizeof(before), BufferUsage::Static);
    buffer->Activate(0);
    EXPECT_EQ(Draw(0), (Pixel{255, 255, 255, 255}));

    buffer->Update(after, sizeof(after), BufferUsage::Stream);
    buffer->Activate(0);

    EXPECT_EQ(Draw(0), (Pixel{0, 102, 0, 255}));
}

TEST_F(UniformBufferOnDriver, EveryBindingPointHasItsOwnBuffer)
{
    std::vector<Owned<IUniformBuffer>> buffers;
    for (int i = 0; i < 4; ++i)
    {
        const float color[8] = {static_cast<float>(i) * 0.2f, 0, 0, 1, 0, 0, 0, 0};
        buffers.push_back(NewBuffer());
        buffers.back()->Update(color, sizeof(color), BufferUsage::Static);
        buffers.back()->Activate(i);
    }

    EXPECT_EQ(Draw(0), (Pixel{0, 0, 0, 255}));
    EXPECT_EQ(Draw(1), (Pixel{51, 0, 0, 255}));
    EXPECT_EQ(Draw(2), (Pixel{102, 0, 0, 255}));
    EXPECT_EQ(Draw(3), (Pixel{153, 0, 0, 255}));
}

TEST_F(UniformBufferOnDriver, MakingOneEmptiesTheArrayBufferThatIsBound)
{
    GLuint array = 0;
    glGenBuffers(1, &array);
    glBindBuffer(GL_ARRAY_BUFFER, array);
    glBufferData(GL_ARRAY_BUFFER, 16, nullptr, GL_STATIC_DRAW);

    const Owned<IUniformBuffer> buffer(RendererFactory::CreateUniformBuffer());

    GLint size = -1;
    glGetBufferParameteriv(GL_ARRAY_BUFFER, GL_BUFFER_SIZE, &size);
    EXPECT_EQ(size, 0);
    glDeleteBuffers(1, &array);
}

using GpuFenceOnDriver = ResourceContext;

TEST_F(GpuFenceOnDriver, IsPassedOnceTheGpuIsDone)
{
    const Owned<ITextureObject> texture = NewTexture(256, 256);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    const Owned<IFence> fence(RendererFactory::CreateFence());
    EXPECT_EQ(fence->Wait(), IFence::Signaled); // nothing was inserted
    target->ClearColor(1, 0, 0, 1);
    DrawQuad({0, 1, 0, 1});

    fence->Insert();

    EXPECT_EQ(fence->Wait(), IFence::Signaled);
    EXPECT_EQ(fence->GetStatus(), IFence::Signaled);
    EXPECT_EQ(fence->Wait(0), IFence::Signaled);
}

TEST_F(GpuFenceOnDriver, MayBeInsertedAgain)
{
    const Owned<IFence> fence(RendererFactory::CreateFence());
    for (int i = 0; i < 3; ++i)
    {
        fence->Insert();
        EXPECT_EQ(fence->Wait(10'000'000'000), IFence::Signaled);
    }
}

TEST_F(GpuFenceOnDriver, NeverInsertedItIsReleasedWithoutAnError)
{
    Owned<IFence> fence(RendererFactory::CreateFence());

    fence.reset();

    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

using ContextHolderOnDriver = ResourceContext;

TEST_F(ContextHolderOnDriver, NamesTheCurrentContextAndItsVendor)
{
    IContextHolder* const holder = RendererFactory::GetContextHolder();
    const std::string vendor = reinterpret_cast<const char*>(glGetString(GL_VENDOR));

    EXPECT_EQ(holder->GetCurrentContextId(), eglGetCurrentContext());
    const bool arm = vendor.find("ARM") != std::string::npos;
    const bool qualcomm = vendor.find("Qualcomm") != std::string::npos;
    EXPECT_EQ(holder->GetGPUVendor(), arm        ? IContextHolder::Arm
                                      : qualcomm ? IContextHolder::Qualcomm
                                                 : IContextHolder::Other);
    holder->WaitForGpuCompletion();
}

TEST_F(ContextHolderOnDriver, TheTextureLimitIsTheDrivers)
{
    OpenGLRenderer::InitParameters();

    EXPECT_EQ(RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize(),
              std::min(Integer(GL_MAX_TEXTURE_SIZE), FourIntegers(GL_MAX_VIEWPORT_DIMS)[0]));
}
