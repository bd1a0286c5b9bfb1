#include "faults/LifeRecord.h"

#include "faults/DrawingLife.h"
#include "faults/GuestLife.h"
#include "gles/CacheFiles.h"

#include <regex>
#include <sstream>

namespace
{

/// The error that a refused call of @p name has: for EGL one that the call is known for.
unsigned EglErrorOf(const std::string& name)
{
    if (name == "eglMakeCurrent")
        return EGL_BAD_ACCESS;
    if (name == "eglCreateWindowSurface")
        return EGL_BAD_NATIVE_WINDOW;
    if (name.rfind("eglSwapBuffers", 0) == 0 || name == "eglSurfaceAttrib")
        return EGL_BAD_SURFACE;
    if (name == "eglInitialize" || name == "eglGetDisplay")
        return EGL_NOT_INITIALIZED;
    return EGL_BAD_ALLOC;
}

unsigned GlErrorOf(const std::string& name)
{
    return name == "glCheckFramebufferStatus" ? GL_FRAMEBUFFER_UNSUPPORTED : GL_OUT_OF_MEMORY;
}

void Inject(SimDriver& driver, const Fault& fault)
{
    if (fault.kind == Fault::Refused)
        driver.FailAt(fault.call, EglErrorOf(fault.name), GlErrorOf(fault.name));
    if (fault.kind == Fault::ContextLost)
        driver.LoseContextsAt(fault.call);
}

std::string WithoutAddresses(const std::string& text)
{
    static const std::regex address("0x[0-9a-f]{4,}|/tmp/nib-[A-Za-z0-9]+");
    return std::regex_replace(text, address, "*");
}

void AddLine(std::string& report, char kind, std::string text)
{
    std::replace(text.begin(), text.end(), '\n', ' ');
    report += kind + text + "\n";
}

void AddObjects(std::string& report, const SimCounts& left)
{
    const std::pair<const char*, int> counts[] = {{"contexts", left.contexts},
                                                  {"surfaces", left.surfaces},
                                                  {"EGL-fences", left.eglSyncs},
                                                  {"textures", left.textures},
                                                  {"samplers", left.samplers},
                                                  {"buffers", left.buffers},
                                                  {"renderbuffers", left.renderbuffers},
                                                  {"framebuffers", left.framebuffers},
                                                  {"programs", left.programs},
                                                  {"shaders", left.shaders},
                                                  {"fences", left.syncs}};
    for (const auto& [kind, count] : counts)
        AddLine(report, 'o', std::string(kind) + " " + std::to_string(count));
}

std::unique_ptr<Life> MakeLife(LifeKind kind, SimDriver& driver)
{
    if (kind == LifeKind::Guest)
        return std::make_unique<GuestLife>(driver);
    return std::make_unique<DrawingLife>(driver);
}

std::string Live(const SimGpu& gpu, const Fault& fault, const std::string& sdkFolder, LifeKind kind)
{
    const CacheFolder cache;
    if (!sdkFolder.empty())
        Nib::System::SetSDKCacheDirectoryPath(sdkFolder.c_str());
    std::string report;
    SimDriver driver(gpu);
    driver.AllowMisuse();
    driver.NotePictures(true);
    Inject(driver, fault);
    {
        const std::unique_ptr<Life> life = MakeLife(kind, driver);
        life->Live();
        for (const std::string& note : life->Notes())
            AddLine(report, 'n', note);
    }
    for (const SimCall& call : driver.Calls())
    {
        const bool isPlatform = call.name.rfind("gl", 0) != 0 && call.name.rfind("egl", 0) != 0;
        if (!isPlatform)
            AddLine(report, 'c', call.name);
    }
    for (const SimPicture& picture : driver.Pictures())
    {
        std::ostringstream text;
        text << picture.where << " " << picture.digest;
        for (const int number : picture.area)
            text << " " << number;
        AddLine(report, 'p', text.str());
    }
    for (const SimLogLine& line : driver.Log())
    {
        if (line.priority >= ANDROID_LOG_WARN)
            AddLine(report, 'l', WithoutAddresses(line.text));
    }
    for (const std::string& misuse : driver.Misuses())
        AddLine(report, 'm', misuse);
    AddObjects(report, driver.Live());
    return report;
}

SimPicture ReadPicture(const std::string& text)
{
    std::istringstream words(text);
    SimPicture picture;
    words >> picture.where >> picture.digest;
    for (int& number : picture.area)
        words >> number;
    return picture;
}

/// "programs 2"
std::pair<std::string, int> ReadCount(const std::string& text)
{
    const std::size_t blank = text.find(' ');
    return {text.substr(0, blank), std::stoi(text.substr(blank))};
}

} // namespace

LifeRecord LiveOnce(const SimGpu& gpu, const Fault& fault, const std::string& sdkFolder,
                    LifeKind kind)
{
    LifeRecord record;
    record.run = RunInChild([&] { return Live(gpu, fault, sdkFolder, kind); });
    std::istringstream lines(record.run.report);
    for (std::string line; std::getline(lines, line);)
    {
        const std::string text = line.substr(1);
        switch (line.front())
        {
        case 'n': record.notes.push_back(text); break;
        case 'c': record.calls.push_back(text); break;
        case 'p': record.pictures.push_back(ReadPicture(text)); break;
        case 'l': record.log.push_back(text); break;
        case 'm': record.misuses.push_back(text); break;
        case 'o': record.left.insert(ReadCount(text)); break;
        default: record.run.end += "unknown line: " + line; break;
        }
    }
    return record;
}
