// Pieces shared by the drawings crv writes (render, intersect-points): the
// rectangle a drawing shows and its view box, the SVG prologue, the paths of
// a document, legend labels, and writing the result to a file.
//
// A drawing's sizes follow from its area: the marker size s is 1/100 of the
// area's larger side, so that marks look the same whatever the units; a
// margin of 2 s surrounds the area and a legend strip, a number of marker
// sizes high that the caller chooses, lies below it (at larger y: the drawing is in document
// coordinates, y down). The picture is at most 800 pixels on its longer side.
#pragma once

#include <cstddef>
#include <ostream>
#include <string>

#include "common.h"

namespace crv {

// A coordinate in a drawing: nine significant digits.
std::string F(double v);

// The area shown and the sizes derived from it.
struct Canvas {
  MavikMath::Bounds area;
  double s = 0.0;                             // marker size
  double margin = 0.0;                        // around the area
  double vx = 0.0, vy = 0.0, vw = 0.0, vh = 0.0;  // the view box
};

// The area to show, in the document coordinates of docs[0]: its view box;
// failing that, with useSize, its width and height (when both are positive);
// failing that, the bounding box of the points of all `count` documents
// padded by 5% of its larger side (100 by 100 at the origin when there are no
// points). count must be at least 1.
MavikMath::Bounds DrawingArea(const OstraCrv::svgdoc::Document* docs, std::size_t count, bool useSize);

// The canvas of an area with a legend strip legendSizes marker sizes high.
Canvas MakeCanvas(const MavikMath::Bounds& area, double legendSizes);

// Writes the XML declaration, the opening svg element, the comment (none
// when empty; the caller escapes it) and a white background over the view
// box.
void OpenDrawing(std::ostream& o, const Canvas& c, const std::string& comment);

// Writes the path element of a shape in the frame's document coordinates,
// with its id and the extra attributes (written as given, each with a
// leading space). Writes nothing for a shape without path data.
void WriteShapePath(std::ostream& o, const OstraCrv::svgdoc::Shape& shape, const OstraCrv::svgdoc::Frame& frame,
                    const std::string& attributes);

// Opens the legend group: text of size 1.6 s.
void OpenLegend(std::ostream& o, double s);
// The label of a legend entry whose mark stands at p.
void LegendLabel(std::ostream& o, MavikMath::V p, double s, const char* text);

// Writes text to the file; kOk, or kInputError after the message when the
// file cannot be written.
int WriteTextFile(const std::string& file, const std::string& text);

}  // namespace crv
