// Word-parallel scanning of node bytes (private to the curve core).
//
// The counting queries read every byte of a path on each call, so they work on
// eight bytes at a time as one 64-bit word (SWAR) instead of one byte and one
// branch at a time. Each byte of the word is a lane; a selector turns a word
// into a lane mask that has bit 7 of a lane set exactly when that lane's byte
// matches. Shifting the whole word left by k moves bit 7-k of every byte to
// bit 7 of the same byte (bits that cross into the next lane land below bit 7
// and are masked off), so the fields of the node byte become:
//
//   bit 7 (type high)   w        bit 3 (closed)   w << 4
//   bit 6 (type low)    w << 1   bit 2 (user)     w << 5
//                                bit 0 (enabled)  w << 7
//
// and a type test is a two-bit pattern of w and w << 1 (move 00, line 01,
// curve 10, arc 11). The masks only ever look at one lane at a time, so the
// result does not depend on the byte order of the machine.
//
// Counting adds the lane masks shifted down to bit 0 into eight byte-wide
// counters of one word; after at most kBlockWords words (255, the largest
// count a byte lane holds) the lanes are summed and the counters start again.
// The inner loop has no branch and vectorises. The last n mod 8 bytes are read
// into a zeroed word and only their lanes are kept, so that the zero padding
// (which reads as an open move) is never counted.
//
// Cost: one pass, O(n), no allocation.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>

#include "ostracrv/core/nodetype.h"

namespace OstraCrv::lanes {

inline constexpr uint64_t kHigh = 0x8080808080808080ull;
inline constexpr std::size_t kBlockWords = 255;

// Selectors: a word in, the lane mask (bit 7 per matching byte) out.
struct Move {
  static constexpr uint64_t Mask(uint64_t w) noexcept { return ~(w | (w << 1)) & kHigh; }
};
struct Line {
  static constexpr uint64_t Mask(uint64_t w) noexcept { return ~w & (w << 1) & kHigh; }
};
struct Curve {
  static constexpr uint64_t Mask(uint64_t w) noexcept { return w & ~(w << 1) & kHigh; }
};
// A line or a curve: the two type bits differ.
struct SegmentEnd {
  static constexpr uint64_t Mask(uint64_t w) noexcept { return (w ^ (w << 1)) & kHigh; }
};
// A move with the closed bit clear.
struct OpenMove {
  static constexpr uint64_t Mask(uint64_t w) noexcept { return ~(w | (w << 1) | (w << 4)) & kHigh; }
};
struct Closed {
  static constexpr uint64_t Mask(uint64_t w) noexcept { return (w << 4) & kHigh; }
};
// A node that is not an arc and has the user bit.
struct UserNode {
  static constexpr uint64_t Mask(uint64_t w) noexcept { return (w << 5) & ~(w & (w << 1)) & kHigh; }
};
// As UserNode, and enabled as well.
struct EnabledUserNode {
  static constexpr uint64_t Mask(uint64_t w) noexcept { return UserNode::Mask(w) & (w << 7); }
};

// Whether one byte matches: the byte alone is a word with a single lane.
template <class Sel>
constexpr bool Matches(NODETYPE b) noexcept {
  return (Sel::Mask(uint64_t(b)) & 0x80u) != 0;
}

inline uint64_t LoadWord(const NODETYPE* p) noexcept {
  uint64_t w;
  std::memcpy(&w, p, sizeof w);
  return w;
}

// Sum of the eight byte lanes of a counter word (each at most 255).
constexpr uint64_t SumLanes(uint64_t acc) noexcept {
  const uint64_t pairs = (acc & 0x00FF00FF00FF00FFull) + ((acc >> 8) & 0x00FF00FF00FF00FFull);
  return (pairs * 0x0001000100010001ull) >> 48;
}

// Matches among the first count < 8 bytes at p.
template <class Sel>
inline uint64_t CountTail(const NODETYPE* p, std::size_t count) noexcept {
  static constexpr unsigned char kLaneBits[8] = {0x80, 0x80, 0x80, 0x80, 0x80, 0x80, 0x80, 0x80};
  uint64_t w = 0, live = 0;
  std::memcpy(&w, p, count);
  std::memcpy(&live, kLaneBits, count);
  return SumLanes((Sel::Mask(w) & live) >> 7);
}

// Matches among full words [0, words) at p; words <= kBlockWords.
template <class Sel>
inline uint64_t CountBlock(const NODETYPE* p, std::size_t words) noexcept {
  uint64_t acc = 0;
  for (std::size_t k = 0; k < words; ++k) acc += Sel::Mask(LoadWord(p + 8 * k)) >> 7;
  return SumLanes(acc);
}

// Number of bytes in p[0, n) that the selector matches.
template <class Sel>
inline uint64_t Count(const NODETYPE* p, std::size_t n) noexcept {
  const std::size_t words = n / 8;
  uint64_t total = 0;
  for (std::size_t w = 0; w < words; w += kBlockWords)
    total += CountBlock<Sel>(p + 8 * w, std::min(kBlockWords, words - w));
  if (n % 8) total += CountTail<Sel>(p + 8 * words, n % 8);
  return total;
}

// Index of the match with ordinal k (from 0) in p[0, n), or -1. Whole blocks
// are skipped by counting, so only the block that holds the answer is read
// byte by byte.
template <class Sel>
inline long long FindNth(const NODETYPE* p, std::size_t n, uint64_t k) noexcept {
  constexpr std::size_t kBlockBytes = 8 * kBlockWords;
  std::size_t start = 0;
  while (n - start >= kBlockBytes) {
    const uint64_t c = CountBlock<Sel>(p + start, kBlockWords);
    if (k < c) break;
    k -= c;
    start += kBlockBytes;
  }
  for (std::size_t i = start; i < n; ++i) {
    if (Matches<Sel>(p[i])) {
      if (k == 0) return static_cast<long long>(i);
      --k;
    }
  }
  return -1;
}

}  // namespace OstraCrv::lanes
