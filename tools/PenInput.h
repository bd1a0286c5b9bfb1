#ifndef NIB_TOOLS_PEN_INPUT_H
#define NIB_TOOLS_PEN_INPUT_H

#include "Recording.h"

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

/// One valuator of an input device, as the X server describes it.
struct PenAxis
{
    int number = 0;
    std::string label; ///< "Abs Pressure", "Abs Tilt X", "Abs Tilt Y"; others do not matter
    double min = 0.0;
    double max = 0.0;
    double value = 0.0; ///< at the moment
};

/// What one input device tells besides its place: pressure and tilt, where it has them.
class PenAxes
{
public:
    PenAxes() = default; ///< a mouse
    explicit PenAxes(const std::vector<PenAxis>& axes);

    void Set(int number, double value); ///< a valuator changed; others keep what they had
    void FillIn(Ink::Sample& sample) const;

private:
    struct Range
    {
        int number;
        double min;
        double max;
        double value;
    };
    static std::optional<Range> Find(const std::vector<PenAxis>& axes, const char* label);
    static float Degrees(const Range& tilt);

    std::optional<Range> m_pressure;
    std::optional<Range> m_tiltX;
    std::optional<Range> m_tiltY;
};

/// A report of a pointer, as it came in.
struct PenReport
{
    enum class Kind
    {
        Down,
        Move,
        Up
    };
    Kind kind = Kind::Move;
    int pointer = 0;                ///< the pointer on the screen
    int device = 0;                 ///< the device that moved it
    std::uint32_t milliseconds = 0; ///< the server's clock, which starts again after 49 days
    float x = 0.0f;                 ///< window pixels, y downward
    float y = 0.0f;

    /// The valuators that changed: bit n of @ref mask stands for valuator n, its value is the next
    /// of @ref values. As in an event of the X server; borrowed.
    const unsigned char* mask = nullptr;
    int maskBytes = 0;
    const double* values = nullptr;
};

/// Makes samples of what the pointers report. One pointer writes at a time; what another one does
/// meanwhile is not part of the stroke.
class PenInput
{
public:
    /// The first report gets the time @p startTime, in seconds.
    explicit PenInput(double startTime) : m_startTime(startTime) {}

    bool Knows(int device) const { return m_axes.count(device) != 0; }
    void Describe(int device, const std::vector<PenAxis>& axes);
    void Forget(int device) { m_axes.erase(device); } ///< it may be another one the next time

    /// The sample of @p report: every report of the writing pointer gives one, from its Down to its
    /// Up. Nothing for a hover, and for other pointers.
    std::optional<Ink::Sample> Accept(const PenReport& report);

private:
    bool IsOfStroke(const PenReport& report);
    double TimeOf(const PenReport& report);

    std::map<int, PenAxes> m_axes; // by device
    std::optional<int> m_writing;  // pointer
    double m_startTime;
    std::optional<std::uint32_t> m_lastReport; // milliseconds
    std::uint64_t m_elapsed = 0;               // milliseconds since the first report
};

#endif
