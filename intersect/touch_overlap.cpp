// Touches of a segment end on a line or a Bezier, and the overlap test of two
// meetings of one pair; see touch_overlap.h.
//
// A touch on a line projects the point on the line: the foot's parameter
// must lie in [0, 1] (ends included, so an end exactly at the other line's
// end still touches, and the distance decides) and the foot must be closer
// than the tolerance. A touch on a Bezier asks for the nearest point of the
// curve (a global search, so loops and cusps are handled).
//
// The overlap test compares the two stretches between the meetings. Cut out
// of each segment (running from the first meeting to the second, a Bezier
// reversed first when its range runs backwards), a Bezier stretch lies on a
// line if its four control points do (the curve lies in their hull), and two
// Bezier stretches coincide if their corresponding control points do. Two
// straight stretches (all control points within the tolerance of a line)
// coincide when their ends do: inner control points of a straight curve only
// set its speed along the line.
#include "ostracrv/intersect/touch_overlap.h"

#include <cmath>
#include <limits>

#include "engine_internal.h"
#include "ostracrv/math/bezier_closest.h"
#include "ostracrv/math/bezier_split.h"
#include "ostracrv/math/collinear.h"

namespace OstraCrv {

namespace engine_detail {

bool TouchLineCandidate(const V* line, int lineSegment, const D& lineTangent, const V& point, int pointSegment,
                        const D& pointTangent, double pointCurvature, double pointT, double squaredTolerance,
                        IntersectionCandidate& out) noexcept {
  const D d = line[1] - line[0];
  const double length = d.SquaredLength();
  if (!(length > 0.0)) return false;
  const double u = Dot(point - line[0], d) / length;
  const V foot = line[0] + u * d;
  if (!(u >= 0.0 && u <= 1.0 && SquaredDistance(foot, point) < squaredTolerance)) return false;
  out.first = foot;
  out.second = IntersectionParams{u,      lineSegment,  lineTangent,    0.0,  pointT,
                                  pointSegment, pointTangent, pointCurvature, point};
  return true;
}

bool TouchBezierCandidate(const SegmentGeometry& bezier, int bezierSegment, const V& point, int pointSegment,
                          const D& pointTangent, double pointCurvature, double pointT, double squaredTolerance,
                          IntersectionCandidate& out) noexcept {
  // Only points closer than the tolerance matter, so the search starts with
  // the tolerance as the best distance known: a curve whose control points
  // all lie farther away is rejected at once, and otherwise the answer is the
  // nearest point, as from an unbounded search.
  double u = 0.0;
  V nearest;
  double distance = squaredTolerance;
  if (!MavikMath::CubicBezier::FindClosestPointOnBezier(bezier.p, point, u, nearest, distance)) return false;
  if (!(distance < squaredTolerance)) return false;
  out.first = nearest;
  out.second = IntersectionParams{u,      bezierSegment, bezier.Tangent(u), bezier.Curvature(u), pointT,
                                  pointSegment, pointTangent, pointCurvature,    point};
  return true;
}

}  // namespace engine_detail

namespace {

using namespace engine_detail;
using Framework::common_types::POINT;

bool ValidSegment(const std::vector<SegmentIntersections>& segments, int s) {
  return s >= 0 && s < static_cast<int>(segments.size());
}

// The stretch of a Bezier between two parameters, running from `from` to
// `to`: a backward range is cut from the reversed curve.
void CutStretch(const SegmentGeometry& g, double from, double to, V* out) {
  if (from <= to) {
    MavikMath::CubicBezier::Subsection(from, to, g.p, out);
    return;
  }
  const V reversed[4] = {g.p[3], g.p[2], g.p[1], g.p[0]};
  MavikMath::CubicBezier::Subsection(1.0 - from, 1.0 - to, reversed, out);
}

}  // namespace

template <class T>
bool TouchLine(T const* line, int lineSegment, const D& lineTangent, const T& point, int pointSegment,
               const D& pointTangent, double pointCurvature, double pointT, IntersectionCandidates& candidates,
               double squaredTolerance) {
  if (!line) return false;
  const V l[2] = {MavikMath::ToV(line[0]), MavikMath::ToV(line[1])};
  IntersectionCandidate c;
  if (!TouchLineCandidate(l, lineSegment, lineTangent, MavikMath::ToV(point), pointSegment, pointTangent,
                          pointCurvature, pointT, squaredTolerance, c))
    return false;
  candidates.push_back(c);
  return true;
}

template <class T>
bool TouchLine(T const* line, int lineSegment, const D& lineTangent, const T& point, int pointSegment,
               const D& pointTangent, double pointCurvature, double pointT, SegmentsT<T>& segments,
               const SegmentIntersectionSettings& settings) {
  if (!line) return false;
  const V l[2] = {MavikMath::ToV(line[0]), MavikMath::ToV(line[1])};
  IntersectionCandidate c;
  if (!TouchLineCandidate(l, lineSegment, lineTangent, MavikMath::ToV(point), pointSegment, pointTangent,
                          pointCurvature, pointT, settings.touchToleranceSquared, c))
    return false;
  return AddCandidate(c.second, segments, settings.normalizeTangents, true).first != nullptr;
}

template <class T>
bool TouchBezier(T const* bezier, int bezierSegment, const T& point, int pointSegment, const D& pointTangent,
                 double pointCurvature, double pointT, IntersectionCandidates& candidates,
                 double squaredTolerance) {
  if (!bezier) return false;
  IntersectionCandidate c;
  if (!TouchBezierCandidate(ReadSegment(bezier, true), bezierSegment, MavikMath::ToV(point), pointSegment,
                            pointTangent, pointCurvature, pointT, squaredTolerance, c))
    return false;
  candidates.push_back(c);
  return true;
}

template <class T>
bool TouchBezier(T const* bezier, int bezierSegment, const T& point, int pointSegment, const D& pointTangent,
                 double pointCurvature, double pointT, SegmentsT<T>& segments,
                 const SegmentIntersectionSettings& settings) {
  if (!bezier) return false;
  IntersectionCandidate c;
  if (!TouchBezierCandidate(ReadSegment(bezier, true), bezierSegment, MavikMath::ToV(point), pointSegment,
                            pointTangent, pointCurvature, pointT, settings.touchToleranceSquared, c))
    return false;
  return AddCandidate(c.second, segments, settings.normalizeTangents, true).first != nullptr;
}

template <class T>
Intersection* ProcessOverlap(T const* firstPoints, T const* secondPoints, int first, int second,
                             SegmentsT<T>& segments, const SegmentIntersectionSettings& settings) {
  if (!firstPoints || !secondPoints || !ValidSegment(segments.segments, first) ||
      !ValidSegment(segments.segments, second))
    return nullptr;
  SegmentIntersections& f = segments.segments[first];
  const SegmentIntersections& s = segments.segments[second];

  // The first two meetings with `second`, in the order they were found.
  Intersection* r1 = nullptr;
  Intersection* r2 = nullptr;
  for (Intersection* r : f.intersections) {
    if (!OnSegment(r->other, second)) continue;
    if (!r1) {
      r1 = r;
    } else {
      r2 = r;
      break;
    }
  }
  if (!r1) return nullptr;

  // One meeting of two adjacent segments: the other is their joint, which
  // the end pass skipped on purpose. Make it now, to take it back if the
  // stretch between the two is not shared.
  Intersection* joint = nullptr;
  if (!r2) {
    const SegmentGeometry gf = ReadSegment(firstPoints, f.type == SegmentIntersections::Bezier);
    const SegmentGeometry gs = ReadSegment(secondPoints, s.type == SegmentIntersections::Bezier);
    double tf = 0.0, ts = 0.0;
    V at;
    if (f.next == second) {
      tf = 1.0;
      ts = 0.0;
      at = gf.End();
    } else if (f.prev == second) {
      tf = 0.0;
      ts = 1.0;
      at = gf.Start();
    } else {
      return nullptr;
    }
    joint = AddRecordPair(tf, first, gf.Tangent(tf), gf.Curvature(tf), ts, second, gs.Tangent(ts),
                          gs.Curvature(ts), at, segments, settings.normalizeTangents, false)
                .first;
    if (!joint) return nullptr;
    r2 = joint;
  }

  Intersection* lo = r2->t < r1->t ? r2 : r1;
  Intersection* hi = lo == r1 ? r2 : r1;
  if (!DoSegmentsOverlap(firstPoints, secondPoints, f.type, s.type, lo->t, hi->t, lo->other->t, hi->other->t,
                         settings.touchToleranceSquared)) {
    if (joint) segments.RemoveIntersection(joint);
    return nullptr;
  }
  lo->overlapEnd = hi;
  hi->overlapEnd = lo;
  lo->other->overlapEnd = hi->other;
  hi->other->overlapEnd = lo->other;
  segments.overlapCount += 2;
  return lo;
}

template <class T>
bool DoSegmentsOverlap(T const* first, T const* second, SegmentIntersections::Type firstType,
                       SegmentIntersections::Type secondType, double firstStart, double firstEnd,
                       double secondStart, double secondEnd, double squaredTolerance) {
  if (!(std::fabs(firstEnd - firstStart) > MavikMath::kEpsilon &&
        std::fabs(secondEnd - secondStart) > MavikMath::kEpsilon))
    return false;
  if (!first || !second) return false;
  const bool firstBezier = firstType == SegmentIntersections::Bezier;
  const bool secondBezier = secondType == SegmentIntersections::Bezier;
  // Two lines: the two meetings already prove the shared stretch.
  if (!firstBezier && !secondBezier) return true;

  const SegmentGeometry gf = ReadSegment(first, firstBezier);
  const SegmentGeometry gs = ReadSegment(second, secondBezier);
  if (firstBezier != secondBezier) {
    const SegmentGeometry& line = firstBezier ? gs : gf;
    const SegmentGeometry& bezier = firstBezier ? gf : gs;
    V stretch[4];
    if (firstBezier)
      CutStretch(bezier, firstStart, firstEnd, stretch);
    else
      CutStretch(bezier, secondStart, secondEnd, stretch);
    const D d = line.p[1] - line.p[0];
    const double length = d.SquaredLength();
    if (!(length > 0.0)) return false;
    for (const V& q : stretch) {
      const double u = Dot(q - line.p[0], d) / length;
      if (!(u >= 0.0 && u <= 1.0 && SquaredDistance(line.p[0] + u * d, q) < squaredTolerance)) return false;
    }
    return true;
  }

  V s[4], r[4];
  CutStretch(gf, firstStart, firstEnd, s);
  CutStretch(gs, secondStart, secondEnd, r);
  if (MavikMath::AreCollinear(s, 4, squaredTolerance) && MavikMath::AreCollinear(r, 4, squaredTolerance))
    return SquaredDistance(s[0], r[0]) < squaredTolerance && SquaredDistance(s[3], r[3]) < squaredTolerance;
  for (int k = 0; k < 4; ++k)
    if (!(SquaredDistance(s[k], r[k]) < squaredTolerance)) return false;
  return true;
}

#define OSTRACRV_INSTANTIATE(T)                                                                                   \
  template bool TouchLine<T>(T const*, int, const D&, const T&, int, const D&, double, double,                    \
                             IntersectionCandidates&, double);                                                    \
  template bool TouchLine<T>(T const*, int, const D&, const T&, int, const D&, double, double, SegmentsT<T>&,     \
                             const SegmentIntersectionSettings&);                                                 \
  template bool TouchBezier<T>(T const*, int, const T&, int, const D&, double, double, IntersectionCandidates&,   \
                               double);                                                                           \
  template bool TouchBezier<T>(T const*, int, const T&, int, const D&, double, double, SegmentsT<T>&,             \
                               const SegmentIntersectionSettings&);                                               \
  template Intersection* ProcessOverlap<T>(T const*, T const*, int, int, SegmentsT<T>&,                          \
                                           const SegmentIntersectionSettings&);                                   \
  template bool DoSegmentsOverlap<T>(T const*, T const*, SegmentIntersections::Type, SegmentIntersections::Type, \
                                     double, double, double, double, double);
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace OstraCrv
