#include "ostracrv/math/bezier_map.h"

#include <gtest/gtest.h>

#include <cmath>

#include "math/test_curves.h"

namespace {

using namespace testcurves;
using namespace MavikMath;
using namespace MavikMath::CubicBezier;

TEST(MapToBezier, PlacesByArcLengthAndLeftNormalDistance) {
  for (const FamilyCurve& c : RandomCurves(120, 17)) {
    if (c.kind != Kind::Ordinary && c.kind != Kind::Crossed) continue;
    const double size = Size(c.p), whole = ReferenceLength(c.p);
    for (double f : {0.0, 0.25, 0.6, 1.0}) {
      double lo = 0, hi = 1;  // the parameter at that fraction, by bisection on the reference
      for (int i = 0; i < 60; ++i) {
        const double m = 0.5 * (lo + hi);
        if (ReferenceLength(c.p, 0, m) < f * whole) lo = m; else hi = m;
      }
      const V on = At(c.p, lo);
      const D v = Velocity(c.p, lo);
      EXPECT_LT(Distance(MapToBezier(c.p, f, 0, 0), on), 1e-7 * size);
      for (double h : {-0.3 * size, 0.2 * size}) {
        const D off = MapToBezier(c.p, f, h, 0.1 * size) - on;  // the offset adds to the distance
        EXPECT_NEAR(off.Length(), std::fabs(h + 0.1 * size), 1e-7 * size);
        EXPECT_NEAR(Dot(off, v) / v.Length(), 0, 1e-6 * size);
        EXPECT_EQ(Cross(v, off) > 0, h + 0.1 * size > 0);  // left for positive
      }
    }
  }
}

TEST(MapToBezier, StraightStrokeOutsideTheRangeAndBadInput) {
  const V line[4] = {{0, 0}, {50, 0}, {250, 0}, {300, 0}};  // uneven handles: length, not t, counts
  const V mid = MapToBezier(line, 0.5, 10, 0), past = MapToBezier(line, 1.1, -5, 0), before = MapToBezier(line, -0.1, 0, 2);
  EXPECT_NEAR(Distance(mid, V{150, 10}), 0, 1e-7);
  EXPECT_NEAR(Distance(past, V{330, -5}), 0, 1e-7);
  EXPECT_NEAR(Distance(before, V{-30, 2}), 0, 1e-7);
  const V dot[4] = {{4, 4}, {4, 4}, {4, 4}, {4, 4}};
  EXPECT_EQ(MapToBezier(dot, 0.5, 10, 1), (V{4, 4}));
  EXPECT_EQ(MapToBezier(line, kNaN, 1, 1), line[0]);
  EXPECT_EQ(MapToBezier(nullptr, 0.5, 1, 1), (V{0, 0}));
}

}  // namespace
