// Point in polygon by crossings of the horizontal through the point.
//
// Each edge is taken from its lower end `low` to its upper end `high` (for
// equal heights the current point is `low`, and such an edge is then never
// counted). An edge counts when low.y < p.y <= high.y: half-open, so that a
// horizontal line through a vertex counts the vertex once where the outline
// passes through it and twice or not at all where it turns back. Which side
// of p the crossing lies on is the sign of the cross product
//     c = (p.y - low.y)(high.x - low.x) - (high.y - low.y)(p.x - low.x),
// in doubles (exact for integer input up to 2^26 or so, and only its sign is
// used): c > 0 means p lies left of the upward edge, so the edge lies to the
// right of p. Edges through p itself (c = 0) count on the left.
//
// The vertex test compares the squared distance with 2.0, inclusive: a point
// on a vertex or one integer step away, diagonals included, is on the
// outline. The same constant serves both point kinds.
#include "ostracrv/measure/point_in_polygon.h"

#include <cmath>

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {
constexpr double kVertexNearSquared = 2.0;
}

template <class T>
bool IsPointInPolygon(T const* points, int n, T const& p, bool anyOnBothSides, bool testVertices, bool* onEdge) {
  if (onEdge) *onEdge = false;
  if (!points || n < 1) return false;
  const double px = double(p.x), py = double(p.y);
  if (!std::isfinite(px) || !std::isfinite(py)) return false;

  int right = 0, left = 0;  // the counts A and B
  const T* prev = &points[n - 1];
  for (int i = 0; i < n; ++i) {
    const T* cur = &points[i];
    if (testVertices) {
      const double dx = double(cur->x) - px, dy = double(cur->y) - py;
      if (dx * dx + dy * dy <= kVertexNearSquared) {
        if (onEdge) *onEdge = true;
        return true;
      }
    }
    const T* low = cur;
    const T* high = prev;
    if (double(prev->y) < double(cur->y)) {
      low = prev;
      high = cur;
    }
    const double ly = double(low->y), hy = double(high->y);
    if (ly < py && py <= hy) {
      const double lx = double(low->x), hx = double(high->x);
      const double c = (py - ly) * (hx - lx) - (hy - ly) * (px - lx);
      if (c > 0)
        ++right;
      else
        ++left;
    }
    prev = cur;
  }
  if (anyOnBothSides) return right > 0 && left > 0;
  return (right & 1) && (left & 1);
}

template bool IsPointInPolygon<POINT>(POINT const*, int, POINT const&, bool, bool, bool*);
template bool IsPointInPolygon<V>(V const*, int, V const&, bool, bool, bool*);

}  // namespace OstraCrv
