// The copy-on-write handle; see polycurve.h.
//
// Every write calls ForkData (or replaces the storage through MoveData) before
// touching an array, so storage with more than one holder is never written.
// Values passed by reference are copied before the fork, because they may live
// in the storage that the fork or a reallocation releases.
//
// Inside members the free node readers and the NodeTypes constants are named
// with a leading :: because members of the same names (GetSegmentType,
// GetContinuity, NodeTypes) hide them.
#include "ostracrv/core/polycurve.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <stdexcept>

namespace OstraCrv {

namespace {

template <class T>
T const& ZeroPoint() noexcept {
  static const T zero{};
  return zero;
}

// Converts n points of one kind to the other: exact towards doubles, half
// away from zero towards integers.
template <class To, class From>
void ConvertPoints(From const* src, To* dst, unsigned long n) noexcept {
  for (unsigned long i = 0; i < n; ++i) dst[i] = MavikMath::FromV<To>(MavikMath::ToV(src[i]));
}

// The first `size` entries of the arrays copied into p and nd, which get room
// for `capacity` entries first, so that a fork that grows next copies once.
template <class T>
void CopyWithRoom(T const* points, NODETYPE const* nodes, unsigned long size, unsigned long capacity,
                  std::vector<T>& p, std::vector<NODETYPE>& nd) {
  p.reserve(capacity);
  nd.reserve(capacity);
  if (size > 0) {
    p.assign(points, points + size);
    nd.assign(nodes, nodes + size);
  }
}

}  // namespace

// ---- Construction and lifetime ----------------------------------------------

template <class T>
PolycurveT<T>::PolycurveT() : data(new CurveData<T>()) {}

template <class T>
PolycurveT<T>::PolycurveT(unsigned long n) : data(nullptr) {
  auto d = std::make_unique<CurveData<T>>();
  if (IsPlausibleCount(n)) d->Reserve(n);
  data = d.release();
}

template <class T>
PolycurveT<T>::PolycurveT(T const* points, NODETYPE const* nodes, unsigned long n)
    : data(new CurveData<T>(points, nodes, n)) {}

template <class T>
PolycurveT<T>::PolycurveT(PolycurveT const& o) noexcept : data(o.data) {
  data->AddRef();
}

template <class T>
PolycurveT<T>::PolycurveT(PolycurveT&& o) : data(new CurveData<T>()) {
  std::swap(data, o.data);
}

template <class T>
PolycurveT<T>::PolycurveT(CurveDataBase<T>* d) : data(d ? d : new CurveData<T>()) {}

template <class T>
PolycurveT<T>::PolycurveT(PolycurveT<OtherT> const& o) : data(nullptr) {
  const unsigned long n = o.GetPointCount();
  auto d = std::make_unique<CurveData<T>>();
  if (n > 0) {
    d->Resize(n);
    ConvertPoints(o.GetPoints(), d->points.data(), n);
    std::memcpy(d->nodes.data(), o.GetNodeTypes(), n);
  }
  data = d.release();
}

template <class T>
PolycurveT<T>::~PolycurveT() {
  CurveDataBase<T>::Release(data);
}

template <class T>
PolycurveT<T>& PolycurveT<T>::operator=(PolycurveT const& o) noexcept {
  if (data != o.data) {
    o.data->AddRef();
    CurveDataBase<T>::Release(data);
    data = o.data;
  }
  return *this;
}

template <class T>
PolycurveT<T>& PolycurveT<T>::operator=(PolycurveT&& o) noexcept {
  std::swap(data, o.data);
  return *this;
}

template <class T>
void PolycurveT<T>::Swap(PolycurveT& o) noexcept {
  std::swap(data, o.data);
}

// ---- Reads -------------------------------------------------------------------

template <class T>
T const& PolycurveT<T>::GetPoint(int i) const noexcept {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return ZeroPoint<T>();
  return GetPoints()[i];
}

template <class T>
T const& PolycurveT<T>::GetFirstPoint() const noexcept {
  return IsEmpty() ? ZeroPoint<T>() : GetPoints()[0];
}

template <class T>
T const& PolycurveT<T>::GetLastPoint() const noexcept {
  const unsigned long n = GetPointCount();
  return n == 0 ? ZeroPoint<T>() : GetPoints()[n - 1];
}

template <class T>
NODETYPE const& PolycurveT<T>::GetNodeType(int i) const noexcept {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return ::NodeTypes::Open::move;
  return GetNodeTypes()[i];
}

template <class T>
MavikUtils::RangeView<T const*> PolycurveT<T>::Points() const noexcept {
  T const* p = GetPoints();
  return {p, p ? p + GetPointCount() : p};
}

template <class T>
MavikUtils::RangeView<NODETYPE const*> PolycurveT<T>::NodeTypes() const noexcept {
  NODETYPE const* n = GetNodeTypes();
  return {n, n ? n + GetPointCount() : n};
}

template <class T>
MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>> PolycurveT<T>::Indexes() const {
  return MavikUtils::Indices(0, GetPointCount());
}

template <class T>
SegmentType PolycurveT<T>::GetSegmentType(int i) const noexcept {
  return ::GetSegmentType(GetNodeType(i));
}

template <class T>
ContinuityType PolycurveT<T>::GetContinuity(int i) const noexcept {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return ContinuityType::cusp;
  return ::GetContinuity(GetNodeTypes()[i]);
}

template <class T>
bool PolycurveT<T>::IsUser(int i) const noexcept {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return false;
  return IsUserNode(GetNodeTypes()[i]);
}

template <class T>
bool PolycurveT<T>::IsClosed(int i) const noexcept {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return false;
  return IsClosedNode(GetNodeTypes()[i]);
}

template <class T>
bool PolycurveT<T>::IsLetter(int i) const noexcept {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return false;
  return IsLetterNode(GetNodeTypes()[i]);
}

template <class T>
void PolycurveT<T>::CopyTo(T* points, NODETYPE* nodes) const {
  const unsigned long n = GetPointCount();
  if (n == 0) return;
  if (points) std::memcpy(points, GetPoints(), n * sizeof(T));
  if (nodes) std::memcpy(nodes, GetNodeTypes(), n);
}

template <class T>
void PolycurveT<T>::GetCurve(std::vector<T>& points, std::vector<NODETYPE>& nodes) const {
  const unsigned long n = GetPointCount();
  if (n == 0) {
    points.clear();
    nodes.clear();
    return;
  }
  points.assign(GetPoints(), GetPoints() + n);
  nodes.assign(GetNodeTypes(), GetNodeTypes() + n);
}

// ---- Writes ------------------------------------------------------------------

template <class T>
CurveData<T>* PolycurveT<T>::ForkData() {
  data = data->Fork();
  // Fork always answers owning storage.
  return static_cast<CurveData<T>*>(data);
}

template <class T>
CurveData<T>* PolycurveT<T>::GetCurveData() {
  return ForkData();
}

template <class T>
bool PolycurveT<T>::SetPoint(int i, T const& p) {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return false;
  const T value = p;
  ForkData()->points[i] = value;
  return true;
}

template <class T>
bool PolycurveT<T>::SetNodeType(int i, NODETYPE const& n) {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return false;
  const NODETYPE value = n;
  ForkData()->nodes[i] = value;
  return true;
}

template <class T>
bool PolycurveT<T>::SetFirstPoint(T const& p) {
  return SetPoint(0, p);
}

template <class T>
bool PolycurveT<T>::SetLastPoint(T const& p) {
  const unsigned long n = GetPointCount();
  if (n == 0) return false;
  return SetPoint(int(n - 1), p);
}

template <class T>
void PolycurveT<T>::SetSegmentType(int i, SegmentType t) {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return;
  NODETYPE& b = ForkData()->nodes[i];
  b = WithSegmentType(b, t);
}

template <class T>
void PolycurveT<T>::SetNodeClosed(int i, bool closed) {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return;
  NODETYPE& b = ForkData()->nodes[i];
  b = NODETYPE(closed ? (b | NodeMask::kClosed) : (b & ~NodeMask::kClosed));
}

template <class T>
void PolycurveT<T>::SetUserNode(int i, bool user) {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return;
  NODETYPE& b = ForkData()->nodes[i];
  b = NODETYPE(user ? (b | NodeMask::kUser) : (b & ~NodeMask::kUser));
}

template <class T>
void PolycurveT<T>::SetLetter(int i, bool letter) {
  if (i < 0 || static_cast<unsigned long>(i) >= GetPointCount()) return;
  NODETYPE& b = ForkData()->nodes[i];
  b = NODETYPE(letter ? (b | NodeMask::kLetter) : (b & ~NodeMask::kLetter));
}

template <class T>
void PolycurveT<T>::SetContinuity(int i, ContinuityType c) {
  const unsigned long n = GetPointCount();
  if (i < 0 || static_cast<unsigned long>(i) >= n) return;
  CurveData<T>* d = ForkData();
  CRV_SetCont(d->nodes.data(), int(n), i, c);
}

template <class T>
bool PolycurveT<T>::ClearLetterFlags() {
  const NODETYPE* nodes = GetNodeTypes();
  const unsigned long n = GetPointCount();
  if (std::none_of(nodes, nodes + n, [](NODETYPE b) { return IsLetterNode(b); })) return false;
  for (NODETYPE& b : ForkData()->nodes) b = NODETYPE(b & ~NodeMask::kLetter);
  return true;
}

template <class T>
void PolycurveT<T>::ClearUserFlagOnArcs() {
  const NODETYPE* nodes = GetNodeTypes();
  const unsigned long n = GetPointCount();
  auto userArc = [](NODETYPE b) { return IsArc(b) && IsUserNode(b); };
  if (std::none_of(nodes, nodes + n, userArc)) return;
  for (NODETYPE& b : ForkData()->nodes)
    if (IsArc(b)) b = NODETYPE(b & ~NodeMask::kUser);
}

template <class T>
void PolycurveT<T>::Reserve(unsigned long n) {
  if (!IsPlausibleCount(n)) return;
  const unsigned long size = GetPointCount();
  if (data->IsForkRequired() && n > size) {
    // Copy once into arrays of the final capacity instead of fork-then-grow.
    std::vector<T> p;
    std::vector<NODETYPE> nd;
    CopyWithRoom(GetPoints(), GetNodeTypes(), size, n, p, nd);
    data = data->MoveData(p, nd);
    return;
  }
  ForkData()->Reserve(n);
}

template <class T>
void PolycurveT<T>::Truncate(unsigned long n) {
  if (GetPointCount() <= n) return;
  ForkData()->Truncate(n);
}

template <class T>
void PolycurveT<T>::Clear() {
  std::vector<T> p;
  std::vector<NODETYPE> nd;
  data = data->MoveData(p, nd);
}

template <class T>
void PolycurveT<T>::MoveData(std::vector<T>& points, std::vector<NODETYPE>& nodes) {
  // The arrays of a storage always have equal length.
  const size_t n = std::min(points.size(), nodes.size());
  points.resize(n);
  nodes.resize(n);
  data = data->MoveData(points, nodes);
}

template <class T>
void PolycurveT<T>::EnsureDataOwnership() {
  CurveDataBase<T>* owned = data->BreakReference();
  CurveDataBase<T>::Release(data);
  data = owned;
}

template <class T>
bool PolycurveT<T>::SetPoints(T const* points, NODETYPE const* nodes, unsigned long n) {
  if (n > 0 && (!points || !nodes || !IsPlausibleCount(n))) return false;
  if (data->IsForkRequired()) {
    // Copying the old content only to overwrite it would be wasted.
    std::vector<T> p;
    std::vector<NODETYPE> nd;
    CopyWithRoom(points, nodes, n, n, p, nd);
    data = data->MoveData(p, nd);
    return true;
  }
  CurveData<T>* d = ForkData();
  d->Replace(0, d->points.size(), points, nodes, n);
  return true;
}

template <class T>
bool PolycurveT<T>::SetPoints(std::vector<T> const& points, std::vector<NODETYPE> const& nodes) {
  if (points.empty()) return false;
  return SetPoints(points.data(), nodes.data(), std::min(points.size(), nodes.size()));
}

template <class T>
bool PolycurveT<T>::SetPoints(PolycurveT const& o) {
  if (IsSameData(o)) return true;
  return SetPoints(o.GetPoints(), o.GetNodeTypes(), o.GetPointCount());
}

template <class T>
void PolycurveT<T>::PushBack(T const& p, NODETYPE const& n) {
  const T point = p;
  const NODETYPE node = n;
  ForkData()->PushBack(point, node);
}

template <class T>
void PolycurveT<T>::Append(T const* points, NODETYPE const* nodes, unsigned long m) {
  const unsigned long size = GetPointCount();
  if (data->IsForkRequired()) {
    // Copy the old content once into arrays that already fit the new one.
    if (m > ~0ul - size) throw std::length_error("PolycurveT::PushBack");
    std::vector<T> p;
    std::vector<NODETYPE> nd;
    CopyWithRoom(GetPoints(), GetNodeTypes(), size, size + m, p, nd);
    p.insert(p.end(), points, points + m);
    nd.insert(nd.end(), nodes, nodes + m);
    data = data->MoveData(p, nd);
    return;
  }
  CurveData<T>* d = ForkData();
  d->Replace(d->points.size(), 0, points, nodes, m);
}

template <class T>
bool PolycurveT<T>::PushBack(T const* points, NODETYPE const* nodes, unsigned long n) {
  if (n == 0) return true;
  if (!points || !nodes || !IsPlausibleCount(n)) return false;
  Append(points, nodes, n);
  return true;
}

template <class T>
bool PolycurveT<T>::PushBack(std::vector<T> const& points, std::vector<NODETYPE> const& nodes) {
  if (points.empty()) return false;
  return PushBack(points.data(), nodes.data(), std::min(points.size(), nodes.size()));
}

template <class T>
bool PolycurveT<T>::PushBack(OtherT const* points, NODETYPE const* nodes, unsigned long n) {
  if (n == 0) return true;
  if (!points || !nodes || !IsPlausibleCount(n)) return false;
  std::vector<T> converted(n);
  ConvertPoints(points, converted.data(), n);
  Append(converted.data(), nodes, n);
  return true;
}

template <class T>
void PolycurveT<T>::PushBack(PolycurveT const& o) {
  if (IsEmpty()) {
    // Share instead of copying; only borrowed arrays are copied.
    *this = o;
    EnsureDataOwnership();
    return;
  }
  const unsigned long m = o.GetPointCount();
  if (m == 0) return;
  if (IsSameData(o)) {
    // Appending a curve to itself: the source must outlive the fork.
    const PolycurveT keep(o);
    Append(keep.GetPoints(), keep.GetNodeTypes(), m);
    return;
  }
  Append(o.GetPoints(), o.GetNodeTypes(), m);
}

// ---- Buffer protocol ------------------------------------------------------------

template <class T>
CurveBuffer<T> PolycurveT<T>::GetBuffer() {
  CurveData<T>* d = ForkData();
  return {d->points.data(), d->nodes.data(), int(d->points.size())};
}

template <class T>
CurveBuffer<T> PolycurveT<T>::GetBuffer(int n, bool setCount) {
  if (n < 0) return GetBuffer();
  const unsigned long want = static_cast<unsigned long>(n);
  const unsigned long size = GetPointCount();
  if (data->IsForkRequired() && size < want) {
    // Build the final arrays directly instead of copying and then growing.
    std::vector<T> p(want);
    std::vector<NODETYPE> nd(want);
    if (size > 0) {
      std::memcpy(p.data(), GetPoints(), size * sizeof(T));
      std::memcpy(nd.data(), GetNodeTypes(), size);
    }
    data = data->MoveData(p, nd);
  }
  CurveData<T>* d = ForkData();
  const unsigned long now = d->points.size();
  if (setCount ? now != want : now < want) d->Resize(want);
  return {d->points.data(), d->nodes.data(), int(d->points.size())};
}

template <class T>
void PolycurveT<T>::ReleaseBuffer(int n) {
  if (n < 0) return;
  ForkData()->Truncate(static_cast<unsigned long>(n));
}

template <class T>
bool PolycurveT<T>::ReleaseBufferInternal(int n) {
  if (n < 0) return false;
  ReleaseBuffer(n);
  return true;
}

// ---- Comparison ---------------------------------------------------------------

template <class T>
int PolycurveT<T>::Compare(PolycurveT const& o) const noexcept {
  const unsigned long n = GetPointCount(), m = o.GetPointCount();
  if (n != m) return n < m ? -1 : 1;
  if (n == 0 || IsSameData(o)) return 0;
  int c = std::memcmp(GetPoints(), o.GetPoints(), n * sizeof(T));
  if (c == 0) c = std::memcmp(GetNodeTypes(), o.GetNodeTypes(), n);
  return (c > 0) - (c < 0);
}

// ---- Derived handles ------------------------------------------------------------

template <class T>
PolycurveRefT<T>::PolycurveRefT(T const* points, NODETYPE const* nodes, unsigned long n)
    : PolycurveT<T>(new CurveDataRef<T>(points, nodes, n)) {}

template <class T>
PolylineT<T>::PolylineT(T const* points, unsigned long n, bool closed) {
  if (!points || n == 0 || !IsPlausibleCount(n)) return;
  const bool close = closed && n >= 2;
  const bool repeatFirst = close && !(points[0] == points[n - 1]);
  CurveData<T>* d = this->GetCurveData();
  d->Reserve(repeatFirst ? n + 1 : n);
  d->PushBack(points[0], close ? ::NodeTypes::Closed::move : ::NodeTypes::Open::move);
  for (unsigned long i = 1; i < n; ++i) d->PushBack(points[i], ::NodeTypes::Open::line);
  if (repeatFirst)
    d->PushBack(points[0], ::NodeTypes::Closed::line);
  else if (close)
    d->nodes[n - 1] = ::NodeTypes::Closed::line;
}

template class PolycurveT<Framework::common_types::POINT>;
template class PolycurveT<MavikMath::V>;
template class PolycurveRefT<Framework::common_types::POINT>;
template class PolycurveRefT<MavikMath::V>;
template class PolylineT<Framework::common_types::POINT>;
template class PolylineT<MavikMath::V>;

}  // namespace OstraCrv
