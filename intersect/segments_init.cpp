// One engine record per segment of a curve, linked to its neighbours.
//
// The walk follows the node kinds: an arc opens a Bezier whose first point is
// the node before it (the four points are i-1 .. i+2), a line node ends a
// line from the node before it, and a move starts a subpath. When a subpath
// ends (at the next move or the end of the array) its segments are linked in
// a ring if its last node carries the closed bit, and end at -1 otherwise.
// Segments whose points are all exactly equal are kept, marked degenerate, so
// that the numbering of segments follows the nodes. O(count).
#include <cstddef>

#include "ostracrv/intersect/segments.h"

namespace OstraCrv {

template <class T>
void InitializeSegments(int curve, T const* points, NODETYPE const* nodes, int count,
                        std::vector<SegmentIntersections>& segments) {
  if (!nodes || count < 2) return;
  size_t subpathFirst = segments.size();

  // Links the segments of the subpath that ends at node lastNode.
  auto finishSubpath = [&](int lastNode) {
    if (segments.size() > subpathFirst) {
      SegmentIntersections& first = segments[subpathFirst];
      SegmentIntersections& last = segments.back();
      if (lastNode >= 0 && IsClosedNode(nodes[lastNode])) {
        last.next = first.index;
        first.prev = last.index;
      } else {
        last.next = -1;
        first.prev = -1;
      }
    }
    subpathFirst = segments.size();
  };
  auto push = [&](int firstNode, SegmentIntersections::Type type, bool degenerate) {
    SegmentIntersections s;
    s.index = static_cast<int>(segments.size());
    s.firstNode = firstNode;
    s.curve = curve;
    s.type = type;
    s.degenerate = degenerate;
    s.next = s.index + 1;
    s.prev = s.index - 1;
    segments.push_back(std::move(s));
  };

  int i = 0;
  int lastNode = count - 1;
  while (i < count) {
    const NODETYPE n = nodes[i];
    if (IsMove(n)) {
      finishSubpath(i - 1);
      ++i;
    } else if (IsArc(n)) {
      if (i < 1 || i + 2 >= count) {  // no room for the Bezier: a broken tail
        lastNode = i - 1;
        break;
      }
      bool degenerate = false;
      if (points) {
        const T& p = points[i - 1];
        degenerate = points[i] == p && points[i + 1] == p && points[i + 2] == p;
      }
      push(i - 1, SegmentIntersections::Bezier, degenerate);
      i += 3;
    } else if (IsLine(n) && i >= 1) {
      push(i - 1, SegmentIntersections::Line, points && points[i] == points[i - 1]);
      ++i;
    } else {
      ++i;  // a curve node out of step, or a line before any node: no segment
    }
  }
  finishSubpath(lastNode);
}

using Framework::common_types::POINT;
using MavikMath::V;

template void InitializeSegments<POINT>(int, POINT const*, NODETYPE const*, int, std::vector<SegmentIntersections>&);
template void InitializeSegments<V>(int, V const*, NODETYPE const*, int, std::vector<SegmentIntersections>&);

}  // namespace OstraCrv
