#include <nib/egl.h>
#include <nib/gl_debug.h>
#include <nib/trace.h>

#include "base/Log.h"
#include "egl/EglTokens.h"

namespace Nib
{

namespace
{

constexpr int kMostAttributes = 7; // three, and the end of the list

} // namespace

bool EglContext::Create(const EGLContext shareContext, bool enableFrontBuffer, Priority priority)
{
    NIB_FUNCTION("bool Nib::EglContext::Create(const EGLContext, bool, Nib::EglContext::Priority)");
    const TraceScope trace("context", "create");
    const Egl* egl = Egl::GetInstance();

    EGLint version = 3;
    if (shareContext != EGL_NO_CONTEXT)
    {
        eglQueryContext(egl->GetDisplay(), shareContext, EGL_CONTEXT_CLIENT_VERSION, &version);
        NIB_LOG_INFO("%s, Shared context client version %i", function, version);
    }

    EGLint attributes[kMostAttributes] = {EGL_CONTEXT_CLIENT_VERSION, version, EGL_NONE};
    EGLint* end = attributes + 2;
    if (egl->IsEglExtensionSupported("EGL_IMG_context_priority"))
    {
        NIB_LOG_INFO("%s, Create context with priority: 0x%x", function,
                     static_cast<unsigned>(priority));
        *end++ = EGL_CONTEXT_PRIORITY_LEVEL_IMG;
        *end++ = static_cast<EGLint>(priority);
        *end = EGL_NONE;
    }

    const EGLConfig config = egl->GetConfig(enableFrontBuffer);
    if (config == nullptr)
    {
        NIB_LOG_ERROR("%s - required config is NULL (enableFrontBuffer = %s)", function,
                      enableFrontBuffer ? "true" : "false");
        return false;
    }
    m_context = EGL_NO_CONTEXT;
    if (GlDebug::IsEnabled() && egl->IsEglExtensionSupported("EGL_KHR_create_context"))
    {
        end[0] = EGL_CONTEXT_FLAGS_KHR;
        end[1] = EGL_CONTEXT_OPENGL_DEBUG_BIT_KHR;
        end[2] = EGL_NONE;
        m_context = eglCreateContext(egl->GetDisplay(), config, shareContext, attributes);
        *end = EGL_NONE; // should it be refused
    }
    if (m_context == EGL_NO_CONTEXT)
        m_context = eglCreateContext(egl->GetDisplay(), config, shareContext, attributes);
    if (m_context == EGL_NO_CONTEXT)
    {
        NIB_LOG_ERROR("%s: eglCreateContext. Error:%d", function, eglGetError());
        return false;
    }
    return true;
}

void EglContext::Destroy()
{
    NIB_FUNCTION("void Nib::EglContext::Destroy()");
    NIB_LOG_INFO("%s", function);
    if (m_context == EGL_NO_CONTEXT)
        return;
    const TraceScope trace("context", "destroy");
    eglDestroyContext(Egl::GetInstance()->GetDisplay(), m_context);
    m_context = EGL_NO_CONTEXT;
}

EglContext::~EglContext()
{
    Destroy();
}

EGLContext EglContext::Get() const
{
    return m_context;
}

} // namespace Nib
