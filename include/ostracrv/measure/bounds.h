// Bounding boxes of a path: loose (all points, control points included),
// tight (the true extent of lines and Beziers), tight over the enabled
// segments only, and tight under an affine transform.
//
// Integer RECT results are rounded outward from the double extremes (lower
// sides down, upper sides up), so the box always contains the curve. The
// field order is that of RECT: left (smallest x), top (largest y), right,
// bottom; y points up. An empty result is the inverted marker of rect.h.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/matrix.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The box of all n points, control points included. The double form rounds
// outward. Null points or n < 1 give the empty RECT. O(n).
Framework::common_types::RECT GetLooseBBox(Framework::common_types::POINT const* points, int n);
Framework::common_types::RECT GetLooseBBox(MavikMath::V const* points, int n);
// The same into out (written in every case, empty for bad input).
void GetLooseBBox(Framework::common_types::POINT const* points, int n, Framework::common_types::RECT& out);

// The box around the true shape of the path: move and line points, and the
// extremes of each Bezier found from the roots of its derivative (never by
// flattening). Null arrays or n < 1 give the empty RECT. An unfinished Bezier
// at the end of the arrays ends the walk; non-finite coordinates are left
// out. O(n).
template <class T>
Framework::common_types::RECT GetTightBBox(T const* points, NODETYPE const* nodes, int n);
// The same without rounding. Null arrays or n < 1 leave out unchanged.
void GetTightBBox(MavikMath::V const* points, NODETYPE const* nodes, int n, MavikMath::BoundsT<double>& out);

// The tight box of the segments that touch an enabled node: a line whose
// start or end node is enabled, a Bezier any of whose four nodes is. Empty
// when nothing is enabled, for null arrays and for n < 2. O(n).
template <class T>
Framework::common_types::RECT GetTightEnabledBBox(T const* points, NODETYPE const* nodes, int n);

// The tight box of the path after the transform m, in doubles: each Bezier
// is transformed first and bounded in the transformed space, so the box is
// tight there. Starts (and stays, for null arrays or n < 1) at left = bottom
// = the largest double and right = top = minus the largest double. O(n).
template <class T>
MavikMath::BoundsT<double> GetTightTransformedBBox(T const* points, NODETYPE const* nodes, int n,
                                                   MavikMath::MATRIX const& m);

// The box of every point (control points included) after the transform m,
// starting from the same inverted extremes as above. O(n).
template <class T>
MavikMath::BoundsT<double> GetLooseTransformedBBox(T const* points, int n, MavikMath::MATRIX const& m);

}  // namespace OstraCrv
