// The selection methods of PolycurveT: thin wrappers over the node selection
// functions, each O(n) or O(length of its input list).
//
// A change of selection is a write: it forks shared storage like any other.
// Methods that clear the enabled bit of an arc also clear its user bit, so
// that no control point stays offered without following the selection (an
// offered arc must be enabled in a valid path).
#include <algorithm>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/edit/node_selection.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

// The byte with the enabled bit set to on; an arc that loses it is no longer
// offered either.
NODETYPE withEnabled(NODETYPE b, bool on) noexcept {
  if (on) return NODETYPE(b | NodeMask::kEnabled);
  const NODETYPE clear = NODETYPE(NodeMask::kEnabled | (IsArc(b) ? NodeMask::kUser : 0));
  return NODETYPE(b & ~clear);
}

// Enables the nodes of which `is` holds and disables all others. The queries
// read only move and closed bits, which this leaves alone.
template <bool (*is)(NODETYPE const*, int, int)>
void EnableOnly(NODETYPE* nodes, int n) noexcept {
  for (int i = 0; i < n; ++i) nodes[i] = withEnabled(nodes[i], is(nodes, n, i));
}

}  // namespace

template <class T>
std::vector<unsigned long> PolycurveT<T>::GetEnabledNodes(bool includeArcs) const {
  std::vector<unsigned long> out;
  NODETYPE const* nodes = GetNodeTypes();
  const unsigned long n = GetPointCount();
  for (unsigned long i = 0; i < n; ++i)
    if (IsEnabledNode(nodes[i]) && (includeArcs || !IsArc(nodes[i]))) out.push_back(i);
  return out;
}

template <class T>
std::vector<unsigned long> PolycurveT<T>::GetEnabledNodesFrom(std::vector<unsigned long> indices,
                                                              bool treatArcsByNeighbours) const {
  NODETYPE const* nodes = GetNodeTypes();
  const unsigned long n = GetPointCount();
  bool previousKeptEnabled = false;
  auto keep = [&](unsigned long i) {
    if (i >= n) return false;
    if (treatArcsByNeighbours && IsArc(nodes[i])) {
      if (!previousKeptEnabled) return false;
      unsigned long j = i + 1;
      while (j < n && IsArc(nodes[j])) ++j;
      // A control point belongs to the Bezier that ends at the next curve
      // node. Beyond the array the arc is judged by its own bit.
      if (j < n) return IsCurve(nodes[j]) && IsEnabledNode(nodes[j]);
    }
    previousKeptEnabled = IsEnabledNode(nodes[i]);
    return previousKeptEnabled;
  };
  indices.erase(std::remove_if(indices.begin(), indices.end(), [&](unsigned long i) { return !keep(i); }),
                indices.end());
  return indices;
}

template <class T>
std::vector<unsigned long> PolycurveT<T>::GetEnabledNodesFrom(SubcurveRange range, bool treatArcsByNeighbours) const {
  const unsigned long n = GetPointCount();
  std::vector<unsigned long> indices;
  const unsigned long first = std::min(range.first, n);
  const unsigned long count = std::min(range.count, n - first);
  indices.reserve(count);
  for (unsigned long i = first; i < first + count; ++i) indices.push_back(i);
  return GetEnabledNodesFrom(std::move(indices), treatArcsByNeighbours);
}

template <class T>
std::vector<unsigned long> PolycurveT<T>::GetEnabledOpenEndNodes() const {
  std::vector<unsigned long> out;
  NODETYPE const* nodes = GetNodeTypes();
  const int n = int(GetPointCount());
  for (int i = 0; i < n; ++i)
    if (!IsArc(nodes[i]) && IsEnabledNode(nodes[i]) && CRV_IsFirstOrLastOpenSubpathNode(nodes, n, i))
      out.push_back(static_cast<unsigned long>(i));
  return out;
}

template <class T>
void PolycurveT<T>::SetEnabledNodes(std::vector<unsigned long> const& indices) {
  if (IsEmpty()) return;
  const std::vector<unsigned long> list = indices;  // may live in shared storage
  CurveBuffer<T> buf = GetBuffer();
  CRV_DisableAllNodes(buf.nodes, buf.count);
  for (unsigned long i : list)
    if (i < static_cast<unsigned long>(buf.count)) buf.nodes[i] = NODETYPE(buf.nodes[i] | NodeMask::kEnabled);
}

template <class T>
void PolycurveT<T>::DisableAllNodes() {
  if (IsEmpty()) return;
  CurveBuffer<T> buf = GetBuffer();
  CRV_DisableAllNodes(buf.nodes, buf.count);
}

template <class T>
void PolycurveT<T>::EnableAllNodes() {
  if (IsEmpty()) return;
  CurveBuffer<T> buf = GetBuffer();
  CRV_EnableAllNodes(buf.nodes, buf.count);
  CRV_EnableAllControls(buf.nodes, buf.count);
}

template <class T>
int PolycurveT<T>::EnableAllControls() {
  if (IsEmpty()) return 0;
  CurveBuffer<T> buf = GetBuffer();
  return CRV_EnableAllControls(buf.nodes, buf.count);
}

template <class T>
void PolycurveT<T>::EnableFirstAndLastInOpenSubpaths() {
  if (IsEmpty()) return;
  CurveBuffer<T> buf = GetBuffer();
  EnableOnly<CRV_IsFirstOrLastOpenSubpathNode>(buf.nodes, buf.count);
}

template <class T>
void PolycurveT<T>::EnableFirstAndLastInClosedSubpaths() {
  if (IsEmpty()) return;
  CurveBuffer<T> buf = GetBuffer();
  EnableOnly<CRV_IsFirstOrLastClosedSubpathNode>(buf.nodes, buf.count);
}

template <class T>
void PolycurveT<T>::SetEnabled(unsigned long i, bool on) {
  if (i >= GetPointCount()) return;
  CurveBuffer<T> buf = GetBuffer();
  buf.nodes[i] = withEnabled(buf.nodes[i], on);
}

template <class T>
void PolycurveT<T>::SetEnabled(unsigned long first, unsigned long count, bool on) {
  const unsigned long n = GetPointCount();
  if (first >= n || count == 0) return;
  const unsigned long end = first + std::min(count, n - first);
  CurveBuffer<T> buf = GetBuffer();
  for (unsigned long i = first; i < end; ++i) buf.nodes[i] = withEnabled(buf.nodes[i], on);
}

template <class T>
void PolycurveT<T>::SetSubpathEnabled(unsigned long node, bool on) {
  const unsigned long n = GetPointCount();
  if (node >= n) return;
  const int f = CRV_FirstNodeOfThisSubpath(GetNodeTypes(), int(n), int(node));
  const int l = CRV_LastNodeOfThisSubpath(GetNodeTypes(), int(n), int(node));
  if (f < 0 || l < f) return;
  CurveBuffer<T> buf = GetBuffer();
  for (int i = f; i <= l; ++i) buf.nodes[i] = withEnabled(buf.nodes[i], on);
}

template <class T>
bool PolycurveT<T>::AnyEnabled() const {
  NODETYPE const* nodes = GetNodeTypes();
  return std::any_of(nodes, nodes + GetPointCount(), [](NODETYPE b) { return IsEnabledNode(b); });
}

template <class T>
bool PolycurveT<T>::IsEnabled(unsigned long i) const {
  return i < GetPointCount() && IsEnabledNode(GetNodeTypes()[i]);
}

template <class T>
void PolycurveT<T>::CopyEnabledFrom(PolycurveT other) {
  // other holds its own reference: when it shares this curve's storage, the
  // fork below leaves it the old bits to copy from.
  if (IsEmpty()) return;
  CurveBuffer<T> buf = GetBuffer();
  CRV_DisableAllNodes(buf.nodes, buf.count);
  NODETYPE const* src = other.GetNodeTypes();
  const unsigned long m = std::min(static_cast<unsigned long>(buf.count), other.GetPointCount());
  for (unsigned long i = 0; i < m; ++i)
    buf.nodes[i] = NODETYPE(buf.nodes[i] | (src[i] & NodeMask::kEnabled));
}

#define OSTRACRV_SELECTION_MEMBERS(T)                                                                        \
  template std::vector<unsigned long> PolycurveT<T>::GetEnabledNodes(bool) const;                            \
  template std::vector<unsigned long> PolycurveT<T>::GetEnabledNodesFrom(std::vector<unsigned long>, bool)   \
      const;                                                                                                  \
  template std::vector<unsigned long> PolycurveT<T>::GetEnabledNodesFrom(SubcurveRange, bool) const;        \
  template std::vector<unsigned long> PolycurveT<T>::GetEnabledOpenEndNodes() const;                         \
  template void PolycurveT<T>::SetEnabledNodes(std::vector<unsigned long> const&);                           \
  template void PolycurveT<T>::DisableAllNodes();                                                            \
  template void PolycurveT<T>::EnableAllNodes();                                                             \
  template int PolycurveT<T>::EnableAllControls();                                                           \
  template void PolycurveT<T>::EnableFirstAndLastInOpenSubpaths();                                           \
  template void PolycurveT<T>::EnableFirstAndLastInClosedSubpaths();                                         \
  template void PolycurveT<T>::SetEnabled(unsigned long, bool);                                              \
  template void PolycurveT<T>::SetEnabled(unsigned long, unsigned long, bool);                               \
  template void PolycurveT<T>::SetSubpathEnabled(unsigned long, bool);                                       \
  template bool PolycurveT<T>::AnyEnabled() const;                                                           \
  template bool PolycurveT<T>::IsEnabled(unsigned long) const;                                               \
  template void PolycurveT<T>::CopyEnabledFrom(PolycurveT<T>);

OSTRACRV_SELECTION_MEMBERS(POINT)
OSTRACRV_SELECTION_MEMBERS(V)
#undef OSTRACRV_SELECTION_MEMBERS

}  // namespace OstraCrv
