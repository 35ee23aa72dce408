#include "ostracrv/math/collinear.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>

namespace {

using namespace MavikMath;
using Framework::common_types::POINT;

// Three points lie near one line when two nearly coincide or the smallest
// of the three heights is short: computed from all three heights.
bool ReferenceThree(const V& a, const V& b, const V& c, double tol) {
  const V p[3] = {a, b, c};
  double smallest = std::numeric_limits<double>::infinity();
  for (int i = 0; i < 3; ++i) {
    const V& apex = p[i];
    const V& s = p[(i + 1) % 3];
    const V& e = p[(i + 2) % 3];
    const double base = SquaredDistance(s, e);
    if (base < tol) return true;
    const double cross = Cross(e - s, apex - s);
    smallest = std::min(smallest, cross * cross / base);
  }
  return smallest < tol;
}

TEST(AreCollinear, ThreePointsMatchTheHeightsOfTheTriangle) {
  std::mt19937 rng(6);
  std::uniform_real_distribution<double> u(-100.0, 100.0), small(-3.0, 3.0);
  int agreeTrue = 0;
  for (double tol : {1e-16, 4.0, 10.0, 100.0, 250000.0}) {
    for (int i = 0; i < 3000; ++i) {
      const V a{u(rng), u(rng)}, b{u(rng), u(rng)};
      // Every third triangle is nearly flat.
      const V c = i % 3 ? V{u(rng), u(rng)} : Lerp(a, b, u(rng) / 50) + D{small(rng), small(rng)};
      const bool ref = ReferenceThree(a, b, c, tol);
      ASSERT_EQ(AreCollinear(a, b, c, tol), ref) << tol;
      ASSERT_EQ(AreCollinear(b, c, a, tol), ref);
      const V pts[3] = {c, a, b};
      ASSERT_EQ(AreCollinear(pts, 3ul, tol), ref);
      agreeTrue += ref;
    }
  }
  EXPECT_GT(agreeTrue, 1000);
  EXPECT_FALSE(AreCollinear(V{0, 0}, V{0, 0}, V{0, 0}, 0.0));  // no base, no line
  EXPECT_TRUE(AreCollinear(V{0, 0}, V{0, 0}, V{50, 50}, 1e-16));
  EXPECT_FALSE(AreCollinear(V{0, 0}, V{std::nan(""), 0}, V{1, 1}, 4.0));
  EXPECT_TRUE(AreCollinear(POINT{0, 0}, POINT{10, 1}, POINT{20, 0}, 4.0));
  EXPECT_FALSE(AreCollinear(POINT{0, 0}, POINT{10, 3}, POINT{20, 0}, 4.0));
}

TEST(AreCollinear, ManyPointsNearALine) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> u(-1.0, 1.0);
  for (int trial = 0; trial < 2000; ++trial) {
    const double tol = 4.0, r = std::sqrt(tol);
    const V o{1000 * u(rng), 1000 * u(rng)};
    const D dir = D{u(rng), u(rng)}.Normalized(), n = dir.Perpendicular();
    const int count = 4 + trial % 30;
    // Two far ends, the rest between them; all within 0.3 r of the line.
    std::vector<V> pts;
    for (int i = 0; i < count; ++i) {
      const double along = i == 0 ? -500 : i == 1 ? 500 : 250 * u(rng);
      pts.push_back(o + dir * along + n * (0.3 * r * u(rng)));
    }
    std::shuffle(pts.begin() + 1, pts.end(), rng);
    ASSERT_TRUE(AreCollinear(pts.data(), pts.size(), tol));
    // Any line within r of both ends stays within r of the line in the
    // middle half, so an inner point 4 r off cannot be near it.
    for (V& q : pts)
      if (std::fabs(Dot(q - o, dir)) <= 250) {
        q = q + n * (4 * r);
        break;
      }
    ASSERT_FALSE(AreCollinear(pts.data(), pts.size(), tol));
  }
  // A Bezier folded back along its chord, as a spike is.
  const V spike[4] = {{0, 0}, {100, 1}, {-40, -1}, {60, 0}};
  EXPECT_TRUE(AreCollinear(spike, 4ul, 4.0));
  EXPECT_FALSE(AreCollinear(spike, 4ul, 0.01));  // no line comes within 0.3 of all four
  const POINT ispike[4] = {{0, 0}, {100, 1}, {-40, -1}, {60, 0}};
  EXPECT_TRUE(AreCollinear(ispike, 4ul, 4.0));
  const V same[5] = {{3, 3}, {3, 3}, {3, 3}, {3, 3}, {3, 3}};
  EXPECT_TRUE(AreCollinear(same, 5ul, 1.0));
  EXPECT_TRUE(AreCollinear(same, 2ul, 1.0));
  EXPECT_FALSE(AreCollinear(static_cast<const V*>(nullptr), 4ul, 1.0));
  const V bad[4] = {{0, 0}, {1, 1}, {2, std::numeric_limits<double>::infinity()}, {3, 3}};
  EXPECT_FALSE(AreCollinear(bad, 4ul, 1.0));
}

}  // namespace
