#include <nib/nib.h>

#include <cstdio>
#include <cstdlib>

// Draws on a render thread into a texture and looks at the pixel that comes out. Calls no function
// of EGL or GL, and so needs neither library to be linked.

#ifndef EGL_NO_X11
#error "the package has to keep the window system's names away"
#endif

namespace
{

class DrawTask : public Nib::ITask
{
public:
    explicit DrawTask(unsigned char (&pixel)[4]) : m_pixel(pixel) {}

    void run() override
    {
        Nib::TextureDescriptor descriptor;
        descriptor.width = 8;
        descriptor.height = 8;
        Nib::ITextureObject* const texture =
            Nib::RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr);
        Nib::IOffscreenRenderTarget* const target =
            Nib::RendererFactory::CreateOffscreenRenderTarget(texture);
        target->ClearColor(0.2f, 0.4f, 0.6f, 1.0f);
        target->ReadPixels(4, 4, 1, 1, {m_pixel, 0, 0, 0});
        target->Release();
        texture->Release();
    }

private:
    unsigned char (&m_pixel)[4];
};

} // namespace

int main()
{
    unsigned char pixel[4] = {};
    Nib::RenderThreadGL* const thread =
        Nib::RendererFactory::CreateSurfaceRenderer("consumer", Nib::RenderThreadGL::Medium);
    if (!thread->Start())
        return EXIT_FAILURE;
    thread->GetMsgQueue()->enQueueMsg(new DrawTask(pixel));
    thread->GetMsgQueue()->waitForCompleting();
    delete thread;

    Nib::Matrix4<float> identity;
    const bool drawn = std::abs(pixel[0] - 51) <= 1 && std::abs(pixel[1] - 102) <= 1 &&
                       std::abs(pixel[2] - 153) <= 1 && pixel[3] == 255;
    std::printf("consumer: %d, %d, %d, %d\n", pixel[0], pixel[1], pixel[2], pixel[3]);
    if (!drawn || !identity.isIdentity())
        return EXIT_FAILURE;
    std::puts("consumer: ok");
    return EXIT_SUCCESS;
}
