// Pieces shared by the drawings crv writes; see drawing.h for the sizes.
#include "drawing.h"

#include <algorithm>
#include <fstream>

#include "polycurve.h"

namespace crv {

std::string F(double v) { return Number(v, 9); }

MavikMath::Bounds DrawingArea(const OstraCrv::svgdoc::Document* docs, std::size_t count, bool useSize) {
  const auto& frame = docs[0].frame;
  MavikMath::Bounds area;
  if (frame.hasViewBox) return frame.viewBox;
  if (useSize && frame.width > 0 && frame.height > 0) {
    area.left = 0;
    area.bottom = 0;
    area.right = frame.width;
    area.top = frame.height;
    return area;
  }
  const MATRIX toDoc = frame.ToDocument();
  for (std::size_t d = 0; d < count; ++d)
    for (const auto& shape : docs[d].shapes)
      for (const MavikMath::V& p : shape.curve.Points()) area.Add(toDoc(p));
  if (area.IsEmpty()) area = MavikMath::Bounds{0, 100, 100, 0};
  const double pad = 0.05 * std::max(area.Width(), area.Height()) + 1e-9;
  MavikMath::InflateRect(area, pad, pad);
  return area;
}

Canvas MakeCanvas(const MavikMath::Bounds& area, double legendSizes) {
  Canvas c;
  c.area = area;
  c.s = std::max(area.Width(), area.Height()) / 100;
  c.margin = 2 * c.s;
  c.vx = area.left - c.margin;
  c.vy = area.bottom - c.margin;
  c.vw = area.Width() + 2 * c.margin;
  c.vh = area.Height() + 2 * c.margin + legendSizes * c.s;
  return c;
}

void OpenDrawing(std::ostream& o, const Canvas& c, const std::string& comment) {
  const double scale = 800 / std::max(c.vw, c.vh);
  o << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
    << "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"" << F(c.vx) << " " << F(c.vy) << " " << F(c.vw) << " "
    << F(c.vh) << "\" width=\"" << F(c.vw * scale) << "\" height=\"" << F(c.vh * scale) << "\">\n";
  if (!comment.empty()) o << "<!-- " << comment << " -->\n";
  o << "<rect x=\"" << F(c.vx) << "\" y=\"" << F(c.vy) << "\" width=\"" << F(c.vw) << "\" height=\"" << F(c.vh)
    << "\" fill=\"white\"/>\n";
}

void WriteShapePath(std::ostream& o, const OstraCrv::svgdoc::Shape& shape, const OstraCrv::svgdoc::Frame& frame,
                    const std::string& attributes) {
  const std::string d = OstraCrv::svgdoc::ToDocumentPathData(shape.curve, frame);
  if (d.empty()) return;
  o << "<path";
  if (!shape.id.empty()) o << " id=\"" << OstraCrv::svgdoc::XmlEscape(shape.id) << "\"";
  o << " d=\"" << d << "\"" << attributes << "/>\n";
}

void OpenLegend(std::ostream& o, double s) {
  o << "<g id=\"legend\" font-family=\"sans-serif\" font-size=\"" << F(1.6 * s) << "\" fill=\"#1f2937\">\n";
}

void LegendLabel(std::ostream& o, MavikMath::V p, double s, const char* text) {
  o << "<text x=\"" << F(p.x + 1.5 * s) << "\" y=\"" << F(p.y + 0.55 * s) << "\">" << text << "</text>\n";
}

int WriteTextFile(const std::string& file, const std::string& text) {
  std::ofstream f(file, std::ios::binary);
  f << text;
  f.close();
  if (!f) return InputError(file, "cannot write file");
  return kOk;
}

}  // namespace crv
