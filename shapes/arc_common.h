// Small pieces shared by the arc builders of the shapes layer (private to the
// library: not installed, not part of the interface).
//
// The standard cubic approximation of a circular arc of sweep d puts handles
// tangent to the circle at both ends, of length k = r 4 (1 - cos(d/2)) /
// (3 sin(d/2)); that puts the Bezier's midpoint on the circle. For a quarter
// turn k / r = 0.5522847498 and the radial error peaks near 2.7e-4 r.
#pragma once

#include <cmath>
#include <numbers>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv::arc_internal {

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;

inline constexpr double kEps = MavikMath::kEpsilon;
inline constexpr double kHalfPi = std::numbers::pi / 2.0;
inline constexpr double kTwoPi = 2.0 * std::numbers::pi;

// The handle length k above for radius r and half sweep `half`; 0 (no
// handles rather than 0/0) for a piece of no sweep, where sin(half) is 0.
inline double CircleHandleLength(double r, double half) noexcept {
  const double sn = std::sin(half);
  return sn != 0.0 ? r * 4.0 * (1.0 - std::cos(half)) / (3.0 * sn) : 0.0;
}

// The unit left normal of u scaled to h, or (h, u.x) for a u too short to
// have a direction (a squared length not above kEpsilon, or NaN).
inline D ScaledLeftNormal(const D& u, double h) noexcept {
  const double l2 = u.SquaredLength();
  if (!(l2 > kEps)) return D{h, u.x};
  const double l = std::sqrt(l2);
  return D{-u.y / l * h, u.x / l * h};
}

}  // namespace OstraCrv::arc_internal
