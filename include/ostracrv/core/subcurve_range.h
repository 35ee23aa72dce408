// A stretch of a path by index: its first node and its node count.
#pragma once

namespace OstraCrv {

struct SubcurveRange {
  unsigned long first = 0;
  unsigned long count = 0;

  friend constexpr bool operator==(const SubcurveRange& a, const SubcurveRange& b) noexcept {
    return a.first == b.first && a.count == b.count;
  }
};

}  // namespace OstraCrv
