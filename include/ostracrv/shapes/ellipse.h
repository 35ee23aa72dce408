// Ellipses, elliptical arcs, pies and circles written into caller arrays.
//
// T is Framework::common_types::POINT (points rounded half away from zero)
// or MavikMath::V (points stored as computed). The caller supplies room for
// 16 nodes for an open arc or a closed ellipse and 18 for a pie; a circle
// takes 13. Nothing allocates.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The arc of the ellipse round center with radii radiusX and radiusY from
// startAngle to endAngle, counter-clockwise (y up) in the ellipse's own
// angle, split at the quadrant boundaries into at most five Beziers. Equal
// angles (modulo a full turn) give the whole ellipse, closed, starting at
// startAngle; otherwise the arc is open. With pie the arc is closed through
// the centre by two lines. With arcNodesPlain the arc's curve nodes do not
// carry the user bit (and a pie's centre takes it instead).
//
// Node bytes: curve ends 0x94 (0x90 plain), symmetric 0xA4 (0xA0) between
// two whole quadrants; a full turn starts 0x1C and ends 0x98, or 0x2C and
// 0xA8 when it starts on a quadrant boundary; an open arc starts 0x04 and
// ends 0x84. Returns the node count: 3 k + 1 for k Beziers, plus 2 for a pie.
// Returns 0, writing nothing, for null arrays or non-finite arguments, and
// for a double result that overflows to infinity.
template <class T>
unsigned long BuildEllipseT(T* points, NODETYPE* nodes, const T& center, double radiusX, double radiusY,
                            double startAngle, double endAngle, bool pie, bool arcNodesPlain);

unsigned long BuildEllipse(Framework::common_types::POINT* points, NODETYPE* nodes,
                           const Framework::common_types::POINT& center, double radiusX, double radiusY,
                           double startAngle, double endAngle, bool pie, bool arcNodesPlain);
unsigned long BuildEllipse(MavikMath::V* points, NODETYPE* nodes, const MavikMath::V& center, double radiusX,
                           double radiusY, double startAngle, double endAngle, bool pie, bool arcNodesPlain);

// The closed circle of 13 nodes starting at angle 0: four quadrant Beziers,
// first byte 0x2C, last 0xA8, the inner quadrant nodes symmetric. A zero
// radius gives 13 coincident points. Returns 13, or 0 as BuildEllipseT fails.
unsigned long BuildCircle(Framework::common_types::POINT* points, NODETYPE* nodes,
                          const Framework::common_types::POINT& center, double radius);
unsigned long BuildCircle(MavikMath::V* points, NODETYPE* nodes, const MavikMath::V& center, double radius);

}  // namespace OstraCrv
