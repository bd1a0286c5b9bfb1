// Pause and resume: objects come back with the new context, contents are the owner's to bring back.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <GLES2/gl2.h>
#include <memory>

namespace
{

// [page]
/// A page of one pixel that outlives its context. Used in tasks.
class Page
{
public:
    Page()
    {
        Nib::TextureDescriptor descriptor;
        descriptor.width = descriptor.height = 1;
        m_texture.reset(
            Nib::RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr));
        Resume();
    }

    void Suspend() { m_target.reset(); } // a render target does not come back

    void Resume()
    {
        m_texture->Update(m_ink, 0); // the texture is back, and empty
        m_target.reset(Nib::RendererFactory::CreateOffscreenRenderTarget(m_texture.get()));
    }

    void Read(unsigned char* pixel)
    {
        Nib::IRenderTarget::BufferDescriptor buffer;
        buffer.pixels = pixel;
        m_target->ReadPixels(0, 0, 1, 1, buffer);
    }

private:
    const unsigned char m_ink[4] = {0, 0, 255, 255}; // what the page is drawn from
    Ink::Owned<Nib::ITextureObject> m_texture;
    Ink::Owned<Nib::IOffscreenRenderTarget> m_target;
};
// [page]

// [own]
/// A GL name of the application's own, made in the context that is current.
class OwnBuffer : public Nib::ManagedObject
{
public:
    OwnBuffer()
    {
        glGenBuffers(1, &m_name);
        Register(); // with the render thread that this runs on
    }
    ~OwnBuffer() override { glDeleteBuffers(1, &m_name); }

    void ReleaseGLObject() override // the context is about to end
    {
        glDeleteBuffers(1, &m_name);
        m_name = 0;
    }
    void RestoreGLObject() override // the next one is current
    {
        glGenBuffers(1, &m_name);
        ++m_restores;
    }

    int Restores() const { return m_restores; }

private:
    GLuint m_name = 0;
    int m_restores = 0;
};
// [own]

} // namespace

int main()
{
    using namespace Nib;
    const std::unique_ptr<RenderThreadGL> parent(
        RendererFactory::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    parent->Start();
    unsigned char pixel[4] = {};
    int restores = 0;
    // [pause]
    // Managed: its objects take part in pause and resume. Deleted before its parent.
    const std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateOffscreenRenderer(parent->GetMsgQueue(), "page", true));
    thread->Start();
    IGLMsgQueue& queue = *thread->GetMsgQueue();

    std::unique_ptr<Page> page;
    std::unique_ptr<OwnBuffer> buffer;
    Ink::Post(queue, [&] { page = std::make_unique<Page>(); });
    Ink::Post(queue, [&] { buffer = std::make_unique<OwnBuffer>(); });

    Ink::Post(queue, [&] { page->Suspend(); });
    thread->OnPause();         // behind all tasks: names are released, the context ends
    thread->OnResume();        // may return before the new context is there
    queue.waitForCompleting(); // now it is, and the names are back
    Ink::Post(queue, [&] { page->Resume(); });
    // [pause]

    Ink::Post(queue, [&] { page->Read(pixel); });
    Ink::Post(queue, [&] { restores = buffer->Restores(); });
    Ink::Post(queue, [&] { page.reset(); }); // on the thread that made them
    Ink::Post(queue, [&] { buffer.reset(); });
    queue.waitForCompleting();
    std::printf("pixel %d %d %d %d, own name restored %d time\n", pixel[0], pixel[1], pixel[2],
                pixel[3], restores);
    return pixel[2] == 255 && pixel[0] == 0 && restores == 1 ? 0 : 1;
}
