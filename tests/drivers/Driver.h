#ifndef NIB_TESTS_DRIVERS_DRIVER_H
#define NIB_TESTS_DRIVERS_DRIVER_H

#include <EGL/egl.h>

#include <initializer_list>
#include <string_view>

// The driver that a run is for. docs/drivers.md lists them, and tells how they differ.

/// Its name there, from NIB_DRIVER; empty for a program that was started by hand.
std::string_view DriverName();

bool DriverIs(std::initializer_list<std::string_view> names);

/// Whether EGL has configurations of 8 bits a channel whose surfaces are of all of these types.
bool HasConfigFor(EGLint surfaceTypes);

/// Whether there are pbuffers, on which the library keeps its contexts while there is no window.
inline bool HasPbuffers()
{
    return HasConfigFor(EGL_PBUFFER_BIT);
}
inline constexpr const char* kNoPbuffers = "this display has no pbuffers";

#endif
