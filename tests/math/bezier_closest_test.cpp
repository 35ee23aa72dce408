#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "math/search_reference.h"
#include "ostracrv/math/bezier_closest.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using namespace MavikMath::CubicBezier;
using search_ref::At;
using search_ref::Curve;
using search_ref::Dist2;

constexpr double kMax = std::numeric_limits<double>::max();

// The global minimum against dense sampling with golden-section refinement,
// on random curves (many with loops), cusps and loops built to order.
TEST(BezierClosest, GlobalMinimumMatchesDenseReference) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> u(-50.0, 150.0), s(0.05, 0.95);
  for (int i = 0; i < 3000; ++i) {
    Curve c;
    if (i % 3 == 0) c = search_ref::RandomCurve(rng);
    else if (i % 3 == 1) c = search_ref::RandomCusp(rng, s(rng));
    else {
      const double a = s(rng), b = s(rng);
      c = search_ref::LoopThrough(rng, std::min(a, b), std::max(a, b));
    }
    const V target{u(rng), u(rng)};
    double t = -1, d = kMax;
    V p;
    ASSERT_TRUE(FindClosestPointOnBezier(c.data(), target, t, p, d)) << i;
    const double ref = search_ref::ClosestRef(c, target);
    ASSERT_GE(t, 0.0);
    ASSERT_LE(t, 1.0);
    // The answer is a point of the curve at t, and no farther than the reference.
    EXPECT_NEAR(d, Dist2(At(c, t), target), 1e-9 * (1 + d)) << i;
    EXPECT_LE(d, ref + 1e-10 * (1 + ref)) << i;
    EXPECT_LT(Dist2(p, At(c, t)), 1e-18 * 1e4) << i;
    // The same far from the origin, to the precision left there.
    Curve f = c;
    for (auto& q : f) q = V{q.x - 4e6, q.y + 9e6};
    double tf = 0, df = kMax;
    V pf;
    ASSERT_TRUE(FindClosestPointOnBezier(f.data(), V{target.x - 4e6, target.y + 9e6}, tf, pf, df));
    EXPECT_NEAR(std::sqrt(df), std::sqrt(d), 1e-7) << i;
  }
}

// A target on a curve's self-crossing, and targets at its cusp: distance 0.
TEST(BezierClosest, FindsCrossingAndCuspPoints) {
  std::mt19937 rng(11);
  for (int i = 0; i < 200; ++i) {
    const Curve loop = search_ref::LoopThrough(rng, 0.2, 0.7);
    const V x = At(loop, 0.2);
    double t = 0, d = kMax;
    V p;
    ASSERT_TRUE(FindClosestPointOnBezier(loop.data(), x, t, p, d));
    EXPECT_LT(d, 1e-16 * (1 + x.SquaredLength()));
    const Curve cusp = search_ref::RandomCusp(rng, 0.4);
    const V k = At(cusp, 0.4);
    d = kMax;
    ASSERT_TRUE(FindClosestPointOnBezier(cusp.data(), k, t, p, d));
    EXPECT_LT(d, 1e-16 * (1 + k.SquaredLength()));
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
  EXPECT_EQ(t, -5);
  EXPECT_EQ(d, 99.0);
  EXPECT_EQ(p, (V{-1, -1}));
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
    for (int k = 0; k < 4; ++k) {
      c[k] = POINT{u(rng), u(rng)};
      cv[k] = V{double(c[k].x), double(c[k].y)};
    }
    const POINT target{u(rng), u(rng)};
    double ti = 0, di = kMax, tv = 0, dv = kMax;
    POINT pi;
    V pv;
    const bool okI = FindClosestPointOnBezier(c, target, ti, pi, di);
    const bool okV = FindClosestPointOnBezier(cv, V{double(target.x), double(target.y)}, tv, pv, dv);
    ASSERT_EQ(okI, okV);
    if (!okI) continue;
    EXPECT_EQ(ti, tv);
    EXPECT_EQ(di, dv);
    EXPECT_EQ(pi, (POINT{MavikMath::RoundToInt(pv.x), MavikMath::RoundToInt(pv.y)}));
  }
  // Half away from zero on a straight curve from -3 to 3 at y = -2.5.
  const POINT line[4] = {POINT{-3, -2}, POINT{-1, -3}, POINT{1, -3}, POINT{3, -2}};
  double t = 0, d = kMax;
  POINT p;
  ASSERT_TRUE(FindClosestPointOnBezier(line, POINT{0, -10}, t, p, d));
  EXPECT_EQ(p, (POINT{0, -3}));  // the curve's lowest point is (0, -2.75): rounds to -3
}

// Every local minimum of the distance, checked against the sampled
// minima; every reported minimum is a true local minimum.
TEST(BezierClosest, AllLocalMinima) {
  std::mt19937 rng(3);
  std::uniform_real_distribution<double> u(-20.0, 120.0);
  int checked = 0;
  for (int i = 0; i < 800; ++i) {
    const Curve c = i % 2 ? search_ref::RandomCurve(rng) : search_ref::LoopThrough(rng, 0.3, 0.6);
    const V target{u(rng), u(rng)};
    std::vector<double> ts, ds;
    std::vector<V> ps;
    ASSERT_TRUE(FindClosestPointsOnBezier(c.data(), target, ts, ps, ds));
    ASSERT_EQ(ts.size(), ps.size());
    ASSERT_EQ(ts.size(), ds.size());
    ASSERT_LE(ts.size(), 4u);
    for (size_t k = 0; k < ts.size(); ++k) {
      if (k) {
        EXPECT_LT(ts[k - 1], ts[k]);
      }
      EXPECT_NEAR(ds[k], Dist2(At(c, ts[k]), target), 1e-9 * (1 + ds[k]));
      const double h = 1e-4;
      if (ts[k] - h >= 0) {
        EXPECT_LE(ds[k], Dist2(At(c, ts[k] - h), target) + 1e-9) << i;
      }
      if (ts[k] + h <= 1) {
        EXPECT_LE(ds[k], Dist2(At(c, ts[k] + h), target) + 1e-9) << i;
      }
    }
    // Sampled minima with a clear dip (relative prominence) must be found.
    const int n = 2000;
    std::vector<double> d(n + 1);
    for (int k = 0; k <= n; ++k) d[k] = Dist2(At(c, double(k) / n), target);
    for (int k = 0; k <= n; ++k) {
      const bool isMin = (k == 0 || d[k] < d[k - 1]) && (k == n || d[k] < d[k + 1]);
      if (!isMin) continue;
      // Prominence: rises by 1e-3 relative within 0.05 on both open sides.
      const int w = n / 20;
      const double lim = d[k] + 1e-3 * (1 + d[k]);
      const bool leftRise = k == 0 || d[std::max(0, k - w)] > lim;
      const bool rightRise = k == n || d[std::min(n, k + w)] > lim;
      if (!leftRise || !rightRise) continue;
      ++checked;
      bool found = false;
      for (size_t j = 0; j < ts.size(); ++j) found = found || std::fabs(ts[j] - double(k) / n) <= 1.0 / n + 1e-9;
      EXPECT_TRUE(found) << "curve " << i << " minimum near t=" << double(k) / n;
    }
    // The smallest reported minimum is the global one.
    double t = 0, dmin = kMax;
    V p;
    ASSERT_TRUE(FindClosestPointOnBezier(c.data(), target, t, p, dmin));
    EXPECT_NEAR(*std::min_element(ds.begin(), ds.end()), dmin, 1e-9 * (1 + dmin));
  }
  EXPECT_GT(checked, 800);
}

// A target at the centre of a near-circular arc: several minima of almost
// equal distance; the ends count only when the distance grows from them.
TEST(BezierClosest, CentreOfArcAndEndMinima) {
  const double k = 0.5522847498;
  const V arc[4] = {V{100, 0}, V{100, 100 * k}, V{100 * k, 100}, V{0, 100}};
  std::vector<double> ts, ds;
  std::vector<V> ps;
  ASSERT_TRUE(FindClosestPointsOnBezier(arc, V{0, 0}, ts, ps, ds));
  for (double d : ds) EXPECT_NEAR(std::sqrt(d), 100.0, 0.03);
  // A target beyond the start: only the start is a minimum.
  ts.clear();
  ps.clear();
  ds.clear();
  ASSERT_TRUE(FindClosestPointsOnBezier(arc, V{110, -50}, ts, ps, ds));
  ASSERT_EQ(ts.size(), 1u);
  EXPECT_EQ(ts[0], 0.0);
  EXPECT_EQ(ps[0], arc[0]);
}

// Null, non-finite and point-like curves: false, outputs untouched.
TEST(BezierClosest, BadInputLeavesOutputs) {
  const double nan = std::nan(""), inf = std::numeric_limits<double>::infinity();
  const V good[4] = {V{0, 0}, V{1, 1}, V{2, 1}, V{3, 0}};
  const V bad1[4] = {V{0, 0}, V{nan, 1}, V{2, 1}, V{3, 0}};
  const V bad2[4] = {V{0, 0}, V{1, 1}, V{2, inf}, V{3, 0}};
  const V dot[4] = {V{5, 5}, V{5, 5}, V{5, 5}, V{5, 5}};
  for (const V* c : {static_cast<const V*>(nullptr), bad1, bad2, dot}) {
    double t = 0.25, d = kMax;
    V p{7, 7};
    EXPECT_FALSE(FindClosestPointOnBezier(c, V{1, 0}, t, p, d));
    EXPECT_EQ(t, 0.25);
    EXPECT_EQ(d, kMax);
    EXPECT_EQ(p, (V{7, 7}));
    std::vector<double> ts{9}, ds{9};
    std::vector<V> ps{V{9, 9}};
    EXPECT_FALSE(FindClosestPointsOnBezier(c, V{1, 0}, ts, ps, ds));
    EXPECT_EQ(ts.size(), 1u);
    EXPECT_EQ(ps.size(), 1u);
    EXPECT_EQ(ds.size(), 1u);
  }
  double t = 0.25, d = kMax;
  V p;
  EXPECT_FALSE(FindClosestPointOnBezier(good, V{nan, 0}, t, p, d));
  EXPECT_FALSE(FindClosestPointOnBezier(good, V{0, inf}, t, p, d));
  EXPECT_EQ(t, 0.25);
}

}  // namespace
