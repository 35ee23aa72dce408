// Appending lines and Beziers to a growing curve, joining each piece to the
// last one when it starts close enough to where the curve ends.
//
// Used wherever a curve is assembled from separately computed pieces
// (offset chains, corner arcs, node reduction). T is MavikMath::V or
// Framework::common_types::POINT; the integer form computes in doubles, reads
// stored points back as doubles and rounds each point it stores half away
// from zero. `threshold` is a squared distance. Pieces with a non-finite
// point are not appended.
#pragma once

#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// Appends the line a-b. It joins the curve when isFirst is false, the curve
// has at least two points and a lies closer than sqrt(threshold) to the last
// point: the last point moves to the midpoint of the two (a curve node's
// second control point moves with it), and b is appended as a line node,
// 0x44. With checkCollinear, a join that continues straight (the point before
// the last, a and b within 2 units of one line) makes the last node smooth,
// and if that node is a line it is simply extended to b instead. Otherwise a
// new subpath a (0x04), b (0x44) is appended.
template <class T>
void AddLineT(std::vector<T>& points, std::vector<NODETYPE>& nodes, const MavikMath::V& a, const MavikMath::V& b,
              double threshold, bool isFirst, bool checkCollinear);

// Appends the Bezier. It joins as AddLineT does (the join point is the
// midpoint, the first control point shifts with it, a straight continuation
// makes the last node smooth). Otherwise p0 is appended as a line node (0x44)
// when continuing, bridging the gap inside one chain, or as a move (0x04)
// starting a new subpath; then p1, p2 (0xC0) and p3 (0x84). A curve that is
// still empty always starts with a move, so that the result stays a valid
// path.
template <class T>
void AddBezierT(std::vector<T>& points, std::vector<NODETYPE>& nodes,
                const MavikMath::CubicBezier::bezier2dT<MavikMath::V>& bezier, double threshold, bool isFirst,
                bool continuing);

// Forwarding forms.
void AddLine(std::vector<MavikMath::V>& points, std::vector<NODETYPE>& nodes, const MavikMath::V& a,
             const MavikMath::V& b, double threshold, bool isFirst, bool checkCollinear);
void AddLine(std::vector<Framework::common_types::POINT>& points, std::vector<NODETYPE>& nodes,
             const MavikMath::V& a, const MavikMath::V& b, double threshold, bool isFirst, bool checkCollinear);
void AddBezier(std::vector<MavikMath::V>& points, std::vector<NODETYPE>& nodes,
               const MavikMath::CubicBezier::bezier2dT<MavikMath::V>& bezier, double threshold, bool isFirst,
               bool continuing);
void AddBezier(std::vector<Framework::common_types::POINT>& points, std::vector<NODETYPE>& nodes,
               const MavikMath::CubicBezier::bezier2dT<MavikMath::V>& bezier, double threshold, bool isFirst,
               bool continuing);

}  // namespace OstraCrv
