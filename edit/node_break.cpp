// Breaking a path at a position.
//
// A break parts the path at one place, so that two subpath ends lie on the
// same point. Inside a segment a node is added first; at a node, a move on a
// copy of the node's point is inserted behind it, and CleansPath turns a
// closed subpath broken that way into a single open one. The closing node of
// a closed subpath needs no new node: clearing the closed bits of the twins
// opens the subpath there, the closing node becoming its open end (it takes
// the user bit of its twin, and neither end stays smooth, as ends have no
// continuity).
//
// Cost: one insertion and the tidy-up, O(n).
#include "ostracrv/edit/node_edits.h"
#include "ostracrv/repair/clean_path.h"

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr NODETYPE kClosedAndContinuity = NodeMask::kClosed | NodeMask::kContinuity;

}  // namespace

template <class T>
int CRV_BreakAtLocation(T* points, NODETYPE* nodes, int n, int i, double t) {
  if (!points || !nodes || n < 1 || i < 0 || i >= n) return -1;
  if (!(t >= 0.0 && t <= 1.0)) return -1;
  // The first node of a closed subpath is the same place as its closing node,
  // where the closing segment ends.
  if (IsMove(nodes[i]) && IsClosedNode(nodes[i])) {
    const int w = OtherClosedEnd(nodes, i, n);
    if (w < 0) return -1;
    i = w;
  }
  if (!IsLine(nodes[i]) && !IsCurve(nodes[i])) return -1;

  const bool atStart = t <= MavikMath::kEpsilon;
  const bool atEnd = t >= 1.0 - MavikMath::kEpsilon;
  if (!atStart && !atEnd) {
    const int added = CRV_Add(points, nodes, n, i, t, 1);
    if (added == 0) return -1;
    n += added;
    // i is now the new middle node; the copy behind it starts the second piece.
    n = CRV_AppendMove(points, nodes, n, i + 1, points[i]);
    nodes[i] = NODETYPE(nodes[i] & ~NodeMask::kEnabled);
    nodes[i + 1] = NODETYPE(nodes[i + 1] & ~NodeMask::kEnabled);
    return OstraCrv::CleansPath(points, nodes, n);
  }

  const int k = atStart ? PNControl(nodes, i, n) : i;
  if (CRV_IsFirstOrLastOpenSubpathNode(nodes, n, k) || IsMove(nodes[k])) return -1;
  if (CRV_IsLastClosedSubpathNode(nodes, n, k)) {
    const int w = OtherClosedEnd(nodes, k, n);
    if (w < 0 || w == k) return -1;
    nodes[k] = NODETYPE((nodes[k] & ~NodeMask::kUser) | (nodes[w] & NodeMask::kUser));
    nodes[k] = NODETYPE(nodes[k] & ~kClosedAndContinuity);
    nodes[w] = NODETYPE(nodes[w] & ~kClosedAndContinuity);
    return OstraCrv::CleansPath(points, nodes, n);
  }
  n = CRV_AppendMove(points, nodes, n, k + 1, points[k]);
  return OstraCrv::CleansPath(points, nodes, n);
}

template int CRV_BreakAtLocation<POINT>(POINT*, NODETYPE*, int, int, double);
template int CRV_BreakAtLocation<V>(V*, NODETYPE*, int, int, double);
