#include "Pages.h"

#include "Batch.h"
#include "Failure.h"

#include "InkStroke.h"

#include <GLES3/gl3.h>

#include <algorithm>
#include <string>
#include <utility>

namespace Soak
{

namespace
{

constexpr int kStrokesOfPage = 5;

Ink::Colour SomeColour(Random& random)
{
    const auto part = [&random] { return static_cast<float>(random.Below(256)) / 255.0f; };
    const float red = part();
    const float green = part();
    return {red, green, part(), random.OneIn(3) ? 0.5f : 1.0f};
}

Ink::BrushKind SomeKind(Random& random)
{
    constexpr Ink::BrushKind kKinds[] = {Ink::BrushKind::Pen, Ink::BrushKind::Marker,
                                         Ink::BrushKind::Stamp};
    return kKinds[random.Below(3)];
}

Ink::PenPoint SomePoint(Random& random, int width, int height)
{
    const auto x = static_cast<float>(random.Below(width));
    const auto y = static_cast<float>(random.Below(height));
    return {x, y, 0.5f * static_cast<float>(random.Between(2, 20))};
}

/// softpipe blends in the pixels of a tile as it has computed them, and rounds them to bytes when the
/// tile is written back: whoever saves a page in between gets another last bit.
bool RoundsLate(Nib::RenderThreadGL& thread)
{
    std::string driver;
    Batch batch;
    batch.Post(thread,
               [&driver] { driver = reinterpret_cast<const char*>(glGetString(GL_RENDERER)); });
    batch.Finish();
    return driver == "softpipe";
}

void RequireNoError(Ink::InkSession& session)
{
    const std::string error = session.Error();
    Require(error.empty(), "drawing failed: " + error);
}

} // namespace

void DrawStroke(Ink::InkSession& session, Random& random, int width, int height,
                const std::function<void()>& afterPiece)
{
    Ink::BrushStyle style = Ink::DefaultStyle(SomeKind(random));
    style.colour = SomeColour(random);
    const int points = random.Between(1, 12);
    Ink::InkStroke stroke(style);
    for (int i = 0; i < points; ++i)
    {
        stroke.Add(SomePoint(random, width, height));
        if (i + 1 == points)
            stroke.End();
        session.Draw(stroke.Take());
        if (afterPiece)
            afterPiece();
    }
}

void Pages::DrawStrokes(int page, Ink::InkSession& session, const std::function<void()>& afterPiece)
{
    const auto behindPiece = [&]
    {
        if (m_roundsLate)
            session.ReadPixels(); // so that a lost context, which reads them too, changes nothing
        if (afterPiece)
            afterPiece();
    };
    Random random(static_cast<std::uint64_t>(page));
    for (int i = 0; i < kStrokesOfPage; ++i)
        DrawStroke(session, random, kPageWidth, kPageHeight, behindPiece);
}

void Pages::MakeReferences(Nib::RenderThreadGL& thread)
{
    m_roundsLate = RoundsLate(thread);
    for (int page = 0; page < kCount; ++page)
    {
        Ink::InkSession session(thread, kPageWidth, kPageHeight, kPaper);
        const Pixels empty = session.ReadPixels();
        DrawStrokes(page, session, nullptr);
        Pixels pixels = session.ReadPixels();
        RequireNoError(session);
        Require(pixels != empty, "a reference page is empty");
        Require(std::find(m_references.begin(), m_references.end(), pixels) == m_references.end(),
                "two reference pages are the same");
        m_references.push_back(std::move(pixels));
    }
}

void Pages::Draw(int page, Ink::InkSession& session, const std::function<void()>& afterPiece)
{
    DrawStrokes(page, session, afterPiece);
    const Pixels pixels = session.ReadPixels();
    RequireNoError(session);
    m_drawn.fetch_add(1, std::memory_order_relaxed);
    const Pixels& reference = m_references[static_cast<std::size_t>(page)];
    const auto differs =
        std::mismatch(pixels.begin(), pixels.end(), reference.begin(), reference.end()).first;
    Require(pixels == reference, "page " + std::to_string(page) +
                                     " differs from its reference from byte " +
                                     std::to_string(differs - pixels.begin()) + " on");
}

} // namespace Soak
