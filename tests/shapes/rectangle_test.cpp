// Rectangles: orientation and area of the plain forms, corner treatments
// against the circles they approximate, and random arguments that must
// always give a closed valid outline.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::V;
using OstraCrv::BuildRectangle;
using OstraCrv::RectangleCorner;

TEST(Rectangle, PlainFormsOrientationAndArea) {
  POINT p[5], rp[5];
  NODETYPE nd[5], rn[5], bn[5];
  V bp[5];
  ASSERT_EQ(BuildRectangle(p, nd, 10.4, 20.6), 5u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 5));
  EXPECT_DOUBLE_EQ(testgeo::ClockwiseArea(p, nd, 5), -210.0);  // counter-clockwise, rounded size
  // RECT and bounds of one box: the same corners, clockwise, equal positive areas.
  const RECT r{-5, 40, 15, 10};
  ASSERT_EQ(BuildRectangle(rp, rn, r), 5u);
  ASSERT_EQ(BuildRectangle(bp, bn, MavikMath::ToBounds(r)), 5u);
  EXPECT_DOUBLE_EQ(testgeo::ClockwiseArea(rp, rn, 5), 600.0);
  EXPECT_DOUBLE_EQ(testgeo::ClockwiseArea(bp, bn, 5), 600.0);
  for (int i = 0; i < 5; ++i) EXPECT_EQ(testgeo::Widen(rp[i]), bp[i]);
  EXPECT_EQ(BuildRectangle(bp, nullptr, MavikMath::BoundsT<double>()), 0u);  // the empty marker is infinite
}

// The middle of the corner Bezier ending at `end`, seen from the corner circle's centre.
double CornerMidRadius(const POINT* p, int end, V centre) {
  using testgeo::Widen;
  return MavikMath::Distance(testgeo::Bezier(Widen(p[end - 3]), Widen(p[end - 2]), Widen(p[end - 1]), Widen(p[end]), 0.5),
                             centre);
}

TEST(Rectangle, CornerTreatments) {
  POINT p[17];
  NODETYPE nd[17];
  const double r = 1000.0, square = 5000.0 * 3000.0, pi = M_PI;
  // Round: quarter curves round (W - r, r) etc. with 11/20 handles, so the
  // middle lies on the circle within 0.15% (9/20 handles would miss by 5%).
  ASSERT_EQ(BuildRectangle(p, nd, 5000, 3000, r, RectangleCorner::Round, false), 17u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 17));
  EXPECT_EQ(nd[0], 0x1C);  // the seam in a round corner is smooth
  EXPECT_NEAR(CornerMidRadius(p, 4, V{4000, 1000}), r, 1.5);
  EXPECT_NEAR(-testgeo::ClockwiseArea(p, nd, 17), square - (4 - pi) * r * r, 0.005 * (4 - pi) * r * r);
  // Scallop: quarter circles round the corner points bite into the shape.
  ASSERT_EQ(BuildRectangle(p, nd, 5000, 3000, r, RectangleCorner::Scallop, false), 17u);
  EXPECT_NEAR(CornerMidRadius(p, 4, V{5000, 0}), r, 1.5);
  EXPECT_NEAR(-testgeo::ClockwiseArea(p, nd, 17), square - pi * r * r, 0.005 * pi * r * r);
  // Any other value is a chamfer.
  ASSERT_EQ(BuildRectangle(p, nd, 5000, 3000, r, static_cast<RectangleCorner>(7), false), 9u);
  EXPECT_DOUBLE_EQ(-testgeo::ClockwiseArea(p, nd, 9), square - 2 * r * r);
}

TEST(Rectangle, RadiiScalesAndLimits) {
  POINT p[17];
  NODETYPE nd[17];
  const auto C = RectangleCorner::Chamfer, R = RectangleCorner::Round;
  // All radii 0: the plain rectangle, scales not applied.
  EXPECT_EQ(BuildRectangle(p, nd, 100, 50, 0, R, 0, R, 0, R, 0, R, 3.0, 0.25, true), 5u);
  EXPECT_EQ(p[2], (POINT{100, 50}));
  // A radius below 1 truncates to 0: that corner alone stays square.
  EXPECT_EQ(BuildRectangle(p, nd, 100, 50, 10, R, 0.9, R, 10, R, 10, R, 1.0, 1.0, false), 14u);
  // A pair that fits the width but not the height shrinks only by the height step.
  ASSERT_EQ(BuildRectangle(p, nd, 100, 40, 0, C, 30, C, 30, C, 0, C, 1.0, 1.0, true), 7u);
  EXPECT_EQ(p[1], (POINT{80, 0}));
  EXPECT_EQ(p[2], (POINT{100, 20}));
  // r3 + r4 is held against the width first; afterwards every cut fits.
  ASSERT_EQ(BuildRectangle(p, nd, 100, 40, 10, C, 10, C, 60, C, 60, C, 1.0, 1.0, true), 9u);
  for (int i = 0; i < 9; ++i) EXPECT_TRUE(p[i].x >= 0 && p[i].x <= 100 && p[i].y >= 0 && p[i].y <= 40) << i;
  // Laid out at scale (4, 1) and mapped back: x radii a quarter of the radius.
  ASSERT_EQ(BuildRectangle(p, nd, 1000, 400, 200, R, 200, R, 200, R, 200, R, 4.0, 1.0, false), 17u);
  EXPECT_EQ(p[0], (POINT{50, 0}));
  EXPECT_EQ(p[4], (POINT{1000, 200}));
  // A negative width mirrors the corners and the outline stays closed.
  const unsigned long n = BuildRectangle(p, nd, -200, 100, 20, R, false);
  ASSERT_EQ(n, 17u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, n));
  EXPECT_EQ(p[n - 1], p[0]);
  for (unsigned long i = 0; i < n; ++i) EXPECT_TRUE(p[i].x <= 0 && p[i].x >= -200);
  EXPECT_GT(testgeo::ClockwiseArea(p, nd, int(n)), 0.0);
}

TEST(Rectangle, RandomArgumentsGiveClosedValidOutlines) {
  std::mt19937 rng(41);
  const double inf = std::numeric_limits<double>::infinity();
  const double specials[] = {0.0, -0.0, 1e-300, 0.5, -0.7, 1e12, -1e12, inf, -inf, std::nan("")};
  std::uniform_real_distribution<double> u(-500.0, 500.0);
  auto arg = [&] { return rng() % 4 == 0 ? specials[rng() % 10] : u(rng); };
  auto corner = [&] { return static_cast<RectangleCorner>(int(rng() % 6) - 2); };
  for (int k = 0; k < 4000; ++k) {
    POINT p[17];
    NODETYPE nd[17];
    const unsigned long n =
        BuildRectangle(p, nd, arg(), arg(), arg(), corner(), arg(), corner(), arg(), corner(), arg(), corner(),
                       rng() % 3 ? 1.0 : arg(), rng() % 3 ? 1.0 : arg(), rng() % 2 == 0);
    ASSERT_TRUE(n >= 5 && n <= 17) << k;
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n)) << k;
    ASSERT_TRUE(IsClosedNode(nd[0]) && IsClosedNode(nd[n - 1])) << k;
  }
}

}  // namespace
