#include "ostracrv/math/linear_solvers.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <random>
#include <vector>

namespace {

using namespace MavikMath;

// Dense Gaussian elimination with partial pivoting: the reference.
std::vector<double> DenseSolve(std::vector<std::vector<double>> m, std::vector<double> r) {
  const std::size_t n = r.size();
  for (std::size_t k = 0; k < n; ++k) {
    std::size_t p = k;
    for (std::size_t i = k + 1; i < n; ++i)
      if (std::fabs(m[i][k]) > std::fabs(m[p][k])) p = i;
    std::swap(m[k], m[p]);
    std::swap(r[k], r[p]);
    for (std::size_t i = k + 1; i < n; ++i) {
      const double f = m[i][k] / m[k][k];
      for (std::size_t j = k; j < n; ++j) m[i][j] -= f * m[k][j];
      r[i] -= f * r[k];
    }
  }
  std::vector<double> x(n);
  for (std::size_t i = n; i-- > 0;) {
    double s = r[i];
    for (std::size_t j = i + 1; j < n; ++j) s -= m[i][j] * x[j];
    x[i] = s / m[i][i];
  }
  return x;
}

// The dense form of the rows, with the corners wrapped when cyclic.
std::vector<std::vector<double>> Dense(const std::vector<std::array<double, 3>>& rows, bool cyclic) {
  const std::size_t n = rows.size();
  std::vector<std::vector<double>> m(n, std::vector<double>(n, 0.0));
  for (std::size_t i = 0; i < n; ++i) {
    m[i][i] += rows[i][1];
    if (i > 0) m[i][i - 1] += rows[i][0]; else if (cyclic) m[i][n - 1] += rows[i][0];
    if (i + 1 < n) m[i][i + 1] += rows[i][2]; else if (cyclic) m[i][0] += rows[i][2];
  }
  return m;
}

TEST(TridiagonalMatrix, MatchesDenseElimination) {
  std::mt19937 rng(4);
  std::uniform_real_distribution<double> u(-1.0, 1.0);
  for (int trial = 0; trial < 400; ++trial) {
    const std::size_t n = 1 + trial % 40;
    const bool cyclic = trial % 2 == 1;
    std::vector<std::array<double, 3>> rows(n);
    TridiagonalMatrix m(n);
    std::vector<double> r(n);
    std::vector<V> rv(n);
    for (std::size_t i = 0; i < n; ++i) {
      // Diagonally dominant, as spline systems are.
      rows[i] = {u(rng), 0.0, u(rng)};
      rows[i][1] = (2.5 + u(rng)) * (u(rng) < 0 ? -1 : 1);
      m.AddRow(rows[i][0], rows[i][1], rows[i][2]);
      r[i] = 10 * u(rng);
      rv[i] = V{r[i], -2 * r[i] + 1};
    }
    const std::vector<double> x = m.Solve(r, cyclic);
    const std::vector<double> ref = DenseSolve(Dense(rows, cyclic), r);
    ASSERT_EQ(x.size(), n);
    for (std::size_t i = 0; i < n; ++i) EXPECT_NEAR(x[i], ref[i], 1e-10 * (1 + std::fabs(ref[i])));
    // The V form solves both coordinates with the same matrix.
    std::vector<double> ry(n);
    for (std::size_t i = 0; i < n; ++i) ry[i] = rv[i].y;
    const std::vector<V> xv = m.Solve(rv, cyclic);
    const std::vector<double> y = m.Solve(ry, cyclic);
    ASSERT_EQ(xv.size(), n);
    for (std::size_t i = 0; i < n; ++i) {
      EXPECT_EQ(xv[i].x, x[i]);
      EXPECT_EQ(xv[i].y, y[i]);
    }
  }
}

TEST(TridiagonalMatrix, ClosedNaturalSplineThroughASquare) {
  // Derivatives of the closed C2 spline through the corners of a square:
  // with D_i = k (p[i+1] - p[i-1]) the neighbours' chords cancel (they turn
  // by +-90 degrees), so 4 k = 3.
  const std::vector<V> p = {{0, 0}, {1, 0}, {1, 1}, {0, 1}};
  TridiagonalMatrix m;
  std::vector<V> r;
  for (std::size_t i = 0; i < 4; ++i) {
    m.AddRow(1.0, 4.0, 1.0);
    const V& next = p[(i + 1) % 4];
    const V& prev = p[(i + 3) % 4];
    r.push_back(V{3 * (next.x - prev.x), 3 * (next.y - prev.y)});
  }
  const std::vector<V> d = m.Solve(r, true);
  ASSERT_EQ(d.size(), 4u);
  EXPECT_NEAR(d[0].x, 0.75, 1e-12);
  EXPECT_NEAR(d[0].y, -0.75, 1e-12);
  EXPECT_NEAR(d[2].x, -0.75, 1e-12);
  EXPECT_NEAR(d[2].y, 0.75, 1e-12);
}

TEST(TridiagonalMatrix, FailuresGiveEmptyResults) {
  TridiagonalMatrix empty;
  EXPECT_TRUE(empty.Solve(std::vector<double>{}, false).empty());
  TridiagonalMatrix m;
  m.AddRow(0, 0, 1);  // zero pivot
  m.AddRow(1, 2, 0);
  EXPECT_TRUE(m.Solve(std::vector<double>{1, 2}, false).empty());
  EXPECT_TRUE(m.Solve(std::vector<double>{1}, false).empty());  // size mismatch
  TridiagonalMatrix ok;
  ok.AddRow(0, 2, 1);
  ok.AddRow(1, 2, 0);
  EXPECT_TRUE(ok.Solve(std::vector<double>{1, std::nan("")}, false).empty());
  EXPECT_EQ(ok.Solve(std::vector<double>{3, 3}, false).size(), 2u);
  // Cyclic 2x2 whose wrapped entries make it singular.
  TridiagonalMatrix singular;
  singular.AddRow(1, 2, 1);
  singular.AddRow(1, 2, 1);
  EXPECT_TRUE(singular.Solve(std::vector<V>{{1, 1}, {2, 2}}, true).empty());
}

TEST(Gaussian, IsTheNormalDensity) {
  const double sigma = 1.7;
  double sum = 0.0;
  for (int i = -2000; i <= 2000; ++i) sum += Gaussian(i * 0.01, 0.3, sigma) * 0.01;
  EXPECT_NEAR(sum, 1.0, 1e-9);
  EXPECT_NEAR(Gaussian(0.3, 0.3, sigma), 1.0 / (sigma * std::sqrt(2 * M_PI)), 1e-15);
  EXPECT_DOUBLE_EQ(Gaussian(0.3 + 1.1, 0.3, sigma), Gaussian(0.3 - 1.1, 0.3, sigma));
  EXPECT_NEAR(Gaussian(sigma, 0.0, sigma) / Gaussian(0.0, 0.0, sigma), std::exp(-0.5), 1e-15);
  EXPECT_EQ(Gaussian(1.0, 0.0, 0.0), 0.0);
  EXPECT_EQ(Gaussian(1.0, 0.0, -1.0), 0.0);
  EXPECT_EQ(Gaussian(std::nan(""), 0.0, 1.0), 0.0);
}

}  // namespace
