// Random pairs of segments against an independent brute-force reference:
// the crossings the engine reports must be exactly the reference crossings,
// at the same places, for every kind of pair and both point kinds.
#include <gtest/gtest.h>

#include <random>

#include "crossing_reference.h"
#include "engine_test_util.h"
#include "ostracrv/intersect/intersection_settings.h"

namespace {

using namespace engine_test;

enum Kind { kLine, kBezier };

crossing_ref::Seg RandomSeg(std::mt19937& rng, Kind kind, bool integer) {
  std::uniform_real_distribution<double> u(0.0, 100.0);
  crossing_ref::Seg s;
  const int n = kind == kLine ? 2 : 4;
  for (int i = 0; i < n; ++i) {
    V p{u(rng), u(rng)};
    if (integer) p = V{std::round(p.x * 10), std::round(p.y * 10)};
    s.p.push_back(p);
  }
  return s;
}

template <class T>
Path<T> AsPath(const crossing_ref::Seg& s) {
  Path<T> p;
  p.Move(MavikMath::FromV<T>(s.p[0]));
  if (s.p.size() == 2)
    p.Line(MavikMath::FromV<T>(s.p[1]));
  else
    p.Cubic(MavikMath::FromV<T>(s.p[1]), MavikMath::FromV<T>(s.p[2]), MavikMath::FromV<T>(s.p[3]));
  return p;
}

// Runs the engine on the two segments as two curves and compares with the
// reference; returns whether the case was clear enough to compare.
template <class T>
bool Compare(const crossing_ref::Seg& a, const crossing_ref::Seg& b, double scale) {
  const crossing_ref::Result ref = crossing_ref::Crossings(a, b, 0.5 * scale);
  if (ref.ambiguous) return false;
  const Path<T> pa = AsPath<T>(a), pb = AsPath<T>(b);
  SegmentIntersectionSettings settings = Settings(0.01 * scale, 0.01 * scale);
  SegmentsT<T> s({pa.Curve(true, false), pb.Curve(true, false)}, settings);
  CheckInvariants(s, 1e-6 * scale);
  const auto& list = s.segments[0].intersections;
  EXPECT_EQ(list.size(), ref.crossings.size());
  for (const Intersection* r : list) {
    EXPECT_FALSE(r->touch);
    bool matched = false;
    for (const crossing_ref::Crossing& x : ref.crossings)
      if (crossing_ref::Dist(x.point, r->point) < 1e-7 * scale && std::fabs(x.s - r->t) < 1e-7 &&
          std::fabs(x.u - r->other->t) < 1e-7)
        matched = true;
    EXPECT_TRUE(matched) << "at (" << r->point.x << ", " << r->point.y << ") t " << r->t;
  }
  return true;
}

class PairProperty : public ::testing::TestWithParam<std::pair<Kind, Kind>> {};

TEST_P(PairProperty, CrossingsMatchBruteForce) {
  const auto [ka, kb] = GetParam();
  std::mt19937 rng(1234 + 10 * ka + kb);
  int compared = 0, withCrossings = 0;
  const int cases = ka == kLine && kb == kLine ? 2000 : 250;
  for (int i = 0; i < cases; ++i) {
    const crossing_ref::Seg a = RandomSeg(rng, ka, false), b = RandomSeg(rng, kb, false);
    if (Compare<V>(a, b, 1.0)) {
      ++compared;
      if (!crossing_ref::Crossings(a, b, 0.5).crossings.empty()) ++withCrossings;
    }
    // Integer points: the same reference on the integer grid.
    const crossing_ref::Seg ai = RandomSeg(rng, ka, true), bi = RandomSeg(rng, kb, true);
    Compare<POINT>(ai, bi, 10.0);
  }
  // The filter must leave most cases, and many of them with crossings.
  EXPECT_GT(compared, cases / 2);
  EXPECT_GT(withCrossings, cases / 10);
}

INSTANTIATE_TEST_SUITE_P(Kinds, PairProperty,
                         ::testing::Values(std::make_pair(kLine, kLine), std::make_pair(kLine, kBezier),
                                           std::make_pair(kBezier, kLine), std::make_pair(kBezier, kBezier)));

// On integer-valued coordinates the integer and double forms give the same
// records: integer input is widened before every test.
TEST(PointKinds, IntegerAndDoubleFormsAgree) {
  std::mt19937 rng(99);
  std::uniform_int_distribution<int> coord(0, 400);
  for (int round = 0; round < 40; ++round) {
    Path<V> pv;
    Path<POINT> pi;
    for (int sub = 0; sub < 3; ++sub) {
      const int x = coord(rng), y = coord(rng);
      pv.Move(V{double(x), double(y)});
      pi.Move(P(x, y));
      for (int k = 0; k < 6; ++k) {
        if (rng() % 2) {
          const int a = coord(rng), b = coord(rng);
          pv.Line(V{double(a), double(b)});
          pi.Line(P(a, b));
        } else {
          int c[6];
          for (int& v : c) v = coord(rng);
          pv.Cubic(V{double(c[0]), double(c[1])}, V{double(c[2]), double(c[3])}, V{double(c[4]), double(c[5])});
          pi.Cubic(P(c[0], c[1]), P(c[2], c[3]), P(c[4], c[5]));
        }
      }
      if (sub != 1) {
        pv.Close();
        pi.Close();
      }
    }
    for (const auto& settings : {OstraCrv::PointInShapeIntersectionSettings(), OstraCrv::BreakIntersectionSettings(),
                                 OstraCrv::WeldGraphIntersectionSettings(OstraCrv::kWeldTolerance)}) {
      SegmentsT<V> sv({pv.Curve()}, settings);
      SegmentsT<POINT> si({pi.Curve()}, settings);
      EXPECT_EQ(Snapshot(sv), Snapshot(si));
      CheckInvariants(sv, settings.touchTolerance * 1.5);
    }
  }
}

}  // namespace
