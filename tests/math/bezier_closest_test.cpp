#include "ostracrv/math/bezier_closest.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"

namespace {

using namespace testcurves;
using namespace MavikMath::CubicBezier;
using MavikMath::SquaredDistance;

// The global minimum against dense sampling with golden-section refinement,
// on random curves (many with loops), cusps and loops built to order; the
// same far from the origin, to the precision left there.
TEST(BezierClosest, GlobalMinimumMatchesDenseReference) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> u(-50.0, 150.0), s(0.05, 0.95);
  for (int i = 0; i < 3000; ++i) {
    const double a = s(rng), b = s(rng);
    const Curve c = i % 3 == 0 ? RandomCurve(rng)
                               : i % 3 == 1 ? RandomCusp(rng, a) : LoopThrough(rng, std::min(a, b), std::max(a, b));
    const V target{u(rng), u(rng)};
    double t = -1, d = kMaxDouble;
    V p;
    ASSERT_TRUE(FindClosestPointOnBezier(c.data(), target, t, p, d)) << i;
    const double ref = NearestSq(c.data(), target);
    ASSERT_TRUE(t >= 0.0 && t <= 1.0);
    EXPECT_NEAR(d, SquaredDistance(At(c, t), target), 1e-9 * (1 + d)) << i;  // a point of the curve at t
    EXPECT_LE(d, ref + 1e-10 * (1 + ref)) << i;                              // no farther than the reference
    EXPECT_LT(SquaredDistance(p, At(c, t)), 1e-14) << i;
    Curve f = c;
    for (auto& q : f) q = V{q.x - 4e6, q.y + 9e6};
    double tf = 0, df = kMaxDouble;
    ASSERT_TRUE(FindClosestPointOnBezier(f.data(), V{target.x - 4e6, target.y + 9e6}, tf, p, df));
    EXPECT_NEAR(std::sqrt(df), std::sqrt(d), 1e-7) << i;
  }
}

// A target on a curve's self-crossing, and targets at its cusp: distance 0.
TEST(BezierClosest, FindsCrossingAndCuspPoints) {
  std::mt19937 rng(11);
  for (int i = 0; i < 200; ++i) {
    const Curve loop = LoopThrough(rng, 0.2, 0.7), cusp = RandomCusp(rng, 0.4);
    for (const auto& [c, x] : {std::pair{loop, At(loop, 0.2)}, std::pair{cusp, At(cusp, 0.4)}}) {
      double t = 0, d = kMaxDouble;
      V p;
      ASSERT_TRUE(FindClosestPointOnBezier(c.data(), x, t, p, d));
      EXPECT_LT(d, 1e-16 * (1 + x.SquaredLength()));
    }
  }
}

// The entering distance is the best so far: only a strictly closer point
// is written, and nothing is touched otherwise.
TEST(BezierClosest, EnteringDistanceIsBestSoFar) {
  const V c[4] = {V{0, 0}, V{30, 0}, V{70, 0}, V{100, 0}};
  const V target{50, 10};
  double t = -5, d = 99.0;  // better than the curve's 100
  V p{-1, -1};
  EXPECT_FALSE(FindClosestPointOnBezier(c, target, t, p, d));
  EXPECT_TRUE(t == -5 && d == 99.0 && p == (V{-1, -1}));
  d = 100.0;  // equal is not closer
  EXPECT_FALSE(FindClosestPointOnBezier(c, target, t, p, d));
  d = 100.5;
  ASSERT_TRUE(FindClosestPointOnBezier(c, target, t, p, d));
  EXPECT_NEAR(d, 100.0, 1e-9);
  EXPECT_NEAR(p.x, 50.0, 1e-9);
  // A curve far away is rejected before any work, with the box test.
  const V far[4] = {V{1000, 1000}, V{1001, 1000}, V{1002, 1000}, V{1003, 1000}};
  EXPECT_FALSE(FindClosestPointOnBezier(far, target, t, p, d));
  EXPECT_NEAR(d, 100.0, 1e-9);
}

// Integer curves: the same t as in doubles, the point rounded half away from
// zero, the distance that of the exact point.
TEST(BezierClosest, IntegerFormRoundsThePoint) {
  std::mt19937 rng(5);
  std::uniform_int_distribution<int> u(-500, 500);
  for (int i = 0; i < 500; ++i) {
    POINT c[4];
    V cv[4];
    RandomIntegerCurve(rng, 500, c, cv);
    const POINT target{u(rng), u(rng)};
    double ti = 0, di = kMaxDouble, tv = 0, dv = kMaxDouble;
    POINT pi;
    V pv;
    const bool okI = FindClosestPointOnBezier(c, target, ti, pi, di);
    ASSERT_EQ(okI, FindClosestPointOnBezier(cv, V{double(target.x), double(target.y)}, tv, pv, dv));
    if (!okI) continue;
    EXPECT_TRUE(ti == tv && di == dv);
    EXPECT_EQ(pi, (POINT{MavikMath::RoundToInt(pv.x), MavikMath::RoundToInt(pv.y)}));
  }
}

// Every local minimum of the distance, checked against the sampled minima
// with a clear dip; every reported minimum is a true local minimum and the
// smallest is the global one.
TEST(BezierClosest, AllLocalMinima) {
  std::mt19937 rng(3);
  std::uniform_real_distribution<double> u(-20.0, 120.0);
  int checked = 0;
  for (int i = 0; i < 800; ++i) {
    const Curve c = i % 2 ? RandomCurve(rng) : LoopThrough(rng, 0.3, 0.6);
    const V target{u(rng), u(rng)};
    std::vector<double> ts, ds;
    std::vector<V> ps;
    ASSERT_TRUE(FindClosestPointsOnBezier(c.data(), target, ts, ps, ds));
    ASSERT_TRUE(ts.size() == ps.size() && ts.size() == ds.size() && ts.size() <= 4u);
    for (size_t k = 0; k < ts.size(); ++k) {
      EXPECT_TRUE(k == 0 || ts[k - 1] < ts[k]);
      EXPECT_NEAR(ds[k], SquaredDistance(At(c, ts[k]), target), 1e-9 * (1 + ds[k]));
      for (double h : {-1e-4, 1e-4})
        EXPECT_TRUE(ts[k] + h < 0 || ts[k] + h > 1 || ds[k] <= SquaredDistance(At(c, ts[k] + h), target) + 1e-9) << i;
    }
    const int n = 2000, w = n / 20;
    std::vector<double> d(n + 1);
    for (int k = 0; k <= n; ++k) d[k] = SquaredDistance(At(c, double(k) / n), target);
    for (int k = 0; k <= n; ++k) {
      if ((k > 0 && d[k] >= d[k - 1]) || (k < n && d[k] >= d[k + 1])) continue;
      // Prominence: rises by 1e-3 relative within 0.05 on both open sides.
      const double lim = d[k] + 1e-3 * (1 + d[k]);
      if ((k > 0 && d[std::max(0, k - w)] <= lim) || (k < n && d[std::min(n, k + w)] <= lim)) continue;
      ++checked;
      bool found = false;
      for (double t : ts) found = found || std::fabs(t - double(k) / n) <= 1.0 / n + 1e-9;
      EXPECT_TRUE(found) << "curve " << i << " minimum near t=" << double(k) / n;
    }
    double t = 0, dmin = kMaxDouble;
    V p;
    ASSERT_TRUE(FindClosestPointOnBezier(c.data(), target, t, p, dmin));
    EXPECT_NEAR(*std::min_element(ds.begin(), ds.end()), dmin, 1e-9 * (1 + dmin));
  }
  EXPECT_GT(checked, 800);
}

// A target at the centre of a near-circular arc: several minima of almost
// equal distance; the ends count only when the distance grows from them.
TEST(BezierClosest, CentreOfArcAndEndMinima) {
  const Curve arc = QuarterArc(100);
  std::vector<double> ts, ds;
  std::vector<V> ps;
  ASSERT_TRUE(FindClosestPointsOnBezier(arc.data(), V{0, 0}, ts, ps, ds));
  for (double d : ds) EXPECT_NEAR(std::sqrt(d), 100.0, 0.03);
  ts.clear(), ps.clear(), ds.clear();
  ASSERT_TRUE(FindClosestPointsOnBezier(arc.data(), V{110, -50}, ts, ps, ds));  // beyond the start
  ASSERT_EQ(ts.size(), 1u);
  EXPECT_EQ(ts[0], 0.0);
  EXPECT_EQ(ps[0], arc[0]);
}

// Null, non-finite and point-like curves, non-finite targets: false,
// outputs untouched.
TEST(BezierClosest, BadInputLeavesOutputs) {
  const V good[4] = {V{0, 0}, V{1, 1}, V{2, 1}, V{3, 0}};
  auto expectNothing = [](const V* c, const V& target) {
    double t = 0.25, d = kMaxDouble;
    V p{7, 7};
    EXPECT_FALSE(FindClosestPointOnBezier(c, target, t, p, d));
    EXPECT_TRUE(t == 0.25 && d == kMaxDouble && p == (V{7, 7}));
    std::vector<double> ts{9}, ds{9};
    std::vector<V> ps{V{9, 9}};
    EXPECT_FALSE(FindClosestPointsOnBezier(c, target, ts, ps, ds));
    EXPECT_TRUE(ts.size() == 1u && ps.size() == 1u && ds.size() == 1u);
  };
  for (const Curve& c : kBadCurves) expectNothing(c.data(), V{1, 0});
  expectNothing(nullptr, V{1, 0});
  expectNothing(good, V{kNaN, 0});
  expectNothing(good, V{0, kInf});
}

}  // namespace
