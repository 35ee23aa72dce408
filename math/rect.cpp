// Rectangle folding services. See rect.h for the empty-rectangle convention.
#include "ostracrv/math/rect.h"

#include <algorithm>
#include <climits>
#include <cmath>

namespace MavikMath {

using Framework::common_types::POINT;
using Framework::common_types::RECT;

namespace {

// A whole number clamped to the int32 range; 0 for NaN.
int32_t SaturateWhole(double w) noexcept {
  if (!(w == w)) return 0;
  if (w >= 2147483647.0) return INT32_MAX;
  if (w <= -2147483648.0) return INT32_MIN;
  return static_cast<int32_t>(w);
}

int32_t SaturateFloor(double v) noexcept { return SaturateWhole(std::floor(v)); }
int32_t SaturateCeil(double v) noexcept { return SaturateWhole(std::ceil(v)); }

int32_t Saturate(int64_t v) noexcept {
  return static_cast<int32_t>(std::clamp<int64_t>(v, INT32_MIN, INT32_MAX));
}

}  // namespace

RECT ToRect(const BoundsT<double>& b) noexcept {
  RECT r;
  if (b.IsEmpty()) {
    InitializeEmpty(r);
    return r;
  }
  r.left = SaturateFloor(b.left);
  r.bottom = SaturateFloor(b.bottom);
  r.right = SaturateCeil(b.right);
  r.top = SaturateCeil(b.top);
  return r;
}

BoundsT<double> ToBounds(const RECT& r) noexcept {
  BoundsT<double> b;
  if (IsRectEmpty(r)) return b;
  b.left = r.left;
  b.top = r.top;
  b.right = r.right;
  b.bottom = r.bottom;
  return b;
}

void InitializeEmpty(RECT& r) noexcept {
  r.left = INT32_MAX;
  r.top = INT32_MIN;
  r.right = INT32_MIN;
  r.bottom = INT32_MAX;
}

void InitializeEmpty(BoundsT<double>& b) noexcept { b = BoundsT<double>{}; }

bool IsRectEmpty(const RECT& r) noexcept { return r.left > r.right || r.bottom > r.top; }

void InflateRect(RECT& r, int dx, int dy) noexcept {
  r.left = Saturate(int64_t(r.left) - dx);
  r.right = Saturate(int64_t(r.right) + dx);
  r.bottom = Saturate(int64_t(r.bottom) - dy);
  r.top = Saturate(int64_t(r.top) + dy);
}

void InflateRect(BoundsT<double>& b, double dx, double dy) noexcept {
  b.left -= dx;
  b.right += dx;
  b.bottom -= dy;
  b.top += dy;
}

void IntersectRect(RECT& r, const RECT& o) noexcept {
  r.left = std::max(r.left, o.left);
  r.right = std::min(r.right, o.right);
  r.bottom = std::max(r.bottom, o.bottom);
  r.top = std::min(r.top, o.top);
}

void UnionRect(RECT& r, const RECT& o) noexcept {
  if (IsRectEmpty(o)) return;
  if (IsRectEmpty(r)) {
    r = o;
    return;
  }
  r.left = std::min(r.left, o.left);
  r.right = std::max(r.right, o.right);
  r.bottom = std::min(r.bottom, o.bottom);
  r.top = std::max(r.top, o.top);
}

void IntersectRect(BoundsT<double>& r, const BoundsT<double>& o) noexcept {
  r.left = std::max(r.left, o.left);
  r.right = std::min(r.right, o.right);
  r.bottom = std::max(r.bottom, o.bottom);
  r.top = std::min(r.top, o.top);
}

void UnionRect(BoundsT<double>& r, const BoundsT<double>& o) noexcept { r.Add(o); }

bool DoRectsOverlap(const RECT& a, const RECT& b) noexcept {
  return !IsRectEmpty(a) && !IsRectEmpty(b) && a.left <= b.right && b.left <= a.right && a.bottom <= b.top &&
         b.bottom <= a.top;
}

bool DoRectsOverlap(const BoundsT<double>& a, const BoundsT<double>& b) noexcept {
  return a.left <= b.right && b.left <= a.right && a.bottom <= b.top && b.bottom <= a.top && !a.IsEmpty() &&
         !b.IsEmpty();
}

bool IsPointInRect(const POINT& p, const RECT& r) noexcept {
  return p.x >= r.left && p.x <= r.right && p.y >= r.bottom && p.y <= r.top;
}

bool IsPointInRect(const V& p, const RECT& r) noexcept {
  return p.x >= r.left && p.x <= r.right && p.y >= r.bottom && p.y <= r.top;
}

bool IsPointInRect(const V& p, const BoundsT<double>& r) noexcept {
  return p.x >= r.left && p.x <= r.right && p.y >= r.bottom && p.y <= r.top;
}

POINT GetRectCenter(const RECT& r) noexcept {
  return {RoundToInt((double(r.left) + double(r.right)) * 0.5), RoundToInt((double(r.bottom) + double(r.top)) * 0.5)};
}

V GetRectCenter(const BoundsT<double>& b) noexcept { return {(b.left + b.right) * 0.5, (b.bottom + b.top) * 0.5}; }

RECT GetPointsBBox(const POINT* points, int count) noexcept {
  RECT r;
  InitializeEmpty(r);
  if (!points || count < 1) return r;
  int32_t l = points[0].x, rt = points[0].x, b = points[0].y, t = points[0].y;
  for (int i = 1; i < count; ++i) {
    l = std::min(l, points[i].x);
    rt = std::max(rt, points[i].x);
    b = std::min(b, points[i].y);
    t = std::max(t, points[i].y);
  }
  r.left = l;
  r.right = rt;
  r.bottom = b;
  r.top = t;
  return r;
}

BoundsT<double> GetPointsBBox(const V* points, int count) noexcept {
  BoundsT<double> b;
  if (!points || count < 1) return b;
  for (int i = 0; i < count; ++i) b.Add(points[i]);
  return b;
}

void GetPointsBBox(const POINT* points, int count, RECT& out) noexcept { out = GetPointsBBox(points, count); }

}  // namespace MavikMath
