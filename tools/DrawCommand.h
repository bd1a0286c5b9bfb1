#ifndef NIB_TOOLS_DRAW_COMMAND_H
#define NIB_TOOLS_DRAW_COMMAND_H

#include "DrawOptions.h"

#include <CLI/CLI.hpp>

#include <functional>

/// Adds the subcommand `draw` to @p app; @p run is called when its options have been parsed and fit
/// together. Throws UserError from CLI::App::parse when they do not.
void AddDrawCommand(CLI::App& app, std::function<void(const DrawOptions&)> run);

#endif
