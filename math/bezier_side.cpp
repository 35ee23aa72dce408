// Side of a point relative to a Bezier; see bezier_side.h for the method.
//
// Constants:
//   kOnCurveUlps 64: a target this many units in the last place of the
//     coordinate magnitude from the curve is on it; the nearest point itself
//     is only that accurate.
#include "ostracrv/math/bezier_side.h"

#include <limits>

#include "bezier_common.h"
#include "ostracrv/math/bezier_closest.h"
#include "ostracrv/math/bezier_derivatives.h"

namespace MavikMath::CubicBezier {

namespace {

using internal::Magnitude;
using Framework::common_types::POINT;

constexpr double kOnCurveUlps = 64.0;

// Control points from the power basis: p1 = d + c/3, p2 = p1 + (b + c)/3,
// p3 = a + b + c + d.
void ControlPoints(const V& a, const V& b, const V& c, const V& d, V* p) noexcept {
  p[0] = d;
  p[1] = V{d.x + c.x / 3.0, d.y + c.y / 3.0};
  p[2] = V{p[1].x + (b.x + c.x) / 3.0, p[1].y + (b.y + c.y) / 3.0};
  p[3] = V{a.x + b.x + c.x + d.x, a.y + b.y + c.y + d.y};
}

}  // namespace

template <class T>
bool GetSide(const T& target, const V& a, const V& b, const V& c, const V& d, double& t, V& closest,
             double& squaredDistance, Side& side) noexcept {
  V p[4];
  ControlPoints(a, b, c, d, p);
  const V P = ToV(target);
  double u = 0.0, dist = std::numeric_limits<double>::max();
  V foot;
  if (!FindClosestPointOnBezier(p, P, u, foot, dist)) return false;
  const D dir = SafeBezierTangent(u, a, b, c, d);
  if (dir.x == 0.0 && dir.y == 0.0) return false;

  const double mag = std::max(Magnitude(p, 4), std::max(std::fabs(P.x), std::fabs(P.y)));
  const double onCurve = kOnCurveUlps * kEpsilon * mag;
  Side s = SideNone;
  if (dist > onCurve * onCurve) {
    const double cr = Cross(dir, P - foot);
    s = cr > 0.0 ? SideLeft : (cr < 0.0 ? SideRight : SideNone);
  }
  t = u;
  closest = foot;
  squaredDistance = dist;
  side = s;
  return true;
}

template <class T>
Side GetSide(const T& target, const V& a, const V& b, const V& c, const V& d, double& t) noexcept {
  V closest;
  double dist;
  Side side;
  if (!GetSide(target, a, b, c, d, t, closest, dist, side)) return SideNone;
  return side;
}

#define OSTRACRV_INSTANTIATE(T)                                                                                   \
  template Side GetSide<T>(const T&, const V&, const V&, const V&, const V&, double&) noexcept;                   \
  template bool GetSide<T>(const T&, const V&, const V&, const V&, const V&, double&, V&, double&, Side&) noexcept;
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace MavikMath::CubicBezier
