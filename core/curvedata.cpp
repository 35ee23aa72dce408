// Reference-counted path storage; see curvedata.h for the sharing rules.
//
// Every write here that grows an array first reserves room in both arrays, so
// that the step that may throw (allocation) runs before either array changes
// size; the later inserts and resizes of trivially copyable elements into
// reserved room cannot throw. The two arrays therefore keep equal length even
// when memory runs out.
#include "ostracrv/core/curvedata.h"

#include <algorithm>
#include <cstring>
#include <functional>
#include <memory>
#include <stdexcept>

namespace OstraCrv {

namespace {

// Whether p points into the allocation of v (its whole capacity). A source
// array that starts inside the destination must be copied out before the
// destination reallocates or shifts.
template <class E>
bool PointsInto(const E* p, const std::vector<E>& v) noexcept {
  if (!p || v.capacity() == 0) return false;
  const std::less_equal<const E*> le;
  const std::less<const E*> lt;
  return le(v.data(), p) && lt(p, v.data() + v.capacity());
}

// The MoveData of storage that must not be written in place: hands the
// caller's vectors to a new CurveData (leaving them empty) and lets go of the
// caller's reference to old. Throws std::bad_alloc with nothing changed.
template <class T>
CurveDataBase<T>* MoveIntoFresh(CurveDataBase<T>* old, std::vector<T>& p, std::vector<NODETYPE>& n) {
  auto* fresh = new CurveData<T>(std::move(p), std::move(n));
  p.clear();
  n.clear();
  CurveDataBase<T>::Release(old);
  return fresh;
}

}  // namespace

// ---- CurveDataBase ---------------------------------------------------------

template <class T>
CurveDataBase<T>::~CurveDataBase() = default;

template <class T>
void CurveDataBase<T>::Release(CurveDataBase* d) noexcept {
  if (d && d->refCount.fetch_sub(1) == 1) delete d;
}

// ---- CurveData -------------------------------------------------------------

template <class T>
CurveData<T>::CurveData(T const* p, NODETYPE const* nd, unsigned long n) {
  if (!p || !nd || n == 0 || !IsPlausibleCount(n)) return;
  points.assign(p, p + n);
  nodes.assign(nd, nd + n);
}

template <class T>
bool CurveData<T>::IsForkRequired() const {
  return this->refCount.load() > 1;
}

template <class T>
CurveDataBase<T>* CurveData<T>::Fork() {
  if (this->refCount.load() < 2) return this;
  // Copy first: if that throws, the caller keeps its reference unchanged.
  auto* copy = new CurveData<T>(points.data(), nodes.data(), points.size());
  CurveDataBase<T>::Release(this);
  return copy;
}

template <class T>
CurveDataBase<T>* CurveData<T>::MoveData(std::vector<T>& p, std::vector<NODETYPE>& n) {
  if (this->refCount.load() < 2) {
    points.swap(p);
    nodes.swap(n);
    return this;
  }
  return MoveIntoFresh(this, p, n);
}

template <class T>
T const* CurveData<T>::GetPoints() const {
  return points.empty() ? nullptr : points.data();
}

template <class T>
NODETYPE const* CurveData<T>::GetNodeTypes() const {
  return nodes.empty() ? nullptr : nodes.data();
}

template <class T>
unsigned long CurveData<T>::GetSize() const {
  return points.size();
}

template <class T>
CurveDataBase<T>* CurveData<T>::BreakReference() {
  this->AddRef();
  return this;
}

template <class T>
void CurveData<T>::Reserve(unsigned long n) {
  if (points.capacity() < n) points.reserve(n);
  if (nodes.capacity() < n) nodes.reserve(n);
}

template <class T>
void CurveData<T>::Replace(unsigned long pos, unsigned long count, T const* p, NODETYPE const* nd,
                           unsigned long m) {
  if (m > 0 && (!p || !nd || !IsPlausibleCount(m))) return;
  if (m > 0 && (PointsInto(p, points) || PointsInto(nd, nodes))) {
    // The source is (part of) this storage: take it out before shifting.
    const std::vector<T> tp(p, p + m);
    const std::vector<NODETYPE> tn(nd, nd + m);
    Replace(pos, count, tp.data(), tn.data(), m);
    return;
  }
  const unsigned long size = points.size();
  pos = std::min(pos, size);
  count = std::min(count, size - pos);
  if (count >= m) {
    if (m > 0) {
      std::memcpy(points.data() + pos, p, m * sizeof(T));
      std::memcpy(nodes.data() + pos, nd, m);
    }
    points.erase(points.begin() + long(pos + m), points.begin() + long(pos + count));
    nodes.erase(nodes.begin() + long(pos + m), nodes.begin() + long(pos + count));
    return;
  }
  if (m - count > points.max_size() - size) throw std::length_error("CurveData::Replace");
  // Grow geometrically, as PushBack does, so that a run of small inserts
  // (appending Beziers one by one) stays linear overall.
  const unsigned long need = size + (m - count);
  if (need > points.capacity()) Reserve(std::max<unsigned long>(need, 2 * points.capacity()));
  if (count > 0) {
    std::memcpy(points.data() + pos, p, count * sizeof(T));
    std::memcpy(nodes.data() + pos, nd, count);
  }
  points.insert(points.begin() + long(pos + count), p + count, p + m);
  nodes.insert(nodes.begin() + long(pos + count), nd + count, nd + m);
}

template <class T>
void CurveData<T>::PushBack(T const& p, NODETYPE nd) {
  const T value = p;  // p may live in points, which may move below
  if (points.size() == points.capacity()) points.reserve(std::max<size_t>(1, points.capacity() * 2));
  if (nodes.size() == nodes.capacity()) nodes.reserve(std::max<size_t>(1, nodes.capacity() * 2));
  points.push_back(value);
  nodes.push_back(nd);
}

template <class T>
void CurveData<T>::Resize(unsigned long n) {
  Reserve(n);
  points.resize(n);
  nodes.resize(n);
}

template <class T>
void CurveData<T>::Truncate(unsigned long n) noexcept {
  if (points.size() > n) points.resize(n);
  if (nodes.size() > n) nodes.resize(n);
}

// ---- CurveDataRef ----------------------------------------------------------

template <class T>
CurveDataRef<T>::CurveDataRef(T const* p, NODETYPE const* nd, unsigned long n) noexcept {
  if (!p || !nd || n == 0 || !IsPlausibleCount(n)) return;
  points = p;
  nodes = nd;
  size = n;
}

template <class T>
bool CurveDataRef<T>::IsForkRequired() const {
  return true;
}

template <class T>
CurveDataBase<T>* CurveDataRef<T>::Fork() {
  auto* copy = (points && nodes) ? new CurveData<T>(points, nodes, size) : new CurveData<T>();
  CurveDataBase<T>::Release(this);
  return copy;
}

template <class T>
CurveDataBase<T>* CurveDataRef<T>::MoveData(std::vector<T>& p, std::vector<NODETYPE>& n) {
  return MoveIntoFresh(this, p, n);
}

template <class T>
T const* CurveDataRef<T>::GetPoints() const {
  return size ? points : nullptr;
}

template <class T>
NODETYPE const* CurveDataRef<T>::GetNodeTypes() const {
  return size ? nodes : nullptr;
}

template <class T>
unsigned long CurveDataRef<T>::GetSize() const {
  return size;
}

template <class T>
CurveDataBase<T>* CurveDataRef<T>::BreakReference() {
  return new CurveData<T>(points, nodes, size);
}

template class CurveDataBase<Framework::common_types::POINT>;
template class CurveDataBase<MavikMath::V>;
template class CurveData<Framework::common_types::POINT>;
template class CurveData<MavikMath::V>;
template class CurveDataRef<Framework::common_types::POINT>;
template class CurveDataRef<MavikMath::V>;

}  // namespace OstraCrv
