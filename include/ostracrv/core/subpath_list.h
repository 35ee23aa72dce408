// Listing the subpaths of a raw path.
#pragma once

#include <vector>

#include "ostracrv/core/nodetype.h"
#include "ostracrv/core/polycurve.h"
#include "ostracrv/core/subcurve_range.h"

namespace OstraCrv {

// Clears out, then appends one record per subpath in array order, pointing
// into the arrays (nothing is copied): each stretch runs from a first node to
// the node before the next move (or the array's end). A record's limit is
// true when its first node is at or beyond `limit`, or when limit is
// negative. Returns whether any record was made: false for null arrays or
// n < 1. O(n).
template <class T>
bool GetSubPaths(T const* points, NODETYPE const* nodes, int n, std::vector<ConstDrawCurveT<T>>& out, int limit);

// The (first, count) pairs of all subpaths in array order; empty for null
// nodes or n < 1. O(n).
std::vector<SubcurveRange> GetSubpathRanges(NODETYPE const* nodes, int n);

}  // namespace OstraCrv
