// Throughput of path data: reading a text of lines and Beziers, reading arcs
// (each cut into cubics), and writing a curve at full and at 3-decimal
// precision. Reported as bytes of text per second.
#include <benchmark/benchmark.h>

#include <random>
#include <string>

#include "polycurve.h"

namespace {

// A text of n segments, lines and cubics mixed, with decimals like those of
// drawing programs.
std::string MakeText(int n, bool arcs) {
  std::mt19937 rng(5);
  std::uniform_real_distribution<double> u(0, 1000);
  std::string d = "M10.5 20.25";
  char buf[160];
  for (int i = 0; i < n; ++i) {
    if (arcs)
      std::snprintf(buf, sizeof buf, "A%.3f %.3f %.1f %d %d %.3f %.3f", u(rng) / 4 + 1, u(rng) / 4 + 1, u(rng) / 3,
                    i & 1, (i >> 1) & 1, u(rng), u(rng));
    else if (i % 3 == 0)
      std::snprintf(buf, sizeof buf, "L%.3f %.3f", u(rng), u(rng));
    else
      std::snprintf(buf, sizeof buf, "C%.3f %.3f %.3f %.3f %.3f %.3f", u(rng), u(rng), u(rng), u(rng), u(rng), u(rng));
    d += buf;
  }
  return d + "Z";
}

void BM_ParsePathData(benchmark::State& state) {
  const std::string d = MakeText(int(state.range(0)), false);
  OstraCrv::PolycurveD c;
  for (auto _ : state) {
    OstraCrv::ParseSvgPathData(d, c);
    benchmark::DoNotOptimize(c.GetPoints());
  }
  state.SetBytesProcessed(int64_t(state.iterations()) * int64_t(d.size()));
}
BENCHMARK(BM_ParsePathData)->Arg(100)->Arg(10000);

void BM_ParseArcs(benchmark::State& state) {
  const std::string d = MakeText(int(state.range(0)), true);
  OstraCrv::PolycurveD c;
  for (auto _ : state) {
    OstraCrv::ParseSvgPathData(d, c);
    benchmark::DoNotOptimize(c.GetPoints());
  }
  state.SetBytesProcessed(int64_t(state.iterations()) * int64_t(d.size()));
}
BENCHMARK(BM_ParseArcs)->Arg(1000);

void BM_WritePathData(benchmark::State& state) {
  OstraCrv::PolycurveD c;
  OstraCrv::ParseSvgPathData(MakeText(10000, false), c);
  OstraCrv::SvgPathWriteOptions o;
  o.precision = int(state.range(0));
  std::string out;
  for (auto _ : state) {
    OstraCrv::WriteSvgPathData(c, out, o);
    benchmark::DoNotOptimize(out.data());
  }
  state.SetBytesProcessed(int64_t(state.iterations()) * int64_t(out.size()));
}
BENCHMARK(BM_WritePathData)->Arg(-1)->Arg(3);

}  // namespace
