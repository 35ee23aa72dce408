// Median cost of the evaluation services on a fixed set of random curves:
// arc length at both accuracies, tight bounds and adaptive flattening.
#include <benchmark/benchmark.h>

#include <random>
#include <vector>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_derivatives.h"
#include "ostracrv/math/bezier_flatten.h"
#include "ostracrv/math/bezier_length.h"

namespace {

using MavikMath::V;
using MavikMath::CubicBezier::PowerBasis;

struct Curves {
  std::vector<PowerBasis> bases;
  std::vector<V> points;  // four per curve
};

const Curves& TestCurves() {
  static const Curves curves = [] {
    Curves c;
    std::mt19937 rng(12345);
    std::uniform_real_distribution<double> u(-500.0, 500.0);
    for (int i = 0; i < 256; ++i) {
      V p[4];
      for (V& q : p) q = V{u(rng), u(rng)};
      c.points.insert(c.points.end(), p, p + 4);
      c.bases.push_back(MavikMath::CubicBezier::GetPowerBasis(p));
    }
    return c;
  }();
  return curves;
}

void BM_Length(benchmark::State& state) {
  const Curves& c = TestCurves();
  const int accuracy = static_cast<int>(state.range(0));
  std::size_t i = 0;
  for (auto _ : state) {
    const PowerBasis& q = c.bases[i++ & 255];
    benchmark::DoNotOptimize(MavikMath::CubicBezier::Length(q.a, q.b, q.c, accuracy));
  }
}
BENCHMARK(BM_Length)->Arg(10)->Arg(2);

void BM_GetTightBounds(benchmark::State& state) {
  const Curves& c = TestCurves();
  std::size_t i = 0;
  for (auto _ : state) {
    const PowerBasis& q = c.bases[i++ & 255];
    double x0, y0, x1, y1;
    MavikMath::CubicBezier::GetTightBounds<double>(q.a, q.b, q.c, q.d, x0, y0, x1, y1);
    benchmark::DoNotOptimize(x0 + y0 + x1 + y1);
  }
}
BENCHMARK(BM_GetTightBounds);

void BM_AdaptiveBezierToLines(benchmark::State& state) {
  const Curves& c = TestCurves();
  const double tolerance = 1.0 / static_cast<double>(state.range(0));
  V out[4096];
  std::size_t i = 0;
  for (auto _ : state) {
    const V* p = &c.points[4 * (i++ & 255)];
    benchmark::DoNotOptimize(MavikMath::AdaptiveBezierToLines(p, out, tolerance, 4096));
  }
}
// Tolerances 1 and 0.1 units on curves some 1000 units across.
BENCHMARK(BM_AdaptiveBezierToLines)->Arg(1)->Arg(10);

}  // namespace
