#include "SimEgl.h"
#include "SimPrograms.h"

// Contexts: creation, the current one of each thread, destruction.

namespace Sim
{

Context* EglEntry::CheckContext(EGLContext handle)
{
    if (Context* context = state.FindContext(handle))
        return context;
    if (handle == EGL_NO_CONTEXT)
        Refuse(EGL_BAD_CONTEXT);
    else
        Misuse(EGL_BAD_CONTEXT, "the context is unknown or destroyed");
    return nullptr;
}

namespace
{

/// Adds what dies with @p context to the account of lost objects.
void CountLost(SimCounts& lost, const Context& context)
{
    lost.framebuffers += context.gl.framebuffers.Count();
    if (context.group.use_count() > 1)
        return;
    const ShareGroup& group = *context.group;
    lost.textures += group.textures.Count();
    lost.samplers += group.samplers.Count();
    lost.buffers += group.buffers.Count();
    lost.renderbuffers += group.renderbuffers.Count();
    lost.programs += group.programs.Count();
    lost.shaders += group.shaders.Count();
    lost.syncs += static_cast<int>(group.syncs.size());
}

/// What eglCreateContext was asked for.
struct ContextRequest
{
    int version = 1;
    int priority = EGL_CONTEXT_PRIORITY_MEDIUM_IMG;
};

/// False, with the error set, when the list holds something that is not known.
bool ReadRequest(EglEntry& entry, const EGLint* list, ContextRequest& request)
{
    for (; list && *list != EGL_NONE; list += 2)
    {
        switch (list[0])
        {
        case EGL_CONTEXT_CLIENT_VERSION: request.version = list[1]; break;
        case EGL_CONTEXT_MINOR_VERSION_KHR: break;
        case EGL_CONTEXT_PRIORITY_LEVEL_IMG:
            if (!entry.state.gpu.HasEglExtension("EGL_IMG_context_priority"))
                return entry.Misuse(EGL_BAD_ATTRIBUTE, "there are no context priorities");
            if (list[1] < EGL_CONTEXT_PRIORITY_HIGH_IMG || list[1] > EGL_CONTEXT_PRIORITY_LOW_IMG)
                return entry.Misuse(EGL_BAD_ATTRIBUTE, "no such context priority");
            request.priority = list[1];
            break;
        case EGL_CONTEXT_FLAGS_KHR:
            if (!entry.state.gpu.HasEglExtension("EGL_KHR_create_context"))
                return entry.Misuse(EGL_BAD_ATTRIBUTE, "there are no context flags");
            if (list[1] != EGL_CONTEXT_OPENGL_DEBUG_BIT_KHR)
                return entry.Misuse(EGL_BAD_ATTRIBUTE, "no such context flags");
            break;
        default:
            return entry.Misuse(EGL_BAD_ATTRIBUTE,
                                "no such attribute: " + Hex(static_cast<unsigned>(list[0])));
        }
    }
    return true;
}

void InitialiseOnFirstUse(Context& context, const Surface* draw)
{
    if (context.wasCurrent)
        return;
    context.wasCurrent = true;
    if (draw)
        context.gl.viewport = context.gl.scissor = {0, 0, draw->width, draw->height};
}

bool SameColors(const SimConfig& a, const SimConfig& b)
{
    return a.red == b.red && a.green == b.green && a.blue == b.blue && a.alpha == b.alpha;
}

/// A surface that may become current on @p thread together with @p context; null with the error
/// set.
Surface* UsableSurface(EglEntry& entry, EGLSurface handle, const Context& context)
{
    Surface* const surface = entry.CheckSurface(handle);
    if (!surface)
        return nullptr;
    if (surface->thread != 0 && surface->thread != entry.CallingThread().number)
    {
        entry.Misuse(EGL_BAD_ACCESS, "the surface is current on another thread");
        return nullptr;
    }
    const auto& configs = entry.state.gpu.configs;
    if (!SameColors(configs[static_cast<std::size_t>(surface->config)],
                    configs[static_cast<std::size_t>(context.config)]))
    {
        entry.Misuse(EGL_BAD_MATCH, "the configurations of context and surface differ");
        return nullptr;
    }
    if (surface->window && entry.state.windows.at(surface->window)->abandoned)
    {
        entry.Refuse(EGL_BAD_NATIVE_WINDOW);
        return nullptr;
    }
    return surface;
}

} // namespace

void BuryContext(State& state, Context& context)
{
    if (!context.destroyed || context.thread != 0)
        return;
    if (Program* const used = context.group->programs.Find(context.gl.program))
    {
        --used->uses;
        BuryProgram(*context.group, context.gl.program);
    }
    CountLost(state.lost, context);
    state.contexts.erase(context.handle);
}

void ReleaseCurrent(State& state, Thread& thread)
{
    Context* const context = std::exchange(thread.context, nullptr);
    Surface* const draw = std::exchange(thread.draw, nullptr);
    Surface* const read = std::exchange(thread.read, nullptr);
    if (context)
    {
        FlushContext(*context);
        context->thread = 0;
        BuryContext(state, *context);
    }
    if (read && read != draw)
    {
        read->thread = 0;
        BurySurface(state, *read);
    }
    if (draw)
    {
        draw->thread = 0;
        BurySurface(state, *draw);
    }
}

void DestroyAllContexts(State& state)
{
    for (auto next = state.contexts.begin(); next != state.contexts.end();)
    {
        Context& context = *(next++)->second;
        context.destroyed = true;
        BuryContext(state, context);
    }
}

} // namespace Sim

using namespace Sim;

SIM_API EGLContext eglCreateContext(EGLDisplay display, EGLConfig config, EGLContext share,
                                    const EGLint* list)
{
    EglEntry entry("eglCreateContext", {display, config, share, (const void*)list});
    entry.AttributeList(list);
    if (!entry || !entry.Check(display))
        return EGL_NO_CONTEXT;
    const int index = ConfigIndex(config, entry.state.gpu);
    if (index < 0)
    {
        entry.Misuse(EGL_BAD_CONFIG, "the configuration is unknown");
        return EGL_NO_CONTEXT;
    }
    Context* sharing = nullptr;
    if (share != EGL_NO_CONTEXT && !(sharing = entry.CheckContext(share)))
        return EGL_NO_CONTEXT;
    ContextRequest request;
    if (!ReadRequest(entry, list, request))
        return EGL_NO_CONTEXT;
    const int needed = request.version >= 3 ? EGL_OPENGL_ES3_BIT : EGL_OPENGL_ES2_BIT;
    if ((entry.state.gpu.configs[static_cast<std::size_t>(index)].renderableType & needed) == 0)
    {
        entry.Refuse(EGL_BAD_CONFIG);
        return EGL_NO_CONTEXT;
    }
    if (request.version < 2 || request.version > 3)
    {
        entry.Misuse(EGL_BAD_CONFIG, "OpenGL ES 2 and 3 are there");
        return EGL_NO_CONTEXT;
    }
    if (sharing && sharing->clientVersion != request.version)
    {
        entry.Misuse(EGL_BAD_MATCH, "the share context has another client version");
        return EGL_NO_CONTEXT;
    }

    auto context = std::make_unique<Context>();
    context->handle = entry.state.NewHandle();
    context->share = share;
    context->group = sharing ? sharing->group : std::make_shared<ShareGroup>();
    context->clientVersion = request.version;
    context->priority = request.priority;
    context->config = index;
    const EGLContext handle = context->handle;
    entry.state.contexts[handle] = std::move(context);
    return handle;
}

SIM_API EGLBoolean eglDestroyContext(EGLDisplay display, EGLContext handle)
{
    EglEntry entry("eglDestroyContext", {display, handle});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Context* const context = entry.CheckContext(handle);
    if (!context)
        return EGL_FALSE;
    context->destroyed = true;
    BuryContext(entry.state, *context);
    return EGL_TRUE;
}

SIM_API EGLBoolean eglMakeCurrent(EGLDisplay display, EGLSurface draw, EGLSurface read,
                                  EGLContext handle)
{
    EglEntry entry("eglMakeCurrent", {display, draw, read, handle});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Thread& thread = entry.CallingThread();
    if (handle == EGL_NO_CONTEXT)
    {
        if (draw != EGL_NO_SURFACE || read != EGL_NO_SURFACE)
            return entry.Refuse(EGL_BAD_MATCH);
        ReleaseCurrent(entry.state, thread);
        return EGL_TRUE;
    }
    Context* const context = entry.CheckContext(handle);
    if (!context)
        return EGL_FALSE;
    if (context->thread != 0 && context->thread != thread.number)
        return entry.Misuse(EGL_BAD_ACCESS, "the context is current on another thread");
    if (context->group->lost)
        return entry.Refuse(EGL_CONTEXT_LOST);
    Surface* drawSurface = nullptr;
    Surface* readSurface = nullptr;
    if (draw == EGL_NO_SURFACE && read == EGL_NO_SURFACE)
    {
        if (!entry.state.gpu.HasEglExtension("EGL_KHR_surfaceless_context"))
            return entry.Refuse(EGL_BAD_MATCH);
    }
    else
    {
        drawSurface = UsableSurface(entry, draw, *context);
        readSurface = drawSurface ? UsableSurface(entry, read, *context) : nullptr;
        if (!readSurface)
            return EGL_FALSE;
    }
    if (thread.context == context && thread.draw == drawSurface && thread.read == readSurface)
        return EGL_TRUE;
    ReleaseCurrent(entry.state, thread);
    thread.context = context;
    thread.draw = drawSurface;
    thread.read = readSurface;
    context->thread = thread.number;
    for (Surface* surface : {drawSurface, readSurface})
    {
        if (surface)
            surface->thread = thread.number;
    }
    InitialiseOnFirstUse(*context, drawSurface);
    return EGL_TRUE;
}

SIM_API EGLBoolean eglReleaseThread()
{
    EglEntry entry("eglReleaseThread", {});
    if (!entry)
        return EGL_FALSE;
    ReleaseCurrent(entry.state, entry.CallingThread());
    entry.CallingThread().api.reset();
    return EGL_TRUE;
}

SIM_API EGLBoolean eglQueryContext(EGLDisplay display, EGLContext handle, EGLint attribute,
                                   EGLint* value)
{
    EglEntry entry("eglQueryContext", {display, handle, attribute, (const void*)value});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    const Context* const context = entry.CheckContext(handle);
    if (!context)
        return EGL_FALSE;
    switch (attribute)
    {
    case EGL_CONFIG_ID: *value = context->config + 1; return EGL_TRUE;
    case EGL_CONTEXT_CLIENT_TYPE: *value = EGL_OPENGL_ES_API; return EGL_TRUE;
    case EGL_CONTEXT_CLIENT_VERSION: *value = context->clientVersion; return EGL_TRUE;
    case EGL_RENDER_BUFFER:
    {
        const Thread& thread = entry.CallingThread();
        const bool isCurrent = thread.context == context && thread.draw;
        *value = isCurrent ? thread.draw->activeRenderBuffer : EGLint{EGL_NONE};
        return EGL_TRUE;
    }
    case EGL_CONTEXT_PRIORITY_LEVEL_IMG:
        if (!entry.state.gpu.HasEglExtension("EGL_IMG_context_priority"))
            break;
        *value = context->priority;
        return EGL_TRUE;
    default: break;
    }
    return entry.Misuse(EGL_BAD_ATTRIBUTE,
                        "no such attribute: " + Hex(static_cast<unsigned>(attribute)));
}

SIM_API EGLContext eglGetCurrentContext()
{
    EglEntry entry("eglGetCurrentContext", {});
    const Context* const context = entry.CallingThread().context;
    return entry && context ? context->handle : EGL_NO_CONTEXT;
}

SIM_API EGLDisplay eglGetCurrentDisplay()
{
    EglEntry entry("eglGetCurrentDisplay", {});
    return entry && entry.CallingThread().context ? TheDisplay() : EGL_NO_DISPLAY;
}

SIM_API EGLSurface eglGetCurrentSurface(EGLint which)
{
    EglEntry entry("eglGetCurrentSurface", {which});
    if (!entry)
        return EGL_NO_SURFACE;
    const Thread& thread = entry.CallingThread();
    const Surface* const surface = which == EGL_READ ? thread.read : thread.draw;
    return surface ? surface->handle : EGL_NO_SURFACE;
}

SimContextState SimDriver::Context(EGLContext handle) const
{
    const std::lock_guard lock(GetState().mutex);
    const Sim::Context* const context = GetState().FindContext(handle);
    SimContextState state;
    if (!context)
        return state;
    state.exists = true;
    state.share = context->share;
    state.clientVersion = context->clientVersion;
    state.priority = context->priority;
    state.config = context->config;
    state.thread = context->thread;
    return state;
}

std::vector<EGLContext> SimDriver::Contexts() const
{
    const std::lock_guard lock(GetState().mutex);
    std::vector<EGLContext> handles;
    for (const auto& [handle, context] : GetState().contexts)
    {
        if (!context->destroyed)
            handles.push_back(handle);
    }
    return handles;
}
