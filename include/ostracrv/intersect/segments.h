// The intersection engine: every crossing, touch and overlap among the
// segments of a set of curves, as linked records.
//
// Use: fill a vector of IntersectionCurveT<T> (one per curve, usually one per
// subpath), pick a SegmentIntersectionSettings (intersection_settings.h has
// the ready-made ones) and construct SegmentsT<T>. The constructor does all
// the work; afterwards `segments[i].intersections` holds, for every line and
// Bezier segment of every curve, its meetings sorted by parameter, and each
// record reaches its twin on the other segment through `other`.
//
// The run:
//  1. One SegmentIntersections per segment, curve after curve in node order,
//     linked to its neighbours in the subpath (wrapping when closed).
//  2. Pairs of segments are visited in a fixed order: each segment i of an
//     active curve drives the search (a self-crossing of a Bezier first, if
//     its curve is self-tested), against every later segment of an active
//     curve and every segment of an inactive curve, in ascending index. A
//     curve that is not active is therefore only a target: a short active
//     probe against many inactive curves tests the probe alone.
//  3. Each list is sorted by t; then clean-up passes drop, as the settings
//     ask, records of overlaps, a crossing on a node found on both segments
//     there, and the same meeting reported once as a touch and once as a
//     crossing.
//
// Pair pruning. Every pair test begins with a test of the two segments'
// boxes, inflated by the larger of the end and touch tolerances, and a pair
// that fails it adds nothing. Instead of visiting all pairs (quadratic in the
// number of segments) the engine by default finds the pairs that pass the box
// test with a bounding volume hierarchy over the driving segments, and visits
// exactly those, in the same order; the records are identical to those of the
// plain loop (PairSearch::AllPairs), which is kept as the reference.
// Cost with pruning: O(a log a + m log a + k) for the pair search, a the
// number of segments of active curves, m of inactive ones, k the pairs whose
// boxes meet; then a constant per pair and per record, and O(r log r) to sort
// a list of r records.
//
// Overlap bookkeeping. An overlap is four records: a pair at each end of the
// shared stretch, the two records of each segment linked by overlapEnd.
// overlapCount grows by 2 per overlap found. Removing the pair at one end
// unlinks the pair at the other end too and lowers the count by one for each
// of the two segments, that is by 2 in all: the count stays at twice the
// number of live overlaps and is never lowered again for the second pair,
// which is then an ordinary meeting. Its one reader asks only whether it is
// above zero.
//
// Bad input never crashes: a curve with fewer than 2 nodes, a null node
// array or a null point array has no records; segments whose points are all
// equal are kept (so that numbering follows the nodes) but take no part; a
// segment with a non-finite coordinate fails every box test and meets
// nothing.
#pragma once

#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/intersect/intersection.h"
#include "ostracrv/intersect/intersection_settings.h"
#include "ostracrv/intersect/segment_intersections.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// One input curve. The arrays are borrowed and must stay unchanged while the
// engine object lives.
template <class T>
struct IntersectionCurveT {
  T const* points = nullptr;
  NODETYPE const* nodes = nullptr;
  int count = 0;
  bool active = true;       // its segments drive the search; otherwise only a target
  bool selfTest = false;    // its segments are tested against each other and its Beziers against themselves
  bool callerMark = false;  // the caller's; the engine neither reads nor writes it
  std::vector<int> intersectsWith;  // the curves it meets, without duplicates

  IntersectionCurveT() = default;
  IntersectionCurveT(T const* points_, NODETYPE const* nodes_, int count_, bool active_, bool selfTest_,
                     bool callerMark_ = false)
      : points(points_), nodes(nodes_), count(count_), active(active_), selfTest(selfTest_),
        callerMark(callerMark_) {}

  // Adds curve to intersectsWith unless it is there (a linear search).
  void SetIntersectsWith(int curve) {
    for (int c : intersectsWith)
      if (c == curve) return;
    intersectsWith.push_back(curve);
  }
};

// How the engine finds the pairs of segments to test.
enum class PairSearch {
  Pruned,    // only the pairs whose inflated boxes meet, found by a hierarchy of boxes
  AllPairs,  // every pair, each rejected by its own box test: the plain reference
};

template <class T>
class SegmentsT {
 public:
  std::vector<SegmentIntersections> segments;  // all segments of all curves, in node order
  bool hasIntersections = false;               // some record exists
  int cursorSegment = 0;                       // start of GetAllIntersections; reset on every change
  int cursorIndex = 0;
  std::vector<IntersectionCurveT<T>> curves;  // a copy of the input, with intersectsWith filled in
  int overlapCount = 0;                       // twice the number of live overlaps

  SegmentsT() = default;
  // Copies the curves and runs GenerateIntersections.
  SegmentsT(const std::vector<IntersectionCurveT<T>>& curves, const SegmentIntersectionSettings& settings,
            PairSearch search = PairSearch::Pruned);
  SegmentsT(const SegmentsT&) = delete;
  SegmentsT& operator=(const SegmentsT&) = delete;
  SegmentsT(SegmentsT&&) noexcept = default;
  SegmentsT& operator=(SegmentsT&&) noexcept = default;
  ~SegmentsT() = default;

  // The whole run on `curves`. A used object first drops all its records and
  // segments and clears intersectsWith and the counts.
  void GenerateIntersections(const SegmentIntersectionSettings& settings, PairSearch search = PairSearch::Pruned);

  // Every record, segment after segment, each in list order, from the cursors
  // (which are always at the start, so every record). O(s + r).
  std::vector<Intersection*> GetAllIntersections() const;

  // Removes a record and its twin and deletes both; unlinks an overlap they
  // belong to (the other end's pair stays, as an ordinary meeting). Null and
  // records of no segment of this object are ignored (nothing is deleted).
  void RemoveIntersection(Intersection* record);
  // Removes every record of the segments of one curve (and their twins), then
  // rebuilds intersectsWith and hasIntersections. A bad index only rebuilds.
  void RemoveIntersections(int curve);
  // Removes every record whose enabled flag is false (with its twin) and
  // rebuilds intersectsWith and hasIntersections from the records that stay.
  // O(r * l) for r records and lists of length l.
  void RemoveInvalidIntersections();

  // Points of the segment's first node, or null for a bad index or a curve
  // without points.
  T const* SegmentPoints(int segment) const noexcept;
};

// Appends the segments of one curve to `segments` (see step 1 above). Does
// nothing for fewer than 2 nodes or a null node array; a null point array
// gives segments that are never degenerate (their points cannot be read). A
// malformed stretch (an arc without room for its Bezier, a segment before the
// first node) ends the walk. O(count).
template <class T>
void InitializeSegments(int curve, T const* points, NODETYPE const* nodes, int count,
                        std::vector<SegmentIntersections>& segments);

// Visits all pairs in the engine's order (step 2), each through
// AddSegmentIntersections, which rejects pairs whose boxes do not meet.
// O(s^2) for s segments.
template <class T>
void FindAllIntersections(SegmentsT<T>& segments, const SegmentIntersectionSettings& settings);
// The same records as FindAllIntersections, visiting only pairs whose boxes
// meet (see Pair pruning above).
template <class T>
void FindAllIntersectionsPruned(SegmentsT<T>& segments, const SegmentIntersectionSettings& settings);
// The pairs of one driving segment: every later segment of an active curve
// and every segment of an inactive curve, skipping degenerate segments and,
// unless self-tested, segments of its own curve. O(s).
template <class T>
void FindAllIntersectionsWithSegment(int index, SegmentIntersections& segment, SegmentsT<T>& segments,
                                     const SegmentIntersectionSettings& settings);
// Tests one pair and adds what it finds: dispatches on the two kinds, putting
// the line first for a line and a Bezier (the joint is mirrored with it).
// Returns at once if either curve has no points.
template <class T>
void AddSegmentIntersections(int first, int second, SegmentIntersections& firstSegment,
                             SegmentIntersections& secondSegment, JointType joint, SegmentsT<T>& segments,
                             const SegmentIntersectionSettings& settings);

// The crossing that reports the same meeting as the touch record `touch`:
// on the touch's segment, scanning from the end when the touch is at t = 1
// and from the start otherwise, the first record that is enabled, no touch,
// no overlap end, and meets the same other segment. It is the answer if it
// lies closer than squaredTolerance (squared distance) to the touch, or closer
// than twice that and the stretch between the two meetings is shared by the
// two segments. Null otherwise, and for a null touch.
template <class T>
Intersection* FindIntersectionCloseToTouch(SegmentsT<T>& segments, Intersection* touch, double squaredTolerance);

// Adds a pair of records: the first (t, segment, tangent, curvature) on
// `segment`, the second on otherSegment, both at point with the same touch
// flag, linked through other. Tangents are scaled to unit length when asked
// and long enough (squared length above kEpsilon). Resets the cursors, notes
// the two curves in each other's intersectsWith and sets hasIntersections.
// Does nothing for a bad segment index.
template <class T>
void AddIntersection(double t, int segment, const MavikMath::D& tangent, double curvature, double otherT,
                     int otherSegment, const MavikMath::D& otherTangent, double otherCurvature,
                     const MavikMath::V& point, SegmentsT<T>& segments, bool normalizeTangents, bool touch);

}  // namespace OstraCrv
