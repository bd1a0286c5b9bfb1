#ifndef NIB_TESTS_GLES_SHADER_FIXTURE_H
#define NIB_TESTS_GLES_SHADER_FIXTURE_H

#include "gles/CacheFiles.h"
#include "gles/GlesFixture.h"
#include "gles/OpenGLShaderProgram.h"

#include <memory>

using Program = std::unique_ptr<Nib::GLES::OpenGLShaderProgram, Releaser>;

/// The signature that stands in front of most lines of a build.
inline const std::string kBuilding = "void Nib::GLES::OpenGLShaderProgram::createShader() - ";

/// A thread that can build programs, with a cache folder that is empty at first.
class ShaderTest : public GlesTest
{
protected:
    explicit ShaderTest(SimGpu gpu = SimGpu::Default()) : GlesTest(std::move(gpu))
    {
        Nib::ShaderProgramCache::GetInstance();
        Forget();
    }

    void Forget()
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    /// A program of these sources, its making forgotten.
    Program Built(const char* vs = kVertex, const char* fs = kFragment)
    {
        Program program(new Nib::GLES::OpenGLShaderProgram(vs, fs));
        Forget();
        return program;
    }

    /// The calls as text; addresses stand as "*".
    Texts Steps() const
    {
        Texts texts;
        for (const SimCall& call : driver.Calls())
        {
            std::string text = call.name + "(";
            for (const SimValue& value : call.args)
            {
                const bool isAddress =
                    value.GetKind() == SimValue::Kind::Pointer && value.Pointer();
                text += (text.back() == '(' ? "" : ", ") + (isAddress ? "*" : value.ToString());
            }
            texts.push_back(text + ")");
        }
        return texts;
    }

    Texts Warnings() const { return driver.LogTexts(ANDROID_LOG_WARN); }

    static std::string FileOf(const char* vs, const char* fs)
    {
        return "sh" + std::to_string(Nib::ShaderProgramCache::GetShaderKey(vs, fs)) + ".dat";
    }

    /// The line that a first start writes, because there is no file yet.
    std::string MissingFile(const char* vs = kVertex, const char* fs = kFragment) const
    {
        return "ShaderProgramCache::BinaryShader *Nib::ShaderProgramCache::LoadFromFile("
               "ShaderProgramCache::BinaryShaderKey) Failed to create shader binary file. Err=2. "
               "File=" +
               folder.File(FileOf(vs, fs));
    }

    static constexpr const char* kVertex = "attribute vec2 a_pos;\n"
                                           "attribute vec4 a_color;\n"
                                           "uniform mat4 u_matrix;\n"
                                           "void main() { gl_Position = u_matrix * a_color; }\n";
    static constexpr const char* kFragment = "precision mediump float;\n"
                                             "uniform vec4 u_tint;\n"
                                             "void main() { gl_FragColor = u_tint; }\n";

    CacheFolder folder;
};

#endif
