// The measurement methods of PolycurveT: each passes the curve's arrays to
// the raw measure of the same name (bounds.h, area.h, length.h,
// pointoncurve.h, tangents.h). Reads only; nothing forks.
#include "ostracrv/core/polycurve.h"
#include "ostracrv/measure/area.h"
#include "ostracrv/measure/bounds.h"
#include "ostracrv/measure/length.h"
#include "ostracrv/measure/pointoncurve.h"
#include "ostracrv/measure/tangents.h"

namespace OstraCrv {

namespace {
using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::D;
using MavikMath::V;
}  // namespace

template <class T>
RECT PolycurveT<T>::GetTightBBox() const {
  return OstraCrv::GetTightBBox(GetPoints(), GetNodeTypes(), int(GetPointCount()));
}

template <class T>
RECT PolycurveT<T>::GetLooseBBox() const {
  return OstraCrv::GetLooseBBox(GetPoints(), int(GetPointCount()));
}

template <class T>
RECT PolycurveT<T>::GetTightEnabledBBox() const {
  return OstraCrv::GetTightEnabledBBox(GetPoints(), GetNodeTypes(), int(GetPointCount()));
}

template <class T>
MavikMath::BoundsT<double> PolycurveT<T>::GetTightTransformedBBox(MavikMath::MATRIX const& m) const {
  return OstraCrv::GetTightTransformedBBox(GetPoints(), GetNodeTypes(), int(GetPointCount()), m);
}

template <class T>
MavikMath::BoundsT<double> PolycurveT<T>::GetLooseTransformedBBox(MavikMath::MATRIX const& m) const {
  return OstraCrv::GetLooseTransformedBBox(GetPoints(), int(GetPointCount()), m);
}

template <class T>
double PolycurveT<T>::GetArea() const {
  return OstraCrv::GetArea(GetPoints(), GetNodeTypes(), int(GetPointCount()));
}

template <class T>
double PolycurveT<T>::GetLength() const {
  return OstraCrv::GetLength(GetPoints(), GetNodeTypes(), int(GetPointCount()));
}

template <class T>
T PolycurveT<T>::GetPointOnCurve(unsigned long i, double t) const {
  return OstraCrv::GetPointOnCurve(GetPoints(), GetNodeTypes(), int(GetPointCount()), i, t);
}

template <class T>
bool PolycurveT<T>::GetPointOnCurve(unsigned long i, double t, T& out) const {
  V v;
  if (!OstraCrv::GetPoint2dOnCurve(GetPoints(), GetNodeTypes(), int(GetPointCount()), i, t, v)) return false;
  out = MavikMath::FromV<T>(v);
  return true;
}

template <class T>
T PolycurveT<T>::GetPointOnCurve(CurvePosition const& pos) const {
  if (pos.segment < 0 || pos.endNode < 0) return T{};
  return GetPointOnCurve((unsigned long)pos.endNode, pos.t);
}

template <class T>
bool PolycurveT<T>::GetPointOnCurve(CurvePosition const& pos, T& out) const {
  if (pos.segment < 0 || pos.endNode < 0) return false;
  return GetPointOnCurve((unsigned long)pos.endNode, pos.t, out);
}

template <class T>
bool PolycurveT<T>::GetPointOnCurve(unsigned long i, double t, V& out) const requires(!std::is_same_v<T, V>) {
  return OstraCrv::GetPoint2dOnCurve(GetPoints(), GetNodeTypes(), int(GetPointCount()), i, t, out);
}

template <class T>
V PolycurveT<T>::GetPoint2dOnCurve(unsigned long i, double t) const {
  V v;
  OstraCrv::GetPoint2dOnCurve(GetPoints(), GetNodeTypes(), int(GetPointCount()), i, t, v);
  return v;
}

template <class T>
T PolycurveT<T>::GetPointOnCurve() const {
  const unsigned long n = GetPointCount();
  NODETYPE const* nodes = GetNodeTypes();
  if (n > 1 && IsLine(nodes[1])) return GetPointOnCurve(1ul, 0.5);
  if (n > 3 && IsCurve(nodes[3])) return GetPointOnCurve(3ul, 0.5);
  return T{};
}

template <class T>
D PolycurveT<T>::GetTangentAt(unsigned long i, double t, bool normalise) const {
  const int index = i > (unsigned long)INT32_MAX ? -1 : int(i);
  return OstraCrv::GetTangentAt(GetPoints(), GetNodeTypes(), GetPointCount(), index, t, normalise);
}

template <class T>
D PolycurveT<T>::GetForwardTangentAt(int i) const {
  return OstraCrv::GetForwardTangentAt(GetPoints(), GetNodeTypes(), int(GetPointCount()), i);
}

template <class T>
D PolycurveT<T>::GetReverseTangentAt(int i) const {
  return OstraCrv::GetReverseTangentAt(GetPoints(), GetNodeTypes(), int(GetPointCount()), i);
}

template <class T>
double PolycurveT<T>::GetForwardCurvatureAt(int i) const {
  return OstraCrv::GetForwardCurvatureAt(GetPoints(), GetNodeTypes(), int(GetPointCount()), i);
}

template <class T>
double PolycurveT<T>::GetReverseCurvatureAt(int i) const {
  return OstraCrv::GetReverseCurvatureAt(GetPoints(), GetNodeTypes(), int(GetPointCount()), i);
}

template <class T>
bool PolycurveT<T>::IsClockwise(unsigned long i, double t, T const& centre, D* tangent) const {
  return OstraCrv::IsClockwise(GetPoints(), GetNodeTypes(), int(GetPointCount()), i, t, centre, tangent);
}

template <class T>
bool PolycurveT<T>::IsCuspNode(unsigned long i) const {
  if (i >= GetPointCount()) return false;
  return OstraCrv::IsCuspNode(GetPoints(), GetNodeTypes(), int(GetPointCount()), int(i));
}

template <class T>
int PolycurveT<T>::GetNumberOfSegments() const {
  return GetSegmentCount(GetNodeTypes(), int(GetPointCount()));
}

template <class T>
bool PolycurveT<T>::AllLineSegments() const {
  const unsigned long n = GetPointCount();
  if (n == 0) return false;
  NODETYPE const* nodes = GetNodeTypes();
  for (unsigned long i = 0; i < n; ++i)
    if (nodes[i] & 0x80) return false;
  return true;
}

#define OSTRACRV_INSTANTIATE_MEASURE_METHODS(T)                                                               \
  template RECT PolycurveT<T>::GetTightBBox() const;                                                          \
  template RECT PolycurveT<T>::GetLooseBBox() const;                                                          \
  template RECT PolycurveT<T>::GetTightEnabledBBox() const;                                                   \
  template MavikMath::BoundsT<double> PolycurveT<T>::GetTightTransformedBBox(MavikMath::MATRIX const&) const; \
  template MavikMath::BoundsT<double> PolycurveT<T>::GetLooseTransformedBBox(MavikMath::MATRIX const&) const; \
  template double PolycurveT<T>::GetArea() const;                                                             \
  template double PolycurveT<T>::GetLength() const;                                                           \
  template T PolycurveT<T>::GetPointOnCurve(unsigned long, double) const;                                     \
  template bool PolycurveT<T>::GetPointOnCurve(unsigned long, double, T&) const;                              \
  template T PolycurveT<T>::GetPointOnCurve(CurvePosition const&) const;                                      \
  template bool PolycurveT<T>::GetPointOnCurve(CurvePosition const&, T&) const;                               \
  template V PolycurveT<T>::GetPoint2dOnCurve(unsigned long, double) const;                                   \
  template T PolycurveT<T>::GetPointOnCurve() const;                                                          \
  template D PolycurveT<T>::GetTangentAt(unsigned long, double, bool) const;                                  \
  template D PolycurveT<T>::GetForwardTangentAt(int) const;                                                   \
  template D PolycurveT<T>::GetReverseTangentAt(int) const;                                                   \
  template double PolycurveT<T>::GetForwardCurvatureAt(int) const;                                            \
  template double PolycurveT<T>::GetReverseCurvatureAt(int) const;                                            \
  template bool PolycurveT<T>::IsClockwise(unsigned long, double, T const&, D*) const;                        \
  template bool PolycurveT<T>::IsCuspNode(unsigned long) const;                                               \
  template int PolycurveT<T>::GetNumberOfSegments() const;                                                    \
  template bool PolycurveT<T>::AllLineSegments() const;

OSTRACRV_INSTANTIATE_MEASURE_METHODS(POINT)
OSTRACRV_INSTANTIATE_MEASURE_METHODS(V)
// The double-point form exists only where it differs from the curve's own.
template bool PolycurveT<POINT>::GetPointOnCurve(unsigned long, double, V&) const;

#undef OSTRACRV_INSTANTIATE_MEASURE_METHODS

}  // namespace OstraCrv
