// Ellipses and circles against the true curve: sampled points on the ellipse
// within the error of the cubic approximation, the turning direction and
// area, and the node bytes of the seam and the quadrant joins.
#include <gtest/gtest.h>

#include <cmath>
#include <initializer_list>
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
using testgeo::kQuarterError;
using testgeo::MaxUnitRadialError;

// Node bytes at the given positions: {index, byte}.
void ExpectNodes(const NODETYPE* nd, std::initializer_list<std::pair<int, int>> expected) {
  for (const auto& [i, byte] : expected) EXPECT_EQ(nd[i], byte) << "node " << i;
}

TEST(Ellipse, CircleQuadrantsAreaAndLength) {
  V p[13];
  NODETYPE nd[13];
  const double r = 250.0;
  ASSERT_EQ(OstraCrv::BuildCircle(p, nd, V{10, -20}, r), 13u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 13));
  ExpectNodes(nd, {{0, 0x2C}, {3, 0xA4}, {6, 0xA4}, {9, 0xA4}, {12, 0xA8}});
  EXPECT_EQ(p[12], p[0]);
  EXPECT_NEAR(p[3].y, 230, 1e-12);  // a quarter turn counter-clockwise
  const double err = MaxUnitRadialError(p, nd, 13, V{10, -20}, r, r);
  EXPECT_TRUE(err > 2.0e-4 && err < kQuarterError) << err;
  // Counter-clockwise with y up: negative under the clockwise-positive rule.
  EXPECT_NEAR(testgeo::ClockwiseArea(p, nd, 13), -kPi * r * r, 1e-3 * kPi * r * r);
  EXPECT_NEAR(testgeo::Length(p, nd, 13), 2 * kPi * r, 1e-3 * r);
  POINT ip[13];
  ASSERT_EQ(OstraCrv::BuildCircle(ip, nd, POINT{100, 100}, 1000), 13u);
  EXPECT_EQ(ip[1], (POINT{1100, 652}));  // 100 + 552.28 rounded
}

TEST(Ellipse, OffGridTurnsArcsAndPies) {
  V p[18];
  NODETYPE nd[18];
  // Off the grid: five pieces, a smooth seam, symmetric only between whole quadrants.
  ASSERT_EQ(BuildEllipse(p, nd, V{0, 0}, 300, 100, 0.3, 0.3 + 2 * kPi, false, false), 16u);
  ExpectNodes(nd, {{0, 0x1C}, {3, 0x94}, {6, 0xA4}, {9, 0xA4}, {12, 0x94}, {15, 0x98}});
  EXPECT_NEAR(testgeo::ClockwiseArea(p, nd, 16), -kPi * 300 * 100, 1e-3 * kPi * 300 * 100);
  // An end angle below the start runs on counter-clockwise through angle 0.
  ASSERT_EQ(BuildEllipse(p, nd, V{0, 0}, 10, 10, 3 * kPi / 2, kPi / 2, false, false), 7u);
  ExpectNodes(nd, {{0, 0x04}, {6, 0x84}});
  EXPECT_NEAR(p[3].x, 10, 1e-12);
  // A pie closes through the centre and has the sector's area.
  const double a0 = 80 * kPi / 180, a1 = 200 * kPi / 180;
  ASSERT_EQ(BuildEllipse(p, nd, V{5, 5}, 40, 40, a0, a1, true, false), 12u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 12));
  EXPECT_TRUE(p[0] == (V{5, 5}) && p[11] == (V{5, 5}));
  ExpectNodes(nd, {{10, 0x84}, {11, 0x48}});
  const double sector = 0.5 * 40 * 40 * (a1 - a0);
  EXPECT_NEAR(testgeo::ClockwiseArea(p, nd, 12), -sector, 1e-3 * sector);
  ASSERT_EQ(BuildEllipse(p, nd, V{5, 5}, 40, 40, a0, a1, true, true), 12u);
  ExpectNodes(nd, {{0, 0x08}, {4, 0x90}, {10, 0x84}});
  EXPECT_EQ(BuildEllipse(p, nd, V{0, 0}, 1, 1, 0.1, 0.1, true, false), 18u);  // the largest case
}

TEST(Ellipse, RandomArgumentsLieOnTheEllipseOrAreRefused) {
  std::mt19937 rng(7);
  const double inf = std::numeric_limits<double>::infinity();
  const double specials[] = {0.0, -0.0, kPi / 2, kPi, 2 * kPi, -kPi / 2, 1e300, -1e300, 1e20, inf, -inf, std::nan("")};
  std::uniform_real_distribution<double> u(-20.0, 20.0), rad(-1000.0, 1000.0);
  auto angle = [&] { return rng() % 4 == 0 ? specials[rng() % 12] : u(rng); };
  auto radius = [&] { return rng() % 6 == 0 ? specials[rng() % 12] : rad(rng); };
  for (int k = 0; k < 5000; ++k) {
    V p[18];
    NODETYPE nd[18];
    const V c{u(rng) * 50, u(rng) * 50};
    const double rx = radius(), ry = radius(), s = angle(), e = angle();
    const bool pie = rng() % 2, plain = rng() % 2;
    const unsigned long n = BuildEllipse(p, nd, c, rx, ry, s, e, pie, plain);
    const bool finite = std::isfinite(rx) && std::isfinite(ry) && std::isfinite(s) && std::isfinite(e);
    ASSERT_EQ(n == 0, !finite) << k;
    if (n == 0) continue;
    ASSERT_LE(n, 18u);
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n)) << k;
    for (unsigned long i = 0; i < n; ++i) ASSERT_TRUE(p[i].IsFinite()) << k;
    if (std::fabs(rx) > 1e-3 && std::fabs(ry) > 1e-3 && std::fabs(rx) < 1e6 && std::fabs(ry) < 1e6 &&
        std::fabs(s) < 1e3 && std::fabs(e) < 1e3) {
      EXPECT_LT(MaxUnitRadialError(p, nd, int(n), c, std::fabs(rx), std::fabs(ry)), kQuarterError) << k;
      const int first = pie ? 1 : 0;
      EXPECT_NEAR(p[first].x, c.x + rx * std::cos(s), 1e-9 * (1e3 + std::fabs(rx))) << k;
      EXPECT_NEAR(p[pie ? n - 2 : n - 1].y, c.y + ry * std::sin(e), 1e-9 * (1e3 + std::fabs(ry))) << k;
    }
    POINT ip[18];
    const unsigned long m = BuildEllipse(ip, nd, POINT{int(c.x), 0}, rx, ry, s, e, pie, plain);
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, m)) << k;
  }
}

}  // namespace
