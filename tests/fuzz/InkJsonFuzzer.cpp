#include "RecordingFuzzer.h"

#include "InkJson.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    return Nib::FuzzReader(Ink::ReadInkJson, data, size);
}
