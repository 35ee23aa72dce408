// Growing a curve: plain appends, joining appends, arcs, whole-curve
// operators and the shape makers.
//
// Every method forks before it writes. Values passed by reference are copied
// first, since they may live in the storage that a fork or a reallocation
// releases; curves passed in are held by a local handle for the same reason
// (a curve may be appended to itself).
//
// Joins compare the squared distance with the squared tolerance and join at
// "at most", so a tolerance of 0.0 still joins coincident ends; a NaN
// distance or tolerance never joins. The collinear merge of LineTo uses a
// fixed squared distance of 10.0 (about 3.16 units) in both point kinds.
//
// The makers reserve the builder's worst case once (5 nodes for a rectangle,
// 13 for a circle, an ellipse or an arc), let it write behind the current
// end, and cut the arrays to what it wrote.
#include <cmath>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/math/collinear.h"
#include "ostracrv/math/matrix.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/measure/tangents.h"
#include "ostracrv/shapes/circular_arc.h"
#include "ostracrv/shapes/ellipse.h"
#include "ostracrv/shapes/rectangle.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::D;
using MavikMath::V;

namespace {

// Three points within sqrt(10) units of one line continue a straight line.
constexpr double kMergeCollinearSquared = 10.0;
constexpr int kRectangleNodes = 5;
constexpr int kArcNodes = 13;

constexpr NODETYPE kLow6 = 0x3F;
constexpr NODETYPE kEnabledAndContinuity = NodeMask::kEnabled | NodeMask::kContinuity;

// Whether two points lie within tolerance, squared distances compared with
// "at most".
template <class T>
bool WithinTolerance(const T& a, const T& b, double tolerance) noexcept {
  return MavikMath::SquaredDistance(MavikMath::ToV(a), MavikMath::ToV(b)) <= tolerance * tolerance;
}

}  // namespace

// ---- Plain appends ---------------------------------------------------------------

template <class T>
bool PolycurveT<T>::MoveTo(T const& p) {
  PushBack(p, ::NodeTypes::Open::move);
  return true;
}

template <class T>
bool PolycurveT<T>::MoveTo(coordinate_type x, coordinate_type y) {
  return MoveTo(T{x, y});
}

template <class T>
bool PolycurveT<T>::LineTo(T const& p) {
  PushBack(p, ::NodeTypes::Open::line);
  return true;
}

template <class T>
bool PolycurveT<T>::LineTo(coordinate_type x, coordinate_type y) {
  return LineTo(T{x, y});
}

template <class T>
bool PolycurveT<T>::LineTo(T const& p, bool mergeCollinear) {
  const unsigned long n = GetPointCount();
  if (n == 0) return false;
  const T point = p;
  if (mergeCollinear && n >= 2 && IsLine(GetNodeTypes()[n - 1])) {
    T const* pts = GetPoints();
    if (MavikMath::AreCollinear(pts[n - 2], pts[n - 1], point, kMergeCollinearSquared)) {
      ForkData()->points[n - 1] = point;
      return true;
    }
  }
  PushBack(point, ::NodeTypes::Open::line);
  return true;
}

template <class T>
bool PolycurveT<T>::LineTo(coordinate_type x, coordinate_type y, bool mergeCollinear) {
  return LineTo(T{x, y}, mergeCollinear);
}

template <class T>
bool PolycurveT<T>::CubicTo(T const& c1, T const& c2, T const& p) {
  const T pts[3] = {c1, c2, p};
  const NODETYPE nds[3] = {::NodeTypes::arc, ::NodeTypes::arc, ::NodeTypes::Open::curve};
  Append(pts, nds, 3);
  return true;
}

template <class T>
bool PolycurveT<T>::CircularArcTo(T const& p, D const& tangent) {
  if (IsEmpty()) return false;
  T pts[kArcNodes];
  NODETYPE nds[kArcNodes];
  const unsigned long count =
      BuildCircularArc(pts, nds, MavikMath::ToV(GetLastPoint()), MavikMath::ToV(p), tangent);
  if (count < 2) return false;
  // The arc continues the last subpath: its end is an ordinary open end even
  // where rounding made the builder see a whole circle.
  nds[count - 1] = NODETYPE((nds[count - 1] & ~NodeMask::kClosed) | NodeMask::kUser);
  Append(pts + 1, nds + 1, count - 1);
  return true;
}

template <class T>
bool PolycurveT<T>::CircularArcTo(T const& p) {
  const unsigned long n = GetPointCount();
  if (n == 0) return false;
  D tangent;
  if (n == 1) {
    // With d = p - last point the tangent is (-d.y, d.x): the arc leaves at
    // right angles to the chord, a half circle turning clockwise.
    const D d = MavikMath::ToV(p) - MavikMath::ToV(GetLastPoint());
    tangent = D{-d.y, d.x};
  } else {
    tangent = OstraCrv::GetTangentAt(GetPoints(), GetNodeTypes(), n, int(n - 1), 1.0, false);
  }
  return CircularArcTo(p, tangent);
}

// ---- Joining appends -------------------------------------------------------------

template <class T>
void PolycurveT<T>::PushBackWithJoinCheck(T const& p, NODETYPE const& node) {
  const T point = p;
  const NODETYPE byte = node;
  const unsigned long n = GetPointCount();
  if (n > 0 && GetPoints()[n - 1] == point) {
    NODETYPE& last = ForkData()->nodes[n - 1];
    last = NODETYPE((last & ~kEnabledAndContinuity) | (byte & kEnabledAndContinuity));
    return;
  }
  PushBack(point, NODETYPE(byte & kLow6));
}

template <class T>
bool PolycurveT<T>::AppendLineWithJoin(T const* p, NODETYPE const& node) {
  if (!p) return false;
  const T end = p[1];
  PushBackWithJoinCheck(p[0], node);
  PushBack(end, ::NodeTypes::Open::line);
  return true;
}

template <class T>
bool PolycurveT<T>::AppendBezierWithJoin(T const* p, NODETYPE const& node) {
  if (!p) return false;
  const T rest[3] = {p[1], p[2], p[3]};
  const NODETYPE nds[3] = {::NodeTypes::arc, ::NodeTypes::arc, ::NodeTypes::Open::curve};
  PushBackWithJoinCheck(p[0], node);
  Append(rest, nds, 3);
  return true;
}

template <class T>
void PolycurveT<T>::AppendWithJoin(PolycurveT const& other, bool closeAfter, double tolerance) {
  const PolycurveT piece(other);  // keeps other's arrays alive across the fork
  const unsigned long m = piece.GetPointCount();
  if (m == 0) return;
  const unsigned long n = GetPointCount();
  const bool joins = n > 0 && !IsClosedNode(GetNodeTypes()[n - 1]) &&
                     WithinTolerance(GetPoints()[n - 1], piece.GetPoints()[0], tolerance);
  if (!joins) {
    PushBack(piece);
  } else {
    // The seam keeps this curve's end point; other's first node goes.
    NODETYPE& seam = ForkData()->nodes[n - 1];
    seam = NODETYPE(seam & ~NodeMask::kContinuity);
    if (m > 1) {
      Append(piece.GetPoints() + 1, piece.GetNodeTypes() + 1, m - 1);
      // other's first subpath now continues an open one: a closed other
      // opens at the seam, its closing node becoming an open end.
      CurveData<T>* d = ForkData();
      const unsigned long total = d->nodes.size();
      unsigned long end = n;
      while (end + 1 < total && !IsMove(d->nodes[end + 1])) ++end;
      NODETYPE& last = d->nodes[end];
      if (IsClosedNode(last)) last = NODETYPE((last & ~NodeMask::kClosed) | NodeMask::kUser);
    }
  }
  if (closeAfter) CloseLastSubpath(tolerance, false);
}

// ---- Whole-curve operators -------------------------------------------------------

template <class T>
PolycurveT<T>& PolycurveT<T>::operator+=(PolycurveT const& o) {
  PushBack(o);
  return *this;
}

template <class T>
PolycurveT<T>& PolycurveT<T>::operator+=(std::vector<PolycurveT> const& curves) {
  for (const PolycurveT& c : curves) PushBack(c);
  return *this;
}

template <class T>
PolycurveT<T>& PolycurveT<T>::operator+=(D const& offset) {
  if (IsEmpty()) return *this;
  const D shift = offset;
  CurveData<T>* d = ForkData();
  if constexpr (MavikMath::IsIntegerPoint<T>) {
    // Rounded once, so that all points move by the same whole amount.
    const double dx = MavikMath::RoundToInt(shift.x), dy = MavikMath::RoundToInt(shift.y);
    for (T& p : d->points) p = MavikMath::FromV<T>(V{p.x + dx, p.y + dy});
  } else {
    for (T& p : d->points) p += shift;
  }
  return *this;
}

template <class T>
PolycurveT<T>& PolycurveT<T>::operator*=(MavikMath::MATRIX const& m) {
  if (IsEmpty()) return *this;
  const MavikMath::MATRIX copy = m;
  CurveData<T>* d = ForkData();
  copy.TransformPoints(d->points.data(), d->points.size());
  return *this;
}

template <class T>
PolycurveT<T>& PolycurveT<T>::operator/=(MavikMath::MATRIX const& m) {
  MavikMath::MATRIX inverse = m;
  // A singular matrix stays as it is: the inversion leaves it unchanged.
  inverse.Invert(MavikMath::kEpsilon);
  return *this *= inverse;
}

// ---- Makers ------------------------------------------------------------------------

template <class T>
bool PolycurveT<T>::CreateLineSubpath(T const& a, T const& b) {
  const T pts[2] = {a, b};
  const NODETYPE nds[2] = {::NodeTypes::Open::move, ::NodeTypes::Open::line};
  Append(pts, nds, 2);
  return true;
}

template <class T>
PolycurveT<T> PolycurveT<T>::CreateLine(T const& a, T const& b) {
  PolycurveT c;
  c.CreateLineSubpath(a, b);
  return c;
}

namespace {

// Runs a builder into room for `room` more nodes behind the curve's end and
// cuts the arrays to what it wrote. Returns whether it wrote anything.
template <class T, class Build>
bool BuildBehind(PolycurveT<T>& curve, int room, Build build) {
  const int n = int(curve.GetPointCount());
  CurveBuffer<T> buf = curve.GetBuffer(n + room);
  const unsigned long written = build(buf.points + n, buf.nodes + n);
  curve.ReleaseBuffer(n + int(written));
  return written > 0;
}

}  // namespace

template <class T>
bool PolycurveT<T>::CreateRectangleSubpath(RECT const& rect) {
  const RECT r = rect;
  return BuildBehind(*this, kRectangleNodes, [&](T* p, NODETYPE* nd) {
    if constexpr (MavikMath::IsIntegerPoint<T>) {
      return BuildRectangle(p, nd, r);
    } else {
      // The bounds form has the corners of the RECT form: same orientation,
      // same sign of the area.
      return BuildRectangle(p, nd, MavikMath::ToBounds(r));
    }
  });
}

template <class T>
PolycurveT<T> PolycurveT<T>::CreateRectangle(RECT const& rect) {
  PolycurveT c;
  c.CreateRectangleSubpath(rect);
  return c;
}

template <class T>
bool PolycurveT<T>::CreateCircleSubpath(T const& centre, double radius) {
  const T c = centre;
  return BuildBehind(*this, kArcNodes, [&](T* p, NODETYPE* nd) { return BuildCircle(p, nd, c, radius); });
}

template <class T>
PolycurveT<T> PolycurveT<T>::CreateCircle(T const& centre, double radius) {
  PolycurveT c;
  c.CreateCircleSubpath(centre, radius);
  return c;
}

template <class T>
bool PolycurveT<T>::CreateEllipseSubpath(T const& centre, T const& radii) {
  const T c = centre, r = radii;
  // Starting at angle 0, on the quadrant grid: four pieces, 13 nodes.
  return BuildBehind(*this, kArcNodes, [&](T* p, NODETYPE* nd) {
    return BuildEllipse(p, nd, c, double(r.x), double(r.y), 0.0, 0.0, false, false);
  });
}

template <class T>
PolycurveT<T> PolycurveT<T>::CreateEllipse(T const& centre, T const& radii) {
  PolycurveT c;
  c.CreateEllipseSubpath(centre, radii);
  return c;
}

template <class T>
bool PolycurveT<T>::Create3PointArcSubpath(T const& a, T const& b, T const& c) {
  const V va = MavikMath::ToV(a), vb = MavikMath::ToV(b), vc = MavikMath::ToV(c);
  return BuildBehind(*this, kArcNodes,
                     [&](T* p, NODETYPE* nd) { return Build3PointCircularArc(p, nd, va, vb, vc); });
}

// ---- Instantiation -------------------------------------------------------------------

#define OSTRACRV_BUILD_MEMBERS(T)                                                                              \
  template bool PolycurveT<T>::MoveTo(T const&);                                                               \
  template bool PolycurveT<T>::MoveTo(PolycurveT<T>::coordinate_type, PolycurveT<T>::coordinate_type);         \
  template bool PolycurveT<T>::LineTo(T const&);                                                               \
  template bool PolycurveT<T>::LineTo(PolycurveT<T>::coordinate_type, PolycurveT<T>::coordinate_type);         \
  template bool PolycurveT<T>::LineTo(T const&, bool);                                                         \
  template bool PolycurveT<T>::LineTo(PolycurveT<T>::coordinate_type, PolycurveT<T>::coordinate_type, bool);   \
  template bool PolycurveT<T>::CubicTo(T const&, T const&, T const&);                                          \
  template bool PolycurveT<T>::CircularArcTo(T const&, D const&);                                              \
  template bool PolycurveT<T>::CircularArcTo(T const&);                                                        \
  template void PolycurveT<T>::PushBackWithJoinCheck(T const&, NODETYPE const&);                               \
  template bool PolycurveT<T>::AppendLineWithJoin(T const*, NODETYPE const&);                                  \
  template bool PolycurveT<T>::AppendBezierWithJoin(T const*, NODETYPE const&);                                \
  template void PolycurveT<T>::AppendWithJoin(PolycurveT<T> const&, bool, double);                             \
  template PolycurveT<T>& PolycurveT<T>::operator+=(PolycurveT<T> const&);                                     \
  template PolycurveT<T>& PolycurveT<T>::operator+=(std::vector<PolycurveT<T>> const&);                        \
  template PolycurveT<T>& PolycurveT<T>::operator+=(D const&);                                                 \
  template PolycurveT<T>& PolycurveT<T>::operator*=(MavikMath::MATRIX const&);                                 \
  template PolycurveT<T>& PolycurveT<T>::operator/=(MavikMath::MATRIX const&);                                 \
  template bool PolycurveT<T>::CreateLineSubpath(T const&, T const&);                                          \
  template PolycurveT<T> PolycurveT<T>::CreateLine(T const&, T const&);                                        \
  template bool PolycurveT<T>::CreateRectangleSubpath(RECT const&);                                            \
  template PolycurveT<T> PolycurveT<T>::CreateRectangle(RECT const&);                                          \
  template bool PolycurveT<T>::CreateCircleSubpath(T const&, double);                                          \
  template PolycurveT<T> PolycurveT<T>::CreateCircle(T const&, double);                                        \
  template bool PolycurveT<T>::CreateEllipseSubpath(T const&, T const&);                                       \
  template PolycurveT<T> PolycurveT<T>::CreateEllipse(T const&, T const&);                                     \
  template bool PolycurveT<T>::Create3PointArcSubpath(T const&, T const&, T const&);

OSTRACRV_BUILD_MEMBERS(POINT)
OSTRACRV_BUILD_MEMBERS(V)
#undef OSTRACRV_BUILD_MEMBERS

}  // namespace OstraCrv
