// Breaking paths: a break keeps every segment (a cut segment becomes the two
// de Casteljau halves), leaves a valid path and parts it at the right place.
#include <gtest/gtest.h>

#include "edit/edit_fixture.h"
#include "ostracrv/math/bezier_split.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using testedit::Raw;

// The segment that ends at node e, as the library's point tuple, split at t.
template <class T>
testedit::SegSet Halves(const Raw<T>& r, int e, double t) {
  if (IsLine(r.b[e])) {
    const T m = MavikMath::FromV<T>(MavikMath::Lerp(MavikMath::ToV(r.p[e - 1]), MavikMath::ToV(r.p[e]), t));
    const T h[] = {r.p[e - 1], m, m, r.p[e]};
    const NODETYPE b[] = {0x04, 0x44, 0x04, 0x44};
    return testedit::Segments(h, b, 4);
  }
  T h[8];
  MavikMath::CubicBezier::Split(t, &r.p[e - 3], h, h + 4);
  const NODETYPE b[] = {0x04, 0xC0, 0xC0, 0x84, 0x04, 0xC0, 0xC0, 0x84};
  return testedit::Segments(h, b, 8);
}

template <class T>
void BreakInsideSegments(double tol) {
  std::mt19937 rng(41);
  for (int k = 0; k < 3000; ++k) {
    testpaths::Path path;
    Raw<T> r = testedit::Random<T>(rng, path);
    if (path.segments.empty()) continue;
    const testpaths::Segment seg = path.segments[rng() % path.segments.size()];
    const double t = std::uniform_real_distribution<double>(0.01, 0.99)(rng);
    testedit::SegSet expected = testedit::Segments(r);
    // The cut segment is replaced by its halves.
    expected.erase(expected.find(
        *testedit::Segments(r.p.data() + seg.start, r.b.data() + seg.start, seg.end - seg.start + 1).begin()));
    for (const auto& s : Halves(r, seg.end, t)) expected.insert(s);
    const int subpaths = r.Subpaths();
    const int sp = path.subpathOf(seg.end);
    const int n = CRV_BreakAtLocation(r.p.data(), r.b.data(), r.n, seg.end, t);
    ASSERT_TRUE(r.Take(n)) << k;
    // A closed subpath opens into one; an open one parts in two. Stray moves
    // of the path are tidied away.
    const bool text = IsLetterNode(path.nodes[0]);
    EXPECT_EQ(r.Subpaths(), subpaths + (path.subpaths[sp].closed ? 0 : 1) - (text ? 0 : testedit::Stray(path))) << k;
    EXPECT_TRUE(testedit::Near(testedit::Segments(r), expected, tol)) << k;
  }
}

TEST(BreakAtLocation, InsideASegmentSplitsItIntoItsHalves) {
  BreakInsideSegments<V>(1e-9);
  // Integer halves are rounded, and the smoothed handles of the new node may
  // move by a unit more.
  BreakInsideSegments<POINT>(2.0);
}

TEST(BreakAtLocation, AtNodesKeepsSegmentsAndPartsThePathThere) {
  std::mt19937 rng(42);
  for (int k = 0; k < 3000; ++k) {
    testpaths::Path path;
    Raw<V> r = testedit::Random<V>(rng, path);
    if (path.segments.empty()) continue;
    const testpaths::Segment seg = path.segments[rng() % path.segments.size()];
    const bool atStart = rng() % 2 == 0;
    const int node = atStart ? seg.start : seg.end;
    const testpaths::Subpath sp = path.subpaths[seg.subpath];
    const bool openEnd = !sp.closed && (node == sp.first || node == sp.last);
    const Raw<V> before = r;
    const int n = CRV_BreakAtLocation(r.p.data(), r.b.data(), r.n, seg.end, atStart ? 0.0 : 1.0);
    if (openEnd) {
      EXPECT_EQ(n, -1) << k;
      EXPECT_TRUE(r == before) << k;
      continue;
    }
    ASSERT_TRUE(r.Take(n)) << k;
    EXPECT_EQ(testedit::Segments(r), testedit::Segments(before)) << k;
    // Some subpath now ends at the break point and another (or the same one)
    // starts there.
    const V at = before.p[node];
    bool starts = false, ends = false;
    for (int i = 0; i < r.n; ++i) {
      if (IsClosedNode(r.b[i])) continue;
      if (CRV_IsFirstOpenSubpathNode(r.b.data(), r.n, i) && r.p[i] == at) starts = true;
      if (CRV_IsLastOpenSubpathNode(r.b.data(), r.n, i) && r.p[i] == at) ends = true;
    }
    EXPECT_TRUE(starts && ends) << k;
  }
}

TEST(BreakAtLocation, ClosedSquareOpensAtTheBreak) {
  // A closed square broken in the middle of its third side: one open path
  // from the break round the old closing corner back to the break.
  Raw<POINT> r{{{0, 0}, {10, 0}, {10, 10}, {0, 10}, {0, 0}}, {0x0C, 0x44, 0x44, 0x44, 0x48}, 5};
  r.p.resize(12);
  r.b.resize(12);
  r.n = CRV_BreakAtLocation(r.p.data(), r.b.data(), r.n, 3, 0.5);
  ASSERT_EQ(r.n, 6);
  EXPECT_TRUE(r.Valid());
  const std::vector<POINT> want = {{5, 10}, {0, 10}, {0, 0}, {10, 0}, {10, 10}, {5, 10}};
  EXPECT_TRUE(std::equal(want.begin(), want.end(), r.p.begin()));
  EXPECT_FALSE(CRV_ContainsClosedSubpath(r.b.data(), r.n));
  // At the closing node: no node added, the same square opens at its start.
  Raw<POINT> s{{{0, 0}, {10, 0}, {10, 10}, {0, 0}}, {0x0C, 0x44, 0x44, 0x48}, 4};
  EXPECT_EQ(CRV_BreakAtLocation(s.p.data(), s.b.data(), 4, 0, 1.0), 4);
  EXPECT_EQ(s.b, (std::vector<NODETYPE>{0x04, 0x44, 0x44, 0x44}));
}

TEST(SmoothNode, AlignsHandlesKeepingOrEqualisingTheirLengths) {
  std::mt19937 rng(45);
  std::uniform_real_distribution<double> u(-50, 50);
  for (int k = 0; k < 500; ++k) {
    const bool symmetric = k % 2;
    Raw<V> r{{{0, 0}, {u(rng), u(rng)}, {u(rng), u(rng)}, {u(rng), u(rng)}, {u(rng), u(rng)}, {u(rng), u(rng)}, {9, 9}},
             {0x04, 0xC0, 0xC0, NODETYPE(symmetric ? 0xA4 : 0x94), 0xC0, 0xC0, 0x84}, 7};
    const V p = r.p[3];
    const double a = MavikMath::Distance(p, r.p[2]), b = MavikMath::Distance(p, r.p[4]);
    OstraCrv::SmoothNode(r.p.data(), r.b.data(), 7, 3);
    EXPECT_NEAR(MavikMath::Cross(r.p[2] - p, r.p[4] - p), 0.0, 1e-9 * (1 + a * b));
    EXPECT_LT(MavikMath::Dot(r.p[2] - p, r.p[4] - p), 0.0);  // on opposite sides
    EXPECT_NEAR(MavikMath::Distance(p, r.p[2]), symmetric ? (a + b) / 2 : a, 1e-9);
    EXPECT_NEAR(MavikMath::Distance(p, r.p[4]), symmetric ? (a + b) / 2 : b, 1e-9);
  }
}

TEST(BreakAtLocation, BadInputChangesNothing) {
  std::mt19937 rng(43);
  testpaths::Path path;
  Raw<POINT> r = testedit::Random<POINT>(rng, path);
  const Raw<POINT> before = r;
  for (double t : {-0.1, 1.5, std::nan("")}) EXPECT_EQ(CRV_BreakAtLocation(r.p.data(), r.b.data(), r.n, r.n - 1, t), -1);
  for (int i : {-1, r.n, 1 << 30}) EXPECT_EQ(CRV_BreakAtLocation(r.p.data(), r.b.data(), r.n, i, 0.5), -1);
  EXPECT_EQ(CRV_BreakAtLocation(r.p.data(), r.b.data(), -3, 1, 0.5), -1);
  EXPECT_EQ(CRV_BreakAtLocation<POINT>(nullptr, r.b.data(), r.n, 1, 0.5), -1);
  EXPECT_EQ(CRV_BreakAtLocation(r.p.data(), r.b.data(), r.n, 0, 0.5), -1);  // a move ends no segment
  EXPECT_TRUE(r == before);
  EXPECT_EQ(CRV_Add(r.p.data(), r.b.data(), r.n, 0, 0.5, 1), 0);
  EXPECT_EQ(CRV_Remove(r.p.data(), r.b.data(), r.n, -1, 2), r.n);
  EXPECT_EQ(CRV_Remove(r.p.data(), r.b.data(), r.n, 1, r.n), 1);  // the tail is cut by the count alone
  EXPECT_EQ(CRV_AppendMove(r.p.data(), r.b.data(), r.n, r.n + 1, POINT{1, 1}), -1);
  EXPECT_TRUE(r == before);
}

TEST(OpenAllSubpaths, LeavesOnlyOpenSubpathsWithTheSameSegments) {
  std::mt19937 rng(44);
  for (int k = 0; k < 2000; ++k) {
    testpaths::Path path;
    Raw<POINT> r = testedit::Random<POINT>(rng, path, k % 2 == 0);
    OstraCrv::Polycurve c(r.p.data(), r.b.data(), unsigned(r.n));
    const OstraCrv::Polycurve shared = c;
    c.OpenAllSubpaths();
    ASSERT_TRUE(testgeo::Valid(c)) << k;
    EXPECT_TRUE(shared.GetPointCount() == unsigned(r.n));  // the copy did not change
    const NODETYPE* b = c.GetNodeTypes();
    const int n = int(c.GetPointCount());
    EXPECT_EQ(testgeo::SegmentSet(c.GetPoints(), b, n), testgeo::SegmentSet(r.p.data(), r.b.data(), r.n)) << k;
    // Only a lone closed move (no segment to open) keeps its closed bit.
    for (int i = 0; i < n; ++i)
      EXPECT_TRUE(!IsClosedNode(b[i]) || (IsMove(b[i]) && CRV_IsLastSubpathNode(b, n, i))) << k;
  }
}

}  // namespace
