// Real roots of small polynomials.
//
// Coefficients are given in ascending order: c[0] + c[1] x + ... + c[n] x^n.
//
// SolveQuadratic uses the cancellation-free form q = -(b + sign(b) sqrt(disc))/2,
// roots q/a and c/q, so that neither root loses digits when b^2 >> 4ac.
//
// FindRootsInInterval isolates roots by recursion on the derivative: the real
// roots of p' split [lo, hi] into stretches on which p is monotone, so each
// stretch holds at most one root, found by safeguarded Newton (a Newton step
// that leaves the bracket falls back to bisection) to full double precision.
// A critical point where |p| is at the rounding level of the evaluation is a
// double root (a tangency) and is reported once. This is exact in structure
// for any degree and costs O(n^3) evaluations; the library uses degree <= 6.
#pragma once

namespace MavikMath {

inline constexpr int kMaxPolynomialDegree = 10;

// Roots of a x^2 + b x + c = 0 in ascending order; degenerates to the linear
// and constant cases. Returns the count (0, 1 or 2); an identically zero
// polynomial yields 0. A double root is reported once.
int SolveQuadratic(double a, double b, double c, double roots[2]) noexcept;

// Value of the polynomial at x (Horner). Unchecked: coeffs must hold
// degree + 1 values, degree >= 0.
double EvaluatePolynomial(const double* coeffs, int degree, double x) noexcept;

// All real roots in [lo, hi], ascending, deduplicated. roots must hold
// degree entries. Returns the count; 0 for a zero polynomial, a degree out of
// 0..kMaxPolynomialDegree, non-finite input or an empty interval.
int FindRootsInInterval(const double* coeffs, int degree, double lo, double hi, double* roots) noexcept;

}  // namespace MavikMath
