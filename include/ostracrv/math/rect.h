// Rectangles: integer RECT and double BoundsT, with the folding services the
// path code uses (empty marker, union, intersection, inflation, point test).
//
// Both use the field order left (smallest x), top (largest y), right (largest
// x), bottom (smallest y): y points up. An empty rectangle is inverted, with
// left above right and bottom above top, so that folding a point or a
// rectangle into it by min/max needs no special case. For RECT the empty
// marker is (INT_MAX, INT_MIN, INT_MIN, INT_MAX); for BoundsT it is the same
// with infinities.
#pragma once

#include <cstdint>
#include <limits>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath {

template <class S>
struct BoundsT {
  S left = std::numeric_limits<S>::infinity();
  S top = -std::numeric_limits<S>::infinity();
  S right = -std::numeric_limits<S>::infinity();
  S bottom = std::numeric_limits<S>::infinity();

  constexpr bool IsEmpty() const noexcept { return !(left <= right) || !(bottom <= top); }
  constexpr S Width() const noexcept { return right - left; }
  constexpr S Height() const noexcept { return top - bottom; }
  // Folds one point in.
  constexpr void Add(S x, S y) noexcept {
    if (x < left) left = x;
    if (x > right) right = x;
    if (y < bottom) bottom = y;
    if (y > top) top = y;
  }
  constexpr void Add(const V& p) noexcept { Add(p.x, p.y); }
  // Folds another bounds in; an empty one changes nothing.
  constexpr void Add(const BoundsT& o) noexcept {
    if (o.IsEmpty()) return;
    Add(o.left, o.top);
    Add(o.right, o.bottom);
  }
  friend constexpr bool operator==(const BoundsT& a, const BoundsT& b) noexcept {
    return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
  }
};

using Bounds = BoundsT<double>;

// Double bounds to RECT, rounded outward (floor of the low sides, ceiling of
// the high sides) and saturated to the int32 range. Empty stays empty.
Framework::common_types::RECT ToRect(const BoundsT<double>& b) noexcept;
BoundsT<double> ToBounds(const Framework::common_types::RECT& r) noexcept;

void InitializeEmpty(Framework::common_types::RECT& r) noexcept;
void InitializeEmpty(BoundsT<double>& b) noexcept;
bool IsRectEmpty(const Framework::common_types::RECT& r) noexcept;

// Grows each side by dx and dy (shrinks for negative values), saturating.
void InflateRect(Framework::common_types::RECT& r, int dx, int dy) noexcept;
void InflateRect(BoundsT<double>& b, double dx, double dy) noexcept;

// Folds the second rectangle into the first: common part / covering box.
// An intersection without common area leaves an empty (inverted) rectangle.
void IntersectRect(Framework::common_types::RECT& r, const Framework::common_types::RECT& o) noexcept;
void UnionRect(Framework::common_types::RECT& r, const Framework::common_types::RECT& o) noexcept;
void IntersectRect(BoundsT<double>& r, const BoundsT<double>& o) noexcept;
void UnionRect(BoundsT<double>& r, const BoundsT<double>& o) noexcept;
// True when the two rectangles share at least one point (edges inclusive).
bool DoRectsOverlap(const Framework::common_types::RECT& a, const Framework::common_types::RECT& b) noexcept;
bool DoRectsOverlap(const BoundsT<double>& a, const BoundsT<double>& b) noexcept;

// Inclusive containment test.
bool IsPointInRect(const Framework::common_types::POINT& p, const Framework::common_types::RECT& r) noexcept;
bool IsPointInRect(const V& p, const Framework::common_types::RECT& r) noexcept;
bool IsPointInRect(const V& p, const BoundsT<double>& r) noexcept;

// The centre, rounded half away from zero for the integer form. An empty
// rectangle has none: the result is then meaningless (NaN for BoundsT).
Framework::common_types::POINT GetRectCenter(const Framework::common_types::RECT& r) noexcept;
V GetRectCenter(const BoundsT<double>& b) noexcept;

// Bounds of a point list; a null pointer or a count below 1 gives empty.
Framework::common_types::RECT GetPointsBBox(const Framework::common_types::POINT* points, int count) noexcept;
BoundsT<double> GetPointsBBox(const V* points, int count) noexcept;
void GetPointsBBox(const Framework::common_types::POINT* points, int count, Framework::common_types::RECT& out) noexcept;

}  // namespace MavikMath
