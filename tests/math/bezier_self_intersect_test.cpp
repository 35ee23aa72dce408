#include "ostracrv/math/bezier_self_intersect.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"

namespace {

using namespace testcurves;
using namespace MavikMath::CubicBezier;

// Loops built to cross at chosen parameters are found there; the widest
// points lie inside the loop.
TEST(BezierSelfIntersect, FindsConstructedLoops) {
  std::mt19937 rng(51);
  std::uniform_real_distribution<double> u(0.02, 0.98);
  for (int i = 0; i < 2000; ++i) {
    double s = u(rng), t = u(rng);
    if (s > t) std::swap(s, t);
    if (t - s < 0.02) continue;
    const Curve c = LoopThrough(rng, s, t);
    double t1 = -1, t2 = -1, w1, w2, w3, w4;
    V p;
    ASSERT_TRUE(FindBezierSelfIntersection(c.data(), t1, t2, p)) << i;
    EXPECT_NEAR(t1, s, 1e-9) << i;
    EXPECT_NEAR(t2, t, 1e-9) << i;
    EXPECT_LT(MavikMath::Distance(p, At(c, s)), 1e-7);
    ASSERT_TRUE(DoesBezierSelfIntersect(c.data(), w1, w2, w3, w4, false));
    EXPECT_TRUE(w1 == t1 && w2 == t2);
    EXPECT_TRUE(w1 < w3 && w3 < w4 && w4 < w2);
  }
}

// Whether a polyline of the curve crosses itself (non-adjacent chords).
bool PolylineCrosses(const Curve& c, int n) {
  std::vector<V> p(n + 1);
  for (int i = 0; i <= n; ++i) p[i] = At(c, double(i) / n);
  auto side = [](V o, V a, V b) { return Cross(a - o, b - o) > 0; };
  for (int i = 0; i < n; ++i)
    for (int j = i + 2; j < n; ++j)
      if (side(p[i], p[i + 1], p[j]) != side(p[i], p[i + 1], p[j + 1]) &&
          side(p[j], p[j + 1], p[i]) != side(p[j], p[j + 1], p[i + 1]))
        return true;
  return false;
}

// Random curves: a loop exactly when a fine polyline crosses itself,
// except for borderline loops (tiny, or crossing near an end).
TEST(BezierSelfIntersect, RandomCurvesAgreeWithPolyline) {
  std::mt19937 rng(52);
  int loops = 0, plain = 0;
  for (int i = 0; i < 400; ++i) {
    const Curve c = RandomCurve(rng);
    double t1, t2;
    V p;
    const bool found = FindBezierSelfIntersection(c.data(), t1, t2, p);
    if (found && (t2 - t1 < 0.02 || t1 < 0.01 || t2 > 0.99)) continue;
    EXPECT_EQ(found, PolylineCrosses(c, 300)) << i;
    EXPECT_TRUE(!found || MavikMath::Distance(At(c, t1), At(c, t2)) < 1e-9);
    (found ? loops : plain)++;
  }
  EXPECT_GT(loops, 20);
  EXPECT_GT(plain, 200);
}

// Cusps, S-curves, parabolas, straight folds and bad input have no loop; a
// closed curve crosses itself at its ends.
TEST(BezierSelfIntersect, NoLoopAndClosedCurves) {
  std::mt19937 rng(53);
  double t1 = -1, t2 = -1, t3 = -1, t4 = -1;
  V p{9, 9};
  for (int i = 0; i < 200; ++i) EXPECT_FALSE(FindBezierSelfIntersection(RandomCusp(rng, 0.5).data(), t1, t2, p)) << i;
  std::vector<Curve> none = {Curve{V{0, 0}, V{100, 100}, V{0, 100}, V{100, 200}},  // S
                             Curve{V{0, 0}, V{10, 20}, V{20, 20}, V{30, 0}},       // parabola
                             Curve{V{0, 0}, V{100, 0}, V{-50, 0}, V{50, 0}},       // folded line
                             Curve{V{0, 0}, V{100, 100}, V{0, 100}, V{100, 0}}};   // cusp
  none.insert(none.end(), kBadCurves.begin(), kBadCurves.end());
  for (const Curve& c : none) {
    EXPECT_FALSE(FindBezierSelfIntersection(c.data(), t1, t2, p));
    EXPECT_FALSE(DoesBezierSelfIntersect(c.data(), t1, t2, t3, t4, false));
  }
  EXPECT_FALSE(FindBezierSelfIntersection(static_cast<const V*>(nullptr), t1, t2, p));
  EXPECT_FALSE(DoesBezierSelfIntersect(nullptr, t1, t2, t3, t4, false));
  EXPECT_TRUE(t1 == -1 && t2 == -1 && p == (V{9, 9}));

  const POINT closed[4] = {POINT{0, 0}, POINT{100, 100}, POINT{-100, 100}, POINT{0, 0}};
  ASSERT_TRUE(FindBezierSelfIntersection(closed, t1, t2, p));
  EXPECT_TRUE(t1 == 0.0 && t2 == 1.0);
  EXPECT_NEAR(p.x, 0, 1e-9);
}

// The loop's widest points: tangent parallel to the axis from the crossing
// to the farthest loop point. Symmetric about x = 50: the apex at t = 0.5,
// the axis vertical.
TEST(BezierSelfIntersect, WidestPointsOfTheLoop) {
  const V c[4] = {V{0, 0}, V{150, 100}, V{-50, 100}, V{100, 0}};
  double t1, t2, t3, t4;
  ASSERT_TRUE(DoesBezierSelfIntersect(c, t1, t2, t3, t4, false));
  EXPECT_NEAR(t1 + t2, 1.0, 1e-12);
  EXPECT_NEAR(t3 + t4, 1.0, 1e-9);
  for (double w : {t3, t4}) EXPECT_NEAR(Velocity(c, w).Normalized().x, 0.0, 1e-6);
}

}  // namespace
