// Independent references for the Bezier search tests: explicit Bernstein
// evaluation (not de Casteljau), dense sampling refined by golden section,
// and brute-force box subdivision.
#pragma once

#include <algorithm>
#include <array>
#include <cmath>
#include <random>
#include <vector>

#include "ostracrv/math/vector2d.h"

namespace search_ref {

using MavikMath::V;
using Curve = std::array<V, 4>;

inline V At(const V* p, double t) {
  const double s = 1.0 - t;
  const double b0 = s * s * s, b1 = 3 * s * s * t, b2 = 3 * s * t * t, b3 = t * t * t;
  return V{b0 * p[0].x + b1 * p[1].x + b2 * p[2].x + b3 * p[3].x, b0 * p[0].y + b1 * p[1].y + b2 * p[2].y + b3 * p[3].y};
}
inline V At(const Curve& c, double t) { return At(c.data(), t); }

inline double Dist2(const V& a, const V& b) { return (a.x - b.x) * (a.x - b.x) + (a.y - b.y) * (a.y - b.y); }

// Random control points in [0, size]^2.
inline Curve RandomCurve(std::mt19937& rng, double size = 100.0) {
  std::uniform_real_distribution<double> u(0.0, size);
  return Curve{V{u(rng), u(rng)}, V{u(rng), u(rng)}, V{u(rng), u(rng)}, V{u(rng), u(rng)}};
}

// The curve with power basis a t^3 + b t^2 + c t + d.
inline Curve FromPowerBasis(V a, V b, V c, V d) {
  const V p1{d.x + c.x / 3, d.y + c.y / 3};
  const V p2{p1.x + (b.x + c.x) / 3, p1.y + (b.y + c.y) / 3};
  return Curve{d, p1, p2, V{a.x + b.x + c.x + d.x, a.y + b.y + c.y + d.y}};
}

// A curve with a cusp at t0 (B'(t0) = 0).
inline Curve RandomCusp(std::mt19937& rng, double t0) {
  std::uniform_real_distribution<double> u(-100.0, 100.0);
  const V a{u(rng), u(rng)}, b{u(rng), u(rng)}, d{u(rng), u(rng)};
  // B'(t0) = 3a t0^2 + 2b t0 + c = 0.
  const V c{-(3 * a.x * t0 * t0 + 2 * b.x * t0), -(3 * a.y * t0 * t0 + 2 * b.y * t0)};
  return FromPowerBasis(a, b, c, d);
}

// A curve crossing itself at parameters s < t: a (sigma^2 - pi) + b sigma + c = 0.
inline Curve LoopThrough(std::mt19937& rng, double s, double t) {
  std::uniform_real_distribution<double> u(-100.0, 100.0);
  V a{u(rng), u(rng)};
  const V b{u(rng), u(rng)}, d{u(rng), u(rng)};
  const double sigma = s + t, pi = s * t;
  const V c{-(a.x * (sigma * sigma - pi) + b.x * sigma), -(a.y * (sigma * sigma - pi) + b.y * sigma)};
  return FromPowerBasis(a, b, c, d);
}

// Global minimum of the squared distance by dense sampling and golden
// section around the best samples.
inline double ClosestRef(const Curve& c, const V& target, double* tOut = nullptr) {
  const int n = 4000;
  std::vector<double> d(n + 1);
  for (int i = 0; i <= n; ++i) d[i] = Dist2(At(c, double(i) / n), target);
  double best = 1e300, bestT = 0;
  for (int i = 0; i <= n; ++i) {
    const bool localMin = (i == 0 || d[i] <= d[i - 1]) && (i == n || d[i] <= d[i + 1]);
    if (!localMin) continue;
    double lo = std::max(0.0, double(i - 1) / n), hi = std::min(1.0, double(i + 1) / n);
    const double g = 0.6180339887498949;
    for (int k = 0; k < 80; ++k) {
      const double m1 = hi - g * (hi - lo), m2 = lo + g * (hi - lo);
      if (Dist2(At(c, m1), target) < Dist2(At(c, m2), target)) hi = m2; else lo = m1;
    }
    const double t = 0.5 * (lo + hi);
    for (double cand : {t, double(i) / n}) {
      const double v = Dist2(At(c, cand), target);
      if (v < best) { best = v; bestT = cand; }
    }
  }
  if (tOut) *tOut = bestT;
  return best;
}

// Brute-force intersections: halve the larger piece while the control boxes
// overlap, down to pieces smaller than leaf; leaves are clustered.
struct RefHit {
  double ta, tb;
  double spread;  // parameter extent of the cluster
};

struct RefPiece {
  V p[4];
  double t0, t1;
};

inline void HalvePiece(const RefPiece& in, RefPiece& l, RefPiece& r) {
  const V* p = in.p;
  auto mid = [](V a, V b) { return V{(a.x + b.x) / 2, (a.y + b.y) / 2}; };
  const V q0 = mid(p[0], p[1]), q1 = mid(p[1], p[2]), q2 = mid(p[2], p[3]);
  const V r0 = mid(q0, q1), r1 = mid(q1, q2), s = mid(r0, r1);
  l = RefPiece{{p[0], q0, r0, s}, in.t0, 0.5 * (in.t0 + in.t1)};
  r = RefPiece{{s, r1, q2, p[3]}, 0.5 * (in.t0 + in.t1), in.t1};
}

inline void BoxOf(const V* p, double& lx, double& hx, double& ly, double& hy) {
  lx = hx = p[0].x;
  ly = hy = p[0].y;
  for (int i = 1; i < 4; ++i) {
    lx = std::min(lx, p[i].x); hx = std::max(hx, p[i].x);
    ly = std::min(ly, p[i].y); hy = std::max(hy, p[i].y);
  }
}

// Returns false if the node budget ran out (a near-tangent pair).
inline bool IntersectRef(const Curve& a, const Curve& b, std::vector<RefHit>& hits, double leaf = 1e-11,
                         long budget = 400000) {
  std::vector<std::pair<double, double>> leaves;
  std::vector<std::pair<RefPiece, RefPiece>> stack;
  stack.push_back({RefPiece{{a[0], a[1], a[2], a[3]}, 0, 1}, RefPiece{{b[0], b[1], b[2], b[3]}, 0, 1}});
  long nodes = 0;
  while (!stack.empty()) {
    if (++nodes > budget) return false;
    auto [pa, pb] = stack.back();
    stack.pop_back();
    double alx, ahx, aly, ahy, blx, bhx, bly, bhy;
    BoxOf(pa.p, alx, ahx, aly, ahy);
    BoxOf(pb.p, blx, bhx, bly, bhy);
    if (alx > bhx || blx > ahx || aly > bhy || bly > ahy) continue;
    const double ea = std::max(ahx - alx, ahy - aly), eb = std::max(bhx - blx, bhy - bly);
    if (ea < leaf && eb < leaf) {
      leaves.push_back({0.5 * (pa.t0 + pa.t1), 0.5 * (pb.t0 + pb.t1)});
      continue;
    }
    RefPiece l, r;
    if (ea >= eb) {
      HalvePiece(pa, l, r);
      stack.push_back({l, pb});
      stack.push_back({r, pb});
    } else {
      HalvePiece(pb, l, r);
      stack.push_back({pa, l});
      stack.push_back({pa, r});
    }
  }
  // Cluster leaves that touch in both parameters.
  std::sort(leaves.begin(), leaves.end());
  std::vector<bool> used(leaves.size(), false);
  for (size_t i = 0; i < leaves.size(); ++i) {
    if (used[i]) continue;
    double lo = leaves[i].first, hi = lo, ulo = leaves[i].second, uhi = ulo, sa = 0, sb = 0;
    int n = 0;
    std::vector<size_t> group{i};
    used[i] = true;
    for (size_t g = 0; g < group.size(); ++g) {
      for (size_t j = 0; j < leaves.size(); ++j) {
        if (used[j]) continue;
        if (std::fabs(leaves[j].first - leaves[group[g]].first) < 1e-7 &&
            std::fabs(leaves[j].second - leaves[group[g]].second) < 1e-7) {
          used[j] = true;
          group.push_back(j);
        }
      }
    }
    for (size_t k : group) {
      sa += leaves[k].first;
      sb += leaves[k].second;
      lo = std::min(lo, leaves[k].first);
      hi = std::max(hi, leaves[k].first);
      ulo = std::min(ulo, leaves[k].second);
      uhi = std::max(uhi, leaves[k].second);
      ++n;
    }
    hits.push_back(RefHit{sa / n, sb / n, std::max(hi - lo, uhi - ulo)});
  }
  return true;
}

}  // namespace search_ref
