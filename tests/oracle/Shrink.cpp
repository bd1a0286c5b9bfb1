#include "oracle/Shrink.h"

#include "oracle/SwapChain.h"

#include <cmath>
#include <tuple>

namespace Oracle
{

namespace
{

/// What counts as shorter, the most important first.
using Size = std::tuple<std::size_t, std::size_t, int, double, int, int>;

// A buffer that holds an old frame is easier to follow than one that holds nothing defined.
int AgeSize(int age)
{
    return age == 0 ? 1000 : age;
}

Size SizeOf(const Scenario& scenario)
{
    std::size_t rectangles = 0;
    double coordinates = 0;
    int ages = 0;
    for (const Frame& frame : scenario.frames)
    {
        ages += AgeSize(frame.age);
        rectangles += frame.dirty.size();
        for (const Nib::RectF& rect : frame.dirty)
            coordinates += std::fabs(rect.left) + std::fabs(rect.top) + std::fabs(rect.right) +
                           std::fabs(rect.bottom);
    }
    const int turns = scenario.panelRotation / 90 + scenario.rotation;
    const int flags = (scenario.lostIsZero ? 1 : 0) + (scenario.damageIsAHint ? 1 : 0);
    return {scenario.frames.size(),           rectangles,
            scenario.width + scenario.height, coordinates,
            ages + scenario.buffers,          std::abs(turns) + flags};
}

class Shrinker
{
public:
    Shrinker(Scenario scenario, const std::function<bool(const Scenario&)>& fails)
        : m_best(std::move(scenario)), m_fails(fails)
    {
    }

    Scenario Run()
    {
        Size before;
        do
        {
            before = SizeOf(m_best);
            DropFrames();
            DropRectangles();
            SimplifyWindow();
            SimplifyAges();
            SimplifyRectangles();
        } while (SizeOf(m_best) < before);
        return m_best;
    }

private:
    // Whether the change keeps the failure; then it is kept.
    template <typename Change>
    bool Try(const Change& change)
    {
        Scenario candidate = m_best;
        change(candidate);
        candidate = Repaired(candidate);
        if (!(SizeOf(candidate) < SizeOf(m_best)) || !m_fails(candidate))
            return false;
        m_best = candidate;
        return true;
    }

    void DropFrames()
    {
        const auto with = [this](const std::vector<Frame>& frames)
        {
            Scenario candidate = m_best;
            candidate.frames = frames;
            return Repaired(candidate);
        };
        m_best = with(ShortestFailing(m_best.frames, [&](const std::vector<Frame>& frames)
                                      { return m_fails(with(frames)); }));
    }

    void DropRectangles()
    {
        for (std::size_t i = 0; i < m_best.frames.size(); ++i)
        {
            const auto fails = [&](const std::vector<Nib::RectF>& dirty)
            {
                Scenario candidate = m_best;
                candidate.frames[i].dirty = dirty;
                return m_fails(candidate);
            };
            m_best.frames[i].dirty = ShortestFailing(m_best.frames[i].dirty, fails);
        }
    }

    void SimplifyWindow()
    {
        Try([](Scenario& s) { s.rotation = 0; });
        Try([](Scenario& s) { s.panelRotation = 0; });
        Try([](Scenario& s) { s.lostIsZero = false; });
        Try([](Scenario& s) { s.damageIsAHint = false; });
        for (int Scenario::*field : {&Scenario::buffers, &Scenario::width, &Scenario::height})
        {
            while (m_best.*field > 1 && (Try([&](Scenario& s) { s.*field /= 2; }) ||
                                         Try([&](Scenario& s) { s.*field -= 1; })))
            {
            }
        }
    }

    void SimplifyAges()
    {
        for (std::size_t i = 0; i < m_best.frames.size(); ++i)
        {
            for (const int age : {1, 2, 3, 4, 5, 6, 0})
                Try([&](Scenario& s) { s.frames[i].age = age; });
        }
    }

    void SimplifyRectangles()
    {
        for (std::size_t i = 0; i < m_best.frames.size(); ++i)
        {
            for (std::size_t k = 0; k < m_best.frames[i].dirty.size(); ++k)
                SimplifyRectangle(i, k);
        }
    }

    void SimplifyRectangle(std::size_t frame, std::size_t index)
    {
        const auto rect = [&](Scenario& s) -> Nib::RectF& { return s.frames[frame].dirty[index]; };
        Try([&](Scenario& s) { rect(s) = Nib::RectF(0, 0, 1, 1); });
        for (float Nib::RectF::*edge :
             {&Nib::RectF::left, &Nib::RectF::top, &Nib::RectF::right, &Nib::RectF::bottom})
        {
            Try([&](Scenario& s) { rect(s).*edge = std::trunc(rect(s).*edge * 2) / 2; });
            Try([&](Scenario& s) { rect(s).*edge = std::trunc(rect(s).*edge); });
            while (Try([&](Scenario& s) { rect(s).*edge = std::trunc(rect(s).*edge / 2); }) ||
                   Try([&](Scenario& s) { rect(s).*edge -= std::copysign(1.0F, rect(s).*edge); }))
            {
            }
        }
    }

    Scenario m_best;
    const std::function<bool(const Scenario&)>& m_fails;
};

} // namespace

Scenario Shrunk(Scenario scenario, const std::function<bool(const Scenario&)>& fails)
{
    return Shrinker(std::move(scenario), fails).Run();
}

} // namespace Oracle
