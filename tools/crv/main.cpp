// crv: looks at SVG drawings through the OstraCrv curve library.
//
// The dispatcher: picks the subcommand by its name and hands it the rest of
// the arguments. Exit status: 0 on success, 1 when an input file cannot be
// read, 2 on a bad command line.
#include <iostream>
#include <string>
#include <vector>

#include "common.h"

namespace {

const char* const kHelp =
    "crv - look at SVG drawings through the OstraCrv curve library\n"
    "\n"
    "usage: crv COMMAND [ARGUMENTS]\n"
    "\n"
    "commands:\n"
    "  info FILE.svg                 nodes, segments, closure, validity, area, length and\n"
    "                                bounds of every path and subpath\n"
    "  render FILE.svg -o OUT.svg    draw the paths with nodes, control points and handles\n"
    "                                marked (--png also writes a PNG)\n"
    "  intersect-points A.svg [B.svg] [-o OUT.svg]\n"
    "                                crossings, touches and shared stretches of the\n"
    "                                paths, listed (and drawn with -o)\n"
    "  inside FILE.svg X Y           whether a point lies inside each path, by the non-zero\n"
    "                                and the even-odd rule\n"
    "  union A.svg B.svg -o OUT.svg  the filled area of A or B; also intersect (A and B),\n"
    "                                subtract (A and not B) and xor (exactly one)\n"
    "  help [COMMAND]                this text, or the help of one command\n"
    "\n"
    "'crv COMMAND --help' shows the help of a command.\n"
    "\n"
    "Coordinates: SVG's y axis points down, the library's up. crv mirrors the\n"
    "document through the middle of its view box (y' = H - y, H = 2 y0 + height of\n"
    "the viewBox; the height attribute without a view box; plain negation without\n"
    "either), so a shape drawn clockwise on screen has a positive area.\n"
    "\n"
    "Exit status: 0 on success, 1 when an input file cannot be read, 2 on a bad\n"
    "command line.\n";

}  // namespace

int main(int argc, char** argv) {
  std::vector<std::string> args(argv + 1, argv + argc);
  if (args.empty()) {
    std::cerr << kHelp;
    return crv::kUsage;
  }
  const std::string command = args[0];
  args.erase(args.begin());
  if (command == "info") return crv::RunInfo(args);
  if (command == "render") return crv::RunRender(args);
  if (command == "inside") return crv::RunInside(args);
  if (command == "intersect-points") return crv::RunIntersectPoints(args);
  if (command == "union" || command == "intersect" || command == "subtract" || command == "xor")
    return crv::RunWeld(command, args);
  if (command == "help" || command == "--help" || command == "-h") {
    if (args.empty()) {
      std::cout << kHelp;
      return crv::kOk;
    }
    // The help of each command; the set operations share one text.
    const struct {
      const char* command;
      const char* help;
    } helps[] = {{"info", crv::kInfoHelp},
                 {"render", crv::kRenderHelp},
                 {"inside", crv::kInsideHelp},
                 {"intersect-points", crv::kIntersectPointsHelp},
                 {"union", crv::kWeldHelp},
                 {"intersect", crv::kWeldHelp},
                 {"subtract", crv::kWeldHelp},
                 {"xor", crv::kWeldHelp}};
    for (const auto& h : helps)
      if (args[0] == h.command) {
        std::cout << h.help;
        return crv::kOk;
      }
    std::cerr << "crv help: unknown command '" << args[0] << "'\n";
    return crv::kUsage;
  }
  std::cerr << "crv: unknown command '" << command << "' (see 'crv help')\n";
  return crv::kUsage;
}
