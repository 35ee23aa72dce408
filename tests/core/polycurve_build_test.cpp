// Building curves: appends, joins, closing, cutting and the shape makers.
// The property tests run random edits on random valid paths and require a
// valid path after each, with the geometry that is left accounted for.
#include <gtest/gtest.h>

#include <cmath>
#include <numbers>
#include <random>
#include <set>
#include <vector>

#include "core/path_geometry.h"
#include "core/random_paths.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::D;
using MavikMath::V;
using OstraCrv::Polycurve;
using OstraCrv::PolycurveD;

std::vector<NODETYPE> Bytes(const PolycurveD& c) { return {c.GetNodeTypes(), c.GetNodeTypes() + c.GetPointCount()}; }
template <class C>
bool Valid(const C& c) {
  return OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount());
}
template <class C>
double Area(const C& c) {
  return testgeo::ClockwiseArea(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()));
}

TEST(Build, PlainAppends) {
  PolycurveD c;
  EXPECT_FALSE(c.LineTo(V{1, 1}, true));  // nothing to continue
  EXPECT_TRUE(c.IsEmpty());
  c.LineTo(V{1, 1});  // a plain append does not check
  EXPECT_FALSE(Valid(c));
  c.Clear();
  c.MoveTo(0.0, 0.0);
  c.LineTo(10.0, 0.0);
  c.CubicTo(V{10, 5}, V{5, 10}, V{0, 10});
  EXPECT_EQ(Bytes(c), (std::vector<NODETYPE>{0x04, 0x44, 0xC0, 0xC0, 0x84}));
  EXPECT_TRUE(Valid(c));
}

TEST(Build, CollinearLineToOverwritesTheEnd) {
  PolycurveD c;
  c.MoveTo(V{0, 0});
  c.LineTo(V{10, 0}, true);
  c.LineTo(V{20, 1}, true);  // within sqrt(10) of the line: the end moves
  ASSERT_EQ(c.GetPointCount(), 2u);
  EXPECT_EQ(c.GetLastPoint(), (V{20, 1}));
  c.LineTo(V{30, 20}, true);  // a corner: a new node
  EXPECT_EQ(c.GetPointCount(), 3u);
  // Never across a curve.
  c.CubicTo(V{40, 30}, V{50, 40}, V{60, 50});
  c.LineTo(V{70, 60}, true);
  EXPECT_EQ(c.GetPointCount(), 7u);
  Polycurve i;
  i.MoveTo(0, 0);
  i.LineTo(100, 0, true);
  i.LineTo(200, 3, true);
  EXPECT_EQ(i.GetPointCount(), 2u);
}

TEST(Build, CloseLastSubpath) {
  PolycurveD t;
  t.MoveTo(V{0, 0});
  t.LineTo(V{10, 0});
  t.LineTo(V{0, 10});
  ASSERT_TRUE(t.CloseLastSubpathWithOptionalLine());
  EXPECT_EQ(Bytes(t), (std::vector<NODETYPE>{0x0C, 0x44, 0x44, 0x48}));
  EXPECT_EQ(t.GetLastPoint(), t.GetFirstPoint());
  EXPECT_TRUE(t.IsLastSubpathClosed());
  // Closing again leaves it as it is.
  const PolycurveD before = t;
  EXPECT_TRUE(t.CloseLastSubpath(0.0, false));
  EXPECT_EQ(t, before);

  // Coincident ends close with a zero tolerance; ends 1 apart do not.
  PolycurveD c;
  c.MoveTo(V{0, 0});
  c.LineTo(V{10, 0});
  c.LineTo(V{0, 0});
  EXPECT_TRUE(c.CloseLastSubpath(0.0, false));
  PolycurveD d;
  d.MoveTo(V{0, 0});
  d.LineTo(V{10, 0});
  d.LineTo(V{0, 1});
  const PolycurveD dBefore = d;
  EXPECT_FALSE(d.CloseLastSubpath(0.0, false));
  EXPECT_EQ(d, dBefore);
  EXPECT_TRUE(d.CloseLastSubpath(1.0, false));  // exactly at the tolerance
  EXPECT_EQ(d.GetFirstPoint(), (V{0, 0.5}));
  // Integer midpoint truncates: -3 and 0 give -1.
  Polycurve i;
  i.MoveTo(-3, 0);
  i.LineTo(5, 5);
  i.LineTo(0, 0);
  ASSERT_TRUE(i.CloseLastSubpath(4.0, false));
  EXPECT_EQ(i.GetFirstPoint(), (POINT{-1, 0}));
  EXPECT_EQ(i.GetLastPoint(), (POINT{-1, 0}));
  // Two nodes never close by tolerance; with a line they grow to three.
  PolycurveD two;
  two.MoveTo(V{0, 0});
  two.LineTo(V{0, 0});
  EXPECT_FALSE(two.CloseLastSubpath(5.0, false));
  EXPECT_TRUE(two.CloseLastSubpath(5.0, true));
  EXPECT_EQ(two.GetPointCount(), 3u);
  // A lone move: the line is taken away again.
  PolycurveD lone;
  lone.MoveTo(V{0, 0});
  lone.LineTo(V{5, 0});
  lone.MoveTo(V{9, 9});
  const PolycurveD loneBefore = lone;
  EXPECT_FALSE(lone.CloseLastSubpath(0.0, true));
  EXPECT_EQ(lone, loneBefore);
}

TEST(Build, CloseOpenSubpaths) {
  PolycurveD c;
  c.MoveTo(V{0, 0});
  c.LineTo(V{5, 0});  // two nodes
  c.MoveTo(V{10, 0});
  c.LineTo(V{20, 0});
  c.LineTo(V{20, 10});  // open triangle
  c.MoveTo(V{30, 0});
  c.LineTo(V{40, 0});
  c.LineTo(V{30, 0});  // ends coincide
  PolycurveD skip = c;
  ASSERT_TRUE(skip.CloseOpenSubpaths(true));
  EXPECT_TRUE(Valid(skip));
  EXPECT_EQ(skip.GetPointCount(), 9u);
  EXPECT_FALSE(IsClosedNode(skip.GetNodeType(0)));
  EXPECT_EQ(skip.GetNodeType(5), 0x48);  // closing line of the triangle
  EXPECT_EQ(skip.GetNodeType(8), 0x48);  // coincident ends closed in place
  ASSERT_TRUE(c.CloseOpenSubpaths(false));
  EXPECT_TRUE(Valid(c));
  EXPECT_EQ(c.GetPointCount(), 10u);
  EXPECT_EQ(c.GetPoint(2), (V{0, 0}));
  EXPECT_FALSE(c.CloseOpenSubpaths(false));  // nothing open any more
  // Only short subpaths open: still reported.
  PolycurveD shortOnly;
  shortOnly.MoveTo(V{0, 0});
  shortOnly.LineTo(V{1, 0});
  EXPECT_TRUE(shortOnly.CloseOpenSubpaths(true));
  EXPECT_EQ(shortOnly.GetPointCount(), 2u);
  EXPECT_FALSE(PolycurveD().CloseOpenSubpaths(false));

  // The raw form drops dangling moves and always adds a closing line.
  const POINT rp[] = {{0, 0}, {1, 1}, {2, 2}, {3, 3}, {9, 9}, {0, 0}, {5, 5}};
  const NODETYPE rn[] = {0x04, 0x04, 0x04, 0x44, 0x04, 0x0C, 0x04};
  POINT op[9];
  NODETYPE on[9];
  const int m = OstraCrv::CloseOpenSubpaths(rp, rn, 7, op, on);
  ASSERT_EQ(m, 3);  // {2,2}-{3,3} closed by a line; the rest are lone moves
  EXPECT_EQ(on[0], 0x0C);
  EXPECT_EQ(on[2], 0x48);
  EXPECT_EQ(op[2], (POINT{2, 2}));
}

TEST(Build, CloseOpenSubpathsOnRandomPaths) {
  std::mt19937 rng(21);
  for (int k = 0; k < 500; ++k) {
    const testpaths::Path path = testpaths::Make(rng);
    const auto pts = testgeo::PointsFor<V>(path, rng);
    PolycurveD c(pts.data(), path.nodes.data(), path.nodes.size());
    const bool skip = rng() % 2;
    c.CloseOpenSubpaths(skip);
    ASSERT_TRUE(Valid(c)) << k;
    for (const auto& r : c.GetSubpathIndices())
      if (r.count >= (skip ? 3u : 1u)) {
        ASSERT_TRUE(IsClosedNode(c.GetNodeType(int(r.first)))) << k;
      }
  }
}

TEST(Build, PopAndDeleteSegment) {
  PolycurveD t;
  t.MoveTo(V{0, 0});
  t.LineTo(V{10, 0});
  t.LineTo(V{0, 10});
  t.CloseLastSubpath(0.0, true);
  PolycurveD popped = t;
  ASSERT_TRUE(popped.PopLastSegment());
  EXPECT_EQ(Bytes(popped), (std::vector<NODETYPE>{0x04, 0x44, 0x44}));

  // A closed triangle opens at the deleted segment: it runs from the
  // segment's end round to its start.
  PolycurveD d = t;
  ASSERT_TRUE(d.DeleteSegment(2));  // the segment (10,0) -> (0,10)
  EXPECT_EQ(Bytes(d), (std::vector<NODETYPE>{0x04, 0x44, 0x44}));
  EXPECT_EQ(d.GetPoint(0), (V{0, 10}));
  EXPECT_EQ(d.GetPoint(2), (V{10, 0}));

  // Middle of three lines: two subpaths of two nodes.
  PolycurveD l;
  l.MoveTo(V{0, 0});
  l.LineTo(V{1, 0});
  l.LineTo(V{2, 0});
  l.LineTo(V{3, 0});
  ASSERT_TRUE(l.DeleteSegment(2));
  EXPECT_EQ(Bytes(l), (std::vector<NODETYPE>{0x04, 0x44, 0x04, 0x44}));
  // First and last segments shorten without a dangling move; the only one
  // takes its move along.
  PolycurveD f;
  f.MoveTo(V{0, 0});
  f.CubicTo(V{1, 1}, V{2, 1}, V{3, 0});
  f.LineTo(V{4, 0});
  ASSERT_TRUE(f.DeleteSegment(3));
  EXPECT_EQ(Bytes(f), (std::vector<NODETYPE>{0x04, 0x44}));
  EXPECT_EQ(f.GetFirstPoint(), (V{3, 0}));
  ASSERT_TRUE(f.DeleteSegment(1));
  EXPECT_TRUE(f.IsEmpty());
  // Refused: a move, an arc, out of range.
  EXPECT_FALSE(t.DeleteSegment(0));
  EXPECT_FALSE(t.DeleteSegment(99));
  PolycurveD b;
  b.MoveTo(V{0, 0});
  b.CubicTo(V{1, 1}, V{2, 1}, V{3, 0});
  EXPECT_FALSE(b.DeleteSegment(1));
}

std::multiset<std::vector<double>> SegmentSet(const PolycurveD& c) {
  return testgeo::SegmentSet(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()));
}

TEST(Build, DeleteSegmentOnRandomPaths) {
  std::mt19937 rng(22);
  for (int k = 0; k < 1500; ++k) {
    const testpaths::Path path = testpaths::Make(rng);
    if (path.segments.empty()) continue;
    const auto pts = testgeo::PointsFor<V>(path, rng);
    PolycurveD c(pts.data(), path.nodes.data(), path.nodes.size());
    const testpaths::Segment seg = path.segments[rng() % path.segments.size()];
    auto expected = SegmentSet(c);
    const V* p = c.GetPoints();
    expected.erase(expected.find(seg.bezier ? std::vector<double>{p[seg.start].x, p[seg.start].y, p[seg.start + 1].x,
                                                                   p[seg.start + 1].y, p[seg.end - 1].x,
                                                                   p[seg.end - 1].y, p[seg.end].x, p[seg.end].y}
                                            : std::vector<double>{p[seg.start].x, p[seg.start].y, p[seg.end].x,
                                                                  p[seg.end].y}));
    ASSERT_TRUE(c.DeleteSegment(seg.end)) << k;
    ASSERT_TRUE(Valid(c)) << k;
    EXPECT_EQ(SegmentSet(c), expected) << k;
  }
}

TEST(Build, JoinAppends) {
  PolycurveD c;
  c.PushBackWithJoinCheck(V{0, 0}, 0x45);  // low six bits: a selected move
  EXPECT_EQ(c.GetNodeType(0), 0x05);
  c.LineTo(V{10, 0});
  c.PushBackWithJoinCheck(V{10, 0}, 0x11);  // at the end: only enabled and continuity
  ASSERT_EQ(c.GetPointCount(), 2u);
  EXPECT_EQ(c.GetNodeType(1), 0x55);
  c.PushBackWithJoinCheck(V{11, 0}, 0x00);
  EXPECT_EQ(c.GetPointCount(), 3u);
  const V bz[4] = {V{11, 0}, V{12, 1}, V{13, 1}, V{14, 0}};
  EXPECT_TRUE(c.AppendBezierWithJoin(bz, 0x04));
  EXPECT_EQ(c.GetPointCount(), 6u);
  EXPECT_TRUE(Valid(c));
  EXPECT_FALSE(c.AppendLineWithJoin(nullptr, 0));

  // AppendWithJoin: within tolerance the seam keeps this end point, loses its
  // continuity and other's first node.
  PolycurveD a;
  a.MoveTo(V{0, 0});
  a.LineTo(V{10, 0});
  a.SetContinuity(1, ContinuityType::smooth);
  PolycurveD o;
  o.MoveTo(V{10.5, 0});
  o.LineTo(V{20, 0});
  a.AppendWithJoin(o, false, 1.0);
  EXPECT_EQ(Bytes(a), (std::vector<NODETYPE>{0x04, 0x44, 0x44}));
  EXPECT_EQ(a.GetPoint(1), (V{10, 0}));
  // Beyond tolerance or after a closed end: appended whole.
  PolycurveD far;
  far.MoveTo(V{50, 0});
  far.LineTo(V{60, 0});
  far.LineTo(V{0, 0});
  a.AppendWithJoin(far, false, 1.0);
  EXPECT_EQ(a.GetPointCount(), 6u);
  // closeAfter closes the last subpath within tolerance.
  a.AppendWithJoin(PolycurveD(), true, 1.0);
  EXPECT_FALSE(a.IsLastSubpathClosed());
  PolycurveD e;
  e.AppendWithJoin(far, true, 60.0);
  EXPECT_TRUE(e.IsLastSubpathClosed());
  // Appending a curve to itself.
  e.AppendWithJoin(e, false, 0.0);
  EXPECT_EQ(e.GetPointCount(), 6u);
  EXPECT_TRUE(Valid(e));
}

TEST(Build, OperatorsAndReplacement) {
  Polycurve c = Polycurve::CreateLine(POINT{0, 0}, POINT{10, 0});
  c += D{0.5, -0.5};  // rounded once
  EXPECT_EQ(c.GetPoint(1), (POINT{11, -1}));
  MATRIX m = MavikMath::ConstructMatrix(D{2, 0}, D{0, 3}, D{1, 1});
  c *= m;
  EXPECT_EQ(c.GetPoint(1), (POINT{23, -2}));
  c /= m;
  EXPECT_EQ(c.GetPoint(1), (POINT{11, -1}));
  c += Polycurve::CreateLine(POINT{5, 5}, POINT{6, 6});
  EXPECT_EQ(c.GetPointCount(), 4u);

  PolycurveD a = PolycurveD::CreateLine(V{0, 0}, V{1, 0});
  PolycurveD x = PolycurveD::CreateLine(V{1, 0}, V{2, 0});
  PolycurveD y = PolycurveD::CreateLine(V{2, 0}, V{3, 0});
  PolycurveD r;
  r.ReplacePoints(0, 0, x, y);  // y's move is dropped: one chain
  EXPECT_EQ(Bytes(r), (std::vector<NODETYPE>{0x04, 0x44, 0x44}));
  EXPECT_EQ(r.GetLastPoint(), (V{3, 0}));
  r.InsertPoints(0, a.GetPoints(), a.GetNodeTypes(), 2);
  EXPECT_EQ(r.GetPointCount(), 5u);
  r.DeletePoints(0, 2);
  EXPECT_EQ(r.GetPointCount(), 3u);
  EXPECT_FALSE(r.InsertPoints(0, nullptr, nullptr, 3));
  r.ReplacePoints(99, 99, r);  // clamped to the end; the source is the curve itself
  EXPECT_EQ(r.GetPointCount(), 6u);
}

TEST(Build, MakersGiveValidShapes) {
  const RECT box{-10, 20, 30, -5};
  const Polycurve ri = Polycurve::CreateRectangle(box);
  const PolycurveD rd = PolycurveD::CreateRectangle(box);
  EXPECT_TRUE(Valid(ri));
  EXPECT_TRUE(Valid(rd));
  // Both kinds are clockwise with the same positive area.
  EXPECT_DOUBLE_EQ(Area(ri), 40.0 * 25.0);
  EXPECT_DOUBLE_EQ(Area(rd), 40.0 * 25.0);

  PolycurveD c = PolycurveD::CreateCircle(V{0, 0}, 10);
  EXPECT_EQ(c.GetPointCount(), 13u);
  c.CreateEllipseSubpath(V{100, 0}, V{20, 5});
  c.Create3PointArcSubpath(V{0, 0}, V{10, 0}, V{5, 5});
  c.CreateLineSubpath(V{0, 0}, V{1, 1});
  EXPECT_TRUE(Valid(c));
  EXPECT_EQ(c.GetNumberOfSubpaths(), 4);
  EXPECT_NEAR(Area(c.GetSubpath(13)), -std::numbers::pi * 100, 0.3);
  // A builder that writes nothing leaves the curve alone.
  EXPECT_FALSE(c.CreateCircleSubpath(V{0, 0}, std::nan("")));
  EXPECT_EQ(c.GetNumberOfSubpaths(), 4);
  Polycurve e = Polycurve::CreateEllipse(POINT{0, 0}, POINT{100, 50});
  EXPECT_EQ(e.GetPoint(3), (POINT{0, 50}));
}

TEST(Build, CircularArcTo) {
  PolycurveD c;
  EXPECT_FALSE(c.CircularArcTo(V{1, 1}, D{1, 0}));
  c.MoveTo(V{0, 0});
  ASSERT_TRUE(c.CircularArcTo(V{10, 10}, D{1, 0}));
  EXPECT_EQ(c.GetPointCount(), 4u);
  EXPECT_EQ(c.GetNodeType(3), 0x84);
  EXPECT_NEAR(c.GetLastPoint().x, 10, 1e-9);
  ASSERT_TRUE(c.CircularArcTo(V{20, 10}, D{1, 0}));  // along the chord: a line
  EXPECT_EQ(c.GetNodeType(4), 0x44);
  EXPECT_FALSE(c.CircularArcTo(V{std::nan(""), 0}, D{1, 0}));
  EXPECT_EQ(c.GetPointCount(), 5u);
  EXPECT_TRUE(Valid(c));
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
        case 4: c.CircularArcTo(p, D{u(rng), u(rng)}); break;
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
