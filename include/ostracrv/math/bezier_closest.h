// Nearest points of a cubic Bezier to a target point.
//
// Method. With the target moved to the origin the squared distance is
// f(t) = |B(t)|^2, a polynomial of degree 6, and its stationary points are the
// roots of g(t) = B(t) . B'(t), of degree 5. These roots are isolated on
// [0, 1] by FindRootsInInterval (recursion on derivatives: every root is
// bracketed, none is lost to a poor starting guess) and each is polished by
// Newton's method on g evaluated from the Bernstein form, which is better
// conditioned than the power basis. The candidates are those roots and the
// two ends, so the global minimum is found on loops and cusps as well: a
// cusp is a root of g because B' vanishes there. Root isolation rather than
// sampling plus Newton because sampling can miss a narrow dip next to a cusp
// and Newton can settle in a local minimum.
//
// Complexity: constant, about a microsecond per call; nothing is allocated
// in FindClosestPointOnBezier.
//
// Bad input: a null pointer, a non-finite coordinate or a curve whose four
// points coincide (squared spread at most kEpsilon) gives false and leaves
// every output as it was. A curve that is only a point has no parameter to
// speak of; callers test its end points themselves.
#pragma once

#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// The nearest point of the Bezier p[0..3] to target.
// squaredDistance enters as the best squared distance known so far (the
// largest double for none). Returns true, and writes t in [0, 1], the point
// and its squared distance, only if a point strictly closer than that is
// found; otherwise returns false and writes nothing. A box test on the
// control points rejects a curve that cannot beat the entering distance at
// once. In the integer form the point is rounded half away from zero, while
// the squared distance is that of the exact curve point.
template <class T>
bool FindClosestPointOnBezier(const T* p, const T& target, double& t, T& point, double& squaredDistance) noexcept;

// All local minima of the distance from target to the Bezier p[0..3], in
// ascending order of t: perpendicular feet in the interior, and an end point
// when the distance grows from it into the curve. Appends one entry per
// minimum to each of the three parallel lists (existing entries are kept).
// Returns whether anything was appended. A target at the centre of a
// circular arc may give several minima of practically equal distance.
// Points are rounded half away from zero in the integer form.
template <class T>
bool FindClosestPointsOnBezier(const T* p, const T& target, std::vector<double>& ts, std::vector<T>& points,
                               std::vector<double>& squaredDistances);

}  // namespace MavikMath::CubicBezier
