#include "gles/GlesFixture.h"
#include "gles/TextureObject.h"

#include <nib/exceptions.h>
#include <nib/texture.h>

#include <memory>
#include <stdexcept>

using Nib::TextureBufferInfo;
using Nib::TextureDescriptor;
using Nib::TextureMemoryLayout;
using Nib::TextureTargetLayout;
using Nib::GLES::TextureObject;

namespace
{

using Texture = std::unique_ptr<TextureObject, Releaser>;

TextureDescriptor Described(int width, int height, int target = 1)
{
    TextureDescriptor descriptor;
    descriptor.width = width;
    descriptor.height = height;
    descriptor.target = target;
    return descriptor;
}

Texture Made(const TextureDescriptor& descriptor, const void* pixels = nullptr,
             const std::vector<unsigned>& params = {}, const TextureBufferInfo* info = nullptr)
{
    return Texture(new TextureObject(descriptor, pixels, params.data(),
                                     static_cast<unsigned>(params.size() / 2), info));
}

using TextureCreation = GlesTest;
using TextureCreationWithoutSamplers = GlesTestWithoutSamplers;

} // namespace

// ---- descriptors --------------------------------------------------------------------------------

TEST(TextureDescriptorTest, DefaultIsAnRgba8TextureOfNoSize)
{
    const TextureDescriptor descriptor;
    EXPECT_EQ(descriptor.width, 0);
    EXPECT_EQ(descriptor.height, 0);
    EXPECT_EQ(descriptor.depth, 0);
    EXPECT_EQ(static_cast<int>(descriptor.layout), 2);
    EXPECT_EQ(static_cast<int>(descriptor.memoryLayout), 6);
    EXPECT_EQ(descriptor.target, 1);
    EXPECT_FALSE(descriptor.syncOnCreate);
    EXPECT_EQ(descriptor.source, nullptr);
}

TEST_F(TextureCreation, DescriptorOfATextureIsItsOwnWithItAsSource)
{
    TextureDescriptor described = Described(3, 5);
    described.memoryLayout = static_cast<TextureMemoryLayout>(14);
    const Texture texture = Made(described);
    const TextureDescriptor copy(texture.get());
    EXPECT_EQ(copy.width, 3);
    EXPECT_EQ(copy.height, 5);
    EXPECT_EQ(static_cast<int>(copy.memoryLayout), 14);
    EXPECT_EQ(copy.source, texture.get());
}

// ---- the calls of a creation --------------------------------------------------------------------

TEST_F(TextureCreation, Of2DTextureWithSampler)
{
    const Texture texture = Made(Described(4, 2));
    EXPECT_EQ(CallTexts(), (Texts{
                               "glGenTextures(1)",
                               "glGenSamplers(1)",
                               "glBindTexture(3553, 1)",
                               "glPixelStorei(3317, 1)",
                               "glSamplerParameteri(1, 10242, 33071)",
                               "glSamplerParameteri(1, 10243, 33071)",
                               "glSamplerParameteri(1, 10240, 9729)",
                               "glSamplerParameteri(1, 10241, 9729)",
                               "glSamplerParameteri(1, 33082, 0)",
                               "glSamplerParameteri(1, 33083, 0)",
                               "glTexImage2D(3553, 0, 32856, 4, 2, 0, 6408, 5121, null)",
                               "glPixelStorei(3314, 0)",
                               "glPixelStorei(3316, 0)",
                               "glPixelStorei(3315, 0)",
                               "glGetError()",
                               "glBindTexture(3553, 0)",
                           }));
}

TEST_F(TextureCreationWithoutSamplers, Of2DTextureSetsItsParametersAndAlwaysCompares)
{
    const Texture texture = Made(Described(4, 2));
    EXPECT_EQ(CallTexts(), (Texts{
                               "glGenTextures(1)",
                               "glBindTexture(3553, 1)",
                               "glPixelStorei(3317, 1)",
                               "glTexParameteri(3553, 10242, 33071)",
                               "glTexParameteri(3553, 10243, 33071)",
                               "glTexParameteri(3553, 10240, 9729)",
                               "glTexParameteri(3553, 10241, 9729)",
                               "glTexParameteri(3553, 34893, 515)",
                               "glTexParameteri(3553, 34892, 34894)",
                               "glTexImage2D(3553, 0, 32856, 4, 2, 0, 6408, 5121, null)",
                               "glPixelStorei(3314, 0)",
                               "glPixelStorei(3316, 0)",
                               "glPixelStorei(3315, 0)",
                               "glBindTexture(3553, 0)",
                           }));
}

TEST_F(TextureCreation, OfDepthTextureComparesInItsSampler)
{
    TextureDescriptor depth = Described(4, 2);
    depth.layout = static_cast<TextureTargetLayout>(4);
    depth.memoryLayout = static_cast<TextureMemoryLayout>(8);
    const Texture texture = Made(depth);
    EXPECT_EQ(driver.CallCount("glSamplerParameteri"), 8u);
    const SimSamplerState sampler = driver.Sampler(texture->internals().sampler);
    EXPECT_EQ(sampler.params.at(GL_TEXTURE_COMPARE_FUNC), GL_LEQUAL);
    EXPECT_EQ(sampler.params.at(GL_TEXTURE_COMPARE_MODE), GL_COMPARE_REF_TO_TEXTURE);
}

TEST_F(TextureCreation, OfColourTextureDoesNotCompare)
{
    const Texture texture = Made(Described(4, 2));
    const SimSamplerState sampler = driver.Sampler(texture->internals().sampler);
    EXPECT_EQ(sampler.params.count(GL_TEXTURE_COMPARE_MODE), 0u);
}

TEST_F(TextureCreation, OfVolumesUploadsOnceWithDepthAndThreeWraps)
{
    for (const int target : {2, 3})
    {
        driver.ForgetCalls();
        TextureDescriptor volume = Described(4, 2, target);
        volume.depth = 3;
        const Texture texture = Made(volume);
        const GLenum glTarget = target == 2 ? GL_TEXTURE_2D_ARRAY : GL_TEXTURE_3D;
        EXPECT_EQ(driver.LastCall("glTexImage3D"),
                  Call("glTexImage3D", glTarget, 0, 32856, 4, 2, 3, 0, 6408, 5121, nullptr));
        EXPECT_EQ(driver.CallCount("glSamplerParameteri"), 5u);
        EXPECT_EQ(driver.CallCount("glPixelStorei"), 0u);
        EXPECT_EQ(driver.Sampler(texture->internals().sampler).params.at(GL_TEXTURE_WRAP_R),
                  GL_CLAMP_TO_EDGE);
        EXPECT_EQ(texture->internals().target, glTarget);
    }
}

TEST_F(TextureCreation, OfCubeMapUploadsTheSamePixelsToSixFaces)
{
    const unsigned char pixels[2 * 2 * 4] = {};
    const Texture texture = Made(Described(2, 2, 4), pixels);
    const std::vector<SimCall> uploads = driver.Calls("glTexImage2D");
    ASSERT_EQ(uploads.size(), 6u);
    for (int face = 0; face < 6; ++face)
        EXPECT_EQ(uploads[static_cast<std::size_t>(face)],
                  Call("glTexImage2D", 0x8515 + face, 0, 32856, 2, 2, 0, 6408, 5121,
                       static_cast<const void*>(pixels)));
    EXPECT_EQ(driver.CallCount("glSamplerParameteri"), 5u);
}

TEST_F(TextureCreation, OfExternalTextureUploadsNothing)
{
    const Texture texture = Made(Described(4, 2, 5));
    EXPECT_EQ(driver.CallNames(),
              Names({"glGenTextures", "glGenSamplers", "glBindTexture", "glSamplerParameteri",
                     "glSamplerParameteri", "glSamplerParameteri", "glSamplerParameteri",
                     "glBindTexture"}));
    EXPECT_EQ(texture->internals().target, 0x8D65u);
}

TEST_F(TextureCreation, Of1DTextureUploadsOneRowAndClampsToTheBorder)
{
    driver.AllowMisuse();
    const Texture texture = Made(Described(16, 7, 0));
    EXPECT_EQ(texture->internals().target, 0x0DE0u);
    EXPECT_EQ(driver.LastCall("glTexImage2D"),
              Call("glTexImage2D", 0x0DE0, 0, 32856, 16, 1, 0, 6408, 5121, nullptr));
    EXPECT_EQ(driver.Calls("glSamplerParameteri"),
              Sequence({Call("glSamplerParameteri", 1, GL_TEXTURE_WRAP_S, 0x812D),
                        Call("glSamplerParameteri", 1, GL_TEXTURE_MAG_FILTER, GL_LINEAR),
                        Call("glSamplerParameteri", 1, GL_TEXTURE_MIN_FILTER, GL_LINEAR)}));
}

TEST_F(TextureCreation, TakesTheFormatsOfItsLayouts)
{
    struct Row
    {
        int layout, memoryLayout;
        GLenum internalFormat, format, type;
    };
    const Row rows[] = {
        {0, 0, GL_R8, GL_RED, GL_UNSIGNED_BYTE},
        {1, 4, GL_R32I, GL_RED_INTEGER, GL_INT},
        {2, 14, GL_RGBA16F, GL_RGBA, GL_FLOAT},
        {5, 11, GL_RGB16F, GL_RGB, GL_HALF_FLOAT},
        {6, 13, GL_LUMINANCE, GL_LUMINANCE, GL_UNSIGNED_BYTE},
    };
    for (const Row& row : rows)
    {
        TextureDescriptor descriptor = Described(2, 2);
        descriptor.layout = static_cast<TextureTargetLayout>(row.layout);
        descriptor.memoryLayout = static_cast<TextureMemoryLayout>(row.memoryLayout);
        const Texture texture = Made(descriptor);
        EXPECT_EQ(driver.LastCall("glTexImage2D"),
                  Call("glTexImage2D", GL_TEXTURE_2D, 0, row.internalFormat, 2, 2, 0, row.format,
                       row.type, nullptr));
    }
}

// ---- parameters ---------------------------------------------------------------------------------

TEST_F(TextureCreation, FirstPairOfAnIndexCounts)
{
    const Texture texture = Made(Described(2, 2), nullptr, {4, 0, 4, 1, 0, 3});
    const SimSamplerState sampler = driver.Sampler(texture->internals().sampler);
    EXPECT_EQ(sampler.params.at(GL_TEXTURE_MAG_FILTER), GL_NEAREST);
    EXPECT_EQ(sampler.params.at(GL_TEXTURE_WRAP_S), GL_REPEAT);
    EXPECT_EQ(sampler.params.at(GL_TEXTURE_WRAP_T), GL_CLAMP_TO_EDGE);
}

TEST_F(TextureCreation, EveryWrapAndFilterValue)
{
    const GLint wraps[] = {GL_MIRRORED_REPEAT, GL_CLAMP_TO_EDGE, 0x812D, GL_REPEAT};
    for (unsigned value = 0; value < 4; ++value)
    {
        const Texture texture =
            Made(Described(2, 2), nullptr, {0, value, 1, value, 4, value % 2, 5, value % 2});
        const SimSamplerState sampler = driver.Sampler(texture->internals().sampler);
        EXPECT_EQ(sampler.params.at(GL_TEXTURE_WRAP_S), wraps[value]);
        EXPECT_EQ(sampler.params.at(GL_TEXTURE_WRAP_T), wraps[value]);
        const GLint filter = value % 2 == 0 ? GL_NEAREST : GL_LINEAR;
        EXPECT_EQ(sampler.params.at(GL_TEXTURE_MAG_FILTER), filter);
        EXPECT_EQ(sampler.params.at(GL_TEXTURE_MIN_FILTER), filter);
    }
}

// ---- pixels -------------------------------------------------------------------------------------

TEST_F(TextureCreation, BufferInfoChoosesAPartOfTheMemoryAndIsUndone)
{
    // Rows of 4 pixels; the texture is the 2 x 2 pixels from column 1, row 1.
    unsigned char pixels[4 * 3 * 4];
    for (int i = 0; i < 4 * 3 * 4; ++i)
        pixels[i] = static_cast<unsigned char>(i);
    const TextureBufferInfo info{1, 1, 4};
    const Texture texture = Made(Described(2, 2), pixels, {}, &info);

    const SimTextureState state = driver.Texture(texture->internals().glID);
    EXPECT_EQ(state.At(0, 0), (SimPixel{20, 21, 22, 23}));
    EXPECT_EQ(state.At(1, 1), (SimPixel{40, 41, 42, 43}));
    EXPECT_EQ(driver.Calls("glPixelStorei"),
              Sequence({Call("glPixelStorei", GL_UNPACK_ALIGNMENT, 1),
                        Call("glPixelStorei", GL_UNPACK_ROW_LENGTH, 4),
                        Call("glPixelStorei", GL_UNPACK_SKIP_PIXELS, 1),
                        Call("glPixelStorei", GL_UNPACK_SKIP_ROWS, 1),
                        Call("glPixelStorei", GL_UNPACK_ROW_LENGTH, 0),
                        Call("glPixelStorei", GL_UNPACK_SKIP_PIXELS, 0),
                        Call("glPixelStorei", GL_UNPACK_SKIP_ROWS, 0)}));
}

TEST_F(TextureCreation, FieldsOfTheBufferInfoStandInTheirOrder)
{
    const TextureBufferInfo info{1, 2, 3};
    EXPECT_EQ(info.skipPixels, 1);
    EXPECT_EQ(info.skipRows, 2);
    EXPECT_EQ(info.rowLength, 3);
}

TEST_F(TextureCreation, FencesTheUploadOnRequest)
{
    TextureDescriptor fenced = Described(2, 2);
    fenced.syncOnCreate = true;
    const Texture texture = Made(fenced);
    EXPECT_EQ(driver.CallCount("glFenceSync"), 1u);
    EXPECT_EQ(driver.LastCall("glFenceSync"),
              Call("glFenceSync", GL_SYNC_GPU_COMMANDS_COMPLETE, 0));
    EXPECT_EQ(driver.CallNames().back(), "glFlush");
}

// ---- accounting ---------------------------------------------------------------------------------

TEST_F(TextureCreation, LogsSizesAsRealNumbers)
{
    const Texture first = Made(Described(40, 25)); // 1000 pixels
    const Texture second = Made(Described(512, 512));
    EXPECT_EQ(Infos(), (Texts{
                           "CREATE. Texture Size = 3.91KB Texture Counter = 1 Total Size = 0.00MB, "
                           "glID = 1",
                           "CREATE. Texture Size = 1024.00KB Texture Counter = 2 Total Size = "
                           "1.00MB, glID = 2",
                       }));
}

TEST_F(TextureCreation, EndIsLoggedWithTheTag)
{
    Texture texture = Made(Described(512, 512));
    texture->SetTag("paper");
    driver.ForgetLog();
    texture.reset();
    EXPECT_EQ(Infos(), (Texts{"FREE. Size = 1024.00KB, Counter = 0, Total Size = 0.00MB, glID = 1, "
                              "tag = paper"}));
    EXPECT_EQ(driver.Live().textures, 0);
    EXPECT_EQ(driver.Live().samplers, 0);
}

TEST_F(TextureCreation, OnlyFlatTexturesAreAddedButAllAreSubtracted)
{
    Texture cube = Made(Described(16, 16, 4));
    EXPECT_EQ(Infos(), Texts{});
    cube.reset();
    EXPECT_EQ(Infos(), (Texts{"FREE. Size = 1.00KB, Counter = -1, Total Size = -0.00MB, glID = 1, "
                              "tag = "}));
}

// ---- failures -----------------------------------------------------------------------------------

TEST_F(TextureCreation, WidthAtTheLimitWorksAndOneMoreThrows)
{
    EXPECT_NE(Made(Described(8192, 1))->internals().glID, 0u);
    driver.ForgetLog();
    try
    {
        Made(Described(8193, 1));
        FAIL() << "no exception";
    }
    catch (const std::logic_error& error)
    {
        EXPECT_STREQ(error.what(), "Requested texture size is bigger than max texture size");
    }
    EXPECT_EQ(Errors(),
              (Texts{"static TextureObject::TextureInternals Nib::GLES::TextureObject::"
                     "createTextureInternals(const Nib::TextureDescriptor &, const void *, const "
                     "std::map<int, int> &, const Nib::TextureBufferInfo *), Requested texture "
                     "size exceed GL_MAX_TEXTURE_SIZE = 8192, width = 8193, height = 1"}));
    EXPECT_THROW(Made(Described(1, 8193)), std::logic_error);
    EXPECT_EQ(driver.Live().textures, 0);
}

TEST(TextureCreationLimits, WidthAndHeightHaveTheirOwn)
{
    SimDriver driver(SimGpu::Default().WithMaxTextureSize(4096).WithMaxViewport(2048, 1024));
    SimContext context(driver);
    BoundQueue queue;
    Nib::OpenGLRenderer::InitParameters();
    EXPECT_NE(Made(Described(2048, 1024))->internals().glID, 0u);
    EXPECT_THROW(Made(Described(2049, 1)), std::logic_error);
    EXPECT_THROW(Made(Described(1, 1025)), std::logic_error);
    EXPECT_EQ(driver.CountLogContaining("GL_MAX_TEXTURE_SIZE = 1024, width = 2049, height = 1"),
              1u);
}

TEST_F(TextureCreation, UnknownTargetGivesAnEmptyTextureAndLeavesNoName)
{
    const Texture texture = Made(Described(4, 4, 6));
    EXPECT_EQ(Errors(), (Texts{"static TextureObject::TextureInternals Nib::GLES::TextureObject::"
                               "createWithSampler(const Nib::TextureDescriptor &, const void *, "
                               "const std::map<int, int> &, const Nib::TextureBufferInfo *) "
                               "exception"}));
    EXPECT_EQ(texture->internals().glID, 0u);
    EXPECT_EQ(texture->GetWidth(), 0);
    EXPECT_EQ(texture->GetHeight(), 0);
    EXPECT_EQ(driver.Live().textures, 0);
    EXPECT_EQ(driver.Live().samplers, 0);
    EXPECT_THROW(texture->Activate(0), Nib::TextureNotValidException);
    EXPECT_THROW(texture->SetData(nullptr, 0), Nib::TextureNotValidException);
}

TEST_F(TextureCreation, NameThatGlDoesNotGiveMakesAnEmptyTexture)
{
    driver.FailNext("glGenTextures", GL_OUT_OF_MEMORY);
    const Texture texture = Made(Described(4, 4));
    EXPECT_EQ(Errors().size(), 1u);
    EXPECT_EQ(texture->internals().glID, 0u);
    EXPECT_EQ(driver.Live().samplers, 0);
}

TEST_F(TextureCreationWithoutSamplers, FailureNamesTheOtherPath)
{
    const Texture texture = Made(Described(4, 4, 7));
    EXPECT_EQ(Errors(), (Texts{"static TextureObject::TextureInternals Nib::GLES::TextureObject::"
                               "createWithParameters(const Nib::TextureDescriptor &, const void *, "
                               "const std::map<int, int> &, const Nib::TextureBufferInfo *) "
                               "exception"}));
}

TEST_F(TextureCreation, GlErrorsOfAFlatTextureAreLoggedOneByOne)
{
    driver.QueueGlErrors({GL_INVALID_ENUM, GL_OUT_OF_MEMORY});
    const Texture texture = Made(Described(4, 4));
    const std::string function =
        "static TextureObject::TextureInternals Nib::GLES::TextureObject::createWithSampler(const "
        "Nib::TextureDescriptor &, const void *, const std::map<int, int> &, const "
        "Nib::TextureBufferInfo *)";
    EXPECT_EQ(Errors(), (Texts{function + " - glError = 1280", function + " - glError = 1285"}));
    EXPECT_NE(texture->internals().glID, 0u);
}

// ---- subscription -------------------------------------------------------------------------------

TEST_F(TextureCreation, SubscribesToItsThreadsQueue)
{
    Texture texture = Made(Described(4, 4));
    EXPECT_TRUE(texture->IsSubscribed());
    texture.reset();
    driver.ForgetLog();
    queue.observer.DispatchRelease();
    EXPECT_EQ(driver.CountLogContaining("Release Was called"), 0u);
}
