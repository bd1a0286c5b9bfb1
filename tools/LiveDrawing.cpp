#include "LiveDrawing.h"

#include "FrontBuffer.h"
#include "InkSession.h"
#include "LiveSession.h"
#include "Recordings.h"
#include "RenderThreads.h"
#include "UserError.h"

#include <cstdio>
#include <memory>
#include <utility>

namespace
{

/// What the files hold, in page pixels.
Ink::Recording OpenPage(const DrawOptions& options, PageSize size)
{
    if (options.files.empty())
        return {};
    Ink::Recording recording = ReadRecordings(options.files);
    if (options.scale != "fit")
        return recording;
    const Ink::Placement placement = Ink::FitToPage(recording, size.width, size.height);
    for (std::vector<Ink::Stroke>* runs : {&recording.strokes, &recording.hovers})
        for (Ink::Stroke& run : *runs)
            for (Ink::Sample& sample : run)
            {
                sample.x = sample.x * placement.scale + placement.offsetX;
                sample.y = sample.y * placement.scale + placement.offsetY;
            }
    return recording;
}

void PrintStart(const PageFiles& files)
{
    std::printf("draw with mouse or pen; Ctrl-Z undoes, Ctrl-N clears, Ctrl-S saves %s and %s\n",
                files.picture.c_str(), files.ink.c_str());
    std::fflush(stdout);
}

} // namespace

void DrawUntilClosed(LiveWindow& window, LiveSession& session,
                     const std::function<void()>& beforeFrame)
{
    std::vector<LiveEvent> events;
    bool isOpen = true;
    while (isOpen)
    {
        isOpen = window.WaitForEvents(events);
        for (const LiveEvent& event : events)
            session.Handle(event);
        if (beforeFrame)
            beforeFrame();
        if (isOpen)
            session.ShowFrame();
    }
    session.Finish();
}

LiveDrawing::LiveDrawing(const DrawOptions& options)
    : m_options(options), m_size(ParseSize(options.size)),
      m_files(options.output.empty() ? FilesOfNow() : FilesFor(options.output)),
      m_style(StyleOf(options)), m_paper(ParseColourOption("--paper", options.paper)),
      m_document(OpenPage(options, m_size))
{
}

void LiveDrawing::Run()
{
    LiveWindow window("--live", "nib draw", m_size.width, m_size.height, m_document.EndTime());
    CheckEgl();
    const std::unique_ptr<Nib::RenderThreadGL> parent = StartSurfaceThread();
    std::unique_ptr<Nib::RenderThreadGL> child; // ended before its parent
    if (m_options.frontBuffer)
        child = FrontBufferThread(*parent);
    if (child && !child->Start())
        throw UserError("the render thread does not start");
    DrawOn(child ? *child : *parent, window);
}

void LiveDrawing::DrawOn(Nib::RenderThreadGL& thread, LiveWindow& window)
{
    Ink::InkSession ink(thread, m_size.width, m_size.height, m_paper);
    ink.AttachWindow(window.NativeWindow());
    LiveSession session(ink, m_size, std::move(m_document), m_style, m_files);
    session.ShowFrame(); // what was opened, or an empty page
    CheckDrawn(ink.Error());
    PrintStart(m_files);

    DrawUntilClosed(window, session);
    if (!m_options.output.empty())
        session.Save();
    CheckDrawn(ink.Error());
    std::printf("%s\n", Summary(session.WhatWasDone()).c_str());
    std::fflush(stdout);
    thread.OnSurfaceDestroyed();
}
