#ifndef NIB_SIM_PICTURE_H
#define NIB_SIM_PICTURE_H

#include "SimGl.h"

#include <cstdint>

// Nothing is rasterised; yet two runs can be told apart by what they drew. Each image carries a
// number that stands for the draws that went into it, each draw a number for all that it used.

namespace Sim
{

/// A number that depends on everything that was added, and on the order.
class Digest
{
public:
    void AddBytes(const void* data, std::size_t size);
    void Add(std::uint64_t value) { AddBytes(&value, sizeof value); }
    void Add(double value) { AddBytes(&value, sizeof value); }
    void Add(const std::string& text);
    void Add(const Image& image);
    std::uint64_t Value() const { return m_value; }

private:
    std::uint64_t m_value = 0xCBF29CE484222325; // FNV-1a
};

/// What the image @p target shows after a part of @p source came into it.
std::uint64_t CopiedInto(const Image& target, const Image& source, const Box& area);

/// What the draw @p draw would make visible: program and uniforms, vertices, textures and states,
/// by their contents. Names of objects do not count.
std::uint64_t DigestOfDraw(GlEntry& entry, const SimDraw& draw);

/// Keeps what became visible or was read, where the test asked for it.
void NotePicture(State& state, const char* what, const Image& image, const Box& area);

} // namespace Sim

#endif
