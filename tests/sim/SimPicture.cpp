#include "SimPicture.h"

namespace Sim
{

void Digest::AddBytes(const void* data, std::size_t size)
{
    const auto* bytes = static_cast<const unsigned char*>(data);
    for (std::size_t i = 0; i < size; ++i)
        m_value = (m_value ^ bytes[i]) * 0x100000001B3;
}

void Digest::Add(const std::string& text)
{
    Add(std::uint64_t{text.size()});
    AddBytes(text.data(), text.size());
}

void Digest::Add(const Image& image)
{
    for (const int number : {image.width, image.height, image.depth})
        Add(static_cast<std::uint64_t>(number));
    Add(std::uint64_t{image.internalFormat});
    const std::vector<unsigned char> bytes = image.CopyOfBytes();
    AddBytes(bytes.data(), bytes.size());
    Add(image.drawn);
}

std::uint64_t CopiedInto(const Image& target, const Image& source, const Box& area)
{
    if (target.drawn == 0 && source.drawn == 0)
        return 0;
    Digest digest;
    digest.Add(target.drawn);
    digest.Add(source.drawn);
    for (const int number : {area.x, area.y, area.width, area.height})
        digest.Add(static_cast<std::uint64_t>(number));
    return digest.Value();
}

namespace
{

template <typename Numbers>
void AddAll(Digest& digest, const Numbers& numbers)
{
    for (const auto number : numbers)
        digest.Add(static_cast<double>(number));
}

void AddParams(Digest& digest, const std::map<GLenum, GLint>& params)
{
    for (const auto& [name, value] : params)
    {
        digest.Add(std::uint64_t{name});
        digest.Add(static_cast<std::uint64_t>(value));
    }
}

/// The texture and the sampler of a unit, as a program would see them.
void AddTextureUnit(Digest& digest, GlEntry& entry, std::size_t unit)
{
    const GlState& gl = entry.Gl();
    if (unit >= gl.textures.size())
        return;
    const Sampler* const sampler = entry.Group().samplers.Find(gl.samplers[unit]);
    for (const auto& [target, name] : gl.textures[unit])
    {
        const Texture* const texture = entry.Group().textures.Find(name);
        if (!texture)
            continue;
        digest.Add(std::uint64_t{target});
        AddParams(digest, sampler ? sampler->params : texture->params);
        for (const auto& [where, image] : texture->levels)
            digest.Add(image);
    }
}

bool IsSampler(GLenum type)
{
    return IsOneOf(type, {GL_SAMPLER_2D, GL_SAMPLER_3D, GL_SAMPLER_CUBE, GL_SAMPLER_2D_SHADOW,
                          GL_SAMPLER_2D_ARRAY});
}

void AddProgram(Digest& digest, GlEntry& entry)
{
    const Program* const program = entry.Group().programs.Find(entry.Gl().program);
    if (!program)
        return;
    digest.Add(program->executable.vertexSource);
    digest.Add(program->executable.fragmentSource);
    for (const Uniform& uniform : program->executable.uniforms)
    {
        digest.Add(uniform.name);
        AddAll(digest, uniform.values);
        if (IsSampler(uniform.type) && !uniform.values.empty())
            AddTextureUnit(digest, entry, static_cast<std::size_t>(uniform.values.front()));
    }
    for (const UniformBlock& block : program->executable.blocks)
    {
        digest.Add(block.name);
        const auto range = entry.Gl().uniformBuffers.find(block.binding);
        const Buffer* const buffer = range == entry.Gl().uniformBuffers.end()
                                         ? nullptr
                                         : entry.Group().buffers.Find(range->second.buffer);
        if (buffer)
            digest.AddBytes(buffer->bytes.data(), buffer->bytes.size());
    }
}

void AddVertices(Digest& digest, GlEntry& entry, const SimDraw& draw)
{
    const Program* const program = entry.Group().programs.Find(entry.Gl().program);
    if (!program)
        return;
    for (const Variable& used : program->executable.attributes)
    {
        const SimVertexAttrib& attrib = draw.attribs.at(static_cast<std::size_t>(used.location));
        digest.Add(used.name);
        AddAll(digest,
               std::initializer_list<double>{double(attrib.enabled), double(attrib.size),
                                             double(attrib.type), double(attrib.normalized),
                                             double(attrib.stride), double(attrib.divisor)});
        const Buffer* const buffer = entry.Group().buffers.Find(attrib.buffer);
        if (!attrib.enabled || !buffer)
            continue;
        digest.Add(std::uint64_t{reinterpret_cast<std::uintptr_t>(attrib.pointer)}); // an offset
        digest.AddBytes(buffer->bytes.data(), buffer->bytes.size());
    }
    const Buffer* const indices = entry.Group().buffers.Find(draw.indexBuffer);
    if (draw.indexType != 0 && indices)
    {
        digest.Add(std::uint64_t{reinterpret_cast<std::uintptr_t>(draw.indices)});
        digest.AddBytes(indices->bytes.data(), indices->bytes.size());
    }
}

void AddFixedState(Digest& digest, const GlState& gl)
{
    AddAll(digest, gl.enabled);
    AddAll(digest, gl.viewport);
    if (gl.enabled.count(GL_SCISSOR_TEST))
        AddAll(digest, gl.scissor);
    AddAll(digest, gl.colorMask);
    if (gl.enabled.count(GL_BLEND))
    {
        AddAll(digest, std::initializer_list<GLenum>{gl.blendEquationRgb, gl.blendEquationAlpha,
                                                     gl.blendSrcRgb, gl.blendDstRgb,
                                                     gl.blendSrcAlpha, gl.blendDstAlpha});
        AddAll(digest, gl.blendColor);
    }
    if (gl.enabled.count(GL_DEPTH_TEST))
    {
        digest.Add(std::uint64_t{gl.depthMask});
        digest.Add(std::uint64_t{gl.depthFunc});
    }
    if (!gl.enabled.count(GL_STENCIL_TEST))
        return;
    for (const StencilFace& face : {gl.stencilFront, gl.stencilBack})
        AddAll(digest, std::initializer_list<double>{double(face.func), double(face.ref),
                                                     double(face.readMask), double(face.writeMask),
                                                     double(face.fail), double(face.depthFail),
                                                     double(face.pass)});
}

} // namespace

std::uint64_t DigestOfDraw(GlEntry& entry, const SimDraw& draw)
{
    Digest digest;
    AddAll(digest,
           std::initializer_list<double>{double(draw.mode), double(draw.first), double(draw.count),
                                         double(draw.instances), double(draw.indexType)});
    AddProgram(digest, entry);
    AddVertices(digest, entry, draw);
    AddFixedState(digest, entry.Gl());
    return digest.Value();
}

void NotePicture(State& state, const char* what, const Image& image, const Box& area)
{
    if (!state.notesPictures)
        return;
    Digest digest;
    digest.Add(image);
    state.pictures.push_back({what, digest.Value(), {area.x, area.y, area.width, area.height}});
}

} // namespace Sim

void SimDriver::NotePictures(bool on)
{
    const std::lock_guard lock(Sim::GetState().mutex);
    Sim::GetState().notesPictures = on;
}

std::vector<SimPicture> SimDriver::Pictures() const
{
    const std::lock_guard lock(Sim::GetState().mutex);
    return Sim::GetState().pictures;
}
