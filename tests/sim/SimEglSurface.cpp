#include "SimEgl.h"

#include <algorithm>

// Surfaces: creation, attributes, destruction.

namespace Sim
{

Surface* EglEntry::CheckSurface(EGLSurface handle)
{
    if (Surface* surface = state.FindSurface(handle))
        return surface;
    if (handle == EGL_NO_SURFACE)
        Refuse(EGL_BAD_SURFACE);
    else
        Misuse(EGL_BAD_SURFACE, "the surface is unknown or destroyed");
    return nullptr;
}

void BurySurface(State& state, Surface& surface)
{
    if (!surface.destroyed || surface.thread != 0)
        return;
    if (surface.window && state.windows.at(surface.window)->surface == surface.handle)
        state.windows.at(surface.window)->surface = EGL_NO_SURFACE;
    state.surfaces.erase(surface.handle);
}

void DestroyAllSurfaces(State& state)
{
    for (auto next = state.surfaces.begin(); next != state.surfaces.end();)
    {
        Surface& surface = *(next++)->second;
        surface.destroyed = true;
        BurySurface(state, surface);
    }
}

namespace
{

const SimConfig& ConfigOf(const State& state, const Surface& surface)
{
    return state.gpu.configs[static_cast<std::size_t>(surface.config)];
}

Image NewColorBuffer(int width, int height, const Color& content)
{
    Image image;
    image.width = width;
    image.height = height;
    image.internalFormat = GL_RGBA8;
    image.Fill(content);
    return image;
}

/// The index of a configuration that allows surfaces of this type; -1 with the error set.
int UsableConfig(EglEntry& entry, EGLConfig config, EGLint surfaceBit)
{
    const int index = ConfigIndex(config, entry.state.gpu);
    if (index < 0)
    {
        if (config)
            entry.Misuse(EGL_BAD_CONFIG, "the configuration is unknown");
        else
            entry.Refuse(EGL_BAD_CONFIG);
        return -1;
    }
    const int type = entry.state.gpu.configs[static_cast<std::size_t>(index)].surfaceType;
    if ((type & surfaceBit) != 0)
        return index;
    entry.Misuse(EGL_BAD_MATCH, "the configuration has no such surfaces");
    return -1;
}

EGLSurface AddSurface(State& state, std::unique_ptr<Surface> surface)
{
    const EGLSurface handle = state.NewHandle();
    surface->handle = handle;
    const bool poisoned = surface->window && state.gpu.poisonBackBuffers;
    surface->back =
        NewColorBuffer(surface->width, surface->height, poisoned ? Undefined(state) : Color{});
    state.surfaces[handle] = std::move(surface);
    return handle;
}

EGLBoolean SetRenderBuffer(EglEntry& entry, Surface& surface, EGLint value)
{
    if (!entry.state.gpu.HasEglExtension("EGL_KHR_mutable_render_buffer"))
        return entry.Refuse(EGL_BAD_ATTRIBUTE);
    if (value != EGL_SINGLE_BUFFER && value != EGL_BACK_BUFFER)
        return entry.Misuse(EGL_BAD_PARAMETER, "no such render buffer");
    const bool isMutable =
        (ConfigOf(entry.state, surface).surfaceType & kMutableRenderBufferBit) != 0;
    if (!surface.window || !isMutable || !entry.state.gpu.singleBuffer)
        return entry.Refuse(EGL_BAD_MATCH);
    surface.renderBuffer = value;
    return EGL_TRUE;
}

EGLBoolean SetSwapBehavior(EglEntry& entry, Surface& surface, EGLint value)
{
    if (value != EGL_BUFFER_PRESERVED && value != EGL_BUFFER_DESTROYED)
        return entry.Misuse(EGL_BAD_PARAMETER, "no such swap behaviour");
    if (value == EGL_BUFFER_PRESERVED && !entry.state.gpu.preservedSwap)
        return entry.Refuse(EGL_BAD_MATCH);
    surface.swapBehavior = value;
    return EGL_TRUE;
}

EGLBoolean SetAutoRefresh(EglEntry& entry, Surface& surface, EGLint value)
{
    if (!entry.state.gpu.HasEglExtension("EGL_ANDROID_front_buffer_auto_refresh"))
        return entry.Refuse(EGL_BAD_ATTRIBUTE);
    if (!entry.state.gpu.autoRefresh || !surface.window)
        return entry.Refuse(EGL_BAD_MATCH);
    surface.autoRefresh = value != EGL_FALSE;
    return EGL_TRUE;
}

EGLBoolean SetTimestamps(EglEntry& entry, Surface& surface, EGLint value)
{
    if (!entry.state.gpu.HasEglExtension("EGL_ANDROID_get_frame_timestamps"))
        return entry.Refuse(EGL_BAD_ATTRIBUTE);
    surface.timestamps = value != EGL_FALSE;
    return EGL_TRUE;
}

EGLBoolean QueryBufferAge(EglEntry& entry, Surface& surface, EGLint* value)
{
    const SimGpu& gpu = entry.state.gpu;
    if (!gpu.HasEglExtension("EGL_EXT_buffer_age") &&
        !gpu.HasEglExtension("EGL_KHR_partial_update"))
        return entry.Refuse(EGL_BAD_ATTRIBUTE);
    if (entry.CallingThread().draw != &surface)
        return entry.Misuse(EGL_BAD_SURFACE, "the age of a surface that is not current");
    surface.ageQueried = true;
    *value = surface.window ? surface.age : 0;
    return EGL_TRUE;
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API EGLSurface eglCreatePbufferSurface(EGLDisplay display, EGLConfig config, const EGLint* list)
{
    EglEntry entry("eglCreatePbufferSurface", {display, config, (const void*)list});
    entry.AttributeList(list);
    if (!entry || !entry.Check(display))
        return EGL_NO_SURFACE;
    auto surface = std::make_unique<Surface>();
    surface->config = UsableConfig(entry, config, EGL_PBUFFER_BIT);
    if (surface->config < 0)
        return EGL_NO_SURFACE;
    for (; list && *list != EGL_NONE; list += 2)
    {
        if (list[0] == EGL_WIDTH)
            surface->width = list[1];
        else if (list[0] == EGL_HEIGHT)
            surface->height = list[1];
        else if (list[0] != EGL_TEXTURE_FORMAT && list[0] != EGL_TEXTURE_TARGET &&
                 list[0] != EGL_LARGEST_PBUFFER && list[0] != EGL_MIPMAP_TEXTURE)
        {
            entry.Misuse(EGL_BAD_ATTRIBUTE,
                         "no such attribute: " + Hex(static_cast<unsigned>(list[0])));
            return EGL_NO_SURFACE;
        }
    }
    if (surface->width < 0 || surface->height < 0)
    {
        entry.Misuse(EGL_BAD_PARAMETER, "a negative size");
        return EGL_NO_SURFACE;
    }
    return AddSurface(entry.state, std::move(surface));
}

SIM_API EGLSurface eglCreateWindowSurface(EGLDisplay display, EGLConfig config,
                                          EGLNativeWindowType native, const EGLint* list)
{
    auto* const window = reinterpret_cast<ANativeWindow*>(native);
    EglEntry entry("eglCreateWindowSurface", {display, config, window, (const void*)list});
    entry.AttributeList(list);
    if (!entry || !entry.Check(display))
        return EGL_NO_SURFACE;
    auto surface = std::make_unique<Surface>();
    surface->config = UsableConfig(entry, config, EGL_WINDOW_BIT);
    if (surface->config < 0)
        return EGL_NO_SURFACE;
    const auto found = entry.state.windows.find(window);
    if (found == entry.state.windows.end() || found->second->abandoned)
    {
        entry.Refuse(EGL_BAD_NATIVE_WINDOW);
        return EGL_NO_SURFACE;
    }
    NativeWindow& target = *found->second;
    if (target.surface != EGL_NO_SURFACE)
    {
        entry.Misuse(EGL_BAD_ALLOC, "the window has a surface already");
        return EGL_NO_SURFACE;
    }
    for (; list && *list != EGL_NONE; list += 2)
    {
        if (list[0] == EGL_RENDER_BUFFER)
            surface->renderBuffer = list[1];
        else if (list[0] == EGL_POST_SUB_BUFFER_SUPPORTED_NV &&
                 entry.state.gpu.HasEglExtension("EGL_NV_post_sub_buffer"))
            surface->postSubBuffer = list[1] != EGL_FALSE && entry.state.gpu.postSubBuffer;
        else
        {
            entry.Misuse(EGL_BAD_ATTRIBUTE,
                         "no such attribute: " + Hex(static_cast<unsigned>(list[0])));
            return EGL_NO_SURFACE;
        }
    }
    surface->window = window;
    surface->width = target.width;
    surface->height = target.height;
    target.front = NewColorBuffer(target.width, target.height, Color{});
    target.surface = AddSurface(entry.state, std::move(surface));
    return target.surface;
}

SIM_API EGLSurface eglCreatePlatformWindowSurface(EGLDisplay display, EGLConfig config,
                                                  void* native, const EGLAttrib* list)
{
    std::vector<EGLint> attributes;
    for (; list && *list != EGL_NONE; ++list)
        attributes.push_back(static_cast<EGLint>(*list));
    attributes.push_back(EGL_NONE);
    return eglCreateWindowSurface(display, config, reinterpret_cast<EGLNativeWindowType>(native),
                                  attributes.data());
}

SIM_API EGLBoolean eglDestroySurface(EGLDisplay display, EGLSurface handle)
{
    EglEntry entry("eglDestroySurface", {display, handle});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Surface* const surface = entry.CheckSurface(handle);
    if (!surface)
        return EGL_FALSE;
    surface->destroyed = true;
    if (surface->window)
        entry.state.windows.at(surface->window)->surface = EGL_NO_SURFACE;
    BurySurface(entry.state, *surface);
    return EGL_TRUE;
}

SIM_API EGLBoolean eglSurfaceAttrib(EGLDisplay display, EGLSurface handle, EGLint attribute,
                                    EGLint value)
{
    EglEntry entry("eglSurfaceAttrib", {display, handle, attribute, value});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Surface* const surface = entry.CheckSurface(handle);
    if (!surface)
        return EGL_FALSE;
    switch (attribute)
    {
    case EGL_SWAP_BEHAVIOR: return SetSwapBehavior(entry, *surface, value);
    case EGL_RENDER_BUFFER: return SetRenderBuffer(entry, *surface, value);
    case kFrontBufferAutoRefresh: return SetAutoRefresh(entry, *surface, value);
    case EGL_TIMESTAMPS_ANDROID: return SetTimestamps(entry, *surface, value);
    case EGL_MULTISAMPLE_RESOLVE: surface->multisampleResolve = value; return EGL_TRUE;
    case EGL_MIPMAP_LEVEL: return EGL_TRUE;
    default:
        return entry.Misuse(EGL_BAD_ATTRIBUTE,
                            "no such attribute: " + Hex(static_cast<unsigned>(attribute)));
    }
}

SIM_API EGLBoolean eglQuerySurface(EGLDisplay display, EGLSurface handle, EGLint attribute,
                                   EGLint* value)
{
    EglEntry entry("eglQuerySurface", {display, handle, attribute, (const void*)value});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Surface* const surface = entry.CheckSurface(handle);
    if (!surface)
        return EGL_FALSE;
    const SimGpu& gpu = entry.state.gpu;
    switch (attribute)
    {
    case EGL_WIDTH: *value = surface->width; return EGL_TRUE;
    case EGL_HEIGHT: *value = surface->height; return EGL_TRUE;
    case EGL_CONFIG_ID: *value = surface->config + 1; return EGL_TRUE;
    case EGL_RENDER_BUFFER: *value = surface->renderBuffer; return EGL_TRUE;
    case EGL_SWAP_BEHAVIOR: *value = surface->swapBehavior; return EGL_TRUE;
    case EGL_MULTISAMPLE_RESOLVE: *value = surface->multisampleResolve; return EGL_TRUE;
    case EGL_HORIZONTAL_RESOLUTION:
    case EGL_VERTICAL_RESOLUTION:
    case EGL_PIXEL_ASPECT_RATIO: *value = EGL_UNKNOWN; return EGL_TRUE;
    case EGL_TEXTURE_FORMAT:
    case EGL_TEXTURE_TARGET: *value = EGL_NO_TEXTURE; return EGL_TRUE;
    case EGL_LARGEST_PBUFFER:
    case EGL_MIPMAP_TEXTURE:
    case EGL_MIPMAP_LEVEL: *value = 0; return EGL_TRUE;
    case EGL_BUFFER_AGE_EXT: return QueryBufferAge(entry, *surface, value);
    case EGL_POST_SUB_BUFFER_SUPPORTED_NV:
        if (!gpu.HasEglExtension("EGL_NV_post_sub_buffer"))
            return entry.Refuse(EGL_BAD_ATTRIBUTE);
        *value = surface->postSubBuffer;
        return EGL_TRUE;
    case kFrontBufferAutoRefresh:
        if (!gpu.HasEglExtension("EGL_ANDROID_front_buffer_auto_refresh"))
            return entry.Refuse(EGL_BAD_ATTRIBUTE);
        *value = surface->autoRefresh;
        return EGL_TRUE;
    case EGL_TIMESTAMPS_ANDROID:
        if (!gpu.HasEglExtension("EGL_ANDROID_get_frame_timestamps"))
            return entry.Refuse(EGL_BAD_ATTRIBUTE);
        *value = surface->timestamps;
        return EGL_TRUE;
    default:
        return entry.Misuse(EGL_BAD_ATTRIBUTE,
                            "no such attribute: " + Hex(static_cast<unsigned>(attribute)));
    }
}

SimSurfaceState SimDriver::Surface(EGLSurface handle) const
{
    const std::lock_guard lock(GetState().mutex);
    const Sim::Surface* const surface = GetState().FindSurface(handle);
    SimSurfaceState state;
    if (!surface)
        return state;
    state.exists = true;
    state.window = surface->window != nullptr;
    state.width = surface->width;
    state.height = surface->height;
    state.config = surface->config;
    state.renderBuffer = surface->renderBuffer;
    state.swapBehavior = surface->swapBehavior;
    state.autoRefresh = surface->autoRefresh;
    state.timestamps = surface->timestamps;
    state.bufferAge = surface->age;
    state.presentationTimes = surface->presentationTimes;
    state.thread = surface->thread;
    return state;
}

std::vector<EGLSurface> SimDriver::Surfaces() const
{
    const std::lock_guard lock(GetState().mutex);
    std::vector<EGLSurface> handles;
    for (const auto& [handle, surface] : GetState().surfaces)
    {
        if (!surface->destroyed)
            handles.push_back(handle);
    }
    return handles;
}
