#include "PenInput.h"

#include "RecordingBuilder.h"

#include <algorithm>
#include <cmath>

// ---- the axes of a device -----------------------------------------------------------------------

PenAxes::PenAxes(const std::vector<PenAxis>& axes)
    : m_pressure(Find(axes, "Abs Pressure")), m_tiltX(Find(axes, "Abs Tilt X")),
      m_tiltY(Find(axes, "Abs Tilt Y"))
{
}

std::optional<PenAxes::Range> PenAxes::Find(const std::vector<PenAxis>& axes, const char* label)
{
    for (const PenAxis& axis : axes)
        if (axis.label == label && axis.max > axis.min)
            return Range{axis.number, axis.min, axis.max, axis.value};
    return std::nullopt;
}

void PenAxes::Set(int number, double value)
{
    for (std::optional<Range>* axis : {&m_pressure, &m_tiltX, &m_tiltY})
        if (*axis && (*axis)->number == number)
            (*axis)->value = value;
}

/// Drivers report tilt in degrees, from about -64 to 63; one that counts finer spans the whole
/// half circle.
float PenAxes::Degrees(const Range& tilt)
{
    const double farthest = std::max(std::abs(tilt.min), std::abs(tilt.max));
    const double degree = farthest > 90.0 ? farthest / 90.0 : 1.0;
    return static_cast<float>(std::clamp(tilt.value / degree, -90.0, 90.0));
}

void PenAxes::FillIn(Ink::Sample& sample) const
{
    if (m_pressure)
        sample.pressure = static_cast<float>(std::clamp(
            (m_pressure->value - m_pressure->min) / (m_pressure->max - m_pressure->min), 0.0, 1.0));
    if (m_tiltX && m_tiltY)
        Ink::SetTilt(sample, Degrees(*m_tiltX), Degrees(*m_tiltY));
}

// ---- reports become samples ---------------------------------------------------------------------

void PenInput::Describe(int device, const std::vector<PenAxis>& axes)
{
    m_axes.insert_or_assign(device, PenAxes(axes));
}

std::optional<Ink::Sample> PenInput::Accept(const PenReport& report)
{
    PenAxes& axes = m_axes[report.device];
    const double* value = report.values;
    for (int number = 0; number < report.maskBytes * 8; ++number)
        if ((report.mask[number / 8] >> (number % 8) & 1) != 0)
            axes.Set(number, *value++);

    const double time = TimeOf(report);
    if (!IsOfStroke(report))
        return std::nullopt;
    Ink::Sample sample;
    sample.time = time;
    sample.x = report.x;
    sample.y = report.y;
    axes.FillIn(sample);
    return sample;
}

bool PenInput::IsOfStroke(const PenReport& report)
{
    if (!m_writing && report.kind == PenReport::Kind::Down)
        m_writing = report.pointer;
    const bool isOfStroke = m_writing == report.pointer;
    if (isOfStroke && report.kind == PenReport::Kind::Up)
        m_writing.reset();
    return isOfStroke;
}

double PenInput::TimeOf(const PenReport& report)
{
    constexpr std::uint32_t kHalf = 0x80000000u; // beyond it the difference is a step back
    const std::uint32_t step = report.milliseconds - m_lastReport.value_or(report.milliseconds);
    if (step < kHalf)
    {
        m_elapsed += step;
        m_lastReport = report.milliseconds;
    }
    return m_startTime + static_cast<double>(m_elapsed) / 1000.0;
}
