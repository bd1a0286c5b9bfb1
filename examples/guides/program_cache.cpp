// Programs by name, one for each context, and the cache that keeps their binaries between runs.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <memory>

namespace
{

const char* const kVertexShader = "attribute vec2 a_position;\n"
                                  "void main() { gl_Position = vec4(a_position, 0.0, 1.0); }\n";
const char* const kFragmentShader = "precision mediump float;\n"
                                    "void main() { gl_FragColor = vec4(1.0); }\n";

// [shared]
/// The one program "white" of the context that is current here. In a task.
Nib::IShaderProgram* SharedProgram()
{
    using Nib::ShaderManager;
    ShaderManager* const manager = ShaderManager::GetInstance();
    const ShaderManager::Key key("white");
    ShaderManager::Entry entry;
    if (!manager->Find(key, &entry))
        entry.program =
            Nib::RendererFactory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr);
    ++entry.useCount;
    manager->Add(key, entry);
    return static_cast<Nib::IShaderProgram*>(entry.program);
}
// [shared]

} // namespace

int main()
{
    using namespace Nib;
    const std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateSurfaceRenderer("example", RenderThreadGL::Medium));
    thread->Start();
    bool isShared = false, isCached = false;
    Ink::Post(*thread->GetMsgQueue(),
              [&]
              {
                  IShaderProgram* const program = SharedProgram();
                  isShared = SharedProgram() == program;
                  // [cached]
                  program->Activate(); // builds it: from its binary, or from its sources
                  program->Deactivate();
                  // Built before or just now: its binary is held under the key of its sources.
                  const auto cacheKey =
                      ShaderProgramCache::GetShaderKey(kVertexShader, kFragmentShader);
                  isCached =
                      ShaderProgramCache::GetInstance()->GetBinaryShader(cacheKey) != nullptr;
                  // [cached]

                  ShaderManager::GetInstance()->Remove("white");
                  program->Release();
              });
    thread->GetMsgQueue()->waitForCompleting();
    std::printf("shared %d, cached %d\n", isShared, isCached);
    return isShared && isCached ? 0 : 1;
}
