#include "latency/PenProcess.h"

#include "FrontBuffer.h"
#include "InkSession.h"
#include "LiveDrawing.h"
#include "LiveSession.h"
#include "LiveWindow.h"
#include "RenderThreads.h"
#include "UserError.h"

#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <memory>
#include <sys/wait.h>
#include <unistd.h>

namespace
{

// The first word of an answer.
constexpr char kReady[] = "ready ";
constexpr char kCannot[] = "cannot ";
constexpr char kFailed[] = "failed ";
constexpr char kDone[] = "done ";

void Answer(int answers, const std::string& line)
{
    const std::string text = line + "\n";
    if (write(answers, text.data(), text.size()) < 0)
        std::exit(1); // nobody is listening any more
}

/// What a session has drawn, as a share of all that its frames show.
double RedrawnShare(Ink::InkSession& ink, LiveSession& session, long long before, PageSize size)
{
    const int frames = session.WhatWasDone().frames - 1; // the empty page is not counted
    if (frames <= 0)
        return 0.0;
    return static_cast<double>(ink.Figures().redrawnPixels - before) / frames / size.width /
           size.height;
}

void DrawOn(Nib::RenderThreadGL& thread, LiveWindow& window, PenPath path, PageSize size,
            int answers)
{
    Ink::InkSession ink(thread, size.width, size.height, {1.0f, 1.0f, 1.0f, 1.0f});
    ink.AttachWindow(window.NativeWindow());
    LiveSession session(ink, size, Ink::InkDocument(), Ink::BrushStyle(), PageFiles());
    session.ShowFrame();
    CheckDrawn(ink.Error());
    const long long before = ink.Figures().redrawnPixels;
    Answer(answers, kReady + std::to_string(reinterpret_cast<std::size_t>(window.NativeWindow())));
    DrawUntilClosed(window, session,
                    [&ink, path]
                    {
                        if (path == PenPath::PlainSwap)
                            ink.Invalidate();
                    });
    CheckDrawn(ink.Error());
    Answer(answers, kDone + std::to_string(RedrawnShare(ink, session, before, size)));
    thread.OnSurfaceDestroyed();
}

void Draw(PenPath path, PageSize size, int answers)
{
    LiveWindow window("latency", "nib latency", size.width, size.height, 0.0);
    CheckEgl();
    const std::unique_ptr<Nib::RenderThreadGL> parent = StartSurfaceThread();
    if (path != PenPath::FrontBuffer)
        return DrawOn(*parent, window, path, size, answers);
    const std::string obstacle = FrontBufferObstacle();
    if (!obstacle.empty())
        return Answer(answers, kCannot + obstacle);
    const std::unique_ptr<Nib::RenderThreadGL> front = FrontBufferThread(*parent);
    if (!front || !front->Start())
        throw UserError("the render thread does not start");
    DrawOn(*front, window, path, size, answers);
}

[[noreturn]] void RunPen(PenPath path, PageSize size, int answers)
{
    try
    {
        Draw(path, size, answers);
    }
    catch (const std::exception& failure)
    {
        Answer(answers, kFailed + std::string(failure.what()));
        std::exit(1);
    }
    std::exit(0);
}

/// The rest of @p line behind @p word; throws what a failed process says, else that it ended.
std::string Expect(const char* word, const std::string& line)
{
    const std::string start = word;
    if (line.compare(0, start.size(), start) == 0)
        return line.substr(start.size());
    const std::string failed = kFailed;
    if (line.compare(0, failed.size(), failed) == 0)
        throw UserError(line.substr(failed.size()));
    throw UserError("latency: the drawing process ended");
}

} // namespace

PenProcess::PenProcess(PenPath path, PageSize size)
{
    int ends[2];
    if (pipe(ends) != 0)
        throw UserError("latency: no pipe to a process that draws");
    std::fflush(nullptr); // the other process must not print it again
    m_process = fork();
    if (m_process == 0)
    {
        close(ends[0]);
        RunPen(path, size, ends[1]);
    }
    close(ends[1]);
    m_answers = ends[0];
    if (m_process < 0)
        throw UserError("latency: no process that draws");
    const std::string line = ReadLine();
    if (line.rfind(kCannot, 0) == 0)
        m_obstacle = Expect(kCannot, line);
    else
        m_window = std::stoul(Expect(kReady, line));
}

PenProcess::~PenProcess()
{
    close(m_answers);
    if (m_process > 0)
    {
        kill(m_process, SIGKILL);
        waitpid(m_process, nullptr, 0);
    }
}

double PenProcess::Finish()
{
    const double redrawn = std::stod(Expect(kDone, ReadLine()));
    waitpid(m_process, nullptr, 0);
    m_process = -1;
    return redrawn;
}

std::string PenProcess::ReadLine()
{
    std::string line;
    for (char next = 0; read(m_answers, &next, 1) == 1 && next != '\n';)
        line += next;
    return line;
}
