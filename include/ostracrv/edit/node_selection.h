// The node selection of a path: the enabled bit of each node byte.
//
// On a move, line or curve node the enabled bit means "selected". On an arc
// (a Bezier control point) it is derived data: the arc moves with the
// selection; the user bit on an arc offers it for picking and dragging on its
// own, which happens only while exactly one node is selected. The arc marks
// are recomputed from the node selection by the refresh of
// CRV_EnableAllControls, CRV_EnableAllNodes and CRV_EnableSubpath.
//
// All functions work in place on the caller's node array of n bytes. A null
// array, n < 1 or an index outside 0..n-1 changes nothing; counts answer 0 and
// index queries -1 then.
#pragma once

#include <cstdint>

#include "ostracrv/core/nodetype.h"

// What a user interface may offer for the current selection, from
// CRV_GetEnablingInfo.
struct CRV_ENABLINGINFO {
  // The capability mask, see CRV_EnablingFlags.
  uint16_t flags = 0;
  uint16_t spare = 0;
  // 1 if the path has more than one subpath and all enabled nodes lie in one.
  uint32_t singleSubpath = 0;
  // 1 if enabled open ends can be joined.
  uint32_t endsCanJoin = 0;
};

// Bits of CRV_ENABLINGINFO::flags.
namespace CRV_EnablingFlags {
inline constexpr uint16_t kLine = 0x0001;          // an enabled line node exists
inline constexpr uint16_t kCurve = 0x0002;         // an enabled curve node exists
inline constexpr uint16_t kJoin = 0x0004;          // enabled open ends can be closed or joined
inline constexpr uint16_t kBreak = 0x0008;         // the path can be broken at an enabled node
inline constexpr uint16_t kToCusp = 0x0010;        // an enabled node can be made a cusp
inline constexpr uint16_t kToSmooth = 0x0020;      // an enabled node can be made smooth
inline constexpr uint16_t kToSymmetric = 0x0040;   // an enabled node can be made symmetric
inline constexpr uint16_t kNotOnlyMoves = 0x0080;  // more enabled nodes than enabled open moves
inline constexpr uint16_t kOne = 0x0100;           // at least one node is enabled
inline constexpr uint16_t kTwo = 0x0200;           // at least two nodes are enabled
inline constexpr uint16_t kOneAlso = 0x0400;       // as kOne (a distinct capability to a caller)
inline constexpr uint16_t kTwoAlso = 0x0800;       // as kTwo
inline constexpr uint16_t kSubpaths = 0x1000;      // the path has at least two subpaths
inline constexpr uint16_t kAlways = 0x2000;        // always set
}  // namespace CRV_EnablingFlags

// ---- Counts: one pass over the bytes, O(n), no branch per node ----

// Non-arc nodes with the enabled and user bits: the closing node of a closed
// subpath (no user bit) is not counted apart from its twin. 0 for n < 1.
int CRV_HowManyEnabled(NODETYPE const* nodes, int n);
// Non-arc nodes with the enabled bit and without the closed bit.
int CRV_HowManyEnabledNotClosed(NODETYPE const* nodes, int n);
// Enabled line or curve nodes followed by a node that is not a move: the
// interior nodes of subpaths. 0 for n < 2.
int CRV_HowManyEnabledNotFirstOrLastInSubpath(NODETYPE const* nodes, int n);
// Among nodes 0..n-2: non-arc nodes with the enabled and user bits that have
// the closed bit (the first node of a closed subpath) or are interior. 0 for
// n < 2.
int CRV_HowManyEnabledNotFirstOrLastInOpenSubpath(NODETYPE const* nodes, int n);
// Line, respectively curve, nodes with the enabled bit.
int CRV_HowManyEnabledLines(NODETYPE const* nodes, int n);
int CRV_HowManyEnabledCurves(NODETYPE const* nodes, int n);
// Subpaths with at least one non-arc node that has the enabled and user bits.
int CRV_HowManyEnabledSubpaths(NODETYPE const* nodes, int n);

// ---- Changing the selection ----

// Clears the enabled bit of every node, and the user bit of every arc (no
// control point is offered any more). Other user bits stay.
void CRV_DisableAllNodes(NODETYPE* nodes, int n);
// The arc refresh: clears the enabled and user bits of all arcs, marks the
// control points that each selected node (non-arc, enabled, user) drags,
// and, if exactly one node is selected, offers the marked arcs (user bit).
// Returns the number of selected nodes; 0 for bad input.
int CRV_EnableAllControls(NODETYPE* nodes, int n);
// Sets the enabled bit on every byte, then the arc refresh. Returns the
// number of selected nodes; 0 for bad input.
int CRV_EnableAllNodes(NODETYPE* nodes, int n);
// Writes the low bit of on to the enabled bit of every node of i's subpath
// (arcs included), then the arc refresh. Returns the number of selected
// nodes; -1 (nothing changed) for bad input.
int CRV_EnableSubpath(NODETYPE* nodes, int n, int i, int on);
// Offers the control points of node i alone: clears all arc marks, marks the
// arcs that node i drags (with i's enabled bit) and gives every marked arc
// the user bit.
void CRV_EnableOneControl(NODETYPE* nodes, int n, int i);
// Copies the enabled bit of node i to the arcs that a move of node i drags:
// the arcs of the Beziers at either side, and beyond a smooth line the arcs
// of the Bezier whose handle turns with it. Returns the last arc written, or
// -1 if none (of no use to callers).
int crvEnableOneControlInternal(NODETYPE* nodes, int n, int i);

// ---- Queries ----

// The capability mask and join state of the selection, written to *info
// (when info is not null; it starts zeroed). extraNode, unless -1 or out of
// range, is answered for as though it were selected. The third argument is
// not read. Returns the number of enabled line, curve and open move nodes
// (a closed move counts through its twin); 0 for bad input, with info
// holding only the always-set bit. O(n).
int CRV_GetEnablingInfo(NODETYPE const* nodes, int n, int ignored, int extraNode, CRV_ENABLINGINFO* info);
// The control point just before node i, or -1. An open move has none; for a
// closed move the search starts at its twin (the closing node).
int CRV_GetArcBefore(NODETYPE const* nodes, int n, int i);
// The control point just after node i (NN of i, if that is an arc), or -1.
int CRV_GetArcAfter(NODETYPE const* nodes, int n, int i);
