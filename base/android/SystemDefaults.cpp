#include "base/SystemDefaults.h"

#include <cstdlib>
#include <cstring>

#include <sys/system_properties.h>

namespace Nib
{

namespace
{

// The oldest system that this library is built for.
constexpr int kOldestSdkVersion = 23;

struct Property
{
    explicit Property(const char* name) { __system_property_get(name, value); }

    char value[PROP_VALUE_MAX] = {}; // empty when the device does not have it
};

} // namespace

SystemDefaults ReadSystemDefaults()
{
    const int sdkVersion = NumberOr(Property("ro.build.version.sdk").value, kOldestSdkVersion);
    const bool engMode = std::strcmp(Property("ro.build.type").value, "eng") == 0;
    return {sdkVersion, engMode, std::nullopt, SwitchOr(std::getenv("NIB_DESKTOP"), false)};
}

} // namespace Nib
