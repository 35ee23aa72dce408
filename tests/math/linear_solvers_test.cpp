#include "ostracrv/math/linear_solvers.h"

#include <gtest/gtest.h>

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
    for (std::size_t i = k + 1; i < n; ++i) p = std::fabs(m[i][k]) > std::fabs(m[p][k]) ? i : p;
    std::swap(m[k], m[p]);
    std::swap(r[k], r[p]);
    for (std::size_t i = k + 1; i < n; ++i) {
      const double f = m[i][k] / m[k][k];
      for (std::size_t j = k; j < n; ++j) m[i][j] -= f * m[k][j];
      r[i] -= f * r[k];
    }
  }
  for (std::size_t i = n; i-- > 0;) {
    for (std::size_t j = i + 1; j < n; ++j) r[i] -= m[i][j] * r[j];
    r[i] /= m[i][i];
  }
  return r;
}

TEST(TridiagonalMatrix, MatchesDenseEliminationPlainAndCyclic) {
  std::mt19937 rng(4);
  std::uniform_real_distribution<double> u(-1, 1);
  for (int trial = 0; trial < 400; ++trial) {
    const std::size_t n = 1 + trial % 40;
    const bool cyclic = trial % 2;
    TridiagonalMatrix m(n);
    std::vector<std::vector<double>> dense(n, std::vector<double>(n, 0.0));
    std::vector<double> r(n);
    std::vector<V> rv(n);
    for (std::size_t i = 0; i < n; ++i) {
      const double l = u(rng), c = (2.5 + u(rng)) * (u(rng) < 0 ? -1 : 1), e = u(rng);  // dominant, as in splines
      m.AddRow(l, c, e);
      dense[i][i] += c;
      if (i > 0 || cyclic) dense[i][(i + n - 1) % n] += l;  // the corners wrap when cyclic
      if (i + 1 < n || cyclic) dense[i][(i + 1) % n] += e;
      r[i] = 10 * u(rng);
      rv[i] = V{r[i], -2 * r[i] + 1};
    }
    const std::vector<double> x = m.Solve(r, cyclic), ref = DenseSolve(dense, r);
    ASSERT_EQ(x.size(), n);
    for (std::size_t i = 0; i < n; ++i) EXPECT_NEAR(x[i], ref[i], 1e-10 * (1 + std::fabs(ref[i])));
    std::vector<double> ry(n);
    for (std::size_t i = 0; i < n; ++i) ry[i] = rv[i].y;
    const std::vector<V> xv = m.Solve(rv, cyclic);  // both coordinates with the same matrix
    const std::vector<double> refY = DenseSolve(dense, ry);
    ASSERT_EQ(xv.size(), n);
    for (std::size_t i = 0; i < n; ++i) {
      EXPECT_EQ(xv[i].x, x[i]);
      EXPECT_NEAR(xv[i].y, refY[i], 1e-10 * (1 + std::fabs(refY[i])));
    }
  }
}

TEST(TridiagonalMatrix, FailuresGiveEmptyResults) {
  TridiagonalMatrix m;
  EXPECT_TRUE(m.Solve(std::vector<double>{}, false).empty());
  m.AddRow(0, 0, 1);  // zero pivot
  m.AddRow(1, 2, 0);
  EXPECT_TRUE(m.Solve(std::vector<double>{1, 2}, false).empty());
  EXPECT_TRUE(m.Solve(std::vector<double>{1}, false).empty());  // size mismatch
  TridiagonalMatrix ok;
  ok.AddRow(0, 2, 1);
  ok.AddRow(1, 2, 0);
  EXPECT_TRUE(ok.Solve(std::vector<double>{1, std::nan("")}, false).empty());
  TridiagonalMatrix singular;  // cyclic 2x2 whose wrapped entries make it singular
  singular.AddRow(1, 2, 1);
  singular.AddRow(1, 2, 1);
  EXPECT_TRUE(singular.Solve(std::vector<V>{{1, 1}, {2, 2}}, true).empty());
}

TEST(Gaussian, IsTheNormalDensity) {
  const double sigma = 1.7;
  double sum = 0;
  for (int i = -2000; i <= 2000; ++i) sum += Gaussian(i * 0.01, 0.3, sigma) * 0.01;
  EXPECT_NEAR(sum, 1.0, 1e-9);
  EXPECT_NEAR(Gaussian(0.3, 0.3, sigma), 1 / (sigma * std::sqrt(2 * M_PI)), 1e-15);
  EXPECT_NEAR(Gaussian(sigma, 0, sigma) / Gaussian(0, 0, sigma), std::exp(-0.5), 1e-15);
  EXPECT_EQ(Gaussian(1, 0, 0), 0.0);
  EXPECT_EQ(Gaussian(std::nan(""), 0, 1), 0.0);
}

}  // namespace
