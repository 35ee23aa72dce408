// Arc conversion against the true ellipse. The reference below is the centre
// parameterisation written out in its textbook form (squares of the radii,
// radius correction by Lambda), independent of the unit-space derivation of
// the library. Every cubic is sampled densely; each sample is taken back to
// the ellipse's unit circle, where its radius must be 1 within the stated
// error and its angle must run monotonically through the arc's sweep.
#include <gtest/gtest.h>

#include <cmath>
#include <numbers>
#include <random>
#include <vector>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;
constexpr double kPi = std::numbers::pi;

struct Ellipse {
  double cx, cy, rx, ry, phi, theta1, dtheta;
};

Ellipse Reference(V p1, V p2, double rx, double ry, double phiDeg, bool fa, bool fs) {
  const double phi = phiDeg * kPi / 180.0;
  const double c = std::cos(phi), s = std::sin(phi);
  const double x1p = c * (p1.x - p2.x) / 2 + s * (p1.y - p2.y) / 2;
  const double y1p = -s * (p1.x - p2.x) / 2 + c * (p1.y - p2.y) / 2;
  rx = std::fabs(rx);
  ry = std::fabs(ry);
  const double lambda = x1p * x1p / (rx * rx) + y1p * y1p / (ry * ry);
  if (lambda > 1) {
    rx *= std::sqrt(lambda);
    ry *= std::sqrt(lambda);
  }
  const double num = rx * rx * ry * ry - rx * rx * y1p * y1p - ry * ry * x1p * x1p;
  const double den = rx * rx * y1p * y1p + ry * ry * x1p * x1p;
  // After the correction the centre is the chord's midpoint; the formula
  // would give the square root of rounding noise there.
  double coef = lambda >= 1 ? 0.0 : std::sqrt(std::max(0.0, num / den));
  if (fa == fs) coef = -coef;
  const double cxp = coef * rx * y1p / ry, cyp = -coef * ry * x1p / rx;
  Ellipse e;
  e.cx = c * cxp - s * cyp + (p1.x + p2.x) / 2;
  e.cy = s * cxp + c * cyp + (p1.y + p2.y) / 2;
  e.rx = rx;
  e.ry = ry;
  e.phi = phi;
  const double ux = (x1p - cxp) / rx, uy = (y1p - cyp) / ry, vx = (-x1p - cxp) / rx, vy = (-y1p - cyp) / ry;
  e.theta1 = std::atan2(uy, ux);
  double d = std::atan2(vy, vx) - e.theta1;
  while (d < 0) d += 2 * kPi;  // the angle from u to v, in [0, 2 pi)
  if (!fs) d -= 2 * kPi;
  if (d >= 2 * kPi) d -= 2 * kPi;
  e.dtheta = d;
  return e;
}

// A point in the ellipse's unit frame: radius and angle.
void ToUnit(const Ellipse& e, V p, double& radius, double& angle) {
  const double dx = p.x - e.cx, dy = p.y - e.cy;
  const double c = std::cos(e.phi), s = std::sin(e.phi);
  const double x = (c * dx + s * dy) / e.rx, y = (-s * dx + c * dy) / e.ry;
  radius = std::hypot(x, y);
  angle = std::atan2(y, x);
}

// The angle a relative to the arc's start, unwrapped into the sweep's sign.
double Progress(const Ellipse& e, double a) {
  double d = a - e.theta1;
  if (e.dtheta >= 0) {
    while (d < -1e-9) d += 2 * kPi;
    while (d > 2 * kPi - 1e-9 && e.dtheta < kPi) d -= 2 * kPi;
  } else {
    while (d > 1e-9) d -= 2 * kPi;
    while (d < -2 * kPi + 1e-9 && e.dtheta > -kPi) d += 2 * kPi;
  }
  return d;
}

// Checks one arc; returns the largest radial error in the unit frame.
double CheckArc(V from, double rx, double ry, double phiDeg, bool fa, bool fs, V to, double tolerance,
                std::vector<double>* pieceAngles = nullptr) {
  std::vector<V> ctrl;
  const int n = OstraCrv::SvgArcToCubics(from, rx, ry, phiDeg, fa, fs, to, tolerance, ctrl);
  EXPECT_GE(n, 1);
  EXPECT_EQ(ctrl.size(), 3u * std::size_t(n));
  if (n < 1) return 0;
  EXPECT_EQ(ctrl.back(), to);
  const Ellipse e = Reference(from, to, rx, ry, phiDeg, fa, fs);
  double worst = 0;
  double last = 0;  // progress of the previous sample
  V start = from;
  for (int k = 0; k < n; ++k) {
    const V p[4] = {start, ctrl[3 * k], ctrl[3 * k + 1], ctrl[3 * k + 2]};
    double r, a0, a1;
    ToUnit(e, p[0], r, a0);
    ToUnit(e, p[3], r, a1);
    const double span = std::fabs(Progress(e, a1) - Progress(e, a0));
    if (pieceAngles) pieceAngles->push_back(span);
    EXPECT_LE(span, kPi / 2 + 1e-9) << "piece " << k;
    for (int s = 0; s <= 64; ++s) {
      double radius, angle;
      ToUnit(e, testgeo::Bezier(p, s / 64.0), radius, angle);
      worst = std::max(worst, std::fabs(radius - 1));
      const double prog = Progress(e, angle);
      // Monotone along the sweep, within the arc.
      if (e.dtheta >= 0) {
        EXPECT_GE(prog, last - 1e-9);
        EXPECT_LE(prog, e.dtheta + 1e-9);
      } else {
        EXPECT_LE(prog, last + 1e-9);
        EXPECT_GE(prog, e.dtheta - 1e-9);
      }
      last = prog;
    }
    start = p[3];
  }
  EXPECT_NEAR(last, e.dtheta, 1e-9);
  return worst;
}

TEST(SvgArc, RandomArcsStayOnTheEllipseWithinTheStatedError) {
  std::mt19937 rng(20240611);
  std::uniform_real_distribution<double> coord(-100, 100), radius(0.5, 80), angle(-720, 720);
  double worst = 0;
  for (int i = 0; i < 3000; ++i) {
    const V from{coord(rng), coord(rng)}, to{coord(rng), coord(rng)};
    const double rx = radius(rng) * (rng() % 5 == 0 ? -1 : 1), ry = radius(rng);
    worst = std::max(worst, CheckArc(from, rx, ry, angle(rng), rng() & 1, rng() & 1, to, 0.0));
  }
  // The error of a quarter-turn piece is 2.73e-4 of the radius; a smaller
  // piece strays less.
  EXPECT_LT(worst, 2.8e-4);
  EXPECT_GT(worst, 1e-6);  // the samples do see the approximation
}

TEST(SvgArc, ToleranceAddsPieces) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> coord(-1000, 1000), radius(10, 800);
  int many = 0;
  for (int i = 0; i < 300; ++i) {
    const V from{coord(rng), coord(rng)}, to{coord(rng), coord(rng)};
    const double rx = radius(rng), ry = radius(rng);
    const double tol = 1e-6;
    const bool fa = rng() & 1, fs = rng() & 1;
    std::vector<double> spans;
    const double unitError = CheckArc(from, rx, ry, 30, fa, fs, to, tol, &spans);
    const Ellipse e2 = Reference(from, to, rx, ry, 30, fa, fs);
    many += spans.size() > 8;
    EXPECT_LE(unitError * std::max(e2.rx, e2.ry), tol * 1.01);
  }
  // Quarter turns would stray up to 2.7e-4 times the radius, far above tol:
  // long arcs must have been cut finer.
  EXPECT_GT(many, 50);
}

// Two lists of points agree within 1e-12.
void ExpectClose(const std::vector<V>& a, const std::vector<V>& b) {
  ASSERT_EQ(a.size(), b.size());
  for (std::size_t i = 0; i < a.size(); ++i) EXPECT_LT(MavikMath::Distance(a[i], b[i]), 1e-12) << i;
}

TEST(SvgArc, RadiusCorrectionMakesAHalfEllipse) {
  // Radii 1 cannot span a chord of 10: they grow to 5 and the centre is the
  // chord's midpoint. Sweep 1 runs towards positive angles, through (5, -5)
  // with y down.
  std::vector<double> spans;
  CheckArc({0, 0}, 1, 1, 0, false, true, {10, 0}, 0.0, &spans);
  ASSERT_EQ(spans.size(), 2u);
  std::vector<V> ctrl, other;
  ASSERT_EQ(OstraCrv::SvgArcToCubics({0, 0}, 1, 1, 0, false, true, {10, 0}, 0.0, ctrl), 2);
  EXPECT_LT(MavikMath::Distance(ctrl[2], V{5, -5}), 1e-12);
  // Both flags change nothing when the radii had to grow: the half ellipse is
  // the only arc, on the side the sweep picks.
  OstraCrv::SvgArcToCubics({0, 0}, 1, 1, 0, true, true, {10, 0}, 0.0, other);
  ExpectClose(other, ctrl);
  // A tilted ellipse with non-uniform radii, also corrected.
  CheckArc({3, 4}, 2, 0.5, 37, true, false, {-20, 11}, 0.0);
}

TEST(SvgArc, FlagsPickOneOfFourArcs) {
  // Circle of radius 5 through (0,0) and (5,5): the four flag pairs give the
  // short and long arc around each of the two possible centres.
  double sweepAngles[2][2];
  for (int fa = 0; fa < 2; ++fa)
    for (int fs = 0; fs < 2; ++fs) {
      const Ellipse e = Reference({0, 0}, {5, 5}, 5, 5, 0, fa, fs);
      sweepAngles[fa][fs] = e.dtheta;
      CheckArc({0, 0}, 5, 5, 0, fa, fs, {5, 5}, 0.0);
      std::vector<V> ctrl;
      const int n = OstraCrv::SvgArcToCubics({0, 0}, 5, 5, 0, fa, fs, {5, 5}, 0.0, ctrl);
      EXPECT_EQ(n, fa ? 3 : 1);
    }
  EXPECT_NEAR(sweepAngles[0][1], kPi / 2, 1e-12);
  EXPECT_NEAR(sweepAngles[0][0], -kPi / 2, 1e-12);
  EXPECT_NEAR(sweepAngles[1][1], 3 * kPi / 2, 1e-12);
  EXPECT_NEAR(sweepAngles[1][0], -3 * kPi / 2, 1e-12);
}

TEST(SvgArc, DegenerateArcs) {
  // Equal ends: nothing; a zero or non-finite radius or angle: failure.
  const struct { double x2, rx, ry, phi; int want; } bad[] = {
      {1, 5, 5, 0, 0}, {4, 0, 5, 0, -1}, {4, 5, 0, 0, -1}, {4, NAN, 5, 0, -1}, {4, 5, 5, INFINITY, -1}};
  std::vector<V> ctrl;
  for (const auto& b : bad)
    EXPECT_EQ(OstraCrv::SvgArcToCubics({1, 1}, b.rx, b.ry, b.phi, false, true, {b.x2, 1}, 0.0, ctrl), b.want);
  EXPECT_TRUE(ctrl.empty());
  // In path data: zero radii draw a line, equal end points draw nothing.
  PolycurveD c;
  ASSERT_TRUE(OstraCrv::ParseSvgPathData("M0 0 A0 5 0 0 1 10 0 A5 5 0 0 1 10 0", c));
  ASSERT_EQ(c.GetPointCount(), 2u);
  EXPECT_EQ(c.GetNodeType(1), NodeTypes::Open::line);
  EXPECT_EQ(c.GetPoint(1), (V{10, 0}));
  // Negative radii count as their magnitude.
  PolycurveD a, b;
  ASSERT_TRUE(OstraCrv::ParseSvgPathData("M0 0 A-3 4 10 0 1 5 5", a));
  ASSERT_TRUE(OstraCrv::ParseSvgPathData("M0 0 A3 -4 10 0 1 5 5", b));
  EXPECT_EQ(a, b);
  // Huge radii on a small chord are nearly straight; tiny radii on a huge
  // chord are scaled up: finite either way, ends exact.
  for (const char* d : {"M0 0 A1e300 1e300 0 0 1 1 0", "M0 0 A1e-300 1e-300 0 0 1 1e300 0"}) {
    ASSERT_TRUE(OstraCrv::ParseSvgPathData(d, a));
    for (const V& p : a.Points()) EXPECT_TRUE(p.IsFinite()) << d;
    EXPECT_EQ(a.GetLastPoint().y, 0.0) << d;
  }
}

TEST(SvgArc, RotationIsTakenModuloAFullTurn) {
  PolycurveD a, b;
  ASSERT_TRUE(OstraCrv::ParseSvgPathData("M0 0 A8 3 30 1 0 5 7", a));
  ASSERT_TRUE(OstraCrv::ParseSvgPathData("M0 0 A8 3 390 1 0 5 7", b));
  ExpectClose({a.GetPoints(), a.GetPoints() + a.GetPointCount()}, {b.GetPoints(), b.GetPoints() + b.GetPointCount()});
}

}  // namespace
