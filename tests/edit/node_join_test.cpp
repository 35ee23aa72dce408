// Joining open ends: the joined path is valid, has the expected subpaths and
// nodes, and keeps every segment (turned subpaths compare in either
// direction); joining with lines adds exactly the bridging line.
#include <gtest/gtest.h>

#include "edit/edit_fixture.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using testedit::Raw;

using testedit::Stray;  // the paths here are no texts

// Two open ends of different subpaths, or -1s.
std::pair<int, int> TwoEnds(std::mt19937& rng, const testpaths::Path& path, bool sameSubpath) {
  std::vector<int> ends = testedit::OpenEnds(path);
  if (ends.size() < 2) return {-1, -1};
  for (int tries = 0; tries < 20; ++tries) {
    const int a = ends[rng() % ends.size()], b = ends[rng() % ends.size()];
    if (a != b && (path.subpathOf(a) == path.subpathOf(b)) == sameSubpath) return {a, b};
  }
  return {-1, -1};
}

TEST(JoinTwoNodes, TwoSubpathsBecomeOneWithTheSameSegments) {
  std::mt19937 rng(51);
  int runs = 0;
  for (int k = 0; k < 4000; ++k) {
    testpaths::Path path;
    Raw<V> r = testedit::Random<V>(rng, path, true, 16, false);
    const auto [a, b] = TwoEnds(rng, path, false);
    if (a < 0) continue;
    ++runs;
    r.p[b] = r.p[a];  // coinciding ends: the midpoint moves nothing
    const Raw<V> before = r;
    int joined = -1;
    const int n = CRV_JoinTwoNodesExt(r.p.data(), r.b.data(), r.n, a, b, &joined);
    ASSERT_EQ(n, before.n - 1) << k;
    ASSERT_TRUE(r.Take(n)) << k;
    EXPECT_EQ(r.Subpaths(), before.Subpaths() - 1) << k;
    EXPECT_EQ(testedit::Segments(r), testedit::Segments(before)) << k;
    ASSERT_TRUE(joined >= 0 && joined < n) << k;
    EXPECT_EQ(r.p[joined], before.p[a]) << k;
  }
  EXPECT_GT(runs, 1000);
  // Apart, the ends meet at their midpoint; head to head, one subpath turns.
  Raw<POINT> h{{{0, 0}, {10, 0}, {0, 3}, {-10, 3}}, {0x04, 0x44, 0x04, 0x44}, 4};
  int joined = -1;
  ASSERT_EQ(CRV_JoinTwoNodesExt(h.p.data(), h.b.data(), 4, 0, 2, &joined), 3);
  h.n = 3;
  EXPECT_TRUE(h.Valid());
  EXPECT_EQ(h.p[joined], (POINT{0, 1}));  // (0 + 0) / 2, (0 + 3) / 2 truncated
  EXPECT_EQ(h.p[0].x * h.p[2].x, -100);   // the far ends at both sides
}

TEST(JoinTwoNodes, EndsOfOneSubpathCloseIt) {
  std::mt19937 rng(52);
  for (int k = 0; k < 2000; ++k) {
    testpaths::Path path;
    Raw<V> r = testedit::Random<V>(rng, path, true, 16, false);
    const auto [a, b] = TwoEnds(rng, path, true);
    if (a < 0) continue;
    const V mid = (r.p[a] + r.p[b]) * 0.5;
    const Raw<V> before = r;
    int joined = -1;
    const int n = CRV_JoinTwoNodesExt(r.p.data(), r.b.data(), r.n, a, b, &joined);
    ASSERT_EQ(n, before.n - Stray(path)) << k;
    ASSERT_TRUE(r.Take(n)) << k;
    // The subpath is closed at the midpoint with one user end.
    const int f = joined, l = CRV_LastNodeOfThisSubpath(r.b.data(), n, f);
    EXPECT_EQ(r.p[f], mid);
    EXPECT_EQ(r.p[l], mid);
    EXPECT_TRUE(IsClosedNode(r.b[f]) && IsClosedNode(r.b[l]) && IsUserNode(r.b[f]) && !IsUserNode(r.b[l])) << k;
  }
}

TEST(JoinTwoNodes, WithLinesAddsOnlyTheBridge) {
  std::mt19937 rng(53);
  for (int k = 0; k < 4000; ++k) {
    testpaths::Path path;
    Raw<POINT> r = testedit::Random<POINT>(rng, path, true, 16, false);
    const bool same = k % 3 == 0;
    const auto [a, b] = TwoEnds(rng, path, same);
    if (a < 0 || r.p[a] == r.p[b]) continue;
    testedit::SegSet expected = testedit::Segments(r);
    expected.insert(testedit::LineSeg(MavikMath::ToV(r.p[a]), MavikMath::ToV(r.p[b])));
    const int n0 = r.n;
    const int n = crvJoinTwoNodes(r.p.data(), r.b.data(), r.n, a, b, true);
    ASSERT_EQ(n, same ? n0 + 1 - Stray(path) : n0) << k;
    ASSERT_TRUE(r.Take(n)) << k;
    EXPECT_EQ(testedit::Segments(r), expected) << k;
  }
}

TEST(JoinTwoNodesWithOpenSubpath, InsertsTheSubpathBetweenTwoEnds) {
  std::mt19937 rng(54);
  int closing = 0, bridging = 0;
  for (int k = 0; k < 6000; ++k) {
    testpaths::Path path;
    Raw<V> r = testedit::Random<V>(rng, path, true, 4, false);
    const bool same = k % 2 == 0;
    const auto [a, b] = TwoEnds(rng, path, same);
    if (a < 0) continue;
    // Ends of a third open subpath of more than one node.
    std::vector<int> candidates;
    for (const auto& sp : path.subpaths)
      if (!sp.closed && sp.last > sp.first && path.subpathOf(a) != path.subpathOf(sp.first) &&
          path.subpathOf(b) != path.subpathOf(sp.first))
        candidates.push_back(sp.first);
    if (candidates.empty()) continue;
    const int f = candidates[rng() % candidates.size()];
    int c = f, d = CRV_LastNodeOfThisSubpath(r.b.data(), r.n, f);
    if (rng() % 2) std::swap(c, d);
    r.p[c] = r.p[a];
    r.p[d] = r.p[b];
    const Raw<V> before = r;
    int A = a, B = b, C = c, D = d;
    const int n = CRV_JoinTwoNodesWithOpenSubpathExt(r.p.data(), r.b.data(), r.n, &A, &B, &C, &D);
    ASSERT_EQ(n, same ? before.n - 1 - Stray(path) : before.n - 2) << k;
    ASSERT_TRUE(r.Take(n)) << k;
    EXPECT_EQ(r.Subpaths(), before.Subpaths() - (same ? 1 + Stray(path) : 2)) << k;
    EXPECT_EQ(testedit::Segments(r), testedit::Segments(before)) << k;
    // The rewritten indices name the joined nodes.
    EXPECT_EQ(A, C);
    EXPECT_EQ(r.p[A], before.p[a]) << k;
    EXPECT_EQ(r.p[D], before.p[b]) << k;
    if (same) {
      EXPECT_TRUE(IsClosedNode(r.b[B]) && IsMove(r.b[B]) && IsClosedNode(r.b[D])) << k;
    }
    (same ? closing : bridging)++;
  }
  EXPECT_GT(closing, 200);
  EXPECT_GT(bridging, 200);
}

TEST(JoinEnabled, ClosesEachSubpathWithBothEndsSelected) {
  std::mt19937 rng(55);
  for (int k = 0; k < 2000; ++k) {
    testpaths::Path path;
    Raw<POINT> r = testedit::Random<POINT>(rng, path, true, 16, false);
    CRV_DisableAllNodes(r.b.data(), r.n);
    int ends = 0, toClose = 0, bridges = 0;
    for (const auto& sp : path.subpaths) {
      if (sp.closed || rng() % 3 == 0) continue;
      r.b[sp.first] |= NodeMask::kEnabled;
      r.b[sp.last] |= NodeMask::kEnabled;
      ends += sp.last > sp.first ? 2 : 1;
      // A single line cannot close onto itself.
      const bool oneLine = sp.last == sp.first + 1;
      if (sp.last > sp.first && !oneLine) {
        ++toClose;
        bridges += r.p[sp.first] != r.p[sp.last];
      }
    }
    if (ends <= 2) continue;
    const testedit::SegSet before = testedit::Segments(r);
    const int closedBefore = CRV_NumSubpaths(r.b.data(), r.n) - CRV_HowManyOpenSubpaths(r.b.data(), r.n);
    const int n = CRV_JoinEnabledAddingLineSegments(r.p.data(), r.b.data(), r.n);
    ASSERT_TRUE(r.Take(n)) << k;
    EXPECT_EQ(CRV_NumSubpaths(r.b.data(), n) - CRV_HowManyOpenSubpaths(r.b.data(), n), closedBefore + toClose) << k;
    EXPECT_EQ(testedit::Segments(r).size(), before.size() + bridges) << k;
  }
  // Two selected ends of one line: nothing to do; of two lines: joined.
  Raw<V> one{{{0, 0}, {5, 0}}, {0x05, 0x45}, 2};
  EXPECT_EQ(CRV_JoinEnabled(one.p.data(), one.b.data(), 2), 2);
  EXPECT_EQ(one.b, (std::vector<NODETYPE>{0x05, 0x45}));
}

TEST(JoinTwoNodes, BadInputChangesNothing) {
  Raw<V> r{{{0, 0}, {1, 1}, {2, 0}, {3, 0}, {0, 5}, {1, 5}, {1, 6}, {0, 5}}, {0x04, 0xC0, 0xC0, 0x84, 0x0C, 0x44, 0x44, 0x48}, 8};
  const Raw<V> before = r;
  for (auto [a, b] : {std::pair{0, 0}, {0, 4}, {0, 7}, {1, 3}, {-1, 3}, {0, 8}, {3, 100}})
    EXPECT_EQ(CRV_JoinTwoNodesExt(r.p.data(), r.b.data(), r.n, a, b, nullptr), -2) << a << "," << b;
  EXPECT_EQ(CRV_JoinTwoNodes<V>(nullptr, r.b.data(), r.n, 0, 3), -2);
  EXPECT_EQ(crvJoinTwoNodes(r.p.data(), r.b.data(), r.n, 0, 4, true), -1);
  EXPECT_EQ(CRV_JoinEnabled(r.p.data(), r.b.data(), 0), -2);
  EXPECT_EQ(CRV_JoinEnabled(r.p.data(), r.b.data(), r.n), -2);  // nothing selected
  // The four-way join wants c and d on one subpath other than a's and b's.
  EXPECT_EQ(CRV_JoinTwoNodesWithOpenSubpath(r.p.data(), r.b.data(), r.n, 0, 3, 0, 3), -1);
  EXPECT_EQ(CRV_JoinTwoNodesWithOpenSubpath(r.p.data(), r.b.data(), r.n, -1, -1, 2, 3), -1);
  int a = 0, b = 3, c = 4, d = 7;
  EXPECT_EQ(CRV_JoinTwoNodesWithOpenSubpathExt(r.p.data(), r.b.data(), r.n, &a, &b, &c, &d), -1);
  EXPECT_EQ(CRV_JoinTwoNodesWithOpenSubpathExt<V>(r.p.data(), r.b.data(), r.n, &a, nullptr, &c, &d), -1);
  EXPECT_TRUE(r == before);
}

}  // namespace
