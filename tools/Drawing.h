#ifndef NIB_TOOLS_DRAWING_H
#define NIB_TOOLS_DRAWING_H

#include "BrushStyle.h"
#include "DrawOptions.h"
#include "Figures.h"
#include "InkSession.h"
#include "Recording.h"
#include "XWindow.h"

#include <nib/nib.h>

#include <memory>

/// One run of `nib draw`. Throws UserError and Ink::ReadError.
class Drawing
{
public:
    explicit Drawing(const DrawOptions& options); ///< reads the files
    void Run();

private:
    void DrawOn(Nib::RenderThreadGL& thread, Nib::RenderThreadGL& parent, XWindow* window) const;
    bool ShowsFrames() const;
    Figures Play(Ink::InkSession& session, XWindow* window) const;

    const DrawOptions& m_options;
    PageSize m_size;
    double m_speed;
    int m_loseContextEvery;
    Ink::BrushStyle m_style;
    Ink::Colour m_paper;
    Ink::Recording m_recording;
    Ink::Placement m_placement;
};

#endif
