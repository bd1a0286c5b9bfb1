#include "base/SystemDefaults.h"

#include <cstdlib>
#include <string_view>

namespace Nib
{

namespace
{

constexpr int kSdkVersion = 34;

// The value of a variable, null when it is unset or empty.
const char* Environment(const char* name)
{
    const char* value = std::getenv(name);
    return value && *value ? value : nullptr;
}

std::optional<std::string> CacheDirectory()
{
    if (const char* folder = Environment("NIB_CACHE_DIR"))
        return folder;
    if (const char* caches = Environment("XDG_CACHE_HOME"))
        return std::string(caches) + "/nib/sdk";
    if (const char* home = Environment("HOME"))
        return std::string(home) + "/.cache/nib/sdk";
    return std::nullopt;
}

bool IsEngineeringBuild()
{
    const char* type = Environment("NIB_BUILD_TYPE");
    return type && std::string_view(type) == "eng";
}

} // namespace

SystemDefaults ReadSystemDefaults()
{
    return {NumberOr(Environment("NIB_SDK_VERSION"), kSdkVersion), IsEngineeringBuild(),
            CacheDirectory(), SwitchOr(Environment("NIB_DESKTOP"), true)};
}

} // namespace Nib
