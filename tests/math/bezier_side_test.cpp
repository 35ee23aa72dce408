#include "ostracrv/math/bezier_side.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"
#include "ostracrv/math/bezier_basis.h"

namespace {

using namespace testcurves;
using namespace MavikMath::CubicBezier;
using MavikMath::Side;
using MavikMath::SideLeft;
using MavikMath::SideNone;
using MavikMath::SideRight;

Side SideOf(const Curve& c, const V& target, double& t) {
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
    const Curve c = RandomCurve(rng);
    const V target{u(rng), u(rng)};
    double tr;
    const double d2 = NearestSq(c.data(), target, &tr);
    bool ambiguous = d2 < 1e-6;
    for (int k = 0; k <= 400 && !ambiguous; ++k)
      ambiguous = std::fabs(k / 400.0 - tr) > 0.02 && SquaredDistance(At(c, k / 400.0), target) < d2 * (1 + 1e-3) + 1e-6;
    if (ambiguous) continue;
    const double h = 1e-7;
    const D tangent = At(c, std::min(1.0, tr + h)) - At(c, std::max(0.0, tr - h));
    const double cr = Cross(tangent, target - At(c, tr));
    if (std::fabs(cr) < 1e-6 * tangent.Length()) continue;  // on the tangent line beyond an end
    ++compared;
    double t = -1;
    EXPECT_EQ(SideOf(c, target, t), cr > 0 ? SideLeft : SideRight) << i;
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
  EXPECT_EQ(side, SideLeft);  // above, y up
  EXPECT_NEAR(t, 0.5, 1e-12);
  EXPECT_NEAR(d, 16.0, 1e-9);
  EXPECT_NEAR(foot.x, 15.0, 1e-9);
  EXPECT_EQ(SideOf(line, V{15, -4}, t), SideRight);
  EXPECT_EQ(SideOf(line, V{15, 0}, t), SideNone);
  EXPECT_EQ(SideOf(line, V{40, 0}, t), SideNone);  // on the line beyond the end
  EXPECT_EQ(GetSide(POINT{15, 4}, pb.a, pb.b, pb.c, pb.d, t), SideLeft);

  const Curve flat{V{0, 0}, V{0, 0}, V{30, 0}, V{30, 0}};  // zero derivative at both ends
  EXPECT_EQ(SideOf(flat, V{-5, 3}, t), SideLeft);
  EXPECT_EQ(t, 0.0);
  EXPECT_EQ(SideOf(flat, V{35, -3}, t), SideRight);
  EXPECT_EQ(t, 1.0);

  const Curve arch{V{0, 0}, V{0, 100}, V{100, 100}, V{100, 0}};
  EXPECT_EQ(SideOf(arch, At(arch, 0.3), t), SideNone);
  EXPECT_EQ(SideOf(arch, V{50, 50}, t), SideRight);  // inside the clockwise arch
}

TEST(BezierSide, BadInput) {
  const V z{0, 0}, one{1, 1};
  double t = 0.5, d = 7;
  V foot{3, 3};
  Side side = MavikMath::SideBoth;
  EXPECT_FALSE(GetSide(V{kNaN, 0}, one, one, one, z, t, foot, d, side));
  EXPECT_FALSE(GetSide(V{0, 0}, V{kNaN, 0}, one, one, z, t, foot, d, side));
  EXPECT_FALSE(GetSide(V{5, 0}, z, z, z, one, t, foot, d, side));  // a point
  EXPECT_TRUE(t == 0.5 && d == 7 && foot == (V{3, 3}) && side == MavikMath::SideBoth);
  EXPECT_EQ(GetSide(V{5, 0}, z, z, z, one, t), SideNone);
  EXPECT_EQ(t, 0.5);
  EXPECT_EQ(MavikMath::Opposite(SideLeft), SideRight);
  EXPECT_EQ(MavikMath::Opposite(MavikMath::SideBoth), MavikMath::SideBoth);
  EXPECT_EQ(SideLeft | SideRight, MavikMath::SideBoth);
}

}  // namespace
