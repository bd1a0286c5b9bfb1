#ifndef INK_INK_DOCUMENT_H
#define INK_INK_DOCUMENT_H

#include "Recording.h"

#include <optional>
#include <vector>

namespace Ink
{

/// What a user has written on one page, and the way back. Used on one thread.
class InkDocument
{
public:
    InkDocument() = default;

    /// Goes on from @p opened, which is no step of the user's: Undo does not take it away.
    explicit InkDocument(Recording opened);

    void Begin(const Sample& sample); ///< the pen comes down; an unfinished stroke ends before
    void Add(const Sample& sample); ///< the pen moves on; nothing unless a stroke is being written
    void End();                     ///< the pen goes up
    bool IsWriting() const { return m_isWriting; }

    /// Takes the last step back: a stroke, also the one that is being written, or a Clear. False
    /// when there is none.
    bool Undo();

    /// Takes every stroke off the page, also the one that is being written. False when there is
    /// none.
    bool Clear();

    /// The strokes on the page in their order; the one that is being written is the last.
    const std::vector<Stroke>& Strokes() const { return m_recording.strokes; }

    /// The page as a recording; what hovered in the opened one is kept.
    const Recording& AsRecording() const { return m_recording; }

    /// When the last sample was made, or zero; a new one must not be older.
    double EndTime() const;

private:
    /// What Undo puts back: the strokes that a Clear took, or nothing for a stroke, which it takes.
    using Step = std::optional<std::vector<Stroke>>;

    Recording m_recording;
    std::vector<Step> m_steps;
    bool m_isWriting = false;
};

} // namespace Ink

#endif
