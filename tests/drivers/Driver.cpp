#include "drivers/Driver.h"

#include <EGL/eglext.h>

#include <dlfcn.h>

#include <algorithm>
#include <cstdlib>

std::string_view DriverName()
{
    const char* const name = std::getenv("NIB_DRIVER");
    return name != nullptr ? name : "";
}

bool DriverIs(std::initializer_list<std::string_view> names)
{
    return std::find(names.begin(), names.end(), DriverName()) != names.end();
}

bool HasConfigFor(EGLint surfaceTypes)
{
    const EGLDisplay display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    eglInitialize(display, nullptr, nullptr);
    const EGLint wanted[] = {EGL_SURFACE_TYPE,
                             surfaceTypes,
                             EGL_RENDERABLE_TYPE,
                             EGL_OPENGL_ES2_BIT,
                             EGL_RED_SIZE,
                             8,
                             EGL_GREEN_SIZE,
                             8,
                             EGL_BLUE_SIZE,
                             8,
                             EGL_ALPHA_SIZE,
                             8,
                             EGL_NONE};
    EGLint count = 0;
    return eglChooseConfig(display, wanted, nullptr, 0, &count) == EGL_TRUE && count > 0;
}

// ANGLE takes the Vulkan driver that the system has, rather than the one that it brings, only for a
// display that is asked for in its own way.
extern "C" __attribute__((visibility("default"))) EGLDisplay
eglGetDisplay(EGLNativeDisplayType native)
{
    if (DriverIs({"angle-lavapipe"}))
    {
        constexpr EGLenum kPlatform = 0x3202;             // EGL_PLATFORM_ANGLE_ANGLE
        constexpr EGLint kAttributes[] = {0x3203, 0x3450, // its type: Vulkan
                                          0x348F, 0x31DD, // without a window system
                                          EGL_NONE};
        static auto* const get = reinterpret_cast<PFNEGLGETPLATFORMDISPLAYEXTPROC>(
            eglGetProcAddress("eglGetPlatformDisplayEXT"));
        return get(kPlatform, nullptr, kAttributes);
    }
    static auto* const real =
        reinterpret_cast<decltype(&eglGetDisplay)>(dlsym(RTLD_NEXT, "eglGetDisplay"));
    return real(native);
}
