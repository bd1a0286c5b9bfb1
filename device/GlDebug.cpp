#include <nib/gl_debug.h>

#include "device/GlDebugOutput.h"

#include <atomic>
#include <cstdlib>
#include <string_view>

namespace Nib
{

namespace
{

enum class Setting
{
    NotRead,
    Off,
    On
};

// Relaxed: nothing else is published by it.
std::atomic<Setting> g_setting{Setting::NotRead};

Setting FromEnvironment()
{
    const char* text = std::getenv("NIB_GL_DEBUG");
    return text && std::string_view(text) == "1" ? Setting::On : Setting::Off;
}

} // namespace

void GlDebug::SetEnabled(bool enabled)
{
    g_setting.store(enabled ? Setting::On : Setting::Off, std::memory_order_relaxed);
}

bool GlDebug::IsEnabled()
{
    Setting setting = g_setting.load(std::memory_order_relaxed);
    if (setting == Setting::NotRead)
    {
        const Setting read = FromEnvironment();
        // Unless the application has come in between.
        if (g_setting.compare_exchange_strong(setting, read, std::memory_order_relaxed))
            setting = read;
    }
    return setting == Setting::On;
}

void GlDebug::Label(unsigned int identifier, unsigned int name, const char* label)
{
    GlDebugOutput::Label(identifier, name, label);
}

} // namespace Nib
