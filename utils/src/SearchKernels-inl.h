// The searches in SIMD instructions, compiled once for each instruction set by Kernels.cpp.
//
// A search is a scan with a predicate, which gives the mask of the lanes that are hits. A scan reads whole
// vectors. The last one ends with the range, and so may overlap units that are known to be no hits. A range
// shorter than a vector is read in smaller ones, and one of fewer than 8 bytes unit by unit.
//
// There is no include guard: the file is included once for each instruction set.

#include <hwy/highway.h>

#include <utils/TwoWay.h>

#include "KernelTable.h"

HWY_BEFORE_NAMESPACE();
namespace mirel::detail::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

template <class T> using Lane = std::make_unsigned_t<T>;
template <class T> using FullTag = hn::ScalableTag<Lane<T>>;
template <class T, std::size_t kBytes> using TagOf = hn::FixedTag<Lane<T>, kBytes / sizeof(T)>;

template <class D, class T> HWY_INLINE hn::Vec<D> LoadUnits(D d, const T* p) {
  return hn::LoadU(d, reinterpret_cast<const hn::TFromD<D>*>(p));
}
template <class D, class T> HWY_INLINE hn::Mask<D> EqualTo(D d, hn::Vec<D> v, T x) {
  return hn::Eq(v, hn::Set(d, static_cast<Lane<T>>(x)));
}

// Predicates: At() for one unit, Lanes() for the units of a vector. With a cheap predicate, a scan tests four
// vectors between branches.

/// Whether a unit is v.
template <class T> struct Equal {
  static constexpr bool kIsCheap = true;
  T v;

  HWY_INLINE bool At(const T* p) const { return *p == v; }
  template <class D> HWY_INLINE hn::Mask<D> Lanes(D d, const T* p) const {
    return EqualTo(d, LoadUnits(d, p), v);
  }
};

/// Whether a unit differs from the one at the same index of another range.
template <class T> struct Different {
  static constexpr bool kIsCheap = true;
  const T *x, *y;

  HWY_INLINE bool At(const T* p) const { return *p != y[p - x]; }
  template <class D> HWY_INLINE hn::Mask<D> Lanes(D d, const T* p) const {
    return hn::Not(hn::Eq(LoadUnits(d, p), LoadUnits(d, y + (p - x))));
  }
};

// Scans return the first hit, in reverse the last one; null if there is none.

/// Scans the vector at p.
template <bool kReverse, class D, class T, class Pred>
HWY_INLINE const T* HitIn(D d, const T* p, const Pred& pred) {
  const hn::Repartition<uint8_t, D> d8; // converting masks of wider lanes to bits takes longer
  uint64_t bits = 0;
  hn::StoreMaskBits(d8, hn::MaskFromVec(hn::BitCast(d8, hn::VecFromMask(d, pred.Lanes(d, p)))),
                    reinterpret_cast<uint8_t*>(&bits));
  if (bits == 0)
    return nullptr;
  const auto byte =
      kReverse ? 63 - hwy::Num0BitsAboveMS1Bit_Nonzero64(bits) : hwy::Num0BitsBelowLS1Bit_Nonzero64(bits);
  return p + byte / sizeof(T);
}

template <class D, class T, class Pred>
HWY_INLINE bool HasHit(D d, const T* p, const T* q, const T* r, const T* s, const Pred& pred) {
  return !hn::AllFalse(
      d, hn::Or(hn::Or(pred.Lanes(d, p), pred.Lanes(d, q)), hn::Or(pred.Lanes(d, r), pred.Lanes(d, s))));
}

/// Scans a range of one vector or more.
template <bool kReverse, class D, class T, class Pred>
HWY_INLINE const T* ScanVectors(D d, const T* x1, const T* x2, const Pred& pred) {
  constexpr std::size_t n = hn::MaxLanes(D());
  // Unsigned: i may exceed the length, which in a 32-bit program may be the largest ssize_t.
  const std::size_t length = static_cast<std::size_t>(x2 - x1), last = length - n;
  const auto at = [=](std::size_t i) { return kReverse ? x2 - n - i : x1 + i; };
  const auto clamped = [=](std::size_t i) { return at(i < last ? i : last); };
  if (const T* const hit = HitIn<kReverse>(d, at(0), pred))
    return hit;
  std::size_t i = n;
  if constexpr (Pred::kIsCheap) {
    while (length - i >= 4 * n && !HasHit(d, at(i), at(i + n), at(i + 2 * n), at(i + 3 * n), pred))
      i += 4 * n;
    if (i >= length ||
        (length - i < 4 * n && !HasHit(d, clamped(i), clamped(i + n), clamped(i + 2 * n), at(last), pred)))
      return nullptr;
  }
  for (; i < length; i += n)
    if (const T* const hit = HitIn<kReverse>(d, clamped(i), pred))
      return hit;
  return nullptr;
}

/// Scans a range of one to two vectors.
template <bool kReverse, class D, class T, class Pred>
HWY_INLINE const T* ScanEnds(D d, const T* x1, const T* x2, const Pred& pred) {
  const T* const last = x2 - hn::MaxLanes(d);
  const T* const hit = HitIn<kReverse>(d, kReverse ? last : x1, pred);
  return hit != nullptr ? hit : HitIn<kReverse>(d, kReverse ? x1 : last, pred);
}

/// Scans unit by unit.
template <bool kReverse, class T, class Pred>
HWY_INLINE const T* ScanUnits(const T* x1, const T* x2, const Pred& pred) {
  for (ssize_t i = 0, n = x2 - x1; i < n; ++i)
    if (const T* const p = kReverse ? x2 - 1 - i : x1 + i; pred.At(p))
      return p;
  return nullptr;
}

template <bool kReverse, class T, class Pred>
HWY_INLINE const T* Scan(const T* x1, const T* x2, const Pred& pred) {
  const ssize_t length = x2 - x1;
  constexpr ssize_t n = ssize_t(hn::MaxLanes(FullTag<T>()));
  if (length >= n)
    return length <= 2 * n ? ScanEnds<kReverse>(FullTag<T>(), x1, x2, pred)
                           : ScanVectors<kReverse>(FullTag<T>(), x1, x2, pred);
  if (length >= 16 / ssize_t(sizeof(T)))
    return ScanEnds<kReverse>(TagOf<T, 16>(), x1, x2, pred);
  if (length >= 8 / ssize_t(sizeof(T)))
    return ScanEnds<kReverse>(TagOf<T, 8>(), x1, x2, pred);
  return ScanUnits<kReverse>(x1, x2, pred);
}

template <class T> HWY_INLINE const T* HitOrEnd(const T* hit, const T* end) {
  return hit != nullptr ? hit : end;
}

template <bool kReverse, class T> const T* FindUnit(const T* i1, const T* i2, T v) {
  return HitOrEnd(Scan<kReverse>(i1, i2, Equal<T>{v}), i2);
}

template <class T> ssize_t EqualUnits(const T* x, const T* y, ssize_t n) {
  return HitOrEnd(Scan<false>(x, x + n, Different<T>{x, y}), x + n) - x;
}

/// Removes from [p, end) a hit and the units that the scan passed before it. Returns how many units that is.
template <bool kReverse, class T> HWY_INLINE ssize_t PassHit(const T*& p, const T*& end, const T* hit) {
  const ssize_t length = end - p;
  (kReverse ? end : p) = kReverse ? hit : hit + 1;
  return length - (end - p);
}

/// Whether a needle may begin at a position, by three of its units.
template <class T> class NeedleStart {
public:
  static constexpr bool kIsCheap = true;
  NeedleStart(const T* y1, const T* y2)
      : m_last(y2 - y1 - 1), m_first(*y1), m_middle(y1[m_last / 2]), m_final(y1[m_last]) {}

  HWY_INLINE bool At(const T* p) const {
    return *p == m_first && p[m_last] == m_final && p[m_last / 2] == m_middle;
  }
  template <class D> HWY_INLINE hn::Mask<D> Lanes(D d, const T* p) const {
    const auto matchesEnds =
        hn::And(EqualTo(d, LoadUnits(d, p), m_first), EqualTo(d, LoadUnits(d, p + m_last), m_final));
    return hn::And(matchesEnds, EqualTo(d, LoadUnits(d, p + m_last / 2), m_middle));
  }

  /// Scans [p, end). The first unit alone is found faster, unless it is too frequent.
  template <bool kReverse> const T* Next(const T* p, const T* end) {
    while (end - p >= kRare && m_credit > 0) {
      const T* const hit = FindUnit<kReverse>(p, end, m_first);
      if (hit == end)
        return nullptr;
      m_credit += PassHit<kReverse>(p, end, hit) - kRare;
      if (At(hit))
        return hit;
    }
    return Scan<kReverse>(p, end, *this);
  }

private:
  static constexpr ssize_t kRare = 256;
  ssize_t m_last; ///< the index of the last unit
  T m_first, m_middle, m_final;
  int64 m_credit = 2 * kRare; // 64 bits: it may exceed the largest ssize_t
};

template <bool kReverse, class T>
const T* FindSubSequence(const T* x1, const T* x2, const T* y1, const T* y2) {
  const ssize_t length = y2 - y1;
  if (x2 - x1 < length)
    return x2;
  NeedleStart<T> start(y1, y2);
  Credit credit(length);
  const T* p = x1;
  const T* end = x2 - (length - 1); // past the last position where the needle fits
  ssize_t equal = 0;
  for (ssize_t passed = 0; credit.Allows(equal, passed);) {
    const T* const hit = start.template Next<kReverse>(p, end);
    if (hit == nullptr)
      return x2;
    equal = EqualUnits(hit, y1, length);
    if (equal == length)
      return hit;
    passed += PassHit<kReverse>(p, end, hit);
  }
  const auto& scalar = ScalarSearches<T>(); // these searches switch to Two-Way if comparing stays slow
  end += length - 1;
  const T* const q = (kReverse ? scalar.findLastSubSequence : scalar.findFirstSubSequence)(p, end, y1, y2);
  return q == end ? x2 : q;
}

// Sets: Lanes() gives the mask of the lanes that are members.

/// A set as it is given: Lanes() compares with every member.
template <class T> struct Members {
  static constexpr bool kIsCheap = false;
  const T *y1, *y2;

  template <class D> HWY_INLINE hn::Mask<D> Lanes(D d, hn::Vec<D> v) const {
    auto isIn = hn::MaskFromVec(hn::Zero(d));
    for (const T* y = y1; y != y2; ++y)
      isIn = hn::Or(isIn, EqualTo(d, v, *y));
    return isIn;
  }
};

/// Gives each value of a nibble a bit of a byte: 1 << value % 8.
alignas(16) constexpr uint8_t kNibbleBits[16] = {1, 2, 4, 8, 16, 32, 64, 128, 1, 2, 4, 8, 16, 32, 64, 128};

template <class D> HWY_INLINE hn::Vec<D> Lookup(D d, const uint8_t (&table)[16], hn::Vec<D> indices) {
  return hn::TableLookupBytesOr0(hn::LoadDup128(d, table), indices);
}
template <class D> HWY_INLINE hn::Vec<D> HighNibbles(D d, hn::Vec<D> v) {
  const hn::Repartition<uint16_t, D> d16; // bytes have no shifts of their own
  return hn::And(hn::BitCast(d, hn::ShiftRight<4>(hn::BitCast(d16, v))), hn::Set(d, 0xF));
}

/// A set of bytes in two tables, which are indexed by the low nibble. An entry has a bit for each high nibble
/// that makes a member with it: those below 8 in `low`, the others in `high`.
struct ByteTable {
  static constexpr bool kIsCheap = true, isExact = true; ///< isExact: the table has no other members
  alignas(16) uint8_t low[16], high[16];

  ByteTable(const char8* y1, const char8* y2) {
    alignas(16) uint8_t isMember[256] = {}; // 0xFF for a member
    for (; y1 != y2; ++y1)
      isMember[UnitValue(*y1)] = 0xFF;
    const TagOf<char8, 16> d;
    auto lows = hn::Zero(d), highs = lows;
    for (std::size_t h = 0; h < 8; ++h) {
      const auto bit = hn::Set(d, kNibbleBits[h]);
      lows = hn::Or(lows, hn::And(bit, hn::Load(d, isMember + 16 * h)));
      highs = hn::Or(highs, hn::And(bit, hn::Load(d, isMember + 16 * (h + 8))));
    }
    hn::Store(lows, d, low);
    hn::Store(highs, d, high);
  }
  template <class D> HWY_INLINE hn::Mask<D> Lanes(D d, hn::Vec<D> v) const {
    const auto inLow = hn::And(v, hn::Set(d, 0x8F)); // an index with its highest bit set gives 0
    const auto inHigh = hn::Xor(inLow, hn::Set(d, 0x80));
    const auto bits = hn::Or(Lookup(d, low, inLow), Lookup(d, high, inHigh));
    return hn::TestBit(bits, Lookup(d, kNibbleBits, HighNibbles(d, v)));
  }
};

/// A set of 16-bit units by rows; the units of a row differ in the lowest nibble only. Each row has one of
/// eight bits. Each of the four nibbles has a table, which holds that bit for the values that members of the
/// row have there. If no two rows share a bit, a unit is a member where all four tables have a bit in common.
struct RowTables {
  static constexpr bool kIsCheap = true;
  bool isExact = true;
  alignas(16) uint8_t tables[4][16] = {};

  RowTables(const char16* y1, const char16* y2) {
    uint16_t rows[256]; // by their low byte
    uint8_t bits[256] = {};
    for (int count = 0; y1 != y2; ++y1) {
      const unsigned row = *y1 >> 4u, k = row & 0xFF;
      if (bits[k] == 0 || rows[k] != row) {
        isExact = count < 8; // a row that another has displaced counts again
        rows[k] = static_cast<uint16_t>(row);
        bits[k] = kNibbleBits[count++ % 8];
        for (unsigned nibble = 1; nibble < 4; ++nibble)
          tables[nibble][*y1 >> 4 * nibble & 0xF] |= bits[k];
      }
      tables[0][*y1 & 0xF] |= bits[k];
    }
  }
  template <class D> HWY_INLINE hn::Mask<D> Lanes(D d, hn::Vec<D> v) const {
    const hn::Repartition<uint8_t, D> d8;
    const auto bytes = hn::BitCast(d8, v);
    const auto low = hn::And(bytes, hn::Set(d8, 0xF)), high = HighNibbles(d8, bytes);
    const auto inLowByte = hn::And(Lookup(d8, tables[0], low), Lookup(d8, tables[1], high));
    const auto inHighByte = hn::And(Lookup(d8, tables[2], low), Lookup(d8, tables[3], high));
    const auto common = hn::And(hn::BitCast(d, inLowByte), hn::ShiftRight<8>(hn::BitCast(d, inHighByte)));
    return hn::Not(hn::Eq(common, hn::Zero(d)));
  }
};

/// Whether a unit is in a set or, if !kIsMember, isn't.
template <bool kIsMember, class T, class Set> struct Membership {
  static constexpr bool kIsCheap = Set::kIsCheap;
  const T *y1, *y2;
  const Set& set;

  HWY_INLINE bool At(const T* p) const { return (FindUnit<false>(y1, y2, *p) != y2) == kIsMember; }
  template <class D> HWY_INLINE hn::Mask<D> Lanes(D d, const T* p) const {
    const auto isIn = set.Lanes(d, LoadUnits(d, p));
    return kIsMember ? isIn : hn::Not(isIn);
  }
};

template <bool kReverse, bool kIsMember, class T>
const T* FindInSetByTable(const T* x1, const T* x2, const T* y1, const T* y2) {
  const std::conditional_t<sizeof(T) == 1, ByteTable, RowTables> table(y1, y2);
  if (table.isExact)
    return HitOrEnd(Scan<kReverse>(x1, x2, Membership<kIsMember, T, decltype(table)>{y1, y2, table}), x2);
  const auto& scalar = ScalarSearches<T>();
  const auto search = kReverse ? (kIsMember ? scalar.findLastOf : scalar.findLastNotOf)
                               : (kIsMember ? scalar.findFirstOf : scalar.findFirstNotOf);
  return search(x1, x2, y1, y2);
}

/// Most hits are near, and many texts are short: a table is made only after some units without a hit.
template <bool kReverse, bool kIsMember, class T>
const T* FindInSet(const T* x1, const T* x2, const T* y1, const T* y2) {
  const ssize_t length = x2 - x1, size = y2 - y1;
  const Members<T> set = {y1, y2};
  const Membership<kIsMember, T, Members<T>> pred = {y1, y2, set};
  const bool isLarge = size > 64;
  ssize_t near = isLarge ? 8 : 16;
  if (length <= 24 || (!isLarge && int64(length) * size < 1024 * int64(sizeof(T) * sizeof(T))))
    near = length;
  const T* const from = kReverse ? x2 - near : x1;
  const T* const hit =
      isLarge ? ScanUnits<kReverse>(from, from + near, pred) : Scan<kReverse>(from, from + near, pred);
  if (hit != nullptr || near == length)
    return HitOrEnd(hit, x2);
  return FindInSetByTable<kReverse, kIsMember>(x1, x2, y1, y2);
}

template <class T>
constexpr SearchKernels<T> kSearchKernels = {
    FindUnit<false, T>,       FindUnit<true, T>,         FindSubSequence<false, T>,
    FindSubSequence<true, T>, FindInSet<false, true, T>, FindInSet<false, false, T>,
    FindInSet<true, true, T>, FindInSet<true, false, T>, EqualUnits<T>,
};

} // namespace
} // namespace mirel::detail::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
