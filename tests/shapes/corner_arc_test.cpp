// Corner arcs and the joining appends they write through.
#include <gtest/gtest.h>

#include <cmath>
#include <numbers>
#include <random>
#include <vector>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;
using Bezier = MavikMath::CubicBezier::bezier2dT<V>;

constexpr double kPi = std::numbers::pi;

TEST(ArcHandles, LinearRuleAndDirection) {
  V h[2];
  // A quarter: handles of 0.55078 r, perpendicular to the radii, towards the chord.
  ASSERT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{10, 0}, V{0, 10}), 1);
  EXPECT_NEAR(h[0].x, 10, 1e-12);
  EXPECT_NEAR(h[0].y, 5.5078, 1e-9);
  EXPECT_NEAR(h[1].x, 5.5078, 1e-9);
  EXPECT_NEAR(h[1].y, 10, 1e-12);
  // Clockwise: the handles turn with the chord.
  ASSERT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{0, 10}, V{10, 0}), 1);
  EXPECT_NEAR(h[0].x, 5.5078, 1e-9);
  EXPECT_NEAR(h[0].y, 10, 1e-12);
  // Linear in the angle: a sixth of a turn (60 degrees) has 2/3 of the quarter's handle.
  ASSERT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{10, 0}, V{5, 10 * std::sin(kPi / 3)}), 1);
  EXPECT_NEAR(MavikMath::Distance(h[0], V{10, 0}), 5.5078 * 2 / 3, 1e-9);
  // On the centre: nothing written.
  h[0] = h[1] = V{7, 7};
  EXPECT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{0, 0}, V{1, 0}), 0);
  EXPECT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{1, 0}, V{0, 0}), 0);
  EXPECT_EQ(h[0], (V{7, 7}));
  // Equal ends: handles of zero length, no NaN.
  ASSERT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{3, 4}, V{3, 4}), 1);
  EXPECT_TRUE(h[0].IsFinite() && h[1].IsFinite());
}

TEST(CornerArc, OffsettingFormSplitsWideCorners) {
  V out[5];
  int count = -1;
  // Cosine exactly -0.001 (these coordinates give it without rounding): one
  // piece; just below: two.
  const V a{1000, 0}, b{-1, std::sqrt(999999.0)};
  ASSERT_EQ(MavikMath::Dot(a, b) / std::sqrt(a.SquaredLength() * b.SquaredLength()), -0.001);
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{0, 1}, a, b, 1000.0, out, count), 1);
  EXPECT_EQ(count, 2);
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{0, 1}, a, V{-1.0000001, b.y}, 1000.0, out, count), 1);
  EXPECT_EQ(count, 5);
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{1, 1}, V{10, 0}, V{-10, 0.5}, 10.0, out, count), 1);
  EXPECT_EQ(count, 5);
  EXPECT_NEAR(out[2].x, 10 / std::sqrt(2.0), 1e-12);  // the middle along direction, at the radius
  EXPECT_NEAR(out[2].y, 10 / std::sqrt(2.0), 1e-12);
  // A half turn with a zero direction: the middle falls back on (radius, direction.y).
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{0, 0}, V{0, 10}, V{0, -10}, 10.0, out, count), 1);
  EXPECT_EQ(out[2], (V{10, 0}));
  // No width: failure, count untouched.
  count = 42;
  EXPECT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{1, 0}, V{10, 0}, V{20, 0}, 10.0, out, count), 0);
  EXPECT_EQ(count, 42);
}

TEST(CornerArc, FilletForm) {
  V out[5];
  unsigned long count = 9;
  // Two pieces: the middle on the ray through the chord's midpoint, at the radius.
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{3, 0}, V{-2.4, 1.8}, 3.0, out, count), 0);
  EXPECT_EQ(count, 0u);  // chord midpoint (0.3, 0.9) is within 5 of the centre: refused
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{30, 0}, V{-24, 18}, 30.0, out, count), 1);
  EXPECT_EQ(count, 5u);
  EXPECT_NEAR(MavikMath::Distance(out[2], V{0, 0}), 30.0, 1e-12);
  EXPECT_NEAR(MavikMath::Cross(out[2] - V{0, 0}, V{3, 9} - V{0, 0}), 0.0, 1e-9);
  // Nearly straight: refused at 0.9999, count 0.
  EXPECT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{100, 0}, V{100, 1}, 100.0, out, count), 0);
  EXPECT_EQ(count, 0u);
  // One piece.
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{10, 0}, V{0, 10}, 10.0, out, count), 1);
  EXPECT_EQ(count, 2u);
  EXPECT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{0, 0}, V{0, 10}, 10.0, out, count), 0);
  EXPECT_EQ(count, 0u);
}

TEST(CornerArc, AddArcAppendsBeziersOrCollapsesTheCorner) {
  std::vector<V> pts{V{0, -20}, V{10, 0}};
  std::vector<NODETYPE> nds{0x04, 0x44};
  // A half-turn round join from (10, 0) to (-10, 0), middle at the top.
  OstraCrv::AddArc(V{0, 0}, D{0, 1}, V{10, 0}, V{-10, 0}, 10.0, pts, nds, 1.0);
  ASSERT_EQ(pts.size(), 8u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nds.data(), nds.size()));
  EXPECT_EQ(pts[4], (V{0, 10}));
  EXPECT_EQ(pts[7], (V{-10, 0}));
  // Within 1.5% of the circle (the linear handle rule at a quarter).
  for (const V& q : testgeo::Samples(pts.data(), nds.data(), 8)) {
    if (q.y < 0) continue;  // the leading line
    EXPECT_NEAR(MavikMath::Distance(q, V{0, 0}), 10.0, 0.01);
  }
  // Coincident ends: no arc, the last point moves to the corner.
  OstraCrv::AddArc(V{0, 0}, D{0, 1}, V{-10, 0.5}, V{-10, 0.5}, 10.0, pts, nds, 1.0);
  ASSERT_EQ(pts.size(), 8u);
  EXPECT_EQ(pts[7], (V{-10, 0.5}));
  // Onto an empty curve: a valid subpath.
  std::vector<V> empty;
  std::vector<NODETYPE> emptyNodes;
  OstraCrv::AddArc(V{0, 0}, D{1, 1}, V{10, 0}, V{0, 10}, 10.0, empty, emptyNodes, 1.0);
  EXPECT_EQ(emptyNodes.size(), 4u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(emptyNodes.data(), emptyNodes.size()));
}

TEST(CurveAppend, JoinsMergesAndStartsSubpaths) {
  std::vector<V> p;
  std::vector<NODETYPE> n;
  OstraCrv::AddLine(p, n, V{0, 0}, V{10, 0}, 1.0, false, true);
  ASSERT_EQ(p.size(), 2u);  // a single line cannot join an empty curve
  EXPECT_EQ(n[0], 0x04);
  // Continuing straight: the line is extended, no node added.
  OstraCrv::AddLine(p, n, V{10.5, 0}, V{20, 0}, 1.0, false, true);
  ASSERT_EQ(p.size(), 2u);
  EXPECT_EQ(p[1], (V{20, 0}));
  // A corner: joined at the midpoint of the gap.
  OstraCrv::AddLine(p, n, V{20, 0.5}, V{20, 10}, 1.0, false, true);
  ASSERT_EQ(p.size(), 3u);
  EXPECT_EQ(p[1], (V{20, 0.25}));
  EXPECT_EQ(n[1], 0x44);
  // isFirst: a new subpath even on an exact join.
  OstraCrv::AddLine(p, n, V{20, 10}, V{30, 10}, 1.0, true, true);
  ASSERT_EQ(p.size(), 5u);
  EXPECT_EQ(n[3], 0x04);
  // A Bezier joining with a gap shifts its first handle; the next line
  // joining it moves the Bezier's last handle with its end.
  OstraCrv::AddBezier(p, n, Bezier{{V{30, 10.4}, V{40, 10}, V{50, 20}, V{50, 30}}}, 1.0, false, false);
  ASSERT_EQ(p.size(), 8u);
  EXPECT_NEAR(p[4].y, 10.2, 1e-12);
  EXPECT_NEAR(p[5].y, 9.8, 1e-12);
  EXPECT_EQ(n[4], 0x54);  // a straight continuation: smooth
  OstraCrv::AddLine(p, n, V{50.4, 30}, V{50.4, 40}, 1.0, false, false);
  EXPECT_NEAR(p[7].x, 50.2, 1e-12);
  EXPECT_NEAR(p[6].x, 50.2, 1e-12);
  EXPECT_EQ(p[6].y, 20);
  // A Bezier far from the end: bridged by a line when continuing.
  OstraCrv::AddBezier(p, n, Bezier{{V{100, 100}, V{110, 100}, V{120, 100}, V{130, 110}}}, 1.0, false, true);
  EXPECT_EQ(n[9], 0x44);
  EXPECT_TRUE(OstraCrv::IsValidCurve(n.data(), n.size()));

  // Integer form: stored points rounded, control shift rounded on its own.
  std::vector<POINT> ip;
  std::vector<NODETYPE> in;
  OstraCrv::AddBezier(ip, in, Bezier{{V{0, 0}, V{0, 10}, V{10, 10}, V{10, 0}}}, 4.0, false, false);
  OstraCrv::AddLine(ip, in, V{11, 0}, V{20, 0}, 4.0, false, false);
  EXPECT_EQ(ip[3], (POINT{11, 0}));  // midpoint 10.5 rounds away from zero
  EXPECT_EQ(ip[2], (POINT{11, 10}));
  EXPECT_TRUE(OstraCrv::IsValidCurve(in.data(), in.size()));
}

TEST(CurveAppend, RandomPiecesKeepAValidPath) {
  std::mt19937 rng(11);
  std::uniform_real_distribution<double> u(-50.0, 50.0);
  std::vector<V> p;
  std::vector<NODETYPE> n;
  V last{0, 0};
  for (int k = 0; k < 3000; ++k) {
    const V a = rng() % 2 ? last + D{u(rng) * 0.02, u(rng) * 0.02} : V{u(rng), u(rng)};
    const V b{u(rng), u(rng)};
    if (rng() % 2)
      OstraCrv::AddLine(p, n, a, b, 1.0, rng() % 5 == 0, rng() % 2);
    else
      OstraCrv::AddBezier(p, n, Bezier{{a, V{u(rng), u(rng)}, V{u(rng), u(rng)}, b}}, 1.0, rng() % 5 == 0,
                          rng() % 2);
    last = b;
    ASSERT_EQ(p.size(), n.size());
    ASSERT_TRUE(OstraCrv::IsValidCurve(n.data(), n.size())) << k;
  }
}

}  // namespace
