#ifndef NIB_BASE_FUTEX_H
#define NIB_BASE_FUTEX_H

// The sleep of modelled threads on a modelled word.

#include <atomic>
#include <ctime>

namespace Nib
{

bool FutexWait(std::atomic<int>& word, int value, const timespec* deadline);
void FutexWake(std::atomic<int>& word);

} // namespace Nib

#endif
