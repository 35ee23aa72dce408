// Cutting a cubic Bezier by de Casteljau subdivision.
//
// De Casteljau's construction is affine-invariant and exact at the ends: the
// pieces share their cut point bit for bit and the outer points of the input
// are copied, not recomputed. All forms accept output arrays that overlap the
// input where stated, by computing into locals first.
//
// Parameters outside [0, 1] extrapolate (the construction still holds); a
// NaN parameter yields NaN points, so callers check their parameters. Nothing
// is checked and nothing fails: pointers must be valid, and non-finite
// points give non-finite pieces. Integer output is rounded half away from
// zero, with the input's own end points copied exactly.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath::CubicBezier {

// Split at t into left[0..3] and right[0..3]; left may be p.
template <class T>
void Split(double t, const T* p, T* left, T* right) noexcept;
// Split at t into seven shared points out[0..6]: left = out[0..3],
// right = out[3..6]. out may be p if it holds seven points.
template <class T>
void Split(double t, const T* p, T* out) noexcept;
// Split at two parameters into three Beziers sharing their cut points:
// ten points out[0..9] = left out[0..3], middle out[3..6], right out[6..9].
// Both parameters are on the original curve and are sorted first.
template <class T>
void Split(double t1, double t2, const T* p, T* out) noexcept;
// The part before t and the part behind t; out may be p.
template <class T>
void LeftOf(double t, const T* p, T* out) noexcept;
template <class T>
void RightOf(double t, const T* p, T* out) noexcept;
// The part between t0 and t1 (t0 below t1; if not, the piece runs backwards).
// Four points out; out may be p.
template <class T>
void Subsection(double t0, double t1, const T* p, T* out) noexcept;

}  // namespace MavikMath::CubicBezier
