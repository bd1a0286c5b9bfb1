#include "latency/HistogramPicture.h"

#include "latency/Sheet.h"
#include "Percentile.h"
#include "PngFile.h"

#include <algorithm>
#include <cstdio>

namespace
{

// Pixels.
constexpr int kMargin = 24;
constexpr int kHeading = 22; // of a panel
constexpr int kBarsHeight = 150;
constexpr int kPanelHeight = kHeading + kBarsHeight + 26;
constexpr int kEmptyPanelHeight = kHeading + 8;
constexpr int kAxisHeight = 48;
constexpr int kBarsWidth = 840;

constexpr unsigned long kText = 0x202028;
constexpr unsigned long kRule = 0xC8C8D0;
constexpr unsigned long kMark = 0xD04020;
constexpr unsigned long kBars[] = {0x8090A8, 0x182454, 0x2A7F62};

std::string Milliseconds(float time)
{
    char text[32];
    std::snprintf(text, sizeof text, "%.2f ms", time);
    return text;
}

class Painting
{
public:
    explicit Painting(const std::vector<LatencySeries>& series)
        : m_series(series), m_histogram(series), m_width(kBarsWidth + 2 * kMargin),
          m_height(TopOf(series.size()) + kAxisHeight), m_sheet(m_width, m_height)
    {
        for (std::size_t i = 0; i < series.size(); ++i)
            DrawPanel(i, TopOf(i));
        DrawAxis(TopOf(series.size()));
    }

    void Write(const std::string& path) const
    {
        WritePng(path, m_sheet.Pixels(), m_width, m_height);
    }

private:
    /// Of a panel, and of the axis below the last.
    int TopOf(std::size_t panel) const
    {
        int top = kMargin;
        for (std::size_t i = 0; i < panel; ++i)
            top += m_series[i].times.empty() ? kEmptyPanelHeight : kPanelHeight;
        return top;
    }

    int PlaceOf(float time) const
    {
        const float reach = m_histogram.BinWidth() * static_cast<float>(m_histogram.BinCount());
        return kMargin + static_cast<int>(std::min(time / reach, 1.0f) * kBarsWidth);
    }

    void DrawPanel(std::size_t index, int top)
    {
        const LatencySeries& series = m_series[index];
        const int ground = top + kHeading + kBarsHeight;
        m_sheet.Write(kMargin, top + 12, Heading(series), kText);
        if (series.times.empty())
            return;
        const std::vector<int>& counts = m_histogram.Counts(index);
        for (int bin = 0; bin < m_histogram.BinCount(); ++bin)
        {
            const auto place = static_cast<float>(bin) * m_histogram.BinWidth();
            const int left = PlaceOf(place);
            const int right = PlaceOf(place + m_histogram.BinWidth());
            const int height =
                counts[static_cast<std::size_t>(bin)] * kBarsHeight / m_histogram.Largest();
            m_sheet.Fill(left, ground - height, right - left - 1, height,
                         kBars[index % std::size(kBars)]);
        }
        m_sheet.Fill(kMargin, ground, kBarsWidth, 1, kRule);
        for (const double percent : {50.0, 99.0})
            DrawMark(series, percent, ground);
    }

    static std::string Heading(const LatencySeries& series)
    {
        if (series.times.empty())
            return series.name + ": not granted, " + series.obstacle;
        return series.name + ", " + std::to_string(series.times.size()) + " taps, p50 " +
               Milliseconds(*Ink::Percentile(series.times, 50)) + ", p99 " +
               Milliseconds(*Ink::Percentile(series.times, 99));
    }

    void DrawMark(const LatencySeries& series, double percent, int ground)
    {
        const int x = PlaceOf(*Ink::Percentile(series.times, percent));
        m_sheet.Fill(x, ground - kBarsHeight, 1, kBarsHeight + 5, kMark);
        const std::string label = percent == 50.0 ? "p50" : "p99";
        m_sheet.Write(x - m_sheet.WidthOf(label) / 2, ground + 17, label, kMark);
    }

    /// A label at every fifth or tenth bin, whichever leaves room for its text.
    void DrawAxis(int top)
    {
        const int step = m_histogram.BinCount() > 40 ? 10 : 5;
        m_sheet.Fill(kMargin, top, kBarsWidth, 1, kText);
        for (int bin = 0; bin <= m_histogram.BinCount(); bin += step)
        {
            const float time = static_cast<float>(bin) * m_histogram.BinWidth();
            const int x = PlaceOf(time);
            m_sheet.Fill(x, top, 1, 6, kText);
            char label[16];
            std::snprintf(label, sizeof label, "%g", time);
            m_sheet.Write(x - m_sheet.WidthOf(label) / 2, top + 20, label, kText);
        }
        m_sheet.Write(kMargin, top + 40,
                      "milliseconds from the event of a tap until its ink can be read", kText);
    }

    const std::vector<LatencySeries>& m_series;
    Histogram m_histogram;
    int m_width;
    int m_height;
    Sheet m_sheet;
};

} // namespace

void WriteHistogram(const std::string& path, const std::vector<LatencySeries>& series)
{
    Painting(series).Write(path);
}
