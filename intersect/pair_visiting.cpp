// The order in which the intersection engine visits pairs of segments.
//
// Each segment i of an active curve that is not degenerate drives the search
// in ascending order: first the loop of its own Bezier (if its curve is
// self-tested), then every segment j in ascending order that is not
// degenerate, is not of its own curve unless that curve is self-tested, and
// is either of an inactive curve (visited from every driver, before i as
// well as after) or later than i (a pair of two drivers is visited once, from
// the lower index). Records within a list are in the order of this visit
// until the lists are sorted, and the overlap test reads that order, so the
// pruned search must visit the pairs in the very same order.
//
// The plain visit is O(s^2) box tests for s segments; the pruned visit reads
// the pair list of CollectSegmentPairs, which holds exactly the pairs whose
// boxes meet (pairs failing the box test add nothing and change nothing).
#include "engine_internal.h"
#include "ostracrv/intersect/pair_intersections.h"
#include "ostracrv/intersect/pair_pruning.h"

namespace OstraCrv {

namespace {

template <class T>
bool IsDriver(const SegmentsT<T>& s, const SegmentIntersections& segment) {
  const int curve = segment.curve;
  if (curve < 0 || curve >= static_cast<int>(s.curves.size())) return false;
  return s.curves[curve].active && !segment.degenerate;
}

template <class T>
void SelfTest(int i, SegmentIntersections& segment, SegmentsT<T>& s, const SegmentIntersectionSettings& settings) {
  const IntersectionCurveT<T>& curve = s.curves[segment.curve];
  if (curve.selfTest && segment.type == SegmentIntersections::Bezier && curve.points)
    AddBezierSelfIntersections(curve.points + segment.firstNode, i, s, settings);
}

// How segment j joins the driver i in their subpath.
JointType JointOf(int i, const SegmentIntersections& j) {
  const bool firstToSecond = j.prev == i;
  const bool secondToFirst = j.next == i;
  if (firstToSecond && secondToFirst) return JointBoth;
  if (firstToSecond) return JointFirstToSecond;
  if (secondToFirst) return JointSecondToFirst;
  return JointNone;
}

JointType Mirrored(JointType joint) {
  if (joint == JointFirstToSecond) return JointSecondToFirst;
  if (joint == JointSecondToFirst) return JointFirstToSecond;
  return joint;
}

}  // namespace

template <class T>
void FindAllIntersections(SegmentsT<T>& s, const SegmentIntersectionSettings& settings) {
  const int n = static_cast<int>(s.segments.size());
  for (int i = 0; i < n; ++i) {
    SegmentIntersections& segment = s.segments[i];
    if (!IsDriver(s, segment)) continue;
    SelfTest(i, segment, s, settings);
    FindAllIntersectionsWithSegment(i, segment, s, settings);
  }
}

template <class T>
void FindAllIntersectionsWithSegment(int index, SegmentIntersections& segment, SegmentsT<T>& s,
                                     const SegmentIntersectionSettings& settings) {
  const int n = static_cast<int>(s.segments.size());
  const int curves = static_cast<int>(s.curves.size());
  if (segment.curve < 0 || segment.curve >= curves) return;
  const bool selfTest = s.curves[segment.curve].selfTest;
  for (int j = 0; j < n; ++j) {
    SegmentIntersections& other = s.segments[j];
    if (other.curve < 0 || other.curve >= curves) continue;
    if (s.curves[other.curve].active && j <= index) continue;
    if (other.degenerate) continue;
    if (other.curve == segment.curve && !selfTest) continue;
    AddSegmentIntersections(index, j, segment, other, JointOf(index, other), s, settings);
  }
}

template <class T>
void FindAllIntersectionsPruned(SegmentsT<T>& s, const SegmentIntersectionSettings& settings) {
  std::vector<SegmentPair> pairs;
  CollectSegmentPairs(s, settings, pairs);
  const int n = static_cast<int>(s.segments.size());
  size_t k = 0;
  for (int i = 0; i < n; ++i) {
    SegmentIntersections& segment = s.segments[i];
    if (!IsDriver(s, segment)) continue;
    SelfTest(i, segment, s, settings);
    while (k < pairs.size() && pairs[k].driver < i) ++k;  // none: every listed driver is a driver
    for (; k < pairs.size() && pairs[k].driver == i; ++k) {
      SegmentIntersections& other = s.segments[pairs[k].target];
      AddSegmentIntersections(i, pairs[k].target, segment, other, JointOf(i, other), s, settings);
    }
  }
}

template <class T>
void AddSegmentIntersections(int first, int second, SegmentIntersections& a, SegmentIntersections& b,
                             JointType joint, SegmentsT<T>& s, const SegmentIntersectionSettings& settings) {
  const int curves = static_cast<int>(s.curves.size());
  if (a.curve < 0 || a.curve >= curves || b.curve < 0 || b.curve >= curves) return;
  T const* pa = s.curves[a.curve].points;
  T const* pb = s.curves[b.curve].points;
  if (!pa || !pb) return;
  const bool aLine = a.type == SegmentIntersections::Line;
  const bool bLine = b.type == SegmentIntersections::Line;
  if (aLine && bLine)
    AddLineIntersections(pa, pb, first, second, s, joint, settings);
  else if (!aLine && !bLine)
    AddBezierIntersections(pa, pb, first, second, s, joint, settings);
  else if (aLine)
    AddLineBezierIntersections(pa, pb, first, second, s, joint, settings);
  else
    AddLineBezierIntersections(pb, pa, second, first, s, Mirrored(joint), settings);
}

using Framework::common_types::POINT;
using MavikMath::V;

#define OSTRACRV_INSTANTIATE(T)                                                                                   \
  template void FindAllIntersections<T>(SegmentsT<T>&, const SegmentIntersectionSettings&);                      \
  template void FindAllIntersectionsPruned<T>(SegmentsT<T>&, const SegmentIntersectionSettings&);                \
  template void FindAllIntersectionsWithSegment<T>(int, SegmentIntersections&, SegmentsT<T>&,                     \
                                                   const SegmentIntersectionSettings&);                           \
  template void AddSegmentIntersections<T>(int, int, SegmentIntersections&, SegmentIntersections&, JointType,     \
                                           SegmentsT<T>&, const SegmentIntersectionSettings&);
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace OstraCrv
