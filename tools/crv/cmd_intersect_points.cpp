// crv intersect-points: where the paths of one or two SVG files meet.
//
// Every subpath of every shape becomes one curve of the intersection engine,
// active and self-tested, as welding sees a drawing: all crossings, touches
// and shared stretches among them, a subpath's own loops included. Each
// meeting is printed once, with the two segments it lies on; with -o the
// paths are drawn and the meetings marked over them.
#include <cmath>
#include <iostream>
#include <sstream>

#include "common.h"
#include "drawing.h"
#include "polycurve.h"

namespace crv {

const char* const kIntersectPointsHelp =
    "usage: crv intersect-points A.svg [B.svg] [-o OUT.svg] [--tolerance T] [--precision N]\n"
    "\n"
    "Lists where the paths meet: every crossing, touch and shared stretch among\n"
    "the subpaths of A.svg (each against all others and against itself) and,\n"
    "with B.svg, of both files together. One line per meeting:\n"
    "  meeting K: X, Y  KIND  FILE shape S subpath P segment G t T  /  (the other)\n"
    "KIND is one of\n"
    "  crossing       the segments cross inside both\n"
    "  touch          an end of one segment lies on the other (within the\n"
    "                 tolerance), or two ends meet\n"
    "  overlap start  the first end of a stretch the two segments share\n"
    "  overlap end    its other end\n"
    "Shapes, subpaths and segments are numbered from 1 in file order; t is the\n"
    "parameter on the segment, from 0 at its start to 1 at its end. X, Y are in\n"
    "library coordinates (y up, the document mirrored through the middle of its\n"
    "view box); each file is read in its own frame.\n"
    "\n"
    "options:\n"
    "  -o, --output OUT.svg   also draw the paths (A dark, B orange) with the\n"
    "                         meetings marked: crossing red cross, touch blue\n"
    "                         circle, overlap start and end green triangle and\n"
    "                         square, the shared stretch green; drawn in the\n"
    "                         first file's view box\n"
    "  --tolerance T          how close counts as meeting, in user units\n"
    "                         (default 1.4142135624, the weld tolerance)\n"
    "  --precision N          significant digits of the numbers (default 8)\n"
    "  -h, --help             this text\n";

namespace {

using MavikMath::V;
using OstraCrv::Intersection;
using OstraCrv::SegmentIntersections;

// Where a curve of the engine comes from.
struct Origin {
  int file = 0, shape = 0, subpath = 0;  // from 0
  int firstSegment = 0;                  // index of its first segment in the engine
};

struct Meeting {
  const Intersection* a;  // on the segment listed first
  std::string kind;
};

std::string KindOf(const Intersection* r) {
  if (r->overlapEnd) return r->t < r->overlapEnd->t ? "overlap start" : "overlap end";
  return r->touch ? "touch" : "crossing";
}

bool ParseNumber(const std::string& text, double& v) {
  try {
    std::size_t used = 0;
    v = std::stod(text, &used);
    return used == text.size();
  } catch (...) {
    return false;
  }
}

}  // namespace

int RunIntersectPoints(const std::vector<std::string>& argv) {
  Args args;
  std::string message;
  if (!args.Parse(WithLongOutput(argv), {"--output", "--tolerance", "--precision"}, {}, message))
    return UsageError("intersect-points", message);
  if (args.help) {
    std::cout << kIntersectPointsHelp;
    return kOk;
  }
  if (args.positional.empty() || args.positional.size() > 2)
    return UsageError("intersect-points", "expects one or two SVG files");
  double tolerance = OstraCrv::kWeldTolerance;
  if (args.Has("--tolerance") && (!ParseNumber(args.Value("--tolerance"), tolerance) || !(tolerance > 0) ||
                                  !std::isfinite(tolerance)))
    return UsageError("intersect-points", "--tolerance takes a positive number");
  double precision = 8;
  if (args.Has("--precision") &&
      (!ParseNumber(args.Value("--precision"), precision) || precision != std::floor(precision) || precision < 1 ||
       precision > 17))
    return UsageError("intersect-points", "--precision takes a whole number from 1 to 17");
  const int digits = static_cast<int>(precision);

  std::vector<OstraCrv::svgdoc::Document> docs(args.positional.size());
  for (std::size_t f = 0; f < docs.size(); ++f)
    if (!LoadDocument(args.positional[f], docs[f])) return kInputError;

  // One engine curve per subpath of at least two points.
  std::vector<OstraCrv::IntersectionCurveT<V>> curves;
  std::vector<Origin> origins;
  for (std::size_t f = 0; f < docs.size(); ++f)
    for (std::size_t s = 0; s < docs[f].shapes.size(); ++s) {
      const auto& c = docs[f].shapes[s].curve;
      const int n = static_cast<int>(c.GetPointCount());
      NODETYPE const* nodes = c.GetNodeTypes();
      int subpath = 0;
      for (int i = 0; i < n;) {
        int end = i + 1;
        while (end < n && !IsMove(nodes[end])) ++end;
        if (end - i >= 2) {
          curves.emplace_back(c.GetPoints() + i, nodes + i, end - i, true, true);
          origins.push_back({static_cast<int>(f), static_cast<int>(s), subpath, 0});
        }
        ++subpath;
        i = end;
      }
    }
  const OstraCrv::SegmentsT<V> engine(curves, OstraCrv::WeldGraphIntersectionSettings(tolerance));
  for (int g = static_cast<int>(engine.segments.size()) - 1; g >= 0; --g)
    origins[engine.segments[g].curve].firstSegment = g;

  // Each meeting once: from the record on the lower segment (or, for a loop
  // of one segment, the record listed first).
  std::vector<Meeting> meetings;
  for (const auto& seg : engine.segments)
    for (std::size_t k = 0; k < seg.intersections.size(); ++k) {
      const Intersection* r = seg.intersections[k];
      const int other = r->other->segment;
      if (other < r->segment) continue;
      if (other == r->segment && engine.segments[other].GetIndex(r->other) < static_cast<int>(k)) continue;
      meetings.push_back({r, KindOf(r)});
    }

  auto where = [&](const Intersection* r) {
    const Origin& o = origins[engine.segments[r->segment].curve];
    std::ostringstream s;
    s << args.positional[o.file] << " shape " << o.shape + 1 << " subpath " << o.subpath + 1 << " segment "
      << r->segment - o.firstSegment + 1 << " t " << Number(r->t, digits);
    return s.str();
  };
  std::cout << meetings.size() << (meetings.size() == 1 ? " meeting" : " meetings") << " among " << curves.size()
            << (curves.size() == 1 ? " subpath" : " subpaths") << ", tolerance " << Number(tolerance, digits)
            << "\n";
  for (std::size_t m = 0; m < meetings.size(); ++m) {
    const Intersection* r = meetings[m].a;
    std::cout << "meeting " << m + 1 << ": " << Number(r->point.x, digits) << ", " << Number(r->point.y, digits)
              << "  " << meetings[m].kind << "  " << where(r) << "  /  " << where(r->other) << "\n";
  }

  if (!args.Has("--output")) return kOk;
  const std::string out = args.Value("--output");
  if (out.empty()) return UsageError("intersect-points", "needs a file name after -o");

  // The drawing, in the first file's document coordinates.
  const auto& frame = docs[0].frame;
  const MATRIX toDoc = frame.ToDocument();
  const Canvas canvas = MakeCanvas(DrawingArea(docs.data(), docs.size(), false), 5);
  const MavikMath::Bounds& area = canvas.area;
  const double s = canvas.s, margin = canvas.margin;

  std::ostringstream o;
  OpenDrawing(o, canvas, "");
  const char* colours[2] = {"#1f2937", "#ea580c"};
  for (std::size_t f = 0; f < docs.size(); ++f) {
    o << "<g id=\"paths" << f + 1 << "\" fill=\"none\" stroke=\"" << colours[f] << "\" stroke-width=\""
      << F(0.2 * s) << "\">\n";
    for (const auto& shape : docs[f].shapes) WriteShapePath(o, shape, frame, "");
    o << "</g>\n";
  }

  // Shared stretches, from each overlap start along its segment.
  o << "<path id=\"overlaps\" fill=\"none\" stroke=\"#16a34a\" stroke-width=\"" << F(0.8 * s)
    << "\" stroke-opacity=\"0.6\" d=\"";
  for (const Meeting& m : meetings) {
    const Intersection* r = m.a;
    if (!r->overlapEnd || !(r->t < r->overlapEnd->t)) continue;
    const V* p = engine.SegmentPoints(r->segment);
    if (!p) continue;
    if (engine.segments[r->segment].type == SegmentIntersections::Line) {
      const V a = toDoc(MavikMath::Lerp(p[0], p[1], r->t)), b = toDoc(MavikMath::Lerp(p[0], p[1], r->overlapEnd->t));
      o << "M" << F(a.x) << " " << F(a.y) << "L" << F(b.x) << " " << F(b.y);
    } else {
      V c[4];
      MavikMath::CubicBezier::Subsection(r->t, r->overlapEnd->t, p, c);
      for (V& q : c) q = toDoc(q);
      o << "M" << F(c[0].x) << " " << F(c[0].y) << "C" << F(c[1].x) << " " << F(c[1].y) << " " << F(c[2].x) << " "
        << F(c[2].y) << " " << F(c[3].x) << " " << F(c[3].y);
    }
  }
  o << "\"/>\n";

  auto mark = [&](std::ostream& os, const std::string& kind, V p) {
    const double r = 0.8 * s, w = 0.25 * s;
    if (kind == "crossing") {
      os << "<path d=\"M" << F(p.x - r) << " " << F(p.y - r) << "L" << F(p.x + r) << " " << F(p.y + r) << "M"
         << F(p.x - r) << " " << F(p.y + r) << "L" << F(p.x + r) << " " << F(p.y - r)
         << "\" stroke=\"#dc2626\" stroke-width=\"" << F(w) << "\"/>\n";
    } else if (kind == "touch") {
      os << "<circle cx=\"" << F(p.x) << "\" cy=\"" << F(p.y) << "\" r=\"" << F(r)
         << "\" fill=\"none\" stroke=\"#2563eb\" stroke-width=\"" << F(w) << "\"/>\n";
    } else if (kind == "overlap start") {
      os << "<path d=\"M" << F(p.x) << " " << F(p.y - r) << "L" << F(p.x + r) << " " << F(p.y + r) << "L"
         << F(p.x - r) << " " << F(p.y + r) << "Z\" fill=\"#16a34a\"/>\n";
    } else {
      os << "<rect x=\"" << F(p.x - r / 1.4) << "\" y=\"" << F(p.y - r / 1.4) << "\" width=\"" << F(1.4 * r)
         << "\" height=\"" << F(1.4 * r) << "\" fill=\"#16a34a\"/>\n";
    }
  };
  o << "<g id=\"meetings\">\n";
  for (const Meeting& m : meetings) mark(o, m.kind, toDoc(m.a->point));
  o << "</g>\n";

  const char* kinds[4] = {"crossing", "touch", "overlap start", "overlap end"};
  OpenLegend(o, s);
  for (int k = 0; k < 4; ++k) {
    const V p{area.left + k * (area.Width() / 4) + s, area.top + margin + 2 * s};
    mark(o, kinds[k], p);
    LegendLabel(o, p, s, kinds[k]);
  }
  o << "</g>\n</svg>\n";
  return WriteTextFile(out, o.str());
}

}  // namespace crv
