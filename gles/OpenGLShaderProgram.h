#ifndef NIB_GLES_OPENGL_SHADER_PROGRAM_H
#define NIB_GLES_OPENGL_SHADER_PROGRAM_H

#include <nib/managed_object.h>
#include <nib/shader.h>
#include <nib/shader_cache.h>

#include <GLES3/gl3.h>

#include <memory>
#include <string>
#include <vector>

namespace Nib::GLES
{

/// One GL program, built from its binary in the shader cache where there is one, else from source.
///
/// Everything but construction and GetShaderId needs the context that the program was made in, on
/// the thread where it is current.
class OpenGLShaderProgram : public IShaderProgram, public ManagedObject
{
public:
    static constexpr GLuint kNotCreated = 0xFFFFFFFF;

    OpenGLShaderProgram() = default;

    /// CreateShader; what it throws leaves nothing behind.
    OpenGLShaderProgram(const char* vs, const char* fs);

    ~OpenGLShaderProgram() override;
    void Activate() override;
    void Deactivate() override;
    void PreDraw() override;
    void Release() override;
    IParameterBinding* GetBindingIntf(const char* name) override;
    void ReleaseGLObject() override;
    void RestoreGLObject() override;

    /// Builds the program and subscribes it to its thread's queue. The texts are borrowed for as
    /// long as the program lives.
    void CreateShader(const char* vs, const char* fs);

    GLuint GetShaderId() const { return m_program; }

    /// Sets an integer uniform by name, without a binding. The program must be the active one.
    void activateUniform(const char* name, unsigned int value) const;

    /// What a uniform of GL type @p type is bound as.
    static BindingType convertGLBindingType(GLenum type);

private:
    using BinaryShader = ShaderProgramCache::BinaryShader;

    void createShader();
    void Label() const;
    void createShaderFromSource(std::vector<std::string>& attributes);
    void LinkShaders(GLuint vertex, GLuint fragment, std::vector<std::string>& attributes);
    void parseShaderFromSource(std::vector<std::string>& attributes) const;
    bool LoadFromBinary(const BinaryShader* binary);
    bool SaveToCache(ShaderProgramCache::BinaryShaderKey key,
                     const std::vector<std::string>& attributes) const;
    std::shared_ptr<const BinaryShader> HeldBinary() const;
    bool FindActiveUniform(const char* name, BindingType* bindingType) const;

    GLuint m_program = kNotCreated;
    // The cache's record. Only looked at, so that a record which the cache has replaced is gone for
    // this program too; held while it is being read.
    std::weak_ptr<const BinaryShader> m_cachedBinary;
    const char* m_vertexSource = nullptr;
    const char* m_fragmentSource = nullptr;
};

} // namespace Nib::GLES

#endif
