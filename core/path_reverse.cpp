// Reversal of a raw path.
//
// A node byte describes the segment that ends at its point. After the arrays
// are reversed, the segment that ended at node i (before the swap) ends at
// the point that used to precede it, so each non-arc node takes the type of
// its new predecessor, read before that predecessor is changed in turn (the
// walk runs downward). A predecessor that is an arc means that the segment is
// a Bezier arriving through its two control points: the node becomes a
// curve. Arcs stay arcs, and the low six bits (continuity, closed, user,
// letter, enabled) stay with their point. Closed ends fix their user bit: the
// new first node of a closed subpath is a move and carries it, the new
// closing node does not. Node 0 ends up a move with the user bit.
#include "ostracrv/core/path_reverse.h"

#include <algorithm>

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr NODETYPE kLow = 0x3F;

void RetypeReversed(NODETYPE* nodes, int n) noexcept {
  for (int i = n - 1; i >= 1; --i) {
    NODETYPE b = nodes[i];
    if (IsArc(b)) continue;
    const NODETYPE before = nodes[i - 1];
    const NODETYPE type = IsArc(before) ? NodeMask::kCurve : NODETYPE(before & NodeMask::kType);
    b = NODETYPE((b & kLow) | type);
    if (IsClosedNode(b)) b = IsMove(b) ? NODETYPE(b | NodeMask::kUser) : NODETYPE(b & ~NodeMask::kUser);
    nodes[i] = b;
  }
  nodes[0] = NODETYPE((nodes[0] & kLow) | NodeMask::kUser);
}

}  // namespace

template <class T>
void Reverse(T* points, NODETYPE* nodes, int n) {
  if (!points || !nodes || n < 1) return;
  std::reverse(points, points + n);
  std::reverse(nodes, nodes + n);
  RetypeReversed(nodes, n);
}

template <class T>
void Reverse(T* points, NODETYPE* nodes, int a, int b) {
  if (a > b) std::swap(a, b);
  if (!points || !nodes || a < 0) return;
  Reverse(points + a, nodes + a, b - a + 1);
}

template void Reverse<POINT>(POINT*, NODETYPE*, int);
template void Reverse<V>(V*, NODETYPE*, int);
template void Reverse<POINT>(POINT*, NODETYPE*, int, int);
template void Reverse<V>(V*, NODETYPE*, int, int);

}  // namespace OstraCrv
