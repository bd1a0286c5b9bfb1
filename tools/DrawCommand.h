#ifndef NIB_TOOLS_DRAW_COMMAND_H
#define NIB_TOOLS_DRAW_COMMAND_H

#include <CLI/CLI.hpp>

/// Adds the subcommand `draw` to @p app; it runs when its options have been parsed.
void AddDrawCommand(CLI::App& app);

#endif
