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
  double lo = -INFINITY, hi = INFINITY;
  const double o[2] = {from.x, from.y}, d[2] = {to.x - from.x, to.y - from.y};
  const double mn[2] = {r.left, r.bottom}, mx[2] = {r.right, r.top};
  for (int k = 0; k < 2; ++k) {
    if (d[k] == 0.0) {
      if (o[k] < mn[k] || o[k] > mx[k]) return false;
      continue;
    }
    double a = (mn[k] - o[k]) / d[k], b = (mx[k] - o[k]) / d[k];
    if (a > b) std::swap(a, b);
    lo = std::max(lo, a);
    hi = std::min(hi, b);
  }
  if (!(lo <= hi)) return false;
  enter = lo;
  leave = hi;
  return true;
}

TEST(LineRectIntersection, MatchesSlabClipping) {
  std::mt19937 rng(8);
  std::uniform_real_distribution<double> u(-200.0, 200.0);
  const BoundsT<double> box{-50.0, 30.0, 70.0, -20.0};
  const RECT rect{-50, 30, 70, -20};
  int hits = 0;
  for (int i = 0; i < 5000; ++i) {
    V from{u(rng), u(rng)}, to{u(rng), u(rng)};
    if (i % 7 == 0) to.x = from.x;  // vertical
    if (i % 11 == 0) to.y = from.y;  // horizontal
    double e1 = 9, l1 = 9, e2 = 9, l2 = 9, e3 = 9, l3 = 9;
    const bool ref = Slabs(from, to, box, e1, l1);
    const bool got = LineRectIntersection(from, to, box, e2, l2);
    ASSERT_EQ(got, ref && l1 > e1) << i;  // a grazed corner is a measure-zero case
    ASSERT_EQ(LineRectIntersection(from, to, rect, e3, l3), got);
    if (!got) {
      EXPECT_EQ(e2, 9.0);
      EXPECT_EQ(l2, 9.0);
      continue;
    }
    ++hits;
    EXPECT_NEAR(e2, e1, 1e-9 * (1 + std::fabs(e1)));
    EXPECT_NEAR(l2, l1, 1e-9 * (1 + std::fabs(l1)));
    EXPECT_EQ(e3, e2);
  }
  EXPECT_GT(hits, 1000);
}

TEST(LineRectIntersection, EdgesCornersAndBadInput) {
  const RECT r{0, 10, 10, 0};
  double enter = -1, leave = -1;
  // Along the bottom edge: its ends count, the edge itself is parallel.
  ASSERT_TRUE(LineRectIntersection(POINT{-10, 0}, POINT{0, 0}, r, enter, leave));
  EXPECT_EQ(enter, 1.0);
  EXPECT_EQ(leave, 2.0);
  // Through the diagonal corners.
  ASSERT_TRUE(LineRectIntersection(V{-5, -5}, V{0, 0}, r, enter, leave));
  EXPECT_EQ(enter, 1.0);
  EXPECT_EQ(leave, 3.0);
  // Grazing one corner: two equal parameters.
  ASSERT_TRUE(LineRectIntersection(V{-5, 5}, V{0, 10}, r, enter, leave));
  EXPECT_EQ(enter, 1.0);
  EXPECT_EQ(leave, 1.0);
  enter = leave = 7;
  EXPECT_FALSE(LineRectIntersection(V{-5, 20}, V{0, 21}, r, enter, leave));
  EXPECT_FALSE(LineRectIntersection(V{1, 1}, V{1, 1}, r, enter, leave));
  EXPECT_FALSE(LineRectIntersection(V{1, 1}, V{std::nan(""), 2}, r, enter, leave));
  EXPECT_FALSE(LineRectIntersection(V{1, 1}, V{2, 2}, BoundsT<double>{}, enter, leave));  // empty
  EXPECT_EQ(enter, 7.0);
}

}  // namespace
