#include "gles/GraphicsObject.h"
#include "gles/GlesFixture.h"

#include <nib/exceptions.h>
#include <nib/geometry.h>

#include <cstring>
#include <memory>

using Nib::BufferUsage;
using Nib::PrimitiveType;
using Nib::VertexDescriptor;
using Nib::GLES::GraphicsObject;
using Type = Nib::VertexDescriptor::AttributeType;

namespace
{

using Mesh = std::unique_ptr<GraphicsObject, Releaser>;

/// Two floats and four bytes a vertex: 12 bytes.
VertexDescriptor Layout(BufferUsage usage = BufferUsage::Static)
{
    VertexDescriptor layout;
    layout.addAttribute(Type::Float, 2, -1, 0);
    layout.addAttribute(Type::Byte, 4, -1, 1);
    layout.usage = usage;
    return layout;
}

/// The buffers and their layouts as a mesh is made; a program that reads nothing is current, so
/// that draws are drawn.
class MeshTest : public GlesTest
{
protected:
    explicit MeshTest(SimGpu gpu = SimGpu::Default()) : GlesTest(std::move(gpu))
    {
        UseProgram();
        Forget();
    }

    Mesh Made(unsigned vertexCount = 3, unsigned indexCount = 0,
              const std::vector<VertexDescriptor>& layouts = {Layout()})
    {
        Mesh mesh(new GraphicsObject(static_cast<unsigned>(layouts.size()),
                                     PrimitiveType::Triangles, layouts.data(), vertexCount,
                                     indexCount));
        Forget();
        return mesh;
    }

    void Forget()
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    /// What @p action throws, which also stands in the log.
    template <typename Action>
    std::string ThrownBy(Action&& action)
    {
        driver.ForgetLog();
        try
        {
            action();
        }
        catch (const Nib::InvalidArgumentException& error)
        {
            EXPECT_EQ(Errors(), Texts{error.what()});
            return error.what();
        }
        return "nothing thrown";
    }

private:
    static void UseProgram()
    {
        const GLuint program = glCreateProgram();
        for (const GLenum stage : {GL_VERTEX_SHADER, GL_FRAGMENT_SHADER})
        {
            const char* source = "void main() {}";
            const GLuint shader = glCreateShader(stage);
            glShaderSource(shader, 1, &source, nullptr);
            glCompileShader(shader);
            glAttachShader(program, shader);
        }
        glLinkProgram(program);
        glUseProgram(program);
    }
};

/// A device that draws 16-bit indices only.
class MeshTestWithoutUintIndices : public MeshTest
{
protected:
    MeshTestWithoutUintIndices()
        : MeshTest(SimGpu::Default().WithoutGlExtension("GL_OES_element_index_uint"))
    {
    }
};

class MeshDeathTest : public MeshTest
{
protected:
    MeshDeathTest() { testing::GTEST_FLAG(death_test_style) = "threadsafe"; }
};

std::vector<std::uint16_t> Shorts(const SimBufferState& buffer)
{
    std::vector<std::uint16_t> values(buffer.bytes.size() / 2);
    std::memcpy(values.data(), buffer.bytes.data(), values.size() * 2);
    return values;
}

std::vector<std::uint32_t> Ints(const SimBufferState& buffer)
{
    std::vector<std::uint32_t> values(buffer.bytes.size() / 4);
    std::memcpy(values.data(), buffer.bytes.data(), values.size() * 4);
    return values;
}

const std::uint32_t kIndices[] = {0, 2, 70000};

} // namespace

// ---- making -------------------------------------------------------------------------------------

TEST_F(MeshTest, DefaultHasNoBuffersAndAsksOnceForTheIndexExtension)
{
    GraphicsObject mesh;
    EXPECT_EQ(mesh.numBuffers(), 0u);
    EXPECT_FALSE(mesh.IsSubscribed());
    EXPECT_EQ(driver.CallNames(), Names({"glGetString"}));
}

TEST_F(MeshTest, IsMadeOfBuffersWithoutContents)
{
    const VertexDescriptor layouts[] = {Layout(BufferUsage::Stream), Layout(BufferUsage::Static)};
    const Mesh mesh(new GraphicsObject(2, PrimitiveType::Triangles, layouts, 5, 7));
    EXPECT_EQ(CallTexts(), (Texts{
                               "glGetString(7939)",
                               "glGenBuffers(1)",
                               "glBindBuffer(34962, 1)",
                               "glBufferData(34962, 60, null, 35040)",
                               "glGenBuffers(2)",
                               "glBindBuffer(34962, 2)",
                               "glBufferData(34962, 60, null, 35044)",
                               "glGenBuffers(3)",
                               "glBindBuffer(34963, 3)",
                               "glBufferData(34963, 28, null, 35048)",
                               "glBindBuffer(34962, 0)",
                           }));
    EXPECT_EQ(mesh->numBuffers(), 2u);
    EXPECT_TRUE(mesh->IsSubscribed());
}

TEST_F(MeshTest, WithoutIndicesHasNoIndexBuffer)
{
    const Mesh mesh = Made(5, 0);
    EXPECT_EQ(driver.Live().buffers, 1);
    mesh->Draw(0, -1, true);
    EXPECT_EQ(driver.CallCount("glDrawElements"), 0u);
    EXPECT_EQ(driver.LastCall("glDrawArrays"), Call("glDrawArrays", GL_TRIANGLES, 0, 5));
}

TEST_F(MeshTest, FifteenBuffersWorkAndSixteenAreRefused)
{
    EXPECT_EQ(Made(1, 0, std::vector<VertexDescriptor>(15, Layout()))->numBuffers(), 15u);
    EXPECT_EQ(ThrownBy([&] { Made(1, 0, std::vector<VertexDescriptor>(16, Layout())); }),
              "CreateBuffer: invalid number of buffers!");
    EXPECT_EQ(driver.Live().buffers, 0);
}

TEST_F(MeshTest, EndDeletesItsBuffersAndItsSubscription)
{
    Mesh mesh = Made(3, 3, {Layout(), Layout()});
    mesh.reset();
    EXPECT_EQ(CallTexts(),
              (Texts{"glDeleteBuffers(1)", "glDeleteBuffers(2)", "glDeleteBuffers(3)"}));
    driver.ForgetLog();
    queue.observer.DispatchRelease();
    EXPECT_EQ(Infos(), Texts{});
}

// ---- filling ------------------------------------------------------------------------------------

TEST_F(MeshTest, UpdateBufferReplacesContentsAndCount)
{
    const Mesh mesh = Made(3, 3);
    const unsigned char data[2 * 12] = {1, 2, 3};
    mesh->UpdateBuffer(0, data, 2);
    EXPECT_EQ(driver.Calls(), Sequence({Call("glBindBuffer", GL_ARRAY_BUFFER, 1),
                                        Call("glBufferData", GL_ARRAY_BUFFER, 24,
                                             static_cast<const void*>(data), GL_STATIC_DRAW),
                                        Call("glBindBuffer", GL_ELEMENT_ARRAY_BUFFER, 0),
                                        Call("glBindBuffer", GL_ARRAY_BUFFER, 0)}));
    EXPECT_EQ(driver.Buffer(1).bytes[2], 3);
    mesh->Draw(0, -1, false);
    EXPECT_EQ(driver.LastCall("glDrawArrays"), Call("glDrawArrays", GL_TRIANGLES, 0, 2));
}

TEST_F(MeshTest, UpdateBufferOfAMissingBufferIsRefused)
{
    const Mesh mesh = Made();
    EXPECT_EQ(ThrownBy([&] { mesh->UpdateBuffer(1, nullptr, 1); }),
              "updateBuffer: wrong buffer index!");
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(MeshTest, UpdateIndexesKeeps32BitIndicesAndLeavesThemBound)
{
    const Mesh mesh = Made(3, 1);
    mesh->UpdateIndexes(kIndices, 3);
    EXPECT_EQ(driver.Calls(),
              Sequence({Call("glBindBuffer", GL_ELEMENT_ARRAY_BUFFER, 2),
                        Call("glBufferData", GL_ELEMENT_ARRAY_BUFFER, 12,
                             static_cast<const void*>(kIndices), GL_DYNAMIC_DRAW)}));
    EXPECT_EQ(Ints(driver.Buffer(2)), (std::vector<std::uint32_t>{0, 2, 70000}));
    EXPECT_EQ(Infos(), Texts{});
}

TEST_F(MeshTest, UpdateIndexesMakesAMissingIndexBuffer)
{
    const Mesh mesh = Made(3, 0);
    mesh->UpdateIndexes(kIndices, 3);
    mesh->UpdateIndexes(kIndices, 2);
    EXPECT_EQ(driver.CallCount("glGenBuffers"), 1u);
    mesh->Draw(0, -1, true);
    EXPECT_EQ(driver.LastCall("glDrawElements").Arg(1), 2);
}

TEST_F(MeshTestWithoutUintIndices, UpdateIndexesKeepsTheLow16BitsAndSaysSoEachTime)
{
    const Mesh mesh = Made(3, 3);
    EXPECT_EQ(driver.Buffer(2).bytes.size(), 12u); // made for four bytes each all the same
    mesh->UpdateIndexes(kIndices, 3);
    EXPECT_EQ(Shorts(driver.Buffer(2)), (std::vector<std::uint16_t>{0, 2, 4464}));
    EXPECT_EQ(driver.LastCall("glBufferData").Arg(1), 6);
    EXPECT_EQ(driver.LastCall("glBufferData").Arg(3), GL_DYNAMIC_DRAW);
    mesh->UpdateIndexes(kIndices, 3);
    const std::string line = "GL_UNSIGNED_INT index buffer not supported, performing conversion!";
    EXPECT_EQ(Infos(), (Texts{line, line}));
}

TEST_F(MeshTest, SetVertexDescriptorsAllocatesEachBufferAnew)
{
    const Mesh mesh = Made(5, 0, {Layout(), Layout()});
    VertexDescriptor layouts[2] = {Layout(), Layout(BufferUsage::Stream)};
    layouts[0].addAttribute(Type::Short, 2, -1, 0); // 16 bytes a vertex
    mesh->SetVertexDescriptors(layouts);
    EXPECT_EQ(CallTexts(), (Texts{
                               "glBindBuffer(34962, 1)",
                               "glBufferData(34962, 80, null, 35044)",
                               "glBindBuffer(34962, 2)",
                               "glBufferData(34962, 60, null, 35040)",
                               "glBindBuffer(34962, 0)",
                           }));
    Forget();
    mesh->UpdateBuffer(0, nullptr, 1);
    EXPECT_EQ(driver.LastCall("glBufferData").Arg(1), 16); // the new layout stays
}

TEST_F(MeshTest, SetVertexDescriptorsOfNothingIsRefused)
{
    const Mesh mesh = Made();
    EXPECT_EQ(ThrownBy([&] { mesh->SetVertexDescriptors(nullptr); }),
              "SetVertexDescriptors: invalid descriptor!");
    EXPECT_EQ(driver.CallCount(), 0u);
}

// ---- drawing ------------------------------------------------------------------------------------

TEST_F(MeshTest, DrawSetsUpTheAttributesAndLeavesThemEnabled)
{
    const Mesh mesh = Made(3);
    mesh->Draw(1, 2, false);
    EXPECT_EQ(
        driver.Calls(),
        Sequence({Call("glBindBuffer", GL_ARRAY_BUFFER, 1), Call("glEnableVertexAttribArray", 0),
                  Call("glVertexAttribPointer", 0, 2, GL_FLOAT, GL_FALSE, 12, nullptr),
                  Call("glEnableVertexAttribArray", 1),
                  Call("glVertexAttribPointer", 1, 4, GL_BYTE, GL_FALSE, 12,
                       reinterpret_cast<const void*>(8)),
                  Call("glDrawArrays", GL_TRIANGLES, 1, 2),
                  Call("glBindBuffer", GL_ARRAY_BUFFER, 0)}));
}

TEST_F(MeshTest, LocationsGoOnThroughTheBuffers)
{
    const Mesh mesh = Made(3, 3, {Layout(), Layout()});
    mesh->Draw(0, -1, true);
    const std::vector<SimCall> enabled = driver.Calls("glEnableVertexAttribArray");
    ASSERT_EQ(enabled.size(), 4u);
    for (int location = 0; location < 4; ++location)
        EXPECT_EQ(enabled[static_cast<std::size_t>(location)].Arg(0), location);
    const std::vector<SimDraw> draws = driver.Draws();
    ASSERT_EQ(draws.size(), 1u);
    EXPECT_EQ(draws[0].attribs[1].buffer, 1u);
    EXPECT_EQ(draws[0].attribs[2].buffer, 2u);
    EXPECT_EQ(draws[0].attribs[3].buffer, 2u);
}

TEST_F(MeshTest, AttributeOfEightBytesReachesGlWithoutAType)
{
    driver.AllowMisuse("glVertexAttribPointer");
    VertexDescriptor layout;
    layout.addAttribute(static_cast<Type>(5), 2, -1, 0);
    const Mesh mesh = Made(3, 0, {layout});
    mesh->Draw(0, -1, false);
    EXPECT_EQ(driver.LastCall("glVertexAttribPointer"),
              Call("glVertexAttribPointer", 0, 2, 0, GL_FALSE, 16, nullptr));
}

TEST_F(MeshTest, IndexedDrawOfTheMeshesModeStartsAtItsFirstIndex)
{
    const Mesh mesh = Made(3, 6, {Layout(), Layout()}); // two buffers are no hindrance here
    mesh->Draw(2, 3, true);
    EXPECT_EQ(driver.Calls("glBindBuffer"),
              Sequence({Call("glBindBuffer", GL_ARRAY_BUFFER, 1),
                        Call("glBindBuffer", GL_ARRAY_BUFFER, 2),
                        Call("glBindBuffer", GL_ELEMENT_ARRAY_BUFFER, 3),
                        Call("glBindBuffer", GL_ARRAY_BUFFER, 0)}));
    EXPECT_EQ(
        driver.LastCall("glDrawElements"),
        Call("glDrawElements", GL_TRIANGLES, 3, GL_UNSIGNED_INT, reinterpret_cast<const void*>(8)));
    EXPECT_EQ(driver.CallNames().back(), "glBindBuffer");
}

TEST_F(MeshTest, IndexedDrawOfAGivenModeStartsAtTheFirstIndexWhateverItIsTold)
{
    const Mesh mesh = Made(3, 6);
    mesh->Draw(PrimitiveType::LineStrip, 2, -1, true);
    EXPECT_EQ(driver.LastCall("glDrawElements"),
              Call("glDrawElements", GL_LINE_STRIP, 6, GL_UNSIGNED_INT, nullptr));
}

TEST_F(MeshTest, DrawOfAGivenModeTakesItsFirstVertex)
{
    const Mesh mesh = Made(4);
    mesh->Draw(PrimitiveType::Points, 2, -1, false);
    EXPECT_EQ(driver.LastCall("glDrawArrays"), Call("glDrawArrays", GL_POINTS, 2, 4));
    mesh->Draw(0, 1, false);
    EXPECT_EQ(driver.LastCall("glDrawArrays"), Call("glDrawArrays", GL_TRIANGLES, 0, 1));
}

TEST_F(MeshTest, DrawOfAGivenModeSetsUpTheAttributesToo)
{
    const Mesh mesh = Made(3);
    mesh->Draw(PrimitiveType::Points, 1, 2, false);
    EXPECT_EQ(
        driver.Calls(),
        Sequence({Call("glBindBuffer", GL_ARRAY_BUFFER, 1), Call("glEnableVertexAttribArray", 0),
                  Call("glVertexAttribPointer", 0, 2, GL_FLOAT, GL_FALSE, 12, nullptr),
                  Call("glEnableVertexAttribArray", 1),
                  Call("glVertexAttribPointer", 1, 4, GL_BYTE, GL_FALSE, 12,
                       reinterpret_cast<const void*>(8)),
                  Call("glDrawArrays", GL_POINTS, 1, 2),
                  Call("glBindBuffer", GL_ARRAY_BUFFER, 0)}));
}

TEST_F(MeshTest, MeshTypeIsTheModeOfLaterDraws)
{
    const Mesh mesh = Made(4);
    mesh->setMeshType(PrimitiveType::TriangleFan);
    mesh->Draw(0, -1, false);
    EXPECT_EQ(driver.LastCall("glDrawArrays"), Call("glDrawArrays", GL_TRIANGLE_FAN, 0, 4));
}

TEST_F(MeshTestWithoutUintIndices, IndexedDrawTakes16BitIndices)
{
    const Mesh mesh = Made(3, 6);
    mesh->Draw(2, -1, true);
    EXPECT_EQ(driver.LastCall("glDrawElements"),
              Call("glDrawElements", GL_TRIANGLES, 6, GL_UNSIGNED_SHORT,
                   reinterpret_cast<const void*>(4)));
}

TEST_F(MeshTest, DrawAllocatesNoNameAndAsksNothing)
{
    const Mesh mesh = Made(3, 3);
    mesh->Draw(0, -1, true);
    mesh->Draw(0, -1, false);
    EXPECT_TRUE(
        driver.Calls({"glGenBuffers", "glGetIntegerv", "glGetError", "glGetString"}).empty());
    EXPECT_TRUE(driver.Log().empty());
}

TEST_F(MeshTest, InstancedDrawSetsDivisorsAndDisablesItsArraysAgain)
{
    const Mesh mesh = Made(3);
    mesh->DrawInstanced(1, 2, 5);
    EXPECT_EQ(
        driver.Calls(),
        Sequence({Call("glBindBuffer", GL_ARRAY_BUFFER, 1), Call("glEnableVertexAttribArray", 0),
                  Call("glVertexAttribPointer", 0, 2, GL_FLOAT, GL_FALSE, 12, nullptr),
                  Call("glVertexAttribDivisor", 0, 0), Call("glEnableVertexAttribArray", 1),
                  Call("glVertexAttribPointer", 1, 4, GL_BYTE, GL_FALSE, 12,
                       reinterpret_cast<const void*>(8)),
                  Call("glVertexAttribDivisor", 1, 1),
                  Call("glDrawArraysInstanced", GL_TRIANGLES, 1, 2, 5),
                  Call("glVertexAttribDivisor", 0, 0), Call("glDisableVertexAttribArray", 0),
                  Call("glVertexAttribDivisor", 1, 0), Call("glDisableVertexAttribArray", 1),
                  Call("glBindBuffer", GL_ARRAY_BUFFER, 0)}));
}

// ---- what ends the process ----------------------------------------------------------------------

TEST_F(MeshDeathTest, FiveAttributesInABufferAbortTheFirstDraw)
{
    VertexDescriptor layout;
    for (int i = 0; i < 5; ++i)
        layout.addAttribute(Type::Float, 1, -1, 0);
    const Mesh mesh = Made(3, 0, {layout});
    const char* message =
        "nib_log: cond: Error! Please, change value of variable MAX_VERTEX_ATTRIBS by 6";
    EXPECT_DEATH(mesh->Draw(0, -1, false), message);
    EXPECT_DEATH(mesh->DrawInstanced(0, 1, 1), message);
}

TEST_F(MeshDeathTest, FourAttributesInABufferAreDrawn)
{
    VertexDescriptor layout;
    for (int i = 0; i < 4; ++i)
        layout.addAttribute(Type::Float, 1, -1, 0);
    Made(3, 0, {layout})->Draw(0, -1, false);
    EXPECT_EQ(driver.CallCount("glDrawArrays"), 1u);
}

TEST_F(MeshDeathTest, TwoBuffersWithoutIndicesAbortWhateverTheCount)
{
    const Mesh mesh = Made(3, 0, {Layout(), Layout()});
    const char* message = "nib_log: cond: Please, provide proper count of vertex for drawing";
    EXPECT_DEATH(mesh->Draw(0, -1, false), message);
    EXPECT_DEATH(mesh->Draw(0, 3, false), message);
    EXPECT_DEATH(mesh->Draw(PrimitiveType::Lines, 0, 3, false), message);
    EXPECT_DEATH(mesh->Draw(0, -1, true), message); // no index buffer either
}

TEST_F(MeshDeathTest, NoBufferAbortsADraw)
{
    EXPECT_DEATH(GraphicsObject().Draw(0, 3, false),
                 "Please, provide proper count of vertex for drawing");
}

TEST_F(MeshDeathTest, InstancedDrawOfNothingAborts)
{
    const Mesh mesh = Made(3);
    EXPECT_DEATH(mesh->DrawInstanced(0, 3, 0), "nib_log: cond: Incorrect input parameters");
    EXPECT_DEATH(mesh->DrawInstanced(0, 0, 3), "nib_log: cond: Incorrect input parameters");
    EXPECT_DEATH(mesh->DrawInstanced(0, -1, 3), "nib_log: cond: Incorrect input parameters");
}

// ---- the loss of the context --------------------------------------------------------------------

TEST_F(MeshTest, ReleaseDeletesAllBuffers)
{
    const Mesh mesh = Made(3, 3, {Layout(), Layout()});
    queue.observer.DispatchRelease();
    EXPECT_EQ(CallTexts(),
              (Texts{"glDeleteBuffers(1)", "glDeleteBuffers(2)", "glDeleteBuffers(3)"}));
    EXPECT_EQ(Infos(), (Texts{"virtual void Nib::GLES::GraphicsObject::ReleaseGLObject() - "
                              "Release Was called. Graphics - 1"}));
    EXPECT_EQ(mesh->numBuffers(), 2u);
    Forget();
    mesh->ReleaseGLObject();
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(MeshTest, RestoreMakesEmptyBuffersOfTheOldSizes)
{
    const Mesh mesh = Made(3, 3, {Layout(), Layout(BufferUsage::Stream)});
    mesh->UpdateBuffer(1, nullptr, 7);
    queue.observer.DispatchRelease();
    Forget();
    queue.observer.DispatchRestore();
    EXPECT_EQ(CallTexts(), (Texts{
                               "glGenBuffers(4)",
                               "glBindBuffer(34962, 4)",
                               "glBufferData(34962, 36, null, 35044)",
                               "glGenBuffers(5)",
                               "glBindBuffer(34962, 5)",
                               "glBufferData(34962, 84, null, 35040)",
                               "glGenBuffers(6)",
                               "glBindBuffer(34963, 6)",
                               "glBufferData(34963, 12, null, 35048)",
                               "glBindBuffer(34962, 0)",
                               "glGetError()",
                           }));
    EXPECT_EQ(Infos(), (Texts{"virtual void Nib::GLES::GraphicsObject::RestoreGLObject() - Restore "
                              "Was called. Graphics After - 4(err:0)"}));
}

TEST_F(MeshTest, RestoreLogsThePendingError)
{
    const Mesh mesh = Made();
    queue.observer.DispatchRelease();
    driver.ForgetLog();
    driver.QueueGlErrors({GL_OUT_OF_MEMORY});
    queue.observer.DispatchRestore();
    EXPECT_EQ(driver.CountLogContaining("(err:1285)"), 1u);
}

TEST_F(MeshTestWithoutUintIndices, RestoreAllocatesFourBytesAnIndexAllTheSame)
{
    const Mesh mesh = Made(3, 0);
    mesh->UpdateIndexes(kIndices, 3);
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    EXPECT_EQ(driver.Calls("glBufferData").back(),
              Call("glBufferData", GL_ELEMENT_ARRAY_BUFFER, 12, nullptr, GL_DYNAMIC_DRAW));
}

TEST_F(MeshTest, RestoreWithoutIndicesMakesNoIndexBuffer)
{
    const Mesh mesh = Made(3, 0);
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    EXPECT_EQ(driver.Live().buffers, 1);
}

TEST_F(MeshTest, RestoreOfALiveMeshMakesNothing)
{
    const Mesh mesh = Made(3, 3);
    mesh->RestoreGLObject();
    EXPECT_EQ(CallTexts(), (Texts{"glBindBuffer(34962, 0)", "glGetError()"}));
}

TEST_F(MeshTest, DrawsItsOldCountsAfterALoss)
{
    const Mesh mesh = Made(3, 6);
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    Forget();
    mesh->Draw(0, -1, true);
    mesh->Draw(0, -1, false);
    EXPECT_EQ(driver.LastCall("glDrawElements").Arg(1), 6);
    EXPECT_EQ(driver.LastCall("glDrawArrays").Arg(2), 3);
}
