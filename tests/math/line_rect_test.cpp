#include "ostracrv/math/line_rect.h"

#include <gtest/gtest.h>

#include <cmath>
#include <random>

namespace {

using namespace MavikMath;
using Framework::common_types::POINT;
using Framework::common_types::RECT;

// Slab clipping of the infinite line: the parameter range inside both slabs.
bool Slabs(const V& from, const V& to, const BoundsT<double>& r, double& enter, double& leave) {
  enter = -INFINITY, leave = INFINITY;
  if (from == to) return false;  // no line
  const double o[2] = {from.x, from.y}, d[2] = {to.x - from.x, to.y - from.y}, lo[2] = {r.left, r.bottom}, hi[2] = {r.right, r.top};
  for (int k = 0; k < 2; ++k) {
    if (d[k] == 0) {
      if (o[k] < lo[k] || o[k] > hi[k]) return false;
      continue;
    }
    const double a = (lo[k] - o[k]) / d[k], b = (hi[k] - o[k]) / d[k];
    enter = std::max(enter, std::min(a, b)), leave = std::min(leave, std::max(a, b));
  }
  return enter < leave;  // a grazed corner is a measure-zero case here
}

TEST(LineRectIntersection, MatchesSlabClipping) {
  std::mt19937 rng(8);
  std::uniform_real_distribution<double> u(-200, 200);
  const BoundsT<double> box{-50, 30, 70, -20};
  int hits = 0;
  for (int i = 0; i < 5000; ++i) {
    V from{u(rng), u(rng)}, to{i % 7 ? u(rng) : from.x, i % 11 ? u(rng) : from.y};  // some vertical, some horizontal
    double e1, l1, e2 = 9, l2 = 9, e3 = 9, l3 = 9;
    const bool got = LineRectIntersection(from, to, box, e2, l2);
    ASSERT_EQ(got, Slabs(from, to, box, e1, l1)) << i;
    ASSERT_EQ(LineRectIntersection(from, to, RECT{-50, 30, 70, -20}, e3, l3), got);
    if (!got) {
      EXPECT_TRUE(e2 == 9 && l2 == 9);  // untouched
      continue;
    }
    ++hits;
    EXPECT_NEAR(e2, e1, 1e-9 * (1 + std::fabs(e1)));
    EXPECT_NEAR(l2, l1, 1e-9 * (1 + std::fabs(l1)));
    EXPECT_TRUE(e3 == e2 && l3 == l2);
  }
  EXPECT_GT(hits, 1000);
}

TEST(LineRectIntersection, EdgesCornersAndBadInput) {
  const RECT r{0, 10, 10, 0};
  double enter = -1, leave = -1;
  ASSERT_TRUE(LineRectIntersection(POINT{-10, 0}, POINT{0, 0}, r, enter, leave));  // along an edge: its ends
  EXPECT_TRUE(enter == 1 && leave == 2);
  ASSERT_TRUE(LineRectIntersection(V{-5, -5}, V{0, 0}, r, enter, leave));  // corner to corner
  EXPECT_TRUE(enter == 1 && leave == 3);
  ASSERT_TRUE(LineRectIntersection(V{-5, 5}, V{0, 10}, r, enter, leave));  // grazing a corner
  EXPECT_TRUE(enter == 1 && leave == 1);
  enter = leave = 7;
  EXPECT_FALSE(LineRectIntersection(V{-5, 20}, V{0, 21}, r, enter, leave));
  EXPECT_FALSE(LineRectIntersection(V{1, 1}, V{1, 1}, r, enter, leave));
  EXPECT_FALSE(LineRectIntersection(V{1, 1}, V{std::nan(""), 2}, r, enter, leave));
  EXPECT_FALSE(LineRectIntersection(V{1, 1}, V{2, 2}, BoundsT<double>{}, enter, leave));  // empty
  EXPECT_TRUE(enter == 7 && leave == 7);
}

}  // namespace
