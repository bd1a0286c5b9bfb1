// One render thread, and several threads that have work for it.

#include "PostTask.h"

#include <nib/nib.h>

#include <array>
#include <cstdio>
#include <memory>
#include <thread>
#include <vector>

namespace
{

// [canvas]
/// A picture of one pixel. Its GL objects live on the render thread alone; what other threads have
/// is this face, which posts.
class Canvas
{
public:
    explicit Canvas(Nib::RenderThreadGL& thread) : m_queue(*thread.GetMsgQueue())
    {
        Ink::Post(
            m_queue,
            [this]
            {
                Nib::TextureDescriptor descriptor;
                descriptor.width = descriptor.height = 1;
                m_texture.reset(Nib::RendererFactory::CreateTextureObject(descriptor, nullptr,
                                                                          nullptr, 0, nullptr));
                m_target.reset(Nib::RendererFactory::CreateOffscreenRenderTarget(m_texture.get()));
            });
    }

    ~Canvas() // any thread but the render thread: it waits
    {
        Ink::Post(m_queue,
                  [this]
                  {
                      m_target.reset(); // GL objects end where they were made
                      m_texture.reset();
                  });
        m_queue.waitForCompleting(); // the tasks above use this object
    }

    void Fill(float red) // any thread; returns at once
    {
        Ink::Post(m_queue,
                  [this, red]
                  {
                      m_target->ClearColor(red, 0.0f, 0.0f, 1.0f);
                      ++m_fills; // no lock: tasks run one at a time
                  });
    }

    struct Result
    {
        int fills = 0;
        std::array<unsigned char, 4> pixel{};
    };

    Result Read() // any thread but the render thread; waits for what was posted before
    {
        Result result;
        Ink::Post(m_queue,
                  [this, &result]
                  {
                      result.fills = m_fills;
                      Nib::IRenderTarget::BufferDescriptor buffer;
                      buffer.pixels = result.pixel.data();
                      m_target->ReadPixels(0, 0, 1, 1, buffer);
                  });
        m_queue.waitForCompleting();
        return result;
    }

private:
    Nib::IGLMsgQueue& m_queue;
    Ink::Owned<Nib::ITextureObject> m_texture; // from here on: the render thread's
    Ink::Owned<Nib::IOffscreenRenderTarget> m_target;
    int m_fills = 0;
};
// [canvas]

} // namespace

int main()
{
    const std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::RendererFactory::CreateSurfaceRenderer("canvas", Nib::RenderThreadGL::Medium));
    thread->Start();
    // [use]
    Canvas canvas(*thread);
    std::vector<std::thread> painters(4);
    for (std::thread& painter : painters)
        painter = std::thread(
            [&canvas]
            {
                for (int fill = 0; fill < 100; ++fill)
                    canvas.Fill(0.5f);
            });
    for (std::thread& painter : painters)
        painter.join();
    canvas.Fill(1.0f); // behind all of theirs: they were posted before

    const Canvas::Result result = canvas.Read();
    std::printf("%d fills, the last one red: %d\n", result.fills, result.pixel[0]);
    // [use]
    return result.fills == 401 && result.pixel[0] == 255 ? 0 : 1;
}
