// Node selection and structural edits on a path of 10,000 segments in 1,000
// closed subpaths. The selection counts and the capability mask run on every
// mouse move of an interactive edit; the arc refresh runs after each change
// of selection; a break and opening all subpaths are single user commands.
// All are linear in the node count (opening all subpaths: linear per subpath
// opened, as each tidy-up reads the whole path). The counters report the time
// per node.
#include <benchmark/benchmark.h>

#include <vector>

#include "polycurve.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;

constexpr int kSubpaths = 1000;
constexpr int kSegmentsPerSubpath = 10;

// Closed subpaths of lines and Beziers; every third node selected.
PolycurveD Make(int subpaths = kSubpaths) {
  PolycurveD c;
  for (int s = 0; s < subpaths; ++s) {
    const double y = 20.0 * s;
    c.MoveTo(V{0, y});
    for (int i = 1; i < kSegmentsPerSubpath; ++i) {
      if (i % 2) c.LineTo(V{double(i), y + 3});
      else c.CubicTo(V{i - 0.7, y + 5}, V{i - 0.3, y - 5}, V{double(i), y});
    }
    c.LineTo(V{0, y});
    c.CloseLastSubpath(0.0, false);
  }
  OstraCrv::CurveBuffer<V> b = c.GetBuffer();
  for (int i = 0; i < b.count; i += 3) CRV_SetEnabled(b.nodes, b.count, i, 1);
  return c;
}

void PerNode(benchmark::State& state, double nodes) {
  state.counters["per_node"] =
      benchmark::Counter(nodes, benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}

void BM_HowManyEnabled(benchmark::State& state) {
  const PolycurveD c = Make();
  const int n = int(c.GetPointCount());
  for (auto _ : state) benchmark::DoNotOptimize(CRV_HowManyEnabled(c.GetNodeTypes(), n));
  PerNode(state, n);
}
BENCHMARK(BM_HowManyEnabled);

void BM_GetEnablingInfo(benchmark::State& state) {
  const PolycurveD c = Make();
  const int n = int(c.GetPointCount());
  CRV_ENABLINGINFO info;
  for (auto _ : state) benchmark::DoNotOptimize(CRV_GetEnablingInfo(c.GetNodeTypes(), n, 0, -1, &info));
  PerNode(state, n);
}
BENCHMARK(BM_GetEnablingInfo);

void BM_EnableAllControls(benchmark::State& state) {
  PolycurveD c = Make();
  OstraCrv::CurveBuffer<V> b = c.GetBuffer();
  for (auto _ : state) benchmark::DoNotOptimize(CRV_EnableAllControls(b.nodes, b.count));
  PerNode(state, b.count);
}
BENCHMARK(BM_EnableAllControls);

// A break inside a Bezier in the middle of the path, on a fresh copy each time
// (the copy is part of the time: one more pass over the arrays).
void BM_BreakAt(benchmark::State& state) {
  const PolycurveD c = Make();
  const unsigned long node = c.GetPointCount() / 2 + 3;
  for (auto _ : state) {
    PolycurveD d(c.GetPoints(), c.GetNodeTypes(), c.GetPointCount());
    benchmark::DoNotOptimize(d.BreakAt(node, 0.5));
  }
  PerNode(state, double(c.GetPointCount()));
}
BENCHMARK(BM_BreakAt);

// Opening every closed subpath; argument: the number of subpaths.
void BM_OpenAllSubpaths(benchmark::State& state) {
  const PolycurveD c = Make(int(state.range(0)));
  for (auto _ : state) {
    PolycurveD d(c.GetPoints(), c.GetNodeTypes(), c.GetPointCount());
    d.OpenAllSubpaths();
    benchmark::DoNotOptimize(d.GetPoints());
  }
  PerNode(state, double(c.GetPointCount()));
}
BENCHMARK(BM_OpenAllSubpaths)->Arg(10)->Arg(100)->Arg(1000);

}  // namespace
