// Signed area of a path.
//
// The area is the integral of y dx along the closed subpaths. With the y axis
// pointing up a clockwise subpath gives a positive value and a
// counter-clockwise one a negative value, so outlines and holes of opposite
// direction subtract. Open subpaths do not count at all.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The signed area of the closed subpaths: each line adds the trapezoid
// (y0 + y1)(x1 - x0) / 2, each Bezier the exact integral of y dx under it.
// Whether a segment counts is decided by the closed bit of its subpath's
// move. 0.0 for null arrays, n < 2 and non-finite results. O(n).
template <class T>
double GetArea(T const* points, NODETYPE const* nodes, int n);

// The same trapezoid sum over a plain point list, without a closing edge: n
// points give the area under n-1 edges. 0.0 for a null list, n < 2 and
// non-finite results. O(n).
double GetPolygonArea(Framework::common_types::POINT const* points, int n);
double GetPolygonArea(MavikMath::V const* points, int n);

}  // namespace OstraCrv
