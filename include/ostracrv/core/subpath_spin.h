// Turning a closed subpath so that it starts at another node.
#pragma once

#include "ostracrv/core/nodetype.h"

namespace OstraCrv {

// Rotates the closed subpath whose first node is `first` so that `node`
// becomes its first node; the shape, the point count and the closure stay,
// and the closing node repeats the new first point. The new first node is a
// closed move with the user bit, the new closing node has the closed bit and
// not the user bit, and every segment keeps its type at its end node.
// Callers pass a line or curve node. Returns 1; 0 without a change when
// `first` has no closed bit, its twin does not lie behind it, `node` lies
// outside first..twin, or the arrays are null or n, first out of range.
// O(subpath length).
template <class T>
int SpinSubpath(T* points, NODETYPE* nodes, int n, int first, int node);

}  // namespace OstraCrv
