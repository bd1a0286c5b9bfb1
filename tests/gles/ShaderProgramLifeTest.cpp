#include "gles/ShaderFixture.h"

#include <nib/exceptions.h>

#include <cstdio>
#include <filesystem>
#include <map>

using Nib::ShaderProgramCache;
using Nib::GLES::OpenGLShaderProgram;

namespace
{

constexpr unsigned kNoProgram = 0xFFFFFFFF;
const std::string kInCache = kBuilding + "Binary shader exists in cache";
const std::string kRefused =
    kBuilding + "cached binary shader is not valid. Need to recreate it in cache";

class ShaderProgramLife : public ShaderTest
{
protected:
    explicit ShaderProgramLife(SimGpu gpu = SimGpu::Default()) : ShaderTest(std::move(gpu)) {}

    /// Loss of the context, as the program sees it.
    void LoseContext()
    {
        queue.observer.DispatchRelease();
        Forget();
    }
    void RefuseBinary() { driver.FailNext("glProgramBinary", GL_INVALID_OPERATION); }

    static const ShaderProgramCache::BinaryShader* Record(ShaderProgramCache::BinaryShaderKey key)
    {
        return ShaderProgramCache::GetInstance()->GetBinaryShader(key);
    }
    /// The record of the sources that all programs here are built from.
    static const ShaderProgramCache::BinaryShader* Record()
    {
        return Record(ShaderProgramCache::GetShaderKey(kVertex, kFragment));
    }
};

class ShaderProgramWithoutBinaries : public ShaderProgramLife
{
protected:
    ShaderProgramWithoutBinaries() : ShaderProgramLife(SimGpu::Default().WithoutProgramBinaries())
    {
    }
};

} // namespace

// ---- use ----------------------------------------------------------------------------------------

TEST_F(ShaderProgramLife, ActivateMakesItCurrent)
{
    const Program program = Built();
    program->Activate();
    EXPECT_EQ(Steps(), Texts{"glUseProgram(3)"});
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ShaderProgramLife, DeactivateMakesNoneCurrent)
{
    const Program program = Built();
    program->Deactivate();
    EXPECT_EQ(Steps(), Texts{"glUseProgram(0)"});
}

TEST_F(ShaderProgramLife, PreDrawDoesNothing)
{
    const Program program = Built();
    program->PreDraw();
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ShaderProgramLife, ActivateBuildsAProgramThatIsNotCreated)
{
    const Program program = Built();
    program->ReleaseGLObject();
    Forget();

    program->Activate();
    char line[256];
    std::snprintf(line, sizeof line,
                  "virtual void Nib::GLES::OpenGLShaderProgram::Activate() - Warning shader was "
                  "not created, m_Shader: -1, this: %p",
                  static_cast<void*>(program.get()));
    EXPECT_EQ(Warnings(), Texts{line});
    EXPECT_EQ(Infos(), Texts{kInCache});
    EXPECT_EQ(Errors(), Texts{});
    EXPECT_EQ(Steps().front(), "glCreateProgram()");
    EXPECT_EQ(Steps().back(), "glUseProgram(4)");
    EXPECT_EQ(program->GetShaderId(), 4u);
}

TEST_F(ShaderProgramLife, ActivateUniformSetsItByName)
{
    const Program program = Built(kVertex, "uniform sampler2D u_tex;\nvoid main() {}\n");
    program->Activate();
    Forget();
    program->activateUniform("u_tex", 3);
    EXPECT_EQ(Steps(), (Texts{"glGetUniformLocation(3, \"u_tex\")", "glUniform1i(1, 3)"}));
    EXPECT_EQ(driver.Program(3).uniforms[1].values, std::vector<double>{3});
}

TEST_F(ShaderProgramLife, ActivateUniformOfAnUnknownNameSetsNothing)
{
    const Program program = Built();
    program->Activate();
    Forget();
    program->activateUniform("u_none", 3);
    EXPECT_EQ(Steps(), (Texts{"glGetUniformLocation(3, \"u_none\")", "glUniform1i(-1, 3)"}));
}

// ---- the end ------------------------------------------------------------------------------------

TEST_F(ShaderProgramLife, ReleaseDeletesTheProgram)
{
    Program program = Built();
    program.reset();
    EXPECT_EQ(Steps(), Texts{"glDeleteProgram(3)"});
    EXPECT_EQ(driver.Live().programs, 0);
    EXPECT_EQ(driver.Log().size(), 0u);
    queue.observer.DispatchRelease(); // and finds no subscriber
    EXPECT_EQ(driver.CallCount(), 1u);
}

TEST_F(ShaderProgramLife, ReleaseOfAReleasedProgramDeletesTheNameThatIsNone)
{
    Program program = Built();
    LoseContext();
    driver.ExpectMisuse("glDeleteProgram");
    program.reset();
    EXPECT_EQ(Steps(), Texts{"glDeleteProgram(4294967295)"});
}

// ---- the loss of its context --------------------------------------------------------------------

TEST_F(ShaderProgramLife, IsDeletedWithItsContext)
{
    const Program program = Built();
    queue.observer.DispatchRelease();
    EXPECT_EQ(Steps(), Texts{"glDeleteProgram(3)"});
    EXPECT_EQ(program->GetShaderId(), kNoProgram);
    queue.observer.DispatchRestore();
}

TEST_F(ShaderProgramLife, IsRestoredFromItsBinaryWithoutACompilation)
{
    const Program program = Built();
    LoseContext();
    queue.observer.DispatchRestore();

    EXPECT_EQ(driver.CallNames(), Names({"glCreateProgram", "glProgramBinary", "glGetProgramiv",
                                         "glBindAttribLocation", "glBindAttribLocation"}));
    EXPECT_EQ(Infos(), Texts{kInCache});
    EXPECT_EQ(driver.Log().size(), 1u);
    EXPECT_EQ(program->GetShaderId(), 4u);
    EXPECT_EQ(driver.Program(4).attributes,
              (std::map<std::string, int>{{"a_pos", 0}, {"a_color", 1}}));
}

TEST_F(ShaderProgramLife, IsRestoredManyTimesAlike)
{
    const Program program = Built();
    for (int i = 0; i < 3; ++i)
    {
        LoseContext();
        queue.observer.DispatchRestore();
        EXPECT_EQ(Infos(), Texts{kInCache});
        EXPECT_EQ(driver.CallCount("glCompileShader"), 0u);
        EXPECT_EQ(driver.Live().programs, 1);
    }
}

TEST_F(ShaderProgramLife, IsRestoredFromMemoryWhereThereIsNoFile)
{
    const Program program = Built();
    std::filesystem::remove_all(folder.Path());
    LoseContext();
    queue.observer.DispatchRestore();
    EXPECT_EQ(Infos(), Texts{kInCache});
    EXPECT_EQ(Errors(), Texts{});
}

TEST_F(ShaderProgramLife, AFoundBinaryThatIsRefusedIsStoredUnderItsKey)
{
    const Program program = Built();
    LoseContext();
    RefuseBinary(); // the first restore looks the binary up

    queue.observer.DispatchRestore();
    EXPECT_EQ(Infos(), (Texts{kInCache, "attribute = a_pos", "attribute = a_color"}));
    EXPECT_EQ(Errors(), Texts{kRefused});
    EXPECT_EQ(folder.Names(), Texts{FileOf(kVertex, kFragment)});
    EXPECT_EQ(driver.Live().programs, 2) << "the refused name stays";
}

TEST_F(ShaderProgramLife, AHeldBinaryThatIsRefusedIsStoredUnderZero)
{
    // Given a program that was loaded from its binary, and so holds it
    const Program program = Built();
    LoseContext();
    queue.observer.DispatchRestore();
    LoseContext();
    const auto* const held = Record();
    const Bytes file = ReadBytes(folder.File(FileOf(kVertex, kFragment)));
    RefuseBinary();

    queue.observer.DispatchRestore();
    EXPECT_EQ(Errors(), Texts{kRefused});
    EXPECT_EQ(Warnings(), Texts{}) << "there was no record under 0";
    EXPECT_EQ(folder.Names(), (Texts{"sh0.dat", FileOf(kVertex, kFragment)}));
    EXPECT_EQ(Record(), held);
    EXPECT_EQ(ReadBytes(folder.File(FileOf(kVertex, kFragment))), file);
    ASSERT_NE(Record(0), nullptr);
    EXPECT_EQ(Record(0)->attributes, (Texts{"a_pos", "a_color"}));
}

TEST_F(ShaderProgramLife, AfterARefusalOfAHeldBinaryTheNextBuildLooksItUpAgain)
{
    const Program program = Built();
    LoseContext();
    queue.observer.DispatchRestore();
    LoseContext();
    RefuseBinary();
    queue.observer.DispatchRestore(); // holds none from now on
    LoseContext();
    const auto before = ShaderProgramCache::GetInstance()->HoldBinaryShader(
        ShaderProgramCache::GetShaderKey(kVertex, kFragment));
    RefuseBinary();

    queue.observer.DispatchRestore();
    EXPECT_EQ(Errors(), Texts{kRefused});
    EXPECT_EQ(Warnings().size(), 1u);
    EXPECT_NE(Record(), before.get()) << "the refused one is replaced under its key";
    EXPECT_EQ(folder.Names(), (Texts{"sh0.dat", FileOf(kVertex, kFragment)}));
}

TEST_F(ShaderProgramLife, ABinaryThatTheCacheReplacedIsLookedUpAgain)
{
    // Given a program that holds a binary which another program's refusal has replaced
    const Program holder = Built();
    LoseContext();
    queue.observer.DispatchRestore();
    const auto before = ShaderProgramCache::GetInstance()->HoldBinaryShader(
        ShaderProgramCache::GetShaderKey(kVertex, kFragment)); // as a thread that is reading it
    RefuseBinary();
    const Program other = Built();
    ASSERT_NE(Record(), before.get());
    LoseContext();

    // When the driver refuses the new one too, it is replaced under its key: it was looked up
    RefuseBinary();
    queue.observer.DispatchRestore();
    EXPECT_EQ(driver.CallCount("glCompileShader"), 2u) << "the other program loads what was stored";
    EXPECT_EQ(Warnings().size(), 1u);
    EXPECT_EQ(folder.Names(), Texts{FileOf(kVertex, kFragment)});
}

TEST_F(ShaderProgramLife, ARestoreThatFailsLeavesItUncreated)
{
    const Program program = Built();
    LoseContext();
    RefuseBinary();
    driver.FailLink("no more memory");
    EXPECT_THROW(queue.observer.DispatchRestore(), Nib::InvalidArgumentException);
    EXPECT_EQ(program->GetShaderId(), kNoProgram);
    Forget();

    program->Activate();
    EXPECT_EQ(Infos(), Texts{kInCache});
    EXPECT_NE(program->GetShaderId(), kNoProgram);
}

TEST_F(ShaderProgramLife, ASecondBuildLeavesTheFirstName)
{
    const Program program = Built();
    program->CreateShader(kVertex, kFragment);
    EXPECT_EQ(program->GetShaderId(), 4u);
    EXPECT_EQ(driver.Live().programs, 2);
    EXPECT_EQ(driver.CallCount("glDeleteProgram"), 0u);
}

// ---- a driver that saves no programs ------------------------------------------------------------

TEST_F(ShaderProgramWithoutBinaries, IsBuiltAndStoresAnEmptyRecord)
{
    const Program program(new OpenGLShaderProgram(kVertex, kFragment));
    EXPECT_TRUE(driver.Program(program->GetShaderId()).linked);
    EXPECT_EQ(driver.LastCall("glGetProgramBinary").Arg(1), 0);
    ASSERT_NE(Record(), nullptr);
    EXPECT_EQ(Record()->length, 0);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION}) << "left to the caller";
}

TEST_F(ShaderProgramWithoutBinaries, CompilesAtEachRestoreAndLeavesOneNameEach)
{
    const Program program = Built();
    for (int i = 1; i <= 3; ++i)
    {
        LoseContext();
        queue.observer.DispatchRestore();
        EXPECT_EQ(Errors(), Texts{kRefused});
        EXPECT_EQ(driver.CallCount("glCompileShader"), 2u);
        EXPECT_EQ(driver.Live().programs, 1 + i);
    }
}
