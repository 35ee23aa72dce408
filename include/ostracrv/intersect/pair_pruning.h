// Which pairs of segments the intersection engine tests.
//
// Every pair test rejects a pair whose inflated boxes do not meet, so only
// pairs whose boxes meet can add records. This file finds exactly those pairs
// without looking at all of them, and lists them in the engine's visiting
// order, so that visiting the list gives the records of the plain all-pairs
// loop, bit for bit.
//
// Method: a bounding volume hierarchy over the inflated boxes of the segments
// that drive the search (those of active curves), built top-down by median
// splits on the axis of larger spread of the box centres, leaves of up to 4
// segments. Pairs of two driving segments come from a traversal of the
// hierarchy against itself, pairs of a driving segment and a target (a
// segment of an inactive curve) from one query per target. Every candidate is
// decided by the same box test as the pair tests (DoBoxesMeet on the same
// GetSegmentBox values), so the list is exact, not merely a superset. The
// list is then bucketed by driving segment (a counting sort) and each bucket
// sorted by target.
//
// With very few driving segments (a probe) the hierarchy does not pay: each
// driver is tested against every target directly, one pass per driver.
//
// Cost: O(a log a) to build, O(m log a + k) for the queries in practice (a
// driving segments, m targets, k pairs found), O(s + k log k') to order them
// (k' the largest bucket). Memory O(s + k).
#pragma once

#include <vector>

#include "ostracrv/intersect/segments.h"

namespace OstraCrv {

// One pair in visiting order: the driving segment and the segment it is
// tested against (both indices into SegmentsT::segments).
struct SegmentPair {
  int driver = 0;
  int target = 0;
  friend constexpr bool operator==(const SegmentPair& a, const SegmentPair& b) noexcept {
    return a.driver == b.driver && a.target == b.target;
  }
};

// Replaces `pairs` with the pairs of the engine's visiting order whose
// inflated boxes meet (with the inflation of the settings), sorted by driver
// and then target. The segments must have been initialised.
template <class T>
void CollectSegmentPairs(const SegmentsT<T>& segments, const SegmentIntersectionSettings& settings,
                         std::vector<SegmentPair>& pairs);

}  // namespace OstraCrv
