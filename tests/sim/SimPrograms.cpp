#include "SimPrograms.h"

#include "SimShaderText.h"

// Program objects: shaders, linking, the current program.

namespace Sim
{

GLuint NewProgramName(ShareGroup& group)
{
    return ++group.lastProgramName;
}

Program* FindProgram(GlEntry& entry, GLuint name)
{
    Program* const program = entry.Group().programs.Find(name);
    if (!program)
        entry.Misuse(entry.Group().shaders.Find(name) ? GL_INVALID_OPERATION : GL_INVALID_VALUE,
                     "there is no program " + std::to_string(name));
    return program;
}

void BuryProgram(ShareGroup& group, GLuint name)
{
    const Program* const program = group.programs.Find(name);
    if (!program || !program->deleted || program->uses != 0)
        return;
    for (const GLuint attached : program->shaders)
    {
        if (Shader* const shader = group.shaders.Find(attached))
        {
            --shader->attachments;
            BuryShader(group, attached);
        }
    }
    group.programs.Erase(name);
}

namespace
{

/// The source of the compiled shader of this type; nothing when there is none.
std::optional<std::string> SourceOf(const ShareGroup& group, const Program& program, GLenum type)
{
    for (const GLuint name : program.shaders)
    {
        const Shader* const shader = group.shaders.Find(name);
        if (shader && shader->type == type && shader->compiled)
            return shader->source;
    }
    return std::nullopt;
}

std::string LinkProgram(GlEntry& entry, Program& program)
{
    std::vector<std::string>& failures = entry.state.linkFailures;
    if (!failures.empty())
    {
        const std::string log = failures.front();
        failures.erase(failures.begin());
        return log.empty() ? "link failed" : log;
    }
    const std::optional<std::string> vertex = SourceOf(entry.Group(), program, GL_VERTEX_SHADER);
    const std::optional<std::string> fragment =
        SourceOf(entry.Group(), program, GL_FRAGMENT_SHADER);
    if (!vertex || !fragment)
        return "ERROR: a compiled shader of each type is needed\n";
    return Link(entry.state.gpu, *vertex, *fragment, program.boundLocations, program.executable);
}

std::size_t LongestName(const std::vector<Variable>& variables)
{
    std::size_t longest = 0;
    for (const Variable& variable : variables)
        longest = std::max(longest, variable.name.size() + 1);
    return longest;
}

std::size_t LongestName(const std::vector<Uniform>& uniforms)
{
    return LongestName(std::vector<Variable>(uniforms.begin(), uniforms.end()));
}

std::size_t LongestName(const std::vector<UniformBlock>& blocks)
{
    std::size_t longest = 0;
    for (const UniformBlock& block : blocks)
        longest = std::max(longest, block.name.size() + 1);
    return longest;
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API GLuint glCreateProgram()
{
    GlEntry entry("glCreateProgram", {});
    if (!entry)
        return 0;
    const GLuint name = NewProgramName(entry.Group());
    entry.Group().programs.Adopt(name);
    return name;
}

SIM_API void glDeleteProgram(GLuint name)
{
    GlEntry entry("glDeleteProgram", {name});
    if (!entry || name == 0)
        return;
    Program* const program = FindProgram(entry, name);
    if (!program)
        return;
    if (program->deleted)
        entry.Misuse("the program was deleted already");
    program->deleted = true;
    BuryProgram(entry.Group(), name);
}

SIM_API GLboolean glIsProgram(GLuint name)
{
    GlEntry entry("glIsProgram", {name});
    return entry && entry.Group().programs.Find(name) ? GL_TRUE : GL_FALSE;
}

SIM_API void glAttachShader(GLuint name, GLuint shaderName)
{
    GlEntry entry("glAttachShader", {name, shaderName});
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    Shader* const shader = program ? FindShader(entry, shaderName) : nullptr;
    if (!shader)
        return;
    for (const GLuint attached : program->shaders)
    {
        const Shader* const other = entry.Group().shaders.Find(attached);
        if (attached == shaderName || (other && other->type == shader->type))
            return entry.Misuse(GL_INVALID_OPERATION, "a shader of that type is attached");
    }
    program->shaders.push_back(shaderName);
    ++shader->attachments;
}

SIM_API void glDetachShader(GLuint name, GLuint shaderName)
{
    GlEntry entry("glDetachShader", {name, shaderName});
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    Shader* const shader = program ? FindShader(entry, shaderName) : nullptr;
    if (!shader)
        return;
    const auto found = std::find(program->shaders.begin(), program->shaders.end(), shaderName);
    if (found == program->shaders.end())
        return entry.Misuse(GL_INVALID_OPERATION, "the shader is not attached");
    program->shaders.erase(found);
    --shader->attachments;
    BuryShader(entry.Group(), shaderName);
}

SIM_API void glGetAttachedShaders(GLuint name, GLsizei maxCount, GLsizei* count, GLuint* shaders)
{
    GlEntry entry("glGetAttachedShaders",
                  {name, maxCount, (const void*)count, (const void*)shaders});
    const Program* const program =
        entry && CheckCount(entry, maxCount) ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    const std::size_t given = std::min(program->shaders.size(), static_cast<std::size_t>(maxCount));
    std::copy_n(program->shaders.begin(), given, shaders);
    if (count)
        *count = static_cast<GLsizei>(given);
}

SIM_API void glBindAttribLocation(GLuint name, GLuint index, const GLchar* attribute)
{
    GlEntry entry("glBindAttribLocation", {name, index, attribute});
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    if (index >= static_cast<GLuint>(entry.state.gpu.maxVertexAttribs))
        return entry.Misuse(GL_INVALID_VALUE, "no such location: " + std::to_string(index));
    if (std::string(attribute).rfind("gl_", 0) == 0)
        return entry.Misuse(GL_INVALID_OPERATION, "the name is reserved");
    program->boundLocations[attribute] = index;
}

SIM_API void glLinkProgram(GLuint name)
{
    GlEntry entry("glLinkProgram", {name});
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    program->executable = {};
    program->log = LinkProgram(entry, *program);
    program->linked = program->log.empty();
    program->fromBinary = false;
}

SIM_API void glUseProgram(GLuint name)
{
    GlEntry entry("glUseProgram", {name});
    if (!entry)
        return;
    Program* program = nullptr;
    if (name != 0)
    {
        program = FindProgram(entry, name);
        if (!program)
            return;
        if (!program->linked)
            return entry.Misuse(GL_INVALID_OPERATION, "the program is not linked");
        ++program->uses;
    }
    const GLuint old = std::exchange(entry.Gl().program, name);
    if (Program* const used = entry.Group().programs.Find(old))
    {
        --used->uses;
        BuryProgram(entry.Group(), old);
    }
}

SIM_API void glValidateProgram(GLuint name)
{
    GlEntry entry("glValidateProgram", {name});
    if (Program* const program = entry ? FindProgram(entry, name) : nullptr)
        program->validated = program->linked;
}

SIM_API void glGetProgramiv(GLuint name, GLenum parameter, GLint* params)
{
    GlEntry entry("glGetProgramiv", {name, parameter, (const void*)params});
    const Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    const Executable& made = program->executable;
    const auto set = [&](std::size_t value) { *params = static_cast<GLint>(value); };
    switch (parameter)
    {
    case GL_DELETE_STATUS: return set(program->deleted);
    case GL_LINK_STATUS: return set(program->linked);
    case GL_VALIDATE_STATUS: return set(program->validated);
    case GL_INFO_LOG_LENGTH: return set(program->log.empty() ? 0 : program->log.size() + 1);
    case GL_ATTACHED_SHADERS: return set(program->shaders.size());
    case GL_ACTIVE_ATTRIBUTES: return set(made.attributes.size());
    case GL_ACTIVE_ATTRIBUTE_MAX_LENGTH: return set(LongestName(made.attributes));
    case GL_ACTIVE_UNIFORMS: return set(made.uniforms.size());
    case GL_ACTIVE_UNIFORM_MAX_LENGTH: return set(LongestName(made.uniforms));
    case GL_ACTIVE_UNIFORM_BLOCKS: return set(made.blocks.size());
    case GL_ACTIVE_UNIFORM_BLOCK_MAX_NAME_LENGTH: return set(LongestName(made.blocks));
    case GL_PROGRAM_BINARY_RETRIEVABLE_HINT: return set(program->retrievable);
    case GL_PROGRAM_BINARY_LENGTH:
        return set(program->linked ? SaveProgram(entry.state.gpu, *program).size() : 0);
    case GL_TRANSFORM_FEEDBACK_BUFFER_MODE: return set(GL_INTERLEAVED_ATTRIBS);
    case GL_TRANSFORM_FEEDBACK_VARYINGS:
    case GL_TRANSFORM_FEEDBACK_VARYING_MAX_LENGTH: return set(0);
    default: entry.Misuse(GL_INVALID_ENUM, "programs have no such parameter: " + Hex(parameter));
    }
}

SIM_API void glGetProgramInfoLog(GLuint name, GLsizei size, GLsizei* length, GLchar* log)
{
    GlEntry entry("glGetProgramInfoLog", {name, size, (const void*)length, (const void*)log});
    const Program* const program =
        entry && CheckCount(entry, size) ? FindProgram(entry, name) : nullptr;
    if (program)
        CopyText(program->log, size, length, log);
}

SIM_API void glProgramParameteri(GLuint name, GLenum parameter, GLint value)
{
    GlEntry entry("glProgramParameteri", {name, parameter, value}, 30);
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    if (parameter != GL_PROGRAM_BINARY_RETRIEVABLE_HINT)
        return entry.Misuse(GL_INVALID_ENUM, "programs have no such parameter: " + Hex(parameter));
    program->retrievable = value != 0;
}

SIM_API void glGetProgramBinary(GLuint name, GLsizei size, GLsizei* length, GLenum* format,
                                void* binary)
{
    GlEntry entry("glGetProgramBinary",
                  {name, size, (const void*)length, (const void*)format, (const void*)binary}, 30);
    const Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    if (!program->linked)
        return entry.Misuse(GL_INVALID_OPERATION, "the program is not linked");
    const std::vector<unsigned char> bytes = SaveProgram(entry.state.gpu, *program);
    if (bytes.empty()) // the device's own lack
        return entry.Refuse(GL_INVALID_OPERATION);
    if (size < 0 || static_cast<std::size_t>(size) < bytes.size())
        return entry.Misuse(GL_INVALID_OPERATION, "the place is too small");
    std::copy(bytes.begin(), bytes.end(), static_cast<unsigned char*>(binary));
    if (length)
        *length = static_cast<GLsizei>(bytes.size());
    *format = entry.state.gpu.programBinaryFormats.front();
}

SIM_API void glProgramBinary(GLuint name, GLenum format, const void* binary, GLsizei length)
{
    GlEntry entry("glProgramBinary", {name, format, binary, length}, 30);
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    program->linked = false;
    program->fromBinary = true;
    program->executable = {};
    const std::vector<unsigned>& formats = entry.state.gpu.programBinaryFormats;
    if (std::find(formats.begin(), formats.end(), format) == formats.end())
        return entry.Refuse(GL_INVALID_ENUM); // bytes of another driver
    if (length < 0)
        return entry.Misuse(GL_INVALID_VALUE, "a negative length");
    program->linked =
        LoadProgram(entry.state.gpu, binary, static_cast<std::size_t>(length), *program);
    program->log = program->linked ? "" : "the binary is not of this driver\n";
}
