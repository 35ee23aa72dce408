// Segment views checked against the record of how random paths were built:
// the walk must meet every subpath's move and every segment exactly once, with
// the recorded start and end nodes, and next/prev must agree with the walk.
#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using OstraCrv::CurveSegmentT;
using OstraCrv::details;
using OstraCrv::GetCurveSegment;
using OstraCrv::PolycurveT;

// The small path of a move, a line and a Bezier.
const std::vector<NODETYPE> kSmall = {0x04, 0x44, 0xC0, 0xC0, 0x84};

// A found view is the same piece of the same storage as the expected one.
template <class Found, class View>
bool Same(const Found& f, const View& v) {
  return f && f->number() == v.number() && f->points().data() == v.points().data() &&
         f->nodes().data() == v.nodes().data() && f->nodes().size() == v.nodes().size();
}

template <class T>
class SegmentViews : public ::testing::Test {};
using PointKinds = ::testing::Types<POINT, V>;
TYPED_TEST_SUITE(SegmentViews, PointKinds);

// (Numbers, kinds, ends and the walk order are checked on random paths below.)
TYPED_TEST(SegmentViews, BezierViewOfSmallPath) {
  using T = TypeParam;
  std::vector<T> pts = {T{0, 0}, T{10, 0}, T{10, 10}, T{20, 10}, T{20, 0}};
  PolycurveT<T> c(pts.data(), kSmall.data(), kSmall.size());
  auto byEnd = CurveSegmentT<T>::FromEndIdx(c, 4);
  auto byStart = CurveSegmentT<T>::FromStartIdx(c, 1);
  ASSERT_TRUE(byEnd && byStart);
  EXPECT_EQ(byStart->number(), 2u);
  EXPECT_EQ(byEnd->points().data(), byStart->points().data());
  ASSERT_EQ(byEnd->arc_points().size(), 2u);
  EXPECT_EQ(byEnd->arc_points()[0], pts[2]);
  EXPECT_EQ(byEnd->arc_nodes()[1], NODETYPE(0xC0));
  EXPECT_EQ(byEnd->node(), NODETYPE(0x84));
  // The control points count in the points box.
  const auto box = byEnd->GetPointsBBox();
  EXPECT_TRUE(box.left == 10 && box.right == 20 && box.top == 10 && box.bottom == 0);
  EXPECT_TRUE(CurveSegmentT<T>::FromEndIdx(c, 1)->arc_points().empty());
}

TYPED_TEST(SegmentViews, NumbersThatNameNoPieceAreAbsent) {
  using T = TypeParam;
  std::vector<T> pts(kSmall.size());
  PolycurveT<T> c(pts.data(), kSmall.data(), kSmall.size());
  const auto* n = kSmall.data();
  const auto* p = pts.data();
  // A curve node, the second arc, a Bezier cut by the count, out of range.
  for (auto [i, count] : {std::pair{4, 5ul}, {3, 5ul}, {2, 4ul}, {5, 5ul}})
    EXPECT_FALSE(GetCurveSegment<T>(i, n, p, count)) << i;
  EXPECT_FALSE(GetCurveSegment<T>(1, n, nullptr, 5ul));  // null arrays
  EXPECT_FALSE(GetCurveSegment<T>(1, nullptr, p, 5ul));
  EXPECT_TRUE(GetCurveSegment<T>(2, n, p, MavikUtils::nullopt));
  const NODETYPE lineFirst[] = {0x44, 0x44};
  EXPECT_FALSE(GetCurveSegment<T>(0, lineFirst, p, 2ul));  // a line with no start
  const NODETYPE arcFirst[] = {0xC0, 0xC0, 0x84};
  EXPECT_FALSE(GetCurveSegment<T>(0, arcFirst, p, 3ul));

  for (unsigned long i : {3ul, 5ul, ~0ul}) EXPECT_FALSE(CurveSegmentT<T>::FromEndIdx(c, i));  // 3: an arc ends nothing
  EXPECT_FALSE(CurveSegmentT<T>::FromStartIdx(c, 4));
  EXPECT_FALSE(CurveSegmentT<T>::FromStartIdx(c, ~0ul));  // i+1 wraps to 0
  EXPECT_FALSE(CurveSegmentT<T>::FromNumber(c, 4));

  // The constructors give invalid views where the function gives none.
  CurveSegmentT<T> bad(c, 4);
  EXPECT_FALSE(bad.valid());
  EXPECT_EQ(bad.type(), 0);
  EXPECT_EQ(bad.startpoint(), T{});
  EXPECT_FALSE(bad.next());
  EXPECT_FALSE(bad.prev());
  EXPECT_TRUE(CurveSegmentT<T>(n, p, 1, 5ul).valid());

  // An empty curve has no views at all.
  PolycurveT<T> empty;
  EXPECT_TRUE(details<T>::GetCurveSegments_Base(empty).empty());
  EXPECT_FALSE(CurveSegmentT<T>::FromNumber(empty, 0));
  EXPECT_FALSE(CurveSegmentT<T>(empty, 0).valid());
}

// One view per subpath move and per segment, in array order, with next() and
// prev() stepping between neighbours of the walk.
TYPED_TEST(SegmentViews, WalkMatchesConstructionOfRandomPaths) {
  using T = TypeParam;
  std::mt19937 rng(4711);
  for (int round = 0; round < 300; ++round) {
    const testpaths::Path path = testpaths::Make(rng);
    const std::vector<T> pts = testgeo::PointsFor<T>(path, rng);
    const PolycurveT<T> c(pts.data(), path.nodes.data(), pts.size());
    ASSERT_TRUE(OstraCrv::ValidSegments(c));

    // Expected: for each subpath its move, then its segments.
    struct Piece {
      unsigned long start, end;
      int type;
    };
    std::vector<Piece> expected;
    for (int s = 0; s < int(path.subpaths.size()); ++s) {
      expected.push_back({unsigned(path.subpaths[s].first), unsigned(path.subpaths[s].first), 1});
      for (const auto& seg : path.segments)
        if (seg.subpath == s) expected.push_back({unsigned(seg.start), unsigned(seg.end), seg.bezier ? 3 : 2});
    }

    std::vector<CurveSegmentT<T>> walk;
    for (const auto& v : details<T>::GetCurveSegments_Base(c)) walk.push_back(v);
    ASSERT_EQ(walk.size(), expected.size());
    for (size_t k = 0; k < walk.size(); ++k) {
      const auto& v = walk[k];
      EXPECT_EQ(v.startIndex(), expected[k].start);
      EXPECT_EQ(v.endIndex(), expected[k].end);
      EXPECT_EQ(v.type(), expected[k].type);
      EXPECT_EQ(v.startpoint(), c.GetPoint(int(expected[k].start)));
      EXPECT_EQ(v.endpoint(), c.GetPoint(int(expected[k].end)));
      // The walk's views point into the curve's own storage (shared copy).
      EXPECT_EQ(v.points().data(), c.GetPoints() + v.startIndex());
      // next() and prev() give the walk's neighbours; FromEndIdx finds the
      // view itself by its end node.
      EXPECT_TRUE(k + 1 == walk.size() || Same(v.next(), walk[k + 1])) << k;
      EXPECT_TRUE(k > 0 ? Same(v.prev(), walk[k - 1]) : !v.prev()) << k;
      EXPECT_TRUE(Same(CurveSegmentT<T>::FromEndIdx(c, v.endIndex()), v)) << k;
    }

    // A range over one subpath, without its move view, gives its segments.
    const auto& sp = path.subpaths[rng() % path.subpaths.size()];
    size_t segs = 0;
    for (const auto& v : MavikUtils::skip_first(
             details<T>::GetCurveSegments_Range(c, MavikUtils::Indices(unsigned(sp.first), unsigned(sp.last + 1))))) {
      EXPECT_NE(v.type(), 1);
      EXPECT_LE(v.endIndex(), unsigned(sp.last));
      ++segs;
    }
    size_t recorded = 0;
    for (const auto& seg : path.segments) recorded += seg.subpath == &sp - path.subpaths.data();
    EXPECT_EQ(segs, recorded);
  }
}

TYPED_TEST(SegmentViews, RangeEndsWhereAPieceWouldReachPastIt) {
  using T = TypeParam;
  std::vector<T> pts(kSmall.size());
  PolycurveT<T> c(pts.data(), kSmall.data(), kSmall.size());
  auto numbers = [](const auto& range) {
    std::vector<unsigned long> out;
    for (const auto& v : range) out.push_back(v.number());
    return out;
  };
  using Nums = std::vector<unsigned long>;
  EXPECT_EQ(numbers(details<T>::GetCurveSegments_Range(c, MavikUtils::Indices(0, 4))), (Nums{0, 1}));
  // An end beyond the curve is clipped to it.
  EXPECT_EQ(numbers(details<T>::GetCurveSegments_Range(c, MavikUtils::Indices(1, 99))), (Nums{1, 2}));
  EXPECT_EQ(numbers(details<T>::GetCurveSegments_Raw(kSmall.data(), pts.data(), MavikUtils::Indices(2, 5))), (Nums{2}));
  EXPECT_TRUE(details<T>::GetCurveSegments_Raw(nullptr, pts.data(), MavikUtils::Indices(0, 5)).empty());
  EXPECT_TRUE(details<T>::GetCurveSegments_Raw(kSmall.data(), pts.data(), MavikUtils::Indices(3, 2)).empty());
  // A begin on a curve node has no view: the walk is empty.
  EXPECT_TRUE(details<T>::GetCurveSegments_Range(c, MavikUtils::Indices(4, 5)).empty());
}

// The range keeps its own copy: writes to the source fork away and dropping
// it leaves the range readable (the sanitizer build checks the reads).
TYPED_TEST(SegmentViews, RangeOutlivesItsSourceCurve) {
  using T = TypeParam;
  std::vector<T> pts = {T{0, 0}, T{10, 0}, T{10, 10}, T{20, 10}, T{20, 0}};
  auto source = std::make_unique<PolycurveT<T>>(pts.data(), kSmall.data(), kSmall.size());
  auto range = MavikUtils::skip_first(details<T>::GetCurveSegments_Base(*source));
  source->SetPoint(4, T{99, 99});
  source.reset();
  std::vector<T> ends;
  for (const auto& v : range) ends.push_back(v.endpoint());
  ASSERT_EQ(ends.size(), 2u);
  EXPECT_EQ(ends[0], (T{10, 0}));
  EXPECT_EQ(ends[1], (T{20, 0}));
}

TYPED_TEST(SegmentViews, ValidSegmentsRefusesBrokenShapes) {
  using T = TypeParam;
  auto check = [](std::vector<NODETYPE> nodes) {
    std::vector<T> pts(nodes.size());
    return OstraCrv::ValidSegments(PolycurveT<T>(pts.data(), nodes.data(), nodes.size()));
  };
  EXPECT_TRUE(OstraCrv::ValidSegments(PolycurveT<T>()));
  EXPECT_TRUE(check(kSmall));
  EXPECT_TRUE(check({0x04}));
  EXPECT_FALSE(check({0x04, 0x44, 0xC0}));        // ends in an arc
  EXPECT_FALSE(check({0x04, 0x44, 0xC0, 0xC0}));  // Bezier without its end
  EXPECT_FALSE(check({0x04, 0xC0, 0x84}));        // one arc only
  EXPECT_FALSE(check({0x04, 0x84}));              // curve without arcs
  EXPECT_FALSE(check({0x44, 0x44}));              // no start

  std::vector<T> pts(kSmall.size());
  PolycurveT<T> c(pts.data(), kSmall.data(), kSmall.size());
  EXPECT_TRUE(OstraCrv::ValidSegments(c, MavikUtils::Indices(1, 5)));
  EXPECT_FALSE(OstraCrv::ValidSegments(c, MavikUtils::Indices(1, 4)));  // cuts the Bezier
  EXPECT_FALSE(OstraCrv::ValidSegments(c, MavikUtils::Indices(0, 6)));  // beyond the curve
  EXPECT_FALSE(OstraCrv::ValidSegments(c, MavikUtils::Indices(3, 5)));  // starts on an arc
}

TYPED_TEST(SegmentViews, StepFunctionsFollowTheNodeKinds) {
  using T = TypeParam;
  const NODETYPE nodes[] = {0x04, 0x44, 0xC0, 0xC0, 0x84, 0x04};
  OstraCrv::NextCurveSegment<T> step(nodes);
  EXPECT_EQ(step(0), 1u);
  EXPECT_EQ(step(1), 2u);
  EXPECT_EQ(step(2), 5u);
  EXPECT_EQ(step(4), 1u);  // a curve node: the literal 1
  std::vector<T> pts(6);
  OstraCrv::CurveSegmentGetter<T> get(nodes, pts.data(), 6);
  EXPECT_EQ(get(2)->type(), 3);
  EXPECT_FALSE(get(6));
  // From the last piece of a subpath next gives the following move view;
  // from the following move view prev steps back over the Bezier.
  auto bez = get(2);
  EXPECT_EQ(bez->next()->number(), 5u);
  EXPECT_EQ(bez->next()->type(), 1);
  EXPECT_EQ(get(5)->prev_number(), 2u);
  EXPECT_EQ(get(5)->prev()->type(), 3);
  EXPECT_EQ(bez->prev_number(), 1u);
}

}  // namespace
