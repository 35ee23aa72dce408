#include "ostracrv/math/bezier_flatten.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

#include "math/eval_test_curves.h"
#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/rect.h"

namespace {

using namespace MavikMath;
using Framework::common_types::POINT;
using Framework::common_types::RECT;
using evaltest::At;
using evaltest::Curve;

// Largest distance from the curve to its chord, piece by piece: the piece
// between parameters ts[k] and ts[k + 1] against the chord poly[k]-poly[k+1].
template <class T>
double PieceDeviation(const V* p, const T* poly, const std::vector<double>& ts) {
  double worst = 0.0;
  for (std::size_t k = 0; k + 1 < ts.size(); ++k)
    for (int i = 0; i <= 64; ++i) {
      const V v = At(p, ts[k] + (ts[k + 1] - ts[k]) * i / 64.0);
      worst = std::max(worst, evaltest::SegmentDistance(v, ToV(poly[k]), ToV(poly[k + 1])));
    }
  return worst;
}

// Parameters of the vertices, found in order along the curve: for each
// vertex the first parameter after the previous one at which the curve
// passes through it (to 1e-9 of the size). Empty if a vertex is off the
// curve or out of order.
std::vector<double> VertexParameters(const V* p, const V* poly, int count) {
  const double size = std::max(evaltest::Size(p), 1e-300);
  double speed = 0.0;
  for (int i = 0; i < 3; ++i) speed = std::max(speed, 3 * Distance(p[i], p[i + 1]));
  const double h = 1e-4;
  std::vector<double> ts = {0.0};
  for (int k = 1; k < count; ++k) {
    double t = ts.back();
    bool found = false;
    for (; t <= 1.0 + h && !found; t += h) {
      const double g = std::min(t, 1.0);
      if (Distance(At(p, g), poly[k]) > speed * h * 1.01 + 1e-12 * size) continue;
      // Ternary search for the nearest point around the grid point.
      double lo = std::max(ts.back(), g - h), hi = std::min(1.0, g + h);
      for (int it = 0; it < 100; ++it) {
        const double m1 = lo + (hi - lo) / 3, m2 = hi - (hi - lo) / 3;
        if (Distance(At(p, m1), poly[k]) < Distance(At(p, m2), poly[k])) hi = m2; else lo = m1;
      }
      const double best = 0.5 * (lo + hi);
      if (Distance(At(p, best), poly[k]) <= 1e-9 * size) {
        ts.push_back(best);
        found = true;
      }
    }
    if (!found) return {};
  }
  return ts;
}

// Largest distance from dense samples of the curve to the whole polyline.
template <class T>
double Deviation(const V* p, const T* poly, int count) {
  double worst = 0.0;
  for (int i = 0; i <= 2000; ++i) {
    const V v = At(p, i / 2000.0);
    double best = std::numeric_limits<double>::infinity();
    for (int s = 0; s + 1 < count; ++s) best = std::min(best, evaltest::SegmentDistance(v, ToV(poly[s]), ToV(poly[s + 1])));
    worst = std::max(worst, best);
  }
  return worst;
}

TEST(BezierToLines, SamplesAtEqualParameterSteps) {
  const V p[4] = {{0, 0}, {10, 40}, {50, -20}, {60, 10}};
  for (int lines : {16, 128, 200}) {
    std::vector<V> out(lines + 1);
    ASSERT_EQ(BezierToLines(p, out.data(), lines), lines + 1);
    EXPECT_EQ(out[0], p[0]);
    EXPECT_EQ(out[lines], p[3]);
    for (int i = 0; i <= lines; ++i) EXPECT_LT(Distance(out[i], At(p, double(i) / lines)), 1e-12);
  }
  const POINT ip[4] = {{0, 0}, {10, 40}, {50, -20}, {60, 10}};
  POINT iout[17];
  ASSERT_EQ(BezierToLines(ip, iout, 16), 17);
  for (int i = 0; i <= 16; ++i) {
    const V v = At(p, i / 16.0);
    EXPECT_EQ(iout[i].x, RoundToInt(v.x));
    EXPECT_EQ(iout[i].y, RoundToInt(v.y));
  }
  V untouched[4] = {{7, 7}, {7, 7}, {7, 7}, {7, 7}};
  const V bad[4] = {{0, 0}, {std::nan(""), 0}, {1, 1}, {2, 2}};
  EXPECT_EQ(BezierToLines(p, untouched, 0), 0);
  EXPECT_EQ(BezierToLines(bad, untouched, 3), 0);
  EXPECT_EQ(BezierToLines(static_cast<const V*>(nullptr), untouched, 3), 0);
  EXPECT_EQ(untouched[0], (V{7, 7}));
}

TEST(AdaptiveBezierToLines, StaysWithinToleranceOfTheTrueCurve) {
  std::vector<V> out(4096);
  for (const Curve& c : evaltest::RandomCurves(250, 81)) {
    const double size = evaltest::Size(c.p);
    for (double rel : {1e-1, 1e-2, 1e-3}) {
      const double tol = rel * std::max(size, 1e-9);
      const int n = AdaptiveBezierToLines(c.p, out.data(), tol, 4096);
      ASSERT_GE(n, 2);
      EXPECT_EQ(out[0], c.p[0]);
      EXPECT_EQ(out[n - 1], c.p[3]);
      const std::vector<double> ts = VertexParameters(c.p, out.data(), n);
      ASSERT_EQ(int(ts.size()), n) << "vertices off the curve or out of order, kind " << int(c.kind);
      EXPECT_LE(PieceDeviation(c.p, out.data(), ts), tol * (1 + 1e-9)) << int(c.kind);
      // No more chords than the uniform count for the same guarantee.
      const double m = std::max((c.p[0] - c.p[1] * 2.0 + c.p[2]).Length(), (c.p[1] - c.p[2] * 2.0 + c.p[3]).Length());
      EXPECT_LE(n - 1, std::max(1, int(std::ceil(std::sqrt(0.75 * m / tol)))));
    }
  }
  // A straight curve needs one chord.
  const V line[4] = {{0, 0}, {1, 1}, {2, 2}, {3, 3}};
  EXPECT_EQ(AdaptiveBezierToLines(line, out.data(), 0.01, 100), 2);
}

TEST(AdaptiveBezierToLines, RespectsTheBudgetAndIntegerRounding) {
  const V p[4] = {{0, 0}, {0, 1000}, {1000, 1000}, {1000, 0}};
  V out[8];
  const int n = AdaptiveBezierToLines(p, out, 1e-6, 8);
  EXPECT_GE(n, 2);
  EXPECT_LE(n, 8);
  EXPECT_EQ(out[n - 1], p[3]);
  // Integer output keeps the tolerance against the true curve.
  const POINT ip[4] = {{0, 0}, {0, 1000}, {1000, 1000}, {1000, 0}};
  std::vector<POINT> iout(2000);
  for (double tol : {1.5, 4.0, 25.0}) {
    const int k = AdaptiveBezierToLines(ip, iout.data(), tol, 2000);
    ASSERT_GE(k, 2);
    EXPECT_LE(Deviation(p, iout.data(), k), tol);
    for (int i = 1; i + 1 < k; ++i) EXPECT_NE(iout[i], iout[i - 1]);
  }
  // Failures write nothing.
  V keep[3] = {{9, 9}, {9, 9}, {9, 9}};
  EXPECT_EQ(AdaptiveBezierToLines(p, keep, 0.0, 3), 0);
  EXPECT_EQ(AdaptiveBezierToLines(p, keep, std::nan(""), 3), 0);
  EXPECT_EQ(AdaptiveBezierToLines(p, keep, 1.0, 1), 0);
  const V bad[4] = {{0, 0}, {std::numeric_limits<double>::infinity(), 0}, {1, 1}, {2, 2}};
  EXPECT_EQ(AdaptiveBezierToLines(bad, keep, 1.0, 3), 0);
  EXPECT_EQ(keep[0], (V{9, 9}));
}

TEST(CalculateNumBezierLines, UniformStepsOfThatCountMeetTheTolerance) {
  std::vector<V> out(kMaxBezierLines + 1);
  for (const Curve& c : evaltest::RandomCurves(300, 91)) {
    V scaled[4];
    for (int i = 0; i < 4; ++i) scaled[i] = V{c.p[i].x * 20, c.p[i].y * 20};
    for (int tol : {1, 3, 10}) {
      const int n = CalculateNumBezierLines(scaled, tol);
      ASSERT_GE(n, 1);
      ASSERT_EQ(BezierToLines(scaled, out.data(), n), n + 1);
      std::vector<double> ts;
      for (int i = 0; i <= n; ++i) ts.push_back(double(i) / n);
      EXPECT_LE(PieceDeviation(scaled, out.data(), ts), tol * (1 + 1e-9));
      // A box around the control points asks for at least as many.
      const BoundsT<double> b = GetPointsBBox(scaled, 4);
      const RECT r{int(std::floor(b.left)), int(std::ceil(b.top)), int(std::ceil(b.right)), int(std::floor(b.bottom))};
      EXPECT_GE(CalculateNumBezierLines(r, tol), n);
    }
  }
  const V tiny[4] = {{0, 0}, {0.1, 0}, {0.2, 0.1}, {0.3, 0}};
  EXPECT_EQ(CalculateNumBezierLines(tiny, 0), 1);
  const V huge[4] = {{0, 0}, {0, 1e12}, {1e12, 1e12}, {1e12, 0}};
  EXPECT_EQ(CalculateNumBezierLines(huge, 1), kMaxBezierLines);
  EXPECT_EQ(CalculateNumBezierLines(static_cast<const V*>(nullptr), 1), 0);
  EXPECT_EQ(CalculateNumBezierLines(RECT{10, 0, 0, 10}, 1), 1);  // empty
}

}  // namespace
