#ifndef NIB_TOOLS_LIVE_EVENT_H
#define NIB_TOOLS_LIVE_EVENT_H

#include "Recording.h"

/// What a user does in a window that is drawn in.
struct LiveEvent
{
    enum class Kind
    {
        PenDown, ///< with a sample
        PenMove, ///< with a sample
        PenUp,   ///< with a sample
        Undo,
        Clear,
        Save,
        Resize,    ///< with a size
        Uncovered, ///< what the window showed is lost
    };

    Kind kind = Kind::Uncovered;
    Ink::Sample sample{}; ///< window pixels, y downward
    int width = 0;        ///< pixels
    int height = 0;
};

#endif
