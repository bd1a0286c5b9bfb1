#ifndef NIB_PIPELINE_STATE_H
#define NIB_PIPELINE_STATE_H

/// @file
/// Small GL objects that a drawing pass switches between: blend and depth/stencil states, scissor,
/// uniform buffers and fences, and what the device can do.
///
/// Made by RendererFactory. Every operation that touches GL is called on a GL thread with a current
/// context. State objects cache nothing: each Activate() issues all its calls.

#include <nib/export.h>
#include <nib/geometry.h>

#include <cstdint>

// X11 defines this name.
#pragma push_macro("Always")
#undef Always

namespace Nib
{

/// How source and destination are combined once their factors are applied.
enum class BlendingFunction : int
{
    Add = 0,
    Subtract = 1,        ///< source - destination
    ReverseSubtract = 2, ///< destination - source
    Min = 3,             ///< factors are ignored
    Max = 4              ///< factors are ignored
};

/// What a source or destination colour is multiplied with.
enum class BlendingFactor : int
{
    Zero = 0,
    One = 1,
    SourceColor = 2,
    OneMinusSourceColor = 3,
    DestinationColor = 4,
    OneMinusDestinationColor = 5,
    SourceAlpha = 6,
    OneMinusSourceAlpha = 7,
    DestinationAlpha = 8,
    OneMinusDestinationAlpha = 9,
    ConstantColor = 10,
    OneMinusConstantColor = 11,
    ConstantAlpha = 12,
    OneMinusConstantAlpha = 13
};

/// When a fragment passes the depth or stencil test; the new value is compared with the stored one.
enum class DepthStencilFunction : int
{
    Never = 0,
    Less = 1,
    Equal = 2,
    LessOrEqual = 3,
    Greater = 4,
    NotEqual = 5,
    GreaterOrEqual = 6,
    Always = 7
};

/// What happens to a stencil value.
enum class StencilOperation : int
{
    Keep = 0,
    Zero = 1,
    Replace = 2,   ///< by the reference value
    Increment = 3, ///< saturating
    Decrement = 4, ///< saturating
    Invert = 5,
    IncrementWrap = 6,
    DecrementWrap = 7
};

/// A blend state as a value. The default modes are those of premultiplied alpha: add, one, one
/// minus source alpha, for colour and alpha alike.
struct NIB_EXPORT BlendStateDescriptor
{
    explicit BlendStateDescriptor(bool enabled);         ///< all colour channels are written
    BlendStateDescriptor(bool enabled, bool colorWrite); ///< with the default modes

    /// Switches blending, and the writing of all four channels.
    void SetEnabled(bool blending, bool writeColor);
    /// How colour is blended: function(source * src, destination * dst).
    void SetColorBlendingMode(BlendingFunction function, BlendingFactor src, BlendingFactor dst);
    /// How alpha is blended, likewise.
    void SetAlphaBlendingMode(BlendingFunction function, BlendingFactor src, BlendingFactor dst);

    bool enabled;                   ///< blending is on
    bool colorWrite;                ///< all four channels are written, or none
    BlendingFunction colorFunction; ///< how source and destination colour combine
    BlendingFunction alphaFunction; ///< how source and destination alpha combine
    BlendingFactor colorSrcFactor;  ///< what the source colour is multiplied by
    BlendingFactor colorDstFactor;  ///< what the destination colour is multiplied by
    BlendingFactor alphaSrcFactor;  ///< what the source alpha is multiplied by
    BlendingFactor alphaDstFactor;  ///< what the destination alpha is multiplied by
};

/// A depth and stencil state as a value. By default depth passes when less and is written, stencil
/// always passes and is kept, reference 0, all bits read and written.
struct NIB_EXPORT DepthStencilStateDescriptor
{
    DepthStencilStateDescriptor(bool depthEnabled,
                                bool stencilEnabled); ///< with the defaults above

    /// The depth test, and whether the depth of what passes is stored.
    void SetDepthFunction(DepthStencilFunction function, bool writeDepth);
    /// The stencil test: what @p readMask leaves of @p ref and of the stored value is compared.
    void SetStencilFunction(DepthStencilFunction function, unsigned char ref,
                            unsigned char readMask, unsigned char writeMask);

    /// Both faces. @p sfail: the stencil test fails; @p dpfail: it passes and depth fails;
    /// @p dppass: both pass.
    void SetStencilOperation(StencilOperation sfail, StencilOperation dpfail,
                             StencilOperation dppass);
    /// As SetStencilOperation, for front faces.
    void SetStencilOperationFront(StencilOperation sfail, StencilOperation dpfail,
                                  StencilOperation dppass);
    /// As SetStencilOperation, for back faces.
    void SetStencilOperationBack(StencilOperation sfail, StencilOperation dpfail,
                                 StencilOperation dppass);

    bool depthEnabled;   ///< the depth test is on
    bool stencilEnabled; ///< the stencil test is on
    DepthStencilFunction
        depthFunction; ///< passes when it holds of the new depth and the stored one
    DepthStencilFunction
        stencilFunction;               ///< passes when it holds of stencilRef and the stored value
    StencilOperation frontStencilFail; ///< front faces: the stencil test fails
    StencilOperation frontDepthFail;   ///< front faces: it passes, the depth test fails
    StencilOperation frontPass;        ///< front faces: both pass
    StencilOperation backStencilFail;  ///< back faces: the stencil test fails
    StencilOperation backDepthFail;    ///< back faces: it passes, the depth test fails
    StencilOperation backPass;         ///< back faces: both pass
    std::uint8_t stencilRef;           ///< the reference value
    std::uint8_t stencilReadMask;      ///< the bits that are compared
    std::uint8_t stencilWriteMask;     ///< the bits that are written
    bool depthWrite;                   ///< the depth of what passes is stored
};

/// A blend state that can be made current. Holds no GL name and serves every context.
class NIB_EXPORT IBlendStateObject
{
public:
    virtual ~IBlendStateObject() = default;

    /// Copied; not yet sent.
    virtual void SetDescriptor(const BlendStateDescriptor& descriptor) = 0;
    virtual void Activate() = 0; ///< sends the state to the current context
    virtual void Release() = 0;  ///< deletes the object
};

/// A depth and stencil state that can be made current. Holds no GL name and serves every context.
class NIB_EXPORT IDepthStencilState
{
public:
    virtual ~IDepthStencilState() = default;

    /// Copied; not yet sent.
    virtual void SetDescriptor(const DepthStencilStateDescriptor& descriptor) = 0;

    /// Sends the state to the current context. A test that is off is only switched off: the depth
    /// write mask, for one, stays as it was.
    virtual void Activate() = 0;
    virtual void Release() = 0; ///< deletes the object
};

/// The scissor of the current context; nothing is kept here.
class NIB_EXPORT IRasterizerState
{
public:
    /// Pixels, from the lower left corner of the framebuffer.
    struct ScissorRect
    {
        std::int32_t x = 0;      ///< of the left edge
        std::int32_t y = 0;      ///< of the lower edge
        std::int32_t width = 0;  ///< none or more
        std::int32_t height = 0; ///< none or more
    };

    virtual ~IRasterizerState() = default;
    /// Switches the scissor test.
    virtual void SetScissorEnabled(bool enabled) = 0;
    /// Sets the rectangle; it holds while the test is on.
    virtual void SetScissorRect(const ScissorRect& rect) = 0;
    /// Whether the scissor test is on, asked of GL.
    virtual bool IsScissorEnabled() const = 0;
    /// The rectangle, asked of GL.
    virtual ScissorRect GetScissorRect() const = 0;
};

/// A buffer for a uniform block. It does not survive a context loss: release it before the thread
/// is paused and make another one afterwards.
class NIB_EXPORT IUniformBuffer
{
public:
    virtual ~IUniformBuffer() = default; ///< deletes no GL name; that is Release()'s business
    virtual void Release() = 0;          ///< deletes the GL buffer and the object

    /// Replaces the whole contents by @p size bytes at @p data, which are copied. A null @p data
    /// leaves the new contents undefined.
    virtual void Update(const void* data, unsigned int size, BufferUsage usage) = 0;

    /// Binds the buffer to a uniform binding point, 0 to 3; 4 and above ends the process.
    virtual void Activate(int binding) = 0;
};

/// A point in the GPU's work that can be waited for. It does not survive a context loss: release it
/// before the thread is paused and make another one afterwards.
class NIB_EXPORT IFence
{
public:
    /// What a wait or a query found.
    enum Result : int
    {
        Signaled = 0,    ///< the GPU has passed the fence
        NotSignaled = 1, ///< not yet: the time is over, or the query came too early
        Failed = 2       ///< the driver refused
    };

    virtual ~IFence() = default;
    virtual void Release() = 0; ///< deletes the sync object and the fence

    /// Sets the fence behind all work issued so far, in place of the old one.
    virtual void Insert() = 0;

    /// Waits without time-out. Signaled at once when no fence was inserted.
    virtual Result Wait() = 0;

    /// Waits at most @p timeout nanoseconds, 0 for none. To be called after Insert().
    virtual Result Wait(unsigned long long timeout) = 0;

    /// Does not wait. To be called after Insert().
    virtual Result GetStatus() = 0;
};

/// What the device can do.
class NIB_EXPORT IRendererDeviceCaps
{
public:
    virtual ~IRendererDeviceCaps() = default;

    /// Greatest width of a texture in pixels; 8192 until a render thread has asked the driver.
    virtual int GetMaxTextureSize() const = 0;
};

/// Names the current context and the maker of its GPU.
class NIB_EXPORT IContextHolder
{
public:
    /// Makers of GPUs that are told apart.
    enum GPUVendor : int
    {
        Unknown = 0, ///< no context was current when asked
        Arm = 1,
        Qualcomm = 2,
        Other = 3
    };

    virtual ~IContextHolder() = default;

    /// The EGLContext current on the calling thread, or null.
    virtual void* GetCurrentContextId() = 0;

    /// Asked of the driver once per process; Unknown as long as no context was current.
    virtual GPUVendor GetGPUVendor() = 0;

    /// [blocks] until the GPU is done with all work issued on the current context.
    virtual void WaitForGpuCompletion() = 0;
};

} // namespace Nib

#pragma pop_macro("Always")

#endif
