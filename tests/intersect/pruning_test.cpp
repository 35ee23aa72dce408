// The pruned pair search against the plain all-pairs visit: identical
// records on random and real shapes (dense grids of crossing lines, shapes
// with many overlapping edges, many tiny curves, wavy outlines, the corpus of
// near-degenerate real drawings), and a pair list equal to the brute-force
// list of pairs whose inflated boxes meet.
#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <random>

#include "engine_test_util.h"
#include "ostracrv/intersect/intersection_settings.h"
#include "ostracrv/intersect/pair_pruning.h"

namespace {

using namespace engine_test;
using OstraCrv::SegmentPair;

// tests/data, found from this file's place.
std::string CorpusDir() {
  std::string here = __FILE__;
  return here.substr(0, here.find_last_of('/')) + "/../data";
}

const SegmentIntersectionSettings kAllSettings[] = {
    OstraCrv::PointInShapeIntersectionSettings(),
    OstraCrv::BreakIntersectionSettings(),
    OstraCrv::WeldGraphIntersectionSettings(OstraCrv::kWeldTolerance),
    OstraCrv::WeldFillProbeIntersectionSettings(OstraCrv::kPreciseWeldTolerance),
    OstraCrv::OffsetIntersectionSettings(),
    OstraCrv::SelfBreakIntersectionSettings(false),
};

// The box test written out afresh: control-point boxes, inflated by the
// largest tolerance (rounded up to a whole number for integer points).
template <class T>
std::vector<std::array<double, 4>> BruteBoxes(const SegmentsT<T>& s, const SegmentIntersectionSettings& st) {
  double r = std::fmax(0.0, std::fmax(st.endTolerance, st.touchTolerance));
  if (st.useExtendedTouch) r = std::fmax(r, st.extendedTouchDistance);
  if (MavikMath::IsIntegerPoint<T>) r = std::ceil(r);
  std::vector<std::array<double, 4>> boxes;
  for (size_t k = 0; k < s.segments.size(); ++k) {
    const std::vector<V> p = SegmentPointsOf(s, static_cast<int>(k));
    double lx = p[0].x, hx = lx, ly = p[0].y, hy = ly;
    bool finite = true;
    for (const V& q : p) {
      finite = finite && q.IsFinite();
      lx = std::min(lx, q.x), hx = std::max(hx, q.x), ly = std::min(ly, q.y), hy = std::max(hy, q.y);
    }
    const double nan = std::nan("");
    boxes.push_back(finite ? std::array<double, 4>{lx - r, ly - r, hx + r, hy + r}
                           : std::array<double, 4>{nan, nan, nan, nan});
  }
  return boxes;
}

// Every pair of the visiting order, in order, whose boxes meet.
template <class T>
std::vector<SegmentPair> BrutePairs(const SegmentsT<T>& s, const SegmentIntersectionSettings& st) {
  const auto box = BruteBoxes(s, st);
  std::vector<SegmentPair> out;
  const int n = static_cast<int>(s.segments.size());
  for (int i = 0; i < n; ++i) {
    const auto& a = s.segments[i];
    if (!s.curves[a.curve].active || a.degenerate) continue;
    for (int j = 0; j < n; ++j) {
      const auto& b = s.segments[j];
      if (s.curves[b.curve].active && j <= i) continue;
      if (b.degenerate || (b.curve == a.curve && !s.curves[a.curve].selfTest)) continue;
      if (box[i][0] <= box[j][2] && box[j][0] <= box[i][2] && box[i][1] <= box[j][3] && box[j][1] <= box[i][3])
        out.push_back({i, j});
    }
  }
  return out;
}

template <class T>
int CompareRuns(const std::vector<IntersectionCurveT<T>>& curves, const SegmentIntersectionSettings& settings) {
  SegmentsT<T> pruned(curves, settings, PairSearch::Pruned);
  SegmentsT<T> plain(curves, settings, PairSearch::AllPairs);
  const auto a = Snapshot(pruned), b = Snapshot(plain);
  EXPECT_EQ(a.size(), b.size());
  EXPECT_TRUE(a == b);
  EXPECT_EQ(pruned.overlapCount, plain.overlapCount);
  for (size_t c = 0; c < curves.size(); ++c) EXPECT_EQ(pruned.curves[c].intersectsWith, plain.curves[c].intersectsWith);
  std::vector<SegmentPair> pairs;
  OstraCrv::CollectSegmentPairs(pruned, settings, pairs);
  EXPECT_TRUE(pairs == BrutePairs(pruned, settings));
  return static_cast<int>(a.size());
}

// Random flags: some curves only targets, some not self-tested.
template <class T>
std::vector<IntersectionCurveT<T>> Curves(const std::vector<Path<T>>& paths, std::mt19937& rng, bool mixFlags) {
  std::vector<IntersectionCurveT<T>> out;
  for (const Path<T>& p : paths) out.push_back(p.Curve(!mixFlags || rng() % 3 != 0, !mixFlags || rng() % 2 == 0));
  return out;
}

TEST(Pruning, DenseGridOfCrossingLines) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> jitter(-0.4, 0.4);
  std::vector<Path<V>> paths;
  for (int k = 0; k < 30; ++k) {
    Path<V> h, v;
    h.Move({0, 10.0 * k});
    v.Move({10.0 * k, 0});
    for (int i = 1; i <= 12; ++i) {
      h.Line({25.0 * i + jitter(rng), 10.0 * k + jitter(rng)});
      v.Line({10.0 * k + jitter(rng), 25.0 * i + jitter(rng)});
    }
    paths.push_back(h);
    paths.push_back(v);
  }
  for (const auto& settings : kAllSettings) {
    EXPECT_GT(CompareRuns(Curves(paths, rng, false), settings), 1000);
    CompareRuns(Curves(paths, rng, true), settings);
  }
  // The same grid in integers, lines only touching at shared points.
  std::vector<Path<POINT>> ints;
  for (const auto& p : paths) ints.push_back(ToInteger(p, 1.0));
  for (const auto& settings : kAllSettings) CompareRuns(Curves(ints, rng, true), settings);
}

TEST(Pruning, ManyOverlappingEdges) {
  std::mt19937 rng(8);
  std::vector<Path<V>> paths;
  // A board of squares sharing their edges, and every third one drawn twice.
  for (int i = 0; i < 12; ++i)
    for (int j = 0; j < 12; ++j) {
      Path<V> p;
      p.Move({10.0 * i, 10.0 * j}).Line({10.0 * i + 10, 10.0 * j}).Line({10.0 * i + 10, 10.0 * j + 10});
      p.Line({10.0 * i, 10.0 * j + 10}).Close();
      paths.push_back(p);
      if ((i + j) % 3 == 0) paths.push_back(p);
    }
  // Circles of Beziers sharing arcs.
  const double k = 0.5522847498 * 20;
  for (int c = 0; c < 20; ++c) {
    const double x = 5.0 * (c % 5), y = 130 + 5.0 * (c / 5);
    Path<V> p;
    p.Move({x + 20, y}).Cubic({x + 20, y + k}, {x + k, y + 20}, {x, y + 20});
    p.Cubic({x - k, y + 20}, {x - 20, y + k}, {x - 20, y}).Cubic({x - 20, y - k}, {x - k, y - 20}, {x, y - 20});
    p.Cubic({x + k, y - 20}, {x + 20, y - k}, {x + 20, y}).Close();
    paths.push_back(p);
  }
  for (const auto& settings : kAllSettings) {
    EXPECT_GT(CompareRuns(Curves(paths, rng, false), settings), 500);
    CompareRuns(Curves(paths, rng, true), settings);
  }
}

TEST(Pruning, ManyTinyCurves) {
  std::mt19937 rng(9);
  std::uniform_real_distribution<double> where(0, 150), small(-1.5, 1.5);
  std::vector<Path<V>> paths;
  for (int c = 0; c < 6; ++c) {
    Path<V> p;
    for (int i = 0; i < 80; ++i) {
      V q{where(rng), where(rng)};
      p.Move(q);
      for (int s = 0; s < 3; ++s) {
        const V a{q.x + small(rng), q.y + small(rng)}, b{q.x + small(rng), q.y + small(rng)};
        q = V{q.x + small(rng), q.y + small(rng)};
        if (rng() % 3 == 0)
          p.Line(q);
        else
          p.Cubic(a, b, q);
      }
      if (rng() % 2) p.Close();
    }
    paths.push_back(p);
  }
  for (const auto& settings : kAllSettings) {
    CompareRuns(Curves(paths, rng, false), settings);
    CompareRuns(Curves(paths, rng, true), settings);
  }
}

TEST(Pruning, WavyOutlinesAndProbes) {
  std::mt19937 rng(10);
  std::vector<Path<V>> paths;
  for (int c = 0; c < 3; ++c) {
    Path<V> p;
    const int n = 300;
    const double phase = c * 0.7;
    auto at = [&](int i) {
      const double a = 2 * 3.14159265358979 * i / n;
      const double r = 100 + 8 * std::sin(n / 2.0 * a + phase);
      return V{r * std::cos(a), r * std::sin(a)};
    };
    p.Move(at(0));
    for (int i = 1; i <= n; ++i) {
      const V q0 = at(i - 1), q1 = at(i);
      if (i % 2)
        p.Line(q1);
      else
        p.Cubic(V{q0.x + (q1.x - q0.x) / 3 + 2, q0.y + (q1.y - q0.y) / 3}, V{q0.x + 2 * (q1.x - q0.x) / 3, q0.y + 2 * (q1.y - q0.y) / 3 - 2}, q1);
    }
    p.Close();
    paths.push_back(p);
  }
  for (const auto& settings : kAllSettings) EXPECT_GT(CompareRuns(Curves(paths, rng, false), settings), 300);
  // A probe (one active segment, the direct search) across inactive targets.
  Path<V> probe;
  probe.Move({-200, 3}).Line({200, 3});
  std::vector<IntersectionCurveT<V>> curves{probe.Curve(true, true)};
  for (const auto& p : paths) curves.push_back(p.Curve(false, true));
  EXPECT_GT(CompareRuns(curves, OstraCrv::PointInShapeIntersectionSettings()), 4);
}

// Real near-degenerate drawings: each pair of operands, one curve per
// subpath, as welding builds them; also in integers scaled by 100, and with
// the second operand as a target only.
TEST(Pruning, CorpusShapes) {
  int files = 0;
  for (int f = 0; f < 8; ++f) {
    const auto operands = ReadCorpusPair(CorpusDir() + "/linesweeper/graphite_" +
                                         std::to_string(f) + ".txt");
    if (operands.size() < 2) continue;
    ++files;
    std::vector<Path<V>> subpaths;
    for (const Path<V>& op : operands) {
      // Split each operand into its subpaths.
      for (int i = 0; i < op.size();) {
        int e = i + 1;
        while (e < op.size() && (op.nodes[e] & 0xC0) != 0) ++e;
        Path<V> sp;
        sp.points.assign(op.points.begin() + i, op.points.begin() + e);
        sp.nodes.assign(op.nodes.begin() + i, op.nodes.begin() + e);
        subpaths.push_back(sp);
        i = e;
      }
    }
    std::mt19937 rng(f);
    for (const auto& settings : kAllSettings) {
      CompareRuns(Curves(subpaths, rng, false), settings);
      CompareRuns(Curves(subpaths, rng, true), settings);
    }
    std::vector<Path<POINT>> ints;
    for (const auto& p : subpaths) ints.push_back(ToInteger(p, 100.0));
    CompareRuns(Curves(ints, rng, false), OstraCrv::BreakIntersectionSettings());
    CompareRuns(Curves(ints, rng, false), OstraCrv::WeldGraphIntersectionSettings(OstraCrv::kWeldTolerance));
  }
  if (files == 0) GTEST_SKIP() << "corpus not found";
}

}  // namespace
