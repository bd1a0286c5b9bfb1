#include "faults/FaultVerdict.h"

#include <algorithm>
#include <map>
#include <set>

namespace
{

using Texts = std::vector<std::string>;
using Names = std::set<std::string>;

// GL functions whose refusal may go by with a wrong picture and no log line. The renderer asks for
// no error behind these calls: an answer would have to be waited for, in every frame. What is
// refused stays in GL's error flag, where an application can look once a frame.
const Names& ToldByGlAlone()
{
    static const auto* names = new Names{
        // A draw goes into another target, with another program, picture or sampler.
        "glActiveTexture", "glBindFramebuffer", "glBindSampler", "glBindTexture", "glUseProgram",
        // A draw is clipped, blended or tested otherwise than it was told to.
        "glBlendFuncSeparate", "glDisable", "glEnable", "glScissor", "glStencilFunc",
        "glStencilMask",
        // A draw reads other uniforms: those of before.
        "glBindBufferBase", "glUniform1i", "glUniformBlockBinding", "glUniformMatrix4fv",
        // A draw reads other vertices; the name 0 of a buffer is what it draws without.
        "glBindBuffer", "glBufferData", "glEnableVertexAttribArray", "glGenBuffers",
        "glVertexAttribDivisor", "glVertexAttribPointer",
        // Pixels are not made, or made in the colour of before, or not handed out.
        "glClear", "glClearColor", "glDrawArraysInstanced", "glDrawElements", "glReadPixels",
        "glTexSubImage2D",
        // The end of a frame in the front buffer: it is shown when the driver likes.
        "glFinish"};
    return *names;
}

// Those whose refusal is seen later in the error flag, and logged, but not on a device where the flag
// is taken already: GL keeps the first error alone.
const Names& ToldByTheFirstError()
{
    static const auto* names =
        new Names{"glGenSamplers",          "glGetActiveUniform",  "glGetProgramiv",
                  "glGetUniformBlockIndex", "glSamplerParameteri", "glTexImage2D"};
    return *names;
}

bool IsToldByGlAlone(const LifeRecord& whole, const std::string& name)
{
    const bool isFlagTaken = std::any_of(whole.log.begin(), whole.log.end(),
                                         [](const std::string& line)
                                         { return line.find("glError = ") != std::string::npos; });
    return ToldByGlAlone().count(name) != 0 ||
           (isFlagTaken && ToldByTheFirstError().count(name) != 0);
}

// The kind of object that a refusal of @p name leaves, since the driver kept what it was to delete.
std::string KindLeftBy(const std::string& name)
{
    static const auto* kinds = new std::map<std::string, std::string>{
        {"eglDestroySurface", "surfaces"}, {"glDeleteBuffers", "buffers"},
        {"glDeleteProgram", "programs"},   {"glDeleteRenderbuffers", "renderbuffers"},
        {"glDeleteSamplers", "samplers"},  {"glDeleteShader", "shaders"},
        {"glDeleteSync", "fences"},        {"glDeleteTextures", "textures"}};
    const auto found = kinds->find(name);
    return found == kinds->end() ? "" : found->second;
}

// Where a refusal makes a program binary not load: the name of the program that was to take it stays in
// the context on purpose.
const Names& MakesABinaryRefused()
{
    static const auto* names =
        new Names{"glProgramBinary", // it is refused itself
                  "glGetProgramiv", // its link status is not told; or its length, when it is stored
                  "glGetProgramBinary"}; // what is stored is not a binary
    return *names;
}

// Where a refusal makes a build of a program fail, and the next use builds it again: on a driver
// without program binaries each attempt begins with one that is refused, and leaves its name.
const Names& MakesABuildFail()
{
    static const auto* names =
        new Names{"glAttachShader", "glCompileShader", "glCreateProgram", "glCreateShader",
                  "glGetProgramiv", "glGetShaderiv",   "glLinkProgram",   "glShaderSource"};
    return *names;
}

// GL functions that the library calls on a thread that has lost its context.
const Names& CalledWithoutContext()
{
    static const auto* names = new Names{
        // the end of a frame and the change of a window, whether or not a context is current
        "glDisable", "glFinish", "glGetIntegerv", "glInvalidateFramebuffer", "glGetString",
        // the end of objects, which goes on without asking
        "glDeleteBuffers", "glDeleteFramebuffers", "glDeleteProgram", "glDeleteRenderbuffers",
        "glDeleteSamplers", "glDeleteSync", "glDeleteTextures", "glDeleteShader",
        // the restoration after a resume whose context did not become current: it is tried, and
        // each object tells how it went
        "glBindBuffer", "glBufferData", "glCompileShader", "glCreateProgram", "glCreateShader",
        "glGenBuffers", "glGenRenderbuffers", "glGenSamplers", "glGenTextures", "glGetError",
        "glGetProgramiv", "glGetShaderInfoLog", "glGetShaderiv", "glProgramBinary",
        "glShaderSource"};
    return *names;
}

/// What is in @p all and not in @p known, each as often as it is there more often.
Texts Further(const Texts& all, Texts known)
{
    Texts further;
    for (const std::string& text : all)
    {
        const auto found = std::find(known.begin(), known.end(), text);
        if (found == known.end())
            further.push_back(text);
        else
            known.erase(found);
    }
    return further;
}

/// Whether the same was drawn, and at least the part that was to be shown was shown.
bool ShowsAsMuch(const SimPicture& shown, const SimPicture& wanted)
{
    const auto end = [](const SimPicture& picture, int axis)
    { return picture.area[axis] + picture.area[axis + 2]; };
    return shown.where == wanted.where && shown.digest == wanted.digest &&
           shown.area[0] <= wanted.area[0] && shown.area[1] <= wanted.area[1] &&
           end(shown, 0) >= end(wanted, 0) && end(shown, 1) >= end(wanted, 1);
}

/// Whether one object of @p kind more than in @p whole is what @p fault has to leave.
bool MayStay(const LifeRecord& whole, const Fault& fault, const std::string& kind)
{
    if (kind == KindLeftBy(fault.name))
        return true;
    const bool loadsNoBinary = whole.left.at("programs") > 0;
    return kind == "programs" && (MakesABinaryRefused().count(fault.name) != 0 ||
                                  (loadsNoBinary && MakesABuildFail().count(fault.name) != 0));
}

/// Complains about objects that the driver has at the end beyond those of @p whole.
void CheckLeft(const LifeRecord& whole, const LifeRecord& faulty, const Fault& fault, Texts& out)
{
    const bool isRefused = fault.kind == Fault::Refused;
    if (isRefused && fault.name == "eglDestroyContext")
        return; // it stays with all that is in it
    for (const auto& [kind, count] : faulty.left)
    {
        const int allowed =
            whole.left.at(kind) + (isRefused && MayStay(whole, fault, kind) ? 1 : 0);
        if (count > allowed)
            out.push_back(std::to_string(count) + " " + kind + " left, not " +
                          std::to_string(allowed));
    }
}

void CheckContexts(const LifeRecord& faulty, Texts& out)
{
    const std::string without = ": no context is current";
    for (const std::string& misuse : faulty.misuses)
    {
        const std::size_t at = misuse.find(without);
        if (at != std::string::npos && CalledWithoutContext().count(misuse.substr(0, at)) == 0)
            out.push_back(misuse);
    }
}

} // namespace

FaultVerdict Judge(const LifeRecord& whole, const LifeRecord& faulty, const Fault& fault)
{
    FaultVerdict verdict;
    if (!faulty.run.end.empty())
    {
        verdict.complaints = {faulty.run.end, faulty.run.messages, faulty.run.stuck};
        return verdict;
    }
    verdict.isRight = std::equal(faulty.pictures.begin(), faulty.pictures.end(),
                                 whole.pictures.begin(), whole.pictures.end(), ShowsAsMuch);
    verdict.isLogged = !Further(faulty.log, whole.log).empty();
    verdict.isNoted = !Further(faulty.notes, whole.notes).empty();
    verdict.isGlError = fault.kind == Fault::Refused && IsToldByGlAlone(whole, fault.name);
    if (!verdict.isRight && !verdict.isLogged && !verdict.isNoted && !verdict.isGlError)
        verdict.complaints.emplace_back("a wrong picture, and nothing tells");
    if (faulty.calls.size() < fault.call || faulty.calls[fault.call - 1] != fault.name)
        verdict.complaints.emplace_back("the calls before the fault differ");
    CheckLeft(whole, faulty, fault, verdict.complaints);
    CheckContexts(faulty, verdict.complaints);
    return verdict;
}
