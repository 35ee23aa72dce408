// Area and length against fine flattenings of random paths (shoelace sum and
// polyline length, which also pin the clockwise-positive sign), against
// circles, and pinned readings of signs and lengths.
#include <gtest/gtest.h>

#include <cmath>
#include <numbers>

#include "measure/inshape_reference.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using OstraCrv::PolycurveT;

template <class T>
class AreaLength : public ::testing::Test {};
using PointKinds = ::testing::Types<POINT, V>;
TYPED_TEST_SUITE(AreaLength, PointKinds);

constexpr int kSteps = 4000;

TYPED_TEST(AreaLength, AgreeWithFineFlattening) {
  using T = TypeParam;
  std::mt19937 rng(20240611);
  for (int round = 0; round < 60; ++round) {
    const auto p = sampled::Make<T>(rng);
    double area = 0.0, scale = 0.0, length = 0.0;
    for (int s = 0; s < int(p.shape.subpaths.size()); ++s) {
      double sub = 0.0;
      for (const auto& seg : p.shape.segments) {
        if (seg.subpath != s) continue;
        const auto pts = sampled::Sample(p, seg, seg.bezier ? kSteps : 1);
        for (size_t k = 1; k < pts.size(); ++k) {
          sub += (pts[k - 1].y + pts[k].y) * (pts[k].x - pts[k - 1].x) * 0.5;
          length += MavikMath::Distance(pts[k - 1], pts[k]);
        }
      }
      if (p.shape.subpaths[s].closed) {
        area += sub;
        scale += std::fabs(sub);
      }
    }
    EXPECT_NEAR(p.curve.GetArea(), area, 1e-6 * scale + 1e-6) << "round " << round;
    EXPECT_NEAR(p.curve.GetLength(), length, 1e-6 * length) << "round " << round;
  }
}

TYPED_TEST(AreaLength, PinnedSignsLengthsAndBadInput) {
  using T = TypeParam;
  const T tri[] = {T{0, 0}, T{0, 4}, T{3, 0}, T{0, 0}};
  const NODETYPE open[] = {NodeTypes::Open::move, NodeTypes::Open::line, NodeTypes::Open::line, NodeTypes::Open::line};
  const NODETYPE closed[] = {NodeTypes::Closed::move, NodeTypes::Open::line, NodeTypes::Open::line,
                             NodeTypes::Closed::line};
  EXPECT_EQ(OstraCrv::GetArea(tri, open, 4), 0.0);
  EXPECT_DOUBLE_EQ(OstraCrv::GetArea(tri, closed, 4), 6.0);  // clockwise with y up
  // (Mixed open and closed subpaths: the random test against flattening.)
  // The polygon form leaves the closing edge out: the area under two edges.
  const POINT poly[] = {{0, 0}, {0, 4}, {3, 0}};
  EXPECT_DOUBLE_EQ(OstraCrv::GetPolygonArea(poly, 3), 6.0);
  EXPECT_EQ(OstraCrv::GetPolygonArea(poly, 1), 0.0);
  // Bad input.
  EXPECT_EQ(OstraCrv::GetArea<T>(nullptr, closed, 4), 0.0);
  EXPECT_EQ(OstraCrv::GetArea(tri, closed, 1), 0.0);
  EXPECT_EQ(OstraCrv::GetLength<T>(tri, nullptr, 4), 0.0);
  EXPECT_EQ(PolycurveT<T>().GetLength(), 0.0);
  EXPECT_DOUBLE_EQ(OstraCrv::GetLength(tri, 4), 12.0);  // polyline 4 + 5 + 3
  const T straight[] = {T{0, 0}, T{1, 0}, T{2, 0}, T{3, 0}};  // a straight Bezier: its chord
  const NODETYPE bez[] = {NodeTypes::Open::move, NodeTypes::arc, NodeTypes::arc, NodeTypes::Open::curve};
  EXPECT_NEAR(OstraCrv::GetLength(straight, bez, 4), 3.0, 1e-12);
}

TEST(AreaLengthBadInput, NaNGivesZeroNotNaN) {
  const double nan = std::nan("");
  const V pts[] = {{0, 0}, {nan, 1}, {2, 2}, {0, 0}};
  const NODETYPE nodes[] = {NodeTypes::Closed::move, NodeTypes::Open::line, NodeTypes::Open::line,
                            NodeTypes::Closed::line};
  EXPECT_EQ(OstraCrv::GetArea(pts, nodes, 4), 0.0);
  EXPECT_EQ(OstraCrv::GetLength(pts, nodes, 4), 0.0);
  EXPECT_EQ(OstraCrv::GetLengthAlongCurveTo(pts, nodes, 4, 3, nan), 0.0);
}

TYPED_TEST(AreaLength, CircleMatchesWithinTheFourArcError) {
  using T = TypeParam;
  const double r = 1000.0, pi = std::numbers::pi;
  inref::Builder<T> b;  // four Bezier quarters with the usual handle factor
  b.Circle({0, 0}, r, false);
  const PolycurveT<T> c(b.points.data(), b.nodes.data(), b.n());
  EXPECT_NEAR(c.GetArea(), -pi * r * r, 1e-3 * pi * r * r);  // counter-clockwise: negative
  EXPECT_NEAR(c.GetLength(), 2 * pi * r, 1e-3 * r);
  // A quarter arc alone.
  EXPECT_NEAR(OstraCrv::GetLength(c.GetPoints(), c.GetNodeTypes(), 4), pi * r / 2, 1e-3 * r);
  // The curvature is positive (a left turn) at every node, close to 1/r.
  for (int i = 0; i < 12; i += 3) {
    EXPECT_GT(c.GetForwardCurvatureAt(i), 0.0);
    EXPECT_NEAR(c.GetForwardCurvatureAt(i), 1.0 / r, 0.05 / r);  // ends of a quarter: -2.1%
    EXPECT_GT(c.GetReverseCurvatureAt(i + 3), 0.0);
  }
}

// Length up to a position plus length from it is the whole, at every end
// node; along a line the part grows linearly with t.
TYPED_TEST(AreaLength, PartialLengthsAddUp) {
  using T = TypeParam;
  std::mt19937 rng(7);
  for (int round = 0; round < 40; ++round) {
    const auto p = sampled::Make<T>(rng);
    const double whole = p.curve.GetLength();
    for (const auto& seg : p.shape.segments) {
      const unsigned long e = seg.end;
      EXPECT_NEAR(p.curve.GetLengthAlongCurveTo(e, 1.0) + p.curve.GetLengthFrom(e, 1.0), whole, 1e-8 * whole);
      EXPECT_NEAR(p.curve.GetLengthAlongCurveTo(e, 0.3) + p.curve.GetLengthFrom(e, 0.3), whole, 1e-8 * whole);
      const double before = p.curve.GetLengthAlongCurveTo(e, 0.0);
      const double segLength = p.curve.GetLengthAlongCurveTo(e, 1.0) - before;
      if (!seg.bezier) {
        EXPECT_NEAR(p.curve.GetLengthAlongCurveTo(e, 0.25) - before, 0.25 * segLength, 1e-9 * whole);
      }
    }
    EXPECT_EQ(p.curve.GetLengthFrom(p.curve.GetPointCount(), 0.0), 0.0);
    EXPECT_NEAR(p.curve.GetLengthAlongCurveTo(~0ul, 0.5), whole, 1e-8 * whole);
  }
}

}  // namespace
