#include "ostracrv/math/bezier_line_intersect.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"

namespace {

using namespace testcurves;
using namespace MavikMath::CubicBezier;

// Sign changes of f (the shared grid reference, 5000 cells); ambiguous when
// one is shallow (near tangency), near an end or near another, where the
// reference cannot resolve it.
std::vector<double> Crossings(const std::function<double(double)>& f, bool& ambiguous) {
  const std::vector<double> roots = SignChanges(f, 5000);
  const double h = 1.0 / 5000;
  ambiguous = false;
  for (size_t k = 0; k < roots.size(); ++k) {
    const double r = roots[k];
    ambiguous = ambiguous || r < 1e-6 || r > 1 - 1e-6 || (k && r - roots[k - 1] < 1e-3) ||
                std::fabs(f(std::min(1.0, r + h)) - f(std::max(0.0, r - h))) < 2e-2 * h;
  }
  return roots;
}

// Crossings of random Beziers with random segments, against the sign changes
// of the signed distance: same crossings, parameters to 1e-9.
TEST(BezierLineIntersect, RandomSegmentsMatchBisection) {
  std::mt19937 rng(31);
  std::uniform_real_distribution<double> u(-20.0, 120.0);
  int compared = 0, found = 0;
  for (int i = 0; i < 3000; ++i) {
    const Curve c = i % 2 ? RandomCurve(rng) : LoopThrough(rng, 0.3, 0.8);
    const V line[2] = {V{u(rng), u(rng)}, V{u(rng), u(rng)}};
    const D dir = line[1] - line[0];
    const double L = dir.Length();
    bool ambiguous;
    const auto roots = Crossings([&](double t) { return Cross(dir, At(c, t) - line[0]) / L; }, ambiguous);
    if (ambiguous) continue;
    std::vector<double> expectT, expectU;
    bool nearSegmentEnd = false;
    for (double t : roots) {
      const double s = Dot(dir, At(c, t) - line[0]) / (L * L);
      nearSegmentEnd = nearSegmentEnd || std::fabs(s) < 1e-6 || std::fabs(s - 1) < 1e-6;
      if (s >= 0 && s <= 1) expectT.push_back(t), expectU.push_back(s);
    }
    if (nearSegmentEnd) continue;
    ++compared;
    std::vector<double> tb, tl;
    ASSERT_EQ(FindBezierLineIntersection(c.data(), line, tb, tl, false), !expectT.empty()) << i;
    ASSERT_TRUE(tb.size() == expectT.size() && tl.size() == expectT.size()) << i;
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
    const Curve c = RandomCurve(rng);
    const double x = u(rng);
    bool ambiguous;
    const auto roots = Crossings([&](double t) { return At(c, t).x - x; }, ambiguous);
    std::vector<double> ts, wide;
    FindBezierIntersectionsAtX(c.data(), x, ts, false);
    FindBezierIntersectionsAtX(c.data(), x, wide, true);
    for (double t : ts) EXPECT_NE(std::find(wide.begin(), wide.end(), t), wide.end()) << i;
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
  const V arch[4] = {V{0, 0}, V{0, 100}, V{100, 100}, V{100, 0}};  // top (50, 75) at t = 0.5
  const V tangent[2] = {V{-10, 75}, V{110, 75}}, below[2] = {V{-10, 74}, V{110, 74}}, above[2] = {V{-10, 76}, V{110, 76}};
  std::vector<double> tb, tl;
  EXPECT_FALSE(FindBezierLineIntersection(arch, tangent, tb, tl, false));
  EXPECT_TRUE(DoesBezierIntersectLineSegment(arch, tangent));
  ASSERT_TRUE(FindBezierLineIntersection(arch, below, tb, tl, false));
  EXPECT_EQ(tb.size(), 2u);
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
  EXPECT_TRUE(tb[0] == 0.0 && tb[2] == 1.0);
  EXPECT_NEAR(tb[1], 0.5, 1e-12);
  EXPECT_NEAR(tl[0], 0.1, 1e-12);
  tb.clear(), tl.clear();
  const V joint[2] = {V{-10, -10}, V{0, 0}};  // the segment ends where the curve starts
  ASSERT_TRUE(FindBezierLineIntersection(curve, joint, tb, tl, false));
  EXPECT_TRUE(tb[0] == 0.0 && tl[0] == 1.0);

  const V straight[4] = {V{0, 0}, V{10, 0}, V{20, 0}, V{30, 0}}, farAxis[2] = {V{35, 0}, V{45, 0}};
  tb.clear();
  EXPECT_FALSE(FindBezierLineIntersection(straight, axis, tb, tl, false));
  EXPECT_TRUE(DoesBezierIntersectLineSegment(straight, axis));
  EXPECT_FALSE(DoesBezierIntersectLineSegment(straight, farAxis));
  std::vector<double> ts;
  const V vertical[4] = {V{5, 0}, V{5, 10}, V{5, 20}, V{5, 30}};
  FindBezierIntersectionsAtX(vertical, 5.0, ts, true);
  EXPECT_TRUE(ts.empty());

  const V point[2] = {V{20, 0}, V{20, 0}};
  EXPECT_FALSE(FindBezierLineIntersection(curve, point, tb, tl, false));
  EXPECT_FALSE(DoesBezierIntersectLineSegment(curve, point));

  const POINT ci[4] = {POINT{0, 0}, POINT{10, 20}, POINT{30, -20}, POINT{40, 0}};
  const POINT li[2] = {POINT{20, -50}, POINT{20, 50}}, lj[2] = {POINT{50, -50}, POINT{50, 50}};
  EXPECT_TRUE(DoesBezierIntersectLineSegment(ci, li));
  EXPECT_FALSE(DoesBezierIntersectLineSegment(ci, lj));
}

TEST(BezierLineIntersect, BadInputAppendsNothing) {
  const V good[4] = {V{0, 0}, V{10, 20}, V{30, -20}, V{40, 0}};
  const V line[2] = {V{20, -50}, V{20, 50}}, badLine[2] = {V{20, -kInf}, V{20, 50}};
  std::vector<double> tb{0.5}, tl{0.5}, ts{0.5};
  for (const Curve& bad : kBadCurves) {  // lines through the start, which is finite
    const V through[2] = {bad[0] + D{0, -50}, bad[0] + D{0, 50}};
    EXPECT_FALSE(FindBezierLineIntersection(bad.data(), through, tb, tl, false));
    EXPECT_FALSE(DoesBezierIntersectLineSegment(bad.data(), through));
    FindBezierIntersectionsAtX(bad.data(), bad[0].x, ts, true);
  }
  EXPECT_FALSE(FindBezierLineIntersection(good, badLine, tb, tl, false));
  EXPECT_FALSE(FindBezierLineIntersection(nullptr, line, tb, tl, false));
  EXPECT_FALSE(FindBezierLineIntersection(good, nullptr, tb, tl, false));
  EXPECT_FALSE(DoesBezierIntersectLineSegment(good, badLine));
  FindBezierIntersectionsAtX(good, kNaN, ts, true);
  EXPECT_TRUE(tb.size() == 1u && tl.size() == 1u && ts.size() == 1u);
}

}  // namespace
