// What the current selection allows: the capability mask a user interface
// reads to enable its node commands.
//
// One pass over the nodes, O(n). Each selected node adds what can be done at
// it: a node with a segment behind it (or the first node of a closed subpath)
// can be broken; a node that is not a cusp can be made one; smooth needs a
// Bezier handle on at least one side, symmetric a Bezier on the way on (or a
// closed end). Open ends are counted to answer whether a join can be offered:
// both ends of one open subpath selected close it, unless the subpath is a
// single line (it would close onto itself); otherwise exactly two selected
// open ends join. A closed subpath's twins count once, through the last node
// (its first node, a move, is not counted).
#include "ostracrv/edit/node_selection.h"

namespace {

namespace F = CRV_EnablingFlags;

}  // namespace

int CRV_GetEnablingInfo(NODETYPE const* nodes, int n, int /*ignored*/, int extraNode, CRV_ENABLINGINFO* info) {
  CRV_ENABLINGINFO r{};
  if (!nodes || n < 1) {
    r.flags = F::kAlways;
    if (info) *info = r;
    return 0;
  }
  uint16_t f = 0;
  int subpaths = 0;
  int c = 0;  // enabled line, curve and open move nodes
  int m = 0;  // enabled open moves
  int e = 0;  // enabled open ends
  int holder = -1;  // the subpath of all enabled nodes so far
  bool several = false;
  bool pairMet = false;  // both ends of one open subpath are enabled
  int curMove = -1, prevNonArc = -1;

  for (int i = 0; i < n; ++i) {
    const NODETYPE b = nodes[i];
    if (IsMove(b)) {
      ++subpaths;
      curMove = i;
    }
    if (IsArc(b)) continue;
    if (IsEnabledNode(b)) {
      const int sp = subpaths - 1;
      if (holder < 0) holder = sp;
      else if (holder != sp) several = true;

      const int cont = int(GetContinuity(b));
      const bool hasNext = i + 1 < n;
      const NODETYPE next = hasNext ? nodes[i + 1] : NODETYPE(0);
      const bool segmentBehind = hasNext && !IsMove(next);
      switch (GetSegmentType(b)) {
        case SegmentType::line:
          f |= F::kLine;
          ++c;
          if (segmentBehind) {
            f |= F::kBreak;
            if (cont != 0) f |= F::kToCusp;
            if (IsArc(next) && cont != 1) f |= F::kToSmooth;
          }
          // A closing line meets the subpath's first segment, a Bezier here.
          if (IsClosedNode(b) && cont != 1 && curMove >= 0 && curMove + 1 < n && IsArc(nodes[curMove + 1]))
            f |= F::kToSmooth;
          break;
        case SegmentType::curve:
          f |= F::kCurve;
          ++c;
          if (segmentBehind) {
            f |= F::kBreak;
            if (cont != 0) f |= F::kToCusp;
          }
          if ((hasNext && IsArc(next)) || IsClosedNode(b)) {
            if (cont != 1) f |= F::kToSmooth;
            if (cont != 2) f |= F::kToSymmetric;
          }
          if (hasNext && IsLine(next) && cont != 1) f |= F::kToSmooth;
          break;
        case SegmentType::move:
          if (IsClosedNode(b)) {
            f |= F::kBreak;
            if (cont != 0) f |= F::kToCusp;
          } else {
            ++c;
            ++m;
            ++e;
          }
          break;
        case SegmentType::arc:
          break;
      }
      // The open end of a subpath that ends in a segment.
      if (!IsMove(b) && (!hasNext || IsMove(next)) && !IsClosedNode(b)) {
        ++e;
        if (curMove >= 0 && IsEnabledNode(nodes[curMove])) {
          pairMet = true;
          if (prevNonArc != curMove) {
            r.endsCanJoin = 1;
            f |= F::kJoin;
          } else if (IsCurve(b)) {
            // One Bezier can close with a line back; one line cannot.
            r.endsCanJoin = 1;
          }
        }
      }
    }
    prevNonArc = i;
  }

  if (e == 2 && !pairMet) {
    f |= F::kJoin;
    r.endsCanJoin = 1;
  }
  if (c >= 1) f |= F::kOne | F::kOneAlso;
  if (c >= 2) f |= F::kTwo | F::kTwoAlso;
  if (c > m) f |= F::kNotOnlyMoves;
  if (extraNode != -1 && extraNode >= 0 && extraNode < n) {
    const NODETYPE x = nodes[extraNode];
    f |= F::kBreak | F::kNotOnlyMoves | F::kOne;
    f |= IsCurve(x) ? F::kCurve : F::kLine;
    switch (int(GetContinuity(x))) {
      case 0: f |= F::kToSmooth | F::kToSymmetric; break;
      case 1: f |= F::kToCusp | F::kToSymmetric; break;
      case 2: f |= F::kToCusp | F::kToSmooth; break;
      default: f |= F::kToCusp | F::kToSmooth | F::kToSymmetric; break;
    }
  }
  if (subpaths >= 2) f |= F::kSubpaths;
  r.singleSubpath = subpaths > 1 && holder >= 0 && !several ? 1u : 0u;
  f |= F::kAlways;
  r.flags = f;
  if (info) *info = r;
  return c;
}
