// Bounding boxes; see bounds.h.
//
// Method. Lines bound themselves by their end points. A cubic Bezier reaches
// its extremes either at an end or where one component of its derivative
// vanishes, so its tight box comes from the roots of two quadratics
// (CubicBezier::GetTightBounds): constant work per segment, no flattening.
// All folding is done in doubles; an integer box is then rounded outward
// once, which equals rounding every candidate outward (floor and ceiling are
// monotone). Integer coordinates widen to doubles exactly.
#include "ostracrv/measure/bounds.h"

#include <limits>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_derivatives.h"

namespace OstraCrv {

namespace {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::BoundsT;
using MavikMath::V;

// Folds the tight box of the Bezier p[0..3] into b. A Bezier with
// non-finite coefficients contributes its finite end points only.
template <class T>
void FoldBezier(T const* p, BoundsT<double>& b) noexcept {
  const auto pb = MavikMath::CubicBezier::GetPowerBasis(p);
  double lx, ly, hx, hy;
  if (MavikMath::CubicBezier::GetTightBounds<double>(pb.a, pb.b, pb.c, pb.d, lx, ly, hx, hy)) {
    b.Add(lx, ly);
    b.Add(hx, hy);
  } else {
    b.Add(MavikMath::ToV(p[0]));
    b.Add(MavikMath::ToV(p[3]));
  }
}

// The tight walk: point 0, then move and line points, and each Bezier whose
// first arc is met. A curve node met on its own adds nothing.
template <class T>
void FoldTight(T const* points, NODETYPE const* nodes, int n, BoundsT<double>& b) noexcept {
  b.Add(MavikMath::ToV(points[0]));
  int i = 1;
  while (i < n) {
    switch (GetSegmentType(nodes[i])) {
      case SegmentType::move:
      case SegmentType::line:
        b.Add(MavikMath::ToV(points[i]));
        ++i;
        break;
      case SegmentType::arc:
        if (i + 2 >= n) return;
        FoldBezier(points + i - 1, b);
        i += 3;
        break;
      case SegmentType::curve:
        ++i;
        break;
    }
  }
}

BoundsT<double> InvertedExtremes() noexcept {
  BoundsT<double> b;
  b.left = b.bottom = std::numeric_limits<double>::max();
  b.right = b.top = -std::numeric_limits<double>::max();
  return b;
}

RECT EmptyRect() noexcept {
  RECT r;
  MavikMath::InitializeEmpty(r);
  return r;
}

}  // namespace

RECT GetLooseBBox(POINT const* points, int n) { return MavikMath::GetPointsBBox(points, n); }

RECT GetLooseBBox(V const* points, int n) { return MavikMath::ToRect(MavikMath::GetPointsBBox(points, n)); }

void GetLooseBBox(POINT const* points, int n, RECT& out) { out = GetLooseBBox(points, n); }

template <class T>
RECT GetTightBBox(T const* points, NODETYPE const* nodes, int n) {
  if (!points || !nodes || n < 1) return EmptyRect();
  BoundsT<double> b;
  FoldTight(points, nodes, n, b);
  return MavikMath::ToRect(b);
}

void GetTightBBox(V const* points, NODETYPE const* nodes, int n, BoundsT<double>& out) {
  if (!points || !nodes || n < 1) return;
  BoundsT<double> b;
  FoldTight(points, nodes, n, b);
  out = b;
}

template <class T>
RECT GetTightEnabledBBox(T const* points, NODETYPE const* nodes, int n) {
  if (!points || !nodes || n < 2) return EmptyRect();
  BoundsT<double> b;
  int i = 1;
  while (i < n) {
    switch (GetSegmentType(nodes[i])) {
      case SegmentType::arc:
        if (i + 2 >= n) return MavikMath::ToRect(b);
        if (IsEnabledNode(nodes[i - 1]) || IsEnabledNode(nodes[i]) || IsEnabledNode(nodes[i + 1]) ||
            IsEnabledNode(nodes[i + 2]))
          FoldBezier(points + i - 1, b);
        i += 3;
        break;
      case SegmentType::line:
        if (IsEnabledNode(nodes[i]) || IsEnabledNode(nodes[i - 1])) {
          b.Add(MavikMath::ToV(points[i - 1]));
          b.Add(MavikMath::ToV(points[i]));
        }
        ++i;
        break;
      default:
        ++i;
        break;
    }
  }
  return MavikMath::ToRect(b);
}

template <class T>
BoundsT<double> GetTightTransformedBBox(T const* points, NODETYPE const* nodes, int n, MavikMath::MATRIX const& m) {
  BoundsT<double> b = InvertedExtremes();
  if (!points || !nodes || n < 1) return b;
  b.Add(m(MavikMath::ToV(points[0])));
  int i = 1;
  while (i < n) {
    switch (GetSegmentType(nodes[i])) {
      case SegmentType::move:
      case SegmentType::line:
        b.Add(m(MavikMath::ToV(points[i])));
        ++i;
        break;
      case SegmentType::arc: {
        if (i + 2 >= n) return b;
        // Transformed in doubles, so integer control points are not rounded
        // before the box is taken.
        V q[4];
        for (int k = 0; k < 4; ++k) q[k] = MavikMath::ToV(points[i - 1 + k]);
        m.TransformPoints(q, 4);
        FoldBezier(q, b);
        i += 3;
        break;
      }
      case SegmentType::curve:
        ++i;
        break;
    }
  }
  return b;
}

template <class T>
BoundsT<double> GetLooseTransformedBBox(T const* points, int n, MavikMath::MATRIX const& m) {
  BoundsT<double> b = InvertedExtremes();
  if (!points || n < 1) return b;
  for (int i = 0; i < n; ++i) b.Add(m(MavikMath::ToV(points[i])));
  return b;
}

#define OSTRACRV_INSTANTIATE_BOUNDS(T)                                                                           \
  template RECT GetTightBBox<T>(T const*, NODETYPE const*, int);                                                 \
  template RECT GetTightEnabledBBox<T>(T const*, NODETYPE const*, int);                                          \
  template BoundsT<double> GetTightTransformedBBox<T>(T const*, NODETYPE const*, int, MavikMath::MATRIX const&); \
  template BoundsT<double> GetLooseTransformedBBox<T>(T const*, int, MavikMath::MATRIX const&);

OSTRACRV_INSTANTIATE_BOUNDS(POINT)
OSTRACRV_INSTANTIATE_BOUNDS(V)

#undef OSTRACRV_INSTANTIATE_BOUNDS

}  // namespace OstraCrv
