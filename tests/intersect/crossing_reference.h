// An independent reference for the crossings of two segments (lines or
// Beziers): both are flattened into fine polylines, the polylines are
// intersected piece by piece, and each hit is polished by Newton's method on
// the Bernstein form. A case is declared ambiguous (and skipped by the
// tests) when the reference cannot be sure: a hit that does not converge, two
// crossings close together, a grazing crossing, a crossing near an end, an
// end close to the other curve, or a near miss away from every crossing.
#pragma once

#include <cmath>
#include <optional>
#include <vector>

#include "core/path_geometry.h"

namespace crossing_ref {

using MavikMath::V;

struct Seg {
  std::vector<V> p;  // 2 points for a line, 4 for a Bezier
  V At(double t) const {
    if (p.size() == 2) return V{p[0].x + (p[1].x - p[0].x) * t, p[0].y + (p[1].y - p[0].y) * t};
    return testgeo::Bezier(p.data(), t);
  }
  V Derivative(double t) const {
    if (p.size() == 2) return V{p[1].x - p[0].x, p[1].y - p[0].y};
    const double s = 1.0 - t;
    const double d0 = 3 * s * s, d1 = 6 * s * t, d2 = 3 * t * t;
    return V{d0 * (p[1].x - p[0].x) + d1 * (p[2].x - p[1].x) + d2 * (p[3].x - p[2].x),
             d0 * (p[1].y - p[0].y) + d1 * (p[2].y - p[1].y) + d2 * (p[3].y - p[2].y)};
  }
  int Pieces() const { return p.size() == 2 ? 1 : 400; }
};

struct Crossing {
  double s, u;  // on the first and the second segment
  V point;
};

inline double Len(const V& v) { return std::hypot(v.x, v.y); }
inline double Dist(const V& a, const V& b) { return std::hypot(a.x - b.x, a.y - b.y); }

// Newton's method on A(s) = B(u).
inline std::optional<Crossing> Polish(const Seg& a, const Seg& b, double s, double u) {
  for (int it = 0; it < 40; ++it) {
    const V pa = a.At(s), pb = b.At(u);
    const V da = a.Derivative(s), db = b.Derivative(u);
    const double fx = pa.x - pb.x, fy = pa.y - pb.y;
    const double det = -da.x * db.y + da.y * db.x;
    if (std::fabs(det) < 1e-300) return std::nullopt;
    // [da, -db] (ds, du) = -f
    const double ds = (-fx * -db.y - -db.x * -fy) / det;
    const double du = (da.x * -fy - da.y * -fx) / det;
    s += ds;
    u += du;
    if (!(s > -0.01 && s < 1.01 && u > -0.01 && u < 1.01)) return std::nullopt;
    if (std::fabs(ds) < 1e-15 && std::fabs(du) < 1e-15) break;
  }
  if (Dist(a.At(s), b.At(u)) > 1e-9 * (1 + Len(a.At(s)))) return std::nullopt;
  return Crossing{s, u, a.At(s)};
}

struct Result {
  bool ambiguous = false;
  std::vector<Crossing> crossings;
};

// margin: how far (in distance) crossings must stay from ends and from each
// other, and ends from the other curve, for the case to be clear.
inline Result Crossings(const Seg& a, const Seg& b, double margin) {
  Result r;
  const int na = a.Pieces(), nb = b.Pieces();
  std::vector<V> pa(na + 1), pb(nb + 1);
  for (int i = 0; i <= na; ++i) pa[i] = a.At(double(i) / na);
  for (int j = 0; j <= nb; ++j) pb[j] = b.At(double(j) / nb);
  for (int i = 0; i < na; ++i) {
    const V a0 = pa[i], a1 = pa[i + 1];
    for (int j = 0; j < nb; ++j) {
      const V b0 = pb[j], b1 = pb[j + 1];
      const double dax = a1.x - a0.x, day = a1.y - a0.y, dbx = b1.x - b0.x, dby = b1.y - b0.y;
      const double c = dax * dby - day * dbx;
      if (c == 0) continue;
      const double wx = a0.x - b0.x, wy = a0.y - b0.y;
      const double v = (dbx * wy - dby * wx) / c, w = (dax * wy - day * wx) / c;
      if (v < -1e-9 || v > 1 + 1e-9 || w < -1e-9 || w > 1 + 1e-9) continue;
      const auto x = Polish(a, b, (i + v) / na, (j + w) / nb);
      if (!x) {
        r.ambiguous = true;
        return r;
      }
      bool known = false;
      for (const Crossing& k : r.crossings) known = known || Dist(k.point, x->point) < 1e-6;
      if (!known) r.crossings.push_back(*x);
    }
  }
  // Clear cases only.
  const V ends[4] = {a.At(0), a.At(1), b.At(0), b.At(1)};
  for (size_t k = 0; k < r.crossings.size(); ++k) {
    const Crossing& x = r.crossings[k];
    for (const V& e : ends)
      if (Dist(e, x.point) < margin) r.ambiguous = true;
    for (size_t m = k + 1; m < r.crossings.size(); ++m)
      if (Dist(x.point, r.crossings[m].point) < margin) r.ambiguous = true;
    const V da = a.Derivative(x.s), db = b.Derivative(x.u);
    const double sine = std::fabs(da.x * db.y - da.y * db.x) / (Len(da) * Len(db) + 1e-300);
    if (sine < 0.2) r.ambiguous = true;
  }
  // Ends near the other curve, and near misses away from the crossings.
  auto nearestOn = [](const std::vector<V>& poly, const V& q) {
    double best = 1e300;
    for (size_t j = 0; j + 1 < poly.size(); ++j) {
      const V d{poly[j + 1].x - poly[j].x, poly[j + 1].y - poly[j].y};
      const double l = d.x * d.x + d.y * d.y;
      double t = l > 0 ? ((q.x - poly[j].x) * d.x + (q.y - poly[j].y) * d.y) / l : 0;
      t = std::fmin(1, std::fmax(0, t));
      best = std::fmin(best, Dist(q, V{poly[j].x + d.x * t, poly[j].y + d.y * t}));
    }
    return best;
  };
  if (nearestOn(pb, ends[0]) < margin || nearestOn(pb, ends[1]) < margin || nearestOn(pa, ends[2]) < margin ||
      nearestOn(pa, ends[3]) < margin)
    r.ambiguous = true;
  for (int i = 0; i <= na && !r.ambiguous; i += (na > 1 ? 4 : 1)) {
    if (nearestOn(pb, pa[i]) > margin) continue;
    bool nearCrossing = false;
    for (const Crossing& x : r.crossings) nearCrossing = nearCrossing || Dist(x.point, pa[i]) < 10 * margin;
    if (!nearCrossing) r.ambiguous = true;
  }
  return r;
}

}  // namespace crossing_ref
