// What drawing meshes through the library costs beside the same GL calls written out. Read each row
// as a ratio to the Gl row before it of the same run. The meshes are a triangle inside one pixel,
// so that the time is that of the calls and not of the pixels.

#include "BenchThread.h"

#include <nib/geometry.h>

#include <GLES3/gl3.h>

#include <cstddef>
#include <cstdint>
#include <vector>

using namespace Nib;

namespace
{

constexpr int kDrawsPerFlush = 256;

constexpr const char* kVertexShader =
    "attribute vec2 a_position;\n"
    "attribute vec4 a_color;\n"
    "uniform mat4 u_transform;\n"
    "varying vec4 v_color;\n"
    "void main()\n"
    "{\n"
    "    v_color = a_color;\n"
    "    gl_Position = u_transform * vec4(a_position, 0.0, 1.0);\n"
    "}\n";
constexpr const char* kFragmentShader = "precision mediump float;\n"
                                        "varying vec4 v_color;\n"
                                        "uniform vec4 u_tint;\n"
                                        "void main() { gl_FragColor = v_color * u_tint; }\n";

struct Vertex
{
    float position[2];
    float color[4];
};

constexpr Vertex kTriangle[] = {
    {{-1.0f, -1.0f}, {1, 0, 0, 1}},
    {{-0.99f, -1.0f}, {0, 1, 0, 1}},
    {{-1.0f, -0.99f}, {0, 0, 1, 1}},
};
constexpr std::uint32_t kIndices[] = {0, 1, 2};

VertexDescriptor Layout()
{
    VertexDescriptor layout;
    layout.addAttribute(VertexDescriptor::AttributeType::Float, 2);
    layout.addAttribute(VertexDescriptor::AttributeType::Float, 4);
    layout.usage = BufferUsage::Dynamic;
    return layout;
}

/// A page of 64 x 64 pixels and a program, current.
class Scene
{
public:
    Scene()
        : m_page(MakePage()), m_target(RendererFactory::CreateOffscreenRenderTarget(m_page.get())),
          m_program(RendererFactory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr))
    {
        m_target->Activate();
        m_program->Activate();
    }

    IShaderProgram& Program() const { return *m_program; }

private:
    static ITextureObject* MakePage()
    {
        TextureDescriptor page;
        page.width = page.height = 64;
        return RendererFactory::CreateTextureObject(page, nullptr, nullptr, 0, nullptr);
    }

    Owned<ITextureObject> m_page;
    Owned<IOffscreenRenderTarget> m_target;
    Owned<IShaderProgram> m_program;
};

/// Times @p draw. The first draw, for which the driver translates the program, is outside what is
/// measured; so is the end of the others, which keeps the driver's queue short.
template <typename Draw>
void Measure(benchmark::State& state, Draw draw)
{
    draw();
    glFinish();
    int draws = 0;
    for (auto _ : state)
    {
        draw();
        if (++draws < kDrawsPerFlush)
            continue;
        draws = 0;
        state.PauseTiming();
        glFinish();
        state.ResumeTiming();
    }
}

Owned<IGraphicsObject> Mesh()
{
    const VertexDescriptor layout = Layout();
    Owned<IGraphicsObject> mesh(
        RendererFactory::CreateGraphicsObject(1, PrimitiveType::Triangles, &layout, 3, 3));
    mesh->UpdateBuffer(0, kTriangle, 3);
    mesh->UpdateIndexes(kIndices, 3);
    return mesh;
}

/// The same mesh as GL buffers.
class GlMesh
{
public:
    GlMesh()
    {
        glGenBuffers(2, m_names);
        glBindBuffer(GL_ARRAY_BUFFER, m_names[0]);
        glBufferData(GL_ARRAY_BUFFER, sizeof kTriangle, kTriangle, GL_DYNAMIC_DRAW);
        glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, m_names[1]);
        glBufferData(GL_ELEMENT_ARRAY_BUFFER, sizeof kIndices, kIndices, GL_DYNAMIC_DRAW);
        glBindBuffer(GL_ARRAY_BUFFER, 0);
    }
    ~GlMesh() { glDeleteBuffers(2, m_names); }
    GlMesh(const GlMesh&) = delete;
    GlMesh& operator=(const GlMesh&) = delete;

    GLuint Vertices() const { return m_names[0]; }
    GLuint Indices() const { return m_names[1]; }

    void SetUpAttributes() const
    {
        glBindBuffer(GL_ARRAY_BUFFER, m_names[0]);
        glEnableVertexAttribArray(0);
        glVertexAttribPointer(0, 2, GL_FLOAT, GL_FALSE, sizeof(Vertex), nullptr);
        glEnableVertexAttribArray(1);
        glVertexAttribPointer(1, 4, GL_FLOAT, GL_FALSE, sizeof(Vertex),
                              reinterpret_cast<const void*>(offsetof(Vertex, color)));
    }

private:
    GLuint m_names[2] = {};
};

// ---- a mesh with its program --------------------------------------------------------------------

constexpr float kTransform[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
constexpr float kTint[4] = {1, 1, 1, 1};

void BM_GlDraw(benchmark::State& state)
{
    const Scene scene;
    const GlMesh mesh;
    GLint name = 0;
    glGetIntegerv(GL_CURRENT_PROGRAM, &name);
    const auto program = static_cast<GLuint>(name);
    const GLint transform = glGetUniformLocation(program, "u_transform");
    const GLint tint = glGetUniformLocation(program, "u_tint");
    Measure(state,
            [&]
            {
                glUseProgram(program);
                glUniformMatrix4fv(transform, 1, GL_FALSE, kTransform);
                glUniform4fv(tint, 1, kTint);
                mesh.SetUpAttributes();
                glDrawArrays(GL_TRIANGLES, 0, 3);
                glBindBuffer(GL_ARRAY_BUFFER, 0);
            });
}
BENCHMARK(BM_GlDraw);

void BM_Draw(benchmark::State& state)
{
    const Scene scene;
    const Owned<IGraphicsObject> mesh = Mesh();
    const Owned<IParameterBinding> transform(scene.Program().GetBindingIntf("u_transform"));
    const Owned<IParameterBinding> tint(scene.Program().GetBindingIntf("u_tint"));
    Measure(state,
            [&]
            {
                scene.Program().Activate();
                transform->SetValue(kTransform);
                tint->SetValue(kTint);
                mesh->Draw(0, -1, false);
            });
}
BENCHMARK(BM_Draw);

// ---- vertices -----------------------------------------------------------------------------------

void BM_GlDrawVertices(benchmark::State& state)
{
    const Scene scene;
    const GlMesh mesh;
    Measure(state,
            [&]
            {
                mesh.SetUpAttributes();
                glDrawArrays(GL_TRIANGLES, 0, 3);
                glBindBuffer(GL_ARRAY_BUFFER, 0);
            });
}
BENCHMARK(BM_GlDrawVertices);

void BM_DrawVertices(benchmark::State& state)
{
    const Scene scene;
    const Owned<IGraphicsObject> mesh = Mesh();
    Measure(state, [&] { mesh->Draw(0, -1, false); });
}
BENCHMARK(BM_DrawVertices);

// ---- indices ------------------------------------------------------------------------------------

void BM_GlDrawIndices(benchmark::State& state)
{
    const Scene scene;
    const GlMesh mesh;
    Measure(state,
            [&]
            {
                mesh.SetUpAttributes();
                glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, mesh.Indices());
                glDrawElements(GL_TRIANGLES, 3, GL_UNSIGNED_INT, nullptr);
                glBindBuffer(GL_ARRAY_BUFFER, 0);
            });
}
BENCHMARK(BM_GlDrawIndices);

void BM_DrawIndices(benchmark::State& state)
{
    const Scene scene;
    const Owned<IGraphicsObject> mesh = Mesh();
    Measure(state, [&] { mesh->Draw(0, -1, true); });
}
BENCHMARK(BM_DrawIndices);

// ---- instances ----------------------------------------------------------------------------------

void BM_GlDrawInstances(benchmark::State& state)
{
    const Scene scene;
    const GlMesh mesh;
    Measure(state,
            [&]
            {
                mesh.SetUpAttributes();
                glVertexAttribDivisor(0, 0);
                glVertexAttribDivisor(1, 0);
                glDrawArraysInstanced(GL_TRIANGLES, 0, 3, 4);
                for (GLuint location = 0; location < 2; ++location)
                {
                    glVertexAttribDivisor(location, 0);
                    glDisableVertexAttribArray(location);
                }
                glBindBuffer(GL_ARRAY_BUFFER, 0);
            });
}
BENCHMARK(BM_GlDrawInstances);

void BM_DrawInstances(benchmark::State& state)
{
    const Scene scene;
    const Owned<IGraphicsObject> mesh = Mesh();
    Measure(state, [&] { mesh->DrawInstanced(0, 3, 4); });
}
BENCHMARK(BM_DrawInstances);

// ---- filling ------------------------------------------------------------------------------------

void BM_GlUpdateVertices(benchmark::State& state)
{
    const GlMesh mesh;
    const std::vector<Vertex> vertices(static_cast<std::size_t>(state.range(0)));
    for (auto _ : state)
    {
        glBindBuffer(GL_ARRAY_BUFFER, mesh.Vertices());
        glBufferData(GL_ARRAY_BUFFER, static_cast<GLsizeiptr>(vertices.size() * sizeof(Vertex)),
                     vertices.data(), GL_DYNAMIC_DRAW);
        glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, 0);
        glBindBuffer(GL_ARRAY_BUFFER, 0);
    }
    state.SetBytesProcessed(state.iterations() * state.range(0) *
                            static_cast<std::int64_t>(sizeof(Vertex)));
}
BENCHMARK(BM_GlUpdateVertices)->Arg(3)->Arg(3000);

void BM_UpdateVertices(benchmark::State& state)
{
    const Owned<IGraphicsObject> mesh = Mesh();
    const std::vector<Vertex> vertices(static_cast<std::size_t>(state.range(0)));
    for (auto _ : state)
        mesh->UpdateBuffer(0, vertices.data(), static_cast<unsigned>(vertices.size()));
    state.SetBytesProcessed(state.iterations() * state.range(0) *
                            static_cast<std::int64_t>(sizeof(Vertex)));
}
BENCHMARK(BM_UpdateVertices)->Arg(3)->Arg(3000);

} // namespace

int main(int argc, char** argv)
{
    return RunBenchmarksOnRenderThread(argc, argv);
}
