// Building curves: appends, joins, closing, cutting and the shape makers.
// The property tests run random edits on random valid paths and require a
// valid path after each, with the segments that remain accounted for.
#include <gtest/gtest.h>

#include <cmath>
#include <numbers>
#include <random>
#include <set>
#include <vector>

#include "core/path_geometry.h"
#include "core/random_paths.h"
#include "ostracrv/core/curvesegment.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::D;
using MavikMath::V;
using OstraCrv::Polycurve;
using OstraCrv::PolycurveD;
using Bytes = std::vector<NODETYPE>;

using testgeo::NodesOf;
using testgeo::Polyline;
using testgeo::Valid;
using testgeo::CurveArea;

TEST(Build, AppendsAndCollinearMerge) {
  PolycurveD c;
  EXPECT_FALSE(c.LineTo(V{1, 1}, true));  // nothing to continue
  EXPECT_TRUE(c.IsEmpty());
  c.LineTo(V{1, 1});  // a plain append does not check
  EXPECT_FALSE(Valid(c));
  // MoveTo, LineTo(p1, true), LineTo(p2, true) on a straight run: two nodes, p1 overwritten.
  c.Clear();
  c.MoveTo(V{0, 0});
  c.LineTo(V{10, 0}, true);
  c.LineTo(V{20, 1}, true);  // within sqrt(10) of the line
  EXPECT_EQ(NodesOf(c), (Bytes{0x04, 0x44}));
  EXPECT_EQ(c.GetLastPoint(), (V{20, 1}));
  c.LineTo(V{30, 20}, true);  // a corner
  c.CubicTo(V{40, 30}, V{50, 40}, V{60, 50});
  c.LineTo(V{70, 60}, true);  // never across a curve
  EXPECT_EQ(NodesOf(c), (Bytes{0x04, 0x44, 0x44, 0xC0, 0xC0, 0x84, 0x44}));
}

TEST(Build, CloseLastSubpath) {
  PolycurveD t = Polyline({V{0, 0}, V{10, 0}, V{0, 10}});
  ASSERT_TRUE(t.CloseLastSubpathWithOptionalLine());
  EXPECT_EQ(NodesOf(t), (Bytes{0x0C, 0x44, 0x44, 0x48}));
  const PolycurveD closed = t;
  EXPECT_TRUE(t.CloseLastSubpath(0.0, false));  // closed already: stays as it is
  EXPECT_EQ(t, closed);
  // A zero tolerance closes coincident ends; ends 1 apart close at tolerance 1 exactly.
  EXPECT_TRUE(Polyline({V{0, 0}, V{10, 0}, V{0, 0}}).CloseLastSubpath(0.0, false));
  PolycurveD d = Polyline({V{0, 0}, V{10, 0}, V{0, 1}});
  const PolycurveD open = d;
  EXPECT_FALSE(d.CloseLastSubpath(0.0, false));
  EXPECT_EQ(d, open);
  EXPECT_TRUE(d.CloseLastSubpath(1.0, false));
  EXPECT_EQ(d.GetFirstPoint(), (V{0, 0.5}));
  Polycurve i;  // the integer midpoint truncates: -3 and 0 give -1
  i.MoveTo(-3, 0);
  i.LineTo(5, 5);
  i.LineTo(0, 0);
  ASSERT_TRUE(i.CloseLastSubpath(4.0, false));
  EXPECT_EQ(i.GetFirstPoint(), (POINT{-1, 0}));
  // Two nodes never close by tolerance; with a line they grow to three.
  PolycurveD two = Polyline({V{0, 0}, V{0, 0}});
  EXPECT_FALSE(two.CloseLastSubpath(5.0, false));
  EXPECT_TRUE(two.CloseLastSubpath(5.0, true));
  EXPECT_EQ(two.GetPointCount(), 3u);
  // A lone move cannot close: the added line is taken away again.
  PolycurveD lone = Polyline({V{0, 0}, V{5, 0}});
  lone.MoveTo(V{9, 9});
  const PolycurveD loneBefore = lone;
  EXPECT_FALSE(lone.CloseLastSubpath(0.0, true));
  EXPECT_EQ(lone, loneBefore);
}

TEST(Build, CloseOpenSubpaths) {
  PolycurveD c = Polyline({V{0, 0}, V{5, 0}});  // two nodes
  c.AppendWithJoin(Polyline({V{10, 0}, V{20, 0}, V{20, 10}}), false, 0.0);  // an open triangle
  c.AppendWithJoin(Polyline({V{30, 0}, V{40, 0}, V{30, 0}}), false, 0.0);   // ends coincide
  PolycurveD skip = c;
  ASSERT_TRUE(skip.CloseOpenSubpaths(true));
  EXPECT_EQ(NodesOf(skip), (Bytes{0x04, 0x44, 0x0C, 0x44, 0x44, 0x48, 0x0C, 0x44, 0x48}));
  ASSERT_TRUE(c.CloseOpenSubpaths(false));
  EXPECT_TRUE(Valid(c) && c.GetPointCount() == 10u && c.GetPoint(2) == (V{0, 0}));
  EXPECT_FALSE(c.CloseOpenSubpaths(false));  // nothing open any more
  EXPECT_TRUE(Polyline({V{0, 0}, V{1, 0}}).CloseOpenSubpaths(true));  // only short ones: still true
  // The raw form drops dangling moves and always adds a closing line.
  const POINT rp[] = {{0, 0}, {1, 1}, {2, 2}, {3, 3}, {9, 9}, {0, 0}, {5, 5}};
  const NODETYPE rn[] = {0x04, 0x04, 0x04, 0x44, 0x04, 0x0C, 0x04};
  POINT op[9];
  NODETYPE on[9];
  ASSERT_EQ(OstraCrv::CloseOpenSubpaths(rp, rn, 7, op, on), 3);
  EXPECT_TRUE(on[0] == 0x0C && on[2] == 0x48 && op[2] == (POINT{2, 2}));

  std::mt19937 rng(21);
  for (int k = 0; k < 500; ++k) {
    const testpaths::Path path = testpaths::Make(rng);
    const auto pts = testgeo::PointsFor<V>(path, rng);
    PolycurveD r(pts.data(), path.nodes.data(), path.nodes.size());
    const bool shortOnes = rng() % 2;
    r.CloseOpenSubpaths(shortOnes);
    ASSERT_TRUE(Valid(r)) << k;
    for (const auto& s : r.GetSubpathIndices())
      ASSERT_TRUE(s.count < (shortOnes ? 3u : 1u) || IsClosedNode(r.GetNodeType(int(s.first)))) << k;
  }
}

TEST(Build, PopAndDeleteSegment) {
  PolycurveD t = Polyline({V{0, 0}, V{10, 0}, V{0, 10}, V{0, 0}});
  t.CloseLastSubpath(0.0, false);
  PolycurveD popped = t;
  ASSERT_TRUE(popped.PopLastSegment());
  EXPECT_EQ(NodesOf(popped), (Bytes{0x04, 0x44, 0x44}));
  // A closed triangle opens at the deleted segment, running round from its end to its start.
  ASSERT_TRUE(t.DeleteSegment(2));
  EXPECT_EQ(NodesOf(t), (Bytes{0x04, 0x44, 0x44}));
  EXPECT_TRUE(t.GetPoint(0) == (V{0, 10}) && t.GetPoint(2) == (V{10, 0}));
  EXPECT_FALSE(t.DeleteSegment(0));   // a move
  EXPECT_FALSE(t.DeleteSegment(99));  // out of range
}

TEST(Build, DeleteSegmentOnRandomPathsRemovesExactlyThatSegment) {
  std::mt19937 rng(22);
  for (int k = 0; k < 1500; ++k) {
    const testpaths::Path path = testpaths::Make(rng);
    if (path.segments.empty()) continue;
    const auto pts = testgeo::PointsFor<V>(path, rng);
    PolycurveD c(pts.data(), path.nodes.data(), path.nodes.size());
    const testpaths::Segment seg = path.segments[rng() % path.segments.size()];
    auto expected = testgeo::SegmentSet(pts.data(), path.nodes.data(), path.n());
    const auto gone = testgeo::SegmentSet(pts.data() + seg.start, path.nodes.data() + seg.start, seg.end - seg.start + 1);
    expected.erase(expected.find(*gone.begin()));
    ASSERT_TRUE(c.DeleteSegment(seg.end)) << k;
    ASSERT_TRUE(Valid(c)) << k;
    EXPECT_EQ(testgeo::CurveSegments(c), expected) << k;
  }
}

TEST(Build, JoinAppends) {
  PolycurveD c;
  c.PushBackWithJoinCheck(V{0, 0}, 0x45);  // the low six bits: a selected move
  c.LineTo(V{10, 0});
  c.PushBackWithJoinCheck(V{10, 0}, 0x11);  // at the end: only enabled and continuity
  EXPECT_EQ(NodesOf(c), (Bytes{0x05, 0x55}));
  c.PushBackWithJoinCheck(V{11, 0}, 0x04);  // 1 away: a new subpath
  EXPECT_EQ(c.GetPointCount(), 3u);
  // Within tolerance the seam keeps this end point and loses its continuity.
  PolycurveD a = Polyline({V{0, 0}, V{10, 0}});
  a.SetContinuity(1, ContinuityType::smooth);
  a.AppendWithJoin(Polyline({V{10.5, 0}, V{20, 0}}), false, 1.0);
  EXPECT_EQ(NodesOf(a), (Bytes{0x04, 0x44, 0x44}));
  EXPECT_EQ(a.GetPoint(1), (V{10, 0}));
  // A closed curve joined onto an open end opens at the seam.
  a.AppendWithJoin(PolycurveD::CreateCircle(V{10, 0}, 10.0), false, 1.0);
  EXPECT_TRUE(Valid(a) && a.GetNumberOfSubpaths() == 1 && a.GetPointCount() == 15u);
  // An empty other: nothing, not even the closing.
  PolycurveD e;
  e.AppendWithJoin(Polyline({V{50, 0}, V{60, 0}, V{0, 0}}), true, 60.0);  // appended whole, then closed
  EXPECT_TRUE(e.IsLastSubpathClosed());
  e.AppendWithJoin(e, false, 0.0);  // onto a closed end, and onto itself
  EXPECT_TRUE(Valid(e) && e.GetPointCount() == 6u);
}

TEST(Build, OperatorsAndReplacement) {
  Polycurve c = Polycurve::CreateLine(POINT{0, 0}, POINT{10, 0});
  c += D{0.5, -0.5};  // rounded once, half away from zero
  EXPECT_EQ(c.GetPoint(1), (POINT{11, -1}));
  const MATRIX m = MavikMath::ConstructMatrix(D{2, 0}, D{0, 3}, D{1, 1});
  c *= m;
  EXPECT_EQ(c.GetPoint(1), (POINT{23, -2}));
  c /= m;
  EXPECT_EQ(c.GetPoint(1), (POINT{11, -1}));
  PolycurveD r;
  r.ReplacePoints(0, 0, PolycurveD::CreateLine(V{1, 0}, V{2, 0}), PolycurveD::CreateLine(V{2, 0}, V{3, 0}));
  EXPECT_EQ(NodesOf(r), (Bytes{0x04, 0x44, 0x44}));  // the second move dropped: one chain
  EXPECT_FALSE(r.InsertPoints(0, nullptr, nullptr, 3));
  r.ReplacePoints(99, 99, r);  // clamped to the end, the source being the curve itself
  r.DeletePoints(0, 1);
  EXPECT_EQ(r.GetPointCount(), 5u);
}

TEST(Build, MakersGiveValidShapes) {
  const RECT box{-10, 20, 30, -5};
  // Both point kinds: clockwise, the same positive area.
  for (double a : {CurveArea(Polycurve::CreateRectangle(box)), CurveArea(PolycurveD::CreateRectangle(box)),
                   Polycurve::CreateRectangle(box).GetArea(), PolycurveD::CreateRectangle(box).GetArea()})
    EXPECT_DOUBLE_EQ(a, 40.0 * 25.0);
  PolycurveD c = PolycurveD::CreateCircle(V{0, 0}, 10);
  c.CreateEllipseSubpath(V{100, 0}, V{20, 5});
  c.Create3PointArcSubpath(V{0, 0}, V{10, 0}, V{5, 5});
  c.CreateLineSubpath(V{0, 0}, V{1, 1});
  EXPECT_TRUE(Valid(c) && c.GetNumberOfSubpaths() == 4 && c.GetPointCount() == 35u);
  EXPECT_NEAR(CurveArea(c.GetSubpath(13)), -std::numbers::pi * 100, 0.3);
  EXPECT_FALSE(c.CreateCircleSubpath(V{0, 0}, std::nan("")));  // nothing written, nothing changed
  EXPECT_EQ(c.GetPointCount(), 35u);
  EXPECT_EQ(Polycurve::CreateEllipse(POINT{0, 0}, POINT{100, 50}).GetPoint(3), (POINT{0, 50}));
}

TEST(Build, CircularArcTo) {
  PolycurveD c;
  EXPECT_FALSE(c.CircularArcTo(V{1, 1}, D{1, 0}));
  c.MoveTo(V{0, 0});
  ASSERT_TRUE(c.CircularArcTo(V{10, 10}, D{1, 0}));
  EXPECT_EQ(NodesOf(c), (Bytes{0x04, 0xC0, 0xC0, 0x84}));
  ASSERT_TRUE(c.CircularArcTo(V{20, 10}, D{1, 0}));  // along the chord: a line
  EXPECT_FALSE(c.CircularArcTo(V{std::nan(""), 0}, D{1, 0}));
  EXPECT_EQ(c.GetNodeType(4), 0x44);
  EXPECT_EQ(c.GetPointCount(), 5u);
}

TEST(Build, CircularArcToFromTheCurvesOwnTangent) {
  PolycurveD c;
  c.MoveTo(V{0, 0});
  // After a lone start: a clockwise half circle bulging left of the chord.
  ASSERT_TRUE(c.CircularArcTo(V{10, 0}));
  ASSERT_EQ(c.GetPointCount(), 7u);
  EXPECT_LT(MavikMath::Distance(c.GetPoint(3), V{5, 5}), 1e-9);
  // Then on along the arrival direction (straight down at (10, 0)): the chord
  // to (20, 0) lies left of it, so the next half circle turns left, below.
  ASSERT_TRUE(c.CircularArcTo(V{20, 0}));
  ASSERT_EQ(c.GetPointCount(), 13u);
  EXPECT_LT(MavikMath::Distance(c.GetPoint(9), V{15, -5}), 1e-9);
  EXPECT_LT(MavikMath::Distance(c.GetLastPoint(), V{20, 0}), 1e-9);
  EXPECT_TRUE(Valid(c));
}

TEST(Build, AppendingEveryViewRebuildsTheCurve) {
  std::mt19937 rng(25);
  for (int k = 0; k < 500; ++k) {
    const testpaths::Path path = testpaths::Make(rng);
    const auto pts = testgeo::PointsFor<V>(path, rng);
    const PolycurveD c(pts.data(), path.nodes.data(), path.nodes.size());
    PolycurveD target;
    for (const auto& view : OstraCrv::details<V>::GetCurveSegments_Base(c)) view.AppendTo(target, true);
    // Expected: the same points and kinds with the same closure, except that a
    // dangling move is replaced by the move that follows it, and a closed
    // subpath of two nodes (one line out and back) cannot close by tolerance.
    std::vector<V> ep;
    Bytes en;
    for (size_t s = 0; s < path.subpaths.size(); ++s) {
      const auto& sp = path.subpaths[s];
      if (sp.first == sp.last && s + 1 < path.subpaths.size()) continue;
      const NODETYPE keep = NodeMask::kType | (sp.last - sp.first == 1 ? 0 : NodeMask::kClosed);
      for (int i = sp.first; i <= sp.last; ++i) {
        ep.push_back(pts[i]);
        en.push_back(NODETYPE(path.nodes[i] & keep));
      }
    }
    ASSERT_EQ(std::vector<V>(target.GetPoints(), target.GetPoints() + target.GetPointCount()), ep) << k;
    Bytes got = NodesOf(target);
    for (NODETYPE& b : got) b &= NodeMask::kType | NodeMask::kClosed;
    ASSERT_EQ(got, en) << k;
    ASSERT_TRUE(Valid(target));
  }
}

template <class T>
void RunRandomEdits(unsigned seed) {
  using C = OstraCrv::PolycurveT<T>;
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> u(-100, 100);
  auto pt = [&] { return MavikMath::FromV<T>(V{u(rng), u(rng)}); };
  for (int k = 0; k < 600; ++k) {
    C c;
    for (int step = 0; step < 40; ++step) {
      const T p = pt();
      const unsigned op = rng() % 12;
      // The plain appends continue an open subpath; onto a closed end they
      // would make an invalid path, as documented.
      if (op >= 1 && op <= 4 && !c.IsEmpty() && c.IsLastSubpathClosed()) c.MoveTo(pt());
      switch (op) {
        case 0: c.MoveTo(p); break;
        case 1: if (!c.IsEmpty()) c.LineTo(p); break;
        case 2: c.LineTo(p, true); break;
        case 3: if (!c.IsEmpty()) c.CubicTo(pt(), pt(), p); break;
        case 4: rng() % 2 ? c.CircularArcTo(p, D{u(rng), u(rng)}) : c.CircularArcTo(p); break;
        case 5: c.CloseLastSubpath(rng() % 3 ? 0.0 : 50.0, rng() % 2); break;
        case 6: c.CloseOpenSubpaths(rng() % 2); break;
        case 7: c.PopLastSegment(); break;
        case 8: if (c.GetPointCount() > 1) c.DeleteSegment(rng() % c.GetPointCount()); break;
        case 9: c.AppendWithJoin(C::CreateCircle(p, u(rng)), rng() % 2, 5.0); break;
        case 10: c.Create3PointArcSubpath(p, pt(), pt()); break;
        case 11: c.PushBackWithJoinCheck(rng() % 2 ? c.GetLastPoint() : p, NODETYPE(rng() & 0x37)); break;
      }
      if (c.GetPointCount() > 0 && !IsMove(c.GetNodeType(0))) c.Clear();  // a plain append onto nothing
      ASSERT_TRUE(Valid(c)) << k << " " << step << " op " << op;
    }
  }
}

TEST(Build, RandomEditSequencesStayValid) {
  RunRandomEdits<V>(23);
  RunRandomEdits<POINT>(24);
}

}  // namespace
