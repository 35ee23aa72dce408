// Small evaluation helpers shared by the Bezier search files (private to the
// library: not installed, not part of the interface).
//
// The searches move their curves into a local frame first (a chosen origin
// subtracted) so that rounding is relative to the size of the curves, not to
// their distance from the coordinate origin. Evaluation uses the Bernstein
// form by de Casteljau, which is exact at the ends and better conditioned
// than the power basis near them.
#pragma once

#include <algorithm>
#include <cmath>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/polynomial.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier::search_detail {

// Loads four points as doubles; false on a null pointer or a non-finite
// coordinate.
template <class T>
inline bool LoadFinite(const T* p, V* out) noexcept {
  if (!p) return false;
  for (int i = 0; i < 4; ++i) {
    out[i] = ToV(p[i]);
    if (!out[i].IsFinite()) return false;
  }
  return true;
}

// The points minus origin.
inline void Translate(const V* p, const V& origin, V* out) noexcept {
  for (int i = 0; i < 4; ++i) out[i] = V{p[i].x - origin.x, p[i].y - origin.y};
}

// Whether the four points coincide within the zero-length threshold.
inline bool IsDot(const V* p) noexcept {
  for (int i = 1; i < 4; ++i)
    if (SquaredDistance(p[i], p[0]) > kEpsilon) return false;
  return true;
}

// Largest absolute coordinate: the scale of rounding errors.
inline double Magnitude(const V* p, int n) noexcept {
  double m = 0.0;
  for (int i = 0; i < n; ++i) m = std::max(m, std::max(std::fabs(p[i].x), std::fabs(p[i].y)));
  return m;
}

// Point and first derivative at t.
inline void PointAndTangent(const V* q, double t, V& b, D& d1) noexcept {
  const V a0 = Lerp(q[0], q[1], t), a1 = Lerp(q[1], q[2], t), a2 = Lerp(q[2], q[3], t);
  const V b0 = Lerp(a0, a1, t), b1 = Lerp(a1, a2, t);
  b = Lerp(b0, b1, t);
  d1 = D{3.0 * (b1.x - b0.x), 3.0 * (b1.y - b0.y)};
}

// Point, first and second derivative at t.
inline void PointAndDerivatives(const V* q, double t, V& b, D& d1, D& d2) noexcept {
  PointAndTangent(q, t, b, d1);
  const D s0{q[2].x - 2.0 * q[1].x + q[0].x, q[2].y - 2.0 * q[1].y + q[0].y};
  const D s1{q[3].x - 2.0 * q[2].x + q[1].x, q[3].y - 2.0 * q[2].y + q[1].y};
  d2 = D{6.0 * (s0.x + (s1.x - s0.x) * t), 6.0 * (s0.y + (s1.y - s0.y) * t)};
}

inline V PointAt(const V* q, double t) noexcept { return Evaluate(q, t); }

inline double Clamp01(double t) noexcept { return t < 0.0 ? 0.0 : (t > 1.0 ? 1.0 : t); }

// Values of a cubic Bernstein function at its stationary points and ends:
// the range of a straight curve's position along its line.
inline void Range1D(const double* x, double& lo, double& hi) noexcept {
  lo = std::min(x[0], x[3]);
  hi = std::max(x[0], x[3]);
  // x'(t)/3 = (x1-x0)(1-t)^2 + 2(x2-x1)t(1-t) + (x3-x2)t^2, in the power basis.
  const double k0 = x[1] - x[0], k1 = x[2] - x[1], k2 = x[3] - x[2];
  double r[2];
  const int n = SolveQuadratic(k0 - 2.0 * k1 + k2, 2.0 * (k1 - k0), k0, r);
  for (int i = 0; i < n; ++i) {
    const double t = r[i];
    if (!(t > 0.0 && t < 1.0)) continue;
    const double s = 1.0 - t;
    const double v = s * s * s * x[0] + 3.0 * s * s * t * x[1] + 3.0 * s * t * t * x[2] + t * t * t * x[3];
    lo = std::min(lo, v);
    hi = std::max(hi, v);
  }
}

// Coefficients (ascending) of g(t) = B(t) . B'(t) for the curve q, the
// target being the origin: with B = a t^3 + b t^2 + c t + d,
// g = 3aa t^5 + 5ab t^4 + (4ac + 2bb) t^3 + (3bc + 3ad) t^2 + (cc + 2bd) t + cd.
inline void StationaryPolynomial(const V* q, double g[6]) noexcept {
  const PowerBasis pb = GetPowerBasis(q);
  const V &a = pb.a, &b = pb.b, &c = pb.c, &d = pb.d;
  g[5] = 3.0 * Dot(a, a);
  g[4] = 5.0 * Dot(a, b);
  g[3] = 4.0 * Dot(a, c) + 2.0 * Dot(b, b);
  g[2] = 3.0 * Dot(b, c) + 3.0 * Dot(a, d);
  g[1] = Dot(c, c) + 2.0 * Dot(b, d);
  g[0] = Dot(c, d);
}

}  // namespace MavikMath::CubicBezier::search_detail
