// The geometric operations of a segment view: nearest point, the on-curve
// test and the intersection test of two views; see curvesegment.h.
//
// The nearest point runs the path search of closest.h on the view's own
// entries (a line or curve view is a small path of one segment), so a view
// and its path answer alike.
//
// Intersection of two views:
//  - Proximity first, when asked: an end point of either view within 10 units
//    of the other view (squared distance at most 100, fixed in both point
//    kinds, not scaled with the curve) counts as meeting.
//  - A move view meets nothing.
//  - With a Bezier involved the control-point boxes (integer, rounded
//    outward; touching boxes overlap) reject far pairs cheaply before the
//    curve test of the math layer.
//  - Two lines a0-a1 (this) and b0-b1 (other): the ends of b must not lie
//    strictly on one side of line a (product of the two crosses above 0
//    fails), and the ends of a must lie strictly on both sides of line b
//    (product below 0). The strictness differs on purpose: an end of the
//    other line lying on this one passes, an end of this line lying on the
//    other does not, and collinear lines never meet here.
#include <cmath>

#include "ostracrv/core/curvesegment.h"
#include "ostracrv/math/bezier_intersect.h"
#include "ostracrv/math/bezier_line_intersect.h"
#include "ostracrv/measure/closest.h"

namespace OstraCrv {

namespace {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::V;

// Ten units of distance, squared.
constexpr double kProximitySquared = 100.0;

RECT BoxOf(RECT const& r) noexcept { return r; }
RECT BoxOf(MavikMath::BoundsT<double> const& b) noexcept { return MavikMath::ToRect(b); }

// The squared distance from p to the view, as IsPointOnCurve measures it;
// false if there is none.
template <class T>
bool SquaredDistanceTo(CurveSegmentT<T> const& v, T const& p, double& out) {
  ClosestPoint<T, SegmentPosition> c;
  if (!v.FindClosestPoint(p, c)) return false;
  out = c.distanceSquared;
  return true;
}

inline double Cross(V const& o, V const& a, V const& b) noexcept {
  return (a.x - o.x) * (b.y - o.y) - (a.y - o.y) * (b.x - o.x);
}

}  // namespace

template <class T>
bool CurveSegmentT<T>::FindClosestPoint(T p, ClosestPoint<T, SegmentPosition>& out) const {
  if (!valid()) return false;
  if (type() == kMove) {
    const double d = MavikMath::SquaredDistance(MavikMath::ToV(points_.front()), MavikMath::ToV(p));
    if (!std::isfinite(d)) return false;
    out.position.t = 0.0;
    out.point = points_.front();
    out.distanceSquared = d;
    out.interior = false;
    return true;
  }
  ClosestPoint<T, CurvePosition> c;
  if (!OstraCrv::FindClosestPoint(points_.data(), nodes_.data(), int(points_.size()), p, c)) return false;
  out.position.t = c.position.t;
  out.point = c.point;
  out.distanceSquared = c.distanceSquared;
  out.interior = c.interior;
  return true;
}

template <class T>
bool CurveSegmentT<T>::IsPointOnCurve(T const& p, double tolerance) const {
  if (!std::isfinite(tolerance)) return false;
  double d;
  if (!SquaredDistanceTo(*this, p, d)) return false;
  return d <= tolerance * tolerance;
}

template <class T>
bool CurveSegmentT<T>::DoesIntersectWith(CurveSegmentT other, bool includeProximity) const {
  if (!valid() || !other.valid()) return false;
  if (includeProximity) {
    double d;
    if (SquaredDistanceTo(*this, other.endpoint(), d) && d <= kProximitySquared) return true;
    if (SquaredDistanceTo(*this, other.startpoint(), d) && d <= kProximitySquared) return true;
    if (SquaredDistanceTo(other, endpoint(), d) && d <= kProximitySquared) return true;
    if (SquaredDistanceTo(other, startpoint(), d) && d <= kProximitySquared) return true;
  }
  const int a = type(), b = other.type();
  if ((a != kLine && a != kCurve) || (b != kLine && b != kCurve)) return false;

  if (a == kCurve || b == kCurve) {
    if (!MavikMath::DoRectsOverlap(BoxOf(GetPointsBBox()), BoxOf(other.GetPointsBBox()))) return false;
    if (a == kCurve && b == kCurve)
      return MavikMath::CubicBezier::DoBeziersIntersect(points_.data(), other.points_.data());
    T const* curve = a == kCurve ? points_.data() : other.points_.data();
    T const* line = a == kCurve ? other.points_.data() : points_.data();
    return MavikMath::CubicBezier::DoesBezierIntersectLineSegment(curve, line);
  }

  const V a0 = MavikMath::ToV(points_[0]), a1 = MavikMath::ToV(points_[1]);
  const V b0 = MavikMath::ToV(other.points_[0]), b1 = MavikMath::ToV(other.points_[1]);
  if (Cross(a0, a1, b1) * Cross(a0, a1, b0) > 0.0) return false;
  return Cross(b0, b1, a1) * Cross(b0, b1, a0) < 0.0;
}

#define OSTRACRV_INSTANTIATE_SEGMENT_GEOMETRY(T)                                                \
  template bool CurveSegmentT<T>::FindClosestPoint(T, ClosestPoint<T, SegmentPosition>&) const; \
  template bool CurveSegmentT<T>::IsPointOnCurve(T const&, double) const;                       \
  template bool CurveSegmentT<T>::DoesIntersectWith(CurveSegmentT<T>, bool) const;

OSTRACRV_INSTANTIATE_SEGMENT_GEOMETRY(POINT)
OSTRACRV_INSTANTIATE_SEGMENT_GEOMETRY(V)

#undef OSTRACRV_INSTANTIATE_SEGMENT_GEOMETRY

}  // namespace OstraCrv
