// Named cases of the set operations, the output flags, the filled sides of
// the graph, the colouring moves, and bad input.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>

#include "ostracrv/weld/keep_rules.h"
#include "weld_reference.h"

namespace {

using namespace weldtest;
using Framework::common_types::POINT;
using OstraCrv::Edge;
using OstraCrv::Polycurve;
using OstraCrv::PolycurveT;
using OstraCrv::WeldFlags;
using OstraCrv::WeldStateData;

int Loops(PolycurveD const& c) { return int(Flatten(c).size()); }

// Whether every sample point well away from the outlines is classified by the
// result (even-odd) as expect says from the two operands' own rules.
template <class F>
void ExpectClassifies(PolycurveD const& r, PolycurveD const& a, bool na, PolycurveD const& b, bool nb, F expect) {
  const auto fa = Flatten(a), fb = Flatten(b), fr = Flatten(r);
  for (double x = -20; x <= 220; x += 7.3)
    for (double y = -20; y <= 220; y += 7.9) {
      const V p{x, y};
      if (Distance(fa, p) < 2 || Distance(fb, p) < 2) continue;
      ASSERT_EQ(Inside(fr, p, false), expect(Inside(fa, p, na), Inside(fb, p, nb))) << x << "," << y;
    }
}

TEST(WeldCases, InnerSquareSubtractedClassifiesUnderEvenOdd) {
  // Both squares turn the same way: the result keeps the hole's direction,
  // so it is read under the even-odd rule.
  const PolycurveD outer = Rect(0, 0, 200, 200), inner = Rect(50, 50, 150, 150);
  for (bool nonZero : {false, true}) {
    const PolycurveD r = PolycurveD::Subtract(outer, inner, nonZero, nonZero);
    EXPECT_EQ(Loops(r), 2);
    EXPECT_TRUE(AllClosedAndValid(r));
    ExpectClassifies(r, outer, nonZero, inner, nonZero, [](bool a, bool b) { return a && !b; });
    EXPECT_NEAR(EvenOddArea(r), 40000.0 - 10000.0, 1e-9);
  }
}

TEST(WeldCases, UnionOfCrossingSquaresIsOneLoopTurningAsTheFirst) {
  for (bool cw : {true, false}) {
    const PolycurveD a = Rect(0, 0, 100, 100, cw), b = Rect(50, 50, 150, 150, true);
    const PolycurveD r = PolycurveD::Union(a, b, false, false);
    ASSERT_EQ(Loops(r), 1);
    EXPECT_NEAR(r.GetArea(), cw ? 17500.0 : -17500.0, 1e-9);
    EXPECT_EQ(a.GetArea() > 0, r.GetArea() > 0);
  }
}

TEST(WeldCases, SharedSideIsDroppedFromTheUnion) {
  // Fillings on opposite sides of the shared side.
  const PolycurveD a = Rect(0, 0, 100, 100), b = Rect(100, 20, 200, 80);
  const PolycurveD r = PolycurveD::Union(a, b, true, true);
  ASSERT_EQ(Loops(r), 1);
  EXPECT_NEAR(EvenOddArea(r), 16000.0, 1e-9);
  // No drawn segment runs along x = 100 between y = 20 and y = 80.
  for (unsigned long i = 1; i < r.GetPointCount(); ++i) {
    const V p = r.GetPoint(int(i - 1)), q = r.GetPoint(int(i));
    const bool onShared = p.x == 100 && q.x == 100 && std::fmax(p.y, q.y) > 20 && std::fmin(p.y, q.y) < 80;
    EXPECT_FALSE(onShared) << p.y << " " << q.y;
  }
}

TEST(WeldCases, ShapeWithItself) {
  std::mt19937 rng(3);
  for (bool curved : {false, true}) {
    const PolycurveD a = Blob(rng, V{100, 100}, 80, 7, curved, true);
    for (bool nonZero : {false, true}) {
      EXPECT_TRUE(PolycurveD::Subtract(a, a, nonZero, nonZero).IsEmpty());
      EXPECT_TRUE(PolycurveD::Xor(a, a, nonZero, nonZero).IsEmpty());
      // The union keeps the first copy, node for node, and so does the
      // intersection.
      for (PolycurveD const& r : {PolycurveD::Union(a, a, nonZero, nonZero), PolycurveD::Intersect(a, a, nonZero, nonZero)}) {
        ASSERT_EQ(r.GetPointCount(), a.GetPointCount());
        for (unsigned long i = 0; i < a.GetPointCount(); ++i) EXPECT_EQ(r.GetPoint(int(i)), a.GetPoint(int(i)));
      }
    }
  }
}

TEST(WeldCases, DisjointTouchingAndNested) {
  const PolycurveD a = Rect(0, 0, 100, 100), far = Rect(150, 0, 200, 50), corner = Rect(100, 100, 180, 180);
  // Disjoint: the union has both outlines, the first operand's first.
  const PolycurveD u = PolycurveD::Union(a, far, false, false);
  ASSERT_EQ(Loops(u), 2);
  EXPECT_EQ(u.GetPoint(0), a.GetPoint(0));
  EXPECT_TRUE(PolycurveD::Intersect(a, far, false, false).IsEmpty());
  // Touching at one corner: nothing in common, areas add up.
  EXPECT_NEAR(EvenOddArea(PolycurveD::Union(a, corner, true, true)), 10000.0 + 6400.0, 1e-9);
  EXPECT_NEAR(EvenOddArea(PolycurveD::Intersect(a, corner, true, true)), 0.0, 1e-9);
  EXPECT_NEAR(EvenOddArea(PolycurveD::Xor(a, corner, true, true)), 16400.0, 1e-9);
  // Nested: the union is the outer, the intersection the inner.
  const PolycurveD inner = Rect(20, 30, 60, 70, false);
  EXPECT_NEAR(EvenOddArea(PolycurveD::Union(a, inner, true, true)), 10000.0, 1e-9);
  EXPECT_NEAR(EvenOddArea(PolycurveD::Intersect(a, inner, true, true)), 1600.0, 1e-9);
  EXPECT_NEAR(EvenOddArea(PolycurveD::Xor(inner, a, true, true)), 8400.0, 1e-9);
}

TEST(WeldCases, IntegerFormRoundsHalfAwayFromZero) {
  // Diagonals crossing at (0.5, 0.5) and at (-0.5, -0.5).
  for (int s : {1, -1}) {
    const Polycurve a(Loop({{0, 0}, {double(s), double(s)}, {double(s), 0}}));
    const Polycurve b(Loop({{double(s), 0}, {0, double(s)}, {0, 0}}));
    const PolycurveD ad(a), bd(b);
    const Polycurve r = Polycurve::Intersect(a, b, false, false, WeldFlags::Precise);
    const PolycurveD rd = PolycurveD::Intersect(ad, bd, false, false, WeldFlags::Precise);
    ASSERT_EQ(r.GetPointCount(), rd.GetPointCount());
    bool sawHalf = false;
    for (unsigned long i = 0; i < r.GetPointCount(); ++i) {
      const V d = rd.GetPoint(int(i));
      if (std::fabs(d.x) == 0.5) sawHalf = true;
      EXPECT_EQ(r.GetPoint(int(i)).x, int(d.x < 0 ? d.x - 0.5 : d.x + 0.5));
      EXPECT_EQ(r.GetPoint(int(i)).y, int(d.y < 0 ? d.y - 0.5 : d.y + 0.5));
    }
    EXPECT_TRUE(sawHalf);
  }
}

TEST(WeldCases, WeldingUpScale) {
  const double range = 268435456.0;
  EXPECT_DOUBLE_EQ(Rect(-100, 50, 200, 400).GetWeldingUpScale(), range / 350.0);
  EXPECT_EQ(Rect(0, 0, 0, 100).GetWeldingUpScale(), 1.0);   // no width
  EXPECT_EQ(PolycurveD().GetWeldingUpScale(), 1.0);
  EXPECT_EQ(Rect(0, 0, 3e8, 10).GetWeldingUpScale(), 1.0);  // wider than the range
  // The largest y does not count: only the smallest y and the height.
  const PolycurveD high = Rect(0, range - 5, 10, range + 5);
  EXPECT_DOUBLE_EQ(high.GetWeldingUpScale(), range / (range - 5));
  const Polycurve ints(Rect(-4, 0, 4, 2));
  EXPECT_DOUBLE_EQ(ints.GetWeldingUpScale(), range / 8.0);
}

TEST(WeldCases, RotateToFirstEnabled) {
  PolycurveD closed = Rect(0, 0, 10, 10);
  closed.SetNodeType(2, NODETYPE(closed.GetNodeType(2) | NodeMask::kEnabled));
  const PolycurveD r = RotateToFirstEnabled(closed);
  EXPECT_EQ(r.GetPoint(0), closed.GetPoint(2));
  EXPECT_EQ(r.GetLastPoint(), closed.GetPoint(2));
  EXPECT_TRUE(r.IsClosed(0) && r.IsClosed(int(r.GetPointCount()) - 1));
  EXPECT_NEAR(r.GetArea(), closed.GetArea(), 1e-12);
  // Open with equal ends: turned, and open again.
  PolycurveD open = closed;
  open.SetNodeClosed(0, false);
  open.SetNodeClosed(int(open.GetPointCount()) - 1, false);
  const PolycurveD ro = RotateToFirstEnabled(open);
  EXPECT_EQ(ro.GetPoint(0), closed.GetPoint(2));
  EXPECT_FALSE(ro.IsClosed(0));
  // Two subpaths, or ends apart: as it came.
  const PolycurveD two = Join(closed, Rect(20, 20, 30, 30));
  EXPECT_TRUE(RotateToFirstEnabled(two) == two);
}

TEST(WeldCases, OpenResultAndFollowCurve) {
  const PolycurveD a = Rect(0, 0, 100, 100), b = Rect(50, 50, 150, 150);
  // The first operand is followed but not drawn: what stays is the second
  // operand's part of the outline, open, broken where it meets the first.
  const PolycurveD pieces = PolycurveD::Union(a, b, false, false, WeldFlags::OpenResult);
  ASSERT_FALSE(pieces.IsEmpty());
  EXPECT_TRUE(OstraCrv::IsValidCurve(pieces.GetNodeTypes(), pieces.GetPointCount()));
  EXPECT_FALSE(pieces.IsClosed(0));
  for (unsigned long i = 0; i < pieces.GetPointCount(); ++i) {
    EXPECT_TRUE(b.IsPointOnCurve(pieces.GetPoint(int(i)), 1e-9));
    EXPECT_FALSE(IsEnabledNode(pieces.GetNodeType(int(i))));
  }
  EXPECT_EQ(pieces.GetFirstPoint(), (V{50, 100}));
  EXPECT_EQ(pieces.GetLastPoint(), (V{100, 50}));
  // Going straight on first changes nothing where curves cross simply.
  EXPECT_NEAR(EvenOddArea(PolycurveD::Union(a, b, false, false, WeldFlags::FollowCurve)), 17500.0, 1e-9);
  // Edges of the first operand that no crossing with a closed curve bounds
  // are not drawn: of two disjoint squares only the second stays.
  const PolycurveD far = Rect(300, 0, 400, 100);
  const PolycurveD trimmed = PolycurveD::Union(a, far, false, false, WeldFlags::TrimDangling);
  ASSERT_EQ(Loops(trimmed), 1);
  EXPECT_NEAR(EvenOddArea(trimmed), 10000.0, 1e-9);
  EXPECT_GE(trimmed.GetPoint(0).x, 300.0);
}

// A loop whose kept edges do not come back to its start stays open, and
// is counted, unless ForceClose closes it.
TEST(WeldCases, ForceCloseClosesAnUnfinishedLoop) {
  const PolycurveD square = Rect(0, 0, 100, 100);
  for (WeldFlags f : {WeldFlags::None, WeldFlags::ForceClose}) {
    WeldStateData s(square, false, PolycurveD(), false, false, false, f);
    s.PerformWeld(&OstraCrv::UnionKeepRule);
    Edge::First(s.segments.get(), 3).setEnabled(false);  // the closing side is not part of the result
    const PolycurveD r = s.GenerateOutputCurve<V>(false);
    EXPECT_EQ(s.UnclosedLoops(), 1);
    ASSERT_TRUE(OstraCrv::IsValidCurve(r.GetNodeTypes(), r.GetPointCount()));
    EXPECT_EQ(r.GetSubpaths().size(), 1u);
    EXPECT_EQ(r.IsClosed(0), f == WeldFlags::ForceClose);
    // The three sides left are drawn whatever the flag.
    for (V p : {V{0, 0}, V{100, 0}, V{100, 100}, V{0, 100}}) EXPECT_TRUE(r.IsPointOnCurve(p, 1e-9));
    // Forced, the gap is bridged by a line back to the start.
    EXPECT_EQ(int(r.GetPointCount()), f == WeldFlags::ForceClose ? 5 : 4);
  }
}

// The filled sides recorded on the graph.
int SidesOfFirstEdge(WeldStateData& s, int segment) { return Edge::First(s.segments.get(), segment).sides(); }

TEST(WeldGraph, FilledSides) {
  const PolycurveD a = Rect(0, 0, 100, 100), b = Rect(50, 50, 150, 150);
  {
    // Two even-odd operands without a shared stretch: no sides needed.
    WeldStateData s(a, false, b, false, false, false, WeldFlags::None);
    for (Edge e = s.FirstEdge(); e.valid(); e = e.nextEdgeAbsolute()) EXPECT_EQ(e.sides(), 0);
  }
  {
    // A clockwise square: filled on its right.
    WeldStateData s(a, true, b, false, false, false, WeldFlags::None);
    for (int k = 0; k < 4; ++k) EXPECT_EQ(SidesOfFirstEdge(s, k), 2);
  }
  {
    // A loop drawn twice: the doubled winding is filled under non-zero
    // (one side) and not under even-odd (neither side).
    const PolycurveD twice = Join(a, a);
    WeldStateData nz(twice, true, PolycurveD(), false, false, false, WeldFlags::None);
    WeldStateData eo(twice, false, PolycurveD(), false, false, true, WeldFlags::None);
    for (Edge e = nz.FirstEdge(); e.valid(); e = e.nextEdgeAbsolute())
      if (!e.isZeroLength()) {
        EXPECT_EQ(e.sides(), 2);
      }
    for (Edge e = eo.FirstEdge(); e.valid(); e = e.nextEdgeAbsolute())
      if (!e.isZeroLength()) {
        EXPECT_EQ(e.sides(), 0);
      }
  }
  {
    // A loop that winds twice round its middle under non-zero: the edges
    // inside the doubly wound part have both sides filled.
    const PolycurveD spiral = Loop({{0, 0}, {100, 0}, {100, 100}, {10, 100}, {10, 10}, {90, 10}, {90, 90}, {0, 90}});
    WeldStateData s(spiral, true, PolycurveD(), false, false, false, WeldFlags::None);
    int both = 0;
    for (Edge e = s.FirstEdge(); e.valid(); e = e.nextEdgeAbsolute())
      if (!e.isZeroLength() && e.sides() == 3) ++both;
    EXPECT_GT(both, 0);
    EXPECT_TRUE(s.IsConsistent());
  }
}

TEST(WeldGraph, PseudoAngleAndCounts) {
  using MavikMath::D;
  EXPECT_EQ(OstraCrv::PseudoAngle(D{1, 0}), 0.0);
  EXPECT_EQ(OstraCrv::PseudoAngle(D{0, 1}), 1.0);
  EXPECT_EQ(OstraCrv::PseudoAngle(D{-1, 0}), 2.0);
  EXPECT_EQ(OstraCrv::PseudoAngle(D{0, -1}), 3.0);
  EXPECT_LT(OstraCrv::PseudoAngle(D{1, 1}), OstraCrv::PseudoAngle(D{-1, 1}));
  EXPECT_GT(OstraCrv::PseudoAngle(D{1, -1e-9}), 3.9);
  // A counter-clockwise square seen from a ray that crosses it from the
  // left: +1 inside, back to 0 outside.
  const PolycurveD ccw = Rect(0, 0, 10, 10, false);
  WeldStateData s(Loop({{-5, 5}, {15, 5}, {15, 6}, {-5, 6}}), false, ccw, false, false, false, WeldFlags::None);
  OstraCrv::FillStateData f;
  std::vector<int> seen;
  for (OstraCrv::Intersection* r : s.segments->segments[0].intersections) {
    if (s.IsFirstCurve(s.segments->segments[size_t(r->other->segment)].curve)) continue;
    f.CountIntersection(r, s.angleTolerance, nullptr, false, false);
    seen.push_back(f.winding);
  }
  EXPECT_EQ(seen, (std::vector<int>{1, 0}));
}

TEST(WeldGraph, ColouringSpreadsRoundLoops) {
  // Without a knife nothing stops the colour: from both sides of one edge
  // it reaches both sides of every edge of the loop, and ResetState then
  // enables exactly the edges of that colour.
  const PolycurveD shape = Rect(0, 0, 100, 100);
  WeldStateData s(PolycurveD(), false, shape, true, false, true, WeldFlags::None);
  const Edge start = s.FirstEdge();
  s.ColorAndFollow(start, 7, 1, MavikMath::SideBoth, false);
  for (Edge e = s.FirstEdge(); e.valid(); e = e.nextEdgeAbsolute()) {
    EXPECT_EQ(e.leftColor(), 7u);
    EXPECT_EQ(e.rightColor(), 7u);
  }
  s.ResetState(7);
  for (Edge e = s.FirstEdge(); e.valid(); e = e.nextEdgeAbsolute()) EXPECT_EQ(e.enabled(), !e.isZeroLength());
  s.ResetState(8);
  for (Edge e = s.FirstEdge(); e.valid(); e = e.nextEdgeAbsolute()) EXPECT_FALSE(e.enabled());
}

// Bad input: a valid, possibly empty, result and no crash or hang.
TEST(WeldBadInput, DegenerateAndExtremeOperands) {
  const PolycurveD square = Rect(0, 0, 100, 100);
  PolycurveD openOnly;
  openOnly.MoveTo(V{0, 0});
  openOnly.LineTo(V{50, 50});
  openOnly.LineTo(V{100, 0});
  const PolycurveD flat = Loop({{0, 0}, {50, 0}, {100, 0}});  // zero area
  const PolycurveD onEdge = Loop({{0, 0}, {100, 0}, {100, 1e-9}, {0, 1e-9}});
  const PolycurveD nearly = Rect(0.5, 0, 100.5, 100);
  const PolycurveD huge = Rect(-1e15, -1e15, 1e15, 1e15), hugeToo = Rect(0, 0, 3e15, 3e15);
  const PolycurveD tiny = Rect(0, 0, 1e-12, 1e-12);
  const double nan = std::numeric_limits<double>::quiet_NaN(), inf = std::numeric_limits<double>::infinity();
  const PolycurveD withNaN = Loop({{0, 0}, {nan, 10}, {10, 10}});
  const PolycurveD withInf = Join(Loop({{0, 0}, {inf, 10}, {10, 10}}), Rect(10, 10, 20, 20));
  const PolycurveD cases[] = {PolycurveD(), openOnly, flat, onEdge, nearly, huge, hugeToo, tiny, withNaN, withInf,
                              square};
  for (PolycurveD const& a : cases)
    for (PolycurveD const& b : cases)
      for (bool nonZero : {false, true})
        for (WeldFlags f : {WeldFlags::None, WeldFlags::Precise}) {
          const PolycurveD rs[] = {PolycurveD::Union(a, b, nonZero, nonZero, f),
                                   PolycurveD::Intersect(a, b, nonZero, nonZero, f),
                                   PolycurveD::Subtract(a, b, nonZero, nonZero, f),
                                   PolycurveD::Xor(a, b, nonZero, nonZero, f)};
          for (PolycurveD const& r : rs) ASSERT_TRUE(AllClosedAndValid(r)) << Svg(a) << " | " << Svg(b);
        }
  EXPECT_TRUE(PolycurveD::Union(PolycurveD(), PolycurveD(), true, true).IsEmpty());
  EXPECT_TRUE(PolycurveD::Union(openOnly, openOnly, true, true).IsEmpty());
  // The NaN subpath takes no part; the finite one does.
  EXPECT_NEAR(EvenOddArea(PolycurveD::Union(withInf, PolycurveD(), false, false)), 100.0, 1e-9);
  // Extreme integer coordinates.
  const Polycurve big(Loop({{-2147483600.0, -2147483600.0}, {2147483600.0, -2147483600.0}, {0, 2147483600.0}}));
  const Polycurve small(Rect(-10, -10, 10, 10));
  for (Polycurve const& r : {Polycurve::Union(big, small, true, true), Polycurve::Intersect(big, small, true, true),
                             Polycurve::Subtract(big, small, true, true), Polycurve::Xor(big, big, true, true)})
    EXPECT_TRUE(AllClosedAndValid(r));
}

// Random paths, well formed but otherwise wild (duplicate points, spikes,
// folded curves, a few hundred nodes in one spot): every operation ends
// with a valid result, in both point kinds.
TEST(WeldBadInput, RandomWildPaths) {
  std::mt19937 rng(12);
  std::uniform_int_distribution<int> coord(0, 12);
  auto wild = [&]() {
    PolycurveD c;
    const int subpaths = 1 + int(rng() % 3);
    for (int s = 0; s < subpaths; ++s) {
      c.MoveTo(V{double(coord(rng) * 10), double(coord(rng) * 10)});
      const int n = 1 + int(rng() % 8);
      for (int k = 0; k < n; ++k) {
        const V p{double(coord(rng) * 10), double(coord(rng) * 10)};
        if (rng() % 3 == 0)
          c.CubicTo(V{double(coord(rng) * 10), double(coord(rng) * 10)}, V{double(coord(rng) * 10), double(coord(rng) * 10)}, p);
        else
          c.LineTo(p);
      }
      if (rng() % 4) {
        c.LineTo(c.GetPoint(int(c.GetPointCount()) - 1 - 0));
        c.CloseLastSubpath(200.0, true);
      }
    }
    return c;
  };
  for (int iter = 0; iter < 150; ++iter) {
    const PolycurveD a = wild(), b = wild();
    const bool nonZero = iter % 2;
    for (PolycurveD const& r : {PolycurveD::Union(a, b, nonZero, !nonZero), PolycurveD::Intersect(a, b, nonZero, nonZero),
                                PolycurveD::Subtract(a, b, !nonZero, nonZero), PolycurveD::Xor(a, b, nonZero, nonZero)})
      ASSERT_TRUE(AllClosedAndValid(r)) << Svg(a) << " | " << Svg(b);
    const Polycurve ai(a), bi(b);
    ASSERT_TRUE(AllClosedAndValid(Polycurve::Union(ai, bi, nonZero, nonZero)));
  }
}

}  // namespace
