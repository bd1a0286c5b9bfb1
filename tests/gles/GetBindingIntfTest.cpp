#include "gles/ParameterBindingImpl.h"
#include "gles/ShaderFixture.h"

#include <nib/exceptions.h>

using Nib::BindingType;
using Nib::GLES::OpenGLShaderProgram;
using Nib::GLES::ParameterBindingImpl;

namespace
{

using Binding = std::unique_ptr<ParameterBindingImpl, Releaser>;

const std::string kNoLocation =
    "OpenGLShaderProgram::GetBindingIntf: failed to find uniform with given name(";

// What a name is bound to, in programs that are active.
class GetBindingIntf : public ShaderTest
{
protected:
    explicit GetBindingIntf(SimGpu gpu = SimGpu::Default()) : ShaderTest(std::move(gpu)) {}

    /// An active program with these uniforms.
    void Declare(const std::string& uniforms)
    {
        m_fragment = "precision mediump float;\n" + uniforms + "\nvoid main() {}\n";
        program = Built(kPlainVertex, m_fragment.c_str());
        program->Activate();
        Forget();
    }
    void DeclareBlocks(const std::string& blocks)
    {
        m_vertex = "#version 300 es\n" + blocks + "\nvoid main() { gl_Position = vec4(0); }\n";
        program = Built(m_vertex.c_str(), "#version 300 es\nvoid main() {}\n");
        program->Activate();
        Forget();
    }

    Binding Get(const std::string& name)
    {
        return Binding(dynamic_cast<ParameterBindingImpl*>(program->GetBindingIntf(name.c_str())));
    }
    BindingType TypeOf(const std::string& name) { return Get(name)->GetType(); }

    /// Where the driver has a uniform; -2 where it has none.
    int LocationOf(const std::string& name) const
    {
        for (const SimUniform& uniform : driver.Program(program->GetShaderId()).uniforms)
        {
            if (uniform.name == name)
                return uniform.location;
        }
        return -2;
    }

    bool IsUnknown(const std::string& name)
    {
        const Binding binding = Get(name);
        return binding->GetType() == BindingType::Undefined && binding->GetLocation() == -1 &&
               !binding->IsActiveUniform();
    }

    std::string Thrown(const std::string& name)
    {
        try
        {
            Get(name);
        }
        catch (const Nib::InvalidArgumentException& error)
        {
            return error.what();
        }
        return "nothing thrown";
    }

    static constexpr const char* kPlainVertex = "void main() { gl_Position = vec4(0); }\n";

    Program program;

private:
    std::string m_vertex;
    std::string m_fragment;
};

} // namespace

// ---- types --------------------------------------------------------------------------------------

TEST(ConvertGLBindingType, HasARowForEachTypeThatIsBound)
{
    const auto convert = OpenGLShaderProgram::convertGLBindingType;
    EXPECT_EQ(convert(0x8B56 /* GL_BOOL */), BindingType::Bool);
    EXPECT_EQ(convert(0x8B5C /* GL_FLOAT_MAT4 */), BindingType::Matrix4);
    EXPECT_EQ(convert(0x8B50 /* GL_FLOAT_VEC2 */), BindingType::Vector2);
    EXPECT_EQ(convert(0x8B51 /* GL_FLOAT_VEC3 */), BindingType::Vector3);
    EXPECT_EQ(convert(0x8B52 /* GL_FLOAT_VEC4 */), BindingType::Vector4);
    EXPECT_EQ(convert(0x1406 /* GL_FLOAT */), BindingType::Float);
    EXPECT_EQ(convert(0x1404 /* GL_INT */), BindingType::Int);
    EXPECT_EQ(convert(0x8B5D /* GL_SAMPLER_1D */), BindingType::Sampler);
    EXPECT_EQ(convert(0x8B5E /* GL_SAMPLER_2D */), BindingType::Sampler);
    EXPECT_EQ(convert(0x8B5F /* GL_SAMPLER_3D */), BindingType::Sampler);
    EXPECT_EQ(convert(0x8B60 /* GL_SAMPLER_CUBE */), BindingType::Sampler);
    EXPECT_EQ(convert(0x8B61 /* GL_SAMPLER_1D_SHADOW */), BindingType::Sampler);
    EXPECT_EQ(convert(0x8B62 /* GL_SAMPLER_2D_SHADOW */), BindingType::Sampler);
    EXPECT_EQ(convert(0x8DC1 /* GL_SAMPLER_2D_ARRAY */), BindingType::Sampler);
}

TEST(ConvertGLBindingType, LeavesEveryOtherTypeUndefined)
{
    for (const GLenum type : {
             0x8B53u, 0x8B54u,     0x8B55u,          // GL_INT_VEC2 to 4
             0x8B57u, 0x8B58u,     0x8B59u,          // GL_BOOL_VEC2 to 4
             0x8B5Au, 0x8B5Bu,                       // GL_FLOAT_MAT2, GL_FLOAT_MAT3
             0x8B65u, 0x8B66u,     0x8B67u, 0x8B68u, // GL_FLOAT_MAT2x3 and so on
             0x8B69u, 0x8B6Au,                       //
             0x8D66u,                                // GL_SAMPLER_EXTERNAL_OES
             0x1405u, 0x8DC6u,     0x8DC7u, 0x8DC8u, // GL_UNSIGNED_INT, GL_UNSIGNED_INT_VEC2 to 4
             0x8DCAu, 0x8DCBu,     0x8DCCu, 0x8DCFu, // GL_INT_SAMPLER_*
             0x8DD2u, 0x8DD3u,     0x8DD4u, 0x8DD7u, // GL_UNSIGNED_INT_SAMPLER_*
             0x8DC4u, 0x8DC5u,                       // GL_SAMPLER_2D_ARRAY_SHADOW, _CUBE_SHADOW
             0u,      0xFFFFFFFFu,
         })
        EXPECT_EQ(OpenGLShaderProgram::convertGLBindingType(type), BindingType::Undefined)
            << std::hex << type;
}

TEST_F(GetBindingIntf, GivesTheTypeOfTheUniform)
{
    Declare("uniform bool u_bool; uniform mat4 u_mat4; uniform vec2 u_vec2; uniform vec3 u_vec3;"
            "uniform vec4 u_vec4; uniform float u_float; uniform int u_int;"
            "uniform sampler2D u_tex; uniform samplerCube u_cube; uniform sampler3D u_volume;"
            "uniform sampler2DArray u_layers; uniform sampler2DShadow u_shadow;");
    EXPECT_EQ(TypeOf("u_bool"), BindingType::Bool);
    EXPECT_EQ(TypeOf("u_mat4"), BindingType::Matrix4);
    EXPECT_EQ(TypeOf("u_vec2"), BindingType::Vector2);
    EXPECT_EQ(TypeOf("u_vec3"), BindingType::Vector3);
    EXPECT_EQ(TypeOf("u_vec4"), BindingType::Vector4);
    EXPECT_EQ(TypeOf("u_float"), BindingType::Float);
    EXPECT_EQ(TypeOf("u_int"), BindingType::Int);
    EXPECT_EQ(TypeOf("u_tex"), BindingType::Sampler);
    EXPECT_EQ(TypeOf("u_cube"), BindingType::Sampler);
    EXPECT_EQ(TypeOf("u_volume"), BindingType::Sampler);
    EXPECT_EQ(TypeOf("u_layers"), BindingType::Sampler);
    EXPECT_EQ(TypeOf("u_shadow"), BindingType::Sampler);
}

TEST_F(GetBindingIntf, AnActiveUniformOfAnotherTypeIsFoundAndUndefined)
{
    Declare("uniform mat3 u_mat3; uniform ivec2 u_ivec2; uniform samplerExternalOES u_camera;");
    for (const char* const name : {"u_mat3", "u_ivec2", "u_camera"})
    {
        const Binding binding = Get(name);
        EXPECT_EQ(binding->GetType(), BindingType::Undefined) << name;
        EXPECT_TRUE(binding->IsActiveUniform()) << name;
        EXPECT_EQ(binding->GetLocation(), LocationOf(name)) << name;
    }
}

// ---- plain names --------------------------------------------------------------------------------

TEST_F(GetBindingIntf, AsksForUniformsUntilOneMatches)
{
    Declare("uniform vec2 u_a; uniform vec4 u_b; uniform float u_c;");
    const Binding binding = Get("u_b");
    EXPECT_EQ(
        Steps(),
        (Texts{"glGetProgramiv(3, 35718, *)", "glGetActiveUniform(3, 0, 63, *, *, *, *)",
               "glGetActiveUniform(3, 1, 63, *, *, *, *)", "glGetUniformLocation(3, \"u_b\")"}));
    EXPECT_EQ(binding->GetType(), BindingType::Vector4);
    EXPECT_EQ(binding->GetLocation(), LocationOf("u_b"));
    EXPECT_TRUE(binding->IsActiveUniform());
}

TEST_F(GetBindingIntf, AnUnknownNameIsUndefined)
{
    Declare("uniform vec2 u_a;");
    const Binding binding = Get("u_none");
    EXPECT_EQ(Steps(),
              (Texts{"glGetProgramiv(3, 35718, *)", "glGetActiveUniform(3, 0, 63, *, *, *, *)",
                     "glGetUniformBlockIndex(3, \"u_none\")"}));
    EXPECT_EQ(binding->GetType(), BindingType::Undefined);
    EXPECT_EQ(binding->GetLocation(), -1);
    EXPECT_FALSE(binding->IsActiveUniform());
    EXPECT_EQ(driver.Log().size(), 0u);

    Forget();
    binding->SetValue(nullptr);
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_THROW(binding->GetValue(), Nib::InvalidArgumentException);
}

TEST_F(GetBindingIntf, AProgramWithoutUniformsHasNoNames)
{
    Declare("");
    EXPECT_TRUE(IsUnknown("u_a"));
    EXPECT_TRUE(IsUnknown(""));
    EXPECT_TRUE(IsUnknown("]"));
}

TEST_F(GetBindingIntf, NamesAreTakenExactly)
{
    Declare("uniform vec2 u_size;");
    EXPECT_TRUE(IsUnknown("U_size"));
    EXPECT_TRUE(IsUnknown("u_siz"));
    EXPECT_TRUE(IsUnknown("u_size "));
    EXPECT_TRUE(IsUnknown("u_size["));
    EXPECT_TRUE(IsUnknown(""));
    EXPECT_FALSE(IsUnknown("u_size"));
}

TEST_F(GetBindingIntf, ReachesTheUniformWhenSet)
{
    Declare("uniform vec2 u_size; uniform mat4 u_matrix;");
    const float size[] = {3, 4};
    const Binding binding = Get("u_size");
    binding->SetValue(size);
    EXPECT_EQ(driver.Program(3).uniforms[0].values, (std::vector<double>{3, 4}));
    EXPECT_EQ(static_cast<const float*>(binding->GetValue())[1], 4.0f);

    const Binding matrix = Get("u_matrix");
    matrix->SetValue(matrix->GetValue());
    EXPECT_EQ(driver.Program(3).uniforms[1].values,
              (std::vector<double>{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}));
}

TEST_F(GetBindingIntf, GivesAnotherBindingEachTime)
{
    Declare("uniform float u_a;");
    const Binding first = Get("u_a");
    const Binding second = Get("u_a");
    EXPECT_NE(first.get(), second.get());
    const float value = 2;
    first->SetValue(&value);
    EXPECT_EQ(*static_cast<const float*>(second->GetValue()), 0.0f) << "each has a copy of its own";
}

// ---- elements of arrays -------------------------------------------------------------------------

TEST_F(GetBindingIntf, AnElementOfAnArrayHasItsOwnLocation)
{
    Declare("uniform float u_first; uniform sampler2D u_tex[4];");
    const int location = LocationOf("u_tex[0]");
    for (const int index : {0, 2, 3})
    {
        const Binding binding = Get("u_tex[" + std::to_string(index) + "]");
        EXPECT_EQ(binding->GetType(), BindingType::Sampler);
        EXPECT_EQ(binding->GetLocation(), location + index);
        EXPECT_TRUE(binding->IsActiveUniform());
    }
    const int32_t unit = 9;
    Get("u_tex[2]")->SetValue(&unit);
    EXPECT_EQ(driver.Program(3).uniforms[1].values, (std::vector<double>{0, 0, 9, 0}));
}

TEST_F(GetBindingIntf, AnElementBehindTheLastDoesNotMatch)
{
    Declare("uniform sampler2D u_tex[4];");
    EXPECT_TRUE(IsUnknown("u_tex[4]"));
    EXPECT_TRUE(IsUnknown("u_tex[10]"));
    EXPECT_TRUE(IsUnknown("u_tex[2147483647]"));
    EXPECT_EQ(driver.CallCount("glGetUniformLocation"), 0u);
}

TEST_F(GetBindingIntf, TheNameOfAnArrayAloneDoesNotMatch)
{
    Declare("uniform sampler2D u_tex[4];");
    EXPECT_TRUE(IsUnknown("u_tex"));
}

TEST_F(GetBindingIntf, ElementsOfAnotherArrayDoNotMatch)
{
    Declare("uniform float u_a[2]; uniform vec2 u_ab[4];");
    EXPECT_EQ(TypeOf("u_a[1]"), BindingType::Float);
    EXPECT_EQ(TypeOf("u_ab[3]"), BindingType::Vector2);
    EXPECT_TRUE(IsUnknown("u_a[3]"));
    EXPECT_TRUE(IsUnknown("[0]"));
    EXPECT_TRUE(IsUnknown("u_a]"));
}

TEST_F(GetBindingIntf, AnIndexIsReadCharacterByCharacter)
{
    // '-' counts as a digit, so this index is below 4; the driver does not know the name.
    Declare("uniform float u_a[4];");
    EXPECT_EQ(Thrown("u_a[-1]"), kNoLocation + "u_a[-1])");
    EXPECT_TRUE(IsUnknown("u_a[x]")) << "'x' counts as 72";
}

TEST_F(GetBindingIntf, AnElementOfAPlainUniformIsTheDriversDecision)
{
    Declare("uniform float u_a;");
    try
    {
        const Binding binding = Get("u_a[0]");
        EXPECT_EQ(binding->GetType(), BindingType::Float);
    }
    catch (const Nib::InvalidArgumentException& error)
    {
        EXPECT_EQ(error.what(), kNoLocation + "u_a[0])");
    }
    EXPECT_EQ(driver.LastCall("glGetUniformLocation").args[1].Text(), "u_a[0]")
        << "asked for by the full name";
}

// ---- long names ---------------------------------------------------------------------------------

TEST_F(GetBindingIntf, NamesOfSixtyTwoCharactersAreFound)
{
    const std::string name(62, 'u');
    Declare("uniform float " + name + ";");
    EXPECT_EQ(TypeOf(name), BindingType::Float);
}

TEST_F(GetBindingIntf, LongerNamesAreNotFound)
{
    const std::string name(63, 'u');
    Declare("uniform float " + name + ";");
    EXPECT_TRUE(IsUnknown(name));
}

TEST_F(GetBindingIntf, ArraysWithTheirBracketsMayHaveSixtyTwoCharacters)
{
    const std::string fits(59, 'u');
    const std::string longer(60, 'v');
    Declare("uniform float " + fits + "[4]; uniform float " + longer + "[4];");
    EXPECT_EQ(TypeOf(fits + "[3]"), BindingType::Float);
    EXPECT_TRUE(IsUnknown(longer + "[3]"));
}

TEST_F(GetBindingIntf, VeryLongRequestsAreCutAndNotFound)
{
    Declare("uniform float u_a;");
    EXPECT_TRUE(IsUnknown(std::string(127, 'u')));
    EXPECT_TRUE(IsUnknown(std::string(5000, 'u')));
    EXPECT_TRUE(IsUnknown(std::string(5000, 'u') + "[0]"));
}

// ---- blocks -------------------------------------------------------------------------------------

TEST_F(GetBindingIntf, TheNameOfABlockBindsTheBlock)
{
    DeclareBlocks("uniform First { vec4 a; }; uniform Second { vec4 b; };");
    const Binding binding = Get("Second");
    EXPECT_EQ(binding->GetType(), BindingType::UniformBlock);
    EXPECT_EQ(binding->GetLocation(), 1);
    EXPECT_FALSE(binding->IsActiveUniform());

    const int32_t point = 3;
    binding->SetValue(&point);
    EXPECT_EQ(driver.Program(3).blocks[1].binding, 3u);
    EXPECT_EQ(driver.Program(3).blocks[0].binding, 0u);
}

TEST_F(GetBindingIntf, TheFirstBlockHasIndexZero)
{
    DeclareBlocks("uniform First { vec4 a; };");
    EXPECT_EQ(TypeOf("First"), BindingType::UniformBlock);
    EXPECT_EQ(Get("First")->GetLocation(), 0);
}

TEST_F(GetBindingIntf, AMemberOfABlockHasNoLocationAndThrows)
{
    DeclareBlocks("uniform First { vec4 u_member; };");
    Forget();
    EXPECT_EQ(Thrown("u_member"), kNoLocation + "u_member)");
    EXPECT_EQ(Errors(), Texts{kNoLocation + "u_member)"});
    EXPECT_EQ(driver.Log().size(), 1u);
    const Texts steps = Steps();
    ASSERT_EQ(steps.size(), 4u);
    EXPECT_EQ(steps[2], "glGetUniformLocation(3, \"u_member\")");
    EXPECT_EQ(steps[3], "glGetUniformBlockIndex(3, \"u_member\")");
}
