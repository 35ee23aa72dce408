// Point in shape, edge tally, side and interior point, against a winding
// number computed on a fine flattening (inshape_reference.h).
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>

#include "measure/inshape_reference.h"
#include "ostracrv/intersect/segments.h"
#include "ostracrv/io/svg_path.h"
#include "polycurve.h"

namespace {

using namespace OstraCrv;
using inref::Builder;
using inref::Ring;
using MavikMath::V;
using Framework::common_types::POINT;

constexpr double kFar = 3.0;  // well beyond the probe tolerance and the on-edge distance

// Checks IsPointInShape for both fill rules at random points farther than
// kFar from the flattened outline. Some points are put on the rows of nodes,
// where the probe passes exactly through a node. Returns the points tested.
template <class T>
int CheckAgainstWinding(const T* pts, const NODETYPE* nodes, int n, std::mt19937& rng, int tries) {
  const std::vector<Ring> rings = inref::Flatten(pts, nodes, n);
  MavikMath::Bounds box;
  for (int i = 0; i < n; ++i) box.Add(MavikMath::ToV(pts[i]));
  std::uniform_real_distribution<double> ux(box.left - 20, box.right + 20), uy(box.bottom - 20, box.top + 20);
  int tested = 0;
  for (int k = 0; k < tries; ++k) {
    V q{ux(rng), uy(rng)};
    if (k % 3 == 0) q.y = MavikMath::ToV(pts[rng() % unsigned(n)]).y;  // a node's row
    const T p = MavikMath::FromV<T>(q);
    const V pv = MavikMath::ToV(p);
    if (inref::Distance(rings, pv) <= kFar) continue;
    const int w = inref::Winding(rings, pv);
    bool onEdge = true;
    MavikMath::Side side = MavikMath::SideBoth;
    EXPECT_EQ(IsPointInShape(pts, nodes, n, p, false, true, &onEdge, &side), w != 0)
        << "non-zero at " << pv.x << "," << pv.y << " winding " << w;
    EXPECT_FALSE(onEdge);
    EXPECT_EQ(side, MavikMath::SideNone);
    EXPECT_EQ(IsPointInShape(pts, nodes, n, p, true, false, nullptr, nullptr), (w & 1) != 0)
        << "even-odd at " << pv.x << "," << pv.y << " winding " << w;
    ++tested;
  }
  return tested;
}

template <class T>
void RandomShapes() {
  std::mt19937 rng(12);
  int tested = 0;
  for (int s = 0; s < 300; ++s) {
    const auto path = sampled::Make<T>(rng, 500, 3, 7);
    tested += CheckAgainstWinding(path.points.data(), path.shape.nodes.data(), path.shape.n(), rng, 20);
  }
  EXPECT_GT(tested, 3000);
}

TEST(PointInShape, RandomSelfCrossingShapesAgreeWithWindingInteger) { RandomShapes<POINT>(); }
TEST(PointInShape, RandomSelfCrossingShapesAgreeWithWindingDouble) { RandomShapes<V>(); }

TEST(PointInShape, CorpusPolygonsAgreeWithWinding) {
  const auto shapes = inref::ClipperShapes(std::string(OSTRACRV_CORPORA) + "/clipper2/Polygons.txt");
  if (shapes.empty()) GTEST_SKIP() << "no corpus at " << OSTRACRV_CORPORA;
  ASSERT_GT(shapes.size(), 100u);
  std::mt19937 rng(5);
  int tested = 0;
  for (const auto& rings : shapes) {
    Builder<POINT> b;
    for (const Ring& r : rings) b.Polygon(r);
    tested += CheckAgainstWinding(b.points.data(), b.nodes.data(), b.n(), rng, 15);
  }
  EXPECT_GT(tested, 1000);
}

TEST(PointInShape, CorpusCurvesAgreeWithWinding) {
  std::mt19937 rng(8);
  int tested = 0;
  for (int f = 0; f < 8; ++f) {
    std::ifstream in(std::string(OSTRACRV_CORPORA) + "/linesweeper/graphite_" + std::to_string(f) + ".txt");
    if (!in) GTEST_SKIP() << "no corpus at " << OSTRACRV_CORPORA;
    std::string d;
    while (std::getline(in, d)) {
      PolycurveD c;
      if (d.empty() || !ParseSvgPathData(d, c)) continue;
      tested += CheckAgainstWinding(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()), rng, 150);
    }
  }
  EXPECT_GT(tested, 1000);
}

// The vertical probe: CountEdges in the swapped frame, on a probe the
// engine ran at x = p.x, agrees with the winding too.
TEST(PointInShape, VerticalTallyAgreesWithWinding) {
  std::mt19937 rng(3);
  int tested = 0;
  for (int s = 0; s < 150; ++s) {
    const auto path = sampled::Make<V>(rng, 500, 3, 6);
    const auto rings = inref::Flatten(path.points.data(), path.shape.nodes.data(), path.shape.n());
    for (int k = 0; k < 10; ++k) {
      const V p{double(int(rng() % 1200) - 600) + 0.37, double(int(rng() % 1200) - 600)};
      if (inref::Distance(rings, p) <= kFar) continue;
      const V ends[2] = {{p.x, -5000}, {p.x, 5000}};
      const NODETYPE probeNodes[2] = {0x04, 0x44};
      std::vector<IntersectionCurveT<V>> curves{{ends, probeNodes, 2, true, true},
                                                {path.points.data(), path.shape.nodes.data(), path.shape.n(), false,
                                                 true}};
      // Only closed subpaths take part in a shape: blank out the open ones.
      std::vector<NODETYPE> closedOnly = path.shape.nodes;
      for (const auto& sp : path.shape.subpaths)
        if (!sp.closed)
          for (int i = sp.first + 1; i <= sp.last; ++i) closedOnly[i] = NodeTypes::Open::move;
      curves[1].nodes = closedOnly.data();
      SegmentsT<V> run(curves, PointInShapeIntersectionSettings());
      int count[2], winding[2];
      bool onEdge = true, onOverlap = true;
      CountEdges(CoordinateSystem::FlipX_Rotate270, run.segments[0], p, count, winding, onEdge, onOverlap);
      const int w = inref::Winding(rings, p);
      EXPECT_FALSE(onEdge || onOverlap);
      EXPECT_EQ((count[0] & 1) != 0, (w & 1) != 0);
      EXPECT_EQ((count[1] & 1) != 0, (w & 1) != 0);
      EXPECT_EQ(winding[0] != 0, w != 0);
      EXPECT_EQ(std::abs(winding[1]), std::abs(w));
      ++tested;
    }
  }
  EXPECT_GT(tested, 800);
}

TEST(PointInShape, PointOnTheOutline) {
  for (bool clockwise : {true, false}) {
    Builder<POINT> b;
    std::vector<V> sq{{0, 0}, {0, 100}, {100, 100}, {100, 0}};
    if (!clockwise) std::reverse(sq.begin(), sq.end());
    b.Polygon(sq);
    bool onEdge = false;
    MavikMath::Side side = MavikMath::SideNone;
    // On the left edge: the interior lies at larger x. On the bottom edge the
    // horizontal probe runs along the edge; the vertical one finds the
    // interior at larger y.
    for (POINT p : {POINT{0, 40}, POINT{40, 0}}) {
      for (bool result : {false, true}) {
        EXPECT_EQ(IsPointInShape(b.points.data(), b.nodes.data(), b.n(), p, result, true, &onEdge, &side), result);
        EXPECT_TRUE(onEdge);
        EXPECT_EQ(side, MavikMath::SideRight);
      }
    }
    EXPECT_TRUE(IsPointInShape(b.points.data(), b.nodes.data(), b.n(), POINT{100, 60}, true, false, &onEdge, &side));
    EXPECT_EQ(side, MavikMath::SideLeft);
    EXPECT_TRUE(IsPointInShape(b.points.data(), b.nodes.data(), b.n(), POINT{60, 100}, true, false, &onEdge, &side));
    EXPECT_EQ(side, MavikMath::SideLeft);
  }
}

TEST(PointInShape, RingsOfTwoSubpaths) {
  for (bool same : {true, false}) {
    Builder<V> b;
    b.Circle({0, 0}, 100, true);
    b.Circle({0, 0}, 50, same);
    const PolycurveD c(b.points.data(), b.nodes.data(), b.points.size());
    EXPECT_EQ(c.IsPointInShape(V{0, 0}, false, true), same);
    EXPECT_FALSE(c.IsPointInShape(V{0, 0}, false, false));
    EXPECT_TRUE(c.IsPointInShape(V{75, 0}, false, false));
    EXPECT_FALSE(c.IsPointInShape(V{95, 95}, false, true));  // box corner of the circle
  }
}

TEST(PointInShape, BadInputAnswersFalse) {
  Builder<V> b;
  b.Polygon({{0, 0}, {0, 100}, {100, 100}, {100, 0}}, false);  // open only
  const V inside{50, 50};
  bool onEdge = true;
  EXPECT_FALSE(IsPointInShape(b.points.data(), b.nodes.data(), b.n(), inside, true, true, &onEdge, nullptr));
  EXPECT_FALSE(onEdge);
  EXPECT_FALSE(IsPointInShape<V>(nullptr, b.nodes.data(), b.n(), inside, true, true, nullptr, nullptr));
  EXPECT_FALSE(IsPointInShape(b.points.data(), b.nodes.data(), 0, inside, true, true, nullptr, nullptr));
  V out{7, 7};
  EXPECT_FALSE(GetPointInShape(b.points.data(), b.nodes.data(), b.n(), out));
  EXPECT_EQ(out, (V{7, 7}));
  Builder<V> closed;
  closed.Polygon({{0, 0}, {0, 100}, {100, 100}, {100, 0}});
  const double nan = std::numeric_limits<double>::quiet_NaN();
  EXPECT_FALSE(IsPointInShape(closed.points.data(), closed.nodes.data(), closed.n(), V{nan, 50}, true, true, nullptr,
                              nullptr));
  closed.points[2] = V{nan, nan};
  IsPointInShape(closed.points.data(), closed.nodes.data(), closed.n(), inside, true, true, nullptr, nullptr);
  GetPointInShape(closed.points.data(), closed.nodes.data(), closed.n(), out);
  EXPECT_FALSE(IsPointInPolygon<V>(nullptr, 3, inside, false, true, &onEdge));
  EXPECT_FALSE(IsPointInPolygon(closed.points.data(), 3, V{nan, 1}, false, true, &onEdge));
}

// IsPointInPolygon: even-odd against the winding of the polygon, off the
// vertices; with anyOnBothSides, inside for convex polygons.
TEST(PointInPolygon, AgreesWithWindingAndFindsVertices) {
  std::mt19937 rng(21);
  for (int s = 0; s < 200; ++s) {
    std::vector<POINT> poly(3 + rng() % 8);
    for (auto& q : poly) q = POINT{int(rng() % 200), int(rng() % 200)};
    std::vector<V> ring;
    for (auto& q : poly) ring.push_back(MavikMath::ToV(q));
    ring.push_back(ring[0]);
    for (int k = 0; k < 40; ++k) {
      const POINT p{int(rng() % 220) - 10, int(rng() % 220) - 10};
      const V pv = MavikMath::ToV(p);
      if (inref::Distance({ring}, pv) < 0.5) continue;
      bool onEdge = true;
      EXPECT_EQ(IsPointInPolygon(poly.data(), int(poly.size()), p, false, false, &onEdge),
                (inref::Winding({ring}, pv) & 1) != 0);
      EXPECT_FALSE(onEdge);
    }
    const POINT& v = poly[rng() % poly.size()];
    bool onEdge = false;
    EXPECT_TRUE(IsPointInPolygon(poly.data(), int(poly.size()), POINT{v.x + 1, v.y - 1}, false, true, &onEdge));
    EXPECT_TRUE(onEdge);
  }
  const V square[4] = {{0, 0}, {0, 10}, {10, 10}, {10, 0}};
  EXPECT_TRUE(IsPointInPolygon(square, 4, V{5, 5}, true, false, nullptr));
  EXPECT_FALSE(IsPointInPolygon(square, 4, V{15, 5}, true, false, nullptr));
  // The half-open rule on a vertex: the bottom corners' row does not count,
  // the top corners' row does, and an edge through p counts on the left.
  EXPECT_FALSE(IsPointInPolygon(square, 4, V{0, 0}, false, false, nullptr));
  EXPECT_TRUE(IsPointInPolygon(square, 4, V{0, 10}, false, false, nullptr));
  EXPECT_FALSE(IsPointInPolygon(square, 4, V{10, 10}, false, false, nullptr));
}

// GetPointInShape finds a point inside by the reference, on blobs, needles a
// few units thick at any angle, and shapes with holes.
template <class T>
void InteriorPoints() {
  std::mt19937 rng(31);
  std::uniform_real_distribution<double> u(0, 1);
  for (int s = 0; s < 400; ++s) {
    Builder<T> b;
    // The integer row starts at x = -100: integer shapes stay to its right.
    const V c{u(rng) * 2000 - 1000 + (std::is_same_v<T, POINT> ? 3200 : 0), u(rng) * 2000 - 1000};
    const int kind = s % 4;
    if (kind == 0) {
      // Needle up to 2000 long at any angle short of level (the row is a
      // whole number, so a level sliver may lie between rows). Double needles
      // 0.05 to 4 thick; integer ones 6 to 8, so that the row has a whole
      // point strictly inside.
      const bool whole = std::is_same_v<T, POINT>;
      double a = u(rng) * 6.283;
      if (std::fabs(std::sin(a)) < 0.05) a += 0.1;
      const double len = 50 + u(rng) * 2000, w = whole ? 6 + 2 * u(rng) : 0.05 + 4 * u(rng);
      const V d{std::cos(a), std::sin(a)}, nrm{-d.y * w / 2, d.x * w / 2};
      b.Polygon({{c.x + nrm.x, c.y + nrm.y},
                 {c.x + d.x * len, c.y + d.y * len},
                 {c.x - nrm.x, c.y - nrm.y}});
    } else if (kind == 1) {  // star polygon
      std::vector<V> star;
      const int k = 3 + int(rng() % 12);
      for (int i = 0; i < k; ++i) {
        const double r = 5 + u(rng) * 300, a = 6.283 * i / k;
        star.push_back({c.x + r * std::cos(a), c.y + r * std::sin(a)});
      }
      b.Polygon(star);
    } else {  // circle, with a hole of either direction
      const double r = 3 + u(rng) * 400;
      b.Circle(c, r, rng() % 2);
      if (kind == 3) b.Circle(c, r * (0.3 + 0.6 * u(rng)), rng() % 2);
    }
    T out{};
    ASSERT_TRUE(GetPointInShape(b.points.data(), b.nodes.data(), b.n(), out)) << s;
    const auto rings = inref::Flatten(b.points.data(), b.nodes.data(), b.n());
    EXPECT_EQ(inref::Winding(rings, MavikMath::ToV(out)) & 1, 1) << "shape " << s << " kind " << kind;
  }
}

TEST(GetPointInShape, InsideByReferenceInteger) { InteriorPoints<POINT>(); }
TEST(GetPointInShape, InsideByReferenceDouble) { InteriorPoints<V>(); }

// Random shapes, self-crossing ones included: the point found is inside by
// even-odd, off the outline (the first stretch inside may be narrow).
TEST(GetPointInShape, RandomShapesGiveInteriorPoints) {
  std::mt19937 rng(44);
  int found = 0;
  for (int s = 0; s < 400; ++s) {
    const auto path = sampled::Make<V>(rng, 500, 3, 6);
    // Only a first closed subpath with some area has an inside to find.
    const auto closed = std::find_if(path.shape.subpaths.begin(), path.shape.subpaths.end(),
                                     [](const testpaths::Subpath& sp) { return sp.closed; });
    if (closed == path.shape.subpaths.end() ||
        std::fabs(GetArea(path.points.data() + closed->first, path.shape.nodes.data() + closed->first,
                          closed->last - closed->first + 1)) < 1.0)
      continue;
    V out;
    ASSERT_TRUE(GetPointInShape(path.points.data(), path.shape.nodes.data(), path.shape.n(), out)) << s;
    const auto rings = inref::Flatten(path.points.data(), path.shape.nodes.data(), path.shape.n());
    EXPECT_EQ(std::abs(inref::Winding(rings, out)) % 2, 1) << s;
    EXPECT_GT(inref::Distance(rings, out), 1e-6) << s;
    ++found;
  }
  EXPECT_GT(found, 200);
}

TEST(CurveSide, CircleInteriorIsOnTheRightOfAClockwiseOutline) {
  std::mt19937 rng(9);
  for (bool clockwise : {true, false}) {
    Builder<V> b;
    b.Circle({10, -20}, 200, clockwise);
    const PolycurveD circle(b.points.data(), b.nodes.data(), b.points.size());
    for (int k = 0; k < 300; ++k) {
      const V p{double(int(rng() % 800) - 390), double(int(rng() % 800) - 420)};
      const double r = std::hypot(p.x - 10, p.y + 20);
      if (std::fabs(r - 200) < 1) continue;
      const bool right = (r < 200) == clockwise;
      EXPECT_EQ(circle.GetSide(p), right ? MavikMath::SideRight : MavikMath::SideLeft);
    }
    Builder<V> small;
    small.Circle({30, 0}, 20, true);
    const PolycurveD inner(small.points.data(), small.nodes.data(), small.points.size());
    EXPECT_EQ(circle.OnLeftOrRight(inner), clockwise ? MavikMath::SideRight : MavikMath::SideLeft);
  }
  Builder<POINT> line;
  line.Polygon({{0, 0}, {100, 0}}, false);
  const Polycurve l(line.points.data(), line.nodes.data(), line.points.size());
  EXPECT_EQ(l.GetSide(POINT{50, 5}), MavikMath::SideLeft);
  EXPECT_EQ(l.GetSide(POINT{50, -5}), MavikMath::SideRight);
  EXPECT_EQ(l.GetSide(POINT{50, 0}), MavikMath::SideNone);
  EXPECT_EQ(Polycurve().GetSide(POINT{1, 1}), MavikMath::SideNone);
  EXPECT_EQ(l.OnLeftOrRight(l), MavikMath::SideNone);
}

}  // namespace
