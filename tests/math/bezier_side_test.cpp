#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>

#include "math/search_reference.h"
#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_side.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::Side;
using MavikMath::V;
using namespace MavikMath::CubicBezier;
using search_ref::At;
using search_ref::Curve;

Side Short(const Curve& c, const V& target, double& t) {
  const PowerBasis pb = GetPowerBasis(c.data());
  return GetSide(target, pb.a, pb.b, pb.c, pb.d, t);
}

// Against an independent answer: the nearest sample, refined, and the sign
// of the cross product with a finite-difference tangent there. Targets that
// are nearly as close to a second, distant part of the curve are skipped:
// there the side depends on which of two equal feet is taken.
TEST(BezierSide, MatchesNearestPointReference) {
  std::mt19937 rng(41);
  std::uniform_real_distribution<double> u(-30.0, 130.0);
  int compared = 0;
  for (int i = 0; i < 2000; ++i) {
    const Curve c = search_ref::RandomCurve(rng);
    const V target{u(rng), u(rng)};
    double tr;
    const double d2 = search_ref::ClosestRef(c, target, &tr);
    // Second-best minimum far from tr.
    bool ambiguous = false;
    for (int k = 0; k <= 400 && !ambiguous; ++k) {
      const double s = k / 400.0;
      if (std::fabs(s - tr) > 0.02 && search_ref::Dist2(At(c, s), target) < d2 * (1 + 1e-3) + 1e-6) ambiguous = true;
    }
    if (ambiguous || d2 < 1e-6) continue;
    const double h = 1e-7;
    const V a = At(c, std::max(0.0, tr - h)), b = At(c, std::min(1.0, tr + h)), p = At(c, tr);
    const double cr = (b.x - a.x) * (target.y - p.y) - (b.y - a.y) * (target.x - p.x);
    const double len = std::hypot(b.x - a.x, b.y - a.y);
    if (std::fabs(cr) < 1e-6 * len) continue;  // on the tangent line beyond an end
    ++compared;
    double t = -1;
    EXPECT_EQ(Short(c, target, t), cr > 0 ? MavikMath::SideLeft : MavikMath::SideRight) << i;
    EXPECT_NEAR(t, tr, 1e-5) << i;
  }
  EXPECT_GT(compared, 1500);
}

// The long form reports the nearest point and distance; a point on the
// curve has no side; a handle on its end point still gives a direction.
TEST(BezierSide, LongFormAndSpecialCases) {
  const Curve line{V{0, 0}, V{10, 0}, V{20, 0}, V{30, 0}};  // left to right
  const PowerBasis pb = GetPowerBasis(line.data());
  double t = -1, d = -1;
  V foot;
  Side side = MavikMath::SideBoth;
  ASSERT_TRUE(GetSide(V{15, 4}, pb.a, pb.b, pb.c, pb.d, t, foot, d, side));
  EXPECT_EQ(side, MavikMath::SideLeft);  // above, y up
  EXPECT_NEAR(t, 0.5, 1e-12);
  EXPECT_NEAR(d, 16.0, 1e-9);
  EXPECT_NEAR(foot.x, 15.0, 1e-9);
  EXPECT_EQ(GetSide(V{15, -4}, pb.a, pb.b, pb.c, pb.d, t), MavikMath::SideRight);
  EXPECT_EQ(GetSide(V{15, 0}, pb.a, pb.b, pb.c, pb.d, t), MavikMath::SideNone);
  EXPECT_EQ(GetSide(V{40, 0}, pb.a, pb.b, pb.c, pb.d, t), MavikMath::SideNone);  // on the line beyond the end
  EXPECT_EQ(GetSide(POINT{15, 4}, pb.a, pb.b, pb.c, pb.d, t), MavikMath::SideLeft);

  // Handles on their end points: zero derivative at both ends.
  const Curve flat{V{0, 0}, V{0, 0}, V{30, 0}, V{30, 0}};
  const PowerBasis fb = GetPowerBasis(flat.data());
  EXPECT_EQ(GetSide(V{-5, 3}, fb.a, fb.b, fb.c, fb.d, t), MavikMath::SideLeft);
  EXPECT_EQ(t, 0.0);
  EXPECT_EQ(GetSide(V{35, -3}, fb.a, fb.b, fb.c, fb.d, t), MavikMath::SideRight);
  EXPECT_EQ(t, 1.0);

  // A point on a curved piece.
  const Curve arch{V{0, 0}, V{0, 100}, V{100, 100}, V{100, 0}};
  const PowerBasis ab = GetPowerBasis(arch.data());
  EXPECT_EQ(GetSide(At(arch, 0.3), ab.a, ab.b, ab.c, ab.d, t), MavikMath::SideNone);
  EXPECT_EQ(GetSide(V{50, 50}, ab.a, ab.b, ab.c, ab.d, t), MavikMath::SideRight);  // inside the clockwise arch
}

TEST(BezierSide, BadInput) {
  const double nan = std::nan("");
  const V z{0, 0}, one{1, 1};
  double t = 0.5, d = 7;
  V foot{3, 3};
  Side side = MavikMath::SideBoth;
  EXPECT_FALSE(GetSide(V{nan, 0}, one, one, one, z, t, foot, d, side));
  EXPECT_FALSE(GetSide(V{0, 0}, V{nan, 0}, one, one, z, t, foot, d, side));
  EXPECT_FALSE(GetSide(V{5, 0}, z, z, z, one, t, foot, d, side));  // a point
  EXPECT_EQ(t, 0.5);
  EXPECT_EQ(d, 7);
  EXPECT_EQ(foot, (V{3, 3}));
  EXPECT_EQ(side, MavikMath::SideBoth);
  EXPECT_EQ(GetSide(V{5, 0}, z, z, z, one, t), MavikMath::SideNone);
  EXPECT_EQ(t, 0.5);
  EXPECT_EQ(MavikMath::Opposite(MavikMath::SideLeft), MavikMath::SideRight);
  EXPECT_EQ(MavikMath::Opposite(MavikMath::SideBoth), MavikMath::SideBoth);
  EXPECT_EQ(MavikMath::SideLeft | MavikMath::SideRight, MavikMath::SideBoth);
}

}  // namespace
