// The tally of the edges that a straight probe meets, on either side of a
// point of the probe.
//
// The probe is one segment of an intersection run (segments.h) whose records
// are the places where the closed subpaths of a shape meet it. CountEdges
// sorts those meetings to the two sides of p and adds up how many there are
// and in which direction the edges cross; point_in_shape.h turns the tally
// into an answer for either fill rule.
#pragma once

#include "ostracrv/intersect/segment_intersections.h"
#include "ostracrv/math/coordinate_system.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// The crossings of the probe segment `probe`, as seen from p on the probe.
//
// Along the probe positions compare by x for CoordinateSystem::Normal and by
// y for CoordinateSystem::FlipX_Rotate270; the other component of the edge's
// tangent tells the crossing direction. Results, all zeroed on entry (null
// arrays are allowed and then not written):
//   edgeCount[0], [1]  crossings before p (smaller position) and behind it
//   winding[0], [1]    the same crossings signed: +1 where the edge's tangent
//                      component across the probe is positive, -1 where
//                      negative, 0 where it is zero
//   onEdge             a meeting lies within squared distance 2.0 of p (at
//                      most), or p lies on a stretch the probe shares with an
//                      edge; such a meeting is not counted
//   onOverlap          p lies on a stretch the probe shares with an edge
// A meeting at a node shared by two edges is found on both of them; only one
// is counted where the outline passes through the probe there, and both or
// none where it turns back. Meetings that open or close a shared stretch are
// not counted. In the integer form meeting points are rounded to integers
// first. Records without a twin are skipped. O(r) for r records.
template <class T>
void CountEdges(CoordinateSystem system, const SegmentIntersections& probe, T p, int* edgeCount, int* winding,
                bool& onEdge, bool& onOverlap);

}  // namespace OstraCrv
