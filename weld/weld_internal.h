// Helpers shared by the source files of welding; not part of the interface.
#pragma once

#include <vector>

#include "ostracrv/core/nodetype.h"
#include "ostracrv/intersect/segments.h"
#include "ostracrv/math/vector2d.h"
#include "ostracrv/weld/weldstate.h"

namespace OstraCrv::weld_detail {

// The points and nodes of one segment inside its curve's arrays: 2 points
// for a line, 4 for a Bezier; last is the index of its end point (1 or 3).
struct SegmentView {
  MavikMath::V const* points = nullptr;
  NODETYPE const* nodes = nullptr;
  bool bezier = false;
  int last = 1;
};

SegmentView ViewOf(WeldSegments const& segments, SegmentIntersections const& s) noexcept;
// The point at t of the segment; the zero point for a view without points.
MavikMath::V PointOn(SegmentView const& v, double t) noexcept;
// The direction of the segment at t: the derivative, or for a Bezier whose
// derivative vanishes there (a collapsed handle) the chord.
MavikMath::D TangentOn(SegmentView const& v, double t) noexcept;
// List position of a record in its segment's list (binary search on t, then
// a scan); -1 if it is not there.
int IndexOfRecord(SegmentIntersections const& s, Intersection const* record) noexcept;

// The first segment of its subpath: no predecessor, or one that is not the
// segment just before it in storage (the link wraps round a closed subpath).
inline bool IsSubpathStart(SegmentIntersections const& s) noexcept {
  return s.prev < 0 || s.prev != s.index - 1;
}

// Places along an edge (fractions of its parameter range) where a probe is
// tried, the middle first, and how many of a subpath's longest edges are
// tried before the first probe is taken as it is.
inline constexpr double kProbeFractions[] = {0.5, 0.3, 0.7, 0.15, 0.85, 0.4, 0.6};
inline constexpr size_t kSeedCandidates = 4;

// Whether every record of a probe segment is a plain crossing (no touch, no
// shared stretch), apart from records at t == allowLow or t == allowHigh
// (where the probe is meant to meet a curve). A probe that meets a node
// within the tolerance may count a crossing twice. O(records).
inline bool IsCleanProbe(SegmentIntersections const& s, double allowLow, double allowHigh) noexcept {
  for (Intersection const* r : s.intersections)
    if ((r->touch || r->overlapEnd) && r->t != allowLow && r->t != allowHigh) return false;
  return true;
}

// How a count treats the other curve's branch on a shared stretch, which runs
// along the own curve. Plain: as the walk along the overlap expects (the
// branch counts on the side that makes entering and leaving cancel). The
// sided forms count the change of winding just to the left (the branch put
// on the right, so that the left region does not cross it) or just to the
// right of the own curve (the branch put on the left).
enum class SidedCount { Plain, CoincidentRight, CoincidentLeft };

// Tie-break of two directions closer than the angle tolerance.
struct Tie {
  bool entering;        // the record opens a shared stretch
  bool leaving;         // it closes one
  bool assign;          // a sided count: put the branch on a fixed side
  bool ownForward;      // the own direction compared is the forward one
  bool coincidentLeft;  // that side is the left
};

// FillStateData::CountIntersection with a choice of how shared stretches
// count (see SidedCount).
void CountPassage(FillStateData& state, Intersection const* crossing, double angleTolerance,
                  std::vector<Intersection const*>* list, bool ownAsInterior, bool otherAsInterior,
                  SidedCount sided);

}  // namespace OstraCrv::weld_detail
