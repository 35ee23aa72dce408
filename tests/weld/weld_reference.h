// Independent references for the welding tests: flattening, winding numbers
// on the flattened polygons, the area of a set of non-crossing loops under
// the even-odd rule, a crossing check, random shapes and the corpora.
#pragma once

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "polycurve.h"
#include "ostracrv/weld/weldstate.h"

namespace weldtest {

using MavikMath::V;
using OstraCrv::PolycurveD;
using Poly = std::vector<V>;

// Closed subpaths as polygons; each Bezier as `pieces` chords.
template <class T>
std::vector<Poly> Flatten(OstraCrv::PolycurveT<T> const& c, int pieces = 48) {
  std::vector<Poly> out;
  const int n = int(c.GetPointCount());
  Poly cur;
  bool closed = false;
  auto finish = [&] {
    if (closed && cur.size() >= 3) out.push_back(cur);
    cur.clear();
  };
  for (int i = 0; i < n; ++i) {
    const NODETYPE b = c.GetNodeType(i);
    const V p = MavikMath::ToV(c.GetPoint(i));
    if (IsMove(b)) {
      finish();
      closed = IsClosedNode(b);
      cur.push_back(p);
    } else if (IsLine(b)) {
      cur.push_back(p);
    } else if (IsCurve(b) && i >= 3) {
      V q[4];
      for (int k = 0; k < 4; ++k) q[k] = MavikMath::ToV(c.GetPoint(i - 3 + k));
      for (int k = 1; k <= pieces; ++k) cur.push_back(MavikMath::CubicBezier::Evaluate(q, double(k) / pieces));
    }
  }
  finish();
  return out;
}

// Winding number and crossing count of a horizontal ray to +x.
inline void Wind(std::vector<Poly> const& polys, V p, int& winding, int& crossings) {
  winding = crossings = 0;
  for (Poly const& poly : polys)
    for (size_t i = 0; i < poly.size(); ++i) {
      const V a = poly[i], b = poly[(i + 1) % poly.size()];
      if ((a.y <= p.y) == (b.y <= p.y)) continue;
      const double x = a.x + (p.y - a.y) * (b.x - a.x) / (b.y - a.y);
      if (x <= p.x) continue;
      ++crossings;
      winding += b.y > a.y ? 1 : -1;
    }
}

inline bool Inside(std::vector<Poly> const& polys, V p, bool nonZero) {
  int w, c;
  Wind(polys, p, w, c);
  return nonZero ? w != 0 : (c & 1) != 0;
}

// The same winding test with the edges sorted into horizontal bands, for
// many queries against large polygon sets.
class RayIndex {
 public:
  explicit RayIndex(std::vector<Poly> const& polys) {
    for (Poly const& poly : polys)
      for (size_t i = 0; i < poly.size(); ++i) {
        const V a = poly[i], b = poly[(i + 1) % poly.size()];
        if (a.y == b.y) continue;
        edges_.push_back({a, b});
        lo_ = std::fmin(lo_, std::fmin(a.y, b.y));
        hi_ = std::fmax(hi_, std::fmax(a.y, b.y));
      }
    bands_.resize(std::max<size_t>(1, edges_.size() / 4));
    for (size_t e = 0; e < edges_.size(); ++e) {
      const auto [a, b] = edges_[e];
      for (size_t k = Band(std::fmin(a.y, b.y)); k <= Band(std::fmax(a.y, b.y)); ++k) bands_[k].push_back(e);
    }
  }
  bool Inside(V p, bool nonZero) const {
    if (edges_.empty() || !(p.y >= lo_ && p.y <= hi_)) return false;
    int winding = 0, crossings = 0;
    for (size_t e : bands_[Band(p.y)]) {
      const auto [a, b] = edges_[e];
      if ((a.y <= p.y) == (b.y <= p.y)) continue;
      if (a.x + (p.y - a.y) * (b.x - a.x) / (b.y - a.y) <= p.x) continue;
      ++crossings;
      winding += b.y > a.y ? 1 : -1;
    }
    return nonZero ? winding != 0 : (crossings & 1) != 0;
  }

 private:
  size_t Band(double y) const {
    const double f = (y - lo_) / (hi_ - lo_) * double(bands_.size());
    return size_t(std::clamp(f, 0.0, double(bands_.size() - 1)));
  }
  std::vector<std::pair<V, V>> edges_;
  std::vector<std::vector<size_t>> bands_;
  double lo_ = INFINITY, hi_ = -INFINITY;
};

inline double SegmentDistance(V p, V a, V b) {
  const double dx = b.x - a.x, dy = b.y - a.y, l2 = dx * dx + dy * dy;
  double t = l2 > 0 ? ((p.x - a.x) * dx + (p.y - a.y) * dy) / l2 : 0.0;
  t = std::fmax(0.0, std::fmin(1.0, t));
  return std::hypot(a.x + t * dx - p.x, a.y + t * dy - p.y);
}

inline double Distance(std::vector<Poly> const& polys, V p) {
  double d = INFINITY;
  for (Poly const& poly : polys)
    for (size_t i = 0; i < poly.size(); ++i) d = std::fmin(d, SegmentDistance(p, poly[i], poly[(i + 1) % poly.size()]));
  return d;
}

// The box of the flattened outlines of one or two operands.
inline MavikMath::BoundsT<double> Box(std::vector<Poly> const& a, std::vector<Poly> const& b = {}) {
  MavikMath::BoundsT<double> box;
  for (auto const* polys : {&a, &b})
    for (Poly const& poly : *polys)
      for (V p : poly) box.Add(p);
  return box;
}

// The area filled under the even-odd rule by loops that do not cross each
// other (they may touch, and a loop may touch itself): by Green's theorem,
// the sum over all segments of the integral of (x dy - y dx) / 2, each
// counted with the side on which the filling lies (+1 on the left, -1 on the
// right, 0 where neither or both sides are filled), tested by parity just
// beside the segment's middle. Exact for lines and cubics (three-point
// Gauss-Legendre integrates the quintic integrand exactly) whatever the
// loops' directions.
template <class T>
double EvenOddArea(OstraCrv::PolycurveT<T> const& c) {
  const auto flat = Flatten(c, 64);
  const RayIndex index(flat);
  MavikMath::BoundsT<double> box;
  for (auto const& poly : flat)
    for (V p : poly) box.Add(p);
  if (box.IsEmpty()) return 0.0;
  const double eps = std::fmax(0.02, 1e-6 * std::fmax(box.Width(), box.Height()));
  static const double gx[3] = {0.5 - 0.5 * std::sqrt(0.6), 0.5, 0.5 + 0.5 * std::sqrt(0.6)};
  static const double gw[3] = {5.0 / 18, 8.0 / 18, 5.0 / 18};
  // Per loop: each segment's integral, side (0 where the test is
  // ambiguous, as on a stub shorter than the offset; such a segment takes
  // the side of its neighbour in the loop) and end points. Where the side
  // changes along a loop, the loop touches itself there (two lobes of
  // opposite turn); each run of one side is closed by a chord from its end
  // to its start, so that a touch missed by a tolerance-sized gap costs only
  // the sliver between the two ends, not a term that grows with the
  // distance from the origin.
  struct Piece {
    double g;
    int side;
    V from, to;
  };
  double sum = 0;
  std::vector<Piece> loop;
  auto chord = [](V a, V b) { return 0.5 * (a.x * b.y - b.x * a.y); };
  auto finish = [&] {
    const size_t m = loop.size();
    for (size_t k = 0; k < m; ++k)
      for (size_t d = 1; loop[k].side == 0 && d < m; ++d)
        loop[k].side = loop[(k + d) % m].side != 0 ? loop[(k + d) % m].side : loop[(k + m - d) % m].side;
    size_t start = 0;
    while (start < m && loop[start].side == loop[(start + m - 1) % m].side) ++start;
    if (start == m) {
      for (Piece const& p : loop) sum += p.side * p.g;
    } else {
      for (size_t k = 0; k < m;) {
        const Piece& first = loop[(start + k) % m];
        double run = 0;
        V end = first.from;
        size_t j = k;
        for (; j < m && loop[(start + j) % m].side == first.side; ++j) {
          run += loop[(start + j) % m].g;
          end = loop[(start + j) % m].to;
        }
        sum += first.side * (run + chord(end, first.from));
        k = j;
      }
    }
    loop.clear();
  };
  const int n = int(c.GetPointCount());
  bool closed = false;
  for (int i = 0; i < n; ++i) {
    const NODETYPE b = c.GetNodeType(i);
    if (IsMove(b)) {
      finish();
      closed = IsClosedNode(b);
      continue;
    }
    if (!closed) continue;
    double g = 0;
    V mid, dir;
    if (IsLine(b)) {
      const V p0 = MavikMath::ToV(c.GetPoint(i - 1)), p1 = MavikMath::ToV(c.GetPoint(i));
      g = 0.5 * (p0.x * p1.y - p1.x * p0.y);
      mid = MavikMath::Lerp(p0, p1, 0.5);
      dir = V{p1.x - p0.x, p1.y - p0.y};
    } else if (IsCurve(b) && i >= 3) {
      V q[4];
      for (int k = 0; k < 4; ++k) q[k] = MavikMath::ToV(c.GetPoint(i - 3 + k));
      const auto pb = MavikMath::CubicBezier::GetPowerBasis(q);
      for (int k = 0; k < 3; ++k) {
        const V p = MavikMath::CubicBezier::Evaluate(q, gx[k]);
        const MavikMath::D d = MavikMath::CubicBezier::Derivative(pb.a, pb.b, pb.c, gx[k]);
        g += gw[k] * 0.5 * (p.x * d.y - p.y * d.x);
      }
      mid = MavikMath::CubicBezier::Evaluate(q, 0.5);
      const MavikMath::D d = MavikMath::CubicBezier::Derivative(pb.a, pb.b, pb.c, 0.5);
      dir = V{d.x, d.y};
    } else {
      continue;
    }
    const double len = std::hypot(dir.x, dir.y);
    const V from = MavikMath::ToV(c.GetPoint(IsLine(b) ? i - 1 : i - 3)), to = MavikMath::ToV(c.GetPoint(i));
    if (!(len > 0)) {
      loop.push_back({g, 0, from, to});
      continue;
    }
    const double off = std::fmin(eps, 0.25 * MavikMath::Distance(from, to));
    const V nrm{-dir.y / len * off, dir.x / len * off};
    const bool left = index.Inside(V{mid.x + nrm.x, mid.y + nrm.y}, false);
    const bool right = index.Inside(V{mid.x - nrm.x, mid.y - nrm.y}, false);
    loop.push_back({g, left == right ? 0 : (left ? 1 : -1), from, to});
  }
  finish();
  return sum;
}

// Proper crossings between edges of the flattened loops (touching at end
// points or within `slack` does not count).
inline int ProperCrossings(std::vector<Poly> const& polys, double slack) {
  struct Seg {
    V a, b;
  };
  std::vector<Seg> segs;
  for (Poly const& p : polys)
    for (size_t i = 0; i < p.size(); ++i) segs.push_back({p[i], p[(i + 1) % p.size()]});
  auto orient = [](V a, V b, V c) { return (b.x - a.x) * (c.y - a.y) - (b.y - a.y) * (c.x - a.x); };
  int count = 0;
  for (size_t i = 0; i < segs.size(); ++i)
    for (size_t j = i + 1; j < segs.size(); ++j) {
      const Seg &s = segs[i], &t = segs[j];
      if (std::fmax(s.a.x, s.b.x) < std::fmin(t.a.x, t.b.x) || std::fmax(t.a.x, t.b.x) < std::fmin(s.a.x, s.b.x) ||
          std::fmax(s.a.y, s.b.y) < std::fmin(t.a.y, t.b.y) || std::fmax(t.a.y, t.b.y) < std::fmin(s.a.y, s.b.y))
        continue;
      const double ls = std::hypot(s.b.x - s.a.x, s.b.y - s.a.y), lt = std::hypot(t.b.x - t.a.x, t.b.y - t.a.y);
      const double d1 = orient(s.a, s.b, t.a) / ls, d2 = orient(s.a, s.b, t.b) / ls;
      const double d3 = orient(t.a, t.b, s.a) / lt, d4 = orient(t.a, t.b, s.b) / lt;
      if (((d1 > slack && d2 < -slack) || (d1 < -slack && d2 > slack)) &&
          ((d3 > slack && d4 < -slack) || (d3 < -slack && d4 > slack)))
        ++count;
    }
  return count;
}

// Every subpath closed, and the node rules hold.
template <class T>
bool AllClosedAndValid(OstraCrv::PolycurveT<T> const& c) {
  if (!OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount())) return false;
  for (unsigned long i = 0; i < c.GetPointCount(); ++i)
    if (IsMove(c.GetNodeType(int(i))) && !c.IsClosed(int(i))) return false;
  for (unsigned long i = 0; i < c.GetPointCount(); ++i) {
    const V p = MavikMath::ToV(c.GetPoint(int(i)));
    if (!std::isfinite(p.x) || !std::isfinite(p.y)) return false;
  }
  return true;
}

// A closed loop through the points (lines).
inline PolycurveD Loop(std::vector<V> const& pts) {
  PolycurveD c;
  if (pts.empty()) return c;
  c.MoveTo(pts[0]);
  for (size_t i = 1; i < pts.size(); ++i) c.LineTo(pts[i]);
  c.LineTo(pts[0]);
  c.CloseLastSubpath(0.0, false);
  return c;
}

inline PolycurveD Rect(double l, double b, double r, double t, bool clockwise = true) {
  return clockwise ? Loop({{l, t}, {r, t}, {r, b}, {l, b}}) : Loop({{l, t}, {l, b}, {r, b}, {r, t}});
}

// A star-shaped blob of k vertices round c, radii in [0.55 R, R]; with
// curves, each side is a Bezier whose handles stray a little off the chord.
inline PolycurveD Blob(std::mt19937& rng, V c, double R, int k, bool curved, bool clockwise) {
  std::uniform_real_distribution<double> u(0.0, 1.0);
  std::vector<double> angles(size_t(k), 0.0);
  for (int i = 0; i < k; ++i) angles[size_t(i)] = 2 * M_PI * (i + 0.15 + 0.7 * u(rng)) / k;
  if (clockwise) std::reverse(angles.begin(), angles.end());
  std::vector<V> p;
  for (double a : angles) {
    const double r = R * (0.55 + 0.45 * u(rng));
    p.push_back(V{c.x + r * std::cos(a), c.y + r * std::sin(a)});
  }
  if (!curved) return Loop(p);
  PolycurveD out;
  out.MoveTo(p[0]);
  for (size_t i = 0; i < p.size(); ++i) {
    const V a = p[i], b = p[(i + 1) % p.size()];
    const V d{b.x - a.x, b.y - a.y};
    const V n{-d.y, d.x};
    const double s1 = 0.3 * (u(rng) - 0.5), s2 = 0.3 * (u(rng) - 0.5);
    out.CubicTo(V{a.x + d.x / 3 + s1 * n.x, a.y + d.y / 3 + s1 * n.y},
                V{a.x + 2 * d.x / 3 + s2 * n.x, a.y + 2 * d.y / 3 + s2 * n.y}, b);
  }
  out.CloseLastSubpath(0.0, false);
  return out;
}

// A random polygon with vertices anywhere in a box: it crosses itself.
inline PolycurveD Scribble(std::mt19937& rng, V c, double R, int k) {
  std::uniform_real_distribution<double> u(-1.0, 1.0);
  std::vector<V> p;
  for (int i = 0; i < k; ++i) p.push_back(V{c.x + R * u(rng), c.y + R * u(rng)});
  return Loop(p);
}

// Path data of a curve, for failure messages and regression files.
template <class T>
std::string Svg(OstraCrv::PolycurveT<T> const& c) {
  std::string out;
  OstraCrv::PolycurveD d(c);
  for (unsigned long i = 0; i < d.GetPointCount(); ++i)
    d.SetNodeType(int(i), NODETYPE(d.GetNodeType(int(i)) & ~(NodeMask::kEnabled | NodeMask::kContinuity)));
  if (!OstraCrv::WriteSvgPathData(d, out)) return "(unwritable)";
  return out;
}

inline PolycurveD Join(PolycurveD a, PolycurveD const& b) {
  a.PushBack(b);
  return a;
}

// A text file of the corpora folder, empty if it is missing.
inline std::filesystem::path CorporaDir() {
#ifdef OSTRACRV_CORPORA
  return std::filesystem::path(OSTRACRV_CORPORA);
#else
  return std::filesystem::path("/nonexistent");
#endif
}

inline std::string ReadFile(std::filesystem::path const& p) {
  std::ifstream in(p);
  std::stringstream ss;
  ss << in.rdbuf();
  return ss.str();
}

}  // namespace weldtest
