#include "Action.h"
#include "Family.h"

namespace Soak
{

namespace
{

class ThreadAction : public Action
{
public:
    const char* Name() const override { return "thread"; }

    void Run(Family& family, Random& random) const override
    {
        if (family.Children() == 0)
            family.AddChild();
        else if (family.Children() == Family::kMostChildren || random.OneIn(2))
            family.RemoveChild(random);
        else
            family.AddChild();
    }
};

} // namespace

std::unique_ptr<Action> MakeThreadAction()
{
    return std::make_unique<ThreadAction>();
}

} // namespace Soak
