// Whether a point lies inside a shape of closed subpaths.
//
// The curves are not flattened: a straight probe through the point is handed
// to the intersection engine with the shape's closed subpaths as targets, and
// the places where the outline passes through the probe are counted on
// either side of the point, with their directions. Open subpaths are no part
// of a shape and are ignored. The engine runs with the point-in-shape
// settings (PointInShapeIntersectionSettings: end and touch tolerance 0.5):
// the outline within that distance of the probe counts as on it, which never
// changes the answer for a point farther than that from the outline.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/side.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// Whether p lies inside the shape of the closed subpaths of the path.
//
// nonZero chooses the fill rule: true for non-zero winding, false for
// even-odd. A point on the outline (within squared distance 2.0 of a meeting
// of the probe with it, or on an edge that the probe runs along) answers
// resultOnEdge and sets *onEdge.
//
// side, if not null, tells on which side of the edge under p the interior
// lies, in the frame of the probe: SideLeft (bit 1) where the interior is at
// smaller x, SideRight (bit 2) where it is at larger x, both or neither as the
// counts say. When p lies on a horizontal edge the horizontal probe runs
// along it and cannot tell; a vertical probe is used instead, and then the
// bits mean smaller y and larger y. side is only written for a point on the
// edge; it starts at SideNone and onEdge at false.
//
// False for null arrays, n < 1, a non-finite p, a point outside the box of
// all points (control points included) grown by 1, and a path without closed
// subpaths. The box test comes first and costs one pass over the points; a
// probe run costs O(n + r log r) for r meetings and allocates the engine's
// records.
template <class T>
bool IsPointInShape(T const* points, NODETYPE const* nodes, int n, T const& p, bool resultOnEdge, bool nonZero,
                    bool* onEdge, MavikMath::Side* side);

}  // namespace OstraCrv
