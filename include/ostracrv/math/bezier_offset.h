// Support for offsetting one cubic Bezier: where to cut it, whether a piece
// can be offset, and one cubic that approximates the offset of a piece.
//
// Sign convention: the offset at distance d is O(t) = B(t) + d n(t), where
// n(t) is the unit LEFT normal of the direction of travel, the tangent turned
// a quarter counter-clockwise: (-y', x') / |B'| with y up. A positive
// distance offsets to the left, a negative one to the right. The curvature
// kappa = cross(B', B'') / |B'|^3 is positive where the curve turns left, so
// the signed radius 1/kappa is positive on the left, as for
// CubicBezier::GetCurvatureRadiusAt.
//
// Why the cuts: O'(t) = B'(t) (1 - d kappa(t)). Where d kappa = 1, i.e. the
// radius of curvature equals the distance on the offset side, the offset
// stops and turns back (a cusp of the offset; between two such points it
// runs backwards, the "swallowtail" that a later self-intersection clean-up
// removes). Where B' = 0 (a cusp of the curve) the normal flips. At an
// inflection kappa changes sign, and the offset of an S is poorly matched by
// one cubic whose handles follow the end tangents. Between these points the
// offset is smooth, moves in one direction and turns one way.
//
// Methods (all in coordinates relative to p0 and scaled to unit size, so that
// the thresholds below are dimensionless):
// - Inflections: roots of the quadratic cross(B', B'') with a sign change.
// - Cusps: minima of |B'|^2 (roots of the cubic B'.B'') where
//   |B'|^2 <= kCuspSpeedSqr.
// - Offset cusps: roots of h(t) = |B'|^3 - d cross(B', B''), which has the
//   sign of 1 - d kappa. The parameter range is cut at the inflections, cusps
//   and curvature extrema (roots of the quintic
//   cross(B', B''') |B'|^2 - 3 cross(B', B'') (B'.B''), the derivative of
//   kappa up to a positive factor) and at sixteenths as a safety net; on each
//   stretch kappa is monotone, so h changes sign at most once and bisection
//   finds every root to full precision. This is exact in structure, unlike a
//   plain scan, which misses two close roots.
// - Specks: rounding leaves inflections and folds a hair apart around a
//   cusp. A critical point only counts where it splits the piece into two
//   parts that are not dots (control points within sqrt(kEpsilon) of their
//   start); this is measured on the curve, since the parameter says little
//   where the speed vanishes.
// - The approximation (FindBezierOffsetCurve) samples the true offset at
//   sixteenths of the parameter, more densely where the normal turns fast,
//   and fits one cubic by LeastSquares with the offset's end points and end
//   tangent directions fixed; it is then checked against the true offset at
//   the quarter points between samples, each projected on the cubic by Newton
//   steps from the fit's own parameters.
//
// The constants are listed and explained in bezier_offset.cpp.
#pragma once

#include <vector>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath {

// Cuts bezier where a single offset at `distance` cannot follow it: at
// interior inflections, cusps (B' = 0) and points where the signed radius of
// curvature equals `distance` (cusps of the offset). Appends the pieces in
// order to `pieces` (one piece, the input itself, if there is no cut); when
// `params` is given, appends the cut parameters on the input, ascending and
// strictly inside (0, 1): the ends 0 and 1 are never included, so n cuts
// give n + 1 pieces. Neighbouring pieces share their cut point bit for bit.
//
// A cut that would leave a dot is dropped (a cusp is cut all the same), and
// every piece is checked again in its own frame, where a fold found is cut
// too; so every piece passes IsBezierValidForOffset.
//
// Appends nothing on non-finite points or distance, or a Bezier whose points
// all lie within sqrt(kEpsilon) of the first (a dot, which has no offset).
// O(1): a bounded number of root finds and bisections per piece.
void GetSegmentsToOffset(const CubicBezier::bezier2dT<V>& bezier, std::vector<CubicBezier::bezier2dT<V>>& pieces,
                         double distance, std::vector<double>* params);

// Approximates the offset of the Bezier p[0..3] at `distance` by one cubic.
// Returns true and writes result[0..3] if the cubic lies within
// sqrt(squaredTolerance) of the true offset B(t) + d n(t) at every checked
// parameter (at least 64, denser where the offset swings fast), where the
// check asks for 0.81 x squaredTolerance so that the error between checked
// parameters stays below the tolerance.
// The ends of result are the exact offsets of the ends of p, its end tangents
// are parallel to those of p (reversed where the offset runs backwards).
// A tolerance below the rounding noise of the coordinates, (1e-12 x (largest
// coordinate + |distance|))^2, is raised to it, so that large coordinates
// cannot force endless splitting. distance 0 returns p itself.
//
// On false, result is untouched and splitAt is either left as it was (the
// callers set -1.0: no split helps) or set to a parameter in (0, 1) at which
// to split and try the halves: a cusp of the offset or of the curve inside
// the piece, else an inflection, else the parameter where the normal has
// turned half its total (0.5 for a nearly straight piece), so that a tight
// bend is isolated in few steps. splitAt is left alone for null
// pointers, non-finite input, squaredTolerance not above 0, a dot, and
// pieces too small to split meaningfully (below 1e-10 of the coordinates).
bool FindBezierOffsetCurve(const V* p, V* result, double distance, double squaredTolerance, double& splitAt);

// Whether the piece p[0..3] may be offset at `distance` at all: its points
// and the distance are finite, it is not a dot, its tangent is defined inside
// (no cusp) and its offset does not fold back inside (no point where the
// signed radius of curvature equals the distance); a cusp or fold counts as
// inside where it splits the piece into two parts that are not dots.
// A piece that passes has an offset that is a smooth curve moving one way.
bool IsBezierValidForOffset(const V* p, double distance);

}  // namespace MavikMath
