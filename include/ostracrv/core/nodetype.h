// The node byte and the read-only rules of a raw path.
//
// A path is two parallel arrays: points and one NODETYPE byte per point.
//
//   bit 7-6  segment type: 0 move (starts a subpath), 1 line (ends a straight
//            segment), 2 curve (ends a cubic Bezier), 3 arc (a Bezier control
//            point)
//   bit 5-4  continuity: 0 cusp, 1 smooth, 2 symmetric
//   bit 3    closed: on the first and the last node of a closed subpath
//   bit 2    user: a node the user sees (on an arc: offered for picking)
//   bit 1    letter: the nodes of a text letter
//   bit 0    enabled: selected for the next edit
//
// A Bezier takes three nodes (arc, arc, curve), so its four points are at
// i-3 .. i where i is the curve node. A closed subpath stores its closing
// point twice; both ends carry the closed bit and only the first is a user
// node. The two ends are twins: a change of enabled or continuity on one is
// written to the other as well.
//
// The walks NN and PN wrap around at closed subpaths. The ring that NN walks
// holds the last node and skips the first (they are one place): NN of the last
// node is the second node; PN of both the first and the second node is the
// last node.
#pragma once

#include <cstdint>

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/vector2d.h"

using NODETYPE = unsigned char;

// Scoped so that the short names (move, line, ...) stay out of the global
// namespace.
enum class SegmentType : unsigned char { move = 0, line = 1, curve = 2, arc = 3 };
enum class ContinuityType : unsigned char { cusp = 0, smooth = 1, symm = 2 };

namespace NodeMask {
inline constexpr NODETYPE kType = 0xC0;
inline constexpr NODETYPE kContinuity = 0x30;
inline constexpr NODETYPE kClosed = 0x08;
inline constexpr NODETYPE kUser = 0x04;
inline constexpr NODETYPE kLetter = 0x02;
inline constexpr NODETYPE kEnabled = 0x01;
inline constexpr NODETYPE kMove = 0x00;
inline constexpr NODETYPE kLine = 0x40;
inline constexpr NODETYPE kCurve = 0x80;
inline constexpr NODETYPE kArc = 0xC0;
}  // namespace NodeMask

// Node bytes used by all building code; none carries enabled or letter bits.
// They are published by the library at load time.
namespace NodeTypes {
extern const NODETYPE arc;
namespace Open {
extern const NODETYPE move;
extern const NODETYPE line;
extern const NODETYPE curve;
extern const NODETYPE smoothLine;
extern const NODETYPE smoothCurve;
extern const NODETYPE symmCurve;
}  // namespace Open
namespace Closed {
extern const NODETYPE move;
extern const NODETYPE line;
extern const NODETYPE curve;
extern const NODETYPE smoothLine;
extern const NODETYPE smoothCurve;
extern const NODETYPE symmCurve;
}  // namespace Closed
}  // namespace NodeTypes

// Field readers of one byte.
constexpr SegmentType GetSegmentType(NODETYPE n) noexcept { return SegmentType(n >> 6); }
constexpr ContinuityType GetContinuity(NODETYPE n) noexcept { return ContinuityType((n >> 4) & 3); }
constexpr bool IsMove(NODETYPE n) noexcept { return (n & NodeMask::kType) == NodeMask::kMove; }
constexpr bool IsLine(NODETYPE n) noexcept { return (n & NodeMask::kType) == NodeMask::kLine; }
constexpr bool IsCurve(NODETYPE n) noexcept { return (n & NodeMask::kType) == NodeMask::kCurve; }
constexpr bool IsArc(NODETYPE n) noexcept { return (n & NodeMask::kType) == NodeMask::kArc; }
constexpr bool IsClosedNode(NODETYPE n) noexcept { return (n & NodeMask::kClosed) != 0; }
constexpr bool IsUserNode(NODETYPE n) noexcept { return (n & NodeMask::kUser) != 0; }
constexpr bool IsLetterNode(NODETYPE n) noexcept { return (n & NodeMask::kLetter) != 0; }
constexpr bool IsEnabledNode(NODETYPE n) noexcept { return (n & NodeMask::kEnabled) != 0; }
constexpr NODETYPE WithSegmentType(NODETYPE n, SegmentType t) noexcept {
  return NODETYPE((n & ~NodeMask::kType) | (unsigned(t) << 6));
}
constexpr NODETYPE WithContinuity(NODETYPE n, ContinuityType c) noexcept {
  return NODETYPE((n & ~NodeMask::kContinuity) | ((unsigned(c) & 3u) << 4));
}

// The empty reporting hook for states that should not occur. Returns 0.
int crvProblem();

namespace OstraCrv {

// Bad input in general: a null array with a count above zero, a negative count
// or an index outside 0..n-1 never reads or writes outside the array; each
// function below says what it answers then.

// Checks the rules of a valid path and stops at the first fault: node 0 is a
// move; no move or line follows an arc; a curve at i has arcs at i-1 and i-2
// and a non-arc at i-3; an arc is not the last node, has no closed or
// continuity bits, and has the user bit only while enabled; the last node of a
// subpath that ends in a segment has the closed bit of the subpath's first
// node, and a closed subpath does not have the user bit on both ends. An empty
// array (even a null one) is valid, a lone move is valid. Returns false for a
// null array with n > 0 and for n > INT_MAX (a negative count cast to
// unsigned). O(n).
bool IsValidCurve(NODETYPE const* nodes, unsigned long n);
// Repairs the flags: every move gets the user bit; the last node of each
// subpath becomes a line if it was an arc, takes the closed bit of the
// subpath's first node, and has the user bit exactly when open; interior nodes
// lose the closed bit and non-arcs among them get the user bit. Moves' closed
// bits, enabled, letter and continuity bits and an invalid order of kinds are
// left alone. Returns whether any byte changed; false and no write for a null
// array, n == 0 or n > INT_MAX. Idempotent. O(n).
bool FixNodeTypes(NODETYPE* nodes, unsigned long n);

// Segment numbering: each line and curve node ends one segment, numbered from
// 0 in array order across all subpaths. Every conversion counts, O(n).
//
// The number of line and curve nodes; 0 for a null array or n < 1.
int GetSegmentCount(NODETYPE const* nodes, int n);
// The number of the segment that starts at the non-arc node i: it ends at i+1
// when i+1 is a line and at i+3 otherwise (the kind at the end is not
// checked). -1 when i+1 or that end lies outside 0..n-1, or nodes is null.
int FirstNodeToSegmentIndex(NODETYPE const* nodes, int n, int i);
// The number of the segment that ends at i; for a node that ends no segment,
// the last segment before it, or -1 if there is none. -1 for i outside
// 0..n-1 or a null array.
int LastNodeToSegmentIndex(NODETYPE const* nodes, int n, int i);
// The start node of segment s: the subpath's move for its first segment, else
// the previous segment's end. -1 when there is no segment s (s < 0, s beyond
// the count, n < 1, null array).
int SegmentToFirstNodeIndex(NODETYPE const* nodes, int n, int s);
// The line or curve node that ends segment s; -1 as for SegmentToFirstNodeIndex.
int SegmentToLastNodeIndex(NODETYPE const* nodes, int n, int s);

// Moves count entries of both arrays from index from to index to, overlap-safe.
// Flags and the array length are the caller's. Nothing moves for null arrays,
// negative indices or count <= 0. Explicitly instantiated for POINT and V.
template <class T>
void MovePath(T* points, NODETYPE* nodes, int to, int from, int count);
// Copies count entries of both arrays of one path into another at index to
// (overlap-safe, so source and destination may be the same path). Nothing is
// copied for null arrays, negative indices or count <= 0.
template <class T>
void CopyPath(T* dstPoints, NODETYPE* dstNodes, int to, T const* srcPoints, NODETYPE const* srcNodes, int from,
              int count);

}  // namespace OstraCrv

// Walking with wrap-around at closed subpaths. Each answers i itself for a
// null array or an i outside 0..n-1.
//
// The next node of the subpath: i+1 inside a subpath; at the last node i of an
// open subpath; at the last node of a closed subpath its second node (the
// first is the same place). A closed move that is its whole subpath answers
// i+1, or i at the array end. O(1), O(subpath) at a wrap.
int NN(NODETYPE const* nodes, int i, int n);
// The previous node: i-1 inside a subpath; i at the first node of an open
// subpath; the closing (last) node for both the first and the second node of
// a closed subpath. O(1), O(subpath) at a wrap.
int PN(NODETYPE const* nodes, int i, int n);
// NN repeated until the node is not an arc: the next segment end (or move)
// on the ring. Stops where NN stops moving. O(subpath).
int NNControl(NODETYPE const* nodes, int i, int n);
// PN repeated until the node is not an arc, stopping where PN stops moving.
int PNControl(NODETYPE const* nodes, int i, int n);
// The twin of a closed end: the last node for the first, the first node (or
// the nearest lower closed node, stopping at 0) for any other closed node. A
// lone closed move is its own twin. -1 for a node without the closed bit, an
// index out of range, a null array, or a closed move whose subpath runs to the
// array end without a closed node. O(subpath).
int OtherClosedEnd(NODETYPE const* nodes, int i, int n);

// Counting queries: single branch-free passes over the bytes, O(n), several
// GB/s. Each gives 0 (false) for a null array or n < 1.
//
// Nodes of type line.
int CRV_HowManyLines(NODETYPE const* nodes, int n);
// Nodes of type curve (Bezier segments).
int CRV_HowManyCurves(NODETYPE const* nodes, int n);
// Moves without the closed bit.
int CRV_HowManyOpenSubpaths(NODETYPE const* nodes, int n);
// Moves: the number of subpaths, dangling moves included.
int CRV_NumSubpaths(NODETYPE const* nodes, int n);
// The node count of the subpath that starts at index first. subpathNodes is
// that subpath's first node (&nodes[first]) while first and n are indices of
// the whole array. At least 1 for a first in 0..n-1; 0 for a null pointer or
// first outside 0..n-1. O(subpath).
int CRV_CountNodesInSubpath(NODETYPE const* subpathNodes, int first, int n);
// Non-arc nodes with the user bit; with enabledOnly, only the enabled ones.
// n > INT_MAX (a negative count cast to unsigned) gives 0.
int CRV_GetNumberOfUserNodes(NODETYPE const* nodes, unsigned n, bool enabledOnly);
// Whether any node has the closed bit.
bool CRV_ContainsClosedSubpath(NODETYPE const* nodes, int n);
// Whether any move lacks the closed bit; with mustHaveSegment the move must
// also be followed by a node of its own subpath (dangling moves do not count).
bool CRV_ContainsOpenSubpath(NODETYPE const* nodes, int n, bool mustHaveSegment);

// Subpath queries of one index. The predicates are false, the index answers
// -1, for a null array or an index outside 0..n-1.
//
// i is a move.
bool CRV_IsFirstSubpathNode(NODETYPE const* nodes, int n, int i);
// i is n-1 or i+1 is a move.
bool CRV_IsLastSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstOrLastSubpathNode(NODETYPE const* nodes, int n, int i);
// As above, restricted to nodes without (Open) or with (Closed) the closed bit.
bool CRV_IsFirstOpenSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsLastOpenSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstOrLastOpenSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstClosedSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsLastClosedSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstOrLastClosedSubpathNode(NODETYPE const* nodes, int n, int i);
// The nearest move at or before i; -1 if there is none.
int CRV_FirstNodeOfThisSubpath(NODETYPE const* nodes, int n, int i);
// The node before the next move after i, or n-1.
int CRV_LastNodeOfThisSubpath(NODETYPE const* nodes, int n, int i);
// The closed bit of the first node of i's subpath; false if it has none.
bool CRV_IsThisSubpathClosed(NODETYPE const* nodes, int n, int i);
// True for a == b; else true when no move lies in lower+1 .. higher. False
// when either index is out of range.
bool CRV_TwoNodesInSameSubpath(NODETYPE const* nodes, int n, int a, int b);
// i if it has the user bit; for a closing node without it, its twin if that
// has the user bit; else -1.
int CRV_GetUserNode(NODETYPE const* nodes, int n, int i);
// Whether node i can be made smooth: it joins two segments and at least one
// is a Bezier (at a closed subpath's ends, the closing and the first segment
// meet). Arcs and the ends of open subpaths never are.
bool IsNodeSmoothable(NODETYPE const* nodes, int i, int n);
// Whether node i can be made symmetric: both segments that meet there are
// Beziers.
bool IsNodeSymmetable(NODETYPE const* nodes, int i, int n);

// Flag writers that keep the twins of a closed subpath in step. Each writes
// node i and, if i has the closed bit, its twin (OtherClosedEnd). Nothing is
// written for a null array or i outside 0..n-1.
//
// The low bit of on becomes the enabled bit.
void CRV_SetEnabled(NODETYPE* nodes, int n, int i, int on);
// The two low bits of c become the continuity field.
void CRV_SetCont(NODETYPE* nodes, int n, int i, ContinuityType c);

// Gap operations on both arrays of a path of n entries, overlap-safe; flags
// and the length are the caller's. Explicitly instantiated for POINT and V.
//
// Closes a gap: the tail from i+count (n-(i+count) entries) moves down to i.
// Nothing moves for null arrays, i < 0, count <= 0 or an empty tail.
template <class T>
void PathDelNext(NODETYPE* nodes, T* points, int i, int count, int n);
// Opens a gap: the tail from i (n-i entries) moves up by count; the caller has
// room for n+count entries, and the gap keeps whatever it held. Nothing moves
// for null arrays, i < 0, count <= 0 or i >= n.
template <class T>
void PathInsNext(NODETYPE* nodes, T* points, int i, int count, int n);
