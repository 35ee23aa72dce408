// Least-squares cubic fitting and the regression line; see least_squares.h
// for the method and its guards.
//
// All work happens in coordinates relative to the first sample, so that the
// normal equations and the Newton steps see small numbers even far from the
// origin; the result is translated back at the end, with its ends copied
// from the samples bit for bit.
//
// Constants:
// - kMinHandle 1e-3: handles below this fraction of the chord count as
//   turned round (the bound of the handle problem).
// - kSingular 1e-12: a 2x2 system is singular when det <= kSingular C11 C22,
//   i.e. the two basis columns are parallel to within 1e-6 rad.
// - Damping: starts at 1e-3 (almost Gauss-Newton), shrinks by 4 after a
//   success and grows by 8 after a failure, at most 6 tries per round
//   (8^6 ~ 2.6e5 covers the gap from Gauss-Newton to steepest descent).
// - kStall 1e-9: a round that lowers the sum of squares by less than this
//   fraction has converged.
// - kNoise 1e-15: a sum of squares below (kNoise x extent)^2 per sample is
//   rounding noise; nothing is left to fit.
// - kPolishSteps 4: Newton steps per sample when the returned curve is
//   measured (Newton converges quadratically from the refined parameters).
// - kStackSamples 64: runs up to this length use no heap.
#include "ostracrv/math/least_squares.h"

#include <algorithm>
#include <cmath>
#include <vector>

#include "bezier_common.h"

namespace MavikMath {

namespace {

constexpr double kMinHandle = 1e-3;
constexpr double kSingular = 1e-12;
constexpr double kInitialDamping = 1e-3;
constexpr double kMinDamping = 1e-12;
constexpr double kDampingDown = 0.25;
constexpr double kDampingUp = 8.0;
constexpr int kMaxDampingTries = 6;
constexpr double kStall = 1e-9;
constexpr double kNoise = 1e-15;
constexpr int kPolishSteps = 4;
constexpr int kStackSamples = 64;

// The fitted cubic relative to its first point: p[0] = (0, 0).
struct Curve {
  V p[4];

  // B(u), B'(u) and B''(u) from the power basis.
  void Eval(double u, D& b, D& d1, D& d2) const noexcept {
    const CubicBezier::PowerBasis pb = CubicBezier::GetPowerBasis(p);
    b = D(CubicBezier::Evaluate(pb.a, pb.b, pb.c, pb.d, u));
    d1 = CubicBezier::Derivative(pb.a, pb.b, pb.c, u);
    d2 = CubicBezier::SecondDerivative(pb.a, pb.b, u);
  }
};

// One inner sample and the per-round quantities of the damped step.
struct Sample {
  D q;            // sample relative to the first one
  double u;       // current parameter
  double best;    // parameter on the best curve so far
  double trial;   // parameter of the step being tried
  double k1, k2;  // B'.dB/dalpha and B'.dB/dbeta at u
  double gu;      // B'.(B - q) at u
  double speed;   // |B'(u)|^2
};

// The fixed data of one fit.
struct Problem {
  D t1, t2, end;  // unit tangents and the last sample, relative
  double lo;      // lower bound of the handles
  double fallback;
  Curve Make(double alpha, double beta) const noexcept {
    return Curve{{V{0.0, 0.0}, V(t1 * alpha), V(end - t2 * beta), V(end)}};
  }
};

// One Newton step of u towards the nearest point of the curve to q, kept
// only if it brings the curve point closer. Returns the squared distance at
// the final u.
double NewtonStep(const Curve& c, const D& q, double& u) noexcept {
  return CubicBezier::internal::PolishNearest(c.p, V(q), u, 0.0, 1.0, 1);
}

// Schneider's solve: the handle lengths that minimise the sum of squares for
// the current parameters, bounded below by p.lo.
void SolveHandles(const Sample* s, int m, const Problem& p, double& alpha, double& beta) noexcept {
  double s11 = 0.0, s12 = 0.0, s22 = 0.0, x1 = 0.0, x2 = 0.0;
  for (int i = 0; i < m; ++i) {
    const double t = s[i].u, w = 1.0 - t;
    const double b1 = 3.0 * w * w * t, b2 = 3.0 * w * t * t;
    const double e = b2 + t * t * t;  // weight of the end point (B2 + B3)
    const D r{s[i].q.x - p.end.x * e, s[i].q.y - p.end.y * e};
    s11 += b1 * b1;
    s12 += b1 * b2;
    s22 += b2 * b2;
    x1 += b1 * Dot(p.t1, r);
    x2 -= b2 * Dot(p.t2, r);
  }
  // Columns A1 = t1 B1 and A2 = -t2 B2 of the linear problem.
  const double c11 = s11, c22 = s22, c12 = -Dot(p.t1, p.t2) * s12;
  const double det = c11 * c22 - c12 * c12;
  const double lo = p.lo;
  auto cost = [&](double a, double b) { return a * a * c11 + 2.0 * a * b * c12 + b * b * c22 - 2.0 * (a * x1 + b * x2); };
  if (c11 > 0.0 && c22 > 0.0 && det > kSingular * c11 * c22) {
    const double a = (x1 * c22 - x2 * c12) / det;
    const double b = (c11 * x2 - c12 * x1) / det;
    if (a >= lo && b >= lo) {
      alpha = a;
      beta = b;
      return;
    }
    // The bounded optimum of a convex quadratic lies on an edge of the box.
    const double bOnEdge = std::max(lo, (x2 - c12 * lo) / c22);
    const double aOnEdge = std::max(lo, (x1 - c12 * lo) / c11);
    if (cost(lo, bOnEdge) <= cost(aOnEdge, lo)) {
      alpha = lo;
      beta = bOnEdge;
    } else {
      alpha = aOnEdge;
      beta = lo;
    }
    return;
  }
  // Singular: the best equal handles, else a third of the chord.
  const double den = c11 + 2.0 * c12 + c22;
  const double h = den > 0.0 ? (x1 + x2) / den : 0.0;
  alpha = beta = (den > 0.0 && h >= lo) ? h : p.fallback;
}

// One Levenberg-Marquardt step on all unknowns (alpha, beta, u_1..u_m) of the
// sum of squares. Each residual depends on the two handles and its own
// parameter only, so the normal equations have an arrow shape: the diagonal
// parameter block is eliminated (Schur complement), leaving a 2x2 system for
// the handles, and the parameter steps follow by back-substitution. Each
// trial parameter then takes one Newton step on the trial curve, so that the
// trial is judged by (nearly) true distances rather than by the linearised
// parameters. On success the state and ss/error are updated.
// Returns false if no damping lowered the sum of squares.
bool DampedStep(Sample* s, int m, const Problem& p, double& alpha, double& beta, double& lambda, double& ss,
                double& error) noexcept {
  const Curve c = p.Make(alpha, beta);
  double h11 = 0.0, h12 = 0.0, h22 = 0.0, g1 = 0.0, g2 = 0.0;
  const double t12 = -Dot(p.t1, p.t2);
  for (int i = 0; i < m; ++i) {
    const double t = s[i].u, w = 1.0 - t;
    const double b1 = 3.0 * w * w * t, b2 = 3.0 * w * t * t;
    D b, d1, d2;
    c.Eval(t, b, d1, d2);
    const D r = b - s[i].q;
    h11 += b1 * b1;
    h12 += t12 * b1 * b2;
    h22 += b2 * b2;
    g1 += b1 * Dot(p.t1, r);
    g2 -= b2 * Dot(p.t2, r);
    s[i].k1 = b1 * Dot(p.t1, d1);
    s[i].k2 = -b2 * Dot(p.t2, d1);
    s[i].gu = Dot(d1, r);
    s[i].speed = d1.SquaredLength();
  }
  for (int attempt = 0; attempt < kMaxDampingTries; ++attempt, lambda *= kDampingUp) {
    const double grow = 1.0 + lambda;
    double s11 = h11 * grow, s12 = h12, s22 = h22 * grow, r1 = g1, r2 = g2;
    for (int i = 0; i < m; ++i) {
      const double di = s[i].speed * grow;
      if (!(di > 0.0)) continue;
      s11 -= s[i].k1 * s[i].k1 / di;
      s12 -= s[i].k1 * s[i].k2 / di;
      s22 -= s[i].k2 * s[i].k2 / di;
      r1 -= s[i].k1 * s[i].gu / di;
      r2 -= s[i].k2 * s[i].gu / di;
    }
    const double det = s11 * s22 - s12 * s12;
    if (!(det > 0.0) || !std::isfinite(det)) continue;
    const double da = -(r1 * s22 - r2 * s12) / det;
    const double db = -(s11 * r2 - s12 * r1) / det;
    const double na = std::max(p.lo, alpha + da), nb = std::max(p.lo, beta + db);
    if (!std::isfinite(na) || !std::isfinite(nb)) continue;
    const Curve nc = p.Make(na, nb);
    double nss = 0.0, nerror = 0.0;
    for (int i = 0; i < m; ++i) {
      const double di = s[i].speed * grow;
      double next = s[i].u;
      if (di > 0.0) next -= (s[i].gu + s[i].k1 * da + s[i].k2 * db) / di;
      next = next >= 0.0 ? std::min(next, 1.0) : (next < 0.0 ? 0.0 : s[i].u);  // NaN keeps u
      const double d = NewtonStep(nc, s[i].q, next);
      s[i].trial = next;
      nss += d;
      nerror = std::max(nerror, d);
    }
    if (nss < ss) {
      alpha = na;
      beta = nb;
      for (int i = 0; i < m; ++i) s[i].u = s[i].trial;
      ss = nss;
      error = nerror;
      lambda = std::max(lambda * kDampingDown, kMinDamping);
      return true;
    }
  }
  return false;
}

// Chord-length parameters of the count samples point(0..count-1), into u;
// uniform if the samples all coincide.
template <class Get>
void ChordParameters(int count, Get point, double* u) noexcept {
  u[0] = 0.0;
  for (int i = 1; i < count; ++i) u[i] = u[i - 1] + std::sqrt((point(i) - point(i - 1)).SquaredLength());
  const double total = u[count - 1];
  if (total > 0.0 && std::isfinite(total)) {
    for (int i = 1; i < count; ++i) u[i] /= total;
  } else {
    for (int i = 1; i < count; ++i) u[i] = double(i) / double(count - 1);
  }
  u[count - 1] = 1.0;
}

// Caller arc lengths normalised to [0, 1]; false if they are unusable
// (non-finite, decreasing or constant).
bool NormaliseParameters(const double* in, int count, double* u) noexcept {
  const double first = in[0], total = in[count - 1] - in[0];
  if (!std::isfinite(first) || !std::isfinite(total) || !(total > 0.0)) return false;
  double prev = first;
  for (int i = 0; i < count; ++i) {
    if (!std::isfinite(in[i]) || in[i] < prev) return false;
    prev = in[i];
  }
  for (int i = 0; i < count; ++i) u[i] = std::clamp((in[i] - first) / total, 0.0, 1.0);
  u[0] = 0.0;
  u[count - 1] = 1.0;
  return true;
}

double FitCubic(const V* points, double* parameters, int count, const D& startTangent, const D& endTangent,
                V* bezierOut, int iterations, double stopErrorSqrd) noexcept {
  if (!points || !bezierOut || count < 2) return kLeastSquaresNoFit;
  if (!startTangent.IsFinite() || !endTangent.IsFinite()) return kLeastSquaresNoFit;
  if (!startTangent.IsNonZero() || !endTangent.IsNonZero()) return kLeastSquaresNoFit;
  for (int i = 0; i < count; ++i)
    if (!points[i].IsFinite()) return kLeastSquaresNoFit;
  if (iterations < 0) iterations = 0;

  const V origin = points[0];
  auto rel = [&](int i) { return points[i] - origin; };
  Problem p;
  p.end = rel(count - 1);
  p.t1 = startTangent;
  p.t2 = endTangent;
  p.t1.Normalize();
  p.t2.Normalize();

  // Inner samples 1..count-2 become s[0..m-1]; the ends are fixed.
  const int m = count - 2;
  Sample stackSamples[kStackSamples];
  double stackU[kStackSamples + 2];
  std::vector<Sample> heapSamples;
  std::vector<double> heapU;
  Sample* s = stackSamples;
  double* u = stackU;
  if (m > kStackSamples) {
    heapSamples.resize(std::size_t(m));
    heapU.resize(std::size_t(count));
    s = heapSamples.data();
    u = heapU.data();
  }
  if (!parameters || !NormaliseParameters(parameters, count, u)) ChordParameters(count, rel, u);
  double extent = 0.0, polyline = 0.0;
  for (int i = 0; i < m; ++i) {
    s[i].q = rel(i + 1);
    s[i].u = s[i].best = u[i + 1];
    extent = std::max(extent, s[i].q.SquaredLength());
  }
  for (int i = 1; i < count; ++i) polyline += std::sqrt((rel(i) - rel(i - 1)).SquaredLength());
  extent = std::sqrt(std::max(extent, p.end.SquaredLength()));
  double chord = std::sqrt(p.end.SquaredLength());
  // A closed run measures its handles against the polyline instead.
  if (!(chord > 0.0)) chord = polyline;
  p.lo = kMinHandle * chord;
  p.fallback = chord / 3.0;

  // First solve on the initial parameters, then one Newton step each, which
  // also measures this curve at the refined parameters.
  double alpha = p.fallback, beta = p.fallback;
  SolveHandles(s, m, p, alpha, beta);
  Curve curve = p.Make(alpha, beta);
  double ss = 0.0, error = 0.0;
  for (int i = 0; i < m; ++i) {
    const double d = NewtonStep(curve, s[i].q, s[i].u);
    ss += d;
    error = std::max(error, d);
  }
  Curve best = curve;
  double bestError = error;
  for (int i = 0; i < m; ++i) s[i].best = s[i].u;

  const double noise = double(m) * (kNoise * extent) * (kNoise * extent);
  double lambda = kInitialDamping;
  for (int round = 1; round <= iterations; ++round) {
    if (stopErrorSqrd >= 0.0 && bestError < stopErrorSqrd) break;
    if (!(ss > noise)) break;
    const double before = ss;
    if (!DampedStep(s, m, p, alpha, beta, lambda, ss, error)) break;
    if (error < bestError) {
      bestError = error;
      best = p.Make(alpha, beta);
      for (int i = 0; i < m; ++i) s[i].best = s[i].u;
    }
    if (before - ss <= kStall * before) break;
  }

  // Measure the returned curve at parameters refined on it.
  error = 0.0;
  for (int i = 0; i < m; ++i) {
    error = std::max(error, CubicBezier::internal::PolishNearest(best.p, V(s[i].q), s[i].best, 0.0, 1.0, kPolishSteps));
  }
  if (!std::isfinite(error) || !best.p[1].IsFinite() || !best.p[2].IsFinite()) return kLeastSquaresNoFit;

  bezierOut[0] = points[0];
  bezierOut[1] = origin + D(best.p[1]);
  bezierOut[2] = origin + D(best.p[2]);
  bezierOut[3] = points[count - 1];
  if (parameters) {
    parameters[0] = 0.0;
    for (int i = 0; i < m; ++i) parameters[i + 1] = s[i].best;
    parameters[count - 1] = 1.0;
  }
  return error;
}

}  // namespace

double LeastSquares(const V* points, double* parameters, int count, const D& startTangent, const D& endTangent,
                    V* bezierOut, int iterations, double* /*reserved*/, double stopErrorSqrd) noexcept {
  return FitCubic(points, parameters, count, startTangent, endTangent, bezierOut, iterations, stopErrorSqrd);
}

double LeastSquares(const V* points, int count, const D& startTangent, const D& endTangent, V* bezierOut,
                    int iterations) noexcept {
  return FitCubic(points, nullptr, count, startTangent, endTangent, bezierOut, iterations, -1.0);
}

void GetLeastSquaresLines(const V* points, int count, V& origin, D& direction) noexcept {
  if (!points || count < 1) return;
  double cx = 0.0, cy = 0.0;
  for (int i = 0; i < count; ++i) {
    if (!points[i].IsFinite()) return;
    cx += points[i].x;
    cy += points[i].y;
  }
  cx /= count;
  cy /= count;
  // Two passes: central moments lose nothing to a large common offset.
  double sxx = 0.0, syy = 0.0, sxy = 0.0;
  for (int i = 0; i < count; ++i) {
    const double dx = points[i].x - cx, dy = points[i].y - cy;
    sxx += dx * dx;
    syy += dy * dy;
    sxy += dx * dy;
  }
  if (!std::isfinite(sxx + syy + sxy)) return;
  origin = V{cx, cy};
  const double spread = sxx + syy;
  if (!(spread / count > kEpsilon)) {
    direction = D{0.0, 0.0};
    return;
  }
  const D run = points[count - 1] - points[0];
  D axis;
  if (std::fabs(sxx - syy) <= 1e-12 * spread && std::fabs(sxy) <= 1e-12 * spread) {
    axis = run.IsNonZero() ? run : D{1.0, 0.0};
    axis.Normalize();
  } else {
    const double angle = 0.5 * std::atan2(2.0 * sxy, sxx - syy);
    axis = D{std::cos(angle), std::sin(angle)};
  }
  if (Dot(axis, run) < 0.0) axis = -axis;
  direction = axis;
}

}  // namespace MavikMath
