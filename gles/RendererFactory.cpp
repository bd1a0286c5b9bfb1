#include <nib/renderer_factory.h>

#include "gles/RendererFactoryImpl.h"

namespace Nib
{

using GLES::RendererFactoryImpl;

ITextureObject* RendererFactory::CreateTextureObject(const TextureDescriptor& descriptor,
                                                     const void* pixels, const unsigned int* params,
                                                     unsigned int paramCount,
                                                     const TextureBufferInfo* bufferInfo)
{
    return RendererFactoryImpl::CreateTextureObject(descriptor, pixels, params, paramCount,
                                                    bufferInfo);
}

IGraphicsObject* RendererFactory::CreateGraphicsObject(unsigned int bufferCount, PrimitiveType mode,
                                                       const VertexDescriptor* descriptors,
                                                       unsigned int vertexCount,
                                                       unsigned int indexCount)
{
    return RendererFactoryImpl::GreateGraphicsObject(bufferCount, mode, descriptors, vertexCount,
                                                     indexCount);
}

IDepthStencilBuffer* RendererFactory::CreateDepthStencilBuffer(unsigned int width,
                                                               unsigned int height)
{
    return RendererFactoryImpl::CreateDepthStencilBuffer(width, height);
}

IBlendStateObject* RendererFactory::CreateBlendStateObject(const BlendStateDescriptor& descriptor)
{
    return RendererFactoryImpl::CreateBlendStateObject(descriptor);
}

IOffscreenRenderTarget* RendererFactory::CreateOffscreenRenderTarget(ITextureObject* color)
{
    return RendererFactoryImpl::CreateOffscreenRenderTarget(color);
}

IRenderTarget* RendererFactory::CreateRenderTargetFromDefault(int width, int height)
{
    return RendererFactoryImpl::CreateRenderTargetFromDefault(width, height);
}

IRenderTarget* RendererFactory::CreateRenderTargetFromCurrent(int width, int height)
{
    return RendererFactoryImpl::CreateRenderTargetFromCurrent(width, height);
}

IShaderProgram* RendererFactory::CreateShaderProgram(const char* vs, const char* fs,
                                                     const char* third)
{
    return RendererFactoryImpl::CreateShaderProgram(vs, fs, third);
}

IDepthStencilState*
RendererFactory::CreateDepthStencilState(const DepthStencilStateDescriptor& descriptor)
{
    return RendererFactoryImpl::CreateDepthStencilState(descriptor);
}

IFence* RendererFactory::CreateFence()
{
    return RendererFactoryImpl::CreateFence();
}

IUniformBuffer* RendererFactory::CreateUniformBuffer()
{
    return RendererFactoryImpl::CreateUniformBuffer();
}

IRasterizerState* RendererFactory::GetRasterizerState()
{
    return RendererFactoryImpl::GetRasterizerState();
}

IRendererDeviceCaps* RendererFactory::GetRendererDeviceCaps()
{
    return RendererFactoryImpl::GetRendererDeviceCaps();
}

IContextHolder* RendererFactory::GetContextHolder()
{
    return RendererFactoryImpl::GetContextHolder();
}

RenderThreadGL* RendererFactory::CreateSurfaceRenderer(const char* name,
                                                       RenderThreadGL::RenderPriority priority)
{
    return GLES::CreateSurfaceRenderer(name, priority);
}

RenderThreadHWUI* RendererFactory::CreateHWUIRenderer(HwuiCallback* callback, const char* name)
{
    return GLES::CreateHWUIRenderer(callback, name);
}

RenderThreadGL* RendererFactory::CreateFBRSurfaceRenderer(IGLMsgQueue* parent, const char* name)
{
    return GLES::CreateFBRSurfaceRenderer(parent, name);
}

RenderThreadGL* RendererFactory::CreateOffscreenRenderer(IGLMsgQueue* parent, const char* name,
                                                         bool managed)
{
    return GLES::CreateOffscreenRenderer(parent, name, managed);
}

RenderThreadGL* RendererFactory::CreateSwapChainRenderer(const char* /*name*/)
{
    return nullptr;
}

} // namespace Nib
