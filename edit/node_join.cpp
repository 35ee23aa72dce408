// Joining open subpath ends.
//
// Two ends of one open subpath close it: the ends meet at their midpoint and
// become the twins of a closed subpath. Ends of two subpaths make one
// subpath: the subpaths are turned so that the path runs out of a and into b,
// then b's subpath, without its move, is moved behind a. The nodes of b's
// subpath are copied out to temporary memory first, so that a failed
// allocation leaves the path untouched.
//
// Joining with lines (addLine) keeps both ends where they are and bridges the
// gap with a straight segment that the user sees as a new node.
//
// Each join shifts the arrays once, O(n). Closing every selected open
// subpath re-reads the path from the front after each closing (a closing
// grows the path by the added line and its tidy-up may drop stray moves
// anywhere), O(n) per subpath closed, like the tidy-up itself.
#include <algorithm>
#include <cstdlib>
#include <utility>

#include "ostracrv/core/path_reverse.h"
#include "ostracrv/edit/node_edits.h"
#include "ostracrv/repair/clean_path.h"

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr NODETYPE kOpenLine = NodeMask::kLine;
constexpr NODETYPE kEnabledUser = NodeMask::kEnabled | NodeMask::kUser;

// (a + b) / 2; the integer form truncates the halved double sum.
template <class T>
T midpoint(const T& a, const T& b) noexcept {
  if constexpr (MavikMath::IsIntegerPoint<T>) {
    return T{int32_t((double(a.x) + double(b.x)) * 0.5), int32_t((double(a.y) + double(b.y)) * 0.5)};
  } else {
    return T{(a.x + b.x) * 0.5, (a.y + b.y) * 0.5};
  }
}

bool isOpenEnd(NODETYPE const* nodes, int n, int i) {
  return i >= 0 && i < n && !IsArc(nodes[i]) && CRV_IsFirstOrLastOpenSubpathNode(nodes, n, i);
}

int firstOf(NODETYPE const* nodes, int n, int i) { return CRV_FirstNodeOfThisSubpath(nodes, n, i); }
int lastOf(NODETYPE const* nodes, int n, int i) { return CRV_LastNodeOfThisSubpath(nodes, n, i); }

// Frees both on leaving scope.
struct TempCopy {
  void* points = nullptr;
  void* nodes = nullptr;
  ~TempCopy() {
    std::free(points);
    std::free(nodes);
  }
};

}  // namespace

template <class T>
int CRV_JoinTwoNodesExt(T* points, NODETYPE* nodes, int n, int a, int b, int* joined) {
  if (!points || !nodes || n < 1) return -2;
  if (a == b || !isOpenEnd(nodes, n, a) || !isOpenEnd(nodes, n, b)) return -2;
  const int fa = firstOf(nodes, n, a), la = lastOf(nodes, n, a);
  const int fb = firstOf(nodes, n, b), lb = lastOf(nodes, n, b);
  if (fa < 0 || fb < 0) return -2;

  if (fa == fb) {
    // The two ends of one subpath: it closes at their midpoint.
    const int lo = std::min(a, b), hi = std::max(a, b);
    const T m = midpoint(points[lo], points[hi]);
    points[lo] = points[hi] = m;
    nodes[lo] = NODETYPE(nodes[lo] | NodeMask::kClosed);
    nodes[hi] = NODETYPE((nodes[hi] | NodeMask::kClosed) & ~NodeMask::kUser);
    // The tidy-up drops a stray move in front of each move that follows it
    // directly (not in a text); the joined node moves down by those in front.
    int dropped = 0;
    if (!IsLetterNode(nodes[0]))
      for (int j = 0; j < lo; ++j) dropped += IsMove(nodes[j]) && IsMove(nodes[j + 1]);
    const int r = OstraCrv::CleansPath(points, nodes, n);
    if (joined) *joined = lo - dropped;
    return r;
  }

  // b's subpath without its move, copied out before anything changes.
  const int stretch = lb - fb;
  TempCopy tmp;
  if (stretch > 0) {
    tmp.points = std::malloc(sizeof(T) * std::size_t(stretch));
    tmp.nodes = std::malloc(std::size_t(stretch));
    if (!tmp.points || !tmp.nodes) return -1;
  }
  // Run out of a and into b.
  const bool turnA = a == fa && fa != la;
  const bool turnB = b == lb && fb != lb;
  if (turnA) {
    OstraCrv::Reverse(points, nodes, fa, la);
    a = la;
  }
  if (turnB) {
    OstraCrv::Reverse(points, nodes, fb, lb);
    b = fb;
  }
  const T m = midpoint(points[a], points[b]);
  points[a] = points[b] = m;

  T* tp = static_cast<T*>(tmp.points);
  NODETYPE* tn = static_cast<NODETYPE*>(tmp.nodes);
  if (stretch > 0) {
    std::copy(points + fb + 1, points + lb + 1, tp);
    std::copy(nodes + fb + 1, nodes + lb + 1, tn);
  }
  // Take b's subpath out, move and all, then put its stretch behind a.
  int count = n;
  PathDelNext(nodes, points, fb, stretch + 1, count);
  count -= stretch + 1;
  if (fb < a) a -= stretch + 1;
  if (stretch > 0) count = CRV_Append(points, nodes, count, a + 1, tp, tn, stretch, 0);

  if (turnA && turnB) {
    // Both were turned: turn the joined subpath back to b's direction.
    const int f = firstOf(nodes, count, a), l = lastOf(nodes, count, a);
    OstraCrv::Reverse(points, nodes, f, l);
    a = f + l - a;
  }
  if (joined) *joined = a;
  return count;
}

template <class T>
int CRV_JoinTwoNodes(T* points, NODETYPE* nodes, int n, int a, int b) {
  return CRV_JoinTwoNodesExt(points, nodes, n, a, b, nullptr);
}

template <class T>
int crvJoinTwoNodes(T* points, NODETYPE* nodes, int n, int a, int b, bool addLine) {
  if (!addLine) return CRV_JoinTwoNodesExt(points, nodes, n, a, b, nullptr);
  if (!points || !nodes || n < 1 || a == b || !isOpenEnd(nodes, n, a) || !isOpenEnd(nodes, n, b)) return -1;
  if (points[a] == points[b]) return CRV_JoinTwoNodesExt(points, nodes, n, a, b, nullptr);

  const bool atLast = CRV_IsLastOpenSubpathNode(nodes, n, a);
  const NODETYPE bits = NODETYPE(nodes[a] & kEnabledUser);
  const T oldA = points[a];
  // The bridge: behind a, a line to b's point; or, at the first node, a line
  // from b's point (where a moves to) back to a's old point.
  const int m = CRV_AppendLine(points, nodes, n, a + 1, atLast ? points[b] : oldA);
  if (m < 0) return -1;
  nodes[a + 1] = NODETYPE(kOpenLine | bits);
  if (b > a) ++b;
  if (!atLast) points[a] = points[b];
  const int joinAt = atLast ? a + 1 : a;
  const int r = CRV_JoinTwoNodesExt(points, nodes, m, joinAt, b, nullptr);
  if (r < 0) {
    // Only an allocation failure gets here: take the bridge away again.
    points[a] = oldA;
    PathDelNext(nodes, points, a + 1, 1, m);
  }
  return r;
}

template <class T>
int crvJoinEnabled(T* points, NODETYPE* nodes, int n, bool addLines) {
  if (!points || !nodes || n < 1) return -2;
  int ends = 0, a = -1, b = -1;
  for (int i = 0; i < n; ++i) {
    if (!IsEnabledNode(nodes[i]) || !isOpenEnd(nodes, n, i)) continue;
    if (ends == 0) a = i;
    else if (ends == 1) b = i;
    ++ends;
  }
  if (ends < 2) return -2;
  if (ends == 2) {
    // The two ends of a single segment would close onto that segment; only a
    // Bezier can, with a line back.
    if (!IsMove(nodes[b]) && b == NNControl(nodes, a, n) && (!addLines || !IsCurve(nodes[b]))) return n;
    return crvJoinTwoNodes(points, nodes, n, a, b, addLines);
  }

  int i = 0;
  while (i < n) {
    if (!(IsMove(nodes[i]) && !IsClosedNode(nodes[i]) && IsEnabledNode(nodes[i]))) {
      ++i;
      continue;
    }
    const int first = i;
    const int l = lastOf(nodes, n, first);
    if (first == 0 && l == n - 1 && l > first && points[0] == points[l]) {
      // One subpath whose ends already meet: close it in place.
      nodes[0] = NODETYPE(nodes[0] | NodeMask::kClosed | NodeMask::kUser);
      nodes[l] = NODETYPE((nodes[l] | NodeMask::kClosed) & ~NodeMask::kUser);
      return n;
    }
    if (l > first && IsEnabledNode(nodes[l]) &&
        (NNControl(nodes, first, n) != l || (addLines && IsCurve(nodes[l])))) {
      const int r = crvJoinTwoNodes(points, nodes, n, first, l, addLines);
      if (r < 0) return n;  // the walk stops; what is closed stays closed
      if (r == 0) return 0;
      n = r;
      i = 0;  // the subpath is closed now and will be passed over
      continue;
    }
    i = l + 1;
  }
  return n;
}

template <class T>
int CRV_JoinEnabled(T* points, NODETYPE* nodes, int n) {
  return crvJoinEnabled(points, nodes, n, false);
}

template <class T>
int CRV_JoinEnabledAddingLineSegments(T* points, NODETYPE* nodes, int n) {
  return crvJoinEnabled(points, nodes, n, true);
}

template <class T>
int CRV_JoinTwoNodesWithOpenSubpathExt(T* points, NODETYPE* nodes, int n, int* pa, int* pb, int* pc, int* pd) {
  if (!points || !nodes || n < 1 || !pa || !pb || !pc || !pd) return -1;
  int a = *pa, b = *pb, c = *pc, d = *pd;
  if (!isOpenEnd(nodes, n, a) || !isOpenEnd(nodes, n, b) || !isOpenEnd(nodes, n, c) || !isOpenEnd(nodes, n, d))
    return -1;
  const int fa = firstOf(nodes, n, a), la = lastOf(nodes, n, a);
  const int fb = firstOf(nodes, n, b);
  const int fc = firstOf(nodes, n, c), lc = lastOf(nodes, n, c);
  if (a == b || c == d || firstOf(nodes, n, d) != fc || fc == fa || fc == fb) return -1;

  // 1. a ends its subpath, b starts its own, c starts the inserted one.
  if (a == fa && fa != la) {
    OstraCrv::Reverse(points, nodes, fa, la);
    if (fb == fa) b = fa + la - b;
    a = la;
  }
  {
    const int lb = lastOf(nodes, n, b);
    const int fb2 = firstOf(nodes, n, b);
    if (b == lb && fb2 != lb) {
      OstraCrv::Reverse(points, nodes, fb2, lb);
      b = fb2;
    }
  }
  if (c == lc) {
    OstraCrv::Reverse(points, nodes, fc, lc);
    std::swap(c, d);
  }

  // 2. a and c: c's subpath [fc, lc] of k nodes leaves its place, and its
  // k-1 nodes behind c follow a.
  int joinedA = -1;
  const int r = CRV_JoinTwoNodesExt(points, nodes, n, a, c, &joinedA);
  if (r < 0) return r;
  // 3. The indices after that move.
  const int k = lc - fc + 1;
  const int a2 = joinedA;
  d = a2 + (k - 1);
  if (b > lc) b -= k;
  if (b > a2) b += k - 1;

  // 4. d and b.
  const int fb3 = firstOf(nodes, r, b), lb3 = lastOf(nodes, r, b);
  const bool closing = fb3 == firstOf(nodes, r, d);
  int joinedD = -1;
  const int r2 = CRV_JoinTwoNodesExt(points, nodes, r, d, b, &joinedD);
  if (r2 < 0) {
    *pa = *pc = a2;
    *pd = d;
    *pb = b;
    return r;
  }
  // 5. The positions after both joins.
  if (closing) {
    // b is the subpath's first node and a2, d lie inside it: all moved down
    // by the stray moves the tidy-up dropped in front.
    const int shift = b - joinedD;
    *pa = *pc = a2 - shift;
    *pd = d - shift;
    *pb = joinedD;
  } else {
    const int kb = lb3 - fb3 + 1;
    *pa = *pc = a2 > lb3 ? a2 - kb : a2;
    *pd = *pb = joinedD;
  }
  return r2;
}

template <class T>
int CRV_JoinTwoNodesWithOpenSubpath(T* points, NODETYPE* nodes, int n, int a, int b, int c, int d) {
  auto valid = [n](int i) { return i >= 0 && i < n; };
  if (valid(a) && valid(b) && valid(c) && valid(d))
    return CRV_JoinTwoNodesWithOpenSubpathExt(points, nodes, n, &a, &b, &c, &d);
  if (valid(a) && valid(c)) return CRV_JoinTwoNodesExt(points, nodes, n, a, c, nullptr);
  if (valid(d) && valid(b)) return CRV_JoinTwoNodesExt(points, nodes, n, d, b, nullptr);
  return -1;
}

#define OSTRACRV_JOIN(T)                                                                      \
  template int CRV_JoinTwoNodesExt<T>(T*, NODETYPE*, int, int, int, int*);                    \
  template int CRV_JoinTwoNodes<T>(T*, NODETYPE*, int, int, int);                             \
  template int crvJoinTwoNodes<T>(T*, NODETYPE*, int, int, int, bool);                        \
  template int crvJoinEnabled<T>(T*, NODETYPE*, int, bool);                                   \
  template int CRV_JoinEnabled<T>(T*, NODETYPE*, int);                                        \
  template int CRV_JoinEnabledAddingLineSegments<T>(T*, NODETYPE*, int);                      \
  template int CRV_JoinTwoNodesWithOpenSubpathExt<T>(T*, NODETYPE*, int, int*, int*, int*, int*); \
  template int CRV_JoinTwoNodesWithOpenSubpath<T>(T*, NODETYPE*, int, int, int, int, int);

OSTRACRV_JOIN(POINT)
OSTRACRV_JOIN(V)
#undef OSTRACRV_JOIN
