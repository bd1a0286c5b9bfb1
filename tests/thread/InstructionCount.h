#ifndef NIB_TESTS_THREAD_INSTRUCTION_COUNT_H
#define NIB_TESTS_THREAD_INSTRUCTION_COUNT_H

#include <functional>

/// How many instructions @p action takes, counted one by one in a copy of this process; it runs on
/// the only thread that the copy has. -1 where processes may not be stepped through.
long InstructionsOf(const std::function<void()>& action);

/// Whether the code is that of the compiler alone: sanitizers add instructions of their own, which
/// differ from run to run.
bool IsInstrumented();

#endif
