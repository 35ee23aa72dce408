// Where a path comes nearest to a target point.
//
// FindClosestPoint answers the single nearest point; FindClosestPoints all
// local minima of the distance along the path: perpendicular feet inside
// segments, nodes where the target lies in the outer wedge of a corner, and
// ends of open subpaths that the target lies beyond. Distances are squared,
// in doubles. Integer results round the point half away from zero while the
// distance is that of the exact point.
#pragma once

#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/curveposition.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/core/polycurve.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The nearest point of the path to target, in one pass over the segments
// without allocation. Candidates are compared strictly, so of equally near
// ones the first in array order stands. Fills out (position with the
// segment's ordinal, start and end node and t; the point; its squared
// distance; interior for a point strictly inside a segment) and returns true;
// returns false, out unchanged, for null arrays, n < 2, a path without
// segments or a non-finite target. O(n).
template <class T>
bool FindClosestPoint(T const* points, NODETYPE const* nodes, int n, T const& target,
                      ClosestPoint<T, CurvePosition>& out);

// All local minima of the distance from target to the path, appended to out
// (which is not cleared), then the whole of out sorted by distance (the order
// of equal distances is unspecified). Returns whether out is non-empty.
// Allocates the lists of the Bezier searches. O(n).
template <class T>
bool FindClosestPoints(T const* points, NODETYPE const* nodes, int n, T const& target,
                       std::vector<ClosestPoint<T, CurvePosition>>& out);

// The minima of one subpath: points and nodes point at its first node, n is
// its node count, first its index in the whole path and segment the running
// ordinal of the next segment (advanced past this subpath's segments).
// Records carry whole-path node indices. Nothing for null arrays or n < 1.
template <class T>
void FindClosestPointsOnSubpathT(int& segment, T const* points, NODETYPE const* nodes, int n, T const& target,
                                 unsigned long first, std::vector<ClosestPoint<T, CurvePosition>>& out);

// The end of an open subpath nearest to p: over the subpaths of more than one
// node that are not closed, their first and last nodes (except the node
// exclude). node is set to 0 first and then to the index of the nearest end.
// Returns its squared distance, or the largest double when there is none.
// O(n).
template <class T>
double FindClosestOpenPointOnCurve(PolycurveT<T> const& curve, T p, unsigned long& node, int exclude);

}  // namespace OstraCrv
