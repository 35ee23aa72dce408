// The point-in-shape methods of PolycurveT, on the curve's arrays. Reads
// only; nothing forks.
#include "ostracrv/core/polycurve.h"
#include "ostracrv/measure/curve_side.h"
#include "ostracrv/measure/point_in_shape.h"
#include "ostracrv/measure/point_in_shape_interior.h"

namespace OstraCrv {

template <class T>
bool PolycurveT<T>::IsPointInShape(T const& p, bool resultOnEdge, bool nonZero) const {
  return OstraCrv::IsPointInShape(GetPoints(), GetNodeTypes(), int(GetPointCount()), p, resultOnEdge, nonZero,
                                  nullptr, nullptr);
}

template <class T>
bool PolycurveT<T>::FindPointInShape(T& out) const {
  return GetPointInShape(GetPoints(), GetNodeTypes(), int(GetPointCount()), out);
}

template <class T>
MavikMath::Side PolycurveT<T>::GetSide(T const& p) const {
  return OstraCrv::GetSide(GetPoints(), GetNodeTypes(), int(GetPointCount()), p);
}

template <class T>
MavikMath::Side PolycurveT<T>::OnLeftOrRight(PolycurveT const& other) const {
  T inside{};
  if (!other.FindPointInShape(inside)) return MavikMath::SideNone;
  return GetSide(inside);
}

#define OSTRACRV_INSTANTIATE_INSHAPE_METHODS(T)                                   \
  template bool PolycurveT<T>::IsPointInShape(T const&, bool, bool) const;        \
  template bool PolycurveT<T>::FindPointInShape(T&) const;                        \
  template MavikMath::Side PolycurveT<T>::GetSide(T const&) const;                \
  template MavikMath::Side PolycurveT<T>::OnLeftOrRight(PolycurveT const&) const;

OSTRACRV_INSTANTIATE_INSHAPE_METHODS(Framework::common_types::POINT)
OSTRACRV_INSTANTIATE_INSHAPE_METHODS(MavikMath::V)

#undef OSTRACRV_INSTANTIATE_INSHAPE_METHODS

}  // namespace OstraCrv
