#ifndef INK_PROGRAM_H
#define INK_PROGRAM_H

#include "PostTask.h"

#include <nib/nib.h>

#include <memory>

namespace Ink
{

/// How the programs of this process came to be, those built again after a loss included.
struct ProgramCounts
{
    int compiled = 0;
    int loaded = 0; ///< from a binary in the cache
};

/// A shader program that knows whether it was compiled or loaded from the cache. Made, used and
/// destroyed on the render thread, in tasks.
class Program
{
public:
    /// The texts must live as long as the program. Throws Nib::InvalidArgumentException when the
    /// driver refuses them.
    Program(const char* vertexShader, const char* fragmentShader);

    void Activate() { m_program->Activate(); }
    Owned<Nib::IParameterBinding> Binding(const char* uniform);

    /// With a new context, in which the library has built the program again.
    void CountRestore() { Count(); }

    /// Of all threads so far.
    static ProgramCounts Counts();

private:
    void Count();

    Nib::ShaderProgramCache::BinaryShaderKey m_key;
    std::shared_ptr<const Nib::ShaderProgramCache::BinaryShader> m_known; ///< before the build
    Owned<Nib::IShaderProgram> m_program;
};

} // namespace Ink

#endif
