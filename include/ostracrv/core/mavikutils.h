// Generic utility types that appear in the library's signatures: an optional
// value, a view of a contiguous array, a range of two iterators, a counting
// index iterator and an iterator that makes its values with functors. They
// carry no geometry.
#pragma once

#include <cstddef>
#include <iterator>
#include <memory>
#include <optional>
#include <type_traits>
#include <utility>

namespace MavikUtils {

template <class T>
using optional = std::optional<T>;
using std::nullopt;

// A borrowed pointer and length.
template <class T>
class array_view {
 public:
  using value_type = std::remove_cv_t<T>;
  using iterator = T*;

  constexpr array_view() noexcept = default;
  constexpr array_view(T* data, std::size_t size) noexcept : data_(data), size_(data ? size : 0) {}
  constexpr array_view(T* begin, T* end) noexcept : data_(begin), size_(begin && end > begin ? std::size_t(end - begin) : 0) {}
  template <class U, class = std::enable_if_t<std::is_convertible_v<U (*)[], T (*)[]>>>
  constexpr array_view(const array_view<U>& o) noexcept : data_(o.data()), size_(o.size()) {}
  template <class C, class = decltype(std::declval<C&>().data())>
  constexpr array_view(C& c) noexcept : data_(c.data()), size_(c.size()) {}

  constexpr T* data() const noexcept { return data_; }
  constexpr std::size_t size() const noexcept { return size_; }
  constexpr bool empty() const noexcept { return size_ == 0; }
  constexpr T* begin() const noexcept { return data_; }
  constexpr T* end() const noexcept { return data_ + size_; }
  constexpr T& operator[](std::size_t i) const noexcept { return data_[i]; }
  constexpr T& front() const noexcept { return data_[0]; }
  constexpr T& back() const noexcept { return data_[size_ - 1]; }
  constexpr array_view subview(std::size_t first, std::size_t count) const noexcept {
    if (first > size_) first = size_;
    if (count > size_ - first) count = size_ - first;
    return {data_ + first, count};
  }

 private:
  T* data_ = nullptr;
  std::size_t size_ = 0;
};

// A counting iterator over indices.
template <class I>
class IndexT {
 public:
  using iterator_category = std::random_access_iterator_tag;
  using value_type = I;
  using difference_type = std::ptrdiff_t;
  using pointer = const I*;
  using reference = I;

  constexpr IndexT() noexcept = default;
  constexpr explicit IndexT(I v) noexcept : v_(v) {}
  constexpr I operator*() const noexcept { return v_; }
  constexpr I value() const noexcept { return v_; }
  constexpr IndexT& operator++() noexcept { ++v_; return *this; }
  constexpr IndexT operator++(int) noexcept { IndexT t = *this; ++v_; return t; }
  constexpr IndexT& operator--() noexcept { --v_; return *this; }
  constexpr IndexT& operator+=(difference_type d) noexcept { v_ = I(difference_type(v_) + d); return *this; }
  friend constexpr IndexT operator+(IndexT a, difference_type d) noexcept { return a += d; }
  friend constexpr difference_type operator-(IndexT a, IndexT b) noexcept { return difference_type(a.v_) - difference_type(b.v_); }
  friend constexpr bool operator==(IndexT a, IndexT b) noexcept { return a.v_ == b.v_; }
  friend constexpr bool operator!=(IndexT a, IndexT b) noexcept { return a.v_ != b.v_; }
  friend constexpr bool operator<(IndexT a, IndexT b) noexcept { return a.v_ < b.v_; }

 private:
  I v_{};
};

// A pair of iterators. It may hold an extra resource (for instance a copy of
// the curve the iterators point into) that lives as long as the range.
template <class It>
class RangeView {
 public:
  RangeView() = default;
  RangeView(It b, It e) : begin_(std::move(b)), end_(std::move(e)) {}
  RangeView(It b, It e, std::shared_ptr<const void> keepAlive)
      : begin_(std::move(b)), end_(std::move(e)), keep_(std::move(keepAlive)) {}
  It begin() const { return begin_; }
  It end() const { return end_; }
  bool empty() const { return !(begin_ != end_); }
  // The resource the range keeps alive (may be null).
  const std::shared_ptr<const void>& keep_alive() const { return keep_; }

 private:
  It begin_{};
  It end_{};
  std::shared_ptr<const void> keep_;
};

inline RangeView<IndexT<unsigned long>> Indices(unsigned long first, unsigned long last) {
  return {IndexT<unsigned long>(first), IndexT<unsigned long>(last)};
}

// An input iterator whose value is made by Getter from a state, and which
// advances by Next. The iterator is at its end when the getter yields no
// value or the state reaches the end state.
//   Getter: optional<Value> operator()(const State&) const
//   Next:   void operator()(State&) const, or State operator()(State) const
//           that returns the next state
template <class Getter, class Next>
class factory_iterator_t {
 public:
  using state_type = typename Getter::state_type;
  using value_type = typename Getter::value_type;
  using difference_type = std::ptrdiff_t;
  using iterator_category = std::input_iterator_tag;
  using reference = const value_type&;
  using pointer = const value_type*;

  factory_iterator_t() = default;
  factory_iterator_t(Getter g, Next n, state_type s, state_type end)
      : getter_(std::move(g)), next_(std::move(n)), state_(s), end_(end) {
    Load();
  }
  // The end sentinel: compares equal to every ended iterator.
  static factory_iterator_t End() { return factory_iterator_t(); }

  reference operator*() const { return *value_; }
  pointer operator->() const { return &*value_; }
  factory_iterator_t& operator++() {
    if constexpr (std::is_void_v<std::invoke_result_t<const Next&, state_type&>>)
      next_(state_);
    else
      state_ = next_(state_);
    Load();
    return *this;
  }
  bool ended() const { return !value_.has_value(); }
  friend bool operator==(const factory_iterator_t& a, const factory_iterator_t& b) {
    if (a.ended() || b.ended()) return a.ended() == b.ended();
    return a.state_ == b.state_;
  }
  friend bool operator!=(const factory_iterator_t& a, const factory_iterator_t& b) { return !(a == b); }

 private:
  void Load() {
    if (!(state_ < end_)) {
      value_.reset();
      return;
    }
    value_ = getter_(state_);
  }
  Getter getter_{};
  Next next_{};
  state_type state_{};
  state_type end_{};
  std::optional<value_type> value_;
};

// A range without its first element (a subpath walk without its move view).
// A resource kept alive by the source range (such as the copy of a curve
// that a segment walk reads) is kept alive by the result too, so that the
// result of skip_first on a temporary range stays valid.
template <class Range>
auto skip_first(const Range& r) {
  auto b = r.begin();
  auto e = r.end();
  if (b != e) ++b;
  if constexpr (requires { r.keep_alive(); })
    return RangeView<decltype(b)>(b, e, r.keep_alive());
  else
    return RangeView<decltype(b)>(b, e);
}

}  // namespace MavikUtils
