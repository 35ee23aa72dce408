// Flattening a cubic Bezier into a polyline.
//
// The bound behind every function here: the distance between a cubic Bezier
// and its chord, compared at equal parameters, is at most
//   (3/4) M,  M = max(|p0 - 2 p1 + p2|, |p1 - 2 p2 + p3|),
// (for degree n the factor is n (n - 1) / 8). Cutting the curve into k equal
// parameter steps scales the second differences of every piece by 1/k^2, so
// k = ceil(sqrt(0.75 M / tolerance)) equal steps keep every chord within the
// tolerance of its piece of curve. This is a guarantee, not an estimate.
//
// AdaptiveBezierToLines applies the bound piece by piece: a piece that needs
// k chords is halved when its halves need fewer than k chords together (the
// bend is concentrated on one side), and is otherwise cut into its k equal
// steps. Curves with a tight bend get their chords where the bend is, and,
// by induction over the halving, no curve gets more chords than the uniform
// count.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath {

// The largest chord count that CalculateNumBezierLines reports.
inline constexpr int kMaxBezierLines = 4096;

// lines + 1 points of the curve at t = i / lines, i = 0..lines, into out; the
// first and last are p[0] and p[3] exactly, integer points are rounded half
// away from zero. Returns the number of points written: lines + 1, or 0
// (nothing written) for lines < 1, null pointers or non-finite points.
template <class T>
int BezierToLines(const T* p, T* out, int lines) noexcept;

// A polyline within `tolerance` of the curve, from p[0] to p[3], with at
// most `maximum` points; returns the number of points written. Every vertex
// lies on the curve, and every point of the curve lies within the tolerance
// of the chord between the vertices around it. If `maximum` points cannot
// meet the tolerance, the tolerance is relaxed fourfold until they can: the
// result is then the best that the budget allows. Integer output is rounded
// half away from zero, which moves a chord by up to 0.71; the flattening
// then works to the tolerance less 0.71 (or half the tolerance below 1.42),
// and repeated points from rounding are dropped, the end point excepted.
// Returns 0 (nothing written) for null pointers, non-finite points, a
// tolerance that is not positive, or maximum < 2.
// Cost: O(number of points written), times at most a few passes when the
// budget forces a coarser tolerance. No allocation.
template <class T>
int AdaptiveBezierToLines(const T* p, T* out, double tolerance, int maximum) noexcept;

// The number of equal parameter steps that keep the curve p[0..3] within
// `tolerance` units of its chords: ceil(sqrt(0.75 M / tolerance)) with M as
// above, at least 1 and at most kMaxBezierLines. A tolerance below 1 counts
// as 1. Returns 0 for a null pointer or non-finite points.
template <class T>
int CalculateNumBezierLines(const T* p, int tolerance) noexcept;

// The same for any curve whose control points lie in r: there M is at most
// twice the diagonal, so the count is ceil(sqrt(1.5 diagonal / tolerance)).
// An empty (inverted) rectangle gives 1.
int CalculateNumBezierLines(const Framework::common_types::RECT& r, int tolerance) noexcept;

}  // namespace MavikMath
