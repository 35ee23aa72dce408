// Conversions between node indices and segment numbers.
//
// A segment has no record of its own: it exists as its end node, a line or a
// curve, and segments are numbered from 0 in array order across all subpaths.
// Moves and arcs end no segment. With no index to look in, every conversion
// counts segment ends, one branch-free pass over at most n bytes (see
// node_lanes.h), O(n) with no allocation.
//
// The start of segment s is the non-arc node before its end: one node back
// for a line, three for a curve (arc, arc, curve). So the first segment of a
// subpath starts at that subpath's move and never at the previous subpath's
// last node.
#include "node_lanes.h"
#include "ostracrv/core/nodetype.h"

namespace OstraCrv {

namespace {

// Segment ends in nodes[0, count).
int segmentEndsBefore(NODETYPE const* nodes, int count) noexcept {
  return static_cast<int>(lanes::Count<lanes::SegmentEnd>(nodes, static_cast<std::size_t>(count)));
}

}  // namespace

int LastNodeToSegmentIndex(NODETYPE const* nodes, int n, int i) {
  if (!nodes || i < 0 || i >= n) return -1;
  // A node that ends no segment answers the last segment before it.
  return segmentEndsBefore(nodes, i + 1) - 1;
}

int FirstNodeToSegmentIndex(NODETYPE const* nodes, int n, int i) {
  // The kind of node i+1 says how far the segment reaches, so both i+1 and the
  // end node must lie inside the array.
  if (!nodes || i < 0 || i + 1 >= n) return -1;
  const int e = IsLine(nodes[i + 1]) ? i + 1 : i + 3;
  if (e >= n) return -1;
  // The caller passes a node that starts a segment; the kind at e is not
  // checked.
  return segmentEndsBefore(nodes, e + 1) - 1;
}

int SegmentToLastNodeIndex(NODETYPE const* nodes, int n, int s) {
  if (!nodes || n < 1 || s < 0) return -1;
  return static_cast<int>(lanes::FindNth<lanes::SegmentEnd>(nodes, static_cast<std::size_t>(n),
                                                             static_cast<uint64_t>(s)));
}

int SegmentToFirstNodeIndex(NODETYPE const* nodes, int n, int s) {
  const int e = SegmentToLastNodeIndex(nodes, n, s);
  if (e < 0) return -1;
  const int start = IsLine(nodes[e]) ? e - 1 : e - 3;
  // A curve too near the array start has no start node.
  return start < 0 ? -1 : start;
}

}  // namespace OstraCrv
