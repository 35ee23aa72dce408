#include "ostracrv/math/bezier_flatten.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

#include "math/test_curves.h"
#include "ostracrv/math/rect.h"

namespace {

using namespace testcurves;
using namespace MavikMath;
using Framework::common_types::RECT;

// Largest distance from the curve to its chords, piece by piece: the curve
// between ts[k] and ts[k + 1] against the chord poly[k] - poly[k + 1].
template <class T>
double PieceDeviation(const V* p, const T* poly, const std::vector<double>& ts) {
  double worst = 0;
  for (std::size_t k = 0; k + 1 < ts.size(); ++k)
    for (int i = 0; i <= 64; ++i)
      worst = std::max(worst, SegmentDistance(At(p, ts[k] + (ts[k + 1] - ts[k]) * i / 64), ToV(poly[k]), ToV(poly[k + 1])));
  return worst;
}

// For each vertex in turn, the first parameter after the previous one where
// the curve passes through it (within 1e-9 of its size); empty if a vertex
// is off the curve or out of order.
std::vector<double> VertexParameters(const V* p, const V* poly, int count) {
  const double size = std::max(Size(p), 1e-300), h = 1e-4;
  double speed = 0;
  for (int i = 0; i < 3; ++i) speed = std::max(speed, 3 * Distance(p[i], p[i + 1]));
  std::vector<double> ts = {0.0};
  for (int k = 1; k < count; ++k) {
    bool found = false;
    for (double t = ts.back(); t <= 1 + h && !found; t += h) {
      if (Distance(At(p, std::min(t, 1.0)), poly[k]) > speed * h * 1.01 + 1e-12 * size) continue;
      const double at = GoldenMin([&](double u) { return Distance(At(p, u), poly[k]); }, std::max(ts.back(), t - h), std::min(1.0, t + h));
      if ((found = Distance(At(p, at), poly[k]) <= 1e-9 * size)) ts.push_back(at);
    }
    if (!found) return {};
  }
  return ts;
}

TEST(BezierToLines, SamplesAtEqualParameterSteps) {
  const V p[4] = {{0, 0}, {10, 40}, {50, -20}, {60, 10}};
  const POINT ip[4] = {{0, 0}, {10, 40}, {50, -20}, {60, 10}};
  std::vector<V> out(201);
  std::vector<POINT> iout(201);
  for (int lines : {16, 128, 200}) {
    ASSERT_EQ(BezierToLines(p, out.data(), lines), lines + 1);
    ASSERT_EQ(BezierToLines(ip, iout.data(), lines), lines + 1);
    EXPECT_TRUE(out[0] == p[0] && out[lines] == p[3]);
    for (int i = 0; i <= lines; ++i) {
      EXPECT_LT(Distance(out[i], At(p, double(i) / lines)), 1e-12);
      EXPECT_EQ(iout[i], FromV<POINT>(At(p, double(i) / lines)));
    }
  }
  V keep[4] = {{7, 7}};
  EXPECT_EQ(BezierToLines(p, keep, 0), 0);
  EXPECT_EQ(BezierToLines(kBadCurves[0].data(), keep, 3), 0);
  EXPECT_EQ(BezierToLines(kBadCurves[1].data(), keep, 3), 0);
  EXPECT_EQ(keep[0], (V{7, 7}));
}

TEST(AdaptiveBezierToLines, StaysWithinToleranceWithNoMoreChordsThanUniformSteps) {
  std::vector<V> out(4096);
  for (const FamilyCurve& c : RandomCurves(250, 81))
    for (double rel : {1e-1, 1e-2, 1e-3}) {
      const double tol = rel * std::max(Size(c.p), 1e-9);
      const int n = AdaptiveBezierToLines(c.p, out.data(), tol, 4096);
      ASSERT_GE(n, 2);
      EXPECT_TRUE(out[0] == c.p[0] && out[n - 1] == c.p[3]);
      const std::vector<double> ts = VertexParameters(c.p, out.data(), n);
      ASSERT_EQ(int(ts.size()), n) << "vertices off the curve or out of order, kind " << int(c.kind);
      EXPECT_LE(PieceDeviation(c.p, out.data(), ts), tol * (1 + 1e-9)) << int(c.kind);
      const double m = std::max((c.p[0] - c.p[1] * 2.0 + c.p[2]).Length(), (c.p[1] - c.p[2] * 2.0 + c.p[3]).Length());
      EXPECT_LE(n - 1, std::max(1.0, std::ceil(std::sqrt(0.75 * m / tol))));
    }
  const V line[4] = {{0, 0}, {1, 1}, {2, 2}, {3, 3}};
  EXPECT_EQ(AdaptiveBezierToLines(line, out.data(), 0.01, 100), 2);
}

TEST(AdaptiveBezierToLines, BudgetIntegerRoundingAndBadInput) {
  const V p[4] = {{0, 0}, {0, 1000}, {1000, 1000}, {1000, 0}};
  V out[8];
  const int n = AdaptiveBezierToLines(p, out, 1e-6, 8);
  EXPECT_TRUE(n >= 2 && n <= 8 && out[n - 1] == p[3]);
  const POINT ip[4] = {{0, 0}, {0, 1000}, {1000, 1000}, {1000, 0}};
  std::vector<POINT> iout(2000);
  for (double tol : {1.5, 4.0, 25.0}) {
    const int k = AdaptiveBezierToLines(ip, iout.data(), tol, 2000);
    ASSERT_GE(k, 2);
    for (int i = 0; i <= 4000; ++i) {  // every curve point near some chord
      double best = INFINITY;
      for (int s = 0; s + 1 < k; ++s) best = std::min(best, SegmentDistance(At(p, i / 4000.0), ToV(iout[s]), ToV(iout[s + 1])));
      ASSERT_LE(best, tol);
    }
    for (int i = 1; i + 1 < k; ++i) EXPECT_NE(iout[i], iout[i - 1]);  // no repeats from rounding
  }
  V keep[3] = {{9, 9}};
  for (double tol : {0.0, kNaN}) EXPECT_EQ(AdaptiveBezierToLines(p, keep, tol, 3), 0);
  EXPECT_EQ(AdaptiveBezierToLines(p, keep, 1.0, 1), 0);
  for (const Curve& bad : {kBadCurves[0], kBadCurves[1]}) EXPECT_EQ(AdaptiveBezierToLines(bad.data(), keep, 1.0, 3), 0);
  EXPECT_EQ(keep[0], (V{9, 9}));
}

TEST(CalculateNumBezierLines, UniformStepsOfThatCountMeetTheTolerance) {
  std::vector<V> out(kMaxBezierLines + 1);
  for (const FamilyCurve& c : RandomCurves(300, 91))
    for (int tol : {1, 3, 10}) {
      const V s[4] = {c.p[0] * 20.0, c.p[1] * 20.0, c.p[2] * 20.0, c.p[3] * 20.0};
      const int n = CalculateNumBezierLines(s, tol);
      ASSERT_EQ(BezierToLines(s, out.data(), n), n + 1);
      std::vector<double> ts;
      for (int i = 0; i <= n; ++i) ts.push_back(double(i) / n);
      EXPECT_LE(PieceDeviation(s, out.data(), ts), tol * (1 + 1e-9));
      const BoundsT<double> b = GetPointsBBox(s, 4);  // any curve in a box around it asks at least as many
      EXPECT_GE(CalculateNumBezierLines(RECT{int(std::floor(b.left)), int(std::ceil(b.top)), int(std::ceil(b.right)), int(std::floor(b.bottom))}, tol), n);
    }
  const V tiny[4] = {{0, 0}, {0.1, 0}, {0.2, 0.1}, {0.3, 0}}, huge[4] = {{0, 0}, {0, 1e12}, {1e12, 1e12}, {1e12, 0}};
  EXPECT_EQ(CalculateNumBezierLines(tiny, 0), 1);
  EXPECT_EQ(CalculateNumBezierLines(huge, 1), kMaxBezierLines);
  EXPECT_EQ(CalculateNumBezierLines(static_cast<const V*>(nullptr), 1), 0);
  EXPECT_EQ(CalculateNumBezierLines(RECT{10, 0, 0, 10}, 1), 1);  // empty
}

}  // namespace
