// The small arc builders that bridge a corner: one or two Beziers round a
// centre, from a to b, both on a circle of the given radius. Offsetting uses
// them for round joins, corner processing for fillets.
#pragma once

#include <vector>

#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// Handle length over radius for a quarter turn in the linear handle rule of
// the corner arcs: handle = r x angle x kCornerArcHandle / (pi/2).
inline constexpr double kCornerArcHandle = 0.55078;

// Writes handles[0] and handles[1], the inner control points of one Bezier
// from a to b round center. The handle length is r x angle x 0.55078 /
// (pi/2), with r = |a - center| used at both ends and the angle between
// a - center and b - center; the handles are perpendicular to the radii and
// point along the chord a-b. Returns 1; 0, writing nothing, when a or b
// lies on the centre or an argument is not finite.
int GetArcSegmentHandles(MavikMath::V* handles, const MavikMath::V& center, const MavikMath::V& a,
                         const MavikMath::V& b);

// The corner arc of offsetting. out receives up to five points. An arc wider
// than a quarter (cosine of its angle below -0.001) is two Beziers meeting at
// center + radius x unit(direction): out = handle, handle, middle, handle,
// handle and count = 5. A narrower arc is one Bezier: out = two handles and
// count = 2. An arc of no width (cosine at least 1) returns 0 and leaves
// count alone. Returns 1 on success, 0 on failure.
int BuildCircularArc(const MavikMath::V& center, const MavikMath::D& direction, const MavikMath::V& a,
                     const MavikMath::V& b, double radius, MavikMath::V* out, int& count);

// The corner arc of fillets, as above with these differences: count is 0 on
// entry and stays 0 on failure of the one-Bezier case; the middle of a
// two-Bezier arc lies at distance radius from center on the ray through the
// midpoint of the chord a-b, and the call fails if that midpoint lies closer
// than 5.0 to center; a cosine of 0.9999 or more fails.
int BuildCircularArc(const MavikMath::V& center, const MavikMath::V& a, const MavikMath::V& b, double radius,
                     MavikMath::V* out, unsigned long& count);

// Appends the offsetting corner arc from a to b to a growing curve with
// AddBezier, joining at the squared distance tolerance (one or two Beziers).
// Where no arc can be made, the curve's last point (if any) moves to the
// midpoint of a and b: a corner too narrow for an arc collapses to a point.
void AddArc(const MavikMath::V& center, const MavikMath::D& direction, const MavikMath::V& a, const MavikMath::V& b,
            double radius, std::vector<MavikMath::V>& points, std::vector<NODETYPE>& nodes, double tolerance);

}  // namespace OstraCrv
