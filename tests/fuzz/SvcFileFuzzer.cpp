#include "RecordingFuzzer.h"

#include "SvcFile.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    return Nib::FuzzReader(Ink::ReadSvcFile, data, size);
}
