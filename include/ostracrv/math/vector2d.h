// Two-dimensional double vectors of the math layer.
//
// vector2dT<S, true> is a position, vector2dT<S, false> a direction. The two
// share one layout (x then y) and convert into each other only explicitly, so
// that the type of an expression says what it means:
//   position - position  -> direction
//   position +/- direction -> position
//   direction +/- direction -> direction
//   position + position  -> position (used for averages such as (a + b) * 0.5)
// Scalar products keep the kind.
//
// The zero-length threshold kEpsilon (2^-52) is the library-wide one: a vector
// is normalised only when its squared length exceeds it, otherwise it is left
// as it is, so that a degenerate direction never turns into NaN.
#pragma once

#include <cmath>
#include <cstdint>

#include "ostracrv/core/common_types.h"

namespace MavikMath {

// Equality of parameters with 0 and 1, and tests for zero length.
inline constexpr double kEpsilon = 2.220446049250313e-16;

template <class S, bool IsPosition>
struct vector2dT {
  S x{};
  S y{};

  constexpr vector2dT() noexcept = default;
  constexpr vector2dT(S x_, S y_) noexcept : x(x_), y(y_) {}
  template <bool Other>
  constexpr explicit vector2dT(const vector2dT<S, Other>& o) noexcept : x(o.x), y(o.y) {}

  constexpr vector2dT operator-() const noexcept { return {-x, -y}; }
  constexpr vector2dT& operator*=(S s) noexcept { x *= s; y *= s; return *this; }
  constexpr vector2dT& operator/=(S s) noexcept { x /= s; y /= s; return *this; }
  template <bool Other>
  constexpr vector2dT& operator+=(const vector2dT<S, Other>& o) noexcept { x += o.x; y += o.y; return *this; }
  template <bool Other>
  constexpr vector2dT& operator-=(const vector2dT<S, Other>& o) noexcept { x -= o.x; y -= o.y; return *this; }

  constexpr S SquaredLength() const noexcept { return x * x + y * y; }
  S Length() const noexcept { return std::hypot(x, y); }
  // True when the vector is long enough to have a direction.
  constexpr bool IsNonZero() const noexcept { return SquaredLength() > kEpsilon; }
  // Scales to unit length if the squared length exceeds kEpsilon; returns
  // whether it did. A shorter vector stays raw.
  bool Normalize() noexcept {
    const S sq = SquaredLength();
    if (!(sq > kEpsilon)) return false;
    const S len = std::sqrt(sq);
    x /= len;
    y /= len;
    return true;
  }
  vector2dT Normalized() const noexcept { vector2dT v = *this; v.Normalize(); return v; }
  // Turned a quarter counter-clockwise (y up): (x, y) -> (-y, x).
  constexpr vector2dT Perpendicular() const noexcept { return {-y, x}; }
  bool IsFinite() const noexcept { return std::isfinite(x) && std::isfinite(y); }

  friend constexpr bool operator==(const vector2dT& a, const vector2dT& b) noexcept { return a.x == b.x && a.y == b.y; }
  friend constexpr bool operator!=(const vector2dT& a, const vector2dT& b) noexcept { return !(a == b); }
  friend constexpr vector2dT operator*(const vector2dT& a, S s) noexcept { return {a.x * s, a.y * s}; }
  friend constexpr vector2dT operator*(S s, const vector2dT& a) noexcept { return {a.x * s, a.y * s}; }
  friend constexpr vector2dT operator/(const vector2dT& a, S s) noexcept { return {a.x / s, a.y / s}; }
};

template <class S, bool A, bool B>
constexpr vector2dT<S, A || B> operator+(const vector2dT<S, A>& a, const vector2dT<S, B>& b) noexcept {
  return {a.x + b.x, a.y + b.y};
}
template <class S, bool A, bool B>
constexpr vector2dT<S, A && !B> operator-(const vector2dT<S, A>& a, const vector2dT<S, B>& b) noexcept {
  return {a.x - b.x, a.y - b.y};
}

template <class S, bool A, bool B>
constexpr S Dot(const vector2dT<S, A>& a, const vector2dT<S, B>& b) noexcept { return a.x * b.x + a.y * b.y; }
// z of the 3D cross product: positive when b lies counter-clockwise of a (y up).
template <class S, bool A, bool B>
constexpr S Cross(const vector2dT<S, A>& a, const vector2dT<S, B>& b) noexcept { return a.x * b.y - a.y * b.x; }
template <class S, bool A, bool B>
constexpr S SquaredDistance(const vector2dT<S, A>& a, const vector2dT<S, B>& b) noexcept {
  const S dx = a.x - b.x, dy = a.y - b.y;
  return dx * dx + dy * dy;
}
template <class S, bool A, bool B>
S Distance(const vector2dT<S, A>& a, const vector2dT<S, B>& b) noexcept { return std::hypot(a.x - b.x, a.y - b.y); }
// Linear interpolation a + (b - a) t. Exact at t = 0, at t = 1 (where the
// plain formula can miss b in the last bit) and when a equals b.
template <class S, bool A>
constexpr vector2dT<S, A> Lerp(const vector2dT<S, A>& a, const vector2dT<S, A>& b, S t) noexcept {
  if (t == S(1)) return b;
  return {a.x + (b.x - a.x) * t, a.y + (b.y - a.y) * t};
}

using V = vector2dT<double, true>;
using D = vector2dT<double, false>;

static_assert(sizeof(V) == 16);

// Rounds half away from zero: x + 0.5, or x - 0.5 for negative x, truncated.
// Values outside the int32 range saturate and NaN becomes 0, so that no
// conversion is undefined.
constexpr int32_t RoundToInt(double x) noexcept {
  if (!(x == x)) return 0;
  const double r = x < 0 ? x - 0.5 : x + 0.5;
  if (r >= 2147483647.0) return INT32_MAX;
  if (r <= -2147483648.0) return INT32_MIN;
  return static_cast<int32_t>(r);
}

// Point kind conversions used by templates over T (POINT or V).
constexpr V ToV(const Framework::common_types::POINT& p) noexcept { return {double(p.x), double(p.y)}; }
constexpr V ToV(const V& p) noexcept { return p; }

template <class T>
constexpr T FromV(const V& v) noexcept;
template <>
constexpr V FromV<V>(const V& v) noexcept { return v; }
template <>
constexpr Framework::common_types::POINT FromV<Framework::common_types::POINT>(const V& v) noexcept {
  return {RoundToInt(v.x), RoundToInt(v.y)};
}

// Whether a point type is the integer one.
template <class T>
inline constexpr bool IsIntegerPoint = false;
template <>
inline constexpr bool IsIntegerPoint<Framework::common_types::POINT> = true;

}  // namespace MavikMath
