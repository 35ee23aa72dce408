// The set operations on pairs of shapes: a drawing-like pair (a disc and a
// star crossing it), a shape against a copy of itself turned a little so
// that every side crosses its twin, and synthetic shapes of 100, 1,000 and
// 10,000 segments (polygons and Bezier outlines, against a turned copy, and
// a shape with many holes against a rectangle cutting through them).
//
// The graph costs O(s log s + k) for s segments and k meetings, the weld pass
// O(edges) plus one exact ray per subpath (a probe through the engine only
// where a curve passes within the tolerance of the place), the output
// O(edges): the time per segment should stay nearly flat for one outline,
// and grow slowly with the number of subpaths when there are many (each ray
// passes the segments of its band up to the place).
#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

#include "polycurve.h"
#include "weld_shapes.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;
using OstraCrv::WeldFlags;
using namespace weldbench;

void Run(benchmark::State& state, PolycurveD const& a, PolycurveD const& b, int op,
         WeldFlags flags = WeldFlags::None) {
  size_t nodes = 0;
  for (auto _ : state) {
    PolycurveD r;
    switch (op) {
      case 0: r = PolycurveD::Union(a, b, true, true, flags); break;
      case 1: r = PolycurveD::Intersect(a, b, true, true, flags); break;
      case 2: r = PolycurveD::Subtract(a, b, true, true, flags); break;
      default: r = PolycurveD::Xor(a, b, true, true, flags); break;
    }
    nodes = r.GetPointCount();
    benchmark::DoNotOptimize(nodes);
  }
  const int segments = a.GetNumberOfSegments() + b.GetNumberOfSegments();
  state.counters["segments"] = segments;
  state.counters["result_nodes"] = double(nodes);
  state.SetItemsProcessed(state.iterations() * segments);
}

// The drawing-like pair: a disc of four Beziers and a ten-pointed star.
void BM_WeldDiscAndStar(benchmark::State& state) { Run(state, Disc(), Star(), int(state.range(0))); }
BENCHMARK(BM_WeldDiscAndStar)->DenseRange(0, 3)->Unit(benchmark::kMicrosecond);

// A shape against a copy turned by a fraction of a segment.
void BM_WeldPolygonTurned(benchmark::State& state) {
  const int n = int(state.range(0));
  Run(state, Outline(n, V{0, 0}, 10.0 * n, 0, false), Outline(n, V{0, 0}, 10.0 * n, M_PI / n, false), 0);
}
BENCHMARK(BM_WeldPolygonTurned)->Arg(100)->Arg(1000)->Arg(10000)->Unit(benchmark::kMillisecond);

void BM_WeldBezierTurned(benchmark::State& state) {
  const int n = int(state.range(0));
  Run(state, Outline(n, V{0, 0}, 10.0 * n, 0, true), Outline(n, V{0, 0}, 10.0 * n, M_PI / n, true), 0);
}
BENCHMARK(BM_WeldBezierTurned)->Arg(100)->Arg(1000)->Arg(10000)->Unit(benchmark::kMillisecond);

// At the precise tolerance: no near miss to resolve, no second attempt.
void BM_WeldBezierTurnedPrecise(benchmark::State& state) {
  const int n = int(state.range(0));
  Run(state, Outline(n, V{0, 0}, 10.0 * n, 0, true), Outline(n, V{0, 0}, 10.0 * n, M_PI / n, true), 0,
      WeldFlags::Precise);
}
BENCHMARK(BM_WeldBezierTurnedPrecise)->Arg(100)->Arg(1000)->Arg(10000)->Unit(benchmark::kMillisecond);

void BM_WeldBezierTurnedIntersect(benchmark::State& state) {
  const int n = int(state.range(0));
  Run(state, Outline(n, V{0, 0}, 10.0 * n, 0, true), Outline(n, V{0, 0}, 10.0 * n, M_PI / n, true), 1);
}
BENCHMARK(BM_WeldBezierTurnedIntersect)->Arg(100)->Arg(1000)->Arg(10000)->Unit(benchmark::kMillisecond);

// Many subpaths: a plate of holes minus a band across it.
void BM_WeldPlateMinusBand(benchmark::State& state) {
  const int n = int(state.range(0));
  const PolycurveD plate = Plate(n);
  Run(state, plate, Band(n), 2);
}
BENCHMARK(BM_WeldPlateMinusBand)->Arg(100)->Arg(1000)->Arg(10000)->Unit(benchmark::kMillisecond);

}  // namespace
