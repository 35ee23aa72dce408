// In-place cuts of one path segment.
//
// Beziers are cut by de Casteljau subdivision in the math layer. A line is cut
// by interpolation p0 + t (p1 - p0); the integer form rounds the product half
// away from zero before adding it, so that a cut at t = 0 or 1 returns the
// end points exactly. A subsection of a line cuts the end at t1 first and then
// finds the start at t0 / t1 on the shortened line (in the integer form from
// the rounded end); t1 = 0 leaves both ends on the start point instead of
// dividing by zero. O(1).
#include "ostracrv/core/segment_cut.h"

#include <utility>

#include "ostracrv/math/bezier_split.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

// p + t (q - p), the product rounded on its own in the integer form.
template <class T>
T Along(const T& p, const T& q, double t) noexcept {
  if constexpr (MavikMath::IsIntegerPoint<T>) {
    const V step{t * (double(q.x) - double(p.x)), t * (double(q.y) - double(p.y))};
    return MavikMath::FromV<T>(V{double(p.x) + MavikMath::RoundToInt(step.x), double(p.y) + MavikMath::RoundToInt(step.y)});
  } else {
    return V{p.x + t * (q.x - p.x), p.y + t * (q.y - p.y)};
  }
}

}  // namespace

template <class T>
void RightOf(double t, T* points, NODETYPE* nodes) {
  if (!points || !nodes) return;
  if (IsLine(nodes[1])) {
    points[0] = Along(points[0], points[1], t);
    return;
  }
  MavikMath::CubicBezier::RightOf(t, points, points);
}

template <class T>
void LeftOf(double t, T* points, NODETYPE* nodes) {
  if (!points || !nodes) return;
  if (IsLine(nodes[1])) {
    points[1] = Along(points[0], points[1], t);
    return;
  }
  MavikMath::CubicBezier::LeftOf(t, points, points);
}

template <class T>
void Subsection(double t0, double t1, T* points, NODETYPE* nodes) {
  if (!points || !nodes) return;
  if (t0 > t1) std::swap(t0, t1);
  if (IsLine(nodes[1])) {
    const T e = Along(points[0], points[1], t1);
    const T s = t1 != 0.0 ? Along(points[0], e, t0 / t1) : points[0];
    points[0] = s;
    points[1] = e;
    return;
  }
  MavikMath::CubicBezier::Subsection(t0, t1, points, points);
}

template void RightOf<POINT>(double, POINT*, NODETYPE*);
template void RightOf<V>(double, V*, NODETYPE*);
template void LeftOf<POINT>(double, POINT*, NODETYPE*);
template void LeftOf<V>(double, V*, NODETYPE*);
template void Subsection<POINT>(double, double, POINT*, NODETYPE*);
template void Subsection<V>(double, double, V*, NODETYPE*);

}  // namespace OstraCrv
