// Closest points against brute force: dense sampling of every segment with a
// golden-section refinement around the best sample, and the discrete local
// minima of the sampled distance along each subpath.
#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>

#include "math/test_curves.h"
#include "measure/inshape_reference.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using OstraCrv::ClosestPoint;
using OstraCrv::CurvePosition;
using OstraCrv::PolycurveT;

template <class T>
class Closest : public ::testing::Test {};
using PointKinds = ::testing::Types<POINT, V>;
TYPED_TEST_SUITE(Closest, PointKinds);

// The squared distance from q to segment seg, by sampling and refinement.
template <class T>
double BruteForce(const sampled::Path<T>& p, const testpaths::Segment& seg, V q) {
  return testcurves::NearestSq([&](double t) { return sampled::SegmentPoint(p.points, seg, t); }, q, nullptr, 1000);
}

template <class T>
void CheckRecord(const sampled::Path<T>& p, const ClosestPoint<T, CurvePosition>& r, V q) {
  const auto& nodes = p.shape.nodes;
  EXPECT_EQ(OstraCrv::SegmentToLastNodeIndex(nodes.data(), p.shape.n(), r.position.segment), r.position.endNode);
  EXPECT_EQ(OstraCrv::SegmentToFirstNodeIndex(nodes.data(), p.shape.n(), r.position.segment), r.position.startNode);
  const V on = p.curve.GetPoint2dOnCurve(r.position.endNode, r.position.t);
  EXPECT_EQ(r.point, MavikMath::FromV<T>(on));
  EXPECT_NEAR(r.distanceSquared, MavikMath::SquaredDistance(on, q), 1e-6 * (1 + r.distanceSquared));
  EXPECT_EQ(r.interior, r.position.t > 0 && r.position.t < 1);
}

TYPED_TEST(Closest, NearestPointMatchesBruteForce) {
  using T = TypeParam;
  std::mt19937 rng(2718);
  std::uniform_int_distribution<int> coord(-1500, 1500);
  for (int round = 0; round < 150; ++round) {
    const auto p = sampled::Make<T>(rng);
    if (p.shape.segments.empty()) continue;
    std::vector<V> targets = {V{double(coord(rng)), double(coord(rng))}, V{1e6, -3e5},
                              MavikMath::ToV(p.points[rng() % p.points.size()])};
    const auto& seg = p.shape.segments[rng() % p.shape.segments.size()];
    targets.push_back(sampled::SegmentPoint(p.points, seg, 0.37));  // on the curve
    for (V q : targets) {
      const T target = MavikMath::FromV<T>(q);
      q = MavikMath::ToV(target);
      double ref = DBL_MAX;
      for (const auto& s : p.shape.segments) ref = std::min(ref, BruteForce(p, s, q));
      ClosestPoint<T, CurvePosition> got;
      ASSERT_TRUE(p.curve.FindClosestPoint(target, got));
      EXPECT_NEAR(std::sqrt(got.distanceSquared), std::sqrt(ref), 1e-6 * (1 + std::sqrt(ref))) << round;
      CheckRecord(p, got, q);

      // All local minima: sorted, led by the nearest point, each a record
      // of a real place on the path.
      std::vector<ClosestPoint<T, CurvePosition>> all;
      ASSERT_TRUE(OstraCrv::FindClosestPoints(p.points.data(), p.shape.nodes.data(), p.shape.n(), target, all))
          << round;
      EXPECT_TRUE(std::is_sorted(all.begin(), all.end()));
      EXPECT_NEAR(std::sqrt(all.front().distanceSquared), std::sqrt(ref), 1e-6 * (1 + std::sqrt(ref))) << round;
      for (const auto& r : all) CheckRecord(p, r, q);

      // Every discrete local minimum of the sampled distance along a subpath
      // has a record near it that is at least as near to the target.
      for (int s = 0; s < int(p.shape.subpaths.size()); ++s) {
        std::vector<V> line;
        for (const auto& sg : p.shape.segments)
          if (sg.subpath == s) {
            auto pts = sampled::Sample(p, sg, 200);
            line.insert(line.end(), pts.begin() + (line.empty() ? 0 : 1), pts.end());
          }
        const bool closed = p.shape.subpaths[s].closed;
        const int m = int(line.size());
        for (int k = 0; k < m; ++k) {
          auto d = [&](int j) { return MavikMath::SquaredDistance(line[j], q); };
          const bool first = k == 0, last = k == m - 1;
          if (closed && last) continue;  // the same place as the first
          const int before = first ? (closed ? m - 2 : -1) : k - 1;
          const int after = last ? -1 : k + 1;
          if ((before >= 0 && !(d(k) < d(before))) || (after >= 0 && !(d(k) < d(after)))) continue;
          if (before < 0 && after < 0) continue;
          const double reach = 2 * std::max(before >= 0 ? MavikMath::Distance(line[k], line[before]) : 0.0,
                                            after >= 0 ? MavikMath::Distance(line[k], line[after]) : 0.0) +
                               1.5;
          bool found = false;
          for (const auto& r : all)
            found |= MavikMath::Distance(MavikMath::ToV(r.point), line[k]) <= reach &&
                     r.distanceSquared <= d(k) + 1e-6 * (1 + d(k));
          EXPECT_TRUE(found) << "round " << round << " subpath " << s << " sample " << k;
        }
      }
    }
  }
}

template <class T>
PolycurveT<T> Lines(const std::vector<T>& pts, bool closed) {
  return OstraCrv::PolylineT<T>(pts.data(), pts.size(), closed);
}

TYPED_TEST(Closest, LinesCornersAndEnds) {
  using T = TypeParam;
  // Plain projections onto a line are checked by the brute-force test.
  ClosestPoint<T, CurvePosition> c;
  // A zero-length line: its end is the answer, no division by zero.
  const auto dot = Lines<T>({T{5, 5}, T{5, 5}}, false);
  ASSERT_TRUE(dot.FindClosestPoint(T{8, 9}, c));
  EXPECT_EQ(c.distanceSquared, 25.0);
  EXPECT_EQ(c.position.t, 0.0);

  // Two subpaths at equal distance: the first in array order.
  auto two = Lines<T>({T{0, 0}, T{10, 0}}, false);
  two.PushBack(Lines<T>({T{0, 10}, T{10, 10}}, false));
  ASSERT_TRUE(two.FindClosestPoint(T{5, 5}, c));
  EXPECT_EQ(c.position.segment, 0);
  ASSERT_TRUE(two.FindClosestPoint(T{5, 6}, c));
  EXPECT_EQ(c.position.segment, 1);
  EXPECT_EQ(c.position.startNode, 2);

  // A right-angle corner: outside in its wedge the node once; inside the two
  // feet; beyond the open start a t = 0 record that sorts first.
  const auto corner = Lines<T>({T{0, 0}, T{10, 0}, T{10, 10}}, false);
  std::vector<ClosestPoint<T, CurvePosition>> all;
  ASSERT_TRUE(OstraCrv::FindClosestPoints(corner.GetPoints(), corner.GetNodeTypes(), 3, T{15, -5}, all));
  ASSERT_EQ(all.size(), 1u);
  EXPECT_EQ(all[0].position.endNode, 1);
  EXPECT_EQ(all[0].position.t, 1.0);
  all.clear();
  OstraCrv::FindClosestPoints(corner.GetPoints(), corner.GetNodeTypes(), 3, T{5, 5}, all);
  ASSERT_EQ(all.size(), 2u);
  EXPECT_TRUE(all[0].interior && all[1].interior);
  all.clear();
  OstraCrv::FindClosestPoints(corner.GetPoints(), corner.GetNodeTypes(), 3, T{-2, 1}, all);
  ASSERT_FALSE(all.empty());
  EXPECT_EQ(all[0].position.t, 0.0);
  EXPECT_EQ(all[0].position.startNode, 0);

  // A closed square: no end records; its closing corner is found with the
  // first segment's direction.
  const auto square = Lines<T>({T{0, 0}, T{0, 10}, T{10, 10}, T{10, 0}}, true);
  all.clear();
  OstraCrv::FindClosestPoints(square.GetPoints(), square.GetNodeTypes(), 5, T{-3, -4}, all);
  ASSERT_EQ(all.size(), 1u);
  EXPECT_EQ(all[0].position.endNode, 4);
  EXPECT_EQ(all[0].distanceSquared, 25.0);
}

TYPED_TEST(Closest, CircleCentreHasSortedMinima) {
  using T = TypeParam;
  const double r = 1000;
  inref::Builder<T> b;
  b.Circle({0, 0}, r, false);
  std::vector<ClosestPoint<T, CurvePosition>> all;
  ASSERT_TRUE(OstraCrv::FindClosestPoints(b.points.data(), b.nodes.data(), b.n(), T{0, 0}, all));
  EXPECT_GE(all.size(), 2u);
  EXPECT_TRUE(std::is_sorted(all.begin(), all.end()));
  for (const auto& c : all) EXPECT_NEAR(std::sqrt(c.distanceSquared), r, 0.001 * r);
}

TYPED_TEST(Closest, OpenEndsOnCurveTestAndBadInput) {
  using T = TypeParam;
  auto curve = Lines<T>({T{0, 0}, T{10, 0}, T{10, 10}}, true);  // closed
  curve.PushBack(T{50, 50}, NodeTypes::Open::move);             // lone move
  unsigned long node = 77;
  EXPECT_EQ(OstraCrv::FindClosestOpenPointOnCurve(curve, T{0, 0}, node, -1), DBL_MAX);
  EXPECT_FALSE(curve.FindClosestOpenPoint(T{0, 0}, node));
  curve.PushBack(Lines<T>({T{100, 0}, T{200, 0}}, false));
  EXPECT_TRUE(curve.FindClosestOpenPoint(T{190, 5}, node));
  EXPECT_EQ(node, curve.GetPointCount() - 1);
  EXPECT_EQ(OstraCrv::FindClosestOpenPointOnCurve(curve, T{190, 5}, node, int(node)), 90.0 * 90 + 25);

  // At most the tolerance counts as on the curve.
  const auto line = Lines<T>({T{0, 0}, T{10, 0}}, false);
  EXPECT_TRUE(line.IsPointOnCurve(T{5, 3}, 3.0));
  EXPECT_FALSE(line.IsPointOnCurve(T{5, 3}, 2.999));
  EXPECT_FALSE(line.IsPointOnCurve(T{5, 3}, std::nan("")));
  EXPECT_NEAR(line.GetLengthAlongCurveTo(T{4, 7}), 4.0, 1e-12);

  // Nothing to find: empty, a lone move, null arrays, a NaN target.
  ClosestPoint<T, CurvePosition> c;
  c.distanceSquared = 123;
  const T one[] = {T{1, 1}};
  const NODETYPE move[] = {NodeTypes::Open::move};
  std::vector<ClosestPoint<T, CurvePosition>> all;
  EXPECT_FALSE(PolycurveT<T>().FindClosestPoint(T{0, 0}, c));
  EXPECT_FALSE(OstraCrv::FindClosestPoint(one, move, 1, T{0, 0}, c));
  EXPECT_FALSE(OstraCrv::FindClosestPoints(one, move, 1, T{0, 0}, all));
  EXPECT_FALSE(OstraCrv::FindClosestPoint<T>(nullptr, move, 2, T{0, 0}, c));
  EXPECT_EQ(PolycurveT<T>().GetLengthAlongCurveTo(T{0, 0}), 0.0);
  if constexpr (std::is_same_v<T, V>) {
    EXPECT_FALSE(line.FindClosestPoint(V{std::nan(""), 0}, c));
    EXPECT_FALSE(OstraCrv::FindClosestPoints(line.GetPoints(), line.GetNodeTypes(), 2, V{0, INFINITY}, all));
  }
  EXPECT_EQ(c.distanceSquared, 123.0);
  EXPECT_TRUE(all.empty());
}

TYPED_TEST(Closest, SegmentViews) {
  using T = TypeParam;
  using View = OstraCrv::CurveSegmentT<T>;
  const T pts[] = {T{0, 0}, T{10, 0}, T{10, 10}, T{20, 10}, T{20, 0}};
  const NODETYPE nodes[] = {NodeTypes::Open::move, NodeTypes::Open::line, NodeTypes::arc, NodeTypes::arc,
                            NodeTypes::Open::curve};
  const PolycurveT<T> c(pts, nodes, 5);
  ClosestPoint<T, OstraCrv::SegmentPosition> s;
  ASSERT_TRUE(View(c, 0).FindClosestPoint(T{3, 4}, s));  // a move view: its point
  EXPECT_EQ(s.distanceSquared, 25.0);
  EXPECT_FALSE(s.interior);
  // The Bezier view agrees with a path made of that Bezier alone.
  const PolycurveT<T> bez(pts + 1, nodes + 1, 4);
  ClosestPoint<T, CurvePosition> whole;
  ASSERT_TRUE(View(c, 2).FindClosestPoint(T{15, 20}, s));
  ASSERT_TRUE(bez.FindClosestPoint(T{15, 20}, whole));
  EXPECT_EQ(s.position.t, whole.position.t);
  EXPECT_EQ(s.distanceSquared, whole.distanceSquared);
  EXPECT_TRUE(View(c, 2).IsPointOnCurve(T{15, 8}, 0.6));
  EXPECT_FALSE(View().FindClosestPoint(T{0, 0}, s));
  EXPECT_FALSE(View().IsPointOnCurve(T{0, 0}, 1e9));

  auto seg = [](std::vector<T> p) {
    static std::vector<std::vector<T>> keep;  // views borrow the arrays
    static const NODETYPE line[] = {NodeTypes::Open::move, NodeTypes::Open::line};
    static const NODETYPE curve[] = {NodeTypes::Open::move, NodeTypes::arc, NodeTypes::arc, NodeTypes::Open::curve};
    keep.push_back(std::move(p));
    return View(keep.back().size() == 2 ? line : curve, keep.back().data(), 1, keep.back().size());
  };
  const View a = seg({T{0, 0}, T{100, 0}});
  const View parallel = seg({T{0, 5}, T{100, 5}});
  EXPECT_TRUE(a.DoesIntersectWith(parallel, true));
  EXPECT_FALSE(a.DoesIntersectWith(parallel, false));
  const View touching = seg({T{50, 0}, T{50, 50}});  // its start lies on a
  EXPECT_TRUE(a.DoesIntersectWith(touching, false));
  EXPECT_FALSE(touching.DoesIntersectWith(a, false));                    // this end on the other: strict
  EXPECT_FALSE(a.DoesIntersectWith(seg({T{50, 0}, T{150, 0}}), false));  // collinear overlap
  EXPECT_TRUE(a.DoesIntersectWith(seg({T{50, -50}, T{50, 50}}), false));
  const View arch = seg({T{10, -20}, T{30, 60}, T{70, 60}, T{90, -20}});  // crosses a twice
  EXPECT_TRUE(arch.DoesIntersectWith(a, false));
  EXPECT_TRUE(a.DoesIntersectWith(arch, false));
  EXPECT_FALSE(arch.DoesIntersectWith(seg({T{0, 500}, T{100, 500}}), false));
  EXPECT_FALSE(View(c, 0).DoesIntersectWith(a, false));  // a move view meets nothing
}

}  // namespace
