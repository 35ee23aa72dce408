// Median cost of the Bezier searches: a transversal Bezier-Bezier pair, a
// Bezier against a line segment, and a closest point.
#include <benchmark/benchmark.h>

#include <random>
#include <vector>

#include "polycurve.h"

namespace {

using MavikMath::V;
namespace CB = MavikMath::CubicBezier;

// A fixed set of inputs so that every iteration does comparable work.
struct Inputs {
  std::vector<V> a, b, lines, targets;
  Inputs() {
    std::mt19937 rng(12345);
    std::uniform_real_distribution<double> u(0.0, 100.0);
    for (int i = 0; i < 256; ++i) {
      // Two curves running across each other: a left to right, b bottom to top.
      a.insert(a.end(), {V{0, u(rng)}, V{33, u(rng)}, V{66, u(rng)}, V{100, u(rng)}});
      b.insert(b.end(), {V{u(rng), 0}, V{u(rng), 33}, V{u(rng), 66}, V{u(rng), 100}});
      lines.insert(lines.end(), {V{u(rng), -10}, V{u(rng), 110}});
      targets.push_back(V{u(rng), u(rng)});
    }
  }
};

const Inputs& Data() {
  static const Inputs in;
  return in;
}

// All intersections of the 256 pairs (first + stride i, second + stride i) in
// turn, into lists reserved once.
void IntersectPairs(benchmark::State& state, const V* first, const V* second, size_t stride) {
  std::vector<double> ta, tb;
  std::vector<V> pts;
  ta.reserve(16);
  tb.reserve(16);
  pts.reserve(16);
  size_t i = 0;
  for (auto _ : state) {
    ta.clear();
    tb.clear();
    pts.clear();
    CB::FindBezierIntersections(first + stride * i, second + stride * i, ta, tb, pts);
    benchmark::DoNotOptimize(ta.data());
    i = (i + 1) & 255;
  }
}

void BM_BezierBezierTransversal(benchmark::State& state) {
  IntersectPairs(state, Data().a.data(), Data().b.data(), 4);
}
BENCHMARK(BM_BezierBezierTransversal);

// Two halves of one curve: they meet only at their smooth joint, the
// common case of neighbouring segments in a path.
void BM_BezierBezierSmoothJoint(benchmark::State& state) {
  const Inputs& in = Data();
  std::vector<V> halves(8 * 256);
  for (size_t i = 0; i < 256; ++i) CB::Split(0.5, &in.a[4 * i], &halves[8 * i], &halves[8 * i + 4]);
  IntersectPairs(state, halves.data(), halves.data() + 4, 8);
}
BENCHMARK(BM_BezierBezierSmoothJoint);

void BM_BezierLine(benchmark::State& state) {
  const Inputs& in = Data();
  std::vector<double> tb, tl;
  tb.reserve(8);
  tl.reserve(8);
  size_t i = 0;
  for (auto _ : state) {
    tb.clear();
    tl.clear();
    benchmark::DoNotOptimize(CB::FindBezierLineIntersection(&in.a[4 * i], &in.lines[2 * i], tb, tl, false));
    i = (i + 1) & 255;
  }
}
BENCHMARK(BM_BezierLine);

void BM_ClosestPoint(benchmark::State& state) {
  const Inputs& in = Data();
  size_t i = 0;
  for (auto _ : state) {
    double t = 0.0, d = 1e300;
    V p;
    benchmark::DoNotOptimize(CB::FindClosestPointOnBezier(&in.a[4 * i], in.targets[i], t, p, d));
    i = (i + 1) & 255;
  }
}
BENCHMARK(BM_ClosestPoint);

void BM_ClosestPoints(benchmark::State& state) {
  const Inputs& in = Data();
  std::vector<double> ts, ds;
  std::vector<V> ps;
  ts.reserve(8);
  ds.reserve(8);
  ps.reserve(8);
  size_t i = 0;
  for (auto _ : state) {
    ts.clear();
    ds.clear();
    ps.clear();
    benchmark::DoNotOptimize(CB::FindClosestPointsOnBezier(&in.a[4 * i], in.targets[i], ts, ps, ds));
    i = (i + 1) & 255;
  }
}
BENCHMARK(BM_ClosestPoints);

void BM_SelfIntersection(benchmark::State& state) {
  const V loop[4] = {V{0, 0}, V{150, 100}, V{-50, 100}, V{100, 0}};
  for (auto _ : state) {
    double t1, t2;
    V p;
    benchmark::DoNotOptimize(CB::FindBezierSelfIntersection(loop, t1, t2, p));
  }
}
BENCHMARK(BM_SelfIntersection);

}  // namespace
