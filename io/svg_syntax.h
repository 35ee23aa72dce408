// Lexical pieces of SVG path data shared by the reader and the writer, so
// that the writer can predict bit for bit what the reader will compute.
//
// Numbers: the grammar's token (sign, digits, fraction, exponent) is scanned
// by hand and only the scanned token is converted, with std::from_chars, which
// rounds correctly; from_chars alone would also take "inf", "nan" and hex
// forms that path data does not have. A value whose magnitude underflows
// the double range reads as the nearest representable value (0 or a
// subnormal) with its sign; one that overflows is an error.
#pragma once

#include <charconv>
#include <cmath>
#include <cstddef>
#include <cstdlib>
#include <string>
#include <string_view>

#include "ostracrv/math/vector2d.h"

namespace OstraCrv::svgsyntax {

inline bool is_wsp(char c) noexcept { return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f'; }
inline bool is_digit(char c) noexcept { return c >= '0' && c <= '9'; }

enum class NumberScan { ok, none, out_of_range };

// Scans one number at s[pos]. On ok, value holds it and pos is moved past it.
// none: no number starts here (pos unchanged). out_of_range: the token is a
// number whose magnitude exceeds the double range (pos unchanged).
inline NumberScan scan_number(std::string_view s, std::size_t& pos, double& value) noexcept {
  std::size_t i = pos;
  const std::size_t n = s.size();
  bool negative = false;
  if (i < n && (s[i] == '+' || s[i] == '-')) {
    negative = s[i] == '-';
    ++i;
  }
  const std::size_t mantissa = i;
  std::size_t digits = 0;
  while (i < n && is_digit(s[i])) ++i, ++digits;
  if (i < n && s[i] == '.') {
    ++i;
    while (i < n && is_digit(s[i])) ++i, ++digits;
  }
  if (digits == 0) return NumberScan::none;
  // An exponent counts only with at least one digit; "1e" is the number 1
  // followed by a stray 'e'.
  if (i < n && (s[i] == 'e' || s[i] == 'E')) {
    std::size_t j = i + 1;
    if (j < n && (s[j] == '+' || s[j] == '-')) ++j;
    if (j < n && is_digit(s[j])) {
      while (j < n && is_digit(s[j])) ++j;
      i = j;
    }
  }
  // from_chars takes no leading '+', and reads the sign itself for '-'.
  const char* first = s.data() + mantissa;
  const char* last = s.data() + i;
  double v = 0.0;
  auto r = std::from_chars(first, last, v, std::chars_format::general);
  if (r.ec == std::errc::result_out_of_range) {
    // Tell underflow from overflow with strtod on a terminated copy.
    std::string token(first, last);
    v = std::strtod(token.c_str(), nullptr);
    if (!std::isfinite(v)) return NumberScan::out_of_range;
  } else if (r.ec != std::errc() || r.ptr != last) {
    return NumberScan::none;
  }
  value = negative ? -v : v;
  pos = i;
  return NumberScan::ok;
}

// The reflection of a control point c through the current point p, as the
// S and T commands compute it.
inline MavikMath::V reflect(const MavikMath::V& p, const MavikMath::V& c) noexcept {
  return {p.x + (p.x - c.x), p.y + (p.y - c.y)};
}

// The controls of the cubic equal to the quadratic (p0, q, p2).
inline MavikMath::V quad_control1(const MavikMath::V& p0, const MavikMath::V& q) noexcept {
  return {p0.x + (q.x - p0.x) * (2.0 / 3.0), p0.y + (q.y - p0.y) * (2.0 / 3.0)};
}
inline MavikMath::V quad_control2(const MavikMath::V& q, const MavikMath::V& p2) noexcept {
  return {p2.x + (q.x - p2.x) * (2.0 / 3.0), p2.y + (q.y - p2.y) * (2.0 / 3.0)};
}

}  // namespace OstraCrv::svgsyntax
