#ifndef NIB_SIM_SHADER_TEXT_H
#define NIB_SIM_SHADER_TEXT_H

#include "SimGlState.h"

#include <string>

namespace Sim
{

/// What a shader's source declares at global scope. Bodies of functions are not read, so everything
/// that is declared counts as used.
struct Declarations
{
    std::string error; ///< empty when the source is in order
    bool hasMain = false;
    std::vector<Variable> inputs;   ///< attribute, or in
    std::vector<Variable> uniforms; ///< blocks' members too, with their block
    std::vector<UniformBlock> blocks;
};

Declarations ReadShader(const std::string& source);

/// The size of a value of a uniform type in numbers: 16 for GL_FLOAT_MAT4, 1 for a sampler.
int ComponentsOf(GLenum type);
bool IsSampler(GLenum type);
bool IsMatrix(GLenum type);
/// GL_FLOAT, GL_INT, GL_UNSIGNED_INT or GL_BOOL; GL_INT for samplers.
GLenum ScalarOf(GLenum type);

} // namespace Sim

#endif
