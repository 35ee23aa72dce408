// The weld graph: the state of one boolean operation on two filled paths.
//
// Welding (union, intersection, difference, exclusive or, knife, boundary)
// works on one graph, which is not a structure of its own: it is the
// intersection engine's result (SegmentsT over every subpath of both
// operands, self-crossings included) read as a set of edges. An Edge is the
// piece of one segment between two neighbouring intersection records, so a
// segment with n records has n + 1 edges. Three things belong to an edge and
// live in the engine's records:
//   enabled  on the record at its end (the segment's own flag for the last
//            edge): the verdicts of every pass, in the end "part of the
//            result";
//   colours  beside enabled: the knife's colouring of the two sides;
//   sides    on the record at its start (the segment's own field for the
//            first edge): bit 1 when the left side, seen along the
//            segment's forward direction, is filled by the edge's own
//            operand, bit 2 the right side.
//
// An operation: build WeldStateData (engine run, filled sides), PerformWeld
// with the operation's keep rule (a running winding count of the other
// operand along every edge decides what stays), then GenerateOutputCurve
// walks the kept edges into a path. Welding always computes in doubles; only
// the output is rounded for integer curves.
//
// Winding counts. FillStateData::CountIntersection is the one place where a
// count changes: it is applied when a walk along one curve passes a record.
// A crossing inside both segments changes the count by the sign of the
// cross product of the two tangents. Where a curve meets the other at a
// node, the count must change only if the walk really passes from one side
// to the other; this is decided by comparing the directions in which the
// curves leave the meeting point by their pseudo-angle (a monotone stand-in
// for the polar angle, see PseudoAngle), with tangents that agree within the
// angle tolerance separated by curvature. Every walk (fill probes, seeding,
// the weld pass) uses the same rule, so counts carried along a curve and
// counts cast by a probe agree.
//
// Seeds. Each subpath's counts start from a place on one of its longest
// edges where no other curve comes within the weld tolerance: there the
// graph's winding numbers are the exact ones, found by casting a ray over
// banded segments; only where no such place exists is a probe run through
// the intersection engine. Round a closed subpath a count must come back to
// its start; when one does not (curves passing a node within the tolerance
// can leave the engine with one side of a meeting), the state says so (see
// IsConsistent) and the set operations do the work again at the precise
// tolerance.
//
// Operands are cleaned first of what bounds no area but would confuse the
// graph: segments of zero length and folds (a line running straight back
// along the line before it).
//
// Bounds of work. Every walk of this header is bounded by the number of
// edges: walks along a curve stop where they come back to where they began,
// and a walk over zero-length edges stops at the first edge with length.
// The graph is built in O(s log s + k) for s segments and k meetings (the
// engine's pair search); seeding a subpath costs a pass over its edges and a
// ray over the segments in one band of heights; the weld pass and the
// output are O(e) for e edges.
#pragma once

#include <cstdint>
#include <memory>
#include <utility>
#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/polycurve.h"
#include "ostracrv/intersect/segments.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/math/side.h"
#include "ostracrv/math/vector2d.h"
#include "ostracrv/weld/weldflags.h"

namespace OstraCrv {

using WeldSegments = SegmentsT<MavikMath::V>;
namespace weld_detail {
class RayWinding;
}
using WeldCurve = IntersectionCurveT<MavikMath::V>;

// Pseudo-angle of a direction: grows with the polar angle like the angle
// itself, 0 along +x, 1 along +y, 2 along -x and 3 along -y, in [0, 4).
// Cheaper than atan2 and exact in its comparisons at the axes. (0, 0) gives
// 0; a non-finite direction gives NaN, which fails every comparison.
double PseudoAngle(MavikMath::D const& d) noexcept;

// A piece of one segment between two neighbouring records of the weld graph.
// A plain value, copied freely. `segments` null means "no edge": the result
// of walking off the end of an open subpath.
struct Edge {
  WeldSegments* segments = nullptr;
  SegmentIntersections* segment = nullptr;  // the segment the edge lies on
  Intersection* start = nullptr;            // record at its start; null at the segment's start
  Intersection* end = nullptr;              // record at its end; null at the segment's end
  int index = 0;  // list position of end (start is at index - 1); the list size for the last edge

  // The edge of `segment` ending at list position index (0 .. size).
  static Edge At(WeldSegments* segments, SegmentIntersections* segment, int index) noexcept;
  // The first edge of segment s; no edge for an index out of range.
  static Edge First(WeldSegments* segments, int s) noexcept;

  bool valid() const noexcept { return segments != nullptr && segment != nullptr; }
  explicit operator bool() const noexcept { return valid(); }
  // Same segment and list position (both "no edge" compare equal).
  bool operator==(Edge const& o) const noexcept { return segment == o.segment && index == o.index; }

  // Parameters of its two ends on the segment: start.t or 0, end.t or 1.
  double startT() const noexcept { return start ? start->t : 0.0; }
  double endT() const noexcept { return end ? end->t : 1.0; }
  // An edge between records of equal t, the first edge of a segment whose
  // first record is at t 0, the last when the last is at t 1, and every
  // edge of a segment whose points all coincide. True for no edge.
  bool isZeroLength() const noexcept;
  // The curve (index into the engine's curves) of its segment; -1 for none.
  int curve() const noexcept { return segment ? segment->curve : -1; }

  // The stored verdict, filled sides and colours (see the file comment).
  // Reads of no edge answer false and 0; writes do nothing.
  bool enabled() const noexcept;
  void setEnabled(bool on) const noexcept;
  int sides() const noexcept;
  void setSides(int s) const noexcept;
  uint32_t leftColor() const noexcept;
  uint32_t rightColor() const noexcept;
  void setLeftColor(uint32_t c) const noexcept;
  void setRightColor(uint32_t c) const noexcept;

  // The edge after this one along the curve: the next list position, then
  // the first edge of the `next` segment (wrapping in a closed subpath); no
  // edge after the end of an open subpath.
  Edge nextEdge() const noexcept;
  // The mirror of nextEdge through `prev`.
  Edge prevEdge() const noexcept;
  // prevEdge, repeated over edges of zero length; no edge at the start of an
  // open subpath or when the walk comes back to this edge.
  Edge prevEdgeNonZero() const noexcept;
  // nextEdge, repeated over edges of zero length; no edge at the end of an
  // open subpath or when the walk comes back to this edge.
  Edge nextEdgeNonZero() const noexcept;
  // Storage order: the next list position, then the first edge of the
  // segment with the next index, whatever subpath that is; no edge after the
  // last segment. Visits every edge of the graph once.
  Edge nextEdgeAbsolute() const noexcept;
  // 0 for no edge and for a zero-length edge; the distance between its ends
  // for a line; the arc length of the Bezier piece (relative accuracy about
  // 1e-10) otherwise.
  double length() const noexcept;
  // The point at parameter t of its segment (t may be any value in 0..1).
  MavikMath::V pointAt(double t) const noexcept;
  // The point at the middle of its parameter range.
  MavikMath::V midPoint() const noexcept { return pointAt(0.5 * (startT() + endT())); }

  // Crosses over to the other curve at one end of the edge: at the record
  // `start` when end > 0, else at `end` (callers pass -dir for the far end
  // of a walk in direction dir). With c the cross product of the record's
  // tangent and its twin's, times dir (c >= 0: the twin's forward direction
  // lies to the walker's left), the "turning side" is side 1 when dir > 0
  // and side 2 otherwise; on it the walk takes the twin curve's branch on
  // the walker's left (the edge starting at the twin when c >= 0, else the
  // edge ending there; newDir +1 or -1 accordingly), on the other side the
  // opposite branch. newSide is, when end equals dir, 2 for c >= 0 and 1
  // otherwise, and when they differ 1 for c >= 0 and 2 otherwise. No edge
  // (outputs untouched) when that record is null or side is not 1 or 2.
  Edge nextEdgeFollowingIntersection(int end, int dir, MavikMath::Side side, int& newDir,
                                     MavikMath::Side& newSide) const noexcept;
  // The pseudo-angle of going straight on at the far end, for sorting the
  // branches of a junction: 2 (half a turn) inside a segment; at a node the
  // pseudo-angle between the direction back along this segment and the
  // direction on along the next segment that has length, in [0, 4).
  double pseudoAngleToNext(int dir) const noexcept;
};

// Winding state of the other operand at a place on an edge.
struct FillStateData {
  int32_t winding = 0;   // winding number of the other operand here
  int32_t overlaps = 0;  // overlaps open here

  // Updates the counts when a walk passes the record `crossing` (on the walked
  // curve; crossing->other is on the curve passed). An overlap record opens
  // (its overlapEnd lies ahead) or closes an overlap: overlaps and the list,
  // if given, follow (a closing record removes the entry of its opening
  // record). Then the winding changes as the two curves' directions say: a
  // crossing inside both segments by the sign of the cross product of the
  // tangents (-1 when the other curve runs to the walker's left); at a node
  // of either curve by comparing the directions leaving the point (see the
  // file comment). ownAsInterior / otherAsInterior make a record at t 0 or 1
  // of that curve count as an interior point.
  void CountIntersection(Intersection const* crossing, double angleTolerance,
                         std::vector<Intersection const*>* overlaps, bool ownAsInterior, bool otherAsInterior);
};

// What a keep rule sees of one operand at one edge.
struct EdgeStateData {
  bool nonZero = false;  // the operand is filled by the non-zero rule (else even-odd)
  bool inside = false;   // the place lies in the operand's filling, or on it
  bool onEdge = false;   // the edge lies on this operand's outline
  int sides = 0;         // filled sides of the stretch of this operand's outline there
};

// A keep rule: true when the edge belongs to the result.
using WeldKeepRule = bool (*)(bool fromFirst, EdgeStateData first, EdgeStateData second);

class WeldStateData {
 public:
  using V = MavikMath::V;

  std::vector<WeldCurve> curves;  // kept subpaths: first operand's, then second's
  PolycurveT<V> first, second;    // the operands; curves point into their arrays
  std::vector<bool> openSubpaths;  // per subpath of both operands: its first node lacks the closed bit
  // Loose bounds of each operand inflated by 1000 (the second stays the
  // zero box, inflated, for an empty operand). Kept in doubles: double
  // operands may lie beyond the integer range.
  MavikMath::BoundsT<double> firstBounds, secondBounds;
  bool firstNonZero = false, secondNonZero = false;
  int firstCurveCount = 0;  // how many of curves come from the first operand
  int currentCurve = 0;     // curve of the edge being handled
  std::unique_ptr<WeldSegments> segments;
  std::vector<Intersection const*> openOverlaps;  // overlaps open at the current place of the weld pass
  std::vector<int> doneSubpaths;                  // knife: curves already classified
  double angleTolerance = 0.001;
  double tolerance = 1.4142135624;
  WeldFlags flags = WeldFlags::None;

  // Builds the graph over both operands: one engine curve per subpath of at
  // least 2 points that is closed or, with includeOpen, open. Subpaths with a
  // non-finite coordinate take no part (a graph through them would carry NaN
  // into the result). Computes the filled sides when alwaysFillSides, either
  // rule is non-zero, or the engine found overlaps; otherwise every sides
  // stays 0 (two even-odd operands without overlaps need none). Never fails:
  // empty operands give no curves.
  WeldStateData(PolycurveT<V> const& first, bool firstNonZero, PolycurveT<V> const& second, bool secondNonZero,
                bool includeOpen, bool alwaysFillSides, WeldFlags flags);
  WeldStateData(WeldStateData const&) = delete;
  WeldStateData& operator=(WeldStateData const&) = delete;
  ~WeldStateData();

  // The first edge of the graph in storage order; no edge for an empty graph.
  Edge FirstEdge() const noexcept;
  // Whether curve c (or the edge's curve) comes from the first operand.
  bool IsFirstCurve(int c) const noexcept { return c >= 0 && c < firstCurveCount; }
  bool IsOnFirst(Edge const& e) const noexcept { return IsFirstCurve(e.curve()); }
  // The open-subpath bit looked up by a curve index (see openSubpaths);
  // false out of range.
  bool IsOpenCurve(int c) const noexcept;

  // Computes sides(edge) for every edge: the winding of the own operand on
  // both sides, seeded per subpath (on a closed one at one of its longest
  // edges, on an open one at its first edge with length) and carried along
  // the curve across the operand's own crossings, where another curve of the
  // operand joining or leaving along a shared stretch changes only the side
  // it lies on.
  void PopulateFilledSides();
  // From edge forward, the first edge whose parameter range is longer than
  // the angle tolerance and that lies on no shared stretch (of any curve);
  // no edge if the walk comes back or runs off an open end. A shared
  // stretch is known from the record that opens it; a stretch never runs
  // past the end of its segment, so from the first edge of a segment (where
  // callers start) the count is exact.
  Edge FindNonZeroNonOverlappingEdge(Edge edge) const;

  // The winding state of the other operand at the start of edge: a ray from
  // outside the other operand's bounds to a safe place on the curve, then a
  // walk back to edge undoing the records passed. 0, 0 where no safe place
  // exists. Clears openOverlaps.
  FillStateData SeedFillState(Edge edge);
  // Asks keep about every edge (in storage order, carrying the winding of the
  // other operand) and leaves the answer in enabled(edge). Zero-length edges
  // and edges inside their own non-zero filling are never kept.
  void PerformWeld(WeldKeepRule keep);
  // Whether the graph proved consistent: every winding count carried round a
  // closed subpath (the filled sides, the weld pass) came back to its start.
  // False when the engine, at the weld tolerance, reported a meeting on one
  // segment but not its partner (two curves passing within the tolerance of
  // a node): the result may then have open or wrong loops.
  bool IsConsistent() const noexcept { return consistent_; }
  // The number of loops that the last GenerateOutputCurve (without
  // OpenResult) could not close within the tolerance, before ForceClose.
  // Where nodes of both operands crowd closer than the tolerance, the graph
  // can snap them into meetings that no walk can get through.
  int UnclosedLoops() const noexcept { return unclosedLoops_; }

  // The next edge of an output walk from edge in direction dir on side side:
  // a turn onto another curve at the far end (tried on both sides, and at
  // every record sitting on the same spot) or straight on along the curve,
  // turn first unless FollowCurve is set. dir and side change only when a
  // turn is taken. The result may be disabled or no edge: the caller tests
  // enabled. With stopAtKnife, a walk along the shape stops at a valid knife
  // edge.
  Edge FindNextEdge(Edge edge, bool stopAtKnife, MavikMath::Side& side, int& dir);
  // Knife: spreads color from edge over the faces it reaches without crossing
  // a valid knife edge (an explicit stack; a closed loop ends where the colour
  // is already present).
  void ColorAndFollow(Edge edge, unsigned int color, int dir, MavikMath::Side side, bool fromKnife);
  // Knife: enabled(edge) becomes whether one of its colours is color and it
  // has length.
  void ResetState(unsigned int color);
  // Knife: whether a walk along the shape in direction dir is stopped at the
  // far end of edge by an enabled knife edge.
  bool DoesIntersectWithValidKnife(Edge edge, int dir) const;

  // Walks the enabled edges into a path, one subpath per loop, each loop
  // starting on its first enabled edge in storage order and running forward
  // along it; continuity is copied from the input nodes the walk passes, and
  // nodes at intersections are cusps. Consumes enabled. For integer output
  // every computed coordinate rounds half away from zero. knife: walk both
  // sides of the knife's edges (see the knife's colours).
  template <class T>
  PolycurveT<T> GenerateOutputCurve(bool knife);

 private:
  int edgeTotal = 0;          // edges in the graph: the bound of every walk
  bool sidesFilled_ = false;  // PopulateFilledSides has run
  bool consistent_ = true;    // every count came back to its start round each loop
  int firstSegmentCount_ = 0;  // segments of the first operand's curves
  std::vector<MavikMath::BoundsT<double>> curveBoxes_;  // loose box of each curve, for probes
  // Exact ray casting over each operand's curves, built on first use.
  mutable std::unique_ptr<weld_detail::RayWinding> rays_[2];
  weld_detail::RayWinding const& Rays(bool firstOperand) const;
  int unclosedLoops_ = 0;      // loops the output walk could not close

  // Runs CountIntersection for every record of probe segment `s` of a probe
  // engine, skipping records at t == skipT (NaN skips none).
  static FillStateData CountProbe(SegmentIntersections const& s, double angleTolerance, double skipT);
  // The probe curves: the probe, then every curve of one operand whose box
  // meets the probe's, inactive.
  // Which shared stretches a safe edge must avoid: those with any curve, with
  // the other operand, with the own operand's curves, or none.
  enum class SharedWith { Anything, OtherOperand, OwnOperand, Nothing };
  // The edges of edge's subpath that have a parameter range longer than the
  // angle tolerance and lie on no shared stretch of the kind given, the
  // `count` with the longest chords first (their middles lie furthest from
  // the meetings that bound them); count 0 asks for the first such edge in
  // walking order. At most kMaxSafeEdges are kept. O(edges of the subpath),
  // allocating nothing once the scratch list has grown to the longest
  // subpath.
  static constexpr size_t kMaxSafeEdges = 4;
  struct SafeEdgeList {
    Edge edges[kMaxSafeEdges];
    size_t size = 0;
    bool empty() const noexcept { return size == 0; }
  };
  SafeEdgeList SafeEdges(Edge edge, SharedWith avoid, size_t count) const;
  mutable std::vector<std::pair<double, Edge>> safeScratch_;  // SafeEdges' candidates
  // The left and right winding of the own operand beside cur at the given
  // fraction of its parameter range: by an exact ray (towards -x, or -y on
  // a horizontal edge) where no other curve of the operand comes within the
  // tolerance, else by a probe along the normal; true for a ray, or a probe
  // that met nothing but plain crossings.
  bool SeedSides(Edge const& cur, double fraction, bool ownFirst, int& left, int& right) const;
  std::vector<WeldCurve> ProbeCurves(V const* points, NODETYPE const* nodes, int count, bool ownFirst) const;
  // The bits of the other operand's filled sides under an overlap entry
  // (PerformWeld, open overlaps).
  int OverlapSides(Edge const& edge, Intersection const* entry) const;
  // The kept continuation at the far end of edge among all records of the
  // junction there (see FindNextEdge); the sharpest left turn.
  Edge FindJunctionEdge(Edge const& edge, MavikMath::Side& side, int& dir) const;
  // Whether the output edge is bounded by crossings with closed curves on
  // both sides (TrimDangling).
  bool IsBounded(Edge const& edge) const;
};

// The output walk of a graph whose edges are all disabled except the
// loops to draw. (Declared for both point kinds.)
extern template PolycurveT<Framework::common_types::POINT>
WeldStateData::GenerateOutputCurve<Framework::common_types::POINT>(bool);
extern template PolycurveT<MavikMath::V> WeldStateData::GenerateOutputCurve<MavikMath::V>(bool);

// A curve of exactly one subpath whose first and last points are equal is
// turned (as a closed subpath) so that it starts at its first enabled node
// that is not a control point; its closed bits are restored afterwards.
// Every other curve is returned as it came.
template <class T>
PolycurveT<T> RotateToFirstEnabled(PolycurveT<T> curve);

}  // namespace OstraCrv
