// The set operations of PolycurveT: union, intersection, difference and
// exclusive or, each as build graph, weld with the operation's keep rule,
// generate the output.
//
// Both operands are widened to double curves (exactly, for integer points);
// open subpaths take no part. The welding up-scale is an offer to hosts: 2^28
// is the coordinate range in which the weld tolerances (about 1.4 units) are
// small and double arithmetic on products of coordinates keeps about 1e-8
// units of precision.
#include <cmath>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/weld/keep_rules.h"
#include "ostracrv/weld/weldstate.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr double kUpScaleRange = 268435456.0;  // 2^28

template <class T>
PolycurveT<V> Widened(PolycurveT<T> const& c) {
  if constexpr (std::is_same_v<T, V>)
    return c;
  else
    return PolycurveT<V>(c);
}

template <class T>
PolycurveT<T> Weld(PolycurveT<T> const& first, PolycurveT<T> const& second, bool firstNonZero, bool secondNonZero,
                   WeldFlags flags, WeldKeepRule rule) {
  const PolycurveT<V> a = Widened(first), b = Widened(second);
  {
    WeldStateData state(a, firstNonZero, b, secondNonZero, false, false, flags);
    state.PerformWeld(rule);
    if (state.IsConsistent() || HasWeldFlag(flags, WeldFlags::Precise)) return state.GenerateOutputCurve<T>(false);
  }
  // Two curves passing within the weld tolerance of a node can leave the
  // graph with a meeting on one side only (a crossing next to the node is
  // taken for the touch there, and the touch for the crossing). The counts
  // then disagree round a loop; at the precise tolerance such near misses
  // are plain crossings, so the operation is done again there.
  WeldStateData state(a, firstNonZero, b, secondNonZero, false, false, flags | WeldFlags::Precise);
  state.PerformWeld(rule);
  return state.GenerateOutputCurve<T>(false);
}

}  // namespace

template <class T>
PolycurveT<T> PolycurveT<T>::Union(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                                   bool secondNonZero, WeldFlags flags) {
  return Weld(first, second, firstNonZero, secondNonZero, flags, &UnionKeepRule);
}

template <class T>
PolycurveT<T> PolycurveT<T>::Intersect(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                                       bool secondNonZero, WeldFlags flags) {
  return Weld(first, second, firstNonZero, secondNonZero, flags, &IntersectKeepRule);
}

template <class T>
PolycurveT<T> PolycurveT<T>::Subtract(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                                      bool secondNonZero, WeldFlags flags) {
  return Weld(first, second, firstNonZero, secondNonZero, flags, &SubtractKeepRule);
}

template <class T>
PolycurveT<T> PolycurveT<T>::Xor(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                                 bool secondNonZero, WeldFlags flags) {
  return Weld(first, second, firstNonZero, secondNonZero, flags, &XorKeepRule);
}

template <class T>
double PolycurveT<T>::GetWeldingUpScale() const {
  const unsigned long n = GetPointCount();
  if (n == 0) return 1.0;
  T const* p = GetPoints();
  double minX = double(p[0].x), maxX = minX, minY = double(p[0].y), maxY = minY;
  for (unsigned long i = 1; i < n; ++i) {
    minX = std::fmin(minX, double(p[i].x));
    maxX = std::fmax(maxX, double(p[i].x));
    minY = std::fmin(minY, double(p[i].y));
    maxY = std::fmax(maxY, double(p[i].y));
  }
  const double width = maxX - minX, height = maxY - minY;
  if (!(width > MavikMath::kEpsilon) || !(height > MavikMath::kEpsilon)) return 1.0;
  // The largest y does not enter: the range is measured from the other
  // three extremes and the two extents.
  const double m = std::fmax(std::fmax(std::fmax(std::fabs(minX), std::fabs(maxX)), std::fmax(width, std::fabs(minY))),
                             height);
  if (!(m <= kUpScaleRange)) return 1.0;
  return kUpScaleRange / m;
}

#define OSTRACRV_WELD_OPERATIONS(T)                                                                         \
  template PolycurveT<T> PolycurveT<T>::Union(PolycurveT const&, PolycurveT const&, bool, bool, WeldFlags);     \
  template PolycurveT<T> PolycurveT<T>::Intersect(PolycurveT const&, PolycurveT const&, bool, bool, WeldFlags); \
  template PolycurveT<T> PolycurveT<T>::Subtract(PolycurveT const&, PolycurveT const&, bool, bool, WeldFlags);  \
  template PolycurveT<T> PolycurveT<T>::Xor(PolycurveT const&, PolycurveT const&, bool, bool, WeldFlags);       \
  template double PolycurveT<T>::GetWeldingUpScale() const;
OSTRACRV_WELD_OPERATIONS(POINT)
OSTRACRV_WELD_OPERATIONS(V)
#undef OSTRACRV_WELD_OPERATIONS

}  // namespace OstraCrv
