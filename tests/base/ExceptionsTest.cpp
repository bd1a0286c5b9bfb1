#include <nib/exceptions.h>

#include <gtest/gtest.h>

#include <type_traits>

using namespace Nib;

TEST(Exceptions, CarryTheirTexts)
{
    EXPECT_STREQ(InvalidArgumentException("wrong buffer index!").what(), "wrong buffer index!");
    EXPECT_STREQ(NotSupportedException().what(), "Functionality are not supported!");
    EXPECT_STREQ(OGLVersionNotSupportedException().what(),
                 "Required OpenGL version not supported!");
    EXPECT_STREQ(TextureNotValidException().what(), "Texture is corrupted or doesn't exist!");
}

template <typename Exception>
void ExpectCaughtAsStandardException(const Exception& exception, const std::string& text)
{
    try
    {
        throw exception;
    }
    catch (const std::exception& caught)
    {
        EXPECT_EQ(caught.what(), text);
    }
}

TEST(Exceptions, AreStandardExceptions)
{
    ExpectCaughtAsStandardException(InvalidArgumentException("a"), "a");
    ExpectCaughtAsStandardException(NotSupportedException(), "Functionality are not supported!");
    ExpectCaughtAsStandardException(OGLVersionNotSupportedException(),
                                    "Required OpenGL version not supported!");
    ExpectCaughtAsStandardException(TextureNotValidException(),
                                    "Texture is corrupted or doesn't exist!");
}

TEST(Exceptions, CopiesDoNotThrow)
{
    EXPECT_TRUE(std::is_nothrow_copy_constructible_v<InvalidArgumentException>);
    const InvalidArgumentException original(std::string(1000, 'x'));
    const InvalidArgumentException copy(original);
    EXPECT_EQ(copy.what(), std::string(1000, 'x'));
}
