#ifndef NIB_TESTS_FAULTS_FORKED_RUN_H
#define NIB_TESTS_FAULTS_FORKED_RUN_H

#include "faults/SlowProcesses.h"

#include <chrono>
#include <functional>
#include <string>

/// How a run in a process of its own came out.
struct RunResult
{
    std::string report;   ///< what the run wrote
    std::string messages; ///< its standard error: sanitizers, assertions
    std::string end;      ///< empty: it returned, and left no memory behind
    std::string stuck;    ///< its threads and where they stand, when it did not end in time
};

/// What no run takes that is not stuck, on a busy machine either.
inline constexpr std::chrono::seconds kPatience{kProcessesAreSlow ? 120 : 10};

/// Runs @p run in a child process and then ends that process in the ordinary way, so that static
/// objects are destroyed and a leak checker looks for what was lost. @p run gives its report.
///
/// One that takes longer than @p limit is ended, after its threads were asked where they are. To
/// be called while the calling process has one thread.
RunResult RunInChild(const std::function<std::string()>& run,
                     std::chrono::seconds limit = kPatience);

#endif
