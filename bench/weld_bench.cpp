// The set operations on pairs of shapes: a drawing-like pair (a disc and a
// star crossing it), a shape against a copy of itself turned a little so
// that every side crosses its twin, and synthetic shapes of 100, 1,000 and
// 10,000 segments (polygons and Bezier outlines, against a turned copy, and
// a shape with many holes against a rectangle cutting through them).
//
// The graph costs O(s log s + k) for s segments and k meetings, the weld pass
// O(edges) plus one probe per subpath, the output O(edges): the time per
// segment should stay nearly flat for one outline, and grow with the number
// of subpaths when there are many (each probe passes the curves whose boxes
// it meets).
#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

#include "polycurve.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;
using OstraCrv::WeldFlags;

// An outline of n segments round c whose radius wanders smoothly (a few
// slow waves and a little noise, well below the length of a segment), so
// that it and a copy turned by half a segment cross a bounded number of
// times per segment whatever n is.
PolycurveD Outline(int n, V c, double r, double turn, bool curved) {
  std::mt19937 rng(7);
  const double chord = 2 * M_PI * r / n;
  std::uniform_real_distribution<double> noise(-0.1 * chord, 0.1 * chord);
  std::vector<double> radius(static_cast<size_t>(n), 0.0);
  for (int k = 0; k < n; ++k)
    radius[size_t(k)] = r * (1 + 0.05 * std::sin(2 * M_PI * 5 * k / n) + 0.03 * std::sin(2 * M_PI * 17 * k / n)) +
                        noise(rng);
  auto at = [&](int k) {
    const double a = 2 * M_PI * k / n + turn;
    const double rr = radius[size_t(k % n)];
    return V{c.x + rr * std::cos(a), c.y + rr * std::sin(a)};
  };
  PolycurveD p;
  p.MoveTo(at(0));
  for (int k = 1; k <= n; ++k) {
    if (curved) {
      // Handles a third of the way along, pushed out by a tenth of the chord.
      const V a = at(k - 1), b = at(k);
      p.CubicTo(V{a.x + (b.x - a.x) / 3 + (b.y - a.y) * 0.1, a.y + (b.y - a.y) / 3 - (b.x - a.x) * 0.1},
                V{a.x + 2 * (b.x - a.x) / 3 + (b.y - a.y) * 0.1, a.y + 2 * (b.y - a.y) / 3 - (b.x - a.x) * 0.1}, b);
    } else {
      p.LineTo(at(k));
    }
  }
  p.CloseLastSubpath(1e-9, false);
  return p;
}

// A square plate of n / 4 square holes in a grid (n segments in all).
PolycurveD Plate(int n) {
  const int holes = std::max(1, n / 4 - 1);
  const int side = int(std::ceil(std::sqrt(double(holes))));
  const double cell = 100.0;
  PolycurveD p = PolycurveD::CreateRectangle(Framework::common_types::RECT{0, side * 100, side * 100, 0});
  for (int k = 0; k < holes; ++k) {
    const double x = (k % side) * cell + 20, y = (k / side) * cell + 20;
    p.MoveTo(V{x, y});
    p.LineTo(V{x, y + 60});
    p.LineTo(V{x + 60, y + 60});
    p.LineTo(V{x + 60, y});
    p.LineTo(V{x, y});
    p.CloseLastSubpath(0.0, false);
  }
  return p;
}

void Run(benchmark::State& state, PolycurveD const& a, PolycurveD const& b, int op) {
  size_t nodes = 0;
  for (auto _ : state) {
    PolycurveD r;
    switch (op) {
      case 0: r = PolycurveD::Union(a, b, true, true); break;
      case 1: r = PolycurveD::Intersect(a, b, true, true); break;
      case 2: r = PolycurveD::Subtract(a, b, true, true); break;
      default: r = PolycurveD::Xor(a, b, true, true); break;
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
void BM_WeldDiscAndStar(benchmark::State& state) {
  const PolycurveD disc = PolycurveD::CreateCircle(V{75, 80}, 55);
  const double pts[] = {140, 20, 154, 62, 196, 62, 162, 88, 176, 130, 140, 104, 104, 130, 118, 88, 84, 62, 126, 62};
  PolycurveD star;
  star.MoveTo(V{pts[0], pts[1]});
  for (int k = 2; k < 20; k += 2) star.LineTo(V{pts[k], pts[k + 1]});
  star.LineTo(V{pts[0], pts[1]});
  star.CloseLastSubpath(0.0, false);
  Run(state, disc, star, int(state.range(0)));
}
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

void BM_WeldBezierTurnedIntersect(benchmark::State& state) {
  const int n = int(state.range(0));
  Run(state, Outline(n, V{0, 0}, 10.0 * n, 0, true), Outline(n, V{0, 0}, 10.0 * n, M_PI / n, true), 1);
}
BENCHMARK(BM_WeldBezierTurnedIntersect)->Arg(100)->Arg(1000)->Arg(10000)->Unit(benchmark::kMillisecond);

// Many subpaths: a plate of holes minus a band across it.
void BM_WeldPlateMinusBand(benchmark::State& state) {
  const int n = int(state.range(0));
  const PolycurveD plate = Plate(n);
  const int side = int(std::ceil(std::sqrt(double(std::max(1, n / 4 - 1)))));
  const PolycurveD band = PolycurveD::CreateRectangle(
      Framework::common_types::RECT{-10, side * 50 + 30, side * 100 + 10, side * 50 - 30});
  Run(state, plate, band, 2);
}
BENCHMARK(BM_WeldPlateMinusBand)->Arg(100)->Arg(1000)->Arg(10000)->Unit(benchmark::kMillisecond);

}  // namespace
