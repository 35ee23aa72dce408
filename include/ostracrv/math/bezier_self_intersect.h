// The loop of a cubic Bezier: where the curve crosses itself.
//
// Method: closed form. B(s) = B(t) with s != t means, after dividing
// B(s) - B(t) by s - t and writing sigma = s + t and pi = s t,
//   a (sigma^2 - pi) + b sigma + c = 0
// for the power-basis coefficients a, b, c. The cross product with a
// removes pi: sigma = -(a x c) / (a x b); the dot product with a gives
// pi = sigma^2 + (a.b sigma + a.c) / |a|^2. s and t are the roots of
// z^2 - sigma z + pi, real and distinct exactly when the curve has a loop.
// The pair is kept if both lie in [0, 1] (1e-9 of slack, clamped), are at
// least 1e-6 apart (closer pairs are a cusp blurred by rounding), and two
// Newton steps on B(s) = B(t) bring the points within 1e-9 of the coordinate
// magnitude of each other. A cubic has at most one loop; a curve with
// a x b = 0 (a parabola, a straight curve) has none: a straight curve that
// runs back over itself overlaps itself but does not cross.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// The self-crossing of the Bezier p[0..3]: t1 < t2 are its parameters and
// point the crossing (the midpoint of the two curve points). Returns false,
// leaving the outputs untouched, for a curve without a loop within [0, 1],
// a null pointer, non-finite input or a curve whose points coincide.
template <class T>
bool FindBezierSelfIntersection(const T* p, double& t1, double& t2, V& point) noexcept;

// Whether the Bezier p[0..3] crosses itself (has a loop within [0, 1]).
// On true: t1 < t2 are the parameters of the crossing, as above; t3 and t4
// are the parameters of the loop's two widest points across its axis, the
// axis being the line from the crossing to the point of the loop farthest
// from it: the points between t1 and t2 where the tangent is parallel to
// the axis, t1 < t3 < t4 < t2. Together they describe where the loop lies
// on the curve and how wide it is. Outputs are untouched on false.
// The flag selects a wider test that the library never asks for; both
// values run the test described here.
bool DoesBezierSelfIntersect(const V* p, double& t1, double& t2, double& t3, double& t4, bool wider) noexcept;

}  // namespace MavikMath::CubicBezier
