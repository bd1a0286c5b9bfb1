#include "SimPrograms.h"
#include "SimShaderText.h"

#include <cstring>
#include <set>

// Linking: locations of attributes and uniforms, uniform blocks; and linked programs as bytes.

namespace Sim
{

namespace
{

constexpr char kMagic[8] = {'S', 'I', 'M', 'P', 'R', 'O', 'G', '1'};

/// How many locations an attribute takes: a matrix takes one a column.
int Columns(GLenum type)
{
    switch (type)
    {
    case GL_FLOAT_MAT2: return 2;
    case GL_FLOAT_MAT3: return 3;
    case GL_FLOAT_MAT4: return 4;
    default: return 1;
    }
}

bool Take(std::set<int>& used, int location, int count, int limit)
{
    if (location < 0 || location + count > limit)
        return false;
    for (int i = 0; i < count; ++i)
    {
        if (used.count(location + i))
            return false;
    }
    for (int i = 0; i < count; ++i)
        used.insert(location + i);
    return true;
}

/// Locations from the source come first, then bound ones, then free ones. The free ones are handed
/// out by name: drivers do not follow the order of declarations, so nothing may rest on it.
std::string PlaceAttributes(const SimGpu& gpu, const std::map<std::string, GLuint>& bound,
                            std::vector<Variable>& attributes)
{
    std::set<int> used;
    std::vector<Variable*> rest;
    for (Variable& attribute : attributes)
    {
        const auto place = bound.find(attribute.name);
        if (attribute.location < 0 && place != bound.end())
            attribute.location = static_cast<int>(place->second);
        if (attribute.location < 0)
            rest.push_back(&attribute);
        else if (!Take(used, attribute.location, Columns(attribute.type), gpu.maxVertexAttribs))
            return "ERROR: the location of '" + attribute.name + "' is taken or does not exist\n";
    }
    std::sort(rest.begin(), rest.end(),
              [](const Variable* a, const Variable* b) { return a->name < b->name; });
    for (Variable* attribute : rest)
    {
        int location = 0;
        while (!Take(used, location, Columns(attribute->type), gpu.maxVertexAttribs))
        {
            if (++location >= gpu.maxVertexAttribs)
                return "ERROR: too many attributes\n";
        }
        attribute->location = location;
    }
    return {};
}

/// Bytes of a member of a uniform block in the std140 layout, from its alignment on.
int Std140Alignment(const Variable& member)
{
    const int components = ComponentsOf(member.type);
    if (member.array || IsMatrix(member.type) || components > 2)
        return 16;
    return components * 4;
}

int Std140Size(const Variable& member)
{
    const int components = ComponentsOf(member.type);
    if (IsMatrix(member.type))
        return 16 * std::max(Columns(member.type), 2) * member.size;
    return member.array ? 16 * member.size : components * 4;
}

/// Adds the uniforms of one shader to those of the other; the text of a conflict.
std::string Merge(const Declarations& shader, Executable& out)
{
    std::map<int, int> blockIndex;
    for (std::size_t i = 0; i < shader.blocks.size(); ++i)
    {
        const UniformBlock& block = shader.blocks[i];
        const auto known =
            std::find_if(out.blocks.begin(), out.blocks.end(),
                         [&](const UniformBlock& b) { return b.name == block.name; });
        blockIndex[static_cast<int>(i)] = static_cast<int>(known - out.blocks.begin());
        if (known == out.blocks.end())
            out.blocks.push_back(block);
    }
    for (const Variable& variable : shader.uniforms)
    {
        const std::string name = variable.array ? variable.name + "[0]" : variable.name;
        const auto known = std::find_if(out.uniforms.begin(), out.uniforms.end(),
                                        [&](const Uniform& u) { return u.name == name; });
        if (known != out.uniforms.end())
        {
            if (known->type != variable.type || known->size != variable.size)
                return "ERROR: '" + name + "' differs between the shaders\n";
            continue;
        }
        Uniform uniform;
        static_cast<Variable&>(uniform) = variable;
        uniform.name = name;
        uniform.block = variable.block < 0 ? -1 : blockIndex[variable.block];
        uniform.values.assign(static_cast<std::size_t>(ComponentsOf(variable.type) * variable.size),
                              0);
        out.uniforms.push_back(uniform);
    }
    return {};
}

void PlaceUniforms(Executable& out)
{
    int next = 0;
    for (std::size_t i = 0; i < out.uniforms.size(); ++i)
    {
        Uniform& uniform = out.uniforms[i];
        if (uniform.block >= 0)
        {
            UniformBlock& block = out.blocks[static_cast<std::size_t>(uniform.block)];
            const int alignment = Std140Alignment(uniform);
            block.dataSize = (block.dataSize + alignment - 1) / alignment * alignment;
            block.dataSize += Std140Size(uniform);
            block.members.push_back(static_cast<int>(i));
            uniform.location = -1;
        }
        else
        {
            uniform.location = next;
            next += uniform.size;
        }
    }
    for (UniformBlock& block : out.blocks)
        block.dataSize = (block.dataSize + 15) / 16 * 16;
}

std::uint64_t Hash(const unsigned char* bytes, std::size_t size)
{
    std::uint64_t hash = 14695981039346656037u;
    for (std::size_t i = 0; i < size; ++i)
        hash = (hash ^ bytes[i]) * 1099511628211u;
    return hash;
}

std::uint64_t DriverHash(const SimGpu& gpu)
{
    const std::string text = gpu.renderer + gpu.version;
    return Hash(reinterpret_cast<const unsigned char*>(text.data()), text.size());
}

void Put(std::vector<unsigned char>& bytes, const void* data, std::size_t size)
{
    const auto* const from = static_cast<const unsigned char*>(data);
    bytes.insert(bytes.end(), from, from + size);
}

void PutText(std::vector<unsigned char>& bytes, const std::string& text)
{
    const std::uint32_t size = static_cast<std::uint32_t>(text.size());
    Put(bytes, &size, sizeof size);
    Put(bytes, text.data(), text.size());
}

std::string TakeText(const unsigned char*& at)
{
    std::uint32_t size = 0;
    std::memcpy(&size, at, sizeof size);
    const std::string text(reinterpret_cast<const char*>(at + sizeof size), size);
    at += sizeof size + size;
    return text;
}

} // namespace

std::string Link(const SimGpu& gpu, const std::string& vertexSource,
                 const std::string& fragmentSource,
                 const std::map<std::string, GLuint>& boundLocations, Executable& out)
{
    const Declarations vertex = ReadShader(vertexSource);
    const Declarations fragment = ReadShader(fragmentSource);
    if (!vertex.hasMain || !fragment.hasMain)
        return "ERROR: main is missing\n";
    out = {};
    out.vertexSource = vertexSource;
    out.fragmentSource = fragmentSource;
    out.attributes = vertex.inputs;
    std::string error = PlaceAttributes(gpu, boundLocations, out.attributes);
    if (error.empty())
        error = Merge(vertex, out);
    if (error.empty())
        error = Merge(fragment, out);
    if (error.empty())
        PlaceUniforms(out);
    else
        out = {};
    return error;
}

std::vector<unsigned char> SaveProgram(const SimGpu& gpu, const Program& program)
{
    std::vector<unsigned char> bytes;
    if (gpu.programBinaryFormats.empty())
        return bytes;
    const std::uint64_t driver = DriverHash(gpu);
    Put(bytes, kMagic, sizeof kMagic);
    Put(bytes, &driver, sizeof driver);
    PutText(bytes, program.executable.vertexSource);
    PutText(bytes, program.executable.fragmentSource);
    const std::uint32_t count = static_cast<std::uint32_t>(program.executable.attributes.size());
    Put(bytes, &count, sizeof count);
    for (const Variable& attribute : program.executable.attributes)
    {
        PutText(bytes, attribute.name);
        Put(bytes, &attribute.location, sizeof attribute.location);
    }
    const std::uint64_t sum = Hash(bytes.data(), bytes.size());
    Put(bytes, &sum, sizeof sum);
    return bytes;
}

bool LoadProgram(const SimGpu& gpu, const void* data, std::size_t size, Program& program)
{
    const auto* at = static_cast<const unsigned char*>(data);
    std::uint64_t sum = 0;
    std::uint64_t driver = 0;
    if (size < sizeof kMagic + sizeof driver + sizeof sum ||
        std::memcmp(at, kMagic, sizeof kMagic) != 0)
        return false;
    std::memcpy(&sum, at + size - sizeof sum, sizeof sum);
    std::memcpy(&driver, at + sizeof kMagic, sizeof driver);
    if (sum != Hash(at, size - sizeof sum) || driver != DriverHash(gpu))
        return false;
    at += sizeof kMagic + sizeof driver;
    const std::string vertex = TakeText(at);
    const std::string fragment = TakeText(at);
    std::uint32_t count = 0;
    std::memcpy(&count, at, sizeof count);
    at += sizeof count;
    std::map<std::string, GLuint> locations;
    for (std::uint32_t i = 0; i < count; ++i)
    {
        const std::string name = TakeText(at);
        int location = 0;
        std::memcpy(&location, at, sizeof location);
        at += sizeof location;
        locations[name] = static_cast<GLuint>(location);
    }
    return Link(gpu, vertex, fragment, locations, program.executable).empty();
}

} // namespace Sim
