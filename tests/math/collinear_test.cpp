#include "ostracrv/math/collinear.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>

namespace {

using namespace MavikMath;
using Framework::common_types::POINT;

// Near one line: two points nearly coincide, or the smallest of the three
// heights of the triangle is short.
bool ReferenceThree(const V* p, double tol) {
  double smallest = std::numeric_limits<double>::infinity();
  for (int i = 0; i < 3; ++i) {
    const V &apex = p[i], &s = p[(i + 1) % 3], &e = p[(i + 2) % 3];
    if (SquaredDistance(s, e) < tol) return true;
    smallest = std::min(smallest, Cross(e - s, apex - s) * Cross(e - s, apex - s) / SquaredDistance(s, e));
  }
  return smallest < tol;
}

TEST(AreCollinear, ThreePointsMatchTheHeightsOfTheTriangle) {
  std::mt19937 rng(6);
  std::uniform_real_distribution<double> u(-100, 100), small(-3, 3);
  int near = 0;
  for (double tol : {1e-16, 4.0, 10.0, 100.0, 250000.0})
    for (int i = 0; i < 3000; ++i) {
      const V a{u(rng), u(rng)}, b{u(rng), u(rng)};
      const V p[3] = {a, b, i % 3 ? V{u(rng), u(rng)} : Lerp(a, b, u(rng) / 50) + D{small(rng), small(rng)}};
      const bool ref = ReferenceThree(p, tol);
      ASSERT_EQ(AreCollinear(p[0], p[1], p[2], tol), ref) << tol;
      ASSERT_EQ(AreCollinear(p[1], p[2], p[0], tol), ref);
      ASSERT_EQ(AreCollinear(p, 3ul, tol), ref);
      near += ref;
    }
  EXPECT_GT(near, 1000);
  EXPECT_FALSE(AreCollinear(V{0, 0}, V{0, 0}, V{0, 0}, 0.0));  // no base, no line
  EXPECT_FALSE(AreCollinear(V{0, 0}, V{std::nan(""), 0}, V{1, 1}, 4.0));
  EXPECT_TRUE(AreCollinear(POINT{0, 0}, POINT{10, 1}, POINT{20, 0}, 4.0));
  EXPECT_FALSE(AreCollinear(POINT{0, 0}, POINT{10, 3}, POINT{20, 0}, 4.0));
}

TEST(AreCollinear, ManyPointsNearALine) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> u(-1, 1);
  for (int trial = 0; trial < 2000; ++trial) {
    const V o{1000 * u(rng), 1000 * u(rng)};
    const D dir = D{u(rng), u(rng)}.Normalized(), n = dir.Perpendicular();
    std::vector<V> pts;  // two far ends, the rest between, all within 0.6 of the line
    for (int i = 0; i < 4 + trial % 30; ++i) pts.push_back(o + dir * (i < 2 ? 1000.0 * i - 500 : 250 * u(rng)) + n * (0.6 * u(rng)));
    std::shuffle(pts.begin(), pts.end(), rng);
    ASSERT_TRUE(AreCollinear(pts.data(), pts.size(), 4.0));
    // Any line within 2 of both ends stays within 2 of this one in the middle
    // half, so an inner point 8 off cannot be near it.
    *std::find_if(pts.begin(), pts.end(), [&](const V& q) { return std::fabs(Dot(q - o, dir)) <= 250; }) += n * 8.0;
    ASSERT_FALSE(AreCollinear(pts.data(), pts.size(), 4.0));
  }
  const POINT spike[4] = {{0, 0}, {100, 1}, {-40, -1}, {60, 0}};  // folded back along its chord
  EXPECT_TRUE(AreCollinear(spike, 4ul, 4.0));
  EXPECT_FALSE(AreCollinear(spike, 4ul, 0.01));  // no line comes within 0.3 of all four
  const V same[5] = {{3, 3}, {3, 3}, {3, 3}, {3, 3}, {3, 3}};
  EXPECT_TRUE(AreCollinear(same, 5ul, 1.0));
  EXPECT_FALSE(AreCollinear(static_cast<const V*>(nullptr), 4ul, 1.0));
  const V bad[4] = {{0, 0}, {1, 1}, {2, std::numeric_limits<double>::infinity()}, {3, 3}};
  EXPECT_FALSE(AreCollinear(bad, 4ul, 1.0));
}

}  // namespace
