// Small numerical services of the spline and smoothing code: the Gaussian
// bell and tridiagonal linear systems.
//
// TridiagonalMatrix holds one row per AddRow: row i reads
//   left_i x[i-1] + centre_i x[i] + right_i x[i+1] = r[i].
// Solve(r, false) drops left_0 and right_(n-1) and runs the Thomas algorithm
// (Gaussian elimination without pivoting on the three diagonals, O(n)). It
// is stable for diagonally dominant systems, which is what spline
// interpolation produces; a zero pivot is reported as failure rather than
// pivoted around.
// Solve(r, true) treats the system as cyclic: left_0 multiplies x[n-1] and
// right_(n-1) multiplies x[0], as on a closed curve. The two corner entries
// are a rank-one correction u v^T of a tridiagonal matrix, so the
// Sherman-Morrison formula solves it with two Thomas solves, O(n):
// x = y - z (v . y) / (1 + v . z), with T y = r and T z = u, where
// u = (g, 0, ..., 0, right_(n-1)), v = (1, 0, ..., 0, left_0 / g), and T is
// the matrix with centre_0 - g and centre_(n-1) - left_0 right_(n-1) / g on
// its diagonal; g = -centre_0 keeps the new diagonal away from cancellation.
// Systems of one or two rows are solved directly (with wrap-around the
// corner entries fall onto the diagonal or the other entry of the row).
#pragma once

#include <vector>

#include "ostracrv/math/vector2d.h"

namespace MavikMath {

// The normal density exp(-(x - mean)^2 / (2 sigma^2)) / (sigma sqrt(2 pi)).
// Returns 0 for sigma not above 0 and for non-finite input.
double Gaussian(double x, double mean, double sigma) noexcept;

class TridiagonalMatrix {
 public:
  TridiagonalMatrix() = default;
  // Room for n rows, so that adding them does not reallocate.
  explicit TridiagonalMatrix(std::size_t n);

  // Appends the row (left, centre, right); see above for the wrap-around.
  void AddRow(double left, double centre, double right);
  std::size_t Size() const noexcept { return centre_.size(); }
  void Clear() noexcept;

  // The solution of the system for the right side r, one value per row.
  // Returns an empty vector when r has a different size from the matrix, the
  // matrix is empty, a pivot is zero (the system is singular or needs
  // pivoting), or the input or the result is not finite.
  // The V form solves for x and y with the same matrix.
  std::vector<double> Solve(const std::vector<double>& r, bool cyclic) const;
  std::vector<V> Solve(const std::vector<V>& r, bool cyclic) const;

 private:
  bool SolveInto(const double* r, double* x, bool cyclic, std::vector<double>& scratch) const;

  std::vector<double> left_, centre_, right_;
};

}  // namespace MavikMath
