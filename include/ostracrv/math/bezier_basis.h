// The cubic Bezier as the math layer sees it: four points, their power-basis
// coefficients and direct evaluation.
//
// With points p0..p3 the curve is B(t) = a t^3 + b t^2 + c t + d where
//   a = p3 - 3(p2 - p1) - p0,  b = 3(p0 + p2 - 2 p1),  c = 3(p1 - p0),  d = p0.
// Every operation that takes (a, b, c[, d]) takes these coefficients of the
// curve itself, never those of its derivative: B'(t) = 3a t^2 + 2b t + c and
// B''(t) = 6a t + 2b. Points are evaluated from the Bernstein form by de
// Casteljau, which is exact at t = 0 and t = 1 and better conditioned than the
// power basis; the power basis serves derivatives and polynomial set-ups.
//
// These are the inner building blocks: constexpr, allocation-free and
// unchecked. Pointers must be valid; a non-finite coordinate propagates into
// the result. Callers validate their input first (IsFinite below).
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// Four control points of either point kind, indexable like an array.
template <class P>
struct bezier2dT {
  P p[4];
  constexpr P& operator[](int i) noexcept { return p[i]; }
  constexpr const P& operator[](int i) const noexcept { return p[i]; }
  constexpr P* data() noexcept { return p; }
  constexpr const P* data() const noexcept { return p; }
};

// B(t) = a t^3 + b t^2 + c t + d.
struct PowerBasis {
  V a, b, c, d;
};

// Coefficients of a Bezier of either point kind (integer points widen exactly).
template <class T>
constexpr PowerBasis GetPowerBasis(const T* p) noexcept {
  const V p0 = ToV(p[0]), p1 = ToV(p[1]), p2 = ToV(p[2]), p3 = ToV(p[3]);
  PowerBasis r;
  r.a = V{p3.x - 3.0 * (p2.x - p1.x) - p0.x, p3.y - 3.0 * (p2.y - p1.y) - p0.y};
  r.b = V{3.0 * (p0.x + p2.x - 2.0 * p1.x), 3.0 * (p0.y + p2.y - 2.0 * p1.y)};
  r.c = V{3.0 * (p1.x - p0.x), 3.0 * (p1.y - p0.y)};
  r.d = p0;
  return r;
}

// Point at t by de Casteljau.
template <class T>
constexpr V Evaluate(const T* p, double t) noexcept {
  const V p0 = ToV(p[0]), p1 = ToV(p[1]), p2 = ToV(p[2]), p3 = ToV(p[3]);
  const V q0 = Lerp(p0, p1, t), q1 = Lerp(p1, p2, t), q2 = Lerp(p2, p3, t);
  const V r0 = Lerp(q0, q1, t), r1 = Lerp(q1, q2, t);
  return Lerp(r0, r1, t);
}

// Point at t from the power basis (Horner).
constexpr V Evaluate(const V& a, const V& b, const V& c, const V& d, double t) noexcept {
  return V{((a.x * t + b.x) * t + c.x) * t + d.x, ((a.y * t + b.y) * t + c.y) * t + d.y};
}
// B'(t) = 3a t^2 + 2b t + c.
constexpr D Derivative(const V& a, const V& b, const V& c, double t) noexcept {
  return D{(3.0 * a.x * t + 2.0 * b.x) * t + c.x, (3.0 * a.y * t + 2.0 * b.y) * t + c.y};
}
// B''(t) = 6a t + 2b.
constexpr D SecondDerivative(const V& a, const V& b, double t) noexcept {
  return D{6.0 * a.x * t + 2.0 * b.x, 6.0 * a.y * t + 2.0 * b.y};
}
// B''' = 6a.
constexpr D ThirdDerivative(const V& a) noexcept { return D{6.0 * a.x, 6.0 * a.y}; }

// Whether p is not null and all four points are finite (integer points
// always are).
template <class T>
bool IsFinite(const T* p) noexcept {
  if constexpr (IsIntegerPoint<T>) {
    return p != nullptr;
  } else {
    return p && p[0].IsFinite() && p[1].IsFinite() && p[2].IsFinite() && p[3].IsFinite();
  }
}

}  // namespace MavikMath::CubicBezier
