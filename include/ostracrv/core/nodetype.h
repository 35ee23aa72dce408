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

// Checks the rules of a valid path; stops at the first fault.
bool IsValidCurve(NODETYPE const* nodes, unsigned long n);
// Repairs the flags (user, closed, a trailing arc); returns whether any byte
// changed. Kinds of nodes are otherwise left alone.
bool FixNodeTypes(NODETYPE* nodes, unsigned long n);

// Segment numbering: each line and curve node ends one segment, counted from
// 0 in array order. -1 where there is no such segment.
int GetSegmentCount(NODETYPE const* nodes, int n);
int FirstNodeToSegmentIndex(NODETYPE const* nodes, int n, int i);
int LastNodeToSegmentIndex(NODETYPE const* nodes, int n, int i);
int SegmentToFirstNodeIndex(NODETYPE const* nodes, int n, int s);
int SegmentToLastNodeIndex(NODETYPE const* nodes, int n, int s);

// Overlap-safe moves of array stretches; flags and lengths are the caller's.
template <class T>
void MovePath(T* points, NODETYPE* nodes, int to, int from, int count);
template <class T>
void CopyPath(T* dstPoints, NODETYPE* dstNodes, int to, T const* srcPoints, NODETYPE const* srcNodes, int from,
              int count);

}  // namespace OstraCrv

// Walking with wrap-around at closed subpaths.
int NN(NODETYPE const* nodes, int i, int n);
int PN(NODETYPE const* nodes, int i, int n);
int NNControl(NODETYPE const* nodes, int i, int n);
int PNControl(NODETYPE const* nodes, int i, int n);
int OtherClosedEnd(NODETYPE const* nodes, int i, int n);

// Counting queries: single branch-free passes over the bytes.
int CRV_HowManyLines(NODETYPE const* nodes, int n);
int CRV_HowManyCurves(NODETYPE const* nodes, int n);
int CRV_HowManyOpenSubpaths(NODETYPE const* nodes, int n);
int CRV_NumSubpaths(NODETYPE const* nodes, int n);
int CRV_CountNodesInSubpath(NODETYPE const* subpathNodes, int first, int n);
int CRV_GetNumberOfUserNodes(NODETYPE const* nodes, unsigned n, bool enabledOnly);
bool CRV_ContainsClosedSubpath(NODETYPE const* nodes, int n);
bool CRV_ContainsOpenSubpath(NODETYPE const* nodes, int n, bool mustHaveSegment);

// Subpath queries of one index.
bool CRV_IsFirstSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsLastSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstOrLastSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstOpenSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsLastOpenSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstOrLastOpenSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstClosedSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsLastClosedSubpathNode(NODETYPE const* nodes, int n, int i);
bool CRV_IsFirstOrLastClosedSubpathNode(NODETYPE const* nodes, int n, int i);
int CRV_FirstNodeOfThisSubpath(NODETYPE const* nodes, int n, int i);
int CRV_LastNodeOfThisSubpath(NODETYPE const* nodes, int n, int i);
bool CRV_IsThisSubpathClosed(NODETYPE const* nodes, int n, int i);
bool CRV_TwoNodesInSameSubpath(NODETYPE const* nodes, int n, int a, int b);
int CRV_GetUserNode(NODETYPE const* nodes, int n, int i);
bool IsNodeSmoothable(NODETYPE const* nodes, int i, int n);
bool IsNodeSymmetable(NODETYPE const* nodes, int i, int n);

// Flag writers that keep the twins of a closed subpath in step.
void CRV_SetEnabled(NODETYPE* nodes, int n, int i, int on);
void CRV_SetCont(NODETYPE* nodes, int n, int i, ContinuityType c);

// Gap operations on both arrays; see MovePath.
template <class T>
void PathDelNext(NODETYPE* nodes, T* points, int i, int count, int n);
template <class T>
void PathInsNext(NODETYPE* nodes, T* points, int i, int count, int n);
