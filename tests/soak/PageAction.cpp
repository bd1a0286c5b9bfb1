#include "Action.h"
#include "Family.h"

namespace Soak
{

namespace
{

/// On any thread, while the others go on.
class PageAction : public Action
{
public:
    const char* Name() const override { return "page"; }

    void Run(Family& family, Random& random) const override
    {
        Nib::RenderThreadGL& thread = family.SomeThread(random);
        Ink::InkSession session(thread, kPageWidth, kPageHeight, kPaper);
        family.Shared().pages.Draw(random.Below(Pages::kCount), session, nullptr);
    }
};

} // namespace

std::unique_ptr<Action> MakePageAction()
{
    return std::make_unique<PageAction>();
}

} // namespace Soak
