// Counting, segment numbering and subpath queries on raw node arrays, checked
// against how random paths were built and against per-byte brute force.
#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "polycurve.h"
#include "random_paths.h"

namespace {

using Nodes = std::vector<NODETYPE>;
using namespace OstraCrv;

// Per-byte reference counts, one at a time and obvious.
struct Reference {
  int lines = 0, curves = 0, moves = 0, openMoves = 0, users = 0, enabledUsers = 0, closed = 0;
  explicit Reference(const NODETYPE* v, int n) {
    for (int i = 0; i < n; ++i) {
      const int type = v[i] >> 6;
      lines += type == 1;
      curves += type == 2;
      moves += type == 0;
      openMoves += type == 0 && !(v[i] & 0x08);
      users += type != 3 && (v[i] & 0x04);
      enabledUsers += type != 3 && (v[i] & 0x04) && (v[i] & 0x01);
      closed += (v[i] & 0x08) != 0;
    }
  }
};

void expectCountsMatch(const NODETYPE* v, int n) {
  const Reference r(v, n);
  ASSERT_EQ(CRV_HowManyLines(v, n), r.lines);
  ASSERT_EQ(CRV_HowManyCurves(v, n), r.curves);
  ASSERT_EQ(CRV_NumSubpaths(v, n), r.moves);
  ASSERT_EQ(CRV_HowManyOpenSubpaths(v, n), r.openMoves);
  ASSERT_EQ(GetSegmentCount(v, n), r.lines + r.curves);
  ASSERT_EQ(CRV_GetNumberOfUserNodes(v, unsigned(n), false), r.users);
  ASSERT_EQ(CRV_GetNumberOfUserNodes(v, unsigned(n), true), r.enabledUsers);
  ASSERT_EQ(CRV_ContainsClosedSubpath(v, n), r.closed > 0);
  ASSERT_EQ(CRV_ContainsOpenSubpath(v, n, false), r.openMoves > 0);
}

// Arbitrary bytes at every alignment and every tail length, and arrays long
// enough to cross the word-counter blocks.
TEST(NodeCounts, AgreeWithPerByteCountOnArbitraryBytes) {
  std::mt19937 rng(606);
  Nodes buf(9000);
  for (auto& b : buf) b = NODETYPE(rng());
  for (int offset = 0; offset < 8; ++offset)
    for (int n = 0; n <= 80; ++n) expectCountsMatch(buf.data() + offset, n);
  for (int n : {2039, 2040, 2041, 4087, 8999 - 7}) expectCountsMatch(buf.data() + 7, n);
  // All bytes alike: every lane counter runs full.
  for (NODETYPE b : {NODETYPE(0x00), NODETYPE(0x44), NODETYPE(0x88), NODETYPE(0xFF)}) {
    Nodes same(5000, b);
    expectCountsMatch(same.data(), int(same.size()));
  }
}

TEST(NodeCounts, AgreeWithConstructionOfRandomPaths) {
  std::mt19937 rng(707);
  for (int trial = 0; trial < 2000; ++trial) {
    const auto p = testpaths::Make(rng);
    const NODETYPE* v = p.nodes.data();
    const int n = p.n();
    int open = 0, closed = 0, openWithSegment = 0, beziers = 0, users = 0;
    for (const auto& sp : p.subpaths) {
      sp.closed ? ++closed : ++open;
      openWithSegment += !sp.closed && sp.last > sp.first;
      // A closed subpath counts its shared point once.
      int nonArcs = 0;
      for (int i = sp.first; i <= sp.last; ++i) nonArcs += !IsArc(v[i]);
      users += nonArcs - sp.closed;
    }
    for (const auto& seg : p.segments) beziers += seg.bezier;
    EXPECT_EQ(CRV_NumSubpaths(v, n), int(p.subpaths.size()));
    EXPECT_EQ(CRV_HowManyOpenSubpaths(v, n), open);
    EXPECT_EQ(GetSegmentCount(v, n), int(p.segments.size()));
    EXPECT_EQ(CRV_HowManyCurves(v, n), beziers);
    EXPECT_EQ(CRV_HowManyLines(v, n), int(p.segments.size()) - beziers);
    EXPECT_EQ(CRV_GetNumberOfUserNodes(v, unsigned(n), false), users);
    EXPECT_EQ(CRV_ContainsClosedSubpath(v, n), closed > 0);
    EXPECT_EQ(CRV_ContainsOpenSubpath(v, n, true), openWithSegment > 0);
    for (const auto& sp : p.subpaths)
      EXPECT_EQ(CRV_CountNodesInSubpath(v + sp.first, sp.first, n), sp.last - sp.first + 1);
  }
}

// Every segment of every random path converts both ways between its number and
// its start and end nodes.
TEST(SegmentIndex, ConversionsAreMutualInverses) {
  std::mt19937 rng(808);
  for (int trial = 0; trial < 2000; ++trial) {
    const auto p = testpaths::Make(rng);
    const NODETYPE* v = p.nodes.data();
    const int n = p.n();
    const int count = int(p.segments.size());
    for (int s = 0; s < count; ++s) {
      const auto& seg = p.segments[s];
      EXPECT_EQ(SegmentToLastNodeIndex(v, n, s), seg.end);
      EXPECT_EQ(SegmentToFirstNodeIndex(v, n, s), seg.start);
      EXPECT_EQ(LastNodeToSegmentIndex(v, n, seg.end), s);
      EXPECT_EQ(FirstNodeToSegmentIndex(v, n, seg.start), s);
    }
    EXPECT_EQ(SegmentToLastNodeIndex(v, n, count), -1);
    EXPECT_EQ(SegmentToFirstNodeIndex(v, n, count), -1);
    // A node that ends nothing answers the last segment before it.
    int last = -1;
    for (int i = 0; i < n; ++i) {
      if (last + 1 < count && p.segments[last + 1].end == i) ++last;
      EXPECT_EQ(LastNodeToSegmentIndex(v, n, i), last);
    }
  }
}

TEST(SegmentIndex, LongArraysAcrossCounterBlocks) {
  std::mt19937 rng(909);
  Nodes v;
  std::vector<int> ends;
  while (v.size() < 12000) {
    const auto p = testpaths::Make(rng, 1, 12);
    for (const auto& seg : p.segments) ends.push_back(int(v.size()) + seg.end);
    v.insert(v.end(), p.nodes.begin(), p.nodes.end());
  }
  const int n = int(v.size());
  for (int s = 0; s < int(ends.size()); ++s) {
    ASSERT_EQ(SegmentToLastNodeIndex(v.data(), n, s), ends[s]);
    ASSERT_EQ(LastNodeToSegmentIndex(v.data(), n, ends[s]), s);
  }
}

TEST(SegmentIndex, NodesThatStartNoSegment) {
  const Nodes v = {NodeTypes::Open::move, NodeTypes::Open::line, NodeTypes::Open::line, NodeTypes::Open::move,
                   NodeTypes::Open::line};
  // The segment "starting" at the last node of a path reaches past the end.
  EXPECT_EQ(FirstNodeToSegmentIndex(v.data(), 5, 4), -1);
  const Nodes bez = {NodeTypes::Open::move, NodeTypes::arc, NodeTypes::arc};
  EXPECT_EQ(FirstNodeToSegmentIndex(bez.data(), 3, 0), -1);
}

// Subpath membership, ends and closedness from the construction record.
TEST(SubpathQueries, AgreeWithConstruction) {
  std::mt19937 rng(1010);
  for (int trial = 0; trial < 1000; ++trial) {
    const auto p = testpaths::Make(rng);
    const NODETYPE* v = p.nodes.data();
    const int n = p.n();
    for (int i = 0; i < n; ++i) {
      const auto& sp = p.subpaths[p.subpathOf(i)];
      const bool first = i == sp.first, last = i == sp.last;
      EXPECT_EQ(CRV_FirstNodeOfThisSubpath(v, n, i), sp.first);
      EXPECT_EQ(CRV_LastNodeOfThisSubpath(v, n, i), sp.last);
      EXPECT_EQ(CRV_IsThisSubpathClosed(v, n, i), sp.closed);
      EXPECT_EQ(CRV_IsFirstSubpathNode(v, n, i), first);
      EXPECT_EQ(CRV_IsLastSubpathNode(v, n, i), last);
      EXPECT_EQ(CRV_IsFirstOrLastSubpathNode(v, n, i), first || last);
      EXPECT_EQ(CRV_IsFirstOpenSubpathNode(v, n, i), first && !sp.closed);
      EXPECT_EQ(CRV_IsLastOpenSubpathNode(v, n, i), last && !sp.closed);
      EXPECT_EQ(CRV_IsFirstOrLastOpenSubpathNode(v, n, i), (first || last) && !sp.closed);
      EXPECT_EQ(CRV_IsFirstClosedSubpathNode(v, n, i), first && sp.closed);
      EXPECT_EQ(CRV_IsLastClosedSubpathNode(v, n, i), last && sp.closed);
      EXPECT_EQ(CRV_IsFirstOrLastClosedSubpathNode(v, n, i), (first || last) && sp.closed);
      const int expectedUser = IsArc(v[i]) ? (IsUserNode(v[i]) ? i : -1) : (sp.closed && last ? sp.first : i);
      EXPECT_EQ(CRV_GetUserNode(v, n, i), expectedUser);
      const int j = int(rng() % unsigned(n));
      EXPECT_EQ(CRV_TwoNodesInSameSubpath(v, n, i, j), p.subpathOf(i) == p.subpathOf(j));
    }
  }
}

// Smoothable: two segments meet and one is a Bezier; symmetable: both are.
// The segments that meet at each node come from the construction record.
TEST(SubpathQueries, SmoothableAndSymmetableFromAdjacentSegments) {
  std::mt19937 rng(1111);
  for (int trial = 0; trial < 2000; ++trial) {
    const auto p = testpaths::Make(rng);
    const int n = p.n();
    std::vector<int> in(n, -1), out(n, -1);  // 0 line, 1 Bezier, -1 none
    for (size_t k = 0; k < p.segments.size(); ++k) {
      const auto& seg = p.segments[k];
      in[seg.end] = out[seg.start] = seg.bezier;
      const auto& sp = p.subpaths[seg.subpath];
      if (sp.closed && seg.end == sp.last) in[sp.first] = seg.bezier;
      if (sp.closed && seg.start == sp.first) out[sp.last] = seg.bezier;
    }
    for (int i = 0; i < n; ++i) {
      const bool both = in[i] >= 0 && out[i] >= 0 && !IsArc(p.nodes[i]);
      EXPECT_EQ(IsNodeSmoothable(p.nodes.data(), i, n), both && (in[i] || out[i])) << i;
      EXPECT_EQ(IsNodeSymmetable(p.nodes.data(), i, n), both && in[i] && out[i]) << i;
    }
  }
}

}  // namespace
