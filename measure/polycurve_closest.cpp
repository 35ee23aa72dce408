// The closest-point methods of PolycurveT, on the curve's arrays; see
// closest.h and length.h. Reads only; nothing forks.
#include <cmath>
#include <limits>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/measure/closest.h"
#include "ostracrv/measure/length.h"

namespace OstraCrv {

template <class T>
bool PolycurveT<T>::FindClosestPoint(T p, ClosestPoint<T, CurvePosition>& out) const {
  return OstraCrv::FindClosestPoint(GetPoints(), GetNodeTypes(), int(GetPointCount()), p, out);
}

template <class T>
bool PolycurveT<T>::FindClosestOpenPoint(T p, unsigned long& node) const {
  return FindClosestOpenPointOnCurve(*this, p, node, -1) < std::numeric_limits<double>::max();
}

template <class T>
bool PolycurveT<T>::IsPointOnCurve(T const& p, double tolerance) const {
  if (!std::isfinite(tolerance)) return false;
  ClosestPoint<T, CurvePosition> c;
  if (!FindClosestPoint(p, c)) return false;
  return c.distanceSquared <= tolerance * tolerance;
}

template <class T>
double PolycurveT<T>::GetLengthAlongCurveTo(T p) const {
  ClosestPoint<T, CurvePosition> c;
  if (!FindClosestPoint(p, c)) return 0.0;
  return GetLengthAlongCurveTo((unsigned long)c.position.endNode, c.position.t);
}

template <class T>
double PolycurveT<T>::GetLengthAlongCurveTo(unsigned long endNode, double t) const {
  return OstraCrv::GetLengthAlongCurveTo(GetPoints(), GetNodeTypes(), int(GetPointCount()), endNode, t);
}

template <class T>
double PolycurveT<T>::GetLengthFrom(unsigned long endNode, double t) const {
  return OstraCrv::GetLengthFrom(GetPoints(), GetNodeTypes(), int(GetPointCount()), endNode, t);
}

#define OSTRACRV_INSTANTIATE_CLOSEST_METHODS(T)                                            \
  template bool PolycurveT<T>::FindClosestPoint(T, ClosestPoint<T, CurvePosition>&) const; \
  template bool PolycurveT<T>::FindClosestOpenPoint(T, unsigned long&) const;              \
  template bool PolycurveT<T>::IsPointOnCurve(T const&, double) const;                     \
  template double PolycurveT<T>::GetLengthAlongCurveTo(T) const;                           \
  template double PolycurveT<T>::GetLengthAlongCurveTo(unsigned long, double) const;       \
  template double PolycurveT<T>::GetLengthFrom(unsigned long, double) const;

OSTRACRV_INSTANTIATE_CLOSEST_METHODS(Framework::common_types::POINT)
OSTRACRV_INSTANTIATE_CLOSEST_METHODS(MavikMath::V)

#undef OSTRACRV_INSTANTIATE_CLOSEST_METHODS

}  // namespace OstraCrv
