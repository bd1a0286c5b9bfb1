#include "pictures/ReferencePen.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <utility>

namespace Reference
{
namespace
{

constexpr int kLines = 16;         // a pixel
constexpr double kApart = 0.4;     // pixels between two places of the nib, at most
constexpr double kThinnest = 0.35; // pixels, half the width of the thinnest stroke
constexpr double kLightest = 0.2;  // share of the width without any pressure

struct Point
{
    double x;
    double y;
};

double DistanceOf(const Point& a, const Point& b)
{
    return std::hypot(b.x - a.x, b.y - a.y);
}

/// The point at @p t on the line that is @p a at @p from and @p b at @p to.
Point OnLine(const Point& a, const Point& b, double from, double to, double t)
{
    const double share = to > from ? (t - from) / (to - from) : 0.0;
    return {a.x + share * (b.x - a.x), a.y + share * (b.y - a.y)};
}

/// One piece of a Catmull-Rom curve, from the second of its four points to the third, by repeated
/// linear interpolation. Centripetal: a knot follows the one before after the square root of the
/// distance.
class CurvePiece
{
public:
    explicit CurvePiece(const std::array<Point, 4>& points) : m_points(points)
    {
        for (std::size_t i = 1; i < 4; ++i)
            m_knots[i] = m_knots[i - 1] + std::sqrt(DistanceOf(points[i - 1], points[i]));
    }

    /// The place after the share @p share of the piece.
    Point At(double share) const
    {
        const double t = m_knots[1] + share * (m_knots[2] - m_knots[1]);
        std::array<Point, 4> p = m_points;
        for (std::size_t level = 1; level < 4; ++level)
            for (std::size_t i = 0; i + level < 4; ++i)
            {
                // The last level joins the two curves at the piece's own knots.
                const std::size_t from = level == 3 ? 1 : i;
                const std::size_t to = level == 3 ? 2 : i + level;
                p[i] = OnLine(p[i], p[i + 1], m_knots[from], m_knots[to], t);
            }
        return p[0];
    }

private:
    std::array<Point, 4> m_points;
    std::array<double, 4> m_knots{};
};

/// What lies as far behind @p end as @p next is before it.
Point Mirrored(const Point& end, const Point& next)
{
    return {2 * end.x - next.x, 2 * end.y - next.y};
}

/// Part of a line across the page; empty when left is not below right.
struct Span
{
    double left = 1.0e9;
    double right = -1.0e9;

    void Take(double x)
    {
        left = std::min(left, x);
        right = std::max(right, x);
    }
};

void TakeDisc(Span& span, const Disc& disc, double y)
{
    const double height = y - disc.y;
    if (std::abs(height) > disc.radius)
        return;
    const double half = std::sqrt(disc.radius * disc.radius - height * height);
    span.Take(disc.x - half);
    span.Take(disc.x + half);
}

void TakeEdge(Span& span, const Point& a, const Point& b, double y)
{
    if (std::min(a.y, b.y) > y || std::max(a.y, b.y) < y)
        return;
    if (a.y == b.y)
    {
        span.Take(a.x);
        span.Take(b.x);
        return;
    }
    span.Take(a.x + (y - a.y) / (b.y - a.y) * (b.x - a.x));
}

/// The convex hull of two discs.
class Hull
{
public:
    Hull(const Disc& a, const Disc& b) : m_a(a), m_b(b)
    {
        const double apart = DistanceOf({a.x, a.y}, {b.x, b.y});
        m_hasSides = apart > std::abs(a.radius - b.radius);
        if (!m_hasSides)
            return; // one disc lies in the other
        const double alongX = (b.x - a.x) / apart;
        const double alongY = (b.y - a.y) / apart;
        const double cosine = (a.radius - b.radius) / apart;
        const double sine = std::sqrt(1.0 - cosine * cosine);
        for (const double side : {1.0, -1.0})
        {
            const double x = alongX * cosine - side * alongY * sine;
            const double y = alongY * cosine + side * alongX * sine;
            const auto touching = [&](const Disc& disc) {
                return Point{disc.x + disc.radius * x, disc.y + disc.radius * y};
            };
            m_sides[side > 0 ? 0 : 1] = {touching(a), touching(b)};
        }
    }

    double Top() const { return std::min(m_a.y - m_a.radius, m_b.y - m_b.radius); }
    double Bottom() const { return std::max(m_a.y + m_a.radius, m_b.y + m_b.radius); }

    /// What the hull covers of the line at @p y: all between its outermost parts.
    Span At(double y) const
    {
        Span span;
        TakeDisc(span, m_a, y);
        TakeDisc(span, m_b, y);
        if (m_hasSides)
            for (const auto& [from, to] : m_sides)
                TakeEdge(span, from, to, y);
        return span;
    }

private:
    Disc m_a;
    Disc m_b;
    bool m_hasSides = false;
    std::array<std::pair<Point, Point>, 2> m_sides{};
};

/// Adds what @p spans cover together to row @p y.
void AddUnion(std::vector<Span>& spans, int y, Coverage& coverage)
{
    std::sort(spans.begin(), spans.end(),
              [](const Span& a, const Span& b) { return a.left < b.left; });
    Span run;
    for (const Span& span : spans)
    {
        if (span.left > run.right && run.left < run.right)
        {
            coverage.AddRun(y, run.left, run.right, 1.0 / kLines);
            run = Span();
        }
        run.Take(span.left);
        run.Take(span.right);
    }
    if (run.left < run.right)
        coverage.AddRun(y, run.left, run.right, 1.0 / kLines);
}

} // namespace

Coverage::Coverage(int width, int height)
    : m_width(width), m_height(height),
      m_shares(static_cast<std::size_t>(width) * static_cast<std::size_t>(height))
{
}

void Coverage::AddRun(int y, double left, double right, double share)
{
    left = std::max(left, 0.0);
    right = std::min(right, static_cast<double>(m_width));
    for (int x = static_cast<int>(left); x < right; ++x)
        m_shares[Index(x, y)] += share * (std::min(x + 1.0, right) - std::max<double>(x, left));
}

double PenRadius(double width, double pressure)
{
    const double pressed = std::clamp(pressure, 0.0, 1.0);
    return std::max(width / 2 * (kLightest + (1 - kLightest) * pressed), kThinnest);
}

std::vector<Disc> PlacesAlong(const PenStroke& stroke, double width)
{
    PenStroke samples;
    for (const PenSample& sample : stroke)
        if (samples.empty() || samples.back().x != sample.x || samples.back().y != sample.y)
            samples.push_back(sample);
    const auto pointAt = [&](std::size_t i) { return Point{samples[i].x, samples[i].y}; };

    std::vector<Disc> places;
    if (!samples.empty())
        places.push_back({samples[0].x, samples[0].y, PenRadius(width, samples[0].pressure)});
    for (std::size_t i = 0; i + 1 < samples.size(); ++i)
    {
        const Point from = pointAt(i);
        const Point to = pointAt(i + 1);
        const CurvePiece piece({i > 0 ? pointAt(i - 1) : Mirrored(from, to), from, to,
                                i + 2 < samples.size() ? pointAt(i + 2) : Mirrored(to, from)});
        const double fromRadius = PenRadius(width, samples[i].pressure);
        const double toRadius = PenRadius(width, samples[i + 1].pressure);
        // Twice as many as a straight piece needs: a curve is longer.
        const int steps = static_cast<int>(std::ceil(2 * DistanceOf(from, to) / kApart));
        for (int step = 1; step <= steps; ++step)
        {
            const double share = static_cast<double>(step) / steps;
            const Point place = piece.At(share);
            places.push_back({place.x, place.y, fromRadius + share * (toRadius - fromRadius)});
        }
    }
    return places;
}

Coverage CoverageOf(const std::vector<std::vector<Disc>>& strokes, int width, int height)
{
    std::vector<std::vector<Span>> lines(static_cast<std::size_t>(height * kLines));
    for (const std::vector<Disc>& places : strokes)
        for (std::size_t i = 0; i < places.size(); ++i)
        {
            if (i == 0 && places.size() > 1)
                continue;
            const Hull hull(places[i > 0 ? i - 1 : 0], places[i]);
            const int first = std::max(0, static_cast<int>(std::floor(hull.Top() * kLines)));
            const int last =
                std::min(height * kLines - 1, static_cast<int>(std::ceil(hull.Bottom() * kLines)));
            for (int line = first; line <= last; ++line)
            {
                const Span span = hull.At((line + 0.5) / kLines);
                if (span.left < span.right)
                    lines[static_cast<std::size_t>(line)].push_back(span);
            }
        }
    Coverage coverage(width, height);
    for (int line = 0; line < height * kLines; ++line)
        AddUnion(lines[static_cast<std::size_t>(line)], line / kLines, coverage);
    return coverage;
}

} // namespace Reference
