#ifndef NIB_TESTS_SOAK_PLANTED_LEAK_H
#define NIB_TESTS_SOAK_PLANTED_LEAK_H

#include <string_view>

namespace Soak
{

/// What a run is made to leave behind, to see whether it finds that.
class PlantedLeak
{
public:
    /// "name", "file", "memory", "thread" or "context"; false for anything else.
    bool Choose(std::string_view what);

    /// On a render thread. Leaves one of what was chosen; nothing when nothing was.
    void LeaveSomething() const;

private:
    void (*m_leave)() = nullptr;
};

} // namespace Soak

#endif
