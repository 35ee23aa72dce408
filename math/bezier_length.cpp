// Arc length by Gauss-Legendre quadrature on panels placed from the
// singularities of the speed; see bezier_length.h for the outline.
//
// The speed as a complex polynomial. For real t, x'(t) + i y'(t) is the
// quadratic P(t) = A t^2 + B t + C with complex A = 3(a.x + i a.y),
// B = 2(b.x + i b.y), C = c.x + i c.y, so
//   |B'(t)| = |P(t)| = |A| |t - z1| |t - z2|
// with the complex roots z1, z2 of P. Each factor |t - z| is
// sqrt((t - Re z)^2 + (Im z)^2): analytic except at Re z +- i Im z. A real
// root is a cusp; a root close to the real axis is a near-cusp, where the
// speed bends sharply over a parameter range of about |Im z|.
//
// Error control. An n-point Gauss-Legendre rule on a panel of half-width h
// errs by at most about M rho^(-2n) h, where rho is the largest Bernstein
// ellipse (foci at the panel ends) inside which the integrand is analytic
// and M bounds it there. The ellipse through a point z has
//   rho + 1/rho = (|z - lo| + |z - hi|) / h.
// For accuracy k a rule of n points is accurate on a panel once every
// non-real root lies outside the ellipse of rho_t = 10^((k + 1) / (2n)) (one
// digit of margin for M). Each panel takes the cheapest rule of its family
// that qualifies: 8, 16 or 32 points (3, 8 or 16 for the estimates of
// accuracy 1 to 3), so that a far singularity costs 8 evaluations and a
// nearer one a longer rule instead of many panels. A panel for which no rule
// qualifies is halved. Since the error bound is known in advance, no panel is
// accepted by a lucky agreement of two poor estimates.
// - A real root (|Im z| not above 1e-3 of the relative tolerance, so that
//   treating it as real changes the integral by less than that share) is a
//   cusp: the range is cut there, after which |t - z| is a polynomial on each
//   side and never limits a panel.
// - A non-real root whose real part lies inside the range and for which no
//   rule qualifies on the whole range also cuts it, so that halving grades
//   the panels geometrically towards the near-cusp from both sides.
// - A panel next to a near-cusp is also accepted when its width times a
//   bound of the speed on it is below a hundredth of the tolerance: the rule
//   and the integral then both lie under that value. The bound is
//   |A| max(|lo - z1|, |hi - z1|) max(|lo - z2|, |hi - z2|), each factor
//   being convex in t. Only the few panels nearest a singularity end this
//   way, so their errors sum well inside the tolerance.
// - The tolerance for that rule is 10^-k times a tenth of the control
//   polygon's length. The arc length is never below a fixed fraction of the
//   polygon (the Bernstein basis is independent, so the curve strays from
//   its start by at least a fixed fraction of its control offsets), and the
//   tenth keeps the rule safely conservative.
//
// Constants: the Gauss-Legendre nodes x_i and weights w_i on [-1, 1] (roots
// of the Legendre polynomial P_n and 2 / ((1 - x^2) P_n'(x)^2)), to 20
// digits, for n = 3, 8, 16 and 32; only the non-negative half is stored, the
// rules being symmetric. kMaxDepth = 60 bounds the halving; it is never
// reached for finite input because the width-times-speed rule ends it first.
//
// Measured on thousands of random curves of every kind (cusps, near-cusps,
// loops, collapsed handles, folded lines) against adaptive Simpson to 1e-14:
// relative error below 1e-12 at accuracy 10, below 1e-3 at accuracy 2.
#include "ostracrv/math/bezier_length.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

#include "bezier_common.h"
#include "ostracrv/math/bezier_basis.h"

namespace MavikMath::CubicBezier {

namespace {

using Framework::common_types::POINT;
// Complex numbers with plain arithmetic: std::complex multiplication and
// division go through library calls for their infinity rules, which this
// hot path neither needs nor can afford.
struct Complex {
  double re = 0.0, im = 0.0;
};
Complex operator+(Complex a, Complex b) noexcept { return {a.re + b.re, a.im + b.im}; }
Complex operator-(Complex a, Complex b) noexcept { return {a.re - b.re, a.im - b.im}; }
Complex operator*(Complex a, Complex b) noexcept { return {a.re * b.re - a.im * b.im, a.re * b.im + a.im * b.re}; }
Complex operator*(double s, Complex a) noexcept { return {s * a.re, s * a.im}; }
Complex Divide(Complex a, Complex b) noexcept {
  // Smith's method: scale by the larger part of b to avoid overflow.
  if (std::fabs(b.re) >= std::fabs(b.im)) {
    const double r = b.im / b.re, d = b.re + b.im * r;
    return {(a.re + a.im * r) / d, (a.im - a.re * r) / d};
  }
  const double r = b.re / b.im, d = b.re * r + b.im;
  return {(a.re * r + a.im) / d, (a.im * r - a.re) / d};
}
// The operands here are built from coefficients scaled near 1, so plain
// square roots of sums of squares can neither overflow nor underflow
// harmfully; hypot's extra care is not needed.
double Norm(double x, double y) noexcept { return std::sqrt(x * x + y * y); }

// Principal square root, without cancellation in either part.
Complex Sqrt(Complex z) noexcept {
  const double m = Norm(z.re, z.im);
  if (m == 0.0) return {0.0, 0.0};
  if (z.re >= 0.0) {
    const double re = std::sqrt(0.5 * (m + z.re));
    return {re, z.im / (2.0 * re)};
  }
  const double im = std::sqrt(0.5 * (m - z.re));
  return {std::fabs(z.im) / (2.0 * im), std::copysign(im, z.im)};
}
bool IsZero(Complex z) noexcept { return z.re == 0.0 && z.im == 0.0; }
double Abs(Complex z) noexcept { return Norm(z.re, z.im); }

struct Node {
  double x, w;
};
constexpr Node kGauss3[] = {{0.0, 0.88888888888888888889}, {0.77459666924148337704, 0.55555555555555555556}};
constexpr Node kGauss8[] = {{0.18343464249564980494, 0.36268378337836198297},
                            {0.52553240991632898582, 0.31370664587788728734},
                            {0.79666647741362673959, 0.22238103445337447054},
                            {0.96028985649753623168, 0.10122853629037625915}};
constexpr Node kGauss16[] = {{0.095012509837637440185, 0.18945061045506849629},
                             {0.28160355077925891323, 0.18260341504492358887},
                             {0.45801677765722738634, 0.16915651939500253819},
                             {0.61787624440264374845, 0.14959598881657673208},
                             {0.7554044083550030339, 0.12462897125553387205},
                             {0.86563120238783174388, 0.09515851168249278481},
                             {0.94457502307323257608, 0.062253523938647892863},
                             {0.9894009349916499326, 0.027152459411754094852}};
constexpr Node kGauss32[] = {{0.048307665687738316235, 0.096540088514727800567},
                             {0.14447196158279649349, 0.095638720079274859419},
                             {0.23928736225213707454, 0.093844399080804565639},
                             {0.33186860228212764978, 0.091173878695763884713},
                             {0.42135127613063534536, 0.087652093004403811143},
                             {0.50689990893222939002, 0.083311924226946755222},
                             {0.58771575724076232904, 0.078193895787070306472},
                             {0.66304426693021520098, 0.072345794108848506225},
                             {0.73218211874028968039, 0.065822222776361846838},
                             {0.79448379596794240696, 0.058684093478535547145},
                             {0.84936761373256997013, 0.050998059262376176196},
                             {0.89632115576605212397, 0.042835898022226680657},
                             {0.93490607593773968917, 0.034273862913021433103},
                             {0.96476225558750643077, 0.025392065309262059456},
                             {0.9856115115452683354, 0.016274394730905670605},
                             {0.99726386184948156354, 0.0070186100094700966004}};

// A symmetric rule: pairs of nodes +-x, and for odd n a centre node.
struct Rule {
  const Node* nodes;
  int count;   // stored nodes
  bool centre;  // the first stored node is x = 0, used once
  int points;
};
constexpr Rule kRules[] = {{kGauss3, 2, true, 3}, {kGauss8, 4, false, 8}, {kGauss16, 8, false, 16},
                           {kGauss32, 16, false, 32}};
// Rules tried in turn, cheapest first: 3, 8, 16 points for the estimates,
// 8, 16, 32 points from accuracy 4 on.
constexpr int kRulesPerFamily = 3;

constexpr int kMaxDepth = 60;
constexpr double kMargin = 1.0;

int FirstRule(int accuracy) noexcept { return accuracy > 3 ? 1 : 0; }

// Per accuracy k: the relative tolerance 10^-k and, for each rule of the
// family, the ellipse sum rho + 1/rho with rho = 10^((k + 1) / (2n)).
struct Tables {
  double relative[kLengthFinest + 1];
  double ellipse[kLengthFinest + 1][kRulesPerFamily];
};
const Tables& GetTables() noexcept {
  static const Tables tables = [] {
    Tables t{};
    for (int k = 1; k <= kLengthFinest; ++k) {
      t.relative[k] = std::pow(10.0, -k);
      for (int j = 0; j < kRulesPerFamily; ++j) {
        const double rho = std::pow(10.0, (k + kMargin) / (2.0 * kRules[FirstRule(k) + j].points));
        t.ellipse[k][j] = rho + 1.0 / rho;
      }
    }
    return t;
  }();
  return tables;
}

// The speed |B'(t)| of the scaled curve and what limits its quadrature.
class Speed {
 public:
  // Returns false for a point curve or non-finite input.
  bool Init(const V& a, const V& b, const V& c, LengthAccuracy accuracy) noexcept {
    if (!a.IsFinite() || !b.IsFinite() || !c.IsFinite()) return false;
    scale_ = internal::PowerOfTwoScale(a, b, c);
    if (scale_ == 0.0) return false;
    // Dividing by a power of two is exact; the coefficients are now near 1.
    ax_ = 3.0 * a.x / scale_;
    ay_ = 3.0 * a.y / scale_;
    bx_ = 2.0 * b.x / scale_;
    by_ = 2.0 * b.y / scale_;
    cx_ = c.x / scale_;
    cy_ = c.y / scale_;
    accuracy = std::clamp(accuracy, 1, kLengthFinest);
    const Tables& tables = GetTables();
    relative_ = tables.relative[accuracy];
    rules_ = kRules + FirstRule(accuracy);
    ellipse_ = tables.ellipse[accuracy];
    // Control polygon of the scaled curve: c/3, (b + c)/3, a + (2b + c)/3
    // with the original a, b, c, i.e. C/3, (B/2 + C)/3, A/3 + (B + C)/3.
    const double polygon =
        (Norm(cx_, cy_) + Norm(0.5 * bx_ + cx_, 0.5 * by_ + cy_) + Norm(ax_ + bx_ + cx_, ay_ + by_ + cy_)) / 3.0;
    small_ = 0.01 * relative_ * 0.1 * polygon;
    FindRoots();
    return true;
  }

  double Scale() const noexcept { return scale_; }
  double Relative() const noexcept { return relative_; }

  double operator()(double t) const noexcept {
    const double x = (ax_ * t + bx_) * t + cx_;
    const double y = (ay_ * t + by_) * t + cy_;
    return std::sqrt(x * x + y * y);
  }

  // Integral of the scaled speed over [t0, t1], t0 < t1 within [0, 1].
  // smallShare scales the width-times-speed threshold (1 for a whole
  // integral; smaller for the short integrals of an inversion).
  double Integrate(double t0, double t1, double smallShare = 1.0) const noexcept {
    if (!(t1 > t0)) return 0.0;
    double ends[4];
    int n = 0;
    ends[n++] = t0;
    for (int i = 0; i < roots_; ++i) {
      const double r = root_[i].re;
      if (r > t0 && r < t1 && (real_[i] || Ellipse(root_[i], t0, t1) < ellipse_[kRulesPerFamily - 1])) ends[n++] = r;
    }
    if (n == 3 && ends[2] < ends[1]) std::swap(ends[1], ends[2]);
    ends[n++] = t1;
    double sum = 0.0;
    for (int i = 0; i + 1 < n; ++i)
      if (ends[i + 1] > ends[i]) sum += Panel(ends[i], ends[i + 1], small_ * smallShare, 0);
    return sum;
  }

 private:
  // Roots of P with their kind. Up to two.
  void FindRoots() noexcept {
    roots_ = 0;
    const Complex A{ax_, ay_}, B{bx_, by_}, C{cx_, cy_};
    if (!IsZero(A)) {
      // Roots q / A and C / q with q = -(B + s) / 2, the sign of the square
      // root s chosen so that B and s do not cancel.
      Complex s = Sqrt(B * B - 4.0 * (A * C));
      if (B.re * s.re + B.im * s.im < 0.0) s = -1.0 * s;
      const Complex q = -0.5 * (B + s);
      if (IsZero(q)) {
        root_[0] = root_[1] = Complex{};  // B = C = 0: P = A t^2
      } else {
        root_[0] = Divide(q, A);
        root_[1] = Divide(C, q);
      }
      roots_ = 2;
      lead_ = Abs(A);
    } else if (!IsZero(B)) {
      root_[0] = Divide(-1.0 * C, B);
      roots_ = 1;
      lead_ = Abs(B);
    } else {
      lead_ = Abs(C);
    }
    for (int i = 0; i < roots_; ++i) {
      real_[i] = std::fabs(root_[i].im) <= 1e-3 * relative_;
      if (!std::isfinite(root_[i].re) || !std::isfinite(root_[i].im)) real_[i] = true;  // far away
    }
  }

  // rho + 1/rho of the Bernstein ellipse of [lo, hi] through z (and
  // conj(z)): the rules whose threshold it reaches are accurate there.
  static double Ellipse(const Complex& z, double lo, double hi) noexcept {
    return (Modulus(z, lo) + Modulus(z, hi)) / (0.5 * (hi - lo));
  }

  // |z - t| without hypot's care for overflow: the scaled roots that matter
  // are of moderate size, and an overflow to infinity reads as "far away".
  static double Modulus(const Complex& z, double t) noexcept {
    const double x = z.re - t, y = z.im;
    return std::sqrt(x * x + y * y);
  }

  // A bound of the speed on [lo, hi].
  double Bound(double lo, double hi) const noexcept {
    double b = lead_;
    for (int i = 0; i < roots_; ++i) b *= std::max(Modulus(root_[i], lo), Modulus(root_[i], hi));
    return b;
  }

  double Panel(double lo, double hi, double small, int depth) const noexcept {
    double e = std::numeric_limits<double>::infinity();
    for (int i = 0; i < roots_; ++i)
      if (!real_[i]) e = std::min(e, Ellipse(root_[i], lo, hi));
    for (int j = 0; j < kRulesPerFamily; ++j)
      if (e >= ellipse_[j]) return Apply(rules_[j], lo, hi);
    if (depth >= kMaxDepth || (hi - lo) * Bound(lo, hi) <= small) return Apply(rules_[0], lo, hi);
    const double mid = 0.5 * (lo + hi);
    return Panel(lo, mid, small, depth + 1) + Panel(mid, hi, small, depth + 1);
  }

  double Apply(const Rule& rule, double lo, double hi) const noexcept {
    const double h = 0.5 * (hi - lo), m = 0.5 * (hi + lo);
    double s = 0.0;
    int i = 0;
    if (rule.centre) s = rule.nodes[i++].w * (*this)(m);
    for (; i < rule.count; ++i) s += rule.nodes[i].w * ((*this)(m - h * rule.nodes[i].x) + (*this)(m + h * rule.nodes[i].x));
    return s * h;
  }

  double ax_ = 0, ay_ = 0, bx_ = 0, by_ = 0, cx_ = 0, cy_ = 0;
  double scale_ = 1.0;
  double relative_ = 1e-10;
  const double* ellipse_ = nullptr;
  const Rule* rules_ = kRules;
  double small_ = 0.0;
  double lead_ = 0.0;
  Complex root_[2];
  bool real_[2] = {true, true};
  int roots_ = 0;
};

}  // namespace

double Length(const V& a, const V& b, const V& c, LengthAccuracy accuracy) noexcept {
  Speed speed;
  if (!speed.Init(a, b, c, accuracy)) return 0.0;
  return speed.Integrate(0.0, 1.0) * speed.Scale();
}

double LengthBetween(const V& a, const V& b, const V& c, double t0, double t1, LengthAccuracy accuracy) noexcept {
  if (!std::isfinite(t0) || !std::isfinite(t1)) return 0.0;
  t0 = std::clamp(t0, 0.0, 1.0);
  t1 = std::clamp(t1, 0.0, 1.0);
  if (!(t1 > t0)) return 0.0;
  Speed speed;
  if (!speed.Init(a, b, c, accuracy)) return 0.0;
  return speed.Integrate(t0, t1) * speed.Scale();
}

template <class T>
double Length(const T* p, LengthAccuracy accuracy) noexcept {
  if (!IsFinite(p)) return 0.0;
  const PowerBasis q = GetPowerBasis(p);
  return Length(q.a, q.b, q.c, accuracy);
}

template <class T>
double LengthTo(double t, const T* p) noexcept {
  if (!IsFinite(p)) return 0.0;
  const PowerBasis q = GetPowerBasis(p);
  return LengthBetween(q.a, q.b, q.c, 0.0, t, kLengthPrecise);
}

template <class T>
double LengthFrom(double t, const T* p) noexcept {
  if (!IsFinite(p)) return 0.0;
  const PowerBasis q = GetPowerBasis(p);
  return LengthBetween(q.a, q.b, q.c, t, 1.0, kLengthPrecise);
}

double GetCurveRelativeLengthParameter(double fraction, const V& a, const V& b, const V& c,
                                       LengthAccuracy accuracy) noexcept {
  if (!std::isfinite(fraction)) return 0.0;
  if (!a.IsFinite() || !b.IsFinite() || !c.IsFinite()) return 0.0;
  if (fraction <= 0.0) return 0.0;
  if (fraction >= 1.0) return 1.0;
  Speed speed;
  if (!speed.Init(a, b, c, accuracy)) return fraction;
  const double total = speed.Integrate(0.0, 1.0);
  if (!(total > 0.0)) return fraction;
  const double target = fraction * total;
  const double tol = 0.5 * speed.Relative() * total;
  double lo = 0.0, hi = 1.0, lengthLo = 0.0, lengthHi = total;
  double t = fraction;
  for (int it = 0; it < 200; ++it) {
    // Measure from the nearer bracket end: short integrals, small errors.
    // The bracket ends carry the sum of a few such integrals, so each keeps
    // a tenth of the usual width-times-speed threshold.
    const double lengthT = (t - lo <= hi - t) ? lengthLo + speed.Integrate(lo, t, 0.1)
                                              : lengthHi - speed.Integrate(t, hi, 0.1);
    const double f = lengthT - target;
    if (std::fabs(f) <= tol) return t;
    if (f < 0.0) {
      lo = t;
      lengthLo = lengthT;
    } else {
      hi = t;
      lengthHi = lengthT;
    }
    if (hi - lo <= 4.0 * kEpsilon) return t;
    const double v = speed(t);
    double next = v > 0.0 ? t - f / v : lo - 1.0;
    if (!(next > lo && next < hi)) next = 0.5 * (lo + hi);
    t = next;
  }
  return t;
}

#define OSTRACRV_INSTANTIATE(T)                                  \
  template double Length<T>(const T*, LengthAccuracy) noexcept; \
  template double LengthTo<T>(double, const T*) noexcept;        \
  template double LengthFrom<T>(double, const T*) noexcept;
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace MavikMath::CubicBezier
