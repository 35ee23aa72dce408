// Clipping an infinite line against an axis-aligned rectangle.
//
// The line through `from` and `to` is written from + s d with d = to - from.
// The sides are tried in the order smallest x, largest x, largest y, smallest
// y. A vertical side is skipped when d.x is 0 and a horizontal one when d.y is
// 0 (the line runs parallel to it); otherwise the line meets the side's own
// line at one s, and the side counts when the other coordinate lies within
// the side, ends included. The first two hits are the line's way through the
// rectangle. A line through a corner meets two sides there, and a line that
// only grazes a corner gives two equal parameters.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath {

// With two hits: enter and leave get their parameters along d (the smaller
// in enter) and the result is true. With fewer, false and both untouched.
// Also false for an empty (inverted) rectangle, from equal to to, and
// non-finite input. P is V or POINT; R is RECT or BoundsT<double>.
template <class P, class R>
bool LineRectIntersection(const P& from, const P& to, const R& rect, double& enter, double& leave) noexcept;

}  // namespace MavikMath
