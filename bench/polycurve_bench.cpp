// Cost of sharing: copying a curve handle is one atomic increment whatever the
// size, while the first write after a copy (a fork) copies the arrays and so
// grows with the node count.
#include <benchmark/benchmark.h>

#include <vector>

#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using OstraCrv::Polycurve;

Polycurve MakeCurve(int n) {
  std::vector<POINT> pts(n);
  std::vector<NODETYPE> nodes(n, NodeTypes::Open::line);
  for (int i = 0; i < n; ++i) pts[i] = {i, (i * 7) % 1000};
  if (n > 0) nodes[0] = NodeTypes::Open::move;
  return Polycurve(pts.data(), nodes.data(), n);
}

// Copy and destroy a handle.
void BM_CopyHandle(benchmark::State& state) {
  const Polycurve source = MakeCurve(int(state.range(0)));
  for (auto _ : state) {
    Polycurve copy(source);
    benchmark::DoNotOptimize(copy);
  }
}
BENCHMARK(BM_CopyHandle)->Arg(1000)->Arg(1000000);

// Copy, then write one point: the write forks the storage.
void BM_CopyThenFork(benchmark::State& state) {
  const Polycurve source = MakeCurve(int(state.range(0)));
  for (auto _ : state) {
    Polycurve copy(source);
    copy.SetPoint(0, POINT{-1, -1});
    benchmark::DoNotOptimize(copy);
  }
}
BENCHMARK(BM_CopyThenFork)->Arg(1000)->Arg(1000000);

}  // namespace
