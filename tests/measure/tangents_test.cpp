// Points, tangents, curvature, passing side and corners: against finite
// differences of an independent evaluation, and the neutral answers for
// nodes without a segment.
#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>
#include <numbers>

#include "measure/sampled_paths.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;
using OstraCrv::PolycurveT;

template <class T>
class Tangents : public ::testing::Test {};
using PointKinds = ::testing::Types<POINT, V>;
TYPED_TEST_SUITE(Tangents, PointKinds);

double Angle(D a, D b) { return std::atan2(MavikMath::Cross(a, b), MavikMath::Dot(a, b)); }

// On every segment of random paths: the point at t is the Bernstein point,
// the tangent points along the finite difference of the curve, and the
// forward tangent of the start node and the reverse tangent of the end node
// point into the segment.
TYPED_TEST(Tangents, AgreeWithIndependentEvaluation) {
  using T = TypeParam;
  std::mt19937 rng(5);
  for (int round = 0; round < 100; ++round) {
    const auto p = sampled::Make<T>(rng);
    for (const auto& seg : p.shape.segments) {
      for (double t : {0.0, 0.3, 0.5, 1.0}) {
        const V ref = sampled::SegmentPoint(p.points, seg, t);
        const V got = p.curve.GetPoint2dOnCurve(seg.end, t);
        EXPECT_NEAR(got.x, ref.x, 1e-9 * 4000);
        EXPECT_NEAR(got.y, ref.y, 1e-9 * 4000);
        if (t > 0.0 && t < 1.0) {
          const V a = sampled::SegmentPoint(p.points, seg, t - 1e-6),
                  b = sampled::SegmentPoint(p.points, seg, t + 1e-6);
          const D fd = b - a;
          if (fd.SquaredLength() > 1e-12) {
            EXPECT_NEAR(Angle(p.curve.GetTangentAt(seg.end, t, true), fd), 0.0, 1e-4);
          }
        }
      }
      const D unit = p.curve.GetTangentAt(seg.end, 0.5, true);
      if (unit.SquaredLength() > 0) {
        EXPECT_NEAR(unit.Length(), 1.0, 1e-12);
      }
      // A segment leaves its start along the first control-polygon leg of
      // length and arrives along the last one.
      std::vector<V> poly;
      for (int j = seg.start; j <= seg.end; ++j) poly.push_back(MavikMath::ToV(p.points[j]));
      for (int j = 1; j < int(poly.size()); ++j)
        if (poly[j] != poly[0]) {
          EXPECT_NEAR(Angle(p.curve.GetForwardTangentAt(seg.start), poly[j] - poly[0]), 0.0, 1e-9);
          break;
        }
      for (int j = int(poly.size()) - 2; j >= 0; --j)
        if (poly[j] != poly.back()) {
          EXPECT_NEAR(Angle(p.curve.GetReverseTangentAt(seg.end), poly[j] - poly.back()), 0.0, 1e-9);
          break;
        }
    }
  }
}

TYPED_TEST(Tangents, NodesWithoutSegmentGiveNeutralValues) {
  using T = TypeParam;
  // move, line, zero-length line, line, then a closed square after it.
  const T pts[] = {T{0, 0}, T{10, 0}, T{10, 0}, T{10, 10}, T{100, 0}, T{100, 10}, T{110, 10}, T{110, 0}, T{100, 0}};
  const NODETYPE nodes[] = {NodeTypes::Open::move, NodeTypes::Open::line,   NodeTypes::Open::line,
                            NodeTypes::Open::line, NodeTypes::Closed::move, NodeTypes::Open::line,
                            NodeTypes::Open::line, NodeTypes::Open::line,   NodeTypes::Closed::line};
  const PolycurveT<T> c(pts, nodes, 9);
  EXPECT_EQ(c.GetTangentAt(0, 0.5, false), (D{1, 0}));   // index 0
  EXPECT_EQ(c.GetTangentAt(4, 0.5, false), (D{0, 0}));   // a move
  EXPECT_EQ(c.GetTangentAt(99, 0.5, false), (D{1, 0}));  // out of range
  EXPECT_EQ(c.GetTangentAt(3, 0.5, true), (D{0, 1}));
  // The zero-length line is looked through in both directions.
  EXPECT_EQ(c.GetForwardTangentAt(1), (D{0, 10}));
  EXPECT_EQ(c.GetReverseTangentAt(2), (D{-10, 0}));
  EXPECT_EQ(c.GetForwardTangentAt(3), (D{0, 0}));  // end of an open subpath
  EXPECT_EQ(c.GetReverseTangentAt(0), (D{0, 0}));  // start of an open subpath
  EXPECT_EQ(c.GetForwardTangentAt(-1), (D{0, 0}));
  // The closing node continues across the closing point, and the first node
  // looks back through it.
  EXPECT_EQ(c.GetForwardTangentAt(8), c.GetForwardTangentAt(4));
  EXPECT_EQ(c.GetReverseTangentAt(4), c.GetReverseTangentAt(8));
  EXPECT_EQ(c.GetReverseTangentAt(4), (D{10, 0}));
  // Lines have no curvature.
  EXPECT_EQ(c.GetForwardCurvatureAt(0), 0.0);
  EXPECT_EQ(c.GetReverseCurvatureAt(3), 0.0);
  EXPECT_EQ(c.GetPointOnCurve(4, 0.5), T{});
  EXPECT_EQ(c.GetPointOnCurve(), (T{5, 0}));
  EXPECT_EQ(c.GetNumberOfSegments(), 7);
  EXPECT_TRUE(c.AllLineSegments());
  EXPECT_FALSE(PolycurveT<T>().AllLineSegments());
  T out{7, 7};
  OstraCrv::CurvePosition none;
  EXPECT_FALSE(c.GetPointOnCurve(none, out));
  EXPECT_FALSE(c.GetPointOnCurve(4ul, 0.5, out));
  EXPECT_FALSE(c.GetPointOnCurve(1ul, std::nan(""), out));
  EXPECT_EQ(out, (T{7, 7}));
}

TEST(PointsOnCurve, IntegerPointsRoundHalfAwayFromZero) {
  const POINT pts[] = {{0, 0}, {1, 0}, {-1, -1}};
  const NODETYPE nodes[] = {NodeTypes::Open::move, NodeTypes::Open::line, NodeTypes::Open::line};
  EXPECT_EQ(OstraCrv::GetPointOnCurve(pts, nodes, 3, 1, 0.5), (POINT{1, 0}));
  EXPECT_EQ(OstraCrv::GetPointOnCurve(pts, nodes, 3, 2, 0.5), (POINT{0, -1}));  // (0, -0.5)
  POINT out{};
  EXPECT_TRUE(OstraCrv::CRV_GetPointOnCurve(&out, pts, nodes, 2, 0.25));
  EXPECT_EQ(out, (POINT{1, 0}));  // (0.5, -0.25)
  EXPECT_FALSE(OstraCrv::CRV_GetPointOnCurve(&out, pts, nodes, 0, 0.5));
  EXPECT_FALSE(OstraCrv::CRV_GetPointOnCurve(nullptr, pts, nodes, 1, 0.5));
  V exact;
  EXPECT_TRUE(PolycurveT<POINT>(pts, nodes, 3).GetPointOnCurve(2ul, 0.25, exact));
  EXPECT_EQ(exact, (V{0.5, -0.25}));
}

TYPED_TEST(Tangents, PassingSideAroundACentre) {
  using T = TypeParam;
  // A square around the origin, counter-clockwise, then clockwise.
  const T ccw[] = {T{10, -10}, T{10, 10}, T{-10, 10}};
  const T cw[] = {T{-10, 10}, T{10, 10}, T{10, -10}};
  const NODETYPE nodes[] = {NodeTypes::Open::move, NodeTypes::Open::line, NodeTypes::Open::line};
  D tangent;
  EXPECT_FALSE(OstraCrv::IsClockwise(ccw, nodes, 3, 1, 0.5, T{0, 0}, &tangent));
  EXPECT_EQ(tangent, (D{0, 10}));
  EXPECT_TRUE(OstraCrv::IsClockwise(cw, nodes, 3, 2, 1.0, T{0, 0}, &tangent));
  EXPECT_EQ(tangent, (D{0, -20}));  // at the very end, taken back to the start
  EXPECT_FALSE(OstraCrv::IsClockwise(cw, nodes, 3, 0, 0.5, T{0, 0}, nullptr));
}

TYPED_TEST(Tangents, CuspNodes) {
  using T = TypeParam;
  // Through (0,0) and (1000,0): the third point sets the bend at node 1.
  auto bend = [](double degrees, ContinuityType cont) {
    const double a = degrees * std::numbers::pi / 180.0;
    const T pts[] = {T{0, 0}, T{1000, 0}, MavikMath::FromV<T>(V{1000 + 1e6 * std::cos(a), 1e6 * std::sin(a)})};
    const NODETYPE nodes[] = {NodeTypes::Open::move, WithContinuity(NodeTypes::Open::line, cont),
                              NodeTypes::Open::line};
    return PolycurveT<T>(pts, nodes, 3).IsCuspNode(1);
  };
  EXPECT_TRUE(bend(1.0, ContinuityType::cusp));
  EXPECT_FALSE(bend(0.5, ContinuityType::cusp));
  EXPECT_FALSE(bend(90.0, ContinuityType::smooth));  // marked smooth: never a cusp
  EXPECT_TRUE(bend(90.0, ContinuityType::cusp));
  // Ends of an open subpath have one side only.
  const T pts[] = {T{0, 0}, T{10, 0}};
  const NODETYPE nodes[] = {NodeTypes::Open::move, NodeTypes::Open::line};
  EXPECT_TRUE(PolycurveT<T>(pts, nodes, 2).IsCuspNode(0));
  EXPECT_FALSE(PolycurveT<T>(pts, nodes, 2).IsCuspNode(2));
}

TYPED_TEST(Tangents, FarthestPointKeepsTheFirstOfEquals) {
  using T = TypeParam;
  const T pts[] = {T{1, 0}, T{0, 5}, T{-5, 0}, T{3, 4}};
  EXPECT_EQ(OstraCrv::FindFarthestPoint(pts, 4, T{0, 0}), (std::pair<int, double>(1, 25.0)));
  EXPECT_EQ(OstraCrv::FindFarthestPoint(pts, 0, T{0, 0}), (std::pair<int, double>(-1, DBL_MAX)));
  EXPECT_EQ(OstraCrv::FindFarthestPoint<T>(nullptr, 4, T{0, 0}).first, -1);
}

}  // namespace
