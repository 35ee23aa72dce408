#include "ostracrv/math/bezier_length.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"
#include "ostracrv/math/bezier_basis.h"

namespace {

using namespace testcurves;
using namespace MavikMath::CubicBezier;

double LengthOf(const V* p, int accuracy) {
  const PowerBasis q = GetPowerBasis(p);
  return Length(q.a, q.b, q.c, accuracy);
}

// Every family at both accuracies against adaptive Simpson (straight and
// folded curves included), plus cusps opened by 1e-2 down to 1e-12 of their
// size.
TEST(BezierLength, MatchesReferenceOnAllFamilies) {
  auto curves = RandomCurves(3000, 7);
  std::mt19937 rng(9);
  std::uniform_real_distribution<double> u(-1, 1);
  for (int i = 0; i < 400; ++i) {
    FamilyCurve c{{}, Kind::NearCusp};
    MakeCusp(V{100 * u(rng), 100 * u(rng)}, 0.5 + 0.45 * u(rng), D{100 * u(rng), 100 * u(rng)}, D{100 * u(rng), 100 * u(rng)}, c.p);
    c.p[1 + i % 2] += D{u(rng), u(rng)} * (std::pow(10.0, -2 - i % 11) * Size(c.p));
    curves.push_back(c);
  }
  for (const FamilyCurve& c : curves) {
    const double ref = ReferenceLength(c.p);
    ASSERT_NEAR(LengthOf(c.p, 10), ref, 1e-9 * ref) << "kind " << int(c.kind);
    ASSERT_NEAR(LengthOf(c.p, 2), ref, 1e-2 * ref) << "kind " << int(c.kind);
    EXPECT_TRUE(ref != 0 || LengthOf(c.p, 10) == 0.0);
  }
}

TEST(BezierLength, PartsAddUpAndTheRelativeParameterInvertsThem) {
  std::mt19937 rng(3);
  std::uniform_real_distribution<double> u(0, 1);
  for (const FamilyCurve& c : RandomCurves(600, 11)) {
    const double whole = Length(c.p, 10), t = u(rng);
    EXPECT_NEAR(LengthTo(t, c.p) + LengthFrom(t, c.p), whole, 2e-9 * whole);
    EXPECT_NEAR(LengthTo(t, c.p), ReferenceLength(c.p, 0, t), 1e-9 * whole);
    const PowerBasis q = GetPowerBasis(c.p);
    for (double f : {0.0, 0.1, u(rng), 0.5, 0.9, 1.0}) {
      const double s = GetCurveRelativeLengthParameter(f, q.a, q.b, q.c, 10);
      ASSERT_TRUE(s >= 0 && s <= 1);
      if (whole == 0) {
        EXPECT_EQ(s, f);  // every parameter is the same point
      } else {
        EXPECT_NEAR(ReferenceLength(c.p, 0, s), f * whole, 1e-9 * whole) << int(c.kind);
      }
    }
  }
  const V p[4] = {{0, 0}, {1, 2}, {3, 2}, {4, 0}};
  EXPECT_EQ(LengthTo(-1.0, p), 0.0);
  EXPECT_DOUBLE_EQ(LengthTo(2.0, p), Length(p, 10));
}

TEST(BezierLength, IntegerPointsExtremeScalesAndBadInput) {
  const POINT ip[4] = {{0, 0}, {100, 250}, {400, -30}, {500, 100}};
  const V dp[4] = {{0, 0}, {100, 250}, {400, -30}, {500, 100}};
  EXPECT_EQ(Length(ip, 10), Length(dp, 10));
  EXPECT_EQ(LengthFrom(0.3, ip), LengthFrom(0.3, dp));
  const double ref = ReferenceLength(dp);
  for (double scale : {1e-150, 1e150}) {
    const V s[4] = {dp[0] * scale, dp[1] * scale, dp[2] * scale, dp[3] * scale};
    EXPECT_NEAR(Length(s, 10) / scale, ref, 1e-9 * ref);
  }
  for (const Curve& bad : {kBadCurves[0], kBadCurves[1]}) {
    EXPECT_EQ(Length(bad.data(), 10), 0.0);
    EXPECT_EQ(Length(bad.data(), 2), 0.0);
    EXPECT_EQ(LengthTo(0.5, bad.data()), 0.0);
  }
  EXPECT_EQ(LengthFrom(kNaN, dp), 0.0);
  EXPECT_EQ(Length(static_cast<const V*>(nullptr), 10), 0.0);
  const PowerBasis q = GetPowerBasis(dp);
  EXPECT_EQ(GetCurveRelativeLengthParameter(kNaN, q.a, q.b, q.c), 0.0);
  EXPECT_EQ(GetCurveRelativeLengthParameter(0.5, V{kNaN, 0}, q.b, q.c), 0.0);
  EXPECT_EQ(Length(q.a, q.b, q.c, -5), Length(q.a, q.b, q.c, 1));  // accuracies clamp to 1..13
  EXPECT_NEAR(Length(q.a, q.b, q.c, 99), ref, 1e-12 * ref);
}

}  // namespace
