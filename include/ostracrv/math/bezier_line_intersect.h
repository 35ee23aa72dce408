// Where a cubic Bezier meets a straight line segment or a vertical line.
//
// Method. The signed distance of the curve from the line, f(t) = n . (B(t) -
// L0) with n the unit normal of the line, is a cubic in t whose Bernstein
// coefficients are the distances of the four control points. Its real
// roots are isolated on the parameter interval by FindRootsInInterval
// (recursion on derivatives, every root bracketed), so no crossing is lost
// to a starting guess; a closed-form cubic formula would lose digits near
// double roots. The parameter on the segment follows by projection.
//
// Crossings and tangential roots. A crossing is a root where f changes sign.
// A root where f only touches zero (the curve tangent to the line) is not a
// crossing: reporting it would make a ray count one crossing where the
// curve only grazes. A root at an end of the curve is always reported (the
// curve begins or ends on the line); roots up to 1e-12 outside [0, 1] are
// taken as the ends, which absorbs the rounding of an end point lying on
// the line. A curve that lies along the line (every control point within 64
// ulps of the coordinate magnitude) has no crossing: that is an overlap.
#pragma once

#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// Crossings of the Bezier bezier[0..3] with the line segment from line[0]
// to line[1]. Appends, in ascending order of the Bezier parameter, the
// parameter on the Bezier (in [0, 1]) to tBezier and the parameter on the
// segment to tLine: a crossing counts if its segment parameter lies in
// [0, 1] or within 1e-9 of it, and is then clamped into [0, 1]. Returns true
// if anything was appended. False, with nothing appended, for a null pointer,
// a non-finite coordinate, a segment of zero length (squared length at most
// kEpsilon), a curve whose points coincide, a curve lying along the line.
// The flag selects a wider search that the library never asks for; both
// values run the crossing search described here.
bool FindBezierLineIntersection(const V* bezier, const V* line, std::vector<double>& tBezier,
                                std::vector<double>& tLine, bool wider);

// Parameters at which the Bezier p[0..3] meets the vertical line at x,
// appended to ts in ascending order.
// tryAgain false: the crossings in [0, 1] as described above.
// tryAgain true: a superset for a second attempt: also tangential roots
//   (the curve touching the line, including an extreme x within 1e-9 of the
//   coordinate magnitude of it), and roots up to 1e-6 outside [0, 1],
//   clamped to the end.
// Nothing is appended for a null pointer, non-finite input, a curve whose
// points coincide, or a vertical straight curve lying on the line.
void FindBezierIntersectionsAtX(const V* p, double x, std::vector<double>& ts, bool tryAgain);

// Whether the Bezier p[0..3] meets the segment q[0]..q[1] at all: crossing,
// touching, or running along it over some stretch. False for bad input as
// above, including a segment of zero length.
template <class T>
bool DoesBezierIntersectLineSegment(const T* p, const T* q) noexcept;

}  // namespace MavikMath::CubicBezier
