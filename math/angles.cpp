// Angle conversions; see angles.h.
//
// Constants: pi and 2 pi to double precision, and 180 / pi for degrees.
#include "ostracrv/math/angles.h"

#include <cmath>

namespace MavikMath {

namespace {
constexpr double kPi = 3.14159265358979323846;
constexpr double kTwoPi = 6.28318530717958647692;
constexpr double kDegreesPerRadian = 57.295779513082320877;

bool Finite(const D& v) noexcept { return std::isfinite(v.x) && std::isfinite(v.y); }

// Signed angle from a to b in radians, (-pi, pi]; 0 for a zero or
// non-finite vector.
double SignedAngle(const D& a, const D& b) noexcept {
  if (!Finite(a) || !Finite(b)) return 0.0;
  if ((a.x == 0.0 && a.y == 0.0) || (b.x == 0.0 && b.y == 0.0)) return 0.0;
  const double r = std::atan2(Cross(a, b), Dot(a, b));
  // atan2 gives -pi for a negative zero cross product; the range is (-pi, pi].
  return r == -kPi ? kPi : r;
}
}  // namespace

namespace Radians {

double VectorToAngle(const D& v) noexcept {
  if (!Finite(v)) return 0.0;
  const double r = std::atan2(v.y, v.x);
  return r == -kPi ? kPi : r;
}

double NormalizeAngle(double angle) noexcept {
  if (!std::isfinite(angle)) return 0.0;
  double r = std::fmod(angle, kTwoPi);
  if (r < 0.0) r += kTwoPi;
  // A tiny negative remainder rounds up to 2 pi, which is 0 on the circle.
  return r >= kTwoPi ? 0.0 : r;
}

double NormalizeFineAngle(double angle) noexcept {
  const double r = NormalizeAngle(angle);
  return r > kPi ? r - kTwoPi : r;
}

D AngleToVector(double angle) noexcept { return AngleToVector(angle, 1.0); }

D AngleToVector(double angle, double length) noexcept {
  if (!std::isfinite(angle) || !std::isfinite(length)) return D{0.0, 0.0};
  return D{std::cos(angle) * length, std::sin(angle) * length};
}

}  // namespace Radians

namespace Degrees {

double GetFineAngle(const D& a, const D& b) noexcept { return SignedAngle(a, b) * kDegreesPerRadian; }

}  // namespace Degrees

namespace TURNANGLE {

int GetFineAngle(const V& vertex, const V& a, const V& b) noexcept {
  if (!vertex.IsFinite() || !a.IsFinite() || !b.IsFinite()) return 0;
  const double degrees = SignedAngle(a - vertex, b - vertex) * kDegreesPerRadian;
  return static_cast<int>(std::lround(degrees * 1e6));
}

}  // namespace TURNANGLE

}  // namespace MavikMath
