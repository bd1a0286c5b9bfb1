#ifndef NIB_DEVICE_H
#define NIB_DEVICE_H

#include <nib/export.h>

#include <atomic>

/// @file
/// What the GL implementation can do, the thin wrappers of its state calls, and the checks whether
/// a device can run the renderer.
///
/// Threads  Everything here needs a thread with a current GL context, except IsCompatibleGL and
///          IsFBRSupported.
/// Failure  Nothing throws. What a driver does not answer gives the result for "unknown" and stays
///          unknown, so that the next call asks again.

/// Logs GL_VERSION, GL_SHADING_LANGUAGE_VERSION and GL_EXTENSIONS and resolves the entry points of
/// GL_QCOM_tiled_rendering where the driver names that extension. Always true.
NIB_EXPORT bool InitOpenGLExtensions();

/// Whether @p name occurs in GL_EXTENSIONS. A plain substring test: a name without its prefix, or
/// one that begins another name, is found too. False for null and when the driver lists nothing.
NIB_EXPORT bool IsGLExtensionSupported(const char* name);

// The window system's headers define some of these names as macros.
#pragma push_macro("Always")
#undef Always

namespace Nib
{

enum class TextureTargetLayout : int;
enum class TextureMemoryLayout : int;

// The values of the enumerations below are the GL tokens, and are handed to GL unchanged: any
// other token that the GL call accepts may be passed by a cast.

/// A capability of glEnable and glDisable.
enum class RenderState : int
{
    CullFace = 0x0B44,
    DepthTest = 0x0B71,
    StencilTest = 0x0B90,
    Dither = 0x0BD0,
    Blend = 0x0BE2,
    ScissorTest = 0x0C11,
    PolygonOffsetFill = 0x8037,
    SampleAlphaToCoverage = 0x809E,
    SampleCoverage = 0x80A0,
    RasterizerDiscard = 0x8C89,
    PrimitiveRestartFixedIndex = 0x8D69,
};

/// A blend equation. Min and Max need isMinMaxBlendingSupported.
enum class BlendingFuncOld : int
{
    Add = 0x8006,
    Min = 0x8007,
    Max = 0x8008,
    Subtract = 0x800A,
    ReverseSubtract = 0x800B,
};

/// A factor of the blend equation.
enum class BlendingFactorOld : int
{
    Zero = 0,
    One = 1,
    SrcColor = 0x0300,
    OneMinusSrcColor = 0x0301,
    SrcAlpha = 0x0302,
    OneMinusSrcAlpha = 0x0303,
    DstAlpha = 0x0304,
    OneMinusDstAlpha = 0x0305,
    DstColor = 0x0306,
    OneMinusDstColor = 0x0307,
    SrcAlphaSaturate = 0x0308,
    ConstantColor = 0x8001,
    OneMinusConstantColor = 0x8002,
    ConstantAlpha = 0x8003,
    OneMinusConstantAlpha = 0x8004,
};

/// The faces that a stencil or culling call is about.
enum class FaceMode : int
{
    Front = 0x0404,
    Back = 0x0405,
    FrontAndBack = 0x0408,
};

/// A comparison of the depth or stencil test.
enum class DSFunc : int
{
    Never = 0x0200,
    Less = 0x0201,
    Equal = 0x0202,
    LessEqual = 0x0203,
    Greater = 0x0204,
    NotEqual = 0x0205,
    GreaterEqual = 0x0206,
    Always = 0x0207,
};

/// What becomes of a stencil value.
enum class StencilAction : int
{
    Zero = 0,
    Invert = 0x150A,
    Keep = 0x1E00,
    Replace = 0x1E01,
    Increment = 0x1E02,
    Decrement = 0x1E03,
    IncrementWrap = 0x8507,
    DecrementWrap = 0x8508,
};

/// A framebuffer binding point.
enum class FramebufferTarget : int
{
    Read = 0x8CA8,
    Draw = 0x8CA9,
    ReadAndDraw = 0x8D40,
};

/// A value of glPixelStorei that shapes what readPixels writes.
enum class ReadbackBufferLayout : int
{
    RowLength = 0x0D02,  ///< pixels a row of the destination; 0: the width that is read
    SkipRows = 0x0D03,   ///< rows left free at the start
    SkipPixels = 0x0D04, ///< pixels left free at the start of each row
    Alignment = 0x0D05,  ///< of the start of each row, in bytes: 1, 2, 4 or 8
};

/// The GL implementation as the library sees it, and its state calls.
///
/// Static members only. What is known about the implementation is process-wide: the first context
/// whose thread runs InitParameters speaks for all later ones.
class NIB_EXPORT OpenGLRenderer
{
public:
    class OpenGlState;

    /// A rectangle of window coordinates in pixels, the origin at the lower left.
    struct Viewport
    {
        int x;      ///< of the left edge
        int y;      ///< of the lower edge
        int width;  ///< of the rectangle
        int height; ///< of the rectangle
    };

    OpenGLRenderer() = delete;

    // ---- what the implementation can do ----

    /// Reads the limits and names of the implementation, once per process. Every render thread
    /// calls it when its context is current for the first time.
    static void InitParameters();
    /// Whether InitParameters has run.
    static bool IsGLParameterInited();

    /// The largest width of a texture that can also be drawn into, in pixels; 8192 before
    /// InitParameters.
    static int getMaxTextureSize();

    /// False only on a GPU whose name begins with "Mali-400"; true before InitParameters.
    static bool isMinMaxBlendingSupported();

    /// Whether sampler objects may be used: from OpenGL ES 3.1 on. True before getSupportSampler.
    static bool isSupportSampler();

    /// Reads GL_VERSION and decides what isSupportSampler answers from then on. False, with nothing
    /// changed, when the driver gives no version.
    static bool getSupportSampler();

    /// 1 ARM, 2 Qualcomm, 3 any other; 0 while the driver gives no vendor. Asked once per process.
    static int getGPUVendor();

    /// Whether GL_RENDERER begins with one of @p names, a list that a null pointer ends.
    static bool isGpuOneOf(const char** names);

    /// The revision N of an ARM driver "v1.rN"; 0 when unknown and for every other vendor.
    static int getMaliDriverVersion();

    static const char* getGLVersion();    ///< GL_VERSION; the driver's text, may be null
    static const char* getGLExtensions(); ///< GL_EXTENSIONS; the driver's text, may be null

    // ---- tiled rendering (GL_QCOM_tiled_rendering) ----
    // Masks: bit 0 colour, bit 1 depth, bit 2 stencil.

    /// Whether InitOpenGLExtensions found the entry points; writes a line when it did.
    static bool checkQCOMTilingSupport();
    /// The GL mask of the buffers that @p mask names.
    static unsigned getTilingMaskQCOM(int mask);

    /// Begins tiled rendering of a rectangle, in pixels from the lower left; the tiles start with
    /// the old contents of the buffers in @p preserveMask. False where tiling is not supported.
    static bool startTilingQCOM(int x, int y, int width, int height, int preserveMask);

    /// Ends it; the buffers in @p preserveMask are written back to memory.
    static void stopTilingQCOM(int preserveMask);

    /// Tells the driver that the buffers in @p mask of the bound framebuffer are not needed again.
    static void discardFramebuffer(int mask);

    // ---- errors ----

    /// Takes one error from GL and logs it with @p label (may be null). True: there was none.
    static bool reportGLError(const char* label);

    /// Takes and logs errors until none is left. True: there was none.
    static bool reportAndResetAllGLErrors(const char* label);

    // ---- state, one GL call each ----

    /// glClearColor
    static void setClearColor(float r, float g, float b, float a);
    /// glClearDepthf
    static void setClearDepth(float value);
    static void setClearStencil(float value); ///< truncated toward zero
    /// glClear of the buffers that are named.
    static void clear(bool color, bool depth, bool stencil);
    /// glEnable
    static void enableState(RenderState state);
    /// glDisable
    static void disableState(RenderState state);
    static void storeState(unsigned state); ///< does nothing, on purpose
    static void loadState(unsigned state);  ///< does nothing, on purpose
    /// glBlendEquationSeparate
    static void setBlendEquation(BlendingFuncOld rgb, BlendingFuncOld alpha);
    /// glBlendFuncSeparate
    static void setBlendFuncFactors(BlendingFactorOld srcRgb, BlendingFactorOld dstRgb,
                                    BlendingFactorOld srcAlpha, BlendingFactorOld dstAlpha);
    /// glStencilFuncSeparate
    static void setStencilFunc(FaceMode face, DSFunc function, int ref, unsigned mask);
    /// glStencilOpSeparate
    static void setStencilAction(FaceMode face, StencilAction sfail, StencilAction dpfail,
                                 StencilAction dppass);
    /// glStencilMaskSeparate
    static void setStencilMask(FaceMode face, unsigned mask);
    /// glCullFace
    static void setCullingSide(FaceMode face);
    /// glDepthFunc
    static void setDepthFunc(DSFunc function);
    /// glColorMask, all channels alike, and glDepthMask
    static void setWriteMask(bool color, bool depth);
    /// glViewport
    static void setViewport(int x, int y, unsigned width, unsigned height);
    /// glScissor
    static void setScissor(int x, int y, unsigned width, unsigned height);
    /// GL_VIEWPORT
    static Viewport getViewport();

    /// Reads a rectangle of the bound framebuffer, in pixels from the lower left, into @p pixels.
    static void readPixels(int x, int y, int width, int height, void* pixels,
                           TextureTargetLayout layout, TextureMemoryLayout memoryLayout);

    static void activateTextureUnit2D(int unit, int texture); ///< leaves @p unit active
    /// glBindFramebuffer
    static void bindFramebuffer(FramebufferTarget target, unsigned name);

    /// Sets one value of the read-back layout; the value that it replaces goes to @p previous,
    /// which may be null.
    static void setReadbackBufferLayout(ReadbackBufferLayout pname, int value, int* previous);

    static void finish(); ///< returns when the GPU has done everything asked for

private:
    friend int GetMaxTextureHeight();

    // Written by whichever render thread comes first and read by all, without a lock: each thread
    // would write the same values.
    struct GlParameters
    {
        std::atomic<int> maxTextureWidth;
        std::atomic<int> maxTextureHeight;
        std::atomic<bool> minMaxBlendingSupported;
        std::atomic<bool> initialised;
    };

    static void ReadTextureLimits();
    static void LogUniformLimits(const char* function);

    static GlParameters m_glParameters;
    static std::atomic<bool> m_isSupportSampler;
    static std::atomic<int> m_vendor;
    static std::atomic<int> m_maliDriverVersion;
};

/// Keeps the GL state that the library disturbs when it draws inside somebody else's context: four
/// texture units, five vertex attributes, the bindings and switches around them.
///
/// Threads  store and restore run with the same context current.
/// Limits   Colour factors of blending are not kept: restore sets the alpha factors for both.
class NIB_EXPORT OpenGLRenderer::OpenGlState
{
public:
    /// Takes the state, after logging the errors that were pending. Changes the active texture
    /// unit and the array buffer, which restore puts back.
    void store();

    /// Puts the state back as often as it is called; nothing before the first store. A texture
    /// that was deleted in between is replaced by 0.
    void restore();

private:
    static constexpr int kTextureUnits = 4;
    static constexpr int kVertexAttributes = 5;

    void StoreBindings();
    void StoreTextureUnits();
    void StoreVertexAttributes();
    void RestoreTextureUnits() const;
    void RestoreVertexAttributes() const;
    void RestoreSwitches() const;
    void RestoreBindings() const;

    bool m_stored = false;
    int m_program = 0;
    int m_arrayBuffer = 0;
    int m_activeTexture = 0;
    bool m_blend = false;
    bool m_depthTest = false;
    bool m_depthWriteMask = false;
    bool m_cullFace = false;
    bool m_scissorTest = false;
    bool m_stencilTest = false;
    int m_blendSrcAlpha = 0;
    int m_blendDstAlpha = 0;
    int m_texture2D[kTextureUnits] = {};
    int m_renderbuffer = 0;
    int m_framebuffer = 0;
    int m_viewport[4] = {};
    int m_scissorBox[4] = {};
    int m_attributeEnabled[kVertexAttributes] = {};
    int m_sampler[kTextureUnits] = {};
    int m_elementArrayBuffer = 0;
    int m_attributeBuffer[kVertexAttributes] = {};
    int m_attributeSize[kVertexAttributes] = {};
    int m_attributeType[kVertexAttributes] = {};
    int m_attributeNormalized[kVertexAttributes] = {};
    int m_attributeStride[kVertexAttributes] = {};
    void* m_attributePointer[kVertexAttributes] = {};
};

/// Whether this device can run the renderer: OpenGL ES 3, or 2 with GL_EXT_unpack_subimage and
/// GL_EXT_blend_minmax. Decided once per process; every call logs the answer.
///
/// Threads  Any, with or without a context, except the shared render thread (RenderThreadGLST), for
///          which the call waits.
NIB_EXPORT bool IsCompatibleGL();

/// Whether this device can draw into its front buffer: the EGL extensions, a GPU that is not known
/// to fail, and a configuration. Threads as for IsCompatibleGL.
NIB_EXPORT bool IsFBRSupported();

/// Whether GL_RENDERER begins with @p name. Each name is asked for once per process, and the answer
/// kept, also when the driver did not tell its name. Null gives false.
///
/// Threads  With a current GL context; one thread at a time, because there is no lock.
NIB_EXPORT bool IsGPUNameEqualTo(const char* name);

} // namespace Nib

#pragma pop_macro("Always")

#endif
