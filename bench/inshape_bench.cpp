// Point in shape on a large outline, and building the subpath tree.
//
// The shape test costs one box pass over the points and one probe run of
// the intersection engine over all segments, so a query grows linearly with
// the outline. The tree of N side-by-side subpaths makes up to two
// containment tests per sibling at each insertion, most of them settled by
// the area comparison or the box test, so building it grows about as N^2 at
// this size.
#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;

// A wavy closed outline of n Bezier segments around the origin, radius about
// 10000, with a ripple so that probes meet many segments near each other.
template <class T>
void WavyOutline(int n, std::vector<T>& pts, std::vector<NODETYPE>& nodes) {
  auto at = [n](double s) {
    const double a = 2 * M_PI * s / n, r = 10000 + 400 * std::sin(37 * a);
    return V{r * std::cos(a), r * std::sin(a)};
  };
  pts.clear();
  nodes.clear();
  for (int i = 0; i < n; ++i) {
    const V p0 = at(i), p3 = at(i + 1), p1 = at(i + 1.0 / 3), p2 = at(i + 2.0 / 3);
    if (i == 0) {
      pts.push_back(MavikMath::FromV<T>(p0));
      nodes.push_back(NodeTypes::Closed::move);
    }
    for (const V& q : {p1, p2}) {
      pts.push_back(MavikMath::FromV<T>(q));
      nodes.push_back(NodeTypes::arc);
    }
    pts.push_back(i + 1 == n ? pts[0] : MavikMath::FromV<T>(p3));
    nodes.push_back(i + 1 == n ? NodeTypes::Closed::curve : NodeTypes::Open::curve);
  }
}

template <class T>
void BM_IsPointInShape(benchmark::State& state) {
  std::vector<T> pts;
  std::vector<NODETYPE> nodes;
  WavyOutline(int(state.range(0)), pts, nodes);
  std::mt19937 rng(1);
  std::uniform_real_distribution<double> u(-10500, 10500);
  std::vector<T> queries(256);
  for (T& q : queries) q = MavikMath::FromV<T>(V{u(rng), u(rng)});
  std::size_t k = 0;
  for (auto _ : state) {
    const T& q = queries[k++ % queries.size()];
    benchmark::DoNotOptimize(
        OstraCrv::IsPointInShape(pts.data(), nodes.data(), int(pts.size()), q, false, true, nullptr, nullptr));
  }
  state.SetComplexityN(state.range(0));
}
BENCHMARK_TEMPLATE(BM_IsPointInShape, V)->Arg(1000)->Arg(10000)->Complexity()->Unit(benchmark::kMicrosecond);
BENCHMARK_TEMPLATE(BM_IsPointInShape, POINT)->Arg(10000)->Unit(benchmark::kMicrosecond);

// N small subpaths on a grid: squares of 8 Bezier-free corners alternating
// with circles, every fourth cell holding a hole, in shuffled order.
void BM_BuildHierarchy(benchmark::State& state) {
  const int n = int(state.range(0));
  std::vector<V> pts;
  std::vector<NODETYPE> nodes;
  std::vector<std::vector<V>> rings;
  const int side = int(std::ceil(std::sqrt(n * 0.8)));
  for (int i = 0; int(rings.size()) < n; ++i) {
    const double cx = (i % side) * 100.0, cy = (i / side) * 100.0;
    for (double r : {40.0, 20.0}) {
      std::vector<V> ring;
      for (int k = 0; k < 8; ++k) {
        const double a = (r > 30 ? 1 : -1) * 2 * M_PI * k / 8;
        ring.push_back({cx + r * std::cos(a), cy + r * std::sin(a)});
      }
      rings.push_back(ring);
      if (i % 4 != 0 || int(rings.size()) >= n) break;
    }
  }
  std::shuffle(rings.begin(), rings.end(), std::mt19937(3));
  for (const auto& ring : rings) {
    for (std::size_t k = 0; k < ring.size(); ++k) {
      pts.push_back(ring[k]);
      nodes.push_back(k == 0 ? NodeTypes::Closed::move : NodeTypes::Open::line);
    }
    pts.push_back(ring[0]);
    nodes.push_back(NodeTypes::Closed::line);
  }
  for (auto _ : state) {
    OstraCrv::SubpathHierarchy tree(pts.data(), nodes.data(), int(pts.size()), false);
    benchmark::DoNotOptimize(tree.GetRoot().GetNumberOfChildren());
  }
  state.SetComplexityN(n);
}
BENCHMARK(BM_BuildHierarchy)->Arg(250)->Arg(500)->Arg(1000)->Complexity()->Unit(benchmark::kMillisecond);

}  // namespace
