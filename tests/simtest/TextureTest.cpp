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

} // namespace
