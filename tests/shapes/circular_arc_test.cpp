// Circular arcs by all four descriptions, checked against the circle they
// describe: points on it within the approximation error, the right ends, the
// right tangent, passing through the third point, and the line fallbacks.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <numbers>
#include <random>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;
using OstraCrv::Build3PointCircularArc;
using OstraCrv::BuildCircularArc;

constexpr double kPi = std::numbers::pi;
constexpr double kQuarterError = 2.75e-4;

double MaxRadialError(const V* p, const NODETYPE* nd, int n, V c, double r) {
  double worst = 0.0;
  for (const auto& poly : testgeo::Flatten(p, nd, n, 64))
    for (const V& q : poly) worst = std::max(worst, std::fabs(MavikMath::Distance(q, c) - r) / r);
  return worst;
}

TEST(CircularArc, PieceCountsAndBytes) {
  V p[13];
  NODETYPE nd[13];
  // Equal angles: a full circle.
  ASSERT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 1.0, 1.0), 13u);
  EXPECT_EQ(nd[0], 0x1C);
  EXPECT_EQ(nd[12], 0x98);
  EXPECT_EQ(p[12], p[0]);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nd, 13));
  // A quarter is one Bezier, within 1e-5 of a quarter too.
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi / 2), 4u);
  EXPECT_EQ(nd[0], 0x04);
  EXPECT_EQ(nd[3], 0x84);
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi / 2 + 0.9e-5), 4u);
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi / 2 + 1.5e-5), 7u);
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi - 0.9e-5), 7u);
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, 3.5), 10u);
  // Equal pieces: the middle node of a half circle is at the top.
  ASSERT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi), 7u);
  EXPECT_NEAR(p[3].x, 0.0, 1e-12);
  EXPECT_NEAR(p[3].y, 10.0, 1e-12);
  EXPECT_EQ(nd[3], 0x94);
}

TEST(CircularArc, ByAnglesLiesOnTheCircleCounterClockwise) {
  std::mt19937 rng(3);
  std::uniform_real_distribution<double> ang(-10.0, 10.0), rad(0.5, 5000.0), pos(-1e4, 1e4);
  for (int k = 0; k < 2000; ++k) {
    V p[13];
    NODETYPE nd[13];
    const V c{pos(rng), pos(rng)};
    const double r = rad(rng), s = ang(rng), e = ang(rng);
    const unsigned long n = BuildCircularArc(p, nd, c, r, s, e);
    ASSERT_LE(n, 13u);
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n));
    if (n < 4) continue;  // a sweep too small for one piece
    ASSERT_LT(MaxRadialError(p, nd, int(n), c, r), kQuarterError) << k;
    EXPECT_NEAR(p[0].x, c.x + r * std::cos(s), 1e-9 * (1e4 + r));
    EXPECT_NEAR(p[n - 1].y, c.y + r * std::sin(e), 1e-9 * (1e4 + r));
    // Counter-clockwise: the first handle leaves along the left normal of the radius.
    const D radius = p[0] - c, handle = p[1] - p[0];
    EXPECT_GT(MavikMath::Cross(radius, handle), 0.0) << k;
  }
}

TEST(CircularArc, ByCentreStartAndEnd) {
  V p[13];
  NODETYPE nd[13];
  // The end gives only a direction: the arc ends on the start's circle.
  const unsigned long n = BuildCircularArc(p, nd, V{0, 0}, V{10, 0}, V{0, 50});
  ASSERT_EQ(n, 4u);
  EXPECT_NEAR(p[3].x, 0, 1e-12);
  EXPECT_NEAR(p[3].y, 10, 1e-12);
}

// Checks an arc from s to e that should leave s along t.
void ExpectTangentArc(const V* p, const NODETYPE* nd, unsigned long n, V s, V e, D t) {
  ASSERT_GE(n, 4u);
  ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n));
  EXPECT_NEAR(p[0].x, s.x, 1e-6);
  EXPECT_NEAR(p[0].y, s.y, 1e-6);
  EXPECT_NEAR(p[n - 1].x, e.x, 1e-6);
  EXPECT_NEAR(p[n - 1].y, e.y, 1e-6);
  const D h = p[1] - p[0];
  EXPECT_NEAR(MavikMath::Cross(h, t) / (h.Length() * t.Length()), 0.0, 1e-9);
  EXPECT_GT(MavikMath::Dot(h, t), 0.0);
}

TEST(CircularArc, ByStartEndAndTangentTurnsEitherWay) {
  V p[13];
  NODETYPE nd[13];
  // End left of the tangent: a left turn, built directly.
  unsigned long n = BuildCircularArc(p, nd, V{0, 0}, V{10, 10}, D{1, 0});
  ExpectTangentArc(p, nd, n, V{0, 0}, V{10, 10}, D{1, 0});
  EXPECT_EQ(n, 4u);
  EXPECT_LT(MaxRadialError(p, nd, int(n), V{0, 10}, 10), kQuarterError);
  // End right of the tangent: built backwards and reversed.
  n = BuildCircularArc(p, nd, V{0, 0}, V{10, -10}, D{3, 0});
  ExpectTangentArc(p, nd, n, V{0, 0}, V{10, -10}, D{3, 0});
  EXPECT_LT(MaxRadialError(p, nd, int(n), V{0, -10}, 10), kQuarterError);
  EXPECT_EQ(nd[0], 0x04);
  EXPECT_EQ(nd[n - 1], 0x84);
  // Tangent along the chord: a line.
  n = BuildCircularArc(p, nd, V{0, 0}, V{10, 0}, D{1, 0});
  ASSERT_EQ(n, 2u);
  EXPECT_EQ(nd[0], 0x04);
  EXPECT_EQ(nd[1], 0x44);
  // Nearly along the chord: the circle is huge and the apex test gives a line.
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, V{10, 0}, D{1, 1e-9}), 2u);
  // Integer form: points rounded as stored.
  POINT ip[13];
  NODETYPE ind[13];
  n = BuildCircularArc(ip, ind, V{0, 0}, V{1000, 1000}, D{0, 1});
  ASSERT_EQ(n, 4u);
  EXPECT_EQ(ip[0], (POINT{0, 0}));
  EXPECT_EQ(ip[3], (POINT{1000, 1000}));
  EXPECT_EQ(ip[1], (POINT{0, 552}));
}

TEST(CircularArc, TangentFormRandom) {
  std::mt19937 rng(5);
  std::uniform_real_distribution<double> pos(-1000.0, 1000.0);
  for (int k = 0; k < 3000; ++k) {
    V p[13];
    NODETYPE nd[13];
    const V s{pos(rng), pos(rng)}, e{pos(rng), pos(rng)};
    const D t{pos(rng), pos(rng)};
    const unsigned long n = BuildCircularArc(p, nd, s, e, t);
    ASSERT_TRUE(n == 2 || (n >= 4 && n <= 13)) << k;
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n)) << k;
    if (n == 2) continue;
    ExpectTangentArc(p, nd, n, s, e, t);
    // Centre on the normal of the tangent, as far from e as from s.
    const double f = (e - s).SquaredLength() / (2 * MavikMath::Cross(t, e - s));
    const V m = s + t.Perpendicular() * f;
    ASSERT_LT(MaxRadialError(p, nd, int(n), m, MavikMath::Distance(m, s)), kQuarterError) << k;
  }
}

TEST(CircularArc, ThreePoints) {
  V p[13];
  NODETYPE nd[13];
  const V a{-10, 0}, b{10, 0};
  for (const V through : {V{0, 10}, V{0, -10}, V{6, 8}, V{-8, -6}, V{0, 3}, V{0, -30}}) {
    const unsigned long n = Build3PointCircularArc(p, nd, a, b, through);
    ASSERT_GE(n, 4u);
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n));
    EXPECT_NEAR(MavikMath::Distance(p[0], a), 0.0, 1e-9);
    EXPECT_NEAR(MavikMath::Distance(p[n - 1], b), 0.0, 1e-9);
    // Passes through the third point (radii here are at most about 20: the
    // approximation error stays below 0.006; the other arc of the circle
    // would miss by a radius).
    const auto polys = testgeo::Flatten(p, nd, int(n), 512);
    EXPECT_LT(testgeo::DistanceToPolylines(polys, through), 0.01) << through.x << "," << through.y;
  }
  // Collinear: a line; `through` just outside the segment: a line by the apex limit.
  EXPECT_EQ(Build3PointCircularArc(p, nd, a, b, V{5, 0}), 2u);
  EXPECT_EQ(Build3PointCircularArc(p, nd, a, b, V{20, 1e-7}), 2u);
  EXPECT_EQ(nd[1], 0x44);
  EXPECT_EQ(p[1], b);
}

TEST(CircularArc, BadArgumentsNeverGiveAnInvalidPath) {
  std::mt19937 rng(9);
  const double inf = std::numeric_limits<double>::infinity(), nan = std::numeric_limits<double>::quiet_NaN();
  const double specials[] = {0.0, 1e-300, 1e300, -1e300, 1e9, inf, -inf, nan};
  std::uniform_real_distribution<double> u(-100.0, 100.0);
  auto v = [&] { return rng() % 3 == 0 ? specials[rng() % 8] : u(rng); };
  for (int k = 0; k < 5000; ++k) {
    V p[13];
    NODETYPE nd[13];
    POINT ip[13];
    NODETYPE ind[13];
    const V a{v(), v()}, b{v(), v()}, c{v(), v()};
    const double r = v(), s = v(), e = v();
    auto check = [&](unsigned long n) {
      ASSERT_LE(n, 13u);
      ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n)) << k;
      for (unsigned long i = 0; i < n; ++i) ASSERT_TRUE(p[i].IsFinite()) << k;
    };
    auto checkInt = [&](unsigned long n) {
      ASSERT_LE(n, 13u);
      ASSERT_TRUE(OstraCrv::IsValidCurve(ind, n)) << k;
    };
    check(BuildCircularArc(p, nd, a, r, s, e));
    check(BuildCircularArc(p, nd, a, b, c));
    check(BuildCircularArc(p, nd, a, b, D{c.x, c.y}));
    check(Build3PointCircularArc(p, nd, a, b, c));
    checkInt(BuildCircularArc(ip, ind, a, r, s, e));
    checkInt(BuildCircularArc(ip, ind, a, b, D{c.x, c.y}));
    checkInt(Build3PointCircularArc(ip, ind, a, b, c));
  }
}

}  // namespace
