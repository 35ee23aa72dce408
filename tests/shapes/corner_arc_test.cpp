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

TEST(CornerArc, HandlesFollowTheLinearRule) {
  V h[2];
  // A quarter: handles of 0.55078 r, perpendicular to the radii, towards the chord.
  ASSERT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{10, 0}, V{0, 10}), 1);
  EXPECT_LT(MavikMath::Distance(h[0], V{10, 5.5078}), 1e-9);
  EXPECT_LT(MavikMath::Distance(h[1], V{5.5078, 10}), 1e-9);
  ASSERT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{0, 10}, V{10, 0}), 1);  // clockwise
  EXPECT_LT(MavikMath::Distance(h[0], V{5.5078, 10}), 1e-9);
  // Linear in the angle: 60 degrees have 2/3 of the quarter's handle.
  ASSERT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{10, 0}, V{5, 10 * std::sin(std::numbers::pi / 3)}), 1);
  EXPECT_NEAR(MavikMath::Distance(h[0], V{10, 0}), 5.5078 * 2 / 3, 1e-9);
  h[0] = V{7, 7};
  EXPECT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{0, 0}, V{1, 0}), 0);  // a on the centre
  EXPECT_EQ(h[0], (V{7, 7}));
  ASSERT_EQ(OstraCrv::GetArcSegmentHandles(h, V{0, 0}, V{3, 4}, V{3, 4}), 1);  // equal ends: no NaN
  EXPECT_TRUE(h[0].IsFinite() && h[1].IsFinite());
}

TEST(CornerArc, OffsettingAndFilletForms) {
  V out[5];
  int count = -1;
  // Cosine exactly -0.001 (these coordinates give it without rounding): one
  // piece; just below: two, meeting on the direction at the radius.
  const V a{1000, 0}, b{-1, std::sqrt(999999.0)};
  ASSERT_EQ(MavikMath::Dot(a, b) / std::sqrt(a.SquaredLength() * b.SquaredLength()), -0.001);
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{0, 1}, a, b, 1000.0, out, count), 1);
  EXPECT_EQ(count, 2);
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{1, 1}, a, V{-1.0000001, b.y}, 1000.0, out, count), 1);
  EXPECT_EQ(count, 5);
  EXPECT_LT(MavikMath::Distance(out[2], V{1000 / std::sqrt(2.0), 1000 / std::sqrt(2.0)}), 1e-9);
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{0, 0}, V{0, 10}, V{0, -10}, 10.0, out, count), 1);
  EXPECT_EQ(out[2], (V{10, 0}));  // no direction: (radius, direction.y)
  count = 42;
  EXPECT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, D{1, 0}, V{10, 0}, V{20, 0}, 10.0, out, count), 0);
  EXPECT_EQ(count, 42);  // no width: count untouched

  unsigned long fc = 9;
  // Fillets: the middle on the ray through the chord's midpoint, at the radius.
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{30, 0}, V{-24, 18}, 30.0, out, fc), 1);
  EXPECT_EQ(fc, 5u);
  EXPECT_NEAR(MavikMath::Distance(out[2], V{0, 0}), 30.0, 1e-12);
  EXPECT_NEAR(MavikMath::Cross(out[2] - V{0, 0}, V{3, 9} - V{0, 0}), 0.0, 1e-9);
  // Refused: a chord midpoint within 5 of the centre, a nearly straight corner.
  EXPECT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{3, 0}, V{-2.4, 1.8}, 3.0, out, fc), 0);
  EXPECT_EQ(fc, 0u);
  EXPECT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{100, 0}, V{100, 1}, 100.0, out, fc), 0);
  ASSERT_EQ(OstraCrv::BuildCircularArc(V{0, 0}, V{10, 0}, V{0, 10}, 10.0, out, fc), 1);
  EXPECT_EQ(fc, 2u);
}

TEST(CornerArc, AddArcAppendsBeziersOrCollapsesTheCorner) {
  std::vector<V> pts{V{0, -20}, V{10, 0}};
  std::vector<NODETYPE> nds{0x04, 0x44};
  // A half-turn join from (10, 0) to (-10, 0) round the top.
  OstraCrv::AddArc(V{0, 0}, D{0, 1}, V{10, 0}, V{-10, 0}, 10.0, pts, nds, 1.0);
  ASSERT_EQ(pts.size(), 8u);
  EXPECT_TRUE(OstraCrv::IsValidCurve(nds.data(), nds.size()));
  EXPECT_TRUE(pts[4] == (V{0, 10}) && pts[7] == (V{-10, 0}));
  for (const auto& poly : testgeo::Flatten(pts.data(), nds.data(), 8))
    for (const V& q : poly)
      EXPECT_TRUE(q.y < 0 || std::fabs(MavikMath::Distance(q, V{0, 0}) - 10.0) < 0.01);
  // Coincident ends: no arc, the last point moves to the corner.
  OstraCrv::AddArc(V{0, 0}, D{0, 1}, V{-10, 0.5}, V{-10, 0.5}, 10.0, pts, nds, 1.0);
  EXPECT_EQ(pts.size(), 8u);
  EXPECT_EQ(pts[7], (V{-10, 0.5}));
  std::vector<V> empty;
  std::vector<NODETYPE> emptyNodes;
  OstraCrv::AddArc(V{0, 0}, D{1, 1}, V{10, 0}, V{0, 10}, 10.0, empty, emptyNodes, 1.0);
  EXPECT_TRUE(emptyNodes.size() == 4u && OstraCrv::IsValidCurve(emptyNodes.data(), 4));
}

TEST(CurveAppend, JoinsMergesAndStartsSubpaths) {
  std::vector<V> p;
  std::vector<NODETYPE> n;
  OstraCrv::AddLine(p, n, V{0, 0}, V{10, 0}, 1.0, false, true);
  OstraCrv::AddLine(p, n, V{10.5, 0}, V{20, 0}, 1.0, false, true);  // straight on: extended
  ASSERT_EQ(p.size(), 2u);
  EXPECT_EQ(p[1], (V{20, 0}));
  OstraCrv::AddLine(p, n, V{20, 0.5}, V{20, 10}, 1.0, false, true);  // a corner: joined halfway
  EXPECT_EQ(p[1], (V{20, 0.25}));
  OstraCrv::AddLine(p, n, V{20, 10}, V{30, 10}, 1.0, true, true);  // isFirst: always a new subpath
  ASSERT_EQ(n.size(), 5u);
  EXPECT_EQ(n[3], 0x04);
  // A Bezier joining with a gap: first handle shifted, a straight join smooth.
  OstraCrv::AddBezier(p, n, Bezier{{V{30, 10.4}, V{40, 10}, V{50, 20}, V{50, 30}}}, 1.0, false, false);
  EXPECT_NEAR(p[5].y, 9.8, 1e-12);
  EXPECT_EQ(n[4], 0x54);
  // A line joining a Bezier moves its last handle with its end.
  OstraCrv::AddLine(p, n, V{50.4, 30}, V{50.4, 40}, 1.0, false, false);
  EXPECT_NEAR(p[6].x, 50.2, 1e-12);
  OstraCrv::AddBezier(p, n, Bezier{{V{100, 100}, V{110, 100}, V{120, 100}, V{130, 110}}}, 1.0, false, true);
  EXPECT_EQ(n[9], 0x44);  // a gap inside a chain is bridged by a line

  // Integer form: points rounded, the control point shifted by the shift rounded on its own.
  std::vector<POINT> ip;
  std::vector<NODETYPE> in;
  OstraCrv::AddBezier(ip, in, Bezier{{V{0, 0}, V{0, 10}, V{10, 10}, V{10, 0}}}, 4.0, false, false);
  OstraCrv::AddLine(ip, in, V{11, 0}, V{20, 0}, 4.0, false, false);
  EXPECT_TRUE(ip[3] == (POINT{11, 0}) && ip[2] == (POINT{11, 10}));
}

TEST(CurveAppend, RandomPiecesKeepAValidPath) {
  std::mt19937 rng(11);
  std::uniform_real_distribution<double> u(-50.0, 50.0);
  std::vector<V> p;
  std::vector<NODETYPE> n;
  std::vector<POINT> ip;
  std::vector<NODETYPE> in;
  V last{0, 0};
  for (int k = 0; k < 3000; ++k) {
    const V a = rng() % 2 ? last + D{u(rng) * 0.02, u(rng) * 0.02} : V{u(rng), u(rng)}, b{u(rng), u(rng)};
    const bool first = rng() % 5 == 0, flag = rng() % 2;
    if (rng() % 2) {
      OstraCrv::AddLine(p, n, a, b, 1.0, first, flag);
      OstraCrv::AddLine(ip, in, a, b, 1.0, first, flag);
    } else {
      const Bezier q{{a, V{u(rng), u(rng)}, V{u(rng), u(rng)}, b}};
      OstraCrv::AddBezier(p, n, q, 1.0, first, flag);
      OstraCrv::AddBezier(ip, in, q, 1.0, first, flag);
    }
    last = b;
    ASSERT_TRUE(p.size() == n.size() && OstraCrv::IsValidCurve(n.data(), n.size())) << k;
    ASSERT_TRUE(ip.size() == in.size() && OstraCrv::IsValidCurve(in.data(), in.size())) << k;
  }
}

}  // namespace
