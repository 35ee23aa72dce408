// crv inside: whether a point lies inside each shape of an SVG file, by both
// fill rules.
#include <cerrno>
#include <cmath>
#include <cstdlib>
#include <iostream>

#include "common.h"
#include "polycurve.h"

namespace crv {

const char* const kInsideHelp =
    "usage: crv inside FILE.svg X Y\n"
    "\n"
    "Tells, for every path of the file, whether the point (X, Y) lies inside it\n"
    "by the non-zero rule and by the even-odd rule, and which rule the shape\n"
    "itself is filled with. X and Y are document coordinates, as written in the\n"
    "file (y pointing down); the point in library coordinates is printed too.\n"
    "A point within about 1.4 units of the outline is reported as on it.\n"
    "Open subpaths are no part of a shape.\n"
    "\n"
    "options:\n"
    "  -h, --help      this text\n";

namespace {

// A whole argument read as a finite number.
bool ReadNumber(const std::string& s, double& v) {
  if (s.empty()) return false;
  char* end = nullptr;
  errno = 0;
  v = std::strtod(s.c_str(), &end);
  return end == s.c_str() + s.size() && errno == 0 && std::isfinite(v);
}

}  // namespace

int RunInside(const std::vector<std::string>& argv) {
  // Numbers may be negative: take them out before the option reader sees
  // them as options.
  std::vector<std::string> rest;
  std::vector<double> numbers;
  for (const std::string& a : argv) {
    double v = 0;
    if (ReadNumber(a, v))
      numbers.push_back(v);
    else
      rest.push_back(a);
  }
  Args args;
  std::string message;
  if (!args.Parse(rest, {}, {}, message)) return UsageError("inside", message);
  if (args.help) {
    std::cout << kInsideHelp;
    return kOk;
  }
  if (args.positional.size() != 1 || numbers.size() != 2)
    return UsageError("inside", "expects FILE.svg and the two coordinates X Y");
  const std::string& file = args.positional[0];
  OstraCrv::svgdoc::Document doc;
  if (!LoadDocument(file, doc)) return kInputError;

  const MavikMath::V p = doc.frame.ToLibrary()(MavikMath::V{numbers[0], numbers[1]});
  std::cout << file << ": point " << Number(numbers[0]) << " " << Number(numbers[1]) << " (library "
            << Number(p.x) << " " << Number(p.y) << ")\n";
  int index = 0;
  for (const auto& shape : doc.shapes) {
    ++index;
    const auto& c = shape.curve;
    const int n = int(c.GetPointCount());
    bool onEdge = false;
    const bool nonZero = OstraCrv::IsPointInShape(c.GetPoints(), c.GetNodeTypes(), n, p, false, true, &onEdge, nullptr);
    const bool evenOdd = OstraCrv::IsPointInShape(c.GetPoints(), c.GetNodeTypes(), n, p, false, false, nullptr, nullptr);
    const bool ownRuleEvenOdd = shape.fillRule == OstraCrv::svgdoc::FillRule::evenodd;
    std::cout << "shape " << index << ": <" << shape.element;
    if (!shape.id.empty()) std::cout << " id=\"" << shape.id << "\"";
    std::cout << "> fill-rule " << (ownRuleEvenOdd ? "evenodd" : "nonzero") << ": ";
    if (onEdge)
      std::cout << "on the outline\n";
    else
      std::cout << "nonzero " << (nonZero ? "inside" : "outside") << ", evenodd " << (evenOdd ? "inside" : "outside")
                << "; filled: " << ((ownRuleEvenOdd ? evenOdd : nonZero) ? "inside" : "outside") << "\n";
  }
  return kOk;
}

}  // namespace crv
