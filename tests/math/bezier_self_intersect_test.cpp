#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "math/search_reference.h"
#include "ostracrv/math/bezier_self_intersect.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using namespace MavikMath::CubicBezier;
using search_ref::At;
using search_ref::Curve;

// Loops built to cross at chosen parameters are found there.
TEST(BezierSelfIntersect, FindsConstructedLoops) {
  std::mt19937 rng(51);
  std::uniform_real_distribution<double> u(0.02, 0.98);
  for (int i = 0; i < 2000; ++i) {
    double s = u(rng), t = u(rng);
    if (s > t) std::swap(s, t);
    if (t - s < 0.02) continue;
    const Curve c = search_ref::LoopThrough(rng, s, t);
    double t1 = -1, t2 = -1;
    V p;
    ASSERT_TRUE(FindBezierSelfIntersection(c.data(), t1, t2, p)) << i;
    EXPECT_NEAR(t1, s, 1e-9) << i;
    EXPECT_NEAR(t2, t, 1e-9) << i;
    const V q = At(c, s);
    EXPECT_NEAR(p.x, q.x, 1e-7);
    EXPECT_NEAR(p.y, q.y, 1e-7);
    double w1, w2, w3, w4;
    ASSERT_TRUE(DoesBezierSelfIntersect(c.data(), w1, w2, w3, w4, false));
    EXPECT_EQ(w1, t1);
    EXPECT_EQ(w2, t2);
    EXPECT_LT(w1, w3);
    EXPECT_LT(w3, w4);
    EXPECT_LT(w4, w2);
  }
}

// Whether a polyline of the curve crosses itself (non-adjacent chords).
bool PolylineCrosses(const Curve& c, int n) {
  std::vector<V> p(n + 1);
  for (int i = 0; i <= n; ++i) p[i] = At(c, double(i) / n);
  auto cross = [](V o, V a, V b) { return (a.x - o.x) * (b.y - o.y) - (a.y - o.y) * (b.x - o.x); };
  for (int i = 0; i < n; ++i)
    for (int j = i + 2; j < n; ++j) {
      const double d1 = cross(p[i], p[i + 1], p[j]), d2 = cross(p[i], p[i + 1], p[j + 1]);
      const double d3 = cross(p[j], p[j + 1], p[i]), d4 = cross(p[j], p[j + 1], p[i + 1]);
      if (((d1 > 0) != (d2 > 0)) && ((d3 > 0) != (d4 > 0))) return true;
    }
  return false;
}

// Random curves: a loop exactly when a fine polyline crosses itself,
// except for borderline loops (tiny, or crossing near an end).
TEST(BezierSelfIntersect, RandomCurvesAgreeWithPolyline) {
  std::mt19937 rng(52);
  int loops = 0, plain = 0;
  for (int i = 0; i < 400; ++i) {
    const Curve c = search_ref::RandomCurve(rng);
    double t1, t2;
    V p;
    const bool found = FindBezierSelfIntersection(c.data(), t1, t2, p);
    if (found && (t2 - t1 < 0.02 || t1 < 0.01 || t2 > 0.99)) continue;
    const bool ref = PolylineCrosses(c, 300);
    EXPECT_EQ(found, ref) << i;
    if (found) {
      ++loops;
      EXPECT_LT(std::hypot(At(c, t1).x - At(c, t2).x, At(c, t1).y - At(c, t2).y), 1e-9);
    } else {
      ++plain;
    }
  }
  EXPECT_GT(loops, 20);
  EXPECT_GT(plain, 200);
}

// Cusps, S-curves, parabolas, straight folds and degenerate input have no
// loop; a closed curve crosses itself at its ends.
TEST(BezierSelfIntersect, NoLoopAndClosedCurves) {
  std::mt19937 rng(53);
  double t1 = -1, t2 = -1, t3 = -1, t4 = -1;
  V p{9, 9};
  for (int i = 0; i < 200; ++i) {
    const Curve cusp = search_ref::RandomCusp(rng, 0.5);
    EXPECT_FALSE(FindBezierSelfIntersection(cusp.data(), t1, t2, p)) << i;
  }
  const V sCurve[4] = {V{0, 0}, V{100, 100}, V{0, 100}, V{100, 200}};
  const V parabola[4] = {V{0, 0}, V{10, 20}, V{20, 20}, V{30, 0}};
  const V fold[4] = {V{0, 0}, V{100, 0}, V{-50, 0}, V{50, 0}};
  const V cusp[4] = {V{0, 0}, V{100, 100}, V{0, 100}, V{100, 0}};
  const V dot[4] = {V{1, 1}, V{1, 1}, V{1, 1}, V{1, 1}};
  const double nan = std::nan("");
  const V bad[4] = {V{0, 0}, V{nan, 1}, V{2, 2}, V{3, 0}};
  for (const V* c : {sCurve, parabola, fold, cusp, dot, bad, static_cast<const V*>(nullptr)}) {
    EXPECT_FALSE(FindBezierSelfIntersection(c, t1, t2, p));
    EXPECT_FALSE(DoesBezierSelfIntersect(c, t1, t2, t3, t4, false));
  }
  EXPECT_EQ(t1, -1);
  EXPECT_EQ(t2, -1);
  EXPECT_EQ(p, (V{9, 9}));

  const POINT closed[4] = {POINT{0, 0}, POINT{100, 100}, POINT{-100, 100}, POINT{0, 0}};
  ASSERT_TRUE(FindBezierSelfIntersection(closed, t1, t2, p));
  EXPECT_EQ(t1, 0.0);
  EXPECT_EQ(t2, 1.0);
  EXPECT_NEAR(p.x, 0, 1e-9);
}

// The loop's widest points: tangent parallel to the axis from the crossing
// to the farthest loop point.
TEST(BezierSelfIntersect, WidestPointsOfTheLoop) {
  const V c[4] = {V{0, 0}, V{150, 100}, V{-50, 100}, V{100, 0}};
  double t1, t2, t3, t4;
  ASSERT_TRUE(DoesBezierSelfIntersect(c, t1, t2, t3, t4, false));
  // Symmetric about x = 50: the apex at t = 0.5, the axis vertical.
  EXPECT_NEAR(t1 + t2, 1.0, 1e-12);
  EXPECT_NEAR(t3 + t4, 1.0, 1e-9);
  const double h = 1e-6;
  for (double w : {t3, t4}) {
    const V a = At(c, w - h), b = At(c, w + h);
    EXPECT_NEAR((b.x - a.x) / std::hypot(b.x - a.x, b.y - a.y), 0.0, 1e-6);
  }
}

}  // namespace
