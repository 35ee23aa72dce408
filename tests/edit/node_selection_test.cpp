// Node selection: counts against the construction record of random paths,
// the control points that follow a selected node, the capability mask, and
// the selection methods of PolycurveT.
#include <gtest/gtest.h>

#include "edit/edit_fixture.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;
using Bytes = std::vector<NODETYPE>;

bool Valid(const Bytes& b) { return OstraCrv::IsValidCurve(b.data(), b.size()); }

TEST(Selection, CountsAgreeWithTheConstruction) {
  std::mt19937 rng(61);
  for (int k = 0; k < 2000; ++k) {
    const testpaths::Path path = testpaths::Make(rng);
    const Bytes& b = path.nodes;
    const int n = path.n();
    int selected = 0, subpaths = 0, lines = 0, curves = 0, interior = 0;
    for (int k2 = 0; k2 < int(path.subpaths.size()); ++k2) {
      // A subpath counts if its move or a segment end other than its closing
      // node (the move's twin, no user node) is selected.
      const testpaths::Subpath& sp = path.subpaths[k2];
      bool any = IsEnabledNode(b[sp.first]);
      for (const auto& s : path.segments)
        if (s.subpath == k2 && !(sp.closed && s.end == sp.last)) any = any || IsEnabledNode(b[s.end]);
      subpaths += any;
    }
    for (const auto& s : path.segments) {
      const bool on = IsEnabledNode(b[s.end]);
      (s.bezier ? curves : lines) += on;
      const bool closing = path.subpaths[s.subpath].closed && s.end == path.subpaths[s.subpath].last;
      selected += on && !closing;
      interior += on && s.end != path.subpaths[s.subpath].last;
    }
    for (const auto& sp : path.subpaths) selected += IsEnabledNode(b[sp.first]);
    EXPECT_EQ(CRV_HowManyEnabled(b.data(), n), selected) << k;
    EXPECT_EQ(CRV_HowManyEnabledSubpaths(b.data(), n), subpaths) << k;
    EXPECT_EQ(CRV_HowManyEnabledLines(b.data(), n), lines) << k;
    EXPECT_EQ(CRV_HowManyEnabledCurves(b.data(), n), curves) << k;
    EXPECT_EQ(CRV_HowManyEnabledNotFirstOrLastInSubpath(b.data(), n), interior) << k;
  }
  const NODETYPE one = 0x05;
  EXPECT_EQ(CRV_HowManyEnabled(&one, 0), 0);
  EXPECT_EQ(CRV_HowManyEnabled(nullptr, 5), 0);
  EXPECT_EQ(CRV_HowManyEnabledNotFirstOrLastInOpenSubpath(&one, 1), 0);
}

TEST(Selection, ClosedEndsAreTwins) {
  Bytes b = {0x0C, 0x44, 0x44, 0x48};
  CRV_SetEnabled(b.data(), 4, 0, 1);
  EXPECT_EQ(b, (Bytes{0x0D, 0x44, 0x44, 0x49}));
  EXPECT_EQ(CRV_HowManyEnabled(b.data(), 4), 1);
  EXPECT_EQ(CRV_HowManyEnabledNotClosed(b.data(), 4), 0);
  EXPECT_EQ(CRV_HowManyEnabledNotFirstOrLastInOpenSubpath(b.data(), 4), 1);
}

TEST(Selection, EditsKeepTwinsInStepAndRefuseBadInput) {
  std::mt19937 rng(63);
  for (int k = 0; k < 2000; ++k) {
    const testpaths::Path path = testpaths::Make(rng);
    Bytes b = path.nodes;
    const int n = path.n();
    for (int step = 0; step < 6; ++step) {
      const int i = int(rng() % unsigned(n));
      switch (rng() % 6) {
        case 0:  // selects nodes, not control points (an arc's bit is derived)
          if (!IsArc(b[i])) CRV_SetEnabled(b.data(), n, i, int(rng() % 2));
          break;
        case 1: CRV_EnableSubpath(b.data(), n, i, int(rng() % 2)); break;
        case 2: CRV_EnableAllNodes(b.data(), n); break;
        case 3: CRV_DisableAllNodes(b.data(), n); break;
        case 4: CRV_EnableAllControls(b.data(), n); break;
        default: CRV_EnableOneControl(b.data(), n, i); break;
      }
      ASSERT_TRUE(Valid(b)) << k;
      for (const auto& sp : path.subpaths)
        ASSERT_TRUE(!sp.closed || IsEnabledNode(b[sp.first]) == IsEnabledNode(b[sp.last])) << k;
    }
    const Bytes before = b;
    for (int bad : {-1, n, n + 7}) {
      EXPECT_EQ(CRV_EnableSubpath(b.data(), n, bad, 1), -1);
      CRV_EnableOneControl(b.data(), n, bad);
      CRV_SetEnabled(b.data(), n, bad, 1);
      EXPECT_EQ(CRV_GetArcBefore(b.data(), n, bad), -1);
      EXPECT_EQ(CRV_GetArcAfter(b.data(), n, bad), -1);
    }
    CRV_DisableAllNodes(b.data(), -n);
    EXPECT_EQ(CRV_EnableAllNodes(nullptr, n), 0);
    ASSERT_EQ(b, before) << k;
  }
  // The arcs around the closing point of a closed Bezier subpath.
  const Bytes c = {0x0C, 0xC0, 0xC0, 0x84, 0xC0, 0xC0, 0x88};
  EXPECT_EQ(CRV_GetArcBefore(c.data(), 7, 0), 5);
  EXPECT_EQ(CRV_GetArcAfter(c.data(), 7, 6), 1);
  EXPECT_EQ(CRV_GetArcBefore(c.data(), 7, 3), 2);
  EXPECT_EQ(CRV_GetArcAfter(c.data(), 7, 0), 1);
}

// The Beziers that node i (or its twin) starts or ends.
std::vector<int> ArcsAt(const testpaths::Path& path, int i) {
  std::vector<int> arcs;
  int twin = -1;
  for (const auto& sp : path.subpaths)
    if (sp.closed && (i == sp.first || i == sp.last)) twin = i == sp.first ? sp.last : sp.first;
  for (const auto& s : path.segments)
    if (s.bezier && (s.start == i || s.end == i || s.start == twin || s.end == twin))
      arcs.insert(arcs.end(), {s.end - 2, s.end - 1});
  return arcs;
}

TEST(Selection, ControlPointsFollowTheSelectedNode) {
  std::mt19937 rng(62);
  for (int k = 0; k < 3000; ++k) {
    const testpaths::Path path = testpaths::Make(rng);
    Bytes b = path.nodes;
    const int n = path.n();
    CRV_DisableAllNodes(b.data(), n);
    for (int i = 0; i < n; ++i)  // only arcs lose the user bit, and none stays selected
      ASSERT_TRUE(IsArc(b[i]) ? !(IsUserNode(b[i]) || IsEnabledNode(b[i]))
                              : IsUserNode(b[i]) == IsUserNode(path.nodes[i])) << k;
    // Pick user nodes; the last one picked is checked.
    const int picks = 1 + int(rng() % 2);
    int i = -1;
    for (int p = 0; p < picks; ++p) {
      do i = int(rng() % unsigned(n));
      while (IsArc(b[i]) || !IsUserNode(b[i]));
      CRV_SetEnabled(b.data(), n, i, 1);
    }
    const int count = CRV_EnableAllControls(b.data(), n);
    ASSERT_TRUE(Valid(b)) << k;
    EXPECT_EQ(count, CRV_HowManyEnabled(b.data(), n)) << k;
    for (int arc : ArcsAt(path, i)) EXPECT_TRUE(IsEnabledNode(b[arc])) << k << " arc " << arc << " of " << i;
    // One selected node offers its control points, several do not.
    for (int j = 0; j < n; ++j)
      EXPECT_TRUE(!IsArc(b[j]) || IsUserNode(b[j]) == (count == 1 && IsEnabledNode(b[j]))) << k;
  }
  // A selected line end, then a smooth line, then a Bezier: its arcs follow.
  Bytes s = {0x04, 0x45, 0x54, 0xC0, 0xC0, 0x84};
  CRV_EnableAllControls(s.data(), 6);
  EXPECT_EQ(s, (Bytes{0x04, 0x45, 0x54, 0xC5, 0xC5, 0x84}));
  CRV_EnableSubpath(s.data(), 6, 4, 0);
  EXPECT_EQ(s, (Bytes{0x04, 0x44, 0x54, 0xC0, 0xC0, 0x84}));
  EXPECT_EQ(CRV_EnableSubpath(s.data(), 6, 9, 1), -1);
}

TEST(Selection, EnablingInfo) {
  auto info = [](Bytes b, int extra = -1) {
    CRV_ENABLINGINFO i;
    const int c = CRV_GetEnablingInfo(b.data(), int(b.size()), 0, extra, &i);
    return std::tuple{c, i.flags, i.singleSubpath, i.endsCanJoin};
  };
  namespace F = CRV_EnablingFlags;
  EXPECT_EQ(info({}), std::tuple(0, F::kAlways, 0u, 0u));
  // Both ends of an open two-line path: it can close.
  const auto [c, flags, single, join] = info({0x05, 0x44, 0x45});
  EXPECT_EQ(c, 2);
  EXPECT_TRUE(flags & F::kJoin);
  EXPECT_EQ(join, 1u);
  EXPECT_EQ(single, 0u);  // one subpath only
  // Both ends of one line cannot join; ends of two subpaths can.
  EXPECT_FALSE(std::get<1>(info({0x05, 0x45})) & F::kJoin);
  const auto two = info({0x04, 0x45, 0x05, 0x44});
  EXPECT_TRUE(std::get<1>(two) & F::kJoin);
  EXPECT_TRUE(std::get<1>(two) & F::kSubpaths);
  EXPECT_EQ(std::get<2>(two), 0u);
  EXPECT_EQ(std::get<2>(info({0x04, 0x45, 0x44, 0x04, 0x44})), 1u);  // all in the first subpath
  // A smooth interior curve node can be broken, made a cusp or symmetric.
  const uint16_t f = std::get<1>(info({0x04, 0xC0, 0xC0, 0x95, 0xC0, 0xC0, 0x84}));
  EXPECT_EQ(f & (F::kCurve | F::kBreak | F::kToCusp | F::kToSmooth | F::kToSymmetric),
            F::kCurve | F::kBreak | F::kToCusp | F::kToSymmetric);
  EXPECT_EQ(CRV_GetEnablingInfo(nullptr, 3, 0, -1, nullptr), 0);
}

TEST(Selection, PolycurveMethods) {
  const V p[7] = {{0, 0}, {1, 1}, {2, 1}, {3, 0}, {4, 1}, {5, 1}, {6, 0}};
  const NODETYPE n[7] = {0x05, 0xC1, 0xC1, 0x85, 0xC1, 0xC0, 0x84};
  PolycurveD c(p, n, 7);
  const PolycurveD copy = c;
  EXPECT_EQ(c.GetEnabledNodes(false), (std::vector<unsigned long>{0, 3}));
  EXPECT_EQ(c.GetEnabledNodes(true), (std::vector<unsigned long>{0, 1, 2, 3, 4}));
  // With the flag, arcs count only between two selected ends.
  EXPECT_EQ(c.GetEnabledNodesFrom({0, 1, 2, 3, 4, 5, 6, 99}, true), (std::vector<unsigned long>{0, 1, 2, 3}));
  EXPECT_EQ(c.GetEnabledNodesFrom(OstraCrv::SubcurveRange{3, 10}, false), (std::vector<unsigned long>{3, 4}));
  EXPECT_EQ(c.GetEnabledOpenEndNodes(), (std::vector<unsigned long>{0}));
  c.SetEnabled(6, true);
  c.SetEnabled(7, true);  // out of range: ignored
  EXPECT_TRUE(c.IsEnabled(6) && !c.IsEnabled(7) && !copy.IsEnabled(6));
  c.SetEnabled(1, 5, false);
  EXPECT_EQ(c.GetEnabledNodes(true), (std::vector<unsigned long>{0, 6}));
  EXPECT_TRUE(Valid({c.GetNodeTypes(), c.GetNodeTypes() + 7}));  // arcs lost their user bits too
  c.EnableFirstAndLastInOpenSubpaths();
  EXPECT_EQ(c.GetEnabledNodes(true), (std::vector<unsigned long>{0, 6}));
  // Copying from a shorter curve leaves the rest unselected.
  c.EnableAllNodes();
  c.CopyEnabledFrom(PolycurveD::CreateLine(V{0, 0}, V{1, 1}));
  EXPECT_FALSE(c.AnyEnabled());
  c.SetEnabledNodes({3, 42});
  c.CopyEnabledFrom(c);  // from itself
  EXPECT_EQ(c.GetEnabledNodes(true), (std::vector<unsigned long>{3}));
  c.SetSubpathEnabled(2, true);
  EXPECT_EQ(c.GetEnabledNodes(true).size(), 7u);
  EXPECT_EQ(c.EnableAllControls(), 3);
  c.DisableAllNodes();
  EXPECT_FALSE(c.AnyEnabled());
  EXPECT_TRUE(Valid({c.GetNodeTypes(), c.GetNodeTypes() + 7}));
}

}  // namespace
