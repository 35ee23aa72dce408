// Signed area; see area.h.
//
// By Green's theorem the area enclosed by a closed curve is the integral of
// y dx around it (with this sign, clockwise positive when y points up). A line
// from (x0, y0) to (x1, y1) contributes exactly (y0 + y1)(x1 - x0) / 2; a
// Bezier contributes the closed-form integral of its degree-5 polynomial
// y(t) x'(t) (CubicBezier::GetAreaUnderBezier). Nothing is flattened.
//
// Integer coordinates: sums and differences are formed in 64 bits, where
// they cannot overflow, and multiplied as doubles.
#include "ostracrv/measure/area.h"

#include <cmath>
#include <cstdint>

#include "ostracrv/math/bezier_area.h"
#include "ostracrv/math/bezier_basis.h"

namespace OstraCrv {

namespace {

using Framework::common_types::POINT;
using MavikMath::V;

// (y0 + y1)(x1 - x0) / 2 of one edge.
inline double Trapezoid(POINT const& a, POINT const& b) noexcept {
  const int64_t sy = int64_t(a.y) + b.y;
  const int64_t dx = int64_t(b.x) - a.x;
  return double(sy) * double(dx) * 0.5;
}
inline double Trapezoid(V const& a, V const& b) noexcept { return (a.y + b.y) * (b.x - a.x) * 0.5; }

inline double Finite(double v) noexcept { return std::isfinite(v) ? v : 0.0; }

}  // namespace

template <class T>
double GetArea(T const* points, NODETYPE const* nodes, int n) {
  if (!points || !nodes || n < 2) return 0.0;
  double sum = 0.0;
  bool closed = IsMove(nodes[0]) && IsClosedNode(nodes[0]);
  int i = 1;
  while (i < n) {
    const NODETYPE node = nodes[i];
    switch (GetSegmentType(node)) {
      case SegmentType::move:
        closed = IsClosedNode(node);
        ++i;
        break;
      case SegmentType::line:
        if (closed) sum += Trapezoid(points[i - 1], points[i]);
        ++i;
        break;
      case SegmentType::arc:
        if (i + 2 >= n) return Finite(sum);
        if (closed) {
          const auto pb = MavikMath::CubicBezier::GetPowerBasis(points + i - 1);
          sum += MavikMath::CubicBezier::GetAreaUnderBezier(pb.a, pb.b, pb.c, pb.d);
        }
        i += 3;
        break;
      case SegmentType::curve:
        ++i;
        break;
    }
  }
  return Finite(sum);
}

template <class T>
static double PolygonArea(T const* points, int n) {
  if (!points || n < 2) return 0.0;
  double sum = 0.0;
  for (int i = 1; i < n; ++i) sum += Trapezoid(points[i - 1], points[i]);
  return Finite(sum);
}

double GetPolygonArea(POINT const* points, int n) { return PolygonArea(points, n); }
double GetPolygonArea(V const* points, int n) { return PolygonArea(points, n); }

template double GetArea<POINT>(POINT const*, NODETYPE const*, int);
template double GetArea<V>(V const*, NODETYPE const*, int);

}  // namespace OstraCrv
