#include "DeviceReport.h"

#include "EglReport.h"
#include "GlReport.h"
#include "LogLines.h"

#include "PostTask.h"

#include "device/DeviceLists.h"

#include <nib/nib.h>

#include <filesystem>
#include <memory>
#include <string>
#include <system_error>

namespace
{

constexpr int kSchema = 1;

Report Versions()
{
    return {{"headers", NIB_VERSION_STRING}, {"library", Nib::GetVersionString()}};
}

Report Settings()
{
    const char* const cache = Nib::System::GetSDKCacheDirectoryPath();
    return {{"sdkVersion", Nib::System::GetSDKVersion()},
            {"engineeringBuild", Nib::System::IsBuildTypeEngMode()},
            {"desktopFallbacks", Nib::System::GetDesktopFallbacks()},
            {"cacheDirectory", cache != nullptr ? Report(cache) : Report(nullptr)}};
}

// Whether the GPU is one that fails at drawing into its front buffer, as ReadGpuLists found.
bool IsBlocked(const Report& lists)
{
    for (const Report& list : lists)
    {
        if (list["meaning"] == kNoFrontBuffer)
            return list["matches"].get<bool>();
    }
    return false;
}

// The first error line of the display's start, without the function that it names.
std::string StartEgl()
{
    constexpr int kError = 6; // ANDROID_LOG_ERROR
    const LogLines log(kError);
    Nib::Egl::GetInstance();
    const std::vector<std::string> lines = log.Lines();
    if (lines.empty())
        return "no reason was logged";
    const std::size_t end = lines.front().find("): ");
    return end == std::string::npos ? lines.front() : lines.front().substr(end + 3);
}

Report FrontBuffer(const Report& gpuLists)
{
    const Nib::Egl& egl = *Nib::Egl::GetInstance();
    Report steps = Report::array();
    const auto add = [&steps](const std::string& step, bool passed) {
        steps.push_back({{"step", step}, {"passed", passed}});
    };
    for (const char* extension : Nib::kFrontBufferExtensions)
        add(extension, egl.IsEglExtensionSupported(extension));
    const bool supported = Nib::IsFBRSupported();
    add("a GPU that is not known to fail at it", !IsBlocked(gpuLists));
    add("a configuration with a mutable render buffer", egl.HasFrontBufferConfig());
    return {{"supported", supported}, {"steps", std::move(steps)}};
}

Report Timing()
{
    return {{"fences", Nib::Egl::GetInstance()->IsEglExtensionSupported("EGL_KHR_fence_sync")},
            {"frameTimestamps", Nib::EglFrameTime::IsFrameTimestampSupported()},
            {"presentationTime", Nib::IsPresentationTimeSupported()}};
}

Report ProgramCache()
{
    const char* const cache = Nib::System::GetSDKCacheDirectoryPath();
    if (cache == nullptr)
        return {{"missing", "no cache directory is set"}};
    const std::filesystem::path folder =
        std::filesystem::path(cache).parent_path() / "RendererCache";
    std::uintmax_t files = 0;
    std::uintmax_t bytes = 0;
    std::error_code absent;
    for (const auto& entry : std::filesystem::directory_iterator(folder, absent))
    {
        if (entry.path().extension() != ".dat")
            continue;
        std::error_code gone;
        const std::uintmax_t size = entry.file_size(gone);
        if (gone)
            continue;
        ++files;
        bytes += size;
    }
    return {{"folder", folder.string()}, {"exists", !absent}, {"files", files}, {"bytes", bytes}};
}

void MarkMissing(Report& report, const char* why)
{
    for (const char* section : {"gl", "gpuLists", "updateMode", "contextPriority", "frontBuffer"})
        report[section] = {{"missing", why}};
    report["compatible"] = nullptr;
}

// What only a thread with a context can tell.
void AskRenderThread(Report& report)
{
    const std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::RendererFactory::CreateSurfaceRenderer("nib info", Nib::RenderThreadGL::High));
    if (!thread->Start())
    {
        MarkMissing(report, "no render thread starts");
        return;
    }
    Ink::Post(*thread->GetMsgQueue(),
              [&report]
              {
                  report["gl"] = ReadGl();
                  report["gpuLists"] = ReadGpuLists();
                  report["updateMode"] = ReadUpdateMode();
                  report["contextPriority"] = ReadContextPriority();
              });
    thread->GetMsgQueue()->waitForCompleting();
    report["compatible"] = Nib::IsCompatibleGL();
    report["frontBuffer"] = FrontBuffer(report["gpuLists"]);
}

} // namespace

Report ReadDeviceReport()
{
    Report report = {{"schema", kSchema}, {"nib", Versions()}, {"settings", Settings()}};
    report["egl"] = ReadEgl(StartEgl());
    report["configurations"] = ReadConfigurations();
    if (Nib::Egl::GetInstance()->GetConfig(false) != nullptr)
        AskRenderThread(report);
    else
        MarkMissing(report, "EGL has no configuration to draw with");
    report["timing"] = Timing();
    report["programCache"] = ProgramCache();
    return report;
}
