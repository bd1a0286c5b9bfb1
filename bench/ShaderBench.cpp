// What it costs to have a shader program: from the cache in memory, from its file, from source,
// each beside the GL calls alone. Everything runs on a render thread, with a cache folder of its
// own.
//
// Every iteration that compiles or reads a file has a source of its own, told apart by a comment,
// so that neither this cache nor the driver's knows it.

#include "BenchThread.h"

#include <nib/shader_cache.h>

#include <GLES3/gl3.h>

#include <cstdint>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

using namespace Nib;
namespace fs = std::filesystem;

namespace
{

constexpr int kPrograms = 100; // sources, files and records of one benchmark

const std::string kVertex = "attribute vec2 a_position;\n"
                            "attribute vec4 a_color;\n"
                            "uniform mat4 u_transform;\n"
                            "varying vec4 v_color;\n"
                            "void main()\n"
                            "{\n"
                            "    v_color = a_color;\n"
                            "    gl_Position = u_transform * vec4(a_position, 0.0, 1.0);\n"
                            "}\n";
const char* const kFragment =
    "precision mediump float;\n"
    "varying vec4 v_color;\n"
    "uniform sampler2D u_tip;\n"
    "uniform vec4 u_tint;\n"
    "void main()\n"
    "{\n"
    "    gl_FragColor = v_color * u_tint * texture2D(u_tip, v_color.xy);\n"
    "}\n";

std::vector<std::string> NewVertexSources()
{
    static int number = 0;
    std::vector<std::string> sources;
    for (int i = 0; i < kPrograms; ++i)
        sources.push_back(kVertex + "// " + std::to_string(++number) + "\n");
    return sources;
}

IShaderProgram* Build(const std::string& vertex)
{
    return RendererFactory::CreateShaderProgram(vertex.c_str(), kFragment, nullptr);
}

// The record of the plain source, which every benchmark starts from.
const ShaderProgramCache::BinaryShader& KnownBinary()
{
    const auto key = ShaderProgramCache::GetShaderKey(kVertex.c_str(), kFragment);
    Build(kVertex)->Release();
    return *ShaderProgramCache::GetInstance()->GetBinaryShader(key);
}

fs::path FileOf(ShaderProgramCache::BinaryShaderKey key)
{
    return fs::path(System::GetSDKCacheDirectoryPath()).parent_path() / "RendererCache" /
           ("sh" + std::to_string(key) + ".dat");
}

GLuint Compiled(GLenum type, const char* source)
{
    const GLuint shader = glCreateShader(type);
    glShaderSource(shader, 1, &source, nullptr);
    glCompileShader(shader);
    GLint status = GL_FALSE;
    glGetShaderiv(shader, GL_COMPILE_STATUS, &status);
    return status == GL_TRUE ? shader : 0;
}

/// Whole files of the binary, one a source.
std::vector<std::string> NewFiles(const std::vector<std::string>& sources)
{
    const fs::path known = FileOf(KnownBinary().key);
    std::vector<std::string> files;
    for (const std::string& source : sources)
    {
        const fs::path file = FileOf(ShaderProgramCache::GetShaderKey(source.c_str(), kFragment));
        fs::copy_file(known, file);
        files.push_back(file.string());
    }
    return files;
}

/// All of a file, in as few system calls as there can be.
std::unique_ptr<unsigned char[]> ReadFile(const char* path)
{
    const int descriptor = open(path, O_RDONLY | O_CLOEXEC);
    struct stat status = {};
    if (descriptor < 0 || fstat(descriptor, &status) != 0)
        return nullptr;
    const auto size = static_cast<std::size_t>(status.st_size);
    std::unique_ptr<unsigned char[]> bytes(new unsigned char[size]);
    const ssize_t got = read(descriptor, bytes.get(), size);
    close(descriptor);
    return got == status.st_size ? std::move(bytes) : nullptr;
}

std::uint64_t FieldOf(const unsigned char* file, std::size_t offset)
{
    std::uint64_t field = 0;
    std::memcpy(&field, file + offset, sizeof field);
    return field;
}

bool IsLinked(GLuint program)
{
    GLint status = GL_FALSE;
    glGetProgramiv(program, GL_LINK_STATUS, &status);
    return status == GL_TRUE;
}

// ---- the measure: GL alone ----------------------------------------------------------------------

void BM_GlProgramBinary(benchmark::State& state)
{
    const ShaderProgramCache::BinaryShader& binary = KnownBinary();
    for (auto _ : state)
    {
        const GLuint program = glCreateProgram();
        glProgramBinary(program, binary.format, binary.bytes, binary.length);
        if (!IsLinked(program))
            state.SkipWithError("the driver refuses its binary");
        glDeleteProgram(program);
    }
    state.counters["bytes"] = binary.length;
}
BENCHMARK(BM_GlProgramBinary);

// The same bytes from the files that the library reads, unchecked: the format stands in the second
// field, the length in the third, the program behind five of them.
void GlProgramBinaryFromDisk(benchmark::State& state, bool keepsBytes)
{
    const std::vector<std::string> files = NewFiles(NewVertexSources());
    static std::vector<std::unique_ptr<unsigned char[]>>
        kept; // to the end, as the library keeps it
    kept.reserve(kept.size() + files.size());
    std::size_t number = 0;
    for (auto _ : state)
    {
        auto file = ReadFile(files[number].c_str());
        const GLuint program = glCreateProgram();
        glProgramBinary(program, static_cast<GLenum>(FieldOf(file.get(), 8)), file.get() + 40,
                        static_cast<GLsizei>(FieldOf(file.get(), 16)));
        if (!IsLinked(program))
            state.SkipWithError("the driver refuses its binary");
        glDeleteProgram(program);
        if (keepsBytes)
            kept.push_back(std::move(file));
        ++number;
    }
}

// What is kept spares the next context the reading, and costs new memory now.
void BM_GlProgramBinaryFromDisk(benchmark::State& state)
{
    GlProgramBinaryFromDisk(state, true);
}
BENCHMARK(BM_GlProgramBinaryFromDisk)->Iterations(kPrograms);

void BM_GlProgramBinaryFromDiskOnce(benchmark::State& state)
{
    GlProgramBinaryFromDisk(state, false);
}
BENCHMARK(BM_GlProgramBinaryFromDiskOnce)->Iterations(kPrograms);

void BM_GlCompileAndLink(benchmark::State& state)
{
    const std::vector<std::string> sources = NewVertexSources();
    auto source = sources.begin();
    for (auto _ : state)
    {
        const GLuint vertex = Compiled(GL_VERTEX_SHADER, (source++)->c_str());
        const GLuint fragment = Compiled(GL_FRAGMENT_SHADER, kFragment);
        const GLuint program = glCreateProgram();
        glAttachShader(program, vertex);
        glAttachShader(program, fragment);
        glLinkProgram(program);
        if (!IsLinked(program))
            state.SkipWithError("the driver does not link");
        glDeleteShader(vertex);
        glDeleteShader(fragment);
        glDeleteProgram(program);
    }
}
BENCHMARK(BM_GlCompileAndLink)->Iterations(kPrograms);

// ---- the library --------------------------------------------------------------------------------

// Read as a ratio to BM_GlProgramBinary: the key, one look-up, the subscription and an INFO line.
void BM_ProgramFromMemory(benchmark::State& state)
{
    KnownBinary();
    for (auto _ : state)
        Build(kVertex)->Release();
}
BENCHMARK(BM_ProgramFromMemory);

// Read as a ratio to BM_GlProgramBinaryFromDisk. The system has all those files in memory.
void BM_ProgramFromDisk(benchmark::State& state)
{
    const std::vector<std::string> sources = NewVertexSources();
    NewFiles(sources);
    auto source = sources.begin();
    for (auto _ : state)
        Build(*source++)->Release();
}
BENCHMARK(BM_ProgramFromDisk)->Iterations(kPrograms);

// Read as a ratio to BM_GlCompileAndLink: besides, the binary is fetched and its file written.
void BM_ProgramFromSource(benchmark::State& state)
{
    const std::vector<std::string> sources = NewVertexSources();
    auto source = sources.begin();
    for (auto _ : state)
        Build(*source++)->Release();
}
BENCHMARK(BM_ProgramFromSource)->Iterations(kPrograms);

} // namespace

int main(int argc, char** argv)
{
    return RunBenchmarksOnRenderThread(argc, argv);
}
