#include "render/UpdateWindow.h"

#include <nib/base.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <set>

using Nib::System;
using Nib::UpdateRectangle;

// The update mode of every GPU that is known: the names decide, then the level of the API, then
// what the driver has.

namespace
{

using Lines = std::vector<std::string>;

/// What a device has beside its usual extensions.
enum class Has
{
    Usual,
    NoPartialUpdate,    // without EGL_KHR_partial_update
    NoPreservedSwap,    // the back buffer is always lost
    PostSubBuffer,      // eglPostSubBufferNV
    PostSubBufferTold,  // the extension, but no window supports it
    PartialUpdateAdded, // EGL_KHR_partial_update also where it is not usual
    TilingAdded,        // GL_QCOM_tiled_rendering also where it is not usual
};

struct Row
{
    const char* renderer;
    int sdk;
    Has has;
    unsigned mode;
    int tileSize;
};

void PrintTo(const Row& row, std::ostream* out)
{
    *out << row.renderer << ", level " << row.sdk;
}

SimGpu DeviceOf(const Row& row)
{
    const SimGpu gpu = SimGpu::Named(row.renderer);
    switch (row.has)
    {
    case Has::Usual: break;
    case Has::NoPartialUpdate: return gpu.WithoutEglExtension("EGL_KHR_partial_update");
    case Has::NoPreservedSwap: return gpu.WithoutPreservedSwap();
    case Has::PostSubBuffer: return gpu.WithPostSubBuffer();
    case Has::PostSubBufferTold: return gpu.WithPostSubBuffer(false);
    case Has::PartialUpdateAdded: return gpu.WithEglExtension("EGL_KHR_partial_update");
    case Has::TilingAdded: return gpu.WithGlExtension("GL_QCOM_tiled_rendering");
    }
    return gpu;
}

/// The lines that each mode has, with the one about buffer ages first where it belongs.
Lines LinesOf(const Row& row)
{
    static const std::set<std::string> noBufferAge = {"Adreno (TM) 330", "Adreno (TM) 306",
                                                      "Adreno (TM) 305", "Adreno (TM) 308"};
    Lines lines;
    if (noBufferAge.count(row.renderer) != 0)
        lines.push_back(". Do not use BUFFER_AGE_KHR extension!");
    switch (row.mode)
    {
    case 0x81: lines.push_back(" : eglPostSubBuffer Suported"); break;
    case 0x45: lines.push_back(": SupportPartialUpdateGPU Mode = 0x45"); break;
    case 0x07: lines.push_back(": Tiled Mali Renderer. Mode = 0x7"); break;
    case 0x25: lines.push_back(": QCOM tiled renderer. Mode = 0x25"); break;
    case 0x09: lines.push_back(": Preserve Behavior. Mode = 0x9"); break;
    case 0x01: lines.push_back(": Update full screen. Mode = 0x1"); break;
    default: lines.push_back("no such mode");
    }
    return lines;
}

constexpr Row kRows[] = {
    // As they come
    {"Adreno (TM) 305", 34, Has::Usual, 0x25, 0},
    {"Adreno (TM) 306", 34, Has::Usual, 0x25, 0},
    {"Adreno (TM) 308", 34, Has::Usual, 0x25, 0},
    {"Adreno (TM) 330", 34, Has::Usual, 0x25, 0},
    {"Adreno (TM) 530", 34, Has::Usual, 0x25, 0},
    {"Adreno (TM) 640", 34, Has::Usual, 0x09, 0},
    {"Mali-400 MP", 34, Has::Usual, 0x09, 0},
    {"Mali-450 MP", 34, Has::Usual, 0x09, 0},
    {"Mali-T720", 34, Has::Usual, 0x45, 0},
    {"Mali-T760", 34, Has::Usual, 0x45, 0},
    {"Mali-T820", 34, Has::Usual, 0x45, 0},
    {"Mali-T830", 34, Has::Usual, 0x45, 0},
    {"Mali-T860", 34, Has::Usual, 0x07, 32},
    {"Mali-T880", 34, Has::Usual, 0x45, 0},
    {"Mali-G71", 34, Has::Usual, 0x45, 0},
    {"Mali-G72", 34, Has::Usual, 0x45, 0},
    {"Mali-G76", 34, Has::Usual, 0x09, 0},
    {"PowerVR Rogue GE8320", 34, Has::Usual, 0x09, 0},

    // One of them changes with the API level; the others do not
    {"Mali-T760", 23, Has::Usual, 0x07, 32},
    {"Mali-T760", 25, Has::Usual, 0x07, 32},
    {"Mali-T760", 26, Has::Usual, 0x45, 0},
    {"Mali-T720", 25, Has::Usual, 0x45, 0},
    {"Mali-T820", 25, Has::Usual, 0x45, 0},
    {"Mali-T830", 25, Has::Usual, 0x45, 0},
    {"Mali-T860", 25, Has::Usual, 0x07, 32},
    {"Mali-T880", 25, Has::Usual, 0x45, 0},
    {"Mali-G71", 25, Has::Usual, 0x45, 0},
    {"Mali-G72", 25, Has::Usual, 0x45, 0},
    {"Mali-G76", 25, Has::Usual, 0x09, 0},

    // Names count from their beginning
    {"Mali-G71 MP20", 34, Has::Usual, 0x45, 0},
    {"Mali-G710", 34, Has::Usual, 0x45, 0},
    {"Mali-T860 MP2", 34, Has::Usual, 0x07, 32},
    {"Mali-T76", 34, Has::Usual, 0x09, 0},
    {"ARM Mali-G72", 34, Has::PartialUpdateAdded, 0x09, 0},
    {"mali-g72", 34, Has::PartialUpdateAdded, 0x09, 0},

    // Without the damage region its GPUs are like any other
    {"Mali-G72", 34, Has::NoPartialUpdate, 0x09, 0},
    {"Mali-T720", 34, Has::NoPartialUpdate, 0x09, 0},
    {"Mali-T760", 26, Has::NoPartialUpdate, 0x09, 0},
    {"Mali-T760", 25, Has::NoPartialUpdate, 0x07, 32},
    {"Mali-T860", 34, Has::NoPartialUpdate, 0x07, 32},

    // With it, others do not become one of its GPUs
    {"Adreno (TM) 330", 34, Has::PartialUpdateAdded, 0x25, 0},
    {"Adreno (TM) 640", 34, Has::PartialUpdateAdded, 0x09, 0},
    {"PowerVR Rogue GE8320", 34, Has::PartialUpdateAdded, 0x09, 0},

    // Where nothing else is there, and the back buffer is lost
    {"Adreno (TM) 640", 34, Has::NoPreservedSwap, 0x01, 0},
    {"Mali-400 MP", 34, Has::NoPreservedSwap, 0x01, 0},
    {"PowerVR Rogue GE8320", 34, Has::NoPreservedSwap, 0x01, 0},
    {"Mali-G72", 34, Has::NoPreservedSwap, 0x45, 0},
    {"Mali-T860", 34, Has::NoPreservedSwap, 0x07, 32},
    {"Adreno (TM) 530", 34, Has::NoPreservedSwap, 0x25, 0},

    // Posting a sub-buffer comes before everything
    {"Adreno (TM) 330", 34, Has::PostSubBuffer, 0x81, 0},
    {"Adreno (TM) 530", 34, Has::PostSubBuffer, 0x81, 0},
    {"Adreno (TM) 640", 34, Has::PostSubBuffer, 0x81, 0},
    {"Mali-400 MP", 34, Has::PostSubBuffer, 0x81, 0},
    {"Mali-T760", 25, Has::PostSubBuffer, 0x81, 0},
    {"Mali-T860", 34, Has::PostSubBuffer, 0x81, 0},
    {"Mali-G72", 34, Has::PostSubBuffer, 0x81, 0},

    // ... where windows support it
    {"Adreno (TM) 530", 34, Has::PostSubBufferTold, 0x25, 0},
    {"Adreno (TM) 640", 34, Has::PostSubBufferTold, 0x09, 0},
    {"Mali-G72", 34, Has::PostSubBufferTold, 0x45, 0},

    // Tiled rendering comes behind the lists of names
    {"Mali-G72", 34, Has::TilingAdded, 0x45, 0},
    {"Mali-T860", 34, Has::TilingAdded, 0x07, 32},
    {"PowerVR Rogue GE8320", 34, Has::TilingAdded, 0x25, 0},
};

class UpdateModes : public testing::TestWithParam<Row>
{
};

std::string NameOf(const testing::TestParamInfo<Row>& info)
{
    std::string name = std::string(info.param.renderer) + "_" + std::to_string(info.param.sdk) +
                       "_" + std::to_string(info.index);
    std::replace_if(
        name.begin(), name.end(),
        [](char c) { return !std::isalnum(static_cast<unsigned char>(c)); }, '_');
    return name;
}

} // namespace

TEST_P(UpdateModes, IsTheOneOfTheTable)
{
    const Row& row = GetParam();
    System::SetSDKVersion(row.sdk);
    UpdateWindow window(DeviceOf(row));
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(rectangle.GetUpdateMode(), row.mode);
    EXPECT_EQ(rectangle.GetTileSize(), row.tileSize);
    EXPECT_EQ(window.Decision(), LinesOf(row));
}

INSTANTIATE_TEST_SUITE_P(Table, UpdateModes, testing::ValuesIn(kRows), NameOf);

TEST(UpdateModesTable, HasARowForEveryDevice)
{
    std::set<std::string> rows;
    for (const Row& row : kRows)
    {
        if (row.has == Has::Usual && row.sdk == 34)
            rows.insert(row.renderer);
    }

    for (const SimGpu& gpu : SimGpu::All())
        EXPECT_EQ(rows.count(gpu.renderer), 1u) << gpu.renderer;
}
