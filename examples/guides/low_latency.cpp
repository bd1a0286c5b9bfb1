// Ink into the visible buffer where the device allows it, and the same code frame by frame where
// it does not.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <GLES2/gl2.h>
#include <memory>

namespace
{

// [threads]
/// The render threads of a window to write in.
struct InkThreads
{
    // Declared first, so ended last: the front-buffer thread shares the other's context.
    std::unique_ptr<Nib::RenderThreadGL> surface;
    std::unique_ptr<Nib::RenderThreadGL> front; // null where ink goes frame by frame

    InkThreads()
        : surface(Nib::RendererFactory::CreateSurfaceRenderer("ink", Nib::RenderThreadGL::High))
    {
        surface->Start();
        if (!Nib::IsFBRSupported()) // never on a render thread: it asks one
            return;
        front.reset(
            Nib::RendererFactory::CreateFBRSurfaceRenderer(surface->GetMsgQueue(), "ink front"));
        front->Start();
    }

    Nib::RenderThreadGL& ForInk() { return front ? *front : *surface; }
};
// [threads]

// [sample]
/// One piece of a stroke, on its way to the screen at once. @p area is whole pixels, y downward.
template <typename Drawing>
void ShowPiece(Nib::RenderThreadGL& thread, const Nib::RectF& area, Drawing drawing)
{
    thread.ApplyUpdateRect(area, 0); // posts
    Ink::Post(*thread.GetMsgQueue(), std::move(drawing));
    thread.Render(); // waits: it is drawn, and on its way
}
// [sample]

} // namespace

int main()
{
    InkThreads threads;
    Nib::RenderThreadGL& thread = threads.ForInk();
    int pieces = 0;
    for (int x = 0; x < 30; x += 10)
        ShowPiece(thread, Nib::RectF(x, 0, x + 10.0f, 10),
                  [&pieces]
                  {
                      glClear(GL_COLOR_BUFFER_BIT); // stands for the ink
                      ++pieces;
                  });
    std::printf("%d pieces, %s\n", pieces,
                threads.front ? "into the front buffer" : "frame by frame");
    return pieces == 3 ? 0 : 1;
}
