// Gaussian bell and tridiagonal solves; see linear_solvers.h.
#include "ostracrv/math/linear_solvers.h"

#include <cmath>

namespace MavikMath {

namespace {

constexpr double kSqrtTwoPi = 2.50662827463100050242;

// Thomas algorithm on rows 0..n-1 with sub-diagonal l (l[0] unused),
// diagonal c (first and last replaced by c0 and cn), super-diagonal u (u[n-1]
// unused). cp is scratch of n values. False on a zero or non-finite pivot.
bool Thomas(std::size_t n, const double* l, const double* c, const double* u, double c0, double cn, const double* r,
            double* x, double* cp) noexcept {
  auto diag = [&](std::size_t i) { return i == 0 ? c0 : (i + 1 == n ? cn : c[i]); };
  double pivot = diag(0);
  if (pivot == 0.0 || !std::isfinite(pivot)) return false;
  cp[0] = n > 1 ? u[0] / pivot : 0.0;
  x[0] = r[0] / pivot;
  for (std::size_t i = 1; i < n; ++i) {
    pivot = diag(i) - l[i] * cp[i - 1];
    if (pivot == 0.0 || !std::isfinite(pivot)) return false;
    cp[i] = i + 1 < n ? u[i] / pivot : 0.0;
    x[i] = (r[i] - l[i] * x[i - 1]) / pivot;
  }
  for (std::size_t i = n - 1; i-- > 0;) x[i] -= cp[i] * x[i + 1];
  return true;
}

}  // namespace

double Gaussian(double x, double mean, double sigma) noexcept {
  if (!std::isfinite(x) || !std::isfinite(mean) || !std::isfinite(sigma) || !(sigma > 0.0)) return 0.0;
  const double z = (x - mean) / sigma;
  return std::exp(-0.5 * z * z) / (sigma * kSqrtTwoPi);
}

TridiagonalMatrix::TridiagonalMatrix(std::size_t n) {
  left_.reserve(n);
  centre_.reserve(n);
  right_.reserve(n);
}

void TridiagonalMatrix::AddRow(double left, double centre, double right) {
  left_.push_back(left);
  centre_.push_back(centre);
  right_.push_back(right);
}

void TridiagonalMatrix::Clear() noexcept {
  left_.clear();
  centre_.clear();
  right_.clear();
}

bool TridiagonalMatrix::SolveInto(const double* r, double* x, bool cyclic, std::vector<double>& scratch) const {
  const std::size_t n = centre_.size();
  const double* l = left_.data();
  const double* c = centre_.data();
  const double* u = right_.data();
  if (!cyclic) {
    scratch.resize(n);
    return Thomas(n, l, c, u, c[0], c[n - 1], r, x, scratch.data());
  }
  if (n == 1) {
    const double d = l[0] + c[0] + u[0];
    if (d == 0.0) return false;
    x[0] = r[0] / d;
    return true;
  }
  if (n == 2) {
    // Row 0: c0 x0 + (l0 + u0) x1; row 1: (l1 + u1) x0 + c1 x1.
    const double a00 = c[0], a01 = l[0] + u[0], a10 = l[1] + u[1], a11 = c[1];
    const double det = a00 * a11 - a01 * a10;
    if (det == 0.0) return false;
    x[0] = (r[0] * a11 - a01 * r[1]) / det;
    x[1] = (a00 * r[1] - a10 * r[0]) / det;
    return true;
  }
  const double alpha = u[n - 1], beta = l[0];
  const double g = c[0] != 0.0 ? -c[0] : -1.0;
  const double c0 = c[0] - g, cn = c[n - 1] - alpha * beta / g;
  // scratch: cp (n), z (n), rhs of the second solve (n).
  scratch.assign(3 * n, 0.0);
  double* cp = scratch.data();
  double* z = cp + n;
  double* e = z + n;
  if (!Thomas(n, l, c, u, c0, cn, r, x, cp)) return false;
  e[0] = g;
  e[n - 1] = alpha;
  if (!Thomas(n, l, c, u, c0, cn, e, z, cp)) return false;
  const double denominator = 1.0 + z[0] + beta * z[n - 1] / g;
  if (denominator == 0.0) return false;
  const double factor = (x[0] + beta * x[n - 1] / g) / denominator;
  for (std::size_t i = 0; i < n; ++i) x[i] -= factor * z[i];
  return true;
}

std::vector<double> TridiagonalMatrix::Solve(const std::vector<double>& r, bool cyclic) const {
  const std::size_t n = centre_.size();
  if (n == 0 || r.size() != n) return {};
  for (double v : r)
    if (!std::isfinite(v)) return {};
  std::vector<double> x(n), scratch;
  if (!SolveInto(r.data(), x.data(), cyclic, scratch)) return {};
  for (double v : x)
    if (!std::isfinite(v)) return {};
  return x;
}

std::vector<V> TridiagonalMatrix::Solve(const std::vector<V>& r, bool cyclic) const {
  const std::size_t n = centre_.size();
  if (n == 0 || r.size() != n) return {};
  std::vector<double> rx(n), ry(n);
  for (std::size_t i = 0; i < n; ++i) {
    rx[i] = r[i].x;
    ry[i] = r[i].y;
  }
  const std::vector<double> x = Solve(rx, cyclic);
  if (x.empty()) return {};
  const std::vector<double> y = Solve(ry, cyclic);
  if (y.empty()) return {};
  std::vector<V> result(n);
  for (std::size_t i = 0; i < n; ++i) result[i] = V{x[i], y[i]};
  return result;
}

}  // namespace MavikMath
