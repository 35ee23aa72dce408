// Rotation of a closed subpath.
//
// A closed subpath f..l stores its closing point twice (f and l). Turning it
// by k = node - f positions drops the old first entry, whose point survives
// as the copy at l, and repeats the new first entry at the end:
//
//   before: f, f+1, ..., l          after: f+k, ..., l, f+1, ..., f+k
//
// The byte that lands at l is the one of node f+k, so the closing segment
// keeps its type; the old closing node l becomes an interior node with the
// user bit. This is one rotation of the entries f+1..l by k-1 plus a copy, not
// k single steps: O(subpath length) whatever k is.
#include "ostracrv/core/subpath_spin.h"

#include <algorithm>

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

template <class T>
int SpinSubpath(T* points, NODETYPE* nodes, int n, int first, int node) {
  if (!points || !nodes || n < 1 || first < 0 || first >= n) return 0;
  if (!IsClosedNode(nodes[first])) return 0;
  const int l = OtherClosedEnd(nodes, first, n);
  if (l <= first) return 0;
  if (node < first || node > l) return 0;

  // While it is inside the ring, the old closing node is an ordinary node.
  nodes[l] = NODETYPE((nodes[l] & ~NodeMask::kClosed) | NodeMask::kUser);
  const int k = node - first;
  if (k > 0) {
    // Drop the old first entry, rotate the ring f+1..l left by k-1, then
    // repeat the new first entry at l.
    std::move(points + first + 1, points + l + 1, points + first);
    std::move(nodes + first + 1, nodes + l + 1, nodes + first);
    std::rotate(points + first, points + first + (k - 1), points + l);
    std::rotate(nodes + first, nodes + first + (k - 1), nodes + l);
    points[l] = points[first];
    nodes[l] = NODETYPE(nodes[first] & ~NodeMask::kClosed);
  }
  nodes[l] = NODETYPE((nodes[l] & ~NodeMask::kUser) | NodeMask::kClosed);
  nodes[first] = NODETYPE((nodes[first] & ~NodeMask::kType) | NodeMask::kClosed);
  return 1;
}

template int SpinSubpath<POINT>(POINT*, NODETYPE*, int, int, int);
template int SpinSubpath<V>(V*, NODETYPE*, int, int, int);

}  // namespace OstraCrv
