#include "CoatPainter.h"

namespace Ink
{
namespace
{

const char* const kVertexShader = R"(
attribute vec2 a_position;
uniform vec2 u_pageSize;
varying vec2 v_place;
void main()
{
    v_place = a_position / u_pageSize;
    gl_Position = vec4(v_place * 2.0 - 1.0, 0.0, 1.0);
}
)";

const char* const kFragmentShader = R"(
precision highp float;
uniform sampler2D u_below;
uniform sampler2D u_coverage;
uniform vec4 u_colour;
varying vec2 v_place;
void main()
{
    vec4 coat = u_colour * texture2D(u_coverage, v_place).a;
    gl_FragColor = coat + texture2D(u_below, v_place) * (1.0 - coat.a);
}
)";

constexpr int kBelowUnit = 0;
constexpr int kCoverageUnit = 1;
constexpr Colour kNothing{0.0f, 0.0f, 0.0f, 0.0f};

struct Corner
{
    float x, y;
};

std::vector<Corner> Triangles(const std::vector<PixelRect>& areas)
{
    std::vector<Corner> corners;
    corners.reserve(areas.size() * 6);
    for (const PixelRect& area : areas)
    {
        const auto left = static_cast<float>(area.left), right = static_cast<float>(area.right);
        const auto top = static_cast<float>(area.top), bottom = static_cast<float>(area.bottom);
        corners.insert(corners.end(), {{left, top},
                                       {right, top},
                                       {left, bottom},
                                       {left, bottom},
                                       {right, top},
                                       {right, bottom}});
    }
    return corners;
}

} // namespace

CoatPainter::CoatPainter()
    : m_program(kVertexShader, kFragmentShader), m_pageSize(m_program.Binding("u_pageSize")),
      m_colour(m_program.Binding("u_colour")), m_belowUnit(m_program.Binding("u_below")),
      m_coverageUnit(m_program.Binding("u_coverage"))
{
    using Factory = Nib::RendererFactory;
    Nib::VertexDescriptor corner;
    corner.addAttribute(Nib::VertexDescriptor::AttributeType::Float, 2);
    corner.usage = Nib::BufferUsage::Stream;
    m_mesh.reset(Factory::CreateGraphicsObject(1, Nib::PrimitiveType::Triangles, &corner, 0, 0));
    m_replacing.reset(Factory::CreateBlendStateObject(Nib::BlendStateDescriptor(false)));
}

void CoatPainter::Lay(const std::vector<PixelRect>& areas, Page& below, Page& coverage,
                      const Colour& colour, Page& target)
{
    if (areas.empty())
        return;
    const float pageSize[] = {static_cast<float>(target.Width()),
                              static_cast<float>(target.Height())};
    const std::vector<Corner> corners = Triangles(areas);
    target.Begin();
    m_program.Activate();
    m_pageSize->SetValue(pageSize);
    m_colour->SetValue(Premultiplied(colour).data());
    m_belowUnit->SetValue(&kBelowUnit);
    m_coverageUnit->SetValue(&kCoverageUnit);
    below.Texture().Activate(kBelowUnit);
    coverage.Texture().Activate(kCoverageUnit);
    m_replacing->Activate();
    m_mesh->UpdateBuffer(0, corners.data(), static_cast<unsigned int>(corners.size()));
    m_mesh->Draw(0, static_cast<int>(corners.size()), false);
    target.End();
}

void CoatPainter::Copy(const std::vector<PixelRect>& areas, Page& source, Page& target)
{
    Lay(areas, source, source, kNothing, target); // a coat of nothing, whatever it covers
}

} // namespace Ink
