#include "Program.h"

#include <atomic>

namespace Ink
{
namespace
{

using Cache = Nib::ShaderProgramCache;

std::atomic<int> s_compiled{0};
std::atomic<int> s_loaded{0};

} // namespace

Program::Program(const char* vertexShader, const char* fragmentShader)
    : m_key(Cache::GetShaderKey(vertexShader, fragmentShader)),
      m_known(Cache::GetInstance()->HoldBinaryShader(m_key)),
      m_program(Nib::RendererFactory::CreateShaderProgram(vertexShader, fragmentShader, nullptr))
{
    Count();
}

Owned<Nib::IParameterBinding> Program::Binding(const char* uniform)
{
    return Owned<Nib::IParameterBinding>(m_program->GetBindingIntf(uniform));
}

/// A build that the cache's binary served leaves it in its place; any other stores a new one there.
void Program::Count()
{
    const bool wasLoaded = m_known && Cache::GetInstance()->IsCurrent(m_known.get());
    (wasLoaded ? s_loaded : s_compiled).fetch_add(1, std::memory_order_relaxed);
    m_known = Cache::GetInstance()->HoldBinaryShader(m_key);
}

ProgramCounts Program::Counts()
{
    return {s_compiled.load(std::memory_order_relaxed), s_loaded.load(std::memory_order_relaxed)};
}

} // namespace Ink
