#ifndef NIB_GLES_PARAMETER_BINDING_IMPL_H
#define NIB_GLES_PARAMETER_BINDING_IMPL_H

#include <nib/shader.h>

namespace Nib::GLES
{

class OpenGLShaderProgram;

/// A binding of one uniform or uniform block of an OpenGLShaderProgram. Setting it makes one GL
/// call and no query.
class ParameterBindingImpl : public IParameterBinding
{
public:
    static constexpr int32_t kNoLocation = -1;

    /// Bound to nothing until SetLocation. @p program is borrowed and outlives the binding.
    ParameterBindingImpl(BindingType type, OpenGLShaderProgram* program);

    void SetValue(const void* value) override;
    void Release() override;
    ~ParameterBindingImpl() override;

    /// A uniform's location or a block's index; @p activeUniform: the name is that of a uniform.
    void SetLocation(int32_t location, bool activeUniform);
    int32_t GetLocation() const { return m_location; }
    bool IsActiveUniform() const { return m_activeUniform; }

private:
    int32_t m_location = kNoLocation;
    bool m_activeUniform = false;
    OpenGLShaderProgram* m_program;
};

} // namespace Nib::GLES

#endif
