// Adding one meeting: a pair of linked records, one on each segment.
//
// Both records carry the same position and touch flag; each has its own
// segment's parameter, tangent and curvature. Tangents are made unit length
// on request only when their squared length exceeds kEpsilon, so a vanishing
// tangent is kept as computed rather than turned into NaN. A meeting whose
// parameters or position are not finite is not added: no record may claim a
// position it does not have.
//
// The first record is owned by its list before the second is allocated, so
// an allocation failure leaves nothing behind.
#include <cmath>

#include "engine_internal.h"

namespace OstraCrv {

namespace engine_detail {

template <class T>
RecordPair AddRecordPair(double t, int segment, const D& tangent, double curvature, double otherT, int otherSegment,
                         const D& otherTangent, double otherCurvature, const V& point, SegmentsT<T>& segments,
                         bool normalizeTangents, bool touch) {
  const int n = static_cast<int>(segments.segments.size());
  if (segment < 0 || segment >= n || otherSegment < 0 || otherSegment >= n) return {};
  if (!std::isfinite(t) || !std::isfinite(otherT) || !point.IsFinite()) return {};

  Intersection a;
  a.t = t;
  a.segment = segment;
  a.point = point;
  a.tangent = tangent;
  a.curvature = curvature;
  a.touch = touch;
  Intersection b = a;
  b.t = otherT;
  b.segment = otherSegment;
  b.tangent = otherTangent;
  b.curvature = otherCurvature;
  if (normalizeTangents) {
    a.tangent.Normalize();
    b.tangent.Normalize();
  }

  segments.cursorSegment = 0;
  segments.cursorIndex = 0;
  SegmentIntersections& sa = segments.segments[segment];
  SegmentIntersections& sb = segments.segments[otherSegment];
  Intersection* ra = sa.AddIntersection(a);
  Intersection* rb = nullptr;
  try {
    rb = sb.AddIntersection(b);
  } catch (...) {
    sa.intersections.pop_back();
    delete ra;
    throw;
  }
  ra->other = rb;
  rb->other = ra;

  const int ca = sa.curve, cb = sb.curve;
  const int curves = static_cast<int>(segments.curves.size());
  if (ca >= 0 && ca < curves && cb >= 0 && cb < curves) {
    segments.curves[ca].SetIntersectsWith(cb);
    segments.curves[cb].SetIntersectsWith(ca);
  }
  segments.hasIntersections = true;
  return {ra, rb};
}

}  // namespace engine_detail

template <class T>
void AddIntersection(double t, int segment, const MavikMath::D& tangent, double curvature, double otherT,
                     int otherSegment, const MavikMath::D& otherTangent, double otherCurvature,
                     const MavikMath::V& point, SegmentsT<T>& segments, bool normalizeTangents, bool touch) {
  engine_detail::AddRecordPair(t, segment, tangent, curvature, otherT, otherSegment, otherTangent, otherCurvature,
                               point, segments, normalizeTangents, touch);
}

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;

#define OSTRACRV_INSTANTIATE(T)                                                                               \
  template engine_detail::RecordPair engine_detail::AddRecordPair<T>(double, int, const D&, double, double, \
                                                                     int, const D&, double, const V&,       \
                                                                     SegmentsT<T>&, bool, bool);            \
  template void AddIntersection<T>(double, int, const D&, double, double, int, const D&, double, const V&,   \
                                   SegmentsT<T>&, bool, bool);
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace OstraCrv
