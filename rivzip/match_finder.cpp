#include "rivzip/match_finder.h"

#include <cstring>

namespace rivzip {

MatchFinder::MatchFinder(std::uint32_t maxChain)
    : maxChain_(maxChain), head_(std::size_t{1} << kHashBits, -1), link_(szdd::kWindowSize, -1) {}

namespace {

// How many leading bytes of a and b agree, at most limit; eight at a time while it can.
std::uint32_t CommonLength(const std::uint8_t* a, const std::uint8_t* b, std::uint32_t limit) {
    std::uint32_t length = 0;
    for (; length + 8 <= limit; length += 8) {
        std::uint64_t x, y;
        std::memcpy(&x, a + length, 8);
        std::memcpy(&y, b + length, 8);
        if (x != y) break;
    }
    while (length < limit && a[length] == b[length]) ++length;
    return length;
}

}  // namespace

std::uint32_t MatchFinder::Hash(const std::uint8_t* data) {
    std::uint32_t key = data[0] | data[1] << 8 | data[2] << 16;
    return (key * 2654435761u) >> (32 - kHashBits);
}

void MatchFinder::Insert(const std::uint8_t* data, std::uint64_t position) {
    std::uint32_t hash = Hash(data);
    link_[position & szdd::kWindowMask] = head_[hash];
    head_[hash] = static_cast<std::int64_t>(position);
}

MatchFinder::Match MatchFinder::FindAndInsert(const std::uint8_t* data, std::uint64_t position,
                                              std::uint32_t maxLength) {
    Match best;
    if (maxLength < szdd::kMinMatch) return best;
    std::uint32_t hash = Hash(data);
    std::int64_t candidate = head_[hash];
    const std::int64_t here = static_cast<std::int64_t>(position);
    // Links of positions within the window are never overwritten, so a chain only needs the
    // distance check; the "smaller than before" check guards against a stale slot all the same.
    for (std::uint32_t steps = 0; steps < maxChain_ && candidate >= 0 && here - candidate <= kMaxDistance;
         ++steps) {
        const std::uint8_t* from = data - (here - candidate);
        if (from[best.length] == data[best.length]) {  // cheap reject of shorter matches
            std::uint32_t length = CommonLength(from, data, maxLength);
            if (length > best.length && length >= szdd::kMinMatch) {
                best.length = length;
                best.source = static_cast<std::uint64_t>(candidate);
                if (length == maxLength) break;
            }
        }
        std::int64_t next = link_[candidate & szdd::kWindowMask];
        if (next >= candidate) break;
        candidate = next;
    }
    link_[position & szdd::kWindowMask] = head_[hash];
    head_[hash] = here;
    return best;
}

}  // namespace rivzip
