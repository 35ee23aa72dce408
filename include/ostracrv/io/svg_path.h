// SVG path data: reading the `d` attribute grammar into a double curve and
// writing a curve back as compact path data.
//
// Coordinates are taken as written: the functions of this header neither flip
// nor scale. SVG's y axis points down and the library's up, so a caller that
// reads whole documents applies the flip of its document frame to the result
// (the crv tool mirrors through the document height, y' = H - y; see
// tools/svgdoc/svg_document.h). Path data read here and written back without a
// flip round-trips exactly.
//
// Mapping onto the library's encoding:
//   M m       a move (Open::move). Further coordinate pairs after a move are
//             implicit lines (relative after m).
//   L l H h V v
//             a line node (Open::line).
//   C c S s   a Bezier: two arcs and a curve node (arc, arc, Open::curve). S
//             reflects the previous Bezier's second control point through the
//             current point when the previous command was C, c, S or s, and
//             uses the current point otherwise.
//   Q q T t   quadratics become the cubic of the same curve: controls
//             P0 + 2/3 (Q - P0) and P2 + 2/3 (Q - P2). T reflects the previous
//             quadratic control point when the previous command was Q, q, T
//             or t, and uses the current point otherwise.
//   A a       elliptical arcs become cubics of at most 90 degrees each, see
//             SvgArcToCubics. Zero radii give a line, identical end points
//             give nothing, radii too small to reach are scaled up.
//   Z z       closes the subpath: a line back to the start is added unless the
//             current point already equals it; the first node becomes
//             Closed::move and the last one gets the closed bit and loses the
//             user bit (Closed::line, Closed::curve). A Z on a subpath without
//             segments marks the lone move closed. A Z right after a Z does
//             nothing. A command other than M after Z starts a new subpath at
//             the closed subpath's start point.
// Every node is cusp: continuity, selection and letter bits are not part of
// path data and are neither read nor written.
//
// Numbers follow the SVG grammar: an optional sign, digits with an optional
// fraction (".5", "1.", "1.5.5" reads 1.5 then .5), an optional exponent
// ("1e2-3" reads 100 then -3). Separators are white space and at most one
// comma between two numbers; arc flags are the single characters 0 and 1 and
// need no separator ("a1 1 0 00 1 1"). A command letter may be followed by any
// number of argument groups (implicit repetition).
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

// Where and why path data stopped being readable. offset is the byte offset
// of the offending character in the data (its size when the data ended too
// early; the start of the argument group for a coordinate that overflows);
// reason is a short static English text, null when there was no error.
struct SvgPathError {
  std::size_t offset = 0;
  const char* reason = nullptr;
};

struct SvgPathParseOptions {
  // Largest distance, in coordinate units, that a cubic piece of an arc may
  // stray from the true ellipse. 0 keeps the plain rule: pieces of at most 90
  // degrees, which stray at most 2.8e-4 times the larger radius. A positive
  // value adds pieces until the bound 2 sin^6(a/4) / (27 cos^2(a/4)) times
  // the larger radius, for a piece of a radians, is below it (at most 1024
  // pieces per arc).
  double arcTolerance = 0.0;
};

// Reads SVG path data into out, replacing its content.
//
// Returns true when the whole text was read (an empty or blank text gives an
// empty curve). On malformed data returns false, stores the position and
// reason in *error (if error is not null), and leaves in out the path read up
// to the last complete command group before the fault, as SVG renderers draw
// it. Faults: a first command other than M or m, an unknown character, a
// missing or malformed number or flag, a stray comma, a number outside the
// double range, a coordinate that becomes infinite. Never throws except for
// exhausted memory. O(length of the text + nodes produced).
bool ParseSvgPathData(std::string_view d, PolycurveT<MavikMath::V>& out, SvgPathError* error = nullptr,
                      SvgPathParseOptions const& options = {});

struct SvgPathWriteOptions {
  // Negative: every number in its shortest form that reads back to the same
  // double, so that reading the text gives the curve back bit for bit.
  // 0 .. 17: numbers rounded to that many decimals (trailing zeros dropped);
  // each coordinate then reads back within half a unit of the last decimal.
  int precision = -1;
  // Allow relative commands where they are shorter and read back to exactly
  // the same value as the absolute form.
  bool allowRelative = true;
};

// Writes c as compact SVG path data into out, replacing its content.
//
// Uses M, L, H, V, C, S and Z in absolute or relative form, whichever is
// shorter for each command, omits repeated command letters and separators
// that the grammar does not need. A closing line whose end lies on the start
// point is left to Z. Reading the result with ParseSvgPathData gives back c's
// points and node bytes for any valid curve whose nodes are cusp, unselected
// and not letters, whose closed ends lie on one point and, at a negative
// precision, exactly.
//
// Returns false, leaving out unchanged, for a curve that is not valid (see
// IsValidCurve) or has a coordinate that is not finite. An empty curve gives
// an empty text. O(nodes).
bool WriteSvgPathData(PolycurveT<MavikMath::V> const& c, std::string& out, SvgPathWriteOptions const& options = {});

// Converts the SVG elliptical arc from `from` to `to` (radii rx and ry, x axis
// turned by xAxisRotationDegrees, the two flags of the arc command) into
// cubic Beziers, by the centre parameterisation of the SVG implementation
// notes: negative radii count as their magnitude, radii too small to join the
// end points are scaled up by the same factor until they just do.
//
// Appends three points per cubic to controls (first control, second control,
// end), the last end being `to` exactly, and returns the number of cubics.
// Returns 0 and appends nothing when the end points are equal. Returns -1 and
// appends nothing when a radius is zero or any input is not finite: the arc
// is then a straight line. Each cubic spans at most 90 degrees of the
// ellipse's parameter; tolerance as in SvgPathParseOptions::arcTolerance.
int SvgArcToCubics(MavikMath::V from, double rx, double ry, double xAxisRotationDegrees, bool largeArc, bool sweep,
                   MavikMath::V to, double tolerance, std::vector<MavikMath::V>& controls);

}  // namespace OstraCrv
