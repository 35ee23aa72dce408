#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "math/search_reference.h"
#include "ostracrv/math/bezier_split.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using namespace MavikMath::CubicBezier;
using search_ref::At;
using search_ref::Curve;

// Largest distance between piece(u) and the curve at t0 + (t1 - t0) u over
// a set of u, relative to the curve's size.
double Deviation(const V* piece, const Curve& c, double t0, double t1) {
  double worst = 0;
  for (int k = 0; k <= 32; ++k) {
    const double u = k / 32.0;
    const V a = At(piece, u), b = At(c, t0 + (t1 - t0) * u);
    worst = std::max(worst, std::hypot(a.x - b.x, a.y - b.y));
  }
  return worst / 100.0;
}

// Every form of cutting reproduces the curve to 1e-12 relative, and the
// pieces share their cut points exactly.
TEST(BezierSplit, PiecesReproduceTheCurve) {
  std::mt19937 rng(21);
  std::uniform_real_distribution<double> u(0.0, 1.0);
  for (int i = 0; i < 2000; ++i) {
    const Curve c = search_ref::RandomCurve(rng);
    double t1 = u(rng), t2 = u(rng);
    if (t1 > t2) std::swap(t1, t2);

    V left[4], right[4];
    Split(t1, c.data(), left, right);
    EXPECT_LT(Deviation(left, c, 0, t1), 1e-12);
    EXPECT_LT(Deviation(right, c, t1, 1), 1e-12);
    EXPECT_EQ(left[3], right[0]);
    EXPECT_EQ(left[0], c[0]);
    EXPECT_EQ(right[3], c[3]);

    V seven[7];
    Split(t1, c.data(), seven);
    for (int k = 0; k < 4; ++k) {
      EXPECT_EQ(seven[k], left[k]);
      EXPECT_EQ(seven[3 + k], right[k]);
    }

    V ten[10];
    Split(t2, t1, c.data(), ten);  // unsorted parameters are sorted
    EXPECT_LT(Deviation(ten, c, 0, t1), 1e-12);
    EXPECT_LT(Deviation(ten + 3, c, t1, t2), 1e-12);
    EXPECT_LT(Deviation(ten + 6, c, t2, 1), 1e-12);
    EXPECT_EQ(ten[9], c[3]);

    V out[4];
    LeftOf(t2, c.data(), out);
    EXPECT_LT(Deviation(out, c, 0, t2), 1e-12);
    RightOf(t2, c.data(), out);
    EXPECT_LT(Deviation(out, c, t2, 1), 1e-12);
    Subsection(t1, t2, c.data(), out);
    EXPECT_LT(Deviation(out, c, t1, t2), 1e-12);
    Subsection(0.0, t2, c.data(), out);
    EXPECT_LT(Deviation(out, c, 0, t2), 1e-12);
    Subsection(t1, 1.0, c.data(), out);
    EXPECT_LT(Deviation(out, c, t1, 1), 1e-12);
    // Reversed parameters give the piece running backwards.
    Subsection(t2, t1, c.data(), out);
    EXPECT_LT(Deviation(out, c, t2, t1), 1e-12);
  }
}

// Output arrays that are the input array.
TEST(BezierSplit, InPlace) {
  std::mt19937 rng(22);
  for (int i = 0; i < 200; ++i) {
    const Curve c = search_ref::RandomCurve(rng);
    V buf[10];
    std::copy(c.begin(), c.end(), buf);
    V expectL[4], expectR[4];
    Split(0.3, c.data(), expectL, expectR);
    V r[4];
    Split(0.3, buf, buf, r);  // left shares storage with the input
    for (int k = 0; k < 4; ++k) EXPECT_EQ(buf[k], expectL[k]);
    for (int k = 0; k < 4; ++k) EXPECT_EQ(r[k], expectR[k]);

    std::copy(c.begin(), c.end(), buf);
    Split(0.3, buf, buf);  // seven points over the input
    for (int k = 0; k < 4; ++k) EXPECT_EQ(buf[3 + k], expectR[k]);

    std::copy(c.begin(), c.end(), buf);
    Split(0.2, 0.6, buf, buf);
    EXPECT_LT(Deviation(buf + 3, c, 0.2, 0.6), 1e-12);

    for (auto f : {&LeftOf<V>, &RightOf<V>}) {
      std::copy(c.begin(), c.end(), buf);
      V expect[4];
      f(0.7, c.data(), expect);
      f(0.7, buf, buf);
      for (int k = 0; k < 4; ++k) EXPECT_EQ(buf[k], expect[k]);
    }
    std::copy(c.begin(), c.end(), buf);
    Subsection(0.1, 0.8, buf, buf);
    EXPECT_LT(Deviation(buf, c, 0.1, 0.8), 1e-12);
  }
}

// Integer curves: pieces are the double pieces rounded half away from zero,
// with the input's own end points kept exactly.
TEST(BezierSplit, IntegerPiecesAreRounded) {
  const POINT c[4] = {POINT{-7, 3}, POINT{10, -21}, POINT{33, 40}, POINT{-5, 9}};
  V cv[4];
  for (int k = 0; k < 4; ++k) cv[k] = V{double(c[k].x), double(c[k].y)};
  POINT ten[10];
  V tenv[10];
  Split(0.25, 0.75, c, ten);
  Split(0.25, 0.75, cv, tenv);
  for (int k = 0; k < 10; ++k)
    EXPECT_EQ(ten[k], (POINT{MavikMath::RoundToInt(tenv[k].x), MavikMath::RoundToInt(tenv[k].y)}));
  EXPECT_EQ(ten[0], c[0]);
  EXPECT_EQ(ten[9], c[3]);
}

}  // namespace
