#ifndef NIB_SIM_GL_H
#define NIB_SIM_GL_H

#include "SimEntry.h"
#include "SimFormats.h"

#include <algorithm>

namespace Sim
{

template <typename T>
bool IsOneOf(T value, std::initializer_list<T> list)
{
    return std::find(list.begin(), list.end(), value) != list.end();
}

inline bool IsOneOf(GLenum value, std::initializer_list<int> list)
{
    return std::find(list.begin(), list.end(), static_cast<int>(value)) != list.end();
}

/// What glEnable takes.
bool IsCapability(GLenum name);

VertexArray& CurrentVertexArray(GlState& gl);
const VertexArray& CurrentVertexArray(const GlState& gl);

/// Where the binding of a buffer target is kept; null for an unknown target.
GLuint* BufferBinding(GlState& gl, GLenum target);
/// The buffer bound to the target; null, with the error set, when there is none.
Buffer* BoundBuffer(GlEntry& entry, GLenum target);
/// Client memory, or the place in the buffer that is bound to @p target; null when it is too small
/// for
/// @p size bytes, with the error set.
unsigned char* PixelMemory(GlEntry& entry, GLenum target, const void* pointer, std::size_t size);

/// Whether textures of this target exist on the device.
bool IsTextureTarget(const SimGpu& gpu, GLenum target);
/// The texture bound to the target of the active unit, or the context's own one of name 0; null,
/// with the error set, for an unknown target.
Texture* BoundTexture(GlEntry& entry, GLenum target);
/// Whether a sampling parameter takes this value; sets the error when not.
bool CheckSamplingParameter(GlEntry& entry, GLenum name, GLint value);
/// The level of a texture that an attachment names; null when there is none.
Image* AttachedImage(ShareGroup& group, const SimAttachment& attachment);

/// A framebuffer target; sets the error when it is none.
bool CheckFramebufferTarget(GlEntry& entry, GLenum target);
/// The status of a framebuffer of the current context; 0 is the window.
GLenum StatusOf(GlEntry& entry, bool read);
/// Colour images that drawing goes to; nothing, with the error set, when the framebuffer is not
/// complete.
std::optional<std::vector<Image*>> DrawImages(GlEntry& entry);
/// The colour image that is read from; null, with the error set, when there is none.
Image* ReadImage(GlEntry& entry);
/// The area that drawing may change: the scissor box when the test is on.
Box DrawArea(const GlState& gl, const Image& image);

/// The program of that name; null, with the error set, when there is none.
Program* FindProgram(GlEntry& entry, GLuint name);
/// Copies a text as the glGet*InfoLog family does.
void CopyText(const std::string& text, GLsizei size, GLsizei* length, GLchar* out);

/// Commands of the context are with the GPU: its fences can be waited for elsewhere.
void FlushContext(Context& context);

/// Sets the error and answers false when @p count is negative.
bool CheckCount(GlEntry& entry, GLsizei count);

/// glGen*: new names from the table; 0 when the call was refused, when there may be no table.
template <typename Table>
void Generate(GlEntry& entry, Table* table, GLsizei count, GLuint* names)
{
    if (entry && !CheckCount(entry, count))
        return;
    for (GLsizei i = 0; i < count; ++i)
        names[i] = entry ? table->Generate() : 0;
    entry.List(names, count);
}

/// glDelete*: calls @p remove(name) for each name that exists; a name that does not is a misuse.
template <typename Table, typename RemoveName>
void Delete(GlEntry& entry, Table* table, GLsizei count, const GLuint* names, RemoveName remove)
{
    entry.List(names, count);
    if (!entry || !CheckCount(entry, count))
        return;
    for (GLsizei i = 0; i < count; ++i)
    {
        if (names[i] == 0)
            continue;
        if (!table->Find(names[i]))
            entry.Misuse("name " + std::to_string(names[i]) + " was not generated here");
        else
            remove(names[i]);
    }
}

/// glBind*: the object of the name, made when nobody generated it, as ES allows; that is a misuse
/// all the same.
template <typename Object>
Object& Bind(GlEntry& entry, NameTable<Object>& table, GLuint name)
{
    if (!table.Find(name))
        entry.Misuse("name " + std::to_string(name) + " was not generated here");
    Object& object = table.Adopt(name);
    object.created = true;
    return object;
}

} // namespace Sim

#endif
