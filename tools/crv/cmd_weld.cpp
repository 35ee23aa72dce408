// crv union | intersect | subtract | xor: the set operations of the library on
// the filled shapes of two SVG files.
//
// Each file becomes one operand: the filled area of all its shapes, each
// filled by its own fill-rule (or the rule given on the command line). A
// file of one shape is that shape with its rule; several shapes are first
// united one by one, which gives their common filling as loops read under
// the even-odd rule. Subpaths left open are closed, as SVG closes them for
// filling. The result is written in the first file's frame as one path read
// under the even-odd rule (the library does not turn the loops of a result
// to one direction), and a summary line goes to standard output.
#include <iostream>
#include <sstream>

#include "common.h"
#include "drawing.h"
#include "polycurve.h"

namespace crv {

const char* const kWeldHelp =
    "usage: crv union|intersect|subtract|xor A.svg B.svg -o OUT.svg\n"
    "           [--nonzero | --evenodd] [--precise]\n"
    "\n"
    "Writes OUT.svg: the area covered by A or B (union), by both (intersect),\n"
    "by A and not B (subtract) or by exactly one of them (xor). Each file is\n"
    "the filled area of all its shapes, each filled by its own fill-rule;\n"
    "open subpaths are closed for filling, as SVG does. The result is one path\n"
    "with fill-rule=\"evenodd\" in the frame (view box and size) of A, and a\n"
    "line with the number of loops and of points is printed.\n"
    "\n"
    "options:\n"
    "  -o, --output OUT.svg   the file to write (required)\n"
    "  --nonzero              fill every shape of both files by the non-zero rule\n"
    "  --evenodd              fill every shape of both files by the even-odd rule\n"
    "  --precise              meet curves at 1e-8 units instead of about 1.4\n"
    "                         (for drawings in small units)\n"
    "  -h, --help             this text\n";

namespace {

using OstraCrv::PolycurveD;
using OstraCrv::WeldFlags;
namespace svgdoc = OstraCrv::svgdoc;

struct Operand {
  PolycurveD curve;
  bool nonZero = true;
};

Operand MakeOperand(const svgdoc::Document& doc, int rule, WeldFlags flags) {
  Operand op;
  bool first = true;
  for (const auto& shape : doc.shapes) {
    PolycurveD c = shape.curve;
    c.CloseOpenSubpaths(false);
    const bool nonZero = rule == 0 ? shape.fillRule == svgdoc::FillRule::nonzero : rule > 0;
    if (first) {
      op.curve = c;
      op.nonZero = nonZero;
      first = false;
    } else {
      op.curve = PolycurveD::Union(op.curve, c, op.nonZero, nonZero, flags);
      op.nonZero = false;
    }
  }
  return op;
}

}  // namespace

int RunWeld(const std::string& command, const std::vector<std::string>& argv) {
  Args args;
  std::string message;
  if (!args.Parse(WithLongOutput(argv), {"--output"}, {"--nonzero", "--evenodd", "--precise"}, message))
    return UsageError(command, message);
  if (args.help) {
    std::cout << kWeldHelp;
    return kOk;
  }
  if (args.positional.size() != 2) return UsageError(command, "expects two files: A.svg B.svg");
  if (args.Has("--nonzero") && args.Has("--evenodd")) return UsageError(command, "--nonzero and --evenodd exclude each other");
  const std::string out = args.Value("--output");
  if (out.empty()) return UsageError(command, "needs an output file: -o OUT.svg");

  svgdoc::Document a, b;
  if (!LoadDocument(args.positional[0], a) || !LoadDocument(args.positional[1], b)) return kInputError;
  const int rule = args.Has("--nonzero") ? 1 : args.Has("--evenodd") ? -1 : 0;
  const WeldFlags flags = args.Has("--precise") ? WeldFlags::Precise : WeldFlags::None;
  // Both drawings in the library's frame: B's shapes are brought into A's
  // document coordinates through its own mirror first.
  const Operand first = MakeOperand(a, rule, flags);
  Operand second = MakeOperand(b, rule, flags);
  second.curve *= b.frame.ToDocument();
  second.curve *= a.frame.ToLibrary();

  PolycurveD result;
  if (command == "union")
    result = PolycurveD::Union(first.curve, second.curve, first.nonZero, second.nonZero, flags);
  else if (command == "intersect")
    result = PolycurveD::Intersect(first.curve, second.curve, first.nonZero, second.nonZero, flags);
  else if (command == "subtract")
    result = PolycurveD::Subtract(first.curve, second.curve, first.nonZero, second.nonZero, flags);
  else
    result = PolycurveD::Xor(first.curve, second.curve, first.nonZero, second.nonZero, flags);
  // Nodes carry no selection in a file.
  for (unsigned long i = 0; i < result.GetPointCount(); ++i)
    result.SetNodeType(int(i), NODETYPE(result.GetNodeType(int(i)) & ~NodeMask::kEnabled));

  int loops = 0;
  for (unsigned long i = 0; i < result.GetPointCount(); ++i) loops += IsMove(result.GetNodeType(int(i))) ? 1 : 0;
  const auto& frame = a.frame;
  std::ostringstream o;
  o << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<svg xmlns=\"http://www.w3.org/2000/svg\"";
  if (frame.hasViewBox)
    o << " viewBox=\"" << Number(frame.viewBox.left, 12) << " " << Number(frame.viewBox.bottom, 12) << " "
      << Number(frame.viewBox.Width(), 12) << " " << Number(frame.viewBox.Height(), 12) << "\"";
  if (frame.width > 0 && frame.height > 0)
    o << " width=\"" << Number(frame.width, 12) << "\" height=\"" << Number(frame.height, 12) << "\"";
  o << ">\n<!-- crv " << command << " of " << svgdoc::XmlEscape(args.positional[0]) << " and "
    << svgdoc::XmlEscape(args.positional[1]) << " -->\n";
  const std::string d = svgdoc::ToDocumentPathData(result, frame);
  if (!d.empty()) o << "<path id=\"" << command << "\" d=\"" << d << "\" fill=\"#2563eb\" fill-rule=\"evenodd\"/>\n";
  o << "</svg>\n";
  if (const int status = WriteTextFile(out, o.str()); status != kOk) return status;
  std::cout << command << ": " << loops << (loops == 1 ? " loop" : " loops") << ", " << result.GetPointCount()
            << " points\n";
  return kOk;
}

}  // namespace crv
