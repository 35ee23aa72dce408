// Offset support for one cubic Bezier; see bezier_offset.h for the sign
// convention, the reasons for the cuts and the methods.
//
// Constants besides those listed in the header:
// - kCuspSpeedSqr 1e-18: |B'|^2 at or below this (unit size, so |B'| below
//   1e-9 of the size) is a cusp.
// - kCuspZone 1e-6: the stretches 1e-6 either side of a cusp get their own
//   ends in the search for offset cusps. Rounding scatters inflections and
//   curvature extrema a hair around a cusp; beyond the zone the curvature is
//   monotone again and the bracketing is reliable.
// - kStraight 1e-12: a curve whose inflection quadratic has no coefficient
//   above this (unit size) is straight and has no inflection.
// - kSafetySteps 16: sixteenths added to the stretch ends of the search.
// - kMinGap 1e-9: cuts closer than this (in the parameter) merge.
// - kMaxRecuts 16: folds found on the pieces themselves that are cut too.
// - kBisections 100: more than enough to reach adjacent doubles in [0, 1].
// - kFitIntervals 16, kMaxSamples 64: the offset is sampled at sixteenths of
//   the parameter, intervals halved (down to kMinSampleStep 1e-9) while the
//   normal turns more than a step between their ends. The step is the angle
//   whose arc of radius |d| strays 1/20 of the tolerance from its chord over
//   an eighth of the step, clamped to [kMinTurnStep 0.5 deg, kMaxTurnStep 8
//   deg]; the checks at quarter intervals then cannot step over a swing of
//   the offset (a tight bend far inside the distance swings it round a half
//   circle within a sliver of the parameter).
// - kCheckMargin 0.81: checks ask for 0.81 of the squared tolerance (0.9 in
//   distance), for the error between the checked points.
// - kFitIterations 10: refinement rounds of the fit; offsets are smooth and
//   the damped fit converges in a few rounds.
// - kNoiseFloor 1e-12, kTinyPiece 1e-10: relative to the largest coordinate
//   plus |distance|, the squared-tolerance floor and the size below which a
//   piece is not split further.
#include "ostracrv/math/bezier_offset.h"

#include <algorithm>
#include <array>
#include <cmath>

#include "bezier_common.h"
#include "ostracrv/math/bezier_split.h"
#include "ostracrv/math/least_squares.h"
#include "ostracrv/math/polynomial.h"

namespace MavikMath {

namespace {

using CubicBezier::bezier2dT;

constexpr double kCuspSpeedSqr = 1e-18;
constexpr double kCuspZone = 1e-6;
constexpr double kMinGap = 1e-9;
constexpr double kStraight = 1e-12;
constexpr int kFitIntervals = 16;
constexpr int kMaxSamples = 64;
constexpr double kMinTurnStep = 0.0087;
constexpr double kMaxTurnStep = 0.14;
constexpr double kMinSampleStep = 1e-9;
constexpr double kCheckMargin = 0.81;
constexpr int kFitIterations = 10;
constexpr double kNoiseFloor = 1e-12;
constexpr double kTinyPiece = 1e-10;
constexpr int kBisections = 100;
constexpr int kSafetySteps = 16;
constexpr int kMaxRecuts = 16;

// Room for every critical parameter: 2 inflections, 3 cusps with their
// zones, 5 curvature extrema, the safety steps and the ends give at most 33
// stretch ends, so at most 32 offset cusps.
using ParamList = std::array<double, 64>;

// The Bezier relative to p0 and scaled to unit size: power basis a, b, c
// (d = 0) and the distance in the same units.
struct Unit {
  double size = 0.0;
  double dist = 0.0;
  V a, b, c;

  D D1(double t) const noexcept { return CubicBezier::Derivative(a, b, c, t); }
  D D2(double t) const noexcept { return CubicBezier::SecondDerivative(a, b, t); }
  // h(t) = |B'|^3 - d cross(B', B''): the sign of 1 - d kappa, the factor by
  // which the offset moves along B'.
  double H(double t) const noexcept {
    const D d1 = D1(t), d2 = D2(t);
    const double s = d1.SquaredLength();
    return s * std::sqrt(s) - dist * Cross(d1, d2);
  }
  // Direction of travel at t, defined also where B' vanishes: the limit of
  // B' from inside the curve (B'' at a degenerate handle, B''' if that
  // vanishes too). Not SafeBezierTangent: pieces end at their cusps, so the
  // fallback must point into the piece from the nearer end (reversed past
  // the middle, not only at t = 1), and the threshold is the cusp one of
  // this unit-size frame, far below kEpsilon.
  D Tangent(double t) const noexcept {
    const D d1 = D1(t);
    if (d1.SquaredLength() > kCuspSpeedSqr) return d1;
    D d2 = D2(t);
    if (t > 0.5) d2 = -d2;
    if (d2.SquaredLength() > kCuspSpeedSqr) return d2;
    return D(a);
  }
};

bool MakeUnit(const V* p, double distance, Unit& u) noexcept {
  if (!p || !CubicBezier::IsFinite(p) || !std::isfinite(distance)) return false;
  double s2 = 0.0;
  for (int i = 1; i < 4; ++i) s2 = std::max(s2, SquaredDistance(p[i], p[0]));
  if (!(s2 > kEpsilon) || !std::isfinite(s2)) return false;
  u.size = std::sqrt(s2);
  u.dist = distance / u.size;
  if (!std::isfinite(u.dist)) return false;
  V q[4];
  for (int i = 0; i < 4; ++i) q[i] = V{(p[i].x - p[0].x) / u.size, (p[i].y - p[0].y) / u.size};
  const CubicBezier::PowerBasis pb = CubicBezier::GetPowerBasis(q);
  u.a = pb.a;
  u.b = pb.b;
  u.c = pb.c;
  return true;
}

// Normalised whatever the length: tangents of the unit frame may be far
// shorter than the kEpsilon threshold of D::Normalize and still point true.
D UnitVector(const D& v) noexcept {
  const double len = std::sqrt(v.SquaredLength());
  return len > 0.0 ? D{v.x / len, v.y / len} : D{0.0, 0.0};
}

// Whether the part of p between t0 and t1 is a dot: all its control points
// within sqrt(kEpsilon) of its start.
bool IsDot(const V* p, double t0, double t1) noexcept {
  V q[4];
  CubicBezier::Subsection(t0, t1, p, q);
  return CubicBezier::internal::IsDot(q);
}
// Whether t splits p into two parts that are not dots. Near a cusp the
// parameter says little about size (the speed vanishes), so this is
// measured on the curve: the specks that rounding leaves around a cusp
// (inflections and folds a hair apart) are dots and do not count.
bool Inside(const V* p, double t) noexcept { return t > 0.0 && t < 1.0 && !IsDot(p, 0.0, t) && !IsDot(p, t, 1.0); }

// Interior inflections: sign changes of cross(B', B'') =
// -6 (a x b) t^2 + 6 (c x a) t + 2 (c x b).
int Inflections(const Unit& u, double* out) noexcept {
  const double qa = -6.0 * Cross(u.a, u.b), qb = 6.0 * Cross(u.c, u.a), qc = 2.0 * Cross(u.c, u.b);
  if (std::max({std::fabs(qa), std::fabs(qb), std::fabs(qc)}) <= kStraight) return 0;
  double r[2];
  const int n = SolveQuadratic(qa, qb, qc, r);
  // A single root of a true quadratic is a double root: a touch, no change.
  if (n == 1 && qa != 0.0) return 0;
  int m = 0;
  for (int i = 0; i < n; ++i)
    if (r[i] > 0.0 && r[i] < 1.0) out[m++] = r[i];
  return m;
}

// Interior cusps: minima of |B'|^2 (roots of B'.B'') where B' vanishes.
int Cusps(const Unit& u, double* out) noexcept {
  // B'.B'' with B' = c + 2b t + 3a t^2 and B'' = 2b + 6a t.
  const double poly[4] = {2.0 * Dot(u.c, u.b), 6.0 * Dot(u.c, u.a) + 4.0 * Dot(u.b, u.b), 18.0 * Dot(u.a, u.b),
                          18.0 * Dot(u.a, u.a)};
  double r[3];
  const int n = FindRootsInInterval(poly, 3, 0.0, 1.0, r);
  int m = 0;
  for (int i = 0; i < n; ++i)
    if (r[i] > 0.0 && r[i] < 1.0 && u.D1(r[i]).SquaredLength() <= kCuspSpeedSqr) out[m++] = r[i];
  return m;
}

// Curvature extrema and cusps: every root of the slope of the curvature.
// Not FindCurvatureMinMax: these only end stretches of the search below,
// where a spare root (a flat point of the curvature) does no harm; its
// merging and sign tests are not needed and cost the cutting a few per cent.
int CurvatureExtrema(const Unit& u, double* out) noexcept {
  double n[6];
  CubicBezier::internal::CurvatureSlopePolynomial(u.a, u.b, u.c, n);
  return FindRootsInInterval(n, 5, 0.0, 1.0, out);
}

// Sign of h near t, looking towards `other` where B' vanishes at t (h is 0
// at a cusp, but its sign next to it is that of -d kappa).
int SignNear(const Unit& u, double t, double other) noexcept {
  double x = t;
  if (u.D1(t).SquaredLength() <= kCuspSpeedSqr) x = t + (other - t) * 1e-6;
  const double h = u.H(x);
  return h > 0.0 ? 1 : (h < 0.0 ? -1 : 0);
}

// Cusps of the offset: every sign change of h in (0, 1), ascending.
int OffsetCusps(const Unit& u, double* out) noexcept {
  ParamList ends{};
  int n = 0;
  ends[n++] = 0.0;
  ends[n++] = 1.0;
  n += Inflections(u, &ends[n]);
  double cusps[3];
  const int nc = Cusps(u, cusps);
  for (int i = 0; i < nc; ++i) {
    // Rounding scatters inflections and extrema a hair around a cusp; the
    // stretches beyond the zone are clean again.
    ends[n++] = cusps[i];
    if (cusps[i] - kCuspZone > 0.0) ends[n++] = cusps[i] - kCuspZone;
    if (cusps[i] + kCuspZone < 1.0) ends[n++] = cusps[i] + kCuspZone;
  }
  n += CurvatureExtrema(u, &ends[n]);
  for (int k = 1; k < kSafetySteps; ++k) ends[n++] = double(k) / kSafetySteps;
  std::sort(ends.begin(), ends.begin() + n);
  int m = 0;
  for (int i = 0; i + 1 < n; ++i) {
    double lo = ends[i], hi = ends[i + 1];
    if (!(hi > lo)) continue;
    const int slo = SignNear(u, lo, hi), shi = SignNear(u, hi, lo);
    if (slo == 0 && lo > 0.0) {
      out[m++] = lo;  // a root exactly on a stretch end
      continue;
    }
    if (slo == 0 || shi == 0 || slo == shi) continue;
    for (int it = 0; it < kBisections; ++it) {
      const double mid = 0.5 * (lo + hi);
      if (mid <= lo || mid >= hi) break;
      const int sm = u.H(mid) > 0.0 ? 1 : -1;
      if (sm == slo) lo = mid; else hi = mid;
    }
    out[m++] = 0.5 * (lo + hi);
  }
  return m;
}

// All parameters where a single offset cannot follow the curve, ascending,
// merged when closer than kMinGap, strictly inside (kMinGap, 1 - kMinGap).
int CutParameters(const Unit& u, double* out) noexcept {
  ParamList all{};
  int n = 0;
  n += Inflections(u, &all[n]);
  n += Cusps(u, &all[n]);
  n += OffsetCusps(u, &all[n]);
  std::sort(all.begin(), all.begin() + n);
  int m = 0;
  for (int i = 0; i < n; ++i) {
    const double t = all[i];
    if (!(t > kMinGap && t < 1.0 - kMinGap)) continue;
    if (m > 0 && t - out[m - 1] < kMinGap) continue;
    out[m++] = t;
  }
  return m;
}

// The fold of the offset inside p nearest to the middle: a cusp of the
// offset or of the curve that splits p into two parts that both matter.
// -1 if there is none.
double InteriorFold(const V* p, const Unit& u) noexcept {
  ParamList r{};
  int n = OffsetCusps(u, r.data());
  n += Cusps(u, &r[n]);
  double best = -1.0;
  for (int i = 0; i < n; ++i)
    if ((best < 0.0 || std::fabs(r[i] - 0.5) < std::fabs(best - 0.5)) && Inside(p, r[i])) best = r[i];
  return best;
}

// The true offset point at t.
V OffsetPoint(const V* p, const Unit& u, double distance, double t) noexcept {
  const V b = t == 1.0 ? p[3] : CubicBezier::Evaluate(p, t);
  const D n = UnitVector(u.Tangent(t)).Perpendicular();
  return b + n * distance;
}

// Parameters at which the offset is sampled: sixteenths, each interval
// halved while the unit tangents at its ends have a dot product below
// minCos. Writes the parameters and unit tangents (kMaxSamples at most) and
// the parameter at which the tangent has turned half its total (or 0.5 for a
// piece that turns less than kMaxTurnStep). Returns the count, or 0 when
// kMaxSamples is not enough.
int SampleParameters(const Unit& u, double minCos, double* ts, D* dirs, double& halfTurn) noexcept {
  int n = 0;
  ts[n] = 0.0;
  dirs[n++] = UnitVector(u.Tangent(0.0));
  struct End {
    double t;
    D dir;
  };
  End stack[64];
  double turn[kMaxSamples];
  turn[0] = 0.0;
  for (int k = 1; k <= kFitIntervals; ++k) {
    int top = 0;
    const double tk = double(k) / kFitIntervals;
    stack[top++] = End{tk, UnitVector(u.Tangent(tk))};
    while (top > 0) {
      const End& e = stack[top - 1];
      const double ta = ts[n - 1];
      const double c = Dot(dirs[n - 1], e.dir);
      if (c < minCos && e.t - ta > kMinSampleStep && top < 64) {
        const double tm = 0.5 * (ta + e.t);
        stack[top++] = End{tm, UnitVector(u.Tangent(tm))};
        continue;
      }
      if (n == kMaxSamples) return 0;
      ts[n] = e.t;
      dirs[n] = e.dir;
      turn[n] = turn[n - 1] + std::acos(std::clamp(c, -1.0, 1.0));
      ++n;
      --top;
    }
  }
  halfTurn = 0.5;
  if (turn[n - 1] > kMaxTurnStep) {
    int j = 1;
    while (j < n - 1 && turn[j] < 0.5 * turn[n - 1]) ++j;
    halfTurn = 0.5 * (ts[j - 1] + ts[j]);
  }
  return n;
}

}  // namespace

void GetSegmentsToOffset(const bezier2dT<V>& bezier, std::vector<bezier2dT<V>>& pieces, double distance,
                         std::vector<double>* params) {
  Unit u;
  if (!MakeUnit(bezier.data(), distance, u)) return;
  ParamList found{};
  const int n = CutParameters(u, found.data());
  const V* p = bezier.data();
  // A cut that would leave a dot is dropped, so that the speck stays part
  // of its neighbour; but a cusp is always cut (the normal turns round
  // there), taking the place of the cut before it if need be.
  double cusps[3];
  const int nc = Cusps(u, cusps);
  auto isCusp = [&](double t) { return std::find(cusps, cusps + nc, t) != cusps + nc; };
  ParamList cuts{};
  int m = 0;
  for (int i = 0; i < n; ++i) {
    const double t = found[i];
    if (!IsDot(p, m > 0 ? cuts[m - 1] : 0.0, t)) {
      cuts[m++] = t;
    } else if (isCusp(t) && m > 0 && !isCusp(cuts[m - 1])) {
      cuts[m - 1] = t;
    }
  }
  while (m > 0 && IsDot(p, cuts[m - 1], 1.0)) --m;

  // Each piece is checked in its own frame, where structure that was a
  // hair wide on the whole curve is resolved; a fold found there is cut as
  // well (a bounded number of times). This makes every piece pass
  // IsBezierValidForOffset, which asks the same question.
  auto piece = [&](int i) {
    const double t0 = i > 0 ? cuts[i - 1] : 0.0, t1 = i < m ? cuts[i] : 1.0;
    bezier2dT<V> q;
    CubicBezier::Subsection(t0, t1, p, q.data());
    // Cut points shared with the neighbour bit for bit; the ends copied
    // (a + (b - a) t need not give b at t = 1).
    q[0] = t0 == 0.0 ? p[0] : CubicBezier::Evaluate(p, t0);
    q[3] = t1 == 1.0 ? p[3] : CubicBezier::Evaluate(p, t1);
    return q;
  };
  int extra = 0;
  for (int i = 0; i <= m; ++i) {
    bezier2dT<V> q = piece(i);
    Unit qu;
    while (extra < kMaxRecuts && m + 1 < int(cuts.size()) && MakeUnit(q.data(), distance, qu)) {
      const double r = InteriorFold(q.data(), qu);
      if (r < 0.0) break;
      const double t0 = i > 0 ? cuts[i - 1] : 0.0, t1 = i < m ? cuts[i] : 1.0;
      const double t = t0 + (t1 - t0) * r;
      if (!(t > t0 && t < t1)) break;
      std::copy_backward(cuts.begin() + i, cuts.begin() + m, cuts.begin() + m + 1);
      cuts[i] = t;
      ++m;
      ++extra;
      q = piece(i);
    }
    pieces.push_back(q);
    if (params && i < m) params->push_back(cuts[i]);
  }
}

bool FindBezierOffsetCurve(const V* p, V* result, double distance, double squaredTolerance, double& splitAt) {
  if (!result || !std::isfinite(squaredTolerance) || !(squaredTolerance > 0.0)) return false;
  Unit u;
  if (!MakeUnit(p, distance, u)) return false;
  if (distance == 0.0) {
    std::copy(p, p + 4, result);
    return true;
  }
  double coord = 0.0;
  for (int i = 0; i < 4; ++i) coord = std::max({coord, std::fabs(p[i].x), std::fabs(p[i].y)});
  const double scale = coord + std::fabs(distance);
  const double floor = (kNoiseFloor * scale) * (kNoiseFloor * scale);
  const double accept = std::max(squaredTolerance, floor) * kCheckMargin;
  const bool splittable = u.size > kTinyPiece * scale;

  // A fold inside: split there, the halves have it at their ends.
  const double fold = InteriorFold(p, u);
  if (fold > 0.0) {
    if (splittable) splitAt = fold;
    return false;
  }

  // Samples where the offset is spread evenly enough: sixteenths, halved
  // where the normal turns faster than a step whose arc of radius |d| stays
  // within 1/20 of the tolerance of its chord over a quarter step (so that
  // the checks at quarter steps cannot miss a swing of the offset).
  const double tol = std::sqrt(std::max(squaredTolerance, floor));
  const double x = 1.0 - 0.05 * tol / std::fabs(distance);
  const double step = std::clamp(8.0 * (x > -1.0 ? std::acos(x) : 3.14159), kMinTurnStep, kMaxTurnStep);
  double ts[kMaxSamples];
  D dirs[kMaxSamples];
  double halfTurn = 0.5;
  const int count = SampleParameters(u, std::cos(step), ts, dirs, halfTurn);
  if (count > 0) {
    // Direction of the offset relative to the curve: constant on the piece.
    const double sigma = u.H(0.5) < 0.0 ? -1.0 : 1.0;
    V samples[kMaxSamples];
    double params[kMaxSamples];
    for (int j = 0; j < count; ++j) {
      samples[j] = OffsetPoint(p, u, distance, ts[j]);
      params[j] = j == 0 ? 0.0 : params[j - 1] + Distance(samples[j], samples[j - 1]);
    }
    V fit[4];
    const double error = LeastSquares(samples, params, count, dirs[0] * sigma, dirs[count - 1] * sigma, fit,
                                      kFitIterations, nullptr, 0.25 * accept);
    bool ok = error < accept;
    for (int j = 0; ok && j + 1 < count; ++j) ok = params[j + 1] >= params[j];
    // Check the quarter points between samples against the true offset.
    // Four Newton steps from the arc-length guess: the fit follows the
    // samples, so the guess is already near the foot.
    for (int j = 0; ok && j + 1 < count; ++j) {
      for (int k = 1; ok && k < 4; ++k) {
        const double t = ts[j] + (ts[j + 1] - ts[j]) * 0.25 * k;
        double guess = params[j] + (params[j + 1] - params[j]) * 0.25 * k;
        ok = CubicBezier::internal::PolishNearest(fit, OffsetPoint(p, u, distance, t), guess, 0.0, 1.0, 4) < accept;
      }
    }
    if (ok) {
      std::copy(fit, fit + 4, result);
      return true;
    }
  }
  if (splittable) {
    // An inflection inside is the natural seam; otherwise split the turn in
    // half, which isolates a tight bend in few steps.
    double r[2];
    const int n = Inflections(u, r);
    double at = -1.0;
    for (int i = 0; i < n; ++i)
      if ((at < 0.0 || std::fabs(r[i] - 0.5) < std::fabs(at - 0.5)) && Inside(p, r[i])) at = r[i];
    if (at < 0.0) at = Inside(p, halfTurn) ? halfTurn : 0.5;
    splitAt = at;
  }
  return false;
}

bool IsBezierValidForOffset(const V* p, double distance) {
  Unit u;
  if (!MakeUnit(p, distance, u)) return false;
  return InteriorFold(p, u) < 0.0;
}

}  // namespace MavikMath
