// Building a 10,000-segment path by appends (half lines, half Beziers) and
// reversing it. Both are linear in the segment count; the counters report the
// time per segment. Appends grow the arrays by doubling, so a build without
// Reserve pays a few reallocations; the reserved variant shows the cost of
// the appends alone.
#include <benchmark/benchmark.h>

#include "polycurve.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;

constexpr int kSegments = 10000;

// Every other segment a line, or (allBeziers) Beziers only.
void Build(PolycurveD& c, bool allBeziers = false) {
  c.MoveTo(V{0, 0});
  for (int i = 0; i < kSegments; ++i) {
    const double x = i + 1.0;
    if (i % 2 == 0 && !allBeziers)
      c.LineTo(V{x, (i % 7) * 3.0});
    else
      c.CubicTo(V{x - 0.7, 5.0}, V{x - 0.3, -5.0}, V{x, (i % 5) * 2.0});
  }
}

// Argument 0: lines and Beziers; 1: the same into reserved arrays; 2: Beziers
// only, whose three-node appends must grow the arrays geometrically too.
void BM_BuildLineToCubicTo(benchmark::State& state) {
  const bool reserve = state.range(0) == 1;
  for (auto _ : state) {
    PolycurveD c;
    if (reserve) c.Reserve(1 + 2 * kSegments);
    Build(c, state.range(0) == 2);
    benchmark::DoNotOptimize(c.GetPoints());
  }
  state.counters["per_segment"] =
      benchmark::Counter(double(kSegments), benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}
BENCHMARK(BM_BuildLineToCubicTo)->Arg(0)->Arg(1)->Arg(2);

void BM_Reverse(benchmark::State& state) {
  PolycurveD c;
  Build(c);
  for (auto _ : state) {
    c.Reverse();
    benchmark::DoNotOptimize(c.GetNodeTypes());
  }
  state.counters["per_segment"] =
      benchmark::Counter(double(kSegments), benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}
BENCHMARK(BM_Reverse);

}  // namespace
