#ifndef NIB_RENDERER_FACTORY_H
#define NIB_RENDERER_FACTORY_H

/// @file
/// The one place from which everything the renderer makes is obtained.

#include <nib/export.h>
#include <nib/geometry.h>
#include <nib/msg_queue.h>
#include <nib/pipeline_state.h>
#include <nib/render_target.h>
#include <nib/render_thread.h>
#include <nib/shader.h>
#include <nib/texture.h>

namespace Nib
{

/// Creates render threads and GPU resources.
///
/// Owner    the caller. Resources end with their own Release(), on the GL thread of the context
///          that made them; render threads are deleted. What a Get function returns is
///          process-wide and never released.
/// Threads  render threads and the Get functions: any thread. Resources: a GL thread with a current
///          context, in practice inside a task on a render thread, because they make GL names and
///          subscribe to that thread's queue.
/// Failure  what a constructor throws reaches the caller, and nothing is leaked. A resource whose
///          GL names could not be made is returned without them.
class NIB_EXPORT RendererFactory
{
public:
    RendererFactory() = delete;

    /// @p pixels may be null. @p params are @p paramCount pairs as ITextureObject::SetParam takes
    /// them; @p bufferInfo, which may be null, tells how the pixels lie in memory. Throws
    /// std::logic_error when the texture is larger than the device allows.
    static ITextureObject* CreateTextureObject(const TextureDescriptor& descriptor,
                                               const void* pixels, const unsigned int* params,
                                               unsigned int paramCount,
                                               const TextureBufferInfo* bufferInfo);

    /// @p descriptors lay out the @p bufferCount vertex buffers, each of @p vertexCount vertices;
    /// an @p indexCount of 0 makes no index buffer. Throws InvalidArgumentException for a bad
    /// number of buffers.
    static IGraphicsObject* CreateGraphicsObject(unsigned int bufferCount, PrimitiveType mode,
                                                 const VertexDescriptor* descriptors,
                                                 unsigned int vertexCount, unsigned int indexCount);

    /// A depth and stencil buffer, in pixels.
    static IDepthStencilBuffer* CreateDepthStencilBuffer(unsigned int width, unsigned int height);

    /// A blend state with a copy of @p descriptor.
    static IBlendStateObject* CreateBlendStateObject(const BlendStateDescriptor& descriptor);

    /// A target that draws into @p color, which is borrowed and must outlive it. Throws
    /// std::logic_error when the texture cannot be drawn into.
    static IOffscreenRenderTarget* CreateOffscreenRenderTarget(ITextureObject* color);

    /// The window's framebuffer, framebuffer 0.
    static IRenderTarget* CreateRenderTargetFromDefault(int width, int height);

    /// The framebuffer that is bound now, which the target does not own.
    static IRenderTarget* CreateRenderTargetFromCurrent(int width, int height);

    /// A program from vertex shader @p vs and fragment shader @p fs, whose texts are not copied and
    /// must live as long as the program. @p third is ignored. Throws when they do not compile or
    /// link.
    static IShaderProgram* CreateShaderProgram(const char* vs, const char* fs, const char* third);

    /// A depth and stencil state with a copy of @p descriptor.
    static IDepthStencilState*
    CreateDepthStencilState(const DepthStencilStateDescriptor& descriptor);

    static IFence* CreateFence(); ///< nothing is inserted yet

    static IUniformBuffer* CreateUniformBuffer(); ///< empty

    /// The one scissor state; not given away.
    static IRasterizerState* GetRasterizerState();
    /// The one view of the device; not given away.
    static IRendererDeviceCaps* GetRendererDeviceCaps();
    /// The one view of the GPU's maker; not given away.
    static IContextHolder* GetContextHolder();

    // Render threads: not started. Names and callbacks are kept as pointers and must outlive them.

    /// As GLES::CreateSurfaceRenderer.
    static RenderThreadGL* CreateSurfaceRenderer(const char* name,
                                                 RenderThreadGL::RenderPriority priority);
    /// As GLES::CreateHWUIRenderer.
    static RenderThreadHWUI* CreateHWUIRenderer(HwuiCallback* callback, const char* name);

    /// Draws into the front buffer; shares its context with the render thread of @p parent, which
    /// must outlive it.
    static RenderThreadGL* CreateFBRSurfaceRenderer(IGLMsgQueue* parent, const char* name);

    /// Draws offscreen; shares its context with the render thread of @p parent, which must outlive
    /// it. With @p managed, its GL objects are released and restored with its context.
    static RenderThreadGL* CreateOffscreenRenderer(IGLMsgQueue* parent, const char* name,
                                                   bool managed);

    static RenderThreadGL* CreateSwapChainRenderer(const char* name); ///< not supported: null
};

} // namespace Nib

#endif
