#include "SimExtensions.h"
#include "SimGl.h"

// GL_KHR_debug: messages, groups and labels. A test sends the messages; groups and labels are seen
// in the recorded calls.

using namespace Sim;

bool SimDriver::SendDebugMessage(GLenum source, GLenum type, GLuint id, GLenum severity,
                                 const std::string& text)
{
    DebugOutput debug;
    {
        const std::lock_guard lock(GetState().mutex);
        const Sim::Context* const context = GetState().CurrentThread().context;
        if (!context || !context->gl.enabled.count(GL_DEBUG_OUTPUT_KHR))
            return false;
        debug = context->gl.debug;
    }
    if (!debug.callback || (severity == GL_DEBUG_SEVERITY_LOW_KHR && !debug.tellsLow))
        return false;
    // Without the lock: the callback writes log lines.
    debug.callback(source, type, id, severity, static_cast<GLsizei>(text.size()), text.c_str(),
                   debug.user);
    return true;
}

void Sim::Extension::glDebugMessageCallbackKHR(GLDEBUGPROCKHR callback, const void* user)
{
    GlEntry entry("glDebugMessageCallbackKHR", {callback != nullptr, user});
    if (!entry)
        return;
    entry.Gl().debug.callback = callback;
    entry.Gl().debug.user = user;
}

void Sim::Extension::glDebugMessageControlKHR(GLenum source, GLenum type, GLenum severity,
                                              GLsizei count, const GLuint* ids, GLboolean enabled)
{
    GlEntry entry("glDebugMessageControlKHR",
                  {source, type, severity, count, static_cast<const void*>(ids), enabled});
    if (!entry || !CheckCount(entry, count))
        return;
    if (severity == GL_DONT_CARE || severity == GL_DEBUG_SEVERITY_LOW_KHR)
        entry.Gl().debug.tellsLow = enabled == GL_TRUE;
}

void Sim::Extension::glPushDebugGroupKHR(GLenum source, GLuint id, GLsizei length,
                                         const GLchar* message)
{
    GlEntry entry("glPushDebugGroupKHR", {source, id, length, message});
    if (!entry)
        return;
    if (source != GL_DEBUG_SOURCE_APPLICATION_KHR && source != GL_DEBUG_SOURCE_THIRD_PARTY_KHR)
        return entry.Misuse(GL_INVALID_ENUM, "groups are not of that source");
    ++entry.Gl().debug.groups;
}

void Sim::Extension::glPopDebugGroupKHR()
{
    GlEntry entry("glPopDebugGroupKHR", {});
    if (!entry)
        return;
    if (entry.Gl().debug.groups == 0)
        return entry.Misuse(GL_STACK_UNDERFLOW_KHR, "no group is open");
    --entry.Gl().debug.groups;
}

namespace
{

/// Whether there is such an object; a name that was generated becomes one when it is bound first.
bool IsObject(GlEntry& entry, GLenum identifier, GLuint name)
{
    const auto isCreated = [name](const auto& table)
    {
        const auto* const object = table.Find(name);
        return object && object->created;
    };
    switch (identifier)
    {
    case GL_TEXTURE: return isCreated(entry.Group().textures);
    case GL_SAMPLER: return isCreated(entry.Group().samplers);
    case GL_BUFFER_KHR: return isCreated(entry.Group().buffers);
    case GL_RENDERBUFFER: return isCreated(entry.Group().renderbuffers);
    case GL_FRAMEBUFFER: return isCreated(entry.Gl().framebuffers);
    case GL_PROGRAM_KHR: return entry.Group().programs.Find(name) != nullptr;
    case GL_SHADER_KHR: return entry.Group().shaders.Find(name) != nullptr;
    default: return false;
    }
}

} // namespace

void Sim::Extension::glObjectLabelKHR(GLenum identifier, GLuint name, GLsizei length,
                                      const GLchar* label)
{
    GlEntry entry("glObjectLabelKHR", {identifier, name, length, label});
    if (entry && !IsObject(entry, identifier, name))
        entry.Misuse(GL_INVALID_VALUE, "no such object: " + Hex(name));
}
