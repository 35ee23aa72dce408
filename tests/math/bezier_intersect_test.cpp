#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "math/search_reference.h"
#include "ostracrv/math/bezier_intersect.h"
#include "ostracrv/math/bezier_split.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using namespace MavikMath::CubicBezier;
using search_ref::At;
using search_ref::Curve;

struct Hits {
  std::vector<double> ta, tb;
  std::vector<V> pts;
  size_t size() const { return ta.size(); }
};

Hits Intersect(const Curve& a, const Curve& b) {
  Hits h;
  FindBezierIntersections(a.data(), b.data(), h.ta, h.tb, h.pts);
  return h;
}

// Unit tangent cross product at a crossing: how transversal it is.
double SinAngle(const Curve& a, double s, const Curve& b, double u) {
  const double h = 1e-6;
  const V da0 = At(a, std::max(0.0, s - h)), da1 = At(a, std::min(1.0, s + h));
  const V db0 = At(b, std::max(0.0, u - h)), db1 = At(b, std::min(1.0, u + h));
  const double ax = da1.x - da0.x, ay = da1.y - da0.y, bx = db1.x - db0.x, by = db1.y - db0.y;
  return std::fabs(ax * by - ay * bx) / (std::hypot(ax, ay) * std::hypot(bx, by) + 1e-300);
}

// A random curve of one of the shapes that stress a search: general
// (often looped), a loop built to order, a cusp, a straight curve that may
// fold back, handles lying on their end points.
Curve Shape(std::mt19937& rng, int kind) {
  std::uniform_real_distribution<double> u(0.0, 100.0), f(-0.5, 1.5);
  Curve c = search_ref::RandomCurve(rng);
  switch (kind) {
    case 1: return search_ref::LoopThrough(rng, 0.25, 0.75);
    case 2: return search_ref::RandomCusp(rng, 0.5);
    case 3:
      for (int k : {1, 2}) {
        const double g = f(rng);
        c[k] = V{c[0].x + (c[3].x - c[0].x) * g, c[0].y + (c[3].y - c[0].y) * g};
      }
      return c;
    case 4: c[1] = c[0]; c[2] = c[3]; return c;
    default: return c;
  }
}

// Every transversal crossing of random pairs, against brute-force box
// subdivision to 1e-13 of the curves' size: same count, parameters within
// 1e-9, positions on both curves. Pairs with a near-tangent or near-double
// crossing are skipped, since there the reference cannot resolve them.
TEST(BezierIntersect, RandomPairsMatchSubdivision) {
  std::mt19937 rng(1234);
  int compared = 0, crossings = 0;
  for (int i = 0; i < 2500; ++i) {
    const Curve a = Shape(rng, i < 1500 ? 0 : i % 5), b = search_ref::RandomCurve(rng);
    std::vector<search_ref::RefHit> ref;
    if (!search_ref::IntersectRef(a, b, ref)) continue;
    bool clean = true;
    for (size_t x = 0; x < ref.size(); ++x) {
      clean = clean && ref[x].spread < 1e-8 && SinAngle(a, ref[x].ta, b, ref[x].tb) > 1e-3;
      for (size_t y = x + 1; y < ref.size(); ++y)
        clean = clean && (std::fabs(ref[x].ta - ref[y].ta) > 1e-4 || std::fabs(ref[x].tb - ref[y].tb) > 1e-4);
    }
    if (!clean) continue;
    ++compared;
    crossings += int(ref.size());
    const Hits h = Intersect(a, b);
    ASSERT_EQ(h.size(), ref.size()) << "pair " << i;
    for (const auto& r : ref) {
      bool found = false;
      for (size_t k = 0; k < h.size(); ++k)
        found = found || (std::fabs(h.ta[k] - r.ta) < 1e-9 && std::fabs(h.tb[k] - r.tb) < 1e-9);
      EXPECT_TRUE(found) << "pair " << i << " crossing " << r.ta << ", " << r.tb;
    }
    for (size_t k = 0; k < h.size(); ++k) {
      EXPECT_TRUE(k == 0 || h.ta[k - 1] <= h.ta[k]);
      EXPECT_LT(std::hypot(At(a, h.ta[k]).x - h.pts[k].x, At(a, h.ta[k]).y - h.pts[k].y), 1e-9);
      EXPECT_LT(std::hypot(At(b, h.tb[k]).x - h.pts[k].x, At(b, h.tb[k]).y - h.pts[k].y), 1e-9);
    }
    EXPECT_EQ(DoBeziersIntersect(a.data(), b.data()), !ref.empty()) << i;
    // Far from the origin the crossings stay, to the precision the
    // coordinates still carry there.
    Curve fa = a, fb = b;
    for (auto* c : {&fa, &fb})
      for (auto& p : *c) p = V{p.x + 3e6, p.y - 7e6};
    const Hits far = Intersect(fa, fb);
    ASSERT_EQ(far.size(), h.size()) << i;
    for (size_t k = 0; k < h.size(); ++k) EXPECT_NEAR(far.ta[k] + far.tb[k], h.ta[k] + h.tb[k], 1e-6);
  }
  EXPECT_GT(compared, 2000);
  EXPECT_GT(crossings, 1200);
}

// Identical, reversed, contained and partly shared curves: the ends of the
// shared stretch.
TEST(BezierIntersect, CoincidentCurvesGiveStretchEnds) {
  std::mt19937 rng(5);
  for (int i = 0; i < 100; ++i) {
    const Curve c = search_ref::RandomCurve(rng);
    Hits h = Intersect(c, c);
    ASSERT_EQ(h.size(), 2u);
    EXPECT_EQ(h.ta[0], 0.0);
    EXPECT_EQ(h.tb[0], 0.0);
    EXPECT_EQ(h.ta[1], 1.0);
    EXPECT_EQ(h.tb[1], 1.0);

    const Curve r{c[3], c[2], c[1], c[0]};
    h = Intersect(c, r);
    ASSERT_EQ(h.size(), 2u);
    EXPECT_EQ(h.tb[0], 1.0);
    EXPECT_EQ(h.tb[1], 0.0);

    Curve sub;
    Subsection(0.2, 0.7, c.data(), sub.data());
    h = Intersect(c, sub);
    // Both branches of a loop of c may cross the piece once more.
    ASSERT_LE(h.size(), 4u) << i;
    ASSERT_GE(h.size(), 2u) << i;
    auto has = [&](double s, double u) {
      for (size_t k = 0; k < h.size(); ++k)
        if (std::fabs(h.ta[k] - s) < 1e-7 && std::fabs(h.tb[k] - u) < 1e-7) return true;
      return false;
    };
    EXPECT_TRUE(has(0.2, 0.0)) << i;
    EXPECT_TRUE(has(0.7, 1.0)) << i;

    Curve first, second;
    Subsection(0.0, 0.6, c.data(), first.data());
    Subsection(1.0, 0.4, c.data(), second.data());  // reversed
    h = Intersect(first, second);
    ASSERT_GE(h.size(), 2u) << i;
    ASSERT_LE(h.size(), 4u) << i;
    EXPECT_TRUE(has(0.4 / 0.6, 1.0)) << i;
    EXPECT_TRUE(has(1.0, 0.4 / 0.6)) << i;
  }
}

// A shared stretch of a looped curve, and the loop's branch crossing it.
TEST(BezierIntersect, SharedStretchAndLoopCrossing) {
  // Crosses itself at t = 0.5 -+ sqrt(3/7) / 2.
  const Curve c{V{0, 0}, V{150, 100}, V{-50, 100}, V{100, 0}};
  const double s = 0.5 - std::sqrt(3.0 / 7) / 2, t = 0.5 + std::sqrt(3.0 / 7) / 2;
  Curve a, b;
  Subsection(0.0, 0.5, c.data(), a.data());
  Subsection(0.4, 1.0, c.data(), b.data());
  const Hits h = Intersect(a, b);
  ASSERT_EQ(h.size(), 3u);
  EXPECT_NEAR(h.ta[0], s / 0.5, 1e-9);
  EXPECT_NEAR(h.tb[0], (t - 0.4) / 0.6, 1e-9);
  EXPECT_NEAR(h.ta[1], 0.8, 1e-7);
  EXPECT_NEAR(h.tb[1], 0.0, 1e-7);
  EXPECT_NEAR(h.ta[2], 1.0, 1e-7);
  EXPECT_NEAR(h.tb[2], 0.1 / 0.6, 1e-7);
}

// Two straight curves on one line: the ends of the common part.
TEST(BezierIntersect, CollinearStraightCurves) {
  const Curve a{V{0, 0}, V{3, 3}, V{6, 6}, V{10, 10}};
  const Curve b{V{5, 5}, V{8, 8}, V{12, 12}, V{20, 20}};
  Hits h = Intersect(a, b);
  ASSERT_EQ(h.size(), 2u);
  EXPECT_NEAR(h.pts[0].x, 5, 1e-9);
  EXPECT_NEAR(h.tb[0], 0, 1e-9);
  EXPECT_NEAR(h.pts[1].x, 10, 1e-9);
  EXPECT_NEAR(h.ta[1], 1, 1e-9);
  const Curve apart{V{11, 11}, V{12, 12}, V{13, 13}, V{14, 14}};
  EXPECT_EQ(Intersect(a, apart).size(), 0u);
  EXPECT_FALSE(DoBeziersIntersect(a.data(), apart.data()));
  const Curve touching{V{10, 10}, V{12, 12}, V{13, 13}, V{14, 14}};
  h = Intersect(a, touching);
  ASSERT_EQ(h.size(), 1u);
  EXPECT_NEAR(h.ta[0], 1.0, 1e-9);
  EXPECT_NEAR(h.tb[0], 0.0, 1e-9);
}

// Contacts, near-coincidence, smooth joints and degenerate curves end in a
// small, sensible answer.
TEST(BezierIntersect, DegenerateInputsAreBounded) {
  // Two parabolas touching at the origin.
  const Curve up{V{-1, 1}, V{-1.0 / 3, -1.0 / 3}, V{1.0 / 3, -1.0 / 3}, V{1, 1}};
  const Curve down{V{-1, -1}, V{-1.0 / 3, 1.0 / 3}, V{1.0 / 3, 1.0 / 3}, V{1, -1}};
  Hits h = Intersect(up, down);
  ASSERT_EQ(h.size(), 1u);
  EXPECT_NEAR(h.ta[0], 0.5, 1e-5);
  EXPECT_NEAR(h.pts[0].x, 0.0, 1e-5);
  EXPECT_TRUE(DoBeziersIntersect(up.data(), down.data()));

  std::mt19937 rng(8);
  std::uniform_real_distribution<double> off(-1.0, 1.0);
  for (int i = 0; i < 60; ++i) {
    const Curve c = search_ref::RandomCurve(rng);
    for (double eps : {1e-13, 1e-9, 1e-6, 1e-3}) {
      Curve d = c;
      for (auto& p : d) p = V{p.x + eps * off(rng), p.y + eps * off(rng)};
      h = Intersect(c, d);
      EXPECT_LE(h.size(), 9u) << i << " " << eps;
      for (size_t k = 0; k < h.size(); ++k) {
        EXPECT_GE(h.ta[k], 0.0);
        EXPECT_LE(h.ta[k], 1.0);
        EXPECT_TRUE(std::isfinite(h.pts[k].x));
      }
    }
    // A smooth joint: b continues a's end tangent; they meet only there.
    Curve a2, b2;
    Split(0.5, c.data(), a2.data(), b2.data());
    h = Intersect(a2, b2);
    ASSERT_GE(h.size(), 1u);
    bool joint = false;
    for (size_t k = 0; k < h.size(); ++k) joint = joint || (h.ta[k] > 1 - 1e-6 && h.tb[k] < 1e-6);
    EXPECT_TRUE(joint) << i;
  }
  // All points equal: nothing.
  const Curve dot{V{1, 1}, V{1, 1}, V{1, 1}, V{1, 1}};
  EXPECT_EQ(Intersect(dot, up).size(), 0u);
  EXPECT_EQ(Intersect(dot, dot).size(), 0u);
  EXPECT_FALSE(DoBeziersIntersect(dot.data(), up.data()));
}

// Integer curves give what their double copies give.
TEST(BezierIntersect, IntegerFormMatchesDoubles) {
  std::mt19937 rng(17);
  std::uniform_int_distribution<int> u(-1000, 1000);
  for (int i = 0; i < 300; ++i) {
    POINT a[4], b[4];
    Curve av, bv;
    for (int k = 0; k < 4; ++k) {
      a[k] = POINT{u(rng), u(rng)};
      b[k] = POINT{u(rng), u(rng)};
      av[k] = V{double(a[k].x), double(a[k].y)};
      bv[k] = V{double(b[k].x), double(b[k].y)};
    }
    Hits hi;
    FindBezierIntersections(a, b, hi.ta, hi.tb, hi.pts);
    const Hits hv = Intersect(av, bv);
    ASSERT_EQ(hi.size(), hv.size());
    for (size_t k = 0; k < hi.size(); ++k) EXPECT_EQ(hi.ta[k], hv.ta[k]);
    EXPECT_EQ(DoBeziersIntersect(a, b), hv.size() > 0);
  }
}

// Integer curves at the ends of the coordinate range terminate with
// finite, bounded results.
TEST(BezierIntersect, ExtremeIntegerCoordinates) {
  const int32_t M = 2147483647, m = -2147483647 - 1;
  const POINT a[4] = {POINT{m, m}, POINT{M, m}, POINT{m, M}, POINT{M, M}};
  const POINT b[4] = {POINT{m, M}, POINT{m, m}, POINT{M, M}, POINT{M, m}};
  Hits h;
  FindBezierIntersections(a, b, h.ta, h.tb, h.pts);
  EXPECT_GE(h.size(), 1u);
  EXPECT_LE(h.size(), 9u);
  for (const V& p : h.pts) EXPECT_TRUE(p.IsFinite());
  h = Hits{};
  FindBezierIntersections(a, a, h.ta, h.tb, h.pts);
  EXPECT_EQ(h.size(), 2u);
}

// Non-finite or missing input appends nothing and keeps what was there.
TEST(BezierIntersect, BadInputAppendsNothing) {
  const double nan = std::nan(""), inf = std::numeric_limits<double>::infinity();
  const Curve good{V{0, 0}, V{10, 10}, V{20, -10}, V{30, 0}};
  const Curve other{V{0, 5}, V{10, -5}, V{20, 5}, V{30, -5}};
  for (const Curve& bad : {Curve{V{nan, 0}, V{1, 1}, V{2, 2}, V{3, 3}}, Curve{V{0, 0}, V{1, inf}, V{2, 2}, V{3, 3}}}) {
    std::vector<double> ta{0.5}, tb{0.5};
    std::vector<V> pts{V{1, 2}};
    FindBezierIntersections(good.data(), bad.data(), ta, tb, pts);
    FindBezierIntersections(bad.data(), good.data(), ta, tb, pts);
    EXPECT_EQ(ta.size(), 1u);
    EXPECT_EQ(tb.size(), 1u);
    EXPECT_EQ(pts.size(), 1u);
    EXPECT_FALSE(DoBeziersIntersect(good.data(), bad.data()));
  }
  std::vector<double> ta, tb;
  std::vector<V> pts;
  FindBezierIntersections(static_cast<const V*>(nullptr), good.data(), ta, tb, pts);
  EXPECT_TRUE(ta.empty());
  // Appending: a second call adds to the lists.
  FindBezierIntersections(good.data(), other.data(), ta, tb, pts);
  const size_t n = ta.size();
  EXPECT_GT(n, 0u);
  FindBezierIntersections(good.data(), other.data(), ta, tb, pts);
  EXPECT_EQ(ta.size(), 2 * n);
}

}  // namespace
