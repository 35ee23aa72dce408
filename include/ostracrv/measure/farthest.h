// The farthest point of a point list from a given point.
#pragma once

#include <utility>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The index of the point of the list farthest from p and its squared
// distance, in doubles. A later point must be strictly farther to win, so
// the first of equals stands; points at a NaN distance never win. (-1, the
// largest double) for null points, n < 1 or no comparable point. O(n).
template <class T>
std::pair<int, double> FindFarthestPoint(T const* points, int n, T const& p);

}  // namespace OstraCrv
