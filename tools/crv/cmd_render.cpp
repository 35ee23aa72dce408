// crv render: draws the paths of an SVG file with their structure marked.
//
// The output is an SVG in the input's coordinates: every path (written back
// from the library's curve, so what is drawn is what the library read), then
// the handle lines from each Bezier control point to its node, the control
// points, and the nodes, with a legend in a strip below the drawing. Marker
// sizes are a fixed fraction (1/100) of the larger side of the view box, so
// that they look the same whatever the drawing's units.
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <sstream>

#include "common.h"
#include "drawing.h"
#include "polycurve.h"

namespace crv {

const char* const kRenderHelp =
    "usage: crv render FILE.svg -o OUT.svg [--png]\n"
    "\n"
    "Writes OUT.svg: the paths of FILE.svg as the library reads them (basic\n"
    "shapes and transforms already turned into path data), with their structure\n"
    "marked:\n"
    "  white square      a node between two segments\n"
    "  green square      the start of an open subpath\n"
    "  red square        the end of an open subpath\n"
    "  blue square       the start (and end) of a closed subpath\n"
    "  orange diamond    a lone move, a subpath without segments\n"
    "  small circle      a Bezier control point, joined to its node by a handle\n"
    "A legend is drawn below the drawing.\n"
    "\n"
    "options:\n"
    "  -o, --output OUT.svg   the file to write (required)\n"
    "  --png                  also write a PNG next to it (OUT.png), using\n"
    "                         rsvg-convert (Debian package librsvg2-bin); skipped\n"
    "                         with a note when that program is not installed\n"
    "  -h, --help             this text\n";

namespace {

using MavikMath::V;

struct Style {
  double s;  // marker size
};

void Square(std::ostream& o, V p, double side, const char* fill, double stroke) {
  o << "<rect x=\"" << F(p.x - side / 2) << "\" y=\"" << F(p.y - side / 2) << "\" width=\"" << F(side)
    << "\" height=\"" << F(side) << "\" fill=\"" << fill << "\" stroke=\"#1f2937\" stroke-width=\"" << F(stroke)
    << "\"/>\n";
}
void Diamond(std::ostream& o, V p, double r, const char* fill, double stroke) {
  o << "<path d=\"M" << F(p.x) << " " << F(p.y - r) << "L" << F(p.x + r) << " " << F(p.y) << "L" << F(p.x) << " "
    << F(p.y + r) << "L" << F(p.x - r) << " " << F(p.y) << "Z\" fill=\"" << fill
    << "\" stroke=\"#1f2937\" stroke-width=\"" << F(stroke) << "\"/>\n";
}
void Circle(std::ostream& o, V p, double r, double stroke) {
  o << "<circle cx=\"" << F(p.x) << "\" cy=\"" << F(p.y) << "\" r=\"" << F(r)
    << "\" fill=\"white\" stroke=\"#6b7280\" stroke-width=\"" << F(stroke) << "\"/>\n";
}

enum class Mark { node, openStart, openEnd, closedStart, loneMove, control };

void DrawMark(std::ostream& o, Mark m, V p, double s) {
  const double w = s * 0.15;
  switch (m) {
    case Mark::node: Square(o, p, s, "white", w); break;
    case Mark::openStart: Square(o, p, 1.3 * s, "#16a34a", w); break;
    case Mark::openEnd: Square(o, p, 1.3 * s, "#dc2626", w); break;
    case Mark::closedStart: Square(o, p, 1.3 * s, "#2563eb", w); break;
    case Mark::loneMove: Diamond(o, p, 0.9 * s, "#f59e0b", w); break;
    case Mark::control: Circle(o, p, 0.4 * s, w); break;
  }
}

// The fill to draw a shape with: its own colour, light; paint servers of the
// input (url(...)) are not copied, so they become grey.
std::string FillOf(const OstraCrv::svgdoc::Shape& shape) {
  if (shape.fill.empty()) return "#000000";
  if (shape.fill.rfind("url(", 0) == 0) return "#888888";
  return OstraCrv::svgdoc::XmlEscape(shape.fill);
}

bool FindProgram(const std::string& name, std::string& path) {
  const char* env = std::getenv("PATH");
  std::string dirs = env ? env : "/usr/bin:/bin";
  std::size_t start = 0;
  while (start <= dirs.size()) {
    const std::size_t end = dirs.find(':', start);
    std::string dir = dirs.substr(start, end == std::string::npos ? std::string::npos : end - start);
    if (dir.empty()) dir.assign(1, '.');
    std::string candidate = dir;
    candidate += '/';
    candidate += name;
    if (access(candidate.c_str(), X_OK) == 0) {
      path = candidate;
      return true;
    }
    if (end == std::string::npos) break;
    start = end + 1;
  }
  return false;
}

// Runs rsvg-convert without a shell; true on exit status 0.
bool RunConverter(const std::string& program, const std::string& in, const std::string& out) {
  const pid_t pid = fork();
  if (pid < 0) return false;
  if (pid == 0) {
    execl(program.c_str(), program.c_str(), "-f", "png", "-o", out.c_str(), in.c_str(), static_cast<char*>(nullptr));
    _exit(127);
  }
  int status = 0;
  if (waitpid(pid, &status, 0) < 0) return false;
  return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

}  // namespace

int RunRender(const std::vector<std::string>& argv) {
  Args args;
  std::string message;
  if (!args.Parse(WithLongOutput(argv), {"--output"}, {"--png"}, message)) return UsageError("render", message);
  if (args.help) {
    std::cout << kRenderHelp;
    return kOk;
  }
  if (args.positional.size() != 1) return UsageError("render", "expects exactly one FILE.svg");
  const std::string out = args.Value("--output");
  if (out.empty()) return UsageError("render", "needs an output file: -o OUT.svg");
  const std::string& file = args.positional[0];

  OstraCrv::svgdoc::Document doc;
  if (!LoadDocument(file, doc)) return kInputError;
  const auto& frame = doc.frame;
  const MATRIX toDoc = frame.ToDocument();
  const Canvas canvas = MakeCanvas(DrawingArea(&doc, 1, true), 7);
  const MavikMath::Bounds& area = canvas.area;
  const double s = canvas.s, margin = canvas.margin;

  std::ostringstream o;
  OpenDrawing(o, canvas, "crv render of " + OstraCrv::svgdoc::XmlEscape(file));

  // Paths, then handles, control points and nodes on top.
  o << "<g id=\"paths\" stroke=\"#1f2937\" stroke-width=\"" << F(0.15 * s) << "\" fill-opacity=\"0.2\">\n";
  for (const auto& shape : doc.shapes) {
    const char* rule = shape.fillRule == OstraCrv::svgdoc::FillRule::evenodd ? "evenodd" : "nonzero";
    WriteShapePath(o, shape, frame, " fill=\"" + FillOf(shape) + "\" fill-rule=\"" + rule + "\"");
  }
  o << "</g>\n";

  std::ostringstream handles, controls, nodesOut;
  for (const auto& shape : doc.shapes) {
    const auto& c = shape.curve;
    const int n = int(c.GetPointCount());
    NODETYPE const* nodes = c.GetNodeTypes();
    auto at = [&](int i) { return toDoc(c.GetPoint(i)); };
    for (int i = 0; i < n; ++i) {
      const NODETYPE t = nodes[i];
      const bool last = i + 1 == n || IsMove(nodes[i + 1]);
      if (IsArc(t)) {
        DrawMark(controls, Mark::control, at(i), s);
        continue;
      }
      if (IsCurve(t) && i >= 3) {
        handles << "M" << F(at(i - 3).x) << " " << F(at(i - 3).y) << "L" << F(at(i - 2).x) << " " << F(at(i - 2).y)
                << "M" << F(at(i - 1).x) << " " << F(at(i - 1).y) << "L" << F(at(i).x) << " " << F(at(i).y);
      }
      if (IsMove(t)) {
        DrawMark(nodesOut, last ? Mark::loneMove : IsClosedNode(t) ? Mark::closedStart : Mark::openStart, at(i), s);
      } else if (last && IsClosedNode(t)) {
        // The closing point: drawn with its twin, the subpath's start.
      } else {
        DrawMark(nodesOut, last ? Mark::openEnd : Mark::node, at(i), s);
      }
    }
  }
  o << "<path id=\"handles\" fill=\"none\" stroke=\"#9ca3af\" stroke-width=\"" << F(0.12 * s) << "\" d=\""
    << handles.str() << "\"/>\n";
  o << "<g id=\"controls\">\n" << controls.str() << "</g>\n";
  o << "<g id=\"nodes\">\n" << nodesOut.str() << "</g>\n";

  // Legend: two rows of three entries below the drawing.
  const struct {
    Mark mark;
    const char* text;
  } legend[] = {{Mark::node, "node"},           {Mark::openStart, "open start"}, {Mark::openEnd, "open end"},
                {Mark::closedStart, "closed start"}, {Mark::loneMove, "lone move"}, {Mark::control, "control point"}};
  const double ly = area.top + margin + 2 * s;
  OpenLegend(o, s);
  for (int k = 0; k < 6; ++k) {
    const V p{area.left + (k % 3) * (area.Width() / 3) + s, ly + (k / 3) * 2.6 * s};
    DrawMark(o, legend[k].mark, p, s);
    LegendLabel(o, p, s, legend[k].text);
  }
  o << "</g>\n</svg>\n";

  if (const int status = WriteTextFile(out, o.str()); status != kOk) return status;

  if (args.Has("--png")) {
    std::string png = out;
    if (png.size() > 4 && png.compare(png.size() - 4, 4, ".svg") == 0) png.resize(png.size() - 4);
    png += ".png";
    std::string program;
    if (!FindProgram("rsvg-convert", program)) {
      std::cerr << "crv render: rsvg-convert not found (Debian package librsvg2-bin); " << png << " not written\n";
    } else if (!RunConverter(program, out, png)) {
      return InputError(png, "rsvg-convert failed");
    }
  }
  return kOk;
}

}  // namespace crv
