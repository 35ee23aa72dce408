// Taking a curve apart into subpaths, turning closed subpaths and reversing.
//
// The listings walk the subpaths once from the front, jumping from each first
// node to the node before the next move: O(n). GetSubpathCurves and
// GetSubpathRefs point into this curve's arrays so that algorithms over
// subpaths need not copy; their records are valid while the storage stays as
// it is.
//
// Glyph groups: a text curve marks the first subpath of each letter with the
// letter bit; the subpaths that follow without it are the letter's inner
// contours (the counters of an "o"). A letter subpath without a segment (a
// lone move) still starts a new group but adds no shape to it, so that a
// glyph made only of closed outlines is never lost.
#include <algorithm>

#include "ostracrv/core/path_reverse.h"
#include "ostracrv/core/polycurve.h"
#include "ostracrv/core/subpath_list.h"
#include "ostracrv/core/subpath_spin.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

bool HasNodeWithEnabled(NODETYPE const* nodes, const SubcurveRange& r, bool wanted) noexcept {
  return std::any_of(nodes + r.first, nodes + r.first + r.count,
                     [wanted](NODETYPE b) { return IsEnabledNode(b) == wanted; });
}

}  // namespace

template <class T>
PolycurveT<T> PolycurveT<T>::GetSubpath(unsigned long node) const {
  unsigned long begin = 0, end = 0;
  if (!GetSubpathRange(node, begin, end)) return PolycurveT();
  return GetSubcurve(begin, end - begin);
}

template <class T>
bool PolycurveT<T>::GetSubpathRange(unsigned long node, unsigned long& begin, unsigned long& end) const {
  const unsigned long n = GetPointCount();
  if (node >= n) return false;
  const int f = CRV_FirstNodeOfThisSubpath(GetNodeTypes(), int(n), int(node));
  const int l = CRV_LastNodeOfThisSubpath(GetNodeTypes(), int(n), int(node));
  if (f < 0 || l <= f) return false;
  begin = static_cast<unsigned long>(f);
  end = static_cast<unsigned long>(l) + 1;
  return true;
}

template <class T>
MavikUtils::optional<MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>>> PolycurveT<T>::GetSubpathRange(
    unsigned long node) const {
  unsigned long begin = 0, end = 0;
  if (!GetSubpathRange(node, begin, end)) return MavikUtils::nullopt;
  return MavikUtils::Indices(begin, end);
}

template <class T>
int PolycurveT<T>::FirstNodeOfSubpath(unsigned long node) const {
  const unsigned long n = GetPointCount();
  if (node >= n) return -1;
  return CRV_FirstNodeOfThisSubpath(GetNodeTypes(), int(n), int(node));
}

template <class T>
int PolycurveT<T>::LastNodeOfSubpath(unsigned long node) const {
  const unsigned long n = GetPointCount();
  if (node >= n) return -1;
  return CRV_LastNodeOfThisSubpath(GetNodeTypes(), int(n), int(node));
}

template <class T>
std::vector<SubcurveRange> PolycurveT<T>::GetSubpathIndices() const {
  return GetSubpathRanges(GetNodeTypes(), int(GetPointCount()));
}

template <class T>
std::vector<SubcurveRange> PolycurveT<T>::GetEnabledSubpathIndices(bool wanted) const {
  std::vector<SubcurveRange> ranges = GetSubpathIndices();
  NODETYPE const* nodes = GetNodeTypes();
  std::erase_if(ranges, [&](const SubcurveRange& r) { return !HasNodeWithEnabled(nodes, r, wanted); });
  return ranges;
}

template <class T>
std::vector<SubcurveRange> PolycurveT<T>::GetEnabledSubpathIndices() const {
  return GetEnabledSubpathIndices(true);
}

template <class T>
int PolycurveT<T>::GetNumberOfSubpaths() const {
  return CRV_NumSubpaths(GetNodeTypes(), int(GetPointCount()));
}

template <class T>
bool PolycurveT<T>::IsSubpathStartOrEnd(unsigned long node) const {
  const unsigned long n = GetPointCount();
  if (node >= n) return false;
  NODETYPE const* nodes = GetNodeTypes();
  return node == n - 1 || IsMove(nodes[node]) || IsMove(nodes[node + 1]);
}

template <class T>
std::vector<ConstDrawCurveT<T>> PolycurveT<T>::GetSubpathCurves() const {
  std::vector<ConstDrawCurveT<T>> out;
  GetSubPaths(GetPoints(), GetNodeTypes(), int(GetPointCount()), out, -1);
  return out;
}

template <class T>
std::vector<ConstDrawCurveT<T>> PolycurveT<T>::GetEnabledSubpathCurves() const {
  std::vector<ConstDrawCurveT<T>> out;
  T const* points = GetPoints();
  NODETYPE const* nodes = GetNodeTypes();
  for (const SubcurveRange& r : GetSubpathIndices())
    if (HasNodeWithEnabled(nodes, r, true)) out.push_back({points + r.first, nodes + r.first, int(r.count), false});
  return out;
}

template <class T>
std::vector<PolycurveT<T>> PolycurveT<T>::GetSubpaths() const {
  std::vector<PolycurveT> out;
  for (const SubcurveRange& r : GetSubpathIndices())
    out.emplace_back(GetPoints() + r.first, GetNodeTypes() + r.first, r.count);
  return out;
}

template <class T>
std::vector<PolycurveT<T>> PolycurveT<T>::GetSubpathRefs() const {
  std::vector<PolycurveT> out;
  for (const SubcurveRange& r : GetSubpathIndices())
    out.emplace_back(new CurveDataRef<T>(GetPoints() + r.first, GetNodeTypes() + r.first, r.count));
  return out;
}

template <class T>
std::vector<PolycurveT<T>> PolycurveT<T>::GetLetterCurves() const {
  std::vector<PolycurveT> out;
  T const* points = GetPoints();
  NODETYPE const* nodes = GetNodeTypes();
  bool started = false;
  for (const SubcurveRange& r : GetSubpathIndices()) {
    if (IsLetterNode(nodes[r.first])) {
      out.emplace_back();
      started = true;
      if (r.count < 2) continue;
    }
    if (!started) continue;
    out.back().PushBack(points + r.first, nodes + r.first, r.count);
  }
  return out;
}

template <class T>
bool PolycurveT<T>::SpinSubpath(SubcurveRange range, unsigned long node) {
  const unsigned long n = GetPointCount();
  if (range.first >= n || range.count > n - range.first || range.count == 0) return false;
  // Checked on the bytes before the fork, so that a refusal forks nothing.
  NODETYPE const* nodes = GetNodeTypes();
  const int end = int(range.first + range.count), first = int(range.first);
  if (!IsClosedNode(nodes[first])) return false;
  const int twin = OtherClosedEnd(nodes, first, end);
  if (twin <= first || node < range.first || node > static_cast<unsigned long>(twin)) return false;
  CurveBuffer<T> buf = GetBuffer();
  return OstraCrv::SpinSubpath(buf.points, buf.nodes, end, first, int(node)) != 0;
}

template <class T>
bool PolycurveT<T>::SpinSubpath(unsigned long anyNode, unsigned long node) {
  unsigned long begin = 0, end = 0;
  if (!GetSubpathRange(anyNode, begin, end)) return false;
  return SpinSubpath(SubcurveRange{begin, end - begin}, node);
}

template <class T>
bool PolycurveT<T>::DeleteSubpath(unsigned long node) {
  unsigned long begin = 0, end = 0;
  if (!GetSubpathRange(node, begin, end)) return false;
  ForkData()->Replace(begin, end - begin, nullptr, nullptr, 0);
  return true;
}

template <class T>
bool PolycurveT<T>::SetPathStartAt(unsigned long node) {
  const unsigned long n = GetPointCount();
  if (n < 3 || node < 1 || node > n - 2) return false;
  T const* src = GetPoints();
  NODETYPE const* srcNodes = GetNodeTypes();
  std::vector<T> p(n);
  std::vector<NODETYPE> nd(n, 0);
  // node .. n-1 first, then 1 .. node-1; the old first entry is the same
  // place as the old closing entry and is dropped.
  std::copy(src + node, src + n, p.begin());
  std::copy(srcNodes + node, srcNodes + n, nd.begin());
  std::copy(src + 1, src + node, p.begin() + (n - node));
  std::copy(srcNodes + 1, srcNodes + node, nd.begin() + (n - node));
  p[n - 1] = p[0];
  nd[n - 1] = nd[0];
  nd[0] = NODETYPE((nd[0] & ~NodeMask::kType) | NodeMask::kClosed | NodeMask::kUser);
  nd[n - 1] = NODETYPE((nd[n - 1] & ~NodeMask::kUser) | NodeMask::kClosed);
  // The old closing node is an ordinary node now.
  NODETYPE& oldLast = nd[n - node - 1];
  oldLast = NODETYPE((oldLast & ~(NodeMask::kClosed | NodeMask::kType)) | NodeMask::kUser |
                     (srcNodes[n - 1] & NodeMask::kType));
  MoveData(p, nd);
  return true;
}

template <class T>
void PolycurveT<T>::Reverse() {
  const unsigned long n = GetPointCount();
  if (n == 0) return;
  CurveBuffer<T> buf = GetBuffer();
  OstraCrv::Reverse(buf.points, buf.nodes, buf.count);
}

template <class T>
PolycurveT<T> PolycurveT<T>::ExtractOpenSubpaths(bool dropDangling) {
  PolycurveT result;
  const std::vector<SubcurveRange> ranges = GetSubpathIndices();
  NODETYPE const* nodes = GetNodeTypes();
  const bool anyOpen =
      std::any_of(ranges.begin(), ranges.end(), [&](const SubcurveRange& r) { return !IsClosedNode(nodes[r.first]); });
  if (!anyOpen) return result;
  CurveBuffer<T> buf = GetBuffer();
  unsigned long kept = 0;
  for (const SubcurveRange& r : ranges) {
    if (IsClosedNode(buf.nodes[r.first])) {
      // Closed subpaths close up the gaps left by the extracted ones.
      if (kept != r.first) {
        std::copy(buf.points + r.first, buf.points + r.first + r.count, buf.points + kept);
        std::copy(buf.nodes + r.first, buf.nodes + r.first + r.count, buf.nodes + kept);
      }
      kept += r.count;
    } else if (!dropDangling || r.count >= 2) {
      result.PushBack(buf.points + r.first, buf.nodes + r.first, r.count);
    }
  }
  ReleaseBuffer(int(kept));
  return result;
}

#define OSTRACRV_SUBPATH_MEMBERS(T)                                                                              \
  template PolycurveT<T> PolycurveT<T>::GetSubpath(unsigned long) const;                                         \
  template bool PolycurveT<T>::GetSubpathRange(unsigned long, unsigned long&, unsigned long&) const;             \
  template MavikUtils::optional<MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>>>                        \
  PolycurveT<T>::GetSubpathRange(unsigned long) const;                                                           \
  template int PolycurveT<T>::FirstNodeOfSubpath(unsigned long) const;                                           \
  template int PolycurveT<T>::LastNodeOfSubpath(unsigned long) const;                                            \
  template std::vector<SubcurveRange> PolycurveT<T>::GetSubpathIndices() const;                                  \
  template std::vector<SubcurveRange> PolycurveT<T>::GetEnabledSubpathIndices(bool) const;                       \
  template std::vector<SubcurveRange> PolycurveT<T>::GetEnabledSubpathIndices() const;                           \
  template int PolycurveT<T>::GetNumberOfSubpaths() const;                                                       \
  template bool PolycurveT<T>::IsSubpathStartOrEnd(unsigned long) const;                                         \
  template std::vector<ConstDrawCurveT<T>> PolycurveT<T>::GetSubpathCurves() const;                              \
  template std::vector<ConstDrawCurveT<T>> PolycurveT<T>::GetEnabledSubpathCurves() const;                       \
  template std::vector<PolycurveT<T>> PolycurveT<T>::GetSubpaths() const;                                        \
  template std::vector<PolycurveT<T>> PolycurveT<T>::GetSubpathRefs() const;                                     \
  template std::vector<PolycurveT<T>> PolycurveT<T>::GetLetterCurves() const;                                    \
  template bool PolycurveT<T>::SpinSubpath(SubcurveRange, unsigned long);                                        \
  template bool PolycurveT<T>::SpinSubpath(unsigned long, unsigned long);                                        \
  template bool PolycurveT<T>::DeleteSubpath(unsigned long);                                                     \
  template bool PolycurveT<T>::SetPathStartAt(unsigned long);                                                    \
  template void PolycurveT<T>::Reverse();                                                                        \
  template PolycurveT<T> PolycurveT<T>::ExtractOpenSubpaths(bool);

OSTRACRV_SUBPATH_MEMBERS(POINT)
OSTRACRV_SUBPATH_MEMBERS(V)
#undef OSTRACRV_SUBPATH_MEMBERS

}  // namespace OstraCrv
