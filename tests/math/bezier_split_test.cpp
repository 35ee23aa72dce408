#include "ostracrv/math/bezier_split.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"

namespace {

using namespace testcurves;
using namespace MavikMath::CubicBezier;

// Largest distance between piece(u) and the curve at t0 + (t1 - t0) u over
// a set of u, relative to the curve's size.
double Deviation(const V* piece, const Curve& c, double t0, double t1) {
  double worst = 0;
  for (int k = 0; k <= 32; ++k) worst = std::max(worst, MavikMath::Distance(At(piece, k / 32.0), At(c, t0 + (t1 - t0) * k / 32.0)));
  return worst / 100.0;
}

// Every form of cutting reproduces the curve to 1e-12 relative, and the
// pieces share their cut points exactly.
TEST(BezierSplit, PiecesReproduceTheCurve) {
  std::mt19937 rng(21);
  std::uniform_real_distribution<double> u(0.0, 1.0);
  for (int i = 0; i < 2000; ++i) {
    const Curve c = RandomCurve(rng);
    double t1 = u(rng), t2 = u(rng);
    if (t1 > t2) std::swap(t1, t2);

    V left[4], right[4], seven[7], ten[10], out[4];
    Split(t1, c.data(), left, right);
    EXPECT_LT(Deviation(left, c, 0, t1), 1e-12);
    EXPECT_LT(Deviation(right, c, t1, 1), 1e-12);
    EXPECT_TRUE(left[3] == right[0] && left[0] == c[0] && right[3] == c[3]);
    Split(t1, c.data(), seven);
    EXPECT_TRUE(std::equal(left, left + 4, seven) && std::equal(right, right + 4, seven + 3));

    Split(t2, t1, c.data(), ten);  // unsorted parameters are sorted
    EXPECT_LT(Deviation(ten, c, 0, t1), 1e-12);
    EXPECT_LT(Deviation(ten + 3, c, t1, t2), 1e-12);
    EXPECT_LT(Deviation(ten + 6, c, t2, 1), 1e-12);
    EXPECT_EQ(ten[9], c[3]);

    LeftOf(t2, c.data(), out);
    EXPECT_LT(Deviation(out, c, 0, t2), 1e-12);
    RightOf(t2, c.data(), out);
    EXPECT_LT(Deviation(out, c, t2, 1), 1e-12);
    // Subsections, the backward one (reversed parameters) running backwards.
    for (auto [a, b] : {std::pair{t1, t2}, std::pair{0.0, t2}, std::pair{t1, 1.0}, std::pair{t2, t1}}) {
      Subsection(a, b, c.data(), out);
      EXPECT_LT(Deviation(out, c, a, b), 1e-12);
    }
  }
}

// Output arrays that are the input array.
TEST(BezierSplit, InPlace) {
  std::mt19937 rng(22);
  for (int i = 0; i < 200; ++i) {
    const Curve c = RandomCurve(rng);
    V buf[10], expectL[4], expectR[4], r[4];
    Split(0.3, c.data(), expectL, expectR);
    std::copy(c.begin(), c.end(), buf);
    Split(0.3, buf, buf, r);  // left shares storage with the input
    EXPECT_TRUE(std::equal(buf, buf + 4, expectL) && std::equal(r, r + 4, expectR));
    std::copy(c.begin(), c.end(), buf);
    Split(0.3, buf, buf);  // seven points over the input
    EXPECT_TRUE(std::equal(buf + 3, buf + 7, expectR));
    std::copy(c.begin(), c.end(), buf);
    Split(0.2, 0.6, buf, buf);
    EXPECT_LT(Deviation(buf + 3, c, 0.2, 0.6), 1e-12);
    for (auto f : {&LeftOf<V>, &RightOf<V>}) {
      std::copy(c.begin(), c.end(), buf);
      f(0.7, c.data(), r);
      f(0.7, buf, buf);
      EXPECT_TRUE(std::equal(buf, buf + 4, r));
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
  const V cv[4] = {V{-7, 3}, V{10, -21}, V{33, 40}, V{-5, 9}};
  POINT ten[10];
  V tenv[10];
  Split(0.25, 0.75, c, ten);
  Split(0.25, 0.75, cv, tenv);
  for (int k = 0; k < 10; ++k) EXPECT_EQ(ten[k], (POINT{MavikMath::RoundToInt(tenv[k].x), MavikMath::RoundToInt(tenv[k].y)}));
  EXPECT_TRUE(ten[0] == c[0] && ten[9] == c[3]);
}

}  // namespace
