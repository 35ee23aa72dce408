// Random Bezier families and independent references for the evaluation
// tests. Everything here works from the control points directly (Bernstein
// form), never through the library's power basis or integrators.
#pragma once

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "ostracrv/math/vector2d.h"

namespace evaltest {

using MavikMath::D;
using MavikMath::V;

enum class Kind { Ordinary, Cusp, NearCusp, CrossedHandles, CollapsedStart, CollapsedEnd, CollapsedBoth, FoldedLine,
                  Point, Integer };

struct Curve {
  V p[4];
  Kind kind;
};

inline V At(const V* p, double t) {
  const double s = 1.0 - t;
  const double b0 = s * s * s, b1 = 3 * s * s * t, b2 = 3 * s * t * t, b3 = t * t * t;
  return V{b0 * p[0].x + b1 * p[1].x + b2 * p[2].x + b3 * p[3].x, b0 * p[0].y + b1 * p[1].y + b2 * p[2].y + b3 * p[3].y};
}

inline D Velocity(const V* p, double t) {
  const double s = 1.0 - t;
  const D d0 = p[1] - p[0], d1 = p[2] - p[1], d2 = p[3] - p[2];
  return D{3 * (s * s * d0.x + 2 * s * t * d1.x + t * t * d2.x), 3 * (s * s * d0.y + 2 * s * t * d1.y + t * t * d2.y)};
}

// A curve whose velocity is (t - t0)(alpha t + beta): a cusp at t0.
inline void MakeCusp(V p0, double t0, D alpha, D beta, V* p) {
  // B' = 3a t^2 + 2b t + c with 3a = alpha, 2b = beta - t0 alpha, c = -t0 beta.
  const D a = alpha / 3.0, b = (beta - alpha * t0) / 2.0, c = beta * -t0;
  p[0] = p0;
  p[1] = p0 + c / 3.0;
  p[2] = V{2 * p[1].x - p0.x + b.x / 3.0, 2 * p[1].y - p0.y + b.y / 3.0};
  p[3] = V{a.x + 3 * (p[2].x - p[1].x) + p0.x, a.y + 3 * (p[2].y - p[1].y) + p0.y};
}

inline std::vector<Curve> RandomCurves(int count, unsigned seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> u(-1.0, 1.0), unit(0.0, 1.0);
  auto pt = [&](double r) { return V{r * u(rng), r * u(rng)}; };
  std::vector<Curve> out;
  for (int i = 0; i < count; ++i) {
    Curve c;
    c.kind = static_cast<Kind>(i % 10);
    const double r = std::pow(10.0, 3.0 * unit(rng) - 1.0);  // sizes 0.1 .. 100
    for (V& q : c.p) q = pt(r);
    switch (c.kind) {
      case Kind::Ordinary:
      case Kind::Point:
        if (c.kind == Kind::Point) c.p[1] = c.p[2] = c.p[3] = c.p[0];
        break;
      case Kind::Cusp:
      case Kind::NearCusp:
        MakeCusp(pt(r), 0.1 + 0.8 * unit(rng), D{r * u(rng), r * u(rng)}, D{r * u(rng), r * u(rng)}, c.p);
        if (c.kind == Kind::NearCusp) c.p[1].x += r * 1e-7 * u(rng);
        break;
      case Kind::CrossedHandles: {
        const V a = pt(r), b = a + D{r * 0.2 * u(rng), r * 0.2 * u(rng)};
        c.p[0] = a;
        c.p[3] = b;
        c.p[1] = b + D{r * u(rng), r * u(rng)} * 2.0;
        c.p[2] = a + D{r * u(rng), r * u(rng)} * 2.0;
        break;
      }
      case Kind::CollapsedStart: c.p[1] = c.p[0]; break;
      case Kind::CollapsedEnd: c.p[2] = c.p[3]; break;
      case Kind::CollapsedBoth:
        c.p[1] = c.p[0];
        c.p[2] = c.p[3];
        break;
      case Kind::FoldedLine: {
        const V o = pt(r);
        const D dir = D{u(rng), u(rng)}.Normalized();
        for (V& q : c.p) q = o + dir * (r * u(rng));
        break;
      }
      case Kind::Integer:
        for (V& q : c.p) q = V{std::round(q.x * 10.0), std::round(q.y * 10.0)};
        break;
    }
    out.push_back(c);
  }
  return out;
}

// Adaptive Simpson with Richardson correction on the Bernstein velocity.
inline double SimpsonStep(const V* p, double a, double b, double fa, double fm, double fb, double whole, double tol,
                          int depth) {
  const double m = 0.5 * (a + b), lm = 0.5 * (a + m), rm = 0.5 * (m + b);
  const double flm = Velocity(p, lm).Length(), frm = Velocity(p, rm).Length();
  const double left = (m - a) / 6 * (fa + 4 * flm + fm), right = (b - m) / 6 * (fm + 4 * frm + fb);
  const double diff = left + right - whole;
  if (depth > 50 || std::fabs(diff) <= 15 * tol) return left + right + diff / 15;
  return SimpsonStep(p, a, m, fa, flm, fm, left, tol / 2, depth + 1) +
         SimpsonStep(p, m, b, fm, frm, fb, right, tol / 2, depth + 1);
}

inline double ReferenceLength(const V* p, double t0 = 0.0, double t1 = 1.0) {
  double scale = 0.0;
  for (int i = 0; i < 3; ++i) scale += MavikMath::Distance(p[i], p[i + 1]);
  if (scale == 0.0 || t1 <= t0) return 0.0;
  // Sixteen starting panels so that no feature hides between samples.
  double sum = 0.0;
  for (int k = 0; k < 16; ++k) {
    const double a = t0 + (t1 - t0) * k / 16, b = t0 + (t1 - t0) * (k + 1) / 16, m = 0.5 * (a + b);
    const double fa = Velocity(p, a).Length(), fm = Velocity(p, m).Length(), fb = Velocity(p, b).Length();
    sum += SimpsonStep(p, a, b, fa, fm, fb, (b - a) / 6 * (fa + 4 * fm + fb), 1e-14 * scale / 16, 0);
  }
  return sum;
}

// Distance from q to the segment a-b.
inline double SegmentDistance(const V& q, const V& a, const V& b) {
  const D d = b - a;
  const double l2 = d.SquaredLength();
  double s = l2 > 0 ? MavikMath::Dot(q - a, d) / l2 : 0.0;
  s = std::clamp(s, 0.0, 1.0);
  return MavikMath::Distance(q, a + d * s);
}

inline double Size(const V* p) {
  double m = 0.0;
  for (int i = 1; i < 4; ++i) m = std::max(m, MavikMath::Distance(p[0], p[i]));
  return m;
}

}  // namespace evaltest
