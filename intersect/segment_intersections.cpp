// The segment record of the intersection engine: ownership of its meeting
// records, lookup and sorting. Records are heap objects so that the links
// between them survive sorting and the growth of the segment vector; sorting
// moves pointers only. The sort is stable, so records of equal t keep the
// order in which they were found, which keeps a run reproducible.
#include "ostracrv/intersect/segment_intersections.h"

#include <algorithm>
#include <memory>

namespace OstraCrv {

SegmentIntersections::SegmentIntersections(SegmentIntersections&& o) noexcept
    : firstNode(o.firstNode),
      curve(o.curve),
      next(o.next),
      index(o.index),
      prev(o.prev),
      degenerate(o.degenerate),
      intersections(std::move(o.intersections)),
      type(o.type),
      enabled(o.enabled),
      sides(o.sides),
      leftColor(o.leftColor),
      rightColor(o.rightColor) {
  o.intersections.clear();
}

SegmentIntersections& SegmentIntersections::operator=(SegmentIntersections&& o) noexcept {
  if (this == &o) return *this;
  DeleteAll();
  firstNode = o.firstNode;
  curve = o.curve;
  next = o.next;
  index = o.index;
  prev = o.prev;
  degenerate = o.degenerate;
  intersections = std::move(o.intersections);
  o.intersections.clear();
  type = o.type;
  enabled = o.enabled;
  sides = o.sides;
  leftColor = o.leftColor;
  rightColor = o.rightColor;
  return *this;
}

SegmentIntersections::~SegmentIntersections() { DeleteAll(); }

Intersection* SegmentIntersections::AddIntersection(const Intersection& record) {
  auto owned = std::make_unique<Intersection>(record);
  intersections.push_back(owned.get());
  return owned.release();
}

int SegmentIntersections::GetIndex(const Intersection* record) const noexcept {
  for (size_t i = 0; i < intersections.size(); ++i)
    if (intersections[i] == record) return static_cast<int>(i);
  return -1;
}

void SegmentIntersections::Sort() {
  std::stable_sort(intersections.begin(), intersections.end(), LessThanIntersection);
}

void SegmentIntersections::DeleteAll() noexcept {
  for (Intersection* r : intersections) delete r;
  intersections.clear();
}

}  // namespace OstraCrv
