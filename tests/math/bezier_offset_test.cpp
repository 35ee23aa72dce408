#include "ostracrv/math/bezier_offset.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"
#include "ostracrv/math/bezier_split.h"

using namespace testcurves;
using namespace MavikMath;
using Bez = CubicBezier::bezier2dT<V>;

namespace {

// The offset as defined: B(t) + d n(t), n the unit left normal of B'.
V TrueOffset(const V* p, double d, double t) { return At(p, t) + Velocity(p, t).Normalized().Perpendicular() * d; }

Bez ToBez(const V* c) { return Bez{{c[0], c[1], c[2], c[3]}}; }

// The callers' recursion: split where the library says, until it accepts.
struct Accepted {
  Bez source, result;
};
int OffsetRecursively(const Bez& b, double d, double tol, int depth, std::vector<Accepted>& out) {
  V r[4];
  double s = -1.0;
  if (FindBezierOffsetCurve(b.data(), r, d, tol * tol, s)) {
    out.push_back({b, ToBez(r)});
    return depth;
  }
  if (!(s > 0.0 && s < 1.0) || depth > 40) return 1000;  // gave up: not expected here
  Bez left, right;
  CubicBezier::Split(s, b.data(), left.data(), right.data());
  return std::max(OffsetRecursively(left, d, tol, depth + 1, out), OffsetRecursively(right, d, tol, depth + 1, out));
}

// Worst squared distance from the densely sampled true offset to the result.
double WorstDeviationSq(const Accepted& a, double d, int n = 300) {
  double worst = 0;
  for (int i = 0; i <= n; ++i)
    worst = std::max(worst, NearestSq(a.result.data(), TrueOffset(a.source.data(), d, double(i) / n), nullptr, n + 100));
  return worst;
}

bool Near(const std::vector<double>& set, double t, double eps) {
  for (double x : set)
    if (std::fabs(x - t) < eps) return true;
  return false;
}

}  // namespace

TEST(FindBezierOffsetCurve, AcceptedCurvesStayWithinToleranceOfTheTrueOffset) {
  std::mt19937 rng(17);
  std::uniform_real_distribution<double> u(0, 1);
  int accepted = 0;
  for (int trial = 0; trial < 120; ++trial) {
    const Bez b = ToBez(RandomCurve(rng, -100, 100).data());
    const double d = (2 * u(rng) - 1) * 60, tol = 0.01 + 2 * u(rng);
    std::vector<Bez> pieces;
    GetSegmentsToOffset(b, pieces, d, nullptr);
    for (const Bez& piece : pieces) {
      EXPECT_TRUE(IsBezierValidForOffset(piece.data(), d));
      std::vector<Accepted> out;
      ASSERT_LE(OffsetRecursively(piece, d, tol, 0, out), 40) << "trial " << trial;
      for (const Accepted& a : out) {
        ++accepted;
        ASSERT_LT(WorstDeviationSq(a, d), tol * tol) << "trial " << trial;
        // Ends are the exact offsets of the ends.
        EXPECT_LT(Distance(a.result[0], TrueOffset(a.source.data(), d, 0)), 1e-9 * (100 + std::fabs(d)));
        EXPECT_LT(Distance(a.result[3], TrueOffset(a.source.data(), d, 1)), 1e-9 * (100 + std::fabs(d)));
      }
    }
  }
  EXPECT_GT(accepted, 200);
}

TEST(FindBezierOffsetCurve, TightBendFarInsideTheDistance) {
  // A hairpin 0.04 wide whose turn happens in a sliver of its parameter: on
  // the outer side the offset swings half a circle of radius 44 there, which
  // evenly spaced samples in t would step over.
  const Bez bend{{{-4.3584326287305579, -1.1041730994096564}, {-4.3295650352003232, -1.1101970363735836},
                  {-4.3174376164979718, -1.1128485977358706}, {-4.3214877059558532, -1.1121234489850718}}};
  const double d = -44.2134, tol = 1.89341;
  std::vector<Accepted> out;
  ASSERT_LE(OffsetRecursively(bend, d, tol, 0, out), 40);
  for (const Accepted& a : out) EXPECT_LT(WorstDeviationSq(a, d, 2000), tol * tol);
}

// The side of positive distances (left of travel) is pinned by the random
// test against the true offset.
TEST(FindBezierOffsetCurve, ConcentricArcs) {
  V r[4];
  double s = -1.0;
  // A counter-clockwise quarter circle of radius 100 around the origin: the
  // offset of d lies on the circle of radius 100 - d, and beyond the centre
  // (d = 150) it runs backwards on radius 50.
  const Curve arc = QuarterArc(100);
  for (double d : {30.0, -30.0, 150.0}) {
    s = -1.0;
    ASSERT_TRUE(FindBezierOffsetCurve(arc.data(), r, d, 0.25, s)) << d;
    for (int i = 0; i <= 50; ++i) EXPECT_NEAR(At(r, i / 50.0).Length(), std::fabs(100 - d), 0.5 + 0.03);
    // Beyond the centre the offset runs against the curve.
    EXPECT_EQ(Dot(r[1] - r[0], arc[1] - arc[0]) > 0, d < 100) << d;
  }
  // Distance 0 is the curve itself.
  ASSERT_TRUE(FindBezierOffsetCurve(arc.data(), r, 0.0, 1e-6, s));
  for (int i = 0; i < 4; ++i) EXPECT_EQ(r[i], arc[i]);
}

TEST(GetSegmentsToOffset, CutsAtInflectionsAndWhereTheRadiusEqualsTheDistance) {
  // Also: the whole curve is valid for offset exactly when its offset has no
  // fold inside.
  std::mt19937 rng(23);
  std::uniform_real_distribution<double> u(0, 1);
  int cuts = 0;
  for (int trial = 0; trial < 250; ++trial) {
    const Bez b = ToBez(RandomCurve(rng, -100, 100).data());
    const double d = (2 * u(rng) - 1) * 80;
    const V* p = b.data();
    // References: sign changes of cross(B', B'') and of 1 - d kappa.
    std::vector<double> ref = SignChanges([&](double t) { return Cross(Velocity(p, t), Acceleration(p, t)); });
    const std::vector<double> folds = SignChanges([&](double t) { return 1 - d * Curvature(p, t); });
    ref.insert(ref.end(), folds.begin(), folds.end());
    EXPECT_EQ(IsBezierValidForOffset(p, d), folds.empty()) << "trial " << trial;
    std::vector<Bez> pieces;
    std::vector<double> params = {-5.0};  // appended to, not cleared
    GetSegmentsToOffset(b, pieces, d, &params);
    ASSERT_EQ(params.front(), -5.0);
    params.erase(params.begin());
    ASSERT_EQ(pieces.size(), params.size() + 1);
    cuts += int(params.size());
    for (double t : ref) EXPECT_TRUE(Near(params, t, 1e-7)) << "missed cut " << t << " trial " << trial;
    for (double t : params) {
      EXPECT_TRUE(t > 0 && t < 1);
      EXPECT_TRUE(Near(ref, t, 1e-7)) << "extra cut " << t << " trial " << trial;
    }
    // The pieces are the curve between the cuts, joined bit for bit.
    EXPECT_EQ(pieces.front()[0], b[0]);
    EXPECT_EQ(pieces.back()[3], b[3]);
    for (size_t i = 0; i < pieces.size(); ++i) {
      const double t0 = i == 0 ? 0 : params[i - 1], t1 = i == params.size() ? 1 : params[i];
      if (i + 1 < pieces.size()) {
        EXPECT_EQ(pieces[i][3], pieces[i + 1][0]);
      }
      EXPECT_LT(Distance(At(pieces[i].data(), 0.3), At(p, t0 + 0.3 * (t1 - t0))), 1e-9 * 100);
    }
  }
  EXPECT_GT(cuts, 250);
}

TEST(GetSegmentsToOffset, CutsAtCuspsAndStraightTurnarounds) {
  std::mt19937 rng(4);
  std::uniform_real_distribution<double> u(0.2, 0.8);
  for (int trial = 0; trial < 50; ++trial) {
    const double t0 = u(rng);
    const Curve cusp = RandomCusp(rng, t0);
    const V* p = cusp.data();
    for (double d : {0.0, 7.0}) {
      std::vector<Bez> pieces;
      std::vector<double> params;
      GetSegmentsToOffset(ToBez(p), pieces, d, &params);
      EXPECT_TRUE(Near(params, t0, 1e-6)) << "trial " << trial;
      EXPECT_FALSE(IsBezierValidForOffset(p, d));
      for (const Bez& piece : pieces) EXPECT_TRUE(IsBezierValidForOffset(piece.data(), d));
    }
  }
  // A straight Bezier that runs back: cut where x' = 0; each piece offsets to
  // the left of its own direction of travel.
  const Bez back{{{0, 0}, {30, 0}, {-10, 0}, {20, 0}}};
  std::vector<Bez> pieces;
  std::vector<double> params;
  GetSegmentsToOffset(back, pieces, 5.0, &params);
  // x'(t)/3 = 30 (1-t)^2 - 80 (1-t) t + 30 t^2 = 140 t^2 - 140 t + 30.
  const double r = std::sqrt(140.0 * 140 - 4 * 140 * 30) / 280;
  ASSERT_EQ(params.size(), 2u);
  EXPECT_NEAR(params[0], 0.5 - r, 1e-9);
  EXPECT_NEAR(params[1], 0.5 + r, 1e-9);
  for (const Bez& piece : pieces) {
    V res[4];
    double s = -1.0;
    ASSERT_TRUE(FindBezierOffsetCurve(piece.data(), res, 5.0, 1e-4, s));
    const double expected = piece[3].x > piece[0].x ? 5.0 : -5.0;
    for (const V& q : res) EXPECT_NEAR(q.y, expected, 1e-6);
  }
}

TEST(BezierOffset, BadInputGivesNoResult) {
  const V good[4] = {{0, 0}, {10, 10}, {20, 10}, {30, 0}}, sentinel{-3, -3};
  auto expectNothing = [&](const V* p, double d, double tol2) {
    V r[4] = {sentinel, sentinel, sentinel, sentinel};
    double s = -1.0;
    EXPECT_FALSE(FindBezierOffsetCurve(p, r, d, tol2, s));
    EXPECT_EQ(s, -1.0);
    for (const V& q : r) EXPECT_EQ(q, sentinel);
    EXPECT_FALSE(p && tol2 > 0 && IsBezierValidForOffset(p, d));
  };
  for (const Curve& p : kBadCurves) {
    expectNothing(p.data(), 3.0, 0.01);
    std::vector<Bez> pieces(1);
    std::vector<double> params(2, 0.5);
    GetSegmentsToOffset(ToBez(p.data()), pieces, 3.0, &params);
    EXPECT_TRUE(pieces.size() == 1u && params.size() == 2u);
  }
  for (double d : {kNaN, kInf}) expectNothing(good, d, 0.01);
  for (double tol2 : {0.0, -1.0, kNaN}) expectNothing(good, 3.0, tol2);
  expectNothing(nullptr, 3.0, 0.01);
  double s = -1.0;
  EXPECT_FALSE(FindBezierOffsetCurve(good, nullptr, 3.0, 0.01, s));
  EXPECT_FALSE(IsBezierValidForOffset(nullptr, 3.0));
}

TEST(FindBezierOffsetCurve, UnreachableToleranceFarFromTheOriginStillEnds) {
  // Rounding of coordinates near 1e9 is ~1e-7: a tolerance of 1e-9 cannot be
  // met and is raised to the noise floor instead of splitting forever.
  const V far[4] = {{1e9, 1e9}, {1e9 + 40, 1e9 + 90}, {1e9 + 120, 1e9 + 60}, {1e9 + 100, 1e9}};
  std::vector<Accepted> out;
  EXPECT_LE(OffsetRecursively(ToBez(far), 10.0, 1e-9, 0, out), 40);
  EXPECT_FALSE(out.empty());
}
