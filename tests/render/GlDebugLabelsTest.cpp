// What the library's objects are called in a GL debugger.

#include "gles/CacheFiles.h"
#include "render/SurfaceThreadSupport.h"

#include <nib/base.h>
#include <nib/geometry.h>
#include <nib/gl_debug.h>
#include <nib/pipeline_state.h>
#include <nib/render_target.h>
#include <nib/renderer_factory.h>
#include <nib/resource_checker.h>
#include <nib/shader.h>
#include <nib/shader_cache.h>
#include <nib/texture.h>

#include <GLES3/gl3.h>
// After gl3.h, which it needs.
#include <GLES2/gl2ext.h>
#include <gtest/gtest.h>

using namespace Nib;

namespace
{

using Texts = std::vector<std::string>;

constexpr const char* kVertexShader = "attribute vec4 a; void main() { gl_Position = a; }";
constexpr const char* kFragmentShader =
    "precision mediump float; void main() { gl_FragColor = vec4(1.0); }";

std::string KindName(long long kind)
{
    switch (kind)
    {
    case GL_TEXTURE: return "texture";
    case GL_SAMPLER_KHR: return "sampler";
    case GL_BUFFER_KHR: return "buffer";
    case GL_PROGRAM_KHR: return "program";
    case GL_FRAMEBUFFER: return "framebuffer";
    case GL_RENDERBUFFER: return "renderbuffer";
    default: return "?";
    }
}

/// The labels that were given since the last look.
Texts NewLabels(SimDriver& driver)
{
    Texts labels;
    for (const SimCall& call : driver.Calls("glObjectLabelKHR"))
    {
        const std::string text = call.args.at(3).Text();
        labels.push_back(KindName(call.Arg(0)) + " " +
                         text.substr(0, static_cast<std::size_t>(call.Arg(2))));
    }
    driver.ForgetCalls();
    return labels;
}

/// A render thread on a driver with the aids, turned on. Each test runs on it.
class GlDebugLabels : public testing::Test
{
protected:
    GlDebugLabels()
    {
        GlDebug::SetEnabled(true);
        m_thread.reset(GLES::CreateSurfaceRenderer("canvas", RenderThreadGL::Medium));
        m_thread->Start();
    }

    void Run(const std::function<void()>& action) { RunOn(m_thread->GetMsgQueue(), action); }

    static ITextureObject* NewTexture()
    {
        TextureDescriptor descriptor;
        descriptor.width = descriptor.height = 4;
        return RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr);
    }

    const CacheFolder m_cache;
    SimDriver m_driver{SimGpu::Default().WithGlExtension("GL_KHR_debug")};
    std::unique_ptr<RenderThreadGL> m_thread;
};

TEST_F(GlDebugLabels, ATextureHasItsTag)
{
    Run(
        [&]
        {
            ITextureObject* texture = NewTexture();
            EXPECT_EQ(NewLabels(m_driver), Texts());
            texture->SetTag("paper");
            EXPECT_EQ(NewLabels(m_driver), Texts({"texture paper"}));
            texture->Release();
        });
}

TEST_F(GlDebugLabels, AnAliasDoesNotRenameItsTexture)
{
    Run(
        [&]
        {
            ITextureObject* texture = NewTexture();
            ITextureObject* alias = RendererFactory::CreateTextureObject(
                TextureDescriptor(texture), nullptr, nullptr, 0, nullptr);
            alias->SetTag("alias");
            EXPECT_EQ(NewLabels(m_driver), Texts());
            alias->Release();
            texture->Release();
        });
}

TEST_F(GlDebugLabels, ATargetHasTheTagOfItsTexture)
{
    Run(
        [&]
        {
            ITextureObject* texture = NewTexture();
            texture->SetTag("paper");
            NewLabels(m_driver);
            IOffscreenRenderTarget* target = RendererFactory::CreateOffscreenRenderTarget(texture);
            EXPECT_EQ(NewLabels(m_driver), Texts({"framebuffer paper"}));
            target->Release();
            texture->Release();
        });
}

TEST_F(GlDebugLabels, ADepthAndStencilBufferIsCalledThat)
{
    Run(
        [&]
        {
            IDepthStencilBuffer* buffer = RendererFactory::CreateDepthStencilBuffer(4, 4);
            EXPECT_EQ(NewLabels(m_driver), Texts({"renderbuffer depth and stencil"}));
            buffer->Release();
        });
}

TEST_F(GlDebugLabels, BuffersSayWhatTheyHold)
{
    Run(
        [&]
        {
            const VertexDescriptor descriptors[2] = {};
            IGraphicsObject* mesh = RendererFactory::CreateGraphicsObject(
                2, PrimitiveType::Triangles, descriptors, 4, 6);
            EXPECT_EQ(NewLabels(m_driver),
                      Texts({"buffer vertices 0", "buffer vertices 1", "buffer indices"}));
            m_driver.AllowMisuse("glBufferData"); // of a uniform buffer, which has no storage yet
            IUniformBuffer* uniforms = RendererFactory::CreateUniformBuffer();
            EXPECT_EQ(NewLabels(m_driver), Texts({"buffer uniforms"}));
            uniforms->Release();
            mesh->Release();
        });
}

TEST_F(GlDebugLabels, AProgramIsCalledAsItsFileInTheCache)
{
    const std::string name =
        "program sh" +
        std::to_string(ShaderProgramCache::GetShaderKey(kVertexShader, kFragmentShader)) + ".dat";
    Run(
        [&]
        {
            for (int round = 0; round < 2; ++round) // compiled, then loaded
            {
                IShaderProgram* program =
                    RendererFactory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr);
                EXPECT_EQ(NewLabels(m_driver), Texts({name}));
                program->Release();
            }
        });
}

TEST_F(GlDebugLabels, WhatTheResourceCheckerIsToldOfATagIsTheLabelToo)
{
    System::SetBuildTypeEngMode(true);
    Run(
        [&]
        {
            GLuint buffer = 0;
            glGenBuffers(1, &buffer);
            glBindBuffer(GL_ARRAY_BUFFER, buffer);
            ResourceChecker::addLookup(buffer, ResourceChecker::vertexBufferDbDescriptor, nullptr);
            ResourceChecker::updateTagLookup(buffer, "points",
                                             ResourceChecker::vertexBufferDbDescriptor);
            EXPECT_EQ(NewLabels(m_driver), Texts({"buffer points"}));
            ResourceChecker::removeLookup(buffer, ResourceChecker::vertexBufferDbDescriptor);
            glDeleteBuffers(1, &buffer);
        });
}

TEST_F(GlDebugLabels, AnApplicationLabelsItsOwn)
{
    Run(
        [&]
        {
            GLuint sampler = 0;
            glGenSamplers(1, &sampler);
            glBindSampler(0, sampler);
            GlDebug::Label(GL_SAMPLER_KHR, sampler, std::string(300, 'n').c_str());
            EXPECT_EQ(NewLabels(m_driver), Texts({"sampler " + std::string(255, 'n')}));
            GlDebug::Label(GL_SAMPLER_KHR, sampler, nullptr);
            EXPECT_EQ(m_driver.LastCall("glObjectLabelKHR").Arg(2), 0);
            EXPECT_EQ(m_driver.LastCall("glObjectLabelKHR").args.at(3).Pointer(), nullptr);
            glDeleteSamplers(1, &sampler);
        });
}

TEST_F(GlDebugLabels, OtherThreadsLabelNothing)
{
    const SimContext context(m_driver);
    m_driver.ForgetCalls();
    GlDebug::Label(GL_TEXTURE, 1, "nothing");
    EXPECT_EQ(NewLabels(m_driver), Texts());
}

} // namespace
