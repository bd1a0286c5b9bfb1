#include "Action.h"
#include "Batch.h"
#include "Failure.h"
#include "Family.h"

namespace Soak
{

namespace
{

/// The thread is made by the first that asks and ended by the last that lets it go; all families do
/// so at once.
class SharedThreadAction : public Action
{
public:
    const char* Name() const override { return "shared thread"; }

    void Run(Family&, Random& random) const override
    {
        const int tasks = random.Between(1, 20);
        int done = 0; // on the render thread, read when all have run
        Nib::RenderThreadGL* const thread = Nib::RenderThreadGLST::getInstance();
        {
            Batch batch;
            for (int i = 0; i < tasks; ++i)
                batch.Post(*thread, [&done] { ++done; });
        }
        Nib::RenderThreadGLST::release();
        Require(done == tasks, "a task of the shared thread was lost");
    }
};

} // namespace

std::unique_ptr<Action> MakeSharedThreadAction()
{
    return std::make_unique<SharedThreadAction>();
}

} // namespace Soak
