#ifndef NIB_TOOLS_INFO_COMMAND_H
#define NIB_TOOLS_INFO_COMMAND_H

#include <CLI/CLI.hpp>

/// nib info: what the library finds on this device, and what it makes of it.
void AddInfoCommand(CLI::App& app);

#endif
