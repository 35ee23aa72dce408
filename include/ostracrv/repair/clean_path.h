// The general tidy-up of a raw path after a structural edit or from outside.
#pragma once

#include "ostracrv/core/nodetype.h"

namespace OstraCrv {

// Brings the node bytes of a path of count entries into a legal form, in
// place, and returns the new count; shrinking the storage is the caller's.
//
// - Node 0 becomes a move.
// - A run of consecutive moves keeps only its last (the one that starts a
//   segment), and moves at the end of the path are cut off; both are left
//   alone when node 0 has the letter bit (a text curve uses lone moves to mark
//   its glyphs).
// - A closed subpath that an inserted move has broken (its first node has the
//   closed bit, and a move comes before any closing node) becomes one open
//   subpath that starts at that move: the stretch before the move is turned
//   to run behind the closing node, the first node (the same place as the
//   closing node) is dropped, and the closing node becomes an ordinary node.
//   A closed first node whose subpath has no closing node at all is opened.
// - Continuity: the open end of a subpath and a line before a line become
//   cusps, a symmetric curve before a line becomes smooth, arcs carry none;
//   the node behind two arcs becomes a curve.
//
// Returns 0 for a path not worth keeping: an open path (node 0 without the
// closed bit) with at most one user node, a closed one with none; also for
// null arrays or count < 1. O(count) plus O(count) per broken closed subpath.
// T is POINT or MavikMath::V.
template <class T>
int CleansPath(T* points, NODETYPE* nodes, int count);

}  // namespace OstraCrv
