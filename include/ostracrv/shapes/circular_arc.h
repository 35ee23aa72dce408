// Circular arcs written into caller arrays, by four descriptions: centre,
// radius and angles; centre, start and end; start, end and start tangent;
// three points on the arc.
//
// T is Framework::common_types::POINT (points rounded half away from zero
// as they are stored) or MavikMath::V. The caller supplies room for 13
// nodes. An arc is split into at most four equal Beziers, with the exact
// handle length of the standard approximation for its sweep; node bytes are
// 0x04 first, 0xC0 0xC0 0x94 per piece and 0x84 last, or 0x1C first and 0x98
// last for a full circle. Where no arc can be made (a straight or near
// straight description) the forms with points on the arc write the line from
// start to end: 2 nodes, 0x04 and 0x44. Every form returns the node count,
// and 0, writing nothing, for null arrays or non-finite arguments, or when a
// double result would overflow to infinity.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// Beyond this distance from the start (in coordinate units) the far side of
// an arc's circle means a radius so large that the arc is drawn as its chord.
inline constexpr double kArcApexLimit = 152400000.0;

// The arc round center of the given radius from startAngle to endAngle, in
// the direction of increasing angle (counter-clockwise, y up). Equal angles
// (within 2.2e-16 after reduction into [0, 2 pi)) give a full circle. The
// sweep is cut into n = floor(sweep / (pi/2)) + 1 equal pieces, one fewer
// when the sweep is within 1e-5 of a whole number of quadrants, so that a
// quarter is one Bezier and not one plus a sliver. A sweep below 1e-5 gives
// no piece: the one start node. Returns 3 n + 1.
template <class T>
unsigned long BuildCircularArcT(T* points, NODETYPE* nodes, const MavikMath::V& center, double radius,
                                double startAngle, double endAngle);

// The arc that leaves start in the direction startTangent and ends at end
// (the tangent need not be unit). It turns left when end lies left of the
// tangent, else right; a right turn is built from end to start and reversed,
// so the result always runs from start to end. A tangent parallel to the
// chord, a circle whose far side lies kArcApexLimit or more from start, or a
// sweep too small for one piece gives the line fallback.
template <class T>
unsigned long BuildCircularArcT2(T* points, NODETYPE* nodes, const MavikMath::V& start, const MavikMath::V& end,
                                 const MavikMath::D& startTangent);

// The arc from first to second that passes through `through`. Collinear
// points (an exactly singular pair of bisectors), a circle beyond the apex
// limit or a sweep too small for one piece give the line fallback from first
// to second.
template <class T>
unsigned long Build3PointCircularArcT(T* points, NODETYPE* nodes, const MavikMath::V& first,
                                      const MavikMath::V& second, const MavikMath::V& through);

// Forwarding forms.
unsigned long BuildCircularArc(Framework::common_types::POINT* points, NODETYPE* nodes, const MavikMath::V& center,
                               double radius, double startAngle, double endAngle);
unsigned long BuildCircularArc(MavikMath::V* points, NODETYPE* nodes, const MavikMath::V& center, double radius,
                               double startAngle, double endAngle);
// Radius |start - center|; the angles of start and end seen from center, so
// that end supplies only a direction.
unsigned long BuildCircularArc(Framework::common_types::POINT* points, NODETYPE* nodes, const MavikMath::V& center,
                               const MavikMath::V& start, const MavikMath::V& end);
unsigned long BuildCircularArc(MavikMath::V* points, NODETYPE* nodes, const MavikMath::V& center,
                               const MavikMath::V& start, const MavikMath::V& end);
unsigned long BuildCircularArc(Framework::common_types::POINT* points, NODETYPE* nodes, const MavikMath::V& start,
                               const MavikMath::V& end, const MavikMath::D& startTangent);
unsigned long BuildCircularArc(MavikMath::V* points, NODETYPE* nodes, const MavikMath::V& start,
                               const MavikMath::V& end, const MavikMath::D& startTangent);
unsigned long Build3PointCircularArc(Framework::common_types::POINT* points, NODETYPE* nodes,
                                     const MavikMath::V& first, const MavikMath::V& second,
                                     const MavikMath::V& through);
unsigned long Build3PointCircularArc(MavikMath::V* points, NODETYPE* nodes, const MavikMath::V& first,
                                     const MavikMath::V& second, const MavikMath::V& through);

}  // namespace OstraCrv
