#ifndef NIB_TOOLS_REPLAY_H
#define NIB_TOOLS_REPLAY_H

#include "BrushStyle.h"
#include "InkSession.h"
#include "Recording.h"

#include <functional>

/// When a replay shows a frame, and how fast it runs.
struct Pace
{
    double speed = 0.0;                   ///< times the recorded speed; 0: as fast as it goes
    bool framePerSample = false;          ///< present after every sample, else not at all
    std::function<void(int)> afterSample; ///< told the number of samples drawn so far; may be null
    std::function<bool()> isWanted;       ///< asked before each sample; false ends the replay
};

/// What a replay has done.
struct Figures
{
    int strokes = 0;
    int samples = 0;
    int frames = 0;
};

/// Draws @p recording into @p session, sample by sample, to its end or until it is no longer
/// wanted.
Figures Replay(Ink::InkSession& session, const Ink::Recording& recording,
               const Ink::Placement& placement, const Ink::BrushStyle& style, const Pace& pace);

#endif
