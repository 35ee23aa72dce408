// The intersection engine on two wavy closed outlines of n segments each that
// cross each other about n times, as welding runs it (all subpaths active and
// self-tested, weld tolerance), with the pruned pair search and with the
// plain all-pairs visit. The outlines are random radial zigzags around one
// circle, alternating lines and Beziers, segments about 10 units long; the
// second is turned by half a step, so each of its segments meets about two
// of the first.
#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

#include "ostracrv/intersect/intersection_settings.h"
#include "ostracrv/intersect/segments.h"

namespace {

using MavikMath::V;
using OstraCrv::IntersectionCurveT;
using OstraCrv::PairSearch;
using OstraCrv::SegmentsT;

struct Outline {
  std::vector<V> points;
  std::vector<NODETYPE> nodes;
};

Outline WavyOutline(int n, double turn, unsigned seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> wave(-1.0, 1.0);
  const double pi = 3.14159265358979323846;
  const double radius = 10.0 * n / (2 * pi);
  std::vector<V> nodes(n);
  for (int i = 0; i < n; ++i) {
    const double a = 2 * pi * (i + turn) / n;
    const double r = radius + 5.0 * wave(rng);
    nodes[i] = V{r * std::cos(a), r * std::sin(a)};
  }
  Outline o;
  o.points.push_back(nodes[0]);
  o.nodes.push_back(0x0C);
  for (int i = 1; i <= n; ++i) {
    const V p = nodes[(i - 1) % n], q = nodes[i % n];
    if (i % 2) {
      o.points.push_back(q);
      o.nodes.push_back(0x44);
    } else {
      const double dx = q.x - p.x, dy = q.y - p.y, bend = 0.3 * wave(rng);
      o.points.push_back(V{p.x + dx / 3 - dy * bend, p.y + dy / 3 + dx * bend});
      o.points.push_back(V{p.x + 2 * dx / 3 + dy * bend, p.y + 2 * dy / 3 - dx * bend});
      o.points.push_back(q);
      o.nodes.insert(o.nodes.end(), {0xC0, 0xC0, 0x84});
    }
  }
  o.nodes.back() = static_cast<NODETYPE>((o.nodes.back() & 0xC0) | 0x08);
  return o;
}

void BM_TwoWavyOutlines(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const PairSearch search = state.range(1) ? PairSearch::Pruned : PairSearch::AllPairs;
  const Outline a = WavyOutline(n, 0.0, 1), b = WavyOutline(n, 0.5, 2);
  const std::vector<IntersectionCurveT<V>> curves = {
      IntersectionCurveT<V>(a.points.data(), a.nodes.data(), static_cast<int>(a.nodes.size()), true, true),
      IntersectionCurveT<V>(b.points.data(), b.nodes.data(), static_cast<int>(b.nodes.size()), true, true)};
  const auto settings = OstraCrv::WeldGraphIntersectionSettings(OstraCrv::kWeldTolerance);
  size_t records = 0;
  for (auto _ : state) {
    SegmentsT<V> engine(curves, settings, search);
    records = 0;
    for (const auto& s : engine.segments) records += s.intersections.size();
    benchmark::DoNotOptimize(records);
  }
  state.counters["meetings"] = static_cast<double>(records / 2);
}

BENCHMARK(BM_TwoWavyOutlines)
    ->ArgNames({"n", "pruned"})
    ->Args({1000, 1})
    ->Args({4000, 1})
    ->Args({16000, 1})
    ->Args({1000, 0})
    ->Args({4000, 0})
    ->Unit(benchmark::kMillisecond);
// The quadratic visit at the largest size takes seconds: one run.
BENCHMARK(BM_TwoWavyOutlines)->ArgNames({"n", "pruned"})->Args({16000, 0})->Iterations(1)->Unit(benchmark::kMillisecond);

}  // namespace
