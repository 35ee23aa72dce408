#include "ostracrv/math/angles.h"

#include <gtest/gtest.h>

#include <cmath>
#include <random>

namespace {

using namespace MavikMath;

TEST(Radians, RangesAndRoundTrips) {
  std::mt19937 rng(1);
  std::uniform_real_distribution<double> u(-50, 50);
  for (int i = 0; i < 2000; ++i) {
    const double a = u(rng), n = Radians::NormalizeAngle(a), f = Radians::NormalizeFineAngle(a);
    EXPECT_TRUE(n >= 0 && n < 2 * M_PI && f > -M_PI && f <= M_PI);
    EXPECT_NEAR(std::cos(n), std::cos(a), 1e-12);  // the same direction
    EXPECT_NEAR(std::sin(f), std::sin(a), 1e-12);
    const D v = Radians::AngleToVector(a, 3.0);
    EXPECT_NEAR(v.Length(), 3.0, 1e-12);
    EXPECT_NEAR(Radians::VectorToAngle(v), f, 1e-12);
  }
  EXPECT_EQ(Radians::NormalizeAngle(2 * M_PI), 0.0);
  EXPECT_EQ(Radians::NormalizeAngle(-1e-20), 0.0);  // 2 pi - 1e-20 rounds to 2 pi
  EXPECT_EQ(Radians::NormalizeFineAngle(-M_PI), M_PI);
  EXPECT_EQ(Radians::VectorToAngle(D{-1.0, -0.0}), M_PI);
  EXPECT_EQ(Radians::VectorToAngle(D{0, 0}), 0.0);
  EXPECT_EQ(Radians::NormalizeAngle(std::nan("")), 0.0);
  EXPECT_EQ(Radians::AngleToVector(INFINITY), (D{0, 0}));
}

TEST(Degrees, SignedAngleIsCounterClockwisePositive) {
  EXPECT_NEAR(Degrees::GetFineAngle(D{1, 0}, D{-1, 0}), 180.0, 1e-12);  // the end the random turns miss
  std::mt19937 rng(2);
  std::uniform_real_distribution<double> u(-179.9, 179.9), len(1e-6, 1e6);
  for (int i = 0; i < 2000; ++i) {
    const double base = u(rng) * M_PI / 180, turn = u(rng);
    const D a = Radians::AngleToVector(base, len(rng)), b = Radians::AngleToVector(base + turn * M_PI / 180, len(rng));
    EXPECT_NEAR(Degrees::GetFineAngle(a, b), turn, 1e-9);
  }
  EXPECT_EQ(Degrees::GetFineAngle(D{0, 0}, D{1, 0}), 0.0);
  EXPECT_EQ(Degrees::GetFineAngle(D{std::nan(""), 0}, D{1, 0}), 0.0);
}

// The corner step of offsetting flattened paths reads the angle so: half of
// it sets the miter's distance along the outgoing edge, its sign the side of
// the normal; together they must give the right-hand offset corner.
TEST(TurnAngle, DrivesTheMiterOfTheRightOffset) {
  std::mt19937 rng(3);
  std::uniform_real_distribution<double> u(-1000, 1000);
  int checked = 0;
  for (int i = 0; i < 2000; ++i) {
    const V prev{u(rng), u(rng)}, corner{u(rng), u(rng)}, next{u(rng), u(rng)};
    const int a = TURNANGLE::GetFineAngle(corner, prev, next);
    ASSERT_TRUE(a > -180000000 && a <= 180000000);
    const double h = std::fabs(a / 2) / 1e6 * M_PI / 180;
    if (h < 0.05 || h > M_PI / 2 - 0.05) continue;  // nearly folded or straight
    const D out = (next - corner).Normalized(), in = (corner - prev).Normalized();
    const V miter = corner + out * (256 / std::tan(h)) + D{out.y, -out.x} * (a < 0 ? -256.0 : 256.0);
    const double sideIn = Cross(in, miter - prev), sideOut = Cross(out, miter - corner);
    EXPECT_NEAR(std::fabs(sideIn), 256, 5e-3);  // millionths of a degree quantise the angle
    EXPECT_NEAR(std::fabs(sideOut), 256, 5e-3);
    EXPECT_EQ(sideIn < 0, sideOut < 0);
    ++checked;
  }
  EXPECT_GT(checked, 1000);
  EXPECT_EQ(TURNANGLE::GetFineAngle(V{0, 0}, V{-1, 0}, V{0, -1}), 90000000);  // a right turn
  EXPECT_EQ(TURNANGLE::GetFineAngle(V{0, 0}, V{-1, 0}, V{0, 1}), -90000000);
  EXPECT_EQ(TURNANGLE::GetFineAngle(V{0, 0}, V{0, 0}, V{0, 1}), 0);
}

}  // namespace
