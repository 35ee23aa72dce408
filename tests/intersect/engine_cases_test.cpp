// Known meetings: what crossing records carry, touches, overlaps, loops,
// joints, probes, the clean-up choices and the removal bookkeeping. Every run is also checked against the invariants and against
// the plain all-pairs visit.
#include <gtest/gtest.h>

#include "engine_test_util.h"
#include "ostracrv/intersect/intersection_settings.h"

namespace {

using namespace engine_test;
using OstraCrv::BreakIntersectionSettings;
using OstraCrv::PointInShapeIntersectionSettings;
using OstraCrv::WeldGraphIntersectionSettings;

// Runs the engine both ways, checks that they agree and that the invariants
// hold, and returns the pruned run.
template <class T>
SegmentsT<T> RunBoth(const std::vector<IntersectionCurveT<T>>& curves, const SegmentIntersectionSettings& settings,
                 double maxDistance = 0.75) {
  SegmentsT<T> pruned(curves, settings);
  SegmentsT<T> plain(curves, settings, PairSearch::AllPairs);
  EXPECT_EQ(Snapshot(pruned), Snapshot(plain));
  CheckInvariants(pruned, maxDistance);
  return pruned;
}

const Intersection* Only(const SegmentsT<V>& s, int segment) {
  EXPECT_EQ(s.segments[segment].intersections.size(), 1u);
  return s.segments[segment].intersections.empty() ? nullptr : s.segments[segment].intersections[0];
}

// Where crossings lie is checked against a brute-force reference by the
// property tests; here: what each record carries besides its place. The arch
// B(t) = (300t^2 - 200t^3, 300t(1-t)) meets y = 48 at t = 0.2 and 0.8; it
// turns clockwise (negative curvature), its mirror lowered by 60 turns
// counter-clockwise.
TEST(EngineCases, RecordsCarryTangentsCurvatureAndWhoMeetsWhom) {
  Path<V> a, b;
  a.Move({0, 0}).Line({100, 100});
  b.Move({0, 100}).Line({100, 0});
  auto s = RunBoth<V>({a.Curve(), b.Curve()}, PointInShapeIntersectionSettings());
  const Intersection* r = Only(s, 0);
  ASSERT_NE(r, nullptr);
  EXPECT_FALSE(r->touch);
  EXPECT_EQ(r->tangent, (D{100, 100}));  // raw: the settings do not normalise
  EXPECT_EQ(r->curvature, 0.0);
  EXPECT_EQ(s.curves[0].intersectsWith, std::vector<int>{1});
  EXPECT_EQ(s.curves[1].intersectsWith, std::vector<int>{0});
  // Unit tangents when asked.
  auto w = RunBoth<V>({a.Curve(), b.Curve()}, WeldGraphIntersectionSettings(OstraCrv::kWeldTolerance));
  EXPECT_NEAR(Only(w, 0)->tangent.Length(), 1.0, 1e-15);

  Path<V> arch, line, bowl;
  arch.Move({0, 0}).Cubic({0, 100}, {100, 100}, {100, 0});
  line.Move({-10, 48}).Line({110, 48});
  bowl.Move({0, 60}).Cubic({0, -40}, {100, -40}, {100, 60});
  for (int order = 0; order < 2; ++order) {  // either curve first
    auto t = order == 0 ? RunBoth<V>({line.Curve(), arch.Curve()}, PointInShapeIntersectionSettings())
                        : RunBoth<V>({arch.Curve(), line.Curve()}, PointInShapeIntersectionSettings());
    const auto& list = t.segments[order == 0 ? 0 : 1].intersections;
    ASSERT_EQ(list.size(), 2u);
    for (int k = 0; k < 2; ++k) {
      const double at = k == 0 ? 0.2 : 0.8;
      EXPECT_NEAR(list[k]->other->t, at, 1e-9);
      EXPECT_LT(list[k]->other->curvature, 0.0);
      // Tangent of the arch: B'(t) = (600t - 600t^2, 300 - 600t).
      EXPECT_NEAR(list[k]->other->tangent.x, 600 * at * (1 - at), 1e-6);
      EXPECT_NEAR(list[k]->other->tangent.y, 300 - 600 * at, 1e-6);
    }
  }
  auto u = RunBoth<V>({arch.Curve(), bowl.Curve()}, PointInShapeIntersectionSettings());
  ASSERT_EQ(u.segments[0].intersections.size(), 2u);
  for (const Intersection* x : u.segments[0].intersections) {
    EXPECT_LT(x->curvature, 0.0);
    EXPECT_GT(x->other->curvature, 0.0);
  }
}

TEST(EngineCases, TJunctionAndEndContactAreTouches) {
  Path<V> bar, stem;
  bar.Move({0, 0}).Line({100, 0});
  stem.Move({50, 0}).Line({50, 50});
  auto s = RunBoth<V>({bar.Curve(), stem.Curve()}, PointInShapeIntersectionSettings());
  const Intersection* r = Only(s, 0);
  ASSERT_NE(r, nullptr);
  EXPECT_TRUE(r->touch);
  EXPECT_DOUBLE_EQ(r->t, 0.5);
  EXPECT_EQ(r->other->t, 0.0);
  EXPECT_EQ(r->point, (V{50, 0}));

  // End to end, for each kind of pair: one touch at the shared point.
  Path<V> l1, l2, c1, c2;
  l1.Move({0, 0}).Line({10, 0});
  l2.Move({10, 0}).Line({20, 5});
  c1.Move({0, 0}).Cubic({3, 4}, {7, 4}, {10, 0});
  c2.Move({10, 0}).Cubic({13, -4}, {17, -4}, {20, 0});
  const std::pair<const Path<V>*, const Path<V>*> pairs[] = {{&l1, &l2}, {&l1, &c2}, {&c1, &l2}, {&c1, &c2}};
  for (const auto& [p, q] : pairs) {
    auto e = RunBoth<V>({p->Curve(), q->Curve()}, PointInShapeIntersectionSettings());
    const Intersection* x = Only(e, 0);
    ASSERT_NE(x, nullptr);
    EXPECT_TRUE(x->touch);
    EXPECT_EQ(x->t, 1.0);
    EXPECT_EQ(x->other->t, 0.0);
    EXPECT_EQ(x->point, (V{10, 0}));
  }
}

TEST(EngineCases, OverlapOfTwoLinesIsLinked) {
  Path<V> a, b;
  a.Move({0, 0}).Line({100, 0});
  b.Move({50, 0}).Line({150, 0});
  auto s = RunBoth<V>({a.Curve(), b.Curve()}, PointInShapeIntersectionSettings());
  const auto& la = s.segments[0].intersections;
  const auto& lb = s.segments[1].intersections;
  ASSERT_EQ(la.size(), 2u);
  ASSERT_EQ(lb.size(), 2u);
  EXPECT_DOUBLE_EQ(la[0]->t, 0.5);
  EXPECT_EQ(la[1]->t, 1.0);
  EXPECT_EQ(lb[0]->t, 0.0);
  EXPECT_DOUBLE_EQ(lb[1]->t, 0.5);
  EXPECT_EQ(la[0]->overlapEnd, la[1]);
  EXPECT_EQ(lb[0]->overlapEnd, lb[1]);
  EXPECT_EQ(s.overlapCount, 2);
  // Removing one end unlinks the other and keeps the count exact.
  Intersection* first = s.segments[0].intersections[0];
  Intersection* second = s.segments[0].intersections[1];
  s.RemoveIntersection(first);
  EXPECT_EQ(s.overlapCount, 0);
  EXPECT_EQ(second->overlapEnd, nullptr);
  EXPECT_EQ(second->other->overlapEnd, nullptr);
  EXPECT_EQ(RecordCount(s), 2);
  s.RemoveIntersection(second);
  EXPECT_EQ(RecordCount(s), 0);
  s.RemoveIntersection(nullptr);
  // Dropping overlap ends on request leaves nothing.
  auto dropped = RunBoth<V>({a.Curve(), b.Curve()}, OstraCrv::SelfBreakIntersectionSettings(false));
  EXPECT_EQ(RecordCount(dropped), 0);
  EXPECT_FALSE(dropped.hasIntersections);
  EXPECT_TRUE(dropped.curves[0].intersectsWith.empty());

  // Identical Beziers, and one of them reversed: records at (0, 0) and (1, 1),
  // or (0, 1) and (1, 0), linked as an overlap.
  Path<V> c, d, r;
  c.Move({0, 0}).Cubic({20, 40}, {60, 40}, {80, 0});
  d = c;
  r.Move({80, 0}).Cubic({60, 40}, {20, 40}, {0, 0});
  for (const Path<V>* other : {&d, &r}) {
    auto o = RunBoth<V>({c.Curve(), other->Curve()}, PointInShapeIntersectionSettings());
    const auto& list = o.segments[0].intersections;
    ASSERT_EQ(list.size(), 2u);
    EXPECT_EQ(list[0]->t, 0.0);
    EXPECT_EQ(list[1]->t, 1.0);
    EXPECT_EQ(list[0]->other->t, other == &d ? 0.0 : 1.0);
    EXPECT_EQ(list[0]->overlapEnd, list[1]);
    EXPECT_EQ(o.overlapCount, 2);
  }
}

// Two squares sharing an edge, and two curves sharing a stretch of several
// segments: every overlap is four linked records.
TEST(EngineCases, SharedStretchGivesEvenOverlapCount) {
  Path<V> left, right;
  left.Move({0, 0}).Line({100, 0}).Line({100, 100}).Line({0, 100}).Close();
  right.Move({100, 0}).Line({200, 0}).Line({200, 100}).Line({100, 100}).Close();
  auto s = RunBoth<V>({left.Curve(), right.Curve()}, PointInShapeIntersectionSettings());
  EXPECT_GE(s.overlapCount, 2);
  // The shared edge (segment 1 of the left square) is wholly overlapped.
  const auto& edge = s.segments[1].intersections;
  bool full = false;
  for (const Intersection* r : edge) full = full || (r->t == 0.0 && r->overlapEnd && r->overlapEnd->t == 1.0);
  EXPECT_TRUE(full);

  Path<V> road, lane;
  road.Move({0, 0}).Line({100, 0}).Line({200, 0}).Line({300, 0}).Line({300, 100});
  lane.Move({50, -50}).Line({50, 0}).Line({150, 0}).Cubic({180, 0}, {220, 0}, {250, 0}).Line({250, 80});
  auto t = RunBoth<V>({road.Curve(), lane.Curve()}, PointInShapeIntersectionSettings());
  EXPECT_GE(t.overlapCount, 6);  // at least three overlapped pairs

  // Without keepFullOverlaps a wholly overlapped segment keeps no records.
  SegmentIntersectionSettings dropFull = PointInShapeIntersectionSettings();
  dropFull.keepFullOverlaps = false;
  auto u = RunBoth<V>({left.Curve(), right.Curve()}, dropFull);
  EXPECT_TRUE(u.segments[1].intersections.empty());
  EXPECT_TRUE(u.segments[7].intersections.empty());
}

// When overlap ends are dropped, the neighbour's meeting with the same curve
// at the shared node goes too.
TEST(EngineCases, OverlapNeighboursDroppedOnRequest) {
  Path<V> c, d;
  c.Move({0, 50}).Line({0, 0}).Line({100, 0}).Line({100, 50});
  d.Move({-50, 0}).Line({150, 0});
  auto t = RunBoth<V>({c.Curve(true, false), d.Curve(true, false)}, OstraCrv::SelfBreakIntersectionSettings(false));
  EXPECT_EQ(RecordCount(t), 0);
  SegmentIntersectionSettings keepNeighbours = OstraCrv::SelfBreakIntersectionSettings(false);
  keepNeighbours.keepOverlapNeighbours = true;
  auto u = RunBoth<V>({c.Curve(true, false), d.Curve(true, false)}, keepNeighbours);
  EXPECT_EQ(u.segments[0].intersections.size(), 1u);  // at the node (0, 0)
  EXPECT_EQ(u.segments[2].intersections.size(), 1u);  // at the node (100, 0)
  EXPECT_TRUE(u.segments[1].intersections.empty());
}

TEST(EngineCases, AdjacentSegmentTurningBackMakesJointOverlap) {
  Path<V> p;
  p.Move({0, 0}).Line({100, 0}).Line({50, 0});
  auto s = RunBoth<V>({p.Curve()}, PointInShapeIntersectionSettings());
  const auto& a = s.segments[0].intersections;
  const auto& b = s.segments[1].intersections;
  ASSERT_EQ(a.size(), 2u);
  ASSERT_EQ(b.size(), 2u);
  EXPECT_DOUBLE_EQ(a[0]->t, 0.5);
  EXPECT_TRUE(a[0]->touch);
  EXPECT_EQ(a[1]->t, 1.0);       // the joint, made by the overlap test
  EXPECT_FALSE(a[1]->touch);
  EXPECT_EQ(a[1]->other->t, 0.0);
  EXPECT_EQ(a[0]->overlapEnd, a[1]);
  EXPECT_EQ(s.overlapCount, 2);
}

TEST(EngineCases, ClosedSubpathOfTwoSegments) {
  // Two lines: both joints are recorded, and they overlap.
  Path<V> lines;
  lines.Move({0, 0}).Line({100, 0}).Close();
  auto s = RunBoth<V>({lines.Curve()}, PointInShapeIntersectionSettings());
  ASSERT_EQ(s.segments.size(), 2u);
  EXPECT_EQ(s.segments[0].next, 1);
  EXPECT_EQ(s.segments[0].prev, 1);
  EXPECT_EQ(s.segments[0].intersections.size(), 2u);
  EXPECT_EQ(s.overlapCount, 2);
  // Two Beziers (a lens): both joints are skipped, nothing is found.
  Path<V> lens;
  lens.Move({0, 0}).Cubic({30, 50}, {70, 50}, {100, 0}).Cubic({70, -50}, {30, -50}, {0, 0});
  lens.Close();
  auto t = RunBoth<V>({lens.Curve()}, BreakIntersectionSettings());
  EXPECT_EQ(RecordCount(t), 0);
}

TEST(EngineCases, AdjacentSegmentsDoNotReportTheirNode) {
  Path<V> open, square, circle;
  open.Move({0, 0}).Line({100, 0}).Line({100, 100}).Cubic({100, 150}, {50, 150}, {50, 120}).Line({0, 200});
  square.Move({0, 0}).Line({100, 0}).Line({100, 100}).Line({0, 100}).Close();
  const double k = 55.228;
  circle.Move({100, 0})
      .Cubic({100, k}, {k, 100}, {0, 100})
      .Cubic({-k, 100}, {-100, k}, {-100, 0})
      .Cubic({-100, -k}, {-k, -100}, {0, -100})
      .Cubic({k, -100}, {100, -k}, {100, 0})
      .Close();
  for (const Path<V>* p : {&open, &square, &circle})
    for (const auto& settings : {PointInShapeIntersectionSettings(), BreakIntersectionSettings(),
                                 WeldGraphIntersectionSettings(OstraCrv::kWeldTolerance)}) {
      auto s = RunBoth<V>({p->Curve()}, settings);
      EXPECT_EQ(RecordCount(s), 0);
    }
}

TEST(EngineCases, SelfCrossingCubicGivesItsLoop) {
  Path<V> p;
  p.Move({0, 0}).Cubic({200, 100}, {-100, 100}, {100, 0});
  auto s = RunBoth<V>({p.Curve()}, PointInShapeIntersectionSettings());
  const auto& list = s.segments[0].intersections;
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(list[0]->other, list[1]);
  EXPECT_LT(list[0]->t, list[1]->t);
  const V pts[4] = {{0, 0}, {200, 100}, {-100, 100}, {100, 0}};
  EXPECT_LT(SquaredDistance(Bezier(pts, list[0]->t), list[0]->point), 1e-16);
  EXPECT_LT(SquaredDistance(Bezier(pts, list[1]->t), list[1]->point), 1e-16);
  EXPECT_NEAR(list[0]->point.x, 50, 1e-9);  // symmetric about x = 50
  EXPECT_EQ(s.curves[0].intersectsWith, std::vector<int>{0});
  // Not self-tested: no loop. A loop closing near an end: ignored.
  auto t = RunBoth<V>({p.Curve(true, false)}, PointInShapeIntersectionSettings());
  EXPECT_EQ(RecordCount(t), 0);
  // The loop closes at (50, 30), 58.3 from the start.
  auto u = RunBoth<V>({p.Curve()}, Settings(0.5, 60));
  EXPECT_EQ(RecordCount(u), 0);
}

TEST(EngineCases, ProbeFindsOnlyProbeMeetings) {
  // A star of crossing lines as an inactive target, crossed by a probe.
  // Brute force: the lines of the star that reach y = 37 cross the probe.
  Path<V> star;
  int expected = 0;
  for (int i = 0; i < 12; ++i) {
    const double a = i * 3.14159265358979 / 12, y0 = 100 + 90 * std::sin(a), y1 = 100 - 90 * std::sin(a);
    star.Move({100 + 90 * std::cos(a), y0}).Line({100 - 90 * std::cos(a), y1});
    if ((y0 - 37) * (y1 - 37) < 0) ++expected;
  }
  Path<V> probe;
  probe.Move({-10, 37}).Line({210, 37});
  auto s = RunBoth<V>({probe.Curve(true, true), star.Curve(false, true)}, PointInShapeIntersectionSettings());
  int probeRecords = 0;
  for (size_t i = 0; i < s.segments.size(); ++i)
    for (const Intersection* r : s.segments[i].intersections) {
      EXPECT_TRUE(r->segment == 0 || r->other->segment == 0);
      if (r->segment == 0) ++probeRecords;
    }
  EXPECT_EQ(probeRecords, expected);
  // With the star active as well, it meets itself at its centre.
  auto all = RunBoth<V>({probe.Curve(true, true), star.Curve(true, true)}, PointInShapeIntersectionSettings());
  EXPECT_GT(RecordCount(all), 2 * probeRecords);
}

// A line ending just past another: found as a touch of its end and as a
// crossing; the crossing stands unless the touch is preferred.
TEST(EngineCases, TouchOrCrossingAtTheSamePlace) {
  Path<V> bar, stem;
  bar.Move({0, 0}).Line({100, 0});
  stem.Move({50, 50}).Line({50, -0.3});
  auto s = RunBoth<V>({bar.Curve(), stem.Curve()}, PointInShapeIntersectionSettings());
  const Intersection* r = Only(s, 0);
  ASSERT_NE(r, nullptr);
  EXPECT_FALSE(r->touch);
  EXPECT_EQ(r->point, (V{50, 0}));
  SegmentIntersectionSettings prefer = PointInShapeIntersectionSettings();
  prefer.preferTouch = true;
  auto t = RunBoth<V>({bar.Curve(), stem.Curve()}, prefer);
  r = Only(t, 0);
  ASSERT_NE(r, nullptr);
  EXPECT_TRUE(r->touch);
  EXPECT_EQ(r->point, (V{50, -0.3}));  // at the end that touched

  // A node near a crossing line: the touches at the node go, the crossing on
  // the far side stays.
  Path<V> path, cut;
  path.Move({0, 0}).Line({100, 0}).Line({200, 0});
  cut.Move({100.2, -50}).Line({100.2, 50});
  auto u = RunBoth<V>({path.Curve(true, false), cut.Curve()}, PointInShapeIntersectionSettings());
  ASSERT_EQ(RecordCount(u), 2);
  EXPECT_TRUE(u.segments[0].intersections.empty());
  EXPECT_FALSE(Only(u, 1)->touch);

  // A node where the path folds back, crossed close to the node on both
  // segments: the crossings are echoes of the touches and go.
  Path<V> fold;
  fold.Move({0, 0}).Line({100, 0}).Line({0, 1});
  Path<V> near;
  near.Move({99.8, -50}).Line({99.8, 50});
  auto v = RunBoth<V>({fold.Curve(true, false), near.Curve()}, PointInShapeIntersectionSettings());
  for (const auto& seg : v.segments)
    for (const Intersection* x : seg.intersections) EXPECT_TRUE(x->touch);
  EXPECT_EQ(RecordCount(v), 4);
}

TEST(EngineCases, NodeDuplicatesDroppedOnRequest) {
  Path<V> path, cut;
  path.Move({0, 0}).Line({100, 0}).Line({200, 0});
  cut.Move({100, -50}).Line({100, 50});
  auto kept = RunBoth<V>({path.Curve(true, false), cut.Curve()}, PointInShapeIntersectionSettings());
  EXPECT_EQ(kept.segments[2].intersections.size(), 2u);
  SegmentIntersectionSettings drop = PointInShapeIntersectionSettings();
  drop.keepNodeDuplicates = false;
  auto s = RunBoth<V>({path.Curve(true, false), cut.Curve()}, drop);
  EXPECT_TRUE(s.segments[0].intersections.empty());
  ASSERT_EQ(s.segments[1].intersections.size(), 1u);
  EXPECT_EQ(s.segments[1].intersections[0]->t, 0.0);
}

TEST(EngineCases, RemovingACurvesRecordsRebuildsWhoMeetsWhom) {
  Path<V> c, d, e;
  c.Move({0, 0}).Line({100, 100});
  d.Move({0, 100}).Line({100, 0});
  e.Move({0, 50}).Line({100, 50});
  auto t = RunBoth<V>({c.Curve(), d.Curve(), e.Curve()}, PointInShapeIntersectionSettings());
  EXPECT_EQ(t.curves[0].intersectsWith.size(), 2u);
  t.RemoveIntersections(2);
  EXPECT_EQ(t.curves[0].intersectsWith, std::vector<int>{1});
  EXPECT_TRUE(t.curves[2].intersectsWith.empty());
  EXPECT_TRUE(t.hasIntersections);
  CheckInvariants(t, 1e-9);
  EXPECT_EQ(t.GetAllIntersections().size(), 2u);
}

TEST(EngineCases, SegmentWalkAndLinks) {
  // A lone move between two subpaths, a degenerate line and a point-Bezier.
  Path<V> p;
  p.Move({0, 0}).Line({10, 0}).Line({10, 0}).Cubic({10, 0}, {10, 0}, {10, 0}).Line({0, 10}).Close();
  p.Move({50, 50});
  p.Move({20, 20}).Line({30, 20}).Cubic({35, 25}, {35, 30}, {30, 30});
  auto s = RunBoth<V>({p.Curve()}, PointInShapeIntersectionSettings());
  ASSERT_EQ(s.segments.size(), 7u);
  EXPECT_FALSE(s.segments[0].degenerate);
  EXPECT_TRUE(s.segments[1].degenerate);
  EXPECT_TRUE(s.segments[2].degenerate);
  EXPECT_EQ(s.segments[2].type, SegmentIntersections::Bezier);
  EXPECT_EQ(s.segments[0].prev, 4);
  EXPECT_EQ(s.segments[4].next, 0);
  EXPECT_EQ(s.segments[5].prev, -1);
  EXPECT_EQ(s.segments[5].firstNode, 9);
  EXPECT_EQ(s.segments[6].firstNode, 10);
  EXPECT_EQ(s.segments[6].next, -1);
  EXPECT_EQ(s.segments[6].prev, 5);
  for (int i = 0; i < 7; ++i) EXPECT_EQ(s.segments[i].index, i);
}

}  // namespace
