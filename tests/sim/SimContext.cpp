#include "SimState.h"

#include <gtest/gtest.h>

SimContext::SimContext(SimDriver&, int clientVersion) : SimContext(EGL_NO_CONTEXT, clientVersion) {}

SimContext::SimContext(SimDriver&, const SimContext& other, int clientVersion)
    : SimContext(other.m_context, clientVersion)
{
}

SimContext::SimContext(EGLContext share, int clientVersion)
{
    const Sim::Quiet quiet;
    const EGLDisplay display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    eglInitialize(display, nullptr, nullptr);
    const EGLint wanted[] = {EGL_RENDERABLE_TYPE,
                             clientVersion == 3 ? 0x40 : EGL_OPENGL_ES2_BIT,
                             EGL_SURFACE_TYPE,
                             EGL_PBUFFER_BIT,
                             EGL_ALPHA_SIZE,
                             8,
                             EGL_NONE};
    EGLConfig config = nullptr;
    EGLint count = 0;
    eglChooseConfig(display, wanted, &config, 1, &count);
    const EGLint version[] = {EGL_CONTEXT_CLIENT_VERSION, clientVersion, EGL_NONE};
    m_context = eglCreateContext(display, config, share, version);
    const EGLint size[] = {EGL_WIDTH, 1, EGL_HEIGHT, 1, EGL_NONE};
    m_surface = eglCreatePbufferSurface(display, config, size);
    if (!eglMakeCurrent(display, m_surface, m_surface, m_context))
        ADD_FAILURE() << "no context: EGL error " << eglGetError();
}

SimContext::~SimContext()
{
    const Sim::Quiet quiet;
    const EGLDisplay display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    if (eglGetCurrentContext() == m_context)
        eglMakeCurrent(display, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
    eglDestroySurface(display, m_surface);
    eglDestroyContext(display, m_context);
}

void SimContext::MakeCurrent()
{
    const Sim::Quiet quiet;
    if (!eglMakeCurrent(eglGetDisplay(EGL_DEFAULT_DISPLAY), m_surface, m_surface, m_context))
        ADD_FAILURE() << "no context: EGL error " << eglGetError();
}

void SimContext::Release()
{
    const Sim::Quiet quiet;
    eglMakeCurrent(eglGetDisplay(EGL_DEFAULT_DISPLAY), EGL_NO_SURFACE, EGL_NO_SURFACE,
                   EGL_NO_CONTEXT);
}
