// Small helpers shared by the Bezier algorithms of the math layer (private to
// the library: not installed, not part of the interface).
//
// The searches move their curves into a local frame first (a chosen origin
// subtracted) so that rounding is relative to the size of the curves, not to
// their distance from the coordinate origin. Points are evaluated from the
// Bernstein form by de Casteljau, which is exact at the ends and better
// conditioned than the power basis near them; derivatives come from the same
// construction (the last two de Casteljau levels span the tangent).
#pragma once

#include <algorithm>
#include <cmath>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/polynomial.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier::internal {

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

// Whether the four points coincide within the zero-length threshold: every
// point within sqrt(kEpsilon) of the first.
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

// A power of two near the largest power-basis coefficient, 0 when all are
// zero. Dividing by it is exact and brings the coefficients near 1, so that
// products of a few of them can neither overflow nor underflow.
inline double PowerOfTwoScale(const V& a, const V& b, const V& c) noexcept {
  const double m = std::max({std::fabs(a.x), std::fabs(a.y), std::fabs(b.x), std::fabs(b.y), std::fabs(c.x),
                             std::fabs(c.y)});
  if (m == 0.0) return 0.0;
  int e = 0;
  std::frexp(m, &e);
  return std::ldexp(1.0, e);
}

// Axis-aligned box of the control points, which contains the curve.
inline void ControlBox(const V* p, double& lx, double& hx, double& ly, double& hy) noexcept {
  lx = hx = p[0].x;
  ly = hy = p[0].y;
  for (int i = 1; i < 4; ++i) {
    lx = std::min(lx, p[i].x);
    hx = std::max(hx, p[i].x);
    ly = std::min(ly, p[i].y);
    hy = std::max(hy, p[i].y);
  }
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

// De Casteljau's cut at t: out[0..3] is the part before t, out[3..6] the
// part after, sharing out[3]; the outer points are copied exactly.
inline void SplitPoints(const V* p, double t, V* out) noexcept {
  const V q0 = Lerp(p[0], p[1], t), q1 = Lerp(p[1], p[2], t), q2 = Lerp(p[2], p[3], t);
  const V r0 = Lerp(q0, q1, t), r1 = Lerp(q1, q2, t);
  const V s = Lerp(r0, r1, t);
  out[0] = p[0];
  out[1] = q0;
  out[2] = r0;
  out[3] = s;
  out[4] = r1;
  out[5] = q2;
  out[6] = p[3];
}

inline double Clamp01(double t) noexcept { return t < 0.0 ? 0.0 : (t > 1.0 ? 1.0 : t); }

// Newton's method on g(t) = (B(t) - x) . B'(t), g' = |B'|^2 + (B - x) . B'',
// from t towards a nearest point of the curve q to x, kept inside [lo, hi].
// A step is taken only where g' > 0 (towards a minimum) and only if it brings
// the point strictly closer, so the distance never grows. At most `steps`
// steps; returns the squared distance at the final t.
inline double PolishNearest(const V* q, const V& x, double& t, double lo, double hi, int steps) noexcept {
  V b;
  D d1, d2;
  PointAndDerivatives(q, t, b, d1, d2);
  double f = SquaredDistance(b, x);
  for (int i = 0; i < steps; ++i) {
    if (i > 0) PointAndDerivatives(q, t, b, d1, d2);
    const D diff = b - x;
    const double gp = Dot(d1, d1) + Dot(diff, d2);
    if (!(gp > 0.0)) break;
    const double next = std::clamp(t - Dot(diff, d1) / gp, lo, hi);
    if (next == t) break;
    const double there = SquaredDistance(Evaluate(q, next), x);
    if (!(there < f)) break;  // also a NaN step
    t = next;
    f = there;
  }
  return f;
}

// The cubic Bernstein function with coefficients e at t (de Casteljau).
inline double BernsteinValue(const double* e, double t) noexcept {
  const double s = 1.0 - t;
  const double a0 = e[0] * s + e[1] * t, a1 = e[1] * s + e[2] * t, a2 = e[2] * s + e[3] * t;
  const double b0 = a0 * s + a1 * t, b1 = a1 * s + a2 * t;
  return b0 * s + b1 * t;
}

// Stationary parameters (any real ones, unordered) of the cubic Bernstein
// function e: roots of e'(t)/3 = k0 (1-t)^2 + 2 k1 t (1-t) + k2 t^2 with
// k = the differences of e, in the power basis. Returns the count (0 to 2).
inline int BernsteinStationary(const double* e, double r[2]) noexcept {
  const double k0 = e[1] - e[0], k1 = e[2] - e[1], k2 = e[3] - e[2];
  return SolveQuadratic(k0 - 2.0 * k1 + k2, 2.0 * (k1 - k0), k0, r);
}

// Range over [0, 1] of the cubic Bernstein function x: its values at the
// ends and at the stationary points inside. The extent of a straight curve
// along its line.
inline void Range1D(const double* x, double& lo, double& hi) noexcept {
  lo = std::min(x[0], x[3]);
  hi = std::max(x[0], x[3]);
  double r[2];
  const int n = BernsteinStationary(x, r);
  for (int i = 0; i < n; ++i) {
    if (!(r[i] > 0.0 && r[i] < 1.0)) continue;
    const double v = BernsteinValue(x, r[i]);
    lo = std::min(lo, v);
    hi = std::max(hi, v);
  }
}

// Coefficients (ascending) of the numerator of the slope of the signed
// curvature, up to a positive factor:
//   N(t) = cross(B', B''') |B'|^2 - 3 cross(B', B'') (B' . B''),
// of degree at most 5 (its t^6 terms cancel), for B = a t^3 + b t^2 + c t + d.
// Its roots include every curvature extremum and every cusp.
inline void CurvatureSlopePolynomial(const V& a, const V& b, const V& c, double n[6]) noexcept {
  const double axb = Cross(a, b), cxa = Cross(c, a), cxb = Cross(c, b);
  const double aa = Dot(a, a), ab = Dot(a, b), ac = Dot(a, c), bb = Dot(b, b), bc = Dot(b, c), cc = Dot(c, c);
  const double crossD1D3[2] = {6.0 * cxa, -12.0 * axb};                                // cross(B', B''')
  const double speed2[5] = {cc, 4.0 * bc, 4.0 * bb + 6.0 * ac, 12.0 * ab, 9.0 * aa};  // |B'|^2
  const double crossD1D2[3] = {2.0 * cxb, 6.0 * cxa, -6.0 * axb};                     // cross(B', B'')
  const double dotD1D2[4] = {2.0 * bc, 4.0 * bb + 6.0 * ac, 18.0 * ab, 18.0 * aa};    // B' . B''
  double p1[6] = {}, p2[6] = {};
  for (int i = 0; i < 2; ++i)
    for (int j = 0; j < 5; ++j) p1[i + j] += crossD1D3[i] * speed2[j];
  for (int i = 0; i < 3; ++i)
    for (int j = 0; j < 4; ++j) p2[i + j] += crossD1D2[i] * dotD1D2[j];
  for (int i = 0; i < 6; ++i) n[i] = p1[i] - 3.0 * p2[i];
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

}  // namespace MavikMath::CubicBezier::internal
