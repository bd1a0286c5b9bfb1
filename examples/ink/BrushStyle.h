#ifndef INK_BRUSH_STYLE_H
#define INK_BRUSH_STYLE_H

#include "Colour.h"
#include "PenPoint.h"
#include "Placement.h"
#include "Recording.h"

#include <optional>
#include <string_view>

namespace Ink
{

/// What a stroke is painted with.
enum class BrushKind
{
    Pen,    ///< a line as wide as the pen presses
    Marker, ///< a translucent line of one width; where a stroke crosses itself it stays as light
    Stamp,  ///< textured dabs, of a size and strength that pressure gives, leaning as the pen does
};

/// How a brush paints.
struct BrushStyle
{
    BrushKind kind = BrushKind::Pen;
    Colour colour{0.09f, 0.13f, 0.33f, 1.0f}; ///< a marker lets half of what it covers through
    float width = 6.0f;                       ///< page pixels at full pressure
};

/// The kind that @p name ("pen", "marker", "stamp") means.
std::optional<BrushKind> BrushNamed(std::string_view name);

/// The colour and width that a brush has unless it is told others.
BrushStyle DefaultStyle(BrushKind kind);

/// The colour that a single coat of the brush lays onto the page.
Colour CoatOf(const BrushStyle& style);

/// Where @p sample falls on the page, and how the brush touches the page there.
PenPoint ToPage(const Sample& sample, const Placement& placement, const BrushStyle& style);

} // namespace Ink

#endif
