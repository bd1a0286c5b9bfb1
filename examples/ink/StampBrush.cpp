#include "StampBrush.h"

#include "Grain.h"

#include <algorithm>

namespace Ink
{
namespace
{

// A dab is an ellipse, its print a disc: turned before it is stretched, it stays inside.
const char* const kVertexShader = R"(
attribute vec2 a_corner;
attribute vec2 a_middle;
attribute vec2 a_along;
attribute vec3 a_print; // breadth, opacity, roll
uniform vec2 u_pageSize;
varying vec2 v_place;
varying float v_opacity;
void main()
{
    float c = cos(a_print.z), s = sin(a_print.z);
    v_place = vec2(c * a_corner.x - s * a_corner.y, s * a_corner.x + c * a_corner.y) * 0.5 + 0.5;
    v_opacity = a_print.y;
    vec2 across = vec2(-a_along.y, a_along.x) * (a_print.x / length(a_along));
    vec2 position = a_middle + a_corner.x * a_along + a_corner.y * across;
    gl_Position = vec4(position / u_pageSize * 2.0 - 1.0, 0.0, 1.0);
}
)";

const char* const kFragmentShader = R"(
precision highp float;
uniform sampler2D u_grain;
uniform vec4 u_colour;
varying vec2 v_place;
varying float v_opacity;
void main()
{
    gl_FragColor = u_colour * (texture2D(u_grain, v_place).a * v_opacity);
}
)";

constexpr int kGrainUnit = 0;
constexpr int kGrainSide = 48;
constexpr float kCorners[] = {-1, -1, 1, -1, -1, 1, 1, 1};
constexpr unsigned int kCornerCount = 4;
constexpr std::size_t kLargestDraw = 16384; // dabs

enum Buffer : unsigned int
{
    kCornerBuffer,
    kDabBuffer,
    kBufferCount
};

Owned<Nib::IGraphicsObject> DabMesh()
{
    using Type = Nib::VertexDescriptor::AttributeType;
    constexpr int kPacked = Nib::VertexDescriptor::kPacked;
    constexpr int kEachInstance = 1;
    Nib::VertexDescriptor buffers[kBufferCount];
    buffers[kCornerBuffer].addAttribute(Type::Float, 2); // a_corner
    buffers[kCornerBuffer].usage = Nib::BufferUsage::Static;
    buffers[kDabBuffer].addAttribute(Type::Float, 2, kPacked, kEachInstance); // a_middle
    buffers[kDabBuffer].addAttribute(Type::Float, 2, kPacked, kEachInstance); // a_along
    buffers[kDabBuffer].addAttribute(Type::Float, 3, kPacked, kEachInstance); // a_print
    buffers[kDabBuffer].usage = Nib::BufferUsage::Stream;
    return Owned<Nib::IGraphicsObject>(Nib::RendererFactory::CreateGraphicsObject(
        kBufferCount, Nib::PrimitiveType::TriangleStrip, buffers, 0, 0));
}

Nib::ITextureObject* GrainTexture()
{
    Nib::TextureDescriptor grain; // RGBA, linear filters, clamped to the edge
    grain.width = grain.height = kGrainSide;
    return Nib::RendererFactory::CreateTextureObject(grain, GrainPixels(kGrainSide).data(), nullptr,
                                                     0, nullptr);
}

} // namespace

StampBrush::StampBrush()
    : m_program(kVertexShader, kFragmentShader), m_pageSize(m_program.Binding("u_pageSize")),
      m_colour(m_program.Binding("u_colour")), m_grainUnit(m_program.Binding("u_grain")),
      m_dabs(DabMesh()),
      m_over(Nib::RendererFactory::CreateBlendStateObject(Nib::BlendStateDescriptor(true)))
{
    m_dabs->UpdateBuffer(kCornerBuffer, kCorners, kCornerCount);
    m_grain.Reset(GrainTexture(), "ink grain");
}

void StampBrush::Paint(const InkPiece& piece, Page& page)
{
    const float pageSize[] = {static_cast<float>(page.Width()), static_cast<float>(page.Height())};
    page.Begin();
    m_program.Activate();
    m_pageSize->SetValue(pageSize);
    m_colour->SetValue(Premultiplied(CoatOf(piece.style)).data());
    m_grainUnit->SetValue(&kGrainUnit);
    m_grain->Activate(kGrainUnit);
    m_over->Activate();
    for (std::size_t first = 0; first < piece.dabs.size(); first += kLargestDraw)
    {
        const std::size_t count = std::min(piece.dabs.size() - first, kLargestDraw);
        m_dabs->UpdateBuffer(kDabBuffer, piece.dabs.data() + first,
                             static_cast<unsigned int>(count));
        m_dabs->DrawInstanced(0, kCornerCount, static_cast<int>(count));
    }
    page.End();
}

void StampBrush::Suspend()
{
    m_grain.Forget();
}

void StampBrush::Resume()
{
    m_program.CountRestore();
    m_dabs->UpdateBuffer(kCornerBuffer, kCorners, kCornerCount);
    m_grain.Remember();
    m_grain->Update(GrainPixels(kGrainSide).data(), 0);
}

} // namespace Ink
