// Meshes on the process's driver: what is drawn where.

#include "drivers/AllocationCount.h"
#include "drivers/GlesOnDriver.h"

#include <nib/geometry.h>

#include <cstdint>

using namespace Nib;
using Type = VertexDescriptor::AttributeType;

namespace
{

constexpr Rgba kNothing = {0, 0, 0, 0};
constexpr Rgba kRed = {255, 0, 0, 255};
constexpr Rgba kGreen = {0, 255, 0, 255};
constexpr Rgba kBlue = {0, 0, 255, 255};
constexpr Rgba kWhite = {255, 255, 255, 255};

// A page of 4 x 4 pixels; positions are given in pixels.
constexpr int kSize = 4;

struct Vertex
{
    float x, y;
    float color[4];
};

constexpr const char* kVertexShader = "attribute vec2 position;\n"
                                      "attribute vec4 paint;\n"
                                      "attribute vec2 shift;\n"
                                      "varying vec4 v_paint;\n"
                                      "void main() {\n"
                                      "    vec2 pixel = (position + shift) / 2.0 - 1.0;\n"
                                      "    gl_Position = vec4(pixel, 0, 1);\n"
                                      "    gl_PointSize = 1.0;\n"
                                      "    v_paint = paint;\n"
                                      "}\n";
constexpr const char* kFragmentShader = "precision mediump float;\n"
                                        "varying vec4 v_paint;\n"
                                        "void main() { gl_FragColor = v_paint; }\n";

/// Position and colour of a vertex in one buffer.
VertexDescriptor Layout()
{
    VertexDescriptor layout;
    layout.addAttribute(Type::Float, 2);
    layout.addAttribute(Type::Float, 4);
    layout.usage = BufferUsage::Static;
    return layout;
}

/// The four corners of a rectangle as a strip, or by the indices 0 1 2 2 1 3.
std::vector<Vertex> Box(float left, float bottom, float right, float top, const Rgba& color)
{
    std::vector<Vertex> box = {
        {left, bottom, {}}, {right, bottom, {}}, {left, top, {}}, {right, top, {}}};
    for (Vertex& vertex : box)
        for (std::size_t i = 0; i < 4; ++i)
            vertex.color[i] = static_cast<float>(color[i]) / 255;
    return box;
}

std::vector<Vertex> operator+(std::vector<Vertex> left, const std::vector<Vertex>& right)
{
    left.insert(left.end(), right.begin(), right.end());
    return left;
}

const std::uint32_t kBoxIndices[] = {0, 1, 2, 2, 1, 3};

class MeshOnDriver : public GlesOnDriver
{
protected:
    /// Runs @p draw on the render thread with a page and the program, and gives the page's pixels
    /// row by row from below.
    std::vector<Rgba> Drawn(const std::function<void()>& draw)
    {
        std::vector<Rgba> pixels;
        OnThread(
            [&]
            {
                const auto program = MadeProgram(kVertexShader, kFragmentShader);
                Page page(kSize, kSize);
                program->Activate();
                for (GLuint location = 0; location < 3; ++location)
                    glDisableVertexAttribArray(location); // what an earlier draw left enabled
                glVertexAttrib4f(2, 0, 0, 0, 0);
                draw();
                EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
                pixels = page.Pixels();
            });
        return pixels;
    }

    static Owned<IGraphicsObject> Made(unsigned vertexCount, unsigned indexCount,
                                       PrimitiveType mode = PrimitiveType::Triangles)
    {
        const VertexDescriptor layout = Layout();
        return Owned<IGraphicsObject>(
            RendererFactory::CreateGraphicsObject(1, mode, &layout, vertexCount, indexCount));
    }

    static Owned<IGraphicsObject> Strip(const std::vector<Vertex>& vertices)
    {
        auto mesh = Made(4, 0, PrimitiveType::TriangleStrip);
        mesh->UpdateBuffer(0, vertices.data(), static_cast<unsigned>(vertices.size()));
        return mesh;
    }
};

/// A page that is @p outside but for the rectangle of pixels.
std::vector<Rgba> Picture(const Rgba& outside, int left, int bottom, int right, int top,
                          const Rgba& inside)
{
    std::vector<Rgba> pixels;
    for (int y = 0; y < kSize; ++y)
        for (int x = 0; x < kSize; ++x)
            pixels.push_back(x >= left && x < right && y >= bottom && y < top ? inside : outside);
    return pixels;
}

} // namespace

TEST_F(MeshOnDriver, VerticesInTheMeshesMode)
{
    const auto pixels = Drawn([] { Strip(Box(1, 0, 3, 2, kRed))->Draw(0, -1, false); });
    EXPECT_EQ(pixels, Picture(kNothing, 1, 0, 3, 2, kRed));
}

TEST_F(MeshOnDriver, PartOfTheVertices)
{
    const auto pixels =
        Drawn([] { Strip(Box(0, 0, 4, 4, kRed) + Box(2, 2, 4, 4, kGreen))->Draw(4, 4, false); });
    EXPECT_EQ(pixels, Picture(kNothing, 2, 2, 4, 4, kGreen));
}

TEST_F(MeshOnDriver, VerticesInAnotherMode)
{
    const auto pixels = Drawn(
        []
        {
            // Points at the middle of pixels.
            Strip(Box(0.5f, 0.5f, 3.5f, 3.5f, kBlue))->Draw(PrimitiveType::Points, 0, -1, false);
        });
    std::vector<Rgba> expected(16, kNothing);
    for (const std::size_t corner : {0, 3, 12, 15})
        expected[corner] = kBlue;
    EXPECT_EQ(pixels, expected);
}

TEST_F(MeshOnDriver, IndicesFromTheFirstOn)
{
    const auto draw = [](bool givenMode)
    {
        const auto vertices = Box(0, 0, 2, 2, kRed) + Box(2, 2, 4, 4, kGreen);
        std::vector<std::uint32_t> indices(kBoxIndices, kBoxIndices + 6);
        for (const std::uint32_t index : kBoxIndices)
            indices.push_back(index + 4);
        const auto mesh = Made(8, 12);
        mesh->UpdateBuffer(0, vertices.data(), 8);
        mesh->UpdateIndexes(indices.data(), 12);
        if (givenMode)
            mesh->Draw(PrimitiveType::Triangles, 6, 6, true);
        else
            mesh->Draw(6, 6, true);
    };
    EXPECT_EQ(Drawn([&] { draw(false); }), Picture(kNothing, 2, 2, 4, 4, kGreen));
    EXPECT_EQ(Drawn([&] { draw(true); }), Picture(kNothing, 0, 0, 2, 2, kRed))
        << "in a given mode the first index is not looked at";
}

TEST_F(MeshOnDriver, IndicesAbove16Bits)
{
    const auto pixels = Drawn(
        []
        {
            // Vertices that the low 16 bits of the indices would reach lie elsewhere.
            constexpr std::uint32_t kFirst = 70000;
            std::vector<Vertex> vertices(kFirst);
            for (Vertex& vertex : vertices)
                vertex = Box(0, 0, 4, 4, kRed)[(&vertex - vertices.data()) % 4];
            vertices = vertices + Box(1, 1, 3, 4, kGreen);
            std::vector<std::uint32_t> indices;
            for (const std::uint32_t index : kBoxIndices)
                indices.push_back(kFirst + index);
            const auto mesh = Made(1, 0);
            mesh->UpdateBuffer(0, vertices.data(), static_cast<unsigned>(vertices.size()));
            mesh->UpdateIndexes(indices.data(), 6);
            mesh->Draw(0, -1, true);
        });
    EXPECT_EQ(pixels, Picture(kNothing, 1, 1, 3, 4, kGreen));
}

TEST_F(MeshOnDriver, AttributesFromSeveralBuffersByIndices)
{
    const auto pixels = Drawn(
        []
        {
            VertexDescriptor layouts[2];
            layouts[0].addAttribute(Type::Short, 2);
            layouts[1].addAttribute(Type::Float, 4);
            const Owned<IGraphicsObject> mesh(RendererFactory::CreateGraphicsObject(
                2, PrimitiveType::TriangleStrip, layouts, 4, 4));
            const std::int16_t positions[] = {0, 1, 4, 1, 0, 3, 4, 3};
            const float colors[] = {0, 0, 1, 1, 0, 0, 1, 1, 0, 0, 1, 1, 0, 0, 1, 1};
            const std::uint32_t indices[] = {0, 1, 2, 3};
            mesh->UpdateBuffer(0, positions, 4);
            mesh->UpdateBuffer(1, colors, 4);
            mesh->UpdateIndexes(indices, 4);
            mesh->Draw(0, -1, true);
        });
    EXPECT_EQ(pixels, Picture(kNothing, 0, 1, 4, 3, kBlue));
}

TEST_F(MeshOnDriver, BytesThatAreNotNormalised)
{
    const auto pixels = Drawn(
        []
        {
            VertexDescriptor layout;
            layout.addAttribute(Type::Byte, 2);
            layout.addAttribute(Type::Byte, 4, 4); // two bytes of filling before it
            const Owned<IGraphicsObject> mesh(RendererFactory::CreateGraphicsObject(
                1, PrimitiveType::TriangleStrip, &layout, 4, 0));
            EXPECT_EQ(layout.size(), 8u);
            const std::int8_t vertices[] = {0, 0, 9, 9, 1, 0, 1, 1, 4, 0, 9, 9, 1, 0, 1, 1,
                                            0, 1, 9, 9, 1, 0, 1, 1, 4, 1, 9, 9, 1, 0, 1, 1};
            mesh->UpdateBuffer(0, vertices, 4);
            mesh->Draw(0, -1, false);
        });
    EXPECT_EQ(pixels, Picture(kNothing, 0, 0, 4, 1, {255, 0, 255, 255}));
}

TEST_F(MeshOnDriver, InstancesWithValuesOfTheirOwn)
{
    const auto pixels = Drawn(
        []
        {
            // The third attribute moves a vertex; here one instance after the other.
            VertexDescriptor layout;
            layout.addAttribute(Type::Float, 2, 0, 0);
            layout.addAttribute(Type::Float, 4, 8, 0);
            layout.addAttribute(Type::Float, 2, 24, 1);
            struct Moved
            {
                Vertex vertex;
                float shift[2];
            };
            std::vector<Moved> vertices;
            const float shifts[4][2] = {{0, 0}, {2, 0}, {0, 2}, {3, 3}};
            for (std::size_t i = 0; i < 4; ++i)
                vertices.push_back({Box(0, 0, 1, 1, kWhite)[i], {shifts[i][0], shifts[i][1]}});
            const Owned<IGraphicsObject> mesh(RendererFactory::CreateGraphicsObject(
                1, PrimitiveType::TriangleStrip, &layout, 4, 0));
            mesh->UpdateBuffer(0, vertices.data(), 4);
            mesh->DrawInstanced(0, 4, 4);
            GLint enabled = -1;
            glGetVertexAttribiv(2, GL_VERTEX_ATTRIB_ARRAY_ENABLED, &enabled);
            EXPECT_EQ(enabled, 0);
        });
    std::vector<Rgba> expected(16, kNothing);
    for (const std::size_t pixel : {0, 2, 8, 15})
        expected[pixel] = kWhite;
    EXPECT_EQ(pixels, expected);
}

TEST_F(MeshOnDriver, NewLayoutsAndContents)
{
    const auto pixels = Drawn(
        []
        {
            const auto mesh = Strip(Box(0, 0, 4, 4, kRed));
            VertexDescriptor padded;
            padded.addAttribute(Type::Float, 2, 0);
            padded.addAttribute(Type::Float, 4, 16);
            mesh->SetVertexDescriptors(&padded);
            std::vector<float> data;
            for (const Vertex& vertex : Box(0, 0, 1, 4, kGreen))
            {
                data.insert(data.end(), {vertex.x, vertex.y, 9, 9});
                data.insert(data.end(), vertex.color, vertex.color + 4);
            }
            mesh->UpdateBuffer(0, data.data(), 4);
            mesh->Draw(0, -1, false);
        });
    EXPECT_EQ(pixels, Picture(kNothing, 0, 0, 1, 4, kGreen));
}

TEST_F(MeshOnDriver, FilledAgainAfterTheLossOfItsContext)
{
    Owned<IGraphicsObject> mesh;
    const auto vertices = Box(1, 1, 4, 4, kBlue);
    OnThread(
        [&]
        {
            mesh = Made(4, 0);
            mesh->UpdateBuffer(0, vertices.data(), 4);
            mesh->UpdateIndexes(kBoxIndices, 6);
        });
    for (int round = 0; round < 3; ++round)
    {
        LoseContext();
        const auto pixels = Drawn(
            [&]
            {
                mesh->UpdateBuffer(0, vertices.data(), 4);
                mesh->UpdateIndexes(kBoxIndices, 6);
                mesh->Draw(0, -1, true);
            });
        EXPECT_EQ(pixels, Picture(kNothing, 1, 1, 4, 4, kBlue)) << round;
    }
    OnThread([&] { mesh.reset(); });
}

TEST_F(MeshOnDriver, BuffersOfTheOldSizeComeBackDrawable)
{
    Owned<IGraphicsObject> mesh;
    OnThread([&] { mesh = Made(4, 6); });
    LoseContext();
    OnThread(
        [&]
        {
            mesh->Draw(0, 0, true); // binds the indices
            GLint bytes = 0;
            glGetBufferParameteriv(GL_ELEMENT_ARRAY_BUFFER, GL_BUFFER_SIZE, &bytes);
            EXPECT_EQ(bytes, 24);
            mesh->UpdateBuffer(0, nullptr, 2);
            mesh->Draw(0, 2, false);
            mesh.reset();
        });
}

TEST_F(MeshOnDriver, DrawsUpdatesAndActivationsAllocateNothing)
{
    Drawn(
        [&]
        {
            const auto mesh = Made(4, 6);
            const auto vertices = Box(0, 0, 4, 4, kRed);
            mesh->UpdateBuffer(0, vertices.data(), 4);
            mesh->UpdateIndexes(kBoxIndices, 6);
            const auto texture = MadeTexture(Described(4, 4));
            const std::vector<Rgba> pixels(16, kRed);
            const auto everything = [&]
            {
                texture->Activate(0);
                texture->Update(pixels.data(), 4);
                texture->Update(Rect(0, 0, 1, 1), pixels.data(), 4);
                texture->SetData(pixels.data(), 0);
                mesh->UpdateBuffer(0, vertices.data(), 4);
                mesh->UpdateIndexes(kBoxIndices, 6);
                mesh->Draw(0, -1, true);
                mesh->Draw(PrimitiveType::TriangleStrip, 0, -1, false);
                mesh->DrawInstanced(0, 4, 2);
            };
            everything();
            const LibraryAllocations allocations;
            for (int round = 0; round < 5; ++round)
                everything();
            EXPECT_EQ(allocations.Count(), 0u);
            MadeTexture(Described(1, 1));
            EXPECT_GT(allocations.Count(), 0u) << "nothing is counted";
        });
}
