#include "Action.h"
#include "Family.h"

namespace Soak
{

namespace
{

class WindowAction : public Action
{
public:
    const char* Name() const override { return "window"; }

    void Run(Family& family, Random& random) const override
    {
        const int width = random.Between(16, 320);
        const int height = random.Between(16, 240);
        if (!HasWindows())
            family.NewSketch(width, height);
        else if (!family.HasWindow())
            family.OpenWindow(width, height);
        else if (random.OneIn(3))
            family.CloseWindow();
        else
            family.ResizeWindow(width, height);
        family.Sketch().Present();
    }
};

} // namespace

std::unique_ptr<Action> MakeWindowAction()
{
    return std::make_unique<WindowAction>();
}

} // namespace Soak
