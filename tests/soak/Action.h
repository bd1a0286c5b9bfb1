#ifndef NIB_TESTS_SOAK_ACTION_H
#define NIB_TESTS_SOAK_ACTION_H

#include <memory>
#include <vector>

namespace Soak
{

class Family;
class Random;

/// One kind of thing that applications do. It has no state, so that all families use the same.
class Action
{
public:
    virtual ~Action() = default;

    virtual const char* Name() const = 0;

    /// Does it once, to its end. Throws Failure, or whatever the library throws.
    virtual void Run(Family& family, Random& random) const = 0;
};

// Each in a file of its name.
std::unique_ptr<Action> MakeWindowAction();       ///< a window comes, changes its size, goes
std::unique_ptr<Action> MakeThreadAction();       ///< a render thread is made or ended
std::unique_ptr<Action> MakeSharedThreadAction(); ///< the thread that the process shares
std::unique_ptr<Action> MakeStrokeAction();       ///< a stroke is drawn and shown
std::unique_ptr<Action> MakePageAction();         ///< a page is drawn, exported, compared
std::unique_ptr<Action> MakeLossAction();         ///< the same, and its context is lost meanwhile
std::unique_ptr<Action> MakeGuestAction();        ///< a page is drawn inside another's frames
std::unique_ptr<Action> MakeProgramAction();      ///< programs are built on all threads at once
std::unique_ptr<Action> MakeResourceAction();     ///< textures, meshes, targets, fences
std::unique_ptr<Action> MakeCacheAction();        ///< the program cache's files are cleared
std::unique_ptr<Action> MakeWorkerAction();       ///< a pool of workers

/// One of each.
inline std::vector<std::unique_ptr<Action>> AllActions()
{
    std::vector<std::unique_ptr<Action>> all;
    for (const auto make :
         {&MakeWindowAction, &MakeThreadAction, &MakeSharedThreadAction, &MakeStrokeAction,
          &MakePageAction, &MakeLossAction, &MakeGuestAction, &MakeProgramAction,
          &MakeResourceAction, &MakeCacheAction, &MakeWorkerAction})
        all.push_back(make());
    return all;
}

} // namespace Soak

#endif
