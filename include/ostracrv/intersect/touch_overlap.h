// Touches and overlaps: how the engine tells a true crossing from a meeting
// that needs care.
//
// A touch is an end of one segment lying on another segment (closer than the
// touch tolerance) without a crossing being provable. An overlap is a stretch
// that two segments share; it is found from two meetings of the same pair
// (ends, touches, or the joint of two adjacent segments) when the stretch
// between them lies on both segments, and it is recorded by linking the two
// records of each segment through overlapEnd.
//
// A touch record lies at the end that touched, not at its projection on the
// other segment, so that both twins hold a node of the input. In each pair of
// records the touched segment comes first.
//
// Distances are compared squared and strictly (closer than the tolerance).
// The integer forms widen points to double; all results are double.
#pragma once

#include "ostracrv/intersect/segments.h"

namespace OstraCrv {

// Whether `point` (an end of segment pointSegment at parameter pointT, with
// that segment's tangent and curvature there) lies on the line line[0..1]:
// its foot on the line must have a parameter u in [0, 1] (the ends count)
// and lie closer than squaredTolerance. On success appends the candidate
// (foot; u on lineSegment with lineTangent and curvature 0; pointT on
// pointSegment; position `point`) and returns true. False for a line of
// zero length.
template <class T>
bool TouchLine(T const* line, int lineSegment, const MavikMath::D& lineTangent, const T& point, int pointSegment,
               const MavikMath::D& pointTangent, double pointCurvature, double pointT,
               IntersectionCandidates& candidates, double squaredTolerance);
// As above, with touchToleranceSquared, adding the touch at once as a record
// pair (touch true, tangents normalised as the settings ask).
template <class T>
bool TouchLine(T const* line, int lineSegment, const MavikMath::D& lineTangent, const T& point, int pointSegment,
               const MavikMath::D& pointTangent, double pointCurvature, double pointT, SegmentsT<T>& segments,
               const SegmentIntersectionSettings& settings);
// Whether `point` lies closer than squaredTolerance to the Bezier
// bezier[0..3] (its nearest point). On success appends the candidate (nearest
// point; its parameter on bezierSegment with the Bezier's tangent and
// curvature there; the rest as TouchLine) and returns true. False for a
// Bezier whose points coincide or non-finite input.
template <class T>
bool TouchBezier(T const* bezier, int bezierSegment, const T& point, int pointSegment,
                 const MavikMath::D& pointTangent, double pointCurvature, double pointT,
                 IntersectionCandidates& candidates, double squaredTolerance);
// As above, adding the touch at once.
template <class T>
bool TouchBezier(T const* bezier, int bezierSegment, const T& point, int pointSegment,
                 const MavikMath::D& pointTangent, double pointCurvature, double pointT, SegmentsT<T>& segments,
                 const SegmentIntersectionSettings& settings);

// Turns two meetings of the segments first and second into an overlap if the
// stretch between them is shared. firstPoints and secondPoints are the
// segments' own first points. The meetings are the first two records of
// `first` (in the order they were added) whose twins lie on `second`; with
// only one and adjacent segments, the joint node is the second meeting and is
// added as a record pair (touch false), and taken back if there is no
// overlap. On success links the four records and raises overlapCount by 2,
// and returns the record of `first` with the lower t. Null otherwise.
template <class T>
Intersection* ProcessOverlap(T const* firstPoints, T const* secondPoints, int first, int second,
                             SegmentsT<T>& segments, const SegmentIntersectionSettings& settings);

// Whether the part of `first` between firstStart and firstEnd lies on the
// part of `second` between secondStart and secondEnd (either range may run
// backwards); the pointers are the segments' own first points. Both ranges
// must be longer than kEpsilon. Two lines: always (the two meetings prove
// it). A line and a Bezier: the Bezier's part must lie closer than
// squaredTolerance to the line over the line's extent (all four control
// points of the cut-out part). Two Beziers: the cut-out parts, both running
// from the first meeting to the second, must have corresponding control
// points closer than squaredTolerance; if both parts are straight within the
// tolerance only their end points are compared, as inner control points of a
// straight curve only set its speed. False for non-finite input.
template <class T>
bool DoSegmentsOverlap(T const* first, T const* second, SegmentIntersections::Type firstType,
                       SegmentIntersections::Type secondType, double firstStart, double firstEnd,
                       double secondStart, double secondEnd, double squaredTolerance);

}  // namespace OstraCrv
