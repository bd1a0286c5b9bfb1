// The library's own code, on modelled atomics.

#include "ModelAtomic.h"

#include "thread/GlobalLocker.cpp"
#include "thread/WorkerThreadImpl.cpp"
