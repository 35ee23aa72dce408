// Validity, flag repair, walking and twins of raw node arrays.
#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "polycurve.h"
#include "random_paths.h"

namespace {

using Nodes = std::vector<NODETYPE>;
using OstraCrv::FixNodeTypes;
using OstraCrv::IsValidCurve;

bool valid(const Nodes& v) { return IsValidCurve(v.data(), v.size()); }

// The published bytes, spelled out.
constexpr NODETYPE kMove = 0x04, kLine = 0x44, kCurve = 0x84, kArc = 0xC0, kCMove = 0x0C, kCLine = 0x48,
                   kCCurve = 0x88;

// (Closed arcs, lone arcs before a curve and ends that disagree are caught by
// the mutation run below.)
TEST(NodeValidity, AcceptsLegalShapesAndRejectsEachRuleViolation) {
  EXPECT_TRUE(IsValidCurve(nullptr, 0));
  EXPECT_TRUE(valid({kMove}));
  EXPECT_TRUE(valid({kCMove}));            // a lone move, even closed
  EXPECT_TRUE(valid({kMove, kMove, kLine}));  // dangling move then a segment
  EXPECT_TRUE(valid({kCMove, kLine, kLine, kCLine}));  // the closed triangle
  EXPECT_TRUE(valid({kCMove, kArc, kArc, kCCurve}));
  EXPECT_TRUE(valid({kMove, kArc | 0x05, kArc | 0x01, kCurve}));  // picked arcs while enabled
  // Flags deliberately left to FixNodeTypes.
  EXPECT_TRUE(valid({kMove, 0x4C, kLine}));             // stray closed bit inside
  EXPECT_TRUE(valid({kMove, 0x40, kLine}));             // interior node without user bit
  EXPECT_TRUE(valid({0x08, kLine, kLine, kCLine}));     // closed, neither end a user node
  const NODETYPE one = kMove;
  EXPECT_FALSE(IsValidCurve(nullptr, 3));
  EXPECT_FALSE(IsValidCurve(&one, static_cast<unsigned long>(-1)));
  EXPECT_FALSE(valid({kLine, kLine}));                         // does not start with a move
  EXPECT_FALSE(valid({kMove, kArc, kMove, kLine}));             // move after an arc
  EXPECT_FALSE(valid({kMove, kArc, kLine}));                    // line after an arc
  EXPECT_FALSE(valid({kMove, kArc, kCurve}));                   // curve too near the start
  EXPECT_FALSE(valid({kMove, kArc, kArc, kArc, kCurve}));       // a third arc in a row
  EXPECT_FALSE(valid({kMove, kLine, kArc}));                    // arc ends the array
  EXPECT_FALSE(valid({kMove, kArc, kArc | 0x10, kCurve}));      // arc with continuity
  EXPECT_FALSE(valid({kMove, kArc | 0x04, kArc, kCurve}));      // picked arc not enabled
  EXPECT_FALSE(valid({kCMove, kLine, kLine, 0x4C}));            // both closed ends user nodes
  EXPECT_FALSE(valid({kMove, kLine, kCMove, kArc, kArc, 0x8C})); // same, in a later subpath
}

TEST(NodeValidity, RandomPathsAreValidAndMutationsAreCaught) {
  std::mt19937 rng(101);
  for (int trial = 0; trial < 2000; ++trial) {
    const auto p = testpaths::Make(rng);
    ASSERT_TRUE(valid(p.nodes));
    for (const auto& seg : p.segments) {
      if (!seg.bezier) continue;
      Nodes bad = p.nodes;
      bad[seg.end - 1] |= NodeMask::kClosed;
      EXPECT_FALSE(valid(bad));
      bad = p.nodes;
      bad[seg.end - 2] = NodeTypes::Open::line;  // a lone arc before the curve
      EXPECT_FALSE(valid(bad));
    }
    for (const auto& sp : p.subpaths) {
      if (sp.first == sp.last) continue;
      Nodes bad = p.nodes;
      bad[sp.last] ^= NodeMask::kClosed;  // ends disagree
      EXPECT_FALSE(valid(bad));
    }
  }
}

// Scrambling the flags that FixNodeTypes owns and repairing gives back the
// original path; the change report is exact and a second run changes nothing.
TEST(NodeRepair, RestoresScrambledFlagsOfRandomPaths) {
  std::mt19937 rng(202);
  for (int trial = 0; trial < 2000; ++trial) {
    const auto p = testpaths::Make(rng);
    Nodes v = p.nodes;
    ASSERT_FALSE(FixNodeTypes(v.data(), v.size()));
    ASSERT_EQ(v, p.nodes);
    for (int i = 0; i < p.n(); ++i) {
      const int r = int(rng() % 8);
      if (IsMove(v[i])) {
        if (r == 0) v[i] &= NODETYPE(~NodeMask::kUser);
      } else {
        if (r == 0) v[i] ^= NodeMask::kClosed;
        if (r == 1 && !IsArc(v[i])) v[i] ^= NodeMask::kUser;
      }
    }
    for (const auto& sp : p.subpaths)  // a last node that lost its kind to an arc
      if (sp.last != sp.first && IsLine(v[sp.last]) && rng() % 4 == 0) v[sp.last] |= NodeMask::kArc;
    const bool scrambled = v != p.nodes;
    EXPECT_EQ(FixNodeTypes(v.data(), v.size()), scrambled);
    EXPECT_EQ(v, p.nodes);
    EXPECT_FALSE(FixNodeTypes(v.data(), v.size()));
  }
}

// NN walks each closed ring f+1..l and returns to its start; PN walks it
// backwards; open ends stay put.
TEST(NodeWalk, RingsOfRandomPaths) {
  std::mt19937 rng(303);
  for (int trial = 0; trial < 2000; ++trial) {
    const auto p = testpaths::Make(rng);
    const NODETYPE* v = p.nodes.data();
    const int n = p.n();
    for (const auto& sp : p.subpaths) {
      if (sp.first == sp.last) {
        EXPECT_EQ(NN(v, sp.first, n), sp.first);
        EXPECT_EQ(PN(v, sp.first, n), sp.first);
        continue;
      }
      EXPECT_EQ(NN(v, sp.first, n), sp.first + 1);
      if (!sp.closed) {
        EXPECT_EQ(NN(v, sp.last, n), sp.last);
        EXPECT_EQ(PN(v, sp.first, n), sp.first);
        for (int i = sp.first + 1; i <= sp.last; ++i) EXPECT_EQ(PN(v, i, n), i - 1);
        continue;
      }
      EXPECT_EQ(PN(v, sp.first, n), sp.last);
      const int ring = sp.last - sp.first;
      int fwd = sp.last, back = sp.last;
      for (int step = 1; step <= ring; ++step) {
        const int next = NN(v, fwd, n);
        EXPECT_EQ(PN(v, next, n), fwd);
        fwd = next;
        back = PN(v, back, n);
        ASSERT_GT(fwd, sp.first);
        ASSERT_LE(fwd, sp.last);
        EXPECT_EQ(step < ring, fwd != sp.last);
        EXPECT_EQ(step < ring, back != sp.last);
      }
    }
  }
}

// NNControl and PNControl step from segment end to segment end.
TEST(NodeWalk, ControlSkipsArcs) {
  std::mt19937 rng(404);
  for (int trial = 0; trial < 2000; ++trial) {
    const auto p = testpaths::Make(rng);
    const NODETYPE* v = p.nodes.data();
    const int n = p.n();
    for (size_t k = 0; k < p.segments.size(); ++k) {
      const auto& seg = p.segments[k];
      const auto& sp = p.subpaths[seg.subpath];
      const bool firstOfSubpath = seg.start == sp.first;
      const bool lastOfSubpath = seg.end == sp.last;
      if (firstOfSubpath) {
        EXPECT_EQ(NNControl(v, sp.first, n), seg.end);
      }
      int next = lastOfSubpath ? seg.end : p.segments[k + 1].end;
      if (lastOfSubpath && sp.closed) {
        size_t j = k;
        while (p.segments[j].start != sp.first) --j;
        next = p.segments[j].end;
      }
      EXPECT_EQ(NNControl(v, seg.end, n), next);
      EXPECT_EQ(PNControl(v, seg.end, n), firstOfSubpath && sp.closed ? sp.last : seg.start);
    }
  }
}

// The twins are exactly the two ends of each closed subpath, and the flag
// writers change the node, its twin and nothing else.
TEST(NodeTwins, PairedAndWrittenTogether) {
  std::mt19937 rng(505);
  for (int trial = 0; trial < 2000; ++trial) {
    const auto p = testpaths::Make(rng);
    const int n = p.n();
    std::vector<int> twin(n, -1);
    for (const auto& sp : p.subpaths)
      if (sp.closed) twin[sp.first] = sp.last, twin[sp.last] = sp.first;
    for (int i = 0; i < n; ++i) EXPECT_EQ(OtherClosedEnd(p.nodes.data(), i, n), twin[i]) << i;

    const int i = int(rng() % unsigned(n));
    const int on = int(rng() % 2);
    const auto c = ContinuityType(rng() % 3);
    Nodes v = p.nodes;
    CRV_SetEnabled(v.data(), n, i, on);
    CRV_SetCont(v.data(), n, i, c);
    for (int j = 0; j < n; ++j) {
      if (j == i || j == twin[i]) {
        EXPECT_EQ(IsEnabledNode(v[j]), on == 1);
        EXPECT_EQ(GetContinuity(v[j]), c);
        EXPECT_EQ(v[j] & 0xCE, p.nodes[j] & 0xCE);  // nothing else moved
      } else {
        EXPECT_EQ(v[j], p.nodes[j]);
      }
    }
  }
}

TEST(NodeTwins, LoneClosedMoveIsItsOwnTwin) {
  const Nodes v = {kCMove, kCMove, kLine, kCLine};
  EXPECT_EQ(OtherClosedEnd(v.data(), 0, 4), 0);
  EXPECT_EQ(OtherClosedEnd(v.data(), 1, 4), 3);
  Nodes w = v;
  CRV_SetEnabled(w.data(), 4, 0, 1);
  EXPECT_EQ(w, (Nodes{kCMove | 1, kCMove, kLine, kCLine}));
  // A closed start whose subpath never closes has no twin.
  const Nodes open = {kCMove, kLine, kLine};
  EXPECT_EQ(OtherClosedEnd(open.data(), 0, 3), -1);
}

}  // namespace
