#include "LiveSession.h"

#include "InkMlWriter.h"
#include "PngFile.h"
#include "Program.h"
#include "RenderThreads.h"
#include "ReplacementFile.h"
#include "Replay.h"
#include "UserError.h"

#include <chrono>
#include <cstdio>
#include <utility>

namespace
{

using Clock = std::chrono::steady_clock;

} // namespace

LiveSession::LiveSession(Ink::InkSession& ink, PageSize size, Ink::InkDocument document,
                         const Ink::BrushStyle& style, const PageFiles& files)
    : m_ink(ink), m_size(size), m_document(std::move(document)), m_style(style), m_files(files),
      m_stroke(style)
{
}

// ---- what the user does -------------------------------------------------------------------------

void LiveSession::Handle(const LiveEvent& event)
{
    using Kind = LiveEvent::Kind;
    switch (event.kind)
    {
    case Kind::PenDown:
    case Kind::PenMove:
    case Kind::PenUp: Write(event); break;
    case Kind::Undo:
        if (m_document.Undo())
            NoteStep();
        break;
    case Kind::Clear:
        if (m_document.Clear())
            NoteStep();
        break;
    case Kind::Save: SaveOnRequest(); break;
    case Kind::Resize:
        m_size = {event.width, event.height};
        m_isResizeDue = true;
        m_isSaved = false; // the picture is of the window's size
        break;
    case Kind::Uncovered:
        m_ink.Invalidate();
        m_isFrameDue = true;
        break;
    }
}

void LiveSession::Write(const LiveEvent& event)
{
    using Kind = LiveEvent::Kind;
    if (event.kind == Kind::PenDown)
    {
        if (m_document.IsWriting())
            Finish();
        DrawPending();
        m_document.Begin(event.sample);
        m_stroke = Ink::InkStroke(m_style);
    }
    else if (!m_document.IsWriting())
        return; // the rest of a stroke that was undone
    else
        m_document.Add(event.sample);
    m_isSaved = false;
    Add(event.sample);
    if (event.kind == Kind::PenUp)
        Finish();
}

void LiveSession::NoteStep()
{
    m_isRedrawDue = true;
    m_isSaved = false;
}

void LiveSession::Finish()
{
    if (!m_document.IsWriting())
        return;
    m_document.End();
    m_stroke.End();
}

// ---- a frame ------------------------------------------------------------------------------------

void LiveSession::ShowFrame()
{
    const Clock::time_point start = Clock::now();
    DrawPending();
    if (!std::exchange(m_isFrameDue, false))
        return;
    m_ink.Present();
    const std::chrono::duration<float, std::milli> time = Clock::now() - start;
    m_frameTimes.push_back(time.count());
}

/// Brings the page up to date with the document.
void LiveSession::DrawPending()
{
    if (std::exchange(m_isResizeDue, false))
    {
        m_ink.Resize(m_size.width, m_size.height);
        m_isRedrawDue = true;
    }
    if (std::exchange(m_isRedrawDue, false))
        Redraw();
    Paint();
}

void LiveSession::Redraw()
{
    m_ink.Clear();
    m_isFrameDue = true;
    m_stroke = Ink::InkStroke(m_style);
    for (const Ink::Stroke& stroke : m_document.Strokes())
    {
        m_stroke = Ink::InkStroke(m_style);
        for (const Ink::Sample& sample : stroke)
            Add(sample);
        if (!m_document.IsWriting() || &stroke != &m_document.Strokes().back())
            m_stroke.End();
        Paint();
    }
}

void LiveSession::Add(const Ink::Sample& sample)
{
    m_stroke.Add(Ink::ToPage(sample, Ink::Placement(), m_style));
}

/// Puts onto the page what the stroke has gained.
void LiveSession::Paint()
{
    Ink::InkPiece piece = m_stroke.Take();
    if (piece.IsEmpty())
        return;
    m_ink.Draw(std::move(piece));
    m_isFrameDue = true;
}

// ---- saving -------------------------------------------------------------------------------------

/// A save that fails costs nobody the page.
void LiveSession::SaveOnRequest()
{
    try
    {
        Save();
    }
    catch (const UserError& failure)
    {
        std::fprintf(stderr, "nib: %s\n", failure.what());
    }
}

void LiveSession::Save()
{
    if (m_isSaved)
        return;
    DrawPending();
    const std::vector<std::uint8_t> pixels = m_ink.ReadPixels();
    CheckDrawn(m_ink.Error());
    WritePng(m_files.picture, pixels, m_size.width, m_size.height);
    WriteTextFile(m_files.ink, Ink::ToInkMl(m_document.AsRecording()));
    m_isSaved = true;
    std::printf("saved %s and %s\n", m_files.picture.c_str(), m_files.ink.c_str());
    std::fflush(stdout);
}

Figures LiveSession::WhatWasDone()
{
    Figures figures;
    figures.strokes = static_cast<int>(m_document.Strokes().size());
    figures.samples = SampleCount(m_document.AsRecording());
    figures.frames = static_cast<int>(m_frameTimes.size());
    figures.frameTimes = m_frameTimes;
    figures.tasks = m_ink.Figures().tasks;
    figures.programs = Ink::Program::Counts();
    return figures;
}
