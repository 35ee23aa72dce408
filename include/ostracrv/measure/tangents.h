// Directions and curvature of a path at its nodes and on its segments, the
// side on which a segment passes a centre, and the cusp test of a node.
//
// Directions are MavikMath::D (x, y doubles). Curvature is signed in the
// direction of travel: positive for a left (counter-clockwise, y up) turn,
// cross(B', B'') / |B'|^3, so the curvature of a counter-clockwise circle is
// positive. Coordinates are compared exactly where a step "looks through"
// segments of zero length.
//
// Every function returns its neutral value ((0, 0), (1, 0), 0.0 or false, as
// listed) for null arrays, indices out of range and non-finite results, and
// reads nothing outside 0..n-1.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/curveposition.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The derivative at t of the segment that ends at i: for a curve node the
// Bezier's tangent (kept defined at a collapsed handle), for a line node its
// direction whatever t is; (0, 0) at any other node, never normalised. (1, 0)
// for i < 1, i >= n or null arrays. With normalise, a vector whose squared
// length exceeds 2^-52 is scaled to unit length; a shorter one stays raw.
template <class T>
MavikMath::D GetTangentAt(T const* points, NODETYPE const* nodes, unsigned long n, int i, double t, bool normalise);
// The same at the position's end node and parameter, normalised.
template <class T>
MavikMath::D GetTangentAt(T const* points, NODETYPE const* nodes, unsigned long n, CurvePosition const& pos);

// The direction in which the curve leaves node i, not normalised: the first
// segment after i that has length decides (a line's direction, a Bezier's
// start tangent); segments of zero length are looked through. At the last
// node of a closed subpath the walk continues from the subpath's first node,
// across the closing point. (0, 0) for an arc node, at the end of a subpath
// or of the arrays, and where nothing has length.
template <class T>
MavikMath::D GetForwardTangentAt(T const* points, NODETYPE const* nodes, int n, int i);
// The direction from node i back along the curve (pointing away from i, so
// that at a smooth node it is opposite to the forward tangent). At the first
// node of a closed subpath the walk starts from the subpath's last node.
// (0, 0) as above, and at the start of an open subpath.
template <class T>
MavikMath::D GetReverseTangentAt(T const* points, NODETYPE const* nodes, int n, int i);

// The signed curvature just after node i: 0.0 on a line, the Bezier's
// curvature at its start for a Bezier; zero-length segments are looked
// through as for the forward tangent. Unlike the tangent it does not wrap:
// after the closing point of a closed subpath it is 0.0.
template <class T>
double GetForwardCurvatureAt(T const* points, NODETYPE const* nodes, int n, int i);
// The signed curvature just before node i, in the path's direction of
// travel (the Bezier's curvature at its end); the mirror of the above.
template <class T>
double GetReverseCurvatureAt(T const* points, NODETYPE const* nodes, int n, int i);

// Whether the segment that ends at i passes centre clockwise at t: with q the
// point at t and v the direction of travel there, whether v turns clockwise
// around centre (v.y w.x - v.x w.y < 0 with w = q - centre). On a line v is
// p1 - q, or q - p0 at t = 1 exactly. tangent, if not null, receives v.
// false for i == 0, i >= n, a node that ends no segment, null arrays.
template <class T>
bool IsClockwise(T const* points, NODETYPE const* nodes, int n, unsigned long i, double t, T const& centre,
                 MavikMath::D* tangent);

// Whether node i is a corner. A node marked smooth or symmetric never is.
// Otherwise the nearest distinct points after and before it (control points
// included, across the closing point of a closed subpath) are compared: the
// node is a cusp unless the two directions are opposite within cos = -0.9999
// (about 0.81 degrees), and also when either side has no distinct point.
// false for i out of range or null arrays.
template <class T>
bool IsCuspNode(T const* points, NODETYPE const* nodes, int n, int i);

}  // namespace OstraCrv
