#include "InkPainter.h"

#include <algorithm>
#include <array>
#include <cstdint>

namespace Ink
{
namespace
{

// Row 0 of the page is its top, so that y needs no turning: the page's pixels come out of
// ReadPixels in the order in which files and screens want them.
const char* const kVertexShader = R"(
attribute vec2 a_position;
attribute float a_inside;
uniform vec2 u_pageSize;
varying float v_inside;
void main()
{
    v_inside = a_inside;
    gl_Position = vec4(a_position / u_pageSize * 2.0 - 1.0, 0.0, 1.0);
}
)";

// The brush holds how much of a pixel the ink covers, by the distance of the pixel's centre to the
// outline, from 2 pixels outside to 2 pixels inside.
const char* const kFragmentShader = R"(
precision highp float;
uniform sampler2D u_brush;
uniform vec4 u_colour;
varying float v_inside;
void main()
{
    float coverage = texture2D(u_brush, vec2(v_inside * 0.25 + 0.5, 0.5)).a;
    gl_FragColor = u_colour * coverage;
}
)";

constexpr int kBrushUnit = 0;
constexpr int kBrushWidth = 256;
constexpr float kBrushReach = 2.0f;          // pixels to either side of the outline
constexpr unsigned int kLargestDraw = 49152; // vertices; a multiple of three

std::array<std::uint8_t, kBrushWidth * 4> BrushPixels()
{
    std::array<std::uint8_t, kBrushWidth * 4> pixels{};
    for (int i = 0; i < kBrushWidth; ++i)
    {
        const float across = (static_cast<float>(i) + 0.5f) / kBrushWidth;
        const float inside = (across * 2.0f - 1.0f) * kBrushReach;
        const float coverage = std::clamp(inside + 0.5f, 0.0f, 1.0f);
        const auto value = static_cast<std::uint8_t>(coverage * 255.0f + 0.5f);
        std::fill_n(pixels.begin() + i * 4, 4, value);
    }
    return pixels;
}

Nib::VertexDescriptor InkVertex()
{
    using Type = Nib::VertexDescriptor::AttributeType;
    Nib::VertexDescriptor descriptor;
    descriptor.addAttribute(Type::Float, 2, Nib::VertexDescriptor::kPacked, 0); // a_position
    descriptor.addAttribute(Type::Float, 1, Nib::VertexDescriptor::kPacked, 0); // a_inside
    descriptor.usage = Nib::BufferUsage::Stream;
    return descriptor;
}

} // namespace

InkPainter::InkPainter()
{
    using Factory = Nib::RendererFactory;
    m_program.reset(Factory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr));
    m_pageSize.reset(m_program->GetBindingIntf("u_pageSize"));
    m_colour.reset(m_program->GetBindingIntf("u_colour"));
    m_brushUnit.reset(m_program->GetBindingIntf("u_brush"));

    const Nib::VertexDescriptor vertex = InkVertex();
    m_mesh.reset(Factory::CreateGraphicsObject(1, Nib::PrimitiveType::Triangles, &vertex, 0, 0));

    Nib::TextureDescriptor brush; // RGBA, linear filters, clamped to the edge
    brush.width = kBrushWidth;
    brush.height = 1;
    m_brush.Reset(Factory::CreateTextureObject(brush, BrushPixels().data(), nullptr, 0, nullptr),
                  "ink brush");

    m_blending.reset(Factory::CreateBlendStateObject(Nib::BlendStateDescriptor(true)));
}

void InkPainter::Draw(const std::vector<Vertex>& triangles, const Colour& colour, int width,
                      int height)
{
    if (triangles.empty())
        return;
    const float pageSize[] = {static_cast<float>(width), static_cast<float>(height)};
    const float premultiplied[] = {colour.red * colour.alpha, colour.green * colour.alpha,
                                   colour.blue * colour.alpha, colour.alpha};
    m_program->Activate();
    m_pageSize->SetValue(pageSize);
    m_colour->SetValue(premultiplied);
    m_brushUnit->SetValue(&kBrushUnit);
    m_brush->Activate(kBrushUnit);
    m_blending->Activate();
    for (std::size_t first = 0; first < triangles.size(); first += kLargestDraw)
    {
        const std::size_t left = triangles.size() - first;
        const auto count = static_cast<unsigned int>(std::min<std::size_t>(left, kLargestDraw));
        m_mesh->UpdateBuffer(0, triangles.data() + first, count);
        m_mesh->Draw(0, static_cast<int>(count), false);
    }
}

void InkPainter::ForgetContents()
{
    m_brush.Forget();
}

void InkPainter::RestoreContents()
{
    m_brush.Remember();
    m_brush->Update(BrushPixels().data(), 0);
}

} // namespace Ink
