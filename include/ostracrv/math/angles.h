// Angles in radians, degrees and millionths of a degree.
//
// Angles are measured counter-clockwise with the y axis up, from the positive
// x axis for a single vector and from the first vector to the second for a
// pair. Signed angles between vectors come from atan2(cross, dot), which is
// accurate at every angle (unlike acos of a dot product near 0 and 180
// degrees) and needs no normalisation. Non-finite input gives 0 (or the zero
// vector), never NaN; so does a zero vector, which has no direction.
#pragma once

#include "ostracrv/math/vector2d.h"

namespace MavikMath::Radians {

// The angle of v from the positive x axis, in (-pi, pi].
double VectorToAngle(const D& v) noexcept;
// The same angle, brought into [0, 2 pi).
double NormalizeAngle(double angle) noexcept;
// The same angle, brought into (-pi, pi].
double NormalizeFineAngle(double angle) noexcept;
// (cos angle, sin angle), and that scaled by length.
D AngleToVector(double angle) noexcept;
D AngleToVector(double angle, double length) noexcept;

}  // namespace MavikMath::Radians

namespace MavikMath::Degrees {

// The signed angle in degrees, in (-180, 180], by which a turns onto b:
// positive counter-clockwise. 0 when either vector is zero or not finite.
double GetFineAngle(const D& a, const D& b) noexcept;

}  // namespace MavikMath::Degrees

namespace MavikMath::TURNANGLE {

// The signed angle at `vertex` from the arm towards a to the arm towards b,
// in millionths of a degree, rounded to the nearest, in (-180e6, 180e6]:
// positive when b - vertex lies counter-clockwise of a - vertex. For a path
// previous -> vertex -> next called with (vertex, previous, next), this is
// the opening of the corner, positive when the path turns right (clockwise)
// and previous lies on the right of the outgoing direction; its half angle h
// places the offset corner at distance d / tan(h) along the outgoing edge. 0
// when an arm has zero length or the input is not finite.
int GetFineAngle(const V& vertex, const V& a, const V& b) noexcept;

}  // namespace MavikMath::TURNANGLE
