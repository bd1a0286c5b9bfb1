#ifndef NIB_TOOLS_CACHE_COMMAND_H
#define NIB_TOOLS_CACHE_COMMAND_H

#include <CLI/CLI.hpp>

/// nib cache: looks at the kept program binaries, and removes them.
void AddCacheCommand(CLI::App& app);

#endif
