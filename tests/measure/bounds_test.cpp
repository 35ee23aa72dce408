// Bounding boxes against dense sampling of random paths, plain and under a
// rotation, and the enabled-only box against a hand-picked selection.
#include <gtest/gtest.h>

#include <climits>
#include <cmath>

#include "measure/sampled_paths.h"

namespace {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::BoundsT;
using MavikMath::V;
using OstraCrv::PolycurveT;

template <class T>
class Bounds : public ::testing::Test {};
using PointKinds = ::testing::Types<POINT, V>;
TYPED_TEST_SUITE(Bounds, PointKinds);

// The sampled box of the path's segments (and lone moves) after m.
template <class T>
BoundsT<double> SampledBox(const sampled::Path<T>& p, const MavikMath::MATRIX& m, int steps) {
  BoundsT<double> b;
  for (const auto& sp : p.shape.subpaths) b.Add(m(MavikMath::ToV(p.points[sp.first])));
  for (const auto& seg : p.shape.segments)
    for (const V& q : sampled::Sample(p, seg, seg.bezier ? steps : 1)) b.Add(m(q));
  return b;
}

// The tight box holds every sample and exceeds the sampled box by no more
// than the sampling can miss; the integer box is that box rounded outward
// (integer Beziers peak between whole numbers).
TYPED_TEST(Bounds, TightBoxMatchesSampling) {
  using T = TypeParam;
  std::mt19937 rng(314);
  MavikMath::MATRIX rot;
  rot.m11 = rot.m22 = std::cos(0.5);
  rot.m12 = std::sin(0.5);
  rot.m21 = -rot.m12;
  rot.dx = 17.25;
  for (int round = 0; round < 80; ++round) {
    const auto p = sampled::Make<T>(rng);
    const BoundsT<double> s = SampledBox(p, MavikMath::MATRIX{}, 20000);
    const double slack = 1e-4;  // 2000 units sampled at 1/20000: miss below 1e-4
    const RECT r = p.curve.GetTightBBox();
    EXPECT_EQ(r.left, int(std::floor(s.left))) << round;
    EXPECT_EQ(r.right, int(std::ceil(s.right))) << round;
    EXPECT_EQ(r.bottom, int(std::floor(s.bottom))) << round;
    EXPECT_EQ(r.top, int(std::ceil(s.top))) << round;
    if constexpr (std::is_same_v<T, V>) {
      BoundsT<double> d;
      OstraCrv::GetTightBBox(p.points.data(), p.shape.nodes.data(), p.shape.n(), d);
      EXPECT_LE(d.left, s.left);
      EXPECT_GE(d.left, s.left - slack);
      EXPECT_GE(d.top, s.top);
      EXPECT_LE(d.top, s.top + slack);
    }
    // The loose box is the box of every point, control points included.
    BoundsT<double> all;
    for (const T& q : p.points) all.Add(MavikMath::ToV(q));
    const RECT loose = p.curve.GetLooseBBox();
    EXPECT_TRUE(loose.left == int(std::floor(all.left)) && loose.right == int(std::ceil(all.right)) &&
                loose.bottom == int(std::floor(all.bottom)) && loose.top == int(std::ceil(all.top)));
    if constexpr (std::is_same_v<T, V>) {
      // Off the grid, the double path's box rounds outward on every side.
      PolycurveT<V> moved = p.curve;
      moved += MavikMath::D{0.37, -0.61};
      const RECT m = moved.GetLooseBBox();
      EXPECT_TRUE(m.left == int(std::floor(all.left + 0.37)) && m.right == int(std::ceil(all.right + 0.37)) &&
                  m.bottom == int(std::floor(all.bottom - 0.61)) && m.top == int(std::ceil(all.top - 0.61)));
    }
    // Under a rotation the box is tight in the rotated frame.
    const BoundsT<double> rs = SampledBox(p, rot, 20000);
    const BoundsT<double> t = p.curve.GetTightTransformedBBox(rot);
    EXPECT_NEAR(t.left, rs.left, slack);
    EXPECT_NEAR(t.right, rs.right, slack);
    EXPECT_NEAR(t.bottom, rs.bottom, slack);
    EXPECT_NEAR(t.top, rs.top, slack);
    const BoundsT<double> lt = p.curve.GetLooseTransformedBBox(rot);
    EXPECT_LE(lt.left, t.left + 1e-9);
    EXPECT_GE(lt.top, t.top - 1e-9);
  }
}

TYPED_TEST(Bounds, EnabledBoxCoversOnlyTouchedSegments) {
  using T = TypeParam;
  // Line 0-1, Bezier 1-4 far out, line 4-5.
  const T pts[] = {T{0, 0}, T{10, 0}, T{10, 100}, T{20, 100}, T{20, 0}, T{30, 0}};
  NODETYPE nodes[] = {NodeTypes::Open::move, NodeTypes::Open::line,  NodeTypes::arc,
                      NodeTypes::arc,        NodeTypes::Open::curve, NodeTypes::Open::line};
  const RECT none = OstraCrv::GetTightEnabledBBox(pts, nodes, 6);
  EXPECT_EQ(none, (RECT{INT_MAX, INT_MIN, INT_MIN, INT_MAX}));
  nodes[5] |= NodeMask::kEnabled;  // the last line only
  EXPECT_EQ(OstraCrv::GetTightEnabledBBox(pts, nodes, 6), (RECT{20, 0, 30, 0}));
  nodes[2] |= NodeMask::kEnabled;  // a control point pulls in the Bezier
  EXPECT_EQ(OstraCrv::GetTightEnabledBBox(pts, nodes, 6), (RECT{10, 75, 30, 0}));
  EXPECT_EQ(OstraCrv::GetTightEnabledBBox<T>(pts, nullptr, 6), none);
}

TYPED_TEST(Bounds, BadInputGivesEmptyBoxes) {
  using T = TypeParam;
  const RECT empty{INT_MAX, INT_MIN, INT_MIN, INT_MAX};
  EXPECT_EQ(PolycurveT<T>().GetTightBBox(), empty);
  EXPECT_EQ(PolycurveT<T>().GetLooseBBox(), empty);
  EXPECT_TRUE(PolycurveT<T>().GetTightTransformedBBox(MavikMath::MATRIX{}).IsEmpty());
  // An unfinished Bezier at the end stops the walk without reading past it.
  const T pts[] = {T{0, 0}, T{5, 5}, T{9, 9}};
  const NODETYPE nodes[] = {NodeTypes::Open::move, NodeTypes::Open::line, NodeTypes::arc};
  EXPECT_EQ(OstraCrv::GetTightBBox(pts, nodes, 3), (RECT{0, 5, 5, 0}));
  BoundsT<double> keep;
  keep.Add(1, 1);
  OstraCrv::GetTightBBox(static_cast<const V*>(nullptr), nodes, 3, keep);
  EXPECT_EQ(keep.left, 1.0);
}

}  // namespace
