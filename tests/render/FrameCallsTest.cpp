#include "gles/CacheFiles.h"
#include "gles/GlesFixture.h"
#include "render/RenderTestSupport.h"
#include "render/UpdateWindow.h"

#include <nib/geometry.h>
#include <nib/renderer_factory.h>
#include <nib/shader.h>

#include <gtest/gtest.h>

// The EGL and GL calls of a whole frame: those that draw, those that present, and no question that
// nobody needs the answer of.

using Nib::RectF;
using Nib::RendererFactory;

namespace
{

using NameList = std::vector<std::string>;

constexpr const char* kVertexShader = "attribute vec2 a_pos;\n"
                                      "attribute vec4 a_tint;\n"
                                      "uniform mat4 u_transform;\n"
                                      "varying vec4 v_tint;\n"
                                      "void main()\n"
                                      "{\n"
                                      "    v_tint = a_tint;\n"
                                      "    gl_Position = u_transform * vec4(a_pos, 0, 1);\n"
                                      "}\n";
constexpr const char* kFragmentShader = "precision mediump float;\n"
                                        "uniform vec4 u_paint;\n"
                                        "varying vec4 v_tint;\n"
                                        "void main() { gl_FragColor = v_tint * u_paint; }\n";

const NameList kDrawCalls = {
    "glUseProgram",
    "glUniformMatrix4fv",
    "glUniform4fv",
    "glBindBuffer",
    "glEnableVertexAttribArray",
    "glVertexAttribPointer",
    "glEnableVertexAttribArray",
    "glVertexAttribPointer",
    "glDrawArrays",
    "glBindBuffer",
};

/// A mesh with its program, made and ended on the render thread.
struct Drawing
{
    Drawing()
        : program(RendererFactory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr)),
          transform(program->GetBindingIntf("u_transform")),
          paint(program->GetBindingIntf("u_paint"))
    {
        Nib::VertexDescriptor layout;
        layout.addAttribute(Nib::VertexDescriptor::AttributeType::Float, 2);
        layout.addAttribute(Nib::VertexDescriptor::AttributeType::Float, 4);
        mesh.reset(
            RendererFactory::CreateGraphicsObject(1, Nib::PrimitiveType::Triangles, &layout, 3, 0));
        constexpr float kVertices[18] = {};
        mesh->UpdateBuffer(0, kVertices, 3);
    }

    void Draw() const
    {
        constexpr float kTransform[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
        constexpr float kPaint[4] = {1, 1, 1, 1};
        program->Activate();
        transform->SetValue(kTransform);
        paint->SetValue(kPaint);
        mesh->Draw(0, -1, false);
    }

    std::unique_ptr<Nib::IShaderProgram, Releaser> program;
    std::unique_ptr<Nib::IParameterBinding, Releaser> transform;
    std::unique_ptr<Nib::IParameterBinding, Releaser> paint;
    std::unique_ptr<Nib::IGraphicsObject, Releaser> mesh;
};

/// A device with a drawing, on whose window some frames have been shown.
class ShownFrames
{
public:
    explicit ShownFrames(const SimGpu& gpu)
        : driver(gpu),
          m_thread(Nib::GLES::CreateSurfaceRenderer("frames", Nib::RenderThreadGL::Medium))
    {
        m_thread->Start();
        m_thread->OnSurfaceChanged(driver.Window(1080, 1920), 1080, 1920, 0);
        RunOn(m_thread->GetMsgQueue(), [this] { m_drawing = std::make_unique<Drawing>(); });
        for (int frame = 0; frame < 3; ++frame) // a new window is drawn in full so often
            Show(kDirty);
        driver.ForgetCalls();
    }
    ~ShownFrames()
    {
        RunOn(m_thread->GetMsgQueue(), [this] { m_drawing.reset(); });
    }
    ShownFrames(const ShownFrames&) = delete;
    ShownFrames& operator=(const ShownFrames&) = delete;

    void Show(RectF dirty)
    {
        m_thread->ApplyUpdateRect(dirty, 0);
        Post(m_thread->GetMsgQueue(), [this] { m_drawing->Draw(); });
        m_thread->Render();
    }

    CacheFolder folder;
    SimDriver driver;

private:
    std::unique_ptr<Nib::RenderThreadGL> m_thread;
    std::unique_ptr<Drawing> m_drawing;
};

NameList Joined(const NameList& first, const NameList& second, const NameList& third)
{
    NameList all = first;
    all.insert(all.end(), second.begin(), second.end());
    all.insert(all.end(), third.begin(), third.end());
    return all;
}

} // namespace

TEST(FrameCalls, WithPostSubBuffer)
{
    ShownFrames frames(PlainDevice().WithPostSubBuffer());

    frames.Show(kDirty);

    EXPECT_EQ(
        frames.driver.CallNames(),
        Joined({}, kDrawCalls, {"glGetIntegerv", "glInvalidateFramebuffer", "eglPostSubBufferNV"}));
    const SimCall post = frames.driver.LastCall("eglPostSubBufferNV");
    EXPECT_EQ(Box(post.Arg(2), post.Arg(3), post.Arg(4), post.Arg(5)), Box(100, 200, 200, 60));
}

TEST(FrameCalls, WithTiledRendering)
{
    ShownFrames frames(WithAge(TilingDevice(), 2));

    frames.Show(kDirty);

    EXPECT_EQ(
        frames.driver.CallNames(),
        Joined({"glBindFramebuffer", "eglQuerySurface", "glStartTilingQCOM"}, kDrawCalls,
               {"glEndTilingQCOM", "glGetIntegerv", "glInvalidateFramebuffer", "eglSwapBuffers"}));
    EXPECT_EQ(frames.driver.LastCall("glStartTilingQCOM"),
              Call("glStartTilingQCOM", 100, 1660, 200, 60, 0));
}

TEST(FrameCalls, WithADamageRegion)
{
    ShownFrames frames(DamageDevice());

    frames.Show(kDirty);

    EXPECT_EQ(frames.driver.CallNames(),
              Joined({}, kDrawCalls,
                     {"glGetIntegerv", "glInvalidateFramebuffer", "eglSwapBuffersWithDamageKHR"}));
}

TEST(FrameCalls, WithAPreservedBackBuffer)
{
    ShownFrames frames(PlainDevice());

    frames.Show(kDirty);

    EXPECT_EQ(
        frames.driver.CallNames(),
        Joined({}, kDrawCalls, {"glGetIntegerv", "glInvalidateFramebuffer", "eglSwapBuffers"}));
}

// In parts of a pixel it is cut toward zero; reaching beyond the screen it is not clipped.
TEST(FrameCalls, PostSubBufferHandsOverTheDirtyRectangleWhateverItIs)
{
    ShownFrames frames(PlainDevice().WithPostSubBuffer());
    const struct
    {
        RectF dirty;
        Box handedOver;
    } rows[] = {
        {RectF(0, 0, 1080, 1920), Box(0, 0, 1080, 1920)},
        {RectF(10.9f, 20.2f, 30.5f, 41.9f), Box(10, 20, 19, 21)},
        {RectF(1000, 1900, 1200, 2000), Box(1000, 1900, 200, 100)},
        {RectF(50, 60, 50, 60), Box(50, 60, 0, 0)},
    };
    for (const auto& row : rows)
    {
        frames.Show(row.dirty);
        const SimCall post = frames.driver.LastCall("eglPostSubBufferNV");
        EXPECT_EQ(Box(post.Arg(2), post.Arg(3), post.Arg(4), post.Arg(5)), row.handedOver);
    }
}

// The area is that of this frame and of the three before it, within the screen.
TEST(FrameCalls, TiledRenderingHandsOverTheAreaOfFourFrames)
{
    ShownFrames frames(WithAge(TilingDevice(), 2)); // three of (100, 200) to (300, 260)
    const struct
    {
        RectF dirty;
        SimCall handedOver;
    } rows[] = {
        {RectF(50, 300, 60, 310), Call("glStartTilingQCOM", 50, 1610, 250, 110, 0)},
        {RectF(1000, 1900, 1200, 2000), Call("glStartTilingQCOM", 50, 0, 1030, 1720, 0)},
        {RectF(10, 10, 20, 20), Call("glStartTilingQCOM", 10, 0, 1070, 1910, 0)},
        {RectF(10, 10, 20, 20), Call("glStartTilingQCOM", 10, 0, 1070, 1910, 0)},
        {RectF(10, 10, 20, 20), Call("glStartTilingQCOM", 10, 0, 1070, 1910, 0)},
        {RectF(10, 10, 20, 20), Call("glStartTilingQCOM", 10, 1900, 10, 10, 0)},
    };
    for (const auto& row : rows)
    {
        frames.Show(row.dirty);
        EXPECT_EQ(frames.driver.LastCall("glStartTilingQCOM"), row.handedOver);
    }
}
