#ifndef NIB_TESTS_PICTURES_INK_SCENE_H
#define NIB_TESTS_PICTURES_INK_SCENE_H

#include "pictures/ReferencePen.h"

#include "BrushStyle.h"
#include "Recording.h"
#include "tool/Picture.h"

#include <string>

/// A recording, and the page and brush that it is drawn with.
struct InkScene
{
    Ink::Recording recording;
    Ink::BrushStyle style;
    Ink::Colour paper{1.0f, 1.0f, 1.0f, 1.0f};
    Ink::Placement placement;
    int width = 0;
    int height = 0;
};

/// What the library paints on the driver of the process. A failure is an exception.
Picture Painted(const InkScene& scene);

/// What the pen is to cover, from the rule.
Reference::Coverage ExpectedCoverage(const InkScene& scene);

/// The scene named @p name, drawn with black pen on white paper: see InkScene.cpp for the names.
/// Empty strokes when a recording is not there, because NIB_STROKES is unset.
InkScene SceneNamed(const std::string& name);

#endif
