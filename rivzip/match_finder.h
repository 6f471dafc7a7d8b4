// MatchFinder: finds earlier occurrences of the bytes at the current position for the SZDD
// compressor, through hash chains over the last kMaxDistance positions.
//
// Positions are absolute offsets in the original. The caller keeps at least kMaxDistance bytes
// before every position it asks about in memory, contiguous with it, and inserts positions in
// increasing order. Memory is fixed: a head per hash value and one link per window slot.
#pragma once
#include <cstdint>
#include <vector>

#include "rivzip/szdd_format.h"

namespace rivzip {

class MatchFinder {
public:
    // The longest distance used. It leaves the 18 slots that a classic LZSS encoder keeps for
    // its look-ahead, so every decoder, whatever its copy order, reads the same bytes.
    static constexpr std::uint32_t kMaxDistance = szdd::kWindowSize - szdd::kMaxMatch;

    struct Match {
        std::uint32_t length = 0;  // 0 when no match of at least kMinMatch bytes exists
        std::uint64_t source = 0;  // absolute position copied from
    };

    explicit MatchFinder(std::uint32_t maxChain = 32);

    // Finds the longest match (at most maxLength bytes, which are all at hand) for the data at
    // `data`, whose absolute position is `position`, then inserts the position. Needs at least
    // 3 bytes at `data` when maxLength >= 3; with maxLength < 3 it only returns no match.
    Match FindAndInsert(const std::uint8_t* data, std::uint64_t position, std::uint32_t maxLength);
    // Inserts a position without searching (needs 3 bytes at `data`).
    void Insert(const std::uint8_t* data, std::uint64_t position);

private:
    static constexpr int kHashBits = 15;
    static std::uint32_t Hash(const std::uint8_t* data);

    std::uint32_t maxChain_;
    std::vector<std::int64_t> head_;  // latest position per hash, -1 when none
    std::vector<std::int64_t> link_;  // previous position of the same hash, per window slot
};

}  // namespace rivzip
