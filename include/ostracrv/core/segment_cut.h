// Cutting one segment of a raw path in place along its parameter.
//
// points and nodes point at the start node of a segment; nodes[1] tells its
// kind. A line is two points, anything else is taken as a Bezier of four
// points (the caller passes a real segment). The parameters are those of the
// segment, 0 at its start and 1 at its end; values outside extrapolate.
#pragma once

#include "ostracrv/core/nodetype.h"

namespace OstraCrv {

// Keeps the part behind t: the start moves to the point at t.
template <class T>
void RightOf(double t, T* points, NODETYPE* nodes);
// Keeps the part before t: the end moves to the point at t.
template <class T>
void LeftOf(double t, T* points, NODETYPE* nodes);
// Keeps the part between t0 and t1 (sorted first). On a line the end is cut
// first and the start is then found on the shortened line; with t1 = 0 both
// ends land on the start point.
template <class T>
void Subsection(double t0, double t1, T* points, NODETYPE* nodes);

}  // namespace OstraCrv
