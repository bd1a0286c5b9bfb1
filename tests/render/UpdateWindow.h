#ifndef NIB_TESTS_RENDER_UPDATE_WINDOW_H
#define NIB_TESTS_RENDER_UPDATE_WINDOW_H

#include "sim/SimDriver.h"

#include <nib/device.h>
#include <nib/egl.h>
#include <nib/partial_update.h>

#include <memory>
#include <ostream>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

namespace Nib
{

/// Sets modes that are never chosen, whose bits still have a meaning.
struct UpdateRectangleModes
{
    static void Set(UpdateRectangle& rectangle, unsigned mode, int tileSize)
    {
        rectangle.m_mode = mode;
        rectangle.m_tileSize = tileSize;
    }
};

} // namespace Nib

using Box = std::tuple<int, int, int, int>; // x, y, width, height

/// A window of 1080 x 1920 pixels, current on the calling thread, with the GL parameters read: what
/// a surface render thread has when it makes its update rectangle. Nothing is recorded yet.
struct UpdateWindow
{
    explicit UpdateWindow(SimGpu gpu = SimGpu::Default())
        : driver(std::move(gpu)), egl(Nib::Egl::GetInstance()), window(driver.Window(1080, 1920)),
          surface(egl->CreateWindowSurface(window))
    {
        context.Create(EGL_NO_CONTEXT, false, Nib::EglContext::Priority::Medium);
        egl->MakeCurrent(&context, surface.get());
        InitOpenGLExtensions();
        Forget();
    }

    ~UpdateWindow() { egl->MakeCurrent(nullptr, nullptr); }

    void Forget()
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    /// Presents by EGL itself, so that the next back buffer has the age that the device gives.
    void Swap() { eglSwapBuffers(egl->GetDisplay(), surface->Get()); }

    /// An update rectangle that presents this window, and nothing recorded since it was made.
    std::unique_ptr<Nib::UpdateRectangle> Rectangle()
    {
        auto rectangle = std::make_unique<Nib::UpdateRectangle>();
        rectangle->Init(surface.get(), 1080, 1920);
        Forget();
        return rectangle;
    }

    /// The lines of SetUpdateMode() so far, without its signature.
    std::vector<std::string> Decision() const
    {
        static const std::string head = "void Nib::UpdateRectangle::SetUpdateMode()";
        std::vector<std::string> lines;
        for (const std::string& text : driver.LogTexts(ANDROID_LOG_INFO))
        {
            if (text.substr(0, head.size()) == head)
                lines.push_back(text.substr(head.size()));
        }
        return lines;
    }

    SimDriver driver;
    Nib::Egl* egl;
    ANativeWindow* window;
    std::unique_ptr<Nib::EglSurface> surface;
    Nib::EglContext context;
};

/// Tiled rendering: mode 0x25.
inline SimGpu TilingDevice()
{
    return SimGpu::Named("Adreno (TM) 530");
}

/// Tiled rendering on a GPU whose buffer ages are not to be trusted.
inline SimGpu OldTilingDevice()
{
    return SimGpu::Named("Adreno (TM) 330");
}

/// Damage regions: mode 0x45.
inline SimGpu DamageDevice()
{
    return SimGpu::Named("Mali-G72");
}

/// Tile alignment: mode 0x07.
inline SimGpu TiledMali()
{
    return SimGpu::Named("Mali-T860");
}

/// None of it: mode 0x09.
inline SimGpu PlainDevice()
{
    return SimGpu::Named("PowerVR Rogue GE8320");
}

/// The centre of the back buffer has this colour.
inline void FillBackBuffer(float red, float green, float blue, float alpha)
{
    glClearColor(red, green, blue, alpha);
    glClear(GL_COLOR_BUFFER_BIT);
}

inline const Nib::RectF kDirty(100, 200, 300, 260);
inline const Box kDirtyBox(100, 1660, 200, 60); // on 1080 x 1920
inline const Box kFullScreen(0, 0, 1080, 1920);

/// A device whose back buffers have this age from the second frame on.
inline SimGpu WithAge(const SimGpu& gpu, int age)
{
    return gpu.WithBufferAges({age});
}

inline Box ScissorOf(Nib::UpdateRectangle& rectangle, const Nib::RectF& rect, int rotationIndex = 0)
{
    Box box{-1, -1, -1, -1};
    rectangle.GetScissorRect(rect, &std::get<0>(box), &std::get<1>(box), &std::get<2>(box),
                             &std::get<3>(box), rotationIndex);
    return box;
}

inline Box DamageOf(const Nib::UpdateRectangle& rectangle)
{
    const Nib::UpdateRectangle::DamageRect damage = rectangle.GetDamageRect();
    return {damage.x, damage.y, damage.width, damage.height};
}

#endif
