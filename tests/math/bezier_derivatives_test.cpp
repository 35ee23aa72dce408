#include "ostracrv/math/bezier_derivatives.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <limits>

#include "math/eval_test_curves.h"
#include "ostracrv/math/bezier_area.h"
#include "ostracrv/math/bezier_basis.h"

namespace {

using namespace MavikMath;
using namespace MavikMath::CubicBezier;
using evaltest::At;
using evaltest::Curve;
using evaltest::Velocity;

constexpr double kHandle = 0.5522847498;
const double kNaN = std::numeric_limits<double>::quiet_NaN();

// Four counter-clockwise quarter arcs of radius r around the origin.
std::vector<std::array<V, 4>> Circle(double r) {
  std::vector<std::array<V, 4>> arcs;
  for (int q = 0; q < 4; ++q) {
    const double a0 = q * M_PI / 2, a1 = a0 + M_PI / 2;
    const V s{r * std::cos(a0), r * std::sin(a0)}, e{r * std::cos(a1), r * std::sin(a1)};
    const D ts{-std::sin(a0), std::cos(a0)}, te{-std::sin(a1), std::cos(a1)};
    arcs.push_back({s, s + ts * (kHandle * r), e - te * (kHandle * r), e});
  }
  return arcs;
}

// Unit vector whatever the length (the library's Normalize leaves tiny
// vectors raw on purpose).
D Unit(const D& d) { return d / d.Length(); }

// Curvature of the circle through three nearby points, signed by turn.
double ThreePointCurvature(const V* p, double t, double h) {
  const V a = At(p, t - h), b = At(p, t), c = At(p, t + h);
  const double cross = Cross(b - a, c - a);
  return 2 * cross / (Distance(a, b) * Distance(b, c) * Distance(a, c));
}

TEST(BezierCurvature, CounterClockwiseCircleTurnsLeft) {
  const double r = 50.0;
  for (const auto& arc : Circle(r)) {
    const PowerBasis q = GetPowerBasis(arc.data());
    for (int i = 0; i <= 20; ++i) {
      const double t = i / 20.0;
      const double k = SafeBezierCurvature(t, q.a, q.b, q.c);
      EXPECT_NEAR(k, 1.0 / r, 3e-2 / r);  // the four-arc circle bends unevenly by ~2%
      double radius = 0.0;
      ASSERT_TRUE(GetCurvatureRadiusAt(t, q.a, q.b, q.c, radius));
      EXPECT_NEAR(radius * k, 1.0, 1e-12);
      // A positive radius puts the centre on the left: near the origin.
      const D n = SafeBezierTangent(t, q.a, q.b, q.c, q.d).Normalized().Perpendicular();
      EXPECT_LT(Distance(Evaluate(arc.data(), t) + n * radius, V{0, 0}), 0.03 * r);
    }
  }
}

TEST(BezierCurvature, MatchesFiniteDifferences) {
  for (const Curve& c : evaltest::RandomCurves(1000, 21)) {
    // Straight kinds have no curvature to compare (see below).
    if (c.kind == evaltest::Kind::Point || c.kind == evaltest::Kind::FoldedLine) continue;
    const PowerBasis q = GetPowerBasis(c.p);
    for (double t : {0.13, 0.5, 0.77}) {
      const double speed = Velocity(c.p, t).Length();
      if (speed < 1e-2 * evaltest::Size(c.p)) continue;  // too close to a cusp for the reference
      const double ref = ThreePointCurvature(c.p, t, 1e-4);
      EXPECT_NEAR(SafeBezierCurvature(t, q.a, q.b, q.c), ref, 1e-4 * std::fabs(ref) + 1e-6 / evaltest::Size(c.p));
    }
  }
}

TEST(BezierCurvature, DegenerateAndBadInput) {
  // Collapsed start handle: finite, with the sign of the turn.
  const V hook[4] = {{0, 0}, {0, 0}, {10, 0}, {10, 10}};
  PowerBasis q = GetPowerBasis(hook);
  EXPECT_GT(SafeBezierCurvature(0.0, q.a, q.b, q.c), 0.0);
  EXPECT_TRUE(std::isfinite(SafeBezierCurvature(0.0, q.a, q.b, q.c)));
  double radius = 42.0;
  EXPECT_FALSE(GetCurvatureRadiusAt(0.0, q.a, q.b, q.c, radius));
  EXPECT_EQ(radius, 42.0);
  // Straight: no curvature, no radius.
  const V line[4] = {{0, 0}, {1, 1}, {2, 2}, {3, 3}};
  q = GetPowerBasis(line);
  EXPECT_EQ(SafeBezierCurvature(0.4, q.a, q.b, q.c), 0.0);
  EXPECT_FALSE(GetCurvatureRadiusAt(0.4, q.a, q.b, q.c, radius));
  double params[kMaxCurvatureExtrema] = {-1, -1, -1, -1, -1};
  EXPECT_EQ(FindCurvatureMinMax(q.a, q.b, q.c, params), 0);
  EXPECT_EQ(params[0], -1);
  const V bad{kNaN, 0};
  EXPECT_EQ(SafeBezierCurvature(0.5, bad, q.b, q.c), 0.0);
  EXPECT_FALSE(GetCurvatureRadiusAt(0.5, bad, q.b, q.c, radius));
  EXPECT_EQ(FindCurvatureMinMax(bad, q.b, q.c, params), 0);
  const D t = SafeBezierTangent(0.5, bad, q.b, q.c, q.d);
  EXPECT_EQ(t.x, 0.0);
  EXPECT_EQ(t.y, 0.0);
}

// Extrema of sampled curvature, refined by golden-section search.
TEST(BezierCurvature, ExtremaMatchSampledCurvature) {
  int checked = 0;
  for (const Curve& c : evaltest::RandomCurves(400, 31)) {
    if (c.kind != evaltest::Kind::Ordinary && c.kind != evaltest::Kind::Integer) continue;
    const PowerBasis q = GetPowerBasis(c.p);
    auto k = [&](double t) { return SafeBezierCurvature(t, q.a, q.b, q.c); };
    double params[kMaxCurvatureExtrema];
    const int n = FindCurvatureMinMax(q.a, q.b, q.c, params);
    ASSERT_LE(n, kMaxCurvatureExtrema);
    const int samples = 4000;
    for (int i = 1; i < samples - 1; ++i) {
      const double t0 = double(i - 1) / samples, t1 = double(i) / samples, t2 = double(i + 1) / samples;
      const double k0 = k(t0), k1 = k(t1), k2 = k(t2);
      const bool peak = (k1 > k0 && k1 > k2) || (k1 < k0 && k1 < k2);
      if (!peak) continue;
      // Golden-section on [t0, t2] for the extremum of k (or -k).
      const double sign = k1 > k0 ? -1.0 : 1.0;
      double lo = t0, hi = t2;
      for (int it = 0; it < 60; ++it) {
        const double m1 = hi - 0.618 * (hi - lo), m2 = lo + 0.618 * (hi - lo);
        if (sign * k(m1) < sign * k(m2)) hi = m2; else lo = m1;
      }
      const double ref = 0.5 * (lo + hi);
      double best = 1.0;
      for (int j = 0; j < n; ++j) best = std::min(best, std::fabs(params[j] - ref));
      EXPECT_LT(best, 1e-6) << "extremum at " << ref;
      ++checked;
    }
    for (int j = 0; j < n; ++j) {
      EXPECT_GE(params[j], 0.0);
      EXPECT_LE(params[j], 1.0);
    }
  }
  EXPECT_GT(checked, 20);
}

TEST(BezierCurvature, CuspIsAnExtremum) {
  V p[4];
  evaltest::MakeCusp(V{0, 0}, 0.4, D{3, 1}, D{-1, 2}, p);
  const PowerBasis q = GetPowerBasis(p);
  double params[kMaxCurvatureExtrema];
  const int n = FindCurvatureMinMax(q.a, q.b, q.c, params);
  int near = 0;
  for (int j = 0; j < n; ++j) near += std::fabs(params[j] - 0.4) < 1e-4;
  EXPECT_EQ(near, 1);
}

TEST(BezierTangent, FollowsTheCurveWhereTheHandleCollapses) {
  for (const Curve& c : evaltest::RandomCurves(2000, 41)) {
    if (c.kind == evaltest::Kind::Point) continue;
    const PowerBasis q = GetPowerBasis(c.p);
    const double h = 1e-5;
    const D start = At(c.p, h) - c.p[0], end = c.p[3] - At(c.p, 1 - h);
    const D t0 = SafeBezierTangent(0.0, q.a, q.b, q.c, q.d), t1 = SafeBezierTangent(1.0, q.a, q.b, q.c, q.d);
    if (start.Length() > 1e-9 * evaltest::Size(c.p)) {
      EXPECT_GT(Dot(Unit(t0), Unit(start)), 0.99) << int(c.kind);
    }
    if (end.Length() > 1e-9 * evaltest::Size(c.p)) {
      EXPECT_GT(Dot(Unit(t1), Unit(end)), 0.99) << int(c.kind);
    }
    // Where the plain derivative is usable it is returned as it is.
    const D plain = Derivative(q.a, q.b, q.c, 0.3);
    if (plain.SquaredLength() > 1e-10) {
      const D safe = SafeBezierTangent(0.3, q.a, q.b, q.c, q.d);
      EXPECT_EQ(safe.x, plain.x);
      EXPECT_EQ(safe.y, plain.y);
    }
  }
  // Both handles collapsed: the chord direction, also at an interior cusp.
  const V flat[4] = {{0, 0}, {0, 0}, {5, 5}, {5, 5}};
  const PowerBasis q = GetPowerBasis(flat);
  const D s = SafeBezierTangent(0.0, q.a, q.b, q.c, q.d).Normalized();
  EXPECT_NEAR(s.x, std::sqrt(0.5), 1e-12);
  EXPECT_NEAR(s.y, std::sqrt(0.5), 1e-12);
  const D e = SafeBezierTangent(1.0, q.a, q.b, q.c, q.d).Normalized();
  EXPECT_NEAR(e.x, std::sqrt(0.5), 1e-12);
  V cusp[4];
  evaltest::MakeCusp(V{0, 0}, 0.5, D{3, 1}, D{-1, 2}, cusp);
  const PowerBasis qc = GetPowerBasis(cusp);
  const D after = At(cusp, 0.5 + 1e-4) - At(cusp, 0.5);
  EXPECT_GT(Dot(Unit(SafeBezierTangent(0.5, qc.a, qc.b, qc.c, qc.d)), Unit(after)), 0.99);
  const V dot[4] = {{3, 3}, {3, 3}, {3, 3}, {3, 3}};
  const PowerBasis qd = GetPowerBasis(dot);
  EXPECT_EQ(SafeBezierTangent(0.0, qd.a, qd.b, qd.c, qd.d).SquaredLength(), 0.0);
}

// Sign changes of the sampled derivative, refined by bisection.
std::vector<double> SampledZeros(const V* p, bool xComponent) {
  std::vector<double> zeros;
  auto f = [&](double t) { const D v = Velocity(p, t); return xComponent ? v.x : v.y; };
  const int n = 3000;
  for (int i = 0; i < n; ++i) {
    double lo = double(i) / n, hi = double(i + 1) / n;
    double flo = f(lo), fhi = f(hi);
    if (flo == 0.0) { zeros.push_back(lo); continue; }
    if ((flo < 0) == (fhi < 0) || fhi == 0.0) continue;
    for (int it = 0; it < 80; ++it) {
      const double m = 0.5 * (lo + hi), fm = f(m);
      if ((fm < 0) == (flo < 0)) { lo = m; flo = fm; } else { hi = m; }
    }
    zeros.push_back(0.5 * (lo + hi));
  }
  return zeros;
}

TEST(BezierAxisTangents, MatchSignChangesOfTheDerivative) {
  for (const Curve& c : evaltest::RandomCurves(1500, 51)) {
    if (c.kind == evaltest::Kind::Point || c.kind == evaltest::Kind::FoldedLine) continue;
    const PowerBasis q = GetPowerBasis(c.p);
    for (bool vertical : {true, false}) {
      auto coord = [&](int i) { return vertical ? c.p[i].x : c.p[i].y; };
      if (coord(0) == coord(1) && coord(1) == coord(2) && coord(2) == coord(3)) continue;  // constant
      std::vector<double> ts = {-7.0};  // appending keeps what is there
      if (vertical) GetVerticalTangents(q.a, q.b, q.c, ts); else GetHorizontalTangents(q.a, q.b, q.c, ts);
      ASSERT_EQ(ts[0], -7.0);
      ts.erase(ts.begin());
      for (double ref : SampledZeros(c.p, vertical)) {
        double best = 1.0;
        for (double t : ts) best = std::min(best, std::fabs(t - ref));
        EXPECT_LT(best, 1e-7) << int(c.kind);
      }
      for (double t : ts) {
        EXPECT_GE(t, 0.0);
        EXPECT_LE(t, 1.0);
        const D v = Velocity(c.p, t);
        EXPECT_LE(std::fabs(vertical ? v.x : v.y), 1e-7 * evaltest::Size(c.p));
      }
    }
  }
  // A component that never changes appends nothing.
  const V horizontalLine[4] = {{0, 5}, {1, 5}, {3, 5}, {4, 5}};
  const PowerBasis q = GetPowerBasis(horizontalLine);
  std::vector<double> ts;
  GetHorizontalTangents(q.a, q.b, q.c, ts);
  EXPECT_TRUE(ts.empty());
}

TEST(BezierTightBounds, ContainAndTouchTheSampledCurve) {
  for (const Curve& c : evaltest::RandomCurves(1500, 61)) {
    const PowerBasis q = GetPowerBasis(c.p);
    double x0, y0, x1, y1;
    ASSERT_TRUE(GetTightBounds<double>(q.a, q.b, q.c, q.d, x0, y0, x1, y1));
    int ix0, iy0, ix1, iy1;
    ASSERT_TRUE(GetTightBounds<int>(q.a, q.b, q.c, q.d, ix0, iy0, ix1, iy1));
    double sx0 = 1e300, sy0 = 1e300, sx1 = -1e300, sy1 = -1e300;
    for (int i = 0; i <= 20000; ++i) {
      const V v = At(c.p, i / 20000.0);
      sx0 = std::min(sx0, v.x);
      sy0 = std::min(sy0, v.y);
      sx1 = std::max(sx1, v.x);
      sy1 = std::max(sy1, v.y);
    }
    // Sampling sees at most the true extent and gets within the quadratic
    // error of its step.
    const double magnitude = evaltest::Size(c.p) + std::fabs(c.p[0].x) + std::fabs(c.p[0].y);
    const double slack = 1e-12 * magnitude, near = 1e-7 * magnitude;
    EXPECT_LE(x0, sx0 + slack);
    EXPECT_LE(y0, sy0 + slack);
    EXPECT_GE(x1, sx1 - slack);
    EXPECT_GE(y1, sy1 - slack);
    EXPECT_NEAR(x0, sx0, near);
    EXPECT_NEAR(y0, sy0, near);
    EXPECT_NEAR(x1, sx1, near);
    EXPECT_NEAR(y1, sy1, near);
    EXPECT_EQ(ix0, int(std::floor(x0)));
    EXPECT_EQ(iy0, int(std::floor(y0)));
    EXPECT_EQ(ix1, int(std::ceil(x1)));
    EXPECT_EQ(iy1, int(std::ceil(y1)));
  }
  double untouched = 5.0;
  double a = untouched, b = untouched, c = untouched;
  EXPECT_FALSE(GetTightBounds<double>(V{kNaN, 0}, V{}, V{}, V{}, untouched, a, b, c));
  EXPECT_EQ(untouched, 5.0);
  int big0, big1, big2, big3;
  ASSERT_TRUE(GetTightBounds<int>(V{0, 0}, V{0, 0}, V{3e12, 0}, V{-1e12, 0}, big0, big1, big2, big3));
  EXPECT_EQ(big0, INT32_MIN);
  EXPECT_EQ(big2, INT32_MAX);
}

TEST(BezierArea, MatchesShoelaceSumAndEnclosesTheCircle) {
  for (const Curve& c : evaltest::RandomCurves(500, 71)) {
    const PowerBasis q = GetPowerBasis(c.p);
    double sum = 0.0;
    const int n = 20000;
    V prev = At(c.p, 0.0);
    for (int i = 1; i <= n; ++i) {
      const V v = At(c.p, double(i) / n);
      sum += 0.5 * (prev.y + v.y) * (v.x - prev.x);
      prev = v;
    }
    const double size = evaltest::Size(c.p);
    EXPECT_NEAR(GetAreaUnderBezier(q.a, q.b, q.c, q.d), sum, 1e-7 * size * size + 1e-20);
  }
  // Counter-clockwise with y up: negative, minus the disc's area.
  double area = 0.0;
  for (const auto& arc : Circle(10.0)) {
    const PowerBasis q = GetPowerBasis(arc.data());
    area += GetAreaUnderBezier(q.a, q.b, q.c, q.d);
  }
  EXPECT_NEAR(area, -M_PI * 100.0, 0.1);  // the four-arc circle is 2.7e-4 too wide
  EXPECT_EQ(GetAreaUnderBezier(V{kNaN, 0}, V{}, V{}, V{}), 0.0);
}

}  // namespace
