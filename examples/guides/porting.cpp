// GL code that was written for a context of its own, moved onto a render thread.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <GLES2/gl2.h>
#include <memory>

namespace
{

// [old]
/// What the application has always drawn: GL calls, and nothing that knows where it runs.
class OldScene
{
public:
    explicit OldScene(unsigned char* pixel) : m_pixel(pixel)
    {
        glGenTextures(1, &m_texture);
        glGenFramebuffers(1, &m_framebuffer);
        glBindTexture(GL_TEXTURE_2D, m_texture);
        glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA, 1, 1, 0, GL_RGBA, GL_UNSIGNED_BYTE, nullptr);
        glBindFramebuffer(GL_FRAMEBUFFER, m_framebuffer);
        glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, m_texture, 0);
    }

    void Draw()
    {
        glBindFramebuffer(GL_FRAMEBUFFER, m_framebuffer);
        glClearColor(0.0f, 1.0f, 0.0f, 1.0f);
        glClear(GL_COLOR_BUFFER_BIT);
        glReadPixels(0, 0, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, m_pixel);
        glBindFramebuffer(GL_FRAMEBUFFER, 0);
    }

    ~OldScene()
    {
        glDeleteFramebuffers(1, &m_framebuffer);
        glDeleteTextures(1, &m_texture);
    }

private:
    unsigned char* m_pixel;
    GLuint m_texture = 0;
    GLuint m_framebuffer = 0;
};
// [old]

void DrawOnThread(unsigned char* pixel)
{
    // [new]
    const std::unique_ptr<Nib::RenderThreadGL> thread( // in place of eglInitialize ... MakeCurrent
        Nib::RendererFactory::CreateSurfaceRenderer("scene", Nib::RenderThreadGL::Medium));
    thread->Start();
    Nib::IGLMsgQueue& queue = *thread->GetMsgQueue();

    std::unique_ptr<OldScene> scene;
    Ink::Post(queue, [&] { scene = std::make_unique<OldScene>(pixel); });
    Ink::Post(queue, [&] { scene->Draw(); });
    thread->Render(); // in place of eglSwapBuffers
    Ink::Post(queue, [&] { scene.reset(); });
    queue.waitForCompleting(); // before what the tasks use goes
    // [new]
}

void DrawWithLibrary(unsigned char* pixel)
{
    const std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::RendererFactory::CreateSurfaceRenderer("scene", Nib::RenderThreadGL::Medium));
    thread->Start();
    Ink::Post(
        *thread->GetMsgQueue(),
        [pixel]
        {
            // [objects]
            using Nib::RendererFactory;
            Nib::TextureDescriptor descriptor; // in place of glGenTextures, glTexImage2D
            descriptor.width = descriptor.height = 1;
            const Ink::Owned<Nib::ITextureObject> texture(
                RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr));
            const Ink::Owned<Nib::IOffscreenRenderTarget> target( // ... glGenFramebuffers
                RendererFactory::CreateOffscreenRenderTarget(texture.get()));

            target->ClearColor(0.0f, 1.0f, 0.0f, 1.0f);
            Nib::IRenderTarget::BufferDescriptor buffer;
            buffer.pixels = pixel;
            target->ReadPixels(0, 0, 1, 1, buffer);
            // [objects]
        });
    thread->GetMsgQueue()->waitForCompleting();
}

} // namespace

int main()
{
    unsigned char moved[4] = {}, renewed[4] = {};
    DrawOnThread(moved);
    DrawWithLibrary(renewed);
    std::printf("moved: %d %d %d %d, renewed: %d %d %d %d\n", moved[0], moved[1], moved[2],
                moved[3], renewed[0], renewed[1], renewed[2], renewed[3]);
    return moved[1] == 255 && renewed[1] == 255 ? 0 : 1;
}
