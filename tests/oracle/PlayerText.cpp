#include "oracle/Player.h"

#include <ostream>

namespace Oracle
{

SimGpu GpuOf(Device device)
{
    const SimGpu plain = SimGpu::Named("PowerVR Rogue GE8320");
    switch (device)
    {
    case Device::PostSubBuffer: return plain.WithPostSubBuffer();
    case Device::DamageRegion: return SimGpu::Named("Mali-G72");
    case Device::TileAligned: return SimGpu::Named("Mali-T860");
    case Device::TiledRendering: return SimGpu::Named("Adreno (TM) 530");
    case Device::TiledRenderingNoAge: return SimGpu::Named("Adreno (TM) 330");
    case Device::TiledRenderingAgeless:
        return SimGpu::Named("Adreno (TM) 530").WithoutEglExtension("EGL_EXT_buffer_age");
    case Device::Preserved:
    case Device::PreservedOnce: return plain;
    case Device::FullScreen: return plain.WithoutPreservedSwap();
    }
    return plain;
}

const char* NameOf(Device device)
{
    switch (device)
    {
    case Device::PostSubBuffer: return "PostSubBuffer";
    case Device::DamageRegion: return "DamageRegion";
    case Device::TileAligned: return "TileAligned";
    case Device::TiledRendering: return "TiledRendering";
    case Device::TiledRenderingNoAge: return "TiledRenderingNoAge";
    case Device::TiledRenderingAgeless: return "TiledRenderingAgeless";
    case Device::Preserved: return "Preserved";
    case Device::PreservedOnce: return "PreservedOnce";
    case Device::FullScreen: return "FullScreen";
    }
    return "?";
}

void PrintTo(Device device, std::ostream* out)
{
    *out << NameOf(device);
}

namespace
{

std::string Habit(const char* field, bool holds)
{
    return holds ? "" : "    caller." + std::string(field) + " = false;\n";
}

std::string ToStatements(const Caller& caller)
{
    std::string text = "    Caller caller;\n";
    text += Habit("namesTheFirstFrameWhole", caller.namesTheFirstFrameWhole);
    if (caller.namesEveryFrameWhole)
        text += "    caller.namesEveryFrameWhole = true;\n";
    text += Habit("namesEmptyFrames", caller.namesEmptyFrames);
    text += Habit("namesOneRectangle", caller.namesOneRectangle);
    text += Habit("namesWholePixels", caller.namesWholePixels);
    text += Habit("namesOnlyTheScreen", caller.namesOnlyTheScreen);
    text += Habit("turnsForSubBuffers", caller.turnsForSubBuffers);
    text += Habit("drawsWhatTheModeAsks", caller.drawsWhatTheModeAsks);
    if (caller.historyLength != Caller().historyLength)
        text += "    caller.historyLength = " + std::to_string(caller.historyLength) + ";\n";
    return text;
}

} // namespace

std::string Player::ToTest(const Scenario& scenario, const std::string& name) const
{
    std::string text = "TEST(PartialUpdateFound, " + name + ")\n{\n";
    if (m_caller != Caller())
        text += ToStatements(m_caller);
    text += "    Player player(Device::" + std::string(NameOf(m_device)) +
            (m_caller != Caller() ? ", caller);\n" : ");\n");
    text += ToStatements(scenario);
    return text + "\n    EXPECT_EQ(player.Play(scenario), \"\");\n}\n";
}

} // namespace Oracle
