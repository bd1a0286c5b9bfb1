#include "BenchCommand.h"
#include "CacheCommand.h"
#include "DrawCommand.h"
#include "Drawing.h"
#include "InfoCommand.h"
#include "LatencyCommand.h"
#include "LiveDrawing.h"
#include "Recording.h"
#include "TraceOption.h"
#include "UserError.h"

#include <nib/version.h>

#include <CLI/CLI.hpp>

#include <cstdio>
#include <cstdlib>
#include <exception>

namespace
{

constexpr int kUserErrorStatus = 2;

void Draw(const DrawOptions& options)
{
    TraceOption trace(options.trace);
    if (options.live)
        LiveDrawing(options).Run();
    else
        Drawing(options).Run();
    trace.Finish();
}

int Fail(const std::exception& failure)
{
    std::fprintf(stderr, "nib: %s\n", failure.what());
    return kUserErrorStatus;
}

} // namespace

int main(int argc, char** argv)
{
    // The library's own log lines are for its developers; NIB_LOG brings them back.
    setenv("NIB_LOG", "silent", 0);
    CLI::App app("Draw with NibRenderer from the command line", "nib");
    app.set_version_flag("--version", std::string("nib ") + Nib::GetVersionString());
    app.require_subcommand(1);
    AddDrawCommand(app, &Draw);
    AddInfoCommand(app);
    AddLatencyCommand(app);
    AddCacheCommand(app);
    AddBenchCommand(app);
    try
    {
        app.parse(argc, argv);
    }
    catch (const CLI::CallForHelp& help)
    {
        return app.exit(help);
    }
    catch (const CLI::CallForVersion& version)
    {
        return app.exit(version);
    }
    catch (const CLI::RuntimeError& result) // the command has told already what there is to tell
    {
        return result.get_exit_code();
    }
    catch (const CLI::ParseError& failure)
    {
        return Fail(failure);
    }
    catch (const std::exception& failure) // Ink::ReadError, UserError, and what the library throws
    {
        return Fail(failure);
    }
    return 0;
}
