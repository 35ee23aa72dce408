#include "ostracrv/math/bezier_length.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <limits>

#include "math/eval_test_curves.h"
#include "ostracrv/math/bezier_basis.h"

namespace {

using namespace MavikMath;
using namespace MavikMath::CubicBezier;
using Framework::common_types::POINT;
using evaltest::Curve;
using evaltest::ReferenceLength;

double LengthOf(const V* p, int accuracy) {
  const PowerBasis q = GetPowerBasis(p);
  return Length(q.a, q.b, q.c, accuracy);
}

TEST(BezierLength, KnownShapes) {
  const V straight[4] = {{0, 0}, {1, 0}, {2, 0}, {3, 0}};
  EXPECT_NEAR(LengthOf(straight, 10), 3.0, 1e-13);
  // A straight segment with uneven handles: same trace, length of the chord.
  const V uneven[4] = {{0, 0}, {2.5, 0}, {2.9, 0}, {3, 0}};
  EXPECT_NEAR(LengthOf(uneven, 10), 3.0, 1e-12);
  const double r = 100.0, k = 0.5522847498 * r;
  const V quarter[4] = {{r, 0}, {r, k}, {k, r}, {0, r}};
  EXPECT_NEAR(LengthOf(quarter, 10), M_PI * r / 2, 1e-3 * r);
  // A line that runs out and back: twice the distance to the turning point.
  const V back[4] = {{0, 0}, {3, 0}, {3, 0}, {0, 0}};
  EXPECT_NEAR(LengthOf(back, 10), 2 * 2.25, 1e-12);
  const V point[4] = {{5, 5}, {5, 5}, {5, 5}, {5, 5}};
  EXPECT_EQ(LengthOf(point, 10), 0.0);
}

// Accuracy 10 against adaptive Simpson to 1e-14 on every family, accuracy 2
// within its one percent.
TEST(BezierLength, MatchesReferenceOnAllFamilies) {
  const auto curves = evaltest::RandomCurves(3000, 7);
  double worst = 0.0, worstEstimate = 0.0;
  for (const Curve& c : curves) {
    const double ref = ReferenceLength(c.p);
    const double precise = LengthOf(c.p, 10), estimate = LengthOf(c.p, 2);
    if (ref == 0.0) {
      EXPECT_EQ(precise, 0.0);
      EXPECT_EQ(estimate, 0.0);
      continue;
    }
    worst = std::max(worst, std::fabs(precise - ref) / ref);
    worstEstimate = std::max(worstEstimate, std::fabs(estimate - ref) / ref);
    ASSERT_LE(std::fabs(precise - ref), 1e-9 * ref) << "kind " << int(c.kind);
    ASSERT_LE(std::fabs(estimate - ref), 1e-2 * ref) << "kind " << int(c.kind);
  }
  char text[64];
  std::snprintf(text, sizeof text, "%.3g / %.3g", worst, worstEstimate);
  RecordProperty("worst_relative_error_10_and_2", text);
}

// Cusps opened by every amount: the speed's sharp bend shrinks with the
// opening, down to a parameter width of about 1e-12.
TEST(BezierLength, NearCuspsOfEveryDepth) {
  std::mt19937 rng(9);
  std::uniform_real_distribution<double> u(-1.0, 1.0), t0(0.05, 0.95);
  for (int i = 0; i < 400; ++i) {
    V p[4];
    evaltest::MakeCusp(V{100 * u(rng), 100 * u(rng)}, t0(rng), D{100 * u(rng), 100 * u(rng)},
                       D{100 * u(rng), 100 * u(rng)}, p);
    const double opening = std::pow(10.0, -2.0 - i % 11) * evaltest::Size(p);
    p[1 + i % 2].x += opening * u(rng);
    p[1 + i % 2].y += opening * u(rng);
    const double ref = ReferenceLength(p);
    ASSERT_NEAR(LengthOf(p, 10), ref, 1e-9 * ref) << i;
    ASSERT_NEAR(LengthOf(p, 2), ref, 1e-2 * ref) << i;
  }
}

TEST(BezierLength, PartsAddUpAndMatchReference) {
  const auto curves = evaltest::RandomCurves(600, 11);
  std::mt19937 rng(3);
  std::uniform_real_distribution<double> u(0.0, 1.0);
  for (const Curve& c : curves) {
    const double whole = Length(c.p, 10);
    const double t = u(rng);
    const double to = LengthTo(t, c.p), from = LengthFrom(t, c.p);
    EXPECT_NEAR(to + from, whole, 2e-9 * whole + 1e-300);
    EXPECT_NEAR(to, ReferenceLength(c.p, 0.0, t), 1e-9 * whole + 1e-300);
  }
  const V p[4] = {{0, 0}, {1, 2}, {3, 2}, {4, 0}};
  EXPECT_EQ(LengthTo(-1.0, p), 0.0);
  EXPECT_DOUBLE_EQ(LengthTo(2.0, p), Length(p, 10));
  EXPECT_DOUBLE_EQ(LengthFrom(0.0, p), Length(p, 10));
}

TEST(BezierLength, RelativeParameterInvertsLengthTo) {
  const auto curves = evaltest::RandomCurves(600, 13);
  std::mt19937 rng(5);
  std::uniform_real_distribution<double> u(0.0, 1.0);
  for (const Curve& c : curves) {
    const PowerBasis q = GetPowerBasis(c.p);
    const double whole = ReferenceLength(c.p);
    for (double f : {0.0, 0.1, u(rng), 0.5, u(rng), 0.9, 1.0}) {
      const double t = GetCurveRelativeLengthParameter(f, q.a, q.b, q.c, 10);
      ASSERT_GE(t, 0.0);
      ASSERT_LE(t, 1.0);
      if (whole == 0.0) {
        EXPECT_EQ(t, f);
        continue;
      }
      EXPECT_NEAR(ReferenceLength(c.p, 0.0, t), f * whole, 1e-9 * whole) << "kind " << int(c.kind);
    }
    // Monotone in the fraction.
    double previous = -1.0;
    for (int i = 0; i < 20; ++i) {
      const double t = GetCurveRelativeLengthParameter(i / 20.0, q.a, q.b, q.c, 10);
      if (whole > 0.0) {
        EXPECT_GE(t, previous);
      }
      previous = t;
    }
  }
}

TEST(BezierLength, IntegerCurvesAndExtremeScales) {
  const POINT ip[4] = {{0, 0}, {100, 250}, {400, -30}, {500, 100}};
  const V dp[4] = {{0, 0}, {100, 250}, {400, -30}, {500, 100}};
  EXPECT_EQ(Length(ip, 10), Length(dp, 10));
  EXPECT_EQ(LengthTo(0.3, ip), LengthTo(0.3, dp));
  const double ref = ReferenceLength(dp);
  for (double scale : {1e-150, 1e150}) {
    V s[4];
    for (int i = 0; i < 4; ++i) s[i] = V{dp[i].x * scale, dp[i].y * scale};
    EXPECT_NEAR(Length(s, 10) / scale, ref, 1e-9 * ref);
  }
}

TEST(BezierLength, BadInputGivesZero) {
  const double nan = std::numeric_limits<double>::quiet_NaN(), inf = std::numeric_limits<double>::infinity();
  const V bad[4] = {{0, 0}, {nan, 1}, {2, 2}, {3, 0}};
  const V huge[4] = {{0, 0}, {inf, 1}, {2, 2}, {3, 0}};
  const V good[4] = {{0, 0}, {1, 1}, {2, 1}, {3, 0}};
  EXPECT_EQ(Length(bad, 10), 0.0);
  EXPECT_EQ(Length(huge, 2), 0.0);
  EXPECT_EQ(LengthTo(0.5, bad), 0.0);
  EXPECT_EQ(LengthFrom(nan, good), 0.0);
  EXPECT_EQ(Length(static_cast<const V*>(nullptr), 10), 0.0);
  const PowerBasis q = GetPowerBasis(good);
  EXPECT_EQ(GetCurveRelativeLengthParameter(nan, q.a, q.b, q.c), 0.0);
  EXPECT_EQ(GetCurveRelativeLengthParameter(0.5, V{nan, 0}, q.b, q.c), 0.0);
  // Accuracies outside the meaningful range still work.
  EXPECT_NEAR(Length(q.a, q.b, q.c, -5), Length(q.a, q.b, q.c, 1), 0.0);
  EXPECT_NEAR(Length(q.a, q.b, q.c, 99), ReferenceLength(good), 1e-12);
}

}  // namespace
