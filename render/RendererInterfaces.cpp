#include <nib/msg_queue.h>
#include <nib/render_thread.h>

namespace Nib
{

// Out of line, so that the interfaces' type information lives in this library alone: objects find
// managed queues by a checked cast.
IGLMsgQueue::~IGLMsgQueue() = default;
IGLManagedMsgQueue::~IGLManagedMsgQueue() = default;
IGLRenderer::~IGLRenderer() = default;
RenderThreadGL::~RenderThreadGL() = default;
RenderThreadHWUI::~RenderThreadHWUI() = default;
RenderThreadHWUI::ISafeLock::~ISafeLock() = default;

bool IGLMsgQueue::setTearingAllowed(bool)
{
    return false;
}

} // namespace Nib
