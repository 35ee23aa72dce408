// The rules of a valid path, and the repair of its flags.
//
// Validity is about the sequence of kinds and the flags that the kinds imply:
// a path starts with a move, every Bezier is exactly arc, arc, curve after a
// node that is not an arc, an arc carries no closed or continuity bits (and is
// offered for picking only while selected), and each subpath that ends in a
// segment agrees at both ends on being closed, with only the first end of a
// closed subpath counted as a user node. A lone move is a legal subpath.
//
// Left unchecked on purpose: a stray closed bit inside a subpath, a missing
// user bit inside a subpath, whether the two closed ends lie on one position.
// FixNodeTypes brings those flags in order.
//
// Both are single passes, O(n), with no allocation. An array count above
// INT_MAX cannot be a path (indices are int) and is taken for a negative count
// that crossed the interface: invalid, and nothing is written.
#include <climits>
#include <cstddef>

#include "ostracrv/core/nodetype.h"

namespace OstraCrv {

namespace {

constexpr NODETYPE kArcForbidden = NodeMask::kClosed | NodeMask::kContinuity;

}  // namespace

bool IsValidCurve(NODETYPE const* nodes, unsigned long n) {
  if (n == 0) return true;
  if (!nodes || n > static_cast<unsigned long>(INT_MAX)) return false;
  if (!IsMove(nodes[0])) return false;
  std::size_t first = 0;  // first node of the current subpath
  for (std::size_t i = 0; i < n; ++i) {
    const NODETYPE node = nodes[i];
    switch (GetSegmentType(node)) {
      case SegmentType::move:
        if (i > 0 && IsArc(nodes[i - 1])) return false;
        first = i;
        break;
      case SegmentType::line:
        if (IsArc(nodes[i - 1])) return false;
        break;
      case SegmentType::curve:
        if (i < 3 || !IsArc(nodes[i - 1]) || !IsArc(nodes[i - 2]) || IsArc(nodes[i - 3])) return false;
        break;
      case SegmentType::arc:
        if (i == n - 1 || (node & kArcForbidden) != 0) return false;
        if (IsUserNode(node) && !IsEnabledNode(node)) return false;
        break;
    }
    const bool endsSegment = IsLine(node) || IsCurve(node);
    const bool lastOfSubpath = i == n - 1 || IsMove(nodes[i + 1]);
    if (endsSegment && lastOfSubpath) {
      const NODETYPE start = nodes[first];
      if (IsClosedNode(node) != IsClosedNode(start)) return false;
      if (IsClosedNode(node) && IsUserNode(node) && IsUserNode(start)) return false;
    }
  }
  return true;
}

bool FixNodeTypes(NODETYPE* nodes, unsigned long n) {
  if (!nodes || n == 0 || n > static_cast<unsigned long>(INT_MAX)) return false;
  bool changed = false;
  // A path that does not start with a move is read as if node 0 started it.
  std::size_t first = 0;
  for (std::size_t i = 0; i < n; ++i) {
    NODETYPE node = nodes[i];
    if (IsMove(node)) {
      first = i;
      node |= NodeMask::kUser;
    } else if (i == n - 1 || IsMove(nodes[i + 1])) {
      // A subpath cannot end on a control point: it becomes the end of a line.
      if (IsArc(node)) node = NODETYPE((node & 0x3F) | NodeMask::kLine);
      const NODETYPE closed = nodes[first] & NodeMask::kClosed;
      node = NODETYPE((node & ~(NodeMask::kClosed | NodeMask::kUser)) | closed);
      // The closing node of a closed subpath is the same place as the first
      // node, which is the one the user counts.
      if (!closed) node |= NodeMask::kUser;
    } else {
      node &= NODETYPE(~NodeMask::kClosed);
      if (!IsArc(node)) node |= NodeMask::kUser;
    }
    changed |= node != nodes[i];
    nodes[i] = node;
  }
  return changed;
}

}  // namespace OstraCrv
