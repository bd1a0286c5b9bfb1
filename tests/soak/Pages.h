#ifndef NIB_TESTS_SOAK_PAGES_H
#define NIB_TESTS_SOAK_PAGES_H

#include "InkSession.h"
#include "Random.h"

#include <nib/nib.h>

#include <atomic>
#include <cstdint>
#include <functional>
#include <vector>

namespace Soak
{

inline constexpr int kPageWidth = 160;
inline constexpr int kPageHeight = 120;
inline constexpr Ink::Colour kPaper{1.0f, 1.0f, 1.0f, 1.0f};

/// Draws a stroke that @p random makes up into @p session, in several pieces. @p afterPiece is
/// called behind each; it may be null.
void DrawStroke(Ink::InkSession& session, Random& random, int width, int height,
                const std::function<void()>& afterPiece);

/// Some pages, what each looks like when nothing else happens, and the count of those drawn since.
/// After MakeReferences, for every thread.
class Pages
{
public:
    static constexpr int kCount = 12;

    /// Draws every page once on @p thread. Throws Failure when one is empty or equals another.
    void MakeReferences(Nib::RenderThreadGL& thread);

    /// Draws page @p page into @p session, which has a page's size, and compares what is read back.
    /// Throws Failure.
    void Draw(int page, Ink::InkSession& session, const std::function<void()>& afterPiece);

    int Drawn() const { return m_drawn.load(std::memory_order_relaxed); }

private:
    using Pixels = std::vector<std::uint8_t>;

    /// Draws the strokes of page @p page, on every driver with the same roundings.
    void DrawStrokes(int page, Ink::InkSession& session, const std::function<void()>& afterPiece);

    bool m_roundsLate =
        false; ///< the driver keeps pixels exact until they are read or their target goes
    std::vector<Pixels> m_references;
    std::atomic<int> m_drawn{0};
};

} // namespace Soak

#endif
