// The loop of a cubic Bezier; see bezier_self_intersect.h for the method.
//
// Constants:
//   kEndSlack 1e-9: a crossing parameter this far outside [0, 1] is the end
//     (a closed curve crosses itself at its end points).
//   kMinLoopWidth 1e-6: closer parameters are a cusp; rounding of the
//     discriminant alone (about 1e-16) gives parameters some 1e-8 apart.
//   kAcceptRel 1e-9: the two points of an accepted crossing lie within this
//     fraction of the coordinate magnitude.
//   kNewtonSteps 2: the closed form is already accurate to rounding except
//     near a cusp; two steps restore full precision.
#include "ostracrv/math/bezier_self_intersect.h"

#include <algorithm>
#include <cmath>

#include "bezier_common.h"
#include "ostracrv/math/polynomial.h"

namespace MavikMath::CubicBezier {

namespace {

using namespace internal;
using Framework::common_types::POINT;

constexpr double kEndSlack = 1e-9;
constexpr double kMinLoopWidth = 1e-6;
constexpr double kAcceptRel = 1e-9;
constexpr int kNewtonSteps = 2;

// The crossing parameters s < t of the curve q, verified.
bool FindLoop(const V* q, double& s, double& t) noexcept {
  const PowerBasis pb = GetPowerBasis(q);
  const V &a = pb.a, &b = pb.b, &c = pb.c;
  const double ab = Cross(a, b);
  const double aa = Dot(a, a);
  if (ab == 0.0 || !(aa > 0.0)) return false;
  const double sigma = -Cross(a, c) / ab;
  const double pi = sigma * sigma + (Dot(a, b) * sigma + Dot(a, c)) / aa;
  if (!std::isfinite(sigma) || !std::isfinite(pi)) return false;
  const double disc = sigma * sigma - 4.0 * pi;
  if (!(disc > 0.0)) return false;
  // Roots of z^2 - sigma z + pi without cancellation; |q| >= sqrt(disc)/2 > 0.
  const double qq = 0.5 * (sigma + std::copysign(std::sqrt(disc), sigma));
  double lo = std::min(qq, pi / qq), hi = std::max(qq, pi / qq);
  if (lo < -kEndSlack || hi > 1.0 + kEndSlack) return false;
  lo = Clamp01(lo);
  hi = Clamp01(hi);
  if (hi - lo < kMinLoopWidth) return false;

  // Newton on B(lo) - B(hi) = 0: columns B'(lo) and -B'(hi).
  for (int i = 0; i < kNewtonSteps; ++i) {
    V ps, pt;
    D ds, dt;
    PointAndTangent(q, lo, ps, ds);
    PointAndTangent(q, hi, pt, dt);
    const D F = ps - pt;
    const double det = Cross(ds, dt);
    if (det == 0.0 || F.SquaredLength() == 0.0) break;
    lo = Clamp01(lo - Cross(F, dt) / det);
    hi = Clamp01(hi + Cross(ds, F) / det);
  }
  const double tol = kAcceptRel * Magnitude(q, 4);
  if (!(hi - lo >= kMinLoopWidth)) return false;
  if (!(SquaredDistance(Evaluate(q, lo), Evaluate(q, hi)) <= tol * tol)) return false;
  s = lo;
  t = hi;
  return true;
}

}  // namespace

template <class T>
bool FindBezierSelfIntersection(const T* p, double& t1, double& t2, V& point) noexcept {
  V q[4];
  if (!LoadFinite(p, q) || IsDot(q)) return false;
  double s, t;
  if (!FindLoop(q, s, t)) return false;
  const V ps = Evaluate(q, s), pt = Evaluate(q, t);
  t1 = s;
  t2 = t;
  point = V{0.5 * (ps.x + pt.x), 0.5 * (ps.y + pt.y)};
  return true;
}

bool DoesBezierSelfIntersect(const V* p, double& t1, double& t2, double& t3, double& t4, bool /*wider*/) noexcept {
  V q[4];
  if (!LoadFinite(p, q) || IsDot(q)) return false;
  double s, t;
  if (!FindLoop(q, s, t)) return false;
  const V ps = Evaluate(q, s), pt = Evaluate(q, t);
  const V x{0.5 * (ps.x + pt.x), 0.5 * (ps.y + pt.y)};

  // The apex: the loop's point farthest from the crossing, a root of
  // (B - x) . B' on [s, t].
  V local[4];
  Translate(q, x, local);
  double g[6], roots[5];
  StationaryPolynomial(local, g);
  const int n = FindRootsInInterval(g, 5, s, t, roots);
  double apex = 0.5 * (s + t), far = -1.0;
  for (int i = 0; i < n; ++i) {
    const double d = Evaluate(local, roots[i]).SquaredLength();
    if (d > far) {
      far = d;
      apex = roots[i];
    }
  }

  // Points where B' is parallel to the axis: B' x axis = 0, a quadratic.
  const D axis = Evaluate(q, apex) - x;
  const PowerBasis pb = GetPowerBasis(q);
  double r[2];
  const int nr = SolveQuadratic(3.0 * Cross(pb.a, axis), 2.0 * Cross(pb.b, axis), Cross(pb.c, axis), r);
  double w1 = 0.5 * (s + apex), w2 = 0.5 * (apex + t);
  for (int i = 0; i < nr; ++i) {
    if (r[i] > s && r[i] < apex) w1 = r[i];
    if (r[i] > apex && r[i] < t) w2 = r[i];
  }
  t1 = s;
  t2 = t;
  t3 = w1;
  t4 = w2;
  return true;
}

template bool FindBezierSelfIntersection<POINT>(const POINT*, double&, double&, V&) noexcept;
template bool FindBezierSelfIntersection<V>(const V*, double&, double&, V&) noexcept;

}  // namespace MavikMath::CubicBezier
