// Questions about the subpath that holds one node.
//
// A subpath runs from a move to the node before the next move (or the array
// end). Its first and last node are found by walking to the neighbouring
// move, O(length of the subpath); the other answers read one or two bytes.
//
// Smoothness of a node depends on the two segments that meet there. A node
// that ends a line has a line behind it, one that ends a curve a Bezier; the
// segment ahead is a Bezier exactly when the next node on the ring is an arc.
// At a closed subpath the first node and the last node are one place, so the
// first node borrows its incoming segment from its twin, the closing node.
//
// An index outside the array, a null array or a negative count give false for
// the predicates and -1 for the index answers; nothing outside 0..n-1 is read.
#include "ostracrv/core/nodetype.h"

namespace {

bool inRange(NODETYPE const* nodes, int i, int n) noexcept { return nodes && i >= 0 && i < n; }

// Callers have checked the range of i.
bool isLast(NODETYPE const* nodes, int i, int n) noexcept { return i == n - 1 || IsMove(nodes[i + 1]); }

}  // namespace

bool CRV_IsFirstSubpathNode(NODETYPE const* nodes, int n, int i) {
  return inRange(nodes, i, n) && IsMove(nodes[i]);
}

bool CRV_IsLastSubpathNode(NODETYPE const* nodes, int n, int i) {
  return inRange(nodes, i, n) && isLast(nodes, i, n);
}

bool CRV_IsFirstOrLastSubpathNode(NODETYPE const* nodes, int n, int i) {
  return inRange(nodes, i, n) && (IsMove(nodes[i]) || isLast(nodes, i, n));
}

bool CRV_IsFirstOpenSubpathNode(NODETYPE const* nodes, int n, int i) {
  return CRV_IsFirstSubpathNode(nodes, n, i) && !IsClosedNode(nodes[i]);
}

bool CRV_IsLastOpenSubpathNode(NODETYPE const* nodes, int n, int i) {
  return CRV_IsLastSubpathNode(nodes, n, i) && !IsClosedNode(nodes[i]);
}

bool CRV_IsFirstOrLastOpenSubpathNode(NODETYPE const* nodes, int n, int i) {
  return CRV_IsFirstOrLastSubpathNode(nodes, n, i) && !IsClosedNode(nodes[i]);
}

bool CRV_IsFirstClosedSubpathNode(NODETYPE const* nodes, int n, int i) {
  return CRV_IsFirstSubpathNode(nodes, n, i) && IsClosedNode(nodes[i]);
}

bool CRV_IsLastClosedSubpathNode(NODETYPE const* nodes, int n, int i) {
  return CRV_IsLastSubpathNode(nodes, n, i) && IsClosedNode(nodes[i]);
}

bool CRV_IsFirstOrLastClosedSubpathNode(NODETYPE const* nodes, int n, int i) {
  return CRV_IsFirstOrLastSubpathNode(nodes, n, i) && IsClosedNode(nodes[i]);
}

int CRV_FirstNodeOfThisSubpath(NODETYPE const* nodes, int n, int i) {
  if (!inRange(nodes, i, n)) return -1;
  while (i >= 0 && !IsMove(nodes[i])) --i;
  return i;  // -1 when no move precedes
}

int CRV_LastNodeOfThisSubpath(NODETYPE const* nodes, int n, int i) {
  if (!inRange(nodes, i, n)) return -1;
  while (i < n - 1 && !IsMove(nodes[i + 1])) ++i;
  return i;
}

bool CRV_IsThisSubpathClosed(NODETYPE const* nodes, int n, int i) {
  const int f = CRV_FirstNodeOfThisSubpath(nodes, n, i);
  return f >= 0 && IsClosedNode(nodes[f]);
}

bool CRV_TwoNodesInSameSubpath(NODETYPE const* nodes, int n, int a, int b) {
  if (!inRange(nodes, a, n) || !inRange(nodes, b, n)) return false;
  const int lo = a < b ? a : b, hi = a < b ? b : a;
  for (int j = lo + 1; j <= hi; ++j)
    if (IsMove(nodes[j])) return false;
  return true;
}

int CRV_GetUserNode(NODETYPE const* nodes, int n, int i) {
  if (!inRange(nodes, i, n)) return -1;
  if (IsUserNode(nodes[i])) return i;
  // The closing node of a closed subpath stands for its twin, the first node.
  if (IsClosedNode(nodes[i])) {
    const int twin = OtherClosedEnd(nodes, i, n);
    if (twin >= 0 && IsUserNode(nodes[twin])) return twin;
  }
  return -1;
}

bool IsNodeSmoothable(NODETYPE const* nodes, int i, int n) {
  if (!inRange(nodes, i, n)) return false;
  const NODETYPE node = nodes[i];
  switch (GetSegmentType(node)) {
    case SegmentType::arc:
      return false;
    case SegmentType::move: {
      if (!IsClosedNode(node)) return false;  // an open start has one segment
      if (i + 1 < n && IsArc(nodes[i + 1])) return true;
      const int closing = OtherClosedEnd(nodes, i, n);
      return closing >= 0 && IsCurve(nodes[closing]);
    }
    case SegmentType::line:
      return IsArc(nodes[NN(nodes, i, n)]);
    case SegmentType::curve: {
      if (!isLast(nodes, i, n)) return true;
      if (!IsClosedNode(node)) return false;  // an open end has one segment
      // The closing curve wraps to the subpath's first segment; a subpath
      // whose second node is this one has no other segment.
      const int f = CRV_FirstNodeOfThisSubpath(nodes, n, i);
      return f + 1 != i;
    }
  }
  return false;
}

bool IsNodeSymmetable(NODETYPE const* nodes, int i, int n) {
  if (!inRange(nodes, i, n)) return false;
  const int next = NN(nodes, i, n);
  if (next == i || !IsArc(nodes[next])) return false;
  if (IsMove(nodes[i]) && IsClosedNode(nodes[i])) {
    const int closing = OtherClosedEnd(nodes, i, n);
    return closing >= 0 && IsCurve(nodes[closing]);
  }
  return IsCurve(nodes[i]);
}
