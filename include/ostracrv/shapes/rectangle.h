// Straight shapes written into caller arrays: a line and rectangles, plain
// or with treated corners.
//
// Every builder writes points and node bytes from index 0 and returns the
// number of nodes written; the caller supplies room for 2 nodes (line), 5
// (plain rectangle) or 17 (treated rectangle). Nothing allocates. A null
// point array (or a null node array where the form needs one) writes nothing
// and returns 0.
#pragma once

#include <cstdint>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// How a corner of a treated rectangle is cut. Passed as a 32-bit value:
// every value other than Round and Scallop means Chamfer.
enum class RectangleCorner : int32_t {
  Round = 0,    // a quarter curve that bulges towards the corner point
  Scallop = 1,  // a quarter curve that bites into the shape round the corner
  Chamfer = 2,  // a straight cut
};

// A line from a to b, both rounded half away from zero; bytes 0x04, 0x44.
// Returns 2.
unsigned long BuildLine(Framework::common_types::POINT* points, NODETYPE* nodes, const MavikMath::V& a,
                        const MavikMath::V& b);

// The closed rectangle (0,0), (w,0), (w,h), (0,h), (0,0) with w and h rounded:
// counter-clockwise with y up. Bytes 0x0C, 0x44, 0x44, 0x44, 0x48. Returns 5.
unsigned long BuildRectangle(Framework::common_types::POINT* points, NODETYPE* nodes, double width,
                             double height);

// The corners (left, top), (right, top), (right, bottom), (left, bottom),
// (left, top): clockwise with y up, so its area is positive. The points-only
// form leaves node bytes to the caller; the other writes the bytes of the
// width-and-height form and skips a null nodes. Return 5.
unsigned long BuildRectangle(Framework::common_types::POINT* points, const Framework::common_types::RECT& rect);
unsigned long BuildRectangle(Framework::common_types::POINT* points, NODETYPE* nodes,
                             const Framework::common_types::RECT& rect);

// The same corners for double bounds: (min x, max y), (max x, max y),
// (max x, min y), (min x, min y), (min x, max y), clockwise like the RECT
// form, so that both forms of one box have the same positive area. A null
// nodes is skipped. Return 5, or 0 (nothing written) for bounds that are
// not finite, such as the empty marker.
unsigned long BuildRectangle(MavikMath::V* points, NODETYPE* nodes, const MavikMath::BoundsT<double>& bounds);
unsigned long BuildRectangle(MavikMath::V* points, const MavikMath::BoundsT<double>& bounds);

// The treated rectangle of size width x height with its corners r1/c1 at the
// origin, r2/c2 at (W, 0), r3/c3 at (W, H) and r4/c4 at (0, H), written
// counter-clockwise from (a1, 0). The outline is laid out in a space scaled by
// scaleX and scaleY (W = round(width scaleX), H = round(height scaleY)) and
// mapped back by 1/scale, so that a later stretch by the scales gives round
// corners. limitRadii shrinks pairs of radii that do not fit their edge.
// With all radii at most 2.2e-16 in size the plain rectangle of the unscaled
// width and height is written. Corners whose truncated radius is 0 are left
// square. Returns 5 to 17 nodes.
unsigned long BuildRectangle(Framework::common_types::POINT* points, NODETYPE* nodes, double width,
                             double height, double r1, RectangleCorner c1, double r2, RectangleCorner c2,
                             double r3, RectangleCorner c3, double r4, RectangleCorner c4, double scaleX,
                             double scaleY, bool limitRadii);
// The same radius and corner four times, scales 1.
unsigned long BuildRectangle(Framework::common_types::POINT* points, NODETYPE* nodes, double width,
                             double height, double radius, RectangleCorner corner, bool limitRadii);

}  // namespace OstraCrv
