// Raw moves of stretches of a path's two parallel arrays.
//
// Points and node bytes always move together so that nodes[i] keeps
// describing points[i]. Every move is overlap-safe (memmove), so a stretch
// may slide within one path in either direction. No flag is touched and no
// length is changed: the caller owns both arrays, has made room before opening
// a gap, and fixes flags and the count afterwards. O(count), no allocation.
//
// Bad arguments (null arrays, negative indices or counts, a tail that would
// lie before the array start) move nothing.
#include <cstring>
#include <type_traits>

#include "ostracrv/core/nodetype.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;

template <class T>
void moveEntries(T* dstPoints, NODETYPE* dstNodes, long long to, T const* srcPoints, NODETYPE const* srcNodes,
                 long long from, long long count) noexcept {
  static_assert(std::is_trivially_copyable_v<T>);
  if (!dstPoints || !dstNodes || !srcPoints || !srcNodes) return;
  if (to < 0 || from < 0 || count <= 0) return;
  std::memmove(dstPoints + to, srcPoints + from, static_cast<std::size_t>(count) * sizeof(T));
  std::memmove(dstNodes + to, srcNodes + from, static_cast<std::size_t>(count));
}

}  // namespace

namespace OstraCrv {

template <class T>
void MovePath(T* points, NODETYPE* nodes, int to, int from, int count) {
  moveEntries<T>(points, nodes, to, points, nodes, from, count);
}

template <class T>
void CopyPath(T* dstPoints, NODETYPE* dstNodes, int to, T const* srcPoints, NODETYPE const* srcNodes, int from,
              int count) {
  moveEntries<T>(dstPoints, dstNodes, to, srcPoints, srcNodes, from, count);
}

template void MovePath<POINT>(POINT*, NODETYPE*, int, int, int);
template void MovePath<V>(V*, NODETYPE*, int, int, int);
template void CopyPath<POINT>(POINT*, NODETYPE*, int, POINT const*, NODETYPE const*, int, int);
template void CopyPath<V>(V*, NODETYPE*, int, V const*, NODETYPE const*, int, int);

}  // namespace OstraCrv

// Closes a gap of count entries at i: the tail from i+count slides down to i.
template <class T>
void PathDelNext(NODETYPE* nodes, T* points, int i, int count, int n) {
  if (i < 0 || count <= 0) return;
  const long long from = static_cast<long long>(i) + count;
  moveEntries<T>(points, nodes, i, points, nodes, from, n - from);
}

// Opens a gap of count entries at i: the tail from i slides up by count; the
// entries of the gap keep what they held.
template <class T>
void PathInsNext(NODETYPE* nodes, T* points, int i, int count, int n) {
  if (i < 0 || count <= 0) return;
  moveEntries<T>(points, nodes, static_cast<long long>(i) + count, points, nodes, i,
                 static_cast<long long>(n) - i);
}

template void PathDelNext<POINT>(NODETYPE*, POINT*, int, int, int);
template void PathDelNext<V>(NODETYPE*, V*, int, int, int);
template void PathInsNext<POINT>(NODETYPE*, POINT*, int, int, int);
template void PathInsNext<V>(NODETYPE*, V*, int, int, int);
