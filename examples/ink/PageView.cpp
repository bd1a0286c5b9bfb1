#include "PageView.h"

#include <EGL/egl.h>

#include <algorithm>
#include <cmath>

namespace Ink
{
namespace
{

const char* const kVertexShader = R"(
attribute vec2 a_corner;
attribute vec2 a_place;
varying vec2 v_place;
void main()
{
    v_place = a_place;
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
constexpr unsigned int kCornerCount = 4;

// Corners of the surface, and places of the page there. The rows of a window count from the bottom,
// those of the page and of a screen from the top.
constexpr float kWindowQuad[] = {0, 0, 0, 1, 1, 0, 1, 1, 0, 1, 0, 0, 1, 1, 1, 0};
constexpr float kScreenQuad[] = {0, 0, 0, 0, 1, 0, 1, 0, 0, 1, 0, 1, 1, 1, 1, 1};

} // namespace

PageView::PageView(int width, int height, Surface surface)
    : m_width(width), m_height(height), m_program(kVertexShader, kFragmentShader),
      m_pageUnit(m_program.Binding("u_page"))
{
    using Factory = Nib::RendererFactory;
    if (surface == Surface::Screen)
        m_screen = std::make_unique<Page>(width, height, Colour(), "screen");
    else
        m_window.reset(Factory::CreateRenderTargetFromDefault(width, height));

    using Type = Nib::VertexDescriptor::AttributeType;
    Nib::VertexDescriptor corner;
    corner.addAttribute(Type::Float, 2); // a_corner
    corner.addAttribute(Type::Float, 2); // a_place
    m_quad.reset(Factory::CreateGraphicsObject(1, Nib::PrimitiveType::TriangleStrip, &corner,
                                               kCornerCount, 0));
    m_quad->UpdateBuffer(0, m_screen ? kScreenQuad : kWindowQuad, kCornerCount);
    m_blending.reset(Factory::CreateBlendStateObject(Nib::BlendStateDescriptor(false)));
}

void PageView::Draw(Nib::ITextureObject& page, const Nib::RectF& dirty)
{
    Nib::IRasterizerState* rasterizer = Nib::RendererFactory::GetRasterizerState();
    m_screen ? m_screen->Begin() : m_window->Activate();
    if (!m_isFirst && BackBufferIsKept())
        LimitTo(dirty);
    m_isFirst = false;
    m_program.Activate();
    m_pageUnit->SetValue(&kPageUnit);
    page.Activate(kPageUnit);
    m_blending->Activate();
    m_quad->Draw(0, kCornerCount, false);
    m_redrawnPixels += PixelsWithinScissor();
    rasterizer->SetScissorEnabled(false);
    if (m_screen)
        Nib::RendererFactory::GetContextHolder()->WaitForGpuCompletion();
}

std::vector<std::uint8_t> PageView::ReadScreen()
{
    return m_screen ? m_screen->ReadPixels() : std::vector<std::uint8_t>();
}

void PageView::Suspend()
{
    if (m_screen)
        m_screen->Suspend();
}

void PageView::Resume()
{
    m_program.CountRestore();
    m_quad->UpdateBuffer(0, m_screen ? kScreenQuad : kWindowQuad, kCornerCount);
    if (m_screen)
        m_screen->Resume();
}

bool PageView::BackBufferIsKept() const
{
    if (m_screen)
        return true;
    EGLint behaviour = EGL_BUFFER_DESTROYED;
    eglQuerySurface(eglGetCurrentDisplay(), eglGetCurrentSurface(EGL_DRAW), EGL_SWAP_BEHAVIOR,
                    &behaviour);
    return behaviour == EGL_BUFFER_PRESERVED;
}

void PageView::LimitTo(const Nib::RectF& dirty) const
{
    const int left = static_cast<int>(std::floor(dirty.left));
    const int top = static_cast<int>(std::floor(dirty.top));
    const int bottom = static_cast<int>(std::ceil(dirty.bottom));
    Nib::IRasterizerState::ScissorRect box;
    box.x = left;
    box.y = m_screen ? top : m_height - bottom;
    box.width = static_cast<int>(std::ceil(dirty.right)) - left;
    box.height = bottom - top;
    Nib::IRasterizerState* rasterizer = Nib::RendererFactory::GetRasterizerState();
    rasterizer->SetScissorRect(box);
    rasterizer->SetScissorEnabled(true);
}

long long PageView::PixelsWithinScissor() const
{
    const Nib::IRasterizerState* rasterizer = Nib::RendererFactory::GetRasterizerState();
    if (!rasterizer->IsScissorEnabled())
        return static_cast<long long>(m_width) * m_height;
    const Nib::IRasterizerState::ScissorRect box = rasterizer->GetScissorRect();
    const auto overlap = [](int first, int count, int size)
    { return std::max(0, std::min(first + count, size) - std::max(first, 0)); };
    return static_cast<long long>(overlap(box.x, box.width, m_width)) *
           overlap(box.y, box.height, m_height);
}

} // namespace Ink
