#include "rivzip/match_finder.h"

namespace rivzip {

MatchFinder::MatchFinder(std::uint32_t maxChain)
    : maxChain_(maxChain), head_(std::size_t{1} << kHashBits, -1), link_(szdd::kWindowSize, -1) {}

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
            std::uint32_t length = 0;
            while (length < maxLength && from[length] == data[length]) ++length;
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
