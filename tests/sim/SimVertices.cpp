#include "SimGl.h"

// Vertex attributes and vertex arrays.

namespace Sim
{

VertexArray& CurrentVertexArray(GlState& gl)
{
    VertexArray* const array = gl.vertexArray ? gl.vertexArrays.Find(gl.vertexArray) : nullptr;
    return array ? *array : gl.defaultVertexArray;
}

const VertexArray& CurrentVertexArray(const GlState& gl)
{
    return CurrentVertexArray(const_cast<GlState&>(gl));
}

namespace
{

/// The attribute; null, with the error set, when there is none.
SimVertexAttrib* FindAttrib(GlEntry& entry, GLuint index)
{
    if (index < static_cast<GLuint>(std::min(entry.state.gpu.maxVertexAttribs, kVertexAttribs)))
        return &CurrentVertexArray(entry.Gl()).attribs[index];
    entry.Misuse(GL_INVALID_VALUE, "there is no attribute " + std::to_string(index));
    return nullptr;
}

bool IsAttribType(const GlEntry& entry, GLenum type, bool integer)
{
    if (IsOneOf(type, {GL_BYTE, GL_UNSIGNED_BYTE, GL_SHORT, GL_UNSIGNED_SHORT}))
        return true;
    if (IsOneOf(type, {GL_INT, GL_UNSIGNED_INT}))
        return entry.Version() >= 30;
    if (integer)
        return false;
    return IsOneOf(type, {GL_FLOAT, GL_FIXED}) ||
           (entry.Version() >= 30 &&
            IsOneOf(type, {GL_HALF_FLOAT, GL_INT_2_10_10_10_REV, GL_UNSIGNED_INT_2_10_10_10_REV}));
}

void SetPointer(GlEntry& entry, GLuint index, const SimVertexAttrib& wanted)
{
    SimVertexAttrib* const attrib = entry ? FindAttrib(entry, index) : nullptr;
    if (!attrib)
        return;
    if (wanted.size < 1 || wanted.size > 4 || wanted.stride < 0)
        return entry.Misuse(GL_INVALID_VALUE, "a size of " + std::to_string(wanted.size) +
                                                  " or a stride of " +
                                                  std::to_string(wanted.stride));
    if (!IsAttribType(entry, wanted.type, wanted.integer))
        return entry.Misuse(GL_INVALID_ENUM, "no such type: " + Hex(wanted.type));
    const GLuint buffer = *BufferBinding(entry.Gl(), GL_ARRAY_BUFFER);
    if (entry.Gl().vertexArray != 0 && buffer == 0 && wanted.pointer)
        return entry.Misuse(GL_INVALID_OPERATION, "client memory in a vertex array object");
    const bool enabled = attrib->enabled;
    const unsigned divisor = attrib->divisor;
    *attrib = wanted;
    attrib->enabled = enabled;
    attrib->divisor = divisor;
    attrib->buffer = buffer;
}

/// False, with the error set, when attributes have no such parameter; the current value has four
/// numbers.
bool GetAttrib(GlEntry& entry, GLuint index, GLenum name, std::vector<double>& out)
{
    const SimVertexAttrib* const attrib = FindAttrib(entry, index);
    if (!attrib)
        return false;
    switch (name)
    {
    case GL_VERTEX_ATTRIB_ARRAY_ENABLED: out = {double(attrib->enabled)}; return true;
    case GL_VERTEX_ATTRIB_ARRAY_SIZE: out = {double(attrib->size)}; return true;
    case GL_VERTEX_ATTRIB_ARRAY_STRIDE: out = {double(attrib->stride)}; return true;
    case GL_VERTEX_ATTRIB_ARRAY_TYPE: out = {double(attrib->type)}; return true;
    case GL_VERTEX_ATTRIB_ARRAY_NORMALIZED: out = {double(attrib->normalized)}; return true;
    case GL_VERTEX_ATTRIB_ARRAY_BUFFER_BINDING: out = {double(attrib->buffer)}; return true;
    case GL_VERTEX_ATTRIB_ARRAY_INTEGER: out = {double(attrib->integer)}; return true;
    case GL_VERTEX_ATTRIB_ARRAY_DIVISOR: out = {double(attrib->divisor)}; return true;
    case GL_CURRENT_VERTEX_ATTRIB:
        out.assign(entry.Gl().currentAttribs[index].begin(),
                   entry.Gl().currentAttribs[index].end());
        return true;
    default: entry.Misuse(GL_INVALID_ENUM, "attributes have no such parameter: " + Hex(name));
    }
    return false;
}

template <typename T>
void GetAttrib(GlEntry& entry, GLuint index, GLenum name, T* params)
{
    std::vector<double> numbers;
    if (!entry || !GetAttrib(entry, index, name, numbers))
        return;
    for (std::size_t i = 0; i < numbers.size(); ++i)
        params[i] = static_cast<T>(numbers[i]);
}

template <typename T>
void SetCurrent(GlEntry& entry, GLuint index, int count, const T* values)
{
    if (!entry || !FindAttrib(entry, index))
        return;
    std::array<double, 4>& current = entry.Gl().currentAttribs[index];
    current = {0, 0, 0, 1};
    for (int i = 0; i < count; ++i)
        current[static_cast<std::size_t>(i)] = static_cast<double>(values[i]);
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API void glEnableVertexAttribArray(GLuint index)
{
    GlEntry entry("glEnableVertexAttribArray", {index});
    if (SimVertexAttrib* const attrib = entry ? FindAttrib(entry, index) : nullptr)
        attrib->enabled = true;
}

SIM_API void glDisableVertexAttribArray(GLuint index)
{
    GlEntry entry("glDisableVertexAttribArray", {index});
    if (SimVertexAttrib* const attrib = entry ? FindAttrib(entry, index) : nullptr)
        attrib->enabled = false;
}

SIM_API void glVertexAttribPointer(GLuint index, GLint size, GLenum type, GLboolean normalized,
                                   GLsizei stride, const void* pointer)
{
    GlEntry entry("glVertexAttribPointer", {index, size, type, normalized, stride, pointer});
    SimVertexAttrib wanted;
    wanted.size = size;
    wanted.type = type;
    wanted.normalized = normalized != 0;
    wanted.stride = stride;
    wanted.pointer = pointer;
    SetPointer(entry, index, wanted);
}

SIM_API void glVertexAttribIPointer(GLuint index, GLint size, GLenum type, GLsizei stride,
                                    const void* pointer)
{
    GlEntry entry("glVertexAttribIPointer", {index, size, type, stride, pointer}, 30);
    SimVertexAttrib wanted;
    wanted.size = size;
    wanted.type = type;
    wanted.integer = true;
    wanted.stride = stride;
    wanted.pointer = pointer;
    SetPointer(entry, index, wanted);
}

SIM_API void glVertexAttribDivisor(GLuint index, GLuint divisor)
{
    GlEntry entry("glVertexAttribDivisor", {index, divisor}, 30);
    if (SimVertexAttrib* const attrib = entry ? FindAttrib(entry, index) : nullptr)
        attrib->divisor = divisor;
}

SIM_API void glGetVertexAttribiv(GLuint index, GLenum name, GLint* params)
{
    GlEntry entry("glGetVertexAttribiv", {index, name, (const void*)params});
    GetAttrib(entry, index, name, params);
}

SIM_API void glGetVertexAttribfv(GLuint index, GLenum name, GLfloat* params)
{
    GlEntry entry("glGetVertexAttribfv", {index, name, (const void*)params});
    GetAttrib(entry, index, name, params);
}

SIM_API void glGetVertexAttribIiv(GLuint index, GLenum name, GLint* params)
{
    GlEntry entry("glGetVertexAttribIiv", {index, name, (const void*)params}, 30);
    GetAttrib(entry, index, name, params);
}

SIM_API void glGetVertexAttribIuiv(GLuint index, GLenum name, GLuint* params)
{
    GlEntry entry("glGetVertexAttribIuiv", {index, name, (const void*)params}, 30);
    GetAttrib(entry, index, name, params);
}

SIM_API void glGetVertexAttribPointerv(GLuint index, GLenum name, void** pointer)
{
    GlEntry entry("glGetVertexAttribPointerv", {index, name, (const void*)pointer});
    const SimVertexAttrib* const attrib = entry ? FindAttrib(entry, index) : nullptr;
    if (!attrib)
        return;
    if (name != GL_VERTEX_ATTRIB_ARRAY_POINTER)
        return entry.Misuse(GL_INVALID_ENUM, "attributes have no such pointer: " + Hex(name));
    *pointer = const_cast<void*>(attrib->pointer);
}

SIM_API void glVertexAttrib1f(GLuint index, GLfloat x)
{
    GlEntry entry("glVertexAttrib1f", {index, x});
    SetCurrent(entry, index, 1, &x);
}

SIM_API void glVertexAttrib2f(GLuint index, GLfloat x, GLfloat y)
{
    GlEntry entry("glVertexAttrib2f", {index, x, y});
    const GLfloat values[] = {x, y};
    SetCurrent(entry, index, 2, values);
}

SIM_API void glVertexAttrib3f(GLuint index, GLfloat x, GLfloat y, GLfloat z)
{
    GlEntry entry("glVertexAttrib3f", {index, x, y, z});
    const GLfloat values[] = {x, y, z};
    SetCurrent(entry, index, 3, values);
}

SIM_API void glVertexAttrib4f(GLuint index, GLfloat x, GLfloat y, GLfloat z, GLfloat w)
{
    GlEntry entry("glVertexAttrib4f", {index, x, y, z, w});
    const GLfloat values[] = {x, y, z, w};
    SetCurrent(entry, index, 4, values);
}

SIM_API void glVertexAttrib1fv(GLuint index, const GLfloat* v)
{
    GlEntry entry("glVertexAttrib1fv", {index, (const void*)v});
    SetCurrent(entry, index, 1, v);
}

SIM_API void glVertexAttrib2fv(GLuint index, const GLfloat* v)
{
    GlEntry entry("glVertexAttrib2fv", {index, (const void*)v});
    SetCurrent(entry, index, 2, v);
}

SIM_API void glVertexAttrib3fv(GLuint index, const GLfloat* v)
{
    GlEntry entry("glVertexAttrib3fv", {index, (const void*)v});
    SetCurrent(entry, index, 3, v);
}

SIM_API void glVertexAttrib4fv(GLuint index, const GLfloat* v)
{
    GlEntry entry("glVertexAttrib4fv", {index, (const void*)v});
    SetCurrent(entry, index, 4, v);
}

SIM_API void glVertexAttribI4i(GLuint index, GLint x, GLint y, GLint z, GLint w)
{
    GlEntry entry("glVertexAttribI4i", {index, x, y, z, w}, 30);
    const GLint values[] = {x, y, z, w};
    SetCurrent(entry, index, 4, values);
}

SIM_API void glVertexAttribI4ui(GLuint index, GLuint x, GLuint y, GLuint z, GLuint w)
{
    GlEntry entry("glVertexAttribI4ui", {index, x, y, z, w}, 30);
    const GLuint values[] = {x, y, z, w};
    SetCurrent(entry, index, 4, values);
}

SIM_API void glVertexAttribI4iv(GLuint index, const GLint* v)
{
    GlEntry entry("glVertexAttribI4iv", {index, (const void*)v}, 30);
    SetCurrent(entry, index, 4, v);
}

SIM_API void glVertexAttribI4uiv(GLuint index, const GLuint* v)
{
    GlEntry entry("glVertexAttribI4uiv", {index, (const void*)v}, 30);
    SetCurrent(entry, index, 4, v);
}

SIM_API void glGenVertexArrays(GLsizei n, GLuint* arrays)
{
    GlEntry entry("glGenVertexArrays", {n, (const void*)arrays}, 30);
    Generate(entry, entry ? &entry.Gl().vertexArrays : nullptr, n, arrays);
}

SIM_API void glDeleteVertexArrays(GLsizei n, const GLuint* arrays)
{
    GlEntry entry("glDeleteVertexArrays", {n, (const void*)arrays}, 30);
    Delete(entry, entry ? &entry.Gl().vertexArrays : nullptr, n, arrays,
           [&](GLuint name)
           {
               GlState& gl = entry.Gl();
               gl.vertexArray = gl.vertexArray == name ? 0 : gl.vertexArray;
               gl.vertexArrays.Erase(name);
           });
}

SIM_API GLboolean glIsVertexArray(GLuint name)
{
    GlEntry entry("glIsVertexArray", {name}, 30);
    const VertexArray* const array = entry ? entry.Gl().vertexArrays.Find(name) : nullptr;
    return array && array->created ? GL_TRUE : GL_FALSE;
}

SIM_API void glBindVertexArray(GLuint name)
{
    GlEntry entry("glBindVertexArray", {name}, 30);
    if (!entry)
        return;
    if (name != 0 && !entry.Gl().vertexArrays.Find(name))
        return entry.Misuse(GL_INVALID_OPERATION,
                            "there is no vertex array " + std::to_string(name));
    if (name != 0)
        entry.Gl().vertexArrays.Find(name)->created = true;
    entry.Gl().vertexArray = name;
}
