#ifndef NIB_TESTS_FAULTS_DRAWING_LIFE_H
#define NIB_TESTS_FAULTS_DRAWING_LIFE_H

#include "faults/Life.h"
#include "sim/SimDriver.h"

#include <memory>

/// A life with windows: start, window, frames with partial update, an offscreen child that is
/// paused, resumed and exports, another window, a second window that is drawn in its front buffer,
/// the end.
class DrawingLife : public Life
{
public:
    explicit DrawingLife(SimDriver& driver) : m_driver(driver) {}
    void Live() override;

private:
    void ShowWindow(int width, int height);
    void DrawFrame(float shade, const Nib::RectF& changed);
    void StartChild();
    void PauseAndResumeChild();
    void StartFront();
    void DrawInFront(float shade);
    void End();

    SimDriver& m_driver;
    std::unique_ptr<Nib::RenderThreadGL> m_surface;
    std::unique_ptr<Nib::RenderThreadGL> m_child;
    std::unique_ptr<Nib::RenderThreadGL> m_front;
    DrawnThings m_onScreen;
    DrawnThings m_offScreen;
    DrawnThings m_inFront;
    int m_width = 0;
    int m_height = 0;
};

#endif
