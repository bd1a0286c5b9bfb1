#include "Action.h"
#include "Family.h"

namespace Soak
{

namespace
{

/// Only children can lose their context: it happens between two pieces of ink.
class LossAction : public Action
{
public:
    const char* Name() const override { return "context loss"; }

    void Run(Family& family, Random& random) const override
    {
        Nib::RenderThreadGL& thread = family.SomeChild(random);
        Ink::InkSession session(thread, kPageWidth, kPageHeight, kPaper);
        session.LoseContext(); // of an empty page
        const auto loseSometimes = [&]
        {
            if (random.OneIn(10))
                session.LoseContext();
        };
        family.Shared().pages.Draw(random.Below(Pages::kCount), session, loseSometimes);
    }
};

} // namespace

std::unique_ptr<Action> MakeLossAction()
{
    return std::make_unique<LossAction>();
}

} // namespace Soak
