#ifndef NIB_TESTS_ORACLE_SCENARIO_H
#define NIB_TESTS_ORACLE_SCENARIO_H

#include <nib/base.h>

#include <string>
#include <vector>

namespace Oracle
{

/// One frame: which back buffer it gets, and what it changes.
struct Frame
{
    int age = 0; ///< swaps since the buffer was presented; 0: it holds nothing defined
    std::vector<Nib::RectF> dirty; ///< window coordinates, y downward; each is painted anew

    friend bool operator==(const Frame&, const Frame&) = default;
};

/// A window, its buffers, and frames that are drawn into it.
struct Scenario
{
    int width = 8; ///< of the window, in pixels
    int height = 8;
    int buffers = 2;            ///< 1 to 4
    int panelRotation = 0;      ///< "ro.sf.hwrotation", in degrees
    int rotation = 0;           ///< of the content, in quarter turns
    bool lostIsZero = false;    ///< a buffer that holds nothing defined holds zeros, else garbage
    bool damageIsAHint = false; ///< a damaged swap shows all of the buffer, else the damage alone
    std::vector<Frame> frames;

    friend bool operator==(const Scenario&, const Scenario&) = default;
};

/// The lines of a test that fill a variable "scenario".
std::string ToStatements(const Scenario& scenario);

} // namespace Oracle

#endif
