// Least-squares fitting of one cubic Bezier to a run of samples, and the
// regression line of a point set.
//
// LeastSquares: Schneider's least-squares fit, refined by a damped
// Gauss-Newton (Levenberg-Marquardt) search over handles and parameters.
// The ends of the cubic are pinned on the first and last sample and the unit
// tangent directions t1 (start) and t2 (end, both in the direction of travel)
// are fixed, so the curve is
//   B(u) = P0 (B0 + B1) + P3 (B2 + B3) + alpha t1 B1(u) - beta t2 B2(u)
// and only the two handle lengths alpha, beta and one parameter u_i per
// sample are unknown.
// 1. Start: u_i from the arc lengths; for fixed u_i the sum of squared
//    distances is a quadratic in (alpha, beta), whose 2x2 normal equations
//    give the handles in closed form (Schneider). One Newton-Raphson step per
//    sample on f(u) = (B(u) - Q).B'(u) then moves each u_i towards its
//    nearest point.
// 2. Each further round is one Levenberg-Marquardt step on all unknowns at
//    once. Every residual depends on the two handles and its own parameter
//    only, so the normal equations are an arrow: the diagonal parameter block
//    is eliminated (Schur complement), leaving a 2x2 system; the parameter
//    steps follow by back-substitution, and each takes one Newton-Raphson
//    step on the trial curve before the trial is judged. A step is kept only
//    if the sum of squares falls; otherwise the damping grows.
// Why not Schneider's plain alternation (solve handles, reparameterise,
// repeat)? It converges linearly and stalls in the long, curved valleys where
// handle length trades against parameter spacing; there it needs hundreds of
// rounds where the joint step needs ten. The cost stays O(n) per round.
// Like every local search, a strongly asymmetric arc can settle in a second,
// nearly as good minimum (about 1 fit in 100 on random arcs, with errors near
// 1e-5 of the chord); the error returned is then that of the curve returned,
// so callers simply see a less good fit.
//
// Guards (why each exists):
// - A singular 2x2 system (all parameters at the ends, or one distinct inner
//   parameter with parallel tangents) has no unique handles: equal handles are
//   solved along alpha = beta, or a third of the chord is taken (the handle of
//   a straight cubic with uniform speed).
// - A non-positive handle would turn the given tangent round. The handles are
//   bounded below by kMinHandle times the chord; the first solve finds the
//   exact bounded optimum (for a convex quadratic it lies on an edge of the
//   feasible box, a one-dimensional problem), later steps are clamped.
// - A Newton step is kept only if it brings the curve point closer to the
//   sample, and the parameter is clamped to [0, 1].
// - The best curve seen (smallest error) is returned, not the last one.
//
// Error: the maximum squared distance from a sample to the curve, measured at
// each sample's refined parameter (after a final polish of at most
// kPolishSteps Newton steps on the returned curve). It is therefore an upper
// bound of, and in practice equal to, the squared distance of the worst
// sample from the curve; callers compare it with a squared tolerance. A mean
// would hide a single outlier, which is exactly what a fit test must see.
//
// The constants are listed and explained in least_squares.cpp.
#pragma once

#include "ostracrv/math/vector2d.h"

namespace MavikMath {

// The error returned on bad input: larger than any tolerance, so that every
// caller's "error below tolerance" test fails and bezierOut (left untouched)
// is never used.
inline constexpr double kLeastSquaresNoFit = 1.7976931348623157e308;

// Fits one cubic to points[0..count-1] and writes its four points to
// bezierOut. bezierOut[0] is points[0] and bezierOut[3] is points[count-1]
// exactly; bezierOut[1] lies on the ray from bezierOut[0] along startTangent,
// bezierOut[2] on the ray from bezierOut[3] against endTangent.
//
// parameters: count values, the cumulative arc length of each sample (any
//   increasing measure starting anywhere; it is normalised to [0, 1]). If it
//   is null, not finite, decreasing or constant, the chord-length
//   parameterisation of the samples is used instead. On success it is
//   overwritten with the refined parameters (in [0, 1]) of the returned curve.
// startTangent, endTangent: any length, in the direction of travel at both
//   ends; a squared length not above kEpsilon counts as zero.
// iterations: refinement rounds after the first solve (at most; negative
//   counts as 0). The loop also ends early once a round gains nothing.
// reserved: ignored (always null).
// stopErrorSqrd: refinement stops as soon as the error is below this value;
//   a negative value (the callers pass -1.0) means no early stop.
//
// Returns the error (see above): 0 for two samples or samples on the curve.
// Samples that all coincide give the point Bezier at them with error 0.
// Fails on null pointers, count < 2, a non-finite sample or tangent, or a
// zero tangent: returns kLeastSquaresNoFit and leaves bezierOut and
// parameters untouched. O(count x iterations), no allocation up to 64 samples.
double LeastSquares(const V* points, double* parameters, int count, const D& startTangent, const D& endTangent,
                    V* bezierOut, int iterations, double* reserved, double stopErrorSqrd) noexcept;

// The same with the chord-length parameterisation of the samples and no
// early stop.
double LeastSquares(const V* points, int count, const D& startTangent, const D& endTangent, V* bezierOut,
                    int iterations) noexcept;

// The regression line of points[0..count-1] by total least squares: origin is
// the centroid and direction the unit principal axis of the centred point set
// (eigenvector of the largest eigenvalue of the 2x2 scatter matrix, from the
// closed form angle = atan2(2 Sxy, Sxx - Syy) / 2). Unlike a regression of y
// on x it treats both axes alike, so vertical runs fit as well as horizontal
// ones, and it minimises the perpendicular distances that callers measure.
// The direction is oriented so that it does not point backwards from the
// first point to the last. For an isotropic spread (no preferred axis) the
// direction from the first to the last point is taken.
//
// If all points coincide (mean squared distance from the centroid not above
// kEpsilon), origin is that point and direction is (0, 0).
// On null pointers, count < 1 or a non-finite point, origin and direction are
// left untouched. O(count).
void GetLeastSquaresLines(const V* points, int count, V& origin, D& direction) noexcept;

}  // namespace MavikMath
