#ifndef NIB_TOOLS_LATENCY_HISTOGRAM_H
#define NIB_TOOLS_LATENCY_HISTOGRAM_H

#include <string>
#include <vector>

/// Times of one kind.
struct LatencySeries
{
    std::string name;
    std::vector<float> times;  ///< milliseconds
    double redrawnShare = 0.0; ///< of the window in an average frame, 0 to 1
    std::string obstacle;      ///< why there are no times
};

/// Times sorted into bins of one width, the same for all series.
class Histogram
{
public:
    /// @p series has at least one time. The bins reach from 0 to just above the largest 99th
    /// percentile; their width is 1, 2 or 5 times a power of ten of a millisecond.
    explicit Histogram(const std::vector<LatencySeries>& series);

    float BinWidth() const { return m_binWidth; } ///< milliseconds
    int BinCount() const { return m_binCount; }
    int Largest() const { return m_largest; } ///< the most times in one bin

    /// How many times of series @p series fall into each bin; those beyond the bins into the last.
    const std::vector<int>& Counts(std::size_t series) const { return m_counts[series]; }

private:
    float m_binWidth = 0.0f;
    int m_binCount = 0;
    int m_largest = 0;
    std::vector<std::vector<int>> m_counts;
};

#endif
