#include "EglReport.h"

#include <nib/egl.h>

#include <EGL/egl.h>
#include <EGL/eglext.h>

#include <sstream>
#include <vector>

namespace
{

struct NamedAttribute
{
    const char* name;
    EGLint attribute;
};

constexpr NamedAttribute kSizes[] = {
    {"red", EGL_RED_SIZE},     {"green", EGL_GREEN_SIZE}, {"blue", EGL_BLUE_SIZE},
    {"alpha", EGL_ALPHA_SIZE}, {"depth", EGL_DEPTH_SIZE}, {"stencil", EGL_STENCIL_SIZE},
    {"samples", EGL_SAMPLES},
};

constexpr NamedAttribute kSurfaceTypes[] = {
    {"window", EGL_WINDOW_BIT},
    {"pbuffer", EGL_PBUFFER_BIT},
    {"pixmap", EGL_PIXMAP_BIT},
    {"preserved", EGL_SWAP_BEHAVIOR_PRESERVED_BIT},
    {"mutable render buffer", EGL_MUTABLE_RENDER_BUFFER_BIT_KHR},
};

EGLint Get(EGLConfig config, EGLint attribute)
{
    EGLint value = 0;
    eglGetConfigAttrib(Nib::Egl::GetInstance()->GetDisplay(), config, attribute, &value);
    return value;
}

EGLint DepthAndStencil(EGLConfig config)
{
    return Get(config, EGL_DEPTH_SIZE) + Get(config, EGL_STENCIL_SIZE);
}

bool IsRgba8888(EGLConfig config)
{
    return Get(config, EGL_RED_SIZE) == 8 && Get(config, EGL_GREEN_SIZE) == 8 &&
           Get(config, EGL_BLUE_SIZE) == 8 && Get(config, EGL_ALPHA_SIZE) == 8;
}

// The first thing that the list asks for and the configuration lacks; empty when it has all.
std::string Lacking(EGLConfig config, const EGLint* wanted)
{
    for (; *wanted != EGL_NONE; wanted += 2)
    {
        const EGLint have = Get(config, wanted[0]);
        if (wanted[0] == EGL_RENDERABLE_TYPE && (have & wanted[1]) != wanted[1])
            return "not for OpenGL ES 3";
        if (wanted[0] == EGL_SURFACE_TYPE && (have & wanted[1]) != wanted[1])
        {
            for (const NamedAttribute& type : kSurfaceTypes)
            {
                if ((wanted[1] & ~have & type.attribute) != 0)
                    return std::string("not for surfaces of type ") + type.name;
            }
        }
        else if (wanted[0] != EGL_RENDERABLE_TYPE && wanted[0] != EGL_SURFACE_TYPE &&
                 have < wanted[1])
            return "fewer colour bits than asked for";
    }
    return {};
}

std::string Verdict(EGLConfig config, const EGLint* wanted, EGLConfig chosen)
{
    if (config == chosen)
        return "chosen";
    // What the chosen one lacks, too, was not asked for in the end: a desktop fallback.
    std::string lacking = Lacking(config, wanted);
    if (!lacking.empty() && (chosen == nullptr || lacking != Lacking(chosen, wanted)))
        return lacking;
    if (!IsRgba8888(config))
        return "not exactly 8 bits for each of red, green, blue and alpha";
    if (chosen == nullptr)
        return "not chosen";
    if (DepthAndStencil(config) > DepthAndStencil(chosen))
        return "more depth and stencil bits than the chosen one";
    return "behind the chosen one in EGL's order";
}

std::vector<EGLConfig> AllConfigurations(EGLDisplay display)
{
    EGLint total = 0;
    eglGetConfigs(display, nullptr, 0, &total);
    std::vector<EGLConfig> configs(static_cast<std::size_t>(total));
    eglGetConfigs(display, configs.data(), total, &total);
    return configs;
}

Report Describe(EGLConfig config)
{
    if (config == nullptr)
        return nullptr;
    Report report = {{"id", Get(config, EGL_CONFIG_ID)}};
    for (const NamedAttribute& size : kSizes)
        report[size.name] = Get(config, size.attribute);
    report["surfaces"] = Report::array();
    for (const NamedAttribute& type : kSurfaceTypes)
    {
        if ((Get(config, EGL_SURFACE_TYPE) & type.attribute) != 0)
            report["surfaces"].push_back(type.name);
    }
    return report;
}

} // namespace

Report Words(const char* text)
{
    Report words = Report::array();
    std::istringstream stream(text != nullptr ? text : "");
    for (std::string word; stream >> word;)
        words.push_back(word);
    return words;
}

Report ReadEgl(const std::string& failure)
{
    const Nib::Egl& egl = *Nib::Egl::GetInstance();
    const EGLDisplay display = egl.GetDisplay();
    if (display == EGL_NO_DISPLAY)
        return {{"started", false}, {"missing", "EGL does not start: " + failure}};
    const auto text = [display](EGLint name) -> Report
    {
        const char* const value = eglQueryString(display, name);
        return value != nullptr ? Report(value) : Report(nullptr);
    };
    return {{"started", true},
            {"version", text(EGL_VERSION)},
            {"vendor", text(EGL_VENDOR)},
            {"apis", text(EGL_CLIENT_APIS)},
            {"extensions", Words(egl.GetEglExtensions())},
            {"clientExtensions", Words(eglQueryString(EGL_NO_DISPLAY, EGL_EXTENSIONS))}};
}

Report ReadConfigurations()
{
    const Nib::Egl& egl = *Nib::Egl::GetInstance();
    if (egl.GetDisplay() == EGL_NO_DISPLAY)
        return {{"missing", "EGL does not start"}};
    const EGLConfig ordinary = egl.GetConfig(false);
    const EGLConfig front = egl.HasFrontBufferConfig() ? egl.GetConfig(true) : nullptr;
    const EGLint* const frontList = egl.GetConfigAttributes(true);
    Report report = {{"ordinary", Describe(ordinary)}, {"frontBuffer", Describe(front)}};
    if (ordinary != nullptr)
    {
        const std::string lacking = Lacking(ordinary, egl.GetConfigAttributes(false));
        if (!lacking.empty())
            report["fallback"] = "the ordinary one is " + lacking + "; so are all others";
    }
    if (frontList == nullptr)
        report["frontBufferMissing"] = "the display has no EGL_KHR_mutable_render_buffer";
    report["all"] = Report::array();
    for (EGLConfig config : AllConfigurations(egl.GetDisplay()))
    {
        Report described = Describe(config);
        described["ordinary"] = Verdict(config, egl.GetConfigAttributes(false), ordinary);
        if (frontList != nullptr)
            described["frontBuffer"] = Verdict(config, frontList, front);
        report["all"].push_back(std::move(described));
    }
    return report;
}
