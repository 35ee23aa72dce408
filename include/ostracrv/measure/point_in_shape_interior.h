// Finding some point strictly inside a shape.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// A point inside the shape of the closed subpaths of the path (even-odd),
// found on the horizontal through the middle of the first closed subpath
// (open subpaths before it are passed over: they are no part of a shape).
//
// The row is y = (top + bottom) / 2 of that subpath's tight box in whole
// units (rounded outward), the sum halved and truncated towards zero, in both
// forms. A probe along the whole row meets all closed subpaths; walking the
// places where the outline meets the row in order with a crossing parity
// (a place where the outline only touches the row and turns back does not
// change it), the answer is the middle of the first stretch between two
// such places that the parity puts inside, or of the last stretch if there
// is none. Integer results are rounded.
//
// Because the row is a whole number, a double shape lying entirely between
// two rows is missed (the probe passes it by or runs along its edge), and the
// integer probe starts at x = -100, so an integer shape lying wholly left of
// it is missed too. Open subpaths are no part of a shape.
//
// Returns true and writes out when the outline met the row in at least two
// places; false, out untouched, for null arrays, n < 1, a path without
// closed subpaths, and a row that met the outline in fewer places. A subpath
// without area (there and back along one line) has no inside: the point then
// lies on its outline. O(n + r log r) for r
// meetings on the row.
template <class T>
bool GetPointInShape(T const* points, NODETYPE const* nodes, int n, T& out);

}  // namespace OstraCrv
