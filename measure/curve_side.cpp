// Side of a path: the nearest segment decides.
//
// The nearest point of the whole path names a segment by its end node. For a
// line from q0 to q1 the side is the sign of
//     c = (q1 - q0).x (p - q0).y - (q1 - q0).y (p - q0).x,
// in doubles: positive is left of the direction of travel (y up), negative
// right, zero on the line's carrier. For a Bezier the math library's side
// search takes the power-basis coefficients of the segment's four points.
#include "ostracrv/measure/curve_side.h"

#include "ostracrv/core/curveposition.h"
#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_side.h"
#include "ostracrv/measure/closest.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

template <class T>
MavikMath::Side GetSide(T const* points, NODETYPE const* nodes, int n, T const& p) {
  ClosestPoint<T, CurvePosition> nearest;
  if (!FindClosestPoint(points, nodes, n, p, nearest)) return MavikMath::SideNone;
  const int end = nearest.position.endNode;
  if (end < 1 || end >= n) return MavikMath::SideNone;
  if (IsCurve(nodes[end]) && end >= 3) {
    const MavikMath::CubicBezier::PowerBasis basis = MavikMath::CubicBezier::GetPowerBasis(points + end - 3);
    double t = 0.0;
    return MavikMath::CubicBezier::GetSide(p, basis.a, basis.b, basis.c, basis.d, t);
  }
  if (IsLine(nodes[end])) {
    const V q0 = MavikMath::ToV(points[end - 1]), q1 = MavikMath::ToV(points[end]), pv = MavikMath::ToV(p);
    const double c = (q1.x - q0.x) * (pv.y - q0.y) - (q1.y - q0.y) * (pv.x - q0.x);
    if (c > 0) return MavikMath::SideLeft;
    if (c < 0) return MavikMath::SideRight;
  }
  return MavikMath::SideNone;
}

template MavikMath::Side GetSide<POINT>(POINT const*, NODETYPE const*, int, POINT const&);
template MavikMath::Side GetSide<V>(V const*, NODETYPE const*, int, V const&);

}  // namespace OstraCrv
