// The subpath tree against containment known from the construction: random
// sets of circles and squares that do not cross, nested or side by side, in
// random order; rings, letters, open subpaths and bad input.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <map>
#include <random>

#include "measure/inshape_reference.h"
#include "polycurve.h"

namespace {

using namespace OstraCrv;
using Framework::common_types::POINT;
using inref::Builder;
using MavikMath::V;

struct Disc {
  V c;
  double r;
};

// Random discs that never cross: each new one lies clear outside or clear
// inside every other, by at least 3 units.
std::vector<Disc> RandomDiscs(std::mt19937& rng, int count) {
  std::uniform_real_distribution<double> u(0, 1);
  std::vector<Disc> discs;
  while (int(discs.size()) < count) {
    const Disc d{{u(rng) * 1800 + 100, u(rng) * 1800 + 100}, 4 + u(rng) * 400};
    bool ok = true;
    for (const Disc& o : discs) {
      const double dist = std::hypot(d.c.x - o.c.x, d.c.y - o.c.y);
      ok = ok && (dist > d.r + o.r + 3 || dist + std::min(d.r, o.r) < std::max(d.r, o.r) - 3);
    }
    if (ok) discs.push_back(d);
  }
  return discs;
}

// The disc that directly holds disc i: the smallest of those holding it.
int Holder(const std::vector<Disc>& discs, int i) {
  int best = -1;
  for (int k = 0; k < int(discs.size()); ++k) {
    const double dist = std::hypot(discs[i].c.x - discs[k].c.x, discs[i].c.y - discs[k].c.y);
    if (k != i && dist + discs[i].r < discs[k].r && (best < 0 || discs[k].r < discs[best].r)) best = k;
  }
  return best;
}

// Parent of every subpath node in the tree, by the subpath's first node
// offset into nodes (-1 for the root); fails on a subpath seen twice.
void CollectParents(const SubpathTreeNode& n, const NODETYPE* nodes, int parent, std::map<int, int>& out) {
  for (unsigned long i = 0; i < n.GetNumberOfChildren(); ++i) {
    const SubpathTreeNode& c = n.GetChild(i);
    const int at = c.count ? int(c.nodes - nodes) : parent;  // groups pass their parent on
    if (c.count) {
      EXPECT_TRUE(out.emplace(at, parent).second);
    }
    CollectParents(c, nodes, at, out);
  }
}

template <class T>
void RandomNesting() {
  std::mt19937 rng(77);
  for (int trial = 0; trial < 40; ++trial) {
    const std::vector<Disc> discs = RandomDiscs(rng, 2 + int(rng() % 12));
    std::vector<int> order(discs.size());
    for (int i = 0; i < int(order.size()); ++i) order[i] = i;
    std::shuffle(order.begin(), order.end(), rng);
    Builder<T> b;
    std::map<int, int> discAt;  // first node -> disc
    for (int i : order) {
      discAt[b.n()] = i;
      if (rng() % 3)  // a circle of Beziers or a square inside the disc's circle
        b.Circle(discs[i].c, discs[i].r, rng() % 2);
      else {
        const double h = discs[i].r * 0.99;
        const V& c = discs[i].c;
        b.Polygon({{c.x - h, c.y - h}, {c.x - h, c.y + h}, {c.x + h, c.y + h}, {c.x + h, c.y - h}});
      }
    }
    // Squares lie within their discs; any disc holding the disc holds them.
    const SubpathHierarchy tree(b.points.data(), b.nodes.data(), b.n(), false);
    std::map<int, int> parents;
    CollectParents(tree.GetRoot(), b.nodes.data(), -1, parents);
    ASSERT_EQ(parents.size(), discs.size());
    for (const auto& [at, parent] : parents) {
      const int h = Holder(discs, discAt[at]);
      EXPECT_EQ(parent < 0 ? -1 : discAt[parent], h) << "trial " << trial;
    }
    // Adding the same nodes one by one in another order gives the same tree.
    std::vector<SubpathTreeNode> flat;
    for (const auto& [at, disc] : discAt) {
      const int count = CRV_LastNodeOfThisSubpath(b.nodes.data(), b.n(), at) - at + 1;
      flat.emplace_back(b.points.data() + at, b.nodes.data() + at, count, disc);
    }
    std::shuffle(flat.begin(), flat.end(), rng);
    const SubpathHierarchy again(flat, false);
    std::map<int, int> parents2;
    CollectParents(again.GetRoot(), b.nodes.data(), -1, parents2);
    EXPECT_EQ(parents, parents2);
  }
}

TEST(SubpathHierarchy, RandomNestingMatchesContainmentInteger) { RandomNesting<POINT>(); }
TEST(SubpathHierarchy, RandomNestingMatchesContainmentDouble) { RandomNesting<V>(); }

int Depth(const SubpathTreeNode& n) { return n.GetNumberOfChildren() ? 1 + Depth(n.GetChild(0)) : 0; }

// Outline, hole, island, hole in the island, in every order of insertion,
// with alternating directions: a chain of depth four whose net areas
// alternate in sign. Turning one loop round drops it with what it holds.
TEST(SubpathHierarchy, RingsNestAsAChainAndCutOffsGo) {
  std::vector<int> order{0, 1, 2, 3};
  do {
    Builder<V> b;
    for (int k : order) b.Circle({0, 0}, 400.0 - 100 * k, k % 2 == 0);
    SubpathHierarchy tree(b.points.data(), b.nodes.data(), b.n(), false);
    const SubpathTreeNode& root = tree.GetRoot();
    ASSERT_EQ(root.GetNumberOfChildren(), 1u);
    EXPECT_EQ(Depth(root), 4);
    const SubpathTreeNode* n = &root.GetChild(0);
    for (int k = 0; k < 4; ++k, n = &n->GetChild(0)) {
      EXPECT_NEAR(std::fabs(n->GetArea()), M_PI * std::pow(400.0 - 100 * k, 2), 2000.0);
      EXPECT_EQ(n->GetAreaWithChildren() > 0, k % 2 == 0);
    }
    tree.GetRoot().EliminateCutOffs(true);
    EXPECT_EQ(Depth(tree.GetRoot()), 4);
    tree.GetRoot().EliminateCutOffs(false);
    EXPECT_EQ(Depth(tree.GetRoot()), 0);
  } while (std::next_permutation(order.begin(), order.end()));

  // The island turned round (running like the hole) is cut off with the hole
  // it holds.
  Builder<V> b;
  for (int k = 0; k < 4; ++k) b.Circle({0, 0}, 400.0 - 100 * k, k == 0);
  SubpathHierarchy tree(b.points.data(), b.nodes.data(), b.n(), false);
  tree.GetRoot().EliminateCutOffs(true);
  EXPECT_EQ(Depth(tree.GetRoot()), 2);
  EXPECT_EQ(tree.GetRoot().GetTotalNumberOfPoints(), 26);
}

// Two glyphs with the letter bit on each outline: every contour is kept, the
// groups do not nest even where one glyph lies within the other, and a lone
// letter move only separates.
TEST(SubpathHierarchy, LettersFormGroups) {
  Builder<V> b;
  b.Polygon({{-5, -5}}, false, NodeMask::kLetter);  // lone separator first
  b.Polygon({{0, 0}, {0, 300}, {300, 300}, {300, 0}}, true, NodeMask::kLetter);
  b.Polygon({{10, 10}, {10, 290}, {290, 290}, {290, 10}});
  b.Polygon({{100, 100}, {100, 200}, {200, 200}, {200, 100}}, true, NodeMask::kLetter);  // within the first
  b.Polygon({{120, 120}, {120, 180}, {180, 180}, {180, 120}});
  b.Polygon({{-9, -9}}, false, NodeMask::kLetter);  // lone separator last
  for (bool asGroup : {false, true}) {
    const SubpathHierarchy tree(b.points.data(), b.nodes.data(), b.n(), asGroup);
    const SubpathTreeNode& root = tree.GetRoot();
    ASSERT_EQ(root.GetNumberOfChildren(), 2u);
    EXPECT_EQ(root.GetTotalNumberOfPoints(), 20);
    for (unsigned long g = 0; g < 2; ++g) {
      const SubpathTreeNode* outline = &root.GetChild(g);
      if (asGroup) {
        EXPECT_EQ(outline->count, 0);
        ASSERT_EQ(outline->GetNumberOfChildren(), 1u);
        outline = &outline->GetChild(0);
      }
      EXPECT_EQ(outline->count, 5);
      EXPECT_EQ(outline->GetNumberOfChildren(), 1u);
    }
  }
  // Without letter bits, asGroup makes one group: the lone moves as open
  // subpaths and the four squares nested in one chain.
  std::vector<NODETYPE> plain(b.nodes);
  for (NODETYPE& n : plain) n &= NODETYPE(~NodeMask::kLetter);
  const SubpathHierarchy one(b.points.data(), plain.data(), b.n(), true);
  ASSERT_EQ(one.GetRoot().GetNumberOfChildren(), 1u);
  ASSERT_EQ(one.GetRoot().GetChild(0).GetNumberOfChildren(), 3u);
  EXPECT_EQ(Depth(one.GetRoot().GetChild(0).GetChild(1)), 3);
}

// Open subpaths stay at the top of their group, before or after a closed
// subpath that covers them; closed ones never nest into them.
TEST(SubpathHierarchy, OpenSubpathsNeverNest) {
  Builder<V> b;
  b.Polygon({{-10, 0}, {10, 0}}, false);
  b.Circle({0, 0}, 100, true);
  b.Polygon({{-20, 5}, {20, 5}}, false);
  b.Circle({0, 0}, 30, false);
  const SubpathHierarchy tree(b.points.data(), b.nodes.data(), b.n(), false);
  const SubpathTreeNode& root = tree.GetRoot();
  ASSERT_EQ(root.GetNumberOfChildren(), 3u);
  EXPECT_EQ(root.GetChild(0).count, 2);
  EXPECT_EQ(root.GetChild(1).count, 13);
  EXPECT_EQ(root.GetChild(1).GetNumberOfChildren(), 1u);
  EXPECT_EQ(root.GetChild(2).count, 2);
  EXPECT_FALSE(root.GetChild(0).IsInsideOf(root.GetChild(1)));
  EXPECT_EQ(root.GetChild(0).GetArea(), 0.0);
}

TEST(SubpathHierarchy, WholeCurvesIdenticalSubpathsAndNodeLists) {
  Builder<V> outer, small, twice;
  outer.Circle({0, 0}, 200, true);
  outer.Circle({0, 0}, 100, false);  // a hole within the same curve
  small.Circle({150, 0}, 30, true);  // in the ring between the two
  std::vector<PolycurveD> curves{PolycurveD(small.points.data(), small.nodes.data(), small.points.size()),
                                 PolycurveD(outer.points.data(), outer.nodes.data(), outer.points.size())};
  const SubpathHierarchy whole(curves);
  ASSERT_EQ(whole.GetRoot().GetNumberOfChildren(), 1u);
  const SubpathTreeNode& big = whole.GetRoot().GetChild(0);
  EXPECT_EQ(big.count, 26);
  EXPECT_EQ(big.index, 1);
  EXPECT_NEAR(big.GetArea(), M_PI * (200 * 200 - 100 * 100), 500);
  ASSERT_EQ(big.GetNumberOfChildren(), 1u);
  EXPECT_EQ(big.GetChild(0).index, 0);

  twice.Circle({0, 0}, 50, true);
  twice.Circle({0, 0}, 50, true);  // identical: nests in the first
  const SubpathHierarchy split(twice.points.data(), twice.nodes.data(), twice.n(), false);
  EXPECT_EQ(Depth(split.GetRoot()), 2);

  // The pre-order walk gives every subpath back, outline before its hole.
  std::vector<V> pts;
  std::vector<NODETYPE> nodes;
  whole.GetRoot().AppendNodes(pts, nodes);
  EXPECT_EQ(pts.size(), 39u);
  EXPECT_EQ(pts[0], outer.points[0]);
  Polycurve asInteger;
  whole.GetRoot().AppendToPolycurve(asInteger);
  EXPECT_EQ(int(asInteger.GetPointCount()), whole.GetRoot().GetTotalNumberOfPoints());
  EXPECT_TRUE(IsValidCurve(asInteger.GetNodeTypes(), asInteger.GetPointCount()));

  std::vector<SubpathTreeNode> list{big, big.GetChild(0)};
  EXPECT_EQ(SubpathHierarchy(list, true).GetRoot().GetNumberOfChildren(), 0u);
  list[1].marked = true;
  EXPECT_EQ(SubpathHierarchy(list, true).GetRoot().GetNumberOfChildren(), 1u);
}

TEST(SubpathHierarchy, EditingChildren) {
  SubpathTreeNode n, a, target;
  for (int i : {1, 2}) {
    a.index = i;
    n.AddChild(a);
  }
  n.AddChild(n.GetChild(0));  // a copy of its own child
  n.RemoveChild(0);
  n.RemoveChild(7);
  ASSERT_EQ(n.GetNumberOfChildren(), 2u);
  EXPECT_EQ(n.GetChild(0).index * 10 + n.GetChild(1).index, 21);
  n.GetChild(9).index = 5;  // the default node for a bad index, reset on each call
  EXPECT_EQ(n.GetChild(9).index, -1);
  n.MoveChildrenTo(target, true);
  ASSERT_EQ(target.GetNumberOfChildren(), 1u);
  EXPECT_EQ(n.GetNumberOfChildren() + target.GetChild(0).GetNumberOfChildren(), 2u);
  target.GetChild(0).MoveChildrenTo(target, false);  // into its own parent
  EXPECT_EQ(target.GetNumberOfChildren(), 3u);
}

TEST(SubpathHierarchy, BadInputNeverCrashes) {
  const double nan = std::numeric_limits<double>::quiet_NaN();
  Builder<V> b;
  b.Polygon({{0, 0}, {0, 100}, {nan, nan}, {100, 0}});
  b.Polygon({{10, 10}, {10, 20}, {20, 20}});
  const SubpathHierarchy withNaN(b.points.data(), b.nodes.data(), b.n(), false);
  EXPECT_EQ(withNaN.GetRoot().GetTotalNumberOfPoints(), b.n());
  const SubpathHierarchy empty(b.points.data(), b.nodes.data(), 0, true);
  EXPECT_EQ(empty.GetRoot().GetNumberOfChildren(), 0u);
  const SubpathHierarchy noNodes(b.points.data(), nullptr, b.n(), false);
  EXPECT_EQ(noNodes.GetRoot().GetNumberOfChildren(), 0u);
  const SubpathHierarchy noPoints(static_cast<const POINT*>(nullptr), b.nodes.data(), b.n(), false);
  EXPECT_EQ(noPoints.GetRoot().GetNumberOfChildren(), 2u);
  const SubpathTreeNode bare(static_cast<const V*>(nullptr), nullptr, 5, 0);
  EXPECT_EQ(bare.GetArea(), 0.0);
  EXPECT_FALSE(bare.IsInsideOf(withNaN.GetRoot().GetChild(0)));
  EXPECT_FALSE(withNaN.GetRoot().GetChild(1).IsInsideOf(bare));
}

}  // namespace
