// Whether a point lies in a polygon given as a plain point list.
//
// The polygon closes itself from its last point back to the first. The test
// casts the horizontal line through the point and sorts the edges that cross
// it to the two sides of the point; see point_in_polygon.cpp for the rule.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// Whether p lies in the polygon of the n points.
//
// An edge counts when it crosses the horizontal through p by the half-open
// rule: its lower end strictly below p.y, its upper end at or above p.y (an
// edge with equal end heights never counts). Counted edges are sorted into A,
// those to the right of p, and B, those to its left or through it. With
// anyOnBothSides the answer is A > 0 and B > 0 (p is enclosed from both sides,
// a test that ignores winding); without it, both A and B are odd (even-odd).
//
// With testVertices, a vertex within squared distance 2.0 of p (at most, so
// the eight integer neighbours of a vertex count) makes the answer true at
// once and sets *onEdge. Only vertices are tested for closeness, never the
// inside of edges. onEdge, if not null, starts false.
//
// False for null points, n < 1 and a non-finite p. O(n), allocates nothing.
template <class T>
bool IsPointInPolygon(T const* points, int n, T const& p, bool anyOnBothSides, bool testVertices, bool* onEdge);

}  // namespace OstraCrv
