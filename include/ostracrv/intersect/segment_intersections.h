// The record of one line or Bezier segment in the intersection engine, with
// the meetings found on it.
//
// The record owns its Intersection objects: they are heap objects so that the
// links between records (other, overlapEnd) stay valid while lists are sorted
// and while the vector of segments grows. The record is therefore move-only;
// a moved-from record owns nothing.
#pragma once

#include <vector>

#include "ostracrv/intersect/intersection.h"

namespace OstraCrv {

class SegmentIntersections {
 public:
  enum Type { Line = 0, Bezier = 1 };

  int firstNode = 0;   // index of the segment's start point in its curve's arrays
  int curve = 0;       // index of its curve in SegmentsT::curves
  int next = -1;       // following segment of the subpath (wraps when closed), or -1
  int index = 0;       // own index in SegmentsT::segments
  int prev = -1;       // preceding segment of the subpath (wraps when closed), or -1
  bool degenerate = false;  // all its points are exactly equal
  std::vector<Intersection*> intersections;  // owned; sorted by t once the engine has run
  Type type = Line;
  bool enabled = true;  // welding: the edge from the last record to the segment's end
  int sides = 0;        // welding: the edge from the segment's start to the first record
  uint32_t leftColor = 0;
  uint32_t rightColor = 0;

  SegmentIntersections() = default;
  SegmentIntersections(const SegmentIntersections&) = delete;
  SegmentIntersections& operator=(const SegmentIntersections&) = delete;
  SegmentIntersections(SegmentIntersections&& o) noexcept;
  SegmentIntersections& operator=(SegmentIntersections&& o) noexcept;
  // Deletes every record still in the list.
  ~SegmentIntersections();

  // Copies the record to a new heap object owned by this list, appends it and
  // returns it. Memory exhaustion throws std::bad_alloc and leaks nothing.
  Intersection* AddIntersection(const Intersection& record);
  // List position of the record (by pointer), or -1 if it is not in the list.
  int GetIndex(const Intersection* record) const noexcept;
  // Sorts the list by t (LessThanIntersection). Records of equal t keep the
  // order in which they were added.
  void Sort();
  // Deletes every record of the list and empties it. The caller unlinks
  // twins first (see SegmentsT::RemoveIntersection).
  void DeleteAll() noexcept;
};

}  // namespace OstraCrv
