// Reading SVG documents into library curves, and the frame that maps between
// the document's coordinates and the library's.
//
// This reader belongs to the tools, not to the library: it uses pugixml for
// the XML and the library's path data reader for the geometry.
//
// What is read: the elements path, rect (with rounded corners), circle,
// ellipse, line, polyline and polygon, each turned into the path that SVG
// defines for it; transform attributes of the element and of all its
// ancestor groups (matrix, translate, scale, rotate with or without a centre,
// skewX, skewY); the fill-rule, fill and stroke properties, from attributes
// or the style attribute, inherited from ancestors. Elements that are not
// drawn by themselves (defs, symbol, clipPath, mask, pattern, marker,
// gradients, ...) and subtrees with display none are skipped; a nested svg
// element counts as a group moved to its x and y; use, text and image are
// skipped with a warning. Lengths may carry the units px, in, cm, mm, pt, pc
// or %, the last relative to the view box.
//
// Coordinates. SVG's y axis points down, the library's up. The document is
// mirrored through the horizontal middle line of its view box:
//     y_library = H - y_svg,   H = 2 * viewBox.y + viewBox.height,
// so that the view box covers the same rectangle in both systems (with a view
// box at the origin, H is its height). Without a view box H is the height
// attribute; without either it is 0, a plain negation. The mirror keeps what
// the eye sees: a shape drawn clockwise on screen runs clockwise with y up and
// has a positive area (GetArea), a hole drawn the other way a negative one.
// Writing applies the same mirror back, so a written file looks like its
// input. Coordinates are in the document's user units: the view box is not
// scaled to the width and height of the viewport.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/math/matrix.h"
#include "ostracrv/math/rect.h"

namespace OstraCrv::svgdoc {

enum class FillRule { nonzero, evenodd };

// One drawn element.
struct Shape {
  std::string element;                // tag name: path, rect, circle, ...
  std::string id;                     // the id attribute, empty if none
  int line = 0;                       // line of the element in the file, from 1
  PolycurveT<MavikMath::V> curve;     // in library coordinates (y up)
  FillRule fillRule = FillRule::nonzero;
  std::string fill;                   // computed fill paint as written; "" means the default, black
  std::string stroke;                 // computed stroke paint; "" means none
  std::string problem;                // why the geometry is incomplete (path data error), or empty
};

// The mapping between document and library coordinates.
struct Frame {
  bool hasViewBox = false;
  MavikMath::Bounds viewBox;  // in document coordinates: left = x, bottom = y, right = x + w, top = y + h
  double width = 0, height = 0;  // viewport size in user units, 0 if not given
  double mirror = 0;             // H of y_library = H - y_svg

  // Document to library coordinates, and back (the mirror is its own inverse).
  MATRIX ToLibrary() const noexcept { return MATRIX{1, 0, 0, -1, 0, mirror}; }
  MATRIX ToDocument() const noexcept { return ToLibrary(); }
};

struct Document {
  Frame frame;
  std::vector<Shape> shapes;
  std::vector<std::string> warnings;  // one line each, without the file name
};

// Reads an SVG document from text or from a file into doc (replacing its
// content). Returns false with a one-line reason in error, and doc in an
// unspecified but valid state, when the input cannot be read: the file cannot
// be opened, the XML is not well formed, or the root element is not svg.
// Faults inside the drawing (bad path data, bad numbers, unknown transforms)
// are not failures: the geometry read up to them is kept and a warning added
// (and for path data, Shape::problem set).
bool ReadText(std::string_view text, Document& doc, std::string& error);
bool ReadFile(const std::string& path, Document& doc, std::string& error);

// Parses a transform attribute list into one matrix (the rightmost transform
// applies first). False, with m unchanged, on a syntax error.
bool ParseTransform(std::string_view text, MATRIX& m);

// A curve in library coordinates as path data in document coordinates; ""
// for a curve that cannot be written (see WriteSvgPathData). precision as in
// SvgPathWriteOptions.
std::string ToDocumentPathData(const PolycurveT<MavikMath::V>& curve, const Frame& frame, int precision = -1);

// Escapes &, <, >, " for use in XML text and attribute values.
std::string XmlEscape(std::string_view s);

}  // namespace OstraCrv::svgdoc
