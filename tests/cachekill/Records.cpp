#include "Records.h"

#include <algorithm>
#include <random>

namespace CacheKill
{

namespace
{

constexpr int kLongestUsual = 40000;
constexpr int kLongest = 1000000; // the longest that is read back
constexpr int kMostNames = 8;

} // namespace

Record MakeRecord(std::uint64_t key, std::uint32_t version)
{
    std::mt19937_64 random(key << 32 | version);
    Record record;
    record.key = key;
    record.format = version;
    const bool isLong = random() % 16 == 0;
    record.length = 1 + static_cast<int>(random() % (isLong ? kLongest : kLongestUsual));
    record.bytes = new unsigned char[static_cast<std::size_t>(record.length)];
    std::generate_n(record.bytes, record.length,
                    [&random] { return static_cast<unsigned char>(random()); });
    for (std::uint64_t i = random() % (kMostNames + 1); i > 0; --i)
        record.attributes.emplace_back(random() % 40, static_cast<char>('a' + random() % 26));
    return record;
}

bool IsWhole(const Record& record, std::uint64_t key)
{
    const Record whole = MakeRecord(key, record.format);
    return record.key == key && record.length == whole.length &&
           std::equal(whole.bytes, whole.bytes + whole.length, record.bytes) &&
           record.attributes == whole.attributes;
}

} // namespace CacheKill
