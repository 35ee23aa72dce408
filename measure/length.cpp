// Arc length; see length.h.
//
// Lines are measured exactly (hypot, no overflow for large coordinates).
// A Bezier's length has no closed form; CubicBezier::Length integrates the
// speed adaptively to the requested relative accuracy. The default accuracy 10
// (relative error about 1e-10) is the library's everywhere except where a
// caller asks otherwise.
#include "ostracrv/measure/length.h"

#include <algorithm>
#include <cmath>

#include "ostracrv/math/bezier_basis.h"

namespace OstraCrv {

namespace {

using Framework::common_types::POINT;
using MavikMath::V;

template <class T>
inline double PointDistance(T const& a, T const& b) noexcept {
  return MavikMath::Distance(MavikMath::ToV(a), MavikMath::ToV(b));
}

inline double Finite(double v) noexcept { return std::isfinite(v) ? v : 0.0; }

// The length of the segment that ends at i (line or curve), else 0.
template <class T>
double SegmentLength(T const* points, NODETYPE const* nodes, int i, MavikMath::LengthAccuracy accuracy) noexcept {
  const NODETYPE node = nodes[i];
  if (IsLine(node) && i >= 1) return PointDistance(points[i - 1], points[i]);
  if (IsCurve(node) && i >= 3) {
    const auto pb = MavikMath::CubicBezier::GetPowerBasis(points + i - 3);
    return MavikMath::CubicBezier::Length(pb.a, pb.b, pb.c, accuracy);
  }
  return 0.0;
}

}  // namespace

template <class T>
double GetLength(T const* points, NODETYPE const* nodes, int n, MavikMath::LengthAccuracy accuracy) {
  if (!points || !nodes || n < 2) return 0.0;
  double sum = 0.0;
  for (int i = 1; i < n; ++i) sum += SegmentLength(points, nodes, i, accuracy);
  return Finite(sum);
}

template <class T>
double GetLength(T const* points, NODETYPE const* nodes, int n) {
  return GetLength(points, nodes, n, MavikMath::kLengthPrecise);
}

template <class T>
double GetLength(T const* points, int n) {
  if (!points || n < 2) return 0.0;
  double sum = 0.0;
  for (int i = 1; i < n; ++i) sum += PointDistance(points[i - 1], points[i]);
  return Finite(sum);
}

template <class T>
double GetLengthAlongCurveTo(T const* points, NODETYPE const* nodes, int n, unsigned long endNode, double t) {
  if (!points || !nodes || n < 2 || std::isnan(t)) return 0.0;
  t = std::clamp(t, 0.0, 1.0);
  double sum = 0.0;
  const unsigned long whole = std::min<unsigned long>(endNode, (unsigned long)n);
  for (unsigned long i = 1; i < whole; ++i) sum += SegmentLength(points, nodes, int(i), MavikMath::kLengthPrecise);
  if (endNode < (unsigned long)n) {
    const int e = int(endNode);
    if (IsLine(nodes[e]) && e >= 1)
      sum += t * PointDistance(points[e - 1], points[e]);
    else if (IsCurve(nodes[e]) && e >= 3)
      sum += MavikMath::CubicBezier::LengthTo(t, points + e - 3);
  }
  return Finite(sum);
}

template <class T>
double GetLengthFrom(T const* points, NODETYPE const* nodes, int n, unsigned long endNode, double t) {
  if (!points || !nodes || n < 2 || std::isnan(t) || endNode >= (unsigned long)n) return 0.0;
  t = std::clamp(t, 0.0, 1.0);
  const int e = int(endNode);
  double sum = 0.0;
  if (IsLine(nodes[e]) && e >= 1)
    sum += (1.0 - t) * PointDistance(points[e - 1], points[e]);
  else if (IsCurve(nodes[e]) && e >= 3)
    sum += MavikMath::CubicBezier::LengthFrom(t, points + e - 3);
  for (int i = e + 1; i < n; ++i) sum += SegmentLength(points, nodes, i, MavikMath::kLengthPrecise);
  return Finite(sum);
}

#define OSTRACRV_INSTANTIATE_LENGTH(T)                                                             \
  template double GetLength<T>(T const*, NODETYPE const*, int);                                    \
  template double GetLength<T>(T const*, NODETYPE const*, int, MavikMath::LengthAccuracy);         \
  template double GetLength<T>(T const*, int);                                                     \
  template double GetLengthAlongCurveTo<T>(T const*, NODETYPE const*, int, unsigned long, double); \
  template double GetLengthFrom<T>(T const*, NODETYPE const*, int, unsigned long, double);

OSTRACRV_INSTANTIATE_LENGTH(POINT)
OSTRACRV_INSTANTIATE_LENGTH(V)

#undef OSTRACRV_INSTANTIATE_LENGTH

}  // namespace OstraCrv
