#include "pictures/InkScene.h"

#include "InkSession.h"
#include "InkStroke.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <memory>
#include <stdexcept>

using namespace Ink;

namespace
{

constexpr float kPi = 3.14159265f;

Sample At(float x, float y, float pressure)
{
    Sample sample;
    sample.x = x;
    sample.y = y;
    sample.pressure = pressure;
    return sample;
}

/// Dots of every width, nowhere in the same place of their pixels.
Recording Dots()
{
    Recording recording;
    for (int row = 0; row < 5; ++row)
        for (int i = 0; i < 8; ++i)
        {
            const float x = 20.0f + 21.27f * static_cast<float>(i) + 3.1f * static_cast<float>(row);
            const float y =
                18.2f + 26.43f * static_cast<float>(row) + 1.37f * static_cast<float>(i);
            recording.strokes.push_back({At(x, y, static_cast<float>(i) / 7.0f)});
        }
    return recording;
}

/// Straight strokes in all directions, from thin to thick.
Recording Rays()
{
    Recording recording;
    for (int i = 0; i < 12; ++i)
    {
        const float angle = kPi / 6.0f * static_cast<float>(i) + 0.1f;
        const float x = std::cos(angle), y = std::sin(angle);
        recording.strokes.push_back({At(100 + 20 * x, 75 + 20 * y, 0.0f),
                                     At(100 + 40 * x, 75 + 40 * y, 0.5f),
                                     At(100 + 65 * x, 75 + 65 * y, 1.0f)});
    }
    return recording;
}

/// A spiral whose pressure comes and goes.
Recording Spiral()
{
    Recording recording;
    Stroke stroke;
    for (int i = 0; i < 90; ++i)
    {
        const float angle = 0.25f * static_cast<float>(i);
        const float radius = 4.0f + 2.6f * angle;
        stroke.push_back(At(100 + radius * std::cos(angle), 75 + radius * std::sin(angle),
                            0.5f + 0.5f * std::sin(0.7f * angle)));
    }
    recording.strokes.push_back(stroke);
    return recording;
}

/// Sharp turns, a turn back on itself, and a crossing.
Recording Corners()
{
    Recording recording;
    recording.strokes.push_back({At(20, 120, 1), At(40, 20, 1), At(60, 120, 1), At(80, 20, 0.4f),
                                 At(100, 120, 0.4f), At(120, 60, 0.8f)});
    recording.strokes.push_back({At(130, 30, 0.9f), At(180, 30, 0.9f), At(140, 31, 0.9f)});
    recording.strokes.push_back({At(130, 60, 0.6f), At(185, 130, 0.6f)});
    recording.strokes.push_back({At(185, 60, 0.6f), At(130, 130, 0.6f)});
    return recording;
}

Recording FromFile(const std::string& name)
{
    if (name == "sample")
        return ReadRecording(NIB_SAMPLE);
    const char* const folder = std::getenv("NIB_STROKES");
    return folder ? ReadRecording(std::string(folder) + "/" + name) : Recording();
}

/// The whole of a recording on a page with a tenth of its size around it.
Placement FitInto(const Recording& recording, int width, int height)
{
    double left = 1.0e30, right = -1.0e30, top = 1.0e30, bottom = -1.0e30;
    for (const Stroke& stroke : recording.strokes)
        for (const Sample& sample : stroke)
        {
            left = std::min<double>(left, sample.x);
            right = std::max<double>(right, sample.x);
            top = std::min<double>(top, sample.y);
            bottom = std::max<double>(bottom, sample.y);
        }
    const double scale = 0.9 * std::min(width / (right - left), height / (bottom - top));
    return {static_cast<float>(scale),
            static_cast<float>(0.5 * width - scale * (0.5 * left + 0.5 * right)),
            static_cast<float>(0.5 * height - scale * (0.5 * top + 0.5 * bottom))};
}

void DrawOn(Nib::RenderThreadGL& thread, const InkScene& scene, Picture& picture)
{
    InkSession session(thread, scene.width, scene.height, scene.paper);
    for (const Stroke& samples : scene.recording.strokes)
    {
        InkStroke stroke(scene.style);
        for (const Sample& sample : samples)
            stroke.Add(ToPage(sample, scene.placement, scene.style));
        stroke.End();
        session.Draw(stroke.Take());
    }
    picture.pixels = session.ReadPixels();
    if (!session.Error().empty())
        throw std::runtime_error(session.Error());
}

} // namespace

Picture Painted(const InkScene& scene)
{
    const std::unique_ptr<Nib::RenderThreadGL> parent(
        Nib::RendererFactory::CreateSurfaceRenderer("parent", Nib::RenderThreadGL::Medium));
    const std::unique_ptr<Nib::RenderThreadGL> thread(
        parent && parent->Start()
            ? Nib::RendererFactory::CreateOffscreenRenderer(parent->GetMsgQueue(), "page", true)
            : nullptr);
    if (!thread || !thread->Start())
        throw std::runtime_error("the render threads do not start");
    Picture picture;
    picture.width = scene.width;
    picture.height = scene.height;
    DrawOn(*thread, scene, picture);
    return picture;
}

Reference::Coverage ExpectedCoverage(const InkScene& scene)
{
    std::vector<std::vector<Reference::Disc>> strokes;
    for (const Stroke& samples : scene.recording.strokes)
    {
        Reference::PenStroke stroke;
        for (const Sample& sample : samples)
            stroke.push_back({double{sample.x} * scene.placement.scale + scene.placement.offsetX,
                              double{sample.y} * scene.placement.scale + scene.placement.offsetY,
                              sample.pressure});
        strokes.push_back(Reference::PlacesAlong(stroke, scene.style.width));
    }
    return Reference::CoverageOf(strokes, scene.width, scene.height);
}

InkScene SceneNamed(const std::string& name)
{
    // "corners-marker" is "corners" with the marker as it comes.
    const std::size_t dash = name.rfind('-');
    const auto brush = BrushNamed(dash < name.size() ? name.substr(dash + 1) : "");
    const std::string subject = brush ? name.substr(0, dash) : name;

    InkScene scene;
    scene.style.colour = {0.0f, 0.0f, 0.0f, 1.0f};
    scene.style.width = 12.0f;
    if (brush)
        scene.style = DefaultStyle(*brush);
    scene.width = 200;
    scene.height = 150;
    if (subject == "dots")
        scene.recording = Dots();
    else if (subject == "rays")
        scene.recording = Rays();
    else if (subject == "spiral")
        scene.recording = Spiral();
    else if (subject == "corners")
        scene.recording = Corners();
    else
    {
        scene.recording = FromFile(subject);
        scene.width = 960;
        scene.height = 600;
        scene.style.width = 8.0f;
        if (!scene.recording.strokes.empty())
            scene.placement = FitInto(scene.recording, scene.width, scene.height);
    }
    return scene;
}
