#include "SimGl.h"
#include "SimPicture.h"

// Draw calls: checked, and recorded with the state that they use. Nothing is rasterised.

namespace Sim
{

namespace
{

/// A draw call as it comes from the application.
struct Request
{
    const char* name = "";
    GLenum mode = 0;
    GLint first = 0;
    GLsizei count = 0;
    GLsizei instances = 1;
    GLenum indexType = 0;
    const void* indices = nullptr;
};

/// Attributes that the program reads from memory at an address that can only be an offset. Arrays
/// that an earlier draw left enabled do no harm as long as the program does not use them.
void CheckAttribs(GlEntry& entry, const VertexArray& array)
{
    constexpr std::uintptr_t kLargestOffset = 1 << 16;
    const Program* const program = entry.Group().programs.Find(entry.Gl().program);
    if (!program)
        return;
    for (const Variable& used : program->executable.attributes)
    {
        const SimVertexAttrib& attrib = array.attribs.at(static_cast<std::size_t>(used.location));
        const auto address = reinterpret_cast<std::uintptr_t>(attrib.pointer);
        if (attrib.enabled && attrib.buffer == 0 && address < kLargestOffset)
            entry.Misuse("attribute '" + used.name + "' is enabled, and has no buffer");
        else if (attrib.enabled && attrib.buffer != 0 && !entry.Group().buffers.Find(attrib.buffer))
            entry.Misuse("attribute '" + used.name + "' has a deleted buffer");
    }
}

bool CheckRequest(GlEntry& entry, const Request& request)
{
    if (request.mode > GL_TRIANGLE_FAN)
        entry.Misuse(GL_INVALID_ENUM, "no such mode: " + Hex(request.mode));
    else if (request.first < 0 || request.count < 0 || request.instances < 0)
        entry.Misuse(GL_INVALID_VALUE, "a negative count");
    else if (request.indexType != 0 &&
             !IsOneOf(request.indexType, {GL_UNSIGNED_BYTE, GL_UNSIGNED_SHORT, GL_UNSIGNED_INT}))
        entry.Misuse(GL_INVALID_ENUM, "no such index type: " + Hex(request.indexType));
    else if (request.indexType == GL_UNSIGNED_INT && entry.Version() < 30 &&
             !entry.state.gpu.HasGlExtension("GL_OES_element_index_uint"))
        entry.Misuse(GL_INVALID_ENUM, "indices of 32 bits");
    else
        return true;
    return false;
}

void CheckIndices(GlEntry& entry, const Request& request, const VertexArray& array)
{
    const Buffer* const buffer = entry.Group().buffers.Find(array.elementBuffer);
    if (!buffer)
    {
        if (!request.indices)
            entry.Misuse("there are no indices");
        return;
    }
    const std::size_t bytes = request.indexType == GL_UNSIGNED_INT     ? 4
                              : request.indexType == GL_UNSIGNED_SHORT ? 2
                                                                       : 1;
    const std::size_t end = reinterpret_cast<std::uintptr_t>(request.indices) +
                            static_cast<std::size_t>(request.count) * bytes;
    if (end > buffer->bytes.size())
        entry.Misuse("the indices lie outside of the index buffer");
}

SimDraw Describe(GlEntry& entry, const Request& request, const VertexArray& array)
{
    const GlState& gl = entry.Gl();
    SimDraw draw;
    draw.name = request.name;
    draw.mode = request.mode;
    draw.first = request.first;
    draw.count = request.count;
    draw.instances = request.instances;
    draw.indexType = request.indexType;
    draw.indices = request.indices;
    draw.indexBuffer = request.indexType != 0 ? array.elementBuffer : 0;
    draw.program = gl.program;
    draw.framebuffer = gl.drawFramebuffer;
    draw.attribs.assign(array.attribs.begin(), array.attribs.end());
    for (std::size_t unit = 0; unit < gl.textures.size(); ++unit)
    {
        const auto bound = gl.textures[unit].find(GL_TEXTURE_2D);
        if (bound != gl.textures[unit].end() && bound->second != 0)
            draw.textures[static_cast<int>(unit)] = bound->second;
    }
    for (const auto& [index, range] : gl.uniformBuffers)
    {
        if (range.buffer != 0)
            draw.uniformBuffers[static_cast<int>(index)] = range.buffer;
    }
    draw.scissorTest = gl.enabled.count(GL_SCISSOR_TEST) != 0;
    std::copy(gl.scissor.begin(), gl.scissor.end(), draw.scissor);
    std::copy(gl.viewport.begin(), gl.viewport.end(), draw.viewport);
    draw.thread = entry.ThreadNumber();
    return draw;
}

void DrawInto(const std::vector<Image*>& images, std::uint64_t draw)
{
    for (Image* const image : images)
    {
        Digest digest;
        digest.Add(image->drawn);
        digest.Add(draw);
        image->drawn = digest.Value();
    }
}

void Draw(GlEntry& entry, const Request& request)
{
    const std::optional<std::vector<Image*>> images =
        entry && CheckRequest(entry, request) ? DrawImages(entry) : std::nullopt;
    if (!images)
        return;
    const VertexArray& array = CurrentVertexArray(entry.Gl());
    CheckAttribs(entry, array);
    if (request.indexType != 0)
        CheckIndices(entry, request, array);
    if (!entry.state.recording && !entry.state.notesPictures)
        return;
    SimDraw draw = Describe(entry, request, array);
    if (entry.state.notesPictures)
        DrawInto(*images, DigestOfDraw(entry, draw));
    if (entry.state.recording)
        entry.state.draws.push_back(std::move(draw));
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API void glDrawArrays(GLenum mode, GLint first, GLsizei count)
{
    GlEntry entry("glDrawArrays", {mode, first, count});
    Draw(entry, {"glDrawArrays", mode, first, count, 1, 0, nullptr});
}

SIM_API void glDrawArraysInstanced(GLenum mode, GLint first, GLsizei count, GLsizei instances)
{
    GlEntry entry("glDrawArraysInstanced", {mode, first, count, instances}, 30);
    Draw(entry, {"glDrawArraysInstanced", mode, first, count, instances, 0, nullptr});
}

SIM_API void glDrawElements(GLenum mode, GLsizei count, GLenum type, const void* indices)
{
    GlEntry entry("glDrawElements", {mode, count, type, indices});
    Draw(entry,
         {"glDrawElements", mode, 0, count, 1, type ? type : GLenum{GL_INVALID_ENUM}, indices});
}

SIM_API void glDrawElementsInstanced(GLenum mode, GLsizei count, GLenum type, const void* indices,
                                     GLsizei instances)
{
    GlEntry entry("glDrawElementsInstanced", {mode, count, type, indices, instances}, 30);
    Draw(entry, {"glDrawElementsInstanced", mode, 0, count, instances,
                 type ? type : GLenum{GL_INVALID_ENUM}, indices});
}

SIM_API void glDrawRangeElements(GLenum mode, GLuint start, GLuint end, GLsizei count, GLenum type,
                                 const void* indices)
{
    GlEntry entry("glDrawRangeElements", {mode, start, end, count, type, indices}, 30);
    Draw(entry, {"glDrawRangeElements", mode, 0, count, 1, type ? type : GLenum{GL_INVALID_ENUM},
                 indices});
}
