#ifndef NIB_TESTS_SOAK_FAMILY_H
#define NIB_TESTS_SOAK_FAMILY_H

#include "Random.h"
#include "Window.h"
#include "World.h"

#include "InkSession.h"

#include <nib/nib.h>

#include <memory>
#include <vector>

namespace Soak
{

/// What one application thread has: a render thread with a sketch, which may be shown in a window,
/// and offscreen render threads that share its objects. Used on that thread alone.
class Family
{
public:
    static constexpr int kMostChildren = 2;

    explicit Family(World& world);
    ~Family();
    Family(const Family&) = delete;
    Family& operator=(const Family&) = delete;

    World& Shared() { return m_world; }

    Nib::RenderThreadGL& Main() { return *m_main; }
    /// The main one or one of its children.
    Nib::RenderThreadGL& SomeThread(Random& random);
    /// One of the children; there is one afterwards.
    Nib::RenderThreadGL& SomeChild(Random& random);

    int Children() const { return static_cast<int>(m_children.size()); }
    void AddChild();
    void RemoveChild(Random& random);

    Ink::InkSession& Sketch() { return *m_sketch; }
    int Width() const { return m_width; } ///< of the sketch and the window
    int Height() const { return m_height; }

    bool HasWindow() const { return m_window != nullptr; }
    void OpenWindow(int width, int height);
    void ResizeWindow(int width, int height);
    void CloseWindow();

    /// Begins an empty sketch. It is shown where there is a window.
    void NewSketch(int width, int height);

private:
    World& m_world;
    std::unique_ptr<Window> m_window;
    std::unique_ptr<Nib::RenderThreadGL> m_main;
    std::unique_ptr<Ink::InkSession> m_sketch;
    std::vector<std::unique_ptr<Nib::RenderThreadGL>> m_children;
    int m_width = 0;
    int m_height = 0;
};

} // namespace Soak

#endif
