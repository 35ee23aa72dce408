// The set operations of this library against lib2geom's boolean operations
// (Geom::PathIntersectionGraph) on the same shapes, in the same process.
//
// Each iteration runs both on the same pair and times each; the counters
// give the mean time of each, `ratio` = ours / lib2geom (below 1: we are
// faster), and `area_diff`, the difference of the two results' areas under
// the even-odd rule relative to the larger, measured on a fine flattening of
// each result (a check that both computed the same thing). Ours runs at the
// ordinary weld tolerance (precise:0) and at the precise one (precise:1,
// closer to lib2geom, which does not snap near misses). `lib2geom_failed`
// counts the runs where lib2geom gave up with an exception (its time is
// then that of giving up, and area_diff compares with nothing).
#include <benchmark/benchmark.h>

#include <2geom/intersection-graph.h>
#include <2geom/path.h>
#include <2geom/pathvector.h>

#include <algorithm>
#include <chrono>
#include <cmath>
#include <vector>

#include "polycurve.h"
#include "weld_shapes.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;
using OstraCrv::WeldFlags;
using namespace weldbench;

Geom::PathVector ToGeom(PolycurveD const& c) {
  Geom::PathVector pv;
  const int n = int(c.GetPointCount());
  for (int i = 0; i < n;) {
    int end = i + 1;
    while (end < n && !IsMove(c.GetNodeType(end))) ++end;
    const V s = c.GetPoint(i);
    Geom::Path path(Geom::Point(s.x, s.y));
    for (int k = i + 1; k < end; ++k) {
      const NODETYPE b = c.GetNodeType(k);
      const V p = c.GetPoint(k);
      if (IsLine(b)) {
        if (!(k + 1 == end && p == s)) path.appendNew<Geom::LineSegment>(Geom::Point(p.x, p.y));
      } else if (IsCurve(b)) {
        const V c1 = c.GetPoint(k - 2), c2 = c.GetPoint(k - 1);
        path.appendNew<Geom::CubicBezier>(Geom::Point(c1.x, c1.y), Geom::Point(c2.x, c2.y), Geom::Point(p.x, p.y));
      }
    }
    path.close(true);
    pv.push_back(path);
    i = end;
  }
  return pv;
}

using Polygon = std::vector<V>;

// Even-odd area of polygons by exact trapezoids between all vertex heights.
double EvenOddArea(std::vector<Polygon> const& polys) {
  std::vector<double> ys;
  for (Polygon const& p : polys)
    for (V q : p) ys.push_back(q.y);
  std::sort(ys.begin(), ys.end());
  ys.erase(std::unique(ys.begin(), ys.end()), ys.end());
  double area = 0;
  std::vector<double> xs;
  // Between two neighbouring heights no edge starts or ends; the width of
  // the inside at the middle height times the gap is exact where no two
  // edges cross in between, which holds for results without crossings.
  for (size_t k = 0; k + 1 < ys.size(); ++k) {
    const double y = 0.5 * (ys[k] + ys[k + 1]);
    xs.clear();
    for (Polygon const& p : polys)
      for (size_t i = 0; i < p.size(); ++i) {
        const V a = p[i], b = p[(i + 1) % p.size()];
        if ((a.y <= y) == (b.y <= y)) continue;
        xs.push_back(a.x + (y - a.y) * (b.x - a.x) / (b.y - a.y));
      }
    std::sort(xs.begin(), xs.end());
    for (size_t i = 0; i + 1 < xs.size(); i += 2) area += (xs[i + 1] - xs[i]) * (ys[k + 1] - ys[k]);
  }
  return area;
}

constexpr int kPieces = 16;

std::vector<Polygon> Flatten(PolycurveD const& c) {
  std::vector<Polygon> out;
  Polygon cur;
  for (unsigned long i = 0; i < c.GetPointCount(); ++i) {
    const NODETYPE b = c.GetNodeType(int(i));
    const V p = c.GetPoint(int(i));
    if (IsMove(b)) {
      if (cur.size() > 2) out.push_back(cur);
      cur.assign(1, p);
    } else if (IsLine(b)) {
      cur.push_back(p);
    } else if (IsCurve(b)) {
      V q[4] = {c.GetPoint(int(i) - 3), c.GetPoint(int(i) - 2), c.GetPoint(int(i) - 1), p};
      for (int k = 1; k <= kPieces; ++k) cur.push_back(MavikMath::CubicBezier::Evaluate(q, double(k) / kPieces));
    }
  }
  if (cur.size() > 2) out.push_back(cur);
  return out;
}

std::vector<Polygon> Flatten(Geom::PathVector const& pv) {
  std::vector<Polygon> out;
  for (Geom::Path const& path : pv) {
    Polygon cur;
    for (Geom::Curve const& curve : path) {
      if (auto const* cubic = dynamic_cast<Geom::CubicBezier const*>(&curve)) {
        V q[4];
        for (int k = 0; k < 4; ++k) q[k] = V{(*cubic)[k][Geom::X], (*cubic)[k][Geom::Y]};
        for (int k = 1; k <= kPieces; ++k) cur.push_back(MavikMath::CubicBezier::Evaluate(q, double(k) / kPieces));
      } else {
        const Geom::Point e = curve.finalPoint();
        cur.push_back(V{e[Geom::X], e[Geom::Y]});
      }
    }
    if (cur.size() > 2) out.push_back(cur);
  }
  return out;
}

void Compare(benchmark::State& state, PolycurveD const& a, PolycurveD const& b, WeldFlags flags) {
  const Geom::PathVector ga = ToGeom(a), gb = ToGeom(b);
  double ours = 0, theirs = 0;
  PolycurveD r;
  Geom::PathVector gr;
  int failed = 0;
  for (auto _ : state) {
    const auto t0 = std::chrono::steady_clock::now();
    r = PolycurveD::Union(a, b, true, true, flags);
    const auto t1 = std::chrono::steady_clock::now();
    try {
      Geom::PathIntersectionGraph graph(ga, gb);
      gr = graph.getUnion();
    } catch (...) {
      // lib2geom reports inputs it cannot handle by an exception.
      ++failed;
      gr.clear();
    }
    const auto t2 = std::chrono::steady_clock::now();
    ours += std::chrono::duration<double, std::milli>(t1 - t0).count();
    theirs += std::chrono::duration<double, std::milli>(t2 - t1).count();
    benchmark::DoNotOptimize(r);
    benchmark::DoNotOptimize(gr);
  }
  const double n = double(state.iterations());
  state.counters["lib2geom_failed"] = failed;
  state.counters["ours_ms"] = ours / n;
  state.counters["lib2geom_ms"] = theirs / n;
  state.counters["ratio"] = ours / theirs;
  const double ao = EvenOddArea(Flatten(r)), at = EvenOddArea(Flatten(gr));
  state.counters["area_diff"] = std::fabs(ao - at) / std::max({ao, at, 1e-300});
  state.counters["segments"] = a.GetNumberOfSegments() + b.GetNumberOfSegments();
}

void BM_UnionDiscAndStar(benchmark::State& state) {
  Compare(state, Disc(), Star(), state.range(0) ? WeldFlags::Precise : WeldFlags::None);
}
BENCHMARK(BM_UnionDiscAndStar)->ArgName("precise")->Arg(0)->Arg(1)->Unit(benchmark::kMicrosecond);

void BM_UnionPolygonTurned(benchmark::State& state) {
  const int n = int(state.range(0));
  Compare(state, Outline(n, V{0, 0}, 10.0 * n, 0, false), Outline(n, V{0, 0}, 10.0 * n, M_PI / n, false),
          state.range(1) ? WeldFlags::Precise : WeldFlags::None);
}
BENCHMARK(BM_UnionPolygonTurned)
    ->ArgNames({"n", "precise"})
    ->ArgsProduct({{100, 1000, 10000}, {0, 1}})
    ->Unit(benchmark::kMillisecond);

void BM_UnionBezierTurned(benchmark::State& state) {
  const int n = int(state.range(0));
  Compare(state, Outline(n, V{0, 0}, 10.0 * n, 0, true), Outline(n, V{0, 0}, 10.0 * n, M_PI / n, true),
          state.range(1) ? WeldFlags::Precise : WeldFlags::None);
}
BENCHMARK(BM_UnionBezierTurned)
    ->ArgNames({"n", "precise"})
    ->ArgsProduct({{100, 1000, 10000}, {0, 1}})
    ->Unit(benchmark::kMillisecond);

void BM_UnionPlateAndBand(benchmark::State& state) {
  const int n = int(state.range(0));
  Compare(state, Plate(n), Band(n), state.range(1) ? WeldFlags::Precise : WeldFlags::None);
}
BENCHMARK(BM_UnionPlateAndBand)
    ->ArgNames({"n", "precise"})
    ->ArgsProduct({{100, 1000, 10000}, {0, 1}})
    ->Unit(benchmark::kMillisecond);

}  // namespace
