#include <EGL/egl.h>
#include <EGL/eglext.h>
#include <GLES3/gl3.h>

#include <cstring>

// An EGL with one display, one configuration, and surfaces of 1000 x 1000 pixels that may be
// presented in part. It remembers only what is current.

namespace
{

constexpr EGLint kSide = 1000;

int g_object; // every handle is its address

thread_local EGLContext t_context = EGL_NO_CONTEXT;
thread_local EGLSurface t_surface = EGL_NO_SURFACE;

EGLBoolean PostSubBuffer(EGLDisplay, EGLSurface, EGLint, EGLint, EGLint, EGLint)
{
    return EGL_TRUE;
}

void StartTiling(GLuint, GLuint, GLuint, GLuint, GLbitfield) {}

void EndTiling(GLbitfield) {}

struct EntryPoint
{
    const char* name;
    __eglMustCastToProperFunctionPointerType address;
};

template <typename Function>
EntryPoint Entry(const char* name, Function* function)
{
    return {name, reinterpret_cast<__eglMustCastToProperFunctionPointerType>(function)};
}

const EntryPoint kEntryPoints[] = {
    Entry("eglPostSubBufferNV", &PostSubBuffer),
    Entry("glStartTilingQCOM", &StartTiling),
    Entry("glEndTilingQCOM", &EndTiling),
};

} // namespace

extern "C"
{
    EGLDisplay eglGetDisplay(EGLNativeDisplayType)
    {
        return &g_object;
    }
    EGLBoolean eglInitialize(EGLDisplay, EGLint* major, EGLint* minor)
    {
        if (major)
            *major = 1;
        if (minor)
            *minor = 4;
        return EGL_TRUE;
    }
    EGLBoolean eglTerminate(EGLDisplay)
    {
        return EGL_TRUE;
    }
    EGLBoolean eglBindAPI(EGLenum)
    {
        return EGL_TRUE;
    }
    EGLenum eglQueryAPI()
    {
        return EGL_OPENGL_ES_API;
    }
    EGLint eglGetError()
    {
        return EGL_SUCCESS;
    }
    const char* eglQueryString(EGLDisplay, EGLint name)
    {
        return name == EGL_EXTENSIONS ? "EGL_NV_post_sub_buffer" : "stub";
    }
    EGLBoolean eglChooseConfig(EGLDisplay, const EGLint*, EGLConfig* configs, EGLint size,
                               EGLint* count)
    {
        *count = 1;
        if (configs && size > 0)
            configs[0] = &g_object;
        return EGL_TRUE;
    }
    EGLBoolean eglGetConfigAttrib(EGLDisplay, EGLConfig, EGLint name, EGLint* value)
    {
        *value = name == EGL_SURFACE_TYPE ? EGL_WINDOW_BIT | EGL_PBUFFER_BIT : 8;
        return EGL_TRUE;
    }
    EGLContext eglCreateContext(EGLDisplay, EGLConfig, EGLContext, const EGLint*)
    {
        return &g_object;
    }
    EGLBoolean eglDestroyContext(EGLDisplay, EGLContext)
    {
        return EGL_TRUE;
    }
    EGLBoolean eglQueryContext(EGLDisplay, EGLContext, EGLint, EGLint* value)
    {
        *value = 3;
        return EGL_TRUE;
    }
    EGLSurface eglCreateWindowSurface(EGLDisplay, EGLConfig, EGLNativeWindowType, const EGLint*)
    {
        return &g_object;
    }
    EGLSurface eglCreatePbufferSurface(EGLDisplay, EGLConfig, const EGLint*)
    {
        return &g_object;
    }
    EGLBoolean eglDestroySurface(EGLDisplay, EGLSurface)
    {
        return EGL_TRUE;
    }
    EGLBoolean eglQuerySurface(EGLDisplay, EGLSurface, EGLint name, EGLint* value)
    {
        *value = name == EGL_WIDTH || name == EGL_HEIGHT ? kSide : EGL_TRUE;
        return EGL_TRUE;
    }
    EGLBoolean eglSurfaceAttrib(EGLDisplay, EGLSurface, EGLint, EGLint)
    {
        return EGL_TRUE;
    }
    EGLBoolean eglMakeCurrent(EGLDisplay, EGLSurface draw, EGLSurface, EGLContext context)
    {
        t_context = context;
        t_surface = draw;
        return EGL_TRUE;
    }
    EGLContext eglGetCurrentContext()
    {
        return t_context;
    }
    EGLSurface eglGetCurrentSurface(EGLint)
    {
        return t_surface;
    }
    EGLBoolean eglSwapBuffers(EGLDisplay, EGLSurface)
    {
        return EGL_TRUE;
    }
    __eglMustCastToProperFunctionPointerType eglGetProcAddress(const char* name)
    {
        for (const EntryPoint& entry : kEntryPoints)
        {
            if (std::strcmp(name, entry.name) == 0)
                return entry.address;
        }
        return nullptr;
    }
}
