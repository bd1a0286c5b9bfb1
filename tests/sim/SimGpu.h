#ifndef NIB_SIM_GPU_H
#define NIB_SIM_GPU_H

#include <string>
#include <string_view>
#include <vector>

/// One EGL frame-buffer configuration of a device.
struct SimConfig
{
    int red = 8;
    int green = 8;
    int blue = 8;
    int alpha = 8;
    int depth = 0;
    int stencil = 0;
    int surfaceType = 0x0005;    ///< EGL_WINDOW_BIT | EGL_PBUFFER_BIT
    int renderableType = 0x0044; ///< EGL_OPENGL_ES2_BIT | EGL_OPENGL_ES3_BIT
    int nativeVisualId = 1;      ///< Android's pixel format; 1 is RGBA_8888
    int samples = 0;
};

/// A device that the simulated driver plays. All fields may be set; the With... operations give
/// changed copies, so that a test can say what matters to it in one expression.
struct SimGpu
{
    std::string renderer;
    std::string vendor;
    std::string version; ///< "OpenGL ES 3.2 ...": the digits decide which functions exist
    std::string shadingLanguage;
    std::vector<std::string> glExtensions;
    std::vector<std::string> eglExtensions;
    int eglMajor = 1;
    int eglMinor = 4;
    std::vector<SimConfig> configs; ///< in the order in which eglChooseConfig returns them

    int maxTextureSize = 16384;
    int maxRenderbufferSize = 16384;
    int maxViewportWidth = 16384;
    int maxViewportHeight = 16384;
    int maxVertexAttribs = 16;
    int maxTextureUnits = 16;
    int maxCombinedTextureUnits = 32;
    int maxUniformBufferBindings = 36;
    int maxUniformBlockSize = 65536;
    int maxVertexUniformBlocks = 12;
    int maxFragmentUniformBlocks = 14;
    int maxSamples = 4;

    std::vector<unsigned> programBinaryFormats; ///< empty: the driver cannot save programs

    int bufferCount = 3;           ///< back buffers of a window, used in turn
    std::vector<int> bufferAges;   ///< when set, the ages of the frames; the last one repeats
    bool poisonBackBuffers = true; ///< a back buffer without defined content holds kSimPoison
    bool preservedSwap = true;     ///< EGL_SWAP_BEHAVIOR may be EGL_BUFFER_PRESERVED
    bool postSubBuffer =
        true; ///< windows support eglPostSubBufferNV, where the extension is listed
    bool autoRefresh =
        true; ///< the front buffer may refresh by itself, where the extension is listed
    bool singleBuffer =
        true; ///< EGL_RENDER_BUFFER may become EGL_SINGLE_BUFFER on mutable configurations

    /// A recent mid-range phone.
    static SimGpu Default();
    /// The device with this GL_RENDERER. Every GPU that the library knows by name is there with
    /// strings as its driver gives them; another name beginning with "Adreno", "Mali" or "PowerVR"
    /// gives a device of that family.
    static SimGpu Named(std::string_view renderer);
    /// Every GPU that the library knows by name, and one of each other family.
    static std::vector<SimGpu> All();

    SimGpu WithRenderer(std::string text) const;
    SimGpu WithVendor(std::string text) const;
    SimGpu WithVersion(std::string text) const;
    SimGpu WithGlExtension(std::string name) const;
    SimGpu WithoutGlExtension(std::string_view name) const;
    SimGpu WithGlExtensions(std::vector<std::string> names) const; ///< exactly these
    SimGpu WithEglExtension(std::string name) const;
    SimGpu WithoutEglExtension(std::string_view name) const;
    SimGpu WithEglExtensions(std::vector<std::string> names) const; ///< exactly these
    SimGpu WithConfigs(std::vector<SimConfig> list) const;
    SimGpu WithMaxTextureSize(int size) const;
    SimGpu WithMaxViewport(int width, int height) const;
    SimGpu WithBufferAges(std::vector<int> ages) const;
    SimGpu WithBufferCount(int count) const;
    SimGpu WithProgramBinaryFormats(std::vector<unsigned> formats) const;
    SimGpu WithoutProgramBinaries() const;
    SimGpu WithoutPreservedSwap() const;
    /// EGL_NV_post_sub_buffer is listed, and windows support it or do not.
    SimGpu WithPostSubBuffer(bool supportedByWindows = true) const;
    /// All that front-buffer rendering needs: the four extensions, auto refresh, mutable
    /// configurations.
    SimGpu WithFrontBuffer() const;
    /// None of it.
    SimGpu WithoutFrontBuffer() const;

    bool HasGlExtension(std::string_view name) const;
    bool HasEglExtension(std::string_view name) const;
    std::string GlExtensionString() const;
    std::string EglExtensionString() const;
    /// 20, 30, 31 or 32, from the version text.
    int GlVersion() const;
};

/// What a back buffer without defined content holds, as bytes R, G, B, A.
inline constexpr unsigned char kSimPoison[4] = {0xDE, 0xAD, 0xBE, 0xEF};

#endif
