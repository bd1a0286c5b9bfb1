#include "gles/ParameterBindingImpl.h"
#include "gles/ShaderFixture.h"

#include <nib/exceptions.h>

#include <cstring>

using Nib::BindingType;
using Nib::GLES::ParameterBindingImpl;

namespace
{

using Binding = std::unique_ptr<ParameterBindingImpl, Releaser>;

// Bindings as such, at places that the test chooses; the calls go out with a program that has
// nothing there, so GL refuses them, which is none of the binding's business.
class ParameterBinding : public ShaderTest
{
protected:
    ParameterBinding() : program(Built()) { driver.AllowMisuse(); }

    Binding Made(BindingType type, int32_t location = 7)
    {
        Binding binding(new ParameterBindingImpl(type, program.get()));
        binding->SetLocation(location, true);
        return binding;
    }

    Program program;
};

template <typename T>
T Value(const Binding& binding)
{
    T value;
    std::memcpy(&value, binding->GetValue(), sizeof value);
    return value;
}

template <std::size_t N>
std::vector<float> Floats(const Binding& binding)
{
    const auto* const values = static_cast<const float*>(binding->GetValue());
    return {values, values + N};
}

template <typename Action>
std::string Thrown(Action action)
{
    try
    {
        action();
    }
    catch (const Nib::InvalidArgumentException& error)
    {
        return error.what();
    }
    return "nothing thrown";
}

} // namespace

TEST(BindingTypeValues, AreFixed)
{
    EXPECT_EQ(sizeof(BindingType), 4u);
    EXPECT_EQ(static_cast<int>(BindingType::Undefined), 0);
    EXPECT_EQ(static_cast<int>(BindingType::Bool), 1);
    EXPECT_EQ(static_cast<int>(BindingType::Matrix4), 2);
    EXPECT_EQ(static_cast<int>(BindingType::Vector2), 3);
    EXPECT_EQ(static_cast<int>(BindingType::Vector3), 4);
    EXPECT_EQ(static_cast<int>(BindingType::Vector4), 5);
    EXPECT_EQ(static_cast<int>(BindingType::Float), 6);
    EXPECT_EQ(static_cast<int>(BindingType::Int), 7);
    EXPECT_EQ(static_cast<int>(BindingType::Sampler), 8);
    EXPECT_EQ(static_cast<int>(BindingType::UniformBlock), 9);
}

// ---- a new binding ------------------------------------------------------------------------------

TEST_F(ParameterBinding, IsBoundToNothingAtFirst)
{
    const Binding binding(new ParameterBindingImpl(BindingType::Float, program.get()));
    EXPECT_EQ(binding->GetLocation(), -1);
    EXPECT_FALSE(binding->IsActiveUniform());
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(ParameterBinding, HasTheTypeItWasMadeWith)
{
    const Binding binding = Made(BindingType::Vector3);
    const BindingType& type = binding->GetType();
    EXPECT_EQ(type, BindingType::Vector3);
    EXPECT_EQ(&binding->GetType(), &type) << "a reference to the field";
}

TEST_F(ParameterBinding, IsZeroAtFirst)
{
    EXPECT_EQ(Value<unsigned char>(Made(BindingType::Bool)), 0);
    EXPECT_EQ(Value<int32_t>(Made(BindingType::Int)), 0);
    EXPECT_EQ(Value<int32_t>(Made(BindingType::Sampler)), 0);
    EXPECT_EQ(Value<int32_t>(Made(BindingType::UniformBlock)), 0);
    EXPECT_EQ(Value<float>(Made(BindingType::Float)), 0.0f);
    EXPECT_EQ(Floats<2>(Made(BindingType::Vector2)), (std::vector<float>{0, 0}));
    EXPECT_EQ(Floats<3>(Made(BindingType::Vector3)), (std::vector<float>{0, 0, 0}));
    EXPECT_EQ(Floats<4>(Made(BindingType::Vector4)), (std::vector<float>{0, 0, 0, 0}));
}

TEST_F(ParameterBinding, MatrixIsTheIdentityAtFirst)
{
    EXPECT_EQ(Floats<16>(Made(BindingType::Matrix4)),
              (std::vector<float>{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}));
}

// ---- setting ------------------------------------------------------------------------------------

TEST_F(ParameterBinding, BoolIsOneByte)
{
    const Binding binding = Made(BindingType::Bool);
    const unsigned char bytes[] = {1, 0xFF, 0xFF, 0xFF};
    binding->SetValue(bytes);
    EXPECT_EQ(Steps(), Texts{"glUniform1i(7, 1)"});
    EXPECT_EQ(Value<unsigned char>(binding), 1);
    Forget();
    const bool off = false;
    binding->SetValue(&off);
    EXPECT_EQ(Steps(), Texts{"glUniform1i(7, 0)"});
}

TEST_F(ParameterBinding, Matrix4IsSixteenFloats)
{
    const Binding binding = Made(BindingType::Matrix4);
    std::vector<float> values(16);
    for (std::size_t i = 0; i < 16; ++i)
        values[i] = static_cast<float>(i) + 0.5f;
    binding->SetValue(values.data());
    EXPECT_EQ(Steps(), Texts{"glUniformMatrix4fv(7, 1, 0, *)"});
    EXPECT_EQ(driver.LastCall("glUniformMatrix4fv").args[3].Pointer(), binding->GetValue())
        << "the stored copy is sent";
    EXPECT_EQ(Floats<16>(binding), values);
}

TEST_F(ParameterBinding, Matrix4MayBeSetFromItself)
{
    const Binding binding = Made(BindingType::Matrix4);
    binding->SetValue(binding->GetValue());
    EXPECT_EQ(Steps(), Texts{"glUniformMatrix4fv(7, 1, 0, *)"});
    EXPECT_EQ(Floats<16>(binding),
              (std::vector<float>{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}));
}

TEST_F(ParameterBinding, Vector2IsTwoFloats)
{
    const Binding binding = Made(BindingType::Vector2);
    const float values[] = {1.5f, -2};
    binding->SetValue(values);
    EXPECT_EQ(Steps(), Texts{"glUniform2fv(7, 1, *)"});
    EXPECT_EQ(driver.LastCall("glUniform2fv").args[2].Pointer(), binding->GetValue());
    EXPECT_EQ(Floats<2>(binding), (std::vector<float>{1.5f, -2}));
}

TEST_F(ParameterBinding, Vector3IsThreeFloats)
{
    const Binding binding = Made(BindingType::Vector3);
    const float values[] = {1.5f, -2, 3};
    binding->SetValue(values);
    EXPECT_EQ(Steps(), Texts{"glUniform3fv(7, 1, *)"});
    EXPECT_EQ(driver.LastCall("glUniform3fv").args[2].Pointer(), binding->GetValue());
    EXPECT_EQ(Floats<3>(binding), (std::vector<float>{1.5f, -2, 3}));
}

TEST_F(ParameterBinding, Vector4IsFourFloats)
{
    const Binding binding = Made(BindingType::Vector4);
    const float values[] = {1.5f, -2, 3, 4};
    binding->SetValue(values);
    EXPECT_EQ(Steps(), Texts{"glUniform4fv(7, 1, *)"});
    EXPECT_EQ(driver.LastCall("glUniform4fv").args[2].Pointer(), binding->GetValue());
    EXPECT_EQ(Floats<4>(binding), (std::vector<float>{1.5f, -2, 3, 4}));
}

TEST_F(ParameterBinding, FloatIsOneFloat)
{
    const Binding binding = Made(BindingType::Float);
    const float value = 0.25f;
    binding->SetValue(&value);
    EXPECT_EQ(Steps(), Texts{"glUniform1f(7, 0.25)"});
    EXPECT_EQ(Value<float>(binding), 0.25f);
}

TEST_F(ParameterBinding, IntAndSamplerAreThirtyTwoBits)
{
    for (const BindingType type : {BindingType::Int, BindingType::Sampler})
    {
        const Binding binding = Made(type);
        const int32_t value = -123456;
        binding->SetValue(&value);
        EXPECT_EQ(Steps(), Texts{"glUniform1i(7, -123456)"});
        EXPECT_EQ(Value<int32_t>(binding), -123456);
        Forget();
    }
}

TEST_F(ParameterBinding, UniformBlockBindsItsBlock)
{
    const Binding binding = Made(BindingType::UniformBlock, 2);
    const int32_t point = 5;
    binding->SetValue(&point);
    EXPECT_EQ(Steps(), Texts{"glUniformBlockBinding(3, 2, 5)"});
    EXPECT_EQ(Value<int32_t>(binding), 5);
}

TEST_F(ParameterBinding, UniformBlockFollowsItsProgramThroughARestore)
{
    const Binding binding = Made(BindingType::UniformBlock, 2);
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    Forget();
    const int32_t point = 5;
    binding->SetValue(&point);
    EXPECT_EQ(Steps(), Texts{"glUniformBlockBinding(4, 2, 5)"});
}

TEST_F(ParameterBinding, ValuesMayBeSetFromThemselves)
{
    const Binding binding = Made(BindingType::Vector4);
    const float values[] = {1, 2, 3, 4};
    binding->SetValue(values);
    binding->SetValue(binding->GetValue());
    EXPECT_EQ(Floats<4>(binding), (std::vector<float>{1, 2, 3, 4}));
}

TEST_F(ParameterBinding, DoesNotMakeItsProgramCurrent)
{
    const Binding binding = Made(BindingType::Int);
    const int32_t value = 1;
    binding->SetValue(&value);
    EXPECT_EQ(driver.CallCount("glUseProgram"), 0u);
}

// ---- types without a value ----------------------------------------------------------------------

TEST_F(ParameterBinding, SettingAnUndefinedOneDoesNothing)
{
    const Binding binding = Made(BindingType::Undefined);
    binding->SetValue(nullptr);
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ParameterBinding, ReadingAnUndefinedOneThrows)
{
    const Binding binding = Made(BindingType::Undefined);
    const std::string message = "ParameterBindingImpl::GetValue: type of binding is undefined";
    EXPECT_EQ(Thrown([&] { binding->GetValue(); }), message);
    EXPECT_EQ(Errors(), Texts{message});
}

TEST_F(ParameterBinding, ATypeThatDoesNotExistThrowsInBothDirections)
{
    for (const int number : {10, -1})
    {
        const Binding binding = Made(static_cast<BindingType>(number));
        Forget();
        const std::string setting = "ParameterBindingImpl::SetValue: type of binding is undefined";
        const std::string reading = "ParameterBindingImpl::GetValue: type of binding is undefined";
        EXPECT_EQ(Thrown([&] { binding->SetValue(nullptr); }), setting);
        EXPECT_EQ(Thrown([&] { binding->GetValue(); }), reading);
        EXPECT_EQ(Errors(), (Texts{setting, reading}));
        EXPECT_EQ(driver.CallCount(), 0u);
    }
}

// ---- the end ------------------------------------------------------------------------------------

TEST_F(ParameterBinding, ReleaseDeletesItAndCallsNoGl)
{
    Binding binding = Made(BindingType::Float);
    binding.reset(); // a leak would be the sanitizer's find
    EXPECT_EQ(driver.CallCount(), 0u);
}
