// Positions on a path and the record of a closest-point search.
//
// A CurvePosition names a place on a whole path: the ordinal of the segment
// (counted over all subpaths from 0, as the segment numbering of nodetype.h),
// the indices of the segment's start and end nodes, and the parameter t in
// 0..1 on that segment. A SegmentPosition is the same inside one segment view,
// where only t is left to say.
//
// ClosestPoint<T, Position> is what a search answers: where, which point of
// the curve (rounded half away from zero for integer curves), its squared
// distance to the target in doubles, and whether it is a foot on a segment's
// interior rather than a node or a segment end. Its defaults are the state a
// search starts from: no segment, the largest double as distance.
#pragma once

#include <limits>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

struct CurvePosition {
  double t = 0.0;
  int segment = -1;    // ordinal over the whole path; negative: no position
  int startNode = -1;  // the segment's start node
  int endNode = -1;    // its line or curve node

  bool IsValid() const noexcept { return segment >= 0; }
};

struct SegmentPosition {
  double t = 0.0;
};

template <class T, class Position>
struct ClosestPoint {
  Position position{};
  T point{};
  double distanceSquared = std::numeric_limits<double>::max();
  bool interior = false;

  // Orders by distance alone.
  friend bool operator<(const ClosestPoint& a, const ClosestPoint& b) noexcept {
    return a.distanceSquared < b.distanceSquared;
  }
};

}  // namespace OstraCrv
