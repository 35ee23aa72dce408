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

// tests/data, found from this file's place: polygons of a clipping library's
// test suite and near-degenerate cubic shapes from a vector editor.
const std::string kData = std::string(__FILE__).substr(0, std::string(__FILE__).find_last_of('/')) + "/../data";

std::vector<std::vector<Ring>> Clipper() { return inref::ClipperShapes(kData + "/clipper2/Polygons.txt"); }

TEST(PointInShape, CorpusPolygonsAndCurvesAgreeWithWinding) {
  const auto shapes = Clipper();
  ASSERT_GT(shapes.size(), 100u);
  std::mt19937 rng(5);
  int tested = 0;
  for (const auto& rings : shapes) {
    Builder<POINT> b;
    for (const Ring& r : rings) b.Polygon(r);
    tested += CheckAgainstWinding(b.points.data(), b.nodes.data(), b.n(), rng, 15);
  }
  for (int f = 0; f < 8; ++f) {  // near-degenerate cubic shapes: chains of tiny segments
    std::ifstream in(kData + "/linesweeper/graphite_" + std::to_string(f) + ".txt");
    ASSERT_TRUE(in) << f;
    for (std::string d; std::getline(in, d);) {
      PolycurveD c;
      if (ParseSvgPathData(d, c))
        tested += CheckAgainstWinding(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()), rng, 150);
    }
  }
  EXPECT_GT(tested, 3000);
}

// CountEdges in the swapped frame, on a vertical probe run by the engine,
// agrees with the winding too.
TEST(PointInShape, VerticalTallyAgreesWithWinding) {
  std::mt19937 rng(3);
  int tested = 0;
  for (const auto& rings : Clipper()) {
    Builder<V> b;
    for (const Ring& r : rings) b.Polygon(r);
    const auto flat = inref::Flatten(b.points.data(), b.nodes.data(), b.n());
    for (int k = 0; k < 10; ++k) {
      const V p{rng() % 400 + 0.37, double(rng() % 400)};
      if (inref::Distance(flat, p) <= kFar) continue;
      const V ends[2] = {{p.x, -1e6}, {p.x, 1e6}};
      const NODETYPE probe[2] = {0x04, 0x44};
      const SegmentsT<V> run({{ends, probe, 2, true, true}, {b.points.data(), b.nodes.data(), b.n(), false, true}},
                             PointInShapeIntersectionSettings());
      int count[2], winding[2];
      bool onEdge = true, onOverlap = true;
      CountEdges(CoordinateSystem::FlipX_Rotate270, run.segments[0], p, count, winding, onEdge, onOverlap);
      const int w = inref::Winding(flat, p);
      EXPECT_FALSE(onEdge || onOverlap);
      EXPECT_EQ(count[0] % 2, std::abs(w) % 2);
      EXPECT_EQ(count[1] % 2, std::abs(w) % 2);
      EXPECT_EQ(std::abs(winding[0]), std::abs(w));
      EXPECT_EQ(winding[0], -winding[1]);
      ++tested;
    }
  }
  EXPECT_GT(tested, 500);
}

TEST(PointInShape, PointOnTheOutlineAndItsSide) {
  for (bool clockwise : {true, false}) {
    Builder<POINT> b;
    std::vector<V> sq{{0, 0}, {0, 100}, {100, 100}, {100, 0}};
    if (!clockwise) std::reverse(sq.begin(), sq.end());
    b.Polygon(sq);
    // The side is in the probe's frame: on the left edge the interior lies at
    // larger x, on the bottom edge (where the horizontal probe runs along the
    // edge and a vertical one decides) at larger y.
    const std::pair<POINT, MavikMath::Side> cases[] = {{{0, 40}, MavikMath::SideRight},
                                                       {{40, 0}, MavikMath::SideRight},
                                                       {{100, 60}, MavikMath::SideLeft},
                                                       {{60, 100}, MavikMath::SideLeft}};
    for (const auto& [p, expected] : cases)
      for (bool result : {false, true}) {
        bool onEdge = false;
        MavikMath::Side side = MavikMath::SideNone;
        EXPECT_EQ(IsPointInShape(b.points.data(), b.nodes.data(), b.n(), p, result, true, &onEdge, &side), result);
        EXPECT_TRUE(onEdge);
        EXPECT_EQ(side, expected);
      }
  }
}

TEST(PointInShape, RingsOfTwoSubpathsAndBadInput) {
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
  Builder<V> open;
  open.Polygon({{0, 0}, {0, 100}, {100, 100}, {100, 0}}, false);
  const V in{50, 50}, nan{std::nan(""), 50};
  bool onEdge = true;
  V out{7, 7};
  EXPECT_FALSE(IsPointInShape(open.points.data(), open.nodes.data(), open.n(), in, true, true, &onEdge, nullptr));
  EXPECT_FALSE(onEdge);
  EXPECT_FALSE(GetPointInShape(open.points.data(), open.nodes.data(), open.n(), out));
  EXPECT_EQ(out, (V{7, 7}));
  EXPECT_FALSE(IsPointInShape<V>(nullptr, open.nodes.data(), 5, in, true, true, nullptr, nullptr));
  EXPECT_FALSE(IsPointInShape(open.points.data(), open.nodes.data(), 0, in, true, true, nullptr, nullptr));
  Builder<V> closed;
  closed.Polygon({{0, 0}, {0, 100}, {100, 100}, {100, 0}});
  EXPECT_FALSE(IsPointInShape(closed.points.data(), closed.nodes.data(), closed.n(), nan, true, true, nullptr, nullptr));
  EXPECT_FALSE(IsPointInPolygon(closed.points.data(), 3, nan, false, true, &onEdge));
  EXPECT_FALSE(IsPointInPolygon<V>(nullptr, 3, in, false, true, &onEdge));
  closed.points[2] = nan;  // a damaged outline: any answer, no crash
  IsPointInShape(closed.points.data(), closed.nodes.data(), closed.n(), in, true, true, nullptr, nullptr);
  GetPointInShape(closed.points.data(), closed.nodes.data(), closed.n(), out);
}

// IsPointInPolygon: even-odd against the winding of the polygon, off its
// vertices; near a vertex, on the outline.
TEST(PointInPolygon, AgreesWithWindingAndFindsVertices) {
  std::mt19937 rng(21);
  for (int s = 0; s < 200; ++s) {
    std::vector<POINT> poly(3 + rng() % 8);
    Ring ring;
    for (auto& q : poly) ring.push_back(MavikMath::ToV(q = POINT{int(rng() % 200), int(rng() % 200)}));
    ring.push_back(ring[0]);
    for (int k = 0; k < 40; ++k) {
      const POINT p{int(rng() % 220) - 10, int(rng() % 220) - 10};
      if (inref::Distance({ring}, MavikMath::ToV(p)) < 0.5) continue;
      bool onEdge = true;
      EXPECT_EQ(IsPointInPolygon(poly.data(), int(poly.size()), p, false, false, &onEdge),
                (inref::Winding({ring}, MavikMath::ToV(p)) & 1) != 0);
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
  // Half-open on the corners: the top row counts, the bottom row does not.
  EXPECT_TRUE(IsPointInPolygon(square, 4, V{0, 10}, false, false, nullptr));
  EXPECT_FALSE(IsPointInPolygon(square, 4, V{0, 0}, false, false, nullptr));
}

// GetPointInShape finds a point inside by the reference: on needles at any
// angle short of level (the row is a whole number, so a level sliver may lie
// between rows), stars, and circles with holes of either direction; and on
// random self-crossing shapes whose first closed subpath has some area.
template <class T>
void InteriorPoints() {
  std::mt19937 rng(31);
  std::uniform_real_distribution<double> u(0, 1);
  const bool whole = std::is_same_v<T, POINT>;
  for (int s = 0; s < 400; ++s) {
    Builder<T> b;
    // The integer row starts at x = -100: integer shapes stay to its right.
    const V c{u(rng) * 2000 - 1000 + (whole ? 3200 : 0), u(rng) * 2000 - 1000};
    const double r = (whole ? 12 : 3) + u(rng) * 400, a = u(rng) * 6.283 + (s % 8 == 0 ? 0.0 : 0.1);
    if (s % 4 == 0) {  // integer needles 6 to 8 thick (room for a whole point), double ones 0.05 to 4
      const double len = 50 + u(rng) * 2000, w = (whole ? 6 + 2 * u(rng) : 0.05 + 4 * u(rng)) / 2;
      const V d{std::cos(a), std::sin(a)};
      if (std::fabs(d.y) < 0.05) continue;
      b.Polygon({{c.x - d.y * w, c.y + d.x * w}, {c.x + d.x * len, c.y + d.y * len}, {c.x + d.y * w, c.y - d.x * w}});
    } else if (s % 4 == 1) {
      std::vector<V> star;
      for (int i = 0, k = 3 + int(rng() % 12); i < k; ++i)
        star.push_back({c.x + r * u(rng) * std::cos(6.283 * i / k), c.y + r * u(rng) * std::sin(6.283 * i / k)});
      b.Polygon(star);
    } else {
      const bool outer = rng() % 2, inner = rng() % 2;
      b.Circle(c, r, outer);
      if (s % 4 == 3) b.Circle(c, r * (0.3 + (whole ? 0.3 : 0.6) * u(rng)), inner);
    }
    T out{};
    if (s % 4 == 1 && std::fabs(GetArea(b.points.data(), b.nodes.data(), b.n())) < 1) continue;
    ASSERT_TRUE(GetPointInShape(b.points.data(), b.nodes.data(), b.n(), out)) << s;
    const auto rings = inref::Flatten(b.points.data(), b.nodes.data(), b.n());
    EXPECT_EQ(inref::Winding(rings, MavikMath::ToV(out)) & 1, 1) << "shape " << s;
  }
  for (int s = 0; s < 400; ++s) {
    const auto path = sampled::Make<T>(rng, 500, 3, 6);
    const auto closed = std::find_if(path.shape.subpaths.begin(), path.shape.subpaths.end(),
                                     [](const testpaths::Subpath& sp) { return sp.closed; });
    if (whole || closed == path.shape.subpaths.end() ||
        std::fabs(GetArea(&path.points[closed->first], &path.shape.nodes[closed->first],
                          closed->last - closed->first + 1)) < 1.0)
      continue;
    T out;
    ASSERT_TRUE(GetPointInShape(path.points.data(), path.shape.nodes.data(), path.shape.n(), out)) << s;
    const auto rings = inref::Flatten(path.points.data(), path.shape.nodes.data(), path.shape.n());
    EXPECT_EQ(std::abs(inref::Winding(rings, MavikMath::ToV(out))) % 2, 1) << s;  // even-odd, however narrow
    EXPECT_GT(inref::Distance(rings, MavikMath::ToV(out)), 1e-6) << s;
  }
}

TEST(GetPointInShape, InsideByReferenceInteger) { InteriorPoints<POINT>(); }
TEST(GetPointInShape, InsideByReferenceDouble) { InteriorPoints<V>(); }

TEST(CurveSide, CircleInteriorIsOnTheRightOfAClockwiseOutline) {
  std::mt19937 rng(9);
  for (bool clockwise : {true, false}) {
    Builder<V> b, small;
    b.Circle({10, -20}, 200, clockwise);
    small.Circle({30, 0}, 20, true);
    const PolycurveD circle(b.points.data(), b.nodes.data(), b.points.size());
    for (int k = 0; k < 300; ++k) {
      const V p{double(int(rng() % 800) - 390), double(int(rng() % 800) - 420)};
      const double r = std::hypot(p.x - 10, p.y + 20);
      if (std::fabs(r - 200) > 1) {
        EXPECT_EQ(circle.GetSide(p), (r < 200) == clockwise ? MavikMath::SideRight : MavikMath::SideLeft);
      }
    }
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
