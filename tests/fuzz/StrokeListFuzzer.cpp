#include "RecordingFuzzer.h"

#include "StrokeList.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    return Nib::FuzzReader(Ink::ReadStrokeList, data, size);
}
