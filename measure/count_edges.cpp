// Edge tally along a probe.
//
// For each record r of the probe (o its twin on the edge):
//  1. A meeting within squared distance 2.0 of p (inclusive: p on the edge
//     or one integer step from it, diagonals included) marks p as on the
//     edge and is not counted.
//  2. The meeting is before p when its position along the probe is smaller.
//  3. A meeting at a node is reported on both edges there: at the end of the
//     edge arriving (o.t = 1) and at the start of the edge leaving (o.t = 0).
//     The record at a start is dropped when the edge leaves in the positive
//     direction across the probe, the one at an end when the edge arrives in
//     the negative direction. An outline passing through keeps exactly one of
//     the two, and one that turns back keeps both (a pair of opposite
//     crossings) or neither; either way the parity and the winding come out
//     as for a probe moved slightly off the node. Records that open or close
//     a stretch shared with an edge are not counted either.
//  4. The counted meeting adds 1 to its side's count and its crossing sign to
//     the side's winding.
//  5. A record that is not counted, lies before p and opens a shared stretch
//     that ends beyond p puts p on that stretch: p lies on the edge, along.
//
// The rule needs both reports of a meeting at a node, which the engine does
// not always keep (see probe_passages.cpp); the point-in-shape test takes its
// counts from the passages of the outline and this tally for whether p lies
// on the outline.
//
// A meeting is at a node when its parameter on the edge lies within 1e-9 of
// 0 or 1 (probe_curves.h): a crossing found at a node has a computed
// parameter, not an exact one, and must still be taken as lying on the node.
#include "ostracrv/measure/count_edges.h"

#include <cmath>

#include "probe_curves.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr double kOnEdgeSquared = 2.0;

}  // namespace

template <class T>
void CountEdges(CoordinateSystem system, const SegmentIntersections& probe, T p, int* edgeCount, int* winding,
                bool& onEdge, bool& onOverlap) {
  int counts[2] = {0, 0}, turns[2] = {0, 0};
  onEdge = false;
  onOverlap = false;
  const bool swap = system.SwapsAxes();
  const V pv = MavikMath::ToV(p);
  const double pAlong = swap ? pv.y : pv.x;
  auto along = [swap](const V& q) { return swap ? q.y : q.x; };
  auto across = [swap](const MavikMath::D& v) { return swap ? v.x : v.y; };

  for (const Intersection* r : probe.intersections) {
    const Intersection* o = r ? r->other : nullptr;
    if (!o) continue;
    const V q = probe::Seen<T>(r->point);
    const double dx = q.x - pv.x, dy = q.y - pv.y;
    if (dx * dx + dy * dy <= kOnEdgeSquared) {
      onEdge = true;
      continue;
    }
    const bool before = along(q) < pAlong;
    const double dir = across(o->tangent);
    const bool atStart = probe::AtStart(o->t), atEnd = probe::AtEnd(o->t);
    const bool counted = !((atStart && dir > 0) || (atEnd && dir < 0) || r->overlapEnd);
    if (counted) {
      const int side = before ? 0 : 1;
      ++counts[side];
      if (dir > 0)
        ++turns[side];
      else if (dir < 0)
        --turns[side];
    } else if (before && r->overlapEnd && pAlong < along(probe::Seen<T>(r->overlapEnd->point))) {
      onEdge = true;
      onOverlap = true;
    }
  }
  if (edgeCount) {
    edgeCount[0] = counts[0];
    edgeCount[1] = counts[1];
  }
  if (winding) {
    winding[0] = turns[0];
    winding[1] = turns[1];
  }
}

template void CountEdges<POINT>(CoordinateSystem, const SegmentIntersections&, POINT, int*, int*, bool&, bool&);
template void CountEdges<V>(CoordinateSystem, const SegmentIntersections&, V, int*, int*, bool&, bool&);

}  // namespace OstraCrv
