// Random paths with coordinates, and independent references for measuring
// them: the Bernstein evaluation of path_geometry.h (not the library's), dense
// sampling of every segment, and the subpath structure recorded when the path
// was made (random_paths.h).
#pragma once

#include <cmath>
#include <random>
#include <vector>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace sampled {

using Framework::common_types::POINT;
using MavikMath::V;

// The point at t of the segment recorded in seg.
template <class T>
V SegmentPoint(const std::vector<T>& pts, const testpaths::Segment& seg, double t) {
  if (seg.bezier) return testgeo::Bezier(pts.data() + seg.start, t);
  const V a = MavikMath::ToV(pts[seg.start]), b = MavikMath::ToV(pts[seg.end]);
  return V{a.x + (b.x - a.x) * t, a.y + (b.y - a.y) * t};
}

template <class T>
struct Path {
  testpaths::Path shape;
  std::vector<T> points;
  OstraCrv::PolycurveT<T> curve;
};

// A random valid path with coordinates in -range..range.
template <class T>
Path<T> Make(std::mt19937& rng, int range = 1000, int maxSubpaths = 4, int maxSegments = 6) {
  Path<T> p;
  p.shape = testpaths::Make(rng, maxSubpaths, maxSegments);
  std::uniform_int_distribution<int> coord(-range, range);
  p.points.resize(p.shape.nodes.size());
  for (auto& q : p.points) q = T{decltype(q.x)(coord(rng)), decltype(q.y)(coord(rng))};
  // A closed subpath ends where it starts.
  for (const auto& sp : p.shape.subpaths)
    if (sp.closed) p.points[sp.last] = p.points[sp.first];
  p.curve = OstraCrv::PolycurveT<T>(p.points.data(), p.shape.nodes.data(), p.points.size());
  return p;
}

// Samples of segment seg at `steps` equal parameter steps (steps + 1 points).
template <class T>
std::vector<V> Sample(const Path<T>& p, const testpaths::Segment& seg, int steps) {
  std::vector<V> out;
  out.reserve(steps + 1);
  for (int k = 0; k <= steps; ++k) out.push_back(SegmentPoint(p.points, seg, double(k) / steps));
  return out;
}

}  // namespace sampled
