// Collinearity of many points; see collinear.h.
#include "ostracrv/math/collinear.h"

#include <cmath>

namespace MavikMath {

namespace {

using Framework::common_types::POINT;

bool IsFinitePoint(const POINT&) noexcept { return true; }
bool IsFinitePoint(const V& p) noexcept { return p.IsFinite(); }

// Index of the point farthest from `from` (the first of equals).
template <class T>
unsigned long Farthest(const T* points, unsigned long count, const V& from) noexcept {
  unsigned long best = 0;
  double bestDistance = -1.0;
  for (unsigned long i = 0; i < count; ++i) {
    const double d = SquaredDistance(ToV(points[i]), from);
    if (d > bestDistance) {
      bestDistance = d;
      best = i;
    }
  }
  return best;
}

}  // namespace

template <class T>
bool AreCollinear(const T* points, unsigned long count, double squaredTolerance) noexcept {
  if (!points) return false;
  for (unsigned long i = 0; i < count; ++i)
    if (!IsFinitePoint(points[i])) return false;
  if (count < 3) return true;
  if (count == 3) return AreCollinear(points[0], points[1], points[2], squaredTolerance);
  const V first = ToV(points[0]);
  const V from = ToV(points[Farthest(points, count, first)]);
  const V to = ToV(points[Farthest(points, count, from)]);
  const D base = to - from;
  const double length2 = base.SquaredLength();
  if (length2 < squaredTolerance) return true;
  if (!(length2 > 0.0)) return false;
  for (unsigned long i = 0; i < count; ++i) {
    const double cross = Cross(base, ToV(points[i]) - from);
    if (!(cross * cross / length2 < squaredTolerance)) return false;
  }
  return true;
}

template bool AreCollinear<POINT>(const POINT*, unsigned long, double) noexcept;
template bool AreCollinear<V>(const V*, unsigned long, double) noexcept;

}  // namespace MavikMath
