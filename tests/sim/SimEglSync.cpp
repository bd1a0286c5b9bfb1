#include "SimEgl.h"

// EGL fences, as EGL_KHR_fence_sync and EGL 1.5 have them.

namespace Sim
{

void SignalAll(State& state)
{
    for (auto& [handle, sync] : state.eglSyncs)
        sync.signalled = true;
    for (auto& [handle, context] : state.contexts)
    {
        for (auto& [name, sync] : context->group->syncs)
            sync.signalled = true;
    }
}

namespace
{

/// The fence; null, with the error set, when there is none of that handle.
EglSync* CheckSync(EglEntry& entry, EGLSyncKHR handle)
{
    const auto found = entry.state.eglSyncs.find(handle);
    if (found != entry.state.eglSyncs.end())
        return &found->second;
    entry.Misuse(EGL_BAD_PARAMETER, "the fence is unknown or destroyed");
    return nullptr;
}

EGLSyncKHR Create(EglEntry& entry, EGLDisplay display, EGLenum type)
{
    if (!entry || !entry.Check(display))
        return EGL_NO_SYNC_KHR;
    if (type != EGL_SYNC_FENCE_KHR)
    {
        entry.Misuse(EGL_BAD_ATTRIBUTE, "only fences are there");
        return EGL_NO_SYNC_KHR;
    }
    if (!entry.CallingThread().context)
    {
        entry.Misuse(EGL_BAD_MATCH, "no context is current");
        return EGL_NO_SYNC_KHR;
    }
    const EGLSyncKHR handle = entry.state.NewHandle();
    entry.state.eglSyncs[handle].signalled = entry.state.pace == SimPace::Instant;
    return handle;
}

EGLBoolean Destroy(EglEntry& entry, EGLDisplay display, EGLSyncKHR handle)
{
    if (!entry || !entry.Check(display) || !CheckSync(entry, handle))
        return EGL_FALSE;
    entry.state.eglSyncs.erase(handle);
    return EGL_TRUE;
}

EGLint ClientWait(EglEntry& entry, EGLDisplay display, EGLSyncKHR handle, EGLTimeKHR timeout)
{
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    EglSync* sync = CheckSync(entry, handle);
    if (!sync)
        return EGL_FALSE;
    if (entry.state.pace == SimPace::OnWait && timeout > 0)
        SignalAll(entry.state);
    if (timeout == EGL_FOREVER_KHR)
    {
        State& state = entry.state;
        entry.Wait(
            [&]
            {
                const auto found = state.eglSyncs.find(handle);
                sync = found == state.eglSyncs.end() ? nullptr : &found->second;
                return !sync || sync->signalled || state.pace != SimPace::Held;
            });
        if (!sync)
            return EGL_CONDITION_SATISFIED_KHR;
        sync->signalled = true;
    }
    return sync->signalled ? EGL_CONDITION_SATISFIED_KHR : EGL_TIMEOUT_EXPIRED_KHR;
}

template <typename Value>
EGLBoolean GetAttribute(EglEntry& entry, EGLDisplay display, EGLSyncKHR handle, EGLint attribute,
                        Value* value)
{
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    const EglSync* const sync = CheckSync(entry, handle);
    if (!sync)
        return EGL_FALSE;
    switch (attribute)
    {
    case EGL_SYNC_TYPE_KHR: *value = EGL_SYNC_FENCE_KHR; return EGL_TRUE;
    case EGL_SYNC_CONDITION_KHR: *value = EGL_SYNC_PRIOR_COMMANDS_COMPLETE_KHR; return EGL_TRUE;
    case EGL_SYNC_STATUS_KHR:
        *value = sync->signalled ? EGL_SIGNALED_KHR : EGL_UNSIGNALED_KHR;
        return EGL_TRUE;
    default: return entry.Misuse(EGL_BAD_ATTRIBUTE, "fences have no such attribute");
    }
}

} // namespace

namespace Extension
{

EGLSyncKHR eglCreateSyncKHR(EGLDisplay display, EGLenum type, const EGLint* list)
{
    EglEntry entry("eglCreateSyncKHR", {display, type, (const void*)list});
    entry.AttributeList(list);
    return Create(entry, display, type);
}

EGLBoolean eglDestroySyncKHR(EGLDisplay display, EGLSyncKHR sync)
{
    EglEntry entry("eglDestroySyncKHR", {display, sync});
    return Destroy(entry, display, sync);
}

EGLint eglClientWaitSyncKHR(EGLDisplay display, EGLSyncKHR sync, EGLint flags, EGLTimeKHR timeout)
{
    EglEntry entry("eglClientWaitSyncKHR", {display, sync, flags, timeout});
    return ClientWait(entry, display, sync, timeout);
}

EGLBoolean eglGetSyncAttribKHR(EGLDisplay display, EGLSyncKHR sync, EGLint attribute, EGLint* value)
{
    EglEntry entry("eglGetSyncAttribKHR", {display, sync, attribute, (const void*)value});
    return GetAttribute(entry, display, sync, attribute, value);
}

} // namespace Extension

} // namespace Sim

using namespace Sim;

SIM_API EGLSync eglCreateSync(EGLDisplay display, EGLenum type, const EGLAttrib* list)
{
    EglEntry entry("eglCreateSync", {display, type, (const void*)list});
    return Create(entry, display, type);
}

SIM_API EGLBoolean eglDestroySync(EGLDisplay display, EGLSync sync)
{
    EglEntry entry("eglDestroySync", {display, sync});
    return Destroy(entry, display, sync);
}

SIM_API EGLint eglClientWaitSync(EGLDisplay display, EGLSync sync, EGLint flags, EGLTime timeout)
{
    EglEntry entry("eglClientWaitSync", {display, sync, flags, timeout});
    return ClientWait(entry, display, sync, timeout);
}

SIM_API EGLBoolean eglGetSyncAttrib(EGLDisplay display, EGLSync sync, EGLint attribute,
                                    EGLAttrib* value)
{
    EglEntry entry("eglGetSyncAttrib", {display, sync, attribute, (const void*)value});
    return GetAttribute(entry, display, sync, attribute, value);
}

SIM_API EGLBoolean eglWaitSync(EGLDisplay display, EGLSync sync, EGLint flags)
{
    EglEntry entry("eglWaitSync", {display, sync, flags});
    return entry && entry.Check(display) && CheckSync(entry, sync) ? EGL_TRUE : EGL_FALSE;
}

SIM_API EGLBoolean eglWaitGL()
{
    EglEntry entry("eglWaitGL", {});
    return entry ? EGL_TRUE : EGL_FALSE;
}

SIM_API EGLBoolean eglWaitClient()
{
    EglEntry entry("eglWaitClient", {});
    return entry ? EGL_TRUE : EGL_FALSE;
}

SIM_API EGLBoolean eglWaitNative(EGLint engine)
{
    EglEntry entry("eglWaitNative", {engine});
    return entry ? EGL_TRUE : EGL_FALSE;
}

void SimDriver::ReleaseGpu()
{
    State& state = GetState();
    const std::lock_guard lock(state.mutex);
    state.pace = SimPace::Instant;
    SignalAll(state);
    state.changed.notify_all();
}
