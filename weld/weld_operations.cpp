// The set operations of PolycurveT: union, intersection, difference and
// exclusive or, each as build graph, weld with the operation's keep rule,
// generate the output.
//
// Both operands are widened to double curves (exactly, for integer points);
// open subpaths take no part. The welding up-scale is an offer to hosts: 2^28
// is the coordinate range in which the weld tolerances (about 1.4 units) are
// small and double arithmetic on products of coordinates keeps about 1e-8
// units of precision.
#include <cmath>
#include <memory>
#include <utility>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/weld/keep_rules.h"
#include "ostracrv/weld/weldstate.h"
#include "weld_internal.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr double kUpScaleRange = 268435456.0;  // 2^28

template <class T>
PolycurveT<V> Widened(PolycurveT<T> const& c) {
  if constexpr (std::is_same_v<T, V>)
    return c;
  else
    return PolycurveT<V>(c);
}

// How much of an operand's outline an attempt may move to get rid of short
// segments, for a caller that asked for precise welding: a ten-millionth of
// the operands' extent.
constexpr double kPreciseCollapse = 1e-7;

double Extent(PolycurveT<V> const& a, PolycurveT<V> const& b) {
  MavikMath::BoundsT<double> box;
  for (PolycurveT<V> const* c : {&a, &b})
    for (unsigned long i = 0; i < c->GetPointCount(); ++i)
      if (std::isfinite(c->GetPoint(int(i)).x) && std::isfinite(c->GetPoint(int(i)).y)) box.Add(c->GetPoint(int(i)));
  return box.IsEmpty() ? 0.0 : std::fmax(box.Width(), box.Height());
}

// Closes every open subpath of a result with a line back to its start; one
// of fewer than three nodes, which bounds nothing, goes.
template <class T>
void CloseAll(PolycurveT<T>& r) {
  PolycurveT<T> out;
  for (PolycurveT<T>& s : r.GetSubpaths()) {
    if (!s.IsClosed(0)) {
      if (s.GetPointCount() < 3) continue;
      s.CloseOpenSubpaths(false);
    }
    out.PushBack(s);
  }
  r = out;
}

template <class T>
PolycurveT<T> Weld(PolycurveT<T> const& first, PolycurveT<T> const& second, bool firstNonZero, bool secondNonZero,
                   WeldFlags flags, WeldKeepRule rule) {
  const PolycurveT<V> a = Widened(first), b = Widened(second);
  // An attempt is sound when every count came back to its start round its
  // loop and every loop closed. One whose counts did not come back is not
  // sound whatever its loops do: its output is needed only if no later
  // attempt is sound, so it is generated only then (its graph is kept
  // meanwhile), and a sound retry costs no output walk of the failed graph.
  // A graph found inconsistent while its sides are filled is not welded
  // either until then.
  struct Attempt {
    std::unique_ptr<WeldStateData> pending;  // graph whose output is not yet walked
    bool welded = false;                     // PerformWeld has run on it
    PolycurveT<T> result;
    bool sound = false;
    bool closed = false;
  };
  auto finish = [&](Attempt& at) {
    if (!at.pending) return;
    if (!at.welded) at.pending->PerformWeld(rule);
    at.result = at.pending->template GenerateOutputCurve<T>(false);
    at.closed = at.pending->UnclosedLoops() == 0;
    at.sound = false;
    at.pending.reset();
  };
  auto run = [&](PolycurveT<V> const& x, PolycurveT<V> const& y, WeldFlags f) {
    auto state = std::make_unique<WeldStateData>(x, firstNonZero, y, secondNonZero, false, false, f);
    Attempt at;
    if (state->IsConsistent()) {
      state->PerformWeld(rule);
      at.welded = true;
    }
    if (!state->IsConsistent()) {
      at.pending = std::move(state);
      return at;
    }
    at.result = state->GenerateOutputCurve<T>(false);
    at.closed = state->UnclosedLoops() == 0;
    at.sound = at.closed;
    return at;
  };
  // Where curves pass within the weld tolerance of each other's nodes, the
  // graph can miss one side of a meeting (a crossing next to a node taken
  // for the touch there, or the touch for the crossing): the counts then
  // disagree round a loop, or the kept edges do not join into loops. The
  // operation is then done again: at the precise tolerance, where such near
  // misses are plain crossings; and on operands without segments shorter
  // than the tolerance, where nodes closer than it are one point, as the
  // tolerance means them to be. The first sound attempt stands; if none is,
  // the first whose loops all closed, else the first, with its open loops
  // closed by a line.
  const bool precise = HasWeldFlag(flags, WeldFlags::Precise);
  Attempt best = run(a, b, flags);
  if (best.sound) return best.result;
  auto consider = [&](Attempt&& at) {
    if (at.sound) {
      best = std::move(at);
      return true;
    }
    // Only the first attempt, whose operands outlive every other, may stay
    // pending: a later one is walked here.
    finish(at);
    finish(best);
    if (at.closed && !best.closed) best = std::move(at);
    return false;
  };
  if (!precise && consider(run(a, b, flags | WeldFlags::Precise))) return best.result;
  const double collapse = precise ? kPreciseCollapse * Extent(a, b) : kWeldTolerance;
  if (collapse > 0.0) {
    const PolycurveT<V> ca = weld_detail::CollapseShortSegments(a, collapse);
    const PolycurveT<V> cb = weld_detail::CollapseShortSegments(b, collapse);
    if (!ca.IsSameData(a) || !cb.IsSameData(b)) {
      if (consider(run(ca, cb, flags))) return best.result;
      if (!precise && consider(run(ca, cb, flags | WeldFlags::Precise))) return best.result;
    }
  }
  finish(best);
  if (!best.closed) CloseAll(best.result);
  return best.result;
}

}  // namespace

template <class T>
PolycurveT<T> PolycurveT<T>::Union(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                                   bool secondNonZero, WeldFlags flags) {
  return Weld(first, second, firstNonZero, secondNonZero, flags, &UnionKeepRule);
}

template <class T>
PolycurveT<T> PolycurveT<T>::Intersect(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                                       bool secondNonZero, WeldFlags flags) {
  return Weld(first, second, firstNonZero, secondNonZero, flags, &IntersectKeepRule);
}

template <class T>
PolycurveT<T> PolycurveT<T>::Subtract(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                                      bool secondNonZero, WeldFlags flags) {
  return Weld(first, second, firstNonZero, secondNonZero, flags, &SubtractKeepRule);
}

template <class T>
PolycurveT<T> PolycurveT<T>::Xor(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                                 bool secondNonZero, WeldFlags flags) {
  return Weld(first, second, firstNonZero, secondNonZero, flags, &XorKeepRule);
}

template <class T>
double PolycurveT<T>::GetWeldingUpScale() const {
  const unsigned long n = GetPointCount();
  if (n == 0) return 1.0;
  T const* p = GetPoints();
  double minX = double(p[0].x), maxX = minX, minY = double(p[0].y), maxY = minY;
  for (unsigned long i = 1; i < n; ++i) {
    minX = std::fmin(minX, double(p[i].x));
    maxX = std::fmax(maxX, double(p[i].x));
    minY = std::fmin(minY, double(p[i].y));
    maxY = std::fmax(maxY, double(p[i].y));
  }
  const double width = maxX - minX, height = maxY - minY;
  if (!(width > MavikMath::kEpsilon) || !(height > MavikMath::kEpsilon)) return 1.0;
  // The largest y does not enter: the range is measured from the other
  // three extremes and the two extents.
  const double m = std::fmax(std::fmax(std::fmax(std::fabs(minX), std::fabs(maxX)), std::fmax(width, std::fabs(minY))),
                             height);
  if (!(m <= kUpScaleRange)) return 1.0;
  return kUpScaleRange / m;
}

#define OSTRACRV_WELD_OPERATIONS(T)                                                                         \
  template PolycurveT<T> PolycurveT<T>::Union(PolycurveT const&, PolycurveT const&, bool, bool, WeldFlags);     \
  template PolycurveT<T> PolycurveT<T>::Intersect(PolycurveT const&, PolycurveT const&, bool, bool, WeldFlags); \
  template PolycurveT<T> PolycurveT<T>::Subtract(PolycurveT const&, PolycurveT const&, bool, bool, WeldFlags);  \
  template PolycurveT<T> PolycurveT<T>::Xor(PolycurveT const&, PolycurveT const&, bool, bool, WeldFlags);       \
  template double PolycurveT<T>::GetWeldingUpScale() const;
OSTRACRV_WELD_OPERATIONS(POINT)
OSTRACRV_WELD_OPERATIONS(V)
#undef OSTRACRV_WELD_OPERATIONS

}  // namespace OstraCrv
