// Reading SVG path data; see svg_path.h for the mapping onto nodes.
//
// One pass over the text with a small state: the current point, the start of
// the current subpath (its index and point), the last Bezier control point
// for S and the last quadratic control point for T, and whether the last
// command was Z. Each command letter is followed by argument groups; a group
// is read whole into a local array before anything is appended, so that a
// fault inside a group leaves the path as it was after the previous complete
// group, which is how SVG renderers draw malformed data.
//
// Complexity: O(length of the text + nodes produced); arcs produce at most
// 1024 cubics each.
#include <array>
#include <cmath>
#include <vector>

#include "ostracrv/io/svg_path.h"
#include "svg_syntax.h"

namespace OstraCrv {

namespace {

using MavikMath::V;
using namespace svgsyntax;

// Number of arguments of one group, per command letter (lower case).
int arg_count(char lower) noexcept {
  switch (lower) {
    case 'm': case 'l': case 't': return 2;
    case 'h': case 'v': return 1;
    case 'c': return 6;
    case 's': case 'q': return 4;
    case 'a': return 7;
    case 'z': return 0;
    default: return -1;
  }
}

class PathReader {
 public:
  PathReader(std::string_view d, SvgPathParseOptions const& options) : d_(d), options_(options) {}

  bool Run(SvgPathError& error);
  void TakeResult(std::vector<V>& points, std::vector<NODETYPE>& nodes) {
    points.swap(points_);
    nodes.swap(nodes_);
  }

 private:
  std::string_view d_;
  SvgPathParseOptions options_;
  std::size_t pos_ = 0;
  std::size_t groupStart_ = 0;  // where the argument group being applied began
  std::vector<V> points_;
  std::vector<NODETYPE> nodes_;
  std::vector<V> arc_;

  V current_{};
  V start_{};
  std::size_t startIndex_ = 0;
  bool afterClose_ = false;
  // The previous command's reflected control points, if it was a Bezier (for
  // S) or a quadratic (for T).
  bool haveCubic_ = false, haveQuad_ = false;
  V lastCubic_{}, lastQuad_{};

  void SkipWsp() {
    while (pos_ < d_.size() && is_wsp(d_[pos_])) ++pos_;
  }
  // Skips white space and at most one comma; returns false if a second comma
  // follows.
  bool SkipCommaWsp() {
    SkipWsp();
    if (pos_ < d_.size() && d_[pos_] == ',') {
      ++pos_;
      SkipWsp();
      if (pos_ < d_.size() && d_[pos_] == ',') return false;
    }
    return true;
  }
  bool Fail(SvgPathError& error, const char* reason) { return FailAt(error, pos_, reason); }
  bool FailAt(SvgPathError& error, std::size_t at, const char* reason) {
    error.offset = at;
    error.reason = reason;
    return false;
  }
  bool ReadGroup(char lower, double* args, SvgPathError& error);
  bool Apply(char lower, bool relative, const double* args, SvgPathError& error);

  void BeginSubpathIfClosed() {
    if (afterClose_) {
      startIndex_ = points_.size();
      points_.push_back(start_);
      nodes_.push_back(NodeTypes::Open::move);
      afterClose_ = false;
    }
  }
  void Line(const V& p) {
    BeginSubpathIfClosed();
    points_.push_back(p);
    nodes_.push_back(NodeTypes::Open::line);
    current_ = p;
  }
  void Cubic(const V& c1, const V& c2, const V& p) {
    BeginSubpathIfClosed();
    points_.push_back(c1);
    points_.push_back(c2);
    points_.push_back(p);
    nodes_.push_back(NodeTypes::arc);
    nodes_.push_back(NodeTypes::arc);
    nodes_.push_back(NodeTypes::Open::curve);
    current_ = p;
  }
  void Close();
};

bool PathReader::ReadGroup(char lower, double* args, SvgPathError& error) {
  groupStart_ = pos_;
  const int count = arg_count(lower);
  for (int k = 0; k < count; ++k) {
    if (k > 0 && !SkipCommaWsp()) return Fail(error, "unexpected comma");
    if (lower == 'a' && (k == 3 || k == 4)) {
      if (pos_ >= d_.size()) return Fail(error, "expected a flag (0 or 1)");
      const char c = d_[pos_];
      if (c != '0' && c != '1') return Fail(error, "expected a flag (0 or 1)");
      args[k] = c == '1' ? 1.0 : 0.0;
      ++pos_;
      continue;
    }
    switch (scan_number(d_, pos_, args[k])) {
      case NumberScan::ok: break;
      case NumberScan::none: return Fail(error, "expected a number");
      case NumberScan::out_of_range: return Fail(error, "number out of range");
    }
  }
  return true;
}

void PathReader::Close() {
  if (afterClose_ || points_.empty()) return;  // Z right after Z
  const std::size_t last = points_.size() - 1;
  if (last == startIndex_) {
    nodes_[startIndex_] = NodeTypes::Closed::move;
  } else {
    if (!(current_ == start_)) {
      points_.push_back(start_);
      nodes_.push_back(NodeTypes::Open::line);
    }
    nodes_[startIndex_] = NodeTypes::Closed::move;
    NODETYPE& end = nodes_.back();
    end = NODETYPE((end | NodeMask::kClosed) & ~NodeMask::kUser);
  }
  current_ = start_;
  afterClose_ = true;
}

bool PathReader::Apply(char lower, bool relative, const double* a, SvgPathError& error) {
  // Absolute values are taken as they are (adding them to a zero would turn
  // -0 into +0).
  auto pt = [&](int k) { return relative ? V{current_.x + a[k], current_.y + a[k + 1]} : V{a[k], a[k + 1]}; };
  // Everything appended must be finite; a relative chain or huge arc radii
  // may overflow.
  auto finite = [](const V& p) { return std::isfinite(p.x) && std::isfinite(p.y); };
  bool cubic = false, quad = false;
  V cubicCtrl{}, quadCtrl{};
  switch (lower) {
    case 'm': {
      const V p = pt(0);
      if (!finite(p)) return FailAt(error, groupStart_, "coordinate is not finite");
      startIndex_ = points_.size();
      points_.push_back(p);
      nodes_.push_back(NodeTypes::Open::move);
      current_ = start_ = p;
      afterClose_ = false;
      break;
    }
    case 'l': case 'h': case 'v': {
      V p = current_;
      if (lower == 'l') p = pt(0);
      else if (lower == 'h') p.x = relative ? current_.x + a[0] : a[0];
      else p.y = relative ? current_.y + a[0] : a[0];
      if (!finite(p)) return FailAt(error, groupStart_, "coordinate is not finite");
      Line(p);
      break;
    }
    case 'c': case 's': {
      const V c1 = lower == 'c' ? pt(0) : (haveCubic_ ? reflect(current_, lastCubic_) : current_);
      const V c2 = lower == 'c' ? pt(2) : pt(0);
      const V p = lower == 'c' ? pt(4) : pt(2);
      if (!finite(c1) || !finite(c2) || !finite(p)) return FailAt(error, groupStart_, "coordinate is not finite");
      Cubic(c1, c2, p);
      cubic = true;
      cubicCtrl = c2;
      break;
    }
    case 'q': case 't': {
      const V p0 = current_;
      const V q = lower == 'q' ? pt(0) : (haveQuad_ ? reflect(current_, lastQuad_) : current_);
      const V p = lower == 'q' ? pt(2) : pt(0);
      const V c1 = quad_control1(p0, q), c2 = quad_control2(q, p);
      if (!finite(q) || !finite(c1) || !finite(c2) || !finite(p)) return FailAt(error, groupStart_, "coordinate is not finite");
      Cubic(c1, c2, p);
      quad = true;
      quadCtrl = q;
      break;
    }
    case 'a': {
      const V p = pt(5);
      if (!finite(p)) return FailAt(error, groupStart_, "coordinate is not finite");
      arc_.clear();
      const int pieces =
          SvgArcToCubics(current_, a[0], a[1], a[2], a[3] != 0.0, a[4] != 0.0, p, options_.arcTolerance, arc_);
      if (pieces < 0) {
        Line(p);
      } else {
        for (const V& c : arc_)
          if (!finite(c)) return FailAt(error, groupStart_, "coordinate is not finite");
        for (int k = 0; k < pieces; ++k) Cubic(arc_[3 * k], arc_[3 * k + 1], arc_[3 * k + 2]);
      }
      break;
    }
    case 'z':
      Close();
      break;
  }
  haveCubic_ = cubic;
  lastCubic_ = cubicCtrl;
  haveQuad_ = quad;
  lastQuad_ = quadCtrl;
  return true;
}

bool PathReader::Run(SvgPathError& error) {
  SkipWsp();
  if (pos_ >= d_.size()) return true;
  std::array<double, 7> args{};
  bool first = true;
  while (true) {
    SkipWsp();
    if (pos_ >= d_.size()) return true;
    const char c = d_[pos_];
    const char lower = char(c | 0x20);
    const bool letter = (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z');
    if (!letter || arg_count(lower) < 0) return Fail(error, c == ',' ? "unexpected comma" : "expected a command");
    if (first && lower != 'm') return Fail(error, "path data must begin with a move");
    first = false;
    const bool relative = c >= 'a';
    ++pos_;
    if (lower == 'z') {
      Apply('z', false, args.data(), error);
      continue;
    }
    // The first group follows the letter; further groups repeat the command,
    // and pairs after a move are lines.
    char command = lower;
    SkipWsp();
    if (!ReadGroup(command, args.data(), error)) return false;
    if (!Apply(command, relative, args.data(), error)) return false;
    if (command == 'm') command = 'l';
    while (true) {
      SkipWsp();
      std::size_t comma = std::string_view::npos;
      if (pos_ < d_.size() && d_[pos_] == ',') {
        comma = pos_++;
        SkipWsp();
      }
      const char next = pos_ < d_.size() ? d_[pos_] : '\0';
      const bool number = is_digit(next) || next == '.' || next == '+' || next == '-';
      if (!number) {
        if (comma != std::string_view::npos) {
          pos_ = comma;
          return Fail(error, "unexpected comma");
        }
        break;
      }
      if (!ReadGroup(command, args.data(), error)) return false;
      if (!Apply(command, relative, args.data(), error)) return false;
    }
  }
}

}  // namespace

bool ParseSvgPathData(std::string_view d, PolycurveT<MavikMath::V>& out, SvgPathError* error,
                      SvgPathParseOptions const& options) {
  PathReader reader(d, options);
  SvgPathError local;
  const bool ok = reader.Run(local);
  std::vector<V> points;
  std::vector<NODETYPE> nodes;
  reader.TakeResult(points, nodes);
  out.MoveData(points, nodes);
  if (error) *error = ok ? SvgPathError{} : local;
  return ok;
}

}  // namespace OstraCrv
