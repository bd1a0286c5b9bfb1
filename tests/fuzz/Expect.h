#ifndef NIB_TESTS_FUZZ_EXPECT_H
#define NIB_TESTS_FUZZ_EXPECT_H

#include <cstdio>
#include <cstdlib>

namespace Nib
{

/// Ends the fuzzer, which keeps the input, when the parser and its second reading disagree.
inline void Expect(bool holds, const char* what)
{
    if (holds)
        return;
    std::fprintf(stderr, "disagreement: %s\n", what);
    std::abort();
}

} // namespace Nib

#endif
