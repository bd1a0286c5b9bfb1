#ifndef NIB_TESTS_CACHEKILL_RECORDS_H
#define NIB_TESTS_CACHEKILL_RECORDS_H

#include <nib/shader_cache.h>

#include <cstdint>

namespace CacheKill
{

using Record = Nib::ShaderProgramCache::BinaryShader;

inline constexpr int kKeys = 16;

/// The record of @p key that @p version says all about: its format is the version, its length, its
/// bytes and its names follow from both.
Record MakeRecord(std::uint64_t key, std::uint32_t version);

/// Whether @p record is all of one version of @p key.
bool IsWhole(const Record& record, std::uint64_t key);

} // namespace CacheKill

#endif
