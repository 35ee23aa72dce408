// Inserting and removing entries, and adding a node on a segment.
//
// Adding a node to a Bezier splits it by de Casteljau's construction at t:
// the two halves together are the same curve, so the shape does not change
// (up to the rounding of the integer form). The new node is smooth, as its
// two handles lie on the tangent at t. The neighbouring nodes keep their
// handles' directions but the handles get shorter, so a symmetric neighbour
// can no longer be symmetric and is relaxed to smooth.
//
// Each operation shifts the tail of the arrays once: O(n).
#include "ostracrv/edit/node_edits.h"

#include <algorithm>

#include "ostracrv/math/bezier_split.h"

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

// The byte of an open move and of an open line end, both user nodes.
constexpr NODETYPE kOpenMove = NodeMask::kMove | NodeMask::kUser;
constexpr NODETYPE kOpenLine = NodeMask::kLine | NodeMask::kUser;
// The middle node of a split Bezier: type, letter and enabled bits kept;
// closed and continuity cleared; user and smooth set.
constexpr NODETYPE kSplitKeep = 0xC7;
constexpr NODETYPE kSplitSet = NodeMask::kUser | 0x10;

template <class T>
int insertOne(T* points, NODETYPE* nodes, int n, int at, T p, NODETYPE b) {
  if (!points || !nodes || n < 0 || at < 0 || at > n) return -1;
  PathInsNext(nodes, points, at, 1, n);
  points[at] = p;
  nodes[at] = b;
  return n + 1;
}

}  // namespace

template <class T>
int CRV_Remove(T* points, NODETYPE* nodes, int n, int i, int count) {
  if (!points || !nodes || i < 0 || count <= 0 || i >= n) return n;
  if (i + count >= n) return i;
  PathDelNext(nodes, points, i, count, n);
  return n - count;
}

int CRV_NeedGrowForAddNodeOfType(int type) {
  switch (type) {
    case 0:
    case 1: return 1;
    case 2: return 3;
    default: return 0;
  }
}

template <class T>
int CRV_AppendMove(T* points, NODETYPE* nodes, int n, int at, T p) {
  return insertOne(points, nodes, n, at, p, kOpenMove);
}

template <class T>
int CRV_AppendLine(T* points, NODETYPE* nodes, int n, int at, T p) {
  return insertOne(points, nodes, n, at, p, kOpenLine);
}

template <class T>
int CRV_Append(T* points, NODETYPE* nodes, int n, int at, T const* srcPoints, NODETYPE const* srcNodes, int end,
               int from) {
  if (!points || !nodes || n < 0 || at < 0 || at > n || from < 0) return -1;
  const int count = end - from;
  if (count <= 0) return n;
  if (!srcPoints || !srcNodes) return -1;
  PathInsNext(nodes, points, at, count, n);
  std::copy(srcPoints + from, srcPoints + end, points + at);
  std::copy(srcNodes + from, srcNodes + end, nodes + at);
  return n + count;
}

template <class T>
int CRV_Add(T* points, NODETYPE* nodes, int n, int i, double t, int smooth) {
  if (!points || !nodes || i < 1 || i >= n) return 0;
  if (!(t >= 0.0 && t <= 1.0)) return 0;
  const NODETYPE end = nodes[i];
  if (IsCurve(end)) {
    if (i < 3 || !IsArc(nodes[i - 1]) || !IsArc(nodes[i - 2])) return 0;
    const T p[4] = {points[i - 3], points[i - 2], points[i - 1], points[i]};
    // The gap of 3 at i-2 moves the arcs and the end node to i+1 .. i+3.
    PathInsNext(nodes, points, i - 2, 3, n);
    T left[4], right[4];
    MavikMath::CubicBezier::Split(t, p, left, right);
    std::copy(left, left + 4, points + i - 3);
    std::copy(right, right + 4, points + i);
    nodes[i - 2] = nodes[i + 1];
    nodes[i - 1] = nodes[i + 2];
    nodes[i] = NODETYPE((nodes[i + 3] & kSplitKeep) | kSplitSet);
    OstraCrv::SmoothEndNodes(nodes, i - 3, i + 3, n + 3);
    if (smooth) {
      OstraCrv::SmoothNode(points, nodes, n + 3, i);
      OstraCrv::SmoothNode(points, nodes, n + 3, i + 3);
    }
    return 3;
  }
  if (IsLine(end)) {
    const V p0 = MavikMath::ToV(points[i - 1]), p1 = MavikMath::ToV(points[i]);
    PathInsNext(nodes, points, i, 1, n);
    points[i] = MavikMath::FromV<T>(MavikMath::Lerp(p0, p1, t));
    nodes[i] = NODETYPE((end & ~NodeMask::kClosed) | NodeMask::kUser);
    return 1;
  }
  return 0;
}

#define OSTRACRV_INSERT(T)                                                                               \
  template int CRV_Remove<T>(T*, NODETYPE*, int, int, int);                                              \
  template int CRV_AppendMove<T>(T*, NODETYPE*, int, int, T);                                            \
  template int CRV_AppendLine<T>(T*, NODETYPE*, int, int, T);                                            \
  template int CRV_Append<T>(T*, NODETYPE*, int, int, T const*, NODETYPE const*, int, int);              \
  template int CRV_Add<T>(T*, NODETYPE*, int, int, double, int);

OSTRACRV_INSERT(POINT)
OSTRACRV_INSERT(V)
#undef OSTRACRV_INSERT
