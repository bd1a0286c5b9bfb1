#include "gles/RendererFactoryImpl.h"

#include "gles/BlendStateObject.h"
#include "gles/ContextHolder.h"
#include "gles/DepthStencilBuffer.h"
#include "gles/DepthStencilState.h"
#include "gles/Fence.h"
#include "gles/GraphicsObject.h"
#include "gles/OffscreenRenderTarget.h"
#include "gles/OpenGLShaderProgram.h"
#include "gles/RasterizerState.h"
#include "gles/RendererDeviceCaps.h"
#include "gles/RenderTargetBase.h"
#include "gles/TextureObject.h"
#include "gles/UniformBuffer.h"

#include <memory>

namespace Nib::GLES
{

ITextureObject* RendererFactoryImpl::CreateTextureObject(const TextureDescriptor& descriptor,
                                                         const void* pixels,
                                                         const unsigned int* params,
                                                         unsigned int paramCount,
                                                         const TextureBufferInfo* bufferInfo)
{
    return new TextureObject(descriptor, pixels, params, paramCount, bufferInfo);
}

IGraphicsObject* RendererFactoryImpl::GreateGraphicsObject(unsigned int bufferCount,
                                                           PrimitiveType mode,
                                                           const VertexDescriptor* descriptors,
                                                           unsigned int vertexCount,
                                                           unsigned int indexCount)
{
    auto object = std::make_unique<GraphicsObject>();
    object->CreateBuffer(mode, bufferCount, descriptors, vertexCount, indexCount);
    return object.release();
}

IDepthStencilBuffer* RendererFactoryImpl::CreateDepthStencilBuffer(unsigned int width,
                                                                   unsigned int height)
{
    auto buffer = std::make_unique<DepthStencilBuffer>();
    buffer->CreateBuffer(width, height);
    return buffer.release();
}

IBlendStateObject*
RendererFactoryImpl::CreateBlendStateObject(const BlendStateDescriptor& descriptor)
{
    return new BlendStateObject(descriptor);
}

IOffscreenRenderTarget* RendererFactoryImpl::CreateOffscreenRenderTarget(ITextureObject* color)
{
    return new OffscreenRenderTarget(color);
}

IRenderTarget* RendererFactoryImpl::CreateRenderTargetFromDefault(int width, int height)
{
    return new RenderTargetBase(width, height, RenderTargetBase::FramebufferType::Default);
}

IRenderTarget* RendererFactoryImpl::CreateRenderTargetFromCurrent(int width, int height)
{
    return new RenderTargetBase(width, height, RenderTargetBase::FramebufferType::Current);
}

IShaderProgram* RendererFactoryImpl::CreateShaderProgram(const char* vs, const char* fs,
                                                         const char* /*third*/)
{
    auto program = std::make_unique<OpenGLShaderProgram>();
    program->CreateShader(vs, fs);
    return program.release();
}

IDepthStencilState*
RendererFactoryImpl::CreateDepthStencilState(const DepthStencilStateDescriptor& descriptor)
{
    return new DepthStencilState(descriptor);
}

IFence* RendererFactoryImpl::CreateFence()
{
    return new Fence;
}

IUniformBuffer* RendererFactoryImpl::CreateUniformBuffer()
{
    return new UniformBuffer;
}

IRasterizerState* RendererFactoryImpl::GetRasterizerState()
{
    static RasterizerState state;
    return &state;
}

IRendererDeviceCaps* RendererFactoryImpl::GetRendererDeviceCaps()
{
    static RendererDeviceCaps caps;
    return &caps;
}

IContextHolder* RendererFactoryImpl::GetContextHolder()
{
    static ContextHolder holder;
    return &holder;
}

} // namespace Nib::GLES
