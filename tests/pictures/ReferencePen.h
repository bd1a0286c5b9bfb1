#ifndef NIB_TESTS_PICTURES_REFERENCE_PEN_H
#define NIB_TESTS_PICTURES_REFERENCE_PEN_H

#include <cstddef>
#include <vector>

// What the pen brush is to paint, computed on the processor from the rule in docs/pictures.md and
// from nothing that the library or examples/ink computes.
namespace Reference
{

/// A report of the pen: page pixels, y downward, and pressure from 0 to 1.
struct PenSample
{
    double x = 0.0;
    double y = 0.0;
    double pressure = 0.0;
};
using PenStroke = std::vector<PenSample>;

/// A place of the pen's round nib.
struct Disc
{
    double x = 0.0;
    double y = 0.0;
    double radius = 0.0;
};

/// How much of each pixel of a page is covered, from 0 to 1, row by row from the top.
class Coverage
{
public:
    Coverage(int width, int height);

    int Width() const { return m_width; }
    int Height() const { return m_height; }
    double At(int x, int y) const { return m_shares[Index(x, y)]; }

    /// Adds the share @p share of the pixels' height, between @p left and @p right, to row @p y.
    void AddRun(int y, double left, double right, double share);

private:
    std::size_t Index(int x, int y) const
    {
        return static_cast<std::size_t>(y) * static_cast<std::size_t>(m_width) +
               static_cast<std::size_t>(x);
    }

    int m_width;
    int m_height;
    std::vector<double> m_shares;
};

/// Half the width of a pen of @p width page pixels where it is pressed with @p pressure.
double PenRadius(double width, double pressure);

/// The nib's places along the curve of a stroke, less than half a pixel apart.
std::vector<Disc> PlacesAlong(const PenStroke& stroke, double width);

/// What the convex hulls of discs that follow each other cover together, in each of @p strokes; a
/// single disc covers itself. Exact across, in 16 lines a pixel downward.
Coverage CoverageOf(const std::vector<std::vector<Disc>>& strokes, int width, int height);

} // namespace Reference

#endif
