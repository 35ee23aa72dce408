// Real root isolation for small polynomials; see polynomial.h for the method.
#include "ostracrv/math/polynomial.h"

#include <algorithm>
#include <cmath>

namespace MavikMath {

int SolveQuadratic(double a, double b, double c, double roots[2]) noexcept {
  if (!std::isfinite(a) || !std::isfinite(b) || !std::isfinite(c)) return 0;
  if (a == 0.0) {
    if (b == 0.0) return 0;
    roots[0] = -c / b;
    return 1;
  }
  const double disc = b * b - 4.0 * a * c;
  if (disc < 0.0) {
    // A negative discriminant at the rounding level of b^2 is a double root.
    if (-disc > 8.0 * 2.220446049250313e-16 * b * b) return 0;
    roots[0] = -b / (2.0 * a);
    return 1;
  }
  if (disc == 0.0) {
    roots[0] = -b / (2.0 * a);
    return 1;
  }
  const double q = -0.5 * (b + std::copysign(std::sqrt(disc), b));
  double r0 = q / a;
  double r1 = q != 0.0 ? c / q : -r0;
  if (r0 > r1) std::swap(r0, r1);
  roots[0] = r0;
  if (r1 == r0) return 1;
  roots[1] = r1;
  return 2;
}

double EvaluatePolynomial(const double* c, int degree, double x) noexcept {
  double v = c[degree];
  for (int i = degree - 1; i >= 0; --i) v = v * x + c[i];
  return v;
}

namespace {

// Value and a bound on its rounding error (running error bound of Horner).
void EvaluateWithError(const double* c, int degree, double x, double& value, double& error) {
  double v = c[degree];
  double e = std::fabs(v) * 0.5;
  const double ax = std::fabs(x);
  for (int i = degree - 1; i >= 0; --i) {
    v = v * x + c[i];
    e = e * ax + std::fabs(v);
  }
  value = v;
  error = e * 2.0 * 2.220446049250313e-16 * 2.0;
}

// The single root of a monotone polynomial on [a, b] given a sign change.
double SolveBracketed(const double* c, const double* dc, int degree, double a, double b, double fa) {
  double x = 0.5 * (a + b);
  for (int it = 0; it < 100; ++it) {
    const double fx = EvaluatePolynomial(c, degree, x);
    if (fx == 0.0) return x;
    if ((fx < 0.0) == (fa < 0.0)) {
      a = x;
      fa = fx;
    } else {
      b = x;
    }
    const double d = EvaluatePolynomial(dc, degree - 1, x);
    double next = d != 0.0 ? x - fx / d : a - 1.0;
    if (!(next > a && next < b)) next = 0.5 * (a + b);
    if (next == x || b - a <= 4.0 * 2.220446049250313e-16 * std::max(std::fabs(a), std::fabs(b))) {
      return next;
    }
    x = next;
  }
  return x;
}

int RootsRecursive(const double* c, int degree, double lo, double hi, double* roots) {
  while (degree > 0 && c[degree] == 0.0) --degree;
  if (degree <= 0) return 0;
  if (degree == 1) {
    const double r = -c[0] / c[1];
    if (r >= lo && r <= hi) {
      roots[0] = r;
      return 1;
    }
    return 0;
  }
  if (degree == 2) {
    double q[2];
    const int k = SolveQuadratic(c[2], c[1], c[0], q);
    int m = 0;
    for (int i = 0; i < k; ++i)
      if (q[i] >= lo && q[i] <= hi) roots[m++] = q[i];
    return m;
  }
  double dc[kMaxPolynomialDegree];
  for (int i = 1; i <= degree; ++i) dc[i - 1] = c[i] * i;
  double crit[kMaxPolynomialDegree];
  const int nc = RootsRecursive(dc, degree - 1, lo, hi, crit);

  // Stretch ends: lo, the critical points, hi.
  double ends[kMaxPolynomialDegree + 2];
  int ne = 0;
  ends[ne++] = lo;
  for (int i = 0; i < nc; ++i)
    if (crit[i] > ends[ne - 1] && crit[i] < hi) ends[ne++] = crit[i];
  ends[ne++] = hi;

  int m = 0;
  double fPrev, ePrev;
  EvaluateWithError(c, degree, ends[0], fPrev, ePrev);
  if (std::fabs(fPrev) <= ePrev) roots[m++] = ends[0];
  // A polynomial of degree d has at most d distinct roots; the tolerance test
  // at stretch ends must not report more.
  for (int i = 1; i < ne; ++i) {
    double f, e;
    EvaluateWithError(c, degree, ends[i], f, e);
    const bool zeroHere = std::fabs(f) <= e;
    const bool zeroPrev = std::fabs(fPrev) <= ePrev;
    if (m >= degree) break;
    if (zeroHere) {
      roots[m++] = ends[i];
    } else if (!zeroPrev && ((f < 0.0) != (fPrev < 0.0))) {
      roots[m++] = SolveBracketed(c, dc, degree, ends[i - 1], ends[i], fPrev);
    }
    fPrev = f;
    ePrev = e;
  }
  return m;
}

}  // namespace

int FindRootsInInterval(const double* coeffs, int degree, double lo, double hi, double* roots) noexcept {
  if (!coeffs || !roots || degree < 0 || degree > kMaxPolynomialDegree || !(lo <= hi)) return 0;
  for (int i = 0; i <= degree; ++i)
    if (!std::isfinite(coeffs[i])) return 0;
  if (!std::isfinite(lo) || !std::isfinite(hi)) return 0;
  double tmp[kMaxPolynomialDegree + 2];
  int n = RootsRecursive(coeffs, degree, lo, hi, tmp);
  if (n > degree) n = degree;
  // Insertion sort: at most a handful of roots.
  for (int i = 1; i < n; ++i)
    for (int j = i; j > 0 && tmp[j] < tmp[j - 1]; --j) std::swap(tmp[j], tmp[j - 1]);
  int m = 0;
  for (int i = 0; i < n; ++i) {
    if (m > 0 && tmp[i] - roots[m - 1] <= 1e-14 * std::max(1.0, std::fabs(tmp[i]))) continue;
    if (m >= degree) break;
    roots[m++] = tmp[i];
  }
  return m;
}

}  // namespace MavikMath
