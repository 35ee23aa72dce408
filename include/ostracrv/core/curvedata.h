// Storage of a path behind a PolycurveT handle, shared by reference count.
//
// A handle holds one reference to a CurveDataBase. Copying a handle adds a
// reference (one atomic increment); the first write through a handle whose
// storage is shared "forks": the handle gets a private copy and gives up its
// reference to the shared one. Two kinds of storage exist:
//
//   CurveData<T>     owns two growable arrays (points, node bytes) of equal
//                    length; written in place only while its count is 1.
//   CurveDataRef<T>  views arrays that the caller owns; it never writes or
//                    frees them, so every write forks into a CurveData.
//
// The reference count is the only atomic value of the library. Increments and
// decrements are sequentially consistent, so handles sharing one storage may be
// copied and destroyed on different threads. A fork decides on a count that may
// drop at the moment it is read; the atomic decrement after the copy then frees
// the old storage if the other holders went away meanwhile, so no race leaks or
// double-frees. A count of 1 means the caller is the only holder and nobody can
// raise it concurrently (that would need a copy of the caller's own handle).
//
// The operations that change what a handle points to (Fork, MoveData,
// BreakReference) consume or add references as documented on each, and return
// the storage the handle must store.
#pragma once

#include <atomic>
#include <cstdint>
#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

template <class T>
class CurveData;

// Abstract storage with a reference count. The order of the virtual
// operations below is part of the binary interface: keep it.
template <class T>
class CurveDataBase {
 public:
  // Holders of this storage; a new object has one holder, its creator.
  std::atomic<uint64_t> refCount{1};

  CurveDataBase() = default;
  CurveDataBase(const CurveDataBase&) = delete;
  CurveDataBase& operator=(const CurveDataBase&) = delete;

  virtual ~CurveDataBase();

  // True when a write must not touch this object in place.
  virtual bool IsForkRequired() const = 0;
  // Returns storage that the caller may write, always an owning CurveData.
  // Consumes the caller's reference to this object when it returns another
  // one. Throws std::bad_alloc on exhausted memory, with nothing changed.
  virtual CurveDataBase* Fork() = 0;
  // Puts the caller's vectors in as the new content. Either swaps them with
  // this object's own (unshared CurveData: the caller gets the old arrays back
  // and this object is returned) or hands them to a new CurveData (the caller's
  // vectors end up empty and the caller's reference to this is consumed). The
  // two vectors must have equal length.
  virtual CurveDataBase* MoveData(std::vector<T>& points, std::vector<NODETYPE>& nodes) = 0;
  // The arrays and their common length; null pointers when empty.
  virtual T const* GetPoints() const = 0;
  virtual NODETYPE const* GetNodeTypes() const = 0;
  virtual unsigned long GetSize() const = 0;
  // Returns storage that no longer depends on borrowed memory, holding a new
  // reference for the caller, who still holds (and must release) the old one:
  // owning storage returns itself with its count raised, borrowed storage a
  // new CurveData with a copy.
  virtual CurveDataBase* BreakReference() = 0;

  // Adds one holder.
  void AddRef() noexcept { refCount.fetch_add(1); }
  // Removes one holder of d and deletes d when that was the last one. A null
  // d is ignored.
  static void Release(CurveDataBase* d) noexcept;
};

// Owning storage. The two arrays always have the same length.
template <class T>
class CurveData final : public CurveDataBase<T> {
 public:
  std::vector<T> points;
  std::vector<NODETYPE> nodes;

  CurveData() = default;
  // Takes the two vectors over; they must have equal length.
  CurveData(std::vector<T>&& p, std::vector<NODETYPE>&& n) noexcept : points(std::move(p)), nodes(std::move(n)) {}
  // Copies n entries of both arrays; null arrays give an empty storage.
  CurveData(T const* p, NODETYPE const* nd, unsigned long n);

  bool IsForkRequired() const override;
  CurveDataBase<T>* Fork() override;
  CurveDataBase<T>* MoveData(std::vector<T>& p, std::vector<NODETYPE>& n) override;
  T const* GetPoints() const override;
  NODETYPE const* GetNodeTypes() const override;
  unsigned long GetSize() const override;
  CurveDataBase<T>* BreakReference() override;

  // The calls below write in place; a handle calls them only after a fork.

  // Raises each array's capacity to exactly n if it is lower; never lowers
  // it. Throws std::length_error or std::bad_alloc, leaving the sizes alone.
  void Reserve(unsigned long n);
  // Replaces the count entries at pos by the m entries of p and nd. pos is
  // clamped to the size, then count to the entries after pos. The source may
  // lie inside this storage's own arrays. Null source arrays with m > 0 change
  // nothing. Throws like Reserve, with the content unchanged.
  void Replace(unsigned long pos, unsigned long count, T const* p, NODETYPE const* nd, unsigned long m);
  // Appends one entry, doubling the capacity when the arrays are full.
  void PushBack(T const& p, NODETYPE nd);
  // Sets both arrays to n entries, new entries zero. Throws like Reserve.
  void Resize(unsigned long n);
  // Cuts both arrays to n entries if they are longer.
  void Truncate(unsigned long n) noexcept;
};

// Storage over arrays the caller owns and keeps alive. Read-only: every write
// through a handle forks away into a CurveData.
template <class T>
class CurveDataRef final : public CurveDataBase<T> {
 public:
  T const* points = nullptr;
  NODETYPE const* nodes = nullptr;
  uint64_t size = 0;

  // A view of n entries; null arrays or a count with the top bit set (a
  // negative count cast to unsigned) give an empty view.
  CurveDataRef(T const* p, NODETYPE const* nd, unsigned long n) noexcept;

  bool IsForkRequired() const override;
  CurveDataBase<T>* Fork() override;
  CurveDataBase<T>* MoveData(std::vector<T>& p, std::vector<NODETYPE>& n) override;
  T const* GetPoints() const override;
  NODETYPE const* GetNodeTypes() const override;
  unsigned long GetSize() const override;
  CurveDataBase<T>* BreakReference() override;
};

// A count that came from a negative int has its top bit set; such counts are
// refused rather than read as a huge length.
constexpr bool IsPlausibleCount(unsigned long n) noexcept { return n <= (~0ul >> 1); }

extern template class CurveDataBase<Framework::common_types::POINT>;
extern template class CurveDataBase<MavikMath::V>;
extern template class CurveData<Framework::common_types::POINT>;
extern template class CurveData<MavikMath::V>;
extern template class CurveDataRef<Framework::common_types::POINT>;
extern template class CurveDataRef<MavikMath::V>;

}  // namespace OstraCrv
