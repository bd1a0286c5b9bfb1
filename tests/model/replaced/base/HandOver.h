#ifndef NIB_BASE_HAND_OVER_H
#define NIB_BASE_HAND_OVER_H

// In the model a signal that comes later is one that comes at once: its waiter runs later anyway,
// in some order. Who spins sees nothing that one who looks once does not see.

#include <atomic>

namespace Nib
{

class HandOver
{
public:
    HandOver() {}
    ~HandOver() {}
    void TellWhenLeft(std::atomic<bool>*) {}
    void SpinInWait() {}
    bool HasSpunInVain() const { return false; }
};

} // namespace Nib

#endif
