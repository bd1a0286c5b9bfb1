#ifndef NIB_TOOLS_REPLAY_H
#define NIB_TOOLS_REPLAY_H

#include "BrushStyle.h"
#include "Figures.h"
#include "InkSession.h"
#include "Recording.h"

#include <functional>

/// When a replay shows a frame, and how fast it runs.
struct Pace
{
    double speed = 0.0;                   ///< times the recorded speed; 0: as fast as it goes
    bool framePerSample = false;          ///< present after every sample, else not at all
    int loseContextEvery = 0;             ///< samples; 0: never
    std::function<void(int)> afterSample; ///< told the number of samples so far; may be null
    std::function<bool()> isWanted;       ///< asked before each sample; false ends the replay
};

/// Draws @p recording into @p session, sample by sample, to its end or until it is no longer
/// wanted. Of the figures, those that the session counts are left out. [blocks] until all is drawn
Figures Replay(Ink::InkSession& session, const Ink::Recording& recording,
               const Ink::Placement& placement, const Ink::BrushStyle& style, const Pace& pace);

/// How many samples a replay of @p recording has.
int SampleCount(const Ink::Recording& recording);

#endif
