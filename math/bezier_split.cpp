// De Casteljau cutting; see bezier_split.h.
#include "ostracrv/math/bezier_split.h"

#include <utility>

#include "bezier_common.h"

namespace MavikMath::CubicBezier {

namespace {

using Framework::common_types::POINT;
using internal::SplitPoints;

template <class T>
void Load(const T* p, V* v) noexcept {
  for (int i = 0; i < 4; ++i) v[i] = ToV(p[i]);
}

// Writes doubles back; for integer output the input's own end points are
// kept exactly where they are copied.
template <class T>
void Store(const V* v, T* out, int count) noexcept {
  for (int i = 0; i < count; ++i) out[i] = FromV<T>(v[i]);
}

// The seven points of the Bezier cut at t (left part o[0..3], right part
// o[3..6]), in doubles; p may be the array the caller writes to afterwards.
template <class T>
void CutAt(double t, const T* p, V* o) noexcept {
  V in[4];
  Load(p, in);
  SplitPoints(in, t, o);
}

}  // namespace

template <class T>
void Split(double t, const T* p, T* left, T* right) noexcept {
  V o[7];
  CutAt(t, p, o);
  Store(o, left, 4);
  Store(o + 3, right, 4);
}

template <class T>
void Split(double t, const T* p, T* out) noexcept {
  V o[7];
  CutAt(t, p, o);
  Store(o, out, 7);
}

template <class T>
void Split(double t1, double t2, const T* p, T* out) noexcept {
  if (t2 < t1) std::swap(t1, t2);
  V first[7], second[7];
  CutAt(t1, p, first);
  // The second cut lies on the right part at the rescaled parameter; when t1
  // is 1 the right part is a point and any parameter gives it.
  const double rest = 1.0 - t1;
  const double u = rest > 0.0 ? (t2 - t1) / rest : 0.0;
  SplitPoints(first + 3, u, second);
  V o[10];
  for (int i = 0; i < 4; ++i) o[i] = first[i];
  for (int i = 1; i < 7; ++i) o[3 + i] = second[i];
  Store(o, out, 10);
}

template <class T>
void LeftOf(double t, const T* p, T* out) noexcept {
  V o[7];
  CutAt(t, p, o);
  Store(o, out, 4);
}

template <class T>
void RightOf(double t, const T* p, T* out) noexcept {
  V o[7];
  CutAt(t, p, o);
  Store(o + 3, out, 4);
}

template <class T>
void Subsection(double t0, double t1, const T* p, T* out) noexcept {
  V in[4], a[7], b[7];
  Load(p, in);
  if (t1 < t0) {
    // The backward piece is the forward piece reversed; cutting it directly
    // would extrapolate the short right part far outside its own range.
    V o[4];
    Subsection(t1, t0, in, o);
    const V r[4] = {o[3], o[2], o[1], o[0]};
    Store(r, out, 4);
    return;
  }
  if (t0 == 0.0) {
    SplitPoints(in, t1, a);
    Store(a, out, 4);
    return;
  }
  // Right of t0, then the left part of that up to t1 rescaled.
  SplitPoints(in, t0, a);
  if (t1 == 1.0) {
    Store(a + 3, out, 4);
    return;
  }
  const double rest = 1.0 - t0;
  const double u = rest != 0.0 ? (t1 - t0) / rest : 0.0;
  SplitPoints(a + 3, u, b);
  Store(b, out, 4);
}

#define OSTRACRV_INSTANTIATE(T)                                  \
  template void Split<T>(double, const T*, T*, T*) noexcept;     \
  template void Split<T>(double, const T*, T*) noexcept;         \
  template void Split<T>(double, double, const T*, T*) noexcept; \
  template void LeftOf<T>(double, const T*, T*) noexcept;        \
  template void RightOf<T>(double, const T*, T*) noexcept;       \
  template void Subsection<T>(double, double, const T*, T*) noexcept;
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace MavikMath::CubicBezier
