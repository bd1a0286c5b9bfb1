#ifndef NIB_TOOLS_BENCH_COMMAND_H
#define NIB_TOOLS_BENCH_COMMAND_H

#include <CLI/CLI.hpp>

/// Adds `nib bench` to @p app. Its run throws UserError.
void AddBenchCommand(CLI::App& app);

#endif
