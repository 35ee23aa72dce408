// Tidying a path after structural edits.
//
// The edits that break a path insert a plain move behind the node where the
// path parts. In an open subpath that already gives two subpaths. In a closed
// subpath f..l (f and l the same place) a move m inserted at the break leaves
//
//   f(closed) .. k | m .. l(closed)
//
// and the ring is mended into one open path that runs from the break round
// through the old closing point back to the break:
//
//   m .. l, f+1 .. k
//
// f is dropped because l repeats its point; l becomes an ordinary user node.
// Several moves in one ring (several breaks) are passed over by the search for
// l, so the first piece runs from the first break to the second and the last
// one from the last break round to the first.
//
// One pass over the nodes, O(n); each mended ring costs one rotation of its
// nodes and one shift of the tail, O(n).
#include "ostracrv/repair/clean_path.h"

#include <algorithm>

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr NODETYPE kClearContinuity = NODETYPE(~NodeMask::kContinuity);

bool isSegmentEnd(NODETYPE b) noexcept { return IsLine(b) || IsCurve(b); }

bool isLastOfSubpath(NODETYPE const* nodes, int n, int i) noexcept { return i + 1 >= n || IsMove(nodes[i + 1]); }

// Mends the ring that starts at the closed move f and was broken by the move
// at i (see the file comment). Returns the new count; rotated tells whether
// the move that was at i is now at f.
template <class T>
int mendBrokenRing(T* points, NODETYPE* nodes, int n, int f, int i, bool& rotated) {
  rotated = false;
  int l = -1;
  for (int j = i; j < n; ++j) {
    if (!IsClosedNode(nodes[j])) continue;
    if (isSegmentEnd(nodes[j])) l = j;
    break;  // a closed move starts another ring: no closing node for f
  }
  if (l < 0) {
    nodes[f] = NODETYPE(nodes[f] & ~NodeMask::kClosed);
    return n;
  }
  // The glyph mark belongs to the first node of the subpath, wherever it now
  // starts.
  const NODETYPE letter = NODETYPE(nodes[f] & NodeMask::kLetter);
  std::rotate(points + f, points + i, points + l + 1);
  std::rotate(nodes + f, nodes + i, nodes + l + 1);
  const int oldLast = f + (l - i);
  const int oldFirst = oldLast + 1;
  nodes[oldLast] = NODETYPE((nodes[oldLast] & ~NodeMask::kClosed) | NodeMask::kUser);
  PathDelNext(nodes, points, oldFirst, 1, n);
  nodes[f] = NODETYPE(nodes[f] | letter);
  rotated = true;
  return n - 1;
}

}  // namespace

template <class T>
int CleansPath(T* points, NODETYPE* nodes, int count) {
  if (!points || !nodes || count < 1) return 0;
  int n = count;
  const bool text = IsLetterNode(nodes[0]);
  nodes[0] = NODETYPE(nodes[0] & ~NodeMask::kType);

  int f = 0;                   // first node of the current subpath
  bool closedEndMet = false;   // a closing node has been seen in it
  for (int i = 0; i < n; ++i) {
    const NODETYPE b = nodes[i];
    switch (GetSegmentType(b)) {
      case SegmentType::move:
        if (!text) {
          while (i + 1 < n && IsMove(nodes[i + 1])) {
            PathDelNext(nodes, points, i, 1, n);
            --n;
          }
        }
        // A ring with a segment and no closing node before this move.
        if (i > 0 && i - f >= 2 && IsClosedNode(nodes[f]) && !closedEndMet) {
          bool rotated = false;
          n = mendBrokenRing(points, nodes, n, f, i, rotated);
          if (rotated) i = f;
        }
        f = i;
        closedEndMet = false;
        break;
      case SegmentType::line:
        if (IsClosedNode(b)) closedEndMet = true;
        if (isLastOfSubpath(nodes, n, i) ? !IsClosedNode(b) : IsLine(nodes[i + 1]))
          nodes[i] = NODETYPE(b & kClearContinuity);
        break;
      case SegmentType::curve:
        if (IsClosedNode(b)) closedEndMet = true;
        if (isLastOfSubpath(nodes, n, i)) {
          if (!IsClosedNode(b)) nodes[i] = NODETYPE(b & kClearContinuity);
        } else if (IsLine(nodes[i + 1]) && GetContinuity(b) == ContinuityType::symm) {
          nodes[i] = WithContinuity(b, ContinuityType::smooth);
        }
        break;
      case SegmentType::arc:
        nodes[i] = NODETYPE(b & kClearContinuity);
        if (i > 0 && IsArc(nodes[i - 1]) && i + 1 < n) nodes[i + 1] = WithSegmentType(nodes[i + 1], SegmentType::curve);
        break;
    }
  }
  // The last ring of the path, closed at its start but never at its end.
  if (n - f >= 2 && IsClosedNode(nodes[f]) && !closedEndMet) nodes[f] = NODETYPE(nodes[f] & ~NodeMask::kClosed);

  if (!text)
    while (n > 0 && IsMove(nodes[n - 1])) --n;

  int users = 0;
  for (int k = 0; k < n; ++k) users += IsUserNode(nodes[k]);
  const bool closed = n > 0 && IsClosedNode(nodes[0]);
  if (closed ? users < 1 : users <= 1) return 0;
  return n;
}

template int CleansPath<POINT>(POINT*, NODETYPE*, int);
template int CleansPath<V>(V*, NODETYPE*, int);

}  // namespace OstraCrv
