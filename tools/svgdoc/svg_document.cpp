// Reading SVG documents; see svg_document.h.
//
// A depth-first walk over the XML tree carries the inherited state: the
// current transform (element transforms composed with their ancestors'),
// fill-rule, fill and stroke. Each basic shape is written as the path data
// that SVG defines for it and read by the library's path data reader, so that
// arcs of rounded rectangles, circles and ellipses go through the same
// conversion as arcs in path data. The curve is then mapped by the element's
// transform and the document mirror in one affine step.
//
// Complexity: linear in the size of the document and of the curves made.
#include "svg_document.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <fstream>
#include <numbers>
#include <sstream>

#include <pugixml.hpp>

#include "ostracrv/io/svg_path.h"

namespace OstraCrv::svgdoc {

namespace {

using MavikMath::V;

bool is_wsp(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f'; }

std::string_view trim(std::string_view s) {
  while (!s.empty() && is_wsp(s.front())) s.remove_prefix(1);
  while (!s.empty() && is_wsp(s.back())) s.remove_suffix(1);
  return s;
}

std::string lower(std::string_view s) {
  std::string r(s);
  for (char& c : r)
    if (c >= 'A' && c <= 'Z') c = char(c - 'A' + 'a');
  return r;
}

// One number of the SVG grammar at s[pos]; moves pos past it.
bool scan_number(std::string_view s, std::size_t& pos, double& v) {
  std::size_t i = pos;
  bool negative = false;
  if (i < s.size() && (s[i] == '+' || s[i] == '-')) negative = s[i++] == '-';
  const std::size_t begin = i;
  bool digits = false;
  while (i < s.size() && std::isdigit((unsigned char)s[i])) ++i, digits = true;
  if (i < s.size() && s[i] == '.') {
    ++i;
    while (i < s.size() && std::isdigit((unsigned char)s[i])) ++i, digits = true;
  }
  if (!digits) return false;
  if (i < s.size() && (s[i] == 'e' || s[i] == 'E')) {
    std::size_t j = i + 1;
    if (j < s.size() && (s[j] == '+' || s[j] == '-')) ++j;
    if (j < s.size() && std::isdigit((unsigned char)s[j])) {
      while (j < s.size() && std::isdigit((unsigned char)s[j])) ++j;
      i = j;
    }
  }
  double x = 0;
  const auto r = std::from_chars(s.data() + begin, s.data() + i, x);
  if (r.ec != std::errc() || !std::isfinite(x)) return false;
  v = negative ? -x : x;
  pos = i;
  return true;
}

// Which viewport extent a percentage refers to.
enum class Axis { x, y, other };

// A length attribute: number with an optional unit. absent is returned for
// a missing attribute; bad for one that does not parse.
enum class LengthRead { ok, absent, bad };

class Reader {
 public:
  Reader(Document& doc, std::string_view text) : doc_(doc), text_(text) {}
  void Walk(const pugi::xml_node& node, const MATRIX& ctm, const Shape& inherited);
  void ReadRoot(const pugi::xml_node& root);

 private:
  Document& doc_;
  std::string_view text_;

  int LineOf(const pugi::xml_node& node) const {
    const std::ptrdiff_t off = node.offset_debug();
    if (off < 0) return 0;
    return 1 + int(std::count(text_.begin(), text_.begin() + std::min<std::ptrdiff_t>(off, text_.size()), '\n'));
  }
  void Warn(const pugi::xml_node& node, const std::string& what) {
    doc_.warnings.push_back("line " + std::to_string(LineOf(node)) + ": <" + std::string(node.name()) + "> " + what);
  }
  double PercentBase(Axis a) const {
    const double w = doc_.frame.hasViewBox ? doc_.frame.viewBox.Width() : doc_.frame.width;
    const double h = doc_.frame.hasViewBox ? doc_.frame.viewBox.Height() : doc_.frame.height;
    if (a == Axis::x) return w;
    if (a == Axis::y) return h;
    return std::sqrt((w * w + h * h) / 2);
  }
  LengthRead Length(const pugi::xml_node& node, const char* name, Axis axis, double& v) {
    const pugi::xml_attribute a = node.attribute(name);
    if (!a) return LengthRead::absent;
    const std::string_view s = trim(a.value());
    if (s == "auto") return LengthRead::absent;
    std::size_t pos = 0;
    double x = 0;
    if (!scan_number(s, pos, x)) {
      Warn(node, std::string("bad length ") + name + "=\"" + a.value() + "\"");
      return LengthRead::bad;
    }
    const std::string unit = lower(trim(s.substr(pos)));
    double f = 1;
    if (unit.empty() || unit == "px") f = 1;
    else if (unit == "in") f = 96;
    else if (unit == "cm") f = 96 / 2.54;
    else if (unit == "mm") f = 96 / 25.4;
    else if (unit == "pt") f = 96.0 / 72;
    else if (unit == "pc") f = 16;
    else if (unit == "%") f = PercentBase(axis) / 100;
    else {
      Warn(node, std::string("unknown unit in ") + name + "=\"" + a.value() + "\"");
      return LengthRead::bad;
    }
    v = x * f;
    return LengthRead::ok;
  }
  // A length with a default for absent (and bad) values.
  double LengthOr(const pugi::xml_node& node, const char* name, Axis axis, double fallback) {
    double v = fallback;
    return Length(node, name, axis, v) == LengthRead::ok ? v : fallback;
  }
  void ApplyPresentation(const pugi::xml_node& node, Shape& state);
  bool ShapePathData(const pugi::xml_node& node, const std::string& name, std::string& d);
  void AddShape(const pugi::xml_node& node, const std::string& name, const MATRIX& ctm, const Shape& state);
};

// A number in its shortest exact form, for path data made from attributes.
std::string num(double v) {
  char buf[32];
  const auto r = std::to_chars(buf, buf + sizeof buf, v);
  return std::string(buf, r.ptr);
}

// Path data made from attribute values, each number in its exact shortest
// form.
class PathText {
 public:
  PathText& Cmd(char c) {
    s_ += c;
    return *this;
  }
  PathText& Num(double v) {
    if (!s_.empty() && !std::isalpha((unsigned char)s_.back())) s_ += ' ';
    s_ += num(v);
    return *this;
  }
  PathText& Pt(double x, double y) { return Num(x).Num(y); }
  // An arc of the given radii, small and clockwise on screen, to (x, y).
  PathText& Arc(double rx, double ry, double x, double y) {
    return Cmd('A').Num(rx).Num(ry).Num(0).Num(0).Num(1).Pt(x, y);
  }
  std::string Take() { return std::move(s_); }

 private:
  std::string s_;
};

void set_property(Shape& s, const Shape& parent, std::string_view name, std::string_view value) {
  value = trim(value);
  const bool inherit = value == "inherit";
  if (name == "fill-rule") {
    if (inherit) s.fillRule = parent.fillRule;
    else if (value == "evenodd") s.fillRule = FillRule::evenodd;
    else if (value == "nonzero") s.fillRule = FillRule::nonzero;
  } else if (name == "fill") {
    s.fill = inherit ? parent.fill : std::string(value);
  } else if (name == "stroke") {
    s.stroke = inherit ? parent.stroke : std::string(value);
  }
}

void Reader::ApplyPresentation(const pugi::xml_node& node, Shape& state) {
  const Shape parent = state;
  for (const char* name : {"fill-rule", "fill", "stroke"})
    if (const pugi::xml_attribute a = node.attribute(name)) set_property(state, parent, name, a.value());
  // The style attribute overrides presentation attributes.
  std::string_view style = node.attribute("style").value();
  while (!style.empty()) {
    const std::size_t semi = style.find(';');
    std::string_view decl = style.substr(0, semi);
    style = semi == std::string_view::npos ? std::string_view() : style.substr(semi + 1);
    const std::size_t colon = decl.find(':');
    if (colon == std::string_view::npos) continue;
    std::string_view value = decl.substr(colon + 1);
    if (const std::size_t bang = value.find('!'); bang != std::string_view::npos) value = value.substr(0, bang);
    set_property(state, parent, lower(trim(decl.substr(0, colon))), value);
  }
}

bool is_display_none(const pugi::xml_node& node) {
  if (trim(node.attribute("display").value()) == "none") return true;
  const std::string style = lower(node.attribute("style").value());
  std::size_t at = style.find("display");
  while (at != std::string::npos) {
    std::size_t i = at + 7;
    while (i < style.size() && is_wsp(style[i])) ++i;
    if (i < style.size() && style[i] == ':') {
      std::string_view rest = std::string_view(style).substr(i + 1);
      rest = trim(rest.substr(0, rest.find(';')));
      if (rest == "none") return true;
    }
    at = style.find("display", at + 1);
  }
  return false;
}

// The local element name: an "svg:" prefix is dropped.
std::string local_name(const pugi::xml_node& node) {
  std::string n = node.name();
  if (n.rfind("svg:", 0) == 0) n.erase(0, 4);
  return n;
}

bool Reader::ShapePathData(const pugi::xml_node& node, const std::string& name, std::string& d) {
  if (name == "path") {
    d = node.attribute("d").value();
    return true;
  }
  PathText t;
  if (name == "line") {
    t.Cmd('M').Pt(LengthOr(node, "x1", Axis::x, 0), LengthOr(node, "y1", Axis::y, 0));
    t.Cmd('L').Pt(LengthOr(node, "x2", Axis::x, 0), LengthOr(node, "y2", Axis::y, 0));
    d = t.Take();
    return true;
  }
  if (name == "polyline" || name == "polygon") {
    // The points list has the grammar of the coordinate pairs after a move.
    const std::string_view pts = trim(node.attribute("points").value());
    if (pts.empty()) return false;
    d.assign(1, 'M');
    d += pts;
    if (name == "polygon") d += 'Z';
    return true;
  }
  if (name == "rect") {
    const double x = LengthOr(node, "x", Axis::x, 0), y = LengthOr(node, "y", Axis::y, 0);
    const double w = LengthOr(node, "width", Axis::x, 0), h = LengthOr(node, "height", Axis::y, 0);
    if (!(w > 0) || !(h > 0)) return false;  // not drawn
    // A missing (or negative) radius takes the other one's value.
    double rx = -1, ry = -1;
    Length(node, "rx", Axis::x, rx);
    Length(node, "ry", Axis::y, ry);
    if (rx < 0) rx = ry;
    if (ry < 0) ry = rx;
    rx = std::clamp(rx, 0.0, w / 2);
    ry = std::clamp(ry, 0.0, h / 2);
    if (rx == 0 || ry == 0) {
      t.Cmd('M').Pt(x, y).Cmd('H').Num(x + w).Cmd('V').Num(y + h).Cmd('H').Num(x).Cmd('Z');
      d = t.Take();
      return true;
    }
    // Clockwise on screen from the top edge; straight pieces of zero length
    // (radius half the side) are left out.
    t.Cmd('M').Pt(x + rx, y);
    if (x + rx < x + w - rx) t.Cmd('H').Num(x + w - rx);
    t.Arc(rx, ry, x + w, y + ry);
    if (y + ry < y + h - ry) t.Cmd('V').Num(y + h - ry);
    t.Arc(rx, ry, x + w - rx, y + h);
    if (x + rx < x + w - rx) t.Cmd('H').Num(x + rx);
    t.Arc(rx, ry, x, y + h - ry);
    if (y + ry < y + h - ry) t.Cmd('V').Num(y + ry);
    t.Arc(rx, ry, x + rx, y).Cmd('Z');
    d = t.Take();
    return true;
  }
  if (name == "circle" || name == "ellipse") {
    const double cx = LengthOr(node, "cx", Axis::x, 0), cy = LengthOr(node, "cy", Axis::y, 0);
    double rx = -1, ry = -1;
    if (name == "circle") {
      rx = ry = LengthOr(node, "r", Axis::other, 0);
    } else {
      Length(node, "rx", Axis::x, rx);
      Length(node, "ry", Axis::y, ry);
      if (rx < 0) rx = ry;
      if (ry < 0) ry = rx;
    }
    if (!(rx > 0) || !(ry > 0)) return false;  // not drawn
    // Four quarter arcs clockwise on screen, from the rightmost point.
    t.Cmd('M').Pt(cx + rx, cy).Arc(rx, ry, cx, cy + ry).Arc(rx, ry, cx - rx, cy).Arc(rx, ry, cx, cy - ry);
    t.Arc(rx, ry, cx + rx, cy).Cmd('Z');
    d = t.Take();
    return true;
  }
  return false;
}

void Reader::AddShape(const pugi::xml_node& node, const std::string& name, const MATRIX& ctm, const Shape& state) {
  std::string d;
  if (!ShapePathData(node, name, d)) return;
  Shape s = state;
  s.element = name;
  s.id = node.attribute("id").value();
  s.line = LineOf(node);
  SvgPathError error;
  if (!ParseSvgPathData(d, s.curve, &error)) {
    const std::string where = name == "path" ? "d" : name == "polyline" || name == "polygon" ? "points" : "geometry";
    // Offsets into points are offsets into the made-up "M..." text, one more.
    const std::size_t offset = name == "path" ? error.offset : error.offset > 0 ? error.offset - 1 : 0;
    s.problem = where + ": " + error.reason + " at offset " + std::to_string(offset);
    Warn(node, s.problem);
  }
  if (s.curve.IsEmpty()) return;
  const MATRIX m = ctm.Then(doc_.frame.ToLibrary());
  CurveBuffer<V> buf = s.curve.GetBuffer();
  m.TransformPoints(buf.points, (unsigned long)buf.count);
  doc_.shapes.push_back(std::move(s));
}

void Reader::Walk(const pugi::xml_node& node, const MATRIX& parentCtm, const Shape& inherited) {
  for (pugi::xml_node child = node.first_child(); child; child = child.next_sibling()) {
    if (child.type() != pugi::node_element) continue;
    const std::string name = local_name(child);
    static const char* const kContainers[] = {"g", "a", "switch", "svg"};
    static const char* const kShapes[] = {"path", "rect", "circle", "ellipse", "line", "polyline", "polygon"};
    const bool container = std::find(std::begin(kContainers), std::end(kContainers), name) != std::end(kContainers);
    const bool shape = std::find(std::begin(kShapes), std::end(kShapes), name) != std::end(kShapes);
    if (!container && !shape) {
      if (name == "use" || name == "text" || name == "image") Warn(child, "is not read");
      continue;
    }
    if (is_display_none(child)) continue;
    MATRIX local;
    if (const pugi::xml_attribute t = child.attribute("transform")) {
      if (!ParseTransform(t.value(), local)) {
        Warn(child, std::string("bad transform \"") + t.value() + "\" ignored");
        local = MATRIX{};
      }
    }
    if (name == "svg") {
      // A nested viewport: moved to its x and y; its own view box is not
      // applied.
      const MATRIX move{1, 0, 0, 1, LengthOr(child, "x", Axis::x, 0), LengthOr(child, "y", Axis::y, 0)};
      local = local.Then(move);
      if (child.attribute("viewBox")) Warn(child, "nested viewBox ignored");
    }
    const MATRIX ctm = local.Then(parentCtm);
    Shape state = inherited;
    ApplyPresentation(child, state);
    if (container) Walk(child, ctm, state);
    else AddShape(child, name, ctm, state);
  }
}

void Reader::ReadRoot(const pugi::xml_node& root) {
  Frame& f = doc_.frame;
  std::string_view vb = root.attribute("viewBox").value();
  double v[4];
  std::size_t pos = 0;
  int count = 0;
  for (; count < 4; ++count) {
    while (pos < vb.size() && (is_wsp(vb[pos]) || vb[pos] == ',')) ++pos;
    if (!scan_number(vb, pos, v[count])) break;
  }
  if (count == 4 && v[2] > 0 && v[3] > 0) {
    f.hasViewBox = true;
    f.viewBox.left = v[0];
    f.viewBox.bottom = v[1];
    f.viewBox.right = v[0] + v[2];
    f.viewBox.top = v[1] + v[3];
  } else if (root.attribute("viewBox")) {
    Warn(root, "bad viewBox ignored");
  }
  // Percent widths refer to a viewport we do not know: they count as absent.
  f.width = std::string_view(root.attribute("width").value()).find('%') == std::string_view::npos
                ? LengthOr(root, "width", Axis::x, 0)
                : 0;
  f.height = std::string_view(root.attribute("height").value()).find('%') == std::string_view::npos
                 ? LengthOr(root, "height", Axis::y, 0)
                 : 0;
  f.mirror = f.hasViewBox ? f.viewBox.bottom + f.viewBox.top : f.height;
  Shape state;
  ApplyPresentation(root, state);
  MATRIX ctm;
  if (const pugi::xml_attribute t = root.attribute("transform"))
    if (!ParseTransform(t.value(), ctm)) Warn(root, "bad transform ignored");
  Walk(root, ctm, state);
}

}  // namespace

bool ParseTransform(std::string_view s, MATRIX& out) {
  constexpr double pi = std::numbers::pi;
  MATRIX m;
  std::size_t pos = 0;
  auto skip = [&] {
    while (pos < s.size() && is_wsp(s[pos])) ++pos;
  };
  skip();
  bool first = true;
  while (pos < s.size()) {
    if (!first && s[pos] == ',') {
      ++pos;
      skip();
    }
    first = false;
    std::size_t nameEnd = pos;
    while (nameEnd < s.size() && std::isalpha((unsigned char)s[nameEnd])) ++nameEnd;
    const std::string_view name = s.substr(pos, nameEnd - pos);
    pos = nameEnd;
    skip();
    if (pos >= s.size() || s[pos] != '(') return false;
    ++pos;
    double a[6];
    int n = 0;
    skip();
    while (pos < s.size() && s[pos] != ')') {
      if (n == 6 || !scan_number(s, pos, a[n])) return false;
      ++n;
      skip();
      if (pos < s.size() && s[pos] == ',') {
        ++pos;
        skip();
        if (pos < s.size() && s[pos] == ')') return false;
      }
    }
    if (pos >= s.size()) return false;
    ++pos;  // ')'
    MATRIX t;
    if (name == "matrix" && n == 6) {
      t = MATRIX{a[0], a[1], a[2], a[3], a[4], a[5]};
    } else if (name == "translate" && (n == 1 || n == 2)) {
      t = MATRIX{1, 0, 0, 1, a[0], n == 2 ? a[1] : 0};
    } else if (name == "scale" && (n == 1 || n == 2)) {
      t = MATRIX{a[0], 0, 0, n == 2 ? a[1] : a[0], 0, 0};
    } else if (name == "rotate" && (n == 1 || n == 3)) {
      const double r = std::fmod(a[0], 360.0) * pi / 180;
      const double c = std::cos(r), sn = std::sin(r);
      t = MATRIX{c, sn, -sn, c, 0, 0};
      if (n == 3) t = MATRIX{1, 0, 0, 1, -a[1], -a[2]}.Then(t).Then(MATRIX{1, 0, 0, 1, a[1], a[2]});
    } else if (name == "skewX" && n == 1) {
      t = MATRIX{1, 0, std::tan(a[0] * pi / 180), 1, 0, 0};
    } else if (name == "skewY" && n == 1) {
      t = MATRIX{1, std::tan(a[0] * pi / 180), 0, 1, 0, 0};
    } else {
      return false;
    }
    // "A B" maps a point by B first, then A.
    m = t.Then(m);
    skip();
  }
  out = m;
  return true;
}

bool ReadText(std::string_view text, Document& doc, std::string& error) {
  doc = Document{};
  pugi::xml_document xml;
  const pugi::xml_parse_result r =
      xml.load_buffer(text.data(), text.size(), pugi::parse_default, pugi::encoding_auto);
  if (!r) {
    const std::ptrdiff_t off = std::clamp<std::ptrdiff_t>(r.offset, 0, std::ptrdiff_t(text.size()));
    const int line = 1 + int(std::count(text.begin(), text.begin() + off, '\n'));
    error = std::string("not well-formed XML (") + r.description() + ") at line " + std::to_string(line);
    return false;
  }
  const pugi::xml_node root = xml.document_element();
  if (local_name(root) != "svg") {
    error = std::string("root element is <") + root.name() + ">, not <svg>";
    return false;
  }
  Reader reader(doc, text);
  reader.ReadRoot(root);
  return true;
}

bool ReadFile(const std::string& path, Document& doc, std::string& error) {
  std::ifstream in(path, std::ios::binary);
  if (!in) {
    error = "cannot open file";
    return false;
  }
  std::ostringstream ss;
  ss << in.rdbuf();
  if (in.bad()) {
    error = "cannot read file";
    return false;
  }
  return ReadText(ss.str(), doc, error);
}

std::string ToDocumentPathData(const PolycurveT<MavikMath::V>& curve, const Frame& frame, int precision) {
  PolycurveT<MavikMath::V> c = curve;
  if (!c.IsEmpty()) {
    CurveBuffer<MavikMath::V> buf = c.GetBuffer();
    frame.ToDocument().TransformPoints(buf.points, (unsigned long)buf.count);
  }
  SvgPathWriteOptions o;
  o.precision = precision;
  std::string d;
  return WriteSvgPathData(c, d, o) ? d : std::string();
}

std::string XmlEscape(std::string_view s) {
  std::string r;
  r.reserve(s.size());
  for (char c : s) {
    switch (c) {
      case '&': r += "&amp;"; break;
      case '<': r += "&lt;"; break;
      case '>': r += "&gt;"; break;
      case '"': r += "&quot;"; break;
      default: r += c;
    }
  }
  return r;
}

}  // namespace OstraCrv::svgdoc
