#ifndef NIB_TESTS_FAULTS_GUEST_LIFE_H
#define NIB_TESTS_FAULTS_GUEST_LIFE_H

#include "faults/Life.h"
#include "faults/UiThread.h"

#include <memory>

/// A life inside the frames of a UI's renderer: start, frames that are asked for by another thread and
/// by the UI's own, export, a pause in which the UI gets another context, the same again, the end.
class GuestLife : public Life
{
public:
    explicit GuestLife(SimDriver& driver);
    void Live() override;

private:
    void Settle() override { m_ui.WaitUntilIdle(); }
    void Draw(float shade);
    void DrawAndExport(float shade);
    void DrawInsideAFrame(float shade);
    void PauseAndResume();
    void End();

    UiThread m_ui;
    std::unique_ptr<Nib::RenderThreadHWUI> m_guest;
    DrawnThings m_things;
};

#endif
