#include "SimEgl.h"

#include <algorithm>

// The display: initialisation, strings, configurations, the bound API and errors.

namespace Sim
{

EGLDisplay TheDisplay()
{
    return reinterpret_cast<EGLDisplay>(std::uintptr_t{0xD15});
}

bool EglEntry::Check(EGLDisplay display, bool initialised)
{
    if (display != TheDisplay())
        return Refuse(EGL_BAD_DISPLAY);
    if (initialised && !state.initialized)
        return Misuse(EGL_NOT_INITIALIZED, "the display is not initialised");
    return true;
}

EGLConfig ConfigHandle(int index)
{
    return reinterpret_cast<EGLConfig>(static_cast<std::uintptr_t>(index) + 1);
}

int ConfigIndex(EGLConfig handle, const SimGpu& gpu)
{
    const std::uintptr_t number = reinterpret_cast<std::uintptr_t>(handle);
    return number >= 1 && number <= gpu.configs.size() ? static_cast<int>(number) - 1 : -1;
}

namespace
{

/// An attribute of a configuration; false when there is no such attribute.
bool ConfigAttribute(const SimGpu& gpu, int index, EGLint attribute, EGLint& value)
{
    const SimConfig& config = gpu.configs[static_cast<std::size_t>(index)];
    switch (attribute)
    {
    case EGL_CONFIG_ID: value = index + 1; return true;
    case EGL_RED_SIZE: value = config.red; return true;
    case EGL_GREEN_SIZE: value = config.green; return true;
    case EGL_BLUE_SIZE: value = config.blue; return true;
    case EGL_ALPHA_SIZE: value = config.alpha; return true;
    case EGL_BUFFER_SIZE:
        value = config.red + config.green + config.blue + config.alpha;
        return true;
    case EGL_DEPTH_SIZE: value = config.depth; return true;
    case EGL_STENCIL_SIZE: value = config.stencil; return true;
    case EGL_SAMPLES: value = config.samples; return true;
    case EGL_SAMPLE_BUFFERS: value = config.samples > 0; return true;
    case EGL_SURFACE_TYPE: value = config.surfaceType; return true;
    case EGL_RENDERABLE_TYPE:
    case EGL_CONFORMANT: value = config.renderableType; return true;
    case EGL_NATIVE_VISUAL_ID: value = config.nativeVisualId; return true;
    case EGL_NATIVE_VISUAL_TYPE:
    case EGL_TRANSPARENT_TYPE:
    case EGL_CONFIG_CAVEAT: value = EGL_NONE; return true;
    case EGL_COLOR_BUFFER_TYPE: value = EGL_RGB_BUFFER; return true;
    case EGL_NATIVE_RENDERABLE: value = EGL_TRUE; return true;
    case EGL_MAX_PBUFFER_WIDTH: value = gpu.maxViewportWidth; return true;
    case EGL_MAX_PBUFFER_HEIGHT: value = gpu.maxViewportHeight; return true;
    case EGL_MAX_PBUFFER_PIXELS: value = gpu.maxViewportWidth * gpu.maxViewportHeight; return true;
    case EGL_MIN_SWAP_INTERVAL: value = 0; return true;
    case EGL_MAX_SWAP_INTERVAL: value = 1; return true;
    case EGL_LEVEL:
    case EGL_LUMINANCE_SIZE:
    case EGL_ALPHA_MASK_SIZE:
    case EGL_BIND_TO_TEXTURE_RGB:
    case EGL_BIND_TO_TEXTURE_RGBA:
    case EGL_TRANSPARENT_RED_VALUE:
    case EGL_TRANSPARENT_GREEN_VALUE:
    case EGL_TRANSPARENT_BLUE_VALUE: value = 0; return true;
    default: return false;
    }
}

enum class Rule
{
    Minimum,
    Exact,
    Mask
};

Rule RuleOf(EGLint attribute)
{
    switch (attribute)
    {
    case EGL_RED_SIZE:
    case EGL_GREEN_SIZE:
    case EGL_BLUE_SIZE:
    case EGL_ALPHA_SIZE:
    case EGL_BUFFER_SIZE:
    case EGL_DEPTH_SIZE:
    case EGL_STENCIL_SIZE:
    case EGL_SAMPLES:
    case EGL_SAMPLE_BUFFERS:
    case EGL_LUMINANCE_SIZE:
    case EGL_ALPHA_MASK_SIZE: return Rule::Minimum;
    case EGL_SURFACE_TYPE:
    case EGL_RENDERABLE_TYPE:
    case EGL_CONFORMANT: return Rule::Mask;
    default: return Rule::Exact;
    }
}

/// The criteria of a list, with EGL's defaults for those that it does not name.
std::map<EGLint, EGLint> Criteria(const EGLint* list)
{
    std::map<EGLint, EGLint> wanted{{EGL_SURFACE_TYPE, EGL_WINDOW_BIT},
                                    {EGL_RENDERABLE_TYPE, EGL_OPENGL_ES_BIT}};
    for (; list && *list != EGL_NONE; list += 2)
        wanted[list[0]] = list[1];
    return wanted;
}

bool Matches(const SimGpu& gpu, int index, const std::map<EGLint, EGLint>& wanted)
{
    for (const auto& [attribute, want] : wanted)
    {
        EGLint value = 0;
        ConfigAttribute(gpu, index, attribute, value);
        if (want == EGL_DONT_CARE)
            continue;
        const Rule rule = RuleOf(attribute);
        const bool fits = rule == Rule::Minimum ? value >= want
                          : rule == Rule::Mask  ? (value & want) == want
                                                : value == want;
        if (!fits)
            return false;
    }
    return true;
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API EGLDisplay eglGetDisplay(EGLNativeDisplayType id)
{
    EglEntry entry("eglGetDisplay", {(const void*)id});
    return entry ? TheDisplay() : EGL_NO_DISPLAY;
}

SIM_API EGLDisplay eglGetPlatformDisplay(EGLenum platform, void* native, const EGLAttrib*)
{
    EglEntry entry("eglGetPlatformDisplay", {platform, native});
    return entry ? TheDisplay() : EGL_NO_DISPLAY;
}

SIM_API EGLBoolean eglInitialize(EGLDisplay display, EGLint* major, EGLint* minor)
{
    EglEntry entry("eglInitialize", {display, (const void*)major, (const void*)minor});
    if (!entry || !entry.Check(display, false))
        return EGL_FALSE;
    entry.state.initialized = true;
    if (major)
        *major = entry.state.gpu.eglMajor;
    if (minor)
        *minor = entry.state.gpu.eglMinor;
    return EGL_TRUE;
}

SIM_API EGLBoolean eglTerminate(EGLDisplay display)
{
    EglEntry entry("eglTerminate", {display});
    if (!entry || !entry.Check(display, false))
        return EGL_FALSE;
    entry.state.initialized = false;
    DestroyAllContexts(entry.state);
    DestroyAllSurfaces(entry.state);
    return EGL_TRUE;
}

SIM_API EGLint eglGetError()
{
    // A query of the error does not itself set one, so it reads the thread's before the entry
    // clears it.
    State& state = GetState();
    EGLint error = EGL_SUCCESS;
    {
        const std::lock_guard lock(state.mutex);
        error = state.CurrentThread().error;
    }
    EglEntry entry("eglGetError", {});
    return entry ? error : static_cast<EGLint>(entry.InjectedError());
}

SIM_API const char* eglQueryString(EGLDisplay display, EGLint name)
{
    EglEntry entry("eglQueryString", {display, name});
    if (!entry)
        return nullptr;
    if (display == EGL_NO_DISPLAY && name == EGL_EXTENSIONS)
        return "EGL_EXT_client_extensions EGL_EXT_platform_base";
    if (!entry.Check(display))
        return nullptr;
    const SimGpu& gpu = entry.state.gpu;
    const std::string version =
        std::to_string(gpu.eglMajor) + "." + std::to_string(gpu.eglMinor) + " simulated";
    switch (name)
    {
    case EGL_EXTENSIONS: return entry.state.Keep("EGL_EXTENSIONS", gpu.EglExtensionString());
    case EGL_VENDOR: return entry.state.Keep("EGL_VENDOR", gpu.vendor);
    case EGL_VERSION: return entry.state.Keep("EGL_VERSION", version);
    case EGL_CLIENT_APIS: return "OpenGL_ES";
    default: entry.Misuse(EGL_BAD_PARAMETER, "no such string: " + Hex(static_cast<unsigned>(name)));
    }
    return nullptr;
}

SIM_API EGLBoolean eglGetConfigs(EGLDisplay display, EGLConfig* configs, EGLint size, EGLint* count)
{
    EglEntry entry("eglGetConfigs", {display, (const void*)configs, size, (const void*)count});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    const int total = static_cast<int>(entry.state.gpu.configs.size());
    *count = configs ? std::min(total, size) : total;
    for (int i = 0; configs && i < *count; ++i)
        configs[i] = ConfigHandle(i);
    return EGL_TRUE;
}

SIM_API EGLBoolean eglChooseConfig(EGLDisplay display, const EGLint* list, EGLConfig* configs,
                                   EGLint size, EGLint* count)
{
    EglEntry entry("eglChooseConfig",
                   {display, (const void*)list, (const void*)configs, size, (const void*)count});
    entry.AttributeList(list);
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    if (!count)
        return entry.Misuse(EGL_BAD_PARAMETER, "no place for the number");
    const SimGpu& gpu = entry.state.gpu;
    const std::map<EGLint, EGLint> wanted = Criteria(list);
    for (const auto& [attribute, value] : wanted)
    {
        EGLint unused = 0;
        if (!gpu.configs.empty() && !ConfigAttribute(gpu, 0, attribute, unused))
            return entry.Misuse(EGL_BAD_ATTRIBUTE,
                                "no such attribute: " + Hex(static_cast<unsigned>(attribute)));
    }
    if ((wanted.at(EGL_SURFACE_TYPE) & kMutableRenderBufferBit) != 0 &&
        !gpu.HasEglExtension("EGL_KHR_mutable_render_buffer"))
        return entry.Refuse(EGL_BAD_ATTRIBUTE);

    std::vector<int> found;
    for (int i = 0; i < static_cast<int>(gpu.configs.size()); ++i)
    {
        if (Matches(gpu, i, wanted))
            found.push_back(i);
    }
    const int total = static_cast<int>(found.size());
    if (!configs)
    {
        *count = entry.state.configsCounted >= 0 ? entry.state.configsCounted : total;
        return EGL_TRUE;
    }
    *count = std::min(total, size);
    if (entry.state.configsGiven >= 0)
        *count = std::min(*count, entry.state.configsGiven);
    for (int i = 0; i < *count; ++i)
        configs[i] = ConfigHandle(found[static_cast<std::size_t>(i)]);
    return EGL_TRUE;
}

SIM_API EGLBoolean eglGetConfigAttrib(EGLDisplay display, EGLConfig config, EGLint attribute,
                                      EGLint* value)
{
    EglEntry entry("eglGetConfigAttrib", {display, config, attribute, (const void*)value});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    const int index = ConfigIndex(config, entry.state.gpu);
    if (index < 0)
        return config ? entry.Misuse(EGL_BAD_CONFIG, "the configuration is unknown")
                      : entry.Refuse(EGL_BAD_CONFIG);
    if (!ConfigAttribute(entry.state.gpu, index, attribute, *value))
        return entry.Misuse(EGL_BAD_ATTRIBUTE,
                            "no such attribute: " + Hex(static_cast<unsigned>(attribute)));
    return EGL_TRUE;
}

SIM_API EGLBoolean eglBindAPI(EGLenum api)
{
    EglEntry entry("eglBindAPI", {api});
    if (!entry)
        return EGL_FALSE;
    if (api != EGL_OPENGL_ES_API)
        return entry.Misuse(EGL_BAD_PARAMETER, "only OpenGL ES is there");
    entry.CallingThread().api = api;
    return EGL_TRUE;
}

SIM_API EGLenum eglQueryAPI()
{
    EglEntry entry("eglQueryAPI", {});
    return entry ? entry.CallingThread().api.value_or(entry.state.initialApi) : EGLenum{EGL_NONE};
}
