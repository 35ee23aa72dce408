// Points at a parameter on one segment of a path.
//
// A segment is named by its end node i: a line node (i >= 1) or a curve node
// (i >= 3); the parameter t runs from 0 at the segment's start to 1 at its
// end. Bezier points are evaluated by de Casteljau, exact at both ends.
// Integer results round half away from zero.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The point at t on the segment that ends at i; the zero point if i >= n, if
// node i is not a line with i >= 1 or a curve with i >= 3, for null arrays or
// a non-finite t.
template <class T>
T GetPointOnCurve(T const* points, NODETYPE const* nodes, int n, unsigned long i, double t);

// The same in doubles without rounding (for integer curves too; a line is
// p0 + (p1 - p0) t). Returns false, out unchanged, where the above gives the
// zero point.
template <class T>
bool GetPoint2dOnCurve(T const* points, NODETYPE const* nodes, int n, unsigned long i, double t, MavikMath::V& out);

// The integer form without a count: the caller vouches that i is inside the
// arrays. False, out unchanged, for a null pointer, i < 1, a node that ends
// no segment (or a curve with i < 3) and a non-finite t.
bool CRV_GetPointOnCurve(Framework::common_types::POINT* out, Framework::common_types::POINT const* points,
                         NODETYPE const* nodes, int i, double t);

}  // namespace OstraCrv
