// Signed area under one cubic Bezier.
//
// With B(t) = a t^3 + b t^2 + c t + d the integral of y dx over [0, 1] is
// the integral of y(t) x'(t) dt, a polynomial of degree 5 whose integral is
// exact in closed form: sum over i, j of y_i x'_j / (i + j + 1), where y_i are
// the coefficients of y(t) and x'_j those of x'(t) = 3a.x t^2 + 2b.x t + c.x.
// Summed over the segments of a closed path (lines adding (y0 + y1)(x1 - x0)/2)
// this gives the enclosed area, positive for a clockwise path with y up.
#pragma once

#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// The integral of y dx over the curve from t = 0 to t = 1, from its
// power-basis coefficients. Returns 0 for non-finite coefficients.
double GetAreaUnderBezier(const V& a, const V& b, const V& c, const V& d) noexcept;

}  // namespace MavikMath::CubicBezier
