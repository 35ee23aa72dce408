#include "ostracrv/math/bezier_map.h"

#include <gtest/gtest.h>

#include <cmath>

#include "math/eval_test_curves.h"

namespace {

using namespace MavikMath;
using namespace MavikMath::CubicBezier;
using evaltest::At;

// The parameter at a fraction of the reference length, by bisection.
double ReferenceParameter(const V* p, double fraction) {
  const double target = fraction * evaltest::ReferenceLength(p);
  double lo = 0, hi = 1;
  for (int i = 0; i < 60; ++i) {
    const double m = 0.5 * (lo + hi);
    (evaltest::ReferenceLength(p, 0, m) < target ? lo : hi) = m;
  }
  return 0.5 * (lo + hi);
}

TEST(MapToBezier, PlacesByArcLengthAndLeftNormalDistance) {
  for (const evaltest::Curve& c : evaltest::RandomCurves(120, 17)) {
    if (c.kind != evaltest::Kind::Ordinary && c.kind != evaltest::Kind::CrossedHandles) continue;
    const double size = evaltest::Size(c.p);
    for (double f : {0.0, 0.25, 0.6, 1.0}) {
      const double t = ReferenceParameter(c.p, f);
      const V on = At(c.p, t);
      EXPECT_LT(Distance(MapToBezier(c.p, f, 0.0, 0.0), on), 1e-7 * size);
      const D v = evaltest::Velocity(c.p, t);
      if (v.Length() < 1e-3 * size) continue;
      for (double h : {-0.3 * size, 0.2 * size}) {
        const V m = MapToBezier(c.p, f, h, 0.1 * size);
        const D off = m - on;
        EXPECT_NEAR(off.Length(), std::fabs(h + 0.1 * size), 1e-7 * size);
        EXPECT_NEAR(Dot(off, v) / v.Length(), 0.0, 1e-7 * size);
        EXPECT_EQ(Cross(v, off) > 0, h + 0.1 * size > 0);  // left for positive
      }
    }
  }
}

TEST(MapToBezier, StraightStrokeAndOutsideTheRange) {
  const V line[4] = {{0, 0}, {50, 0}, {250, 0}, {300, 0}};  // uneven handles
  const V m = MapToBezier(line, 0.5, 10.0, 0.0);
  EXPECT_NEAR(m.x, 150.0, 1e-7);
  EXPECT_NEAR(m.y, 10.0, 1e-9);
  const V past = MapToBezier(line, 1.1, -5.0, 0.0);
  EXPECT_NEAR(past.x, 330.0, 1e-7);
  EXPECT_NEAR(past.y, -5.0, 1e-9);
  const V before = MapToBezier(line, -0.1, 0.0, 2.0);
  EXPECT_NEAR(before.x, -30.0, 1e-7);
  EXPECT_NEAR(before.y, 2.0, 1e-9);
  const V dot[4] = {{4, 4}, {4, 4}, {4, 4}, {4, 4}};
  EXPECT_EQ(MapToBezier(dot, 0.5, 10.0, 1.0), (V{4, 4}));
  EXPECT_EQ(MapToBezier(line, std::nan(""), 1.0, 1.0), line[0]);
  EXPECT_EQ(MapToBezier(nullptr, 0.5, 1.0, 1.0), (V{0, 0}));
}

}  // namespace
