// Independent references for the fitting and offset tests: Bezier points and
// derivatives straight from the Bernstein form, and point-to-curve distance by
// dense sampling plus ternary refinement.
#pragma once

#include <algorithm>
#include <cmath>
#include <functional>
#include <vector>

#include "ostracrv/math/vector2d.h"

namespace fitref {

using MavikMath::D;
using MavikMath::V;

inline V Point(const V* p, double t) {
  const double s = 1 - t, b0 = s * s * s, b1 = 3 * s * s * t, b2 = 3 * s * t * t, b3 = t * t * t;
  return V{b0 * p[0].x + b1 * p[1].x + b2 * p[2].x + b3 * p[3].x, b0 * p[0].y + b1 * p[1].y + b2 * p[2].y + b3 * p[3].y};
}
inline D Deriv(const V* p, double t) {
  const double s = 1 - t;
  return (p[1] - p[0]) * (3 * s * s) + (p[2] - p[1]) * (6 * s * t) + (p[3] - p[2]) * (3 * t * t);
}
inline D Deriv2(const V* p, double t) {
  return D{6 * ((1 - t) * (p[2].x - 2 * p[1].x + p[0].x) + t * (p[3].x - 2 * p[2].x + p[1].x)),
           6 * ((1 - t) * (p[2].y - 2 * p[1].y + p[0].y) + t * (p[3].y - 2 * p[2].y + p[1].y))};
}
// Signed curvature, positive turning left.
inline double Curvature(const V* p, double t) {
  const D d1 = Deriv(p, t);
  return MavikMath::Cross(d1, Deriv2(p, t)) / std::pow(d1.SquaredLength(), 1.5);
}

// Smallest squared distance from q to the curve c(t), t in [0, 1].
inline double DistanceSq(const std::function<V(double)>& c, const V& q, int samples = 2000) {
  double best = 1e300, bt = 0;
  for (int i = 0; i <= samples; ++i) {
    const double t = double(i) / samples, d = MavikMath::SquaredDistance(c(t), q);
    if (d < best) best = d, bt = t;
  }
  double lo = std::max(0.0, bt - 1.0 / samples), hi = std::min(1.0, bt + 1.0 / samples);
  for (int k = 0; k < 100; ++k) {
    const double a = lo + (hi - lo) / 3, b = hi - (hi - lo) / 3;
    if (MavikMath::SquaredDistance(c(a), q) < MavikMath::SquaredDistance(c(b), q)) hi = b; else lo = a;
  }
  return std::min(best, MavikMath::SquaredDistance(c(0.5 * (lo + hi)), q));
}
inline double DistanceSq(const V* bez, const V& q) {
  return DistanceSq([bez](double t) { return Point(bez, t); }, q);
}

// Parameters in (0, 1) where f changes sign, found on a fine grid and refined
// by bisection.
inline std::vector<double> SignChanges(const std::function<double(double)>& f, int grid = 20000) {
  std::vector<double> r;
  double prev = f(0);
  for (int i = 1; i <= grid; ++i) {
    const double t = double(i) / grid, v = f(t);
    if ((v < 0) != (prev < 0) && std::isfinite(v) && std::isfinite(prev)) {
      double lo = double(i - 1) / grid, hi = t;
      for (int k = 0; k < 60; ++k) {
        const double m = 0.5 * (lo + hi);
        ((f(m) < 0) == (prev < 0) ? lo : hi) = m;
      }
      r.push_back(0.5 * (lo + hi));
    }
    prev = v;
  }
  return r;
}

}  // namespace fitref
