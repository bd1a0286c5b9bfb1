#ifndef NIB_TESTS_FAULTS_LIFE_H
#define NIB_TESTS_FAULTS_LIFE_H

#include "faults/DrawnThings.h"

#include <nib/nib.h>

#include <functional>
#include <mutex>
#include <string>
#include <vector>

/// Something that a driver is used for from start to end, so that the calls come in the same order
/// each time: every step waits for its threads.
///
/// The application in it is careful: it draws only where there is a context, and catches what the
/// library throws. It notes both.
class Life
{
public:
    virtual ~Life() = default;
    virtual void Live() = 0;

    /// What the application was told by the library, other than by its log: exceptions, missing
    /// contexts, null and false results.
    std::vector<std::string> Notes() const;

protected:
    void OnThread(Nib::RenderThreadGL& thread, std::function<void()> work);
    void EndOnThread(Nib::RenderThreadGL& thread, DrawnThings& things);
    void ExportOnThread(Nib::RenderThreadGL& thread, DrawnThings& things, float shade);
    void Note(const std::string& text);

private:
    void PostAndWait(Nib::RenderThreadGL& thread, std::function<void()> work);
    /// Waits for what goes on behind the end of a task.
    virtual void Settle() {}

    mutable std::mutex m_lock;
    std::vector<std::string> m_notes;
};

#endif
