// The containment tree of the subpaths of one or more curves.
//
// A path keeps its subpaths as a flat list; code that treats a compound
// shape as outlines with holes needs to know which closed subpath lies in
// which. SubpathHierarchy sorts them into a tree: the children of a node are
// the subpaths directly inside it, so depth 1 holds outlines, depth 2 holes,
// depth 3 islands in holes, and so on. Containment is decided by one point
// inside the subpath (GetPointInShape) tested against the candidate outline
// (IsPointInShape, even-odd), after a cheaper comparison of areas: this
// assumes that subpaths do not cross each other.
//
// Text. A subpath whose move carries the letter bit starts a new glyph: it
// closes the group of subpaths collected so far, and if it has a segment it
// is the first shape of the next group (a letter's first contour carries the
// bit, its inner contours do not). A lone move with the letter bit is a mere
// separator and adds no node. Groups never nest into each other; they lie
// side by side at the root, or each under a group node of its own (count 0).
//
// Open subpaths never nest and never hold anything: they stay at the top of
// their group.
//
// The tree borrows the point and node arrays of the curves and never copies
// a subpath's data: the arrays must outlive the tree and stay unchanged.
// Nodes are held by value, so copying a node copies its subtree. Memory
// exhaustion surfaces as std::bad_alloc, and what was built is released.
#pragma once

#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/core/polycurve.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// One subpath (or the root, or a group) and the subpaths directly inside it.
class SubpathTreeNode {
 public:
  std::vector<SubpathTreeNode> children;               // directly contained subpaths, by value
  const MavikMath::V* doublePoints = nullptr;          // first point, borrowed; null for integer subpaths
  const Framework::common_types::POINT* integerPoints = nullptr;  // null for double subpaths
  const NODETYPE* nodes = nullptr;                     // first node byte, borrowed
  int count = 0;                                       // nodes of the subpath; 0 for a root or a group
  MavikMath::V interiorPoint{0.0, 0.0};                // strictly inside the subpath (widened for integers)
  int index = -1;                                      // the caller's number for it; -1 when not set
  bool marked = false;                                 // the caller's mark, read only by AddNodes
  mutable bool areaValid = false;                      // area below is filled
  mutable double area = 0.0;                           // cached signed area of the subpath alone

  // An empty node: no points, index -1, not marked, no cached area.
  SubpathTreeNode() = default;
  // The node of one subpath of count nodes. interiorPoint is found here
  // (GetPointInShape) when nodes is not null, count >= 1 and the subpath is
  // closed (closed bit on its first node); for integer points also only
  // when points is not null. If none is found it stays (0, 0).
  SubpathTreeNode(const Framework::common_types::POINT* points, const NODETYPE* nodes, int count, int index);
  SubpathTreeNode(const MavikMath::V* points, const NODETYPE* nodes, int count, int index);

  // The i-th child; a static empty node for i out of range (the mutable form
  // resets it on every such call, so writes to it are lost).
  SubpathTreeNode& GetChild(unsigned long i);
  const SubpathTreeNode& GetChild(unsigned long i) const;
  unsigned long GetNumberOfChildren() const { return children.size(); }

  // Whether this subpath lies inside the subpath of other: false when this
  // is not a closed subpath (open subpaths, roots and groups never nest),
  // when its area is larger in size than other's (equal sizes pass), and
  // when other has no points; otherwise whether interiorPoint lies in other
  // by even-odd (rounded half away from zero for an integer other). O(size
  // of other).
  bool IsInsideOf(const SubpathTreeNode& other) const;
  // The signed area of the subpath alone: positive for clockwise with y up;
  // 0.0 for open subpaths, roots and groups. Cached once computed for a
  // closed subpath. O(count) the first time.
  double GetArea() const;
  // GetArea plus the same of every child: the net area of an outline with
  // its holes, where those run the other way.
  double GetAreaWithChildren() const;

  // Appends a deep copy of node to the children.
  void AddChild(const SubpathTreeNode& node);
  // Erases the i-th child, keeping the order of the rest; nothing for a bad i.
  void RemoveChild(unsigned long i);
  // Hands the children over to target and clears them here. Without asGroup
  // they are appended to target's children; with asGroup, and if there are
  // any, target gets one new child: a copy of this node holding them (a
  // group node).
  void MoveChildrenTo(SubpathTreeNode& target, bool asGroup);
  // Drops every child, with all that lies in it, that runs the wrong way for
  // its depth: with antiClockwise true the children whose area with children
  // is greater than 0.0 stay, with it false those whose area with children
  // is at most 0.0; then the same for the grandchildren with the flag
  // negated, and so on. The order of the rest is kept.
  void EliminateCutOffs(bool antiClockwise);

  // Pre-order walk: appends this subpath's points (as doubles) and node
  // bytes if count is not 0, then those of each child in order.
  void AppendNodes(std::vector<MavikMath::V>& points, std::vector<NODETYPE>& nodes) const;
  // The same walk, appending to a curve (points converted to its kind).
  template <class T>
  void AppendToPolycurve(PolycurveT<T>& curve) const;
  // count plus the same of every child.
  int GetTotalNumberOfPoints() const;
};

// The predicate of EliminateCutOffs: true for a node to be removed, that is
// when (its area with children is greater than 0.0) differs from b.
struct IsAntiClockwise {
  bool b;
  bool operator()(const SubpathTreeNode& node) const { return (node.GetAreaWithChildren() > 0.0) != b; }
};

class SubpathHierarchy {
 public:
  // An empty tree.
  SubpathHierarchy() = default;
  // The subpaths of one raw path, groups side by side at the root or, with
  // asGroup, one group node per glyph.
  template <class T>
  SubpathHierarchy(const T* points, const NODETYPE* nodes, int count, bool asGroup);
  // The subpaths of several raw paths, curve c giving its subpaths index c.
  template <class T>
  explicit SubpathHierarchy(const std::vector<ConstDrawCurveT<T>>& curves);
  // One node per polycurve, each whole curve taken as one subpath (its closed
  // flag, area and interior point are those of the whole curve as one shape,
  // decided by the first node's closed bit). The curves must outlive the tree.
  template <class T>
  explicit SubpathHierarchy(const std::vector<PolycurveT<T>>& curves);
  // An empty tree, then AddNodes.
  SubpathHierarchy(const std::vector<SubpathTreeNode>& nodes, bool onlyMarked);

  // Adds the subpaths of the curves to this tree's root (see
  // BuildSubpathHierarchyT).
  template <class T>
  void BuildSubpathHierarchy(const std::vector<ConstDrawCurveT<T>>& curves, bool asGroup, bool wholeCurves);
  // AddNode for each node in order, skipping unmarked ones with onlyMarked.
  void AddNodes(const std::vector<SubpathTreeNode>& nodes, bool onlyMarked);
  // Inserts a copy of node (with its subtree) at the root.
  void AddNode(const SubpathTreeNode& node);
  // Inserts node below parent: descends into the first child that holds it,
  // as long as there is one; there, the children that lie inside node move
  // into it (walked from the last to the first, so they end up in reverse
  // order), and node is appended. node's content is moved into the tree.
  // The resulting tree does not depend on the order of insertion, apart from
  // the order of siblings. O(siblings met x size of a subpath).
  void AddSubpathToTree(SubpathTreeNode& parent, SubpathTreeNode& node);

  SubpathTreeNode& GetRoot() { return root; }
  const SubpathTreeNode& GetRoot() const { return root; }

 private:
  SubpathTreeNode root;
};

// The building loop. For each curve c in order, its subpaths in order (the
// whole curve as one with wholeCurves): a subpath whose move has the letter
// bit closes the group collected so far (moving it to root, as one group node
// with asGroup) and, if it has a segment, goes into the next group like any
// other subpath; a closed subpath is inserted by containment; an open one is
// appended at the top of the group. When all curves are done the last group
// is closed as well. Curves without nodes add nothing. CurveT is
// ConstDrawCurveT<T>.
template <class CurveT>
void BuildSubpathHierarchyT(SubpathHierarchy& tree, SubpathTreeNode& root, const std::vector<CurveT>& curves,
                            bool asGroup, bool wholeCurves);

}  // namespace OstraCrv
