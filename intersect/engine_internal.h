// Shared pieces of the intersection engine's implementation: reading a
// segment as doubles, its tangent and curvature, and adding a record pair
// with access to the new records.
#pragma once

#include "ostracrv/intersect/segments.h"
#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_derivatives.h"

namespace OstraCrv::engine_detail {

using MavikMath::D;
using MavikMath::V;

// A segment widened to double: p[0..1] for a line, p[0..3] for a Bezier.
struct SegmentGeometry {
  V p[4];
  bool bezier = false;
  MavikMath::CubicBezier::PowerBasis basis{};

  const V& Start() const noexcept { return p[0]; }
  const V& End() const noexcept { return bezier ? p[3] : p[1]; }
  V EndAt(bool atOne) const noexcept { return atOne ? End() : Start(); }

  // Tangent at u: end minus start for a line; for a Bezier the derivative,
  // kept defined at a collapsed handle.
  D Tangent(double u) const noexcept {
    if (!bezier) return p[1] - p[0];
    return MavikMath::CubicBezier::SafeBezierTangent(u, basis.a, basis.b, basis.c, basis.d);
  }
  // Signed curvature at u, positive for a left (counter-clockwise) turn with
  // y up, cross(B', B'') / |B'|^3; 0 on a line. Welding separates tangents
  // that agree by it, so the sign must follow the turn.
  double Curvature(double u) const noexcept {
    if (!bezier) return 0.0;
    return MavikMath::CubicBezier::SafeBezierCurvature(u, basis.a, basis.b, basis.c);
  }
};

template <class T>
SegmentGeometry ReadSegment(T const* p, bool bezier) noexcept {
  SegmentGeometry g;
  g.bezier = bezier;
  const int n = bezier ? 4 : 2;
  for (int i = 0; i < n; ++i) g.p[i] = MavikMath::ToV(p[i]);
  if (bezier) g.basis = MavikMath::CubicBezier::GetPowerBasis(g.p);
  return g;
}

// AddIntersection returning the two new records (null, null for a bad index).
struct RecordPair {
  Intersection* first = nullptr;
  Intersection* second = nullptr;
};
template <class T>
RecordPair AddRecordPair(double t, int segment, const D& tangent, double curvature, double otherT, int otherSegment,
                         const D& otherTangent, double otherCurvature, const V& point, SegmentsT<T>& segments,
                         bool normalizeTangents, bool touch);

// Adds a candidate as a record pair.
template <class T>
RecordPair AddCandidate(const IntersectionParams& c, SegmentsT<T>& segments, bool normalizeTangents, bool touch) {
  return AddRecordPair(c.t, c.segment, c.tangent, c.curvature, c.otherT, c.otherSegment, c.otherTangent,
                       c.otherCurvature, c.point, segments, normalizeTangents, touch);
}

// Candidate forms of the touch tests on doubles, writing one candidate
// instead of appending to a list (no allocation on the hot path).
bool TouchLineCandidate(const V* line, int lineSegment, const D& lineTangent, const V& point, int pointSegment,
                        const D& pointTangent, double pointCurvature, double pointT, double squaredTolerance,
                        IntersectionCandidate& out) noexcept;
bool TouchBezierCandidate(const SegmentGeometry& bezier, int bezierSegment, const V& point, int pointSegment,
                          const D& pointTangent, double pointCurvature, double pointT, double squaredTolerance,
                          IntersectionCandidate& out) noexcept;

// Whether the record lies on the given segment (through its twin, say).
inline bool OnSegment(const Intersection* r, int segment) noexcept { return r && r->segment == segment; }
inline bool AtZero(double t) noexcept { return std::fabs(t) <= MavikMath::kEpsilon; }
inline bool AtOne(double t) noexcept { return std::fabs(t - 1.0) <= MavikMath::kEpsilon; }

}  // namespace OstraCrv::engine_detail
