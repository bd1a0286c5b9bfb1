#include "SimGpu.h"

#include <EGL/egl.h>
#include <EGL/eglext.h>

#include <algorithm>
#include <cctype>

namespace
{

constexpr int kMutableBit = 0x1000; // EGL_MUTABLE_RENDER_BUFFER_BIT_KHR

const std::vector<std::string>& CommonGlExtensions()
{
    static const auto* names = new std::vector<std::string>{
        "GL_OES_EGL_image",
        "GL_OES_EGL_image_external",
        "GL_OES_element_index_uint",
        "GL_OES_packed_depth_stencil",
        "GL_OES_texture_npot",
        "GL_OES_vertex_half_float",
        "GL_EXT_texture_format_BGRA8888",
        "GL_EXT_unpack_subimage",
        "GL_EXT_blend_minmax",
        "GL_EXT_color_buffer_half_float",
        "GL_EXT_discard_framebuffer",
    };
    return *names;
}

const std::vector<std::string>& CommonEglExtensions()
{
    static const auto* names = new std::vector<std::string>{
        "EGL_KHR_image",
        "EGL_KHR_image_base",
        "EGL_KHR_fence_sync",
        "EGL_KHR_create_context",
        "EGL_KHR_gl_colorspace",
        "EGL_KHR_surfaceless_context",
        "EGL_ANDROID_recordable",
        "EGL_ANDROID_native_fence_sync",
        "EGL_IMG_context_priority",
        "EGL_EXT_buffer_age",
        "EGL_ANDROID_presentation_time",
        "EGL_ANDROID_get_frame_timestamps",
    };
    return *names;
}

std::vector<SimConfig> PhoneConfigs(int surfaceType)
{
    SimConfig rgba;
    rgba.surfaceType = surfaceType;
    SimConfig rgbaDepth = rgba;
    rgbaDepth.depth = 24;
    rgbaDepth.stencil = 8;
    SimConfig rgb565 = rgba;
    rgb565.red = rgb565.blue = 5;
    rgb565.green = 6;
    rgb565.alpha = 0;
    rgb565.nativeVisualId = 4;
    SimConfig rgbx = rgba;
    rgbx.alpha = 0;
    rgbx.nativeVisualId = 2;
    return {rgb565, rgbx, rgbaDepth, rgba};
}

SimGpu Device(std::string renderer, std::string vendor, std::string version)
{
    SimGpu gpu;
    gpu.renderer = std::move(renderer);
    gpu.vendor = std::move(vendor);
    gpu.version = std::move(version);
    gpu.shadingLanguage = "OpenGL ES GLSL ES 3.20";
    gpu.glExtensions = CommonGlExtensions();
    gpu.eglExtensions = CommonEglExtensions();
    gpu.configs = PhoneConfigs(EGL_WINDOW_BIT | EGL_PBUFFER_BIT);
    return gpu;
}

SimGpu Adreno(std::string renderer, std::string version, bool tiling)
{
    SimGpu gpu = Device(std::move(renderer), "Qualcomm", std::move(version));
    gpu.programBinaryFormats = {0x8740};
    if (tiling)
        gpu.glExtensions.emplace_back("GL_QCOM_tiled_rendering");
    gpu.glExtensions.emplace_back("GL_EXT_color_buffer_float");
    return gpu;
}

SimGpu Mali(std::string renderer, std::string version)
{
    SimGpu gpu = Device(std::move(renderer), "ARM", std::move(version));
    gpu.programBinaryFormats = {0x8F61};
    gpu.eglExtensions.emplace_back("EGL_KHR_partial_update");
    gpu.eglExtensions.emplace_back("EGL_KHR_swap_buffers_with_damage");
    gpu.glExtensions.emplace_back("GL_EXT_color_buffer_float");
    return gpu;
}

SimGpu UtgardMali(std::string renderer)
{
    SimGpu gpu = Mali(std::move(renderer), "OpenGL ES 2.0");
    gpu.shadingLanguage = "OpenGL ES GLSL ES 1.00";
    gpu.maxTextureSize = gpu.maxRenderbufferSize = 4096;
    gpu.maxViewportWidth = gpu.maxViewportHeight = 4096;
    return gpu.WithoutGlExtension("GL_OES_element_index_uint")
        .WithoutGlExtension("GL_EXT_blend_minmax")
        .WithoutGlExtension("GL_EXT_unpack_subimage")
        .WithoutEglExtension("EGL_KHR_partial_update")
        .WithoutEglExtension("EGL_KHR_swap_buffers_with_damage")
        .WithoutEglExtension("EGL_ANDROID_get_frame_timestamps");
}

std::string Join(const std::vector<std::string>& names)
{
    std::string text;
    for (const std::string& name : names)
        text += (text.empty() ? "" : " ") + name;
    return text;
}

void Remove(std::vector<std::string>& names, std::string_view name)
{
    names.erase(std::remove(names.begin(), names.end(), name), names.end());
}

void Add(std::vector<std::string>& names, std::string name)
{
    if (std::find(names.begin(), names.end(), name) == names.end())
        names.push_back(std::move(name));
}

constexpr const char* kFrontBufferExtensions[] = {
    "EGL_KHR_mutable_render_buffer",
    "EGL_ANDROID_front_buffer_auto_refresh",
    "EGL_KHR_fence_sync",
    "EGL_ANDROID_get_frame_timestamps",
    "EGL_ANDROID_presentation_time",
};

} // namespace

SimGpu SimGpu::Default()
{
    return Named("Adreno (TM) 640");
}

std::vector<SimGpu> SimGpu::All()
{
    const std::string adreno3 = "OpenGL ES 3.0 V@127.0 AU@ (GIT@I96aee987eb)";
    const std::string midgard = "OpenGL ES 3.2 v1.r22p0-01rel0.5ea1cd4a3d4a5c2b6ff3d4f5b3d6c0e1";
    const std::string bifrost = "OpenGL ES 3.2 v1.r19p0-01rel0.0f5ba4ad3f6ec7ab2d34a2fd6d1e4cbc";
    return {
        Adreno("Adreno (TM) 305", adreno3, true),
        Adreno("Adreno (TM) 306", adreno3, true),
        Adreno("Adreno (TM) 308", adreno3, true),
        Adreno("Adreno (TM) 330", adreno3, true),
        Adreno("Adreno (TM) 530", "OpenGL ES 3.2 V@331.0 (GIT@b8d0f3b, I9ab3d1c2f8)", true),
        Adreno("Adreno (TM) 640", "OpenGL ES 3.2 V@415.0 (GIT@663be55, I724753c5e3, 1573037262)",
               false),
        UtgardMali("Mali-400 MP"),
        UtgardMali("Mali-450 MP"),
        Mali("Mali-T720", "OpenGL ES 3.1 v1.r12p1-00bet0.55b1c5d4a1e9b7a3a1d0c9c3d4b5a6f7"),
        Mali("Mali-T760", midgard),
        Mali("Mali-T820", midgard),
        Mali("Mali-T830", midgard),
        Mali("Mali-T860", midgard),
        Mali("Mali-T880", midgard),
        Mali("Mali-G71", bifrost),
        Mali("Mali-G72", bifrost),
        Mali("Mali-G76", bifrost),
        Device("PowerVR Rogue GE8320", "Imagination Technologies",
               "OpenGL ES 3.2 build 1.10@5187610"),
    };
}

SimGpu SimGpu::Named(std::string_view renderer)
{
    std::vector<SimGpu> all = All();
    for (SimGpu& gpu : all)
    {
        if (gpu.renderer == renderer)
            return gpu;
    }
    const auto familyOf = [](std::string_view name) { return name.substr(0, 4); };
    // The newest of the family stands for the devices that have no row of their own.
    const auto relative = std::find_if(all.rbegin(), all.rend(),
                                       [&](const SimGpu& gpu)
                                       { return familyOf(gpu.renderer) == familyOf(renderer); });
    const SimGpu& base = relative == all.rend() ? all.back() : *relative;
    return base.WithRenderer(std::string(renderer));
}

SimGpu SimGpu::WithRenderer(std::string text) const
{
    SimGpu gpu = *this;
    gpu.renderer = std::move(text);
    return gpu;
}

SimGpu SimGpu::WithVendor(std::string text) const
{
    SimGpu gpu = *this;
    gpu.vendor = std::move(text);
    return gpu;
}

SimGpu SimGpu::WithVersion(std::string text) const
{
    SimGpu gpu = *this;
    gpu.version = std::move(text);
    return gpu;
}

SimGpu SimGpu::WithGlExtension(std::string name) const
{
    SimGpu gpu = *this;
    Add(gpu.glExtensions, std::move(name));
    return gpu;
}

SimGpu SimGpu::WithoutGlExtension(std::string_view name) const
{
    SimGpu gpu = *this;
    Remove(gpu.glExtensions, name);
    return gpu;
}

SimGpu SimGpu::WithGlExtensions(std::vector<std::string> names) const
{
    SimGpu gpu = *this;
    gpu.glExtensions = std::move(names);
    return gpu;
}

SimGpu SimGpu::WithEglExtension(std::string name) const
{
    SimGpu gpu = *this;
    Add(gpu.eglExtensions, std::move(name));
    return gpu;
}

SimGpu SimGpu::WithoutEglExtension(std::string_view name) const
{
    SimGpu gpu = *this;
    Remove(gpu.eglExtensions, name);
    return gpu;
}

SimGpu SimGpu::WithEglExtensions(std::vector<std::string> names) const
{
    SimGpu gpu = *this;
    gpu.eglExtensions = std::move(names);
    return gpu;
}

SimGpu SimGpu::WithConfigs(std::vector<SimConfig> list) const
{
    SimGpu gpu = *this;
    gpu.configs = std::move(list);
    return gpu;
}

SimGpu SimGpu::WithMaxTextureSize(int size) const
{
    SimGpu gpu = *this;
    gpu.maxTextureSize = size;
    return gpu;
}

SimGpu SimGpu::WithMaxViewport(int width, int height) const
{
    SimGpu gpu = *this;
    gpu.maxViewportWidth = width;
    gpu.maxViewportHeight = height;
    return gpu;
}

SimGpu SimGpu::WithBufferAges(std::vector<int> ages) const
{
    SimGpu gpu = *this;
    gpu.bufferAges = std::move(ages);
    return gpu;
}

SimGpu SimGpu::WithBufferCount(int count) const
{
    SimGpu gpu = *this;
    gpu.bufferCount = count;
    return gpu;
}

SimGpu SimGpu::WithProgramBinaryFormats(std::vector<unsigned> formats) const
{
    SimGpu gpu = *this;
    gpu.programBinaryFormats = std::move(formats);
    return gpu;
}

SimGpu SimGpu::WithoutProgramBinaries() const
{
    return WithProgramBinaryFormats({});
}

SimGpu SimGpu::WithoutPreservedSwap() const
{
    SimGpu gpu = *this;
    gpu.preservedSwap = false;
    return gpu;
}

SimGpu SimGpu::WithPostSubBuffer(bool supportedByWindows) const
{
    SimGpu gpu = WithEglExtension("EGL_NV_post_sub_buffer");
    gpu.postSubBuffer = supportedByWindows;
    return gpu;
}

SimGpu SimGpu::WithFrontBuffer() const
{
    SimGpu gpu = *this;
    for (const char* name : kFrontBufferExtensions)
        Add(gpu.eglExtensions, name);
    for (SimConfig& config : gpu.configs)
        config.surfaceType |= kMutableBit;
    return gpu;
}

SimGpu SimGpu::WithoutFrontBuffer() const
{
    SimGpu gpu = *this;
    Remove(gpu.eglExtensions, "EGL_KHR_mutable_render_buffer");
    Remove(gpu.eglExtensions, "EGL_ANDROID_front_buffer_auto_refresh");
    for (SimConfig& config : gpu.configs)
        config.surfaceType &= ~kMutableBit;
    return gpu;
}

bool SimGpu::HasGlExtension(std::string_view name) const
{
    return std::find(glExtensions.begin(), glExtensions.end(), name) != glExtensions.end();
}

bool SimGpu::HasEglExtension(std::string_view name) const
{
    return std::find(eglExtensions.begin(), eglExtensions.end(), name) != eglExtensions.end();
}

std::string SimGpu::GlExtensionString() const
{
    return Join(glExtensions);
}

std::string SimGpu::EglExtensionString() const
{
    return Join(eglExtensions);
}

int SimGpu::GlVersion() const
{
    const std::size_t dot = version.find('.');
    if (dot == std::string::npos || dot == 0 || dot + 1 >= version.size())
        return 20;
    const auto digit = [](char c)
    { return std::isdigit(static_cast<unsigned char>(c)) ? c - '0' : 0; };
    return digit(version[dot - 1]) * 10 + digit(version[dot + 1]);
}
