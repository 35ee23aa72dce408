#include "ostracrv/math/bezier_derivatives.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"
#include "ostracrv/math/bezier_area.h"
#include "ostracrv/math/bezier_basis.h"

namespace {

using namespace testcurves;
using namespace MavikMath;
using namespace MavikMath::CubicBezier;

D Unit(const D& d) { return d / d.Length(); }  // whatever the length

TEST(BezierCurvature, PositiveOnACounterClockwiseCircleWithTheCentreOnTheLeft) {
  const double r = 50;
  for (int quadrant = 0; quadrant < 4; ++quadrant) {
    const Curve arc = QuarterArc(r, quadrant);
    const PowerBasis q = GetPowerBasis(arc.data());
    for (double t = 0; t <= 1; t += 0.05) {
      const double k = SafeBezierCurvature(t, q.a, q.b, q.c);
      EXPECT_NEAR(k, 1 / r, 3e-2 / r);  // the four-arc circle bends unevenly by ~2%
      double radius = 0;
      ASSERT_TRUE(GetCurvatureRadiusAt(t, q.a, q.b, q.c, radius));
      EXPECT_NEAR(radius * k, 1.0, 1e-12);
      const D left = Unit(SafeBezierTangent(t, q.a, q.b, q.c, q.d)).Perpendicular();
      EXPECT_LT(Distance(At(arc, t) + left * radius, V{0, 0}), 0.03 * r);
    }
  }
}

TEST(BezierCurvature, MatchesThreePointCircles) {
  for (const FamilyCurve& c : RandomCurves(1000, 21)) {
    if (c.kind == Kind::Point || c.kind == Kind::FoldedLine) continue;
    const PowerBasis q = GetPowerBasis(c.p);
    for (double t : {0.13, 0.5, 0.77}) {
      if (Velocity(c.p, t).Length() < 0.1 * Size(c.p)) continue;  // too near a cusp for the reference
      auto circle = [&](double h) {  // signed curvature of the circle through three points
        const V a = At(c.p, t - h), b = At(c.p, t), e = At(c.p, t + h);
        return 2 * Cross(b - a, e - a) / (Distance(a, b) * Distance(b, e) * Distance(a, e));
      };
      const double ref = (4 * circle(1e-4) - circle(2e-4)) / 3;  // Richardson: error O(h^4)
      EXPECT_NEAR(SafeBezierCurvature(t, q.a, q.b, q.c), ref, 1e-4 * (std::fabs(ref) + 1 / Size(c.p)));
    }
  }
}

TEST(BezierCurvature, ExtremaMatchSampledCurvatureAndIncludeCusps) {
  int found = 0;
  for (const FamilyCurve& c : RandomCurves(400, 31)) {
    if (c.kind != Kind::Ordinary && c.kind != Kind::Integer) continue;
    const PowerBasis q = GetPowerBasis(c.p);
    auto k = [&](double t) { return SafeBezierCurvature(t, q.a, q.b, q.c); };
    double params[kMaxCurvatureExtrema];
    const int n = FindCurvatureMinMax(q.a, q.b, q.c, params);
    for (int i = 1; i < 3999; ++i) {
      const double k0 = k((i - 1) / 4000.0), k1 = k(i / 4000.0), k2 = k((i + 1) / 4000.0);
      if (!((k1 > k0 && k1 > k2) || (k1 < k0 && k1 < k2))) continue;
      const double sign = k1 > k0 ? -1 : 1;
      const double at = GoldenMin([&](double t) { return sign * k(t); }, (i - 1) / 4000.0, (i + 1) / 4000.0, 60);
      double best = 1;
      for (int j = 0; j < n; ++j) best = std::min(best, std::fabs(params[j] - at));
      EXPECT_LT(best, 1e-6);
      ++found;
    }
  }
  EXPECT_GT(found, 20);
  V cusp[4];
  MakeCusp(V{0, 0}, 0.4, D{3, 1}, D{-1, 2}, cusp);
  const PowerBasis q = GetPowerBasis(cusp);
  double params[kMaxCurvatureExtrema];
  const int n = FindCurvatureMinMax(q.a, q.b, q.c, params);
  EXPECT_EQ(std::count_if(params, params + n, [](double t) { return std::fabs(t - 0.4) < 1e-4; }), 1);
}

TEST(BezierTangent, FollowsTheCurveWhereTheDerivativeVanishes) {
  for (const FamilyCurve& c : RandomCurves(2000, 41)) {
    if (c.kind == Kind::Point) continue;
    const PowerBasis q = GetPowerBasis(c.p);
    const D start = At(c.p, 1e-5) - c.p[0], end = c.p[3] - At(c.p, 1 - 1e-5);
    EXPECT_GT(Dot(Unit(SafeBezierTangent(0, q.a, q.b, q.c, q.d)), Unit(start)), 0.99) << int(c.kind);
    EXPECT_GT(Dot(Unit(SafeBezierTangent(1, q.a, q.b, q.c, q.d)), Unit(end)), 0.99) << int(c.kind);
    const D plain = Derivative(q.a, q.b, q.c, 0.3);  // usable: returned as it is
    EXPECT_TRUE(plain.SquaredLength() <= 1e-10 || SafeBezierTangent(0.3, q.a, q.b, q.c, q.d) == plain);
  }
  V cusp[4];  // at an inner cusp: the direction of departure
  MakeCusp(V{0, 0}, 0.5, D{3, 1}, D{-1, 2}, cusp);
  const PowerBasis q = GetPowerBasis(cusp);
  EXPECT_GT(Dot(Unit(SafeBezierTangent(0.5, q.a, q.b, q.c, q.d)), Unit(At(cusp, 0.5001) - At(cusp, 0.5))), 0.99);
  EXPECT_EQ(SafeBezierTangent(0.5, V{kNaN, 0}, q.b, q.c, q.d), (D{0, 0}));
  const PowerBasis qd = GetPowerBasis(kBadCurves[2].data());  // a dot
  EXPECT_EQ(SafeBezierTangent(0, qd.a, qd.b, qd.c, qd.d), (D{0, 0}));
}

TEST(BezierCurvature, DegenerateAndBadInput) {
  const V hook[4] = {{0, 0}, {0, 0}, {10, 0}, {10, 10}};  // collapsed start, turning left
  PowerBasis q = GetPowerBasis(hook);
  const double k = SafeBezierCurvature(0, q.a, q.b, q.c);
  EXPECT_TRUE(k > 0 && std::isfinite(k));
  double radius = 42;
  EXPECT_FALSE(GetCurvatureRadiusAt(0, q.a, q.b, q.c, radius));
  const V line[4] = {{0, 0}, {1, 1}, {2, 2}, {3, 3}};
  q = GetPowerBasis(line);
  EXPECT_EQ(SafeBezierCurvature(0.4, q.a, q.b, q.c), 0.0);
  EXPECT_FALSE(GetCurvatureRadiusAt(0.4, q.a, q.b, q.c, radius));
  double params[kMaxCurvatureExtrema] = {-1};
  EXPECT_EQ(FindCurvatureMinMax(q.a, q.b, q.c, params), 0);
  EXPECT_EQ(SafeBezierCurvature(0.5, V{kNaN, 0}, q.b, q.c), 0.0);
  EXPECT_FALSE(GetCurvatureRadiusAt(0.5, V{kNaN, 0}, q.b, q.c, radius));
  EXPECT_EQ(FindCurvatureMinMax(V{kNaN, 0}, q.b, q.c, params), 0);
  EXPECT_TRUE(radius == 42.0 && params[0] == -1.0);
}

// Axis tangents against sign changes of the sampled derivative refined by
// bisection; tight bounds against dense sampling.
TEST(BezierAxisTangentsAndTightBounds, MatchSampling) {
  for (const FamilyCurve& c : RandomCurves(1500, 51)) {
    const PowerBasis q = GetPowerBasis(c.p);
    for (int axis = 0; axis < 2; ++axis) {
      auto f = [&](double t) { const D v = Velocity(c.p, t); return axis == 0 ? v.x : v.y; };
      std::vector<double> ts = {-7.0};  // appending keeps what is there
      if (axis == 0) GetVerticalTangents(q.a, q.b, q.c, ts); else GetHorizontalTangents(q.a, q.b, q.c, ts);
      ASSERT_EQ(ts[0], -7.0);
      for (std::size_t j = 1; j < ts.size(); ++j) EXPECT_LE(std::fabs(f(ts[j])), 1e-7 * Size(c.p));
      if (c.kind == Kind::Point || c.kind == Kind::FoldedLine) continue;
      for (double r : SignChanges(f, 3000)) {
        double best = 1;
        for (std::size_t j = 1; j < ts.size(); ++j) best = std::min(best, std::fabs(ts[j] - r));
        EXPECT_LT(best, 1e-7) << int(c.kind);
      }
    }
    double b[4], s[4] = {1e300, 1e300, -1e300, -1e300};
    int ib[4];
    ASSERT_TRUE(GetTightBounds<double>(q.a, q.b, q.c, q.d, b[0], b[1], b[2], b[3]));
    ASSERT_TRUE(GetTightBounds<int>(q.a, q.b, q.c, q.d, ib[0], ib[1], ib[2], ib[3]));
    for (int i = 0; i <= 20000; ++i) {
      const V v = At(c.p, i / 20000.0);
      s[0] = std::min(s[0], v.x), s[1] = std::min(s[1], v.y), s[2] = std::max(s[2], v.x), s[3] = std::max(s[3], v.y);
    }
    const double size = Size(c.p) + std::fabs(c.p[0].x) + std::fabs(c.p[0].y);
    for (int k = 0; k < 4; ++k) {
      // Sampling sees at most the true extent, and comes within its step.
      EXPECT_LE(k < 2 ? b[k] - s[k] : s[k] - b[k], 1e-12 * size);
      EXPECT_NEAR(b[k], s[k], 1e-7 * size);
      EXPECT_EQ(ib[k], int(k < 2 ? std::floor(b[k]) : std::ceil(b[k])));
    }
  }
  double keep = 5;
  EXPECT_FALSE(GetTightBounds<double>(V{kNaN, 0}, V{}, V{}, V{}, keep, keep, keep, keep));
  EXPECT_EQ(keep, 5.0);
  int i0, i1, i2, i3;  // saturates rather than overflow
  ASSERT_TRUE(GetTightBounds<int>(V{0, 0}, V{0, 0}, V{3e12, 0}, V{-1e12, 0}, i0, i1, i2, i3));
  EXPECT_TRUE(i0 == INT32_MIN && i2 == INT32_MAX);
}

TEST(BezierArea, MatchesShoelaceSumAndEnclosesTheCircle) {
  for (const FamilyCurve& c : RandomCurves(500, 71)) {
    const PowerBasis q = GetPowerBasis(c.p);
    double sum = 0;
    for (int i = 1; i <= 20000; ++i) {
      const V a = At(c.p, (i - 1) / 20000.0), b = At(c.p, i / 20000.0);
      sum += 0.5 * (a.y + b.y) * (b.x - a.x);
    }
    const double size = Size(c.p);
    EXPECT_NEAR(GetAreaUnderBezier(q.a, q.b, q.c, q.d), sum, 1e-7 * size * size + 1e-20);
  }
  double area = 0;  // counter-clockwise with y up: minus the disc
  for (int quadrant = 0; quadrant < 4; ++quadrant) {
    const PowerBasis q = GetPowerBasis(QuarterArc(10, quadrant).data());
    area += GetAreaUnderBezier(q.a, q.b, q.c, q.d);
  }
  EXPECT_NEAR(area, -M_PI * 100, 0.1);  // the four-arc circle is 2.7e-4 too wide
  EXPECT_EQ(GetAreaUnderBezier(V{kNaN, 0}, V{}, V{}, V{}), 0.0);
}

}  // namespace
