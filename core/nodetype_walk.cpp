// Walking a path node by node, with wrap-around at closed subpaths.
//
// A closed subpath stores its closing point twice, at its first node f (the
// move) and at its last node l. The ring of the subpath is therefore
// f+1 .. l: NN of l is f+1, and PN of f+1 is l. The first node stands outside
// the ring but leads into it: NN of f is f+1 and PN of f is l, the same place
// as f. An open subpath has ends: NN of its last node and PN of its first node
// answer the node itself.
//
// Each step is O(1) except at a wrap, which walks the subpath once, O(length
// of the subpath). A node index outside the array, a null array or a negative
// count answer the index that was passed, so a loop that stops when the walk
// stops moving also stops on bad input.
#include "ostracrv/core/nodetype.h"

namespace {

bool bad(NODETYPE const* nodes, int i, int n) noexcept { return !nodes || i < 0 || i >= n; }

}  // namespace

int NN(NODETYPE const* nodes, int i, int n) {
  if (bad(nodes, i, n)) return i;
  if (i < n - 1 && !IsMove(nodes[i + 1])) return i + 1;
  // i is the last node of its subpath.
  if (!IsClosedNode(nodes[i])) return i;
  if (IsMove(nodes[i]) || i < 1) {
    // A closed move that is the whole subpath steps on to the next node; at the
    // array end there is none and the walk stays.
    return i + 1 < n ? i + 1 : i;
  }
  int f = i - 1;
  while (f > 0 && !IsMove(nodes[f])) --f;
  return f + 1;
}

int PN(NODETYPE const* nodes, int i, int n) {
  if (bad(nodes, i, n)) return i;
  const NODETYPE node = nodes[i];
  if (!IsMove(node)) {
    if (i < 1) return 0;
    const NODETYPE before = nodes[i - 1];
    if (!(IsMove(before) && IsClosedNode(before))) return i - 1;
    // The second node of a closed subpath: its predecessor is the closing
    // node, the next one that carries the closed bit.
    if (i >= n - 1 || IsClosedNode(node)) return i;
  } else if (!IsClosedNode(node)) {
    return i;
  }
  // The first or second node of a closed subpath: find the closing node.
  int j = i + 1;
  if (j >= n) return n - 1;
  while (j < n - 1 && !IsClosedNode(nodes[j])) ++j;
  return j;
}

namespace {

// One step with `step` (NN or PN), then on past control points to the first
// node that is not one, or to where the walk stops moving. A ring holds at
// most n nodes; the bound keeps a ring of arcs alone (never valid) from
// spinning.
template <int (*step)(NODETYPE const*, int, int)>
int StepPastControls(NODETYPE const* nodes, int i, int n) {
  if (bad(nodes, i, n)) return i;
  int j = step(nodes, i, n);
  for (int steps = 0; steps < n && IsArc(nodes[j]); ++steps) {
    const int k = step(nodes, j, n);
    if (k == j) break;
    j = k;
  }
  return j;
}

}  // namespace

int NNControl(NODETYPE const* nodes, int i, int n) { return StepPastControls<NN>(nodes, i, n); }

int PNControl(NODETYPE const* nodes, int i, int n) { return StepPastControls<PN>(nodes, i, n); }
