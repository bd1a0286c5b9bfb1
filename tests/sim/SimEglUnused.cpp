#include "SimEgl.h"

// Entry points of EGL that the simulated devices have, and refuse.

using namespace Sim;

SIM_API EGLSurface eglCreatePixmapSurface(EGLDisplay display, EGLConfig config,
                                          EGLNativePixmapType pixmap, const EGLint*)
{
    EglEntry entry("eglCreatePixmapSurface", {display, config, pixmap});
    entry.Refuse(EGL_BAD_MATCH);
    return EGL_NO_SURFACE;
}

SIM_API EGLSurface eglCreatePlatformPixmapSurface(EGLDisplay display, EGLConfig config,
                                                  void* pixmap, const EGLAttrib*)
{
    EglEntry entry("eglCreatePlatformPixmapSurface", {display, config, pixmap});
    entry.Refuse(EGL_BAD_MATCH);
    return EGL_NO_SURFACE;
}

SIM_API EGLSurface eglCreatePbufferFromClientBuffer(EGLDisplay display, EGLenum type,
                                                    EGLClientBuffer buffer, EGLConfig,
                                                    const EGLint*)
{
    EglEntry entry("eglCreatePbufferFromClientBuffer", {display, type, buffer});
    entry.Refuse(EGL_BAD_PARAMETER);
    return EGL_NO_SURFACE;
}

SIM_API EGLBoolean eglCopyBuffers(EGLDisplay display, EGLSurface surface,
                                  EGLNativePixmapType pixmap)
{
    EglEntry entry("eglCopyBuffers", {display, surface, pixmap});
    return entry.Refuse(EGL_BAD_NATIVE_PIXMAP);
}

SIM_API EGLBoolean eglBindTexImage(EGLDisplay display, EGLSurface surface, EGLint buffer)
{
    EglEntry entry("eglBindTexImage", {display, surface, buffer});
    return entry.Refuse(EGL_BAD_MATCH);
}

SIM_API EGLBoolean eglReleaseTexImage(EGLDisplay display, EGLSurface surface, EGLint buffer)
{
    EglEntry entry("eglReleaseTexImage", {display, surface, buffer});
    return entry.Refuse(EGL_BAD_MATCH);
}

SIM_API EGLImage eglCreateImage(EGLDisplay display, EGLContext context, EGLenum target,
                                EGLClientBuffer buffer, const EGLAttrib*)
{
    EglEntry entry("eglCreateImage", {display, context, target, buffer});
    entry.Refuse(EGL_BAD_PARAMETER);
    return EGL_NO_IMAGE;
}

SIM_API EGLBoolean eglDestroyImage(EGLDisplay display, EGLImage image)
{
    EglEntry entry("eglDestroyImage", {display, image});
    return entry.Refuse(EGL_BAD_PARAMETER);
}
