// Closing every open subpath of a raw integer path into new arrays.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"

namespace OstraCrv {

// Copies the path into outPoints/outNodes with every subpath closed. An open
// subpath always gets a closing line node (0x48) on a copy of its first
// point, even when its ends coincide; a closed subpath is copied as it is.
// Every copied subpath's first node gets the closed bit. Single-node
// subpaths (dangling moves, including a final one) are dropped. The output
// arrays must hold n plus the number of open subpaths. Returns the output
// count; 0 for n < 1 or null arrays. O(n).
int CloseOpenSubpaths(Framework::common_types::POINT const* points, NODETYPE const* nodes, int n,
                      Framework::common_types::POINT* outPoints, NODETYPE* outNodes);

}  // namespace OstraCrv
