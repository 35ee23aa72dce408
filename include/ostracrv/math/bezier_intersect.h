// Where two cubic Beziers meet.
//
// Method: Bezier clipping (Sederberg and Nishita). For a pair of pieces,
// each piece is clipped against two fat lines of the other: the band of
// distances of its control points from its chord (narrowed to 3/4 or 4/9 of
// the control-point spread, which bounds the curve itself), and the band of
// its extent along the chord. The distance of a cubic from a line is a
// cubic in Bernstein form, so the convex hull of its control values bounds
// the parameters that can lie in the band. Clipping converges quadratically
// at a transversal crossing; where it stalls (two crossings in one pair, a
// tangency) the larger piece is halved. A pair narrowed to a parameter width
// of 1e-10 on both curves is polished by Newton's method on the 2x2 system
// A(s) = B(u); a stalled pair narrower than 1e-6 is solved the same way
// with a small Levenberg-Marquardt damping, which finds a point of contact
// where the Jacobian is singular. Solutions within 1e-6 in both parameters
// are merged. Clipping rather than plain box subdivision because it needs a
// handful of steps per crossing instead of dozens, and a fat line separates
// the two sides of a tangency at every level, so a touching pair costs a
// bounded number of pieces per level.
//
// Tolerances are relative to the largest coordinate magnitude m of the two
// curves: the bands are widened by 256 ulps of m against rounding, and a
// solution is accepted when its two points lie within 1e-10 m.
//
// Bounded work: at most 4096 clipping steps and a fixed stack; at most 9
// results (two cubics that share no stretch meet at most 9 times), plus the
// shared stretch's ends. A pair that needs many steps (more than 64) is
// examined for a shared stretch, which allocates three small lists; nothing
// else is allocated except the output. A pair that exhausts the steps
// (curves running within about 1e-5 of their size of each other without
// sharing a stretch) returns what was found by then, in about a
// millisecond.
//
// Coincident curves. Two curves that run along each other (within 1e-10 m)
// over a stretch are reported by the two ends of the shared stretch: the
// parameters on both curves where it begins and ends, each an end point of
// one of the curves (or, for two straight curves that fold back, a turning
// point). Identical curves give (0, 0) and (1, 1); a curve and its reverse
// (0, 1) and (1, 0). Crossings of the rest, such as a branch of a loop
// crossing the shared stretch, are reported as usual. A tangential contact
// gives one point. Nearly coincident curves that stay apart give no result
// or a few points of closest approach within tolerance, never more than 9.
#pragma once

#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// All points where the Beziers a[0..3] and b[0..3] meet. Appends to the
// three parallel lists (existing entries are kept): the parameter on a, the
// parameter on b, both in [0, 1], and the position (the midpoint of the two
// curve points), in ascending order of the parameter on a. End points are
// included where the curves meet there. Appends nothing for a null pointer,
// a non-finite coordinate, or a curve whose four points coincide.
// Cost: a few microseconds for a transversal pair.
template <class T>
void FindBezierIntersections(const T* a, const T* b, std::vector<double>& ta, std::vector<double>& tb,
                             std::vector<V>& points);

// Whether the Beziers p and q meet at all, crossing, touching or sharing a
// stretch (the same search, stopped at the first hit). False for the bad
// input above.
template <class T>
bool DoBeziersIntersect(const T* p, const T* q);

}  // namespace MavikMath::CubicBezier
