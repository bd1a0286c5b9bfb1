#ifndef NIB_TESTS_ORACLE_SWAP_CHAIN_H
#define NIB_TESTS_ORACLE_SWAP_CHAIN_H

#include "oracle/Scenario.h"

#include <vector>

namespace Oracle
{

/// Which back buffers a window can get: each buffer holds the frame that was last presented from
/// it, and the one on display is not given out (but a single one always is).
class SwapChain
{
public:
    explicit SwapChain(int buffers);

    /// The ages that the next frame's buffer may have, ascending. 0 is always among them, because
    /// any buffer may have lost what it held.
    std::vector<int> Ages() const;

    /// Whether a buffer was never given out yet.
    bool HasFresh() const;

    /// The possible age that is @p wanted or comes next above it, else a fresh buffer's, else the
    /// greatest.
    int Nearest(int wanted) const;

    /// The next frame is drawn into the buffer of this age, one of Ages(), and presented.
    void Present(int age);

private:
    int AgeOf(std::size_t buffer) const;
    bool IsGivenOut(std::size_t buffer) const;

    std::vector<int> m_frames; // the number of the frame that each holds, from 1; 0: none
    int m_next = 1;            // the number of the next frame
};

/// The scenario with ages that its buffers can have.
Scenario Repaired(Scenario scenario);

} // namespace Oracle

#endif
