// The meetings of one pair of segments: line and line, line and Bezier, two
// Beziers, and the loop of one Bezier.
//
// The three pair tests share one skeleton (A the first segment, from A0 to
// A1; B the second, from B0 to B1; for a Bezier these are its end points):
//  1. Box test: the boxes of the control points, inflated by the larger of
//     endTolerance and touchTolerance (and extendedTouchDistance when the
//     second chance is on), must meet; touching boxes meet. The integer form
//     rounds the inflation up to a whole number and compares integers.
//  2. End pass: ends closer than endToleranceSquared are one point. A0-B0 and
//     A1-B1 always give a touch record; the cross pairs A0-B1 and A1-B0 only
//     when the two segments do not simply continue into each other there:
//     the end pair that forms the joint of adjacent segments is no meeting.
//  3. Touch pass: each end not matched yet is tested against the other
//     segment (an end closer than touchToleranceSquared to the interior
//     touches it); the record lies at the end that touched.
//  4. Overlap and crossing: two meetings of the same pair may bound a shared
//     stretch (an overlap, see touch_overlap.h); otherwise true crossings in
//     the interiors of both are added.
//  5. Second chance (only with useExtendedTouch, which no caller of the
//     library sets): when nothing else was found, the closest approach of an
//     end pair or an end to the other segment within extendedTouchDistance
//     becomes a touch.
// The forms differ in details that callers rely on:
//   - position of an end record: the end of A for two lines and two
//     Beziers, the end of B (the Bezier) for a line and a Bezier;
//   - cross pairs are tried A1-B0 first for two lines, A0-B1 first otherwise;
//   - two lines forming a closed subpath of two segments (JointBoth) record
//     both joints; the Bezier forms skip both;
//   - for two lines and for a line and a Bezier an overlap ends the search;
//     for two Beziers it only hides crossings inside the shared stretch;
//   - between two Beziers, a crossing within a squared distance of 0.1 of a
//     joint node is a rounding echo of the joint and is dropped, whatever
//     the touch tolerance.
//
// Tangents of a line are its end minus its start; of a Bezier the derivative
// (kept defined at a collapsed handle). Curvature is signed, positive for a
// left (counter-clockwise) turn with the y axis up, cross(B', B'') / |B'|^3,
// and 0 on a line; welding breaks ties of tangent direction by it.
//
// Distances are compared squared, each test as stated: ends and touches match
// when strictly closer than their tolerance; the joint and loop filters keep a
// crossing only when strictly farther.
//
// The point arrays of the pair tests are the whole arrays of the two curves:
// the segments' firstNode gives their place. The integer forms widen every
// point to double and test in double, except the box test. No square root in
// the tests; nothing is allocated except the records and the small result
// lists of the Bezier searches.
#pragma once

#include "ostracrv/intersect/segments.h"

namespace OstraCrv {

// Two lines. The crossing is the solution of A0 + v (A1 - A0) = B0 + u (B1 -
// B0) with both parameters strictly inside (0, 1); parallel lines have none.
template <class T>
void AddLineIntersections(T const* firstPoints, T const* secondPoints, int first, int second,
                          SegmentsT<T>& segments, JointType joint, const SegmentIntersectionSettings& settings);
// A line (first) and a Bezier (second). Crossings near the joint node (both
// parameters within 1e-7 of it) are dropped; the line parameter must lie
// strictly inside (0, 1).
template <class T>
void AddLineBezierIntersections(T const* linePoints, T const* bezierPoints, int line, int bezier,
                                SegmentsT<T>& segments, JointType joint, const SegmentIntersectionSettings& settings);
// Two Beziers.
template <class T>
void AddBezierIntersections(T const* firstPoints, T const* secondPoints, int first, int second,
                            SegmentsT<T>& segments, JointType joint, const SegmentIntersectionSettings& settings);
// The loop of one Bezier (points at its first point): one meeting of the
// segment with itself, both records in its own list, unless the crossing lies
// within touchToleranceSquared of an end of the segment.
template <class T>
void AddBezierSelfIntersections(T const* points, int segment, SegmentsT<T>& segments,
                                const SegmentIntersectionSettings& settings);

// The inflation of the box test: the largest of endTolerance, touchTolerance
// and (with useExtendedTouch) extendedTouchDistance, not below 0; a NaN
// tolerance counts as 0.
double GetBoxInflation(const SegmentIntersectionSettings& settings) noexcept;

// A segment's box of control points, inflated. In the integer form the
// inflation is rounded up to a whole number and the box is exact (its values
// are integers held in doubles).
struct SegmentBox {
  double minX = 0.0, minY = 0.0, maxX = 0.0, maxY = 0.0;
};
// The inflated box of the line p[0..1] or the Bezier p[0..3]. False, with box
// untouched, for a null pointer or a non-finite coordinate.
template <class T>
bool GetSegmentBox(T const* p, SegmentIntersections::Type type, double inflation, SegmentBox& box) noexcept;
// Whether two inflated boxes meet; touching boxes meet.
constexpr bool DoBoxesMeet(const SegmentBox& a, const SegmentBox& b) noexcept {
  return a.minX <= b.maxX && b.minX <= a.maxX && a.minY <= b.maxY && b.minY <= a.maxY;
}

}  // namespace OstraCrv
