// Flag writers that keep the two ends of a closed subpath in step, and the
// twin lookup they rely on.
//
// The first and the last node of a closed subpath are one place stored twice,
// so a state flag (enabled, continuity) written on one end is written on the
// other too. Finding the twin walks the subpath once, O(length of the
// subpath); out-of-range indices and null arrays write nothing.
#include "ostracrv/core/nodetype.h"

int OtherClosedEnd(NODETYPE const* nodes, int i, int n) {
  if (!nodes || i < 0 || i >= n || !IsClosedNode(nodes[i])) return -1;
  if (!IsMove(nodes[i])) {
    int j = i - 1;
    while (j > 0 && !IsClosedNode(nodes[j])) --j;
    return j < 0 ? 0 : j;
  }
  // The twin stays inside the subpath: meeting the next subpath's move ends
  // the walk before that move's own closed bit is looked at, so a lone closed
  // move is its own twin.
  for (int j = i + 1; j < n; ++j) {
    if (IsMove(nodes[j])) return j - 1;
    if (IsClosedNode(nodes[j])) return j;
  }
  return -1;
}

void CRV_SetEnabled(NODETYPE* nodes, int n, int i, int on) {
  if (!nodes || i < 0 || i >= n) return;
  const NODETYPE bit = NODETYPE(on & 1);
  nodes[i] = NODETYPE((nodes[i] & ~NodeMask::kEnabled) | bit);
  const int twin = OtherClosedEnd(nodes, i, n);
  if (twin >= 0) nodes[twin] = NODETYPE((nodes[twin] & ~NodeMask::kEnabled) | bit);
}

void CRV_SetCont(NODETYPE* nodes, int n, int i, ContinuityType c) {
  if (!nodes || i < 0 || i >= n) return;
  nodes[i] = WithContinuity(nodes[i], c);
  const int twin = OtherClosedEnd(nodes, i, n);
  if (twin >= 0) nodes[twin] = WithContinuity(nodes[twin], c);
}
