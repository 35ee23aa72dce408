// The pair tests of the intersection engine; the skeleton and its variants
// are described in pair_intersections.h.
//
// Constants:
//   kJointParameter 1e-7: a line-Bezier crossing with both parameters this
//     close to the joint node of adjacent segments is the joint itself, found
//     again by the root search; it is dropped.
//   kJointDistanceSquared 0.1: between adjacent Beziers, a crossing closer
//     than this (squared) to the joint node is the joint found again by the
//     clipping search, with a little rounding; dropped whatever the touch
//     tolerance is, since at a joint the touch tolerance says nothing.
//   kJointReach 0.1: the stretch of each of two adjacent Beziers next to
//     their joint that is cut off before asking whether the rest of them
//     can meet; well inside the joint distance (0.1^2 < 0.1), so that
//     whatever the clipping search finds on it is dropped.
//   kApartRel 1e-9: how far apart, relative to the coordinates' magnitude,
//     the rest of the two must lie: five times the closeness (at most twice
//     1e-10 of the magnitude) at which the clipping search takes two curves
//     for meeting.
//
// The Bezier searches write into lists; these are scratch buffers of the
// calling thread, kept between calls, so a pair test allocates nothing but
// its records.
#include "ostracrv/intersect/pair_intersections.h"

#include <array>
#include <cmath>
#include <vector>

#include "engine_internal.h"
#include "ostracrv/intersect/touch_overlap.h"
#include "ostracrv/math/bezier_intersect.h"
#include "ostracrv/math/bezier_line_intersect.h"
#include "ostracrv/math/bezier_self_intersect.h"
#include "ostracrv/math/bezier_split.h"
#include "ostracrv/math/rect.h"

namespace OstraCrv {

namespace {

using namespace engine_detail;
using Framework::common_types::POINT;

constexpr double kJointParameter = 1e-7;
constexpr double kJointDistanceSquared = 0.1;
constexpr double kJointReach = 0.1;
constexpr double kApartRel = 1e-9;

enum class PairKind { Lines, LineBezier, Beziers };

struct Scratch {
  std::vector<double> ta, tb;
  std::vector<V> points;
  void Clear() {
    ta.clear();
    tb.clear();
    points.clear();
  }
};
Scratch& GetScratch() {
  thread_local Scratch scratch;
  scratch.Clear();
  return scratch;
}

// The crossing of two lines strictly inside both.
template <class T>
bool AddLineCrossing(const SegmentGeometry& A, const SegmentGeometry& B, int a, int b, SegmentsT<T>& segments,
                     const SegmentIntersectionSettings& settings) {
  const D dA = A.p[1] - A.p[0];
  const D dB = B.p[1] - B.p[0];
  const double c = Cross(dA, dB);
  if (c == 0.0) return false;
  const D w = A.p[0] - B.p[0];
  const double u = Cross(dA, w) / c;  // on B
  const double v = Cross(dB, w) / c;  // on A
  if (!(u > 0.0 && u < 1.0 && v > 0.0 && v < 1.0)) return false;
  return AddRecordPair(v, a, dA, 0.0, u, b, dB, 0.0, A.p[0] + v * dA, segments, settings.normalizeTangents, false)
             .first != nullptr;
}

// Crossings of the line A and the Bezier B.
template <class T>
bool AddLineBezierCrossings(const SegmentGeometry& A, const SegmentGeometry& B, int a, int b,
                            SegmentsT<T>& segments, JointType joint, const SegmentIntersectionSettings& settings) {
  Scratch& s = GetScratch();
  if (!MavikMath::CubicBezier::FindBezierLineIntersection(B.p, A.p, s.tb, s.ta, false)) return false;
  const D dA = A.p[1] - A.p[0];
  bool crossed = false;
  for (size_t k = 0; k < s.ta.size() && k < s.tb.size(); ++k) {
    const double u = s.ta[k], v = s.tb[k];
    if (joint == JointFirstToSecond && std::fabs(u - 1.0) <= kJointParameter && std::fabs(v) <= kJointParameter)
      continue;
    if (joint == JointSecondToFirst && std::fabs(u) <= kJointParameter && std::fabs(v - 1.0) <= kJointParameter)
      continue;
    if (!(u > 0.0 && u < 1.0)) continue;
    if (AddRecordPair(u, a, dA, 0.0, v, b, B.Tangent(v), B.Curvature(v), A.p[0] + u * dA, segments,
                      settings.normalizeTangents, false)
            .first)
      crossed = true;
  }
  return crossed;
}

// Whether two Beziers joined end to start (joint JointFirstToSecond or
// JointSecondToFirst) can meet only near their joint node, where every
// meeting the clipping search reports is dropped. Each is cut where it stays
// within kJointReach of the joint from there on (a stretch of parameter
// width w moves at most w times three times its longest control leg), and
// the boxes of the rest of both must lie apart by more than kApartRel of
// the magnitude. A meeting the search reports has a point on each curve
// closer than that: on the rests it cannot be, so it lies within the
// reach (plus that closeness) of the joint, and is dropped. (Pairs of
// flat curves, which the search answers otherwise, are left to it.) Then the
// search, the costliest step at a smooth node, where the curves touch
// tangentially, need not run. O(1).
bool MeetOnlyAtJoint(const SegmentGeometry& A, const SegmentGeometry& B, JointType joint) {
  if (joint != JointFirstToSecond && joint != JointSecondToFirst) return false;
  // The curve ending at the joint, and the one starting there.
  const V* in = joint == JointFirstToSecond ? A.p : B.p;
  const V* out = joint == JointFirstToSecond ? B.p : A.p;
  double mag = 0.0;
  for (int i = 0; i < 4; ++i)
    mag = std::fmax(mag, std::fmax(std::fmax(std::fabs(in[i].x), std::fabs(in[i].y)),
                                   std::fmax(std::fabs(out[i].x), std::fabs(out[i].y))));
  const double apart = kApartRel * (mag + 1.0);
  if (!std::isfinite(mag) || !((kJointReach + apart) * (kJointReach + apart) < 0.9 * kJointDistanceSquared))
    return false;
  // The search answers curves whose control points all lie along one line
  // by a projection that need not report points close to both curves:
  // such a pair is always searched. A curve is flat here when its control
  // points lie within apart of the line through the farthest two of them,
  // which holds for each curve of every pair the search takes for collinear.
  auto flat = [&](const V* p) {
    int bi = 0, bj = 1;
    double best = -1.0;
    for (int i = 0; i < 4; ++i)
      for (int j = i + 1; j < 4; ++j)
        if (const double d = SquaredDistance(p[i], p[j]); d > best) {
          best = d;
          bi = i;
          bj = j;
        }
    if (!(best > 0.0)) return true;
    const D u = (p[bj] - p[bi]) * (1.0 / std::sqrt(best));
    for (int i = 0; i < 4; ++i)
      if (!(std::fabs(Cross(u, p[i] - p[bi])) <= apart)) return false;
    return true;
  };
  if (flat(in) || flat(out)) return false;
  auto width = [](const V* p) {
    double leg = 0.0;
    for (int i = 0; i < 3; ++i) leg = std::fmax(leg, MavikMath::Distance(p[i], p[i + 1]));
    return leg > 0.0 ? std::fmin(0.5, kJointReach / (3.0 * leg)) : 0.0;
  };
  const double wIn = width(in), wOut = width(out);
  if (!(wIn > 0.0) || !(wOut > 0.0)) return false;
  V inNear[4], inRest[4], outNear[4], outRest[4];
  MavikMath::CubicBezier::Subsection(1.0 - wIn, 1.0, in, inNear);
  MavikMath::CubicBezier::Subsection(0.0, 1.0 - wIn, in, inRest);
  MavikMath::CubicBezier::Subsection(0.0, wOut, out, outNear);
  MavikMath::CubicBezier::Subsection(wOut, 1.0, out, outRest);
  // The cut-off stretches lie in the hulls of their control points.
  const double reach2 = kJointReach * kJointReach;
  for (int i = 0; i < 4; ++i)
    if (!(SquaredDistance(inNear[i], in[3]) <= reach2) || !(SquaredDistance(outNear[i], out[0]) <= reach2))
      return false;
  MavikMath::BoundsT<double> a, b;
  for (int i = 0; i < 4; ++i) {
    a.Add(inRest[i]);
    b.Add(outRest[i]);
  }
  return a.right + apart < b.left || b.right + apart < a.left || a.top + apart < b.bottom ||
         b.top + apart < a.bottom;
}

// Crossings of two Beziers, away from the joint node and outside the shared
// stretch `overlap` (if any).
template <class T>
bool AddBezierCrossings(const SegmentGeometry& A, const SegmentGeometry& B, int a, int b, SegmentsT<T>& segments,
                        JointType joint, const SegmentIntersectionSettings& settings, const Intersection* overlap) {
  if (MeetOnlyAtJoint(A, B, joint)) return false;
  Scratch& s = GetScratch();
  MavikMath::CubicBezier::FindBezierIntersections(A.p, B.p, s.ta, s.tb, s.points);
  const double tts = settings.touchToleranceSquared;
  const double nearA0 = (joint == JointSecondToFirst || joint == JointBoth) ? kJointDistanceSquared : tts;
  const double nearB0 = (joint == JointFirstToSecond || joint == JointBoth) ? kJointDistanceSquared : tts;
  double lo = 0.0, hi = 0.0;
  const bool masked = overlap && overlap->overlapEnd;
  if (masked) {
    lo = std::fmin(overlap->t, overlap->overlapEnd->t);
    hi = std::fmax(overlap->t, overlap->overlapEnd->t);
  }
  bool crossed = false;
  for (size_t k = 0; k < s.points.size(); ++k) {
    const V& p = s.points[k];
    // The ends of A: A0 with the threshold of B1's joint, A1 with that of B0.
    if (!(SquaredDistance(p, A.p[0]) > nearA0 && SquaredDistance(p, B.p[0]) > nearB0 &&
          SquaredDistance(p, A.p[3]) > nearB0 && SquaredDistance(p, B.p[3]) > nearA0))
      continue;
    const double u = s.ta[k], v = s.tb[k];
    if (masked && u > lo && u < hi) continue;
    if (AddRecordPair(u, a, A.Tangent(u), A.Curvature(u), v, b, B.Tangent(v), B.Curvature(v), p, segments,
                      settings.normalizeTangents, false)
            .first)
      crossed = true;
  }
  return crossed;
}

// A point (an end of segment pointSegment, with its tangent and curvature at
// parameter t there) on the touched segment within squared distance
// tolSquared: the candidate, the touched segment first.
bool TouchCandidate(const SegmentGeometry& touched, int touchedSegment, const V& point, int pointSegment,
                    const D& tangent, double curvature, double t, double tolSquared,
                    IntersectionCandidate& c) noexcept {
  return touched.bezier ? TouchBezierCandidate(touched, touchedSegment, point, pointSegment, tangent, curvature, t,
                                               tolSquared, c)
                        : TouchLineCandidate(touched.p, touchedSegment, touched.Tangent(0.0), point, pointSegment,
                                             tangent, curvature, t, tolSquared, c);
}

// The shared skeleton. aPts and bPts are the segments' own first points.
template <class T>
void RunPair(PairKind kind, T const* aPts, T const* bPts, int a, int b, SegmentsT<T>& segments, JointType joint,
             const SegmentIntersectionSettings& settings) {
  const bool aBezier = kind == PairKind::Beziers;
  const bool bBezier = kind != PairKind::Lines;
  const auto aType = aBezier ? SegmentIntersections::Bezier : SegmentIntersections::Line;
  const auto bType = bBezier ? SegmentIntersections::Bezier : SegmentIntersections::Line;

  // 1. Box test.
  const double inflation = GetBoxInflation(settings);
  SegmentBox boxA, boxB;
  if (!GetSegmentBox(aPts, aType, inflation, boxA) || !GetSegmentBox(bPts, bType, inflation, boxB) ||
      !DoBoxesMeet(boxA, boxB))
    return;

  const SegmentGeometry A = ReadSegment(aPts, aBezier);
  const SegmentGeometry B = ReadSegment(bPts, bBezier);
  const V &A0 = A.Start(), &A1 = A.End(), &B0 = B.Start(), &B1 = B.End();
  const bool normalize = settings.normalizeTangents;

  // 2. End pass.
  const double e = settings.endToleranceSquared;
  const bool f00 = SquaredDistance(A0, B0) < e;
  const bool f01 = SquaredDistance(A0, B1) < e;
  const bool f10 = SquaredDistance(A1, B0) < e;
  const bool f11 = SquaredDistance(A1, B1) < e;
  bool hitA0 = f00, hitB0 = f00, hitA1 = false, hitB1 = false;

  auto addEnds = [&](bool aAtOne, bool bAtOne) {
    const double ta = aAtOne ? 1.0 : 0.0, tb = bAtOne ? 1.0 : 0.0;
    const V& at = kind == PairKind::LineBezier ? B.EndAt(bAtOne) : A.EndAt(aAtOne);
    AddRecordPair(ta, a, A.Tangent(ta), A.Curvature(ta), tb, b, B.Tangent(tb), B.Curvature(tb), at, segments,
                  normalize, true);
  };
  if (f00) addEnds(false, false);
  if (f11) {
    addEnds(true, true);
    hitA1 = hitB1 = true;
  } else {
    // The end pair that forms the joint of adjacent segments is where the
    // path simply goes on: no meeting. Two lines that make a closed subpath
    // of two segments are the one case that records both joints.
    const bool lines = kind == PairKind::Lines;
    const bool skip01 = joint == JointSecondToFirst || (!lines && joint == JointBoth);
    const bool skip10 = joint == JointFirstToSecond || (!lines && joint == JointBoth);
    auto try01 = [&] {
      if (f01 && !f00 && !skip01) {
        addEnds(false, true);
        hitA0 = hitB1 = true;
      }
    };
    auto try10 = [&] {
      if (f10 && !f00 && !skip10) {
        addEnds(true, false);
        hitB0 = hitA1 = true;
      }
    };
    if (lines) {
      try10();
      try01();
    } else {
      try01();
      try10();
    }
  }

  // 3. Touch pass: an end of one segment on the other; the touched segment
  // comes first in the record pair. The touching end's tangent and
  // curvature are computed only for a touch found.
  const double tts = settings.touchToleranceSquared;
  auto touch = [&](const SegmentGeometry& touched, int touchedSegment, const SegmentGeometry& end, int endSegment,
                   bool atOne) -> bool {
    const double t = atOne ? 1.0 : 0.0;
    IntersectionCandidate c;
    if (!TouchCandidate(touched, touchedSegment, end.EndAt(atOne), endSegment, D{}, 0.0, t, tts, c)) return false;
    c.second.otherTangent = end.Tangent(t);
    c.second.otherCurvature = end.Curvature(t);
    return AddCandidate(c.second, segments, normalize, true).first != nullptr;
  };
  auto touchAOnB = [&](bool atOne) { return touch(B, b, A, a, atOne); };
  auto touchBOnA = [&](bool atOne) { return touch(A, a, B, b, atOne); };
  if (!(f00 || f01 || hitA0)) hitA0 = touchAOnB(false);
  if (!(f10 || f11 || hitA1)) hitA1 = touchAOnB(true);
  if (!(f00 || f10 || hitB0)) hitB0 = touchBOnA(false);
  if (!(f01 || f11 || hitB1)) hitB1 = touchBOnA(true);

  // 4. Overlap and crossings.
  bool crossed = false;
  switch (kind) {
    case PairKind::Lines:
      if (!ProcessOverlap(aPts, bPts, a, b, segments, settings))
        crossed = AddLineCrossing(A, B, a, b, segments, settings);
      break;
    case PairKind::LineBezier:
      if (!ProcessOverlap(bPts, aPts, b, a, segments, settings))
        crossed = AddLineBezierCrossings(A, B, a, b, segments, joint, settings);
      break;
    case PairKind::Beziers: {
      const Intersection* overlap = ProcessOverlap(aPts, bPts, a, b, segments, settings);
      crossed = AddBezierCrossings(A, B, a, b, segments, joint, settings, overlap);
      break;
    }
  }

  // 5. Second chance: the closest approach of the two segments, if within
  // the extended distance, is a touch.
  if (!settings.useExtendedTouch || crossed || hitA0 || hitA1 || hitB0 || hitB1) return;
  const double q = settings.extendedTouchDistance * settings.extendedTouchDistance;
  std::array<IntersectionCandidate, 8> list;
  int n = 0;
  for (int k = 0; k < 4; ++k) {
    const bool aAtOne = k >= 2, bAtOne = (k & 1) != 0;
    const double ta = aAtOne ? 1.0 : 0.0, tb = bAtOne ? 1.0 : 0.0;
    list[n++] = {A.EndAt(aAtOne), IntersectionParams{ta, a, A.Tangent(ta), A.Curvature(ta), tb, b, B.Tangent(tb),
                                                     B.Curvature(tb), B.EndAt(bAtOne)}};
  }
  // The ends of one segment near the other, A's ends first.
  auto nearEnds = [&](const SegmentGeometry& touched, int touchedSegment, const SegmentGeometry& end, int endSegment) {
    for (int k = 0; k < 2; ++k) {
      const double t = k;
      if (TouchCandidate(touched, touchedSegment, end.EndAt(k == 1), endSegment, end.Tangent(t), end.Curvature(t), t,
                         q, list[n]))
        ++n;
    }
  };
  nearEnds(B, b, A, a);
  nearEnds(A, a, B, b);
  int best = -1;
  double bestDistance = 0.0;
  for (int k = 0; k < n; ++k) {
    const double d = SquaredDistance(list[k].first, list[k].second.point);
    if (best < 0 || d < bestDistance) {
      best = k;
      bestDistance = d;
    }
  }
  if (best >= 0 && bestDistance < q) AddCandidate(list[best].second, segments, normalize, true);
}

// The segment's own first point in its curve's array, or null.
template <class T>
T const* OwnPoints(T const* curvePoints, const SegmentsT<T>& segments, int segment) {
  if (!curvePoints || segment < 0 || segment >= static_cast<int>(segments.segments.size())) return nullptr;
  return curvePoints + segments.segments[segment].firstNode;
}

// Runs a pair given by its curves' arrays; nothing when either segment has
// no points there.
template <class T>
void RunOwnPair(PairKind kind, T const* firstPoints, T const* secondPoints, int first, int second,
                SegmentsT<T>& segments, JointType joint, const SegmentIntersectionSettings& settings) {
  T const* a = OwnPoints(firstPoints, segments, first);
  T const* b = OwnPoints(secondPoints, segments, second);
  if (!a || !b) return;
  RunPair(kind, a, b, first, second, segments, joint, settings);
}

}  // namespace

template <class T>
void AddLineIntersections(T const* firstPoints, T const* secondPoints, int first, int second, SegmentsT<T>& segments,
                          JointType joint, const SegmentIntersectionSettings& settings) {
  RunOwnPair(PairKind::Lines, firstPoints, secondPoints, first, second, segments, joint, settings);
}

template <class T>
void AddLineBezierIntersections(T const* linePoints, T const* bezierPoints, int line, int bezier,
                                SegmentsT<T>& segments, JointType joint, const SegmentIntersectionSettings& settings) {
  RunOwnPair(PairKind::LineBezier, linePoints, bezierPoints, line, bezier, segments, joint, settings);
}

template <class T>
void AddBezierIntersections(T const* firstPoints, T const* secondPoints, int first, int second,
                            SegmentsT<T>& segments, JointType joint, const SegmentIntersectionSettings& settings) {
  RunOwnPair(PairKind::Beziers, firstPoints, secondPoints, first, second, segments, joint, settings);
}

template <class T>
void AddBezierSelfIntersections(T const* points, int segment, SegmentsT<T>& segments,
                                const SegmentIntersectionSettings& settings) {
  if (!points) return;
  const SegmentGeometry g = ReadSegment(points, true);
  double u = 0.0, v = 0.0;
  V p;
  if (!MavikMath::CubicBezier::FindBezierSelfIntersection(g.p, u, v, p)) return;
  // A loop closing within the touch tolerance of an end is a kink at the
  // node, not a crossing.
  const double tts = settings.touchToleranceSquared;
  if (!(SquaredDistance(p, g.p[0]) > tts && SquaredDistance(p, g.p[3]) > tts)) return;
  AddRecordPair(u, segment, g.Tangent(u), g.Curvature(u), v, segment, g.Tangent(v), g.Curvature(v), p, segments,
                settings.normalizeTangents, false);
}

#define OSTRACRV_INSTANTIATE(T)                                                                              \
  template void AddLineIntersections<T>(T const*, T const*, int, int, SegmentsT<T>&, JointType,              \
                                        const SegmentIntersectionSettings&);                                 \
  template void AddLineBezierIntersections<T>(T const*, T const*, int, int, SegmentsT<T>&, JointType,        \
                                              const SegmentIntersectionSettings&);                           \
  template void AddBezierIntersections<T>(T const*, T const*, int, int, SegmentsT<T>&, JointType,            \
                                          const SegmentIntersectionSettings&);                               \
  template void AddBezierSelfIntersections<T>(T const*, int, SegmentsT<T>&, const SegmentIntersectionSettings&);
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace OstraCrv
