// Tangent, curvature, curvature extrema and axis tangents of a cubic Bezier;
// see bezier_derivatives.h for the conventions and methods.
//
// Constants:
// - kStep = 1e-6: the parameter step into the curve at which the curvature
//   is read where the speed vanishes. Far below any geometric feature of a
//   cubic yet far above the rounding level of t.
// - kCluster = 1e-5: roots of the curvature numerator closer than this in t
//   are one extremum. A cusp is a triple root of that numerator, which double
//   arithmetic resolves only to about the cube root of the rounding level
//   (some 6e-6), so its copies must merge.
#include "ostracrv/math/bezier_derivatives.h"

#include <algorithm>
#include <cmath>

#include "bezier_common.h"
#include "ostracrv/math/polynomial.h"

namespace MavikMath::CubicBezier {

namespace {

using internal::PowerOfTwoScale;

constexpr double kStep = 1e-6;
constexpr double kCluster = 1e-5;

bool AllFinite(const V& a, const V& b, const V& c) noexcept { return a.IsFinite() && b.IsFinite() && c.IsFinite(); }

// Roots in [0, 1] of q2 t^2 + q1 t + q0, ascending; returns the count.
int AxisRoots(double q2, double q1, double q0, double ts[2]) noexcept {
  if (!std::isfinite(q2) || !std::isfinite(q1) || !std::isfinite(q0)) return 0;
  const double m = std::max({std::fabs(q2), std::fabs(q1), std::fabs(q0)});
  if (m == 0.0) return 0;
  // Bring the magnitudes near 1 so that q1^2 - 4 q2 q0 cannot overflow.
  q2 /= m;
  q1 /= m;
  q0 /= m;
  double r[2];
  const int k = SolveQuadratic(q2, q1, q0, r);
  int n = 0;
  for (int i = 0; i < k; ++i)
    if (r[i] >= 0.0 && r[i] <= 1.0) ts[n++] = r[i];
  return n;
}

}  // namespace

D SafeBezierTangent(double t, const V& a, const V& b, const V& c, const V& /*d*/) noexcept {
  if (!std::isfinite(t) || !AllFinite(a, b, c)) return D{0.0, 0.0};
  const D first = Derivative(a, b, c, t);
  if (first.SquaredLength() > kEpsilon) return first;
  // Arriving at the end, the second-order term points backwards.
  D second = SecondDerivative(a, b, t);
  if (t >= 1.0) second = -second;
  const D third = ThirdDerivative(a);
  const D chord{a.x + b.x + c.x, a.y + b.y + c.y};
  const D candidates[4] = {first, second, third, chord};
  for (const D& v : candidates)
    if (v.SquaredLength() > kEpsilon) return v;
  for (const D& v : candidates)
    if (v.x != 0.0 || v.y != 0.0) return v;
  return D{0.0, 0.0};
}

double SafeBezierCurvature(double t, const V& a, const V& b, const V& c) noexcept {
  if (!std::isfinite(t) || !AllFinite(a, b, c)) return 0.0;
  const double s = PowerOfTwoScale(a, b, c);
  if (s == 0.0) return 0.0;
  if (!(Derivative(a, b, c, t).SquaredLength() > kEpsilon)) t = t + kStep <= 1.0 ? t + kStep : t - kStep;
  // Curvature scales as 1 / size: work on coefficients near 1, then rescale.
  const V sa = a / s, sb = b / s, sc = c / s;
  const D d1 = Derivative(sa, sb, sc, t);
  const D d2 = SecondDerivative(sa, sb, t);
  const double speed2 = d1.SquaredLength();
  if (speed2 == 0.0) return 0.0;
  const double k = Cross(d1, d2) / (speed2 * std::sqrt(speed2)) / s;
  return std::isfinite(k) ? k : 0.0;
}

bool GetCurvatureRadiusAt(double t, const V& a, const V& b, const V& c, double& radius) noexcept {
  if (!std::isfinite(t) || !AllFinite(a, b, c)) return false;
  const double s = PowerOfTwoScale(a, b, c);
  if (s == 0.0) return false;
  const V sa = a / s, sb = b / s, sc = c / s;
  const D d1 = Derivative(sa, sb, sc, t);
  const D d2 = SecondDerivative(sa, sb, t);
  const double cross = Cross(d1, d2);
  if (cross == 0.0) return false;
  const double speed2 = d1.SquaredLength();
  const double r = speed2 * std::sqrt(speed2) / cross * s;
  if (!std::isfinite(r) || r == 0.0) return false;
  radius = r;
  return true;
}

int FindCurvatureMinMax(const V& a0, const V& b0, const V& c0, double* params) noexcept {
  if (!params || !AllFinite(a0, b0, c0)) return 0;
  const double s = PowerOfTwoScale(a0, b0, c0);
  if (s == 0.0) return 0;
  // The parameters of the extrema do not depend on the size of the curve.
  const V a = a0 / s, b = b0 / s, c = c0 / s;
  double n[6];
  internal::CurvatureSlopePolynomial(a, b, c, n);
  if (std::all_of(n, n + 6, [](double x) { return x == 0.0; })) return 0;  // straight: no curvature
  double roots[5];
  const int k = FindRootsInInterval(n, 5, 0.0, 1.0, roots);
  if (k == 0) return 0;

  // Merge near-equal roots into clusters [lo, hi], then keep those across
  // which the numerator changes sign (or that sit at an end of [0, 1]).
  double lo[5], hi[5];
  int m = 0;
  for (int i = 0; i < k; ++i) {
    if (m > 0 && roots[i] - hi[m - 1] <= kCluster) {
      hi[m - 1] = roots[i];
    } else {
      lo[m] = hi[m] = roots[i];
      ++m;
    }
  }
  int count = 0;
  double out[5];
  for (int i = 0; i < m; ++i) {
    const double mid = 0.5 * (lo[i] + hi[i]);
    if (lo[i] <= 0.0 || hi[i] >= 1.0) {
      out[count++] = std::clamp(mid, 0.0, 1.0);
      continue;
    }
    const double left = 0.5 * ((i > 0 ? hi[i - 1] : 0.0) + lo[i]);
    const double right = 0.5 * (hi[i] + (i + 1 < m ? lo[i + 1] : 1.0));
    const double fl = EvaluatePolynomial(n, 5, left), fr = EvaluatePolynomial(n, 5, right);
    if ((fl < 0.0 && fr > 0.0) || (fl > 0.0 && fr < 0.0)) out[count++] = mid;
  }
  for (int i = 0; i < count; ++i) params[i] = out[i];
  return count;
}

int GetVerticalTangents(const V& a, const V& b, const V& c, double ts[2]) noexcept {
  if (!ts) return 0;
  return AxisRoots(3.0 * a.x, 2.0 * b.x, c.x, ts);
}

int GetHorizontalTangents(const V& a, const V& b, const V& c, double ts[2]) noexcept {
  if (!ts) return 0;
  return AxisRoots(3.0 * a.y, 2.0 * b.y, c.y, ts);
}

void GetVerticalTangents(const V& a, const V& b, const V& c, std::vector<double>& ts) {
  double r[2];
  const int n = GetVerticalTangents(a, b, c, r);
  ts.insert(ts.end(), r, r + n);
}

void GetHorizontalTangents(const V& a, const V& b, const V& c, std::vector<double>& ts) {
  double r[2];
  const int n = GetHorizontalTangents(a, b, c, r);
  ts.insert(ts.end(), r, r + n);
}

}  // namespace MavikMath::CubicBezier
