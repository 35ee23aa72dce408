// Curves and independent references shared by the math tests. Everything
// here works from the control points with explicit Bernstein polynomials,
// dense sampling, bisection and golden section, never through the library's
// power basis, de Casteljau or solvers, so that a test compares two
// independent computations.
#pragma once

#include <algorithm>
#include <array>
#include <cmath>
#include <functional>
#include <limits>
#include <random>
#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace testcurves {

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;
using Curve = std::array<V, 4>;

inline constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
inline constexpr double kInf = std::numeric_limits<double>::infinity();
inline constexpr double kMaxDouble = std::numeric_limits<double>::max();

// ---------------------------------------------------------------- evaluation

inline V At(const V* p, double t) {
  const double s = 1 - t, b0 = s * s * s, b1 = 3 * s * s * t, b2 = 3 * s * t * t, b3 = t * t * t;
  return V{b0 * p[0].x + b1 * p[1].x + b2 * p[2].x + b3 * p[3].x, b0 * p[0].y + b1 * p[1].y + b2 * p[2].y + b3 * p[3].y};
}
inline V At(const Curve& c, double t) { return At(c.data(), t); }

inline D Velocity(const V* p, double t) {
  const double s = 1 - t;
  return (p[1] - p[0]) * (3 * s * s) + (p[2] - p[1]) * (6 * s * t) + (p[3] - p[2]) * (3 * t * t);
}
inline D Acceleration(const V* p, double t) {
  return ((p[2] - p[1]) - (p[1] - p[0])) * (6 * (1 - t)) + ((p[3] - p[2]) - (p[2] - p[1])) * (6 * t);
}
// Signed curvature, positive turning left (y up).
inline double Curvature(const V* p, double t) {
  const D d1 = Velocity(p, t);
  return MavikMath::Cross(d1, Acceleration(p, t)) / std::pow(d1.SquaredLength(), 1.5);
}

// Largest distance of a control point from the start.
inline double Size(const V* p) {
  double m = 0;
  for (int i = 1; i < 4; ++i) m = std::max(m, MavikMath::Distance(p[0], p[i]));
  return m;
}

// ------------------------------------------------------------- constructions

// The curve with power basis a t^3 + b t^2 + c t + d.
inline Curve FromPowerBasis(D a, D b, D c, V d) {
  const V p1 = d + c / 3.0, p2 = p1 + (b + c) / 3.0;
  return Curve{d, p1, p2, V{a.x + b.x + c.x + d.x, a.y + b.y + c.y + d.y}};
}

// A curve with velocity (t - t0)(alpha t + beta): a cusp at t0.
inline void MakeCusp(V p0, double t0, D alpha, D beta, V* p) {
  const Curve c = FromPowerBasis(alpha / 3.0, (beta - alpha * t0) / 2.0, beta * -t0, p0);
  std::copy(c.begin(), c.end(), p);
}

// Random power basis in [-100, 100] with c chosen so that B'(t0) = 0.
inline Curve RandomCusp(std::mt19937& rng, double t0) {
  std::uniform_real_distribution<double> u(-100.0, 100.0);
  const D a{u(rng), u(rng)}, b{u(rng), u(rng)};
  const V d{u(rng), u(rng)};
  return FromPowerBasis(a, b, D{-(3 * a.x * t0 * t0 + 2 * b.x * t0), -(3 * a.y * t0 * t0 + 2 * b.y * t0)}, d);
}

// A curve crossing itself at parameters s < t: a (sigma^2 - pi) + b sigma + c = 0.
inline Curve LoopThrough(std::mt19937& rng, double s, double t) {
  std::uniform_real_distribution<double> u(-100.0, 100.0);
  const D a{u(rng), u(rng)}, b{u(rng), u(rng)};
  const V d{u(rng), u(rng)};
  const double sigma = s + t, pi = s * t;
  return FromPowerBasis(a, b, a * -(sigma * sigma - pi) - b * sigma, d);
}

// Random control points in [lo, hi]^2.
inline Curve RandomCurve(std::mt19937& rng, double lo = 0.0, double hi = 100.0) {
  std::uniform_real_distribution<double> u(lo, hi);
  return Curve{V{u(rng), u(rng)}, V{u(rng), u(rng)}, V{u(rng), u(rng)}, V{u(rng), u(rng)}};
}

// Random integer control points in [-range, range]^2 and their double copy.
inline void RandomIntegerCurve(std::mt19937& rng, int range, POINT* p, V* v) {
  std::uniform_int_distribution<int> u(-range, range);
  for (int k = 0; k < 4; ++k) {
    p[k] = POINT{u(rng), u(rng)};
    v[k] = V{double(p[k].x), double(p[k].y)};
  }
}

// The counter-clockwise quarter circle of radius r around the origin from
// angle quadrant * 90 degrees: the usual handle factor, about 2.7e-4 of r
// outside the circle at its worst.
inline Curve QuarterArc(double r, int quadrant = 0) {
  const double k = 0.5522847498;
  const D s{std::cos(quadrant * M_PI / 2), std::sin(quadrant * M_PI / 2)}, e = s.Perpendicular();
  return Curve{V{} + s * r, V{} + (s + e * k) * r, V{} + (e + s * k) * r, V{} + e * r};
}

// Curves every algorithm must refuse: a NaN and an infinite coordinate, and
// four equal points.
inline const std::array<Curve, 3> kBadCurves = {Curve{V{0, 0}, V{kNaN, 1}, V{2, 2}, V{3, 0}},
                                                Curve{V{0, 0}, V{1, 1}, V{2, kInf}, V{3, 0}},
                                                Curve{V{5, 5}, V{5, 5}, V{5, 5}, V{5, 5}}};

// Random families that stress evaluation: each kind in turn, sizes 0.1 to
// 100 around the origin.
enum class Kind { Ordinary, Cusp, NearCusp, Crossed, CollapsedStart, CollapsedEnd, CollapsedBoth, FoldedLine, Point, Integer };

struct FamilyCurve {
  V p[4];
  Kind kind;
};

inline std::vector<FamilyCurve> RandomCurves(int count, unsigned seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> u(-1, 1), unit(0, 1);
  std::vector<FamilyCurve> out(count);
  for (int i = 0; i < count; ++i) {
    FamilyCurve& c = out[i];
    c.kind = static_cast<Kind>(i % 10);
    const double r = std::pow(10.0, 3 * unit(rng) - 1);
    auto pt = [&] { return V{r * u(rng), r * u(rng)}; };
    auto dir = [&] { return D{r * u(rng), r * u(rng)}; };
    for (V& q : c.p) q = pt();
    switch (c.kind) {
      case Kind::Cusp: case Kind::NearCusp:
        MakeCusp(pt(), 0.1 + 0.8 * unit(rng), dir(), dir(), c.p);
        if (c.kind == Kind::NearCusp) c.p[1].x += r * 1e-7 * u(rng);
        break;
      case Kind::Crossed:  // handles reaching past each other: loops
        c.p[3] = c.p[0] + dir() * 0.2;
        c.p[1] = c.p[3] + dir() * 2.0;
        c.p[2] = c.p[0] + dir() * 2.0;
        break;
      case Kind::CollapsedStart: c.p[1] = c.p[0]; break;
      case Kind::CollapsedEnd: c.p[2] = c.p[3]; break;
      case Kind::CollapsedBoth: c.p[1] = c.p[0], c.p[2] = c.p[3]; break;
      case Kind::FoldedLine: {
        const V o = pt();
        const D d = D{u(rng), u(rng)}.Normalized();
        for (V& q : c.p) q = o + d * (r * u(rng));
        break;
      }
      case Kind::Point: c.p[1] = c.p[2] = c.p[3] = c.p[0]; break;
      case Kind::Integer: for (V& q : c.p) q = V{std::round(q.x * 10), std::round(q.y * 10)}; break;
      default: break;
    }
  }
  return out;
}

// ---------------------------------------------------------------- references

// The argument of the smallest f on [lo, hi] by golden section (f unimodal
// there).
template <class F>
double GoldenMin(F f, double lo, double hi, int iterations = 80) {
  const double g = 0.6180339887498949;
  for (int k = 0; k < iterations; ++k) {
    const double m1 = hi - g * (hi - lo), m2 = lo + g * (hi - lo);
    if (f(m1) < f(m2)) hi = m2; else lo = m1;
  }
  return 0.5 * (lo + hi);
}

// Global minimum over t in [0, 1] of the squared distance from q to the curve
// c(t): every local minimum of dense samples refined by golden section.
inline double NearestSq(const std::function<V(double)>& c, const V& q, double* tOut = nullptr, int n = 4000) {
  std::vector<double> d(n + 1);
  for (int i = 0; i <= n; ++i) d[i] = MavikMath::SquaredDistance(c(double(i) / n), q);
  double best = 1e300, bestT = 0;
  for (int i = 0; i <= n; ++i) {
    if ((i > 0 && d[i] > d[i - 1]) || (i < n && d[i] > d[i + 1])) continue;
    auto f = [&](double t) { return MavikMath::SquaredDistance(c(t), q); };
    for (double t : {GoldenMin(f, std::max(0.0, double(i - 1) / n), std::min(1.0, double(i + 1) / n)), double(i) / n})
      if (f(t) < best) best = f(t), bestT = t;
  }
  if (tOut) *tOut = bestT;
  return best;
}
inline double NearestSq(const V* p, const V& q, double* tOut = nullptr, int n = 4000) {
  return NearestSq([p](double t) { return At(p, t); }, q, tOut, n);
}

// Parameters in (0, 1) where f changes sign, found on a grid and refined by
// bisection. A zero at t = 0 or t = 1 (a collapsed handle) is no change.
inline std::vector<double> SignChanges(const std::function<double(double)>& f, int grid = 20000) {
  std::vector<double> r;
  double prev = f(0);
  for (int i = 1; i <= grid; ++i) {
    const double t = double(i) / grid, v = f(t);
    const bool endZero = (i == 1 && prev == 0) || (i == grid && v == 0);
    if ((v < 0) != (prev < 0) && std::isfinite(v) && std::isfinite(prev) && !endZero) {
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

// Adaptive Simpson with Richardson correction on the Bernstein speed.
inline double Simpson(const V* p, double a, double b, double fa, double fm, double fb, double whole, double tol, int depth) {
  const double m = 0.5 * (a + b), flm = Velocity(p, 0.5 * (a + m)).Length(), frm = Velocity(p, 0.5 * (m + b)).Length();
  const double left = (m - a) / 6 * (fa + 4 * flm + fm), right = (b - m) / 6 * (fm + 4 * frm + fb);
  const double diff = left + right - whole;
  if (depth > 50 || std::fabs(diff) <= 15 * tol) return left + right + diff / 15;
  return Simpson(p, a, m, fa, flm, fm, left, tol / 2, depth + 1) + Simpson(p, m, b, fm, frm, fb, right, tol / 2, depth + 1);
}

// Arc length between t0 and t1 to about 1e-14 of the control polygon.
inline double ReferenceLength(const V* p, double t0 = 0, double t1 = 1) {
  double polygon = 0;
  for (int i = 0; i < 3; ++i) polygon += MavikMath::Distance(p[i], p[i + 1]);
  double sum = 0;
  for (int k = 0; k < 16 && t1 > t0; ++k) {  // sixteen panels so that no feature hides between samples
    const double a = t0 + (t1 - t0) * k / 16, b = t0 + (t1 - t0) * (k + 1) / 16;
    const double fa = Velocity(p, a).Length(), fm = Velocity(p, 0.5 * (a + b)).Length(), fb = Velocity(p, b).Length();
    sum += Simpson(p, a, b, fa, fm, fb, (b - a) / 6 * (fa + 4 * fm + fb), 1e-14 * polygon / 16, 0);
  }
  return sum;
}

inline double SegmentDistance(const V& q, const V& a, const V& b) {
  const D d = b - a;
  const double l2 = d.SquaredLength(), s = l2 > 0 ? std::clamp(MavikMath::Dot(q - a, d) / l2, 0.0, 1.0) : 0.0;
  return MavikMath::Distance(q, a + d * s);
}

}  // namespace testcurves
