#ifndef NIB_SIM_SWAP_CHAIN_H
#define NIB_SIM_SWAP_CHAIN_H

#include "SimObjects.h"

#include <vector>

/// How the buffers of windows behave, where a test goes beyond what a device says about itself.
struct SimSwapChain
{
    /// Swaps since the back buffer of each frame was presented, 0 for a buffer that holds nothing
    /// defined. The last one repeats; none: as the device has it.
    std::vector<int> ages;
    /// What a buffer holds that holds nothing defined.
    SimPixel undefined{0xDE, 0xAD, 0xBE, 0xEF};
    /// A swap with damage shows the whole back buffer, where it else shows the damage alone.
    bool damageIsAHint = false;
    /// Above 0: clears write whole tiles of so many pixels, and what a tile held before its first
    /// clear in a frame is lost. Tiles are counted from the left and the bottom, or from these:
    int tileSize = 0;
    bool tilesFromRight = false;
    bool tilesFromTop = false;
};

#endif
