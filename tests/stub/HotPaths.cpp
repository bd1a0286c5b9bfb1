#include "HotPaths.h"

#include "base/Log.h"

#include <nib/egl.h>
#include <nib/renderer_factory.h>
#include <nib/shader_cache.h>

#include <EGL/egl.h>
#include <EGL/eglext.h>
#include <GLES2/gl2ext.h>

#include <cstddef>

using namespace Nib;

namespace Nib
{

/// The way to a mode that this driver would not choose.
struct UpdateRectangleModes
{
    static void Set(UpdateRectangle& rectangle, unsigned mode) { rectangle.m_mode = mode; }
};

} // namespace Nib

namespace
{

constexpr int kSide = 64;     // of the page and the texture, in pixels
constexpr int kScreen = 1000; // side
constexpr unsigned kTiledRendering = 0x25;

constexpr const char* kVertexShader =
    "attribute vec2 a_position;\n"
    "attribute vec4 a_color;\n"
    "uniform mat4 u_transform;\n"
    "varying vec4 v_color;\n"
    "void main()\n"
    "{\n"
    "    v_color = a_color;\n"
    "    gl_Position = u_transform * vec4(a_position, 0.0, 1.0);\n"
    "}\n";
constexpr const char* kFragmentShader = "precision mediump float;\n"
                                        "varying vec4 v_color;\n"
                                        "uniform vec4 u_tint;\n"
                                        "void main() { gl_FragColor = v_color * u_tint; }\n";

struct Vertex
{
    float position[2];
    float color[4];
};

constexpr Vertex kTriangle[] = {
    {{-1.0f, -1.0f}, {1, 0, 0, 1}},
    {{-0.99f, -1.0f}, {0, 1, 0, 1}},
    {{-1.0f, -0.99f}, {0, 0, 1, 1}},
};
constexpr float kTransform[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
constexpr float kTint[4] = {1, 1, 1, 1};

ITextureObject* MakeTexture(const void* pixels)
{
    TextureDescriptor described;
    described.width = described.height = kSide;
    return RendererFactory::CreateTextureObject(described, pixels, nullptr, 0, nullptr);
}

IGraphicsObject* MakeMesh()
{
    VertexDescriptor layout;
    layout.addAttribute(VertexDescriptor::AttributeType::Float, 2);
    layout.addAttribute(VertexDescriptor::AttributeType::Float, 4);
    IGraphicsObject* const mesh =
        RendererFactory::CreateGraphicsObject(1, PrimitiveType::Triangles, &layout, 3, 0);
    mesh->UpdateBuffer(0, kTriangle, 3);
    return mesh;
}

GLint Integer(GLenum name)
{
    GLint value = 0;
    glGetIntegerv(name, &value);
    return value;
}

template <typename Function>
Function EntryPoint(const char* name)
{
    return reinterpret_cast<Function>(eglGetProcAddress(name));
}

} // namespace

HotScene::HotScene()
    : page(MakeTexture(nullptr)), target(RendererFactory::CreateOffscreenRenderTarget(page.get())),
      program(RendererFactory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr)),
      transform(program->GetBindingIntf("u_transform")), tint(program->GetBindingIntf("u_tint")),
      mesh(MakeMesh()), pixels(kSide * kSide, 0x80FF4020u)
{
    texture.reset(MakeTexture(pixels.data()));
    target->Activate();

    program->Activate();
    glProgram = static_cast<GLuint>(Integer(GL_CURRENT_PROGRAM));
    glTransform = glGetUniformLocation(glProgram, "u_transform");
    glTint = glGetUniformLocation(glProgram, "u_tint");
    glGenBuffers(1, &glVertices);
    glBindBuffer(GL_ARRAY_BUFFER, glVertices);
    glBufferData(GL_ARRAY_BUFFER, sizeof kTriangle, kTriangle, GL_STREAM_DRAW);
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    glGenTextures(1, &glTexture);
    HotPaths::GlSetData(*this, 1);

    m_screen = std::make_unique<EglSurface>(eglGetCurrentSurface(EGL_DRAW));
    update.Init(m_screen.get(), kScreen, kScreen);
    UpdateRectangleModes::Set(tiled, kTiledRendering);
    tiled.InitClipRect();
    tiled.Init(m_screen.get(), kScreen, kScreen);
}

HotScene::~HotScene()
{
    glDeleteTextures(1, &glTexture);
    glDeleteBuffers(1, &glVertices);
}

namespace HotPaths
{

// ---- a mesh -------------------------------------------------------------------------------------

void GlDraw(HotScene& scene, int times)
{
    for (; times != 0; --times)
    {
        glUseProgram(scene.glProgram);
        glUniformMatrix4fv(scene.glTransform, 1, GL_FALSE, kTransform);
        glUniform4fv(scene.glTint, 1, kTint);
        glBindBuffer(GL_ARRAY_BUFFER, scene.glVertices);
        glEnableVertexAttribArray(0);
        glVertexAttribPointer(0, 2, GL_FLOAT, GL_FALSE, sizeof(Vertex), nullptr);
        glEnableVertexAttribArray(1);
        glVertexAttribPointer(1, 4, GL_FLOAT, GL_FALSE, sizeof(Vertex),
                              reinterpret_cast<const void*>(offsetof(Vertex, color)));
        glDrawArrays(GL_TRIANGLES, 0, 3);
        glBindBuffer(GL_ARRAY_BUFFER, 0);
    }
}

void Draw(HotScene& scene, int times)
{
    for (; times != 0; --times)
    {
        scene.program->Activate();
        scene.transform->SetValue(kTransform);
        scene.tint->SetValue(kTint);
        scene.mesh->Draw(0, -1, false);
    }
}

// ---- the state of the context -------------------------------------------------------------------

namespace
{

constexpr int kUnits = 4;
constexpr int kAttributes = 5;

struct Attribute
{
    GLint enabled, buffer, size, type, normalized, stride;
    void* pointer;
};

struct GlStateValues
{
    GLint program, arrayBuffer, unit, blendSource, blendDestination, renderbuffer, framebuffer,
        indexBuffer;
    GLboolean switches[6]; // and the mask of depth
    GLint viewport[4], scissor[4];
    GLint textures[kUnits], samplers[kUnits];
    Attribute attributes[kAttributes];
};

constexpr GLenum kSwitches[] = {GL_BLEND,     GL_DEPTH_TEST,   GL_DEPTH_WRITEMASK,
                                GL_CULL_FACE, GL_SCISSOR_TEST, GL_STENCIL_TEST};

void GlStore(GlStateValues& state)
{
    while (glGetError() != GL_NO_ERROR)
        continue;
    glGetIntegerv(GL_CURRENT_PROGRAM, &state.program);
    glGetIntegerv(GL_ARRAY_BUFFER_BINDING, &state.arrayBuffer);
    glGetIntegerv(GL_ACTIVE_TEXTURE, &state.unit);
    for (int i = 0; i < 6; ++i)
        glGetBooleanv(kSwitches[i], &state.switches[i]);
    glGetIntegerv(GL_BLEND_SRC_ALPHA, &state.blendSource);
    glGetIntegerv(GL_BLEND_DST_ALPHA, &state.blendDestination);
    glGetIntegerv(GL_RENDERBUFFER_BINDING, &state.renderbuffer);
    glGetIntegerv(GL_FRAMEBUFFER_BINDING, &state.framebuffer);
    glGetIntegerv(GL_VIEWPORT, state.viewport);
    glGetIntegerv(GL_SCISSOR_BOX, state.scissor);
    glGetIntegerv(GL_ELEMENT_ARRAY_BUFFER_BINDING, &state.indexBuffer);
    for (GLuint unit = 0; unit < kUnits; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        glGetIntegerv(GL_TEXTURE_BINDING_2D, &state.textures[unit]);
        glGetIntegerv(GL_SAMPLER_BINDING, &state.samplers[unit]);
    }
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    for (GLuint i = 0; i < kAttributes; ++i)
    {
        Attribute& attribute = state.attributes[i];
        glGetVertexAttribiv(i, GL_VERTEX_ATTRIB_ARRAY_ENABLED, &attribute.enabled);
        glGetVertexAttribiv(i, GL_VERTEX_ATTRIB_ARRAY_BUFFER_BINDING, &attribute.buffer);
        glGetVertexAttribiv(i, GL_VERTEX_ATTRIB_ARRAY_SIZE, &attribute.size);
        glGetVertexAttribiv(i, GL_VERTEX_ATTRIB_ARRAY_TYPE, &attribute.type);
        glGetVertexAttribiv(i, GL_VERTEX_ATTRIB_ARRAY_NORMALIZED, &attribute.normalized);
        glGetVertexAttribiv(i, GL_VERTEX_ATTRIB_ARRAY_STRIDE, &attribute.stride);
        glGetVertexAttribPointerv(i, GL_VERTEX_ATTRIB_ARRAY_POINTER, &attribute.pointer);
    }
}

void GlRestore(const GlStateValues& state)
{
    for (GLuint unit = 0; unit < kUnits; ++unit)
    {
        const auto texture = static_cast<GLuint>(state.textures[unit]);
        glActiveTexture(GL_TEXTURE0 + unit);
        const bool alive = glIsTexture(texture) != GL_FALSE;
        glBindTexture(GL_TEXTURE_2D, alive ? texture : 0);
        glBindSampler(unit, alive ? static_cast<GLuint>(state.samplers[unit]) : 0);
    }
    for (GLuint i = 0; i < kAttributes; ++i)
    {
        const Attribute& attribute = state.attributes[i];
        (attribute.enabled != 0 ? glEnableVertexAttribArray : glDisableVertexAttribArray)(i);
        glBindBuffer(GL_ARRAY_BUFFER, static_cast<GLuint>(attribute.buffer));
        glVertexAttribPointer(i, attribute.size, static_cast<GLenum>(attribute.type),
                              static_cast<GLboolean>(attribute.normalized), attribute.stride,
                              attribute.pointer);
    }
    glUseProgram(static_cast<GLuint>(state.program));
    glActiveTexture(static_cast<GLenum>(state.unit));
    for (int i = 0; i < 6; ++i)
    {
        if (kSwitches[i] != GL_DEPTH_WRITEMASK)
            (state.switches[i] != GL_FALSE ? glEnable : glDisable)(kSwitches[i]);
    }
    glBlendFunc(static_cast<GLenum>(state.blendSource),
                static_cast<GLenum>(state.blendDestination));
    glBindRenderbuffer(GL_RENDERBUFFER, static_cast<GLuint>(state.renderbuffer));
    glBindFramebuffer(GL_FRAMEBUFFER, static_cast<GLuint>(state.framebuffer));
    glBindBuffer(GL_ARRAY_BUFFER, static_cast<GLuint>(state.arrayBuffer));
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, static_cast<GLuint>(state.indexBuffer));
    glViewport(state.viewport[0], state.viewport[1], state.viewport[2], state.viewport[3]);
    glScissor(state.scissor[0], state.scissor[1], state.scissor[2], state.scissor[3]);
    glDepthMask(state.switches[2]);
    while (glGetError() != GL_NO_ERROR)
        continue;
}

} // namespace

void GlState(HotScene&, int times)
{
    GlStateValues state{};
    for (; times != 0; --times)
    {
        GlStore(state);
        GlRestore(state);
    }
}

void State(HotScene& scene, int times)
{
    for (; times != 0; --times)
    {
        scene.state.store();
        scene.state.restore();
    }
}

// ---- pixels -------------------------------------------------------------------------------------

void GlUpdate(HotScene& scene, int times)
{
    for (; times != 0; --times)
    {
        glBindTexture(GL_TEXTURE_2D, scene.glTexture);
        glPixelStorei(GL_UNPACK_SKIP_PIXELS, 0);
        glPixelStorei(GL_UNPACK_SKIP_ROWS, 0);
        glTexSubImage2D(GL_TEXTURE_2D, 0, 0, 0, kSide, kSide, GL_RGBA, GL_UNSIGNED_BYTE,
                        scene.pixels.data());
    }
}

void Update(HotScene& scene, int times)
{
    for (; times != 0; --times)
        scene.texture->Update(scene.pixels.data(), 0);
}

void GlSetData(HotScene& scene, int times)
{
    for (; times != 0; --times)
    {
        GLint previous = 0;
        glGetIntegerv(GL_TEXTURE_BINDING_2D, &previous);
        glBindTexture(GL_TEXTURE_2D, scene.glTexture);
        glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, kSide, kSide, 0, GL_RGBA, GL_UNSIGNED_BYTE,
                     scene.pixels.data());
        glBindTexture(GL_TEXTURE_2D, static_cast<GLuint>(previous));
    }
}

void SetData(HotScene& scene, int times)
{
    for (; times != 0; --times)
        scene.texture->SetData(scene.pixels.data(), 0);
}

void GlReadPixels(HotScene& scene, int times)
{
    for (; times != 0; --times)
        glReadPixels(0, 0, kSide, kSide, GL_RGBA, GL_UNSIGNED_BYTE, scene.pixels.data());
}

void ReadPixels(HotScene& scene, int times)
{
    for (; times != 0; --times)
        OpenGLRenderer::readPixels(0, 0, kSide, kSide, scene.pixels.data(),
                                   TextureTargetLayout::Rgba, TextureMemoryLayout::RGBA8);
}

// ---- a frame ------------------------------------------------------------------------------------

void GlPresent(HotScene&, int times)
{
    static const auto post = EntryPoint<PFNEGLPOSTSUBBUFFERNVPROC>("eglPostSubBufferNV");
    constexpr GLenum kDropped[] = {GL_DEPTH, GL_STENCIL};
    const EGLDisplay display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    const EGLSurface surface = eglGetCurrentSurface(EGL_DRAW);
    for (; times != 0; --times)
    {
        GLint framebuffer = 0;
        glGetIntegerv(GL_FRAMEBUFFER_BINDING, &framebuffer);
        glInvalidateFramebuffer(GL_FRAMEBUFFER, 2, kDropped);
        post(display, surface, 100, 200, 200, 60);
    }
}

void GlTiledPresent(HotScene&, int times)
{
    static const auto start = EntryPoint<PFNGLSTARTTILINGQCOMPROC>("glStartTilingQCOM");
    static const auto end = EntryPoint<PFNGLENDTILINGQCOMPROC>("glEndTilingQCOM");
    constexpr GLenum kDropped[] = {GL_DEPTH, GL_STENCIL};
    const EGLDisplay display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    const EGLSurface surface = eglGetCurrentSurface(EGL_DRAW);
    for (; times != 0; --times)
    {
        EGLint age = 0;
        GLint framebuffer = 0;
        glBindFramebuffer(GL_FRAMEBUFFER, 0);
        eglQuerySurface(display, surface, EGL_BUFFER_AGE_EXT, &age);
        start(100, 740, 200, 60, 0);
        end(GL_COLOR_BUFFER_BIT0_QCOM);
        glGetIntegerv(GL_FRAMEBUFFER_BINDING, &framebuffer);
        glInvalidateFramebuffer(GL_FRAMEBUFFER, 2, kDropped);
        eglSwapBuffers(display, surface);
    }
}

namespace
{

void PresentWith(UpdateRectangle& update, int times)
{
    const RectF dirty(100, 200, 300, 260);
    for (; times != 0; --times)
    {
        update.UseRect(dirty, 0);
        update.Reset();
        update.DoSwapBuffers();
    }
}

} // namespace

void Present(HotScene& scene, int times)
{
    PresentWith(scene.update, times);
}

void TiledPresent(HotScene& scene, int times)
{
    PresentWith(scene.tiled, times);
}

// ---- a program ----------------------------------------------------------------------------------

void GlProgram(HotScene&, int times)
{
    const ShaderProgramCache::BinaryShader& binary =
        *ShaderProgramCache::GetInstance()->GetBinaryShader(
            ShaderProgramCache::GetShaderKey(kVertexShader, kFragmentShader));
    for (; times != 0; --times)
    {
        const GLuint program = glCreateProgram();
        glProgramBinary(program, binary.format, binary.bytes, binary.length);
        GLint status = GL_FALSE;
        glGetProgramiv(program, GL_LINK_STATUS, &status);
        for (GLuint i = 0; i < binary.attributes.size(); ++i)
            glBindAttribLocation(program, i, binary.attributes[i].c_str());
        glDeleteProgram(program);
    }
}

void Program(HotScene&, int times)
{
    for (; times != 0; --times)
        RendererFactory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr)->Release();
}

// ---- the log ------------------------------------------------------------------------------------

void Filtered(HotScene& scene, int times)
{
    for (; times != 0; --times)
        NIB_LOG_DEBUG("%s. ScreenRect = %d * %d of %p", "void HotPaths::Filtered(HotScene&, int)",
                      kScreen, times, static_cast<void*>(&scene));
}

} // namespace HotPaths
