// The box test that opens every pair test of the intersection engine, and
// that the pair pruning reproduces: both call GetSegmentBox and DoBoxesMeet,
// so they agree bit for bit.
//
// The box is that of the control points (the curve lies in their hull),
// inflated by the largest tolerance of the run, so that an end within the
// tolerance of the other segment is not lost. Integer segments are tested on
// integers: the inflation is rounded up to a whole number, capped at 2^33
// (beyond the whole int32 plane, so a larger inflation makes every box meet
// every other just the same), and the box is computed in 64-bit integers and
// held exactly in doubles. A NaN or negative tolerance inflates by nothing.
#include <algorithm>
#include <cmath>
#include <cstdint>

#include "ostracrv/intersect/pair_intersections.h"

namespace OstraCrv {

namespace {
using Framework::common_types::POINT;
using MavikMath::V;

constexpr double kMaxIntegerInflation = 8589934592.0;  // 2^33
}  // namespace

double GetBoxInflation(const SegmentIntersectionSettings& settings) noexcept {
  double r = 0.0;
  if (settings.endTolerance > r) r = settings.endTolerance;
  if (settings.touchTolerance > r) r = settings.touchTolerance;
  if (settings.useExtendedTouch && settings.extendedTouchDistance > r) r = settings.extendedTouchDistance;
  return r;
}

template <class T>
bool GetSegmentBox(T const* p, SegmentIntersections::Type type, double inflation, SegmentBox& box) noexcept {
  if (!p) return false;
  const int n = type == SegmentIntersections::Bezier ? 4 : 2;
  if constexpr (MavikMath::IsIntegerPoint<T>) {
    int64_t lx = p[0].x, hx = p[0].x, ly = p[0].y, hy = p[0].y;
    for (int i = 1; i < n; ++i) {
      lx = std::min<int64_t>(lx, p[i].x);
      hx = std::max<int64_t>(hx, p[i].x);
      ly = std::min<int64_t>(ly, p[i].y);
      hy = std::max<int64_t>(hy, p[i].y);
    }
    const double up = inflation > 0.0 ? std::ceil(std::min(inflation, kMaxIntegerInflation)) : 0.0;
    const int64_t r = static_cast<int64_t>(up);
    box.minX = static_cast<double>(lx - r);
    box.minY = static_cast<double>(ly - r);
    box.maxX = static_cast<double>(hx + r);
    box.maxY = static_cast<double>(hy + r);
  } else {
    double lx = p[0].x, hx = p[0].x, ly = p[0].y, hy = p[0].y;
    for (int i = 0; i < n; ++i) {
      if (!p[i].IsFinite()) return false;
      lx = std::min(lx, p[i].x);
      hx = std::max(hx, p[i].x);
      ly = std::min(ly, p[i].y);
      hy = std::max(hy, p[i].y);
    }
    const double r = inflation > 0.0 ? inflation : 0.0;
    box.minX = lx - r;
    box.minY = ly - r;
    box.maxX = hx + r;
    box.maxY = hy + r;
  }
  return true;
}

template bool GetSegmentBox<POINT>(POINT const*, SegmentIntersections::Type, double, SegmentBox&) noexcept;
template bool GetSegmentBox<V>(V const*, SegmentIntersections::Type, double, SegmentBox&) noexcept;

}  // namespace OstraCrv
