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

// Wild: four random points in a square of 1000 units, so that loops, near
// cusps and crossed handles are common. Gentle: the shapes of drawing
// tools, arcs and S-bends with handles about a third of the chord.
Curves MakeCurves(bool gentle) {
  Curves c;
  std::mt19937 rng(12345);
  std::uniform_real_distribution<double> u(-500.0, 500.0), s(-0.3, 0.3);
  for (int i = 0; i < 256; ++i) {
    V p[4];
    if (gentle) {
      p[0] = V{u(rng), u(rng)};
      p[3] = V{u(rng), u(rng)};
      const double dx = p[3].x - p[0].x, dy = p[3].y - p[0].y;
      p[1] = V{p[0].x + dx / 3 - s(rng) * dy, p[0].y + dy / 3 + s(rng) * dx};
      p[2] = V{p[3].x - dx / 3 - s(rng) * dy, p[3].y - dy / 3 + s(rng) * dx};
    } else {
      for (V& q : p) q = V{u(rng), u(rng)};
    }
    c.points.insert(c.points.end(), p, p + 4);
    c.bases.push_back(MavikMath::CubicBezier::GetPowerBasis(p));
  }
  return c;
}

const Curves& TestCurves(bool gentle = false) {
  static const Curves wild = MakeCurves(false), mild = MakeCurves(true);
  return gentle ? mild : wild;
}

// Arguments: accuracy, and 1 for gentle curves.
void BM_Length(benchmark::State& state) {
  const Curves& c = TestCurves(state.range(1) != 0);
  const int accuracy = static_cast<int>(state.range(0));
  std::size_t i = 0;
  for (auto _ : state) {
    const PowerBasis& q = c.bases[i++ & 255];
    benchmark::DoNotOptimize(MavikMath::CubicBezier::Length(q.a, q.b, q.c, accuracy));
  }
}
BENCHMARK(BM_Length)->Args({10, 0})->Args({2, 0})->Args({10, 1})->Args({2, 1});

void BM_GetTightBounds(benchmark::State& state) {
  const Curves& c = TestCurves();
  std::size_t i = 0;
  for (auto _ : state) {
    const PowerBasis& q = c.bases[i++ & 255];
    double x0 = 0, y0 = 0, x1 = 0, y1 = 0;
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
  double points = 0.0;
  for (auto _ : state) {
    const V* p = &c.points[4 * (i++ & 255)];
    const int n = MavikMath::AdaptiveBezierToLines(p, out, tolerance, 4096);
    benchmark::DoNotOptimize(n);
    points += n;
  }
  state.counters["points"] = benchmark::Counter(points, benchmark::Counter::kAvgIterations);
}
// Tolerances 1 and 0.1 units on curves some 1000 units across.
BENCHMARK(BM_AdaptiveBezierToLines)->Arg(1)->Arg(10);

}  // namespace
