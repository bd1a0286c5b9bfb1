#include "InkDocument.h"

#include <algorithm>
#include <utility>

namespace Ink
{

InkDocument::InkDocument(Recording opened) : m_recording(std::move(opened)) {}

void InkDocument::Begin(const Sample& sample)
{
    m_recording.strokes.push_back({sample});
    m_steps.emplace_back();
    m_isWriting = true;
}

void InkDocument::Add(const Sample& sample)
{
    if (m_isWriting)
        m_recording.strokes.back().push_back(sample);
}

void InkDocument::End()
{
    m_isWriting = false;
}

bool InkDocument::Undo()
{
    if (m_steps.empty())
        return false;
    if (Step& step = m_steps.back())
        m_recording.strokes = std::move(*step);
    else
        m_recording.strokes.pop_back();
    m_steps.pop_back();
    m_isWriting = false;
    return true;
}

bool InkDocument::Clear()
{
    if (m_recording.strokes.empty())
        return false;
    m_steps.emplace_back(std::exchange(m_recording.strokes, {}));
    m_isWriting = false;
    return true;
}

double InkDocument::EndTime() const
{
    double end = 0.0;
    for (const std::vector<Stroke>* runs : {&m_recording.strokes, &m_recording.hovers})
        for (const Stroke& run : *runs)
            end = std::max(end, run.back().time);
    return end;
}

} // namespace Ink
