#include "ostracrv/math/bezier_intersect.h"

#include <gtest/gtest.h>

#include "math/test_curves.h"
#include "ostracrv/math/bezier_split.h"

namespace {

using namespace testcurves;
using namespace MavikMath::CubicBezier;

struct Hits {
  std::vector<double> ta, tb;
  std::vector<V> pts;
  size_t size() const { return ta.size(); }
  bool Has(double s, double u, double eps) const {
    for (size_t k = 0; k < size(); ++k)
      if (std::fabs(ta[k] - s) < eps && std::fabs(tb[k] - u) < eps) return true;
    return false;
  }
};

template <class P>
Hits Intersect(const P* a, const P* b) {
  Hits h;
  FindBezierIntersections(a, b, h.ta, h.tb, h.pts);
  return h;
}
Hits Intersect(const Curve& a, const Curve& b) { return Intersect(a.data(), b.data()); }

// Brute-force reference: halve the larger piece while the control boxes
// overlap, down to pieces below leaf; leaves touching in both parameters
// form one hit (mean parameters, and the spread of the cluster). False if
// the node budget ran out (a near-tangent pair).
struct RefHit {
  double ta, tb, spread;
};
bool IntersectRef(const Curve& a, const Curve& b, std::vector<RefHit>& hits, double leaf = 1e-11, long budget = 400000) {
  struct Piece {
    Curve p;
    double t0, t1;
    void Box(double& lx, double& hx, double& ly, double& hy) const {
      lx = std::min({p[0].x, p[1].x, p[2].x, p[3].x}), hx = std::max({p[0].x, p[1].x, p[2].x, p[3].x});
      ly = std::min({p[0].y, p[1].y, p[2].y, p[3].y}), hy = std::max({p[0].y, p[1].y, p[2].y, p[3].y});
    }
    void Halve(Piece& l, Piece& r) const {
      auto mid = [](V x, V y) { return V{(x.x + y.x) / 2, (x.y + y.y) / 2}; };
      const V q0 = mid(p[0], p[1]), q1 = mid(p[1], p[2]), q2 = mid(p[2], p[3]), r0 = mid(q0, q1), r1 = mid(q1, q2), s = mid(r0, r1);
      l = Piece{{p[0], q0, r0, s}, t0, 0.5 * (t0 + t1)};
      r = Piece{{s, r1, q2, p[3]}, 0.5 * (t0 + t1), t1};
    }
  };
  std::vector<std::pair<double, double>> leaves;
  std::vector<std::pair<Piece, Piece>> stack{{Piece{a, 0, 1}, Piece{b, 0, 1}}};
  for (long nodes = 0; !stack.empty(); ++nodes) {
    if (nodes > budget) return false;
    auto [pa, pb] = stack.back();
    stack.pop_back();
    double alx, ahx, aly, ahy, blx, bhx, bly, bhy;
    pa.Box(alx, ahx, aly, ahy);
    pb.Box(blx, bhx, bly, bhy);
    if (alx > bhx || blx > ahx || aly > bhy || bly > ahy) continue;
    const double ea = std::max(ahx - alx, ahy - aly), eb = std::max(bhx - blx, bhy - bly);
    if (ea < leaf && eb < leaf) {
      leaves.push_back({0.5 * (pa.t0 + pa.t1), 0.5 * (pb.t0 + pb.t1)});
      continue;
    }
    Piece l, r;
    (ea >= eb ? pa : pb).Halve(l, r);
    stack.push_back(ea >= eb ? std::pair{l, pb} : std::pair{pa, l});
    stack.push_back(ea >= eb ? std::pair{r, pb} : std::pair{pa, r});
  }
  std::vector<bool> used(leaves.size(), false);
  for (size_t i = 0; i < leaves.size(); ++i) {
    if (used[i]) continue;
    std::vector<size_t> group{i};
    used[i] = true;
    for (size_t g = 0; g < group.size(); ++g)
      for (size_t j = 0; j < leaves.size(); ++j)
        if (!used[j] && std::fabs(leaves[j].first - leaves[group[g]].first) < 1e-7 &&
            std::fabs(leaves[j].second - leaves[group[g]].second) < 1e-7)
          used[j] = true, group.push_back(j);
    double sa = 0, sb = 0, lo = 1, hi = 0, ulo = 1, uhi = 0;
    for (size_t k : group) {
      sa += leaves[k].first, sb += leaves[k].second;
      lo = std::min(lo, leaves[k].first), hi = std::max(hi, leaves[k].first);
      ulo = std::min(ulo, leaves[k].second), uhi = std::max(uhi, leaves[k].second);
    }
    hits.push_back(RefHit{sa / group.size(), sb / group.size(), std::max(hi - lo, uhi - ulo)});
  }
  return true;
}

// Unit tangent cross product at a crossing: how transversal it is.
double SinAngle(const Curve& a, double s, const Curve& b, double u) {
  const D da = Velocity(a.data(), s), db = Velocity(b.data(), u);
  return std::fabs(Cross(da, db)) / (da.Length() * db.Length() + 1e-300);
}

// A random curve of one of the shapes that stress a search: general
// (often looped), a loop built to order, a cusp, a straight curve that may
// fold back, handles lying on their end points.
Curve Shape(std::mt19937& rng, int kind) {
  std::uniform_real_distribution<double> f(-0.5, 1.5);
  Curve c = RandomCurve(rng);
  switch (kind) {
    case 1: return LoopThrough(rng, 0.25, 0.75);
    case 2: return RandomCusp(rng, 0.5);
    case 3: for (int k : {1, 2}) c[k] = MavikMath::Lerp(c[0], c[3], f(rng)); return c;
    case 4: c[1] = c[0], c[2] = c[3]; return c;
    default: return c;
  }
}

// Every transversal crossing of random pairs, against brute-force box
// subdivision to 1e-13 of the curves' size: same count, parameters within
// 1e-9, positions on both curves; the same far from the origin to the
// precision left there. Pairs with a near-tangent or near-double crossing
// are skipped, since there the reference cannot resolve them.
TEST(BezierIntersect, RandomPairsMatchSubdivision) {
  std::mt19937 rng(1234);
  int compared = 0, crossings = 0;
  for (int i = 0; i < 2500; ++i) {
    const Curve a = Shape(rng, i < 1500 ? 0 : i % 5), b = RandomCurve(rng);
    std::vector<RefHit> ref;
    if (!IntersectRef(a, b, ref)) continue;
    bool clean = true;
    for (size_t x = 0; x < ref.size(); ++x) {
      clean = clean && ref[x].spread < 1e-8 && SinAngle(a, ref[x].ta, b, ref[x].tb) > 1e-3;
      for (size_t y = x + 1; y < ref.size(); ++y)
        clean = clean && (std::fabs(ref[x].ta - ref[y].ta) > 1e-4 || std::fabs(ref[x].tb - ref[y].tb) > 1e-4);
    }
    if (!clean) continue;
    ++compared;
    crossings += int(ref.size());
    const Hits h = Intersect(a, b);
    ASSERT_EQ(h.size(), ref.size()) << "pair " << i;
    for (const auto& r : ref) EXPECT_TRUE(h.Has(r.ta, r.tb, 1e-9)) << "pair " << i << " crossing " << r.ta << ", " << r.tb;
    for (size_t k = 0; k < h.size(); ++k) {
      EXPECT_TRUE(k == 0 || h.ta[k - 1] <= h.ta[k]);
      EXPECT_LT(MavikMath::Distance(At(a, h.ta[k]), h.pts[k]), 1e-9);
      EXPECT_LT(MavikMath::Distance(At(b, h.tb[k]), h.pts[k]), 1e-9);
    }
    EXPECT_EQ(DoBeziersIntersect(a.data(), b.data()), !ref.empty()) << i;
    Curve fa = a, fb = b;
    for (auto* c : {&fa, &fb})
      for (auto& p : *c) p = V{p.x + 3e6, p.y - 7e6};
    const Hits far = Intersect(fa, fb);
    ASSERT_EQ(far.size(), h.size()) << i;
    for (size_t k = 0; k < h.size(); ++k) EXPECT_NEAR(far.ta[k] + far.tb[k], h.ta[k] + h.tb[k], 1e-6);
  }
  EXPECT_GT(compared, 2000);
  EXPECT_GT(crossings, 1200);
}

// Identical, reversed, contained and partly shared curves: the ends of the
// shared stretch (both branches of a loop may cross a piece once more).
TEST(BezierIntersect, CoincidentCurvesGiveStretchEnds) {
  std::mt19937 rng(5);
  for (int i = 0; i < 100; ++i) {
    const Curve c = RandomCurve(rng), r{c[3], c[2], c[1], c[0]};
    Hits h = Intersect(c, c);
    ASSERT_EQ(h.size(), 2u);
    EXPECT_TRUE(h.ta[0] == 0.0 && h.tb[0] == 0.0 && h.ta[1] == 1.0 && h.tb[1] == 1.0);
    h = Intersect(c, r);
    ASSERT_EQ(h.size(), 2u);
    EXPECT_TRUE(h.tb[0] == 1.0 && h.tb[1] == 0.0);

    Curve sub, first, second;
    Subsection(0.2, 0.7, c.data(), sub.data());
    h = Intersect(c, sub);
    ASSERT_TRUE(h.size() >= 2u && h.size() <= 4u) << i;
    EXPECT_TRUE(h.Has(0.2, 0.0, 1e-7) && h.Has(0.7, 1.0, 1e-7)) << i;
    Subsection(0.0, 0.6, c.data(), first.data());
    Subsection(1.0, 0.4, c.data(), second.data());  // reversed
    h = Intersect(first, second);
    ASSERT_TRUE(h.size() >= 2u && h.size() <= 4u) << i;
    EXPECT_TRUE(h.Has(0.4 / 0.6, 1.0, 1e-7) && h.Has(1.0, 0.4 / 0.6, 1e-7)) << i;
  }
}

// A shared stretch of a looped curve, and the loop's branch crossing it.
TEST(BezierIntersect, SharedStretchAndLoopCrossing) {
  // Crosses itself at t = 0.5 -+ sqrt(3/7) / 2.
  const Curve c{V{0, 0}, V{150, 100}, V{-50, 100}, V{100, 0}};
  const double s = 0.5 - std::sqrt(3.0 / 7) / 2, t = 0.5 + std::sqrt(3.0 / 7) / 2;
  Curve a, b;
  Subsection(0.0, 0.5, c.data(), a.data());
  Subsection(0.4, 1.0, c.data(), b.data());
  const Hits h = Intersect(a, b);
  ASSERT_EQ(h.size(), 3u);
  EXPECT_NEAR(h.ta[0], s / 0.5, 1e-9);
  EXPECT_NEAR(h.tb[0], (t - 0.4) / 0.6, 1e-9);
  EXPECT_TRUE(h.Has(0.8, 0.0, 1e-7) && h.Has(1.0, 0.1 / 0.6, 1e-7));
}

// Two straight curves on one line: the ends of the common part.
TEST(BezierIntersect, CollinearStraightCurves) {
  const Curve a{V{0, 0}, V{3, 3}, V{6, 6}, V{10, 10}}, b{V{5, 5}, V{8, 8}, V{12, 12}, V{20, 20}};
  Hits h = Intersect(a, b);
  ASSERT_EQ(h.size(), 2u);
  EXPECT_NEAR(h.pts[0].x, 5, 1e-9);
  EXPECT_NEAR(h.tb[0], 0, 1e-9);
  EXPECT_NEAR(h.pts[1].x, 10, 1e-9);
  EXPECT_NEAR(h.ta[1], 1, 1e-9);
  const Curve apart{V{11, 11}, V{12, 12}, V{13, 13}, V{14, 14}}, touching{V{10, 10}, V{12, 12}, V{13, 13}, V{14, 14}};
  EXPECT_EQ(Intersect(a, apart).size(), 0u);
  EXPECT_FALSE(DoBeziersIntersect(a.data(), apart.data()));
  h = Intersect(a, touching);
  ASSERT_EQ(h.size(), 1u);
  EXPECT_TRUE(h.Has(1.0, 0.0, 1e-9));
}

// Contacts, near-coincidence, smooth joints and degenerate curves end in a
// small, sensible answer.
TEST(BezierIntersect, DegenerateInputsAreBounded) {
  // Two parabolas touching at the origin.
  const Curve up{V{-1, 1}, V{-1.0 / 3, -1.0 / 3}, V{1.0 / 3, -1.0 / 3}, V{1, 1}};
  const Curve down{V{-1, -1}, V{-1.0 / 3, 1.0 / 3}, V{1.0 / 3, 1.0 / 3}, V{1, -1}};
  Hits h = Intersect(up, down);
  ASSERT_EQ(h.size(), 1u);
  EXPECT_NEAR(h.ta[0], 0.5, 1e-5);
  EXPECT_NEAR(h.pts[0].x, 0.0, 1e-5);
  EXPECT_TRUE(DoBeziersIntersect(up.data(), down.data()));

  std::mt19937 rng(8);
  std::uniform_real_distribution<double> off(-1.0, 1.0);
  for (int i = 0; i < 60; ++i) {
    const Curve c = RandomCurve(rng);
    for (double eps : {1e-13, 1e-9, 1e-6, 1e-3}) {
      Curve d = c;
      for (auto& p : d) p = V{p.x + eps * off(rng), p.y + eps * off(rng)};
      h = Intersect(c, d);
      EXPECT_LE(h.size(), 9u) << i << " " << eps;
      for (size_t k = 0; k < h.size(); ++k) EXPECT_TRUE(h.ta[k] >= 0.0 && h.ta[k] <= 1.0 && std::isfinite(h.pts[k].x));
    }
    // A smooth joint: b continues a's end tangent; they meet there.
    Curve a2, b2;
    Split(0.5, c.data(), a2.data(), b2.data());
    h = Intersect(a2, b2);
    ASSERT_GE(h.size(), 1u);
    EXPECT_TRUE(h.Has(1.0, 0.0, 1e-6)) << i;
  }
  const Curve& dot = kBadCurves[2];
  EXPECT_EQ(Intersect(dot, up).size(), 0u);
  EXPECT_EQ(Intersect(dot, dot).size(), 0u);
  EXPECT_FALSE(DoBeziersIntersect(dot.data(), up.data()));
}

// Integer curves give what their double copies give, and at the ends of the
// coordinate range finite, bounded results.
TEST(BezierIntersect, IntegerFormMatchesDoubles) {
  std::mt19937 rng(17);
  for (int i = 0; i < 300; ++i) {
    POINT a[4], b[4];
    Curve av, bv;
    RandomIntegerCurve(rng, 1000, a, av.data());
    RandomIntegerCurve(rng, 1000, b, bv.data());
    const Hits hi = Intersect(a, b), hv = Intersect(av, bv);
    ASSERT_EQ(hi.size(), hv.size());
    EXPECT_EQ(hi.ta, hv.ta);
    EXPECT_EQ(DoBeziersIntersect(a, b), hv.size() > 0);
  }
  const int32_t M = 2147483647, m = -2147483647 - 1;
  const POINT a[4] = {POINT{m, m}, POINT{M, m}, POINT{m, M}, POINT{M, M}};
  const POINT b[4] = {POINT{m, M}, POINT{m, m}, POINT{M, M}, POINT{M, m}};
  const Hits h = Intersect(a, b);
  EXPECT_TRUE(h.size() >= 1u && h.size() <= 9u);
  for (const V& p : h.pts) EXPECT_TRUE(p.IsFinite());
  EXPECT_EQ(Intersect(a, a).size(), 2u);
}

// Non-finite or missing input appends nothing; good input appends.
TEST(BezierIntersect, BadInputAppendsNothing) {
  const Curve good{V{0, 0}, V{10, 10}, V{20, -10}, V{30, 0}}, other{V{0, 5}, V{10, -5}, V{20, 5}, V{30, -5}};
  std::vector<double> ta{0.5}, tb{0.5};
  std::vector<V> pts{V{1, 2}};
  for (const Curve& bad : {kBadCurves[0], kBadCurves[1]}) {
    FindBezierIntersections(good.data(), bad.data(), ta, tb, pts);
    FindBezierIntersections(bad.data(), good.data(), ta, tb, pts);
    EXPECT_FALSE(DoBeziersIntersect(good.data(), bad.data()));
  }
  FindBezierIntersections(static_cast<const V*>(nullptr), good.data(), ta, tb, pts);
  EXPECT_TRUE(ta.size() == 1u && tb.size() == 1u && pts.size() == 1u);
  FindBezierIntersections(good.data(), other.data(), ta, tb, pts);
  const size_t n = ta.size() - 1;
  EXPECT_GT(n, 0u);
  FindBezierIntersections(good.data(), other.data(), ta, tb, pts);
  EXPECT_EQ(ta.size(), 1 + 2 * n);
}

}  // namespace
