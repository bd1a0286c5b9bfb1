#ifndef NIB_TOOLS_LATENCY_COMMAND_H
#define NIB_TOOLS_LATENCY_COMMAND_H

#include <CLI/CLI.hpp>

/// nib latency: how long a pen event takes to become ink on the screen.
void AddLatencyCommand(CLI::App& app);

#endif
