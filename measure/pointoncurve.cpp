// Points on segments; see pointoncurve.h.
#include "ostracrv/measure/pointoncurve.h"

#include <cmath>

#include "ostracrv/math/bezier_basis.h"

namespace OstraCrv {

namespace {

using Framework::common_types::POINT;
using MavikMath::V;

// The point at t of the segment ending at i; false where there is none. The
// count has been checked by the caller (or vouched for).
template <class T>
bool PointAt(T const* points, NODETYPE const* nodes, long i, double t, V& out) noexcept {
  if (!points || !nodes || i < 1 || !std::isfinite(t)) return false;
  const NODETYPE node = nodes[i];
  if (IsLine(node)) {
    out = MavikMath::Lerp(MavikMath::ToV(points[i - 1]), MavikMath::ToV(points[i]), t);
    return true;
  }
  if (IsCurve(node) && i >= 3) {
    out = MavikMath::CubicBezier::Evaluate(points + i - 3, t);
    return true;
  }
  return false;
}

}  // namespace

template <class T>
T GetPointOnCurve(T const* points, NODETYPE const* nodes, int n, unsigned long i, double t) {
  V v;
  if (n < 1 || i >= (unsigned long)n || !PointAt(points, nodes, long(i), t, v)) return T{};
  return MavikMath::FromV<T>(v);
}

template <class T>
bool GetPoint2dOnCurve(T const* points, NODETYPE const* nodes, int n, unsigned long i, double t, V& out) {
  if (n < 1 || i >= (unsigned long)n) return false;
  return PointAt(points, nodes, long(i), t, out);
}

bool CRV_GetPointOnCurve(POINT* out, POINT const* points, NODETYPE const* nodes, int i, double t) {
  V v;
  if (!out || !PointAt(points, nodes, long(i), t, v)) return false;
  *out = MavikMath::FromV<POINT>(v);
  return true;
}

#define OSTRACRV_INSTANTIATE_POINTS(T)                                                  \
  template T GetPointOnCurve<T>(T const*, NODETYPE const*, int, unsigned long, double); \
  template bool GetPoint2dOnCurve<T>(T const*, NODETYPE const*, int, unsigned long, double, V&);

OSTRACRV_INSTANTIATE_POINTS(POINT)
OSTRACRV_INSTANTIATE_POINTS(V)

#undef OSTRACRV_INSTANTIATE_POINTS

}  // namespace OstraCrv
