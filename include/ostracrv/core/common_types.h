// The host's integer value types. A POINT is two signed 32-bit coordinates;
// a RECT holds four in the order smallest x, largest y, largest x, smallest y,
// because the y axis points up and the second field is therefore the top.
#pragma once

#include <cstdint>

namespace Framework::common_types {

struct POINT {
  int32_t x = 0;
  int32_t y = 0;

  friend constexpr bool operator==(const POINT& a, const POINT& b) noexcept {
    return a.x == b.x && a.y == b.y;
  }
  friend constexpr bool operator!=(const POINT& a, const POINT& b) noexcept { return !(a == b); }
};

struct RECT {
  int32_t left = 0;    // smallest x
  int32_t top = 0;     // largest y
  int32_t right = 0;   // largest x
  int32_t bottom = 0;  // smallest y

  friend constexpr bool operator==(const RECT& a, const RECT& b) noexcept {
    return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
  }
  friend constexpr bool operator!=(const RECT& a, const RECT& b) noexcept { return !(a == b); }
};

static_assert(sizeof(POINT) == 8);
static_assert(sizeof(RECT) == 16);

}  // namespace Framework::common_types
