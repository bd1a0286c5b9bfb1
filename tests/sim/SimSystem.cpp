#include "SimEntry.h"

#include <dlfcn.h>

#include <cstring>

// The Android system: properties, the C library that holds their getter, and windows.

using Sim::GetState;
using Sim::PlatformEntry;

namespace
{

constexpr std::size_t kPropertyValueMax = 92; // PROP_VALUE_MAX, with the final zero

template <typename Function>
Function RealFunction(const char* name)
{
    return reinterpret_cast<Function>(dlsym(RTLD_NEXT, name));
}

void* RealOpen(const char* name, int flags)
{
    static const auto real = RealFunction<void* (*)(const char*, int)>("dlopen");
    return real(name, flags);
}

} // namespace

SIM_API int __system_property_get(const char* name, char* value)
{
    PlatformEntry entry("__system_property_get", {name});
    value[0] = '\0';
    if (!entry)
        return 0;
    const auto found = entry.state.properties.find(name);
    if (found == entry.state.properties.end())
        return 0;
    const std::string text = found->second.substr(0, kPropertyValueMax - 1);
    std::memcpy(value, text.c_str(), text.size() + 1);
    return static_cast<int>(text.size());
}

SIM_API void* dlopen(const char* name, int flags) noexcept
{
    if (!name || std::strcmp(name, "libc.so") != 0)
        return RealOpen(name, flags);
    PlatformEntry entry("dlopen", {name, flags});
    switch (entry.state.libc)
    {
    case SimLibc::Complete: return RealOpen(nullptr, flags); // this program has the getter
    case SimLibc::WithoutProperties: return RealOpen("libc.so.6", flags);
    case SimLibc::Missing: break;
    }
    return RealOpen("/no/such/folder/libc.so", flags);
}

SIM_API int32_t ANativeWindow_setBuffersGeometry(ANativeWindow* window, int32_t width,
                                                 int32_t height, int32_t format)
{
    PlatformEntry entry("ANativeWindow_setBuffersGeometry", {window, width, height, format});
    if (!entry)
        return -1;
    const auto found = entry.state.windows.find(window);
    if (found == entry.state.windows.end())
    {
        entry.Misuse("the window is unknown");
        return -1;
    }
    ++found->second->geometryCalls;
    found->second->format = format;
    return 0;
}

void SimDriver::SetProperty(const std::string& name, const std::string& value)
{
    const std::lock_guard lock(GetState().mutex);
    GetState().properties[name] = value;
}

void SimDriver::RemoveProperty(const std::string& name)
{
    const std::lock_guard lock(GetState().mutex);
    GetState().properties.erase(name);
}

void SimDriver::SetLibc(SimLibc libc)
{
    const std::lock_guard lock(GetState().mutex);
    GetState().libc = libc;
}

ANativeWindow* SimDriver::Window(int width, int height)
{
    const std::lock_guard lock(GetState().mutex);
    auto* const window = static_cast<ANativeWindow*>(GetState().NewHandle());
    auto native = std::make_unique<Sim::NativeWindow>();
    native->width = width;
    native->height = height;
    GetState().windows[window] = std::move(native);
    return window;
}

void SimDriver::ResizeWindow(ANativeWindow* window, int width, int height)
{
    const std::lock_guard lock(GetState().mutex);
    Sim::NativeWindow& native = *GetState().windows.at(window);
    native.width = width;
    native.height = height;
}

void SimDriver::AbandonWindow(ANativeWindow* window)
{
    const std::lock_guard lock(GetState().mutex);
    GetState().windows.at(window)->abandoned = true;
}

SimWindowState SimDriver::WindowState(ANativeWindow* window) const
{
    const std::lock_guard lock(GetState().mutex);
    const auto found = GetState().windows.find(window);
    if (found == GetState().windows.end())
        return {};
    const Sim::NativeWindow& native = *found->second;
    SimWindowState state;
    state.exists = true;
    state.width = native.width;
    state.height = native.height;
    state.format = native.format;
    state.geometryCalls = native.geometryCalls;
    state.presented = native.presented;
    state.connected = native.surface != EGL_NO_SURFACE;
    state.lastDamage = native.lastDamage;
    return state;
}
