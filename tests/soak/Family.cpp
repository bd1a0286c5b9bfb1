#include "Family.h"

#include "Failure.h"

namespace Soak
{

namespace
{

using Nib::RendererFactory;
using Nib::RenderThreadGL;

constexpr int kFirstWidth = 200;
constexpr int kFirstHeight = 150;

std::unique_ptr<RenderThreadGL> Started(RenderThreadGL* made)
{
    std::unique_ptr<RenderThreadGL> thread(made);
    Require(thread->Start(), "a render thread does not start");
    return thread;
}

} // namespace

Family::Family(World& world)
    : m_world(world),
      m_main(Started(RendererFactory::CreateSurfaceRenderer("soak", RenderThreadGL::Medium)))
{
    NewSketch(kFirstWidth, kFirstHeight);
}

Family::~Family()
{
    m_children.clear(); // before the thread whose objects they share
    m_sketch.reset();
    if (m_window)
        CloseWindow();
}

RenderThreadGL& Family::SomeThread(Random& random)
{
    const int index = random.Below(Children() + 1);
    return index == 0 ? *m_main : *m_children[static_cast<std::size_t>(index - 1)];
}

RenderThreadGL& Family::SomeChild(Random& random)
{
    if (m_children.empty())
        AddChild();
    return *m_children[static_cast<std::size_t>(random.Below(Children()))];
}

void Family::AddChild()
{
    m_children.push_back(Started(
        RendererFactory::CreateOffscreenRenderer(m_main->GetMsgQueue(), "soak child", true)));
}

void Family::RemoveChild(Random& random)
{
    m_children.erase(m_children.begin() + random.Below(Children()));
}

void Family::OpenWindow(int width, int height)
{
    m_window = std::make_unique<Window>(width, height);
    NewSketch(width, height);
}

void Family::ResizeWindow(int width, int height)
{
    m_window->Resize(width, height);
    NewSketch(width, height);
}

void Family::CloseWindow()
{
    m_main->OnSurfaceDestroyed();
    m_window.reset();
}

void Family::NewSketch(int width, int height)
{
    m_width = width;
    m_height = height;
    m_sketch.reset(); // the new one may need its memory
    m_sketch = std::make_unique<Ink::InkSession>(*m_main, width, height, kPaper);
    if (m_window)
        m_sketch->AttachWindow(m_window->Native());
}

} // namespace Soak
