// Reversing the direction of a raw path.
#pragma once

#include "ostracrv/core/nodetype.h"

namespace OstraCrv {

// Reverses both arrays of a path of n entries in place, so that every
// subpath runs the other way and the subpaths also come in reverse order.
// The segment types move to their new end nodes (a Bezier's two arcs swap
// places and its curve byte goes to its new end), every other bit stays on
// its point; a closed subpath stays valid: its new first node is a move with
// the user bit, its new last node loses the user bit. Nothing happens for
// null arrays or n < 1. O(n). T is POINT or MavikMath::V.
template <class T>
void Reverse(T* points, NODETYPE* nodes, int n);

// The same on the stretch from index a to index b, both inclusive, in either
// order; meant for one whole subpath. The caller keeps both indices inside
// the arrays; nothing happens for null arrays or a negative index.
template <class T>
void Reverse(T* points, NODETYPE* nodes, int a, int b);

}  // namespace OstraCrv
