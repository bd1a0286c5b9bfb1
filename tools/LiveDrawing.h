#ifndef NIB_TOOLS_LIVE_DRAWING_H
#define NIB_TOOLS_LIVE_DRAWING_H

#include "BrushStyle.h"
#include "DrawOptions.h"
#include "InkDocument.h"
#include "LiveWindow.h"
#include "PageFiles.h"

#include <nib/nib.h>

#include <functional>

class LiveSession;

/// Hands @p session what the user does in @p window, and shows it frame by frame, until the window
/// is closed. @p beforeFrame is called before each frame; it may be null.
void DrawUntilClosed(LiveWindow& window, LiveSession& session,
                     const std::function<void()>& beforeFrame = nullptr);

/// One run of `nib draw --live`. Throws UserError and Ink::ReadError.
class LiveDrawing
{
public:
    explicit LiveDrawing(const DrawOptions& options); ///< reads the files
    void Run();

private:
    void DrawOn(Nib::RenderThreadGL& thread, LiveWindow& window);

    const DrawOptions& m_options;
    PageSize m_size;
    PageFiles m_files;
    Ink::BrushStyle m_style;
    Ink::Colour m_paper;
    Ink::InkDocument m_document;
};

#endif
