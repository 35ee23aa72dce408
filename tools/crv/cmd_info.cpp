// crv info: what the library sees in each path of an SVG file.
//
// Per shape a summary line and per subpath one line: nodes the user sees,
// points stored, segments, closed or open, validity of the node bytes, and
// the measurements of the library in library coordinates (y up).
#include <cstdio>
#include <iostream>
#include <map>
#include <sstream>

#include "common.h"
#include "polycurve.h"

namespace crv {

const char* const kInfoHelp =
    "usage: crv info FILE.svg [--precision N]\n"
    "\n"
    "Prints, for every path of the file (path, rect, circle, ellipse, line,\n"
    "polyline and polygon elements, with their transforms applied) and for each\n"
    "of its subpaths: the nodes a user sees, the points stored (nodes plus\n"
    "Bezier control points and the repeated closing point), the segments, whether\n"
    "it is closed, whether its node bytes are valid, its area, its length and\n"
    "its tight bounds. A closed subpath also shows its depth among the subpaths\n"
    "of its path: 1 an outline, 2 a hole in it, 3 an island in the hole, and so\n"
    "on (subpaths that cross each other are placed by one inner point).\n"
    "\n"
    "Coordinates have y pointing up (the document is mirrored through the middle\n"
    "of its view box); the area is positive for a subpath drawn clockwise on\n"
    "screen and negative for one drawn counter-clockwise. A shape's area is the\n"
    "sum over its subpaths.\n"
    "\n"
    "options:\n"
    "  --precision N   significant digits of the numbers (default 8)\n"
    "  -h, --help      this text\n";

namespace {

using MavikMath::V;

// Counts and measurements of a stretch of a path (one subpath or all).
struct Facts {
  int userNodes = 0, points = 0, segments = 0;
  bool valid = false;
  double area = 0, length = 0;
  MavikMath::Bounds bounds;
};

Facts Measure(V const* pts, NODETYPE const* nodes, int n) {
  Facts f;
  f.userNodes = CRV_GetNumberOfUserNodes(nodes, unsigned(n), false);
  f.points = n;
  f.segments = OstraCrv::GetSegmentCount(nodes, n);
  f.valid = OstraCrv::IsValidCurve(nodes, (unsigned long)n);
  f.area = OstraCrv::GetArea(pts, nodes, n);
  f.length = OstraCrv::GetLength(pts, nodes, n);
  OstraCrv::GetTightBBox(pts, nodes, n, f.bounds);
  return f;
}

// Depth of every subpath in the containment tree, by its first node: 1 for
// an outline, 2 for a hole, 3 for an island in a hole, and so on.
void CollectDepths(const OstraCrv::SubpathTreeNode& n, NODETYPE const* nodes, int depth, std::map<int, int>& out) {
  for (unsigned long i = 0; i < n.GetNumberOfChildren(); ++i) {
    const auto& c = n.GetChild(i);
    const int d = c.count ? depth + 1 : depth;  // group nodes add no level
    if (c.count) out[int(c.nodes - nodes)] = d;
    CollectDepths(c, nodes, d, out);
  }
}

std::string DepthName(int depth) {
  if (depth == 1) return "outline";
  return depth % 2 == 0 ? "hole" : "island";
}

std::string Describe(const Facts& f, int digits) {
  std::ostringstream s;
  s << f.userNodes << (f.userNodes == 1 ? " node, " : " nodes, ") << f.points
    << (f.points == 1 ? " point, " : " points, ") << f.segments << (f.segments == 1 ? " segment" : " segments")
    << ", " << (f.valid ? "valid" : "INVALID") << ", area " << Number(f.area, digits) << ", length "
    << Number(f.length, digits) << ", bounds ";
  if (f.bounds.IsEmpty())
    s << "empty";
  else
    s << "x " << Number(f.bounds.left, digits) << " .. " << Number(f.bounds.right, digits) << ", y "
      << Number(f.bounds.bottom, digits) << " .. " << Number(f.bounds.top, digits);
  return s.str();
}

}  // namespace

int RunInfo(const std::vector<std::string>& argv) {
  Args args;
  std::string message;
  if (!args.Parse(argv, {"--precision"}, {}, message)) return UsageError("info", message);
  if (args.help) {
    std::cout << kInfoHelp;
    return kOk;
  }
  if (args.positional.size() != 1) return UsageError("info", "expects exactly one FILE.svg");
  int digits = 8;
  if (args.Has("--precision")) {
    try {
      std::size_t used = 0;
      digits = std::stoi(args.Value("--precision"), &used);
      if (used != args.Value("--precision").size() || digits < 1 || digits > 17) throw 0;
    } catch (...) {
      return UsageError("info", "--precision takes a whole number from 1 to 17");
    }
  }
  const std::string& file = args.positional[0];
  OstraCrv::svgdoc::Document doc;
  if (!LoadDocument(file, doc)) return kInputError;

  const auto& f = doc.frame;
  std::cout << file << ": " << doc.shapes.size() << (doc.shapes.size() == 1 ? " shape" : " shapes");
  if (f.hasViewBox)
    std::cout << ", view box " << Number(f.viewBox.left) << " " << Number(f.viewBox.bottom) << " "
              << Number(f.viewBox.Width()) << " " << Number(f.viewBox.Height());
  std::cout << "; y up: y = " << (f.mirror == 0 ? std::string("-y_svg") : Number(f.mirror) + " - y_svg") << "\n";

  int index = 0;
  for (const auto& shape : doc.shapes) {
    ++index;
    const auto& c = shape.curve;
    const int n = int(c.GetPointCount());
    V const* pts = c.GetPoints();
    NODETYPE const* nodes = c.GetNodeTypes();
    std::cout << "\nshape " << index << ": <" << shape.element;
    if (!shape.id.empty()) std::cout << " id=\"" << shape.id << "\"";
    std::cout << "> line " << shape.line << ", fill-rule "
              << (shape.fillRule == OstraCrv::svgdoc::FillRule::evenodd ? "evenodd" : "nonzero") << ", "
              << CRV_NumSubpaths(nodes, n) << (CRV_NumSubpaths(nodes, n) == 1 ? " subpath" : " subpaths") << "\n"
              << "  whole: " << Describe(Measure(pts, nodes, n), digits) << "\n";
    if (!shape.problem.empty()) std::cout << "  incomplete: " << shape.problem << "\n";
    std::map<int, int> depths;
    if (n > 0) {
      const OstraCrv::SubpathHierarchy tree(pts, nodes, n, false);
      CollectDepths(tree.GetRoot(), nodes, 0, depths);
    }
    int sub = 0;
    for (int first = 0; first < n;) {
      const int count = CRV_CountNodesInSubpath(nodes + first, first, n);
      ++sub;
      const bool closed = IsClosedNode(nodes[first]);
      std::cout << "  subpath " << sub << ": " << (count == 1 ? "lone move" : closed ? "closed" : "open") << ", "
                << Describe(Measure(pts + first, nodes + first, count), digits);
      if (closed && count > 1 && depths.count(first))
        std::cout << ", depth " << depths[first] << " (" << DepthName(depths[first]) << ")";
      std::cout << "\n";
      first += count;
    }
  }
  return kOk;
}

}  // namespace crv
