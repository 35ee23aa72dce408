// Ellipses and circles against the true curve: every sampled point on the
// ellipse within the error of the cubic approximation, the expected turning
// direction and area, and the node bytes of the seam and the quadrant joins.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <numbers>
#include <random>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using OstraCrv::BuildEllipse;

constexpr double kPi = std::numbers::pi;
// Largest radial error of the standard quarter-circle Bezier, over the radius.
constexpr double kQuarterError = 2.75e-4;

// Largest |(x/rx)^2 + (y/ry)^2| deviation from the unit circle, as a radial
// error of the unit circle, over all samples of the path's Beziers.
template <class T>
double MaxUnitRadialError(const T* p, const NODETYPE* nd, int n, V c, double rx, double ry, bool skipCentre) {
  double worst = 0.0;
  for (const auto& poly : testgeo::Flatten(p, nd, n, 64))
    for (const V& q : poly) {
      const double x = (q.x - c.x) / rx, y = (q.y - c.y) / ry;
      const double r = std::hypot(x, y);
      if (skipCentre && r < 1e-9) continue;
      worst = std::max(worst, std::fabs(r - 1.0));
    }
  return worst;
}

TEST(Ellipse, CircleHasQuadrantsSymmetricNodesAndTheRightArea) {
  V p[13];
  NODETYPE nd[13];
  const double r = 250.0;
  ASSERT_EQ(OstraCrv::BuildCircle(p, nd, V{10, -20}, r), 13u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 13));
  EXPECT_EQ(nd[0], 0x2C);
  EXPECT_EQ(nd[12], 0xA8);
  EXPECT_EQ(nd[3], 0xA4);
  EXPECT_EQ(nd[6], 0xA4);
  EXPECT_EQ(nd[9], 0xA4);
  EXPECT_EQ(p[0], (V{260, -20}));
  EXPECT_NEAR(p[3].x, 10, 1e-12);
  EXPECT_NEAR(p[3].y, 230, 1e-12);  // a quarter turn counter-clockwise
  EXPECT_LT(MaxUnitRadialError(p, nd, 13, V{10, -20}, r, r, false), kQuarterError);
  EXPECT_GT(MaxUnitRadialError(p, nd, 13, V{10, -20}, r, r, false), 2.0e-4);  // it is an approximation
  // Counter-clockwise with y up: negative under the clockwise-positive rule.
  EXPECT_NEAR(testgeo::ClockwiseArea(p, nd, 13), -kPi * r * r, 1e-3 * kPi * r * r);
  EXPECT_NEAR(testgeo::Length(p, nd, 13), 2 * kPi * r, 1e-3 * r);
}

TEST(Ellipse, OffGridFullTurnHasFivePiecesAndASmoothSeam) {
  V p[16];
  NODETYPE nd[16];
  ASSERT_EQ(BuildEllipse(p, nd, V{0, 0}, 300, 100, 0.3, 0.3 + 2 * kPi, false, false), 16u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 16));
  EXPECT_EQ(nd[0], 0x1C);
  EXPECT_EQ(nd[15], 0x98);
  // The nodes at pi and 3 pi / 2 join whole quadrants; those at pi/2 and 2 pi
  // join a partial piece.
  EXPECT_EQ(nd[3], 0x94);
  EXPECT_EQ(nd[6], 0xA4);
  EXPECT_EQ(nd[9], 0xA4);
  EXPECT_EQ(nd[12], 0x94);
  EXPECT_LT(MaxUnitRadialError(p, nd, 16, V{0, 0}, 300, 100, false), kQuarterError);
  EXPECT_NEAR(p[0].x, 300 * std::cos(0.3), 1e-9);
  EXPECT_NEAR(p[0].y, 100 * std::sin(0.3), 1e-9);
  EXPECT_NEAR(testgeo::ClockwiseArea(p, nd, 16), -kPi * 300 * 100, 1e-3 * kPi * 300 * 100);
}

TEST(Ellipse, OpenArcAndPie) {
  V p[18];
  NODETYPE nd[18];
  // From 80 to 200 degrees: three pieces (to 90, to 180, to 200).
  const double a0 = 80 * kPi / 180, a1 = 200 * kPi / 180;
  ASSERT_EQ(BuildEllipse(p, nd, V{5, 5}, 40, 40, a0, a1, false, false), 10u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 10));
  EXPECT_EQ(nd[0], 0x04);
  EXPECT_EQ(nd[9], 0x84);
  EXPECT_NEAR(p[9].x, 5 + 40 * std::cos(a1), 1e-9);
  EXPECT_NEAR(p[9].y, 5 + 40 * std::sin(a1), 1e-9);
  // An end angle below the start runs on counter-clockwise past 2 pi.
  ASSERT_EQ(BuildEllipse(p, nd, V{0, 0}, 10, 10, 3 * kPi / 2, kPi / 2, false, false), 7u);
  EXPECT_NEAR(p[3].x, 10, 1e-12);  // through angle 0
  EXPECT_NEAR(p[3].y, 0, 1e-12);

  // Pie: centre, line out, arc, line back.
  ASSERT_EQ(BuildEllipse(p, nd, V{5, 5}, 40, 40, a0, a1, true, false), 12u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 12));
  EXPECT_EQ(p[0], (V{5, 5}));
  EXPECT_EQ(p[11], (V{5, 5}));
  EXPECT_EQ(nd[0], 0x0C);
  EXPECT_EQ(nd[1], 0x44);
  EXPECT_EQ(nd[10], 0x84);
  EXPECT_EQ(nd[11], 0x48);
  const double sector = 0.5 * 40 * 40 * (a1 - a0);
  EXPECT_NEAR(testgeo::ClockwiseArea(p, nd, 12), -sector, 1e-3 * sector);
  ASSERT_EQ(BuildEllipse(p, nd, V{5, 5}, 40, 40, a0, a1, true, true), 12u);
  EXPECT_EQ(nd[0], 0x08);
  EXPECT_EQ(nd[4], 0x90);
  EXPECT_EQ(nd[10], 0x84);
  // A full-turn pie on the grid: the largest case fits in 18 nodes.
  EXPECT_EQ(BuildEllipse(p, nd, V{0, 0}, 1, 1, 0.1, 0.1, true, false), 18u);
}

TEST(Ellipse, IntegerFormRoundsEveryPoint) {
  POINT p[13];
  NODETYPE nd[13];
  ASSERT_EQ(OstraCrv::BuildCircle(p, nd, POINT{100, 100}, 1000), 13u);
  EXPECT_EQ(p[0], (POINT{1100, 100}));
  EXPECT_EQ(p[1], (POINT{1100, 652}));  // 100 + 552.28 handle
  EXPECT_EQ(p[6], (POINT{-900, 100}));
  // Rounded points stay within half a unit of the double curve.
  EXPECT_LT(MaxUnitRadialError(p, nd, 13, V{100, 100}, 1000, 1000, false), kQuarterError + 0.001);
}

TEST(Ellipse, RandomArgumentsNeverGiveAnInvalidPath) {
  std::mt19937 rng(7);
  const double inf = std::numeric_limits<double>::infinity(), nan = std::numeric_limits<double>::quiet_NaN();
  const double specials[] = {0.0, -0.0, kPi / 2, kPi, 2 * kPi, -kPi / 2, 1e300, -1e300, 1e20, inf, -inf, nan};
  std::uniform_real_distribution<double> u(-10.0, 10.0), rad(-500.0, 500.0);
  auto angle = [&] { return rng() % 4 == 0 ? specials[rng() % 12] : u(rng); };
  auto radius = [&] { return rng() % 6 == 0 ? specials[rng() % 12] : rad(rng); };
  for (int k = 0; k < 4000; ++k) {
    V p[18];
    NODETYPE nd[18];
    const double rx = radius(), ry = radius(), s = angle(), e = angle();
    const bool pie = rng() % 2, plain = rng() % 2;
    const V c{u(rng), u(rng)};
    const unsigned long n = BuildEllipse(p, nd, c, rx, ry, s, e, pie, plain);
    if (n == 0) {
      // Refused: only for non-finite arguments or an overflowing result.
      EXPECT_FALSE(std::isfinite(rx) && std::isfinite(ry) && std::isfinite(s) && std::isfinite(e) &&
                   std::fabs(rx) < 1e200 && std::fabs(ry) < 1e200)
          << k;
      continue;
    }
    ASSERT_LE(n, 18u);
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n)) << k;
    for (unsigned long i = 0; i < n; ++i) ASSERT_TRUE(p[i].IsFinite()) << k;
    if (std::fabs(rx) > 1e-3 && std::fabs(ry) > 1e-3 && std::fabs(rx) < 1e6 && std::fabs(ry) < 1e6) {
      EXPECT_LT(MaxUnitRadialError(p, nd, int(n), c, std::fabs(rx), std::fabs(ry), pie), kQuarterError) << k;
    }
    POINT ip[18];
    NODETYPE ind[18];
    const unsigned long m = BuildEllipse(ip, ind, POINT{int(u(rng)), 0}, rx, ry, s, e, pie, plain);
    ASSERT_TRUE(m == 0 || OstraCrv::IsValidCurve(ind, m)) << k;
  }
}

TEST(Ellipse, ArcsLieOnTheEllipse) {
  std::mt19937 rng(8);
  std::uniform_real_distribution<double> ang(-20.0, 20.0), rad(1.0, 1000.0), pos(-1000.0, 1000.0);
  for (int k = 0; k < 2000; ++k) {
    V p[18];
    NODETYPE nd[18];
    const V c{pos(rng), pos(rng)};
    const double rx = rad(rng), ry = rad(rng), s = ang(rng), e = ang(rng);
    const unsigned long n = BuildEllipse(p, nd, c, rx, ry, s, e, false, false);
    ASSERT_GE(n, 4u);
    ASSERT_LE(n, 16u);
    ASSERT_LT(MaxUnitRadialError(p, nd, int(n), c, rx, ry, false), kQuarterError) << k;
    // Starts at the start angle and ends at the end angle.
    EXPECT_NEAR(p[0].x, c.x + rx * std::cos(s), 1e-9 * (1 + std::fabs(c.x) + rx));
    EXPECT_NEAR(p[n - 1].y, c.y + ry * std::sin(e), 1e-9 * (1 + std::fabs(c.y) + ry));
  }
}

}  // namespace
