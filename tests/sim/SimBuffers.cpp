#include "SimGl.h"

#include <cstring>

// Buffer objects: names, bindings, contents.

namespace Sim
{

GLuint* BufferBinding(GlState& gl, GLenum target)
{
    switch (target)
    {
    case GL_ELEMENT_ARRAY_BUFFER: return &CurrentVertexArray(gl).elementBuffer;
    case GL_ARRAY_BUFFER:
    case GL_UNIFORM_BUFFER:
    case GL_COPY_READ_BUFFER:
    case GL_COPY_WRITE_BUFFER:
    case GL_PIXEL_PACK_BUFFER:
    case GL_PIXEL_UNPACK_BUFFER:
    case GL_TRANSFORM_FEEDBACK_BUFFER: return &gl.buffers[target];
    default: return nullptr;
    }
}

Buffer* BoundBuffer(GlEntry& entry, GLenum target)
{
    const GLuint* const name = BufferBinding(entry.Gl(), target);
    if (!name)
    {
        entry.Misuse(GL_INVALID_ENUM, "no such buffer target: " + Hex(target));
        return nullptr;
    }
    Buffer* const buffer = *name ? entry.Group().buffers.Find(*name) : nullptr;
    if (!buffer)
        entry.Misuse(GL_INVALID_OPERATION, "no buffer is bound to " + Hex(target));
    return buffer;
}

unsigned char* PixelMemory(GlEntry& entry, GLenum target, const void* pointer, std::size_t size)
{
    const GLuint name = *BufferBinding(entry.Gl(), target);
    if (name == 0)
        return static_cast<unsigned char*>(const_cast<void*>(pointer));
    Buffer* const buffer = entry.Group().buffers.Find(name);
    const std::size_t offset = reinterpret_cast<std::uintptr_t>(pointer);
    if (buffer && offset + size <= buffer->bytes.size())
        return buffer->bytes.data() + offset;
    entry.Misuse(GL_INVALID_OPERATION, "the pixel buffer is too small");
    return nullptr;
}

namespace
{

/// A deleted buffer is bound nowhere in this context any more.
void Unbind(GlState& gl, GLuint name)
{
    for (auto& [target, bound] : gl.buffers)
        bound = bound == name ? 0 : bound;
    for (auto& [index, range] : gl.uniformBuffers)
        range.buffer = range.buffer == name ? 0 : range.buffer;
    VertexArray& array = CurrentVertexArray(gl);
    array.elementBuffer = array.elementBuffer == name ? 0 : array.elementBuffer;
    for (SimVertexAttrib& attrib : array.attribs)
        attrib.buffer = attrib.buffer == name ? 0 : attrib.buffer;
}

bool IsUsage(GLenum usage)
{
    return IsOneOf(usage,
                   {GL_STREAM_DRAW, GL_STREAM_READ, GL_STREAM_COPY, GL_STATIC_DRAW, GL_STATIC_READ,
                    GL_STATIC_COPY, GL_DYNAMIC_DRAW, GL_DYNAMIC_READ, GL_DYNAMIC_COPY});
}

bool CheckRange(GlEntry& entry, const Buffer& buffer, GLintptr offset, GLsizeiptr size)
{
    if (offset >= 0 && size >= 0 &&
        static_cast<std::size_t>(offset) + static_cast<std::size_t>(size) <= buffer.bytes.size())
        return true;
    entry.Misuse(GL_INVALID_VALUE, "the range lies outside of the buffer");
    return false;
}

/// The table of an indexed target; null, with the error set, when there is none.
std::map<GLuint, BufferRange>* IndexedBindings(GlEntry& entry, GLenum target, GLuint index)
{
    const bool uniform = target == GL_UNIFORM_BUFFER;
    if (!uniform && target != GL_TRANSFORM_FEEDBACK_BUFFER)
    {
        entry.Misuse(GL_INVALID_ENUM, "no such indexed target: " + Hex(target));
        return nullptr;
    }
    const int limit = uniform ? entry.state.gpu.maxUniformBufferBindings : 4;
    if (index >= static_cast<GLuint>(limit))
    {
        entry.Misuse(GL_INVALID_VALUE, "the binding point is too high");
        return nullptr;
    }
    return uniform ? &entry.Gl().uniformBuffers : &entry.Gl().feedbackBuffers;
}

void BindRange(GlEntry& entry, GLenum target, GLuint index, const BufferRange& range)
{
    if (!entry)
        return;
    std::map<GLuint, BufferRange>* const bindings = IndexedBindings(entry, target, index);
    if (!bindings)
        return;
    if (range.buffer != 0)
        Bind(entry, entry.Group().buffers, range.buffer);
    (*bindings)[index] = range;
    *BufferBinding(entry.Gl(), target) = range.buffer;
}

template <typename T>
void GetParameter(GlEntry& entry, GLenum target, GLenum name, T* out)
{
    const Buffer* const buffer = entry ? BoundBuffer(entry, target) : nullptr;
    if (!buffer)
        return;
    switch (name)
    {
    case GL_BUFFER_SIZE: *out = static_cast<T>(buffer->bytes.size()); break;
    case GL_BUFFER_USAGE: *out = static_cast<T>(buffer->usage); break;
    case GL_BUFFER_MAPPED: *out = buffer->mapped; break;
    case GL_BUFFER_ACCESS_FLAGS: *out = static_cast<T>(buffer->mapAccess); break;
    case GL_BUFFER_MAP_OFFSET: *out = static_cast<T>(buffer->mapOffset); break;
    case GL_BUFFER_MAP_LENGTH: *out = static_cast<T>(buffer->mapLength); break;
    default: entry.Misuse(GL_INVALID_ENUM, "buffers have no such parameter: " + Hex(name));
    }
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API void glGenBuffers(GLsizei n, GLuint* buffers)
{
    GlEntry entry("glGenBuffers", {n, (const void*)buffers});
    Generate(entry, entry ? &entry.Group().buffers : nullptr, n, buffers);
}

SIM_API void glDeleteBuffers(GLsizei n, const GLuint* buffers)
{
    GlEntry entry("glDeleteBuffers", {n, (const void*)buffers});
    Delete(entry, entry ? &entry.Group().buffers : nullptr, n, buffers,
           [&](GLuint name)
           {
               Unbind(entry.Gl(), name);
               entry.Group().buffers.Erase(name);
           });
}

SIM_API GLboolean glIsBuffer(GLuint name)
{
    GlEntry entry("glIsBuffer", {name});
    const Buffer* const buffer = entry ? entry.Group().buffers.Find(name) : nullptr;
    return buffer && buffer->created ? GL_TRUE : GL_FALSE;
}

SIM_API void glBindBuffer(GLenum target, GLuint name)
{
    GlEntry entry("glBindBuffer", {target, name});
    if (!entry)
        return;
    GLuint* const binding = BufferBinding(entry.Gl(), target);
    if (!binding)
        return entry.Misuse(GL_INVALID_ENUM, "no such buffer target: " + Hex(target));
    if (name != 0)
        Bind(entry, entry.Group().buffers, name);
    *binding = name;
}

SIM_API void glBindBufferBase(GLenum target, GLuint index, GLuint name)
{
    GlEntry entry("glBindBufferBase", {target, index, name}, 30);
    BindRange(entry, target, index, {name, 0, 0});
}

SIM_API void glBindBufferRange(GLenum target, GLuint index, GLuint name, GLintptr offset,
                               GLsizeiptr size)
{
    GlEntry entry("glBindBufferRange", {target, index, name, offset, size}, 30);
    if (entry && name != 0 && (offset < 0 || size <= 0))
        return entry.Misuse(GL_INVALID_VALUE, "an empty range");
    BindRange(entry, target, index, {name, offset, size});
}

SIM_API void glBufferData(GLenum target, GLsizeiptr size, const void* data, GLenum usage)
{
    GlEntry entry("glBufferData", {target, size, data, usage});
    if (!entry)
        return;
    if (!IsUsage(usage))
        return entry.Misuse(GL_INVALID_ENUM, "no such usage: " + Hex(usage));
    if (size < 0)
        return entry.Misuse(GL_INVALID_VALUE, "a negative size");
    Buffer* const buffer = BoundBuffer(entry, target);
    if (!buffer)
        return;
    buffer->usage = usage;
    buffer->mapped = false;
    buffer->bytes.assign(static_cast<std::size_t>(size), 0);
    if (data && size > 0)
        std::memcpy(buffer->bytes.data(), data, static_cast<std::size_t>(size));
}

SIM_API void glBufferSubData(GLenum target, GLintptr offset, GLsizeiptr size, const void* data)
{
    GlEntry entry("glBufferSubData", {target, offset, size, data});
    Buffer* const buffer = entry ? BoundBuffer(entry, target) : nullptr;
    if (buffer && CheckRange(entry, *buffer, offset, size) && size > 0)
        std::memcpy(buffer->bytes.data() + offset, data, static_cast<std::size_t>(size));
}

SIM_API void glCopyBufferSubData(GLenum readTarget, GLenum writeTarget, GLintptr readOffset,
                                 GLintptr writeOffset, GLsizeiptr size)
{
    GlEntry entry("glCopyBufferSubData", {readTarget, writeTarget, readOffset, writeOffset, size},
                  30);
    Buffer* const source = entry ? BoundBuffer(entry, readTarget) : nullptr;
    Buffer* const target = source ? BoundBuffer(entry, writeTarget) : nullptr;
    if (target && CheckRange(entry, *source, readOffset, size) &&
        CheckRange(entry, *target, writeOffset, size) && size > 0)
        std::memmove(target->bytes.data() + writeOffset, source->bytes.data() + readOffset,
                     static_cast<std::size_t>(size));
}

SIM_API void* glMapBufferRange(GLenum target, GLintptr offset, GLsizeiptr length, GLbitfield access)
{
    GlEntry entry("glMapBufferRange", {target, offset, length, access}, 30);
    Buffer* const buffer = entry ? BoundBuffer(entry, target) : nullptr;
    if (!buffer || !CheckRange(entry, *buffer, offset, length))
        return nullptr;
    if (buffer->mapped)
    {
        entry.Misuse(GL_INVALID_OPERATION, "the buffer is mapped already");
        return nullptr;
    }
    buffer->mapped = true;
    buffer->mapOffset = static_cast<std::size_t>(offset);
    buffer->mapLength = static_cast<std::size_t>(length);
    buffer->mapAccess = access;
    return buffer->bytes.data() + offset;
}

SIM_API GLboolean glUnmapBuffer(GLenum target)
{
    GlEntry entry("glUnmapBuffer", {target}, 30);
    Buffer* const buffer = entry ? BoundBuffer(entry, target) : nullptr;
    if (!buffer)
        return GL_FALSE;
    if (!buffer->mapped)
    {
        entry.Misuse(GL_INVALID_OPERATION, "the buffer is not mapped");
        return GL_FALSE;
    }
    buffer->mapped = false;
    return GL_TRUE;
}

SIM_API void glFlushMappedBufferRange(GLenum target, GLintptr offset, GLsizeiptr length)
{
    GlEntry entry("glFlushMappedBufferRange", {target, offset, length}, 30);
    const Buffer* const buffer = entry ? BoundBuffer(entry, target) : nullptr;
    if (buffer && !buffer->mapped)
        entry.Misuse(GL_INVALID_OPERATION, "the buffer is not mapped");
}

SIM_API void glGetBufferParameteriv(GLenum target, GLenum name, GLint* params)
{
    GlEntry entry("glGetBufferParameteriv", {target, name, (const void*)params});
    GetParameter(entry, target, name, params);
}

SIM_API void glGetBufferParameteri64v(GLenum target, GLenum name, GLint64* params)
{
    GlEntry entry("glGetBufferParameteri64v", {target, name, (const void*)params}, 30);
    GetParameter(entry, target, name, params);
}

SIM_API void glGetBufferPointerv(GLenum target, GLenum name, void** params)
{
    GlEntry entry("glGetBufferPointerv", {target, name, (const void*)params}, 30);
    Buffer* const buffer = entry ? BoundBuffer(entry, target) : nullptr;
    if (buffer)
        *params = buffer->mapped ? buffer->bytes.data() + buffer->mapOffset : nullptr;
}

namespace
{

template <typename T>
void GetIndexed(GlEntry& entry, GLenum name, GLuint index, T* data)
{
    if (!entry)
        return;
    const bool uniform =
        IsOneOf(name, {GL_UNIFORM_BUFFER_BINDING, GL_UNIFORM_BUFFER_START, GL_UNIFORM_BUFFER_SIZE});
    std::map<GLuint, BufferRange>* const bindings =
        IndexedBindings(entry, uniform ? GL_UNIFORM_BUFFER : GL_TRANSFORM_FEEDBACK_BUFFER, index);
    if (!bindings)
        return;
    const BufferRange& range = (*bindings)[index];
    if (IsOneOf(name, {GL_UNIFORM_BUFFER_BINDING, GL_TRANSFORM_FEEDBACK_BUFFER_BINDING}))
        *data = static_cast<T>(range.buffer);
    else if (IsOneOf(name, {GL_UNIFORM_BUFFER_START, GL_TRANSFORM_FEEDBACK_BUFFER_START}))
        *data = static_cast<T>(range.offset);
    else if (IsOneOf(name, {GL_UNIFORM_BUFFER_SIZE, GL_TRANSFORM_FEEDBACK_BUFFER_SIZE}))
        *data = static_cast<T>(range.size);
    else
        entry.Misuse(GL_INVALID_ENUM, "no such indexed state: " + Hex(name));
}

} // namespace

SIM_API void glGetIntegeri_v(GLenum name, GLuint index, GLint* data)
{
    GlEntry entry("glGetIntegeri_v", {name, index, (const void*)data}, 30);
    GetIndexed(entry, name, index, data);
}

SIM_API void glGetInteger64i_v(GLenum name, GLuint index, GLint64* data)
{
    GlEntry entry("glGetInteger64i_v", {name, index, (const void*)data}, 30);
    GetIndexed(entry, name, index, data);
}
