#include <nib/egl.h>

#include "base/Log.h"

namespace Nib
{

namespace
{

EGLDisplay Display()
{
    return Egl::GetInstance()->GetDisplay();
}

} // namespace

EglSurface::EglSurface(EGLSurface handle) : m_surface(handle) {}

EglSurface::~EglSurface()
{
    Destroy();
}

void EglSurface::Destroy()
{
    if (m_surface == EGL_NO_SURFACE)
        return;
    eglDestroySurface(Display(), m_surface);
    m_surface = EGL_NO_SURFACE;
}

EGLSurface EglSurface::Get() const
{
    return m_surface;
}

bool EglSurface::IsCreated() const
{
    return m_surface != EGL_NO_SURFACE;
}

bool EglSurface::SetAttribute(int attribute, int value)
{
    NIB_FUNCTION("bool Nib::EglSurface::SetAttribute(int, int)");
    if (eglSurfaceAttrib(Display(), m_surface, attribute, value) == EGL_TRUE)
        return true;
    NIB_LOG_ERROR("%s : Failed. attr = %d, val = %d, err = %d", function, attribute, value,
                  eglGetError());
    return false;
}

bool EglSurface::QueryAttribute(int attribute, int* value) const
{
    NIB_FUNCTION("bool Nib::EglSurface::QueryAttribute(int, int *) const");
    EGLint answer = 0;
    if (eglQuerySurface(Display(), m_surface, attribute, &answer) != EGL_TRUE)
    {
        NIB_LOG_ERROR("%s : Failed. attr = %d, err = %d", function, attribute, eglGetError());
        return false;
    }
    if (value != nullptr)
        *value = answer;
    return true;
}

bool EglSurface::SwapBuffers() const
{
    NIB_FUNCTION("bool Nib::EglSurface::SwapBuffers() const");
    if (eglSwapBuffers(Display(), m_surface) == EGL_TRUE)
        return true;
    NIB_LOG_ERROR("%s Failed. Err = %d", function, eglGetError());
    return false;
}

int EglSurface::GetWidth() const
{
    NIB_FUNCTION("int Nib::EglSurface::GetWidth() const");
    int width = 0;
    if (QueryAttribute(EGL_WIDTH, &width))
        return width;
    NIB_LOG_ERROR("%s : Failed.", function);
    return -1;
}

int EglSurface::GetHeight() const
{
    NIB_FUNCTION("int Nib::EglSurface::GetHeight() const");
    int height = 0;
    if (QueryAttribute(EGL_HEIGHT, &height))
        return height;
    NIB_LOG_ERROR("%s : Failed.", function);
    return -1;
}

} // namespace Nib
