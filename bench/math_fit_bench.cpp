// Least-squares fitting and offset approximation: median time per call.
#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

#include "ostracrv/math/bezier_offset.h"
#include "ostracrv/math/least_squares.h"

using namespace MavikMath;

namespace {

// 50 samples of a smooth arc with a little noise, as a smoothing pipeline
// hands them over, with their cumulative arc lengths.
struct Run {
  std::vector<V> points;
  std::vector<double> lengths;
  D startTangent, endTangent;
};

Run MakeRun(unsigned seed) {
  std::mt19937 rng(seed);
  std::normal_distribution<double> noise(0.0, 0.05);
  Run r;
  for (int i = 0; i < 50; ++i) {
    const double a = 2.0 * i / 49;
    r.points.push_back(V{100 * std::sin(a) + noise(rng), 60 * (1 - std::cos(a)) + noise(rng)});
  }
  r.lengths.push_back(0.0);
  for (int i = 1; i < 50; ++i) r.lengths.push_back(r.lengths.back() + Distance(r.points[i], r.points[i - 1]));
  r.startTangent = D{1.0, 0.0};
  r.endTangent = D{100 * std::cos(2.0), 60 * std::sin(2.0)};
  return r;
}

void BM_LeastSquaresShort50(benchmark::State& state) {
  const Run r = MakeRun(1);
  V fit[4];
  for (auto _ : state) {
    benchmark::DoNotOptimize(LeastSquares(r.points.data(), 50, r.startTangent, r.endTangent, fit, int(state.range(0))));
    benchmark::DoNotOptimize(fit);
  }
}
BENCHMARK(BM_LeastSquaresShort50)->Arg(10)->Arg(20);

void BM_LeastSquaresLong50(benchmark::State& state) {
  const Run r = MakeRun(2);
  std::vector<double> params(50);
  V fit[4];
  for (auto _ : state) {
    params = r.lengths;  // the callers pass a fresh copy each time
    benchmark::DoNotOptimize(LeastSquares(r.points.data(), params.data(), 50, r.startTangent, r.endTangent, fit,
                                          int(state.range(0)), nullptr, -1.0));
    benchmark::DoNotOptimize(fit);
  }
}
BENCHMARK(BM_LeastSquaresLong50)->Arg(20);

void BM_FindBezierOffsetCurve(benchmark::State& state) {
  // A smooth quarter-turn piece offset outwards by a fifth of its size with
  // a tolerance of 0.1 units: accepted in one call.
  const V p[4] = {{0, 0}, {40, 0}, {80, 20}, {100, 60}};
  V result[4];
  for (auto _ : state) {
    double split = -1.0;
    benchmark::DoNotOptimize(FindBezierOffsetCurve(p, result, -20.0, 0.01, split));
    benchmark::DoNotOptimize(result);
  }
}
BENCHMARK(BM_FindBezierOffsetCurve);

void BM_GetSegmentsToOffset(benchmark::State& state) {
  const CubicBezier::bezier2dT<V> b{{{0, 0}, {100, 80}, {0, 80}, {100, 0}}};
  std::vector<CubicBezier::bezier2dT<V>> pieces;
  for (auto _ : state) {
    pieces.clear();
    GetSegmentsToOffset(b, pieces, 15.0, nullptr);
    benchmark::DoNotOptimize(pieces.data());
  }
}
BENCHMARK(BM_GetSegmentsToOffset);

}  // namespace
