// Welding an appended curve to open ends, closing one subpath and breaking
// through the PolycurveT methods.
#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "core/path_geometry.h"
#include "core/random_paths.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using OstraCrv::PolycurveD;

using testgeo::Polyline;
using testgeo::Valid;
PolycurveD RandomCurve(std::mt19937& rng) {
  testpaths::Path path;
  return testgeo::RandomCurve(rng, path, 4, 100.0);
}

TEST(JoinEndpoints, WeldsTheLastEndToTheNearestOpenEnd) {
  const PolycurveD a = Polyline({{0, 0}, {10, 0}, {10, 10}});
  // other's last end lies next to a's start: one subpath, other then a.
  PolycurveD c = a;
  EXPECT_TRUE(c.JoinEndpoints(Polyline({{30, 30}, {0, 1}}), 2.0));
  ASSERT_TRUE(Valid(c));
  EXPECT_EQ(c.GetNumberOfSubpaths(), 1);
  ASSERT_EQ(c.GetPointCount(), 4u);
  EXPECT_EQ(c.GetPoint(1), (V{0, 0.5}));
  EXPECT_EQ(c.GetPoint(3), (V{10, 10}));
  // Nothing near: other simply stands behind.
  c = a;
  EXPECT_FALSE(c.JoinEndpoints(Polyline({{30, 30}, {40, 40}}), 2.0));
  EXPECT_EQ(c.GetPointCount(), 5u);
  EXPECT_EQ(c.GetNumberOfSubpaths(), 2);
  // Both ends near: the weld is asked with this curve's old last node in the
  // place of other's first node, which describes no inserted subpath; only
  // the append stays.
  c = a;
  EXPECT_FALSE(c.JoinEndpoints(Polyline({{10, 11}, {0, 1}}), 2.0));
  EXPECT_EQ(c.GetPointCount(), 5u);
  // other's first end near: that open end is joined to the old last node,
  // here a's start to its end, which closes a.
  c = a;
  EXPECT_TRUE(c.JoinEndpoints(Polyline({{0, 1}, {50, 50}}), 2.0));
  ASSERT_TRUE(Valid(c));
  EXPECT_TRUE(c.IsClosed(0));
  // Empty curves.
  c = PolycurveD();
  EXPECT_FALSE(c.JoinEndpoints(a, 1.0));
  EXPECT_EQ(c, a);
  EXPECT_FALSE(c.JoinEndpoints(PolycurveD(), 1.0));
  EXPECT_EQ(c, a);
}

TEST(JoinEndpoints, AlwaysValidAndNeverLosesASegment) {
  std::mt19937 rng(71);
  for (int k = 0; k < 2000; ++k) {
    PolycurveD c = RandomCurve(rng);
    const PolycurveD other = RandomCurve(rng);
    const int segments = c.GetNumberOfSegments() + other.GetNumberOfSegments();
    c.JoinEndpoints(other, 60.0);
    ASSERT_TRUE(Valid(c)) << k;
    EXPECT_EQ(c.GetNumberOfSegments(), segments) << k;
  }
}

TEST(CloseSubpath, ClosesWithALineWhereTheEndsDiffer) {
  std::mt19937 rng(72);
  int closedSome = 0;
  for (int k = 0; k < 2000; ++k) {
    PolycurveD c = RandomCurve(rng);
    const unsigned long node = rng() % c.GetPointCount();
    unsigned long begin = 0, end = 0;
    const bool hasRange = c.GetSubpathRange(node, begin, end);
    const PolycurveD before = c;
    ASSERT_EQ(c.CloseSubpath(node), hasRange) << k;
    ASSERT_TRUE(Valid(c)) << k;
    if (!hasRange) {
      EXPECT_EQ(c, before);
      continue;
    }
    const bool wasOpen = !before.IsClosed(int(begin));
    const bool oneLine = end - begin == 2;
    const int closedBefore = before.GetNumberOfSubpaths() - CRV_HowManyOpenSubpaths(before.GetNodeTypes(), int(before.GetPointCount()));
    const int closedAfter = c.GetNumberOfSubpaths() - CRV_HowManyOpenSubpaths(c.GetNodeTypes(), int(c.GetPointCount()));
    const bool closes = wasOpen && !oneLine;
    EXPECT_EQ(closedAfter, closedBefore + (closes ? 1 : 0)) << k;
    const bool bridge = closes && before.GetPoint(int(begin)) != before.GetPoint(int(end - 1));
    EXPECT_EQ(c.GetNumberOfSegments(), before.GetNumberOfSegments() + (bridge ? 1 : 0)) << k;
    closedSome += closes;
  }
  EXPECT_GT(closedSome, 300);
}

TEST(BreakAt, PartsAnOpenPathInTwo) {
  OstraCrv::Polycurve c;
  c.MoveTo(POINT{0, 0});
  c.CubicTo(POINT{0, 30}, POINT{30, 30}, POINT{30, 0});
  const OstraCrv::Polycurve before = c;
  EXPECT_FALSE(c.BreakAt(0, 0.5));  // a move ends no segment
  EXPECT_FALSE(c.BreakAt(3, 1.0));  // the open end
  EXPECT_EQ(c, before);
  EXPECT_TRUE(c.BreakAt(3, 0.5));
  ASSERT_EQ(c.GetPointCount(), 8u);
  EXPECT_EQ(c.GetNumberOfSubpaths(), 2);
  EXPECT_EQ(c.GetPoint(3), (POINT{15, 23}));  // the middle of the arch, 22.5 rounded
  EXPECT_EQ(c.GetPoint(4), c.GetPoint(3));
  EXPECT_TRUE(Valid(c));
}

}  // namespace
