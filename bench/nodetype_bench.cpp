// Throughput of the whole-path counting queries over ten million node bytes.
//
// The bytes are a chain of random subpaths (lines, Beziers, open and closed,
// with random enabled/continuity flags) so that the kinds are mixed as in real
// paths. Each query is set against a plain per-byte loop with a branch, the
// form the word-parallel scan replaces.
#include <benchmark/benchmark.h>

#include <random>
#include <vector>

#include "polycurve.h"

namespace {

constexpr int kBytes = 10'000'000;

const std::vector<NODETYPE>& pathBytes() {
  static const std::vector<NODETYPE> bytes = [] {
    std::vector<NODETYPE> v;
    v.reserve(kBytes + 64);
    std::mt19937 rng(12345);
    auto pick = [&](int k) { return int(rng() % unsigned(k)); };
    while (int(v.size()) < kBytes) {
      const bool closed = pick(2) == 0;
      const NODETYPE flags = NODETYPE(pick(2));  // enabled
      v.push_back(NODETYPE((closed ? NodeTypes::Closed::move : NodeTypes::Open::move) | flags));
      const int segments = 1 + pick(12);
      for (int s = 0; s < segments; ++s) {
        const bool last = s + 1 == segments;
        const NODETYPE cont = NODETYPE(pick(3) << 4);
        if (pick(2)) {
          v.push_back(NodeTypes::arc);
          v.push_back(NodeTypes::arc);
          v.push_back(NODETYPE((last && closed ? NodeTypes::Closed::curve : NodeTypes::Open::curve) | cont));
        } else {
          v.push_back(NODETYPE((last && closed ? NodeTypes::Closed::line : NodeTypes::Open::line) | cont));
        }
      }
    }
    v.resize(kBytes);
    return v;
  }();
  return bytes;
}

template <int (*Query)(NODETYPE const*, int)>
void BM_Query(benchmark::State& state) {
  const auto& v = pathBytes();
  for (auto _ : state) benchmark::DoNotOptimize(Query(v.data(), int(v.size())));
  state.SetBytesProcessed(int64_t(state.iterations()) * int64_t(v.size()));
}

// The per-byte form, kept from vectorising so that it measures the branchy
// loop it stands for.
template <int Type>
__attribute__((optimize("no-tree-vectorize"))) int naiveCount(NODETYPE const* nodes, int n) {
  int c = 0;
  for (int i = 0; i < n; ++i) {
    const int t = nodes[i] >> 6;
    if (Type == 4 ? (t == 1 || t == 2) : t == Type) ++c;
  }
  return c;
}

}  // namespace

BENCHMARK(BM_Query<CRV_HowManyCurves>)->Name("CRV_HowManyCurves");
BENCHMARK(BM_Query<OstraCrv::GetSegmentCount>)->Name("GetSegmentCount");
BENCHMARK(BM_Query<CRV_NumSubpaths>)->Name("CRV_NumSubpaths");
BENCHMARK(BM_Query<naiveCount<2>>)->Name("naive/curves");
BENCHMARK(BM_Query<naiveCount<4>>)->Name("naive/segments");
BENCHMARK(BM_Query<naiveCount<0>>)->Name("naive/subpaths");
