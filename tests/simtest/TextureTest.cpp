#include "sim/SimDriver.h"

#include <gtest/gtest.h>

namespace
{

GLuint NewTexture()
{
    GLuint name = 0;
    glGenTextures(1, &name);
    glBindTexture(GL_TEXTURE_2D, name);
    return name;
}

TEST(SimTexture, UploadFollowsRowLengthAndSkips)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint name = NewTexture();
    unsigned char pixels[4 * 3 * 4];
    for (std::size_t i = 0; i < sizeof pixels; ++i)
        pixels[i] = static_cast<unsigned char>(i);

    glPixelStorei(GL_UNPACK_ROW_LENGTH, 4);
    glPixelStorei(GL_UNPACK_SKIP_PIXELS, 1);
    glPixelStorei(GL_UNPACK_SKIP_ROWS, 1);
    glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, 2, 2, 0, GL_RGBA, GL_UNSIGNED_BYTE, pixels);

    const SimTextureState texture = driver.Texture(name);
    EXPECT_EQ(texture.At(0, 0), (SimPixel{20, 21, 22, 23}));
    EXPECT_EQ(texture.At(1, 0), (SimPixel{24, 25, 26, 27}));
    EXPECT_EQ(texture.At(0, 1), (SimPixel{36, 37, 38, 39}));
    glDeleteTextures(1, &name);
    EXPECT_EQ(driver.Live().textures, 0);
}

TEST(SimTexture, AnUnknownNameIsMisuse)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.ExpectMisuse("glBindTexture");

    glBindTexture(GL_TEXTURE_2D, 7);

    EXPECT_EQ(driver.Misuses(),
              std::vector<std::string>{"glBindTexture: name 7 was not generated here"});
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST(SimTexture, FormatsThatDoNotGoTogetherAreMisuse)
{
    SimDriver driver;
    driver.ExpectMisuse("glTexImage2D");
    const SimContext context(driver);
    NewTexture();
    glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, 1, 1, 0, GL_RGBA, GL_FLOAT, nullptr);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION});
    glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, 1, 1, 0, GL_RGBA, 0, nullptr);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
    glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, 1, 20000, 0, GL_RGBA, GL_UNSIGNED_BYTE, nullptr);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_VALUE});
}

TEST(SimTexture, TheUsualPairsAreAccepted)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint name = NewTexture();
    const GLenum rows[][3] = {
        {GL_R8, GL_RED, GL_UNSIGNED_BYTE},
        {GL_RGBA8, GL_RGBA, GL_UNSIGNED_BYTE},
        {GL_LUMINANCE, GL_LUMINANCE, GL_UNSIGNED_BYTE},
        {GL_RGBA32F, GL_RGBA, GL_FLOAT},
        {GL_RGBA16F, GL_RGBA, GL_FLOAT},
        {GL_R32F, GL_RED, GL_FLOAT},
        {GL_RGB32F, GL_RGB, GL_FLOAT},
        {GL_RGB16F, GL_RGB, GL_HALF_FLOAT},
        {GL_R16UI, GL_RED_INTEGER, GL_UNSIGNED_SHORT},
        {GL_R32I, GL_RED_INTEGER, GL_INT},
        {GL_DEPTH_COMPONENT32F, GL_DEPTH_COMPONENT, GL_FLOAT},
        {GL_DEPTH_COMPONENT, GL_DEPTH_COMPONENT, GL_UNSIGNED_INT},
        {0x93A1, 0x80E1, GL_UNSIGNED_BYTE}, // BGRA
    };
    for (const auto& row : rows)
    {
        glTexImage2D(GL_TEXTURE_2D, 0, static_cast<GLint>(row[0]), 2, 2, 0, row[1], row[2],
                     nullptr);
        EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
        EXPECT_EQ(driver.Texture(name).internalFormat, row[0]);
    }
}

TEST(SimTexture, OneDimensionalOnesDoNotExist)
{
    SimDriver driver;
    driver.ExpectMisuse("glBindTexture");
    const SimContext context(driver);
    GLuint name = 0;
    glGenTextures(1, &name);
    glBindTexture(0x0DE0, name);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
}

TEST(SimTexture, ATargetIsForLife)
{
    SimDriver driver;
    driver.ExpectMisuse("glBindTexture");
    const SimContext context(driver);
    const GLuint name = NewTexture();
    glBindTexture(GL_TEXTURE_CUBE_MAP, name);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION});
}

TEST(SimTexture, CubesHaveSixFaces)
{
    SimDriver driver;
    const SimContext context(driver);
    GLuint name = 0;
    glGenTextures(1, &name);
    glBindTexture(GL_TEXTURE_CUBE_MAP, name);
    for (GLenum face = 0; face < 6; ++face)
        glTexImage2D(GL_TEXTURE_CUBE_MAP_POSITIVE_X + face, 0, GL_RGBA8, 2, 2, 0, GL_RGBA,
                     GL_UNSIGNED_BYTE, nullptr);
    EXPECT_EQ(driver.Texture(name).faces, 6);
    EXPECT_EQ(driver.Texture(name).target, GLenum{GL_TEXTURE_CUBE_MAP});
}

TEST(SimTexture, LayersAreStored)
{
    SimDriver driver;
    const SimContext context(driver);
    GLuint name = 0;
    glGenTextures(1, &name);
    glBindTexture(GL_TEXTURE_2D_ARRAY, name);
    const unsigned char bytes[] = {1, 2, 3, 4, 5, 6};
    glPixelStorei(GL_UNPACK_ALIGNMENT, 1);
    glTexImage3D(GL_TEXTURE_2D_ARRAY, 0, GL_R8, 1, 2, 3, 0, GL_RED, GL_UNSIGNED_BYTE, bytes);
    EXPECT_EQ(driver.Texture(name).depth, 3);
    EXPECT_EQ(driver.Texture(name).bytes, (std::vector<unsigned char>{1, 2, 3, 4, 5, 6}));
}

TEST(SimTexture, ParametersAreKept)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint name = NewTexture();
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_S, GL_CLAMP_TO_EDGE);
    EXPECT_EQ(driver.Texture(name).params, (std::map<GLenum, GLint>{{GL_TEXTURE_WRAP_S, 0x812F}}));
    GLint value = 0;
    glGetTexParameteriv(GL_TEXTURE_2D, GL_TEXTURE_MAG_FILTER, &value);
    EXPECT_EQ(value, GL_LINEAR);
    GLuint sampler = 0;
    glGenSamplers(1, &sampler);
    glSamplerParameteri(sampler, GL_TEXTURE_MIN_FILTER, GL_NEAREST);
    glBindSampler(2, sampler);
    EXPECT_EQ(driver.Sampler(sampler).params,
              (std::map<GLenum, GLint>{{GL_TEXTURE_MIN_FILTER, GL_NEAREST}}));
}

TEST(SimTexture, AnUnknownParameterIsMisuse)
{
    SimDriver driver;
    driver.ExpectMisuse("glSamplerParameteri");
    const SimContext context(driver);
    GLuint sampler = 0;
    glGenSamplers(1, &sampler);
    glSamplerParameteri(sampler, 0, GL_LINEAR);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
}

} // namespace
