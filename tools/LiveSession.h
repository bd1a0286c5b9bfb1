#ifndef NIB_TOOLS_LIVE_SESSION_H
#define NIB_TOOLS_LIVE_SESSION_H

#include "BrushStyle.h"
#include "DrawOptions.h"
#include "Figures.h"
#include "InkDocument.h"
#include "InkSession.h"
#include "InkStroke.h"
#include "LiveEvent.h"
#include "PageFiles.h"

/// A page that is written on: every sample goes into the document at once and becomes ink with the
/// next frame, all that came in before it together. Used on one thread, the window's.
class LiveSession
{
public:
    /// Page and document lie on one another, pixel by pixel. @p ink outlives this.
    LiveSession(Ink::InkSession& ink, PageSize size, Ink::InkDocument document,
                const Ink::BrushStyle& style, const PageFiles& files);

    void Handle(const LiveEvent& event);

    /// Shows what was handled since the last frame, if it changes the page. [blocks] until the
    /// frame is presented.
    void ShowFrame();

    /// The window is gone: what is being written ends here, and is not shown any more.
    void Finish();

    /// Writes both files, unless they hold the page already. [blocks] Throws UserError.
    void Save();

    /// What was done, with the strokes and samples that the page holds now. [blocks]
    Figures WhatWasDone();

private:
    void Write(const LiveEvent& event);
    void NoteStep();
    void SaveOnRequest();
    void DrawPending();
    void Redraw();
    void Paint();
    void Add(const Ink::Sample& sample);

    Ink::InkSession& m_ink;
    PageSize m_size;
    Ink::InkDocument m_document;
    Ink::BrushStyle m_style;
    PageFiles m_files;
    Ink::InkStroke m_stroke;   ///< the last one of the document
    bool m_isRedrawDue = true; ///< the page does not hold the document
    bool m_isResizeDue = false;
    bool m_isFrameDue = true;
    bool m_isSaved = false;
    std::vector<float> m_frameTimes; ///< milliseconds
};

#endif
