#include "PageView.h"

#include <EGL/egl.h>

#include <cmath>

namespace Ink
{
namespace
{

// The window's rows count from the bottom, the page's from the top.
const char* const kVertexShader = R"(
attribute vec2 a_corner;
varying vec2 v_place;
void main()
{
    v_place = vec2(a_corner.x, 1.0 - a_corner.y);
    gl_Position = vec4(a_corner * 2.0 - 1.0, 0.0, 1.0);
}
)";

const char* const kFragmentShader = R"(
precision highp float;
uniform sampler2D u_page;
varying vec2 v_place;
void main()
{
    gl_FragColor = texture2D(u_page, v_place);
}
)";

constexpr int kPageUnit = 0;
constexpr float kCorners[] = {0, 0, 1, 0, 0, 1, 1, 1};

} // namespace

PageView::PageView(int width, int height)
    : m_height(height), m_program(kVertexShader, kFragmentShader)
{
    using Factory = Nib::RendererFactory;
    m_window.reset(Factory::CreateRenderTargetFromDefault(width, height));
    m_pageUnit = m_program.Binding("u_page");

    Nib::VertexDescriptor corner;
    corner.addAttribute(Nib::VertexDescriptor::AttributeType::Float, 2,
                        Nib::VertexDescriptor::kPacked, 0);
    m_quad.reset(
        Factory::CreateGraphicsObject(1, Nib::PrimitiveType::TriangleStrip, &corner, 4, 0));
    m_quad->UpdateBuffer(0, kCorners, 4);
    m_blending.reset(Factory::CreateBlendStateObject(Nib::BlendStateDescriptor(false)));
}

void PageView::Draw(Nib::ITextureObject& page, const Nib::RectF& dirty)
{
    Nib::IRasterizerState* rasterizer = Nib::RendererFactory::GetRasterizerState();
    m_window->Activate();
    if (!m_isFirst && BackBufferIsKept())
        LimitTo(dirty);
    m_isFirst = false;
    m_program.Activate();
    m_pageUnit->SetValue(&kPageUnit);
    page.Activate(kPageUnit);
    m_blending->Activate();
    m_quad->Draw(0, 4, false);
    rasterizer->SetScissorEnabled(false);
}

bool PageView::BackBufferIsKept() const
{
    EGLint behaviour = EGL_BUFFER_DESTROYED;
    eglQuerySurface(eglGetCurrentDisplay(), eglGetCurrentSurface(EGL_DRAW), EGL_SWAP_BEHAVIOR,
                    &behaviour);
    return behaviour == EGL_BUFFER_PRESERVED;
}

void PageView::LimitTo(const Nib::RectF& dirty) const
{
    const int left = static_cast<int>(std::floor(dirty.left));
    const int bottom = static_cast<int>(std::ceil(dirty.bottom));
    Nib::IRasterizerState::ScissorRect box;
    box.x = left;
    box.y = m_height - bottom;
    box.width = static_cast<int>(std::ceil(dirty.right)) - left;
    box.height = bottom - static_cast<int>(std::floor(dirty.top));
    Nib::IRasterizerState* rasterizer = Nib::RendererFactory::GetRasterizerState();
    rasterizer->SetScissorRect(box);
    rasterizer->SetScissorEnabled(true);
}

} // namespace Ink
