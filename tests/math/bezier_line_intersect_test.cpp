#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "math/search_reference.h"
#include "ostracrv/math/bezier_line_intersect.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using namespace MavikMath::CubicBezier;
using search_ref::At;
using search_ref::Curve;

// Sign changes of f over dense samples, refined by bisection; a crossing
// whose |f'| is tiny (near tangency) marks the case as ambiguous.
template <class F>
std::vector<double> SignChanges(F f, bool& ambiguous) {
  const int n = 5000;
  std::vector<double> roots;
  ambiguous = false;
  double prev = f(0.0);
  for (int i = 1; i <= n; ++i) {
    const double t = double(i) / n, cur = f(t);
    if ((prev < 0) != (cur < 0)) {
      double lo = double(i - 1) / n, hi = t;
      for (int k = 0; k < 100; ++k) {
        const double m = 0.5 * (lo + hi);
        if ((f(m) < 0) == (f(lo) < 0)) lo = m; else hi = m;
      }
      roots.push_back(0.5 * (lo + hi));
      if (std::fabs(cur - prev) * n < 1e-2) ambiguous = true;
    }
    prev = cur;
  }
  // Roots too close to an end or to each other are not resolvable here.
  for (size_t k = 0; k < roots.size(); ++k) {
    if (roots[k] < 1e-6 || roots[k] > 1 - 1e-6) ambiguous = true;
    if (k && roots[k] - roots[k - 1] < 1e-3) ambiguous = true;
  }
  return roots;
}

// Crossings of random Beziers with random segments, against sampling and
// bisection of the signed distance: same crossings, parameters to 1e-9.
TEST(BezierLineIntersect, RandomSegmentsMatchBisection) {
  std::mt19937 rng(31);
  std::uniform_real_distribution<double> u(-20.0, 120.0);
  int compared = 0, found = 0;
  for (int i = 0; i < 3000; ++i) {
    const Curve c = i % 2 ? search_ref::RandomCurve(rng) : search_ref::LoopThrough(rng, 0.3, 0.8);
    const V line[2] = {V{u(rng), u(rng)}, V{u(rng), u(rng)}};
    const double dx = line[1].x - line[0].x, dy = line[1].y - line[0].y, L = std::hypot(dx, dy);
    bool ambiguous;
    const auto roots = SignChanges([&](double t) {
      const V p = At(c, t);
      return (dx * (p.y - line[0].y) - dy * (p.x - line[0].x)) / L;
    }, ambiguous);
    if (ambiguous) continue;
    std::vector<double> expectT, expectU;
    bool nearSegmentEnd = false;
    for (double t : roots) {
      const V p = At(c, t);
      const double s = (dx * (p.x - line[0].x) + dy * (p.y - line[0].y)) / (L * L);
      if (std::fabs(s) < 1e-6 || std::fabs(s - 1) < 1e-6) nearSegmentEnd = true;
      if (s >= 0 && s <= 1) {
        expectT.push_back(t);
        expectU.push_back(s);
      }
    }
    if (nearSegmentEnd) continue;
    ++compared;
    std::vector<double> tb, tl;
    const bool any = FindBezierLineIntersection(c.data(), line, tb, tl, false);
    ASSERT_EQ(any, !expectT.empty()) << i;
    ASSERT_EQ(tb.size(), expectT.size()) << i;
    ASSERT_EQ(tl.size(), expectT.size()) << i;
    for (size_t k = 0; k < tb.size(); ++k) {
      EXPECT_NEAR(tb[k], expectT[k], 1e-9) << i;
      EXPECT_NEAR(tl[k], expectU[k], 1e-9) << i;
    }
    found += int(tb.size());
    EXPECT_EQ(DoesBezierIntersectLineSegment(c.data(), line), !expectT.empty()) << i;
  }
  EXPECT_GT(compared, 2500);
  EXPECT_GT(found, 500);
}

// Vertical lines, against the same reference; the wider search is a
// superset of the plain one.
TEST(BezierLineIntersect, AtXMatchesBisection) {
  std::mt19937 rng(32);
  std::uniform_real_distribution<double> u(-10.0, 110.0);
  int compared = 0;
  for (int i = 0; i < 3000; ++i) {
    const Curve c = search_ref::RandomCurve(rng);
    const double x = u(rng);
    bool ambiguous;
    const auto roots = SignChanges([&](double t) { return At(c, t).x - x; }, ambiguous);
    std::vector<double> ts, wide;
    FindBezierIntersectionsAtX(c.data(), x, ts, false);
    FindBezierIntersectionsAtX(c.data(), x, wide, true);
    for (double t : ts) {
      bool in = false;
      for (double w : wide) in = in || w == t;
      EXPECT_TRUE(in) << i;
    }
    if (ambiguous) continue;
    ++compared;
    ASSERT_EQ(ts.size(), roots.size()) << i;
    for (size_t k = 0; k < ts.size(); ++k) EXPECT_NEAR(ts[k], roots[k], 1e-9);
  }
  EXPECT_GT(compared, 2500);
}

// A line tangent to the curve is not crossed: the plain searches skip the
// touching root, the wider search and the yes/no test see it.
TEST(BezierLineIntersect, TangentialRoots) {
  // Symmetric arch with its top at (50, 75) for t = 0.5.
  const V arch[4] = {V{0, 0}, V{0, 100}, V{100, 100}, V{100, 0}};
  const V tangent[2] = {V{-10, 75}, V{110, 75}};
  std::vector<double> tb, tl;
  EXPECT_FALSE(FindBezierLineIntersection(arch, tangent, tb, tl, false));
  EXPECT_TRUE(DoesBezierIntersectLineSegment(arch, tangent));
  const V below[2] = {V{-10, 74}, V{110, 74}};
  ASSERT_TRUE(FindBezierLineIntersection(arch, below, tb, tl, false));
  EXPECT_EQ(tb.size(), 2u);
  const V above[2] = {V{-10, 76}, V{110, 76}};
  EXPECT_FALSE(DoesBezierIntersectLineSegment(arch, above));

  // Turned a quarter so that x has the extreme: the vertical line at x = 75.
  const V side[4] = {V{0, 0}, V{100, 0}, V{100, 100}, V{0, 100}};
  std::vector<double> ts;
  FindBezierIntersectionsAtX(side, 75.0, ts, false);
  EXPECT_TRUE(ts.empty());
  FindBezierIntersectionsAtX(side, 75.0, ts, true);
  ASSERT_EQ(ts.size(), 1u);
  EXPECT_NEAR(ts[0], 0.5, 1e-9);
  // Just beyond an end: only the wider search, clamped to the end.
  ts.clear();
  FindBezierIntersectionsAtX(side, -1e-9, ts, false);
  EXPECT_TRUE(ts.empty());
  FindBezierIntersectionsAtX(side, -1e-9, ts, true);
  ASSERT_GE(ts.size(), 1u);
  EXPECT_EQ(ts.front(), 0.0);
}

// Ends on the line, a curve along the line, a zero-length segment.
TEST(BezierLineIntersect, EndsAndOverlaps) {
  const V curve[4] = {V{0, 0}, V{10, 20}, V{30, -20}, V{40, 0}};
  const V axis[2] = {V{-5, 0}, V{45, 0}};  // through both ends and the middle
  std::vector<double> tb, tl;
  ASSERT_TRUE(FindBezierLineIntersection(curve, axis, tb, tl, false));
  ASSERT_EQ(tb.size(), 3u);
  EXPECT_EQ(tb[0], 0.0);
  EXPECT_NEAR(tb[1], 0.5, 1e-12);
  EXPECT_EQ(tb[2], 1.0);
  EXPECT_NEAR(tl[0], 0.1, 1e-12);
  // A joint: the segment ends where the curve starts.
  tb.clear();
  tl.clear();
  const V joint[2] = {V{-10, -10}, V{0, 0}};
  ASSERT_TRUE(FindBezierLineIntersection(curve, joint, tb, tl, false));
  EXPECT_EQ(tb[0], 0.0);
  EXPECT_EQ(tl[0], 1.0);

  const V straight[4] = {V{0, 0}, V{10, 0}, V{20, 0}, V{30, 0}};
  tb.clear();
  EXPECT_FALSE(FindBezierLineIntersection(straight, axis, tb, tl, false));
  EXPECT_TRUE(DoesBezierIntersectLineSegment(straight, axis));
  const V farAxis[2] = {V{35, 0}, V{45, 0}};
  EXPECT_FALSE(DoesBezierIntersectLineSegment(straight, farAxis));
  std::vector<double> ts;
  const V vertical[4] = {V{5, 0}, V{5, 10}, V{5, 20}, V{5, 30}};
  FindBezierIntersectionsAtX(vertical, 5.0, ts, true);
  EXPECT_TRUE(ts.empty());

  const V point[2] = {V{20, 0}, V{20, 0}};
  EXPECT_FALSE(FindBezierLineIntersection(curve, point, tb, tl, false));
  EXPECT_FALSE(DoesBezierIntersectLineSegment(curve, point));

  // Integer form.
  const POINT ci[4] = {POINT{0, 0}, POINT{10, 20}, POINT{30, -20}, POINT{40, 0}};
  const POINT li[2] = {POINT{20, -50}, POINT{20, 50}};
  const POINT lj[2] = {POINT{50, -50}, POINT{50, 50}};
  EXPECT_TRUE(DoesBezierIntersectLineSegment(ci, li));
  EXPECT_FALSE(DoesBezierIntersectLineSegment(ci, lj));
}

TEST(BezierLineIntersect, BadInputAppendsNothing) {
  const double nan = std::nan(""), inf = std::numeric_limits<double>::infinity();
  const V good[4] = {V{0, 0}, V{10, 20}, V{30, -20}, V{40, 0}};
  const V bad[4] = {V{0, 0}, V{nan, 20}, V{30, -20}, V{40, 0}};
  const V dot[4] = {V{1, 1}, V{1, 1}, V{1, 1}, V{1, 1}};
  const V line[2] = {V{20, -50}, V{20, 50}};
  const V badLine[2] = {V{20, -inf}, V{20, 50}};
  std::vector<double> tb{0.5}, tl{0.5}, ts{0.5};
  EXPECT_FALSE(FindBezierLineIntersection(bad, line, tb, tl, false));
  EXPECT_FALSE(FindBezierLineIntersection(dot, line, tb, tl, false));
  EXPECT_FALSE(FindBezierLineIntersection(good, badLine, tb, tl, false));
  EXPECT_FALSE(FindBezierLineIntersection(nullptr, line, tb, tl, false));
  EXPECT_FALSE(FindBezierLineIntersection(good, nullptr, tb, tl, false));
  EXPECT_EQ(tb.size(), 1u);
  EXPECT_EQ(tl.size(), 1u);
  FindBezierIntersectionsAtX(bad, 20.0, ts, true);
  FindBezierIntersectionsAtX(good, nan, ts, true);
  FindBezierIntersectionsAtX(dot, 1.0, ts, true);
  EXPECT_EQ(ts.size(), 1u);
  EXPECT_FALSE(DoesBezierIntersectLineSegment(bad, line));
  EXPECT_FALSE(DoesBezierIntersectLineSegment(good, badLine));
}

}  // namespace
