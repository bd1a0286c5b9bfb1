#include "Action.h"
#include "Family.h"
#include "Host.h"

#include <mutex>

namespace Soak
{

namespace
{

class GuestAction : public Action
{
public:
    const char* Name() const override { return "guest of a UI"; }

    void Run(Family& family, Random& random) const override
    {
        const int page = random.Below(Pages::kCount);
        const bool losesContext = random.OneIn(2);
        const std::lock_guard<std::mutex> onlyOne(family.Shared().host);
        Host host;
        {
            Ink::InkSession session(host.Guest(), kPageWidth, kPageHeight, kPaper);
            const auto loseSometimes = [&]
            {
                if (random.OneIn(10) && losesContext)
                    session.LoseContext();
            };
            family.Shared().pages.Draw(page, session, loseSometimes);
        }
        host.Finish();
    }
};

} // namespace

std::unique_ptr<Action> MakeGuestAction()
{
    return std::make_unique<GuestAction>();
}

} // namespace Soak
