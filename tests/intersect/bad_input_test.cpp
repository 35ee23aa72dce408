// Bad input never crashes, hangs or leaves a non-finite record: empty and
// short curves, null arrays, lone moves, NaN and infinite points, degenerate
// segments, malformed node bytes, extreme coordinates and tolerances. The
// pruned and plain searches agree on all of it.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>

#include "engine_test_util.h"
#include "ostracrv/intersect/intersection_settings.h"

namespace {

using namespace engine_test;

const SegmentIntersectionSettings kSettings[] = {
    OstraCrv::PointInShapeIntersectionSettings(),
    OstraCrv::BreakIntersectionSettings(),
    OstraCrv::WeldGraphIntersectionSettings(OstraCrv::kWeldTolerance),
    OstraCrv::OffsetIntersectionSettings(),
    OstraCrv::SelfBreakIntersectionSettings(false),
};

// Both searches; every record finite and linked; returns the record count.
template <class T>
int RunChecked(const std::vector<IntersectionCurveT<T>>& curves, const SegmentIntersectionSettings& settings) {
  SegmentsT<T> pruned(curves, settings);
  SegmentsT<T> plain(curves, settings, PairSearch::AllPairs);
  EXPECT_TRUE(Snapshot(pruned) == Snapshot(plain));
  for (const auto& seg : pruned.segments)
    for (const Intersection* r : seg.intersections) {
      EXPECT_TRUE(r->point.IsFinite());
      EXPECT_TRUE(std::isfinite(r->t));
      EXPECT_TRUE(std::isfinite(r->curvature));
      EXPECT_NE(r->other, nullptr);
      if (r->other) {
        EXPECT_EQ(r->other->other, r);
      }
    }
  EXPECT_EQ(pruned.overlapCount % 2, 0);
  return RecordCount(pruned);
}

TEST(BadInput, EmptyShortAndNullCurves) {
  const SegmentIntersectionSettings st = OstraCrv::PointInShapeIntersectionSettings();
  EXPECT_EQ(RunChecked<V>({}, st), 0);
  Path<V> cross;
  cross.Move({0, 0}).Line({100, 100});
  Path<V> other;
  other.Move({0, 100}).Line({100, 0});
  const NODETYPE loneMoves[] = {0x04, 0x04, 0x04};
  const V somePoints[] = {{0, 100}, {100, 0}, {50, 50}};
  std::vector<IntersectionCurveT<V>> curves = {cross.Curve(),
                                               IntersectionCurveT<V>(other.points.data(), other.nodes.data(), 0, true, true),
                                               IntersectionCurveT<V>(other.points.data(), other.nodes.data(), 1, true, true),
                                               IntersectionCurveT<V>(other.points.data(), other.nodes.data(), -5, true, true),
                                               IntersectionCurveT<V>(other.points.data(), nullptr, 5, true, true),
                                               IntersectionCurveT<V>(nullptr, other.nodes.data(), 2, true, true),
                                               IntersectionCurveT<V>(somePoints, loneMoves, 3, true, true)};
  SegmentsT<V> s(curves, st);
  EXPECT_EQ(RecordCount(s), 0);  // the null-point curve has a segment but meets nothing
  EXPECT_EQ(s.segments.size(), 2u);
  EXPECT_FALSE(s.hasIntersections);
  // A curve of fewer than 2 nodes has no segments.
  SegmentsT<V> t({IntersectionCurveT<V>(somePoints, loneMoves, 1, true, true)}, st);
  EXPECT_TRUE(t.segments.empty());
  // Removal with bad arguments changes nothing.
  s.RemoveIntersections(-1);
  s.RemoveIntersections(99);
  Intersection stray;
  stray.segment = 0;
  s.RemoveIntersection(&stray);
  EXPECT_EQ(RecordCount(s), 0);
}

TEST(BadInput, NonFinitePoints) {
  const double nan = std::numeric_limits<double>::quiet_NaN(), inf = std::numeric_limits<double>::infinity();
  const double bad[] = {nan, inf, -inf};
  for (double b : bad) {
    Path<V> p;
    p.Move({0, 0}).Line({b, 50}).Line({100, 0}).Cubic({50, b}, {0, 100}, {100, 100}).Line({0, 100});
    p.Cubic({b, b}, {b, 0}, {20, 20}).Close();
    Path<V> q;
    q.Move({-10, 50}).Line({110, 50}).Cubic({50, 150}, {50, -50}, {-10, 60});
    Path<V> r;
    r.Move({b, b}).Line({b, b});
    for (const auto& st : kSettings) {
      RunChecked<V>({p.Curve(), q.Curve(), r.Curve()}, st);
      RunChecked<V>({q.Curve(true, false), p.Curve(false, true)}, st);
    }
  }
}

TEST(BadInput, DegenerateSegments) {
  Path<V> p;
  p.Move({0, 0}).Line({0, 0}).Cubic({0, 0}, {0, 0}, {0, 0});       // zero line, point Bezier
  p.Cubic({0, 0}, {100, 100}, {100, 100});                          // collapsed handles
  p.Cubic({200, 100}, {0, 100}, {150, 100});                        // straight, doubling back
  p.Line({150, 100}).Line({0, 0}).Close();
  Path<V> q = p;                                                    // the same curve again
  Path<V> line;
  line.Move({50, -10}).Line({50, 200}).Line({50, -10});              // a line doubling back
  for (const auto& st : kSettings) {
    RunChecked<V>({p.Curve(), q.Curve(), line.Curve()}, st);
    RunChecked<POINT>({ToInteger(p, 1).Curve(), ToInteger(q, 1).Curve(), ToInteger(line, 1).Curve()}, st);
  }
}

TEST(BadInput, MalformedNodeBytes) {
  std::mt19937 rng(5);
  std::uniform_int_distribution<int> byte(0, 255), count(0, 24);
  std::uniform_real_distribution<double> coord(0, 50);
  for (int round = 0; round < 1500; ++round) {
    std::vector<V> pv[2];
    std::vector<POINT> pi[2];
    std::vector<NODETYPE> nodes[2];
    for (int c = 0; c < 2; ++c) {
      const int n = count(rng);
      for (int i = 0; i < n; ++i) {
        // Mostly plausible kinds, sometimes anything.
        const NODETYPE kinds[] = {0x04, 0x44, 0xC0, 0x84, 0x0C, 0x48, 0x88};
        nodes[c].push_back(rng() % 4 ? kinds[rng() % 7] : static_cast<NODETYPE>(byte(rng)));
        const V v{std::round(coord(rng)), std::round(coord(rng))};
        pv[c].push_back(v);
        pi[c].push_back(MavikMath::FromV<POINT>(v));
      }
    }
    const auto& st = kSettings[round % 5];
    const bool active = round % 3 != 0;
    RunChecked<V>({IntersectionCurveT<V>(pv[0].data(), nodes[0].data(), int(nodes[0].size()), true, true),
                   IntersectionCurveT<V>(pv[1].data(), nodes[1].data(), int(nodes[1].size()), active, true)},
                  st);
    RunChecked<POINT>({IntersectionCurveT<POINT>(pi[0].data(), nodes[0].data(), int(nodes[0].size()), true, true),
                       IntersectionCurveT<POINT>(pi[1].data(), nodes[1].data(), int(nodes[1].size()), active, true)},
                      st);
  }
}

TEST(BadInput, ExtremeCoordinatesAndTolerances) {
  const int32_t hi = std::numeric_limits<int32_t>::max(), lo = std::numeric_limits<int32_t>::min();
  Path<POINT> a, b;
  a.Move(P(lo, lo)).Line(P(hi, hi)).Cubic(P(lo, hi), P(hi, lo), P(lo, lo));
  b.Move(P(lo, hi)).Line(P(hi, lo)).Line(P(hi, hi));
  for (const auto& st : kSettings) RunChecked<POINT>({a.Curve(), b.Curve()}, st);

  Path<V> c, d;
  c.Move({-1e300, -1e300}).Line({1e300, 1e300}).Cubic({-1e300, 1e300}, {1e300, -1e300}, {-1e300, -1e300});
  d.Move({-1e300, 1e300}).Line({1e300, -1e300}).Cubic({0, 0}, {1e-300, 1e-300}, {5, 5});
  for (const auto& st : kSettings) RunChecked<V>({c.Curve(), d.Curve()}, st);

  // Tolerances that are infinite, NaN or negative.
  Path<V> e, f;
  e.Move({0, 0}).Line({10, 10}).Cubic({20, 0}, {30, 20}, {40, 10});
  f.Move({0, 10}).Line({10, 0}).Line({40, 12});
  const double inf = std::numeric_limits<double>::infinity(), nan = std::numeric_limits<double>::quiet_NaN();
  for (double tol : {inf, nan, -1.0, 1e200}) {
    const SegmentIntersectionSettings st = Settings(tol, tol);
    RunChecked<V>({e.Curve(), f.Curve()}, st);
    RunChecked<POINT>({ToInteger(e, 1).Curve(), ToInteger(f, 1).Curve()}, st);
  }
}

TEST(BadInput, RerunAndMoveKeepRecordsValid) {
  Path<V> a, b;
  a.Move({0, 0}).Line({100, 100}).Line({200, 0});
  b.Move({0, 50}).Line({200, 50});
  const auto st = OstraCrv::PointInShapeIntersectionSettings();
  SegmentsT<V> s({a.Curve(), b.Curve()}, st);
  const auto first = Snapshot(s);
  s.GenerateIntersections(st);
  EXPECT_TRUE(Snapshot(s) == first);
  SegmentsT<V> moved(std::move(s));
  EXPECT_TRUE(Snapshot(moved) == first);
  CheckInvariants(moved, 1e-9);
  EXPECT_EQ(RecordCount(moved), 4);
}

}  // namespace
