// Writing compact SVG path data; see svg_path.h.
//
// The writer keeps the reader's view: the current point, subpath start and
// last Bezier control exactly as ParseSvgPathData will compute them from the
// text written so far. Every coordinate is first given its target value, the
// double that its absolute token reads back as (the coordinate itself at full
// precision, since the shortest round-trip form of std::to_chars reads back
// exactly). A relative token, an H or V, or an S whose reflected control the
// reader would compute itself, is used only when it reproduces the target bit
// for bit; so the reader's view never drifts and, at full precision, reading
// the text gives the curve back exactly.
//
// Compactness: per command the shorter of the absolute and the relative form
// is taken; a command letter is left out when it repeats the previous one (a
// move's letter is never left out, since pairs after a move are lines); and
// separators are left out where the next token starts with '-', or with '.'
// after a token that already has a '.' or an exponent. Leading zeros before a
// decimal point are dropped ("0.5" is written ".5").
//
// Complexity: O(nodes).
#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstring>

#include "ostracrv/io/svg_path.h"
#include "svg_syntax.h"

namespace OstraCrv {

namespace {

using MavikMath::V;

bool same_bits(double a, double b) noexcept { return std::memcmp(&a, &b, sizeof a) == 0; }
bool same_bits(const V& a, const V& b) noexcept { return same_bits(a.x, b.x) && same_bits(a.y, b.y); }

// A number token in the shortest form at the chosen precision.
std::string format_number(double v, int precision) {
  char buf[400];
  std::to_chars_result r{};
  if (precision < 0) r = std::to_chars(buf, buf + sizeof buf, v);
  else r = std::to_chars(buf, buf + sizeof buf, v, std::chars_format::fixed, precision);
  char* end = r.ptr;
  char* e = std::find(buf, end, 'e');
  // Mantissa: trailing zeros of a fraction and a bare point go.
  char* mEnd = e;
  if (std::find(buf, mEnd, '.') != mEnd) {
    while (mEnd > buf && mEnd[-1] == '0') --mEnd;
    if (mEnd > buf && mEnd[-1] == '.') --mEnd;
  }
  std::string s;
  s.reserve(std::size_t(end - buf));
  const char* m = buf;
  if (*m == '-') {
    // A value rounded to zero has no sign worth keeping.
    if (!(precision >= 0 && mEnd - m == 2 && m[1] == '0')) s += '-';
    ++m;
  }
  if (mEnd - m >= 2 && m[0] == '0' && m[1] == '.') ++m;  // "0.5" -> ".5"
  s.append(m, std::size_t(mEnd - m));
  if (e != end) {
    // Exponent without '+' and leading zeros: "1e+07" -> "1e7".
    const char* x = e + 1;
    s += 'e';
    if (*x == '-') s += '-';
    if (*x == '-' || *x == '+') ++x;
    while (x + 1 < end && *x == '0') ++x;
    s.append(x, std::size_t(end - x));
  }
  return s;
}

double read_number(const std::string& token) {
  double v = 0.0;
  std::size_t pos = 0;
  svgsyntax::scan_number(token, pos, v);
  return v;
}

class PathWriter {
 public:
  PathWriter(SvgPathWriteOptions const& o) : precision_(o.precision < 0 ? -1 : std::min(o.precision, 17)),
                                            relative_(o.allowRelative) {}
  std::string Write(V const* pts, NODETYPE const* nodes, int n);

 private:
  int precision_;
  bool relative_;
  std::string out_;
  std::vector<std::string> abs_, rel_;
  char lastLetter_ = 0;       // letter whose repetition may be left out
  bool lastHasDotOrExp_ = false;
  bool lastWasLetter_ = false;
  V cur_{}, start_{};
  bool haveCubic_ = false;
  V lastCubic_{};

  // The value the reader gets for v's absolute token.
  double Target(double v) const { return precision_ < 0 ? v : read_number(format_number(v, precision_)); }
  V Target(const V& p) const { return {Target(p.x), Target(p.y)}; }

  // The token for the relative step from base to target, or "" if no token
  // reads back to exactly that target.
  std::string RelToken(double base, double target) const {
    const std::string t = format_number(target - base, precision_);
    return same_bits(base + read_number(t), target) ? t : std::string();
  }

  void Token(const std::string& t) {
    if (!lastWasLetter_ && !out_.empty()) {
      const bool joins = t[0] == '-' || (t[0] == '.' && lastHasDotOrExp_);
      if (!joins) out_ += ' ';
    }
    out_ += t;
    lastHasDotOrExp_ = t.find_first_of(".e") != std::string::npos;
    lastWasLetter_ = false;
  }
  void Letter(char c, bool mayOmit) {
    if (mayOmit && c == lastLetter_) return;
    out_ += c;
    lastLetter_ = c;
    lastWasLetter_ = true;
  }
  static std::size_t Length(const std::vector<std::string>& tokens) {
    std::size_t n = 0;
    for (const auto& t : tokens) n += t.size() + 1;
    return n;
  }
  // Emits a command with its tokens, choosing absolute or relative.
  void Command(char letter, const std::vector<std::string>& abs, const std::vector<std::string>& rel, bool relOk,
               bool isMove) {
    const bool useRel = relOk && relative_ && Length(rel) + (char(letter | 0x20) == lastLetter_ ? 0 : 1) <
                                                   Length(abs) + (letter == lastLetter_ ? 0 : 1);
    const char l = useRel ? char(letter | 0x20) : letter;
    Letter(l, !isMove);
    for (const auto& t : useRel ? rel : abs) Token(t);
    // Pairs after a move are lines: a following line may leave its letter out.
    if (isMove) lastLetter_ = useRel ? 'l' : 'L';
  }
  // Absolute and relative tokens of points; relOk turns false if one fails.
  void Points(std::initializer_list<V> targets, std::vector<std::string>& abs, std::vector<std::string>& rel,
              bool& relOk) {
    for (const V& p : targets) {
      abs.push_back(format_number(p.x, precision_));
      abs.push_back(format_number(p.y, precision_));
      if (relOk) {
        std::string rx = RelToken(cur_.x, p.x), ry = RelToken(cur_.y, p.y);
        if (rx.empty() || ry.empty()) relOk = false;
        rel.push_back(rx);
        rel.push_back(ry);
      }
    }
  }
};

std::string PathWriter::Write(V const* pts, NODETYPE const* nodes, int n) {
  for (int i = 0; i < n; ++i) {
    const NODETYPE node = nodes[i];
    // Token lists reused from command to command; the tokens are short
    // enough for the strings' own buffers, so nothing is allocated per node.
    std::vector<std::string>& abs = abs_;
    std::vector<std::string>& rel = rel_;
    abs.clear();
    rel.clear();
    bool relOk = true;
    if (IsMove(node)) {
      const V p = Target(pts[i]);
      Points({p}, abs, rel, relOk);
      Command('M', abs, rel, relOk, true);
      cur_ = start_ = p;
      haveCubic_ = false;
      if (IsClosedNode(node) && (i + 1 == n || IsMove(nodes[i + 1]))) {
        Letter('Z', false);  // a closed lone move
        lastLetter_ = 'Z';
      }
      continue;
    }
    const bool closing = IsClosedNode(node) && (i + 1 == n || IsMove(nodes[i + 1]));
    if (IsLine(node)) {
      const V p = Target(pts[i]);
      // The reader adds the closing line itself when the current point is off
      // the start, and puts its end exactly on the start.
      if (closing && same_bits(p, start_) && !(cur_ == start_)) {
        // nothing to write but Z
      } else if (same_bits(p.y, cur_.y) && !same_bits(p.x, cur_.x)) {
        abs.push_back(format_number(p.x, precision_));
        std::string r = RelToken(cur_.x, p.x);
        rel.push_back(r);
        Command('H', abs, rel, !r.empty(), false);
      } else if (same_bits(p.x, cur_.x)) {
        abs.push_back(format_number(p.y, precision_));
        std::string r = RelToken(cur_.y, p.y);
        rel.push_back(r);
        Command('V', abs, rel, !r.empty(), false);
      } else {
        Points({p}, abs, rel, relOk);
        Command('L', abs, rel, relOk, false);
      }
      cur_ = p;
      haveCubic_ = false;
    } else if (IsCurve(node)) {
      const V c1 = Target(pts[i - 2]), c2 = Target(pts[i - 1]), p = Target(pts[i]);
      const V reflected = haveCubic_ ? svgsyntax::reflect(cur_, lastCubic_) : cur_;
      if (same_bits(reflected, c1)) {
        Points({c2, p}, abs, rel, relOk);
        Command('S', abs, rel, relOk, false);
      } else {
        Points({c1, c2, p}, abs, rel, relOk);
        Command('C', abs, rel, relOk, false);
      }
      cur_ = p;
      haveCubic_ = true;
      lastCubic_ = c2;
    }
    if (closing) {
      Letter('Z', false);
      lastLetter_ = 'Z';
      cur_ = start_;
      haveCubic_ = false;
    }
  }
  return std::move(out_);
}

}  // namespace

bool WriteSvgPathData(PolycurveT<MavikMath::V> const& c, std::string& out, SvgPathWriteOptions const& options) {
  const int n = int(c.GetPointCount());
  V const* pts = c.GetPoints();
  NODETYPE const* nodes = c.GetNodeTypes();
  if (n == 0) {
    out.clear();
    return true;
  }
  if (!IsValidCurve(nodes, (unsigned long)n)) return false;
  for (int i = 0; i < n; ++i)
    if (!pts[i].IsFinite()) return false;
  PathWriter writer(options);
  out = writer.Write(pts, nodes, n);
  return true;
}

}  // namespace OstraCrv
