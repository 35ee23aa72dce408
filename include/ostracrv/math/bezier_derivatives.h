// Differential quantities of one cubic Bezier: tangent, signed curvature,
// radius of curvature, curvature extrema, axis tangents and tight bounds.
//
// Every function takes the power-basis coefficients of the curve itself
// (see bezier_basis.h): B(t) = a t^3 + b t^2 + c t + d, so B' = 3a t^2 + 2b t
// + c, B'' = 6a t + 2b and B''' = 6a.
//
// Sign convention (y up): a counter-clockwise (left) turn has positive
// curvature, k = cross(B', B'') / |B'|^3, and a positive radius of curvature
// places the centre on the left of the direction of travel, so radius and
// curvature always share their sign.
//
// Methods:
// - Axis tangents are the roots of one quadratic component of B', solved in
//   closed form without cancellation (SolveQuadratic). A component that is
//   identically zero (the curve runs along the axis) yields no parameter:
//   every point is then extreme and the end points already bound it.
// - Curvature extrema are the roots of the numerator of dk/dt,
//     N(t) = cross(B', B''') |B'|^2 - 3 cross(B', B'') (B' . B''),
//   a polynomial of degree at most 5 (its t^6 terms cancel), isolated by
//   recursion on derivatives (FindRootsInInterval). Only roots where N
//   changes sign are extrema; a double root (a flat stationary point of the
//   curvature) is dropped.
// - Tight bounds evaluate the curve at the axis tangents and at both ends.
#pragma once

#include <cmath>
#include <cstdint>
#include <type_traits>
#include <vector>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// Direction of travel at t, not normalised. Where B'(t) is too short to have
// a direction (squared length not above kEpsilon, as at a collapsed handle),
// the curve still moves: near such a point B(t + s) - B(t) is led by B'' s^2/2,
// or by B''' s^3/6 when B'' vanishes too. The fallbacks are therefore, in
// order: B''(t), then B''' = 6a, then the chord p3 - p0 = a + b + c. At t >= 1
// the curve arrives at its end, and the arrival direction of the second
// derivative term is -B''(1); everywhere else the direction of departure is
// given. If no candidate is long enough the first non-zero one is returned,
// and the zero vector for a curve that is one point or has non-finite
// coefficients.
D SafeBezierTangent(double t, const V& a, const V& b, const V& c, const V& d) noexcept;

// Signed curvature at t (positive for a left turn). Where |B'(t)|^2 is not
// above kEpsilon the curvature is unbounded in general; the value returned is
// then the curvature a parameter step of 1e-6 into the curve (forward, or
// backward at the end), which has the sign of the turn and a large finite
// size. Returns 0 for a straight stretch, a curve that is one point, and
// non-finite input; never NaN or infinity.
double SafeBezierCurvature(double t, const V& a, const V& b, const V& c) noexcept;

// Signed radius of curvature |B'|^3 / cross(B', B'') at t: positive when the
// centre of curvature lies on the left. Returns false, leaving radius as it
// was, where the curve is straight (cross product zero), where B'(t) is zero,
// and where the result or the input is not finite.
bool GetCurvatureRadiusAt(double t, const V& a, const V& b, const V& c, double& radius) noexcept;

// Largest number of curvature extrema of one cubic, the size that the params
// array of FindCurvatureMinMax must have.
inline constexpr int kMaxCurvatureExtrema = 5;

// Parameters in [0, 1] where the signed curvature has a local minimum or
// maximum (including the cusps, where it changes sign through infinity), in
// ascending order. params must hold kMaxCurvatureExtrema values. Returns the
// count, 0 for a straight curve, a point, or non-finite input (params
// untouched).
int FindCurvatureMinMax(const V& a, const V& b, const V& c, double* params) noexcept;

// Parameters in [0, 1] where dx/dt (vertical tangents) or dy/dt (horizontal
// tangents) vanishes, appended to ts in ascending order. Nothing is appended
// when the component of B' is identically zero or the input is not finite.
void GetVerticalTangents(const V& a, const V& b, const V& c, std::vector<double>& ts);
void GetHorizontalTangents(const V& a, const V& b, const V& c, std::vector<double>& ts);
// The same into a caller array of two values; returns the count written.
int GetVerticalTangents(const V& a, const V& b, const V& c, double ts[2]) noexcept;
int GetHorizontalTangents(const V& a, const V& b, const V& c, double ts[2]) noexcept;

namespace detail {
template <class R>
R BoundOut(double v, bool up) noexcept {
  if constexpr (std::is_same_v<R, int>) {
    const double r = up ? std::ceil(v) : std::floor(v);
    if (r >= 2147483647.0) return INT32_MAX;
    if (r <= -2147483648.0) return INT32_MIN;
    return static_cast<int>(r);
  } else {
    return static_cast<R>(v);
  }
}
}  // namespace detail

// Tight axis-aligned bounds of the curve over [0, 1], for R = double or int.
// The candidates are t = 0 (the start d), every vertical and horizontal
// tangent parameter, and t = 1, each evaluated in nested (Horner) form; a
// value beyond the current extreme replaces it. With R = int the values are
// compared as doubles and a new maximum is rounded up, a new minimum down
// (saturated to the int range), so the integer box contains the curve.
// Returns false, outputs untouched, for non-finite coefficients.
template <class R>
bool GetTightBounds(const V& a, const V& b, const V& c, const V& d, R& minX, R& minY, R& maxX, R& maxY) noexcept {
  if (!a.IsFinite() || !b.IsFinite() || !c.IsFinite() || !d.IsFinite()) return false;
  double ts[5];
  int n = GetVerticalTangents(a, b, c, ts);
  n += GetHorizontalTangents(a, b, c, ts + n);
  ts[n++] = 1.0;
  R lx = detail::BoundOut<R>(d.x, false), hx = detail::BoundOut<R>(d.x, true);
  R ly = detail::BoundOut<R>(d.y, false), hy = detail::BoundOut<R>(d.y, true);
  for (int i = 0; i < n; ++i) {
    const double t = ts[i];
    const double x = ((a.x * t + b.x) * t + c.x) * t + d.x;
    const double y = ((a.y * t + b.y) * t + c.y) * t + d.y;
    if (x > static_cast<double>(hx)) hx = detail::BoundOut<R>(x, true);
    if (y > static_cast<double>(hy)) hy = detail::BoundOut<R>(y, true);
    if (x < static_cast<double>(lx)) lx = detail::BoundOut<R>(x, false);
    if (y < static_cast<double>(ly)) ly = detail::BoundOut<R>(y, false);
  }
  minX = lx;
  minY = ly;
  maxX = hx;
  maxY = hy;
  return true;
}

}  // namespace MavikMath::CubicBezier
