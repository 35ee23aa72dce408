// Arc length of a cubic Bezier, of its parts, and the parameter at a given
// fraction of the length.
//
// The length is the integral of the speed |B'(t)| = |3a t^2 + 2b t + c| over
// the parameter range, where a, b, c are the power-basis coefficients of the
// curve itself (bezier_basis.h). The speed is the square root of a quartic:
// smooth wherever it stays away from zero, with a kink where the curve has a
// cusp (B' = 0) and a sharp bend near one. Method:
// - The coefficients are divided by a power of two near their largest
//   magnitude, exactly, so that neither overflow nor underflow can occur;
//   the result is scaled back at the end.
// - x' + i y' is a complex quadratic, so |B'(t)| = |A| |t - z1| |t - z2|
//   with its two complex roots: the singularities of the integrand are known
//   exactly. Cusps (real roots) and near-cusps cut the range, so that each
//   sits at the end of a stretch.
// - Each stretch is covered by Gauss-Legendre panels of 8, 16 or 32 points,
//   chosen from the distance of the singularities with the classical error
//   bound of the rule (Bernstein ellipses), halving panels close to a
//   singularity. Gauss-Legendre converges geometrically on analytic
//   integrands, and placing the panels from a bound rather than from the
//   agreement of two estimates cannot be fooled by an accidental agreement.
//   Ordinary curves take one panel of 8 to 32 evaluations.
//
// LengthAccuracy k asks for a relative error of about 10^-k. Values 1 to 13
// are meaningful; smaller values act as 1 and larger ones as 13. Up to
// accuracy 3 the rules have 3, 8 and 16 points (a cheap estimate).
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath {

// Accuracy of an arc-length integration: the number of correct decimal
// digits asked for (relative error about 10^-accuracy).
using LengthAccuracy = int;
// A cheap estimate, good to about 1%.
inline constexpr LengthAccuracy kLengthEstimate = 2;
// The default of the library: relative error about 1e-10.
inline constexpr LengthAccuracy kLengthPrecise = 10;
// The finest accuracy that double arithmetic supports for this integral.
inline constexpr LengthAccuracy kLengthFinest = 13;

}  // namespace MavikMath

namespace MavikMath::CubicBezier {

// Arc length over [0, 1] from the power-basis coefficients of the curve.
// Returns 0 for a curve that is one point and for non-finite coefficients.
// Cost: one panel of 8 to 32 speed evaluations for an ordinary curve; a
// near-cusp adds about two panels per halving of its distance from the
// real axis (a few dozen panels at most).
double Length(const V& a, const V& b, const V& c, LengthAccuracy accuracy = kLengthPrecise) noexcept;

// Arc length over [t0, t1] (clamped to [0, 1]); 0 when t1 <= t0 or for
// non-finite input. The tolerance is relative to the length of the whole
// curve, so pieces add up to the whole.
double LengthBetween(const V& a, const V& b, const V& c, double t0, double t1,
                     LengthAccuracy accuracy = kLengthPrecise) noexcept;

// Arc length of the Bezier p[0..3] (widened to doubles); 0 for a null
// pointer or non-finite points.
template <class T>
double Length(const T* p, LengthAccuracy accuracy) noexcept;

// Arc length over [0, t] and over [t, 1], at accuracy 10; t is clamped to
// [0, 1]. A null pointer, non-finite points or a NaN t give 0.
template <class T>
double LengthTo(double t, const T* p) noexcept;
template <class T>
double LengthFrom(double t, const T* p) noexcept;

// The parameter t in [0, 1] at which the arc length from the start is
// `fraction` times the whole length: the inverse of LengthTo. The arguments
// are the fraction, then the power-basis coefficients a, b, c, then the
// accuracy. A fraction at most 0 gives 0, at least 1 gives 1; a curve of
// zero length gives the fraction itself (every parameter is the same point);
// non-finite input gives 0. The answer meets the fraction to about
// 10^-accuracy of the whole length, found by safeguarded Newton iteration on
// the length (bisection whenever a Newton step leaves the bracket).
double GetCurveRelativeLengthParameter(double fraction, const V& a, const V& b, const V& c,
                                       LengthAccuracy accuracy = kLengthPrecise) noexcept;

}  // namespace MavikMath::CubicBezier
