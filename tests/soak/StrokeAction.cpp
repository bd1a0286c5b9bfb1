#include "Action.h"
#include "Failure.h"
#include "Family.h"

#include <string>

namespace Soak
{

namespace
{

class StrokeAction : public Action
{
public:
    const char* Name() const override { return "stroke"; }

    void Run(Family& family, Random& random) const override
    {
        Ink::InkSession& sketch = family.Sketch();
        DrawStroke(sketch, random, family.Width(), family.Height(),
                   [&sketch] { sketch.Present(); });
        const std::string error = sketch.Error();
        Require(error.empty(), "drawing the sketch failed: " + error);
    }
};

} // namespace

std::unique_ptr<Action> MakeStrokeAction()
{
    return std::make_unique<StrokeAction>();
}

} // namespace Soak
