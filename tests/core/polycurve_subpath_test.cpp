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
using Bytes = std::vector<NODETYPE>;

using testgeo::NodesOf;
using testgeo::RandomCurve;
using testgeo::CurveSegments;
using testgeo::Valid;
PolycurveD ClosedSquare() {
  PolycurveD sq;
  for (const V& p : {V{0, 0}, V{10, 0}, V{10, 10}, V{0, 10}, V{0, 0}}) sq.IsEmpty() ? sq.MoveTo(p) : sq.LineTo(p);
  sq.CloseLastSubpath(0.0, false);
  return sq;
}

// A Bezier whose arcs kept their places would change its length and area.
TEST(Reverse, TwiceRestoresAndFlipsTheArea) {
  std::mt19937 rng(31);
  for (int k = 0; k < 1000; ++k) {
    testpaths::Path path;
    const PolycurveD original = RandomCurve(rng, path);
    PolycurveD r = original;
    r.Reverse();
    ASSERT_TRUE(Valid(r)) << k;
    const double area = testgeo::CurveArea(original), len = testgeo::CurveLength(original);
    EXPECT_NEAR(testgeo::CurveArea(r), -area, 1e-6 * (1 + std::fabs(area)));
    EXPECT_NEAR(testgeo::CurveLength(r), len, 1e-9 * len);
    r.Reverse();
    ASSERT_EQ(r, original) << k;
  }
  // The range form turns one closed subpath, ends inclusive, in either order.
  PolycurveD two = ClosedSquare();
  two.ReplacePoints(0, 0, PolycurveD::CreateLine(V{5, 5}, V{6, 6}));
  OstraCrv::CurveBuffer<V> b = two.GetBuffer();
  OstraCrv::Reverse(b.points, b.nodes, 6, 2);
  EXPECT_EQ(NodesOf(two), (Bytes{0x04, 0x44, 0x0C, 0x44, 0x44, 0x44, 0x48}));
  EXPECT_EQ(two.GetPoint(3), (V{0, 10}));
}

TEST(Spin, KeepsTheShapeAndTurnsBack) {
  std::mt19937 rng(32);
  int spun = 0;
  for (int k = 0; k < 1500; ++k) {
    testpaths::Path path;
    PolycurveD c = RandomCurve(rng, path);
    const testpaths::Subpath sp = path.subpaths[rng() % path.subpaths.size()];
    const PolycurveD before = c;
    if (!sp.closed) {
      EXPECT_FALSE(c.SpinSubpath(static_cast<unsigned long>(sp.first), static_cast<unsigned long>(sp.first)));
      EXPECT_EQ(c, before);
      continue;
    }
    std::vector<int> ends{sp.first};
    for (const auto& s : path.segments)
      if (s.end > sp.first && s.end <= sp.last) ends.push_back(s.end);
    const int node = ends[rng() % ends.size()];
    ASSERT_TRUE(c.SpinSubpath(static_cast<unsigned long>(sp.last), static_cast<unsigned long>(node))) << k;
    ++spun;
    ASSERT_TRUE(Valid(c)) << k;
    EXPECT_EQ(c.GetPoint(sp.first), before.GetPoint(node));
    EXPECT_EQ(c.GetPoint(sp.last), c.GetPoint(sp.first));
    EXPECT_EQ(CRV_GetUserNode(c.GetNodeTypes(), int(c.GetPointCount()), sp.last), sp.first);
    EXPECT_EQ(CurveSegments(c), CurveSegments(before)) << k;  // the same segments, the ring starting elsewhere
    // Turning on to the old start restores every point.
    ASSERT_TRUE(c.SpinSubpath(static_cast<unsigned long>(sp.first), static_cast<unsigned long>(sp.last - node + sp.first)));
    EXPECT_TRUE(std::equal(c.GetPoints(), c.GetPoints() + path.n(), before.GetPoints())) << k;
  }
  EXPECT_GT(spun, 300);
  // At the first node only the end flags are put right.
  const V pts[4] = {V{0, 0}, V{1, 0}, V{0, 1}, V{0, 0}};
  const NODETYPE nds[4] = {0x0D, 0x44, 0x44, 0x4D};
  PolycurveD c(pts, nds, 4);
  ASSERT_TRUE(c.SpinSubpath(0ul, 0ul));
  EXPECT_EQ(NodesOf(c), (Bytes{0x0D, 0x44, 0x44, 0x49}));
  // SetPathStartAt turns a one-subpath curve the same way.
  PolycurveD sq = ClosedSquare();
  ASSERT_TRUE(sq.SetPathStartAt(2));
  EXPECT_TRUE(Valid(sq) && sq.GetFirstPoint() == (V{10, 10}) && CurveSegments(sq) == CurveSegments(ClosedSquare()));
  EXPECT_FALSE(sq.SetPathStartAt(4));
}

TEST(Subcurve, StepsAndWraps) {
  PolycurveD c = PolycurveD::CreateLine(V{0, 0}, V{10, 0});
  c.CreateLineSubpath(V{20, 0}, V{30, 0});
  EXPECT_EQ(NodesOf(c.GetSubcurve(0, 0.0, 0, 1.0, false)), (Bytes{0x04, 0x44}));
  // t0 = 1 at a subpath's end starts in the next subpath; t1 = 0 at a move ends in the previous one.
  EXPECT_EQ(c.GetSubcurve(0, 1.0, 2, 0.5, false).GetFirstPoint(), (V{20, 0}));
  EXPECT_EQ(c.GetSubcurve(0, 0.5, 2, 0.0, false).GetLastPoint(), (V{10, 0}));
  for (const PolycurveD& empty : {c.GetSubcurve(1, 0.0, 1, 1.0, false), c.GetSubcurve(0, 0.5, 0, 0.5, false),
                                  c.GetSubcurve(0, -0.5, 0, 1.0, false), c.GetSubcurve(0, std::nan(""), 0, 1.0, false),
                                  c.GetSubcurve(9, 0.0, 9, 1.0, false)})
    EXPECT_TRUE(empty.IsEmpty());  // no segment at 1, a wrap on an open subpath, bad t, out of range
  EXPECT_EQ(c.GetSubcurve(1, 99).GetNodeType(0), 0x04);
  // Wraps round the closing point of a closed subpath.
  const PolycurveD sq = ClosedSquare();
  const PolycurveD w = sq.GetSubcurve(3, 0.5, 0, 0.5, false);
  EXPECT_TRUE(Valid(w) && w.GetPointCount() == 3u);
  EXPECT_TRUE(w.GetFirstPoint() == (V{0, 5}) && w.GetPoint(1) == (V{0, 0}) && w.GetLastPoint() == (V{5, 0}));
  const PolycurveD second = sq.GetSubcurve(3, 1.0, 1, 0.5, false);  // t0 = 1 on the final segment
  EXPECT_TRUE(second.GetPointCount() == 3u && second.GetFirstPoint() == (V{0, 0}));
  const PolycurveD ring = sq.GetSubcurve(1, 0.5, 1, 0.5, false);  // all the way round
  EXPECT_TRUE(Valid(ring) && ring.GetPointCount() == 6u && ring.GetFirstPoint() == ring.GetLastPoint());
  // Integer cuts round the product; a subsection halves the rounded end.
  Polycurve i = Polycurve::CreateLine(POINT{0, 0}, POINT{-3, 7});
  EXPECT_EQ(i.GetSubcurve(0, 0.5, 0, 1.0, false).GetFirstPoint(), (POINT{-2, 4}));
  EXPECT_EQ(i.GetSubcurve(0, 0.25, 0, 0.5, false).GetFirstPoint(), (POINT{-1, 2}));
}

struct Pos {
  unsigned long node;
  double t;
};
// A segment start and a parameter, the ends of the range hit often.
Pos RandomPos(std::mt19937& rng, const testpaths::Path& path) {
  const double ends[] = {0.0, 1.0, 0.5};
  const double t = rng() % 3 == 0 ? ends[rng() % 3] : std::uniform_real_distribution<double>(0, 1)(rng);
  return {static_cast<unsigned long>(path.segments[rng() % path.segments.size()].start), t};
}

TEST(Subcurve, RandomPiecesAreValidStartWhereAskedAndMirrorWhenReversed) {
  std::mt19937 rng(33);
  int nonEmpty = 0;
  for (int k = 0; k < 3000; ++k) {
    testpaths::Path path;
    const PolycurveD c = RandomCurve(rng, path);
    if (path.segments.empty()) continue;
    const Pos a = RandomPos(rng, path), b = RandomPos(rng, path);
    const PolycurveD fwd = c.GetSubcurve(a.node, a.t, b.node, b.t, false);
    ASSERT_TRUE(Valid(fwd)) << k;
    nonEmpty += !fwd.IsEmpty();
    if (!fwd.IsEmpty() && a.t > 0 && a.t < 1 && b.t > 0 && b.t < 1) {
      EXPECT_LT(MavikMath::Distance(fwd.GetFirstPoint(), testgeo::PointAt(c.GetPoints(), c.GetNodeTypes(), int(a.node), a.t)), 1e-9);
      EXPECT_LT(MavikMath::Distance(fwd.GetLastPoint(), testgeo::PointAt(c.GetPoints(), c.GetNodeTypes(), int(b.node), b.t)), 1e-9);
    }
    // Reversed with the positions swapped: the same nodes backwards.
    PolycurveD mirror = fwd;
    mirror.Reverse();
    ASSERT_EQ(c.GetSubcurve(b.node, b.t, a.node, a.t, true), mirror) << k;
  }
  EXPECT_GT(nonEmpty, 1000);
}

TEST(Subcurve, LeftAndRightReproduceTheCurve) {
  std::mt19937 rng(34);
  for (int k = 0; k < 3000; ++k) {
    testpaths::Path path;
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
    // An inner cut splits one segment in two; at a node the curve comes back as it was.
    const bool inner = p.t > 0 && p.t < 1;
    ASSERT_EQ(int(joined.GetPointCount()), n + (inner ? kk : 0)) << k;
    const V* jp = joined.GetPoints();
    const V* cp = c.GetPoints();
    for (int i = 0; i <= node; ++i) ASSERT_EQ(jp[i], cp[i]) << k;
    for (int i = node + kk; i < n; ++i) ASSERT_EQ(jp[i + (inner ? kk : 0)], cp[i]) << k;
    for (double u : {0.2, 0.5, 0.8}) {
      if (!inner) break;  // left follows [0, t] of the cut segment, right [t, 1]
      const V l = testgeo::PointAt(jp, joined.GetNodeTypes(), node, u);
      const V r = testgeo::PointAt(jp, joined.GetNodeTypes(), node + kk, u);
      EXPECT_LT(MavikMath::Distance(l, testgeo::PointAt(cp, c.GetNodeTypes(), node, p.t * u)), 1e-9) << k;
      EXPECT_LT(MavikMath::Distance(r, testgeo::PointAt(cp, c.GetNodeTypes(), node, p.t + (1 - p.t) * u)), 1e-9) << k;
    }
  }
}

TEST(Subpaths, ListingsAgreeWithTheConstruction) {
  std::mt19937 rng(35);
  for (int k = 0; k < 500; ++k) {
    testpaths::Path path;
    const PolycurveD c = RandomCurve(rng, path);
    const auto ranges = c.GetSubpathIndices();
    const auto curves = c.GetSubpathCurves();
    const auto copies = c.GetSubpaths();
    const auto refs = c.GetSubpathRefs();
    ASSERT_EQ(ranges.size(), path.subpaths.size());
    ASSERT_EQ(int(curves.size()), c.GetNumberOfSubpaths());
    size_t enabled = 0, disabled = 0;
    for (size_t i = 0; i < ranges.size(); ++i) {
      const auto& sp = path.subpaths[i];
      EXPECT_TRUE(ranges[i] == (OstraCrv::SubcurveRange{unsigned(sp.first), unsigned(sp.last - sp.first + 1)}));
      EXPECT_TRUE(curves[i].points == c.GetPoints() + sp.first && curves[i].limit);
      EXPECT_TRUE(copies[i] == refs[i] && refs[i].GetPoints() == c.GetPoints() + sp.first);  // refs copy nothing
      EXPECT_TRUE(c.FirstNodeOfSubpath(sp.last) == sp.first && c.LastNodeOfSubpath(sp.first) == sp.last);
      EXPECT_TRUE(c.IsSubpathStartOrEnd(sp.first) && c.IsSubpathStartOrEnd(sp.last));
      EXPECT_EQ(c.GetSubpathRange(sp.last).has_value(), sp.last > sp.first);
      EXPECT_EQ(c.GetSubpath(sp.last).GetPointCount(), sp.last > sp.first ? unsigned(sp.last - sp.first + 1) : 0u);
      bool on = false, off = false;
      for (int j = sp.first; j <= sp.last; ++j) (IsEnabledNode(path.nodes[j]) ? on : off) = true;
      enabled += on;
      disabled += off;
    }
    // A subpath is listed as soon as one node has the bit asked for.
    EXPECT_EQ(c.GetEnabledSubpathIndices().size(), enabled);
    EXPECT_EQ(c.GetEnabledSubpathIndices(false).size(), disabled);
    EXPECT_EQ(c.GetEnabledSubpathCurves().size(), enabled);
  }
}

TEST(Subpaths, DeleteExtractAndLetters) {
  PolycurveD c = PolycurveD::CreateLine(V{0, 0}, V{1, 0});  // open
  c.MoveTo(V{5, 5});                                        // a lone move
  c.CreateCircleSubpath(V{0, 0}, 3);                        // closed
  c.CreateLineSubpath(V{9, 9}, V{9, 8});                    // open
  EXPECT_FALSE(c.DeleteSubpath(2));                         // a lone move has no range
  PolycurveD x = c, y = c;
  const PolycurveD open = x.ExtractOpenSubpaths(true);
  EXPECT_TRUE(Valid(x) && Valid(open) && open.GetPointCount() == 4u && x.GetPointCount() == 13u);
  EXPECT_EQ(y.ExtractOpenSubpaths(false).GetPointCount(), 5u);
  ASSERT_TRUE(c.DeleteSubpath(5));
  EXPECT_EQ(c.GetPointCount(), 5u);
  EXPECT_TRUE(c.GetLetterCurves().empty());  // no letter bit, no glyph
  PolycurveD t = PolycurveD::CreateLine(V{100, 100}, V{101, 100});  // before the first letter: left out
  t.CreateCircleSubpath(V{0, 0}, 10);
  t.SetLetter(2, true);  // glyph 1: outline ...
  t.CreateCircleSubpath(V{0, 0}, 5);  // ... and its counter
  t.MoveTo(V{50, 50});
  t.SetLetter(28, true);  // a lone letter move: a new, empty glyph
  t.CreateCircleSubpath(V{50, 0}, 10);
  t.SetLetter(29, true);  // a closed glyph outline (0x2E) must not vanish
  const auto glyphs = t.GetLetterCurves();
  ASSERT_EQ(glyphs.size(), 3u);
  EXPECT_EQ(glyphs[0].GetNumberOfSubpaths(), 2);
  EXPECT_TRUE(glyphs[1].IsEmpty());
  EXPECT_EQ(glyphs[2].GetPointCount(), 13u);
}

}  // namespace
