// Circular arcs as chains of cubic Beziers.
//
// An arc of sweep S is cut into n equal pieces of sweep d = S / n, with n the
// number of quadrants it touches, so no piece exceeds a quarter turn. Each
// piece is the standard cubic approximation of a circular arc: handles tangent
// to the circle at both ends, of length k = r 4 (1 - cos(d/2)) / (3 sin(d/2)),
// which puts the midpoint of the Bezier on the circle; for a quarter turn
// k / r = 0.5522847498 and the radial error peaks near 2.7e-4 r. A sweep
// within 1e-5 of a whole number of quadrants is given that number of pieces,
// so that a quarter drawn from slightly rounded angles stays one Bezier.
//
// The tangent form finds the centre m on the normal of the tangent at the
// start: m = s + f perp(t) with f = |e - s|^2 / (2 cross(t, e - s)), the one
// point of that normal as far from e as from s. The sign of cross(t, e - s)
// says whether the arc turns left (built directly, in the direction of
// increasing angle) or right (built from e back to s and reversed). The three
// point form intersects the perpendicular bisectors of first-through and
// second-through; whether `through` lies left of the chord decides the
// direction in the same way, so that the arc passes through it.
//
// Both forms guard against an arc of enormous radius with the apex test: the
// point of the circle opposite the chord's left normal (m - n, n the unit left
// normal of the chord times r) must lie closer to the start than
// kArcApexLimit, or the arc is written as its chord. That also catches nearly
// collinear input, whose circle runs off towards infinity.
#include "ostracrv/shapes/circular_arc.h"

#include <algorithm>
#include <cmath>

#include "arc_common.h"
#include "ostracrv/core/path_reverse.h"
#include "ostracrv/math/angles.h"

namespace OstraCrv {

using namespace arc_internal;

namespace {

// A sweep this close to a whole number of quadrants gets no sliver piece.
constexpr double kQuadrantTolerance = 1e-5;
constexpr int kMaxPieces = 4;
constexpr int kMaxPoints = 3 * kMaxPieces + 1;

template <class T>
unsigned long LineFallback(T* points, NODETYPE* nodes, const V& s, const V& e) {
  points[0] = MavikMath::FromV<T>(s);
  points[1] = MavikMath::FromV<T>(e);
  nodes[0] = 0x04;
  nodes[1] = 0x44;
  return 2;
}

bool PassesApexTest(const V& from, const V& centre, const D& chord, double r) noexcept {
  const V far = centre - ScaledLeftNormal(chord, r);
  // NaN fails as well as a far point.
  return MavikMath::Distance(from, far) < kArcApexLimit;
}

// The arc from s to e round m in the direction of increasing angle, or, with
// reversed, from e to s built that way and turned round.
template <class T>
unsigned long ArcRound(T* points, NODETYPE* nodes, const V& m, const V& s, const V& e, bool reversed) {
  if (!reversed)
    return BuildCircularArcT<T>(points, nodes, m, MavikMath::Distance(s, m), MavikMath::Radians::VectorToAngle(s - m),
                                MavikMath::Radians::VectorToAngle(e - m));
  const unsigned long n = BuildCircularArcT<T>(points, nodes, m, MavikMath::Distance(e, m),
                                               MavikMath::Radians::VectorToAngle(e - m),
                                               MavikMath::Radians::VectorToAngle(s - m));
  Reverse(points, nodes, int(n));
  return n;
}

// Whether the builder saw equal angles, which it draws as a whole circle: for
// an arc between two distinct points that only happens when the sweep is lost
// in rounding, on a circle far too large for the chord.
bool IsWholeCircle(const NODETYPE* nodes, unsigned long n) noexcept { return n > 1 && IsClosedNode(nodes[0]); }

}  // namespace

template <class T>
unsigned long BuildCircularArcT(T* points, NODETYPE* nodes, const V& center, double radius, double startAngle,
                                double endAngle) {
  if (!points || !nodes) return 0;
  if (!center.IsFinite() || !std::isfinite(radius) || !std::isfinite(startAngle) || !std::isfinite(endAngle))
    return 0;
  const double a0 = MavikMath::Radians::NormalizeAngle(startAngle);
  double a1 = MavikMath::Radians::NormalizeAngle(endAngle);
  while (a1 < a0) a1 += kTwoPi;
  const bool full = std::fabs(a0 - a1) <= kEps;
  const double sweep = full ? a1 + kTwoPi - a0 : a1 - a0;

  int n = int(std::trunc(sweep / kHalfPi)) + 1;
  if (std::fabs(std::fmod(sweep, kHalfPi)) <= kQuadrantTolerance) --n;
  n = std::clamp(n, 0, kMaxPieces);
  const double d = n > 0 ? sweep / n : 0.0;
  const double half = d / 2.0;
  const double k = CircleHandleLength(radius, half);

  V local[kMaxPoints];
  local[0] = V{center.x + radius * std::cos(a0), center.y + radius * std::sin(a0)};
  for (int j = 1; j <= n; ++j) {
    const double a = a0 + d * (j - 1), b = a0 + d * j;
    V end{center.x + radius * std::cos(b), center.y + radius * std::sin(b)};
    // A full circle ends exactly on its start point, as a closed subpath must.
    if (full && j == n) end = local[0];
    const int i = 3 * j;
    local[i - 2] = V{local[i - 3].x + k * std::cos(a + kHalfPi), local[i - 3].y + k * std::sin(a + kHalfPi)};
    local[i - 1] = V{end.x - k * std::cos(b + kHalfPi), end.y - k * std::sin(b + kHalfPi)};
    local[i] = end;
  }
  const int count = 3 * n + 1;
  if constexpr (!MavikMath::IsIntegerPoint<T>) {
    for (int i = 0; i < count; ++i)
      if (!local[i].IsFinite()) return 0;
  }
  for (int i = 0; i < count; ++i) {
    points[i] = MavikMath::FromV<T>(local[i]);
    nodes[i] = i == 0 ? 0x04 : (i % 3 == 0 ? 0x94 : 0xC0);
  }
  if (full) {
    nodes[0] = 0x1C;
    nodes[count - 1] = 0x98;
  } else {
    nodes[count - 1] = NODETYPE(nodes[count - 1] & ~0x30);
  }
  return static_cast<unsigned long>(count);
}

template <class T>
unsigned long BuildCircularArcT2(T* points, NODETYPE* nodes, const V& s, const V& e, const D& t) {
  if (!points || !nodes) return 0;
  if (!s.IsFinite() || !e.IsFinite() || !t.IsFinite()) return 0;
  const double den = -2.0 * (t.x * (s.y - e.y) - t.y * (s.x - e.x));
  if (!(std::fabs(den) > kEps)) return LineFallback(points, nodes, s, e);
  const D c = e - s;
  const double f = c.SquaredLength() / den;
  const V m{s.x - t.y * f, s.y + t.x * f};
  const double r = MavikMath::Distance(m, s);
  if (!PassesApexTest(s, m, c, r)) return LineFallback(points, nodes, s, e);
  const unsigned long n = ArcRound(points, nodes, m, s, e, !(MavikMath::Cross(t, c) > 0.0));
  // A sweep too small for one piece (a lone start node, or a whole circle
  // from angles equal to rounding) is drawn as its chord.
  return n >= 2 && !IsWholeCircle(nodes, n) ? n : LineFallback(points, nodes, s, e);
}

template <class T>
unsigned long Build3PointCircularArcT(T* points, NODETYPE* nodes, const V& a, const V& b, const V& c) {
  if (!points || !nodes) return 0;
  if (!a.IsFinite() || !b.IsFinite() || !c.IsFinite()) return 0;
  // Bisector of a-c: mid1 + u n1; of b-c: mid2 + w n2.
  const V mid1 = (a + c) * 0.5, mid2 = (b + c) * 0.5;
  const D n1 = (c - a).Perpendicular(), n2 = (c - b).Perpendicular();
  const double det = n2.x * n1.y - n1.x * n2.y;
  if (det == 0.0) return LineFallback(points, nodes, a, b);
  const D dm = mid2 - mid1;
  const double u = (n2.x * dm.y - dm.x * n2.y) / det;
  const V m = mid1 + n1 * u;
  // Arcs run towards increasing angle: when `through` lies left of a->b the
  // arc that passes it goes from b to a.
  const bool fromB = (c.y - a.y) * (b.x - a.x) - (c.x - a.x) * (b.y - a.y) > 0.0;
  const double r = MavikMath::Distance(m, a);
  const D chord = fromB ? a - b : b - a;
  if (!PassesApexTest(a, m, chord, r)) return LineFallback(points, nodes, a, b);
  const unsigned long n = ArcRound(points, nodes, m, a, b, fromB);
  return n >= 2 && !IsWholeCircle(nodes, n) ? n : LineFallback(points, nodes, a, b);
}

template unsigned long BuildCircularArcT<POINT>(POINT*, NODETYPE*, const V&, double, double, double);
template unsigned long BuildCircularArcT<V>(V*, NODETYPE*, const V&, double, double, double);
template unsigned long BuildCircularArcT2<POINT>(POINT*, NODETYPE*, const V&, const V&, const D&);
template unsigned long BuildCircularArcT2<V>(V*, NODETYPE*, const V&, const V&, const D&);
template unsigned long Build3PointCircularArcT<POINT>(POINT*, NODETYPE*, const V&, const V&, const V&);
template unsigned long Build3PointCircularArcT<V>(V*, NODETYPE*, const V&, const V&, const V&);

unsigned long BuildCircularArc(POINT* points, NODETYPE* nodes, const V& center, double radius, double startAngle,
                               double endAngle) {
  return BuildCircularArcT<POINT>(points, nodes, center, radius, startAngle, endAngle);
}
unsigned long BuildCircularArc(V* points, NODETYPE* nodes, const V& center, double radius, double startAngle,
                               double endAngle) {
  return BuildCircularArcT<V>(points, nodes, center, radius, startAngle, endAngle);
}

namespace {
template <class T>
unsigned long ArcByCentre(T* points, NODETYPE* nodes, const V& center, const V& start, const V& end) {
  return BuildCircularArcT<T>(points, nodes, center, MavikMath::Distance(center, start),
                              MavikMath::Radians::VectorToAngle(start - center),
                              MavikMath::Radians::VectorToAngle(end - center));
}
}  // namespace

unsigned long BuildCircularArc(POINT* points, NODETYPE* nodes, const V& center, const V& start, const V& end) {
  return ArcByCentre(points, nodes, center, start, end);
}
unsigned long BuildCircularArc(V* points, NODETYPE* nodes, const V& center, const V& start, const V& end) {
  return ArcByCentre(points, nodes, center, start, end);
}
unsigned long BuildCircularArc(POINT* points, NODETYPE* nodes, const V& start, const V& end, const D& startTangent) {
  return BuildCircularArcT2<POINT>(points, nodes, start, end, startTangent);
}
unsigned long BuildCircularArc(V* points, NODETYPE* nodes, const V& start, const V& end, const D& startTangent) {
  return BuildCircularArcT2<V>(points, nodes, start, end, startTangent);
}
unsigned long Build3PointCircularArc(POINT* points, NODETYPE* nodes, const V& first, const V& second,
                                     const V& through) {
  return Build3PointCircularArcT<POINT>(points, nodes, first, second, through);
}
unsigned long Build3PointCircularArc(V* points, NODETYPE* nodes, const V& first, const V& second, const V& through) {
  return Build3PointCircularArcT<V>(points, nodes, first, second, through);
}

}  // namespace OstraCrv
