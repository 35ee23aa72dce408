// On which side of a path a point lies.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/side.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The side of the path's nearest segment to p, in that segment's forward
// frame with y up: SideLeft or SideRight. The nearest point is found over the
// whole path (closest.h); on a line the sign of the cross product of the
// line's direction with p minus its start decides, on a Bezier the side
// search of the math library (bezier_side.h). SideNone for a point on the
// nearest segment (exactly, for a line), for null arrays, a path without
// segments and a non-finite p. O(n).
template <class T>
MavikMath::Side GetSide(T const* points, NODETYPE const* nodes, int n, T const& p);

}  // namespace OstraCrv
