#ifndef NIB_TESTS_FAULTS_DRAWING_LIFE_H
#define NIB_TESTS_FAULTS_DRAWING_LIFE_H

#include "sim/SimDriver.h"

#include <nib/nib.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

/// Objects of the factory's kind, ended on the thread that made them.
struct ReleaseObject
{
    template <typename T>
    void operator()(T* object) const
    {
        object->Release();
    }
};

template <typename T>
using Made = std::unique_ptr<T, ReleaseObject>;

/// What a careful application keeps on one render thread: something of every family of objects.
struct DrawnThings
{
    Made<Nib::IShaderProgram> program;
    Made<Nib::IShaderProgram> tinted; // takes its colour from a uniform block
    Made<Nib::IParameterBinding> matrix;
    Made<Nib::IParameterBinding> picture;
    Made<Nib::IParameterBinding> block;
    Made<Nib::ITextureObject> texture;
    Made<Nib::ITextureObject> color;
    Made<Nib::IDepthStencilBuffer> depth;
    Made<Nib::IOffscreenRenderTarget> target;
    Made<Nib::IGraphicsObject> mesh;
    Made<Nib::IGraphicsObject> copies;
    Made<Nib::IUniformBuffer> uniforms;
    Made<Nib::IBlendStateObject> blend;
    Made<Nib::IDepthStencilState> depthTest;
    Made<Nib::IFence> fence;

    bool isReady = false; // all of it is there

    void Make();
    /// Ends what does not survive the loss of a context.
    void ReleaseUnmanaged();
    /// Makes that again, and the contents that were lost.
    void Refill();
    void DrawOffscreen(float shade);
    void DrawOn(Nib::IRenderTarget& screen, float shade);
    /// The pixels of the offscreen target.
    std::vector<unsigned char> Export();
    void Release();

private:
    void MakeUnmanaged();
    void Fill();
};

/// A life with windows: start, window, frames with partial update, an offscreen child that is
/// paused, resumed and exports, another window, a second window that is drawn in its front buffer, the end. Every step waits for its threads, so that
/// the calls come in the same order each time.
///
/// The application in it is careful: it draws only where there is a context, and catches what the
/// library throws. It notes both.
class DrawingLife
{
public:
    explicit DrawingLife(SimDriver& driver) : m_driver(driver) {}
    void Live();

    /// What the application was told by the library, other than by its log: exceptions, missing
    /// contexts, null and false results.
    const std::vector<std::string>& Notes() const { return m_notes; }

private:
    void OnThread(Nib::RenderThreadGL& thread, std::function<void()> work);
    void EndOnThread(Nib::RenderThreadGL& thread, DrawnThings& things);
    void PostAndWait(Nib::RenderThreadGL& thread, std::function<void()> work);
    void ShowWindow(int width, int height);
    void DrawFrame(float shade, const Nib::RectF& changed);
    void StartChild();
    void PauseAndResumeChild();
    void ExportOnChild(float shade);
    void StartFront();
    void DrawInFront(float shade);
    void End();
    void Note(const std::string& text) { m_notes.push_back(text); }

    SimDriver& m_driver;
    std::unique_ptr<Nib::RenderThreadGL> m_surface;
    std::unique_ptr<Nib::RenderThreadGL> m_child;
    std::unique_ptr<Nib::RenderThreadGL> m_front;
    DrawnThings m_onScreen;
    DrawnThings m_offScreen;
    DrawnThings m_inFront;
    int m_width = 0;
    int m_height = 0;
    std::vector<std::string> m_notes;
};

#endif
