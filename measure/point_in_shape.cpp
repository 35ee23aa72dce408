// Point in shape by a probe through the point.
//
//  1. The box of all points, control points included, grown by 1 on each
//     side, must hold p (a Bezier never leaves the hull of its points, so
//     outside the box nothing can be inside). This is the cheap common
//     negative answer.
//  2. A horizontal probe across the box at p.y meets the closed subpaths.
//     The passages of the outline through the probe (probe_passages.cpp) are
//     sorted to the two sides of p (by x), with their directions; CountEdges
//     tells from the meetings whether p lies on the outline (a meeting within
//     squared distance 2.0, or a stretch of outline along the probe through
//     p). A passage with a meeting that close to p is p's own edge and is not
//     counted, so that the counts on the two sides tell where the interior
//     lies.
//  3. Inside by non-zero: the winding on either side is not 0. Inside by
//     even-odd: the count on either side is odd. The probe reaches beyond
//     the shape at both ends, so for a clean meeting both sides agree; asking
//     for either keeps a point inside when one meeting on one side was lost
//     to the tolerance.
//  4. A point on the outline answers the caller's choice. If the caller asks
//     for the side, the side whose tally is inside (before p: bit 1, behind
//     p: bit 2) is where the interior lies. A point on a horizontal edge makes
//     the horizontal probe run along that edge, which says nothing about the
//     sides; then a vertical probe at p.x (positions by y) is counted
//     instead, and the bits speak of smaller and larger y.
#include "ostracrv/measure/point_in_shape.h"

#include <cmath>
#include <vector>

#include "ostracrv/intersect/segments.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/measure/count_edges.h"
#include "probe_curves.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::V;

namespace {

// A meeting this close to p (squared distance, inclusive) puts p on the
// outline; the same constant as CountEdges.
constexpr double kOnEdgeSquared = 2.0;

RECT PointsBox(POINT const* points, int n) { return MavikMath::GetPointsBBox(points, n); }
RECT PointsBox(V const* points, int n) { return MavikMath::ToRect(MavikMath::GetPointsBBox(points, n)); }

struct Tally {
  int edgeCount[2] = {0, 0};
  int winding[2] = {0, 0};
  bool onEdge = false;
  bool onOverlap = false;

  bool InsideBefore(bool nonZero) const { return nonZero ? winding[0] != 0 : (edgeCount[0] & 1) != 0; }
  bool InsideBehind(bool nonZero) const { return nonZero ? winding[1] != 0 : (edgeCount[1] & 1) != 0; }
};

// Runs the probe between the two ends (curves[0] is replaced by it) and
// counts: whether p is on the outline from the meetings themselves, the
// crossings before and behind p from the passages of the outline.
template <class T>
Tally Probe(std::vector<IntersectionCurveT<T>>& curves, const T (&ends)[2], CoordinateSystem system, const T& p) {
  curves[0] = IntersectionCurveT<T>(ends, probe::kProbeNodes, 2, true, true);
  const SegmentsT<T> run = probe::RunProbe(curves);
  Tally tally;
  if (run.segments.empty() || run.segments[0].curve != 0) return tally;
  int unused[2];
  CountEdges(system, run.segments[0], p, unused, unused, tally.onEdge, tally.onOverlap);
  const bool swap = system.SwapsAxes();
  const V pv = MavikMath::ToV(p);
  std::vector<probe::Passage> passages;
  probe::FindPassages(run, swap, swap ? pv.x : pv.y, pv, passages);
  const double along = swap ? pv.y : pv.x;
  for (const probe::Passage& g : passages) {
    if (g.direction == 0 || g.nearestSquared <= kOnEdgeSquared) continue;  // turned back, or p's own edge
    const int side = (g.from + g.to) * 0.5 < along ? 0 : 1;
    ++tally.edgeCount[side];
    tally.winding[side] += g.direction;
  }
  return tally;
}

template <class T>
T Make(double x, double y) {
  return T{decltype(T::x)(x), decltype(T::y)(y)};
}

}  // namespace

template <class T>
bool IsPointInShape(T const* points, NODETYPE const* nodes, int n, T const& p, bool resultOnEdge, bool nonZero,
                    bool* onEdge, MavikMath::Side* side) {
  if (onEdge) *onEdge = false;
  if (side) *side = MavikMath::SideNone;
  if (!points || !nodes || n < 1) return false;
  RECT box = PointsBox(points, n);
  MavikMath::InflateRect(box, 1, 1);
  if (!MavikMath::IsPointInRect(p, box)) return false;  // also refuses NaN

  std::vector<IntersectionCurveT<T>> curves(1);
  if (probe::AppendClosedSubpaths(points, nodes, n, curves) == 0) return false;

  const T horizontal[2] = {Make<T>(box.left, double(p.y)), Make<T>(box.right, double(p.y))};
  Tally tally = Probe(curves, horizontal, CoordinateSystem::Normal, p);
  if (!tally.onEdge) return tally.InsideBefore(nonZero) || tally.InsideBehind(nonZero);

  if (onEdge) *onEdge = true;
  if (!side) return resultOnEdge;
  if (tally.onOverlap) {
    const T vertical[2] = {Make<T>(double(p.x), box.bottom), Make<T>(double(p.x), box.top)};
    tally = Probe(curves, vertical, CoordinateSystem::FlipX_Rotate270, p);
  }
  MavikMath::Side s = MavikMath::SideNone;
  if (tally.InsideBefore(nonZero)) s |= MavikMath::SideLeft;
  if (tally.InsideBehind(nonZero)) s |= MavikMath::SideRight;
  *side = s;
  return resultOnEdge;
}

template bool IsPointInShape<POINT>(POINT const*, NODETYPE const*, int, POINT const&, bool, bool, bool*,
                                    MavikMath::Side*);
template bool IsPointInShape<V>(V const*, NODETYPE const*, int, V const&, bool, bool, bool*, MavikMath::Side*);

}  // namespace OstraCrv
