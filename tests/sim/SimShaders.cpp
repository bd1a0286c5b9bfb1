#include "SimPrograms.h"
#include "SimShaderText.h"

#include <cstring>

// Shader objects.

namespace Sim
{

void CopyText(const std::string& text, GLsizei size, GLsizei* length, GLchar* out)
{
    const std::size_t room = size > 0 ? static_cast<std::size_t>(size) - 1 : 0;
    const std::size_t count = std::min(text.size(), room);
    if (size > 0 && out)
    {
        std::memcpy(out, text.data(), count);
        out[count] = '\0';
    }
    if (length)
        *length = static_cast<GLsizei>(count);
}

Shader* FindShader(GlEntry& entry, GLuint name)
{
    Shader* const shader = entry.Group().shaders.Find(name);
    if (!shader)
        entry.Misuse(entry.Group().programs.Find(name) ? GL_INVALID_OPERATION : GL_INVALID_VALUE,
                     "there is no shader " + std::to_string(name));
    return shader;
}

void BuryShader(ShareGroup& group, GLuint name)
{
    const Shader* const shader = group.shaders.Find(name);
    if (shader && shader->deleted && shader->attachments == 0)
        group.shaders.Erase(name);
}

} // namespace Sim

using namespace Sim;

SIM_API GLuint glCreateShader(GLenum type)
{
    GlEntry entry("glCreateShader", {type});
    if (!entry)
        return 0;
    if (!IsOneOf(type, {GL_VERTEX_SHADER, GL_FRAGMENT_SHADER}))
    {
        entry.Misuse(GL_INVALID_ENUM, "no such shader type: " + Hex(type));
        return 0;
    }
    const GLuint name = NewProgramName(entry.Group());
    entry.Group().shaders.Adopt(name).type = type;
    return name;
}

SIM_API void glDeleteShader(GLuint name)
{
    GlEntry entry("glDeleteShader", {name});
    if (!entry || name == 0)
        return;
    Shader* const shader = FindShader(entry, name);
    if (!shader)
        return;
    if (shader->deleted)
        entry.Misuse("the shader was deleted already");
    shader->deleted = true;
    BuryShader(entry.Group(), name);
}

SIM_API GLboolean glIsShader(GLuint name)
{
    GlEntry entry("glIsShader", {name});
    return entry && entry.Group().shaders.Find(name) ? GL_TRUE : GL_FALSE;
}

SIM_API void glShaderSource(GLuint name, GLsizei count, const GLchar* const* strings,
                            const GLint* lengths)
{
    GlEntry entry("glShaderSource", {name, count, (const void*)strings, (const void*)lengths});
    Shader* const shader = entry && CheckCount(entry, count) ? FindShader(entry, name) : nullptr;
    if (!shader)
        return;
    shader->source.clear();
    for (GLsizei i = 0; i < count; ++i)
    {
        if (lengths && lengths[i] >= 0)
            shader->source.append(strings[i], static_cast<std::size_t>(lengths[i]));
        else
            shader->source.append(strings[i]);
    }
}

SIM_API void glCompileShader(GLuint name)
{
    GlEntry entry("glCompileShader", {name});
    Shader* const shader = entry ? FindShader(entry, name) : nullptr;
    if (!shader)
        return;
    shader->log.clear();
    std::vector<std::string>& failures = entry.state.compileFailures;
    if (!failures.empty())
    {
        shader->log = failures.front();
        failures.erase(failures.begin());
        shader->compiled = false;
        return;
    }
    shader->log = ReadShader(shader->source).error;
    shader->compiled = shader->log.empty();
}

SIM_API void glGetShaderiv(GLuint name, GLenum parameter, GLint* params)
{
    GlEntry entry("glGetShaderiv", {name, parameter, (const void*)params});
    const Shader* const shader = entry ? FindShader(entry, name) : nullptr;
    if (!shader)
        return;
    const auto lengthOf = [](const std::string& text)
    { return text.empty() ? 0 : static_cast<GLint>(text.size()) + 1; };
    switch (parameter)
    {
    case GL_SHADER_TYPE: *params = static_cast<GLint>(shader->type); break;
    case GL_DELETE_STATUS: *params = shader->deleted; break;
    case GL_COMPILE_STATUS: *params = shader->compiled; break;
    case GL_INFO_LOG_LENGTH: *params = lengthOf(shader->log); break;
    case GL_SHADER_SOURCE_LENGTH: *params = lengthOf(shader->source); break;
    default: entry.Misuse(GL_INVALID_ENUM, "shaders have no such parameter: " + Hex(parameter));
    }
}

SIM_API void glGetShaderInfoLog(GLuint name, GLsizei size, GLsizei* length, GLchar* log)
{
    GlEntry entry("glGetShaderInfoLog", {name, size, (const void*)length, (const void*)log});
    const Shader* const shader =
        entry && CheckCount(entry, size) ? FindShader(entry, name) : nullptr;
    if (shader)
        CopyText(shader->log, size, length, log);
}

SIM_API void glGetShaderSource(GLuint name, GLsizei size, GLsizei* length, GLchar* source)
{
    GlEntry entry("glGetShaderSource", {name, size, (const void*)length, (const void*)source});
    const Shader* const shader =
        entry && CheckCount(entry, size) ? FindShader(entry, name) : nullptr;
    if (shader)
        CopyText(shader->source, size, length, source);
}

SIM_API void glShaderBinary(GLsizei count, const GLuint* shaders, GLenum format, const void* binary,
                            GLsizei length)
{
    GlEntry entry("glShaderBinary", {count, (const void*)shaders, format, binary, length});
    if (entry)
        entry.Misuse(GL_INVALID_ENUM, "no such binary format: " + Hex(format));
}

SIM_API void glReleaseShaderCompiler()
{
    GlEntry entry("glReleaseShaderCompiler", {});
}

SIM_API void glGetShaderPrecisionFormat(GLenum shaderType, GLenum precisionType, GLint* range,
                                        GLint* precision)
{
    GlEntry entry("glGetShaderPrecisionFormat",
                  {shaderType, precisionType, (const void*)range, (const void*)precision});
    if (!entry)
        return;
    const bool isFloat = IsOneOf(precisionType, {GL_LOW_FLOAT, GL_MEDIUM_FLOAT, GL_HIGH_FLOAT});
    range[0] = range[1] = isFloat ? 127 : 31;
    *precision = isFloat ? 23 : 0;
}
