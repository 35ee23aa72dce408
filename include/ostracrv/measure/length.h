// Arc length of a path and of parts of it.
//
// A line counts its distance, a Bezier the integral of its speed
// |3a t^2 + 2b t + c| over its parameter range (a, b, c its power-basis
// coefficients), computed by CubicBezier::Length at the given accuracy.
// Subpaths are summed without the gaps between them. Every result is a
// finite number: non-finite sums answer 0.0.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/bezier_length.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The length of all segments of all subpaths at accuracy 10. 0.0 for null
// arrays and n < 2. O(n).
template <class T>
double GetLength(T const* points, NODETYPE const* nodes, int n);
// The same at the given accuracy (about 10^-accuracy relative).
template <class T>
double GetLength(T const* points, NODETYPE const* nodes, int n, MavikMath::LengthAccuracy accuracy);
// The length of the polyline through n points; 0.0 for null points, n < 2.
template <class T>
double GetLength(T const* points, int n);

// The length from the start of the path, across subpaths, to the place t on
// the segment that ends at endNode: all segments that end before endNode,
// plus t times the segment at endNode (LengthTo for a Bezier). A node that
// ends no segment adds nothing for itself. t is clamped to 0..1; a NaN t,
// null arrays or n < 2 give 0.0. O(endNode).
template <class T>
double GetLengthAlongCurveTo(T const* points, NODETYPE const* nodes, int n, unsigned long endNode, double t);
// The mirror: from t on the segment at endNode to the end of the path.
// GetLengthAlongCurveTo(e, t) + GetLengthFrom(e, t) is GetLength for every
// end node e, up to the accuracy of Bezier length. O(n - endNode).
template <class T>
double GetLengthFrom(T const* points, NODETYPE const* nodes, int n, unsigned long endNode, double t);

}  // namespace OstraCrv
