#ifndef NIB_TESTS_DRIVERS_GLES_ON_DRIVER_H
#define NIB_TESTS_DRIVERS_GLES_ON_DRIVER_H

#include "drivers/Driver.h"
#include "drivers/RenderThreadSupport.h"
#include "Owned.h"

#include <nib/base.h>
#include <nib/egl.h>
#include <nib/render_thread.h>
#include <nib/renderer_factory.h>

#include <EGL/egl.h>
#include <GLES3/gl3.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

/// An offscreen render thread that manages its objects, beside the surface render thread that it
/// shares with. Resources are made, used and ended inside OnThread.
class GlesOnDriver : public testing::Test
{
protected:
    void SetUp() override
    {
        if (!HasPbuffers())
            GTEST_SKIP() << kNoPbuffers;
        Nib::System::SetSDKCacheDirectoryPath((m_folder.Path() / "sdk").c_str());
        ASSERT_EQ(Nib::Egl::GetEglStatus(), 0) << "the driver does not start";
        parent.reset(
            Nib::RendererFactory::CreateSurfaceRenderer("parent", Nib::RenderThreadGL::Medium));
        ASSERT_TRUE(parent->Start());
        thread.reset(
            Nib::RendererFactory::CreateOffscreenRenderer(parent->GetMsgQueue(), "gles", true));
        ASSERT_TRUE(thread->Start());
    }

    void TearDown() override
    {
        if (thread)
            OnThread([] { EXPECT_NE(eglGetCurrentContext(), EGL_NO_CONTEXT); });
        thread.reset();
        parent.reset();
    }

    /// Runs @p function on the offscreen thread; it must leave no GL error behind.
    void OnThread(const std::function<void()>& function) { On(*thread, function); }
    void OnParent(const std::function<void()>& function) { On(*parent, function); }

    /// The context of the offscreen thread goes and comes back.
    void LoseContext()
    {
        thread->OnPause();
        thread->OnResume();
        ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());
    }

    std::unique_ptr<Nib::RenderThreadGL> parent;
    std::unique_ptr<Nib::RenderThreadGL> thread;

private:
    /// A folder for the shader cache, gone with the test.
    class TemporaryFolder
    {
    public:
        ~TemporaryFolder() { std::filesystem::remove_all(m_path); }
        const std::filesystem::path& Path() const { return m_path; }

    private:
        static std::filesystem::path Make()
        {
            std::string name = std::filesystem::temp_directory_path() / "nib-gles-XXXXXX";
            return mkdtemp(name.data());
        }

        const std::filesystem::path m_path = Make();
    };

    TemporaryFolder m_folder;

    static void On(Nib::RenderThreadGL& renderer, const std::function<void()>& function)
    {
        RunOn(renderer.GetMsgQueue(),
              [&]
              {
                  EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
                  function();
                  EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
              });
    }
};

inline Nib::TextureDescriptor Described(int width, int height, int layout = 2, int memoryLayout = 6)
{
    Nib::TextureDescriptor descriptor;
    descriptor.width = width;
    descriptor.height = height;
    descriptor.layout = static_cast<Nib::TextureTargetLayout>(layout);
    descriptor.memoryLayout = static_cast<Nib::TextureMemoryLayout>(memoryLayout);
    return descriptor;
}

/// A texture that is sampled pixel by pixel unless @p params say otherwise.
inline Owned<Nib::ITextureObject> MadeTexture(const Nib::TextureDescriptor& descriptor,
                                              const void* pixels = nullptr,
                                              const Nib::TextureBufferInfo* info = nullptr,
                                              const std::vector<unsigned>& params = {4, 0, 5, 0})
{
    return Owned<Nib::ITextureObject>(Nib::RendererFactory::CreateTextureObject(
        descriptor, pixels, params.data(), static_cast<unsigned>(params.size() / 2), info));
}

/// A picture to draw into, RGBA8, black and transparent at first.
class Page
{
public:
    Page(int width, int height)
        : m_width(width), m_height(height), m_color(MadeTexture(Described(width, height))),
          m_target(Nib::RendererFactory::CreateOffscreenRenderTarget(m_color.get()))
    {
        m_target->ClearColor(0, 0, 0, 0);
        m_target->Activate();
    }

    Nib::ITextureObject& Color() { return *m_color; }
    Nib::IOffscreenRenderTarget& Target() { return *m_target; }

    /// All pixels, the lowest row first.
    std::vector<Rgba> Pixels()
    {
        std::vector<Rgba> pixels(static_cast<std::size_t>(m_width * m_height));
        Nib::IRenderTarget::BufferDescriptor buffer;
        buffer.pixels = pixels.data();
        m_target->ReadPixels(0, 0, m_width, m_height, buffer);
        return pixels;
    }

    Rgba At(int x, int y) { return Pixels()[static_cast<std::size_t>(y * m_width + x)]; }

private:
    const int m_width;
    const int m_height;
    Owned<Nib::ITextureObject> m_color;
    Owned<Nib::IOffscreenRenderTarget> m_target;
};

/// A program. A driver without binary formats refuses what is kept of one, which must not disturb
/// the test.
inline Owned<Nib::IShaderProgram> MadeProgram(const char* vertex, const char* fragment)
{
    Owned<Nib::IShaderProgram> program(
        Nib::RendererFactory::CreateShaderProgram(vertex, fragment, nullptr));
    GLint binaryFormats = 0;
    glGetIntegerv(GL_NUM_PROGRAM_BINARY_FORMATS, &binaryFormats);
    while (binaryFormats == 0 && glGetError() != GL_NO_ERROR)
    {
    }
    return program;
}

/// Two triangles over the whole page, drawn with a fragment shader of the test's.
class Cover
{
public:
    /// @p fragment is the shader without its version line; it writes `color`. It must live as long
    /// as the cover.
    explicit Cover(const std::string& fragment)
        : m_fragment("#version 300 es\nprecision highp float;\nprecision highp int;\n"
                     "out vec4 color;\n" +
                     fragment),
          m_program(MadeProgram(kVertex, m_fragment.c_str()))
    {
        Nib::VertexDescriptor layout;
        layout.addAttribute(Nib::VertexDescriptor::AttributeType::Float, 2);
        m_mesh.reset(Nib::RendererFactory::CreateGraphicsObject(
            1, Nib::PrimitiveType::TriangleStrip, &layout, 4, 0));
        const float corners[] = {-1, -1, 1, -1, -1, 1, 1, 1};
        m_mesh->UpdateBuffer(0, corners, 4);
        m_program->Activate();
    }

    void SetSampler(const char* name, int unit)
    {
        Owned<Nib::IParameterBinding> binding(m_program->GetBindingIntf(name));
        EXPECT_EQ(static_cast<int>(binding->GetType()), 8) << name;
        binding->SetValue(&unit);
    }

    /// For samplers that bindings do not know, integer and shadow ones among them: they read unit 0
    /// without being told.
    void Draw()
    {
        m_program->Activate();
        m_mesh->Draw(0, -1, false);
    }

private:
    static constexpr const char* kVertex = "#version 300 es\n"
                                           "layout(location = 0) in vec2 position;\n"
                                           "void main() { gl_Position = vec4(position, 0, 1); }\n";

    const std::string m_fragment;
    Owned<Nib::IShaderProgram> m_program;
    Owned<Nib::IGraphicsObject> m_mesh;
};

inline ::testing::AssertionResult Near(const Rgba& actual, const Rgba& expected, int tolerance = 1)
{
    for (std::size_t i = 0; i < 4; ++i)
        if (std::abs(actual[i] - expected[i]) > tolerance)
        {
            auto result = ::testing::AssertionFailure();
            for (const Rgba& pixel : {actual, expected})
                result << "(" << int{pixel[0]} << ", " << int{pixel[1]} << ", " << int{pixel[2]}
                       << ", " << int{pixel[3]} << ") ";
            return result << "actual and expected";
        }
    return ::testing::AssertionSuccess();
}

#endif
