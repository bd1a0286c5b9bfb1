#ifndef NIB_BASE_SYSTEM_DEFAULTS_H
#define NIB_BASE_SYSTEM_DEFAULTS_H

#include <optional>
#include <string>

namespace Nib
{

/// What System answers where the application has set nothing.
struct SystemDefaults
{
    int sdkVersion;
    bool engMode;
    std::optional<std::string> cacheDirectory;
    bool desktopFallbacks;
};

/// Asks the platform; one definition for each.
SystemDefaults ReadSystemDefaults();

/// A number and nothing else, or @p otherwise.
int NumberOr(const char* text, int otherwise);

/// "0" or "1", or @p otherwise.
bool SwitchOr(const char* text, bool otherwise);

} // namespace Nib

#endif
