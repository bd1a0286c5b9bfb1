#ifndef NIB_TESTS_STUB_HOTPATHS_H
#define NIB_TESTS_STUB_HOTPATHS_H

#include "../Owned.h"

#include <nib/device.h>
#include <nib/geometry.h>
#include <nib/partial_update.h>
#include <nib/render_target.h>
#include <nib/shader.h>
#include <nib/texture.h>

#include <GLES3/gl3.h>

#include <cstdint>
#include <memory>
#include <vector>

/// What the paths below work on: a page, a program with two uniforms, a triangle, a texture of 64 x
/// 64 pixels, a frame that is presented in part. Made, used and ended on a render thread.
class HotScene
{
public:
    HotScene();
    ~HotScene();
    HotScene(const HotScene&) = delete;
    HotScene& operator=(const HotScene&) = delete;

    // The library's.
    Owned<Nib::ITextureObject> page;
    Owned<Nib::IOffscreenRenderTarget> target;
    Owned<Nib::IShaderProgram> program;
    Owned<Nib::IParameterBinding> transform;
    Owned<Nib::IParameterBinding> tint;
    Owned<Nib::IGraphicsObject> mesh;
    Owned<Nib::ITextureObject> texture;
    Nib::OpenGLRenderer::OpenGlState state;
    Nib::UpdateRectangle update; ///< presents a part of the window
    Nib::UpdateRectangle tiled;  ///< draws a part of the window, where the GPU renders in tiles

    // The same in GL's own names.
    GLuint glProgram = 0;
    GLint glTransform = -1;
    GLint glTint = -1;
    GLuint glVertices = 0;
    GLuint glTexture = 0;

    std::vector<std::uint32_t> pixels;

private:
    std::unique_ptr<Nib::EglSurface> m_screen;
};

/// One thing that drawing code does for every mesh or frame, with the library and as the GL calls
/// that the library makes for it, each as often as it is told. The functions stand alone, so that a
/// profile tells them apart by name.
struct HotPath
{
    using Function = void (*)(HotScene&, int times);

    const char* name;
    Function gl;      ///< null for what makes no call
    Function library; ///< makes the same calls
};

namespace HotPaths
{

void GlDraw(HotScene& scene, int times);
void Draw(HotScene& scene, int times); ///< Activate, SetValue twice, GraphicsObject::Draw
void GlState(HotScene& scene, int times);
void State(HotScene& scene, int times); ///< OpenGlState: store and restore
void GlUpdate(HotScene& scene, int times);
void Update(HotScene& scene, int times); ///< of a texture
void GlSetData(HotScene& scene, int times);
void SetData(HotScene& scene, int times); ///< of a texture
void GlReadPixels(HotScene& scene, int times);
void ReadPixels(HotScene& scene, int times);
void GlPresent(HotScene& scene, int times);
void Present(HotScene& scene, int times); ///< UseRect, Reset, DoSwapBuffers
void GlTiledPresent(HotScene& scene, int times);
void TiledPresent(HotScene& scene, int times); ///< the same in tiles
void GlProgram(HotScene& scene, int times);
void Program(HotScene& scene, int times);  ///< made from a binary in memory, and released
void Filtered(HotScene& scene, int times); ///< a log line that nobody wants to see
void Product3(HotScene&, int times);       ///< of matrices of 3x3, into a new one
void Product4(HotScene&, int times);
void Inverse3(HotScene&, int times);
void Inverse4(HotScene&, int times);
void MapRect(HotScene&, int times); ///< the box of a rectangle mapped by a matrix of 3x3

} // namespace HotPaths

inline constexpr HotPath kHotPaths[] = {
    {"Draw", &HotPaths::GlDraw, &HotPaths::Draw},
    {"State", &HotPaths::GlState, &HotPaths::State},
    {"Update", &HotPaths::GlUpdate, &HotPaths::Update},
    {"SetData", &HotPaths::GlSetData, &HotPaths::SetData},
    {"ReadPixels", &HotPaths::GlReadPixels, &HotPaths::ReadPixels},
    {"Present", &HotPaths::GlPresent, &HotPaths::Present},
    {"TiledPresent", &HotPaths::GlTiledPresent, &HotPaths::TiledPresent},
    {"Program", &HotPaths::GlProgram, &HotPaths::Program},
    {"Filtered", nullptr, &HotPaths::Filtered},
    {"Product3", nullptr, &HotPaths::Product3},
    {"Product4", nullptr, &HotPaths::Product4},
    {"Inverse3", nullptr, &HotPaths::Inverse3},
    {"Inverse4", nullptr, &HotPaths::Inverse4},
    {"MapRect", nullptr, &HotPaths::MapRect},
};

#endif
