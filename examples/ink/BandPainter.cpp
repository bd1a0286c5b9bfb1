#include "BandPainter.h"

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

// The edge holds how much of a pixel the ink covers, by the distance of the pixel's centre to the
// outline, from 2 pixels outside to 2 pixels inside.
const char* const kFragmentShader = R"(
precision highp float;
uniform sampler2D u_edge;
uniform vec4 u_colour;
varying float v_inside;
void main()
{
    float coverage = texture2D(u_edge, vec2(v_inside * 0.25 + 0.5, 0.5)).a;
    gl_FragColor = u_colour * coverage;
}
)";

constexpr int kEdgeUnit = 0;
constexpr int kEdgeWidth = 256;
constexpr float kEdgeReach = 2.0f;           // pixels to either side of the outline
constexpr unsigned int kLargestDraw = 49152; // vertices; a multiple of three

std::array<std::uint8_t, kEdgeWidth * 4> EdgePixels()
{
    std::array<std::uint8_t, kEdgeWidth * 4> pixels{};
    for (int i = 0; i < kEdgeWidth; ++i)
    {
        const float across = (static_cast<float>(i) + 0.5f) / kEdgeWidth;
        const float inside = (across * 2.0f - 1.0f) * kEdgeReach;
        const float coverage = std::clamp(inside + 0.5f, 0.0f, 1.0f);
        const auto value = static_cast<std::uint8_t>(coverage * 255.0f + 0.5f);
        std::fill_n(pixels.begin() + i * 4, 4, value);
    }
    return pixels;
}

Nib::VertexDescriptor BandVertex()
{
    using Type = Nib::VertexDescriptor::AttributeType;
    Nib::VertexDescriptor descriptor;
    descriptor.addAttribute(Type::Float, 2, Nib::VertexDescriptor::kPacked, 0); // a_position
    descriptor.addAttribute(Type::Float, 1, Nib::VertexDescriptor::kPacked, 0); // a_inside
    descriptor.usage = Nib::BufferUsage::Stream;
    return descriptor;
}

} // namespace

BandPainter::BandPainter() : m_program(kVertexShader, kFragmentShader)
{
    using Factory = Nib::RendererFactory;
    m_pageSize = m_program.Binding("u_pageSize");
    m_colour = m_program.Binding("u_colour");
    m_edgeUnit = m_program.Binding("u_edge");

    const Nib::VertexDescriptor vertex = BandVertex();
    m_mesh.reset(Factory::CreateGraphicsObject(1, Nib::PrimitiveType::Triangles, &vertex, 0, 0));

    Nib::TextureDescriptor edge; // RGBA, linear filters, clamped to the edge
    edge.width = kEdgeWidth;
    edge.height = 1;
    m_edge.Reset(Factory::CreateTextureObject(edge, EdgePixels().data(), nullptr, 0, nullptr),
                 "ink edge");
}

void BandPainter::Draw(const std::vector<Vertex>& triangles, const Colour& colour, int width,
                       int height)
{
    const float pageSize[] = {static_cast<float>(width), static_cast<float>(height)};
    m_program.Activate();
    m_pageSize->SetValue(pageSize);
    m_colour->SetValue(Premultiplied(colour).data());
    m_edgeUnit->SetValue(&kEdgeUnit);
    m_edge->Activate(kEdgeUnit);
    for (std::size_t first = 0; first < triangles.size(); first += kLargestDraw)
    {
        const std::size_t left = triangles.size() - first;
        const auto count = static_cast<unsigned int>(std::min<std::size_t>(left, kLargestDraw));
        m_mesh->UpdateBuffer(0, triangles.data() + first, count);
        m_mesh->Draw(0, static_cast<int>(count), false);
    }
}

void BandPainter::Suspend()
{
    m_edge.Forget();
}

void BandPainter::Resume()
{
    m_program.CountRestore();
    m_edge.Remember();
    m_edge->Update(EdgePixels().data(), 0);
}

} // namespace Ink
