// Selection counts and the marking of control points that follow a selection.
//
// The counts run on every mouse move of an interactive edit, so each is one
// pass over the bytes that adds a 0/1 condition per byte: no branch per node,
// and the compiler vectorises the loop. O(n).
//
// Arc refresh. When a node moves, the control points next to it move with it:
// the two handles of a Bezier that ends at the node and of one that starts
// there. Beyond a smooth join with a line, the handle on the far side turns
// with the line, so those arcs are marked too. With a single selected node its
// marked arcs are offered for dragging (user bit); with several they only
// follow. O(n) plus one wrap-around walk per selected closed end.
#include "ostracrv/edit/node_selection.h"

namespace {

constexpr NODETYPE kEnabledUser = NodeMask::kEnabled | NodeMask::kUser;

bool bad(NODETYPE const* nodes, int n) noexcept { return !nodes || n < 1; }

// 0/1 predicates of one byte, written without branches.
inline int notArc(NODETYPE b) noexcept { return (b & NodeMask::kType) != NodeMask::kArc; }
inline int segmentEnd(NODETYPE b) noexcept { return ((b >> 7) ^ (b >> 6)) & 1; }  // line or curve
inline int enabled(NODETYPE b) noexcept { return b & NodeMask::kEnabled; }
inline int enabledUser(NODETYPE b) noexcept { return (b & kEnabledUser) == kEnabledUser; }

// Clears the enabled and user bits of every arc.
void clearArcMarks(NODETYPE* nodes, int n) noexcept {
  for (int k = 0; k < n; ++k)
    if (IsArc(nodes[k])) nodes[k] = NODETYPE(nodes[k] & ~kEnabledUser);
}

// Gives every enabled arc the user bit.
void offerMarkedArcs(NODETYPE* nodes, int n) noexcept {
  for (int k = 0; k < n; ++k)
    if (IsArc(nodes[k]) && IsEnabledNode(nodes[k])) nodes[k] = NODETYPE(nodes[k] | NodeMask::kUser);
}

int refreshArcs(NODETYPE* nodes, int n) noexcept {
  clearArcMarks(nodes, n);
  int selected = 0;
  for (int k = 0; k < n; ++k) {
    if (notArc(nodes[k]) && enabledUser(nodes[k])) {
      crvEnableOneControlInternal(nodes, n, k);
      ++selected;
    }
  }
  if (selected == 1) offerMarkedArcs(nodes, n);
  return selected;
}

}  // namespace

int CRV_HowManyEnabled(NODETYPE const* nodes, int n) {
  if (bad(nodes, n)) return 0;
  int c = 0;
  for (int k = 0; k < n; ++k) c += notArc(nodes[k]) & enabledUser(nodes[k]);
  return c;
}

int CRV_HowManyEnabledNotClosed(NODETYPE const* nodes, int n) {
  if (bad(nodes, n)) return 0;
  int c = 0;
  for (int k = 0; k < n; ++k) c += notArc(nodes[k]) & enabled(nodes[k]) & int(!IsClosedNode(nodes[k]));
  return c;
}

int CRV_HowManyEnabledNotFirstOrLastInSubpath(NODETYPE const* nodes, int n) {
  if (bad(nodes, n) || n < 2) return 0;
  int c = 0;
  for (int k = 0; k + 1 < n; ++k) c += segmentEnd(nodes[k]) & enabled(nodes[k]) & int(!IsMove(nodes[k + 1]));
  return c;
}

int CRV_HowManyEnabledNotFirstOrLastInOpenSubpath(NODETYPE const* nodes, int n) {
  if (bad(nodes, n) || n < 2) return 0;
  int c = 0;
  for (int k = 0; k + 1 < n; ++k) {
    const NODETYPE b = nodes[k];
    const int interior = segmentEnd(b) & int(!IsMove(nodes[k + 1]));
    c += notArc(b) & enabledUser(b) & (int(IsClosedNode(b)) | interior);
  }
  return c;
}

int CRV_HowManyEnabledLines(NODETYPE const* nodes, int n) {
  if (bad(nodes, n)) return 0;
  int c = 0;
  for (int k = 0; k < n; ++k) c += int(IsLine(nodes[k])) & enabled(nodes[k]);
  return c;
}

int CRV_HowManyEnabledCurves(NODETYPE const* nodes, int n) {
  if (bad(nodes, n)) return 0;
  int c = 0;
  for (int k = 0; k < n; ++k) c += int(IsCurve(nodes[k])) & enabled(nodes[k]);
  return c;
}

int CRV_HowManyEnabledSubpaths(NODETYPE const* nodes, int n) {
  if (bad(nodes, n)) return 0;
  // hit: whether the current subpath has a selected node yet. A move closes
  // the previous subpath's account and opens a new one.
  int c = 0, hit = 0;
  for (int k = 0; k < n; ++k) {
    const NODETYPE b = nodes[k];
    const int move = IsMove(b);
    c += move & hit;
    hit &= move ^ 1;
    hit |= notArc(b) & enabledUser(b);
  }
  return c + hit;
}

void CRV_DisableAllNodes(NODETYPE* nodes, int n) {
  if (bad(nodes, n)) return;
  for (int k = 0; k < n; ++k) {
    const NODETYPE b = nodes[k];
    // An arc loses its user bit as well: no control point stays offered.
    const NODETYPE clear = NODETYPE(NodeMask::kEnabled | (IsArc(b) ? NodeMask::kUser : 0));
    nodes[k] = NODETYPE(b & ~clear);
  }
}

int CRV_EnableAllControls(NODETYPE* nodes, int n) {
  if (bad(nodes, n)) return 0;
  return refreshArcs(nodes, n);
}

int CRV_EnableAllNodes(NODETYPE* nodes, int n) {
  if (bad(nodes, n)) return 0;
  for (int k = 0; k < n; ++k) nodes[k] = NODETYPE(nodes[k] | NodeMask::kEnabled);
  return refreshArcs(nodes, n);
}

int CRV_EnableSubpath(NODETYPE* nodes, int n, int i, int on) {
  if (bad(nodes, n) || i < 0 || i >= n) return -1;
  const int f = CRV_FirstNodeOfThisSubpath(nodes, n, i);
  if (f < 0) return -1;
  const int l = CRV_LastNodeOfThisSubpath(nodes, n, i);
  const NODETYPE bit = NODETYPE(on & 1);
  for (int k = f; k <= l; ++k) nodes[k] = NODETYPE((nodes[k] & ~NodeMask::kEnabled) | bit);
  return refreshArcs(nodes, n);
}

void CRV_EnableOneControl(NODETYPE* nodes, int n, int i) {
  if (bad(nodes, n) || i < 0 || i >= n) return;
  clearArcMarks(nodes, n);
  crvEnableOneControlInternal(nodes, n, i);
  offerMarkedArcs(nodes, n);
}

int crvEnableOneControlInternal(NODETYPE* nodes, int n, int i) {
  if (bad(nodes, n) || i < 0 || i >= n) return -1;
  const NODETYPE e = NODETYPE(nodes[i] & NodeMask::kEnabled);
  int last = -1;
  auto mark = [&](int k) {
    if (k >= 0 && k < n && IsArc(nodes[k])) {
      nodes[k] = NODETYPE((nodes[k] & ~NodeMask::kEnabled) | e);
      last = k;
    }
  };
  // The two control points of the Bezier whose first arc is k; written only
  // if the second one is inside the array.
  auto markBezierFrom = [&](int k) {
    if (k >= 0 && k + 1 < n && IsArc(nodes[k])) {
      mark(k);
      mark(k + 1);
    }
  };
  auto isSmoothLine = [&](int k) { return IsLine(nodes[k]) && GetContinuity(nodes[k]) != ContinuityType::cusp; };
  // Beyond a smooth line node k: the handles of the Bezier that follows it.
  auto markBeyondSmoothLine = [&](int k) {
    const int after = NN(nodes, k, n);
    if (after != k) markBezierFrom(after);
  };
  auto isSmoothCurve = [&](int k) { return IsCurve(nodes[k]) && GetContinuity(nodes[k]) != ContinuityType::cusp; };

  const int next = NN(nodes, i, n);
  const bool hasNext = next != i;
  const int prev = PN(nodes, i, n);
  switch (GetSegmentType(nodes[i])) {
    case SegmentType::curve:
      if (i >= 2) {
        mark(i - 2);
        mark(i - 1);
      }
      if (hasNext && IsArc(nodes[next])) markBezierFrom(next);
      if (hasNext && isSmoothLine(next)) markBeyondSmoothLine(next);
      break;
    case SegmentType::line:
      if (prev >= 2 && prev != i && isSmoothCurve(prev)) {
        mark(prev - 2);
        mark(prev - 1);
      }
      if (hasNext && IsArc(nodes[next])) markBezierFrom(next);
      if (hasNext && isSmoothLine(next)) markBeyondSmoothLine(next);
      break;
    case SegmentType::move: {
      if (hasNext && IsArc(nodes[next])) markBezierFrom(next);
      if (i + 2 < n && hasNext && isSmoothLine(next)) markBeyondSmoothLine(next);
      if (!IsClosedNode(nodes[i])) break;
      // The closing node is the same place: the segment that ends there.
      const int w = OtherClosedEnd(nodes, i, n);
      if (w < 2) break;
      if (IsCurve(nodes[w])) {
        mark(w - 2);
        mark(w - 1);
      } else if (IsLine(nodes[w]) && w >= 3 && isSmoothCurve(w - 1)) {
        mark(w - 3);
        mark(w - 2);
      }
      break;
    }
    case SegmentType::arc:
      break;
  }
  return last;
}

int CRV_GetArcBefore(NODETYPE const* nodes, int n, int i) {
  if (bad(nodes, n) || i < 0 || i >= n) return -1;
  int j = i;
  if (IsMove(nodes[i])) {
    if (!IsClosedNode(nodes[i])) return -1;
    j = OtherClosedEnd(nodes, i, n);
    if (j < 0 || j == i) return -1;
  }
  const int p = PN(nodes, j, n);
  return p != j && IsArc(nodes[p]) ? p : -1;
}

int CRV_GetArcAfter(NODETYPE const* nodes, int n, int i) {
  if (bad(nodes, n) || i < 0 || i >= n) return -1;
  const int k = NN(nodes, i, n);
  return k != i && IsArc(nodes[k]) ? k : -1;
}
