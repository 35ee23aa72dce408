// Elliptical arcs by Beziers on the unit circle.
//
// The arc is built on the unit circle in a local array of doubles and then
// mapped onto the ellipse by the affine transform with axes (radiusX, 0) and
// (0, radiusY) and translation `center`; an affine map of a Bezier is the
// Bezier of the mapped points, so the fit quality carries over unchanged.
//
// The arc is cut at the multiples of pi/2, so that no piece sweeps more than
// a quadrant: a start on the grid gives whole quadrants, a start between
// boundaries a partial first and last piece (five pieces on a full turn).
// A piece of sweep d is the standard cubic circle approximation: handles
// tangent at both ends, of length k = 4 (1 - cos(d/2)) / (3 sin(d/2)) of the
// radius, which puts the Bezier's midpoint on the circle. For a quarter this
// is 0.5522847498 and the largest radial error is about 2.7e-4 of the radius.
//
// The end angle is reduced into (start, start + 2 pi]: equal angles mean a full
// turn, and no call can ask for more than five pieces, which bounds the local
// array at 18 points (a five-piece arc plus the two centre points of a pie).
// Nodes between two whole quadrants are symmetric, since both handles there
// have the same length and direction; other inner nodes are smooth.
#include "ostracrv/shapes/ellipse.h"

#include <algorithm>
#include <cmath>

#include "arc_common.h"
#include "ostracrv/math/angles.h"
#include "ostracrv/math/matrix.h"

namespace OstraCrv {

using namespace arc_internal;

namespace {

// Five pieces, 3 points each, the first point, and two centre points of a pie.
constexpr int kLocalPoints = 18;
constexpr int kMaxPieces = 5;

bool OnQuadrantGrid(double angle) noexcept { return std::fabs(std::fmod(angle, kHalfPi)) <= kEps; }

constexpr NODETYPE ReplaceContinuity(NODETYPE b, NODETYPE c) noexcept { return NODETYPE((b & ~0x30) | c); }

}  // namespace

template <class T>
unsigned long BuildEllipseT(T* points, NODETYPE* nodes, const T& center, double radiusX, double radiusY,
                            double startAngle, double endAngle, bool pie, bool arcNodesPlain) {
  if (!points || !nodes) return 0;
  const V c = MavikMath::ToV(center);
  if (!c.IsFinite() || !std::isfinite(radiusX) || !std::isfinite(radiusY) || !std::isfinite(startAngle) ||
      !std::isfinite(endAngle))
    return 0;

  const double a0 = MavikMath::Radians::NormalizeAngle(startAngle);
  // e into (a0, a0 + 2 pi]: a far end angle is first brought near by fmod so
  // that the loops below run at most once or twice.
  double e = endAngle;
  if (!(std::fabs(e - a0) <= 2.0 * kTwoPi)) e = a0 + std::fmod(e - a0, kTwoPi);
  while (e > a0 + kTwoPi) e -= kTwoPi;
  while (e <= a0) e += kTwoPi;
  const bool fullTurn = std::fabs(a0 + kTwoPi - e) <= kEps;

  V local[kLocalPoints];
  NODETYPE bytes[kLocalPoints] = {};
  int i = pie ? 1 : 0;  // index of the arc's current last point
  local[0] = V{0.0, 0.0};
  local[i] = V(MavikMath::Radians::AngleToVector(a0));

  const NODETYPE curveEnd = arcNodesPlain ? 0x90 : 0x94;
  const double q = std::trunc(a0 / kHalfPi);
  double s = a0, previousStart = a0;
  for (int k = 1; k <= kMaxPieces; ++k) {
    const double boundary = (q + k) * kHalfPi;
    const double t = std::min(boundary, e);
    // A piece of no sweep (a start that lies on a boundary up to rounding)
    // gets no handles.
    const double h = CircleHandleLength(1.0, (t - s) / 2.0);
    const V p = local[i];
    const V qv = V(MavikMath::Radians::AngleToVector(t));
    local[i + 1] = V{p.x - h * p.y, p.y + h * p.x};
    local[i + 2] = V{qv.x + h * qv.y, qv.y - h * qv.x};
    local[i + 3] = qv;
    bytes[i + 1] = bytes[i + 2] = 0xC0;
    bytes[i + 3] = curveEnd;
    // Between two whole quadrants both handles are equal: symmetric.
    if (k >= 2 && OnQuadrantGrid(previousStart) && OnQuadrantGrid(t)) bytes[i] = ReplaceContinuity(bytes[i], 0x20);
    previousStart = s;
    s = t;
    i += 3;
    if (!(boundary < e)) break;
  }

  // A whole turn ends exactly on its start, as a closed subpath must (the
  // cosine and sine of a0 + 2 pi differ from those of a0 by rounding).
  if (fullTurn) local[i] = local[pie ? 1 : 0];

  unsigned long count;
  if (!pie) {
    count = static_cast<unsigned long>(i + 1);
    if (fullTurn) {
      bytes[0] = 0x1C;
      bytes[i] = 0x98;
      if (OnQuadrantGrid(e)) {
        bytes[0] = ReplaceContinuity(bytes[0], 0x20);
        bytes[i] = ReplaceContinuity(bytes[i], 0x20);
      }
    } else {
      bytes[0] = 0x04;
      bytes[i] = 0x84;
    }
  } else {
    // Closed through the centre: centre, line to the arc, arc, line back.
    bytes[0] = 0x0C;
    bytes[1] = 0x44;
    bytes[i] = NODETYPE(bytes[i] & ~0x38);
    local[i + 1] = V{0.0, 0.0};
    bytes[i + 1] = 0x48;
    if (arcNodesPlain) {
      bytes[0] = NODETYPE(bytes[0] & ~0x04);
      bytes[i] = NODETYPE(bytes[i] | 0x04);
    }
    count = static_cast<unsigned long>(i + 2);
  }

  const MATRIX m = MavikMath::ConstructMatrix(D{radiusX, 0.0}, D{0.0, radiusY}, D{c.x, c.y});
  m.TransformPoints(local, count);
  if constexpr (!MavikMath::IsIntegerPoint<T>) {
    for (unsigned long j = 0; j < count; ++j)
      if (!local[j].IsFinite()) return 0;
  }
  for (unsigned long j = 0; j < count; ++j) {
    points[j] = MavikMath::FromV<T>(local[j]);
    nodes[j] = bytes[j];
  }
  return count;
}

template unsigned long BuildEllipseT<POINT>(POINT*, NODETYPE*, const POINT&, double, double, double, double, bool,
                                            bool);
template unsigned long BuildEllipseT<V>(V*, NODETYPE*, const V&, double, double, double, double, bool, bool);

unsigned long BuildEllipse(POINT* points, NODETYPE* nodes, const POINT& center, double radiusX, double radiusY,
                           double startAngle, double endAngle, bool pie, bool arcNodesPlain) {
  return BuildEllipseT<POINT>(points, nodes, center, radiusX, radiusY, startAngle, endAngle, pie, arcNodesPlain);
}

unsigned long BuildEllipse(V* points, NODETYPE* nodes, const V& center, double radiusX, double radiusY,
                           double startAngle, double endAngle, bool pie, bool arcNodesPlain) {
  return BuildEllipseT<V>(points, nodes, center, radiusX, radiusY, startAngle, endAngle, pie, arcNodesPlain);
}

unsigned long BuildCircle(POINT* points, NODETYPE* nodes, const POINT& center, double radius) {
  return BuildEllipseT<POINT>(points, nodes, center, radius, radius, 0.0, 0.0, false, false);
}

unsigned long BuildCircle(V* points, NODETYPE* nodes, const V& center, double radius) {
  return BuildEllipseT<V>(points, nodes, center, radius, radius, 0.0, 0.0, false, false);
}

}  // namespace OstraCrv
