// Circular arcs by all four descriptions, checked against the circle they
// describe: points on it within the approximation error, the right ends and
// start tangent, passing through the third point, and the line fallbacks.
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
using testgeo::kQuarterError;

double MaxRadialError(const V* p, const NODETYPE* nd, unsigned long n, V c, double r) {
  return testgeo::MaxUnitRadialError(p, nd, int(n), c, r, r);
}

TEST(CircularArc, PieceCounts) {
  V p[13];
  NODETYPE nd[13];
  ASSERT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 1.0, 1.0), 13u);  // equal angles: a circle
  EXPECT_TRUE(nd[0] == 0x1C && nd[12] == 0x98 && p[12] == p[0]);
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi / 2), 4u);
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi / 2 + 0.9e-5), 4u);  // no sliver
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi / 2 + 1.5e-5), 7u);
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, 3.5), 10u);
  ASSERT_EQ(BuildCircularArc(p, nd, V{0, 0}, 10.0, 0.0, kPi), 7u);  // equal pieces
  EXPECT_NEAR(p[3].x, 0.0, 1e-12);
  // By centre, start and end: the end only gives a direction.
  ASSERT_EQ(BuildCircularArc(p, nd, V{0, 0}, V{10, 0}, V{0, 50}), 4u);
  EXPECT_NEAR(p[3].y, 10, 1e-12);
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
    ASSERT_TRUE(n == 1 || (n >= 4 && n <= 13)) << k;
    ASSERT_TRUE(OstraCrv::IsValidCurve(nd, n));
    if (n == 1) continue;  // a sweep too small for one piece
    ASSERT_LT(MaxRadialError(p, nd, n, c, r), kQuarterError) << k;
    EXPECT_NEAR(p[0].x, c.x + r * std::cos(s), 1e-8);
    EXPECT_NEAR(p[n - 1].y, c.y + r * std::sin(e), 1e-8);
    EXPECT_GT(MavikMath::Cross(p[0] - c, p[1] - p[0]), 0.0) << k;  // leaves counter-clockwise
  }
}

// An arc from s to e that leaves s along t, on the circle round m.
void ExpectTangentArc(const V* p, const NODETYPE* nd, unsigned long n, V s, V e, D t, V m) {
  ASSERT_TRUE(n >= 4 && n <= 13 && OstraCrv::IsValidCurve(nd, n));
  EXPECT_LT(MavikMath::Distance(p[0], s), 1e-6);
  EXPECT_LT(MavikMath::Distance(p[n - 1], e), 1e-6);
  const D h = p[1] - p[0];
  EXPECT_NEAR(MavikMath::Cross(h, t) / (h.Length() * t.Length()), 0.0, 1e-9);
  EXPECT_GT(MavikMath::Dot(h, t), 0.0);
  EXPECT_LT(MaxRadialError(p, nd, n, m, MavikMath::Distance(m, s)), kQuarterError);
}

TEST(CircularArc, ByStartEndAndTangent) {
  V p[13];
  NODETYPE nd[13];
  // Left and right turns alike: the random arcs below.
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, V{10, 0}, D{1, 0}), 2u);  // along the chord: a line
  EXPECT_TRUE(nd[0] == 0x04 && nd[1] == 0x44);
  EXPECT_EQ(BuildCircularArc(p, nd, V{0, 0}, V{10, 0}, D{1, 1e-9}), 2u);  // a huge circle: the apex limit
  POINT ip[13];
  ASSERT_EQ(BuildCircularArc(ip, nd, V{0, 0}, V{1000, 1000}, D{0, 1}), 4u);
  EXPECT_TRUE(ip[1] == (POINT{0, 552}) && ip[3] == (POINT{1000, 1000}));

  std::mt19937 rng(5);
  std::uniform_real_distribution<double> pos(-1000.0, 1000.0);
  for (int k = 0; k < 3000; ++k) {
    const V s{pos(rng), pos(rng)}, e{pos(rng), pos(rng)};
    const D t{pos(rng), pos(rng)};
    const unsigned long n = BuildCircularArc(p, nd, s, e, t);
    if (n == 2) continue;
    // The centre is on the normal of the tangent, as far from e as from s.
    const V m = s + t.Perpendicular() * ((e - s).SquaredLength() / (2 * MavikMath::Cross(t, e - s)));
    ExpectTangentArc(p, nd, n, s, e, t, m);
    if (::testing::Test::HasFailure()) FAIL() << k;
  }
}

TEST(CircularArc, ThreePoints) {
  V p[13];
  NODETYPE nd[13];
  const V a{-10, 0}, b{10, 0};
  for (const V through : {V{0, 10}, V{0, -10}, V{6, 8}, V{-8, -6}, V{0, 3}, V{0, -30}}) {
    const unsigned long n = Build3PointCircularArc(p, nd, a, b, through);
    ASSERT_TRUE(n >= 4 && OstraCrv::IsValidCurve(nd, n));
    EXPECT_LT(MavikMath::Distance(p[0], a), 1e-9);
    EXPECT_LT(MavikMath::Distance(p[n - 1], b), 1e-9);
    // Through the third point: radii here are below 20, so the approximation
    // misses by less than 0.006; the other arc of the circle would miss by a radius.
    EXPECT_LT(testgeo::DistanceToPolylines(testgeo::Flatten(p, nd, int(n), 512), through), 0.01);
  }
  EXPECT_EQ(Build3PointCircularArc(p, nd, a, b, V{5, 0}), 2u);      // collinear
  EXPECT_EQ(Build3PointCircularArc(p, nd, a, b, V{20, 1e-7}), 2u);  // just outside: the apex limit
  EXPECT_EQ(p[1], b);
}

TEST(CircularArc, BadArgumentsNeverGiveAnInvalidPath) {
  std::mt19937 rng(9);
  const double inf = std::numeric_limits<double>::infinity();
  const double specials[] = {0.0, 1e-300, 1e300, -1e300, 1e9, inf, -inf, std::nan("")};
  std::uniform_real_distribution<double> u(-100.0, 100.0);
  auto v = [&] { return rng() % 3 == 0 ? specials[rng() % 8] : u(rng); };
  for (int k = 0; k < 5000; ++k) {
    V p[13];
    POINT ip[13];
    NODETYPE nd[13];
    const V a{v(), v()}, b{v(), v()}, c{v(), v()};
    const double r = v(), s = v(), e = v();
    auto check = [&](unsigned long n, bool points) {
      ASSERT_TRUE(n <= 13 && OstraCrv::IsValidCurve(nd, n)) << k;
      for (unsigned long i = 0; points && i < n; ++i) ASSERT_TRUE(p[i].IsFinite()) << k;
    };
    check(BuildCircularArc(p, nd, a, r, s, e), true);
    check(BuildCircularArc(p, nd, a, b, c), true);
    check(BuildCircularArc(p, nd, a, b, D{c.x, c.y}), true);
    check(Build3PointCircularArc(p, nd, a, b, c), true);
    check(BuildCircularArc(ip, nd, a, r, s, e), false);
    check(BuildCircularArc(ip, nd, a, b, D{c.x, c.y}), false);
    check(Build3PointCircularArc(ip, nd, a, b, c), false);
  }
}

}  // namespace
