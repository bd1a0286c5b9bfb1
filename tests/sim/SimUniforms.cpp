#include "SimPrograms.h"
#include "SimShaderText.h"

#include <cstdlib>

// Uniforms, uniform blocks and attributes of linked programs: queries and values.

namespace Sim
{

namespace
{

/// An active uniform and an element of it.
struct Element
{
    Uniform* uniform = nullptr;
    int index = 0;
};

Element FindLocation(Program& program, GLint location)
{
    for (Uniform& uniform : program.executable.uniforms)
    {
        if (uniform.block < 0 && location >= uniform.location &&
            location < uniform.location + uniform.size)
            return {&uniform, location - uniform.location};
    }
    return {};
}

/// The location of "name", "name[0]" or "name[2]"; -1 when there is none.
GLint LocationOf(const Program& program, const std::string& name)
{
    std::string base = name;
    int index = 0;
    bool indexed = false;
    const std::size_t open = name.rfind('[');
    if (open != std::string::npos && name.back() == ']')
    {
        base = name.substr(0, open);
        index = std::atoi(name.c_str() + open + 1);
        indexed = true;
    }
    for (const Uniform& uniform : program.executable.uniforms)
    {
        if (uniform.block >= 0)
            continue;
        if (uniform.array && uniform.name == base + "[0]" && index >= 0 && index < uniform.size)
            return uniform.location + index;
        if (!uniform.array && !indexed && uniform.name == name)
            return uniform.location;
    }
    return -1;
}

/// What a glUniform call brings.
struct Values
{
    GLenum scalar = GL_FLOAT; // of the call's numbers
    int components = 1;       // of one value
    bool matrix = false;
    GLsizei count = 1;
    std::vector<double> numbers;
};

bool Accepts(const Uniform& uniform, const Values& values)
{
    if (ComponentsOf(uniform.type) != values.components || IsMatrix(uniform.type) != values.matrix)
        return false;
    if (IsSampler(uniform.type))
        return values.scalar == GL_INT;
    const GLenum scalar = ScalarOf(uniform.type);
    return scalar == GL_BOOL || scalar == values.scalar;
}

void SetUniform(GlEntry& entry, GLint location, const Values& values)
{
    if (!entry || !CheckCount(entry, values.count))
        return;
    Program* const program = entry.Group().programs.Find(entry.Gl().program);
    if (!program)
        return entry.Misuse(GL_INVALID_OPERATION, "no program is in use");
    if (location == -1)
        return;
    const Element element = FindLocation(*program, location);
    if (!element.uniform)
        return entry.Misuse(GL_INVALID_OPERATION, "no such location: " + std::to_string(location));
    Uniform& uniform = *element.uniform;
    if (!Accepts(uniform, values))
        return entry.Misuse(GL_INVALID_OPERATION, "'" + uniform.name + "' has another type");
    if (values.count > 1 && !uniform.array)
        return entry.Misuse(GL_INVALID_OPERATION, "'" + uniform.name + "' is no array");
    if (IsSampler(uniform.type) &&
        (values.numbers[0] < 0 || values.numbers[0] >= entry.state.gpu.maxCombinedTextureUnits))
        return entry.Misuse(GL_INVALID_VALUE, "no such texture unit");
    const std::size_t at = static_cast<std::size_t>(element.index * values.components);
    const std::size_t room = uniform.values.size() - at;
    for (std::size_t i = 0; i < std::min(values.numbers.size(), room); ++i)
    {
        const double number = values.numbers[i];
        uniform.values[at + i] =
            ScalarOf(uniform.type) == GL_BOOL ? static_cast<double>(number != 0) : number;
    }
}

template <typename T>
Values Read(GLenum scalar, int components, GLsizei count, const T* from, bool matrix = false)
{
    Values values{scalar, components, matrix, count, {}};
    for (GLsizei i = 0; i < count * components; ++i)
        values.numbers.push_back(static_cast<double>(from[i]));
    return values;
}

void SetMatrix(GlEntry& entry, GLint location, int columns, int rows, GLsizei count,
               GLboolean transpose, const GLfloat* from)
{
    if (entry && transpose && entry.Version() < 30)
        return entry.Misuse(GL_INVALID_VALUE, "a transposed matrix");
    Values values = Read(GL_FLOAT, columns * rows, count, from, true);
    for (GLsizei m = 0; transpose && m < count; ++m)
    {
        for (int column = 0; column < columns; ++column)
        {
            for (int row = 0; row < rows; ++row)
                values.numbers[static_cast<std::size_t>((m * columns + column) * rows + row)] =
                    static_cast<double>(from[(m * rows + row) * columns + column]);
        }
    }
    SetUniform(entry, location, values);
}

template <typename T>
void GetUniform(GlEntry& entry, GLuint name, GLint location, T* params)
{
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    const Element element = program->linked ? FindLocation(*program, location) : Element{};
    if (!element.uniform)
        return entry.Misuse(GL_INVALID_OPERATION, "no such location: " + std::to_string(location));
    const int components = ComponentsOf(element.uniform->type);
    for (int i = 0; i < components; ++i)
        params[i] = static_cast<T>(
            element.uniform->values[static_cast<std::size_t>(element.index * components + i)]);
}

/// The program, when its link succeeded; null with the error set when there is none.
Program* FindLinked(GlEntry& entry, GLuint name)
{
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program || program->linked)
        return program;
    entry.Misuse(GL_INVALID_OPERATION, "the program is not linked");
    return nullptr;
}

void Describe(const Variable& variable, GLsizei size, GLsizei* length, GLint* count, GLenum* type,
              GLchar* name)
{
    *count = variable.size;
    *type = variable.type;
    CopyText(variable.name, size, length, name);
}

GLint UniformParameter(GlEntry& entry, const Uniform& uniform, GLenum parameter)
{
    switch (parameter)
    {
    case GL_UNIFORM_TYPE: return static_cast<GLint>(uniform.type);
    case GL_UNIFORM_SIZE: return uniform.size;
    case GL_UNIFORM_NAME_LENGTH: return static_cast<GLint>(uniform.name.size()) + 1;
    case GL_UNIFORM_BLOCK_INDEX: return uniform.block;
    case GL_UNIFORM_OFFSET: return uniform.block < 0 ? -1 : 0;
    case GL_UNIFORM_ARRAY_STRIDE: return uniform.block < 0 ? -1 : uniform.array ? 16 : 0;
    case GL_UNIFORM_MATRIX_STRIDE: return uniform.block < 0 ? -1 : IsMatrix(uniform.type) ? 16 : 0;
    case GL_UNIFORM_IS_ROW_MAJOR: return 0;
    default: entry.Misuse(GL_INVALID_ENUM, "uniforms have no such parameter: " + Hex(parameter));
    }
    return 0;
}

/// The block; null with the error set when there is none.
UniformBlock* FindBlock(GlEntry& entry, GLuint name, GLuint index)
{
    Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return nullptr;
    if (index < program->executable.blocks.size())
        return &program->executable.blocks[index];
    entry.Misuse(GL_INVALID_VALUE, "there is no uniform block " + std::to_string(index));
    return nullptr;
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API GLint glGetUniformLocation(GLuint name, const GLchar* uniform)
{
    GlEntry entry("glGetUniformLocation", {name, uniform});
    const Program* const program = FindLinked(entry, name);
    return program ? LocationOf(*program, uniform) : -1;
}

SIM_API GLint glGetAttribLocation(GLuint name, const GLchar* attribute)
{
    GlEntry entry("glGetAttribLocation", {name, attribute});
    const Program* const program = FindLinked(entry, name);
    if (!program)
        return -1;
    for (const Variable& variable : program->executable.attributes)
    {
        if (variable.name == attribute)
            return variable.location;
    }
    return -1;
}

SIM_API GLint glGetFragDataLocation(GLuint name, const GLchar* output)
{
    GlEntry entry("glGetFragDataLocation", {name, output}, 30);
    return FindLinked(entry, name) ? 0 : -1;
}

SIM_API void glGetActiveUniform(GLuint name, GLuint index, GLsizei size, GLsizei* length,
                                GLint* count, GLenum* type, GLchar* out)
{
    GlEntry entry("glGetActiveUniform", {name, index, size, (const void*)length, (const void*)count,
                                         (const void*)type, (const void*)out});
    const Program* const program =
        entry && CheckCount(entry, size) ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    if (index >= program->executable.uniforms.size())
        return entry.Misuse(GL_INVALID_VALUE, "there is no uniform " + std::to_string(index));
    Describe(program->executable.uniforms[index], size, length, count, type, out);
}

SIM_API void glGetActiveAttrib(GLuint name, GLuint index, GLsizei size, GLsizei* length,
                               GLint* count, GLenum* type, GLchar* out)
{
    GlEntry entry("glGetActiveAttrib", {name, index, size, (const void*)length, (const void*)count,
                                        (const void*)type, (const void*)out});
    const Program* const program =
        entry && CheckCount(entry, size) ? FindProgram(entry, name) : nullptr;
    if (!program)
        return;
    if (index >= program->executable.attributes.size())
        return entry.Misuse(GL_INVALID_VALUE, "there is no attribute " + std::to_string(index));
    Describe(program->executable.attributes[index], size, length, count, type, out);
}

SIM_API void glGetUniformIndices(GLuint name, GLsizei count, const GLchar* const* names,
                                 GLuint* indices)
{
    GlEntry entry("glGetUniformIndices", {name, count, (const void*)names, (const void*)indices},
                  30);
    const Program* const program = entry ? FindProgram(entry, name) : nullptr;
    for (GLsizei i = 0; program && i < count; ++i)
    {
        const auto& uniforms = program->executable.uniforms;
        const std::string wanted = names[i];
        const auto found = std::find_if(
            uniforms.begin(), uniforms.end(),
            [&](const Uniform& uniform) {
                return uniform.name == wanted || (uniform.array && uniform.name == wanted + "[0]");
            });
        indices[i] = found == uniforms.end() ? GL_INVALID_INDEX
                                             : static_cast<GLuint>(found - uniforms.begin());
    }
}

SIM_API void glGetActiveUniformsiv(GLuint name, GLsizei count, const GLuint* indices,
                                   GLenum parameter, GLint* params)
{
    GlEntry entry("glGetActiveUniformsiv",
                  {name, count, (const void*)indices, parameter, (const void*)params}, 30);
    const Program* const program = entry ? FindProgram(entry, name) : nullptr;
    for (GLsizei i = 0; program && i < count; ++i)
    {
        if (indices[i] >= program->executable.uniforms.size())
            return entry.Misuse(GL_INVALID_VALUE,
                                "there is no uniform " + std::to_string(indices[i]));
        params[i] = UniformParameter(entry, program->executable.uniforms[indices[i]], parameter);
    }
}

SIM_API GLuint glGetUniformBlockIndex(GLuint name, const GLchar* block)
{
    GlEntry entry("glGetUniformBlockIndex", {name, block}, 30);
    const Program* const program = entry ? FindProgram(entry, name) : nullptr;
    if (!program)
        return GL_INVALID_INDEX;
    const auto& blocks = program->executable.blocks;
    const auto found = std::find_if(blocks.begin(), blocks.end(),
                                    [&](const UniformBlock& one) { return one.name == block; });
    return found == blocks.end() ? GL_INVALID_INDEX : static_cast<GLuint>(found - blocks.begin());
}

SIM_API void glGetActiveUniformBlockiv(GLuint name, GLuint index, GLenum parameter, GLint* params)
{
    GlEntry entry("glGetActiveUniformBlockiv", {name, index, parameter, (const void*)params}, 30);
    const UniformBlock* const block = FindBlock(entry, name, index);
    if (!block)
        return;
    switch (parameter)
    {
    case GL_UNIFORM_BLOCK_BINDING: *params = static_cast<GLint>(block->binding); break;
    case GL_UNIFORM_BLOCK_DATA_SIZE: *params = block->dataSize; break;
    case GL_UNIFORM_BLOCK_NAME_LENGTH: *params = static_cast<GLint>(block->name.size()) + 1; break;
    case GL_UNIFORM_BLOCK_ACTIVE_UNIFORMS:
        *params = static_cast<GLint>(block->members.size());
        break;
    case GL_UNIFORM_BLOCK_ACTIVE_UNIFORM_INDICES:
        std::copy(block->members.begin(), block->members.end(), params);
        break;
    case GL_UNIFORM_BLOCK_REFERENCED_BY_VERTEX_SHADER:
    case GL_UNIFORM_BLOCK_REFERENCED_BY_FRAGMENT_SHADER: *params = 1; break;
    default: entry.Misuse(GL_INVALID_ENUM, "blocks have no such parameter: " + Hex(parameter));
    }
}

SIM_API void glGetActiveUniformBlockName(GLuint name, GLuint index, GLsizei size, GLsizei* length,
                                         GLchar* out)
{
    GlEntry entry("glGetActiveUniformBlockName",
                  {name, index, size, (const void*)length, (const void*)out}, 30);
    if (const UniformBlock* const block = FindBlock(entry, name, index))
        CopyText(block->name, size, length, out);
}

SIM_API void glUniformBlockBinding(GLuint name, GLuint index, GLuint binding)
{
    GlEntry entry("glUniformBlockBinding", {name, index, binding}, 30);
    UniformBlock* const block = FindBlock(entry, name, index);
    if (!block)
        return;
    if (binding >= static_cast<GLuint>(entry.state.gpu.maxUniformBufferBindings))
        return entry.Misuse(GL_INVALID_VALUE, "the binding point is too high");
    block->binding = binding;
}

SIM_API void glGetUniformfv(GLuint program, GLint location, GLfloat* params)
{
    GlEntry entry("glGetUniformfv", {program, location, (const void*)params});
    GetUniform(entry, program, location, params);
}

SIM_API void glGetUniformiv(GLuint program, GLint location, GLint* params)
{
    GlEntry entry("glGetUniformiv", {program, location, (const void*)params});
    GetUniform(entry, program, location, params);
}

SIM_API void glGetUniformuiv(GLuint program, GLint location, GLuint* params)
{
    GlEntry entry("glGetUniformuiv", {program, location, (const void*)params}, 30);
    GetUniform(entry, program, location, params);
}

// glUniform1f to glUniform4uiv, and the matrices: one pattern, thirty-three functions.

#define SIM_UNIFORM_VECTOR(suffix, type, scalar, components, version)                              \
    SIM_API void glUniform##components##suffix##v(GLint location, GLsizei count,                   \
                                                  const type* value)                               \
    {                                                                                              \
        GlEntry entry("glUniform" #components #suffix "v", {location, count, (const void*)value},  \
                      version);                                                                    \
        SetUniform(entry, location, Read(scalar, components, count, value));                       \
    }
#define SIM_UNIFORM_VECTORS(suffix, type, scalar, version)                                         \
    SIM_UNIFORM_VECTOR(suffix, type, scalar, 1, version)                                           \
    SIM_UNIFORM_VECTOR(suffix, type, scalar, 2, version)                                           \
    SIM_UNIFORM_VECTOR(suffix, type, scalar, 3, version)                                           \
    SIM_UNIFORM_VECTOR(suffix, type, scalar, 4, version)                                           \
    SIM_API void glUniform1##suffix(GLint location, type x)                                        \
    {                                                                                              \
        GlEntry entry("glUniform1" #suffix, {location, x}, version);                               \
        SetUniform(entry, location, Read(scalar, 1, 1, &x));                                       \
    }                                                                                              \
    SIM_API void glUniform2##suffix(GLint location, type x, type y)                                \
    {                                                                                              \
        GlEntry entry("glUniform2" #suffix, {location, x, y}, version);                            \
        const type value[] = {x, y};                                                               \
        SetUniform(entry, location, Read(scalar, 2, 1, value));                                    \
    }                                                                                              \
    SIM_API void glUniform3##suffix(GLint location, type x, type y, type z)                        \
    {                                                                                              \
        GlEntry entry("glUniform3" #suffix, {location, x, y, z}, version);                         \
        const type value[] = {x, y, z};                                                            \
        SetUniform(entry, location, Read(scalar, 3, 1, value));                                    \
    }                                                                                              \
    SIM_API void glUniform4##suffix(GLint location, type x, type y, type z, type w)                \
    {                                                                                              \
        GlEntry entry("glUniform4" #suffix, {location, x, y, z, w}, version);                      \
        const type value[] = {x, y, z, w};                                                         \
        SetUniform(entry, location, Read(scalar, 4, 1, value));                                    \
    }
SIM_UNIFORM_VECTORS(f, GLfloat, GL_FLOAT, 20)
SIM_UNIFORM_VECTORS(i, GLint, GL_INT, 20)
SIM_UNIFORM_VECTORS(ui, GLuint, GL_UNSIGNED_INT, 30)

#define SIM_UNIFORM_MATRIX(name, columns, rows, version)                                           \
    SIM_API void glUniformMatrix##name##fv(GLint location, GLsizei count, GLboolean transpose,     \
                                           const GLfloat* value)                                   \
    {                                                                                              \
        GlEntry entry("glUniformMatrix" #name "fv",                                                \
                      {location, count, transpose, (const void*)value}, version);                  \
        SetMatrix(entry, location, columns, rows, count, transpose, value);                        \
    }
SIM_UNIFORM_MATRIX(2, 2, 2, 20)
SIM_UNIFORM_MATRIX(3, 3, 3, 20)
SIM_UNIFORM_MATRIX(4, 4, 4, 20)
SIM_UNIFORM_MATRIX(2x3, 2, 3, 30)
SIM_UNIFORM_MATRIX(3x2, 3, 2, 30)
SIM_UNIFORM_MATRIX(2x4, 2, 4, 30)
SIM_UNIFORM_MATRIX(4x2, 4, 2, 30)
SIM_UNIFORM_MATRIX(3x4, 3, 4, 30)
SIM_UNIFORM_MATRIX(4x3, 4, 3, 30)
