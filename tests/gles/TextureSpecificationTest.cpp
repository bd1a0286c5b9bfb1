#include "gles/TextureSpecification.h"
#include "gles/GlesFixture.h"
#include "gles/TextureObject.h"
#include "gles/TextureParams.h"

#include <nib/exceptions.h>
#include <nib/texture.h>

#include <memory>

using Nib::TextureDescriptor;
using Nib::TextureMemoryLayout;
using Nib::TextureTargetLayout;
using namespace Nib::GLES;

namespace
{

using Texture = std::unique_ptr<TextureObject, Releaser>;

TextureDescriptor Described(int target, int width = 4, int height = 2, int depth = 3)
{
    TextureDescriptor descriptor;
    descriptor.width = width;
    descriptor.height = height;
    descriptor.depth = depth;
    descriptor.target = target;
    return descriptor;
}

Texture Made(const TextureDescriptor& descriptor, const std::vector<unsigned>& params = {})
{
    return Texture(new TextureObject(descriptor, nullptr, params.data(),
                                     static_cast<unsigned>(params.size() / 2)));
}

using TextureSpecificationTest = GlesTest;
using TextureParameterPath = GlesTestWithoutSamplers;

} // namespace

// ---- tables -------------------------------------------------------------------------------------

TEST(TextureTables, EachTargetIndexHasItsTarget)
{
    constexpr GLenum expected[] = {0x0DE0, 0x0DE1, 0x8C1A, 0x806F, 0x8513, 0x8D65};
    for (int i = 0; i < 6; ++i)
    {
        EXPECT_TRUE(IsTextureTarget(i));
        EXPECT_EQ(GetTextureTarget(i), expected[i]) << i;
    }
    for (const int i : {-1, 6, 7, 1000})
    {
        EXPECT_FALSE(IsTextureTarget(i)) << i;
        EXPECT_EQ(GetTextureTarget(i), 0u) << i;
    }
}

TEST(TextureTables, EachParameterIndexHasItsGlParameter)
{
    constexpr GLenum expected[] = {0x2802, 0x2803, 0x8072, 0, 0x2800, 0x2801, 0, 0};
    for (int i = 0; i < 8; ++i)
        EXPECT_EQ(getGlPname(i), expected[i]) << i;
}

TEST(TextureTables, WrapsAndFiltersHaveTheirGlValues)
{
    constexpr GLint wraps[] = {0x8370, 0x812F, 0x812D, 0x2901};
    for (const int index : {0, 1, 2})
        for (int value = 0; value < 4; ++value)
            EXPECT_EQ(GetTextureParamValue(index, value), wraps[value]) << index << ", " << value;
    for (const int index : {3, 4, 5, 6})
    {
        EXPECT_EQ(GetTextureParamValue(index, 0), 0x2600) << index;
        EXPECT_EQ(GetTextureParamValue(index, 1), 0x2601) << index;
    }
}

TEST(TextureTables, OnlyWrapSOf1DTexturesDefaultsToTheBorder)
{
    EXPECT_EQ(GetTextureParamDefault(0, 0), 2);
    EXPECT_EQ(GetTextureParamDefault(0, 1), 1);
    EXPECT_EQ(GetTextureParamDefault(0, 4), 1);
    for (int target = 1; target < 6; ++target)
        for (const int index : {0, 1, 2, 4, 5})
            EXPECT_EQ(GetTextureParamDefault(target, index), 1) << target << ", " << index;
}

TEST(TextureTables, EachTargetIsAskedForItsBinding)
{
    EXPECT_EQ(GetTextureBinding(0x0DE0), 0x8068u); // GL_TEXTURE_1D
    EXPECT_EQ(GetTextureBinding(GL_TEXTURE_2D), 0x8069u);
    EXPECT_EQ(GetTextureBinding(GL_TEXTURE_2D_ARRAY), 0x8C1Du);
    EXPECT_EQ(GetTextureBinding(GL_TEXTURE_3D), 0x806Au);
    EXPECT_EQ(GetTextureBinding(GL_TEXTURE_CUBE_MAP), 0x8514u);
    EXPECT_EQ(GetTextureBinding(0x8D66), 0x8D67u); // the sampler type of external textures
    EXPECT_EQ(GetTextureBinding(0x8D65), 0x8514u); // their target
}

// ---- what is refused ----------------------------------------------------------------------------

TEST_F(TextureSpecificationTest, TypeOfAllOnesIsRefused)
{
    EXPECT_NO_THROW(RequireSupportedType(0));
    EXPECT_NO_THROW(RequireSupportedType(GL_UNSIGNED_BYTE));
    try
    {
        RequireSupportedType(0xFFFFFFFF);
        FAIL() << "no exception";
    }
    catch (const Nib::OGLVersionNotSupportedException& error)
    {
        EXPECT_STREQ(error.what(), "Required OpenGL version not supported!");
    }
    EXPECT_EQ(Errors(), (Texts{"Required OpenGL version not supported!"}));
}

TEST_F(TextureSpecificationTest, ImageOfTheExternalSamplerTypeIsRefused)
{
    try
    {
        SpecifyImage(0x8D66, Described(5), nullptr, 0);
        FAIL() << "no exception";
    }
    catch (const Nib::NotSupportedException& error)
    {
        EXPECT_STREQ(error.what(), "Functionality are not supported!");
    }
    EXPECT_EQ(Errors(), (Texts{"Functionality are not supported!"}));
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(TextureSpecificationTest, NegativeTargetIsRefusedToo)
{
    const Texture texture = Made(Described(-1));
    EXPECT_EQ(Errors().size(), 1u);
    EXPECT_EQ(texture->internals().glID, 0u);
    EXPECT_EQ(driver.Live().textures, 0);
}

// ---- parameters of each target ------------------------------------------------------------------

TEST_F(TextureSpecificationTest, VolumesAndCubeMapsWrapInThreeDirections)
{
    for (const int target : {2, 3, 4})
    {
        driver.ForgetCalls();
        const Texture texture = Made(Described(target, 2, 2), {0, 3, 1, 0, 2, 2, 4, 0, 5, 0});
        const int sampler = static_cast<int>(texture->internals().sampler);
        EXPECT_EQ(
            driver.Calls("glSamplerParameteri"),
            Sequence({Call("glSamplerParameteri", sampler, GL_TEXTURE_WRAP_S, GL_REPEAT),
                      Call("glSamplerParameteri", sampler, GL_TEXTURE_WRAP_T, GL_MIRRORED_REPEAT),
                      Call("glSamplerParameteri", sampler, GL_TEXTURE_WRAP_R, 0x812D),
                      Call("glSamplerParameteri", sampler, GL_TEXTURE_MAG_FILTER, GL_NEAREST),
                      Call("glSamplerParameteri", sampler, GL_TEXTURE_MIN_FILTER, GL_NEAREST)}))
            << target;
    }
}

TEST_F(TextureSpecificationTest, ExternalTexturesWrapInTwoDirections)
{
    const Texture texture = Made(Described(5), {0, 3, 2, 3});
    EXPECT_EQ(driver.Calls("glSamplerParameteri"),
              Sequence({Call("glSamplerParameteri", 1, GL_TEXTURE_WRAP_S, GL_REPEAT),
                        Call("glSamplerParameteri", 1, GL_TEXTURE_WRAP_T, GL_CLAMP_TO_EDGE),
                        Call("glSamplerParameteri", 1, GL_TEXTURE_MAG_FILTER, GL_LINEAR),
                        Call("glSamplerParameteri", 1, GL_TEXTURE_MIN_FILTER, GL_LINEAR)}));
}

TEST_F(TextureSpecificationTest, OnlyFlatTexturesSetTheAlignmentAndTakeErrors)
{
    for (const int target : {2, 3, 4, 5})
    {
        driver.ForgetCalls();
        const Texture texture = Made(Described(target, 2, 2));
        EXPECT_EQ(driver.CallCount("glPixelStorei"), 0u) << target;
        EXPECT_EQ(driver.CallCount("glGetError"), 0u) << target;
    }
}

TEST_F(TextureSpecificationTest, BufferInfoIsForFlatTexturesOnly)
{
    const Nib::TextureBufferInfo info{1, 2, 3};
    const TextureDescriptor volume = Described(3);
    const Texture texture(new TextureObject(volume, nullptr, nullptr, 0, &info));
    EXPECT_EQ(driver.CallCount("glPixelStorei"), 0u);
}

TEST_F(TextureSpecificationTest, EveryTargetLeavesNothingBound)
{
    for (const int target : {1, 2, 3, 4, 5})
    {
        const Texture texture = Made(Described(target, 2, 2));
        EXPECT_EQ(driver.LastCall("glBindTexture"),
                  Call("glBindTexture", texture->internals().target, 0));
    }
}

// ---- without sampler objects --------------------------------------------------------------------

TEST_F(TextureParameterPath, VolumesSetTheirParametersOnTheTexture)
{
    const Texture texture = Made(Described(3), {2, 0});
    EXPECT_EQ(driver.CallNames(), Names({"glGenTextures", "glBindTexture", "glTexParameteri",
                                         "glTexParameteri", "glTexParameteri", "glTexParameteri",
                                         "glTexParameteri", "glTexImage3D", "glBindTexture"}));
    EXPECT_EQ(driver.Calls("glTexParameteri")[2],
              Call("glTexParameteri", GL_TEXTURE_3D, GL_TEXTURE_WRAP_R, GL_MIRRORED_REPEAT));
    EXPECT_EQ(texture->internals().sampler, 0u);
}

TEST_F(TextureParameterPath, ExternalTexturesSetFourParameters)
{
    const Texture texture = Made(Described(5));
    EXPECT_EQ(driver.CallNames(),
              Names({"glGenTextures", "glBindTexture", "glTexParameteri", "glTexParameteri",
                     "glTexParameteri", "glTexParameteri", "glBindTexture"}));
    EXPECT_EQ(driver.LastCall("glTexParameteri").Arg(0), 0x8D65);
}

TEST_F(TextureParameterPath, CubeMapsUploadSixFaces)
{
    const Texture texture = Made(Described(4, 2, 2));
    EXPECT_EQ(driver.CallCount("glTexImage2D"), 6u);
    EXPECT_EQ(driver.CallCount("glTexParameteri"), 5u);
}

TEST_F(TextureParameterPath, OneDimensionalTexturesClampToTheBorder)
{
    driver.AllowMisuse();
    const Texture texture = Made(Described(0));
    EXPECT_EQ(driver.Calls("glTexParameteri"),
              Sequence({Call("glTexParameteri", 0x0DE0, GL_TEXTURE_WRAP_S, 0x812D),
                        Call("glTexParameteri", 0x0DE0, GL_TEXTURE_MAG_FILTER, GL_LINEAR),
                        Call("glTexParameteri", 0x0DE0, GL_TEXTURE_MIN_FILTER, GL_LINEAR)}));
}

TEST_F(TextureParameterPath, ErrorsOfAFlatTextureStayPending)
{
    driver.QueueGlErrors({GL_INVALID_ENUM});
    const Texture texture = Made(Described(1));
    EXPECT_EQ(Errors(), Texts{});
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
}

TEST_F(TextureParameterPath, EndDeletesTheTextureAlone)
{
    Texture texture = Made(Described(1));
    driver.ForgetCalls();
    texture.reset();
    EXPECT_EQ(CallTexts(), (Texts{"glDeleteTextures(1)"}));
}

TEST_F(TextureParameterPath, ReleaseDeletesTheTextureAlone)
{
    const Texture texture = Made(Described(1));
    driver.ForgetCalls();
    queue.observer.DispatchRelease();
    EXPECT_EQ(CallTexts(), (Texts{"glDeleteTextures(1)"}));
}

TEST_F(TextureParameterPath, RestoreLogsThePendingError)
{
    const Texture texture = Made(Described(1));
    queue.observer.DispatchRelease();
    driver.QueueGlErrors({GL_OUT_OF_MEMORY});
    queue.observer.DispatchRestore();
    EXPECT_EQ(Infos().back(), "virtual void Nib::GLES::TextureObject::RestoreGLObject() - Restore "
                              "Was called. Texture After - 2 (err: 1285)");
}
