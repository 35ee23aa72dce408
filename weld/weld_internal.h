// Helpers shared by the source files of welding; not part of the interface.
#pragma once

#include <cstdint>
#include <vector>

#include "ostracrv/core/nodetype.h"
#include "ostracrv/intersect/segments.h"
#include "ostracrv/math/rect.h"
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

// The operand without segments of zero length and without folds (a line
// running straight back along the line before it), which bound no area but
// would confuse the graph; shared unchanged when there are none. O(n).
PolycurveT<MavikMath::V> CleanWeldOperand(PolycurveT<MavikMath::V> const& c);

// The operand without segments all of whose points lie closer than distance
// to their start (the next segment starts where the outline has got to, its
// first handle moving with it; a closed outline still ends on its start),
// then cleaned as above. Moves the outline by less than distance. Shared
// unchanged when nothing is that short. O(n).
PolycurveT<MavikMath::V> CollapseShortSegments(PolycurveT<MavikMath::V> const& c, double distance);

// Where probes are tried until one meets nothing but plain crossings: which
// of a subpath's longest edges (0 the longest) and where along it (a
// fraction of its parameter range). Several edges, since the longest may be
// a side of a thin spike whose other side lies within the tolerance of it
// all along; but few tries, since where curves crowd closer than the
// tolerance no place is clean, and the first probe is then taken.
struct ProbePlace {
  size_t candidate;
  double fraction;
};
inline constexpr ProbePlace kProbePlan[] = {{0, 0.5}, {1, 0.5}, {2, 0.5}, {3, 0.5}, {0, 0.3}, {1, 0.3}};
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

// Exact winding numbers of a set of curves at single places (see
// ray_winding.cpp).
class RayWinding {
 public:
  // Over the segments of curves[from .. to).
  RayWinding(std::vector<WeldCurve> const& curves, size_t from, size_t to);
  // The winding number (counter-clockwise loops +1) at q, leaving out the
  // crossing of the segment whose first point is *skip at parameter skipT
  // (the segment q lies on; null for none), by a ray towards -x (axis 0) or
  // towards -y (axis 1). False when a segment other than that one comes
  // within tolerance of q, or q is not finite.
  bool Winding(MavikMath::V q, double tolerance, MavikMath::V const* skip, double skipT, int& winding,
               int axis = 0) const;

 private:
  struct Piece {
    MavikMath::V const* points = nullptr;
    bool bezier = false;
    MavikMath::BoundsT<double> box;
  };
  // The bands of one direction of ray: band b holds pieces
  // items[bandStart[b] .. bandStart[b + 1]), in order along the ray once
  // sorted[b] is set.
  struct Index {
    bool built = false;
    size_t bandCount = 0;
    std::vector<uint32_t> bandStart, items;
    std::vector<uint32_t> firstBand;  // per piece
    std::vector<char> sorted;         // per band: put in order along the ray
  };
  void Build(int axis) const;
  size_t Band(Index const& x, double across, int axis) const noexcept;
  static int Crossings(Piece const& s, MavikMath::V q, double skipT, int axis);

  std::vector<Piece> pieces_;
  MavikMath::BoundsT<double> box_;
  mutable Index index_[2];  // built on first use
};

}  // namespace OstraCrv::weld_detail
