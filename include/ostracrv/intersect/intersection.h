// The records of one meeting of two segments.
//
// A meeting of two segments (a crossing, a touch at an end, or one end of a
// shared stretch) is kept as two Intersection records, one in the list of
// each segment, each pointing at the other through `other`. Both hold the
// same position. An overlap (a stretch that two segments share) is no record
// of its own: it is two ordinary meetings whose records are linked pairwise
// through `overlapEnd`, on each segment the record at the other end of the
// shared stretch.
//
// Everything here is double for both point kinds: integer input is widened
// when it is read.
#pragma once

#include <cstdint>
#include <utility>
#include <vector>

#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// How the two segments of a pair follow each other in their subpath.
enum JointType {
  JointNone = 0,           // not adjacent
  JointFirstToSecond = 1,  // the first segment ends where the second starts
  JointSecondToFirst = 2,  // the second segment ends where the first starts
  JointBoth = 3,           // both: a closed subpath of exactly two segments
};

// One end of a meeting, owned by the list of its segment.
struct Intersection {
  double t = 0.0;                      // parameter on the own segment, 0 to 1
  int segment = -1;                    // index of the own segment in SegmentsT::segments
  Intersection* other = nullptr;       // the twin record on the other segment
  Intersection* overlapEnd = nullptr;  // the record at the other end of a shared stretch, same segment
  MavikMath::V point;                  // the position; both twins hold the same value
  MavikMath::D tangent;                // of the own segment at t (unit length if the settings ask)
  double curvature = 0.0;              // signed, positive for a left turn; 0 on a line
  bool enabled = true;                 // false marks the record for removal; welding reuses it
  int sides = 0;                       // welding: filled sides of the edge starting here
  bool touch = false;                  // found by nearness of a segment end, not as a crossing
  uint32_t leftColor = 0;              // knife: colours of the edge ending here
  uint32_t rightColor = 0;
};

// A meeting that has been found but not yet added. The two sets of fields
// describe the two records; `point` is where the pair will lie.
struct IntersectionParams {
  double t = 0.0;
  int segment = -1;
  MavikMath::D tangent;
  double curvature = 0.0;
  double otherT = 0.0;
  int otherSegment = -1;
  MavikMath::D otherTangent;
  double otherCurvature = 0.0;
  MavikMath::V point;
};

// Candidates of the second-chance touch search: the first member is the
// position on the touched segment nearest to the candidate's point, used only
// to measure how close the two segments come.
using IntersectionCandidate = std::pair<MavikMath::V, IntersectionParams>;
using IntersectionCandidates = std::vector<IntersectionCandidate>;

// Order of records along a segment: by t alone.
inline bool LessThanIntersection(const Intersection* a, const Intersection* b) noexcept { return a->t < b->t; }

}  // namespace OstraCrv
