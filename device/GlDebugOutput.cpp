#include "device/GlDebugOutput.h"

#include "base/Log.h"
#include "egl/EntryPoint.h"
#include "thread/TaskScope.h"

#include <nib/device.h>
#include <nib/gl_debug.h>

#include <cstring>
#include <mutex>
#include <sstream>
#include <string>

namespace Nib
{

std::atomic<int> GlDebugOutput::s_contexts{0};

namespace
{

// Drivers take at least that much of a label; of the text of a group most take more.
constexpr std::size_t kLongestText = 255;

GLsizei LengthOf(const char* text)
{
    return static_cast<GLsizei>(strnlen(text, kLongestText));
}

// ---- entry points -------------------------------------------------------------------------------

EntryPoint<PFNGLDEBUGMESSAGECALLBACKKHRPROC> g_messageCallback("glDebugMessageCallbackKHR");
EntryPoint<PFNGLDEBUGMESSAGECONTROLKHRPROC> g_messageControl("glDebugMessageControlKHR");
EntryPoint<PFNGLPUSHDEBUGGROUPKHRPROC> g_pushGroup("glPushDebugGroupKHR");
EntryPoint<PFNGLPOPDEBUGGROUPKHRPROC> g_popGroup("glPopDebugGroupKHR");
EntryPoint<PFNGLOBJECTLABELKHRPROC> g_objectLabel("glObjectLabelKHR");

/// Whether the driver has them all.
bool Resolve(const char* function)
{
    if (!IsGLExtensionSupported("GL_KHR_debug"))
        return false;
    g_messageCallback.Resolve(function);
    g_messageControl.Resolve(function);
    g_pushGroup.Resolve(function);
    g_popGroup.Resolve(function);
    g_objectLabel.Resolve(function);
    return g_messageCallback.Get() && g_messageControl.Get() && g_pushGroup.Get() &&
           g_popGroup.Get() && g_objectLabel.Get();
}

// ---- the driver's messages ----------------------------------------------------------------------

void Log(GLenum severity, const std::string& text)
{
    switch (severity)
    {
    case GL_DEBUG_SEVERITY_HIGH_KHR: NIB_LOG_ERROR("GL %s", text.c_str()); break;
    case GL_DEBUG_SEVERITY_MEDIUM_KHR: NIB_LOG_WARN("GL %s", text.c_str()); break;
    case GL_DEBUG_SEVERITY_LOW_KHR: NIB_LOG_INFO("GL %s", text.c_str()); break;
    default: NIB_LOG_DEBUG("GL %s", text.c_str()); break;
    }
}

const char* SourceName(GLenum source)
{
    switch (source)
    {
    case GL_DEBUG_SOURCE_API_KHR: return "API";
    case GL_DEBUG_SOURCE_WINDOW_SYSTEM_KHR: return "window system";
    case GL_DEBUG_SOURCE_SHADER_COMPILER_KHR: return "shader compiler";
    case GL_DEBUG_SOURCE_THIRD_PARTY_KHR: return "third party";
    case GL_DEBUG_SOURCE_APPLICATION_KHR: return "application";
    default: return "driver";
    }
}

const char* TypeName(GLenum type)
{
    switch (type)
    {
    case GL_DEBUG_TYPE_ERROR_KHR: return "error";
    case GL_DEBUG_TYPE_DEPRECATED_BEHAVIOR_KHR: return "deprecated behaviour";
    case GL_DEBUG_TYPE_UNDEFINED_BEHAVIOR_KHR: return "undefined behaviour";
    case GL_DEBUG_TYPE_PORTABILITY_KHR: return "portability";
    case GL_DEBUG_TYPE_PERFORMANCE_KHR: return "performance";
    case GL_DEBUG_TYPE_MARKER_KHR: return "marker";
    default: return "message";
    }
}

/// The driver calls it inside the GL call that it tells of.
void GL_APIENTRY LogMessage(GLenum source, GLenum type, GLuint id, GLenum severity, GLsizei,
                            const GLchar* text, const void*)
{
    if (type == GL_DEBUG_TYPE_PUSH_GROUP_KHR || type == GL_DEBUG_TYPE_POP_GROUP_KHR)
        return; // our own
    std::ostringstream line;
    line << SourceName(source) << ", " << TypeName(type) << " 0x" << std::uppercase << std::hex
         << id << ": " << text;
    std::string message = line.str();
    message.erase(message.find_last_not_of('\n') + 1);
    Log(severity, message);
}

void LogMessages()
{
    glEnable(GL_DEBUG_OUTPUT_KHR);
    glEnable(GL_DEBUG_OUTPUT_SYNCHRONOUS_KHR);
    // Those of low severity are off unless they are asked for.
    g_messageControl.Get()(GL_DONT_CARE, GL_DONT_CARE, GL_DONT_CARE, 0, nullptr, GL_TRUE);
    g_messageCallback.Get()(&LogMessage, nullptr);
}

// ---- a group for each task ----------------------------------------------------------------------

// The calling thread's context has the aids, and that many groups.
thread_local bool t_isOn = false;
thread_local int t_groups = 0;

class Groups final : public ITaskGroups
{
public:
    void BeginTask(const char* type) override
    {
        g_pushGroup.Get()(GL_DEBUG_SOURCE_APPLICATION_KHR, 0, LengthOf(type), type);
        ++t_groups;
    }

    /// A task that has ended its context has closed its group before.
    void EndTask() override
    {
        if (t_groups == 0)
            return;
        g_popGroup.Get()();
        --t_groups;
    }
};

Groups g_groups;

} // namespace

void GlDebugOutput::Attach(Owner owner)
{
    NIB_FUNCTION("static void Nib::GlDebugOutput::Attach(Nib::GlDebugOutput::Owner)");
    if (t_isOn || !GlDebug::IsEnabled())
        return;
    if (!Resolve(function))
    {
        NIB_LOG_INFO("%s GL_KHR_debug is not supported", function);
        return;
    }
    if (owner == Owner::RenderThread)
        LogMessages();
    t_isOn = true;
    SetAttached(true);
}

void GlDebugOutput::Detach()
{
    if (!t_isOn)
        return;
    t_isOn = false;
    for (; t_groups > 0; --t_groups)
        g_popGroup.Get()(); // those of the tasks that end the context: with it, drivers leak them
    SetAttached(false);
}

/// Tasks are told of while there is a context with the aids.
void GlDebugOutput::SetAttached(bool attached)
{
    static std::mutex& lock = *new std::mutex; // for ever: threads may end after the library
    TaskScope::SetGroups(attached ? &g_groups : nullptr);
    const std::lock_guard guard(lock);
    const int before = s_contexts.fetch_add(attached ? 1 : -1, std::memory_order_relaxed);
    TaskScope::ListenToTasks(before + (attached ? 1 : -1) > 0);
}

bool GlDebugOutput::IsOnHere()
{
    return t_isOn;
}

void GlDebugOutput::SetLabel(GLenum identifier, GLuint name, const char* label)
{
    g_objectLabel.Get()(identifier, name, label ? LengthOf(label) : 0, label);
}

} // namespace Nib
