// Structural edits of a raw path in place: inserting and removing entries,
// adding a node on a segment, keeping handles in line with a node's
// continuity, breaking and joining.
//
// Every function works on the caller's arrays of n entries and returns the
// new node count. A function that can grow the path needs arrays with room
// for the growth (stated per function). Failures return -1 (a failed
// precondition or allocation) or -2 (a join without valid ends) and leave the
// arrays as they were, unless stated otherwise. Null arrays, a negative n or
// indices outside 0..n-1 are failed preconditions.
//
// T is Framework::common_types::POINT (integer results round half away from
// zero unless stated) or MavikMath::V; each template is instantiated for both.
#pragma once

#include "ostracrv/core/nodetype.h"

// ---- Entries ----

// Removes count entries at i and returns the new count. With i < 0,
// count <= 0 or i >= n nothing changes and n is returned. If i+count >= n
// nothing moves and i is returned: the tail of a path is cut by the returned
// count alone.
template <class T>
int CRV_Remove(T* points, NODETYPE* nodes, int n, int i, int count);
// The entries that adding a node to a segment of that type can need: 1 for a
// move (0) or a line (1), 3 for a curve (2), 0 for anything else.
int CRV_NeedGrowForAddNodeOfType(int type);
// Inserts p at index at (0..n; n appends), the entries from at on moving back
// by one: as an open move (byte 0x04), respectively an open line end (0x44).
// Room for n+1 entries. Returns n+1; -1 for at outside 0..n.
template <class T>
int CRV_AppendMove(T* points, NODETYPE* nodes, int n, int at, T p);
template <class T>
int CRV_AppendLine(T* points, NODETYPE* nodes, int n, int at, T p);
// Inserts the source entries from .. end-1 at index at (0..n), the entries
// from at on moving back. The source must not overlap the destination. Room
// for n + (end - from) entries. Returns n plus the number inserted (n if
// end <= from); -1 for at outside 0..n, null arrays or a negative from.
template <class T>
int CRV_Append(T* points, NODETYPE* nodes, int n, int at, T const* srcPoints, NODETYPE const* srcNodes, int end,
               int from);

// ---- Adding a node ----

// Adds a node at parameter t (0..1) on the segment that ends at node i and
// returns the number of entries added. A Bezier is split in two (3 entries;
// the shape stays: the halves are the exact de Casteljau pieces, rounded in
// the integer form); the new middle node at i is a smooth user node without
// the closed bit, the neighbours i-3 and i+3 stop being symmetric (their
// handles have changed length), and with smooth other than 0 the handles at
// i and i+3 are brought in line (SmoothNode). A line gets a node at
// p0 + t (p1 - p0) (1 entry) with the end node's byte, closed bit cleared and
// user bit set. Room for n+3 entries. Returns 0 (nothing changed) for any
// other node, a t outside 0..1 or NaN, or bad input.
template <class T>
int CRV_Add(T* points, NODETYPE* nodes, int n, int i, double t, int smooth);

namespace OstraCrv {

// Brings the handles of node i in line with its continuity; nothing unless
// the node is smooth or symmetric and is a user node or a closed end. The
// handles (the arcs just before and after the node; for the first node of a
// closed subpath the arc before its closing node) are turned onto one line
// through the node and keep their lengths, or for a symmetric node both take
// the mean of the two. A handle next to a line is turned onto the line's
// direction; this keeps its length only to within half a unit, as the turned
// offset is rounded by adding 0.5 (and truncating in the integer form). Other
// offsets truncate towards zero in the integer form. O(1), O(subpath) at a
// closed end.
template <class T>
void SmoothNode(T* points, NODETYPE* nodes, int n, int i);
// For each of the indices a and b that lies inside the array: a symmetric
// node that can be smooth becomes smooth, and so does its twin.
void SmoothEndNodes(NODETYPE* nodes, int a, int b, int n);

}  // namespace OstraCrv

// ---- Breaking ----

// Breaks the path at parameter t on the segment that ends at node i (the
// first node of a closed subpath stands for its closing node). At t = 0 the
// break is at the segment's start node, at t = 1 at node i; in between a node
// is added there first (CRV_Add with smoothing) and, like the copy behind it,
// is not selected. A break at the closing node of a closed subpath opens the
// subpath without adding a node; elsewhere a move on a copy of the point is
// inserted behind the node, which splits an open subpath in two and turns a
// closed one into one open subpath that starts and ends at the break. The
// result is tidied by CleansPath, whose count it returns. Room for n+4
// entries. -1 (nothing changed) for t outside 0..1 or NaN, i outside the
// array, no segment ending at i, or a break at an end of an open subpath.
// O(n).
template <class T>
int CRV_BreakAtLocation(T* points, NODETYPE* nodes, int n, int i, double t);

// ---- Joining ----

// Joins two open ends a and b (the first or last node of a subpath without
// the closed bit; a lone move is both). Both points move to their midpoint
// (the integer form truncates the halved double sum).
// - The two ends of one subpath close it: both get the closed bit, the later
//   loses the user bit; the result is tidied by CleansPath.
// - Ends of two subpaths: the subpaths are turned where needed so that a
//   ends its subpath and b starts its own; b's subpath then continues a's
//   (its move is dropped, its other nodes follow a). Result n-1. If both had
//   to be turned, the joined subpath is turned back, keeping the direction of
//   b's subpath.
// joined, if not null, receives the joined node: the first node of a closed
// subpath, or a's index after the move. -2 (nothing changed) unless a and b
// are two different open ends; -1, nothing changed, if the temporary copy
// cannot be allocated. O(n).
template <class T>
int CRV_JoinTwoNodesExt(T* points, NODETYPE* nodes, int n, int a, int b, int* joined);
// CRV_JoinTwoNodesExt without the joined index.
template <class T>
int CRV_JoinTwoNodes(T* points, NODETYPE* nodes, int n, int a, int b);
// Joins with a straight line instead of moving the ends (addLine true): a
// line to b's point is added behind a (if a is the last node of its subpath),
// or a moves onto b's point and a line back to a's old point follows it (if
// a is the first node); the new line node takes a's enabled and user bits.
// Then the ends, now coinciding, are joined. Ends that coincide already are
// joined directly. With addLine false this is CRV_JoinTwoNodesExt. Room for
// n+1 entries. -1 (nothing changed) unless a and b are two different open
// ends.
template <class T>
int crvJoinTwoNodes(T* points, NODETYPE* nodes, int n, int a, int b, bool addLine);
// Joins the selected open ends. With exactly two selected open ends they are
// joined (crvJoinTwoNodes) unless they are the two ends of a single line, or
// of a single Bezier without addLines: that would close onto one segment, and
// n is returned unchanged. With more, every open subpath whose two ends are
// both selected is closed, and pairs across subpaths are not joined. -2 for
// n < 1 or fewer than two selected open ends. Room for n plus the number of
// open subpaths. O(n) per subpath closed.
template <class T>
int crvJoinEnabled(T* points, NODETYPE* nodes, int n, bool addLines);
template <class T>
int CRV_JoinEnabled(T* points, NODETYPE* nodes, int n);
template <class T>
int CRV_JoinEnabledAddingLineSegments(T* points, NODETYPE* nodes, int n);

// Makes the two joins (a, c) and (d, b) that put the open subpath with ends c
// and d between the open ends a and b (of one subpath, which is then closed,
// or of two). Each subpath is turned as needed: a to the end of its subpath,
// b to the start of its, c to the start of the inserted one. The four indices
// are rewritten with the joined nodes' positions afterwards (c with a's, b
// with d's when two subpaths were joined). -1, nothing changed, unless all
// four are open ends, a != b, c and d are the two ends of one subpath and
// that subpath is neither a's nor b's. Should the second join fail for lack
// of memory, the count after the first is returned. O(n).
template <class T>
int CRV_JoinTwoNodesWithOpenSubpathExt(T* points, NODETYPE* nodes, int n, int* a, int* b, int* c, int* d);
// The same with indices by value. If any index lies outside 0..n-1, the
// complete pair decides: CRV_JoinTwoNodesExt on a and c if both are valid,
// else on d and b if both are valid; otherwise -1.
template <class T>
int CRV_JoinTwoNodesWithOpenSubpath(T* points, NODETYPE* nodes, int n, int a, int b, int c, int d);
