// Directions, curvature, passing side and the cusp test; see tangents.h.
//
// The forward and reverse walks look through segments of zero length: a
// line whose end equals the node's point, or a Bezier whose three other
// points all equal it, carries no direction, so the next segment decides.
// Each walk stops at the end of its subpath. The Bezier tangent comes from
// CubicBezier::SafeBezierTangent, which stays defined at a collapsed handle
// (where the plain derivative vanishes), and the curvature from
// SafeBezierCurvature. Both are O(1) per node except for the zero-length
// stretches, which are walked over (O(subpath) at worst).
//
// The cusp threshold -0.9999 is the cosine of the angle between the two
// sides; it lets a bend of less than about 0.81 degrees (acos 0.9999) pass as
// straight, which absorbs the rounding of integer control points.
#include "ostracrv/measure/tangents.h"

#include <cmath>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_derivatives.h"

namespace OstraCrv {

namespace {

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;
namespace CB = MavikMath::CubicBezier;

constexpr double kStraightCosine = -0.9999;

inline D FiniteOrZero(D v) noexcept { return v.IsFinite() ? v : D{}; }
inline double FiniteOrZero(double v) noexcept { return std::isfinite(v) ? v : 0.0; }

template <class T>
inline D Difference(T const& to, T const& from) noexcept {
  return D(MavikMath::ToV(to) - MavikMath::ToV(from));
}

// Start or end tangent of the Bezier p[0..3].
template <class T>
D BezierTangent(T const* p, double t) noexcept {
  const auto pb = CB::GetPowerBasis(p);
  return CB::SafeBezierTangent(t, pb.a, pb.b, pb.c, pb.d);
}

template <class T>
double BezierCurvature(T const* p, double t) noexcept {
  const auto pb = CB::GetPowerBasis(p);
  return CB::SafeBezierCurvature(t, pb.a, pb.b, pb.c);
}

template <class T>
inline bool AllEqual(T const* p, T const& q) noexcept {
  return p[0] == q && p[1] == q && p[2] == q;
}

}  // namespace

template <class T>
D GetTangentAt(T const* points, NODETYPE const* nodes, unsigned long n, int i, double t, bool normalise) {
  if (!points || !nodes || i < 1 || (unsigned long)i >= n) return D{1.0, 0.0};
  D v;
  const NODETYPE node = nodes[i];
  if (IsCurve(node) && i >= 3)
    v = BezierTangent(points + i - 3, t);
  else if (IsLine(node))
    v = Difference(points[i], points[i - 1]);
  else
    return D{};
  v = FiniteOrZero(v);
  if (normalise) v.Normalize();
  return v;
}

template <class T>
D GetTangentAt(T const* points, NODETYPE const* nodes, unsigned long n, CurvePosition const& pos) {
  return GetTangentAt(points, nodes, n, pos.endNode, pos.t, true);
}

template <class T>
D GetForwardTangentAt(T const* points, NODETYPE const* nodes, int n, int i) {
  if (!points || !nodes || i < 0 || i >= n) return D{};
  // The closing node of a closed subpath continues through its first node.
  if (CRV_IsLastClosedSubpathNode(nodes, n, i)) i = CRV_FirstNodeOfThisSubpath(nodes, n, i);
  if (IsArc(nodes[i]) || i + 1 >= n) return D{};
  const T pi = points[i];
  int j = i + 1;
  while (j < n) {
    switch (GetSegmentType(nodes[j])) {
      case SegmentType::line:
        if (points[j] != pi) return FiniteOrZero(Difference(points[j], pi));
        ++j;
        break;
      case SegmentType::arc:
        if (j + 2 >= n) return D{};
        if (AllEqual(points + j, pi)) {
          j += 3;
          break;
        }
        return FiniteOrZero(BezierTangent(points + j - 1, 0.0));
      default:
        return D{};
    }
  }
  return D{};
}

template <class T>
D GetReverseTangentAt(T const* points, NODETYPE const* nodes, int n, int i) {
  if (!points || !nodes || i < 0 || i >= n) return D{};
  // The first node of a closed subpath looks back from its closing node.
  if (CRV_IsFirstClosedSubpathNode(nodes, n, i)) i = CRV_LastNodeOfThisSubpath(nodes, n, i);
  if (IsArc(nodes[i]) || i < 1) return D{};
  const T pi = points[i];
  int j = i - 1;
  while (j >= 0 && !IsMove(nodes[j + 1])) {
    if (!IsArc(nodes[j])) {
      if (points[j] != pi) return FiniteOrZero(Difference(points[j], pi));
      --j;
      continue;
    }
    if (j < 2) return D{};
    if (AllEqual(points + j - 2, pi)) {
      j -= 3;
      continue;
    }
    return FiniteOrZero(-BezierTangent(points + j - 2, 1.0));
  }
  return D{};
}

template <class T>
double GetForwardCurvatureAt(T const* points, NODETYPE const* nodes, int n, int i) {
  if (!points || !nodes || i < 0 || i >= n || IsArc(nodes[i]) || i + 1 >= n) return 0.0;
  const T pi = points[i];
  int j = i + 1;
  while (j < n) {
    switch (GetSegmentType(nodes[j])) {
      case SegmentType::line:
        if (points[j] != pi) return 0.0;  // a line has no curvature
        ++j;
        break;
      case SegmentType::arc:
        if (j + 2 >= n) return 0.0;
        if (AllEqual(points + j, pi)) {
          j += 3;
          break;
        }
        return FiniteOrZero(BezierCurvature(points + j - 1, 0.0));
      default:
        return 0.0;
    }
  }
  return 0.0;
}

template <class T>
double GetReverseCurvatureAt(T const* points, NODETYPE const* nodes, int n, int i) {
  if (!points || !nodes || i < 1 || i >= n || IsArc(nodes[i])) return 0.0;
  const T pi = points[i];
  int j = i - 1;
  while (j >= 0 && !IsMove(nodes[j + 1])) {
    if (!IsArc(nodes[j])) {
      if (points[j] != pi) return 0.0;
      --j;
      continue;
    }
    if (j < 2) return 0.0;
    if (AllEqual(points + j - 2, pi)) {
      j -= 3;
      continue;
    }
    return FiniteOrZero(BezierCurvature(points + j - 2, 1.0));
  }
  return 0.0;
}

template <class T>
bool IsClockwise(T const* points, NODETYPE const* nodes, int n, unsigned long i, double t, T const& centre,
                 D* tangent) {
  if (!points || !nodes || n < 1 || i == 0 || i >= (unsigned long)n) return false;
  V q;
  D v;
  const NODETYPE node = nodes[i];
  if (IsCurve(node) && i >= 3) {
    const auto pb = CB::GetPowerBasis(points + i - 3);
    q = CB::Evaluate(pb.a, pb.b, pb.c, pb.d, t);
    v = CB::Derivative(pb.a, pb.b, pb.c, t);
  } else if (IsLine(node)) {
    const V p0 = MavikMath::ToV(points[i - 1]), p1 = MavikMath::ToV(points[i]);
    q = MavikMath::Lerp(p0, p1, t);
    // At the very end p1 - q vanishes; the direction is then taken back to p0.
    v = t == 1.0 ? q - p0 : p1 - q;
  } else {
    return false;
  }
  if (!q.IsFinite() || !v.IsFinite()) return false;
  const D w = q - MavikMath::ToV(centre);
  if (tangent) *tangent = v;
  return v.y * w.x - v.x * w.y < 0.0;
}

template <class T>
bool IsCuspNode(T const* points, NODETYPE const* nodes, int n, int i) {
  if (!points || !nodes || i < 0 || i >= n) return false;
  if (GetContinuity(nodes[i]) != ContinuityType::cusp) return false;
  const int first = CRV_FirstNodeOfThisSubpath(nodes, n, i);
  const int last = CRV_LastNodeOfThisSubpath(nodes, n, i);
  if (first < 0 || last < 0) return false;
  const bool closed = IsClosedNode(nodes[i]) && IsClosedNode(nodes[first]) && last > first;
  const T pi = points[i];

  // Forward: the first point after i that differs from it. The closing node
  // of a closed subpath continues after the first node (the same place).
  V ahead = MavikMath::ToV(pi);
  const int fromAhead = (closed && i == last) ? first + 1 : i + 1;
  for (int k = fromAhead; k <= last; ++k) {
    ahead = MavikMath::ToV(points[k]);
    if (points[k] != pi) break;
  }
  // Backward: the first node of a closed subpath continues before its
  // closing node; an open subpath's start has nothing before it.
  V behind = MavikMath::ToV(pi);
  const int fromBehind = (closed && i == first) ? last - 1 : i - 1;
  for (int k = fromBehind; k >= first; --k) {
    behind = MavikMath::ToV(points[k]);
    if (points[k] != pi) break;
  }

  const D u = ahead - MavikMath::ToV(pi);
  const D v = behind - MavikMath::ToV(pi);
  const double m = u.SquaredLength() * v.SquaredLength();
  if (m == 0.0) return true;
  return MavikMath::Dot(u, v) / std::sqrt(m) > kStraightCosine;
}

#define OSTRACRV_INSTANTIATE_TANGENTS(T)                                                             \
  template D GetTangentAt<T>(T const*, NODETYPE const*, unsigned long, int, double, bool);           \
  template D GetTangentAt<T>(T const*, NODETYPE const*, unsigned long, CurvePosition const&);        \
  template D GetForwardTangentAt<T>(T const*, NODETYPE const*, int, int);                            \
  template D GetReverseTangentAt<T>(T const*, NODETYPE const*, int, int);                            \
  template double GetForwardCurvatureAt<T>(T const*, NODETYPE const*, int, int);                     \
  template double GetReverseCurvatureAt<T>(T const*, NODETYPE const*, int, int);                     \
  template bool IsClockwise<T>(T const*, NODETYPE const*, int, unsigned long, double, T const&, D*); \
  template bool IsCuspNode<T>(T const*, NODETYPE const*, int, int);

OSTRACRV_INSTANTIATE_TANGENTS(POINT)
OSTRACRV_INSTANTIATE_TANGENTS(V)

#undef OSTRACRV_INSTANTIATE_TANGENTS

}  // namespace OstraCrv
