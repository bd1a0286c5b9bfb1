#include "SimState.h"

#include <set>

// What a test sees of the objects: copies, made under the driver's lock.

using Sim::GetState;
using Sim::ShareGroup;
using Sim::State;

namespace
{

std::set<const ShareGroup*> Groups(const State& state)
{
    std::set<const ShareGroup*> groups;
    for (const auto& [handle, context] : state.contexts)
        groups.insert(context->group.get());
    return groups;
}

/// The object of that name: of the calling thread's share group, else of the first group that has
/// it.
template <typename Object>
const Object* Find(GLuint name, Sim::NameTable<Object> ShareGroup::*table)
{
    State& state = GetState();
    if (const Sim::Context* const context = state.CurrentThread().context)
        return (context->group.get()->*table).Find(name);
    for (const ShareGroup* group : Groups(state))
    {
        if (const Object* const object = (group->*table).Find(name))
            return object;
    }
    return nullptr;
}

const Sim::Framebuffer* FindFramebuffer(GLuint name)
{
    State& state = GetState();
    if (const Sim::Context* const context = state.CurrentThread().context)
        return context->gl.framebuffers.Find(name);
    for (const auto& [handle, context] : state.contexts)
    {
        if (const Sim::Framebuffer* const framebuffer = context->gl.framebuffers.Find(name))
            return framebuffer;
    }
    return nullptr;
}

} // namespace

SimCounts SimDriver::Live() const
{
    const std::lock_guard lock(GetState().mutex);
    const State& state = GetState();
    SimCounts counts;
    counts.contexts = static_cast<int>(state.contexts.size());
    counts.surfaces = static_cast<int>(state.surfaces.size());
    counts.eglSyncs = static_cast<int>(state.eglSyncs.size());
    for (const auto& [handle, context] : state.contexts)
        counts.framebuffers += context->group->lost ? 0 : context->gl.framebuffers.Count();
    for (const ShareGroup* group : Groups(state))
    {
        if (group->lost)
            continue; // so are its objects
        counts.textures += group->textures.Count();
        counts.samplers += group->samplers.Count();
        counts.buffers += group->buffers.Count();
        counts.renderbuffers += group->renderbuffers.Count();
        counts.programs += group->programs.Count();
        counts.shaders += group->shaders.Count();
        counts.syncs += static_cast<int>(group->syncs.size());
    }
    return counts;
}

SimCounts SimDriver::LostWithContext() const
{
    const std::lock_guard lock(GetState().mutex);
    return GetState().lost;
}

SimTextureState SimDriver::Texture(GLuint name) const
{
    const std::lock_guard lock(GetState().mutex);
    const Sim::Texture* const texture = Find(name, &ShareGroup::textures);
    SimTextureState state;
    if (!texture)
        return state;
    state.exists = true;
    state.target = texture->target;
    state.immutable = texture->immutable;
    state.params = texture->params;
    for (const auto& [where, image] : texture->levels)
    {
        if (where.second != 0)
            continue;
        ++state.faces;
        if (state.faces > 1)
            continue;
        state.width = image.width;
        state.height = image.height;
        state.depth = image.depth;
        state.internalFormat = image.internalFormat;
        state.format = image.layout.format;
        state.type = image.layout.type;
        state.bytes = image.CopyOfBytes();
    }
    return state;
}

SimBufferState SimDriver::Buffer(GLuint name) const
{
    const std::lock_guard lock(GetState().mutex);
    const Sim::Buffer* const buffer = Find(name, &ShareGroup::buffers);
    return buffer ? SimBufferState{true, buffer->usage, buffer->bytes} : SimBufferState{};
}

SimSamplerState SimDriver::Sampler(GLuint name) const
{
    const std::lock_guard lock(GetState().mutex);
    const Sim::Sampler* const sampler = Find(name, &ShareGroup::samplers);
    return sampler ? SimSamplerState{true, sampler->params} : SimSamplerState{};
}

SimRenderbufferState SimDriver::Renderbuffer(GLuint name) const
{
    const std::lock_guard lock(GetState().mutex);
    const Sim::Renderbuffer* const buffer = Find(name, &ShareGroup::renderbuffers);
    if (!buffer)
        return {};
    const Sim::Image& image = buffer->image;
    return {true, image.internalFormat, image.width, image.height, buffer->samples};
}

SimFramebufferState SimDriver::Framebuffer(GLuint name) const
{
    const std::lock_guard lock(GetState().mutex);
    const Sim::Framebuffer* const framebuffer = FindFramebuffer(name);
    return framebuffer ? SimFramebufferState{true, framebuffer->attachments}
                       : SimFramebufferState{};
}

SimProgramState SimDriver::Program(GLuint name) const
{
    const std::lock_guard lock(GetState().mutex);
    const Sim::Program* const program = Find(name, &ShareGroup::programs);
    SimProgramState state;
    if (!program)
        return state;
    state.exists = true;
    state.linked = program->linked;
    state.fromBinary = program->fromBinary;
    state.shaders = program->shaders;
    for (const auto& [attribute, location] : program->boundLocations)
        state.bound[attribute] = static_cast<int>(location);
    for (const Sim::Variable& attribute : program->executable.attributes)
        state.attributes[attribute.name] = attribute.location;
    for (const Sim::Uniform& uniform : program->executable.uniforms)
        state.uniforms.push_back(
            {uniform.name, uniform.type, uniform.size, uniform.location, uniform.values});
    for (const Sim::UniformBlock& block : program->executable.blocks)
        state.blocks.push_back({block.name, block.binding});
    return state;
}

std::vector<SimDraw> SimDriver::Draws() const
{
    const std::lock_guard lock(GetState().mutex);
    return GetState().draws;
}
