// Independent geometry of raw paths for tests: Bezier points straight from
// the Bernstein polynomials, fine flattenings, shoelace areas and lengths,
// radial errors against an ellipse, and points for the random node arrays of
// random_paths.h. Nothing here calls the library's geometry, so that tests
// compare against a second method; only the curve makers at the end build
// curves through the library's plain appends.
#pragma once

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <set>
#include <vector>

#include "core/random_paths.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"
#include "polycurve.h"

namespace testgeo {

using MavikMath::V;

inline V Widen(const Framework::common_types::POINT& p) { return V{double(p.x), double(p.y)}; }
inline V Widen(const V& p) { return p; }

// A curve's node bytes, and whether they form a legal path.
template <class C>
std::vector<NODETYPE> NodesOf(const C& c) {
  return {c.GetNodeTypes(), c.GetNodeTypes() + c.GetPointCount()};
}
template <class C>
bool Valid(const C& c) {
  return OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount());
}

// The cubic through p0..p3 at t from its Bernstein form.
inline V Bezier(const V& p0, const V& p1, const V& p2, const V& p3, double t) {
  const double s = 1.0 - t;
  const double b0 = s * s * s, b1 = 3 * s * s * t, b2 = 3 * s * t * t, b3 = t * t * t;
  return V{b0 * p0.x + b1 * p1.x + b2 * p2.x + b3 * p3.x, b0 * p0.y + b1 * p1.y + b2 * p2.y + b3 * p3.y};
}
template <class T>
V Bezier(const T* p, double t) {
  return Bezier(Widen(p[0]), Widen(p[1]), Widen(p[2]), Widen(p[3]), t);
}

// One polyline per subpath; each Bezier contributes `steps` chords.
template <class T>
std::vector<std::vector<V>> Flatten(const T* pts, const NODETYPE* nds, int n, int steps = 256) {
  std::vector<std::vector<V>> out;
  for (int i = 0; i < n; ++i) {
    if (IsMove(nds[i]) || out.empty()) {
      out.emplace_back();
      out.back().push_back(Widen(pts[i]));
      continue;
    }
    if (IsLine(nds[i])) out.back().push_back(Widen(pts[i]));
    if (IsCurve(nds[i]) && i >= 3) {
      const V p0 = Widen(pts[i - 3]), p1 = Widen(pts[i - 2]), p2 = Widen(pts[i - 1]), p3 = Widen(pts[i]);
      for (int k = 1; k <= steps; ++k) out.back().push_back(Bezier(p0, p1, p2, p3, double(k) / steps));
    }
  }
  return out;
}

// Area of the closed ring, positive for a clockwise ring with y up.
inline double ClockwiseArea(const std::vector<V>& ring) {
  double s = 0.0;
  for (size_t i = 0; i + 1 < ring.size(); ++i) s += ring[i].x * ring[i + 1].y - ring[i + 1].x * ring[i].y;
  if (!ring.empty()) s += ring.back().x * ring.front().y - ring.front().x * ring.back().y;
  return -0.5 * s;
}

template <class T>
double ClockwiseArea(const T* pts, const NODETYPE* nds, int n) {
  double a = 0.0;
  for (const auto& ring : Flatten(pts, nds, n)) a += ClockwiseArea(ring);
  return a;
}

inline double Length(const std::vector<V>& poly) {
  double l = 0.0;
  for (size_t i = 0; i + 1 < poly.size(); ++i) l += MavikMath::Distance(poly[i], poly[i + 1]);
  return l;
}

template <class T>
double Length(const T* pts, const NODETYPE* nds, int n) {
  double l = 0.0;
  for (const auto& poly : Flatten(pts, nds, n)) l += Length(poly);
  return l;
}

// Distance from q to the nearest chord of a flattening.
inline double DistanceToPolylines(const std::vector<std::vector<V>>& polys, const V& q) {
  double best = std::numeric_limits<double>::infinity();
  for (const auto& poly : polys) {
    if (poly.size() == 1) best = std::min(best, MavikMath::Distance(poly[0], q));
    for (size_t i = 0; i + 1 < poly.size(); ++i) {
      const V a = poly[i], b = poly[i + 1];
      const MavikMath::D ab = b - a;
      const double l2 = ab.SquaredLength();
      double t = l2 > 0 ? MavikMath::Dot(q - a, ab) / l2 : 0.0;
      t = std::clamp(t, 0.0, 1.0);
      best = std::min(best, MavikMath::Distance(a + ab * t, q));
    }
  }
  return best;
}

// Every segment as the list of its point coordinates (2 points for a line, 4
// for a Bezier), so that two paths can be compared as sets of segments,
// whatever their order or start points.
template <class T>
std::multiset<std::vector<double>> SegmentSet(const T* p, const NODETYPE* n, int count) {
  std::multiset<std::vector<double>> out;
  for (int i = 1; i < count; ++i) {
    std::vector<double> s;
    const int from = IsLine(n[i]) ? i - 1 : (IsCurve(n[i]) && i >= 3 ? i - 3 : i);
    if (from == i) continue;
    for (int j = from; j <= i; ++j) {
      s.push_back(Widen(p[j]).x);
      s.push_back(Widen(p[j]).y);
    }
    out.insert(s);
  }
  return out;
}

// The same measures of a whole curve.
template <class C>
double CurveArea(const C& c) {
  return ClockwiseArea(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()));
}
template <class C>
double CurveLength(const C& c) {
  return Length(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()));
}
template <class C>
std::multiset<std::vector<double>> CurveSegments(const C& c) {
  return SegmentSet(c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()));
}

// The point at t on the segment that starts at node s.
template <class T>
V PointAt(const T* p, const NODETYPE* n, int s, double t) {
  if (IsLine(n[s + 1])) {
    const V a = Widen(p[s]), b = Widen(p[s + 1]);
    return V{a.x + t * (b.x - a.x), a.y + t * (b.y - a.y)};
  }
  return Bezier(Widen(p[s]), Widen(p[s + 1]), Widen(p[s + 2]), Widen(p[s + 3]), t);
}

// Largest radial error of the standard quarter-circle Bezier, over the radius.
constexpr double kQuarterError = 2.75e-4;

// Largest radial error, on the unit circle the ellipse round c is mapped from,
// of the samples of a path (a pie's centre skipped).
template <class T>
double MaxUnitRadialError(const T* p, const NODETYPE* nd, int n, V c, double rx, double ry) {
  double worst = 0.0;
  for (const auto& poly : Flatten(p, nd, n, 64))
    for (const V& q : poly) {
      const double r = std::hypot((q.x - c.x) / rx, (q.y - c.y) / ry);
      if (r > 1e-9) worst = std::max(worst, std::fabs(r - 1.0));
    }
  return worst;
}

// Random points for the node array of a random path; each closed subpath
// ends on a copy of its first point, as a closed subpath must.
template <class T>
std::vector<T> PointsFor(const testpaths::Path& path, std::mt19937& rng, double range = 1000.0) {
  std::uniform_real_distribution<double> u(-range, range);
  std::vector<T> pts(path.nodes.size());
  for (auto& p : pts) p = MavikMath::FromV<T>(V{u(rng), u(rng)});
  for (const auto& sp : path.subpaths)
    if (sp.closed) pts[sp.last] = pts[sp.first];
  return pts;
}

// ---- Curve makers for the tests.

// An open polyline through the points.
inline OstraCrv::PolycurveD Polyline(std::initializer_list<V> pts) {
  OstraCrv::PolycurveD c;
  for (const V& p : pts) c.IsEmpty() ? c.MoveTo(p) : c.LineTo(p);
  return c;
}

// A random valid curve, with the record of how it was built in path.
inline OstraCrv::PolycurveD RandomCurve(std::mt19937& rng, testpaths::Path& path, int maxSubpaths = 4,
                                        double range = 1000.0) {
  path = testpaths::Make(rng, maxSubpaths, 5);
  const auto pts = PointsFor<V>(path, rng, range);
  return OstraCrv::PolycurveD(pts.data(), path.nodes.data(), path.nodes.size());
}

}  // namespace testgeo
