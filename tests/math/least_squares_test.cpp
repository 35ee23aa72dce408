#include "ostracrv/math/least_squares.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"

using namespace testcurves;
using namespace MavikMath;

namespace {

// A random cubic: chord of length L, handles at up to maxAngle from it with
// lengths in [hMin, hMax] L, then turned and moved anywhere.
struct Cubic {
  V p[4];
  double length;
};
Cubic RandomCubic(std::mt19937& rng, double maxAngle, double hMin, double hMax) {
  std::uniform_real_distribution<double> u(0, 1);
  const double L = 1 + 300 * u(rng), rot = 6.283 * u(rng);
  const double a1 = (2 * u(rng) - 1) * maxAngle, a2 = (2 * u(rng) - 1) * maxAngle;
  const double h1 = (hMin + (hMax - hMin) * u(rng)) * L, h2 = (hMin + (hMax - hMin) * u(rng)) * L;
  const V q[4] = {{0, 0}, {h1 * std::cos(a1), h1 * std::sin(a1)}, {L - h2 * std::cos(a2), h2 * std::sin(a2)}, {L, 0}};
  const V o{2000 * u(rng) - 1000, 2000 * u(rng) - 1000};
  Cubic c{{}, L};
  for (int k = 0; k < 4; ++k)
    c.p[k] = V{o.x + q[k].x * std::cos(rot) - q[k].y * std::sin(rot), o.y + q[k].x * std::sin(rot) + q[k].y * std::cos(rot)};
  return c;
}

std::vector<V> Sample(const V* p, int n) {
  std::vector<V> s(n);
  for (int i = 0; i < n; ++i) s[i] = At(p, double(i) / (n - 1));
  return s;
}

std::vector<double> ArcLengths(const std::vector<V>& s) {
  std::vector<double> a(s.size(), 0.0);
  for (size_t i = 1; i < s.size(); ++i) a[i] = a[i - 1] + Distance(s[i], s[i - 1]);
  return a;
}

double MaxSampleDistanceSq(const std::vector<V>& s, const V* fit) {
  double worst = 0;
  for (const V& q : s) worst = std::max(worst, NearestSq(fit, q, nullptr, 2000));
  return worst;
}

void ExpectEndsAndTangents(const std::vector<V>& s, const V* fit, const D& t1, const D& t2) {
  EXPECT_EQ(fit[0], s.front());
  EXPECT_EQ(fit[3], s.back());
  const D h1 = fit[1] - fit[0], h2 = fit[3] - fit[2];
  EXPECT_GT(Dot(h1, t1), 0.0);
  EXPECT_GT(Dot(h2, t2), 0.0);
  EXPECT_NEAR(Cross(h1, t1) / (h1.Length() * t1.Length()), 0.0, 1e-12);
  EXPECT_NEAR(Cross(h2, t2) / (h2.Length() * t2.Length()), 0.0, 1e-12);
}

}  // namespace

TEST(LeastSquares, ReproducesSampledCubicsInBothForms) {
  // The fit is a local search: on a few strongly asymmetric arcs it settles
  // in a second, nearly as good minimum. Every fit must be close and almost
  // all exact.
  std::mt19937 rng(11);
  int exact = 0;
  const int n = 300;
  for (int trial = 0; trial < n; ++trial) {
    const Cubic c = RandomCubic(rng, 0.8, 0.25, 0.45);
    const std::vector<V> s = Sample(c.p, 50);
    // Tangents of arbitrary length, in the direction of travel.
    const D t1 = (c.p[1] - c.p[0]) * 0.01, t2 = (c.p[3] - c.p[2]) * 7.0;
    V fit[4], fit2[4];
    // The short form at a caller's round count, the long form with more.
    const double e1 = LeastSquares(s.data(), int(s.size()), t1, t2, fit, 20);
    ExpectEndsAndTangents(s, fit, t1, t2);
    std::vector<double> params = ArcLengths(s);
    for (double& a : params) a += 123.0;  // any origin
    const double e2 = LeastSquares(s.data(), params.data(), int(s.size()), t1, t2, fit2, 50, nullptr, -1.0);
    ExpectEndsAndTangents(s, fit2, t1, t2);
    const double slack = 1e-20;  // squared rounding of coordinates near 1e3
    const double brute = MaxSampleDistanceSq(s, fit), loose = 1e-4 * c.length, tight = 1e-6 * c.length;
    ASSERT_LT(brute, loose * loose) << "trial " << trial;
    EXPECT_NEAR(e1, brute, 1e-6 * brute + slack);
    exact += brute < tight * tight && MaxSampleDistanceSq(s, fit2) < tight * tight;
    // The parameters come back refined: in [0, 1], ends pinned, and each
    // sample sits where the fitted curve passes.
    EXPECT_EQ(params.front(), 0.0);
    EXPECT_EQ(params.back(), 1.0);
    for (size_t i = 0; i < s.size(); ++i) EXPECT_LE(SquaredDistance(At(fit2, params[i]), s[i]), e2 * (1 + 1e-9) + slack);
  }
  EXPECT_GE(exact, n * 98 / 100);
}

TEST(LeastSquares, ErrorIsTheWorstSquaredDistanceOfASample) {
  std::mt19937 rng(3);
  std::normal_distribution<double> noise(0.0, 1.0);
  for (int trial = 0; trial < 100; ++trial) {
    const Cubic c = RandomCubic(rng, 0.8, 0.25, 0.45);
    std::vector<V> s = Sample(c.p, 30);
    for (size_t i = 1; i + 1 < s.size(); ++i) s[i] += D{noise(rng), noise(rng)} * (0.01 * c.length);
    V fit[4];
    const double e = LeastSquares(s.data(), int(s.size()), c.p[1] - c.p[0], c.p[3] - c.p[2], fit, 10);
    const double brute = MaxSampleDistanceSq(s, fit);
    EXPECT_GE(e, brute * (1 - 1e-9));
    EXPECT_NEAR(e, brute, 1e-6 * brute) << "trial " << trial;
  }
}

TEST(LeastSquares, OneOutlierSetsTheError) {
  // Samples on a line with both tangents along it: every fit stays on the
  // line, so the sample 3 units off is 3 units away (a mean would give 9/n).
  std::vector<V> s;
  for (int i = 0; i <= 20; ++i) s.push_back(V{5.0 * i, 0.0});
  s[10].y = 3.0;
  V fit[4];
  for (int rounds : {0, 1, 5, 10}) {
    const double e = LeastSquares(s.data(), int(s.size()), D{1, 0}, D{1, 0}, fit, rounds);
    EXPECT_GE(e, 9.0 - 1e-9);
    EXPECT_NEAR(e, 9.0, 1e-6);
    for (const V& q : fit) EXPECT_EQ(q.y, 0.0);
  }
}

TEST(LeastSquares, DegenerateRuns) {
  V fit[4];
  // Two samples fit exactly: handles a third of the chord along the tangents.
  const V two[2] = {{0, 0}, {9, 0}};
  EXPECT_EQ(LeastSquares(two, 2, D{0, 1}, D{0, -1}, fit, 10), 0.0);
  EXPECT_NEAR(fit[1].y, 3.0, 1e-12);
  EXPECT_NEAR(fit[2].y, 3.0, 1e-12);
  // Coincident samples give the point itself.
  const V same[5] = {{4, 4}, {4, 4}, {4, 4}, {4, 4}, {4, 4}};
  EXPECT_EQ(LeastSquares(same, 5, D{1, 0}, D{1, 0}, fit, 10), 0.0);
  for (const V& q : fit) EXPECT_EQ(q, (V{4, 4}));
  // A closed run (first sample = last) fits its loop.
  const V teardrop[4] = {{0, 0}, {120, 90}, {-120, 90}, {0, 0}};
  const std::vector<V> loop = Sample(teardrop, 30);
  const double e = LeastSquares(loop.data(), int(loop.size()), D{4, 3}, D{4, -3}, fit, 20);
  EXPECT_LT(e, 1e-10);
  EXPECT_LT(MaxSampleDistanceSq(loop, fit), 1e-10);
}

TEST(LeastSquares, EarlyStopAndBadParameters) {
  std::mt19937 rng(8);
  const Cubic c = RandomCubic(rng, 0.8, 0.25, 0.45);
  const std::vector<V> s = Sample(c.p, 25);
  const D t1 = c.p[1] - c.p[0], t2 = c.p[3] - c.p[2];
  V first[4], stopped[4], full[4];
  std::vector<double> a = ArcLengths(s), b = a, d = a;
  const double e0 = LeastSquares(s.data(), a.data(), 25, t1, t2, first, 0, nullptr, -1.0);
  // A stop error above the first solve's error stops right after it.
  const double es = LeastSquares(s.data(), b.data(), 25, t1, t2, stopped, 30, nullptr, 2 * e0 + 1);
  EXPECT_EQ(e0, es);
  for (int k = 0; k < 4; ++k) EXPECT_EQ(first[k], stopped[k]);
  const double ef = LeastSquares(s.data(), d.data(), 25, t1, t2, full, 30, nullptr, -1.0);
  EXPECT_LT(ef, e0);
  // Decreasing or NaN parameters fall back to the samples' own spacing.
  std::vector<double> bad(25, 1.0);
  bad[3] = kNaN;
  V fromBad[4];
  EXPECT_LT(LeastSquares(s.data(), bad.data(), 25, t1, t2, fromBad, 30, nullptr, -1.0), 1e-12 * c.length * c.length);
}

TEST(LeastSquares, BadInputLeavesOutputsAloneAndFailsEveryTolerance) {
  const V pts[4] = {{0, 0}, {1, 1}, {2, 1}, {3, 0}};
  const V sentinel{-7, -7};
  auto check = [&](const V* p, int count, const D& t1, const D& t2) {
    V fit[4] = {sentinel, sentinel, sentinel, sentinel};
    double params[4] = {0, 1, 2, 3};
    EXPECT_EQ(LeastSquares(p, count, t1, t2, fit, 10), kLeastSquaresNoFit);
    EXPECT_EQ(LeastSquares(p, params, count, t1, t2, fit, 10, nullptr, -1.0), kLeastSquaresNoFit);
    for (const V& q : fit) EXPECT_EQ(q, sentinel);
    EXPECT_EQ(params[1], 1.0);
  };
  check(pts, 1, D{1, 0}, D{1, 0});
  check(pts, 0, D{1, 0}, D{1, 0});
  check(nullptr, 4, D{1, 0}, D{1, 0});
  check(pts, 4, D{0, 0}, D{1, 0});
  check(pts, 4, D{1e-9, 0}, D{1, 0});  // squared length below 2^-52 is zero
  check(pts, 4, D{1, 0}, D{kNaN, 0});
  const V withNan[4] = {{0, 0}, {kNaN, 1}, {2, 1}, {3, 0}}, withInf[4] = {{0, 0}, {1, 1}, {2, kInf}, {3, 0}};
  check(withNan, 4, D{1, 0}, D{1, 0});
  check(withInf, 4, D{1, 0}, D{1, 0});
  EXPECT_FALSE(kLeastSquaresNoFit < 1e300);
}

TEST(GetLeastSquaresLines, PrincipalAxisBeatsEveryOtherDirection) {
  std::mt19937 rng(2);
  std::uniform_real_distribution<double> u(-1, 1);
  for (int trial = 0; trial < 200; ++trial) {
    // Vertical and near-vertical runs included: both axes are treated alike.
    const double angle = trial % 4 == 0 ? 1.5707963267948966 : 3.2 * u(rng);
    const D dir{std::cos(angle), std::sin(angle)};
    const V base{500 * u(rng), 500 * u(rng)};
    std::vector<V> pts;
    for (int i = 0; i < 20; ++i) pts.push_back(base + dir * (10.0 * i) + dir.Perpendicular() * u(rng));
    V origin;
    D direction;
    GetLeastSquaresLines(pts.data(), int(pts.size()), origin, direction);
    EXPECT_NEAR(direction.Length(), 1.0, 1e-12);
    EXPECT_GT(Dot(direction, pts.back() - pts.front()), 0.0);
    auto cost = [&](const D& d) {
      double sum = 0;
      for (const V& p : pts) sum += Cross(p - origin, d) * Cross(p - origin, d);
      return sum;
    };
    const double mine = cost(direction);
    for (int k = 0; k < 720; ++k) EXPECT_LE(mine, cost(D{std::cos(k * 0.00436), std::sin(k * 0.00436)}) + 1e-9);
  }
}

TEST(GetLeastSquaresLines, DegenerateAndBadInput) {
  V origin{-1, -1};
  D direction{-1, -1};
  const V one[1] = {{3, 4}}, withNan[2] = {{0, 0}, {kNaN, 1}};
  GetLeastSquaresLines(withNan, 2, origin, direction);
  GetLeastSquaresLines(one, 0, origin, direction);
  GetLeastSquaresLines(nullptr, 3, origin, direction);
  EXPECT_EQ(origin, (V{-1, -1}));
  EXPECT_EQ(direction, (D{-1, -1}));
  GetLeastSquaresLines(one, 1, origin, direction);
  EXPECT_EQ(origin, (V{3, 4}));
  EXPECT_EQ(direction, (D{0, 0}));
}
