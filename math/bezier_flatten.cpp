// Flattening by the second-difference bound; see bezier_flatten.h.
//
// Constants:
// - kRounding = 0.7072: just above sqrt(2)/2, the largest distance by which
//   rounding a double point to the integer grid moves it.
// - kMaxDepth = 30: pieces are halved at most this often; deeper halving
//   cannot pay, since a piece of 2^-30 of the range needs one chord for any
//   tolerance above 1e-18 of the curve's size.
// - kMaxSteps = 2^30: the cap on one piece's equal-step count, so that an
//   absurd tolerance cannot overflow an int (the budget stops it far sooner).
#include "ostracrv/math/bezier_flatten.h"

#include <algorithm>
#include <cmath>

#include "bezier_common.h"
#include "ostracrv/math/bezier_basis.h"

namespace MavikMath {

namespace {

using CubicBezier::internal::LoadFinite;
using CubicBezier::internal::SplitPoints;
using Framework::common_types::POINT;
using Framework::common_types::RECT;

constexpr double kRounding = 0.7072;
constexpr int kMaxDepth = 30;
constexpr double kMaxSteps = 1073741824.0;

double SecondDifference(const V* q) noexcept {
  const double x0 = q[0].x - 2.0 * q[1].x + q[2].x, y0 = q[0].y - 2.0 * q[1].y + q[2].y;
  const double x1 = q[1].x - 2.0 * q[2].x + q[3].x, y1 = q[1].y - 2.0 * q[2].y + q[3].y;
  return std::sqrt(std::max(x0 * x0 + y0 * y0, x1 * x1 + y1 * y1));
}

// Equal steps that keep the piece within tol of its chords, as a double.
double Steps(const V* q, double tol) noexcept {
  const double k = std::ceil(std::sqrt(0.75 * SecondDifference(q) / tol));
  if (!(k >= 1.0)) return 1.0;  // also NaN from overflowing coordinates
  return std::min(k, kMaxSteps);
}

// Calls emit(point, isLast) for each vertex after the start, in order; stops
// early, returning false, when emit does.
template <class Emit>
bool Flatten(const V* p, double tol, Emit&& emit) noexcept {
  struct Piece {
    V q[4];
    int depth;
  };
  Piece stack[kMaxDepth + 2];
  int top = 0;
  stack[top++] = Piece{{p[0], p[1], p[2], p[3]}, 0};
  while (top > 0) {
    const Piece piece = stack[--top];
    const bool lastPiece = top == 0;
    const double k = Steps(piece.q, tol);
    if (k > 1.0 && piece.depth < kMaxDepth) {
      V o[7];
      SplitPoints(piece.q, 0.5, o);
      const Piece left{{o[0], o[1], o[2], o[3]}, piece.depth + 1}, right{{o[3], o[4], o[5], o[6]}, piece.depth + 1};
      if (Steps(left.q, tol) + Steps(right.q, tol) < k) {
        stack[top++] = right;
        stack[top++] = left;
        continue;
      }
    }
    const long steps = static_cast<long>(k);
    for (long j = 1; j < steps; ++j)
      if (!emit(CubicBezier::Evaluate(piece.q, double(j) / double(steps)), false)) return false;
    if (!emit(piece.q[3], lastPiece)) return false;
  }
  return true;
}

}  // namespace

template <class T>
int BezierToLines(const T* p, T* out, int lines) noexcept {
  if (!out || lines < 1) return 0;
  V q[4];
  if (!LoadFinite(p, q)) return 0;
  out[0] = p[0];
  for (int i = 1; i < lines; ++i) out[i] = FromV<T>(CubicBezier::Evaluate(q, double(i) / double(lines)));
  out[lines] = p[3];
  return lines + 1;
}

template <class T>
int AdaptiveBezierToLines(const T* p, T* out, double tolerance, int maximum) noexcept {
  if (!out || maximum < 2 || !(tolerance > 0.0) || !std::isfinite(tolerance)) return 0;
  V q[4];
  if (!LoadFinite(p, q)) return 0;
  double tol = tolerance;
  if constexpr (IsIntegerPoint<T>) tol = tolerance > 2.0 * kRounding ? tolerance - kRounding : 0.5 * tolerance;

  // Integer output drops interior points that round onto the previous one;
  // the count and the writing pass share that rule.
  auto run = [&](double tolNow, bool write) -> int {
    int count = 1;
    T last = p[0];
    if (write) out[0] = p[0];
    const bool fits = Flatten(q, tolNow, [&](const V& v, bool isLast) {
      const T point = isLast ? p[3] : FromV<T>(v);
      if constexpr (IsIntegerPoint<T>) {
        if (!isLast && point == last) return true;
      }
      if (count >= maximum) return false;
      if (write) out[count] = point;
      last = point;
      ++count;
      return true;
    });
    return fits ? count : -1;
  };

  for (int attempt = 0; attempt < 64; ++attempt, tol *= 4.0) {
    // A piece is only halved when its halves need fewer chords than it, so
    // the uniform count of the whole curve bounds the result: when that
    // fits, one pass suffices.
    if (Steps(q, tol) < double(maximum)) return run(tol, true);
    if (run(tol, false) > 0) return run(tol, true);
  }
  // Unreachable for finite input: a tolerance above the curve's size needs
  // one chord. Fall back to that chord.
  out[0] = p[0];
  out[1] = p[3];
  return 2;
}

template <class T>
int CalculateNumBezierLines(const T* p, int tolerance) noexcept {
  V q[4];
  if (!LoadFinite(p, q)) return 0;
  const double tol = std::max(1, tolerance);
  return static_cast<int>(std::min(Steps(q, tol), double(kMaxBezierLines)));
}

int CalculateNumBezierLines(const RECT& r, int tolerance) noexcept {
  if (r.left > r.right || r.bottom > r.top) return 1;
  const double w = double(r.right) - double(r.left), h = double(r.top) - double(r.bottom);
  const double tol = std::max(1, tolerance);
  const double k = std::ceil(std::sqrt(1.5 * std::hypot(w, h) / tol));
  return static_cast<int>(std::clamp(k, 1.0, double(kMaxBezierLines)));
}

#define OSTRACRV_INSTANTIATE(T)                                                 \
  template int BezierToLines<T>(const T*, T*, int) noexcept;                    \
  template int AdaptiveBezierToLines<T>(const T*, T*, double, int) noexcept;    \
  template int CalculateNumBezierLines<T>(const T*, int) noexcept;
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace MavikMath
