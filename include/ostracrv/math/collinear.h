// Whether points lie near one straight line.
//
// Distances are compared squared, strictly: a tolerance t means "closer than
// sqrt(t)". Integer points are read as doubles.
//
// Three points: if any two are closer than the tolerance, a line through the
// third and either of them passes near all three, so the answer is yes.
// Otherwise the longest side is the base (the side opposite the apex), since
// the height over the longest side is the smallest height of the triangle,
// and the apex's squared distance from the base's line, cross^2 / |base|^2,
// decides. A base of zero length cannot carry a line: the answer is no.
//
// Many points: the base runs between two points far apart: the point
// farthest from the first, and the point farthest from that one (at least
// half the diameter). If even they are closer than the tolerance, all points
// lie within it of a line through the first; otherwise every point must lie
// within it of the base's line. Three points use the three-point rule.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath {

// True if a, b and c lie within sqrt(threshold) of one line (threshold is a
// squared distance). False for non-finite points.
template <class T>
bool AreCollinear(const T& a, const T& b, const T& c, double threshold) noexcept {
  const V pa = ToV(a), pb = ToV(b), pc = ToV(c);
  if (!pa.IsFinite() || !pb.IsFinite() || !pc.IsFinite()) return false;
  const double ab = SquaredDistance(pa, pb), ac = SquaredDistance(pa, pc), bc = SquaredDistance(pb, pc);
  if (ab < threshold || ac < threshold || bc < threshold) return true;
  V from = pa, to = pb, apex = pc;
  double base = ab;
  if (bc > ab && bc > ac) {
    from = pb;
    to = pc;
    apex = pa;
    base = bc;
  } else if (ac > ab) {
    from = pa;
    to = pc;
    apex = pb;
    base = ac;
  }
  if (!(base > 0.0)) return false;
  const double cross = Cross(to - from, apex - from);
  return cross * cross / base < threshold;
}

// True if all count points lie within sqrt(squaredTolerance) of one line
// (see above for the choice of line). True for fewer than three finite
// points; false for a null pointer and for non-finite points.
// Cost: O(count).
template <class T>
bool AreCollinear(const T* points, unsigned long count, double squaredTolerance) noexcept;

}  // namespace MavikMath
