// Subpaths and subcurves: cutting reproduces the curve, turning and reversing
// keep the shape, and the listings agree with how the test path was built.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <set>
#include <vector>

#include "core/path_geometry.h"
#include "core/random_paths.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using OstraCrv::Polycurve;
using OstraCrv::PolycurveD;

std::vector<NODETYPE> Bytes(const PolycurveD& c) { return {c.GetNodeTypes(), c.GetNodeTypes() + c.GetPointCount()}; }
template <class C>
bool Valid(const C& c) {
  return OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount());
}
template <class C>
std::vector<std::vector<V>> Flat(const C& c, int steps = 32) {
  return testgeo::Flatten(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()), steps);
}

PolycurveD RandomCurve(std::mt19937& rng, testpaths::Path& path, int maxSubpaths = 4) {
  path = testpaths::Make(rng, maxSubpaths, 5);
  const auto pts = testgeo::PointsFor<V>(path, rng);
  return PolycurveD(pts.data(), path.nodes.data(), path.nodes.size());
}

std::multiset<std::vector<double>> SegmentSet(const PolycurveD& c) {
  return testgeo::SegmentSet(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()));
}

TEST(Reverse, BytesAndTwiceRestores) {
  const V pts[5] = {V{0, 0}, V{1, 1}, V{2, 1}, V{3, 0}, V{4, 0}};
  const NODETYPE nds[5] = {0x04, 0xC0, 0xC0, 0x84, 0x44};
  PolycurveD c(pts, nds, 5);
  c.Reverse();
  EXPECT_EQ(Bytes(c), (std::vector<NODETYPE>{0x04, 0x44, 0xC0, 0xC0, 0x84}));
  EXPECT_EQ(c.GetPoint(0), (V{4, 0}));
  EXPECT_EQ(c.GetPoint(2), (V{2, 1}));  // the arcs swapped places
  const NODETYPE lines[3] = {0x04, 0x44, 0x44};
  PolycurveD l(pts, lines, 3);
  l.Reverse();
  EXPECT_EQ(Bytes(l), (std::vector<NODETYPE>(lines, lines + 3)));

  std::mt19937 rng(31);
  for (int k = 0; k < 1000; ++k) {
    testpaths::Path path;
    const PolycurveD original = RandomCurve(rng, path);
    PolycurveD r = original;
    r.Reverse();
    ASSERT_TRUE(Valid(r)) << k;
    // Reversing keeps the length and flips the area of every closed subpath.
    const double area = testgeo::ClockwiseArea(original.GetPoints(), original.GetNodeTypes(), path.n());
    EXPECT_NEAR(testgeo::ClockwiseArea(r.GetPoints(), r.GetNodeTypes(), path.n()), -area, 1e-6 * (1 + std::fabs(area)));
    const double len = testgeo::Length(original.GetPoints(), original.GetNodeTypes(), path.n());
    EXPECT_NEAR(testgeo::Length(r.GetPoints(), r.GetNodeTypes(), path.n()), len, 1e-9 * len);
    r.Reverse();
    ASSERT_EQ(r, original) << k;
  }
}

TEST(Reverse, RangeFormTurnsOneSubpath) {
  PolycurveD c;
  c.MoveTo(V{0, 0});
  c.LineTo(V{1, 0});
  c.MoveTo(V{5, 5});
  c.CubicTo(V{6, 6}, V{7, 6}, V{8, 5});
  c.LineTo(V{5, 5});
  c.CloseLastSubpath(0.0, false);
  OstraCrv::CurveBuffer<V> b = c.GetBuffer();
  OstraCrv::Reverse(b.points, b.nodes, 6, 2);  // either order, both ends inclusive
  EXPECT_TRUE(Valid(c));
  EXPECT_EQ(Bytes(c), (std::vector<NODETYPE>{0x04, 0x44, 0x0C, 0x44, 0xC0, 0xC0, 0x88}));
  EXPECT_EQ(c.GetPoint(1), (V{1, 0}));
}

TEST(Spin, KeepsShapeCountAndClosure) {
  std::mt19937 rng(32);
  int spun = 0;
  for (int k = 0; k < 1500; ++k) {
    testpaths::Path path;
    PolycurveD c = RandomCurve(rng, path);
    const testpaths::Subpath sp = path.subpaths[rng() % path.subpaths.size()];
    if (!sp.closed) {
      const PolycurveD before = c;
      EXPECT_FALSE(c.SpinSubpath(static_cast<unsigned long>(sp.first), static_cast<unsigned long>(sp.first)));
      EXPECT_EQ(c, before);
      continue;
    }
    // A segment end of the subpath becomes its start.
    std::vector<int> ends;
    for (const auto& s : path.segments)
      if (s.end > sp.first && s.end <= sp.last) ends.push_back(s.end);
    const int node = rng() % 4 == 0 ? sp.first : ends[rng() % ends.size()];
    const PolycurveD before = c;
    ASSERT_TRUE(c.SpinSubpath(static_cast<unsigned long>(sp.last), static_cast<unsigned long>(node))) << k;
    ++spun;
    ASSERT_TRUE(Valid(c)) << k;
    ASSERT_EQ(c.GetPointCount(), before.GetPointCount());
    EXPECT_EQ(c.GetPoint(sp.first), before.GetPoint(node));
    EXPECT_EQ(c.GetPoint(sp.last), c.GetPoint(sp.first));
    EXPECT_TRUE(IsClosedNode(c.GetNodeType(sp.first)) && IsClosedNode(c.GetNodeType(sp.last)));
    EXPECT_EQ(CRV_GetUserNode(c.GetNodeTypes(), int(c.GetPointCount()), sp.last), sp.first);
    // Same shape: the same segments, only the ring starts elsewhere.
    EXPECT_EQ(SegmentSet(c), SegmentSet(before)) << k;
    // Turning back to the old start point restores the arrays.
    const int back = sp.first + (sp.last - node);
    ASSERT_TRUE(c.SpinSubpath(static_cast<unsigned long>(sp.first), static_cast<unsigned long>(back)));
    EXPECT_EQ(std::vector<V>(c.GetPoints(), c.GetPoints() + c.GetPointCount()),
              std::vector<V>(before.GetPoints(), before.GetPoints() + before.GetPointCount()));
  }
  EXPECT_GT(spun, 300);
}

TEST(Spin, AtTheFirstNodeOnlyFixesTheEndFlags) {
  const V pts[4] = {V{0, 0}, V{1, 0}, V{0, 1}, V{0, 0}};
  const NODETYPE nds[4] = {0x0D, 0x44, 0x44, 0x4D};  // closing node wrongly a user node
  PolycurveD c(pts, nds, 4);
  ASSERT_TRUE(c.SpinSubpath(0ul, 0ul));
  EXPECT_EQ(Bytes(c), (std::vector<NODETYPE>{0x0D, 0x44, 0x44, 0x49}));
}

TEST(SetPathStartAt, RotatesTheWholeRing) {
  PolycurveD c;
  c.MoveTo(V{0, 0});
  c.LineTo(V{10, 0});
  c.CubicTo(V{12, 3}, V{12, 7}, V{10, 10});
  c.LineTo(V{0, 0});
  c.CloseLastSubpath(0.0, false);
  PolycurveD r = c;
  ASSERT_TRUE(r.SetPathStartAt(4));
  EXPECT_TRUE(Valid(r));
  EXPECT_EQ(r.GetFirstPoint(), (V{10, 10}));
  EXPECT_EQ(r.GetLastPoint(), (V{10, 10}));
  EXPECT_EQ(SegmentSet(r), SegmentSet(c));
  EXPECT_FALSE(r.SetPathStartAt(0));
  EXPECT_FALSE(r.SetPathStartAt(5));
}

TEST(Subcurve, SingleSegmentsAndStepping) {
  PolycurveD c;
  c.MoveTo(V{0, 0});
  c.LineTo(V{10, 0});
  c.MoveTo(V{20, 0});
  c.LineTo(V{30, 0});
  const PolycurveD s = c.GetSubcurve(0, 0.0, 0, 1.0, false);
  EXPECT_EQ(Bytes(s), (std::vector<NODETYPE>{0x04, 0x44}));
  EXPECT_EQ(s.GetLastPoint(), (V{10, 0}));
  // t0 = 1 at the end of a subpath followed by a move: starts in the next one.
  const PolycurveD n = c.GetSubcurve(0, 1.0, 2, 0.5, false);
  EXPECT_EQ(n.GetPointCount(), 2u);
  EXPECT_EQ(n.GetFirstPoint(), (V{20, 0}));
  EXPECT_EQ(n.GetLastPoint(), (V{25, 0}));
  // t1 = 0 at a move: ends on the previous subpath's last segment.
  const PolycurveD p = c.GetSubcurve(0, 0.5, 2, 0.0, false);
  EXPECT_EQ(p.GetLastPoint(), (V{10, 0}));
  EXPECT_EQ(p.GetPointCount(), 2u);
  // Bad positions.
  EXPECT_TRUE(c.GetSubcurve(1, 0.0, 1, 1.0, false).IsEmpty());    // no segment starts at 1
  EXPECT_TRUE(c.GetSubcurve(0, 0.5, 0, 0.5, false).IsEmpty());    // a wrap, on an open subpath
  EXPECT_TRUE(c.GetSubcurve(0, -0.5, 0, 1.0, false).IsEmpty());
  EXPECT_TRUE(c.GetSubcurve(0, std::nan(""), 0, 1.0, false).IsEmpty());
  EXPECT_TRUE(c.GetSubcurve(9, 0.0, 9, 1.0, false).IsEmpty());
  // The count form clamps and makes its first node a move.
  const PolycurveD k = c.GetSubcurve(1, 99);
  EXPECT_EQ(k.GetPointCount(), 3u);
  EXPECT_EQ(k.GetNodeType(0), 0x04);
  EXPECT_TRUE(c.GetSubcurve(7, 1).IsEmpty());
}

TEST(Subcurve, WrapRoundAClosedSubpath) {
  PolycurveD sq;
  sq.MoveTo(V{0, 0});
  sq.LineTo(V{10, 0});
  sq.LineTo(V{10, 10});
  sq.LineTo(V{0, 10});
  sq.LineTo(V{0, 0});
  sq.CloseLastSubpath(0.0, false);
  // From the middle of the last side across the closing point to the middle of the first.
  const PolycurveD w = sq.GetSubcurve(3, 0.5, 0, 0.5, false);
  EXPECT_TRUE(Valid(w));
  EXPECT_EQ(w.GetPointCount(), 3u);
  EXPECT_EQ(w.GetFirstPoint(), (V{0, 5}));
  EXPECT_EQ(w.GetPoint(1), (V{0, 0}));
  EXPECT_EQ(w.GetLastPoint(), (V{5, 0}));
  // t0 = 1 on the final segment: only the second part.
  const PolycurveD second = sq.GetSubcurve(3, 1.0, 1, 0.5, false);
  EXPECT_EQ(second.GetFirstPoint(), (V{0, 0}));
  EXPECT_EQ(second.GetLastPoint(), (V{10, 5}));
  EXPECT_EQ(second.GetPointCount(), 3u);
  // Equal positions: the whole ring from there round to there.
  const PolycurveD ring = sq.GetSubcurve(1, 0.5, 1, 0.5, false);
  EXPECT_EQ(ring.GetPointCount(), 6u);
  EXPECT_EQ(ring.GetFirstPoint(), ring.GetLastPoint());
  EXPECT_FALSE(IsClosedNode(ring.GetNodeType(0)));
  // On an open subpath there is nothing to wrap round.
  PolycurveD open;
  open.MoveTo(V{0, 0});
  open.LineTo(V{1, 0});
  open.LineTo(V{2, 0});
  EXPECT_TRUE(open.GetSubcurve(1, 0.5, 0, 0.5, false).IsEmpty());
}

// A random valid position: a segment start and a parameter, with the ends of
// the range hit often.
struct Pos {
  unsigned long node;
  double t;
};
Pos RandomPos(std::mt19937& rng, const testpaths::Path& path) {
  const auto& s = path.segments[rng() % path.segments.size()];
  const double ends[] = {0.0, 1.0, 0.5};
  const double t = rng() % 3 == 0 ? ends[rng() % 3] : std::uniform_real_distribution<double>(0, 1)(rng);
  return {static_cast<unsigned long>(s.start), t};
}

TEST(Subcurve, RandomPiecesAreValidAndMirrorWhenReversed) {
  std::mt19937 rng(33);
  int nonEmpty = 0;
  for (int k = 0; k < 3000; ++k) {
    testpaths::Path path;
    const PolycurveD c = RandomCurve(rng, path);
    if (path.segments.empty()) continue;
    const Pos a = RandomPos(rng, path), b = RandomPos(rng, path);
    const PolycurveD fwd = c.GetSubcurve(a.node, a.t, b.node, b.t, false);
    ASSERT_TRUE(Valid(fwd)) << k;
    if (!fwd.IsEmpty()) ++nonEmpty;
    // The reversed piece of the swapped positions is the mirror: the same
    // points backwards and the bytes of a reversal.
    const PolycurveD rev = c.GetSubcurve(b.node, b.t, a.node, a.t, true);
    ASSERT_TRUE(Valid(rev)) << k;
    PolycurveD mirror = fwd;
    mirror.Reverse();
    ASSERT_EQ(rev, mirror) << k;
    // Inner positions: the piece starts and ends where asked.
    if (!fwd.IsEmpty() && a.t > 0 && a.t < 1 && b.t > 0 && b.t < 1) {
      const V s = testgeo::PointAt(c.GetPoints(), c.GetNodeTypes(), int(a.node), a.t);
      const V e = testgeo::PointAt(c.GetPoints(), c.GetNodeTypes(), int(b.node), b.t);
      EXPECT_LT(MavikMath::Distance(fwd.GetFirstPoint(), s), 1e-9) << k;
      EXPECT_LT(MavikMath::Distance(fwd.GetLastPoint(), e), 1e-9) << k;
    }
  }
  EXPECT_GT(nonEmpty, 1000);
}

TEST(Subcurve, LeftAndRightReproduceTheCurve) {
  std::mt19937 rng(34);
  for (int k = 0; k < 3000; ++k) {
    testpaths::Path path;
    // One open subpath: left and right join at the cut into the whole curve.
    PolycurveD c;
    do {
      c = RandomCurve(rng, path, 1);
    } while (path.segments.empty() || path.subpaths[0].closed);
    const int n = path.n();
    const Pos p = RandomPos(rng, path);
    const int node = int(p.node), kk = IsLine(c.GetNodeType(node + 1)) ? 1 : 3;
    const PolycurveD left = c.GetLeftSubcurve(p.node, p.t), right = c.GetRightSubcurve(p.node, p.t);
    ASSERT_TRUE(Valid(left) && Valid(right)) << k;
    PolycurveD joined = left;
    joined.AppendWithJoin(right, false, 1e-6);
    ASSERT_EQ(joined.GetNumberOfSubpaths(), 1) << k;
    // An inner cut splits one segment in two; at a node the curve comes back as it was.
    const bool inner = p.t > 0 && p.t < 1;
    ASSERT_EQ(int(joined.GetPointCount()), n + (inner ? kk : 0)) << k;
    const V* jp = joined.GetPoints();
    const V* cp = c.GetPoints();
    for (int i = 0; i <= node; ++i) ASSERT_EQ(jp[i], cp[i]) << k;
    for (int i = node + kk; i < n; ++i) ASSERT_EQ(jp[i + (inner ? kk : 0)], cp[i]) << k;
    if (inner) {
      // The two halves follow the original segment: left over [0, t], right over [t, 1].
      for (double u : {0.2, 0.5, 0.8, 1.0}) {
        const V l = testgeo::PointAt(jp, joined.GetNodeTypes(), node, u);
        const V r = testgeo::PointAt(jp, joined.GetNodeTypes(), node + kk, u);
        EXPECT_LT(MavikMath::Distance(l, testgeo::PointAt(cp, c.GetNodeTypes(), node, p.t * u)), 1e-9) << k;
        EXPECT_LT(MavikMath::Distance(r, testgeo::PointAt(cp, c.GetNodeTypes(), node, p.t + (1 - p.t) * u)), 1e-9)
            << k;
      }
    }
  }
}

TEST(Subpaths, ListingsAgreeWithTheConstruction) {
  std::mt19937 rng(35);
  for (int k = 0; k < 500; ++k) {
    testpaths::Path path;
    const PolycurveD c = RandomCurve(rng, path);
    const auto ranges = c.GetSubpathIndices();
    ASSERT_EQ(ranges.size(), path.subpaths.size());
    const auto curves = c.GetSubpathCurves();
    const auto copies = c.GetSubpaths();
    const auto refs = c.GetSubpathRefs();
    ASSERT_EQ(curves.size(), ranges.size());
    ASSERT_EQ(int(ranges.size()), c.GetNumberOfSubpaths());
    for (size_t i = 0; i < ranges.size(); ++i) {
      const auto& sp = path.subpaths[i];
      EXPECT_EQ(ranges[i].first, static_cast<unsigned long>(sp.first));
      EXPECT_EQ(ranges[i].count, static_cast<unsigned long>(sp.last - sp.first + 1));
      EXPECT_EQ(curves[i].points, c.GetPoints() + sp.first);
      EXPECT_TRUE(curves[i].limit);
      EXPECT_EQ(copies[i], refs[i]);
      EXPECT_EQ(refs[i].GetPoints(), c.GetPoints() + sp.first);  // no copy
      EXPECT_TRUE(Valid(copies[i]));
      EXPECT_EQ(c.FirstNodeOfSubpath(sp.last), sp.first);
      EXPECT_EQ(c.LastNodeOfSubpath(sp.first), sp.last);
      EXPECT_TRUE(c.IsSubpathStartOrEnd(sp.first) && c.IsSubpathStartOrEnd(sp.last));
      unsigned long b = 0, e = 0;
      EXPECT_EQ(c.GetSubpathRange(sp.first, b, e), sp.last > sp.first);
      EXPECT_EQ(c.GetSubpathRange(sp.last).has_value(), sp.last > sp.first);
      EXPECT_EQ(c.GetSubpath(sp.last).GetPointCount(), sp.last > sp.first ? unsigned(sp.last - sp.first + 1) : 0u);
    }
    // Selection listings: a subpath counts once any node has the bit asked for.
    const auto enabled = c.GetEnabledSubpathIndices();
    const auto disabled = c.GetEnabledSubpathIndices(false);
    const auto enabledCurves = c.GetEnabledSubpathCurves();
    size_t ne = 0, nd = 0;
    for (const auto& r : ranges) {
      bool any = false, anyOff = false;
      for (unsigned long i = r.first; i < r.first + r.count; ++i)
        (IsEnabledNode(c.GetNodeType(int(i))) ? any : anyOff) = true;
      ne += any;
      nd += anyOff;
    }
    EXPECT_EQ(enabled.size(), ne);
    EXPECT_EQ(disabled.size(), nd);
    ASSERT_EQ(enabledCurves.size(), ne);
    for (const auto& r : enabledCurves) EXPECT_FALSE(r.limit);
  }
}

TEST(Subpaths, DeleteExtractAndLetters) {
  PolycurveD c;
  c.MoveTo(V{0, 0});
  c.LineTo(V{1, 0});  // open
  c.MoveTo(V{5, 5});  // lone move
  c.CreateCircleSubpath(V{0, 0}, 3);  // closed
  c.MoveTo(V{9, 9});
  c.LineTo(V{9, 8});  // open
  EXPECT_FALSE(c.DeleteSubpath(2));  // a lone move is not a subpath to delete
  PolycurveD x = c;
  const PolycurveD open = x.ExtractOpenSubpaths(true);
  EXPECT_EQ(open.GetPointCount(), 4u);
  EXPECT_EQ(open.GetNumberOfSubpaths(), 2);
  EXPECT_EQ(x.GetPointCount(), 13u);
  EXPECT_TRUE(Valid(x) && Valid(open));
  PolycurveD y = c;
  EXPECT_EQ(y.ExtractOpenSubpaths(false).GetPointCount(), 5u);
  ASSERT_TRUE(c.DeleteSubpath(5));
  EXPECT_EQ(c.GetPointCount(), 5u);
  EXPECT_TRUE(c.GetSubpath(2).IsEmpty());
  EXPECT_EQ(c.GetSubpathIndices()[1].count, 1u);

  // Letters: no letter bit, no glyph.
  EXPECT_TRUE(c.GetLetterCurves().empty());
  PolycurveD t;
  t.MoveTo(V{100, 100});
  t.LineTo(V{101, 100});  // before the first letter: left out
  t.CreateCircleSubpath(V{0, 0}, 10);
  t.SetLetter(2, true);  // glyph 1: outline ...
  t.CreateCircleSubpath(V{0, 0}, 5);  // ... and its counter
  t.MoveTo(V{50, 50});
  t.SetLetter(28, true);  // a lone letter move: a new, empty glyph
  t.CreateCircleSubpath(V{50, 0}, 10);
  t.SetLetter(29, true);  // glyph 3: a closed outline (0x2E) must not vanish
  const auto glyphs = t.GetLetterCurves();
  ASSERT_EQ(glyphs.size(), 3u);
  EXPECT_EQ(glyphs[0].GetNumberOfSubpaths(), 2);
  EXPECT_TRUE(glyphs[1].IsEmpty());
  EXPECT_EQ(glyphs[2].GetPointCount(), 13u);
}

TEST(Subpaths, IntegerCutsRoundTheProduct) {
  Polycurve c;
  c.MoveTo(0, 0);
  c.LineTo(-3, 7);
  const Polycurve h = c.GetSubcurve(0, 0.5, 0, 1.0, false);
  EXPECT_EQ(h.GetFirstPoint(), (POINT{-2, 4}));  // -1.5 and 3.5 round away from zero
  const Polycurve s = c.GetSubcurve(0, 0.25, 0, 0.5, false);
  EXPECT_EQ(s.GetLastPoint(), (POINT{-2, 4}));
  EXPECT_EQ(s.GetFirstPoint(), (POINT{-1, 2}));  // half of the rounded end
}

}  // namespace
