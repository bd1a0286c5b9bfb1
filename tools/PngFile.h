#ifndef NIB_TOOLS_PNG_FILE_H
#define NIB_TOOLS_PNG_FILE_H

#include <cstdint>
#include <string>
#include <vector>

/// Writes @p pixels (RGBA with premultiplied alpha, top row first) as an 8-bit RGBA PNG with
/// straight alpha. The file appears whole or not at all: it is written under a temporary name in
/// the same folder and renamed. Throws UserError.
void WritePng(const std::string& path, const std::vector<std::uint8_t>& pixels, int width,
              int height);

#endif
