#include "SimGl.h"

// Fences of OpenGL ES 3.

namespace Sim
{

void FlushContext(Context& context)
{
    for (auto& [handle, sync] : context.group->syncs)
    {
        if (sync.creator == &context)
            sync.flushed = true;
    }
}

namespace
{

Sync* FindSync(GlEntry& entry, GLsync handle)
{
    const auto found = entry.Group().syncs.find(handle);
    if (found != entry.Group().syncs.end())
        return &found->second;
    entry.Misuse(GL_INVALID_VALUE, handle ? "the fence is unknown or deleted" : "no fence");
    return nullptr;
}

/// Waits without a time-out until the fence is passed, or somebody deletes it.
void WaitForever(Entry& entry, ShareGroup& group, GLsync handle)
{
    State& state = entry.state;
    entry.Wait(
        [&]
        {
            const auto found = group.syncs.find(handle);
            return found == group.syncs.end() || found->second.signalled ||
                   state.pace != SimPace::Held;
        });
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API GLsync glFenceSync(GLenum condition, GLbitfield flags)
{
    GlEntry entry("glFenceSync", {condition, flags}, 30);
    if (!entry)
        return nullptr;
    if (condition != GL_SYNC_GPU_COMMANDS_COMPLETE || flags != 0)
    {
        entry.Misuse(condition == GL_SYNC_GPU_COMMANDS_COMPLETE ? GL_INVALID_VALUE
                                                                : GL_INVALID_ENUM,
                     "no such condition");
        return nullptr;
    }
    auto* const handle = static_cast<GLsync>(entry.state.NewHandle());
    Sync& sync = entry.Group().syncs[handle];
    sync.signalled = entry.state.pace == SimPace::Instant;
    sync.creator = &entry.CurrentContext();
    return handle;
}

SIM_API GLboolean glIsSync(GLsync handle)
{
    GlEntry entry("glIsSync", {(const void*)handle}, 30);
    return entry && entry.Group().syncs.count(handle) ? GL_TRUE : GL_FALSE;
}

SIM_API void glDeleteSync(GLsync handle)
{
    GlEntry entry("glDeleteSync", {(const void*)handle}, 30);
    if (!entry || !handle || !FindSync(entry, handle))
        return;
    entry.Group().syncs.erase(handle);
    entry.state.changed.notify_all();
}

SIM_API GLenum glClientWaitSync(GLsync handle, GLbitfield flags, GLuint64 timeout)
{
    GlEntry entry("glClientWaitSync", {(const void*)handle, flags, timeout}, 30);
    if (!entry)
        return GL_WAIT_FAILED;
    const Sync* const sync = FindSync(entry, handle);
    if (!sync)
        return GL_WAIT_FAILED;
    if ((flags & ~GLbitfield{GL_SYNC_FLUSH_COMMANDS_BIT}) != 0)
    {
        entry.Misuse(GL_INVALID_VALUE, "no such flag: " + Hex(flags));
        return GL_WAIT_FAILED;
    }
    if (sync->signalled)
        return GL_ALREADY_SIGNALED;
    if ((flags & GL_SYNC_FLUSH_COMMANDS_BIT) != 0)
        FlushContext(entry.CurrentContext());
    if (timeout == 0)
        return GL_TIMEOUT_EXPIRED;
    ShareGroup& group = entry.Group();
    if (entry.state.pace == SimPace::Held)
    {
        if (timeout != GL_TIMEOUT_IGNORED)
            return GL_TIMEOUT_EXPIRED;
        WaitForever(entry, group, handle);
    }
    const auto found = group.syncs.find(handle);
    if (found != group.syncs.end())
        found->second.signalled = true;
    return GL_CONDITION_SATISFIED;
}

SIM_API void glWaitSync(GLsync handle, GLbitfield flags, GLuint64 timeout)
{
    GlEntry entry("glWaitSync", {(const void*)handle, flags, timeout}, 30);
    const Sync* const sync = entry ? FindSync(entry, handle) : nullptr;
    if (!sync)
        return;
    if (flags != 0 || timeout != GL_TIMEOUT_IGNORED)
        return entry.Misuse(GL_INVALID_VALUE, "flags or a time-out");
    if (sync->creator != &entry.CurrentContext() && !sync->flushed)
        entry.Misuse("the fence was never flushed, the wait may never end");
}

SIM_API void glGetSynciv(GLsync handle, GLenum name, GLsizei size, GLsizei* length, GLint* values)
{
    GlEntry entry("glGetSynciv",
                  {(const void*)handle, name, size, (const void*)length, (const void*)values}, 30);
    const Sync* const sync = entry ? FindSync(entry, handle) : nullptr;
    if (!sync || size < 1)
        return;
    if (length)
        *length = 1;
    switch (name)
    {
    case GL_SYNC_STATUS: *values = sync->signalled ? GL_SIGNALED : GL_UNSIGNALED; break;
    case GL_OBJECT_TYPE: *values = GL_SYNC_FENCE; break;
    case GL_SYNC_CONDITION: *values = GL_SYNC_GPU_COMMANDS_COMPLETE; break;
    case GL_SYNC_FLAGS: *values = 0; break;
    default: entry.Misuse(GL_INVALID_ENUM, "fences have no such parameter: " + Hex(name));
    }
}
