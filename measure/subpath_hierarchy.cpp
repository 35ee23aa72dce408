// The subpath containment tree.
//
// Insertion. A new subpath descends from the parent into the first child
// that holds it, as long as one does; at the level where it stops, the
// children that lie inside it move under it, and it is appended. A larger
// outline inserted after its holes thus picks them up, and the tree is the
// same for any order of insertion apart from the order of siblings.
//
// Containment (IsInsideOf) first compares the sizes of the two areas (a
// subpath cannot lie in a smaller one; equal sizes go on, so that of two
// identical subpaths the second nests in the first), then tests the one
// interior point of the candidate in the other subpath. Areas are cached
// because the descent asks for them at every level; the interior point is
// found once per subpath. Only closed subpaths nest: an open subpath, a root
// and a group node are inside nothing.
//
// Cost. Inserting into a level with k siblings makes up to 2k containment
// tests, each either an area comparison or a box test over the other's points
// followed, when the box holds the point, by one probe run. Building the tree
// of N side-by-side subpaths of s nodes is therefore O(N^2 s) in the worst
// case, dominated by box tests; nested shapes are cheaper per level.
//
// Letters. The letter bit on a subpath's move marks the first contour of a
// glyph: it closes the group of the previous glyph and, if it has a segment,
// is inserted as the first shape of the new group. A lone move carrying the
// bit only separates.
#include "ostracrv/measure/subpath_hierarchy.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include "ostracrv/measure/area.h"
#include "ostracrv/measure/point_in_shape.h"
#include "ostracrv/measure/point_in_shape_interior.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

// A subpath that can hold others and lie in others.
bool IsClosedSubpath(const SubpathTreeNode& n) {
  return n.nodes && n.count >= 1 && IsClosedNode(n.nodes[0]);
}

// The letter separator test: a move node with the letter bit.
constexpr NODETYPE kLetterMoveMask = 0xC2;
constexpr NODETYPE kLetterMove = 0x02;

}  // namespace

SubpathTreeNode::SubpathTreeNode(const POINT* points, const NODETYPE* nodes_, int count_, int index_)
    : integerPoints(points), nodes(nodes_), count(count_), index(index_) {
  if (points && nodes_ && count_ >= 1 && IsClosedNode(nodes_[0])) {
    POINT inside{};
    if (GetPointInShape(points, nodes_, count_, inside)) interiorPoint = MavikMath::ToV(inside);
  }
}

SubpathTreeNode::SubpathTreeNode(const V* points, const NODETYPE* nodes_, int count_, int index_)
    : doublePoints(points), nodes(nodes_), count(count_), index(index_) {
  if (nodes_ && count_ >= 1 && IsClosedNode(nodes_[0])) {
    V inside{};
    if (GetPointInShape(points, nodes_, count_, inside)) interiorPoint = inside;
  }
}

SubpathTreeNode& SubpathTreeNode::GetChild(unsigned long i) {
  if (i < children.size()) return children[i];
  thread_local SubpathTreeNode empty;
  empty = SubpathTreeNode();
  return empty;
}

const SubpathTreeNode& SubpathTreeNode::GetChild(unsigned long i) const {
  if (i < children.size()) return children[i];
  static const SubpathTreeNode empty;
  return empty;
}

bool SubpathTreeNode::IsInsideOf(const SubpathTreeNode& other) const {
  // Only a closed subpath lies inside anything; an open one, a root or a
  // group stays where it was put.
  if (!IsClosedSubpath(*this)) return false;
  if (std::fabs(GetArea()) > std::fabs(other.GetArea())) return false;
  if (other.doublePoints)
    return IsPointInShape(other.doublePoints, other.nodes, other.count, interiorPoint, false, false, nullptr,
                          nullptr);
  if (other.integerPoints) {
    const POINT p = MavikMath::FromV<POINT>(interiorPoint);
    return IsPointInShape(other.integerPoints, other.nodes, other.count, p, false, false, nullptr, nullptr);
  }
  return false;
}

double SubpathTreeNode::GetArea() const {
  if (areaValid) return area;
  area = 0.0;
  if (IsClosedSubpath(*this)) {
    area = doublePoints ? OstraCrv::GetArea(doublePoints, nodes, count)
                        : OstraCrv::GetArea(integerPoints, nodes, count);
    areaValid = true;
  }
  return area;
}

double SubpathTreeNode::GetAreaWithChildren() const {
  double sum = GetArea();
  for (const SubpathTreeNode& c : children) sum += c.GetAreaWithChildren();
  return sum;
}

void SubpathTreeNode::AddChild(const SubpathTreeNode& node) {
  // Copy first: node may lie inside this node's own subtree, which the
  // growth of children would move.
  SubpathTreeNode copy(node);
  children.push_back(std::move(copy));
}

void SubpathTreeNode::RemoveChild(unsigned long i) {
  if (i < children.size()) children.erase(children.begin() + long(i));
}

void SubpathTreeNode::MoveChildrenTo(SubpathTreeNode& target, bool asGroup) {
  if (&target == this) return;
  // Take the children out first: target may be an ancestor whose growth
  // moves this node, so nothing of this node is touched after target grows.
  std::vector<SubpathTreeNode> moved = std::move(children);
  children.clear();
  if (!asGroup) {
    target.children.reserve(target.children.size() + moved.size());
    for (SubpathTreeNode& c : moved) target.children.push_back(std::move(c));
  } else if (!moved.empty()) {
    SubpathTreeNode group;
    group.doublePoints = doublePoints;
    group.integerPoints = integerPoints;
    group.nodes = nodes;
    group.count = count;
    group.interiorPoint = interiorPoint;
    group.index = index;
    group.marked = marked;
    group.areaValid = areaValid;
    group.area = area;
    group.children = std::move(moved);
    target.children.push_back(std::move(group));
  }
}

void SubpathTreeNode::EliminateCutOffs(bool antiClockwise) {
  children.erase(std::remove_if(children.begin(), children.end(), IsAntiClockwise{antiClockwise}), children.end());
  for (SubpathTreeNode& c : children) c.EliminateCutOffs(!antiClockwise);
}

void SubpathTreeNode::AppendNodes(std::vector<V>& outPoints, std::vector<NODETYPE>& outNodes) const {
  if (count > 0 && nodes && (doublePoints || integerPoints)) {
    for (int i = 0; i < count; ++i) {
      outPoints.push_back(doublePoints ? doublePoints[i] : MavikMath::ToV(integerPoints[i]));
      outNodes.push_back(nodes[i]);
    }
  }
  for (const SubpathTreeNode& c : children) c.AppendNodes(outPoints, outNodes);
}

template <class T>
void SubpathTreeNode::AppendToPolycurve(PolycurveT<T>& curve) const {
  if (count > 0 && nodes) {
    if (doublePoints)
      curve.PushBack(doublePoints, nodes, (unsigned long)count);
    else if (integerPoints)
      curve.PushBack(integerPoints, nodes, (unsigned long)count);
  }
  for (const SubpathTreeNode& c : children) c.AppendToPolycurve(curve);
}

int SubpathTreeNode::GetTotalNumberOfPoints() const {
  int total = count;
  for (const SubpathTreeNode& c : children) total += c.GetTotalNumberOfPoints();
  return total;
}

template void SubpathTreeNode::AppendToPolycurve<POINT>(PolycurveT<POINT>&) const;
template void SubpathTreeNode::AppendToPolycurve<V>(PolycurveT<V>&) const;

// ---- SubpathHierarchy ----

template <class T>
SubpathHierarchy::SubpathHierarchy(const T* points, const NODETYPE* nodes, int count, bool asGroup) {
  const std::vector<ConstDrawCurveT<T>> one{ConstDrawCurveT<T>{points, nodes, count, true}};
  BuildSubpathHierarchyT(*this, root, one, asGroup, false);
}

template <class T>
SubpathHierarchy::SubpathHierarchy(const std::vector<ConstDrawCurveT<T>>& curves) {
  BuildSubpathHierarchyT(*this, root, curves, false, false);
}

template <class T>
SubpathHierarchy::SubpathHierarchy(const std::vector<PolycurveT<T>>& curves) {
  std::vector<ConstDrawCurveT<T>> list;
  list.reserve(curves.size());
  for (const PolycurveT<T>& c : curves)
    list.push_back(ConstDrawCurveT<T>{c.GetPoints(), c.GetNodeTypes(), int(c.GetPointCount()), true});
  BuildSubpathHierarchyT(*this, root, list, false, true);
}

SubpathHierarchy::SubpathHierarchy(const std::vector<SubpathTreeNode>& nodes, bool onlyMarked) {
  AddNodes(nodes, onlyMarked);
}

template <class T>
void SubpathHierarchy::BuildSubpathHierarchy(const std::vector<ConstDrawCurveT<T>>& curves, bool asGroup,
                                             bool wholeCurves) {
  BuildSubpathHierarchyT(*this, root, curves, asGroup, wholeCurves);
}

void SubpathHierarchy::AddNodes(const std::vector<SubpathTreeNode>& nodes, bool onlyMarked) {
  for (const SubpathTreeNode& n : nodes)
    if (!onlyMarked || n.marked) AddNode(n);
}

void SubpathHierarchy::AddNode(const SubpathTreeNode& node) {
  SubpathTreeNode copy(node);
  AddSubpathToTree(root, copy);
}

void SubpathHierarchy::AddSubpathToTree(SubpathTreeNode& parent, SubpathTreeNode& node) {
  SubpathTreeNode* at = &parent;
  for (;;) {
    SubpathTreeNode* into = nullptr;
    for (SubpathTreeNode& c : at->children)
      if (node.IsInsideOf(c)) {
        into = &c;
        break;
      }
    if (!into) break;
    at = into;
  }
  for (std::size_t i = at->children.size(); i-- > 0;) {
    if (at->children[i].IsInsideOf(node)) {
      node.children.push_back(std::move(at->children[i]));
      at->children.erase(at->children.begin() + long(i));
    }
  }
  at->children.push_back(std::move(node));
}

template <class CurveT>
void BuildSubpathHierarchyT(SubpathHierarchy& tree, SubpathTreeNode& root, const std::vector<CurveT>& curves,
                            bool asGroup, bool wholeCurves) {
  SubpathTreeNode group;  // the shapes since the last letter
  for (std::size_t c = 0; c < curves.size(); ++c) {
    const CurveT& curve = curves[c];
    const NODETYPE* nodes = curve.nodes;
    const int count = curve.count;
    if (!nodes || count < 1) continue;
    int first = 0;
    int last = wholeCurves ? count - 1 : CRV_LastNodeOfThisSubpath(nodes, count, 0);
    while (last >= first && last < count) {
      const NODETYPE head = nodes[first];
      const int length = last - first + 1;
      bool insert = true;
      if ((head & kLetterMoveMask) == kLetterMove) {
        group.MoveChildrenTo(root, asGroup);
        insert = length >= 2;  // a lone move only separates
      }
      if (insert) {
        SubpathTreeNode node(curve.points ? curve.points + first : nullptr, nodes + first, length, int(c));
        if (IsClosedNode(head))
          tree.AddSubpathToTree(group, node);
        else
          group.children.push_back(std::move(node));
      }
      first = last + 1;
      last = CRV_LastNodeOfThisSubpath(nodes, count, first);
    }
  }
  group.MoveChildrenTo(root, asGroup);
}

#define OSTRACRV_INSTANTIATE_HIERARCHY(T)                                                                   \
  template SubpathHierarchy::SubpathHierarchy(const T*, const NODETYPE*, int, bool);                       \
  template SubpathHierarchy::SubpathHierarchy(const std::vector<ConstDrawCurveT<T>>&);                     \
  template SubpathHierarchy::SubpathHierarchy(const std::vector<PolycurveT<T>>&);                          \
  template void SubpathHierarchy::BuildSubpathHierarchy(const std::vector<ConstDrawCurveT<T>>&, bool, bool); \
  template void BuildSubpathHierarchyT<ConstDrawCurveT<T>>(SubpathHierarchy&, SubpathTreeNode&,             \
                                                           const std::vector<ConstDrawCurveT<T>>&, bool, bool);

OSTRACRV_INSTANTIATE_HIERARCHY(POINT)
OSTRACRV_INSTANTIATE_HIERARCHY(V)

#undef OSTRACRV_INSTANTIATE_HIERARCHY

}  // namespace OstraCrv
