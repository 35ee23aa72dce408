// On which side of a cubic Bezier a point lies.
//
// Method. The nearest point of the curve to the target is found (see
// bezier_closest.h: root isolation of the stationary polynomial, so the
// global nearest point on loops and cusps too). The side is the sign of the
// cross product of the curve's direction there with the vector from the
// nearest point to the target: positive is left of the forward direction,
// negative right, with the y axis up. Where the nearest point is an end, the
// end tangent decides, so a target beyond an end is judged against the
// tangent line extended. The direction is SafeBezierTangent's (see
// bezier_derivatives.h): the derivative, or where that vanishes (a handle
// lying on its end point, a cusp) the first non-vanishing higher derivative
// with the sign of the direction of travel there.
//
// A target closer to the curve than 64 units in the last place of the
// largest coordinate involved is on it: the side is SideNone.
//
// Curves are given by their power-basis coefficients a = p3 - 3(p2 - p1) -
// p0, b = 3(p0 + p2 - 2 p1), c = 3(p1 - p0), d = p0, in doubles for both
// point kinds; the control points are recovered from them.
//
// Bad input: a non-finite coefficient or target, or a curve whose points all
// coincide, has no side: the short form answers SideNone, the long form
// false with its outputs untouched.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/side.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// The side of target relative to the Bezier with coefficients a, b, c, d:
// SideLeft, SideRight, or SideNone on the curve or for bad input.
// t is an output only: it receives the parameter of the nearest point (its
// entering value is not read); on SideNone for bad input it is untouched.
template <class T>
Side GetSide(const T& target, const V& a, const V& b, const V& c, const V& d, double& t) noexcept;

// The same with everything the search found: t and closest are the nearest
// point, squaredDistance its squared distance to target (callers compare it
// with a squared threshold), side as above. Returns false only for bad input,
// leaving all outputs untouched; a target on the curve is a success with
// side SideNone.
template <class T>
bool GetSide(const T& target, const V& a, const V& b, const V& c, const V& d, double& t, V& closest,
             double& squaredDistance, Side& side) noexcept;

}  // namespace MavikMath::CubicBezier
