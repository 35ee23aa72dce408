// Whole-path measures per segment: area, length, tight box and nearest point
// on one closed path of alternating lines and Beziers (a random walk of short
// steps). Each is a single pass, so the time per segment should stay flat
// from 1,000 to 100,000 segments.
#include <benchmark/benchmark.h>

#include <random>
#include <vector>

#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using OstraCrv::PolycurveT;

template <class T>
PolycurveT<T> MakePath(int segments) {
  std::mt19937 rng(12345);
  std::uniform_int_distribution<int> step(-400, 400);
  std::vector<T> pts;
  std::vector<NODETYPE> nodes;
  int x = 0, y = 0;
  auto next = [&] {
    x += step(rng);
    y += step(rng);
    return T{decltype(T{}.x)(x), decltype(T{}.y)(y)};
  };
  pts.push_back(T{0, 0});
  nodes.push_back(NodeTypes::Closed::move);
  for (int s = 0; s < segments; ++s) {
    const bool last = s + 1 == segments;
    if (s % 2) {
      pts.push_back(next());
      pts.push_back(next());
      nodes.push_back(NodeTypes::arc);
      nodes.push_back(NodeTypes::arc);
      pts.push_back(last ? T{0, 0} : next());
      nodes.push_back(last ? NodeTypes::Closed::curve : NodeTypes::Open::curve);
    } else {
      pts.push_back(last ? T{0, 0} : next());
      nodes.push_back(last ? NodeTypes::Closed::line : NodeTypes::Open::line);
    }
  }
  return PolycurveT<T>(pts.data(), nodes.data(), pts.size());
}

template <class T>
void BM_GetArea(benchmark::State& state) {
  const auto c = MakePath<T>(int(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(c.GetArea());
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

template <class T>
void BM_GetLength(benchmark::State& state) {
  const auto c = MakePath<T>(int(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(c.GetLength());
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

template <class T>
void BM_GetTightBBox(benchmark::State& state) {
  const auto c = MakePath<T>(int(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(c.GetTightBBox());
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

template <class T>
void BM_FindClosestPoint(benchmark::State& state) {
  const auto c = MakePath<T>(int(state.range(0)));
  const T target{1234, -567};
  OstraCrv::ClosestPoint<T, OstraCrv::CurvePosition> out;
  for (auto _ : state) {
    benchmark::DoNotOptimize(c.FindClosestPoint(target, out));
    benchmark::DoNotOptimize(out);
  }
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

#define MEASURE_SIZES ->Arg(1000)->Arg(10000)->Arg(100000)

BENCHMARK_TEMPLATE(BM_GetArea, V) MEASURE_SIZES;
BENCHMARK_TEMPLATE(BM_GetArea, POINT) MEASURE_SIZES;
BENCHMARK_TEMPLATE(BM_GetLength, V) MEASURE_SIZES;
BENCHMARK_TEMPLATE(BM_GetLength, POINT) MEASURE_SIZES;
BENCHMARK_TEMPLATE(BM_GetTightBBox, V) MEASURE_SIZES;
BENCHMARK_TEMPLATE(BM_GetTightBBox, POINT) MEASURE_SIZES;
BENCHMARK_TEMPLATE(BM_FindClosestPoint, V) MEASURE_SIZES;
BENCHMARK_TEMPLATE(BM_FindClosestPoint, POINT) MEASURE_SIZES;

}  // namespace
