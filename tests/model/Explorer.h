#ifndef NIB_TESTS_MODEL_EXPLORER_H
#define NIB_TESTS_MODEL_EXPLORER_H

#include <functional>
#include <string>

// A small model checker. It runs a scenario, whose threads are fibers of one real thread, again and
// again, until it has seen every order of their steps and, for every load, every value that the
// memory model allows. Orders that differ only in steps which do not touch the same object are one
// (sleep sets).

namespace Model
{

/// What a thread is about to do.
struct Step
{
    const void* object; ///< null: nothing that another thread could see
    bool writes;
};

struct Result
{
    long executions = 0; ///< orders that were run to their end
    std::string failure; ///< of the first execution that failed; empty when none did
};

/// Runs @p scenario in every possible way. It is thread 0 of each execution.
Result Explore(const std::function<void()>& scenario);

/// Whether an execution is going on: outside of one, atomics are plain values.
bool IsExploring();

// ---- within a scenario --------------------------------------------------------------------------

/// Starts a thread and returns its number.
int Spawn(std::function<void()> body);

/// Returns when that thread has ended.
void Join(int thread);

/// The number of this execution, redundant ones included.
long Execution();

/// The number of the running thread.
int Self();

/// Marks the execution as failed when @p holds is false.
void Require(bool holds, const char* what);

/// Before each step that another thread could see: others may come first. Returns when it is this
/// thread's turn and @p enabled (when given) is true.
void Before(Step step, std::function<bool()> enabled = {});

/// One of 0 ... @p options - 1, each in an execution of its own.
int Choose(int options);

/// Whether this thread has only looked for a while: then it sees what is newest. A thread that
/// looks on is held until another one has written.
bool IsSpinning();

} // namespace Model

#endif
