// Rectangles: orientation and area of the plain forms, the corner treatments
// of the treated rectangle checked against the circle they approximate, and
// random arguments that must always give a closed valid outline.
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

TEST(Rectangle, PlainFormsAndOrientation) {
  POINT p[5];
  NODETYPE nd[5];
  ASSERT_EQ(BuildRectangle(p, nd, 10.4, 20.6), 5u);
  EXPECT_EQ(p[2], (POINT{10, 21}));
  EXPECT_EQ(p[4], p[0]);
  const NODETYPE bytes[5] = {0x0C, 0x44, 0x44, 0x44, 0x48};
  EXPECT_TRUE(std::equal(nd, nd + 5, bytes));
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 5));
  // Width and height: counter-clockwise, negative under the clockwise-positive rule.
  EXPECT_DOUBLE_EQ(testgeo::ClockwiseArea(p, nd, 5), -210.0);

  // RECT and bounds of one box: clockwise, equal positive areas.
  const RECT r{-5, 40, 15, 10};
  POINT rp[5];
  NODETYPE rn[5];
  ASSERT_EQ(BuildRectangle(rp, rn, r), 5u);
  V bp[5];
  NODETYPE bn[5];
  ASSERT_EQ(BuildRectangle(bp, bn, MavikMath::ToBounds(r)), 5u);
  EXPECT_DOUBLE_EQ(testgeo::ClockwiseArea(rp, rn, 5), 600.0);
  EXPECT_DOUBLE_EQ(testgeo::ClockwiseArea(bp, bn, 5), 600.0);
  for (int i = 0; i < 5; ++i) EXPECT_EQ(testgeo::Widen(rp[i]), bp[i]) << i;
  EXPECT_TRUE(std::equal(rn, rn + 5, bytes));

  // The points-only forms leave the bytes alone; null bytes are skipped.
  NODETYPE untouched[5] = {1, 2, 3, 4, 5};
  EXPECT_EQ(BuildRectangle(rp, r), 5u);
  EXPECT_EQ(BuildRectangle(rp, nullptr, r), 5u);
  EXPECT_EQ(BuildRectangle(bp, nullptr, MavikMath::ToBounds(r)), 5u);
  EXPECT_EQ(untouched[0], 1);
  // The empty marker has infinite sides: nothing is written.
  MavikMath::BoundsT<double> empty;
  EXPECT_EQ(BuildRectangle(bp, bn, empty), 0u);
}

TEST(Rectangle, LineIsRounded) {
  POINT p[2];
  NODETYPE nd[2];
  ASSERT_EQ(OstraCrv::BuildLine(p, nd, V{1.5, -1.5}, V{2.49, -2.5}), 2u);
  EXPECT_EQ(p[0], (POINT{2, -2}));
  EXPECT_EQ(p[1], (POINT{2, -3}));
  EXPECT_EQ(nd[0], 0x04);
  EXPECT_EQ(nd[1], 0x44);
}

// The middle of a corner Bezier from (r, 0)-side to the next edge, measured
// from the centre of the corner's circle.
double CornerMidRadius(const POINT* p, int end, V centre) {
  const V m = testgeo::Bezier(testgeo::Widen(p[end - 3]), testgeo::Widen(p[end - 2]), testgeo::Widen(p[end - 1]),
                              testgeo::Widen(p[end]), 0.5);
  return MavikMath::Distance(m, centre);
}

TEST(Rectangle, CornerTreatments) {
  POINT p[17];
  NODETYPE nd[17];
  const double r = 1000.0;
  // Round: the corner at (W, 0) is a quarter curve round (W - r, r).
  ASSERT_EQ(BuildRectangle(p, nd, 5000, 3000, r, RectangleCorner::Round, false), 17u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 17));
  EXPECT_EQ(nd[0], 0x1C);   // smooth seam in a round corner
  EXPECT_EQ(nd[1], 0x54);   // edge end before a round corner
  EXPECT_EQ(nd[16], 0x98);  // closing curve, smooth
  EXPECT_EQ(p[16], p[0]);
  // Handles 11/20 of the radius: the midpoint lies on the circle within 0.15%
  // (9/20 handles would miss it by more than 5%).
  EXPECT_NEAR(CornerMidRadius(p, 4, V{4000, 1000}), r, 1.5);
  // Inside the box, and counter-clockwise: the corner area is cut off (the
  // 11/20 handles run a little inside the circle: 0.4% more is cut).
  const double square = 5000.0 * 3000.0, cut = 4 * (r * r - M_PI * r * r / 4);
  EXPECT_NEAR(-testgeo::ClockwiseArea(p, nd, 17), square - cut, 0.005 * cut);

  // Scallop: bites into the shape; the corner point's quarter circle round (W, 0).
  ASSERT_EQ(BuildRectangle(p, nd, 5000, 3000, r, RectangleCorner::Scallop, false), 17u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 17));
  EXPECT_EQ(nd[0], 0x0C);
  EXPECT_EQ(nd[4], 0x84);
  EXPECT_NEAR(CornerMidRadius(p, 4, V{5000, 0}), r, 0.03 * r);
  EXPECT_NEAR(-testgeo::ClockwiseArea(p, nd, 17), square - M_PI * r * r, 0.01 * M_PI * r * r);

  // Chamfer (any other value): a straight cut, 9 nodes.
  ASSERT_EQ(BuildRectangle(p, nd, 5000, 3000, r, static_cast<RectangleCorner>(7), false), 9u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 9));
  EXPECT_NEAR(-testgeo::ClockwiseArea(p, nd, 9), square - 2 * r * r, 1e-6);
}

TEST(Rectangle, ZeroRadiiSkipScalesAndSmallCornersAreAbsent) {
  POINT p[17];
  NODETYPE nd[17];
  EXPECT_EQ(BuildRectangle(p, nd, 100, 50, 0, RectangleCorner::Round, 0, RectangleCorner::Round, 0,
                           RectangleCorner::Round, 0, RectangleCorner::Round, 3.0, 0.25, true),
            5u);
  EXPECT_EQ(p[2], (POINT{100, 50}));  // the scales were not applied
  // r2 below 1 truncates to 0: that corner alone stays square (3 points fewer).
  EXPECT_EQ(BuildRectangle(p, nd, 100, 50, 10, RectangleCorner::Round, 0.9, RectangleCorner::Round, 10,
                           RectangleCorner::Round, 10, RectangleCorner::Round, 1.0, 1.0, false),
            14u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 14));
}

TEST(Rectangle, LimitRadiiShrinksPairsInOrder) {
  POINT p[17];
  NODETYPE nd[17];
  // Width 100, height 40. r3 + r4 = 120 > 100: shrunk by the width step to
  // 50 + 50, then the height steps bring r2 + r3 and r1 + r4 within 40.
  ASSERT_EQ(BuildRectangle(p, nd, 100, 40, 10, RectangleCorner::Chamfer, 10, RectangleCorner::Chamfer, 60,
                           RectangleCorner::Chamfer, 60, RectangleCorner::Chamfer, 1.0, 1.0, true),
            9u);
  // Every corner cut fits its edges: no edge runs backwards.
  for (int i = 0; i + 1 < 9; ++i) {
    EXPECT_GE(p[i].x, 0);
    EXPECT_LE(p[i].x, 100);
    EXPECT_GE(p[i].y, 0);
    EXPECT_LE(p[i].y, 40);
  }
  // Without limiting, the far edge's corners overlap.
  ASSERT_EQ(BuildRectangle(p, nd, 100, 40, 10, RectangleCorner::Chamfer, 10, RectangleCorner::Chamfer, 60,
                           RectangleCorner::Chamfer, 60, RectangleCorner::Chamfer, 1.0, 1.0, false),
            9u);
  EXPECT_GT(p[5].x, p[4].x);  // (a4, H) lies right of (W - a3, H)
  // A pair that fits the width but not the height shrinks only by the height.
  ASSERT_EQ(BuildRectangle(p, nd, 100, 40, 0, RectangleCorner::Chamfer, 30, RectangleCorner::Chamfer, 30,
                           RectangleCorner::Chamfer, 0, RectangleCorner::Chamfer, 1.0, 1.0, true),
            7u);
  EXPECT_EQ(p[1], (POINT{80, 0}));   // r2 = 20 after the height step
  EXPECT_EQ(p[2], (POINT{100, 20}));
}

TEST(Rectangle, NegativeSizeMirrorsAndStaysClosed) {
  POINT p[17];
  NODETYPE nd[17];
  const unsigned long n = BuildRectangle(p, nd, -200, 100, 20, RectangleCorner::Round, false);
  ASSERT_EQ(n, 17u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, n));
  EXPECT_EQ(p[n - 1], p[0]);
  for (unsigned long i = 0; i < n; ++i) {
    EXPECT_LE(p[i].x, 0);
    EXPECT_GE(p[i].x, -200);
  }
  // A mirrored shape turns the other way.
  EXPECT_GT(testgeo::ClockwiseArea(p, nd, int(n)), 0.0);
}

TEST(Rectangle, ScaledLayoutGivesRoundCornersAfterStretch) {
  POINT p[17];
  NODETYPE nd[17];
  // Laid out at scale (4, 1) and mapped back: the corner is an ellipse quarter
  // of x radius 50/4 that a later stretch by 4 makes round.
  const unsigned long n = BuildRectangle(p, nd, 1000, 400, 200, RectangleCorner::Round, 200,
                                         RectangleCorner::Round, 200, RectangleCorner::Round, 200,
                                         RectangleCorner::Round, 4.0, 1.0, false);
  ASSERT_EQ(n, 17u);
  EXPECT_EQ(p[0], (POINT{50, 0}));
  EXPECT_EQ(p[4], (POINT{1000, 200}));
}

TEST(Rectangle, RandomArgumentsGiveClosedValidOutlines) {
  std::mt19937 rng(41);
  const double specials[] = {0.0,  -0.0, 1e-300, 0.5, -0.7, 1e12, -1e12, std::numeric_limits<double>::infinity(),
                             -std::numeric_limits<double>::infinity(), std::numeric_limits<double>::quiet_NaN()};
  std::uniform_real_distribution<double> u(-500.0, 500.0);
  auto arg = [&] { return rng() % 4 == 0 ? specials[rng() % 10] : u(rng); };
  auto corner = [&] { return static_cast<RectangleCorner>(int(rng() % 4) - (rng() % 5 == 0 ? 3 : 0)); };
  for (int k = 0; k < 4000; ++k) {
    POINT p[17];
    NODETYPE nd[17];
    const unsigned long n = BuildRectangle(p, nd, arg(), arg(), arg(), corner(), arg(), corner(), arg(), corner(),
                                           arg(), corner(), rng() % 3 ? 1.0 : arg(), rng() % 3 ? 1.0 : arg(),
                                           rng() % 2 == 0);
    ASSERT_GE(n, 5u);
    ASSERT_LE(n, 17u);
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n)) << k;
    ASSERT_TRUE(IsClosedNode(nd[0]) && IsClosedNode(nd[n - 1])) << k;
  }
}

}  // namespace
