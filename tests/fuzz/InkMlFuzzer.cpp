#include "RecordingFuzzer.h"

#include "InkMl.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    return Nib::FuzzReader(Ink::ReadInkMl, data, size, Nib::EmptyPage::Accepted);
}
