#ifndef NIB_TESTS_DRIVERS_RESOURCE_CONTEXT_H
#define NIB_TESTS_DRIVERS_RESOURCE_CONTEXT_H

#include "drivers/DriverContext.h"
#include "gles/BoundQueue.h"
#include "Owned.h"

#include <nib/renderer_factory.h>

#include <array>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

/// A pixel as bytes.
struct Pixel
{
    int r = 0;
    int g = 0;
    int b = 0;
    int a = 0;

    /// Drivers round differently: equal but for one step.
    friend bool operator==(const Pixel& x, const Pixel& y)
    {
        return std::abs(x.r - y.r) <= 1 && std::abs(x.g - y.g) <= 1 && std::abs(x.b - y.b) <= 1 &&
               std::abs(x.a - y.a) <= 1;
    }
    friend std::ostream& operator<<(std::ostream& out, const Pixel& p)
    {
        return out << '(' << p.r << ", " << p.g << ", " << p.b << ", " << p.a << ')';
    }
};

/// A driver's context with a managed queue and the means to draw quads of one colour.
class ResourceContext : public DriverContext
{
protected:
    void SetUp() override
    {
        DriverContext::SetUp();
        if (IsSkipped() || HasFatalFailure())
            return;
        m_folder = testing::TempDir() + "nib-resources-" + std::to_string(getpid());
        m_cachePath = m_folder + "/sdk";
        std::filesystem::create_directories(m_cachePath);
        Nib::System::SetSDKCacheDirectoryPath(m_cachePath.c_str());
        queue = std::make_unique<BoundQueue>();
    }

    void TearDown() override
    {
        m_quad.reset();
        m_program.reset();
        queue.reset();
        if (!m_folder.empty())
            std::filesystem::remove_all(m_folder);
        DriverContext::TearDown();
    }

    static Owned<Nib::ITextureObject> NewTexture(int width, int height)
    {
        Nib::TextureDescriptor descriptor;
        descriptor.width = width;
        descriptor.height = height;
        return Owned<Nib::ITextureObject>(
            Nib::RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr));
    }

    static Owned<Nib::IOffscreenRenderTarget> NewTarget(Nib::ITextureObject* color)
    {
        return Owned<Nib::IOffscreenRenderTarget>(
            Nib::RendererFactory::CreateOffscreenRenderTarget(color));
    }

    static Owned<Nib::IDepthStencilBuffer> NewDepthStencil(int width, int height)
    {
        return Owned<Nib::IDepthStencilBuffer>(Nib::RendererFactory::CreateDepthStencilBuffer(
            static_cast<unsigned>(width), static_cast<unsigned>(height)));
    }

    /// A program; where the driver knows no program binaries, the cache's attempts are errors.
    static Owned<Nib::IShaderProgram> NewProgram(const char* vertex, const char* fragment)
    {
        Owned<Nib::IShaderProgram> program(
            Nib::RendererFactory::CreateShaderProgram(vertex, fragment, nullptr));
        // One by one: the record of the last time may be refused, and nothing be there to save.
        if (Integer(GL_NUM_PROGRAM_BINARY_FORMATS) == 0)
        {
            while (glGetError() != GL_NO_ERROR)
            {
            }
        }
        return program;
    }

    static Pixel PixelOf(Nib::IRenderTarget& target, int x, int y)
    {
        unsigned char bytes[4] = {};
        target.ReadPixels(x, y, 1, 1, {bytes, 0, 0, 0});
        return {bytes[0], bytes[1], bytes[2], bytes[3]};
    }

    /// Fills a rectangle of the bound framebuffer, given from -1 to 1, at a depth from 0 to 1.
    void DrawQuad(const std::array<float, 4>& color, float depth = 0.5f, float left = -1,
                  float bottom = -1, float right = 1, float top = 1)
    {
        MakeProgram();
        const float z = depth * 2 - 1;
        const float vertices[] = {left, bottom, z, right, bottom, z, left, top, z, right, top, z};
        m_quad->UpdateBuffer(0, vertices, 4);
        m_program->Activate();
        m_color->SetValue(color.data());
        m_quad->Draw(0, 4, false);
    }

    std::unique_ptr<BoundQueue> queue;

private:
    void MakeProgram()
    {
        if (m_program)
            return;
        m_program = NewProgram("attribute vec3 a_position;\n"
                               "void main() { gl_Position = vec4(a_position, 1.0); }\n",
                               "precision highp float;\n"
                               "uniform vec4 u_color;\n"
                               "void main() { gl_FragColor = u_color; }\n");
        m_color.reset(m_program->GetBindingIntf("u_color"));
        Nib::VertexDescriptor layout;
        layout.addAttribute(Nib::VertexDescriptor::AttributeType::Float, 3);
        m_quad.reset(Nib::RendererFactory::CreateGraphicsObject(
            1, Nib::PrimitiveType::TriangleStrip, &layout, 4, 0));
    }

    std::string m_folder;
    std::string m_cachePath;
    Owned<Nib::IShaderProgram> m_program;
    Owned<Nib::IParameterBinding> m_color;
    Owned<Nib::IGraphicsObject> m_quad;
};

#endif
