#include "RecordingFuzzer.h"

#include "PenLog.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    return Nib::FuzzReader(Ink::ReadPenLog, data, size);
}
