#include "gles/ShaderFixture.h"

#include <nib/exceptions.h>

#include <filesystem>
#include <map>

using Nib::ShaderProgramCache;
using Nib::GLES::OpenGLShaderProgram;

namespace
{

constexpr const char* kInCache = "void Nib::GLES::OpenGLShaderProgram::createShader() - Binary "
                                 "shader exists in cache";
constexpr const char* kRefused = "void Nib::GLES::OpenGLShaderProgram::createShader() - cached "
                                 "binary shader is not valid. Need to recreate it in cache";
constexpr const char* kReplaced = "bool Nib::ShaderProgramCache::SetBinaryShader(const "
                                  "ShaderProgramCache::BinaryShader &) - Binary shader already in "
                                  "cache. Replace with new version";
constexpr unsigned kNoProgram = 0xFFFFFFFF;

class ShaderProgram : public ShaderTest
{
protected:
    /// The message of the exception that building throws; empty when it throws none.
    static std::string Failure(const char* vs, const char* fs)
    {
        try
        {
            const Program program(new OpenGLShaderProgram(vs, fs));
        }
        catch (const Nib::InvalidArgumentException& error)
        {
            return error.what();
        }
        return {};
    }

    /// The next load of a binary is refused by the driver.
    void RefuseBinary() { driver.FailNext("glProgramBinary", GL_INVALID_OPERATION); }
};

} // namespace

// ---- from source --------------------------------------------------------------------------------

TEST_F(ShaderProgram, IsNotCreatedAtFirst)
{
    const OpenGLShaderProgram program;
    EXPECT_EQ(program.GetShaderId(), kNoProgram);
    EXPECT_FALSE(program.IsSubscribed());
    EXPECT_EQ(driver.CallCount(), 0u);
    driver.ExpectMisuse("glDeleteProgram"); // its end deletes the name that is none
}

TEST_F(ShaderProgram, IsBuiltFromSourceStepByStep)
{
    const Program program(new OpenGLShaderProgram(kVertex, kFragment));

    const std::string length = std::to_string(driver.LastCall("glGetProgramBinary").Arg(1));
    EXPECT_EQ(Steps(), (Texts{
                           "glCreateShader(35633)",
                           "glShaderSource(1, 1, *, null)",
                           "glCompileShader(1)",
                           "glGetShaderiv(1, 35713, *)",
                           "glCreateShader(35632)",
                           "glShaderSource(2, 1, *, null)",
                           "glCompileShader(2)",
                           "glGetShaderiv(2, 35713, *)",
                           "glCreateProgram()",
                           "glAttachShader(3, 1)",
                           "glAttachShader(3, 2)",
                           "glGetIntegerv(34921, *)",
                           "glBindAttribLocation(3, 0, \"a_pos\")",
                           "glBindAttribLocation(3, 1, \"a_color\")",
                           "glLinkProgram(3)",
                           "glGetProgramiv(3, 35714, *)",
                           "glDetachShader(3, 1)",
                           "glDetachShader(3, 2)",
                           "glDeleteShader(1)",
                           "glDeleteShader(2)",
                           "glGetProgramiv(3, 34625, *)",
                           "glGetProgramBinary(3, " + length + ", null, *, *)",
                       }));
    EXPECT_EQ(program->GetShaderId(), 3u);
    EXPECT_EQ(driver.Live().shaders, 0);
    EXPECT_EQ(driver.Live().programs, 1);
}

TEST_F(ShaderProgram, WritesItsAttributesWhenBuiltFromSource)
{
    const Program program(new OpenGLShaderProgram(kVertex, kFragment));
    EXPECT_EQ(Infos(), (Texts{"attribute = a_pos", "attribute = a_color"}));
    EXPECT_EQ(Errors(), Texts{MissingFile()});
    EXPECT_EQ(driver.Log().size(), 3u);
}

TEST_F(ShaderProgram, AttributesHaveTheLocationsOfTheirOrder)
{
    const Program program = Built("attribute vec4 z;\nattribute vec4 m;\nattribute vec2 a;\n"
                                  "void main() { gl_Position = z + m + a.xyxy; }\n");
    EXPECT_EQ(driver.Program(program->GetShaderId()).attributes,
              (std::map<std::string, int>{{"z", 0}, {"m", 1}, {"a", 2}}));
}

TEST_F(ShaderProgram, WithoutAttributesBindsNone)
{
    const Program program(
        new OpenGLShaderProgram("void main() { gl_Position = vec4(0); }\n", kFragment));
    EXPECT_EQ(driver.CallCount("glBindAttribLocation"), 0u);
    EXPECT_EQ(driver.CallCount("glGetIntegerv"), 1u);
    EXPECT_TRUE(driver.Program(program->GetShaderId()).linked);
}

TEST_F(ShaderProgram, StoresItsBinaryUnderTheKeyOfItsSources)
{
    const Program program = Built();
    EXPECT_EQ(folder.Names(), Texts{FileOf(kVertex, kFragment)});

    const auto* const record = ShaderProgramCache::GetInstance()->GetBinaryShader(
        ShaderProgramCache::GetShaderKey(kVertex, kFragment));
    ASSERT_NE(record, nullptr);
    EXPECT_EQ(record->attributes, (Texts{"a_pos", "a_color"}));
    EXPECT_EQ(record->format, driver.Gpu().programBinaryFormats.front());
    EXPECT_EQ(ProgramText(*record).substr(0, 8), "SIMPROG1") << "the bytes are the driver's";
}

TEST_F(ShaderProgram, ThatCannotBeStoredIsUsedAllTheSame)
{
    std::filesystem::remove_all(folder.Path());
    const Program program(new OpenGLShaderProgram(kVertex, kFragment));

    ASSERT_EQ(Errors().size(), 4u);
    EXPECT_EQ(Errors()[3], "bool Nib::GLES::OpenGLShaderProgram::SaveToCache("
                           "ShaderProgramCache::BinaryShaderKey, const std::vector<std::string> &)"
                           " - Failed to store sghader into cache");
    EXPECT_TRUE(driver.Program(program->GetShaderId()).linked);
    EXPECT_TRUE(program->IsSubscribed());
}

// ---- failures -----------------------------------------------------------------------------------

TEST_F(ShaderProgram, WithoutASourceThrows)
{
    const std::string message = "OpenGLRenderer::createShader: no shader source code provided.";
    EXPECT_EQ(Failure(nullptr, kFragment), message);
    EXPECT_EQ(Errors().back(), message);
    EXPECT_EQ(Failure(kVertex, nullptr), message);
    EXPECT_EQ(Failure(nullptr, nullptr), message);
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(folder.Names(), Texts{});
}

TEST_F(ShaderProgram, OfABadVertexShaderThrowsWithTheLog)
{
    driver.FailCompile("ERROR: 0:1: no such type");
    const std::string message =
        "OpenGLRenderer::createShader: failed to compile vertex shader.\nDetails:\n"
        "ERROR: 0:1: no such type";
    EXPECT_EQ(Failure(kVertex, kFragment), message);
    EXPECT_EQ(Infos(), Texts{"VS error = ERROR: 0:1: no such type"});
    EXPECT_EQ(Errors(), (Texts{MissingFile(), message}));
    EXPECT_EQ(Steps(), (Texts{"glCreateShader(35633)", "glShaderSource(1, 1, *, null)",
                              "glCompileShader(1)", "glGetShaderiv(1, 35713, *)",
                              "glGetShaderInfoLog(1, 1024, null, *)", "glDeleteShader(1)"}));
}

TEST_F(ShaderProgram, OfABadFragmentShaderThrowsWithTheLog)
{
    const char* const fragment = "void main() {}\n#error no luck\n";
    const std::string message =
        "OpenGLRenderer::createShader: failed to compile fragment shader.\nDetails:\n"
        "ERROR: 0:2: 'no luck' : error\n";
    EXPECT_EQ(Failure(kVertex, fragment), message);
    EXPECT_EQ(Infos(), Texts{"FS error = ERROR: 0:2: 'no luck' : error\n"});
    EXPECT_EQ(Errors(), (Texts{MissingFile(kVertex, fragment), message}));
    const Texts steps = Steps();
    ASSERT_EQ(steps.size(), 11u);
    EXPECT_EQ(Texts(steps.begin() + 7, steps.end()),
              (Texts{"glGetShaderiv(2, 35713, *)", "glGetShaderInfoLog(2, 1024, null, *)",
                     "glDeleteShader(1)", "glDeleteShader(2)"}));
}

TEST_F(ShaderProgram, ThatDoesNotLinkThrowsWithTheLog)
{
    driver.FailLink("too many varyings");
    const std::string message =
        "OpenGLRenderer::createShader: failed to link program.\nDetails:\ntoo many varyings";
    EXPECT_EQ(Failure(kVertex, kFragment), message);
    EXPECT_EQ(Infos(), (Texts{"attribute = a_pos", "attribute = a_color"}));
    EXPECT_EQ(Errors(), (Texts{MissingFile(), message}));
    const Texts steps = Steps();
    ASSERT_EQ(steps.size(), 20u);
    EXPECT_EQ(Texts(steps.begin() + 14, steps.end()),
              (Texts{"glLinkProgram(3)", "glGetProgramiv(3, 35714, *)",
                     "glGetProgramInfoLog(3, 1024, null, *)", "glDeleteShader(1)",
                     "glDeleteShader(2)", "glDeleteProgram(3)"}));
    EXPECT_EQ(driver.Live().programs, 0);
    EXPECT_EQ(driver.Live().shaders, 0);
    EXPECT_EQ(folder.Names(), Texts{});
}

TEST_F(ShaderProgram, OfAnEmptyVertexSourceHasNoAttributes)
{
    const std::string message = Failure("", kFragment); // main is missing: it does not link
    EXPECT_EQ(message.substr(0, 52), "OpenGLRenderer::createShader: failed to link program");
    EXPECT_EQ(driver.CallCount("glGetIntegerv"), 1u);
    EXPECT_EQ(driver.CallCount("glBindAttribLocation"), 0u);
}

TEST_F(ShaderProgram, KeepsTheFirstCharactersOfALongLog)
{
    driver.FailCompile(std::string(2000, 'e'));
    EXPECT_EQ(Failure(kVertex, kFragment),
              "OpenGLRenderer::createShader: failed to compile vertex shader.\nDetails:\n" +
                  std::string(1023, 'e'));
    driver.FailLink(std::string(1024, 'l'));
    EXPECT_EQ(Failure(kVertex, kFragment),
              "OpenGLRenderer::createShader: failed to link program.\nDetails:\n" +
                  std::string(1023, 'l'));
}

TEST_F(ShaderProgram, ThatFailedIsNotRegistered)
{
    Program program(new OpenGLShaderProgram);
    driver.FailLink("no");
    EXPECT_THROW(program->CreateShader(kVertex, kFragment), Nib::InvalidArgumentException);
    EXPECT_FALSE(program->IsSubscribed());
    EXPECT_EQ(program->GetShaderId(), kNoProgram);

    program->CreateShader(kVertex, kFragment);
    EXPECT_TRUE(program->IsSubscribed());
}

// ---- from the cache -----------------------------------------------------------------------------

TEST_F(ShaderProgram, OfTheSameSourcesIsLoadedFromItsBinary)
{
    const Program first = Built();
    const Program second(new OpenGLShaderProgram(kVertex, kFragment));

    const SimCall load = driver.LastCall("glProgramBinary");
    EXPECT_EQ(Steps(), (Texts{
                           "glCreateProgram()",
                           "glProgramBinary(4, " + std::to_string(load.Arg(1)) + ", *, " +
                               std::to_string(load.Arg(3)) + ")",
                           "glGetProgramiv(4, 35714, *)",
                           "glBindAttribLocation(4, 0, \"a_pos\")",
                           "glBindAttribLocation(4, 1, \"a_color\")",
                       }));
    EXPECT_EQ(load.Arg(1), driver.Gpu().programBinaryFormats.front());
    EXPECT_EQ(Infos(), Texts{kInCache});
    EXPECT_EQ(driver.Log().size(), 1u);
    EXPECT_EQ(second->GetShaderId(), 4u);
    EXPECT_TRUE(driver.Program(4).fromBinary);
}

TEST_F(ShaderProgram, IsLoadedFromAFileOfAnEarlierRun)
{
    // Given the file of an earlier run, with an attribute name that the source does not have
    const Program earlier = Built("void main() { gl_Position = vec4(0); }", kFragment);
    FileFields fields = FileFields::Of(
        ProgramText(*ShaderProgramCache::GetInstance()->GetBinaryShader(
            ShaderProgramCache::GetShaderKey("void main() { gl_Position = vec4(0); }", kFragment))),
        {"a_first", "a_second"});
    fields.format = driver.Gpu().programBinaryFormats.front();
    WriteBytes(folder.File(FileOf(kVertex, kFragment)), fields.File());

    const Program program(new OpenGLShaderProgram(kVertex, kFragment));
    EXPECT_EQ(Infos(), Texts{kInCache});
    EXPECT_EQ(Errors(), Texts{});
    EXPECT_EQ(driver.Program(program->GetShaderId()).bound,
              (std::map<std::string, int>{{"a_first", 0}, {"a_second", 1}}));
    EXPECT_EQ(driver.CallCount("glCompileShader"), 0u);
}

TEST_F(ShaderProgram, WhoseBinaryIsRefusedIsBuiltAndStoredAgain)
{
    const Program first = Built();
    RefuseBinary();
    const Program second(new OpenGLShaderProgram(kVertex, kFragment));

    EXPECT_EQ(Infos(), (Texts{kInCache, "attribute = a_pos", "attribute = a_color"}));
    EXPECT_EQ(Errors(), Texts{kRefused});
    EXPECT_EQ(Warnings(), Texts{kReplaced});
    EXPECT_EQ(folder.Names(), Texts{FileOf(kVertex, kFragment)});
    EXPECT_FALSE(driver.Program(second->GetShaderId()).fromBinary);
    EXPECT_TRUE(driver.Program(second->GetShaderId()).linked);
}

TEST_F(ShaderProgram, WhoseBinaryIsRefusedLeavesOneNameBehind)
{
    const Program first = Built();
    RefuseBinary();
    const Program second(new OpenGLShaderProgram(kVertex, kFragment));
    EXPECT_EQ(driver.CallCount("glDeleteProgram"), 0u);
    EXPECT_EQ(driver.Live().programs, 3);
    const Texts steps = Steps();
    ASSERT_GT(steps.size(), 3u);
    EXPECT_EQ(steps[2], "glGetProgramiv(4, 35714, *)");
    EXPECT_EQ(steps[3], "glCreateShader(35633)") << "no attribute of a refused binary is bound";
}

TEST_F(ShaderProgram, OfAForeignFileIsBuiltAndItsFileReplaced)
{
    FileFields foreign = FileFields::Of("bytes of another driver", {"a_pos"});
    foreign.format = 0x1234;
    const std::string file = folder.File(FileOf(kVertex, kFragment));
    WriteBytes(file, foreign.File());

    const Program program(new OpenGLShaderProgram(kVertex, kFragment));
    EXPECT_EQ(Errors(), Texts{kRefused});
    EXPECT_EQ(Warnings(), Texts{kReplaced});
    EXPECT_EQ(Number(ReadBytes(file), 8), driver.Gpu().programBinaryFormats.front());
    EXPECT_EQ(Number(ReadBytes(file), 32), 2u);
}

TEST_F(ShaderProgram, OfADamagedFileIsBuiltAndItsFileReplaced)
{
    const std::string file = folder.File(FileOf(kVertex, kFragment));
    WriteBytes(file, Bytes(100, 'x'));

    const Program program(new OpenGLShaderProgram(kVertex, kFragment));
    ASSERT_EQ(Errors().size(), 1u);
    EXPECT_NE(Errors()[0].find("File header read error"), std::string::npos);
    EXPECT_EQ(Warnings(), Texts{}) << "there was no record to replace";
    EXPECT_EQ(Number(ReadBytes(file), 0), 0xACDCACDCu);
}
