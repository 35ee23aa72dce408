// Internal to the point-in-shape code: the probe run and the passages of a
// shape's outline through the probe.
//
// A probe run asks the intersection engine where a straight probe meets the
// closed subpaths of a shape. The probe comes first, as a two-node open path,
// active (it drives the search); each closed subpath follows as a target that
// is not active, so the subpaths are never tested against each other and a run
// costs one pass over the shape's segments. Open subpaths are no part of a
// shape and are left out.
#pragma once

#include <cmath>
#include <type_traits>
#include <vector>

#include "ostracrv/core/nodetype.h"
#include "ostracrv/intersect/segments.h"

namespace OstraCrv::probe {

// A meeting whose parameter on its edge lies this close to 0 or 1 is at the
// edge's end node. Looser than one rounding unit because the parameter of a
// crossing found at a node is computed, not set; 1e-9 of an edge is far below
// the probe tolerance for any edge shorter than a hundred thousand units.
inline constexpr double kAtNode = 1e-9;

inline bool AtStart(double t) { return std::fabs(t) <= kAtNode; }
inline bool AtEnd(double t) { return std::fabs(t - 1.0) <= kAtNode; }

// A meeting point as the point kind sees it: rounded for integer curves.
template <class T>
MavikMath::V Seen(const MavikMath::V& q) {
  if constexpr (std::is_same_v<T, Framework::common_types::POINT>)
    return MavikMath::ToV(MavikMath::FromV<Framework::common_types::POINT>(q));
  else
    return q;
}

// The node bytes of the probe: an open move and a line (user nodes).
inline constexpr NODETYPE kProbeNodes[2] = {0x04, 0x44};

// Appends one target curve per closed subpath of the path, in order, and
// returns how many were appended. O(n).
template <class T>
int AppendClosedSubpaths(T const* points, NODETYPE const* nodes, int n, std::vector<IntersectionCurveT<T>>& curves) {
  int added = 0;
  for (int first = 0; first >= 0 && first < n;) {
    const int last = CRV_LastNodeOfThisSubpath(nodes, n, first);
    if (last < first) break;
    if (IsClosedNode(nodes[first])) {
      curves.emplace_back(points + first, nodes + first, last - first + 1, false, true);
      ++added;
    }
    first = last + 1;
  }
  return added;
}

// The run of the engine with the point-in-shape settings.
template <class T>
SegmentsT<T> RunProbe(const std::vector<IntersectionCurveT<T>>& curves) {
  return SegmentsT<T>(curves, PointInShapeIntersectionSettings());
}

// One passage of an outline from one side of the probe to the other: a
// group of meetings with the probe (crossings, touches at nodes, shared
// stretches) between a stretch of the outline clearly on one side and the
// next stretch clearly on the other side.
struct Passage {
  double from = 0.0, to = 0.0;  // positions along the probe of its first and last meeting, from <= to
  int direction = 0;            // +1 from smaller to larger coordinate across the probe, -1 back
  double nearestSquared = 0.0;  // smallest squared distance from p to one of its meetings
};

// The passages of every closed subpath of the run (curves 1 and on) through
// the probe (curve 0, a straight line). swap: positions along the probe are
// y and across it x (a vertical probe); row: the probe's coordinate across.
// Positions along the probe are exact; for the distance from p, meeting
// points are rounded first for integer curves. Appends to out. O(n) for n segments.
template <class T>
void FindPassages(const SegmentsT<T>& run, bool swap, double row, const MavikMath::V& p, std::vector<Passage>& out);

}  // namespace OstraCrv::probe
