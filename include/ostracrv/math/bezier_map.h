// Placing a point relative to a Bezier by arc length, for bending an object
// along a stroke.
//
// An object's x runs along the stroke's arc length and its y becomes the
// distance from the stroke. A point with x at fraction f of its piece's range
// and y at distance h from the middle line goes to the point of the target
// Bezier at arc length f times the target's length, moved by h along the unit
// normal there. The normal is the left one ((-y, x) of the unit tangent, y
// up), so that a y above the middle line stays on the left of the stroke's
// direction of travel, as it was above the object's x axis.
//
// Method: the parameter at the fraction of the length is one arc-length
// inversion (GetCurveRelativeLengthParameter, safeguarded Newton on the
// Gauss-Legendre length of bezier_length.h), exact to the length accuracy
// rather than a chord-length estimate, which drifts on uneven handles. The
// direction there is SafeBezierTangent's (bezier_derivatives.h), so that a
// handle lying on its end point still has a normal.
#pragma once

#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// The image of a point under the mapping onto the target Bezier p[0..3].
// - fraction: the position along the target as a fraction of its arc length;
//   0 is the start, 1 the end. Outside [0, 1] the point continues straight
//   along the end tangent, by the excess fraction of the length, so that an
//   object reaching past its range does not fold back.
// - distance: the signed distance from the target, positive on the left.
// - offset: a further signed distance added to `distance`, the shift of the
//   whole object away from the stroke.
// Where the target has no direction (a curve that is one point) the point is
// not moved off it. A null or non-finite target gives (0, 0); non-finite
// numbers give the target's start point.
V MapToBezier(const V* p, double fraction, double distance, double offset) noexcept;

}  // namespace MavikMath::CubicBezier
