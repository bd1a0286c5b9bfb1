#ifndef NIB_GLES_RENDERER_FACTORY_IMPL_H
#define NIB_GLES_RENDERER_FACTORY_IMPL_H

#include <nib/geometry.h>
#include <nib/pipeline_state.h>
#include <nib/render_target.h>
#include <nib/shader.h>
#include <nib/texture.h>

namespace Nib::GLES
{

/// Makes the GL objects behind the interfaces that RendererFactory hands out.
class RendererFactoryImpl
{
public:
    RendererFactoryImpl() = delete;

    static ITextureObject* CreateTextureObject(const TextureDescriptor& descriptor,
                                               const void* pixels, const unsigned int* params,
                                               unsigned int paramCount,
                                               const TextureBufferInfo* bufferInfo);
    static IGraphicsObject* GreateGraphicsObject(unsigned int bufferCount, PrimitiveType mode,
                                                 const VertexDescriptor* descriptors,
                                                 unsigned int vertexCount, unsigned int indexCount);
    static IDepthStencilBuffer* CreateDepthStencilBuffer(unsigned int width, unsigned int height);
    static IBlendStateObject* CreateBlendStateObject(const BlendStateDescriptor& descriptor);
    static IOffscreenRenderTarget* CreateOffscreenRenderTarget(ITextureObject* color);
    static IRenderTarget* CreateRenderTargetFromDefault(int width, int height);
    static IRenderTarget* CreateRenderTargetFromCurrent(int width, int height);
    static IShaderProgram* CreateShaderProgram(const char* vs, const char* fs, const char* third);
    static IDepthStencilState*
    CreateDepthStencilState(const DepthStencilStateDescriptor& descriptor);
    static IFence* CreateFence();
    static IUniformBuffer* CreateUniformBuffer();
    static IRasterizerState* GetRasterizerState();
    static IRendererDeviceCaps* GetRendererDeviceCaps();
    static IContextHolder* GetContextHolder();
};

} // namespace Nib::GLES

#endif
