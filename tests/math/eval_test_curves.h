// Random Bezier families and independent references for the evaluation
// tests. Everything here works from the control points (Bernstein form),
// never through the library's power basis or integrators.
#pragma once

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "ostracrv/math/vector2d.h"

namespace evaltest {

using MavikMath::D;
using MavikMath::V;

enum class Kind { Ordinary, Cusp, NearCusp, Crossed, CollapsedStart, CollapsedEnd, CollapsedBoth, FoldedLine, Point, Integer };

struct Curve {
  V p[4];
  Kind kind;
};

inline V At(const V* p, double t) {
  const double s = 1 - t, b0 = s * s * s, b1 = 3 * s * s * t, b2 = 3 * s * t * t, b3 = t * t * t;
  return V{b0 * p[0].x + b1 * p[1].x + b2 * p[2].x + b3 * p[3].x, b0 * p[0].y + b1 * p[1].y + b2 * p[2].y + b3 * p[3].y};
}

inline D Velocity(const V* p, double t) {
  const double s = 1 - t;
  const D d0 = p[1] - p[0], d1 = p[2] - p[1], d2 = p[3] - p[2];
  return (d0 * (s * s) + d1 * (2 * s * t) + d2 * (t * t)) * 3.0;
}

inline double Size(const V* p) {
  double m = 0;
  for (int i = 1; i < 4; ++i) m = std::max(m, MavikMath::Distance(p[0], p[i]));
  return m;
}

// A curve with velocity (t - t0)(alpha t + beta): a cusp at t0.
inline void MakeCusp(V p0, double t0, D alpha, D beta, V* p) {
  const D a = alpha / 3.0, b = (beta - alpha * t0) / 2.0, c = beta * -t0;  // B' = 3a t^2 + 2b t + c
  p[0] = p0;
  p[1] = p0 + c / 3.0;
  p[2] = p[1] + (p[1] - p0) + b / 3.0;
  p[3] = p0 + a + (p[2] - p[1]) * 3.0;
}

// count curves cycling through the kinds, sizes 0.1 to 100.
inline std::vector<Curve> RandomCurves(int count, unsigned seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> u(-1, 1), unit(0, 1);
  std::vector<Curve> out(count);
  for (int i = 0; i < count; ++i) {
    Curve& c = out[i];
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

// Adaptive Simpson with Richardson correction on the Bernstein velocity,
// to about 1e-14 of the control polygon's length.
inline double Simpson(const V* p, double a, double b, double fa, double fm, double fb, double whole, double tol, int depth) {
  const double m = 0.5 * (a + b), flm = Velocity(p, 0.5 * (a + m)).Length(), frm = Velocity(p, 0.5 * (m + b)).Length();
  const double left = (m - a) / 6 * (fa + 4 * flm + fm), right = (b - m) / 6 * (fm + 4 * frm + fb);
  const double diff = left + right - whole;
  if (depth > 50 || std::fabs(diff) <= 15 * tol) return left + right + diff / 15;
  return Simpson(p, a, m, fa, flm, fm, left, tol / 2, depth + 1) + Simpson(p, m, b, fm, frm, fb, right, tol / 2, depth + 1);
}

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

}  // namespace evaltest
